#include "krmainwindow.h"
#include "kraction.h"
#include "krapp.h"
#include "krappsettings.h"
#include "krfileio.h"
#include "krpane.h"
#include "krplugin.h"
#include "krundo.h"

#include <QAction>
#include <QApplication>
#include <QCloseEvent>
#include <QDockWidget>
#include <QFileDialog>
#include <QFileInfo>
#include <QHash>
#include <QMenu>
#include <QMenuBar>
#include <QMessageBox>
#include <QPointer>

namespace {

// Bumped when the dock layout changes incompatibly; an older saved state is then ignored.
const int kLayoutVersion = 1;

QString menuKey(const QString& path)
{
    QStringList parts = path.split(QLatin1Char('/'), Qt::SkipEmptyParts);
    for (QString& p : parts)
        p = p.trimmed().remove(QLatin1Char('&'));
    parts.removeAll(QString());
    return parts.join(QLatin1Char('/'));
}

QString menuTitle(const QString& name)
{
    static const char* const mnemonics[] = {"File", "Edit", "Window", "Help", "Tools", "View"};
    for (const char* m : mnemonics) {
        if (name == QLatin1String(m))
            return QLatin1Char('&') + name;
    }
    return name;
}

} // namespace

struct KrMainWindow::Private
{
    KrPaneMgr* paneMgr = nullptr;
    KrActionMgr* actionMgr = nullptr;
    QHash<QString, QMenu*> menus; // by menu key
    // Actions placed in a menu go before its anchor (so Quit stays last in File).
    QHash<QMenu*, QAction*> anchors;
    QHash<QString, QMenu*> paneMenus; // options menus by pane class name
    QAction* paneOptionsSeparator = nullptr;
    QAction* undoAction = nullptr;
    QAction* redoAction = nullptr;
    QAction* quitAction = nullptr;
    QMenu* helpMenu = nullptr;
    bool layoutRestored = false;
};

KrMainWindow::KrMainWindow(QWidget* parent) : QMainWindow(parent), d(new Private)
{
    setObjectName(QStringLiteral("KrMainWindow"));
    // Scripts reach the managers, panes and actions through these slots' results.
    qRegisterMetaType<KrPaneMgr*>();
    qRegisterMetaType<KrActionMgr*>();
    qRegisterMetaType<KrPane*>();
    qRegisterMetaType<KrAction*>();
    setDockOptions(AnimatedDocks | AllowNestedDocks | AllowTabbedDocks);
    d->paneMgr = new KrPaneMgr(this);
    d->actionMgr = new KrActionMgr(this);
    if (!krApp->getInterface())
        krApp->setInterface(this);

    QMenu* file = getMenu(QStringLiteral("File"));
    QMenu* edit = getMenu(QStringLiteral("Edit"));
    QMenu* window = getMenu(QStringLiteral("Window"));
    d->helpMenu = getMenu(QStringLiteral("Help"));

    d->quitAction = new QAction(tr("&Quit"), this);
    d->quitAction->setObjectName(QStringLiteral("QuitAction"));
    QList<QKeySequence> quitKeys = QKeySequence::keyBindings(QKeySequence::Quit);
    const QKeySequence ctrlQ(Qt::CTRL | Qt::Key_Q);
    if (!quitKeys.contains(ctrlQ))
        quitKeys.append(ctrlQ);
    d->quitAction->setShortcuts(quitKeys);
    d->quitAction->setMenuRole(QAction::QuitRole);
    connect(d->quitAction, &QAction::triggered, this, [this]() {
        if (close())
            QCoreApplication::quit();
    });
    d->anchors.insert(file, file->addSeparator());
    file->addAction(d->quitAction);

    KrUndoStack* stack = krApp->getUndoStack();
    d->undoAction = stack->createUndoAction(this);
    d->undoAction->setObjectName(QStringLiteral("UndoAction"));
    d->redoAction = stack->createRedoAction(this);
    d->redoAction->setObjectName(QStringLiteral("RedoAction"));
    edit->addAction(d->undoAction);
    edit->addAction(d->redoAction);

    d->paneOptionsSeparator = window->addSeparator();
    d->paneOptionsSeparator->setVisible(false);
    d->anchors.insert(window, d->paneOptionsSeparator);

    QAction* about = d->helpMenu->addAction(tr("&About krhost..."));
    about->setMenuRole(QAction::AboutRole);
    connect(about, &QAction::triggered, this, &KrMainWindow::showAbout);

    // The host's own commands; plug-in windows borrow their shortcuts and icons by class name.
    KrAction* hostActions[] = {new KrSaveAction(this),  new KrImportAction(this),
                               new KrCopyAction(this),  new KrSICutAction(this),
                               new KrPasteAction(this), new KrCustomizeAction(this)};
    for (KrAction* a : hostActions)
        addKrAction(a);

    // Commands that act on the focused window are only offered when there is one to act on.
    for (QMenu* m : {file, edit}) {
        connect(m, &QMenu::aboutToShow, this, [m]() {
            const QList<QAction*> actions = m->actions();
            for (QAction* a : actions) {
                if (auto* routed = qobject_cast<KrRoutedAction*>(a))
                    routed->setEnabled(routed->hasTarget());
            }
        });
    }
}

