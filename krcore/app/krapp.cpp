#include "krapp.h"
#include "krclassfactory.h"
#include "krcontentmgr.h"
#include "krmainwindow.h"
#include "krplugin.h"
#include "krstyle.h"
#include "krundo.h"

#include <QApplication>
#include <QDesktopServices>
#include <QDir>
#include <QFileInfo>
#include <QGuiApplication>
#include <QHash>
#include <QLibrary>
#include <QMetaType>
#include <QPointer>
#include <QTemporaryDir>
#include <QUrl>
#include <QtDebug>
#include <vector>

namespace {

KrApp* s_instance = nullptr;

QString versionText(unsigned long v)
{
    return QStringLiteral("%1.%2.%3.%4 (0x%5)")
        .arg((v >> 24) & 0xff)
        .arg((v >> 16) & 0xff)
        .arg((v >> 8) & 0xff)
        .arg(v & 0xff)
        .arg(qulonglong(v & 0xffffffffUL), 8, 16, QLatin1Char('0'));
}

} // namespace

struct KrApp::Private
{
    QList<KrClassFactory*> factories;
    QHash<QString, KrClassFactory*> byName; // the first registered of each name
    QList<KrPlugin*> plugins;
    std::vector<std::unique_ptr<QLibrary>> libraries;
    QPointer<KrMainWindow> mainWindow;
    bool closing = false;
    std::unique_ptr<QTemporaryDir> tempDir;
    quint64 tempCounter = 0;
    QPointer<KrStyle> style;
    std::unique_ptr<KrContentMgr> contentMgr;
    KrRenderMgr* renderMgr = nullptr;
    QPointer<KrUndoStack> undoStack; // the one this KrApp made, if any
};

KrApp::KrApp(QObject* parent) : QObject(parent), d(new Private)
{
    if (!s_instance)
        s_instance = this;
    qRegisterMetaType<KrPlugin*>("KrPlugin*");
    KrPlugin& core = krCorePlugin();
    for (int i = 0; i < core.getNumClassFactories(); ++i)
        registerClassFactory(core.getClassFactory(i));
}

KrApp::~KrApp()
{
    if (s_instance == this)
        s_instance = nullptr;
    // Deleting a QLibrary leaves its library loaded: objects made from its factories may
    // outlive this.
}

KrApp* KrApp::instance()
{
    if (!s_instance)
        new KrApp(QCoreApplication::instance());
    return s_instance;
}

KrApp* KrApp::existingInstance()
{
    return s_instance;
}

KrClassFactory* KrApp::findClassFactory(const QString& className) const
{
    return d->byName.value(className);
}

int KrApp::getNumClassFactories() const
{
    return d->factories.size();
}

KrClassFactory* KrApp::getClassFactory(int i) const
{
    return d->factories.value(i);
}

void KrApp::registerClassFactory(KrClassFactory* factory)
{
    if (!factory || d->factories.contains(factory))
        return;
    d->factories.append(factory);
    const QString name = factory->className();
    if (d->byName.contains(name)) {
        qWarning().noquote() << "Class" << name
                             << "is contributed twice; the first registration is used";
    } else {
        d->byName.insert(name, factory);
    }
    emit classFactoriesChanged();
}

void KrApp::unregisterClassFactory(KrClassFactory* factory)
{
    if (!d->factories.removeAll(factory))
        return;
    const QString name = factory->className();
    if (d->byName.value(name) == factory) {
        d->byName.remove(name);
        for (KrClassFactory* other : qAsConst(d->factories)) {
            if (other->className() == name) {
                d->byName.insert(name, other);
                break;
            }
        }
    }
    emit classFactoriesChanged();
}

KrPlugin* KrApp::loadPlugin(const QString& path, QString* error)
{
    auto refuse = [&](const QString& reason) -> KrPlugin* {
        qWarning().noquote() << QStringLiteral("Plug-in %1 refused: %2").arg(path, reason);
        if (error)
            *error = reason;
        return nullptr;
    };

    auto library = std::make_unique<QLibrary>(path);
    if (!library->load())
        return refuse(tr("it cannot be loaded (%1)").arg(library->errorString()));

    auto sdkVersion = reinterpret_cast<KrGetSDKVersionFn>(library->resolve("getSDKVersion"));
    auto definition =
        reinterpret_cast<KrGetPluginDefinitionFn>(library->resolve("getPluginDefinition"));
    if (!sdkVersion || !definition) {
        library->unload();
        return refuse(tr("it does not export getSDKVersion and getPluginDefinition"));
    }

    const unsigned long version = sdkVersion();
    if (((version >> 24) & 0xff) != ((KR_SDK_VERSION >> 24) & 0xff)) {
        library->unload();
        return refuse(tr("it was built for SDK version %1, this host has SDK version %2")
                          .arg(versionText(version), versionText(KR_SDK_VERSION)));
    }

    KrPlugin* plugin = definition();
    if (!plugin) {
        library->unload();
        return refuse(tr("it gave no plug-in record"));
    }
    if (d->plugins.contains(plugin)) {
        // The same library reached under another name: already registered.
        library->unload();
        return plugin;
    }

    d->libraries.push_back(std::move(library));
    d->plugins.append(plugin);
    for (int i = 0; i < plugin->getNumClassFactories(); ++i)
        registerClassFactory(plugin->getClassFactory(i));
    qInfo().noquote() << QStringLiteral("Plug-in %1 loaded from %2 (%3 classes)")
                             .arg(plugin->getName(), path)
                             .arg(plugin->getNumClassFactories());
    emit pluginLoaded(plugin);
    return plugin;
}

