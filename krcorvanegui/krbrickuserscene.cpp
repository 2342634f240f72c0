#include "krbrickuserscene.h"

#include "krapp.h"
#include "krbrickfactory.h"
#include "krbrickfactorymenu.h"
#include "krbrickframe.h"
#include "krbrickgraphicsitem.h"
#include "krbrickgroup.h"
#include "krbrickparam.h"
#include "krbrickparammime.h"
#include "krbrickset.h"
#include "krbrickuser.h"
#include "krclassfactory.h"
#include "krconnectoritem.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krdefaultbrickuser.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "krstyle.h"

#include <QCoreApplication>
#include <QDataStream>
#include <QGraphicsProxyWidget>
#include <QGraphicsSceneContextMenuEvent>
#include <QGraphicsSceneDragDropEvent>
#include <QGraphicsSceneMouseEvent>
#include <QGraphicsView>
#include <QKeyEvent>
#include <QLabel>
#include <QMenu>
#include <QMimeData>
#include <QPointer>
#include <QSet>
#include <QStandardItemModel>
#include <QTimer>

#include <algorithm>
#include <cmath>

namespace {
const QString kPosX = QStringLiteral("PosX");
const QString kPosY = QStringLiteral("PosY");
const QString kWidth = QStringLiteral("Width");
const QString kHeight = QStringLiteral("Height");
const qreal kMinPos = 10;
// Bricks added one after another (opening a network, undoing a large delete) have their
// posted work carried out in batches: a queue of thousands of posted events slows every post.
const int kFlushBatch = 64;
// Space between bricks stacked by an arrangement.
const int kArrangeGap = 20;

KrUndoStack* sceneUndoStack()
{
    if (KrApp* app = KrApp::existingInstance())
        return app->getUndoStack();
    return krUndoStack;
}

bool canRecord()
{
    KrUndoStack* stack = sceneUndoStack();
    return stack && stack->canPushItems();
}

// Deletes what it holds when it is deleted itself.
class KrItemReaper : public QObject
{
public:
    explicit KrItemReaper(QList<QPointer<QObject>> items) : m_items(std::move(items)) {}
    ~KrItemReaper() override
    {
        for (const QPointer<QObject>& item : qAsConst(m_items))
            delete item.data();
    }

private:
    QList<QPointer<QObject>> m_items;
};

void pushStep(KrUndoItem* item, const QString& text)
{
    KrUndoStackHold hold;
    sceneUndoStack()->push(item);
    hold.accept(text);
}

KrBrickGraphicsItem* brickItemOf(QGraphicsItem* item)
{
    if (!item || item->type() != QGraphicsProxyWidget::Type)
        return nullptr;
    return qobject_cast<KrBrickGraphicsItem*>(static_cast<QGraphicsProxyWidget*>(item));
}

// A library entry travels through the item-view drag data by class name and saved record.
void saveFactory(QDataStream& stream, const void* data)
{
    const auto* factory = static_cast<const KrBrickFactory*>(data);
    const KrClassFactory* classFactory = factory->getFactory();
    stream << (classFactory ? classFactory->className() : QString())
           << factory->getSettings()->toString();
}

void loadFactory(QDataStream& stream, void* data)
{
    auto* factory = static_cast<KrBrickFactory*>(data);
    QString className;
    QString record;
    stream >> className >> record;
    *factory = KrBrickFactory();
    if (!className.isEmpty())
        factory->setClassFactory(krApp->findClassFactory(className));
    if (!record.isEmpty())
        factory->getSettings()->fromString(record);
}

void registerFactoryType()
{
    static bool done = false;
    if (done)
        return;
    done = true;
    const int id = qRegisterMetaType<KrBrickFactory>("KrBrickFactory");
    // Without stream operators the library's drag data cannot carry a factory.
    QByteArray probe;
    QDataStream stream(&probe, QIODevice::WriteOnly);
    const KrBrickFactory empty;
    if (!QMetaType::save(stream, id, &empty))
        QMetaType::registerStreamOperators(id, saveFactory, loadFactory);
}

struct Ends
{
    KrBrickParam* input = nullptr;
    KrBrickParam* output = nullptr;
    uint inputBrick = 0;
    uint outputBrick = 0;
    int inputIndex = -1;
    int outputIndex = -1;
    bool valid = false;
};

// A wire as the undo items name it: the input and the output that feeds it.
Ends endsOf(KrBrickParam* a, KrBrickParam* b)
{
    Ends ends;
    if (!a || !b)
        return ends;
    ends.input = a->isInput() ? a : b;
    ends.output = a->isInput() ? b : a;
    KrShaderBrick* inBrick = ends.input->getBrick();
    KrShaderBrick* outBrick = ends.output->getBrick();
    if (!inBrick || !outBrick)
        return ends;
    ends.inputBrick = inBrick->getBrickID();
    ends.outputBrick = outBrick->getBrickID();
    ends.inputIndex = inBrick->findParameterIndex(ends.input);
    ends.outputIndex = outBrick->findParameterIndex(ends.output);
    ends.valid = ends.inputIndex >= 0 && ends.outputIndex >= 0;
    return ends;
}
} // namespace

// --------------------------------------------------------------------------- KrItemModelReader

KrItemModelReader::KrItemModelReader(QObject* parent) : QAbstractItemModel(parent) {}

KrItemModelReader::~KrItemModelReader() = default;

QModelIndex KrItemModelReader::index(int row, int column, const QModelIndex& parent) const
{
    if (parent.isValid() || row < 0 || column < 0 || row >= m_rows.size() ||
        column >= m_rows.at(row).size())
        return QModelIndex();
    return createIndex(row, column);
}

QModelIndex KrItemModelReader::parent(const QModelIndex&) const
{
    return QModelIndex();
}

int KrItemModelReader::rowCount(const QModelIndex& parent) const
{
    return parent.isValid() ? 0 : m_rows.size();
}

int KrItemModelReader::columnCount(const QModelIndex& parent) const
{
    if (parent.isValid())
        return 0;
    return m_rows.isEmpty() ? m_columns : m_rows.first().size();
}

QVariant KrItemModelReader::data(const QModelIndex& index, int role) const
{
    if (!index.isValid() || index.row() >= m_rows.size() ||
        index.column() >= m_rows.at(index.row()).size())
        return QVariant();
    return m_rows.at(index.row()).at(index.column()).value(role);
}

bool KrItemModelReader::setData(const QModelIndex& index, const QVariant& value, int role)
{
    if (!index.isValid() || index.row() >= m_rows.size() ||
        index.column() >= m_rows.at(index.row()).size())
        return false;
    m_rows[index.row()][index.column()].insert(role, value);
    emit dataChanged(index, index);
    return true;
}

bool KrItemModelReader::insertRows(int row, int count, const QModelIndex& parent)
{
    if (parent.isValid() || count < 1 || row < 0 || row > m_rows.size())
        return false;
    beginInsertRows(parent, row, row + count - 1);
    const int columns = columnCount();
    for (int i = 0; i < count; ++i)
        m_rows.insert(row, QVector<QMap<int, QVariant>>(columns));
    endInsertRows();
    return true;
}

