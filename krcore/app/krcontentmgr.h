#pragma once

#include "krcore_global.h"

#include <QString>
#include <QStringList>

// The folders where the user's content (scenes, brick users, saved bricks) lives.
// Folder 0 is "Content" in the user's application data folder.
class KRCORE_EXPORT KrContentMgr
{
public:
    KrContentMgr();

    int getNumContentDirectories() const;
    // The folder's path, created on first use. Empty for an index out of range or when the
    // folder cannot be created.
    QString getContentDirectoryPath(int index) const;
    // Adds a further content folder (after the default one); returns its index.
    int addContentDirectory(const QString& path);

private:
    QStringList m_folders;
};
