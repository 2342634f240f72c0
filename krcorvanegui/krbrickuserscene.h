#pragma once

#include "krundo.h"

#include <QAbstractItemModel>
#include <QGraphicsScene>
#include <QHash>
#include <QMap>
#include <QPointF>
#include <QSize>
#include <QVector>
#include <functional>
#include <memory>

class IKrBrickUser;
class KrBrickFactory;
class KrBrickGraphicsItem;
class KrBrickParam;
class KrBrickLayoutUndoItem;
class KrBrickSceneUndoItem;
class KrConnectorItem;
class KrCorvaneDockWidget;
class KrShaderBrick;
class QGraphicsPathItem;
class QGraphicsPolygonItem;
class QGraphicsView;

// A table of rows of columns of role maps, filled from the item-view drag data of the
// library tree so that a drop can be read without the tree's own model.
class KrItemModelReader : public QAbstractItemModel
{
    Q_OBJECT
public:
    explicit KrItemModelReader(QObject* parent = nullptr);
    ~KrItemModelReader() override;

    QModelIndex index(int row, int column,
                      const QModelIndex& parent = QModelIndex()) const override;
    QModelIndex parent(const QModelIndex& child) const override;
    int rowCount(const QModelIndex& parent = QModelIndex()) const override;
    int columnCount(const QModelIndex& parent = QModelIndex()) const override;
    QVariant data(const QModelIndex& index, int role = Qt::DisplayRole) const override;
    bool setData(const QModelIndex& index, const QVariant& value, int role = Qt::EditRole) override;
    bool insertRows(int row, int count, const QModelIndex& parent = QModelIndex()) override;
    bool insertColumns(int column, int count, const QModelIndex& parent = QModelIndex()) override;

    // Reads the drag data; false when it carries no item-view rows.
    bool read(const QMimeData* data);
    // The format of the toolkit's item-view drag data.
    static QString itemViewFormat();

private:
    QVector<QVector<QMap<int, QVariant>>> m_rows;
    // Columns inserted while there were no rows yet.
    int m_columns = 0;
};

// The graphics scene of one brick user: an item per brick, plugs and wires, the temporary wire
// of a connection being made, and every edit of the network as an undo step.
class KrBrickUserScene : public QGraphicsScene
{
    Q_OBJECT
public:
    KrBrickUserScene(IKrBrickUser* brickUser, QGraphicsView* view, KrCorvaneDockWidget* dockWindow);
    ~KrBrickUserScene() override;

    IKrBrickUser* getBrickUser() const;
    QGraphicsView* getView() const;
    KrCorvaneDockWidget* getDockWindow() const;
    // The items by brick id.
    const QMap<uint, KrBrickGraphicsItem*>& getItemsById() const;
    QList<KrBrickGraphicsItem*> getSelectedBricks() const;
    QGraphicsPathItem* getWireItem() const;
    QGraphicsPolygonItem* getArrowItem() const;
    QGraphicsItem* getFocusHolder() const;
    QPointF getLastMenuPos() const;
    void setLastMenuPos(const QPointF& pos);

    // Files the brick with the brick user and shows it at pos (never left of x = 10 or above
    // y = 10). A brick that was not in the brick user yet makes an undo step "Add Brick".
    // Null when the brick user refuses the brick.
    KrBrickGraphicsItem* addBrickAt(KrShaderBrick* brick, const QPointF& pos);
    // The same at the position kept in the brick's settings.
    KrBrickGraphicsItem* addItemForBrick(KrShaderBrick* brick);
    // Removes the brick and its item as one undo step "Brick delete...".
    void removeBrickItem(KrBrickGraphicsItem* item);

    // Wires a and b (either may be the input) as one undo step "Brick Connection...". An input
    // that had another source loses it in the same step. False when the model refuses the
    // pair or they are wired already.
    bool connectParameters(KrBrickParam* a, KrBrickParam* b);
    // Removes every wire of param as one undo step "Brick Disconnect...". False when it had none.
    bool disconnectParameter(KrBrickParam* param);

    // One undo step per gesture: begin records where the selected bricks (and item) are; end
    // pushes "Move Bricks" when any moved. While a title bar drag of leader is under way, the
    // other selected bricks follow it.
    void beginBrickMove(KrBrickGraphicsItem* item, bool othersFollow);
    void endBrickMove();
    bool isMoveLeader(const KrBrickGraphicsItem* item) const;
    void moveFollowers(KrBrickGraphicsItem* leader, const QPointF& delta);
    void beginBrickResize(KrBrickGraphicsItem* item);
    void endBrickResize(KrBrickGraphicsItem* item);

    // Positions and layout without undo, for the undo items.
    void applyDirection(bool rightToLeft);
    // Bricks moved between begin and end have their wires redrawn once, at the end.
    void beginBulkLayout();
    void endBulkLayout();
    bool isBulkLayout() const;
    void noteBulkMove(KrBrickGraphicsItem* item);

    void registerUndoItem(KrBrickSceneUndoItem* item);
    void unregisterUndoItem(KrBrickSceneUndoItem* item);
    int getNumUndoItems() const;

