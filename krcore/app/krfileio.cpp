#include "krfileio.h"

#include <QFileInfo>

KrFileFilter::KrFileFilter() = default;

void KrFileFilter::newFilter(const QString& description)
{
    m_entries.append(Entry{description.trimmed(), QStringList()});
}

void KrFileFilter::addExtension(const QString& extension)
{
    QString ext = extension.trimmed();
    if (ext.startsWith(QLatin1String("*.")))
        ext.remove(0, 2);
    else if (ext.startsWith(QLatin1Char('.')))
        ext.remove(0, 1);
    // A pattern separator inside an extension would split the dialog's filter.
    if (ext.isEmpty() || ext.contains(QLatin1Char(' ')) || ext.contains(QLatin1Char(';')) ||
        ext.contains(QLatin1Char('(')) || ext.contains(QLatin1Char(')')))
        return;
    if (m_entries.isEmpty())
        newFilter(QString());
    if (!m_entries.last().extensions.contains(ext))
        m_entries.last().extensions.append(ext);
}

int KrFileFilter::getNumFilters() const
{
    return m_entries.size();
}

QString KrFileFilter::getDescription(int filterIndex) const
{
    return m_entries.value(filterIndex).description;
}

int KrFileFilter::getNumExtensions(int filterIndex) const
{
    return m_entries.value(filterIndex).extensions.size();
}

QString KrFileFilter::getExtension(int filterIndex, int i) const
{
    return m_entries.value(filterIndex).extensions.value(i);
}

QString KrFileFilter::filterString(int filterIndex) const
{
    if (filterIndex < 0 || filterIndex >= m_entries.size())
        return QString();
    const Entry& e = m_entries.at(filterIndex);
    QStringList patterns;
    for (const QString& ext : e.extensions)
        patterns.append(ext == QLatin1String("*") ? ext : QStringLiteral("*.") + ext);
    if (patterns.isEmpty())
        patterns.append(QStringLiteral("*"));
    const QString list = QStringLiteral("(%1)").arg(patterns.join(QLatin1Char(' ')));
    return e.description.isEmpty() ? list : e.description + QLatin1Char(' ') + list;
}

QString KrFileFilter::toString() const
{
    QStringList parts;
    for (int i = 0; i < m_entries.size(); ++i)
        parts.append(filterString(i));
    return parts.join(QStringLiteral(";;"));
}

QString KrFileIO::getFilePath(const QString& path)
{
    if (path.isEmpty())
        return QString();
    return QFileInfo(path).path();
}

QString KrFileIO::getShortFileName(const QString& path)
{
    return QFileInfo(path).fileName();
}
