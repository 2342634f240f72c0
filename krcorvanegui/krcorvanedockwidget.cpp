#include "krcorvanedockwidget.h"

#include "ui_krcorvanebrickuserwindow.h"

#include "kraction.h"
#include "krapp.h"
#include "krbrickgraphicsitem.h"
#include "krbrickparam.h"
#include "krbrickset.h"
#include "krbrickuser.h"
#include "krbrickuserfiles.h"
#include "krbrickuserscene.h"
#include "krcorvanepane.h"
#include "krdefaultbrickuser.h"
#include "krmainwindow.h"
#include "krprefdialogs.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "krstyle.h"
#include "krundo.h"

#include <QApplication>
#include <QClipboard>
#include <QCloseEvent>
#include <QGraphicsView>
#include <QHash>
#include <QMenu>
#include <QMessageBox>
#include <QMimeData>
#include <QPointer>
#include <QToolBar>

namespace {

// Undoes a paste by taking the pasted bricks out again; a redo pastes the same record once more.
// Inert once the window's scene is gone.
class KrPasteUndoItem : public KrUndoItem
{
public:
    KrPasteUndoItem(KrBrickUserScene* scene, IKrBrickUser* user, const KrSettings& record,
                    const QList<uint>& ids)
        : m_scene(scene), m_user(user), m_record(record), m_ids(ids)
    {
    }

    void undo() override
    {
        if (!m_scene)
            return;
        for (uint id : m_ids) {
            if (KrBrickGraphicsItem* item = m_scene->findBrick(id))
                m_scene->removeBrickItem(item);
        }
    }

    void redo() override
    {
        if (!m_scene)
            return;
        m_ids = KrCorvaneDockWidget::pasteRecord(m_user, m_record);
        m_scene->updateBricks();
    }

    int size() const override { return int(sizeof(*this)) + m_ids.size() * int(sizeof(uint)); }

private:
    QPointer<KrBrickUserScene> m_scene;
    IKrBrickUser* m_user;
    KrSettings m_record;
    QList<uint> m_ids;
};

} // namespace

struct KrCorvaneDockWidget::Private
{
    Ui::KrCorvaneBrickUserWindow ui;
    IKrBrickUser* brickUser = nullptr;
    KrCorvanePaneMainWgt* mainParent = nullptr;
    KrBrickUserScene* scene = nullptr;
    QToolBar* toolBar = nullptr;
    QAction* saveAction = nullptr;
    QAction* copyAction = nullptr;
    QAction* pasteAction = nullptr;
    QAction* cutAction = nullptr;
    QAction* preferencesAction = nullptr;
    QAction* importAction = nullptr;
};

KrCorvaneDockWidget::KrCorvaneDockWidget(IKrBrickUser* user, KrCorvanePaneMainWgt* mainParent,
                                         bool rightToLeft)
    : QDockWidget(mainParent, Qt::WindowFlags()), d(new Private)
{
    d->ui.setupUi(this);
    d->ui.graphicsView->setFocusPolicy(Qt::StrongFocus);

    d->brickUser = user;
    user->prepareBricks();
    setWindowTitle(user->getTypeLabel());
    d->mainParent = mainParent;

    d->scene = new KrBrickUserScene(user, d->ui.graphicsView, this);
    if (user->getObject() && user->getObject()->inherits("KrNode"))
        d->ui.applyButton->setText(QStringLiteral("Create"));
    connect(d->ui.applyButton, &QPushButton::clicked, this, &KrCorvaneDockWidget::apply);

    d->ui.graphicsView->setScene(d->scene);
    d->scene->setIsRightToLeft(rightToLeft);
    buildToolBar();

    // Bricks laid out in the other direction are mirrored into the window's direction below.
    bool storedRightToLeft = d->scene->isRightToLeft();
    const QMap<uint, KrShaderBrick*> bricks = user->getBricks();
    bool first = true;
    for (KrShaderBrick* brick : bricks) {
        if (!brick)
            continue;
        if (first) {
            storedRightToLeft = brick->getBrickSettings()->getBoolValue(
                QStringLiteral("BrickIsRightToLeft"), storedRightToLeft);
            first = false;
        }
        d->scene->addItemForBrick(brick);
    }

    connect(d->ui.zoomSpin, QOverload<double>::of(&QDoubleSpinBox::valueChanged), this,
            &KrCorvaneDockWidget::updateZoom);

    if (user->getNumBrickSets() > 0) {
        KrBrickSet* set = user->getBrickSet(0);
        KrShaderBrick* root = set ? set->getRoot() : nullptr;
        if (root) {
            KrSettings* settings = root->getBrickSettings();
            // A request to arrange is carried out once.
            if (settings->getBoolValue(QStringLiteral("AutoArrange"), false)) {
                d->scene->arrange();
                settings->removeValue(QStringLiteral("AutoArrange"));
            }
        }
        if (d->scene->isRightToLeft() != storedRightToLeft)
            d->scene->flipBricksAboutCenter();
    }
}

