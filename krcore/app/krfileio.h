#pragma once

#include "krcore_global.h"

#include <QList>
#include <QString>
#include <QStringList>

// The filters of a file dialog: entries of a description and extensions, in order.
//   KrFileFilter f; f.newFilter("Images"); f.addExtension("png"); f.addExtension("jpg");
//   f.toString() == "Images (*.png *.jpg)"
class KRCORE_EXPORT KrFileFilter
{
public:
    KrFileFilter();

    // Starts a new entry; extensions added afterwards belong to it.
    void newFilter(const QString& description);
    // Adds an extension ("png", ".png" or "*.png" alike; "*" for every file) to the entry
    // last started, starting an entry without description when there is none.
    void addExtension(const QString& extension);

    int getNumFilters() const;
    QString getDescription(int filterIndex) const;
    int getNumExtensions(int filterIndex) const;
    // The bare extension ("png"), empty when out of range.
    QString getExtension(int filterIndex, int i) const;
    bool isEmpty() const { return m_entries.isEmpty(); }

    // One entry as a file dialog shows it: "Images (*.png *.jpg)".
    QString filterString(int filterIndex) const;
    // Every entry, separated by ";;".
    QString toString() const;

private:
    struct Entry
    {
        QString description;
        QStringList extensions;
    };
    QList<Entry> m_entries;
};

class KRCORE_EXPORT KrFileIO
{
public:
    // The folder of path ("/a/b" for "/a/b/c.txt").
    static QString getFilePath(const QString& path);
    // The file name without its folder ("c.txt" for "/a/b/c.txt").
    static QString getShortFileName(const QString& path);
};