bool KrItemModelReader::insertColumns(int column, int count, const QModelIndex& parent)
{
    if (parent.isValid() || count < 1 || column < 0 || column > columnCount())
        return false;
    beginInsertColumns(parent, column, column + count - 1);
    for (auto& row : m_rows)
        row.insert(column, count, QMap<int, QVariant>());
    m_columns += count;
    endInsertColumns();
    return true;
}

QString KrItemModelReader::itemViewFormat()
{
    static const QString format = QStandardItemModel().mimeTypes().value(0);
    return format;
}

bool KrItemModelReader::read(const QMimeData* data)
{
    beginResetModel();
    m_rows.clear();
    m_columns = 0;
    endResetModel();
    if (!data || !data->hasFormat(mimeTypes().value(0)))
        return false;
    return dropMimeData(data, Qt::CopyAction, 0, 0, QModelIndex()) && !m_rows.isEmpty();
}

// ---------------------------------------------------------------------------- KrBrickUserScene

struct KrBrickUserScene::Private
{
    IKrBrickUser* brickUser = nullptr;
    // The brick user's object; null once the brick user is gone.
    QPointer<QObject> userObject;
    QMap<uint, KrBrickGraphicsItem*> itemsById;
    bool factoryDragAccepted = false;
    bool rightToLeft = true;
    KrWireItem* wireItem = nullptr;
    QGraphicsPolygonItem* arrowItem = nullptr;
    QPointF pathStart;
    bool pathStartIsOutput = false;
    QSet<KrBrickSceneUndoItem*> undoItems;
    QPointer<QGraphicsView> view;
    QPointer<KrCorvaneDockWidget> dockWindow;
    QPointF lastMenuPos;
    QGraphicsProxyWidget* focusHolder = nullptr;
    QPointer<KrConnectorItem> connectionItem;
    bool connectMode = false;
    bool updatingBricks = false;
    KrShaderBrick* brickBeingAdded = nullptr;
    bool destroying = false;
    int addsSinceFlush = 0;

    // A move gesture: where the bricks were when it began.
    bool moving = false;
    QPointer<KrBrickGraphicsItem> moveLeader;
    QMap<uint, QPointF> moveStart;
    bool movingFollowers = false;
    // Bricks moved together: their wires are redrawn once, at the end.
    int bulkDepth = 0;
    QSet<uint> bulkMoved;
    // A resize gesture.
    QPointer<KrBrickGraphicsItem> resizeItem;
    QSize resizeStart;
    // Bricks placed by the arrangement under way: a brick that feeds several others is
    // placed once, by the first of them, instead of once per path to it.
    QSet<const KrShaderBrick*> arranged;
    int arrangeDepth = 0;
    bool arranging = false;
    // A flip whose step also takes the direction change that comes right after it.
    KrBrickLayoutUndoItem* flipAwaitingDirection = nullptr;
    // Many bricks going or coming at once (a delete, a group, an undo or redo): the brick
    // user's exposed properties are rebuilt once, at the end, and the items taken out are
    // deleted together by one deferred deletion. Thousands queued one by one would make every
    // later post and removal search the queue.
    int batchDepth = 0;
    QPointer<KrBrickContainer> batchContainer;
    QList<QPointer<QObject>> doomed;

    void beginBatch()
    {
        if (batchDepth++ > 0)
            return;
        IKrBrickUser* brickUser = user();
        batchContainer = brickUser ? brickUser->getBrickContainer() : nullptr;
        if (batchContainer)
            batchContainer->beginBatch();
    }
    void endBatch()
    {
        if (batchDepth <= 0 || --batchDepth > 0)
            return;
        if (batchContainer)
            batchContainer->endBatch();
        batchContainer = nullptr;
        if (doomed.isEmpty())
            return;
        auto* reaper = new KrItemReaper(std::move(doomed));
        doomed.clear();
        reaper->deleteLater();
    }
    QPointer<KrUndoStack> watchedStack;

    IKrBrickUser* user() const { return userObject ? brickUser : nullptr; }

    // Undoing a large delete files its bricks one by one: the brick user's rebuild waits for
    // the end of the step. The stack may come into being after the scene.
    void watchUndoStack(KrBrickUserScene* scene)
    {
        KrUndoStack* stack = sceneUndoStack();
        if (!stack || stack == watchedStack)
            return;
        if (watchedStack)
            QObject::disconnect(watchedStack, nullptr, scene, nullptr);
        watchedStack = stack;
        QObject::connect(stack, &KrUndoStack::replayStarted, scene, [this] { beginBatch(); });
        QObject::connect(stack, &KrUndoStack::replayFinished, scene, [this] { endBatch(); });
    }
};

KrBrickUserScene::KrBrickUserScene(IKrBrickUser* brickUser, QGraphicsView* view,
                                   KrCorvaneDockWidget* dockWindow)
    : QGraphicsScene(nullptr), d(new Private)
{
    // Bricks move all the time and wires can span the whole network: a spatial index would
    // be updated on every move and searched through long wires on every removal.
    setItemIndexMethod(QGraphicsScene::NoIndex);
    registerFactoryType();
    d->brickUser = brickUser;
    if (brickUser) {
        d->userObject = brickUser->getObject();
        brickUser->prepareBricks();
    }
    d->view = view;
    d->dockWindow = dockWindow;

    auto* holder = new QLabel;
    holder->setFixedSize(1, 1);
    d->focusHolder = addWidget(holder);
    d->focusHolder->setFlag(QGraphicsItem::ItemIsFocusable);
    d->focusHolder->setFlag(QGraphicsItem::ItemIsSelectable);

    if (QObject* object = d->userObject) {
        // The brick user is an interface: its element declares the signals.
        connect(object, SIGNAL(brickRemoved(KrShaderBrick*)), this,
                SLOT(brickRemoved(KrShaderBrick*)));
        connect(object, SIGNAL(brickAdded(KrShaderBrick*)), this, SLOT(updateBricks()));
    }
    d->watchUndoStack(this);
}

KrBrickUserScene::~KrBrickUserScene()
{
    d->destroying = true;
    // Items waiting for the end of a batch still go.
    if (d->batchDepth > 0) {
        d->batchDepth = 1;
        d->endBatch();
    }
    for (KrBrickSceneUndoItem* item : qAsConst(d->undoItems))
        item->forgetScene();
    d->undoItems.clear();
    d->flipAwaitingDirection = nullptr;
    if (d->userObject)
        disconnect(d->userObject, nullptr, this, nullptr);
    // The items go while this scene is whole: their plugs and wires still talk to it.
    const QList<KrBrickGraphicsItem*> items = d->itemsById.values();
    d->itemsById.clear();
    qDeleteAll(items);
    clear();
}

IKrBrickUser* KrBrickUserScene::getBrickUser() const
{
    return d->user();
}

QGraphicsView* KrBrickUserScene::getView() const
{
    return d->view;
}

KrCorvaneDockWidget* KrBrickUserScene::getDockWindow() const
{
    return d->dockWindow;
}

const QMap<uint, KrBrickGraphicsItem*>& KrBrickUserScene::getItemsById() const
{
    return d->itemsById;
}

QList<KrBrickGraphicsItem*> KrBrickUserScene::getSelectedBricks() const
{
    QList<KrBrickGraphicsItem*> bricks;
    for (QGraphicsItem* item : selectedItems()) {
        if (KrBrickGraphicsItem* brickItem = brickItemOf(item))
            bricks.append(brickItem);
    }
    return bricks;
}

