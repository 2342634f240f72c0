#include "krappsettings.h"

#include <QDir>
#include <QMutex>
#include <QMutexLocker>
#include <QSettings>

namespace {

QMutex s_folderLock;
QString s_storageFolder;

const char* const kOrganization = "krcorvane";
const char* const kApplication = "krhost";

QSettings* makeSettings()
{
    QString folder;
    {
        QMutexLocker lock(&s_folderLock);
        folder = s_storageFolder;
    }
    if (folder.isEmpty()) {
        return new QSettings(QSettings::IniFormat, QSettings::UserScope,
                             QString::fromLatin1(kOrganization), QString::fromLatin1(kApplication));
    }
    return new QSettings(QDir(folder).filePath(QString::fromLatin1(kApplication) + ".ini"),
                         QSettings::IniFormat);
}

} // namespace

struct KrAppSettings::Private
{
    std::unique_ptr<QSettings> settings;
    int pushed = 0;
};

KrAppSettings::KrAppSettings() : d(new Private)
{
    d->settings.reset(makeSettings());
}

KrAppSettings::~KrAppSettings() = default;

void KrAppSettings::pushPath(const QString& group)
{
    d->settings->beginGroup(group);
    ++d->pushed;
}

void KrAppSettings::popPath()
{
    // An unbalanced pop would otherwise leave QSettings warning and the path unchanged.
    if (d->pushed == 0)
        return;
    d->settings->endGroup();
    --d->pushed;
}

QString KrAppSettings::currentPath() const
{
    return d->settings->group();
}

bool KrAppSettings::getBoolValue(const QString& key, bool defaultValue, bool* ok) const
{
    const QVariant v = d->settings->value(key);
    bool good = false;
    bool result = defaultValue;
    if (v.type() == QVariant::Bool) {
        result = v.toBool();
        good = true;
    } else if (v.isValid()) {
        // INI files hand every scalar back as text; accept only what a bool is written as.
        const QString text = v.toString().trimmed().toLower();
        if (text == QLatin1String("true") || text == QLatin1String("1")) {
            result = true;
            good = true;
        } else if (text == QLatin1String("false") || text == QLatin1String("0")) {
            result = false;
            good = true;
        }
    }
    if (ok)
        *ok = good;
    return good ? result : defaultValue;
}

void KrAppSettings::setBoolValue(const QString& key, bool value)
{
    d->settings->setValue(key, value);
}

int KrAppSettings::getIntValue(const QString& key, int defaultValue, bool* ok) const
{
    const QVariant v = d->settings->value(key);
    bool good = false;
    int result = 0;
    if (v.isValid() && v.type() != QVariant::StringList && v.type() != QVariant::ByteArray)
        result = v.toString().trimmed().toInt(&good);
    if (ok)
        *ok = good;
    return good ? result : defaultValue;
}

void KrAppSettings::setIntValue(const QString& key, int value)
{
    d->settings->setValue(key, value);
}

QString KrAppSettings::getStringValue(const QString& key, const QString& defaultValue,
                                      bool* ok) const
{
    const QVariant v = d->settings->value(key);
    // A list (an unquoted comma in a hand-edited file) or binary data is not a string.
    const bool good = v.isValid() && v.canConvert<QString>() && v.type() != QVariant::StringList &&
                      v.type() != QVariant::ByteArray;
    if (ok)
        *ok = good;
    return good ? v.toString() : defaultValue;
}

void KrAppSettings::setStringValue(const QString& key, const QString& value)
{
    d->settings->setValue(key, value);
}

QByteArray KrAppSettings::getBinaryValue(const QString& key) const
{
    const QVariant v = d->settings->value(key);
    if (v.type() != QVariant::ByteArray)
        return QByteArray();
    return v.toByteArray();
}

void KrAppSettings::setBinaryValue(const QString& key, const QByteArray& value)
{
    d->settings->setValue(key, value);
}

bool KrAppSettings::contains(const QString& key) const
{
    return d->settings->contains(key);
}

void KrAppSettings::removeValue(const QString& key)
{
    // QSettings::remove("") would wipe the whole current group.
    if (key.isEmpty())
        return;
    d->settings->remove(key);
}

void KrAppSettings::sync()
{
    d->settings->sync();
}

QString KrAppSettings::fileName() const
{
    return d->settings->fileName();
}

void KrAppSettings::setStorageFolder(const QString& folder)
{
    QMutexLocker lock(&s_folderLock);
    s_storageFolder = folder;
}

QString KrAppSettings::storageFolder()
{
    QMutexLocker lock(&s_folderLock);
    return s_storageFolder;
}
