#include "krplugin.h"

KrPlugin::KrPlugin(const QString& name, const QString& author, const QString& url,
                   unsigned long version)
    : m_name(name), m_author(author), m_url(url), m_version(version)
{
}

KrPlugin::~KrPlugin() = default;

void KrPlugin::addClassFactory(KrClassFactory* factory)
{
    if (factory && !m_factories.contains(factory))
        m_factories.append(factory);
}

void KrPlugin::removeClassFactory(KrClassFactory* factory)
{
    m_factories.removeAll(factory);
}

KrPlugin& krCorePlugin()
{
    // Function-local so that krcore's own factories, constructed during static
    // initialisation in any order, always find the record.
    static KrPlugin plugin(QStringLiteral("krcore"), QString(), QString(), KR_SDK_VERSION);
    return plugin;
}
