#include "krpane.h"
#include "krapp.h"
#include "krclassfactory.h"
#include "krmainwindow.h"

#include <QDockWidget>
#include <QPointer>

KrPane::KrPane(const QString& name, QWidget* parent) : QWidget(parent), m_name(name)
{
    setWindowTitle(name);
}

KrPane::~KrPane() = default;

void KrPane::saveSettings(KrPaneSettings&) {}

void KrPane::restoreSettings(const KrPaneSettings&) {}

KrPaneMgr::KrPaneMgr(QObject* parent) : QObject(parent) {}

KrPaneMgr::~KrPaneMgr() = default;

void KrPaneMgr::addPane(KrPane* pane, QDockWidget* dock)
{
    if (!pane || getDock(pane))
        return;
    m_entries.append(Entry{pane, dock});
    connect(pane, &QObject::destroyed, this, [this, pane]() {
        for (int i = m_entries.size() - 1; i >= 0; --i) {
            if (m_entries.at(i).pane == pane)
                m_entries.removeAt(i);
        }
    });
    emit paneAdded(pane);
}

QDockWidget* KrPaneMgr::getDock(const KrPane* pane) const
{
    for (const Entry& e : m_entries) {
        if (e.pane == pane)
            return e.dock;
    }
    return nullptr;
}

KrPane* KrPaneMgr::findPane(const QString& name) const
{
    for (const Entry& e : m_entries) {
        if (e.pane->getName() == name)
            return e.pane;
    }
    const QByteArray className = name.toLatin1();
    for (const Entry& e : m_entries) {
        if (className == e.pane->metaObject()->className())
            return e.pane;
    }
    return nullptr;
}

int KrPaneMgr::getNumPanes() const
{
    return m_entries.size();
}

KrPane* KrPaneMgr::getPane(int i) const
{
    return m_entries.value(i).pane;
}

KrPaneAction::KrPaneAction(const char* paneClassName, QObject* parent)
    : KrAction(QString::fromLatin1(paneClassName), QString(), parent),
      m_paneClassName(paneClassName)
{
    setCheckable(true);
    setChecked(false);
    setStatusTip(tr("Shows or hides the %1 pane.").arg(getPaneClassName()));
}

KrPaneAction::~KrPaneAction() = default;

void KrPaneAction::attachToDock(QDockWidget* dock)
{
    if (!dock)
        return;
    setText(dock->windowTitle());
    setStatusTip(tr("Shows or hides the %1 pane.").arg(dock->windowTitle()));
    // The dock's own toggle action only follows show and hide events, so it is stale until
    // the window is shown; the dock's hidden state is not.
    setChecked(!dock->isHidden());
    // toggled (not triggered) so that following the dock never runs executeAction().
    connect(dock->toggleViewAction(), &QAction::toggled, this, &QAction::setChecked,
            Qt::UniqueConnection);
}

QString KrPaneAction::getActionGroup() const
{
    return QStringLiteral("Panes");
}

QString KrPaneAction::getDefaultMenuPath() const
{
    return QStringLiteral("Window");
}

void KrPaneAction::executeAction()
{
    KrMainWindow* window = krApp->getInterface();
    if (!window)
        return;
    const bool show = isChecked();
    KrPane* pane = window->getPaneMgr()->findPane(getPaneClassName());
    if (!pane && show) {
        KrClassFactory* factory = krApp->findClassFactory(getPaneClassName());
        if (factory && factory->provides("KrPane")) {
            QObject* made = factory->createInstance();
            pane = qobject_cast<KrPane*>(made);
            if (!pane)
                delete made;
        }
        if (!pane) {
            setChecked(false);
            return;
        }
        window->addPane(pane);
    }
    QDockWidget* dock = window->getPaneMgr()->getDock(pane);
    if (!dock)
        return;
    attachToDock(dock);
    dock->setVisible(show);
    setChecked(show);
    if (show)
        dock->raise();
}
