#include "krbrickgraphicsitem.h"

#include "krbrickframe.h"
#include "krbrickoptionsframe.h"
#include "krbrickparam.h"
#include "krbrickuserscene.h"
#include "krconnectoritem.h"
#include "krcorvaneplugin.h"
#include "krpreviewnode.h"
#include "krsettings.h"
#include "krshaderbrick.h"

#include <QApplication>
#include <QCoreApplication>
#include <QGraphicsScene>
#include <QGraphicsSceneMouseEvent>
#include <QMap>
#include <QPainter>
#include <QPointer>
#include <QPushButton>
#include <QStyleOptionGraphicsItem>

namespace {
const QString kPosX = QStringLiteral("PosX");
const QString kPosY = QStringLiteral("PosY");
const QString kWidth = QStringLiteral("Width");
const QString kHeight = QStringLiteral("Height");
const qreal kMinPos = 10;
// Scale under which embedded widgets are drawn as boxes (their text would be a few pixels).
const qreal kWidgetDetail = 0.35;
// Room around the frame for the selection outline.
const qreal kOutlineMargin = 2;

qreal lodOf(const QPainter* painter, const QStyleOptionGraphicsItem* option)
{
    return option->levelOfDetailFromTransform(painter->worldTransform());
}

// A child proxy (preview area, preview toggle) that is drawn as a plain box when it is too
// small to read.
class KrDetailProxy : public QGraphicsProxyWidget
{
public:
    explicit KrDetailProxy(QGraphicsItem* parent) : QGraphicsProxyWidget(parent) {}
    void paint(QPainter* painter, const QStyleOptionGraphicsItem* option, QWidget* widget) override
    {
        if (lodOf(painter, option) >= kWidgetDetail) {
            QGraphicsProxyWidget::paint(painter, option, widget);
            return;
        }
        const QPalette pal = this->widget() ? this->widget()->palette() : palette();
        painter->save();
        QPen border(pal.color(QPalette::Mid));
        border.setCosmetic(true);
        painter->setPen(border);
        painter->setBrush(pal.brush(QPalette::Button));
        painter->drawRect(rect());
        painter->restore();
    }
};

int registeredType(bool connector)
{
    const KrBrickItemEventTypes& types = krBrickItemEventTypes();
    int type = connector ? types.updateConnector : types.updatePosition;
    if (type <= 0) {
        // Not yet registered by the library record (a program linking the items directly).
        static const int fallbackConnector = QEvent::registerEventType();
        static const int fallbackPosition = QEvent::registerEventType();
        type = connector ? fallbackConnector : fallbackPosition;
    }
    return type;
}
} // namespace

KrUpdateConnectorEvent::KrUpdateConnectorEvent() : QEvent(eventType()) {}

QEvent::Type KrUpdateConnectorEvent::eventType()
{
    return QEvent::Type(registeredType(true));
}

KrUpdatePositionEvent::KrUpdatePositionEvent() : QEvent(eventType()) {}

QEvent::Type KrUpdatePositionEvent::eventType()
{
    return QEvent::Type(registeredType(false));
}

struct KrBrickGraphicsItem::Private
{
    QPointer<KrShaderBrick> brick;
    QPointer<KrBrickUserScene> scene;
    QPointer<KrBrickFrame> frame;
    QMap<int, KrConnectorItem*> connectors;
    KrDetailProxy* previewProxy = nullptr;
    KrPreviewButton* previewWidget = nullptr;
    QPushButton* previewToggle = nullptr;
    KrDetailProxy* toggleProxy = nullptr;
    QList<QPointer<KrBrickParam>> watchedParams;
    // The layout direction when the frame has no option widget to keep it.
    bool rightToLeft = true;
    bool connectorUpdatePending = false;
    bool positionUpdatePending = false;
    int rebuildCount = 0;
    QPointF lastPos;
    // The brick itself is being dragged (a press that no embedded widget took).
    bool itemDrag = false;

    KrBrickOptionsFrame* options() const { return frame ? frame->getOptionFrame() : nullptr; }
    KrSettings* settings() const { return brick ? brick->getBrickSettings() : nullptr; }
};

