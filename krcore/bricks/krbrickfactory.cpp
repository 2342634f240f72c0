#include "krbrickfactory.h"

#include "krclassfactory.h"
#include "krdefaultbrickuser.h"
#include "krshaderbrick.h"

namespace {
// Registered under the name other code looks up ("KrBrickFactory") as soon as krcore loads.
const int s_metaTypeId = qRegisterMetaType<KrBrickFactory>("KrBrickFactory");
} // namespace

KrBrickFactory::KrBrickFactory() = default;

KrBrickFactory::KrBrickFactory(const KrClassFactory* factory) : m_factory(factory) {}

KrBrickFactory::KrBrickFactory(const KrBrickFactory& other) = default;

KrBrickFactory& KrBrickFactory::operator=(const KrBrickFactory& other) = default;

KrBrickFactory::~KrBrickFactory() = default;

const KrClassFactory* KrBrickFactory::getFactory() const
{
    return m_factory && m_factory->provides("KrShaderBrick") ? m_factory : nullptr;
}

void KrBrickFactory::setClassFactory(const KrClassFactory* factory)
{
    m_factory = factory;
}

KrShaderBrick* KrBrickFactory::generateBrick() const
{
    const KrClassFactory* factory = getFactory();
    if (!factory)
        return nullptr;
    QObject* object = const_cast<KrClassFactory*>(factory)->createInstance();
    auto* brick = qobject_cast<KrShaderBrick*>(object);
    if (!brick) {
        delete object;
        return nullptr;
    }
    if (!m_settings.isEmpty())
        KrDefaultBrickUser::readBrickRecord(brick, &m_settings);
    return brick;
}

bool KrBrickFactory::operator==(const KrBrickFactory& other) const
{
    return m_factory == other.m_factory && m_settings == other.m_settings;
}