KrCorvaneDockWidget::~KrCorvaneDockWidget()
{
    // The view goes with the form's widgets; detach it first so it never paints a dead scene.
    d->ui.graphicsView->setScene(nullptr);
    delete d->scene;
    d->scene = nullptr;
}

void KrCorvaneDockWidget::buildToolBar()
{
    d->toolBar = new QToolBar(d->ui.topFunctions);
    d->toolBar->setObjectName(QStringLiteral("BrickUserToolBar"));
    d->ui.topFunctions->layout()->addWidget(d->toolBar);

    d->saveAction = d->toolBar->addAction(QStringLiteral("Save"));
    d->toolBar->addSeparator();
    d->copyAction = d->toolBar->addAction(QStringLiteral("Copy"));
    d->cutAction = d->toolBar->addAction(QStringLiteral("Cut"));
    d->pasteAction = d->toolBar->addAction(QStringLiteral("Paste"));
    d->toolBar->addSeparator();
    d->importAction = d->toolBar->addAction(QStringLiteral("Import"));
    d->toolBar->addSeparator();
    d->preferencesAction = d->toolBar->addAction(QStringLiteral("Preferences"));

    connect(d->saveAction, &QAction::triggered, this, &KrCorvaneDockWidget::save);
    connect(d->copyAction, &QAction::triggered, this, &KrCorvaneDockWidget::copy);
    connect(d->cutAction, &QAction::triggered, this, &KrCorvaneDockWidget::cut);
    connect(d->pasteAction, &QAction::triggered, this, &KrCorvaneDockWidget::paste);
    connect(d->preferencesAction, &QAction::triggered, this, &KrCorvaneDockWidget::preferences);
    connect(d->importAction, &QAction::triggered, this, &KrCorvaneDockWidget::import);

    struct Entry
    {
        QAction* action;
        const char* hostClass;
        const char* objectName;
        QKeySequence::StandardKey key;
    };
    const Entry entries[] = {
        {d->saveAction, "KrSaveAction", "saveAction", QKeySequence::Save},
        {d->copyAction, "KrCopyAction", "copyAction", QKeySequence::Copy},
        {d->cutAction, "KrSICutAction", "cutAction", QKeySequence::Cut},
        {d->pasteAction, "KrPasteAction", "pasteAction", QKeySequence::Paste},
        {d->preferencesAction, "KrCustomizeAction", "preferencesAction", QKeySequence::UnknownKey},
        {d->importAction, "KrImportAction", "importAction", QKeySequence::UnknownKey},
    };

    KrApp* app = KrApp::existingInstance();
    KrStyle* style = app ? app->getStyle() : nullptr;
    KrMainWindow* mainWindow = app ? app->getInterface() : nullptr;
    KrActionMgr* actionMgr = mainWindow ? mainWindow->getActionMgr() : nullptr;
    for (const Entry& entry : entries) {
        const QString hostClass = QString::fromLatin1(entry.hostClass);
        entry.action->setObjectName(QString::fromLatin1(entry.objectName));
        if (style)
            entry.action->setIcon(style->getActionIcon(hostClass));
        // The host's routed command of the same purpose finds this action by class name.
        entry.action->setProperty("krHostAction", hostClass);
        addAction(entry.action);

        QList<QKeySequence> keys;
        if (KrAction* hostAction = actionMgr ? actionMgr->findAction(hostClass) : nullptr)
            keys = hostAction->shortcuts();
        if (keys.isEmpty() && entry.key != QKeySequence::UnknownKey)
            keys = QKeySequence::keyBindings(entry.key);
        entry.action->setShortcuts(keys);
        // Two windows each hold these keys; only the one with the focus reacts.
        entry.action->setShortcutContext(Qt::WidgetWithChildrenShortcut);
    }
    d->importAction->setVisible(false);
}

