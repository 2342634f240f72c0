#pragma once

#include <QList>
#include <QString>

class IKrBrickUser;
class KrFileFilter;
class KrSettings;
class QWidget;

// Brick-user files and saved-brick (".kcb") files. Both hold the text form of a settings
// record and are written and read as UTF-8, so titles outside ASCII survive a round trip.
// Writes go through QSaveFile: a failed write leaves an existing file as it was.
class KrBrickUserFiles
{
public:
    static QString classNameKey(); // "BrelvoHallixClassName"
    static QString brickSetKey();  // "BrickSet"

    // The folder the open ("LastOpen") or save ("LastSave") dialog starts in: the folder of
    // the last file chosen there, else the first content folder.
    static QString lastFolder(const QString& key);
    static void rememberFolder(const QString& key, const QString& fileName);

    // "Brelvo Brick <type label>" with the kind's extension.
    static KrFileFilter saveFilter(const IKrBrickUser* user);
    // One entry per kind, in list order, then "All" with every kind's extension.
    static KrFileFilter openFilter(const QList<IKrBrickUser*>& kinds);

    // The record a brick-user file holds: the element's class name and its attributes.
    static void writeRecord(const IKrBrickUser* user, KrSettings* record);

    static bool writeTextFile(const QString& fileName, const QString& text,
                              QString* error = nullptr);
    static bool readTextFile(const QString& fileName, QString* text, QString* error = nullptr);

    // Writes user to fileName. False with the reason in error when the file could not be
    // written; an existing file is then untouched.
    static bool writeBrickUserFile(const IKrBrickUser* user, const QString& fileName,
                                   QString* error = nullptr);
    // A new brick user read from fileName (the caller owns it), or null with the message for
    // the user in error.
    static IKrBrickUser* readBrickUserFile(const QString& fileName, QString* error);

    // The save flow of a brick-user window: file dialog, overwrite question, write, and a
    // message box when the write fails. True when the file was written.
    static bool saveWithDialog(IKrBrickUser* user);
    // The open flow: file dialog over the kinds' extensions, then readBrickUserFile(). Null
    // when cancelled or unreadable; error is then set when the user must be told.
    static IKrBrickUser* openWithDialog(const QList<IKrBrickUser*>& kinds, QString* error);

    // Parent of the flows' dialogs and message boxes: the host main window.
    static QWidget* dialogParent();
};
