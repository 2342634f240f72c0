#include "krguid.h"

KrGUID KrGUID::fromString(const QString& text)
{
    // QUuid accepts the form with or without braces and in either case; anything else is null.
    const QString trimmed = text.trimmed();
    return KrGUID(QUuid::fromString(QStringView(trimmed)));
}

KrGUID KrGUID::createGUID()
{
    return KrGUID(QUuid::createUuid());
}

QString KrGUID::toString() const
{
    return m_uuid.toString(QUuid::WithoutBraces).toUpper();
}