IKrBrickUser* KrCorvaneDockWidget::getBrickUser() const
{
    return d->brickUser;
}

QGraphicsView* KrCorvaneDockWidget::getView() const
{
    return d->ui.graphicsView;
}

bool KrCorvaneDockWidget::isRightToLeft()
{
    return d->scene->isRightToLeft();
}

void KrCorvaneDockWidget::setIsRightToLeft(bool onOff, bool doFlip)
{
    if (onOff != d->scene->isRightToLeft() && doFlip)
        d->scene->flipBricksAboutCenter();
    d->scene->setIsRightToLeft(onOff);
}

void KrCorvaneDockWidget::addBrickInCenter(KrShaderBrick* brick)
{
    const QRect r = d->ui.graphicsView->rect();
    const QPoint center((r.left() + r.right()) / 2, (r.top() + r.bottom()) / 2);
    const QPointF scenePos = d->ui.graphicsView->mapToScene(center);
    const float x = qMax(10.0f, float(scenePos.x()) - 100.0f);
    const float y = qMax(10.0f, float(scenePos.y()) - 100.0f);
    QPointF pos(x, y);
    d->scene->addBrickAt(brick, pos);
}

KrCorvanePaneMainWgt* KrCorvaneDockWidget::getMainParent()
{
    return d->mainParent;
}

void KrCorvaneDockWidget::addEditItemsToMenu(QMenu* menu)
{
    if (!menu)
        return;
    menu->addAction(d->copyAction);
    menu->addAction(d->cutAction);
    menu->addAction(d->pasteAction);
}

KrBrickUserScene* KrCorvaneDockWidget::getBrickScene()
{
    return d->scene;
}

void KrCorvaneDockWidget::save()
{
    KrBrickUserFiles::saveWithDialog(d->brickUser);
}

void KrCorvaneDockWidget::apply()
{
    if (d->brickUser->apply())
        return;
    QMessageBox::warning(KrBrickUserFiles::dialogParent(), QStringLiteral("Apply"),
                         QStringLiteral("%1 could not be applied: there is no scene to take it.")
                             .arg(d->brickUser->getName()),
                         QMessageBox::Ok);
}

void KrCorvaneDockWidget::import()
{
    // Importing is not offered; the action stays hidden.
}

void KrCorvaneDockWidget::copy()
{
    copyOrCut(false);
}

void KrCorvaneDockWidget::cut()
{
    copyOrCut(true);
}

QList<KrBrickGraphicsItem*> KrCorvaneDockWidget::selectedBrickItems() const
{
    QList<KrBrickGraphicsItem*> items;
    const QList<QGraphicsItem*> selected = d->scene->selectedItems();
    for (QGraphicsItem* item : selected) {
        // Wires, plugs and the scene's own focus holder are no bricks.
        if (item && item->type() == QGraphicsProxyWidget::Type) {
            if (auto* brickItem = dynamic_cast<KrBrickGraphicsItem*>(item))
                items.append(brickItem);
        }
    }
    return items;
}

