#include "krcorvanepaneactions.h"
#include "krapp.h"
#include "krcorvanepane.h"
#include "krmainwindow.h"
#include "krpane.h"

#include <QStandardPaths>

namespace {

// Both actions live in the pane's own options menu.
QString paneActionGroup()
{
    return QStringLiteral("Corvane");
}

QString paneMenuPath()
{
    return QStringLiteral("::KrCorvanePane");
}

} // namespace

KrCorvanePaneItemRefresh::KrCorvanePaneItemRefresh()
    : KrAction(QStringLiteral("Refresh Custom Bricks"),
               QStringLiteral("Refreshes the list of saved bricks."))
{
}

QString KrCorvanePaneItemRefresh::getActionGroup() const
{
    return paneActionGroup();
}

QString KrCorvanePaneItemRefresh::getDefaultMenuPath() const
{
    return paneMenuPath();
}

void KrCorvanePaneItemRefresh::executeAction()
{
    KrMainWindow* window = krApp->getInterface();
    if (!window)
        return;
    auto* pane = qobject_cast<KrCorvanePane*>(
        window->getPaneMgr()->findPane(QStringLiteral("KrCorvanePane")));
    if (pane)
        pane->getMainWidget()->createUserMenuAndTree();
}

KrCorvanePaneShowMenus::KrCorvanePaneShowMenus()
    : KrAction(QStringLiteral("Open To User Menus..."),
               QStringLiteral("Opens a file window that shows the user bricks."))
{
}

QString KrCorvanePaneShowMenus::getActionGroup() const
{
    return paneActionGroup();
}

QString KrCorvanePaneShowMenus::getDefaultMenuPath() const
{
    return paneMenuPath();
}

QString KrCorvanePaneShowMenus::customBrickPath()
{
    // The brick-model utility takes this over once it exists.
    return QStandardPaths::writableLocation(QStandardPaths::AppDataLocation) +
           QStringLiteral("/UserBricks");
}

QString KrCorvanePaneShowMenus::userBricksURL()
{
    return QStringLiteral("file://%1/").arg(customBrickPath());
}

void KrCorvanePaneShowMenus::executeAction()
{
    krApp->showURL(userBricksURL());
}