QGraphicsPathItem* KrBrickUserScene::getWireItem() const
{
    return d->wireItem;
}

QGraphicsPolygonItem* KrBrickUserScene::getArrowItem() const
{
    return d->arrowItem;
}

QGraphicsItem* KrBrickUserScene::getFocusHolder() const
{
    return d->focusHolder;
}

QPointF KrBrickUserScene::getLastMenuPos() const
{
    return d->lastMenuPos;
}

void KrBrickUserScene::setLastMenuPos(const QPointF& pos)
{
    d->lastMenuPos = pos;
}

QPointF KrBrickUserScene::clampPosition(const QPointF& pos)
{
    return QPointF(float(pos.x()) < kMinPos ? kMinPos : pos.x(),
                   float(pos.y()) < kMinPos ? kMinPos : pos.y());
}

bool KrBrickUserScene::isRightToLeft()
{
    return d->rightToLeft;
}

void KrBrickUserScene::applyDirection(bool rightToLeft)
{
    d->rightToLeft = rightToLeft;
    for (KrBrickGraphicsItem* item : qAsConst(d->itemsById))
        item->setOutputIsRightToLeft(rightToLeft);
}

void KrBrickUserScene::setIsRightToLeft(bool onOff)
{
    KrBrickLayoutUndoItem* flip = d->flipAwaitingDirection;
    d->flipAwaitingDirection = nullptr;
    if (onOff == d->rightToLeft)
        return;
    const bool before = d->rightToLeft;
    applyDirection(onOff);
    // The window flips the bricks and then turns them round: undo does both.
    if (flip && d->undoItems.contains(flip))
        flip->setDirection(before, onOff);
}

KrBrickGraphicsItem* KrBrickUserScene::findBrick(uint id)
{
    return d->itemsById.value(id, nullptr);
}

// ---------------------------------------------------------------------------- adding bricks

KrBrickGraphicsItem* KrBrickUserScene::fileBrick(KrShaderBrick* brick, const QPointF& pos,
                                                 uint wantedId)
{
    IKrBrickUser* user = d->user();
    if (!brick || !user || !user->acceptsBrick(brick))
        return nullptr;
    const bool wasFiled = user->findBrick(brick->getBrickID()) == brick;
    const QPointF at = clampPosition(pos);

    d->brickBeingAdded = brick;
    uint id = 0;
    KrBrickContainer* container = user->getBrickContainer();
    if (!wasFiled && wantedId && container) {
        // Back under the id it had, without using up a fresh one.
        id = container->insertBrick(brick, wantedId);
    } else {
        id = user->insertBrick(brick);
        if (id && wantedId && id != wantedId) {
            brick->setBrickID(wantedId);
            id = brick->getBrickID();
        }
    }
    if (!id) {
        d->brickBeingAdded = nullptr;
        return nullptr;
    }
    if (KrBrickGraphicsItem* shown = d->itemsById.value(id)) {
        if (shown->getBrick() == brick) {
            d->brickBeingAdded = nullptr;
            return shown;
        }
    }

    auto* item = new KrBrickGraphicsItem(brick, this);
    item->setOutputIsRightToLeft(d->rightToLeft);
    addItem(item);
    d->itemsById.insert(id, item);
    item->setPos(int(at.x()), int(at.y()));
    connect(brick, &KrShaderBrick::brickIDChanged, this, &KrBrickUserScene::brickIDChanged,
            Qt::UniqueConnection);
    item->setPositionSettings();
    d->brickBeingAdded = nullptr;

    if (!wasFiled && canRecord())
        pushStep(new KrBrickAddedUndoItem(brick, this), QStringLiteral("Add Brick"));
    flushPostedWork();
    return item;
}

KrBrickGraphicsItem* KrBrickUserScene::addBrickAt(KrShaderBrick* brick, const QPointF& pos)
{
    return fileBrick(brick, pos, 0);
}

KrBrickGraphicsItem* KrBrickUserScene::addItemForBrick(KrShaderBrick* brick)
{
    if (!brick)
        return nullptr;
    const KrSettings* settings = brick->getBrickSettings();
    const QPointF pos(settings->getFloatValue(kPosX, 0.0), settings->getFloatValue(kPosY, 0.0));
    return addBrickAt(brick, pos);
}

void KrBrickUserScene::flushPostedWork()
{
    if (++d->addsSinceFlush < kFlushBatch)
        return;
    d->addsSinceFlush = 0;
    // The window is not painted half-built: each flush would paint everything added so far.
    QWidget* window = d->view ? d->view->window() : nullptr;
    const bool holdPaint = window && window->updatesEnabled();
    if (holdPaint)
        window->setUpdatesEnabled(false);
    QCoreApplication::sendPostedEvents();
    if (holdPaint)
        window->setUpdatesEnabled(true);
}

void KrBrickUserScene::updateBricks()
{
    IKrBrickUser* user = d->user();
    if (d->brickBeingAdded || d->updatingBricks || !user)
        return;
    d->updatingBricks = true;
    const QMap<uint, KrShaderBrick*> bricks = user->getBricks();
    for (auto it = bricks.cbegin(); it != bricks.cend(); ++it) {
        if (!d->itemsById.contains(it.key()))
            addItemForBrick(it.value());
    }
    d->updatingBricks = false;
}

void KrBrickUserScene::addBrick(const KrBrickFactory& factory)
{
    KrShaderBrick* brick = factory.generateBrick();
    // Held while it is added, so a brick the user refuses is released again.
    if (brick)
        brick->ref();
    addBrickAt(brick, d->lastMenuPos);
    if (brick)
        brick->unref();
}

void KrBrickUserScene::brickIDChanged(int oldId)
{
    KrBrickGraphicsItem* item = d->itemsById.value(uint(oldId), nullptr);
    if (!item || !item->getBrick())
        return;
    const uint now = item->getBrick()->getBrickID();
    if (now == uint(oldId))
        return;
    d->itemsById.remove(uint(oldId));
    d->itemsById.insert(now, item);
}

// -------------------------------------------------------------------------- removing bricks

void KrBrickUserScene::brickRemoved(KrShaderBrick* brick)
{
    if (!brick)
        return;
    KrBrickGraphicsItem* item = d->itemsById.value(brick->getBrickID(), nullptr);
    if (!item || item->getBrick() != brick)
        return;
    item->clearConnectorItems();
    // The brick left the brick user through someone else, who answers for undoing it.
    takeOutItem(item, false);
}

void KrBrickUserScene::removeBrickItem(KrBrickGraphicsItem* item)
{
    takeOutItem(item, true);
}

