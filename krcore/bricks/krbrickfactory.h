#pragma once

#include "krcore_global.h"
#include "krsettings.h"

#include <QMetaType>

class KrClassFactory;
class KrShaderBrick;

// What the library offers to make one brick: a brick class, and for a saved brick the record
// it was saved as (the settings), whose values, title and settings the new brick takes.
class KRCORE_EXPORT KrBrickFactory
{
public:
    KrBrickFactory();
    KrBrickFactory(const KrClassFactory* factory);
    KrBrickFactory(const KrBrickFactory& other);
    KrBrickFactory& operator=(const KrBrickFactory& other);
    ~KrBrickFactory();

    // The class factory, or null when there is none or it makes no shader brick.
    const KrClassFactory* getFactory() const;
    void setClassFactory(const KrClassFactory* factory);
    // A saved brick's record (the ".kcb" text read with KrSettings::fromString); empty for a
    // plain brick kind.
    KrSettings* getSettings() { return &m_settings; }
    const KrSettings* getSettings() const { return &m_settings; }
    // A new brick (reference count 0), or null.
    KrShaderBrick* generateBrick() const;

    bool operator==(const KrBrickFactory& other) const;
    bool operator!=(const KrBrickFactory& other) const { return !(*this == other); }

private:
    const KrClassFactory* m_factory = nullptr;
    KrSettings m_settings;
};

Q_DECLARE_METATYPE(KrBrickFactory)