KrMainWindow::~KrMainWindow()
{
    KrApp* app = KrApp::existingInstance();
    if (app && app->getInterface() == this)
        app->setInterface(nullptr);
}

KrPaneMgr* KrMainWindow::getPaneMgr() const
{
    return d->paneMgr;
}

KrActionMgr* KrMainWindow::getActionMgr() const
{
    return d->actionMgr;
}

QAction* KrMainWindow::getUndoAction() const
{
    return d->undoAction;
}

QAction* KrMainWindow::getRedoAction() const
{
    return d->redoAction;
}

QAction* KrMainWindow::getQuitAction() const
{
    return d->quitAction;
}

QMenu* KrMainWindow::findMenu(const QString& path) const
{
    if (path.startsWith(QLatin1String("::")))
        return d->paneMenus.value(path.mid(2).trimmed());
    return d->menus.value(menuKey(path));
}

QMenu* KrMainWindow::getMenu(const QString& path)
{
    if (path.startsWith(QLatin1String("::")))
        return getPaneOptionsMenu(path.mid(2).trimmed());
    const QString key = menuKey(path);
    if (key.isEmpty())
        return nullptr;
    if (QMenu* existing = d->menus.value(key))
        return existing;

    const int slash = key.lastIndexOf(QLatin1Char('/'));
    const QString name = key.mid(slash + 1);
    QMenu* menu = nullptr;
    if (slash < 0) {
        menu = new QMenu(menuTitle(name), menuBar());
        // Help stays the last menu of the bar.
        if (d->helpMenu)
            menuBar()->insertMenu(d->helpMenu->menuAction(), menu);
        else
            menuBar()->addMenu(menu);
    } else {
        QMenu* parentMenu = getMenu(key.left(slash));
        menu = new QMenu(name, parentMenu);
        parentMenu->insertMenu(d->anchors.value(parentMenu), menu);
    }
    menu->setObjectName(key);
    d->menus.insert(key, menu);
    return menu;
}

QMenu* KrMainWindow::getPaneOptionsMenu(const QString& paneClassName)
{
    if (paneClassName.isEmpty())
        return nullptr;
    if (QMenu* existing = d->paneMenus.value(paneClassName))
        return existing;
    KrPane* pane = d->paneMgr->findPane(paneClassName);
    const QString title = tr("%1 Options").arg(pane ? pane->getName() : paneClassName);
    QMenu* window = getMenu(QStringLiteral("Window"));
    auto* menu = new QMenu(title, window);
    menu->setObjectName(QStringLiteral("::") + paneClassName);
    window->addMenu(menu);
    d->paneOptionsSeparator->setVisible(true);
    d->paneMenus.insert(paneClassName, menu);
    return menu;
}

void KrMainWindow::placeAction(QMenu* menu, KrAction* action)
{
    QAction* before = d->anchors.value(menu);
    const QList<QAction*> actions = menu->actions();
    const int pos = before ? actions.indexOf(before) : actions.size();
    QAction* previous = pos > 0 ? actions.at(pos - 1) : nullptr;
    if (previous && !previous->isSeparator()) {
        auto* previousKr = qobject_cast<KrAction*>(previous);
        if (!previousKr || previousKr->getActionGroup() != action->getActionGroup())
            menu->insertSeparator(before);
    }
    menu->insertAction(before, action);
}