void KrBrickUserScene::takeOutItem(KrBrickGraphicsItem* item, bool record)
{
    if (!item)
        return;
    KrShaderBrick* brick = item->getBrick();
    uint id = 0;
    if (brick && d->itemsById.value(brick->getBrickID()) == item) {
        id = brick->getBrickID();
    } else {
        // The brick is gone or was re-filed behind the scene's back.
        for (auto it = d->itemsById.cbegin(); it != d->itemsById.cend(); ++it) {
            if (it.value() == item) {
                id = it.key();
                break;
            }
        }
    }
    if (!id || d->itemsById.value(id) != item)
        return;
    d->itemsById.remove(id);

    if (record) {
        KrUndoStackHold hold;
        item->clearConections();
        if (brick && canRecord())
            sceneUndoStack()->push(new KrBrickDeleteUndoItem(brick, this));
        hold.accept(QStringLiteral("Brick delete..."));
    }

    if (d->connectionItem && d->connectionItem->getBrickItem() == item)
        setConnectMode(false);
    if (d->moveLeader == item)
        d->moveLeader = nullptr;
    if (d->resizeItem == item)
        d->resizeItem = nullptr;
    removeItem(item);
    if (IKrBrickUser* user = d->user()) {
        if (brick && user->findBrick(brick->getBrickID()) == brick)
            user->takeBrick(brick);
    }
    KrApp* app = KrApp::existingInstance();
    if (app && !app->isClosing()) {
        // Later: the item may be in the middle of handling the event that removes it.
        if (d->batchDepth > 0)
            d->doomed.append(item);
        else
            item->deleteLater();
        if (!d->destroying && d->focusHolder)
            d->focusHolder->setFocus(Qt::OtherFocusReason);
    } else {
        delete item;
    }
}

void KrBrickUserScene::deleteSelected()
{
    QList<KrBrickGraphicsItem*> items = getSelectedBricks();
    if (items.isEmpty())
        return;
    // The scene keeps its items in a list ordered by address, and taking one out moves the
    // shorter side of it: bricks taken in address order (their parts were made with them)
    // leave from one end, so deleting thousands moves next to nothing.
    std::sort(items.begin(), items.end(), std::greater<KrBrickGraphicsItem*>());
    KrUndoStackHold hold;
    d->beginBatch();
    for (KrBrickGraphicsItem* item : items)
        removeBrickItem(item);
    d->endBatch();
    hold.accept(QStringLiteral("Delete Bricks"));
}

void KrBrickUserScene::toGroup()
{
    QList<KrBrickGraphicsItem*> grouped;
    QList<uint> ids;
    for (KrBrickGraphicsItem* item : getSelectedBricks()) {
        KrShaderBrick* brick = item->getBrick();
        if (!brick || brick->type() != KrBrickSet::Function)
            continue;
        grouped.append(item);
        ids.append(brick->getBrickID());
    }
    IKrBrickUser* user = d->user();
    if (ids.isEmpty() || !user)
        return;
    const QSet<uint> idSet(ids.cbegin(), ids.cend());

    KrSettings settings;
    QList<uint> listed = ids;
    KrDefaultBrickUser::getAttributesHelper(user, listed, &settings, true);
    auto* group = new KrBrickGroup;
    // Held until the brick user has it (or refused it).
    group->ref();
    QHash<QString, KrShaderBrick*> nameMap;
    KrDefaultBrickUser::setAttributesHelper(group, &settings, nameMap, true);

    KrBrickGraphicsItem* groupItem = nullptr;
    {
        KrUndoStackHold hold;
        d->beginBatch();
        // Wires from grouped bricks to bricks left outside; the group's outputs take them.
        QList<QPair<KrBrickParam*, KrBrickParam*>> outgoing;
        for (KrBrickGraphicsItem* item : qAsConst(grouped)) {
            KrShaderBrick* brick = item->getBrick();
            KrShaderBrick* copy = nameMap.value(KrDefaultBrickUser::brickKey(brick->getBrickID()));
            if (copy) {
                const int count = qMin(brick->getNumParameters(), copy->getNumParameters());
                for (int i = 0; i < count; ++i) {
                    KrBrickParam* param = brick->getParameter(i);
                    KrBrickParam* copyParam = copy->getParameter(i);
                    for (int c = 0; c < param->getNumConnections(); ++c) {
                        KrBrickParam* other = param->getConnection(c)->getParam();
                        KrShaderBrick* otherBrick = other ? other->getBrick() : nullptr;
                        if (!otherBrick || idSet.contains(otherBrick->getBrickID()))
                            continue;
                        if (param->isInput())
                            copyParam->addConnection(other);
                        else
                            outgoing.append(qMakePair(copyParam, other));
                    }
                }
            }
            item->clearConections();
        }
        for (const auto& wire : qAsConst(outgoing))
            wire.first->addConnection(wire.second);

        groupItem = addBrickAt(group, d->lastMenuPos);
        // The group's wires to the rest of the network were made before it was filed: the
        // step records them so that redo makes them again.
        if (groupItem && canRecord()) {
            for (int i = 0; i < group->getNumParameters(); ++i) {
                KrBrickParam* param = group->getParameter(i);
                for (int c = 0; c < param->getNumConnections(); ++c) {
                    const Ends ends = endsOf(param, param->getConnection(c)->getParam());
                    if (ends.valid)
                        sceneUndoStack()->push(
                            new KrConnectionAddedItem(this, ends.inputBrick, ends.outputBrick,
                                                      ends.inputIndex, ends.outputIndex));
                }
            }
        }
        for (int i = grouped.size() - 1; i >= 0; --i)
            removeBrickItem(grouped.at(i));
        d->endBatch();
        hold.accept(QStringLiteral("Group Bricks"));
    }
    group->unref();
    if (groupItem)
        groupItem->doConnections();
}

// ------------------------------------------------------------------------------- connections

bool KrBrickUserScene::connectParameters(KrBrickParam* a, KrBrickParam* b)
{
    if (!a || !b || a == b || !a->canConnectTo(b) || a->isConnectedTo(b))
        return false;
    const Ends ends = endsOf(a, b);
    if (!ends.valid)
        return false;
    KrUndoStackHold hold;
    if (canRecord()) {
        // An input takes one source: the one it loses comes back with undo.
        KrBrickParam* old = ends.input->getSource();
        if (old && old != ends.output) {
            const Ends replaced = endsOf(ends.input, old);
            if (replaced.valid)
                sceneUndoStack()->push(
                    new KrConnectionRemovedItem(this, replaced.inputBrick, replaced.outputBrick,
                                                replaced.inputIndex, replaced.outputIndex));
        }
        sceneUndoStack()->push(new KrConnectionAddedItem(this, ends.inputBrick, ends.outputBrick,
                                                         ends.inputIndex, ends.outputIndex));
        hold.accept(QStringLiteral("Brick Connection..."));
    }
    return ends.input->addConnection(ends.output);
}

bool KrBrickUserScene::disconnectParameter(KrBrickParam* param)
{
    if (!param || param->getNumConnections() < 1)
        return false;
    KrUndoStackHold hold;
    if (canRecord()) {
        for (int i = 0; i < param->getNumConnections(); ++i) {
            const Ends ends = endsOf(param, param->getConnection(i)->getParam());
            if (ends.valid)
                sceneUndoStack()->push(new KrConnectionRemovedItem(
                    this, ends.inputBrick, ends.outputBrick, ends.inputIndex, ends.outputIndex));
        }
        hold.accept(QStringLiteral("Brick Disconnect..."));
    }
    param->removeAllConnections();
    return true;
}

// ------------------------------------------------------------------------------ connect mode

bool KrBrickUserScene::isConnectMode()
{
    return d->connectMode;
}

KrConnectorItem* KrBrickUserScene::getConnectionItem()
{
    return d->connectionItem;
}

