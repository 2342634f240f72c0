#pragma once

#include "krcore_global.h"

#include <QString>
#include <QStringList>
#include <QVariant>
#include <memory>

// Persistent application settings (QSettings underneath). Built on the stack for each use;
// pushPath() descends into a group for the life of the object.
class KRCORE_EXPORT KrAppSettings
{
public:
    KrAppSettings();
    ~KrAppSettings();

    void pushPath(const QString& group);
    void popPath();
    QString currentPath() const;

    bool getBoolValue(const QString& key, bool defaultValue = false, bool* ok = nullptr) const;
    void setBoolValue(const QString& key, bool value);
    int getIntValue(const QString& key, int defaultValue = 0, bool* ok = nullptr) const;
    void setIntValue(const QString& key, int value);
    QString getStringValue(const QString& key, const QString& defaultValue = QString(),
                           bool* ok = nullptr) const;
    void setStringValue(const QString& key, const QString& value);
    QByteArray getBinaryValue(const QString& key) const;
    void setBinaryValue(const QString& key, const QByteArray& value);
    bool contains(const QString& key) const;
    void removeValue(const QString& key);
    void sync();
    // The file the settings live in.
    QString fileName() const;

    // Points every KrAppSettings at one INI file in folder (tests use a temporary folder).
    // An empty folder returns to the user's normal settings.
    static void setStorageFolder(const QString& folder);
    static QString storageFolder();

private:
    struct Private;
    std::unique_ptr<Private> d;
};