void KrMainWindow::addKrAction(KrAction* action)
{
    if (!action || d->actionMgr->contains(action))
        return;
    if (!action->parent())
        action->setParent(this);
    d->actionMgr->addAction(action);
    // In the window too, so its shortcut works wherever the menu is.
    QWidget::addAction(action);
    if (QMenu* menu = getMenu(action->getDefaultMenuPath()))
        placeAction(menu, action);

    if (auto* paneAction = qobject_cast<KrPaneAction*>(action)) {
        if (KrPane* pane = d->paneMgr->findPane(paneAction->getPaneClassName()))
            paneAction->attachToDock(d->paneMgr->getDock(pane));
    }
}

QDockWidget* KrMainWindow::addPane(KrPane* pane, Qt::DockWidgetArea area)
{
    if (!pane)
        return nullptr;
    if (QDockWidget* existing = d->paneMgr->getDock(pane))
        return existing;

    const QString className = QString::fromLatin1(pane->metaObject()->className());
    QString dockName = className;
    for (int n = 2; findChild<QDockWidget*>(dockName, Qt::FindDirectChildrenOnly); ++n)
        dockName = QStringLiteral("%1_%2").arg(className).arg(n);

    auto* dock = new QDockWidget(pane->getName(), this);
    dock->setObjectName(dockName);
    dock->setWidget(pane);
    dock->setContextMenuPolicy(Qt::CustomContextMenu);
    connect(dock, &QWidget::customContextMenuRequested, this,
            [this, dock](const QPoint& pos) { showPaneMenu(dock, pos); });
    addDockWidget(area, dock);
    d->paneMgr->addPane(pane, dock);
    if (d->layoutRestored)
        restoreDockWidget(dock);

    if (QMenu* options = d->paneMenus.value(className))
        options->setTitle(tr("%1 Options").arg(pane->getName()));
    for (int i = 0; i < d->actionMgr->getNumActions(); ++i) {
        auto* paneAction = qobject_cast<KrPaneAction*>(d->actionMgr->getAction(i));
        if (paneAction && paneAction->getPaneClassName() == className)
            paneAction->attachToDock(dock);
    }
    return dock;
}

bool KrMainWindow::installPane(QObject* object)
{
    auto* pane = qobject_cast<KrPane*>(object);
    return pane && addPane(pane);
}

bool KrMainWindow::installAction(QObject* object)
{
    auto* action = qobject_cast<KrAction*>(object);
    if (!action)
        return false;
    addKrAction(action);
    return true;
}

void KrMainWindow::showPaneMenu(QDockWidget* dock, const QPoint& pos)
{
    auto* pane = qobject_cast<KrPane*>(dock->widget());
    QMenu* options =
        pane ? d->paneMenus.value(QString::fromLatin1(pane->metaObject()->className())) : nullptr;
    if (options && !options->isEmpty()) {
        options->popup(dock->mapToGlobal(pos));
        return;
    }
    // A pane without options gets the usual list of panes and toolbars.
    QMenu* panes = createPopupMenu();
    if (!panes)
        return;
    panes->setAttribute(Qt::WA_DeleteOnClose);
    panes->popup(dock->mapToGlobal(pos));
}

bool KrMainWindow::doFileDialog(bool open, const QString& title, const QString& startFolder,
                                const KrFileFilter& filter, QString& fileName, int* selectedFilter,
                                QWidget* parent)
{
    QFileDialog dialog(parent ? parent : this, title, startFolder, filter.toString());
    dialog.setOption(QFileDialog::DontUseNativeDialog);
    dialog.setAcceptMode(open ? QFileDialog::AcceptOpen : QFileDialog::AcceptSave);
    dialog.setFileMode(open ? QFileDialog::ExistingFile : QFileDialog::AnyFile);
    if (!open) {
        // Callers that save ask themselves before replacing a file.
        dialog.setOption(QFileDialog::DontConfirmOverwrite);
    }

    const QStringList names = dialog.nameFilters();
    auto suffixFor = [&filter](int index) {
        for (int i = 0; i < filter.getNumExtensions(index); ++i) {
            const QString ext = filter.getExtension(index, i);
            if (!ext.contains(QLatin1Char('*')) && !ext.contains(QLatin1Char('?')))
                return ext;
        }
        return QString();
    };
    int current = 0;
    if (selectedFilter && *selectedFilter >= 0 && *selectedFilter < filter.getNumFilters())
        current = *selectedFilter;
    if (!filter.isEmpty()) {
        dialog.selectNameFilter(names.value(current));
        if (!open)
            dialog.setDefaultSuffix(suffixFor(current));
    }
    connect(&dialog, &QFileDialog::filterSelected, &dialog,
            [&dialog, names, suffixFor, open](const QString& chosen) {
                if (!open)
                    dialog.setDefaultSuffix(suffixFor(names.indexOf(chosen)));
            });
    if (!fileName.isEmpty())
        dialog.selectFile(fileName);

    if (dialog.exec() != QDialog::Accepted)
        return false;
    const QStringList chosen = dialog.selectedFiles();
    if (chosen.isEmpty() || chosen.first().isEmpty())
        return false;
    fileName = chosen.first();
    if (selectedFilter)
        *selectedFilter = qMax(0, names.indexOf(dialog.selectedNameFilter()));
    return true;
}

