#include "krhost.h"
#include "krviewport.h"

#include "kraction.h"
#include "krapp.h"
#include "krclassfactory.h"
#include "krmainwindow.h"
#include "krpane.h"
#include "krscene.h"
#include "krscenepane.h"

#include <QApplication>
#include <QDockWidget>
#include <QFile>
#include <QImage>
#include <QSaveFile>
#include <QScriptContext>
#include <QTextStream>
#include <QTimer>
#include <QtDebug>
#include <cstdio>

namespace {

QScriptValue scriptPrint(QScriptContext* context, QScriptEngine*)
{
    QStringList parts;
    for (int i = 0; i < context->argumentCount(); ++i)
        parts.append(context->argument(i).toString());
    const QByteArray line = parts.join(QLatin1Char(' ')).toUtf8() + '\n';
    std::fwrite(line.constData(), 1, size_t(line.size()), stdout);
    std::fflush(stdout);
    return QScriptValue();
}

QScriptValue scriptExit(QScriptContext* context, QScriptEngine*, void* arg)
{
    const int code = context->argumentCount() > 0 ? context->argument(0).toInt32() : 0;
    *static_cast<bool*>(arg) = true;
    QCoreApplication::exit(code);
    return QScriptValue();
}

void printError(const QString& text)
{
    const QByteArray line = text.toLocal8Bit() + '\n';
    std::fwrite(line.constData(), 1, size_t(line.size()), stderr);
    std::fflush(stderr);
}

} // namespace

KrHost::KrHost(const Options& options, QObject* parent) : QObject(parent), m_options(options) {}

KrHost::~KrHost()
{
    // The engine goes first: its values may refer to objects of the window.
    m_engine.reset();
    m_window.reset();
}

KrMainWindow* KrHost::mainWindow() const
{
    return m_window.get();
}

KrScene* KrHost::scene() const
{
    return m_scene.get();
}

QScriptEngine* KrHost::scriptEngine()
{
    return m_engine.get();
}

void KrHost::start()
{
    m_window.reset(new KrMainWindow);
    m_window->setWindowTitle(QStringLiteral("krhost"));
    m_window->resize(1400, 900);
    m_window->setCentralWidget(new KrViewport);

    // The scene exists before the plug-ins, so their panes can read from it at start.
    m_scene.reset(new KrScene);
    m_scene->createDefaultContents();
    m_scene->makeCurrent();

    const QString folder =
        m_options.pluginFolder.isEmpty() ? KrApp::defaultPluginFolder() : m_options.pluginFolder;
    krApp->loadPlugins(folder);
    createContributedObjects();
    auto* scenePane = new KrScenePane(m_scene.get());
    QDockWidget* sceneDock = m_window->addPane(scenePane);
    const bool restored = m_window->restoreLayout();
    setUpScriptEngine();

    m_window->show();
    if (KrPane* corvane = m_window->getPaneMgr()->findPane(QStringLiteral("KrCorvanePane"))) {
        QDockWidget* dock = m_window->getPaneMgr()->getDock(corvane);
        if (!restored) {
            // First start: the editor takes most of the window beside the viewport, the
            // scene a narrow column next to it.
            if (sceneDock && m_window->dockWidgetArea(dock) == m_window->dockWidgetArea(sceneDock))
                m_window->splitDockWidget(dock, sceneDock, Qt::Horizontal);
            m_window->resizeDocks({dock, sceneDock},
                                  {m_window->width() * 11 / 20, m_window->width() / 5},
                                  Qt::Horizontal);
        }
        dock->show();
        dock->raise();
    }
    QTimer::singleShot(0, this, &KrHost::afterStart);
}

void KrHost::createContributedObjects()
{
    // Panes first, so that pane actions and pane options menus find their panes.
    for (const char* base : {"KrPane", "KrAction"}) {
        for (int i = 0; i < krApp->getNumClassFactories(); ++i) {
            KrClassFactory* factory = krApp->getClassFactory(i);
            if (!factory->provides(base))
                continue;
            QObject* object = factory->createInstance();
            if (auto* pane = qobject_cast<KrPane*>(object)) {
                m_window->addPane(pane);
            } else if (auto* action = qobject_cast<KrAction*>(object)) {
                m_window->addKrAction(action);
            } else {
                qWarning().noquote()
                    << "The factory of" << factory->className() << "made nothing usable";
                delete object;
            }
        }
    }
}

void KrHost::setUpScriptEngine()
{
    m_engine.reset(new QScriptEngine);
    QScriptValue global = m_engine->globalObject();
    global.setProperty(QStringLiteral("print"), m_engine->newFunction(scriptPrint));
    global.setProperty(QStringLiteral("exit"), m_engine->newFunction(scriptExit, &m_exitRequested));
    global.setProperty(QStringLiteral("mainWindow"), m_engine->newQObject(m_window.get()));
    global.setProperty(QStringLiteral("krApp"), m_engine->newQObject(krApp));
    global.setProperty(QStringLiteral("scene"), m_engine->newQObject(m_scene.get()));
    for (int i = 0; i < krApp->getNumClassFactories(); ++i)
        krApp->getClassFactory(i)->registerClass(m_engine.get());
}

void KrHost::afterStart()
{
    if (!m_options.scriptFile.isEmpty()) {
        if (!runScript(m_options.scriptFile)) {
            QCoreApplication::exit(1);
            return;
        }
        if (m_exitRequested)
            return;
    }
    if (!m_options.screenshotFile.isEmpty()) {
        // Let the layout settle before taking the picture.
        QCoreApplication::processEvents();
        QCoreApplication::exit(writeScreenshot(m_options.screenshotFile) ? 0 : 2);
    }
}

bool KrHost::runScript(const QString& fileName)
{
    QFile file(fileName);
    if (!file.open(QIODevice::ReadOnly | QIODevice::Text)) {
        printError(tr("Cannot read the script %1: %2").arg(fileName, file.errorString()));
        return false;
    }
    const QString program = QString::fromUtf8(file.readAll());
    const QScriptSyntaxCheckResult syntax = QScriptEngine::checkSyntax(program);
    if (syntax.state() != QScriptSyntaxCheckResult::Valid) {
        printError(QStringLiteral("%1:%2:%3: SyntaxError: %4")
                       .arg(fileName)
                       .arg(syntax.errorLineNumber())
                       .arg(syntax.errorColumnNumber())
                       .arg(syntax.errorMessage()));
        return false;
    }
    m_engine->evaluate(program, fileName);
    if (m_engine->hasUncaughtException()) {
        printError(QStringLiteral("%1:%2: %3")
                       .arg(fileName)
                       .arg(m_engine->uncaughtExceptionLineNumber())
                       .arg(m_engine->uncaughtException().toString()));
        const QStringList backtrace = m_engine->uncaughtExceptionBacktrace();
        for (const QString& frame : backtrace)
            printError(QStringLiteral("    at ") + frame);
        m_engine->clearExceptions();
        return false;
    }
    return true;
}

bool KrHost::writeScreenshot(const QString& fileName)
{
    const QImage image = m_window->grab().toImage();
    QSaveFile file(fileName);
    if (image.isNull() || !file.open(QIODevice::WriteOnly) || !image.save(&file, "PNG") ||
        !file.commit()) {
        printError(tr("Cannot write the screenshot %1: %2").arg(fileName, file.errorString()));
        return false;
    }
    return true;
}
