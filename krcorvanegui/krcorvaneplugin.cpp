#include "krcorvaneplugin.h"
#include "krcorvanepane.h"
#include "krcorvanepaneactions.h"
#include "krstandardbrickwidget.h"

#include <QEvent>
#include <new>

// Everything below is built when the library is loaded, in this order, and destroyed in the
// reverse order when it is unloaded: the event types, the record, then each class identifier
// followed by its factory (which files itself with the record).

namespace {

template <class T> QObject* createOrNull()
{
    try {
        return new T();
    } catch (const std::bad_alloc&) {
        return nullptr;
    }
}

KrBrickItemEventTypes registerBrickItemEventTypes()
{
    KrBrickItemEventTypes types;
    types.updateConnector = QEvent::registerEventType(-1);
    types.updatePosition = QEvent::registerEventType(-1);
    return types;
}

const KrBrickItemEventTypes s_brickItemEventTypes = registerBrickItemEventTypes();

class KrCorvanePluginRecord : public KrPlugin
{
public:
    KrCorvanePluginRecord() : KrPlugin(QStringLiteral("Corvane"), QString(), QString(), 0)
    {
        setVersion(0x01000000UL);
        setDescription(
            QStringLiteral("Provides the interface for the Corvane development environment."));
    }
};

KrCorvanePluginRecord s_plugin;

const KrGUID s_paneID = KrGUID::fromString(QStringLiteral("2C701AFF-5E3A-4674-A9AC-AD9D9F4DA499"));
KrCorvanePaneFactory s_paneFactory;

const KrGUID s_paneActionID =
    KrGUID::fromString(QStringLiteral("20005FA4-A33A-446E-BCDC-F266AC891353"));
KrCorvanePaneActionFactory s_paneActionFactory;

const KrGUID s_standardBrickWidgetID =
    KrGUID::fromString(QStringLiteral("2C5A65C3-5E4B-4676-AF7C-DEDD9E44FCC8"));
KrStandardBrickWidgetFactory s_standardBrickWidgetFactory;

const KrGUID s_itemRefreshID =
    KrGUID::fromString(QStringLiteral("91EA4029-77CC-4D7F-9215-4D378E3CEFC7"));
KrCorvanePaneItemRefreshFactory s_itemRefreshFactory;

const KrGUID s_showMenusID =
    KrGUID::fromString(QStringLiteral("3E36075B-82A9-44F7-A085-08137AE33B9B"));
KrCorvanePaneShowMenusFactory s_showMenusFactory;

} // namespace

const KrBrickItemEventTypes& krBrickItemEventTypes()
{
    return s_brickItemEventTypes;
}

KrCorvanePaneFactory::KrCorvanePaneFactory() : KrTClassFactory(s_paneID, s_plugin) {}

QObject* KrCorvanePaneFactory::createInstance()
{
    return createOrNull<KrCorvanePane>();
}

KrCorvanePaneActionFactory::KrCorvanePaneActionFactory() : KrTClassFactory(s_paneActionID, s_plugin)
{
}

QObject* KrCorvanePaneActionFactory::createInstance()
{
    return createOrNull<KrCorvanePaneAction>();
}

KrStandardBrickWidgetFactory::KrStandardBrickWidgetFactory()
    : KrTClassFactory(s_standardBrickWidgetID, s_plugin)
{
}

QObject* KrStandardBrickWidgetFactory::createInstance()
{
    return createOrNull<KrStandardBrickWidget>();
}

KrCorvanePaneItemRefreshFactory::KrCorvanePaneItemRefreshFactory()
    : KrTClassFactory(s_itemRefreshID, s_plugin)
{
}

QObject* KrCorvanePaneItemRefreshFactory::createInstance()
{
    return createOrNull<KrCorvanePaneItemRefresh>();
}

KrCorvanePaneShowMenusFactory::KrCorvanePaneShowMenusFactory()
    : KrTClassFactory(s_showMenusID, s_plugin)
{
}

QObject* KrCorvanePaneShowMenusFactory::createInstance()
{
    return createOrNull<KrCorvanePaneShowMenus>();
}

extern "C" {

unsigned long getSDKVersion()
{
    return 0x0300013DUL;
}

KrPlugin* getPluginDefinition()
{
    return &s_plugin;
}
}