bool KrMainWindow::restoreLayout()
{
    KrAppSettings settings;
    settings.pushPath(QStringLiteral("MainWindow"));
    const QByteArray geometry = settings.getBinaryValue(QStringLiteral("Geometry"));
    const QByteArray state = settings.getBinaryValue(QStringLiteral("State"));
    if (!geometry.isEmpty())
        restoreGeometry(geometry);
    const bool restored = !state.isEmpty() && restoreState(state, kLayoutVersion);
    d->layoutRestored = restored;

    for (int i = 0; i < d->paneMgr->getNumPanes(); ++i) {
        KrPane* pane = d->paneMgr->getPane(i);
        QDockWidget* dock = d->paneMgr->getDock(pane);
        const QString key = QStringLiteral("Panes/%1/").arg(dock->objectName());
        if (!settings.contains(key + QStringLiteral("Visible")))
            continue;
        KrPaneSettings paneSettings;
        paneSettings.name = settings.getStringValue(key + QStringLiteral("Name"), pane->getName());
        paneSettings.visible = settings.getBoolValue(key + QStringLiteral("Visible"), true);
        paneSettings.area = Qt::DockWidgetArea(
            settings.getIntValue(key + QStringLiteral("Area"), Qt::RightDockWidgetArea));
        pane->restoreSettings(paneSettings);
    }
    return restored;
}

void KrMainWindow::saveLayout()
{
    KrAppSettings settings;
    settings.pushPath(QStringLiteral("MainWindow"));
    settings.setBinaryValue(QStringLiteral("Geometry"), saveGeometry());
    settings.setBinaryValue(QStringLiteral("State"), saveState(kLayoutVersion));
    for (int i = 0; i < d->paneMgr->getNumPanes(); ++i) {
        KrPane* pane = d->paneMgr->getPane(i);
        QDockWidget* dock = d->paneMgr->getDock(pane);
        KrPaneSettings paneSettings;
        paneSettings.name = pane->getName();
        paneSettings.visible = !dock->isHidden();
        paneSettings.area = dockWidgetArea(dock);
        pane->saveSettings(paneSettings);
        const QString key = QStringLiteral("Panes/%1/").arg(dock->objectName());
        settings.setStringValue(key + QStringLiteral("Name"), paneSettings.name);
        settings.setBoolValue(key + QStringLiteral("Visible"), paneSettings.visible);
        settings.setIntValue(key + QStringLiteral("Area"), int(paneSettings.area));
    }
    settings.sync();
}

void KrMainWindow::closeEvent(QCloseEvent* event)
{
    krApp->setClosing(true);
    saveLayout();
    QMainWindow::closeEvent(event);
}

void KrMainWindow::showAbout()
{
    QString text = tr("<h3>krhost</h3><p>A host for shader-network editing plug-ins.</p>");
    const QList<KrPlugin*> plugins = krApp->getPlugins();
    if (plugins.isEmpty()) {
        text += tr("<p>No plug-ins are loaded.</p>");
    } else {
        text += tr("<p>Plug-ins:</p><ul>");
        for (KrPlugin* p : plugins) {
            const unsigned long v = p->getVersion();
            text += QStringLiteral("<li><b>%1</b> %2.%3.%4.%5<br>%6</li>")
                        .arg(p->getName().toHtmlEscaped())
                        .arg((v >> 24) & 0xff)
                        .arg((v >> 16) & 0xff)
                        .arg((v >> 8) & 0xff)
                        .arg(v & 0xff)
                        .arg(p->getDescription().toHtmlEscaped());
        }
        text += QStringLiteral("</ul>");
    }
    QMessageBox::about(this, tr("About krhost"), text);
}