KrBrickGraphicsItem::KrBrickGraphicsItem(KrShaderBrick* brick, KrBrickUserScene* scene,
                                         QGraphicsItem* parent, Qt::WindowFlags flags)
    : QGraphicsProxyWidget(parent, flags), d(new Private)
{
    setAcceptDrops(true);
    d->brick = brick;
    d->scene = scene;
    createFrame();
    setFlag(ItemIsSelectable);
    setFlag(ItemIsMovable);
    createPreview();

    if (brick) {
        connect(brick, &KrShaderBrick::paramAdded, this, &KrBrickGraphicsItem::doConnections);
        connect(brick, &KrShaderBrick::paramRemoved, this, &KrBrickGraphicsItem::doConnections);
    }
    if (KrBrickOptionsFrame* options = d->options()) {
        connect(options, &KrBrickOptionsFrame::hideAdvancedChanged, this,
                &KrBrickGraphicsItem::doConnections);
        // The option widget laid its rows out anew: the plugs follow their rows.
        connect(options, &KrBrickOptionsFrame::updateConnections, this,
                &KrBrickGraphicsItem::positionItems);
    }
    if (KrBrickFrame* frame = d->frame) {
        connect(frame, &KrBrickFrame::resized, this, &KrBrickGraphicsItem::positionItems);
        connect(frame, &KrBrickFrame::resized, this, &KrBrickGraphicsItem::updateSize);
        connect(frame, &KrBrickFrame::closeClicked, this, &KrBrickGraphicsItem::close);
        connect(frame, &KrBrickFrame::moveStarted, this, [this] {
            if (d->scene)
                d->scene->beginBrickMove(this, true);
        });
        connect(frame, &KrBrickFrame::moveFinished, this, [this] {
            if (d->scene)
                d->scene->endBrickMove();
        });
        connect(frame, &KrBrickFrame::resizeStarted, this, [this] {
            if (d->scene)
                d->scene->beginBrickResize(this);
        });
        connect(frame, &KrBrickFrame::resizeFinished, this, [this] {
            if (d->scene)
                d->scene->endBrickResize(this);
        });
    }
    readSettings();
    doConnections();
    setZValue(9);
}

KrBrickGraphicsItem::~KrBrickGraphicsItem()
{
    // Nothing may call back into this item while its parts go.
    if (d->frame) {
        disconnect(d->frame, nullptr, this, nullptr);
        if (KrBrickOptionsFrame* options = d->options())
            disconnect(options, nullptr, this, nullptr);
    }
    if (d->brick)
        disconnect(d->brick, nullptr, this, nullptr);
    for (const QPointer<KrBrickParam>& param : qAsConst(d->watchedParams)) {
        if (param)
            disconnect(param, nullptr, this, nullptr);
    }
    if (d->previewToggle)
        disconnect(d->previewToggle, nullptr, this, nullptr);
    if (d->previewWidget)
        disconnect(d->previewWidget, nullptr, this, nullptr);
    clearConnectorItems();
}

// The one place that makes the embedded frame.
void KrBrickGraphicsItem::createFrame()
{
    auto* frame = new KrBrickFrame(d->brick, this, nullptr);
    d->frame = frame;
    setWidget(frame);
}