void KrBrickUserScene::setConnectMode(bool onOff, KrConnectorItem* item, QPointF pos, bool isOut)
{
    d->connectMode = onOff;
    d->connectionItem = item;
    if (onOff)
        followPathStart(pos, isOut);
    else if (d->wireItem)
        d->wireItem->hide();
}

void KrBrickUserScene::followPathStart(QPointF pos, bool isOutPut)
{
    if (!d->wireItem) {
        d->wireItem = new KrWireItem;
        QPen pen(krApp->getStyle()->getColors().highlight, 2.0);
        pen.setCapStyle(Qt::RoundCap);
        pen.setStyle(Qt::DashLine);
        d->wireItem->setPen(pen);
        d->wireItem->setZValue(25);
        d->arrowItem = new QGraphicsPolygonItem(d->wireItem);
        d->arrowItem->setPen(Qt::NoPen);
        d->arrowItem->setBrush(pen.color());
        addItem(d->wireItem);
    }
    d->wireItem->hide();
    d->pathStart = pos;
    d->pathStartIsOutput = isOutPut;
    d->wireItem->setPath(KrWireItem::curve(pos, d->wireItem->mapFromScene(pos)));
}

void KrBrickUserScene::followPathEnd()
{
    if (d->wireItem)
        d->wireItem->hide();
}

void KrBrickUserScene::drawTemporaryWire(const QPointF& pointer, bool withArrow)
{
    if (!d->wireItem)
        return;
    const bool fromPointer = d->pathStartIsOutput == d->rightToLeft;
    const QPointF start = fromPointer ? pointer : d->pathStart;
    const QPointF end = d->wireItem->mapFromScene(fromPointer ? d->pathStart : pointer);
    d->wireItem->setPath(KrWireItem::curve(start, end));
    d->wireItem->show();
    if (withArrow) {
        const int x = int(end.x());
        const int y = int(end.y());
        QPolygonF arrow;
        arrow << QPointF(x, y) << QPointF(x - 8, y - 8) << QPointF(x - 8, y)
              << QPointF(x - 8, y + 8);
        d->arrowItem->setPolygon(arrow);
        d->arrowItem->show();
    } else {
        d->arrowItem->hide();
    }
}

// -------------------------------------------------------------------------------- gestures

void KrBrickUserScene::beginBrickMove(KrBrickGraphicsItem* item, bool othersFollow)
{
    d->moving = true;
    d->moveLeader = othersFollow ? item : nullptr;
    d->moveStart.clear();
    QList<KrBrickGraphicsItem*> items = getSelectedBricks();
    if (item && !items.contains(item))
        items.append(item);
    for (KrBrickGraphicsItem* brickItem : qAsConst(items)) {
        if (KrShaderBrick* brick = brickItem->getBrick())
            d->moveStart.insert(brick->getBrickID(), brickItem->pos());
    }
}

bool KrBrickUserScene::isMoveLeader(const KrBrickGraphicsItem* item) const
{
    return d->moving && item && d->moveLeader == item && !d->movingFollowers && !isBulkLayout();
}

void KrBrickUserScene::moveFollowers(KrBrickGraphicsItem* leader, const QPointF& delta)
{
    if (d->movingFollowers)
        return;
    d->movingFollowers = true;
    // The leader's wires are drawn anew with the followers', once.
    beginBulkLayout();
    noteBulkMove(leader);
    if (!delta.isNull()) {
        for (KrBrickGraphicsItem* item : getSelectedBricks()) {
            if (item != leader)
                item->setPos(item->pos() + delta);
        }
    }
    endBulkLayout();
    d->movingFollowers = false;
}

void KrBrickUserScene::beginBulkLayout()
{
    ++d->bulkDepth;
}

bool KrBrickUserScene::isBulkLayout() const
{
    return d->bulkDepth > 0;
}

void KrBrickUserScene::noteBulkMove(KrBrickGraphicsItem* item)
{
    if (KrShaderBrick* brick = item ? item->getBrick() : nullptr)
        d->bulkMoved.insert(brick->getBrickID());
}

void KrBrickUserScene::endBulkLayout()
{
    if (d->bulkDepth <= 0 || --d->bulkDepth > 0)
        return;
    const QSet<uint> moved = d->bulkMoved;
    d->bulkMoved.clear();
    // Every wire touching a moved brick is drawn anew once: a wire redrawn twice before the
    // scene's index catches up costs a search through everything moved so far.
    QSet<KrConnectorItem*> inputs;
    for (uint id : moved) {
        KrBrickGraphicsItem* item = findBrick(id);
        if (!item)
            continue;
        for (KrConnectorItem* plug : item->getConnectors()) {
            if (!plug->isOutput()) {
                inputs.insert(plug);
                continue;
            }
            KrBrickParam* param = plug->getParam();
            for (int i = 0; param && i < param->getNumConnections(); ++i) {
                KrBrickParam* other = param->getConnection(i)->getParam();
                KrShaderBrick* brick = other ? other->getBrick() : nullptr;
                KrBrickGraphicsItem* consumer = brick ? findBrick(brick->getBrickID()) : nullptr;
                if (KrConnectorItem* input =
                        consumer ? consumer->getConnector(brick->findParameterIndex(other))
                                 : nullptr)
                    inputs.insert(input);
            }
        }
    }
    for (KrConnectorItem* input : qAsConst(inputs))
        input->updatePath();
}

void KrBrickUserScene::endBrickMove()
{
    if (!d->moving)
        return;
    d->moving = false;
    d->moveLeader = nullptr;
    const QMap<uint, QPointF> start = d->moveStart;
    d->moveStart.clear();
    if (!canRecord())
        return;
    auto* step = new KrBrickLayoutUndoItem(this);
    for (auto it = start.cbegin(); it != start.cend(); ++it) {
        KrBrickGraphicsItem* item = findBrick(it.key());
        if (item && item->pos() != it.value())
            step->addPosition(it.key(), it.value(), item->pos());
    }
    if (step->isEmpty()) {
        delete step;
        return;
    }
    pushStep(step, QStringLiteral("Move Bricks"));
}

void KrBrickUserScene::beginBrickResize(KrBrickGraphicsItem* item)
{
    d->resizeItem = item;
    d->resizeStart = item && item->getFrame() ? item->getFrame()->size() : QSize();
}

void KrBrickUserScene::endBrickResize(KrBrickGraphicsItem* item)
{
    if (!item || d->resizeItem != item)
        return;
    d->resizeItem = nullptr;
    KrBrickFrame* frame = item->getFrame();
    KrShaderBrick* brick = item->getBrick();
    if (!frame || !brick || frame->size() == d->resizeStart || !canRecord())
        return;
    auto* step = new KrBrickLayoutUndoItem(this);
    step->addSize(brick->getBrickID(), d->resizeStart, frame->size());
    pushStep(step, QStringLiteral("Resize Brick"));
}

// ------------------------------------------------------------------------ arranging, depth

