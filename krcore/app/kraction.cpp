#include "kraction.h"
#include "krapp.h"
#include "krmainwindow.h"

#include <QApplication>
#include <QKeySequence>
#include <QMenu>
#include <QMetaMethod>
#include <QWidget>

KrAction::KrAction(const QString& text, const QString& description, QObject* parent)
    : QAction(text, parent), m_description(description)
{
    setStatusTip(description);
    setToolTip(description.isEmpty() ? text : description);
    connect(this, &QAction::triggered, this, [this]() { executeAction(); });
}

KrAction::~KrAction() = default;

QString KrAction::getActionGroup() const
{
    return QStringLiteral("General");
}

QString KrAction::getDefaultMenuPath() const
{
    return QStringLiteral("Tools");
}

void KrAction::executeAction() {}

KrRoutedAction::KrRoutedAction(const QString& text, const QString& description,
                               const QString& group, const QString& menuPath,
                               const char* fallbackSlot, QObject* parent)
    : KrAction(text, description, parent), m_group(group), m_menuPath(menuPath),
      m_fallbackSlot(fallbackSlot)
{
    setShortcutContext(Qt::WidgetShortcut);
}

QString KrRoutedAction::getActionGroup() const
{
    return m_group;
}

QString KrRoutedAction::getDefaultMenuPath() const
{
    return m_menuPath;
}

QWidget* KrRoutedAction::focusStart() const
{
    QWidget* focus = QApplication::focusWidget();
    // While one of our menus is open it may hold the focus; the command is for the window.
    if (!focus || qobject_cast<QMenu*>(focus) || focus->window()->windowType() == Qt::Popup) {
        KrApp* app = KrApp::existingInstance();
        KrMainWindow* window = app ? app->getInterface() : nullptr;
        focus = window ? window->focusWidget() : nullptr;
    }
    return focus;
}

QAction* KrRoutedAction::findTarget() const
{
    const QString className = QString::fromLatin1(metaObject()->className());
    const QKeySequence key = shortcut();
    for (QWidget* w = focusStart(); w; w = w->parentWidget()) {
        const QList<QAction*> actions = w->actions();
        for (QAction* a : actions) {
            // Host commands never route to one another.
            if (qobject_cast<KrRoutedAction*>(a) || !a->isEnabled() || !a->isVisible())
                continue;
            if (a->property("krHostAction").toString() == className ||
                (!key.isEmpty() && a->shortcuts().contains(key)))
                return a;
        }
    }
    return nullptr;
}

bool KrRoutedAction::hasTarget() const
{
    if (findTarget())
        return true;
    QWidget* focus = focusStart();
    if (!focus || m_fallbackSlot.isEmpty())
        return false;
    const QByteArray signature = m_fallbackSlot + "()";
    return focus->metaObject()->indexOfMethod(signature.constData()) >= 0;
}

void KrRoutedAction::executeAction()
{
    if (QAction* target = findTarget()) {
        target->trigger();
        return;
    }
    QWidget* focus = focusStart();
    if (focus && !m_fallbackSlot.isEmpty() && hasTarget())
        QMetaObject::invokeMethod(focus, m_fallbackSlot.constData());
}

KrSaveAction::KrSaveAction(QObject* parent)
    : KrRoutedAction(tr("&Save"), tr("Saves the current document."), QStringLiteral("Document"),
                     QStringLiteral("File"), nullptr, parent)
{
    setShortcuts(QKeySequence::Save);
}

KrImportAction::KrImportAction(QObject* parent)
    : KrRoutedAction(tr("&Import..."), tr("Imports a file into the current document."),
                     QStringLiteral("Document"), QStringLiteral("File"), nullptr, parent)
{
}

KrCopyAction::KrCopyAction(QObject* parent)
    : KrRoutedAction(tr("&Copy"), tr("Copies the selection to the clipboard."),
                     QStringLiteral("Clipboard"), QStringLiteral("Edit"), "copy", parent)
{
    setShortcuts(QKeySequence::Copy);
}

KrSICutAction::KrSICutAction(QObject* parent)
    : KrRoutedAction(tr("Cu&t"), tr("Moves the selection to the clipboard."),
                     QStringLiteral("Clipboard"), QStringLiteral("Edit"), "cut", parent)
{
    setShortcuts(QKeySequence::Cut);
}

KrPasteAction::KrPasteAction(QObject* parent)
    : KrRoutedAction(tr("&Paste"), tr("Inserts the clipboard's contents."),
                     QStringLiteral("Clipboard"), QStringLiteral("Edit"), "paste", parent)
{
    setShortcuts(QKeySequence::Paste);
}

KrCustomizeAction::KrCustomizeAction(QObject* parent)
    : KrRoutedAction(tr("Pr&eferences..."), tr("Changes the preferences of the current window."),
                     QStringLiteral("Preferences"), QStringLiteral("Edit"), nullptr, parent)
{
}

KrActionMgr::KrActionMgr(QObject* parent) : QObject(parent) {}

KrActionMgr::~KrActionMgr() = default;

void KrActionMgr::addAction(KrAction* action)
{
    if (!action || m_actions.contains(action))
        return;
    m_actions.append(action);
    connect(action, &QObject::destroyed, this, [this, action]() { m_actions.removeAll(action); });
    emit actionAdded(action);
}

void KrActionMgr::removeAction(KrAction* action)
{
    if (!action)
        return;
    disconnect(action, &QObject::destroyed, this, nullptr);
    m_actions.removeAll(action);
}

KrAction* KrActionMgr::findAction(const QString& className) const
{
    const QByteArray name = className.toLatin1();
    for (KrAction* a : m_actions) {
        if (name == a->metaObject()->className())
            return a;
    }
    return nullptr;
}

int KrActionMgr::getNumActions() const
{
    return m_actions.size();
}

KrAction* KrActionMgr::getAction(int i) const
{
    return m_actions.value(i);
}