void KrBrickGraphicsItem::createPreview()
{
    d->previewWidget = new KrPreviewButton(nullptr);
    d->previewProxy = new KrDetailProxy(this);
    d->previewProxy->setWidget(d->previewWidget);
    d->previewProxy->setPos(0, -d->previewWidget->height());
    d->previewProxy->setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Expanding);
    d->previewProxy->setZValue(-2);
    d->previewProxy->setFlag(ItemStacksBehindParent);

    d->previewToggle = new QPushButton(QStringLiteral("Preview..."));
    d->previewToggle->setCheckable(true);
    d->previewToggle->setChecked(true);
    connect(d->previewToggle, &QPushButton::toggled, this,
            &KrBrickGraphicsItem::previewHideClicked);
    d->toggleProxy = new KrDetailProxy(this);
    d->toggleProxy->setWidget(d->previewToggle);
    d->toggleProxy->setZValue(-1);
    d->toggleProxy->setFlag(ItemStacksBehindParent);

    // Starts hidden.
    d->previewToggle->toggle();
    const int type = d->brick ? d->brick->type() : 0;
    if (type == 2 || type == 8)
        d->previewToggle->setEnabled(false);
    connect(d->previewWidget, &KrPreviewButton::sizeChanged, this,
            &KrBrickGraphicsItem::previewSizeChanged);
    // The button finds its height once polished.
    connect(d->toggleProxy, &QGraphicsWidget::geometryChanged, this,
            &KrBrickGraphicsItem::placePreview);
    placePreview();
}

KrBrickUserScene* KrBrickGraphicsItem::getBrickScene() const
{
    return d->scene;
}

QList<KrConnectorItem*> KrBrickGraphicsItem::getConnectors() const
{
    return d->connectors.values();
}

KrPreviewButton* KrBrickGraphicsItem::getPreviewWidget() const
{
    return d->previewWidget;
}

QPushButton* KrBrickGraphicsItem::getPreviewToggle() const
{
    return d->previewToggle;
}

QGraphicsProxyWidget* KrBrickGraphicsItem::getPreviewProxy() const
{
    return d->previewProxy;
}

QGraphicsProxyWidget* KrBrickGraphicsItem::getToggleProxy() const
{
    return d->toggleProxy;
}

int KrBrickGraphicsItem::getConnectorRebuildCount() const
{
    return d->rebuildCount;
}

qreal KrBrickGraphicsItem::widgetDetailThreshold()
{
    return kWidgetDetail;
}

bool KrBrickGraphicsItem::isRightToLeft()
{
    if (KrBrickOptionsFrame* options = d->options())
        return options->isRightToLeft();
    return d->rightToLeft;
}

void KrBrickGraphicsItem::setOutputIsRightToLeft(bool onOff)
{
    d->rightToLeft = onOff;
    if (KrBrickOptionsFrame* options = d->options())
        options->setIsRightToLeft(onOff);
    doConnections();
}

KrConnectorItem* KrBrickGraphicsItem::getConnector(int i)
{
    return d->connectors.value(i, nullptr);
}

KrShaderBrick* KrBrickGraphicsItem::getBrick()
{
    return d->brick;
}

void KrBrickGraphicsItem::clearConections()
{
    // From the model rather than the plugs: a brick whose plugs are not built yet still
    // loses (and records) every wire.
    KrShaderBrick* brick = d->brick;
    if (!brick)
        return;
    for (int i = 0; i < brick->getNumParameters(); ++i) {
        KrBrickParam* param = brick->getParameter(i);
        if (!param || param->getNumConnections() < 1)
            continue;
        if (KrConnectorItem* plug = d->connectors.value(i))
            plug->disconnectParam();
        else if (d->scene)
            d->scene->disconnectParameter(param);
        else
            param->removeAllConnections();
    }
}

KrBrickFrame* KrBrickGraphicsItem::getFrame()
{
    return d->frame;
}

void KrBrickGraphicsItem::setPositionSettings()
{
    if (KrSettings* settings = d->settings()) {
        settings->setFloatValue(kPosX, pos().x());
        settings->setFloatValue(kPosY, pos().y());
    }
}

void KrBrickGraphicsItem::doConnections()
{
    if (d->connectorUpdatePending)
        return;
    d->connectorUpdatePending = true;
    QCoreApplication::postEvent(this, new KrUpdateConnectorEvent);
}

void KrBrickGraphicsItem::positionItems()
{
    if (d->positionUpdatePending)
        return;
    d->positionUpdatePending = true;
    QCoreApplication::postEvent(this, new KrUpdatePositionEvent);
}

void KrBrickGraphicsItem::clearConnectorItems()
{
    while (!d->connectors.isEmpty()) {
        KrConnectorItem* plug = d->connectors.take(d->connectors.firstKey());
        if (plug->scene())
            plug->scene()->removeItem(plug);
        delete plug;
    }
}