QList<KrPlugin*> KrApp::loadPlugins(const QString& folder)
{
    QList<KrPlugin*> loaded;
    const QDir dir(folder);
    if (folder.isEmpty() || !dir.exists()) {
        qWarning().noquote() << "Plug-in folder" << folder << "does not exist";
        return loaded;
    }
    const QFileInfoList entries = dir.entryInfoList(QDir::Files, QDir::Name);
    for (const QFileInfo& entry : entries) {
        const QString path = entry.absoluteFilePath();
        if (!QLibrary::isLibrary(path)) {
            qInfo().noquote() << "Skipping" << path << "in the plug-in folder: not a library";
            continue;
        }
        if (KrPlugin* plugin = loadPlugin(path)) {
            if (!loaded.contains(plugin))
                loaded.append(plugin);
        }
    }
    return loaded;
}

QList<KrPlugin*> KrApp::getPlugins() const
{
    return d->plugins;
}

QString KrApp::defaultPluginFolder()
{
    const QString fromEnvironment = qEnvironmentVariable("KR_PLUGIN_PATH");
    if (!fromEnvironment.isEmpty())
        return fromEnvironment;
    return QDir::cleanPath(QCoreApplication::applicationDirPath() + QStringLiteral("/../plugins"));
}

KrMainWindow* KrApp::getInterface() const
{
    return d->mainWindow;
}

void KrApp::setInterface(KrMainWindow* window)
{
    d->mainWindow = window;
}

QWidget* KrApp::getDialogParent() const
{
    if (d->mainWindow)
        return d->mainWindow;
    if (qobject_cast<QApplication*>(QCoreApplication::instance()))
        return QApplication::activeWindow();
    return nullptr;
}

bool KrApp::isClosing() const
{
    return d->closing;
}

void KrApp::setClosing(bool closing)
{
    d->closing = closing;
}

QString KrApp::getTempFilename(const QString& suffix)
{
    if (!d->tempDir)
        d->tempDir.reset(new QTemporaryDir(QDir::tempPath() + QStringLiteral("/krhost-XXXXXX")));
    if (!d->tempDir->isValid()) {
        qWarning().noquote() << "No temporary folder:" << d->tempDir->errorString();
        return QString();
    }
    QString ext = suffix.trimmed();
    if (!ext.isEmpty() && !ext.startsWith(QLatin1Char('.')))
        ext.prepend(QLatin1Char('.'));
    const QDir dir(d->tempDir->path());
    QString name;
    do {
        name = dir.filePath(
            QStringLiteral("kr%1%2").arg(++d->tempCounter, 6, 10, QLatin1Char('0')).arg(ext));
    } while (QFileInfo::exists(name));
    return name;
}

KrStyle* KrApp::getStyle()
{
    // QApplication::setStyle() takes the style over; the QPointer notices if it deletes it.
    if (!d->style) {
        d->style = new KrStyle();
        d->style->setParent(this);
    }
    return d->style;
}

KrContentMgr* KrApp::getContentMgr()
{
    if (!d->contentMgr)
        d->contentMgr.reset(new KrContentMgr());
    return d->contentMgr.get();
}

KrRenderMgr* KrApp::getRenderMgr() const
{
    return d->renderMgr;
}

void KrApp::setRenderMgr(KrRenderMgr* mgr)
{
    d->renderMgr = mgr;
}

KrUndoStack* KrApp::getUndoStack() const
{
    if (!krUndoStack && !d->undoStack)
        d->undoStack = new KrUndoStack(const_cast<KrApp*>(this));
    return krUndoStack ? krUndoStack : d->undoStack.data();
}

bool KrApp::showURL(const QString& url)
{
    QUrl target(url, QUrl::TolerantMode);
    // "file://" + a plain path: a path holding '#', '?' or '%' would not survive URL parsing.
    const QString localPrefix = QStringLiteral("file://");
    if (url.startsWith(localPrefix, Qt::CaseInsensitive) &&
        QFileInfo::exists(url.mid(localPrefix.size())))
        target = QUrl::fromLocalFile(url.mid(localPrefix.size()));
    if (url.trimmed().isEmpty() || !target.isValid()) {
        qWarning().noquote() << "Cannot show" << url << "- it is not a valid URL";
        return false;
    }
    emit urlRequested(url);
    const QString platform = QGuiApplication::platformName();
    if (platform == QLatin1String("offscreen") || platform == QLatin1String("minimal")) {
        qInfo().noquote() << "No desktop to show" << target.toString() << "on";
        return false;
    }
    const bool shown = QDesktopServices::openUrl(target);
    if (!shown)
        qWarning().noquote() << "The desktop could not show" << target.toString();
    return shown;
}