void KrCorvaneDockWidget::copyOrCut(bool delBricks)
{
    QList<KrBrickGraphicsItem*> items = selectedBrickItems();
    QList<uint> ids;
    for (KrBrickGraphicsItem* item : items)
        ids.append(item->getBrick()->getBrickID());

    KrSettings record;
    // An empty id list means every brick to the helper; an empty selection copies none.
    if (!ids.isEmpty())
        KrDefaultBrickUser::getAttributesHelper(d->brickUser, ids, &record, true);
    QClipboard* clipboard = QApplication::clipboard();
    clipboard->clear(QClipboard::Clipboard);
    clipboard->setText(record.toString(), QClipboard::Clipboard);

    if (!delBricks)
        return;
    KrUndoStackHold hold;
    for (KrBrickGraphicsItem* item : items)
        item->clearConections();
    while (!items.isEmpty())
        d->scene->removeBrickItem(items.takeLast());
    hold.accept(QStringLiteral("Cut Bricks"));
}

QList<uint> KrCorvaneDockWidget::pasteRecord(IKrBrickUser* user, const KrSettings& record)
{
    QHash<QString, KrShaderBrick*> created;
    KrDefaultBrickUser::setAttributesHelper(user, &record, created, true);
    QList<uint> ids;
    for (KrShaderBrick* brick : created) {
        if (!brick)
            continue;
        QListIterator<KrBrickParam*> it = brick->getParameterIterator();
        while (it.hasNext()) {
            if (KrBrickParam* param = it.next()) {
                param->clearTokens();
                param->getToken(0);
            }
        }
        ids.append(brick->getBrickID());
    }
    return ids;
}

void KrCorvaneDockWidget::paste()
{
    const QMimeData* mime = QApplication::clipboard()->mimeData(QClipboard::Clipboard);
    if (!mime || !mime->hasText())
        return;
    // Text of other programs is not a settings record and is ignored.
    KrSettings record;
    if (!record.fromString(mime->text()))
        return;

    KrUndoStackHold hold;
    const QList<uint> ids = pasteRecord(d->brickUser, record);
    d->scene->updateBricks();
    if (ids.isEmpty())
        return;
    if (krUndoStack) {
        krUndoStack->push(new KrPasteUndoItem(d->scene, d->brickUser, record, ids));
        hold.accept(QStringLiteral("Paste Bricks"));
    }
}

void KrCorvaneDockWidget::preferences()
{
    KrBrickPrefDialog dialog(QStringLiteral("Preferences..."), this,
                             KrBrickUserFiles::dialogParent());
    if (dialog.exec() != QDialog::Accepted)
        return;
    d->brickUser->setName(dialog.getNameText());
    const bool state = dialog.isRightToLeft();
    if (state != d->scene->isRightToLeft())
        d->scene->flipBricksAboutCenter();
    d->scene->setIsRightToLeft(state);
    emit nameChanged(d->brickUser->getName());
}

void KrCorvaneDockWidget::updateZoom()
{
    const double scale = d->ui.zoomSpin->value() / 100.0;
    d->ui.graphicsView->resetTransform();
    d->ui.graphicsView->scale(scale, scale);
}

void KrCorvaneDockWidget::closeEvent(QCloseEvent* event)
{
    const QMessageBox::StandardButton answer = QMessageBox::warning(
        KrBrickUserFiles::dialogParent(), QStringLiteral("Close..."),
        QStringLiteral("Are you sure you want to close %1?").arg(d->brickUser->getName()),
        QMessageBox::Yes | QMessageBox::No);
    if (answer != QMessageBox::Yes) {
        event->ignore();
        return;
    }
    if (d->mainParent)
        d->mainParent->windowClosed(this);
    deleteLater();
}