KrBrickLayoutUndoItem* KrBrickUserScene::layoutAsStep(const QString& text,
                                                      const std::function<void()>& change)
{
    struct Place
    {
        QPointF pos;
        qreal z;
    };
    QMap<uint, Place> before;
    for (auto it = d->itemsById.cbegin(); it != d->itemsById.cend(); ++it)
        before.insert(it.key(), {it.value()->pos(), it.value()->zValue()});
    change();
    // A layout made while the window is being put together (arranged or turned round as it
    // opens) is no edit of the user's.
    if (!canRecord() || (d->view && !d->view->isVisible()))
        return nullptr;
    auto* step = new KrBrickLayoutUndoItem(this);
    for (auto it = before.cbegin(); it != before.cend(); ++it) {
        KrBrickGraphicsItem* item = findBrick(it.key());
        if (!item)
            continue;
        if (item->pos() != it.value().pos)
            step->addPosition(it.key(), it.value().pos, item->pos());
        if (item->zValue() != it.value().z)
            step->addDepth(it.key(), it.value().z, item->zValue());
    }
    if (step->isEmpty()) {
        delete step;
        return nullptr;
    }
    pushStep(step, text);
    // The stack may have refused it (an open hold that is never accepted deletes it later).
    return d->undoItems.contains(step) ? step : nullptr;
}

void KrBrickUserScene::autoArrange()
{
    layoutAsStep(QStringLiteral("Auto Arrange"), [this] { arrange(); });
}

void KrBrickUserScene::arrange()
{
    IKrBrickUser* user = d->user();
    if (!user)
        return;
    beginBulkLayout();
    d->arranged.clear();
    d->arranging = true;
    // Each tree goes below the one before it.
    int y = 148;
    for (int i = 0; i < user->getNumBrickSets(); ++i) {
        KrBrickSet* set = user->getBrickSet(i);
        KrShaderBrick* root = set ? set->getRoot() : nullptr;
        KrBrickGraphicsItem* item = root ? findBrick(root->getBrickID()) : nullptr;
        KrBrickFrame* frame = item ? item->getFrame() : nullptr;
        if (!frame)
            continue;
        item->setPos(10, y);
        d->arranged.insert(root);
        const int xChild = 10 + int(1.5 * frame->width());
        int bottom = y + frame->height() + kArrangeGap;
        arrangeChildren(root, xChild, y, bottom);
        y = bottom;
    }
    d->arranging = false;
    d->arranged.clear();
    endBulkLayout();
    if (!d->rightToLeft)
        flipPositions();
}

void KrBrickUserScene::arrangeChildren(KrShaderBrick* brick, int xOffset, int yOffset, int& yMax)
{
    if (!brick)
        return;
    // A call from outside an arrangement starts one of its own.
    if (d->arrangeDepth == 0 && !d->arranging) {
        d->arranged.clear();
        d->arranged.insert(brick);
    }
    ++d->arrangeDepth;
    QList<KrShaderBrick*> children;
    brick->getBrickList(false, false, true, &children);
    int y = yOffset;
    for (KrShaderBrick* child : qAsConst(children)) {
        KrBrickGraphicsItem* item = findBrick(child->getBrickID());
        KrBrickFrame* frame = item ? item->getFrame() : nullptr;
        if (!frame || d->arranged.contains(child))
            continue;
        d->arranged.insert(child);
        item->setPos(xOffset, y);
        const int xChild = xOffset + int(1.5 * frame->width());
        // A child's own feeders start level with it, and the next child goes below the lower
        // of the two: no subtree lands on another.
        int bottom = y + frame->height() + kArrangeGap;
        arrangeChildren(child, xChild, y, bottom);
        y = bottom;
        if (y > yMax)
            yMax = y;
    }
    --d->arrangeDepth;
}

void KrBrickUserScene::flipBricksAboutCenter()
{
    d->flipAwaitingDirection =
        layoutAsStep(QStringLiteral("Flip Bricks"), [this] { flipPositions(); });
    if (d->flipAwaitingDirection) {
        // Only a direction change made by the same command joins the step.
        QTimer::singleShot(0, this, [this] { d->flipAwaitingDirection = nullptr; });
    }
}

void KrBrickUserScene::flipPositions()
{
    if (d->itemsById.isEmpty())
        return;
    float minX = 0.0f;
    float maxX = 1.0f;
    float maxW = 0.0f;
    for (KrBrickGraphicsItem* item : qAsConst(d->itemsById)) {
        const float x = float(item->pos().x());
        const float w =
            item->getFrame() ? float(item->getFrame()->width()) : float(item->size().width());
        if (x < minX)
            minX = x;
        else if (x > maxX)
            maxX = x;
        if (w > maxW)
            maxW = w;
    }
    const float c = (maxX - minX) * 0.5f;
    float shift = -minX;
    if (d->rightToLeft) {
        const QRectF area = d->view ? d->view->sceneRect() : sceneRect();
        shift = float(area.width()) - maxX - maxW;
    }
    // Mirrored about the middle, then shifted: each brick moves once.
    beginBulkLayout();
    for (KrBrickGraphicsItem* item : qAsConst(d->itemsById)) {
        const float x = float(item->pos().x());
        float mirrored = x;
        if (x < c)
            mirrored = std::trunc(c + std::trunc(c - x));
        else if (x > c)
            mirrored = std::trunc(c - std::trunc(x - c));
        if (mirrored < kMinPos)
            mirrored = kMinPos;
        float to = std::trunc(mirrored + shift);
        if (to < kMinPos)
            to = kMinPos;
        item->setPos(to, item->pos().y());
        item->setPositionSettings();
    }
    endBulkLayout();
    if (d->view)
        d->view->ensureVisible(d->itemsById.first(), 50, 50);
}

void KrBrickUserScene::addjustDepth(float sel, float unsel)
{
    for (KrBrickGraphicsItem* item : qAsConst(d->itemsById))
        item->setZValue(item->isSelected() ? sel : unsel);
}

void KrBrickUserScene::toFront()
{
    layoutAsStep(QStringLiteral("To Front"), [this] { addjustDepth(9, 8); });
}

void KrBrickUserScene::toBack()
{
    layoutAsStep(QStringLiteral("To Back"), [this] { addjustDepth(8, 9); });
}

// ------------------------------------------------------------------------------ undo items

void KrBrickUserScene::registerUndoItem(KrBrickSceneUndoItem* item)
{
    if (item && !d->destroying) {
        d->undoItems.insert(item);
        d->watchUndoStack(this);
    }
}

void KrBrickUserScene::unregisterUndoItem(KrBrickSceneUndoItem* item)
{
    d->undoItems.remove(item);
    if (d->flipAwaitingDirection == item)
        d->flipAwaitingDirection = nullptr;
}

int KrBrickUserScene::getNumUndoItems() const
{
    return d->undoItems.size();
}

// --------------------------------------------------------------------------------- events

