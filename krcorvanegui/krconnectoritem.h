#pragma once

#include <QColor>
#include <QGraphicsPathItem>
#include <QGraphicsRectItem>
#include <QObject>
#include <QPainterPath>
#include <memory>

class KrBrickGraphicsItem;
class KrBrickParam;
class KrBrickUserScene;
class KrConnectorItem;
class QGraphicsEllipseItem;
class QGraphicsPolygonItem;
class QGraphicsSimpleTextItem;

// A wire between two plugs, or the dashed wire of a connection being made. Its pen keeps the
// width it was given at 100 % and more; zoomed out, it stays at least that many pixels wide so
// that a network seen as a whole still shows its wires.
class KrWireItem : public QGraphicsPathItem
{
public:
    enum
    {
        Type = UserType + 0x4b31
    };

    explicit KrWireItem(QGraphicsItem* parent = nullptr);
    ~KrWireItem() override;

    int type() const override { return Type; }
    void paint(QPainter* painter, const QStyleOptionGraphicsItem* option,
               QWidget* widget = nullptr) override;

    // The input plug owning this wire; told when the wire is deleted by someone else (the
    // scene, when it goes first).
    KrConnectorItem* getOwner() const { return m_owner; }
    void setOwner(KrConnectorItem* owner) { m_owner = owner; }

    // The horizontal S-curve from b to a: it leaves b going right and enters a from the left.
    // b and the first control point are taken at whole units; a is reached exactly.
    static QPainterPath curve(const QPointF& b, const QPointF& a);

private:
    KrConnectorItem* m_owner = nullptr;
};

// The plug of one brick parameter at the edge of its brick item. An input plug owns the wire
// from the output that feeds it.
class KrConnectorItem : public QObject, public QGraphicsRectItem
{
    Q_OBJECT
public:
    enum
    {
        Type = UserType + 0x4b32
    };

    KrConnectorItem(KrBrickParam* param, KrBrickGraphicsItem* brickItem, int size);
    ~KrConnectorItem() override;

    int type() const override { return Type; }

    // D, the plug's diameter: 0.82 times the plug size.
    static float plugDiameter(int size);
    // White on dark colours (mean of red, green and blue 127 or less), black on light ones.
    static QColor labelColor(const QColor& color);
    // The default colour of an output plug: made from the parameter's argument name and its
    // brick's id, kept apart from the window colour.
    static QColor generatedColor(const KrBrickParam* param, const QColor& window);
    // The colour that marks a value type ("float", "color", "point", ...) on plugs.
    static QColor typeColor(const QString& typeLabel);

    KrBrickGraphicsItem* getBrickItem() const;
    KrBrickUserScene* getBrickScene() const;
    // Inputs: the output plug feeding this one, or null.
    KrConnectorItem* getTarget() const;
    // Inputs: the wire (hidden while there is no target); null for outputs.
    KrWireItem* getWire() const;
    QGraphicsEllipseItem* getPlugCircle() const;
    QGraphicsPolygonItem* getArrowHead() const;
    bool isOutput() const;
    int getSize() const;

    // Whether a drag of source may end on this plug.
    bool acceptsParam(KrBrickParam* source) const;

    // Called by the wire when it is deleted before its plug.
    void wireDestroyed(KrWireItem* wire);
    // Puts the wire into the scene the plug is in now (its brick item may have left it).
    void syncWireScene();

signals:
    void movedInScene();
    void colorChanged();

public slots:
    void updatePath();
    QColor getColor();
    void setColor(QColor color);
    void setColorSettings();
    void getColorSettings(QColor& color);
    QPointF getConnectPoint();
    QGraphicsSimpleTextItem* getTextItem();
    KrBrickParam* getParam();
    void removeConnection();
    void updateConnections();
    void disconnectParam();

private slots:
    void createConnectionInternal(KrConnectorItem* item);
    void targetDestoyed();
    void changeColor();
    void updateText();

protected:
    void contextMenuEvent(QGraphicsSceneContextMenuEvent* event) override;
    void mousePressEvent(QGraphicsSceneMouseEvent* event) override;
    void mouseMoveEvent(QGraphicsSceneMouseEvent* event) override;
    void mouseReleaseEvent(QGraphicsSceneMouseEvent* event) override;
    void dragEnterEvent(QGraphicsSceneDragDropEvent* event) override;
    void dragMoveEvent(QGraphicsSceneDragDropEvent* event) override;
    void dropEvent(QGraphicsSceneDragDropEvent* event) override;
    bool sceneEventFilter(QGraphicsItem* watched, QEvent* event) override;
    QVariant itemChange(GraphicsItemChange change, const QVariant& value) override;

private:
    void applyPlugColor(const QColor& color);
    void detachTarget();
    QList<KrConnectorItem*> feedingPlugs() const;

    struct Private;
    std::unique_ptr<Private> d;
};