bool KrBrickGraphicsItem::wantsPlug(KrBrickParam* param, bool hideAdvanced) const
{
    if (!param)
        return false;
    const int direction = param->getDirection();
    if (direction != KrBrickParam::Input && direction != KrBrickParam::Output)
        return false;
    // A wired advanced parameter keeps its plug: its wire must end somewhere.
    return !(param->getIsAdvanced() && hideAdvanced && param->getNumConnections() < 1);
}

void KrBrickGraphicsItem::rebuildConnectors()
{
    d->connectorUpdatePending = false;
    ++d->rebuildCount;
    clearConnectorItems();
    for (const QPointer<KrBrickParam>& param : qAsConst(d->watchedParams)) {
        if (param)
            disconnect(param, nullptr, this, nullptr);
    }
    d->watchedParams.clear();
    KrShaderBrick* brick = d->brick;
    if (!brick)
        return;
    KrBrickOptionsFrame* options = d->options();
    const bool rightToLeft = isRightToLeft();
    const bool hideAdvanced = options ? options->hidesAdvanced() : true;
    for (QListIterator<KrBrickParam*> it = brick->getParameterIterator(); it.hasNext();) {
        KrBrickParam* param = it.next();
        if (!param)
            continue;
        d->watchedParams.append(param);
        connect(param, &KrBrickParam::connectionsChanged, this,
                [this, param] { paramConnectionChange(param); });
        connect(param, &KrBrickParam::advancedChanged, this, &KrBrickGraphicsItem::doConnections);
        if (!wantsPlug(param, hideAdvanced))
            continue;
        // The flag only mirrors the plug; placement decides its edge.
        const bool input = param->getDirection() == KrBrickParam::Input;
        const bool rightSide = input ? !rightToLeft : rightToLeft;
        if (KrConnectorItem* plug = buildItem(param, rightSide))
            d->connectors.insert(brick->findParameterIndex(param), plug);
    }
    placeConnectors();
}

KrConnectorItem* KrBrickGraphicsItem::buildItem(KrBrickParam* param, bool rightSide)
{
    KrBrickOptionsFrame* options = d->options();
    const int size = options ? options->getConnectorSize(param) : 20;
    auto* plug = new KrConnectorItem(param, this, size);
    if (rightSide) {
        plug->setTransform(QTransform::fromScale(-1, 1));
        QGraphicsSimpleTextItem* text = plug->getTextItem();
        const QPointF c = text->boundingRect().center();
        const float cx = float(c.x());
        const float cy = float(c.y());
        QTransform mirror;
        mirror.translate(cx, cy);
        mirror.scale(-1, 1);
        mirror.translate(-cx, -cy);
        text->setTransform(mirror);
    }
    plug->updateConnections();
    return plug;
}

void KrBrickGraphicsItem::paramConnectionChange(KrBrickParam* param)
{
    KrShaderBrick* brick = d->brick;
    if (!brick || !param)
        return;
    KrConnectorItem* plug = d->connectors.value(brick->findParameterIndex(param));
    KrBrickOptionsFrame* options = d->options();
    const bool hideAdvanced = options ? options->hidesAdvanced() : true;
    // An advanced parameter gains or loses its plug with its first or last wire.
    if ((plug != nullptr) != wantsPlug(param, hideAdvanced)) {
        doConnections();
        return;
    }
    if (plug)
        plug->updateConnections();
}

// The one place that decides where a plug goes.
QPointF KrBrickGraphicsItem::plugPosition(KrBrickParam* param, const KrConnectorItem* plug) const
{
    const QRectF bounds = plug ? plug->boundingRect() : QRectF();
    KrBrickOptionsFrame* options = d->options();
    if (options && !options->isHidden()) {
        const QPointF p = options->getParamPosition(param);
        if (p.x() >= 0 && p.y() >= 0)
            return QPointF(p.x(), p.y() - bounds.height() / 2);
    }
    // Parameters collapsed (or without a row): every plug at the middle of its edge.
    const QRect frameRect = d->frame ? d->frame->rect() : rect().toRect();
    const int middle = (frameRect.top() + frameRect.bottom()) / 2;
    const bool rightToLeft = const_cast<KrBrickGraphicsItem*>(this)->isRightToLeft();
    const bool input = param && param->isInput();
    const qreal x = input == rightToLeft ? frameRect.width() : 0;
    return QPointF(x, middle);
}

