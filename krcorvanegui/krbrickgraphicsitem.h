#pragma once

#include <QEvent>
#include <QGraphicsProxyWidget>
#include <QList>
#include <memory>

class KrBrickFrame;
class KrBrickParam;
class KrBrickUserScene;
class KrConnectorItem;
class KrPreviewButton;
class KrShaderBrick;
class QPushButton;

// Posted to a brick item to rebuild its plugs once, however many requests came meanwhile.
class KrUpdateConnectorEvent : public QEvent
{
public:
    KrUpdateConnectorEvent();
    static QEvent::Type eventType();
};

// Posted to a brick item to put its plugs back at their parameters' rows.
class KrUpdatePositionEvent : public QEvent
{
public:
    KrUpdatePositionEvent();
    static QEvent::Type eventType();
};

// One brick in a brick scene: the brick's frame embedded as a widget, a plug per parameter
// that can be wired, and the preview area above the frame. The brick's position and size are
// kept in its own settings record.
class KrBrickGraphicsItem : public QGraphicsProxyWidget
{
    Q_OBJECT
public:
    KrBrickGraphicsItem(KrShaderBrick* brick, KrBrickUserScene* scene,
                        QGraphicsItem* parent = nullptr, Qt::WindowFlags flags = {});
    ~KrBrickGraphicsItem() override;

    KrBrickUserScene* getBrickScene() const;
    // The plugs in parameter order.
    QList<KrConnectorItem*> getConnectors() const;
    KrPreviewButton* getPreviewWidget() const;
    QPushButton* getPreviewToggle() const;
    QGraphicsProxyWidget* getPreviewProxy() const;
    QGraphicsProxyWidget* getToggleProxy() const;
    // How many times the plugs were rebuilt; bursts of requests count once.
    int getConnectorRebuildCount() const;

    // Where the plug of param sits, in this item's coordinates.
    QPointF plugPosition(KrBrickParam* param, const KrConnectorItem* plug) const;

    // Below this scale the frame is drawn as a plain box: its text could not be read.
    static qreal widgetDetailThreshold();

    QRectF boundingRect() const override;
    void paint(QPainter* painter, const QStyleOptionGraphicsItem* option,
               QWidget* widget = nullptr) override;

public slots:
    bool isRightToLeft();
    void setOutputIsRightToLeft(bool onOff);
    KrConnectorItem* getConnector(int i);
    KrShaderBrick* getBrick();
    void clearConections();
    KrBrickFrame* getFrame();
    void setPositionSettings();
    void doConnections();
    void clearConnectorItems();
    void previewSizeChanged();
    void previewHideClicked();

private slots:
    void positionItems();
    KrConnectorItem* buildItem(KrBrickParam* param, bool rightSide);
    void close();
    void updateSize();
    void readSettings();

protected:
    bool event(QEvent* event) override;
    QVariant itemChange(GraphicsItemChange change, const QVariant& value) override;
    void mousePressEvent(QGraphicsSceneMouseEvent* event) override;
    void mouseMoveEvent(QGraphicsSceneMouseEvent* event) override;
    void mouseReleaseEvent(QGraphicsSceneMouseEvent* event) override;

private:
    void createFrame();
    void createPreview();
    void placePreview();
    void rebuildConnectors();
    void placeConnectors();
    void paramConnectionChange(KrBrickParam* param);
    bool wantsPlug(KrBrickParam* param, bool hideAdvanced) const;
    void selectOnPress(Qt::KeyboardModifiers modifiers);
    void paintOutline(QPainter* painter, qreal lod);

    struct Private;
    std::unique_ptr<Private> d;
};