void KrBrickUserScene::contextMenuEvent(QGraphicsSceneContextMenuEvent* event)
{
    d->lastMenuPos = event->scenePos();
    if (!items(event->scenePos()).isEmpty()) {
        // Each item has its own menu.
        QGraphicsScene::contextMenuEvent(event);
        return;
    }
    QMenu menu;
    QPointer<KrBrickFactoryMenu> factoryMenu;
    if (d->dockWindow) {
        if (KrCorvanePaneMainWgt* main = d->dockWindow->getMainParent())
            factoryMenu = main->getBrickMenu();
    }
    if (factoryMenu) {
        menu.addMenu(factoryMenu);
        connect(factoryMenu, &KrBrickFactoryMenu::factoryTriggered, this,
                &KrBrickUserScene::addBrick);
    }
    menu.addSeparator();
    if (d->dockWindow)
        d->dockWindow->addEditItemsToMenu(&menu);
    menu.addSeparator();
    connect(menu.addAction(QStringLiteral("Group")), &QAction::triggered, this,
            &KrBrickUserScene::toGroup);
    menu.addSeparator();
    connect(menu.addAction(QStringLiteral("To Front")), &QAction::triggered, this,
            &KrBrickUserScene::toFront);
    connect(menu.addAction(QStringLiteral("To Back")), &QAction::triggered, this,
            &KrBrickUserScene::toBack);
    menu.addSeparator();
    QAction* deleteAction = menu.addAction(QStringLiteral("Delete"));
    deleteAction->setShortcut(QKeySequence::Delete);
    connect(deleteAction, &QAction::triggered, this, &KrBrickUserScene::deleteSelected);

    QPoint global = event->screenPos();
    if (d->view)
        global = d->view->viewport()->mapToGlobal(d->view->mapFromScene(d->lastMenuPos));
    QPointer<KrBrickUserScene> guard(this);
    menu.exec(global);
    if (guard && factoryMenu)
        disconnect(factoryMenu, nullptr, this, nullptr);
    event->accept();
}

KrShaderBrick* KrBrickUserScene::factoryBrickOfDrag(const QMimeData* data, bool acceptedOnly)
{
    KrItemModelReader reader;
    if (!reader.read(data))
        return nullptr;
    for (int row = 0; row < reader.rowCount(); ++row) {
        const QVariant value = reader.data(reader.index(row, 0), Qt::UserRole);
        if (!value.canConvert<KrBrickFactory>())
            continue;
        const KrBrickFactory factory = value.value<KrBrickFactory>();
        if (!factory.getFactory())
            continue;
        KrShaderBrick* brick = factory.generateBrick();
        if (!acceptedOnly)
            return brick;
        IKrBrickUser* user = d->user();
        if (brick && user && user->acceptsBrick(brick))
            return brick;
        if (brick) {
            brick->ref();
            brick->unref();
        }
    }
    return nullptr;
}

void KrBrickUserScene::dragEnterEvent(QGraphicsSceneDragDropEvent* event)
{
    d->factoryDragAccepted = false;
    const QMimeData* data = event->mimeData();
    if (data && data->hasFormat(KrBrickParamMime::s_mimeType)) {
        QGraphicsScene::dragEnterEvent(event);
        event->accept();
        return;
    }
    if (data && data->hasFormat(KrItemModelReader::itemViewFormat())) {
        if (KrShaderBrick* trial = factoryBrickOfDrag(data, true)) {
            // Only a test: the brick is released again.
            trial->ref();
            trial->unref();
            event->accept();
            d->factoryDragAccepted = true;
            return;
        }
    }
    QGraphicsScene::dragEnterEvent(event);
}

void KrBrickUserScene::dragMoveEvent(QGraphicsSceneDragDropEvent* event)
{
    if (d->factoryDragAccepted) {
        event->accept();
        return;
    }
    const QMimeData* data = event->mimeData();
    if (data && data->hasFormat(KrBrickParamMime::s_mimeType))
        drawTemporaryWire(event->scenePos(), true);
    QGraphicsScene::dragMoveEvent(event);
}

void KrBrickUserScene::dragLeaveEvent(QGraphicsSceneDragDropEvent* event)
{
    d->factoryDragAccepted = false;
    followPathEnd();
    QGraphicsScene::dragLeaveEvent(event);
}

void KrBrickUserScene::dropEvent(QGraphicsSceneDragDropEvent* event)
{
    d->factoryDragAccepted = false;
    const QMimeData* data = event->mimeData();
    KrItemModelReader reader;
    if (data && reader.read(data)) {
        for (int row = 0; row < reader.rowCount(); ++row) {
            const QVariant value = reader.data(reader.index(row, 0), Qt::UserRole);
            if (!value.canConvert<KrBrickFactory>())
                continue;
            const KrBrickFactory factory = value.value<KrBrickFactory>();
            if (!factory.getFactory())
                continue;
            event->accept();
            if (KrShaderBrick* brick = factory.generateBrick()) {
                brick->ref();
                addBrickAt(brick, event->scenePos());
                brick->unref();
            }
            return;
        }
    }
    QGraphicsScene::dropEvent(event);
    followPathEnd();
}

void KrBrickUserScene::keyPressEvent(QKeyEvent* event)
{
    QGraphicsScene::keyPressEvent(event);
    if (event->isAccepted())
        return;
    // No item took the key: Delete removes the selected bricks, Ctrl+A selects every brick,
    // and Escape gives up a connection begun with Shift+click, or else the selection.
    if (event->matches(QKeySequence::Delete) || event->key() == Qt::Key_Backspace) {
        if (!getSelectedBricks().isEmpty()) {
            deleteSelected();
            event->accept();
        }
    } else if (event->matches(QKeySequence::SelectAll)) {
        for (KrBrickGraphicsItem* item : qAsConst(d->itemsById))
            item->setSelected(true);
        event->accept();
    } else if (event->key() == Qt::Key_Escape && event->modifiers() == Qt::NoModifier) {
        if (isConnectMode())
            setConnectMode(false);
        else
            clearSelection();
        event->accept();
    }
}

void KrBrickUserScene::mousePressEvent(QGraphicsSceneMouseEvent* event)
{
    if (event->button() == Qt::LeftButton && (event->modifiers() & Qt::ShiftModifier)) {
        if (items(event->scenePos()).size() <= 1) {
            setConnectMode(false);
            return;
        }
    }
    if (event->button() == Qt::LeftButton) {
        if (event->modifiers() & Qt::ControlModifier) {
            if (d->view)
                d->view->setDragMode(QGraphicsView::ScrollHandDrag);
            return;
        }
        if (!(event->modifiers() & Qt::ShiftModifier) && d->connectMode)
            setConnectMode(false);
        QGraphicsScene::mousePressEvent(event);
        return;
    }
    // Other buttons never change the selection.
    event->accept();
}

void KrBrickUserScene::mouseMoveEvent(QGraphicsSceneMouseEvent* event)
{
    if (d->connectMode)
        drawTemporaryWire(event->scenePos(), false);
    QGraphicsScene::mouseMoveEvent(event);
}

void KrBrickUserScene::mouseReleaseEvent(QGraphicsSceneMouseEvent* event)
{
    if (d->view)
        d->view->setDragMode(QGraphicsView::RubberBandDrag);
    if (d->connectMode) {
        // The plug that started connect mode still lets go of the mouse; nothing else sees
        // the release, so the selection stays.
        QGraphicsItem* grabber = mouseGrabberItem();
        while (grabber && !qgraphicsitem_cast<KrConnectorItem*>(grabber))
            grabber = grabber->parentItem();
        if (grabber)
            QGraphicsScene::mouseReleaseEvent(event);
        else
            event->ignore();
        return;
    }
    QGraphicsScene::mouseReleaseEvent(event);
}

// ------------------------------------------------------------------------------ undo items

