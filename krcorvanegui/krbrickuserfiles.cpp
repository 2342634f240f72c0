#include "krbrickuserfiles.h"

#include "krapp.h"
#include "krappsettings.h"
#include "krbrickuser.h"
#include "krclassfactory.h"
#include "krcontentmgr.h"
#include "krcorvaneutility.h"
#include "krelement.h"
#include "krfileio.h"
#include "krmainwindow.h"
#include "krsettings.h"

#include <QCoreApplication>
#include <QFile>
#include <QMessageBox>
#include <QSaveFile>

namespace {

const char* const kGroup = "DuderOvid";
// The save flow's texts belong to the window that runs it.
const char* const kWindowContext = "KrCorvaneDockWidget";
const char* const kPaneContext = "KrCorvanePaneMainWgt";

QString windowTr(const char* text)
{
    return QCoreApplication::translate(kWindowContext, text);
}

QString readError(const QString& fileName, const QString& reason)
{
    return QStringLiteral("Error reading file %1.\n").arg(fileName) + reason;
}

} // namespace

QString KrBrickUserFiles::classNameKey()
{
    return QStringLiteral("BrelvoHallixClassName");
}

QString KrBrickUserFiles::brickSetKey()
{
    return QStringLiteral("BrickSet");
}

QString KrBrickUserFiles::lastFolder(const QString& key)
{
    KrAppSettings settings;
    settings.pushPath(QLatin1String(kGroup));
    return settings.getStringValue(key, krApp->getContentMgr()->getContentDirectoryPath(0));
}

void KrBrickUserFiles::rememberFolder(const QString& key, const QString& fileName)
{
    KrAppSettings settings;
    settings.pushPath(QLatin1String(kGroup));
    settings.setStringValue(key, KrFileIO::getFilePath(fileName));
}

KrFileFilter KrBrickUserFiles::saveFilter(const IKrBrickUser* user)
{
    KrFileFilter filter;
    filter.newFilter(windowTr("Brelvo Brick %1").arg(user->getTypeLabel()));
    filter.addExtension(user->getFileExtension());
    return filter;
}

KrFileFilter KrBrickUserFiles::openFilter(const QList<IKrBrickUser*>& kinds)
{
    KrFileFilter filter;
    for (const IKrBrickUser* kind : kinds) {
        filter.newFilter(
            QCoreApplication::translate(kPaneContext, "Brelvo Brick %1").arg(kind->getTypeLabel()));
        filter.addExtension(kind->getFileExtension());
    }
    filter.newFilter(QCoreApplication::translate(kPaneContext, "All"));
    for (const IKrBrickUser* kind : kinds)
        filter.addExtension(kind->getFileExtension());
    return filter;
}

void KrBrickUserFiles::writeRecord(const IKrBrickUser* user, KrSettings* record)
{
    const auto* element = qobject_cast<const KrElement*>(user->getObject());
    record->setStringValue(classNameKey(),
                           QString::fromLatin1(user->getObject()->metaObject()->className()));
    KrSettings* brickSet = record->setSettingsValue(brickSetKey());
    if (element)
        element->getAttributes(brickSet);
}

bool KrBrickUserFiles::writeTextFile(const QString& fileName, const QString& text, QString* error)
{
    QSaveFile file(fileName);
    if (!file.open(QIODevice::WriteOnly)) {
        if (error)
            *error = file.errorString();
        return false;
    }
    const QByteArray bytes = text.toUtf8();
    if (file.write(bytes) != bytes.size()) {
        if (error)
            *error = file.errorString();
        file.cancelWriting();
        return false;
    }
    if (!file.commit()) {
        if (error)
            *error = file.errorString();
        return false;
    }
    return true;
}

bool KrBrickUserFiles::readTextFile(const QString& fileName, QString* text, QString* error)
{
    QFile file(fileName);
    if (!file.open(QIODevice::ReadOnly)) {
        if (error)
            *error = file.errorString();
        return false;
    }
    *text = QString::fromUtf8(file.readAll());
    return true;
}

