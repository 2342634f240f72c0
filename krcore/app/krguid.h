#pragma once

#include "krcore_global.h"

#include <QString>
#include <QUuid>

// A class identifier. Its text is the upper-case, hyphenated 8-4-4-4-12 form without braces.
class KRCORE_EXPORT KrGUID
{
public:
    KrGUID() = default;
    explicit KrGUID(const QUuid& uuid) : m_uuid(uuid) {}

    static KrGUID fromString(const QString& text); // null GUID when text is not one
    static KrGUID createGUID();

    QString toString() const;
    bool isNull() const { return m_uuid.isNull(); }
    const QUuid& uuid() const { return m_uuid; }

    bool operator==(const KrGUID& o) const { return m_uuid == o.m_uuid; }
    bool operator!=(const KrGUID& o) const { return m_uuid != o.m_uuid; }

private:
    QUuid m_uuid;
};

inline uint qHash(const KrGUID& g, uint seed = 0) { return qHash(g.uuid(), seed); }