void KrBrickGraphicsItem::placeConnectors()
{
    d->positionUpdatePending = false;
    KrShaderBrick* brick = d->brick;
    if (!brick)
        return;
    for (auto it = d->connectors.cbegin(); it != d->connectors.cend(); ++it) {
        KrConnectorItem* plug = it.value();
        plug->setPos(plugPosition(plug->getParam(), plug));
        plug->updatePath();
    }
}

void KrBrickGraphicsItem::previewSizeChanged()
{
    // The button keeps its own square size; the area follows it.
    placePreview();
}

void KrBrickGraphicsItem::previewHideClicked()
{
    d->previewProxy->setVisible(d->previewToggle->isChecked());
    placePreview();
}

// The preview area right above the frame and the toggle half over its top edge; with the
// preview hidden, the toggle right above the frame.
void KrBrickGraphicsItem::placePreview()
{
    const int toggleHeight = d->previewToggle->height();
    if (d->previewToggle->isChecked()) {
        d->previewProxy->setPos(0, -d->previewWidget->height());
        d->toggleProxy->setPos(0, -d->previewWidget->height() - toggleHeight / 2);
    } else {
        d->toggleProxy->setPos(0, -toggleHeight);
    }
}

void KrBrickGraphicsItem::close()
{
    if (d->scene)
        d->scene->removeBrickItem(this);
}

void KrBrickGraphicsItem::updateSize()
{
    KrSettings* settings = d->settings();
    if (!settings || !d->frame)
        return;
    settings->setIntValue(kWidth, d->frame->width());
    settings->setIntValue(kHeight, d->frame->height());
}

void KrBrickGraphicsItem::readSettings()
{
    KrSettings* settings = d->settings();
    if (!settings)
        return;
    const qreal x = qMax(kMinPos, settings->getFloatValue(kPosX, 0.0));
    const qreal y = qMax(kMinPos, settings->getFloatValue(kPosY, 0.0));
    setPos(x, y);
    const int width = settings->getIntValue(kWidth, 0);
    const int height = settings->getIntValue(kHeight, 0);
    if (width >= 1 && height >= 1 && d->frame)
        d->frame->resize(width, height);
}

bool KrBrickGraphicsItem::event(QEvent* event)
{
    if (event->type() == KrUpdateConnectorEvent::eventType()) {
        // An item taken out of its scene waits for deletion; it has no plugs to show.
        if (scene())
            rebuildConnectors();
        else
            d->connectorUpdatePending = false;
        return true;
    }
    if (event->type() == KrUpdatePositionEvent::eventType()) {
        placeConnectors();
        return true;
    }
    return QGraphicsProxyWidget::event(event);
}

QVariant KrBrickGraphicsItem::itemChange(GraphicsItemChange change, const QVariant& value)
{
    switch (change) {
    case ItemPositionChange: {
        d->lastPos = pos();
        return QGraphicsProxyWidget::itemChange(change,
                                                KrBrickUserScene::clampPosition(value.toPointF()));
    }
    case ItemPositionHasChanged: {
        setPositionSettings();
        if (d->scene && d->scene->isMoveLeader(this)) {
            // The other selected bricks follow; the wires are drawn once they all moved.
            d->scene->moveFollowers(this, pos() - d->lastPos);
        } else if (d->scene && d->scene->isBulkLayout()) {
            d->scene->noteBulkMove(this);
        } else {
            for (KrConnectorItem* plug : qAsConst(d->connectors)) {
                emit plug->movedInScene();
                plug->updatePath();
            }
        }
        break;
    }
    case ItemSelectedHasChanged:
        if (KrBrickFrame* frame = d->frame) {
            if (value.toBool()) {
                QPalette pal = frame->palette();
                pal.setBrush(QPalette::Window,
                             QBrush(QApplication::palette().color(QPalette::Highlight)));
                frame->setPalette(pal);
            } else {
                frame->setPalette(QApplication::palette());
            }
        }
        update();
        break;
    case ItemSceneHasChanged:
        for (KrConnectorItem* plug : qAsConst(d->connectors))
            plug->syncWireScene();
        positionItems();
        break;
    default:
        break;
    }
    return QGraphicsProxyWidget::itemChange(change, value);
}

