#include "krcontentmgr.h"

#include <QDir>
#include <QStandardPaths>
#include <QtDebug>

KrContentMgr::KrContentMgr()
{
    m_folders.append(QStandardPaths::writableLocation(QStandardPaths::AppDataLocation) +
                     QStringLiteral("/Content"));
}

int KrContentMgr::getNumContentDirectories() const
{
    return m_folders.size();
}

QString KrContentMgr::getContentDirectoryPath(int index) const
{
    if (index < 0 || index >= m_folders.size())
        return QString();
    const QString path = QDir::cleanPath(m_folders.at(index));
    if (!QDir().mkpath(path)) {
        qWarning().noquote() << "Cannot create the content folder" << path;
        return QString();
    }
    return path;
}

int KrContentMgr::addContentDirectory(const QString& path)
{
    m_folders.append(path);
    return m_folders.size() - 1;
}