    static QPointF clampPosition(const QPointF& pos);

public slots:
    bool isRightToLeft();
    void setIsRightToLeft(bool onOff);
    void flipBricksAboutCenter();
    KrBrickGraphicsItem* findBrick(uint id);
    void followPathStart(QPointF pos, bool isOutPut);
    void followPathEnd();
    void updateBricks();
    void autoArrange();
    // Lays the bricks out as autoArrange() does, but as part of setting a window up: no step.
    void arrange();
    void arrangeChildren(KrShaderBrick* brick, int xOffset, int yOffset, int& yMax);
    bool isConnectMode();
    void setConnectMode(bool onOff, KrConnectorItem* item = nullptr, QPointF pos = QPointF(),
                        bool isOut = false);
    KrConnectorItem* getConnectionItem();

private slots:
    void brickIDChanged(int oldId);
    void addBrick(const KrBrickFactory& brick);
    void deleteSelected();
    void toFront();
    void toBack();
    void toGroup();
    void addjustDepth(float sel, float unsel);
    void brickRemoved(KrShaderBrick* brick);

protected:
    void contextMenuEvent(QGraphicsSceneContextMenuEvent* event) override;
    void dragEnterEvent(QGraphicsSceneDragDropEvent* event) override;
    void dragMoveEvent(QGraphicsSceneDragDropEvent* event) override;
    void dragLeaveEvent(QGraphicsSceneDragDropEvent* event) override;
    void dropEvent(QGraphicsSceneDragDropEvent* event) override;
    void keyPressEvent(QKeyEvent* event) override;
    void mousePressEvent(QGraphicsSceneMouseEvent* event) override;
    void mouseMoveEvent(QGraphicsSceneMouseEvent* event) override;
    void mouseReleaseEvent(QGraphicsSceneMouseEvent* event) override;

private:
    KrBrickGraphicsItem* fileBrick(KrShaderBrick* brick, const QPointF& pos, uint wantedId);
    void takeOutItem(KrBrickGraphicsItem* item, bool record);
    void drawTemporaryWire(const QPointF& pointer, bool withArrow);
    KrShaderBrick* factoryBrickOfDrag(const QMimeData* data, bool acceptedOnly);
    // Runs change and records what it did to the bricks' positions and depths as one step.
    KrBrickLayoutUndoItem* layoutAsStep(const QString& text, const std::function<void()>& change);
    void flipPositions();
    void flushPostedWork();

    friend class KrBrickDeleteUndoItem;
    friend class KrBrickLayoutUndoItem;

    struct Private;
    std::unique_ptr<Private> d;
};

// Undo items of a brick scene. They name bricks by id, so they still work after the scene's
// items were rebuilt, and do nothing once their scene is gone.
class KrBrickSceneUndoItem : public KrUndoItem
{
public:
    explicit KrBrickSceneUndoItem(KrBrickUserScene* scene);
    ~KrBrickSceneUndoItem() override;
    int size() const override;

    KrBrickUserScene* getScene() const { return scene; }
    // Called by the scene as it goes.
    void forgetScene() { scene = nullptr; }

protected:
    KrBrickUserScene* scene;
};

// A brick taken out of the scene. Holds a reference, so undo brings the same brick back, at the
// position and with the id it had.
class KrBrickDeleteUndoItem : public KrBrickSceneUndoItem
{
public:
    KrBrickDeleteUndoItem(KrShaderBrick* brick, KrBrickUserScene* scene);
    ~KrBrickDeleteUndoItem() override;
    void undo() override;
    void redo() override;
    int size() const override;

    KrShaderBrick* getBrick() const { return brick; }
    uint getBrickId() const { return brickId; }

protected:
    void restoreBrick();
    void takeBrick();

    KrShaderBrick* brick;
    uint brickId;
};

// A brick added to the scene (from the library, the menu, a drop, or a new group).
class KrBrickAddedUndoItem : public KrBrickDeleteUndoItem
{
public:
    KrBrickAddedUndoItem(KrShaderBrick* brick, KrBrickUserScene* scene);
    void undo() override;
    void redo() override;
};

// A wire taken away: the input parameterIndex of brickId fed by srcParamIndex of srcBrickId.
class KrConnectionRemovedItem : public KrBrickSceneUndoItem
{
public:
    KrConnectionRemovedItem(KrBrickUserScene* scene, uint brickId, uint srcBrickId, int paramIndex,
                            int srcParamIndex);
    void undo() override;
    void redo() override;
    int size() const override;

protected:
    void connect();
    void disconnect();

    uint brickId;
    uint srcBrickId;
    int paramIndex;
    int srcParamIndex;
};

class KrConnectionAddedItem : public KrConnectionRemovedItem
{
public:
    KrConnectionAddedItem(KrBrickUserScene* scene, uint brickId, uint srcBrickId, int paramIndex,
                          int srcParamIndex);
    void undo() override;
    void redo() override;
};

// Positions, frame sizes, depths and the flow direction of bricks before and after a move,
// a resize, an arrangement, a flip or a change of depth.
class KrBrickLayoutUndoItem : public KrBrickSceneUndoItem
{
public:
    explicit KrBrickLayoutUndoItem(KrBrickUserScene* scene);
    ~KrBrickLayoutUndoItem() override;
    void undo() override;
    void redo() override;
    int size() const override;

    void addPosition(uint id, const QPointF& before, const QPointF& after);
    void addSize(uint id, const QSize& before, const QSize& after);
    void addDepth(uint id, qreal before, qreal after);
    void setDirection(bool before, bool after);
    bool isEmpty() const;

private:
    void apply(bool after);

    struct Change
    {
        QPointF pos[2];
        QSize size[2];
        qreal z[2] = {0, 0};
        bool hasPos = false;
        bool hasSize = false;
        bool hasZ = false;
    };
    QMap<uint, Change> m_changes;
    bool m_hasDirection = false;
    bool m_direction[2] = {true, true};
};