void KrBrickGraphicsItem::selectOnPress(Qt::KeyboardModifiers modifiers)
{
    QGraphicsScene* scene = this->scene();
    if (!scene)
        return;
    if (modifiers & Qt::ControlModifier) {
        setSelected(!isSelected());
        return;
    }
    if (!isSelected()) {
        scene->clearSelection();
        setSelected(true);
    }
}

void KrBrickGraphicsItem::mousePressEvent(QGraphicsSceneMouseEvent* event)
{
    d->itemDrag = false;
    QGraphicsProxyWidget::mousePressEvent(event);
    if (event->button() != Qt::LeftButton)
        return;
    if (event->isAccepted()) {
        // A widget of the brick took the press; the brick still becomes the selection.
        selectOnPress(event->modifiers());
        return;
    }
    // Nothing in the frame wanted the press: the brick is grabbed as a whole.
    event->accept();
    QGraphicsItem::mousePressEvent(event);
    d->itemDrag = true;
    if (d->scene)
        d->scene->beginBrickMove(this, false);
}

void KrBrickGraphicsItem::mouseMoveEvent(QGraphicsSceneMouseEvent* event)
{
    if (d->itemDrag)
        QGraphicsItem::mouseMoveEvent(event);
    else
        QGraphicsProxyWidget::mouseMoveEvent(event);
}

void KrBrickGraphicsItem::mouseReleaseEvent(QGraphicsSceneMouseEvent* event)
{
    if (!d->itemDrag) {
        QGraphicsProxyWidget::mouseReleaseEvent(event);
        return;
    }
    d->itemDrag = false;
    QGraphicsItem::mouseReleaseEvent(event);
    if (d->scene)
        d->scene->endBrickMove();
}

QRectF KrBrickGraphicsItem::boundingRect() const
{
    return rect().adjusted(-kOutlineMargin, -kOutlineMargin, kOutlineMargin, kOutlineMargin);
}

void KrBrickGraphicsItem::paintOutline(QPainter* painter, qreal lod)
{
    const QPalette pal = d->frame ? d->frame->palette() : palette();
    const QRectF r = rect();
    painter->save();
    QPen border(pal.color(QPalette::Shadow));
    border.setCosmetic(true);
    painter->setPen(border);
    painter->setBrush(pal.brush(QPalette::Window));
    painter->drawRect(r);
    // The title strip, so that a brick still reads as a brick from far away.
    const qreal strip = qMin<qreal>(r.height(), qMax<qreal>(20, 2.0 / qMax<qreal>(lod, 0.001)));
    painter->setPen(Qt::NoPen);
    painter->setBrush(pal.color(QPalette::Dark));
    painter->drawRect(QRectF(r.left(), r.top(), r.width(), strip));
    painter->restore();
}

void KrBrickGraphicsItem::paint(QPainter* painter, const QStyleOptionGraphicsItem* option,
                                QWidget* widget)
{
    const qreal lod = lodOf(painter, option);
    if (lod < kWidgetDetail)
        paintOutline(painter, lod);
    else
        QGraphicsProxyWidget::paint(painter, option, widget);
    if (isSelected()) {
        painter->save();
        QPen outline(QApplication::palette().color(QPalette::Highlight), 3);
        outline.setCosmetic(true);
        outline.setJoinStyle(Qt::MiterJoin);
        painter->setPen(outline);
        painter->setBrush(Qt::NoBrush);
        painter->drawRect(rect());
        painter->restore();
    }
}