bool KrBrickUserFiles::writeBrickUserFile(const IKrBrickUser* user, const QString& fileName,
                                          QString* error)
{
    KrSettings record;
    writeRecord(user, &record);
    return writeTextFile(fileName, record.toString(), error);
}

IKrBrickUser* KrBrickUserFiles::readBrickUserFile(const QString& fileName, QString* error)
{
    // Unreadable text leaves the record empty, which the class name test reports.
    KrSettings record;
    QString text;
    if (readTextFile(fileName, &text))
        record.fromString(text);

    const QString className = record.getStringValue(classNameKey());
    if (className.isEmpty()) {
        *error = readError(fileName, QStringLiteral("No class name."));
        return nullptr;
    }
    const QString invalid = QStringLiteral("Invalid class name: %1.").arg(className);
    // Only elements are made from a file: a name picked from any other class the host knows
    // (a pane, an action) must not create that object.
    KrClassFactory* factory = krApp->findClassFactory(className);
    if (!factory || !factory->provides("KrElement")) {
        *error = readError(fileName, invalid);
        return nullptr;
    }
    QObject* object = factory->createInstance();
    auto* element = qobject_cast<KrElement*>(object);
    IKrBrickUser* user = element ? KrCorvaneUtility::toBrickUser(element) : nullptr;
    if (!user) {
        delete object;
        *error = readError(fileName, invalid);
        return nullptr;
    }
    const KrSettings* brickSet = record.getSettingsValue(brickSetKey());
    if (!brickSet) {
        user->release();
        *error = readError(fileName, QStringLiteral("No brick settings given."));
        return nullptr;
    }
    if (!element->setAttributes(brickSet)) {
        user->release();
        *error = readError(fileName, QStringLiteral("The brick settings could not be read."));
        return nullptr;
    }
    error->clear();
    return user;
}

QWidget* KrBrickUserFiles::dialogParent()
{
    KrApp* app = KrApp::existingInstance();
    return app ? app->getInterface() : nullptr;
}

bool KrBrickUserFiles::saveWithDialog(IKrBrickUser* user)
{
    KrMainWindow* mainWindow = krApp->getInterface();
    if (!user || !mainWindow)
        return false;

    const QString startFolder = lastFolder(QStringLiteral("LastSave"));
    const KrFileFilter filter = saveFilter(user);
    const QString title = windowTr("Save %1 setup...").arg(user->getTypeLabel());
    QString fileName;
    if (!mainWindow->doFileDialog(false, title, startFolder, filter, fileName, nullptr, nullptr) ||
        fileName.isEmpty())
        return false;

    if (QFile::exists(fileName)) {
        const QMessageBox::StandardButton answer = QMessageBox::question(
            mainWindow, windowTr("File Already Exists..."),
            windowTr("Would you like to overwrite %1?").arg(KrFileIO::getShortFileName(fileName)),
            QMessageBox::Ok | QMessageBox::Cancel);
        if (answer != QMessageBox::Ok)
            return false;
    }

    QString reason;
    const bool written = writeBrickUserFile(user, fileName, &reason);
    rememberFolder(QStringLiteral("LastSave"), fileName);
    if (!written) {
        QMessageBox::critical(mainWindow, windowTr("File write error"),
                              windowTr("Error writing file %1.\n%2").arg(fileName, reason),
                              QMessageBox::Ok);
    }
    return written;
}

IKrBrickUser* KrBrickUserFiles::openWithDialog(const QList<IKrBrickUser*>& kinds, QString* error)
{
    error->clear();
    KrMainWindow* mainWindow = krApp->getInterface();
    if (!mainWindow)
        return nullptr;

    const QString startFolder = lastFolder(QStringLiteral("LastOpen"));
    const KrFileFilter filter = openFilter(kinds);
    QString fileName;
    if (!mainWindow->doFileDialog(true, QCoreApplication::translate(kPaneContext, "Open..."),
                                  startFolder, filter, fileName, nullptr, nullptr) ||
        fileName.isEmpty())
        return nullptr;
    rememberFolder(QStringLiteral("LastOpen"), fileName);
    return readBrickUserFile(fileName, error);
}