KrBrickSceneUndoItem::KrBrickSceneUndoItem(KrBrickUserScene* scene) : scene(scene)
{
    if (scene)
        scene->registerUndoItem(this);
}

KrBrickSceneUndoItem::~KrBrickSceneUndoItem()
{
    if (scene)
        scene->unregisterUndoItem(this);
}

int KrBrickSceneUndoItem::size() const
{
    return 4;
}

KrBrickDeleteUndoItem::KrBrickDeleteUndoItem(KrShaderBrick* brick, KrBrickUserScene* scene)
    : KrBrickSceneUndoItem(scene), brick(brick), brickId(brick ? brick->getBrickID() : 0)
{
    if (brick)
        brick->ref();
}

KrBrickDeleteUndoItem::~KrBrickDeleteUndoItem()
{
    if (brick)
        brick->unref();
}

int KrBrickDeleteUndoItem::size() const
{
    return 12;
}

void KrBrickDeleteUndoItem::restoreBrick()
{
    if (!scene || !brick)
        return;
    IKrBrickUser* user = scene->getBrickUser();
    if (!user || user->findBrick(brick->getBrickID()) == brick)
        return;
    const KrSettings* settings = brick->getBrickSettings();
    const QPointF pos(settings->getFloatValue(kPosX, 0.0), settings->getFloatValue(kPosY, 0.0));
    scene->fileBrick(brick, pos, brickId);
}

void KrBrickDeleteUndoItem::takeBrick()
{
    if (!scene || !brick)
        return;
    brickId = brick->getBrickID();
    KrBrickGraphicsItem* item = scene->findBrick(brickId);
    if (item && item->getBrick() == brick) {
        scene->removeBrickItem(item);
        return;
    }
    IKrBrickUser* user = scene->getBrickUser();
    if (user && user->findBrick(brickId) == brick)
        user->takeBrick(brick);
}

void KrBrickDeleteUndoItem::undo()
{
    restoreBrick();
}

void KrBrickDeleteUndoItem::redo()
{
    takeBrick();
}

KrBrickAddedUndoItem::KrBrickAddedUndoItem(KrShaderBrick* brick, KrBrickUserScene* scene)
    : KrBrickDeleteUndoItem(brick, scene)
{
}

void KrBrickAddedUndoItem::undo()
{
    takeBrick();
}

void KrBrickAddedUndoItem::redo()
{
    restoreBrick();
}

KrConnectionRemovedItem::KrConnectionRemovedItem(KrBrickUserScene* scene, uint brickId,
                                                 uint srcBrickId, int paramIndex, int srcParamIndex)
    : KrBrickSceneUndoItem(scene), brickId(brickId), srcBrickId(srcBrickId), paramIndex(paramIndex),
      srcParamIndex(srcParamIndex)
{
}

int KrConnectionRemovedItem::size() const
{
    return 24;
}

void KrConnectionRemovedItem::connect()
{
    IKrBrickUser* user = scene ? scene->getBrickUser() : nullptr;
    KrShaderBrick* brick = user ? user->findBrick(brickId) : nullptr;
    KrShaderBrick* source = user ? user->findBrick(srcBrickId) : nullptr;
    if (brick && source)
        brick->addConnection(paramIndex, source, srcParamIndex);
}

void KrConnectionRemovedItem::disconnect()
{
    IKrBrickUser* user = scene ? scene->getBrickUser() : nullptr;
    KrShaderBrick* brick = user ? user->findBrick(brickId) : nullptr;
    KrShaderBrick* source = user ? user->findBrick(srcBrickId) : nullptr;
    KrBrickParam* param = brick ? brick->getParameter(paramIndex) : nullptr;
    KrBrickParam* sourceParam = source ? source->getParameter(srcParamIndex) : nullptr;
    if (param && sourceParam)
        param->removeConnection(sourceParam);
}

void KrConnectionRemovedItem::undo()
{
    connect();
}

void KrConnectionRemovedItem::redo()
{
    disconnect();
}

KrConnectionAddedItem::KrConnectionAddedItem(KrBrickUserScene* scene, uint brickId, uint srcBrickId,
                                             int paramIndex, int srcParamIndex)
    : KrConnectionRemovedItem(scene, brickId, srcBrickId, paramIndex, srcParamIndex)
{
}

void KrConnectionAddedItem::undo()
{
    disconnect();
}

void KrConnectionAddedItem::redo()
{
    connect();
}

KrBrickLayoutUndoItem::KrBrickLayoutUndoItem(KrBrickUserScene* scene) : KrBrickSceneUndoItem(scene)
{
}

KrBrickLayoutUndoItem::~KrBrickLayoutUndoItem() = default;

int KrBrickLayoutUndoItem::size() const
{
    return int(sizeof(*this)) + m_changes.size() * int(sizeof(Change) + sizeof(uint));
}

void KrBrickLayoutUndoItem::addPosition(uint id, const QPointF& before, const QPointF& after)
{
    Change& change = m_changes[id];
    change.pos[0] = before;
    change.pos[1] = after;
    change.hasPos = true;
}

void KrBrickLayoutUndoItem::addSize(uint id, const QSize& before, const QSize& after)
{
    Change& change = m_changes[id];
    change.size[0] = before;
    change.size[1] = after;
    change.hasSize = true;
}

void KrBrickLayoutUndoItem::addDepth(uint id, qreal before, qreal after)
{
    Change& change = m_changes[id];
    change.z[0] = before;
    change.z[1] = after;
    change.hasZ = true;
}

void KrBrickLayoutUndoItem::setDirection(bool before, bool after)
{
    m_direction[0] = before;
    m_direction[1] = after;
    m_hasDirection = true;
}

bool KrBrickLayoutUndoItem::isEmpty() const
{
    return m_changes.isEmpty() && !m_hasDirection;
}

void KrBrickLayoutUndoItem::apply(bool after)
{
    if (!scene)
        return;
    const int i = after ? 1 : 0;
    IKrBrickUser* user = scene->getBrickUser();
    scene->beginBulkLayout();
    for (auto it = m_changes.cbegin(); it != m_changes.cend(); ++it) {
        const Change& change = it.value();
        KrBrickGraphicsItem* item = scene->findBrick(it.key());
        KrShaderBrick* brick = item ? item->getBrick() : user ? user->findBrick(it.key()) : nullptr;
        if (change.hasPos) {
            if (item) {
                item->setPos(change.pos[i]);
            } else if (brick) {
                brick->getBrickSettings()->setFloatValue(kPosX, change.pos[i].x());
                brick->getBrickSettings()->setFloatValue(kPosY, change.pos[i].y());
            }
        }
        if (change.hasSize) {
            if (item && item->getFrame()) {
                item->getFrame()->resize(change.size[i]);
            } else if (brick) {
                brick->getBrickSettings()->setIntValue(kWidth, change.size[i].width());
                brick->getBrickSettings()->setIntValue(kHeight, change.size[i].height());
            }
        }
        if (change.hasZ && item)
            item->setZValue(change.z[i]);
    }
    scene->endBulkLayout();
    if (m_hasDirection)
        scene->applyDirection(m_direction[i]);
}

void KrBrickLayoutUndoItem::undo()
{
    apply(false);
}

void KrBrickLayoutUndoItem::redo()
{
    apply(true);
}
