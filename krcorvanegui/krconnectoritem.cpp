#include "krconnectoritem.h"

#include "krapp.h"
#include "krbrickgraphicsitem.h"
#include "krbrickparam.h"
#include "krbrickparammime.h"
#include "krbrickuserscene.h"
#include "krsettings.h"
#include "krshaderbrick.h"

#include <QApplication>
#include <QColorDialog>
#include <QDrag>
#include <QFontMetricsF>
#include <QGraphicsEllipseItem>
#include <QGraphicsPolygonItem>
#include <QGraphicsScene>
#include <QGraphicsSceneContextMenuEvent>
#include <QGraphicsSceneDragDropEvent>
#include <QGraphicsSceneMouseEvent>
#include <QGraphicsSimpleTextItem>
#include <QMenu>
#include <QPainter>
#include <QPointer>
#include <QRandomGenerator>
#include <QStyleOptionGraphicsItem>
#include <QWidget>
#include <QtMath>

namespace {
const QString kBrickParamsKey = QStringLiteral("BrickParams");
const QString kConnectionColorKey = QStringLiteral("ConnectionColor");
const QString kRedKey = QStringLiteral("Red");
const QString kGreenKey = QStringLiteral("Green");
const QString kBlueKey = QStringLiteral("Blue");

// Below these scales the label and the type ring are a few pixels across: not drawn.
const qreal kLabelDetail = 0.35;
const qreal kRingDetail = 0.2;

qreal lodOf(const QPainter* painter, const QStyleOptionGraphicsItem* option)
{
    return option->levelOfDetailFromTransform(painter->worldTransform());
}

// The label inside a plug's circle.
class KrPlugLabel : public QGraphicsSimpleTextItem
{
public:
    using QGraphicsSimpleTextItem::QGraphicsSimpleTextItem;
    void paint(QPainter* painter, const QStyleOptionGraphicsItem* option, QWidget* widget) override
    {
        if (lodOf(painter, option) < kLabelDetail)
            return;
        QGraphicsSimpleTextItem::paint(painter, option, widget);
    }
};

// The plug's circle: filled with the plug colour, ringed inside with the colour of the
// parameter's type.
class KrPlugCircle : public QGraphicsEllipseItem
{
public:
    using QGraphicsEllipseItem::QGraphicsEllipseItem;
    QColor typeColor;

    void paint(QPainter* painter, const QStyleOptionGraphicsItem* option, QWidget* widget) override
    {
        painter->save();
        painter->setRenderHint(QPainter::Antialiasing);
        const qreal lod = lodOf(painter, option);
        QPen outline = pen();
        // A hairline at least, however far the view is zoomed out; a small plug shows its
        // colour rather than a black rim.
        if (lod < 1.0)
            outline.setCosmetic(true);
        if (lod < 0.5)
            outline.setColor(brush().color().darker(160));
        painter->setPen(outline);
        painter->setBrush(brush());
        painter->drawEllipse(rect());
        if (lod >= kRingDetail && typeColor.isValid()) {
            const qreal ring = rect().width() * 0.14;
            QPen ringPen(typeColor, ring);
            painter->setPen(ringPen);
            painter->setBrush(Qt::NoBrush);
            const qreal inset = ring / 2 + outline.widthF() / 2;
            painter->drawEllipse(rect().adjusted(inset, inset, -inset, -inset));
        }
        painter->restore();
        Q_UNUSED(widget);
    }
};

KrSettings* colorRecord(KrBrickParam* param, bool create)
{
    KrShaderBrick* brick = param ? param->getBrick() : nullptr;
    KrSettings* settings = brick ? brick->getBrickSettings() : nullptr;
    if (!settings)
        return nullptr;
    const QString paramKey = QStringLiteral("Param_%1").arg(brick->findParameterIndex(param));
    KrSettings* record = settings;
    for (const QString& key : {kBrickParamsKey, paramKey, kConnectionColorKey}) {
        KrSettings* next = record->getSettingsValue(key);
        if (!next) {
            if (!create)
                return nullptr;
            next = record->setSettingsValue(key);
        }
        record = next;
    }
    return record;
}
} // namespace

// -------------------------------------------------------------------------------- KrWireItem

KrWireItem::KrWireItem(QGraphicsItem* parent) : QGraphicsPathItem(parent) {}

KrWireItem::~KrWireItem()
{
    if (m_owner)
        m_owner->wireDestroyed(this);
}

void KrWireItem::paint(QPainter* painter, const QStyleOptionGraphicsItem* option, QWidget*)
{
    const qreal lod = lodOf(painter, option);
    QPen drawn = pen();
    // Zoomed out, the wire keeps its 100 % width in pixels instead of thinning to nothing.
    if (lod < 1.0)
        drawn.setCosmetic(true);
    painter->save();
    painter->setRenderHint(QPainter::Antialiasing);
    painter->setPen(drawn);
    painter->setBrush(Qt::NoBrush);
    painter->drawPath(path());
    painter->restore();
}

QPainterPath KrWireItem::curve(const QPointF& b, const QPointF& a)
{
    const QPointF start(float(int(b.x())), float(int(b.y())));
    const QPointF end(float(int(a.x())), float(int(a.y())));
    const float half = 0.5f * float(QLineF(start, end).length());
    QPainterPath path;
    path.moveTo(start);
    path.cubicTo(start + QPointF(half, 0), end - QPointF(half, 0), a);
    return path;
}

// --------------------------------------------------------------------------- KrConnectorItem

struct KrConnectorItem::Private
{
    QPointer<KrBrickParam> param;
    QPointer<KrBrickGraphicsItem> brickItem;
    QPointer<KrConnectorItem> target;
    QPointer<KrBrickParam> targetParam;
    KrWireItem* wire = nullptr;
    KrPlugLabel* textItem = nullptr;
    KrPlugCircle* plugCircle = nullptr;
    QGraphicsPolygonItem* arrowHead = nullptr;
    QColor color;
    int size = 20;
    float diameter = 16.4f;
    bool constructing = true;
    // A press that may become a drag of the parameter.
    bool dragArmed = false;
    QPointF pressScreenPos;
};

KrConnectorItem::KrConnectorItem(KrBrickParam* param, KrBrickGraphicsItem* brickItem, int size)
    : QObject(nullptr), QGraphicsRectItem(brickItem), d(new Private)
{
    d->param = param;
    d->brickItem = brickItem;
    d->size = size;
    if (param)
        connect(param, &KrBrickParam::typeChanged, this, &KrConnectorItem::updateText);

    QColor initial =
        brickItem ? brickItem->palette().brush(QPalette::Shadow).color() : QColor(Qt::black);

    const float diameter = plugDiameter(size);
    d->diameter = diameter;
    // No outline: the bounding rectangle is the bar, so its outer end is the connect point.
    setPen(Qt::NoPen);
    setRect(0, 0, diameter, diameter / 2);

    d->plugCircle = new KrPlugCircle(0, 0, diameter, diameter, this);
    d->plugCircle->setPos(-diameter / 8, -diameter / 4);
    d->plugCircle->typeColor = typeColor(param ? param->getTypeLabel() : QString());

    d->textItem = new KrPlugLabel(d->plugCircle);
    updateText();

    QPolygonF arrow;
    arrow << QPointF(int(diameter), int(diameter / 4))
          << QPointF(int(1.5f * diameter), int(-diameter / 4))
          << QPointF(int(1.5f * diameter), int(diameter / 4))
          << QPointF(int(1.5f * diameter), int(0.75f * diameter));
    d->arrowHead = new QGraphicsPolygonItem(arrow, this);
    d->arrowHead->setPen(Qt::NoPen);
    d->arrowHead->hide();

    if (param && param->getDirection() == KrBrickParam::Input) {
        d->wire = new KrWireItem;
        d->wire->setOwner(this);
        d->wire->hide();
        d->wire->setZValue(-10);
        if (brickItem && brickItem->scene())
            brickItem->scene()->addItem(d->wire);
    } else if (param) {
        const QColor window =
            brickItem ? brickItem->palette().brush(QPalette::Window).color() : QColor(Qt::white);
        initial = generatedColor(param, window);
    }

    setBrush(Qt::black);
    d->plugCircle->setBrush(initial);
    d->plugCircle->setPen(QPen(Qt::black));
    getColorSettings(initial);
    setColor(initial);
    d->constructing = false;

    setZValue(-5);
    d->plugCircle->setZValue(-3);
    d->textItem->setZValue(-2);
    d->arrowHead->setZValue(-2);
    setAcceptDrops(true);
    d->plugCircle->setAcceptDrops(true);
    // Presses, drops and menus over the circle, label or arrow are the plug's.
    setFiltersChildEvents(true);
    setFlag(ItemSendsGeometryChanges);
    setCursor(Qt::CrossCursor);
}

KrConnectorItem::~KrConnectorItem()
{
    if (d->target)
        disconnect(d->target, nullptr, this, nullptr);
    if (d->targetParam)
        disconnect(d->targetParam, nullptr, this, nullptr);
    if (d->wire) {
        d->wire->setOwner(nullptr);
        delete d->wire;
        d->wire = nullptr;
    }
    delete d->textItem;
    delete d->plugCircle;
    delete d->arrowHead;
}

float KrConnectorItem::plugDiameter(int size)
{
    return 0.82f * float(size);
}

QColor KrConnectorItem::labelColor(const QColor& color)
{
    const int brightness = (color.red() + color.green() + color.blue()) / 3;
    return brightness <= 127 ? QColor(255, 255, 255, 255) : QColor(0, 0, 0, 255);
}

QColor KrConnectorItem::generatedColor(const KrBrickParam* param, const QColor& window)
{
    const uint hash = param ? qHash(param->getParamArg(0)) : 0u;
    const KrShaderBrick* brick = param ? param->getBrick() : nullptr;
    const uint id = brick ? brick->getBrickID() : 0u;
    const quint32 value = quint32(qMax(id, 1u)) * quint32(qMax(hash, 1u)) * quint32(0x11001);
    const QColor generated{QRgb(value)};
    float rgb[3] = {float(generated.redF()), float(generated.greenF()), float(generated.blueF())};
    const float distance = qAbs(rgb[0] - float(window.redF())) +
                           qAbs(rgb[1] - float(window.greenF())) +
                           qAbs(rgb[2] - float(window.blueF()));
    // A plug the colour of the window would be invisible.
    if (distance < 0.05f) {
        const int k = QRandomGenerator::global()->bounded(3);
        rgb[k] += rgb[k] > 0.86f ? -0.1f : 0.1f;
    }
    return QColor(QColor::fromRgbF(rgb[0], rgb[1], rgb[2], 1.0).rgba());
}

QColor KrConnectorItem::typeColor(const QString& typeLabel)
{
    static const QHash<QString, QColor> colors = {
        {QStringLiteral("float"), QColor(0x7f, 0x9c, 0xbf)},
        {QStringLiteral("int"), QColor(0x3f, 0xa9, 0x9f)},
        {QStringLiteral("bool"), QColor(0xc9, 0x5c, 0x5c)},
        {QStringLiteral("color"), QColor(0xf0, 0xa8, 0x30)},
        {QStringLiteral("point"), QColor(0x5d, 0xb8, 0x5d)},
        {QStringLiteral("vector"), QColor(0x4a, 0x90, 0xe2)},
        {QStringLiteral("normal"), QColor(0xa0, 0x6c, 0xd5)},
        {QStringLiteral("string"), QColor(0xd6, 0x6f, 0xa8)},
        {QStringLiteral("matrix"), QColor(0x8c, 0x8c, 0x8c)},
        {QStringLiteral("closure"), QColor(0xe0, 0x4a, 0x3a)}};
    return colors.value(typeLabel, QColor(0xb0, 0xb0, 0xb0));
}

KrBrickGraphicsItem* KrConnectorItem::getBrickItem() const
{
    return d->brickItem;
}

KrBrickUserScene* KrConnectorItem::getBrickScene() const
{
    return d->brickItem ? d->brickItem->getBrickScene() : nullptr;
}

KrConnectorItem* KrConnectorItem::getTarget() const
{
    return d->target;
}

KrWireItem* KrConnectorItem::getWire() const
{
    return d->wire;
}

QGraphicsEllipseItem* KrConnectorItem::getPlugCircle() const
{
    return d->plugCircle;
}

QGraphicsPolygonItem* KrConnectorItem::getArrowHead() const
{
    return d->arrowHead;
}

bool KrConnectorItem::isOutput() const
{
    return d->param && d->param->isOutput();
}

int KrConnectorItem::getSize() const
{
    return d->size;
}

void KrConnectorItem::wireDestroyed(KrWireItem* wire)
{
    if (d->wire == wire)
        d->wire = nullptr;
}

QColor KrConnectorItem::getColor()
{
    return d->color;
}

void KrConnectorItem::applyPlugColor(const QColor& color)
{
    d->plugCircle->setBrush(color);
    d->arrowHead->setBrush(color);
    d->textItem->setBrush(labelColor(color));
}

void KrConnectorItem::setColor(QColor color)
{
    if (color == d->color)
        return;
    d->color = color;
    applyPlugColor(color);
    // The default colour is not stored: only a colour the user chose goes into the brick.
    if (!d->constructing)
        setColorSettings();
    emit colorChanged();
    updatePath();
}

void KrConnectorItem::setColorSettings()
{
    KrSettings* record = colorRecord(d->param, true);
    if (!record)
        return;
    record->setFloatValue(kRedKey, d->color.red());
    record->setFloatValue(kGreenKey, d->color.green());
    record->setFloatValue(kBlueKey, d->color.blue());
}

void KrConnectorItem::getColorSettings(QColor& color)
{
    const KrSettings* record = colorRecord(d->param, false);
    if (!record)
        return;
    const int red = int(record->getFloatValue(kRedKey, color.red()));
    const int green = int(record->getFloatValue(kGreenKey, color.green()));
    const int blue = int(record->getFloatValue(kBlueKey, color.blue()));
    color = QColor(qBound(0, red, 255), qBound(0, green, 255), qBound(0, blue, 255), 255);
}

QPointF KrConnectorItem::getConnectPoint()
{
    const QRectF bounds = boundingRect();
    return mapToScene(QPointF(float(bounds.width()), float(bounds.height() / 2)));
}

QGraphicsSimpleTextItem* KrConnectorItem::getTextItem()
{
    return d->textItem;
}

KrBrickParam* KrConnectorItem::getParam()
{
    return d->param;
}

void KrConnectorItem::updateText()
{
    // The label names the type that arrives: the source's, once wired.
    const KrBrickParam* shown = d->targetParam ? d->targetParam.data() : d->param.data();
    const QString text = shown ? shown->getTypeLabel() : QString();
    QFont font = d->textItem->font();
    qreal pixels = qMax<qreal>(4, qRound(d->diameter * 0.42));
    font.setPixelSize(int(pixels));
    qreal width = QFontMetricsF(font).horizontalAdvance(text);
    // Long type names shrink to fit the circle.
    if (width > d->diameter && width > 0) {
        pixels = qMax<qreal>(3, qFloor(pixels * d->diameter / width));
        font.setPixelSize(int(pixels));
    }
    d->textItem->setFont(font);
    d->textItem->setText(text);
    const QRectF textRect = d->textItem->boundingRect();
    d->textItem->setPos((d->diameter - textRect.width()) / 2,
                        (d->diameter - textRect.height()) / 2);
    if (d->plugCircle)
        d->plugCircle->typeColor = typeColor(shown ? shown->getTypeLabel() : QString());
    updatePath();
}

void KrConnectorItem::detachTarget()
{
    if (d->target)
        disconnect(d->target, nullptr, this, nullptr);
    if (d->targetParam)
        disconnect(d->targetParam, nullptr, this, nullptr);
    d->target = nullptr;
    d->targetParam = nullptr;
    if (d->wire) {
        d->wire->hide();
        d->arrowHead->hide();
    }
}

QList<KrConnectorItem*> KrConnectorItem::feedingPlugs() const
{
    QList<KrConnectorItem*> plugs;
    KrBrickUserScene* scene = getBrickScene();
    KrBrickParam* param = d->param;
    if (!scene || !param)
        return plugs;
    for (int i = 0; i < param->getNumConnections(); ++i) {
        const KrParamConnection* connection = param->getConnection(i);
        KrBrickParam* other = connection ? connection->getParam() : nullptr;
        KrShaderBrick* brick = other ? other->getBrick() : nullptr;
        if (!brick)
            continue;
        KrBrickGraphicsItem* item = scene->findBrick(brick->getBrickID());
        KrConnectorItem* plug =
            item ? item->getConnector(brick->findParameterIndex(other)) : nullptr;
        if (plug)
            plugs.append(plug);
    }
    return plugs;
}

void KrConnectorItem::updateConnections()
{
    applyPlugColor(d->color);
    detachTarget();
    updateText();
    for (KrConnectorItem* plug : feedingPlugs())
        createConnectionInternal(plug);
}

void KrConnectorItem::createConnectionInternal(KrConnectorItem* item)
{
    detachTarget();
    if (!item || !item->d->param || !d->param ||
        item->d->param->getDirection() == d->param->getDirection())
        return;
    if (isOutput()) {
        item->createConnectionInternal(this);
        return;
    }
    d->target = item;
    d->targetParam = item->d->param;
    connect(item->d->param, &KrBrickParam::typeChanged, this, &KrConnectorItem::updateText);
    connect(item, &KrConnectorItem::movedInScene, this, &KrConnectorItem::updatePath);
    connect(item, &KrConnectorItem::colorChanged, this, &KrConnectorItem::updatePath);
    connect(item, &QObject::destroyed, this, &KrConnectorItem::targetDestoyed);
    if (d->wire) {
        d->wire->show();
        d->arrowHead->show();
    }
    updateText();
}

void KrConnectorItem::targetDestoyed()
{
    d->target = nullptr;
    d->targetParam = nullptr;
    if (d->wire) {
        d->wire->hide();
        d->arrowHead->hide();
    }
    applyPlugColor(d->color);
}

void KrConnectorItem::updatePath()
{
    if (!d->wire || !d->target)
        return;
    if (d->wire->scene() != scene()) {
        if (d->wire->scene())
            d->wire->scene()->removeItem(d->wire);
        if (scene())
            scene()->addItem(d->wire);
    }
    const QPointF here = getConnectPoint();
    const QPointF there = d->target->getConnectPoint();
    const bool rightToLeft = d->brickItem && d->brickItem->isRightToLeft();
    const QPointF start = rightToLeft ? here : there;
    const QPointF end = d->wire->mapFromScene(rightToLeft ? there : here);
    d->wire->setPath(KrWireItem::curve(start, end));

    const QColor color = d->target->getColor();
    QPen pen(color, 2.0);
    pen.setCapStyle(Qt::RoundCap);
    d->wire->setPen(pen);
    applyPlugColor(color);
}

void KrConnectorItem::removeConnection()
{
    if (d->target) {
        detachTarget();
    } else {
        for (KrConnectorItem* plug : feedingPlugs())
            plug->removeConnection();
    }
    if (d->param)
        d->param->removeAllConnections();
}

void KrConnectorItem::disconnectParam()
{
    KrBrickParam* param = d->param;
    if (!param || param->getNumConnections() < 1)
        return;
    if (KrBrickUserScene* scene = getBrickScene())
        scene->disconnectParameter(param);
    else
        param->removeAllConnections();
}

void KrConnectorItem::changeColor()
{
    QWidget* parent = krApp->getDialogParent();
    const QColor chosen = QColorDialog::getColor(d->color, parent);
    if (chosen.isValid())
        setColor(chosen);
}

bool KrConnectorItem::acceptsParam(KrBrickParam* source) const
{
    return source && d->param && source->canConnectTo(d->param);
}

void KrConnectorItem::contextMenuEvent(QGraphicsSceneContextMenuEvent* event)
{
    QMenu menu;
    // Connected with this plug as context: a plug rebuilt while the menu is open is not called.
    connect(menu.addAction(QStringLiteral("Disconnect")), &QAction::triggered, this,
            &KrConnectorItem::disconnectParam);
    if (isOutput()) {
        menu.addSeparator();
        connect(menu.addAction(QStringLiteral("Connector Color")), &QAction::triggered, this,
                &KrConnectorItem::changeColor);
    }
    event->accept();
    menu.exec(event->screenPos());
}

void KrConnectorItem::mousePressEvent(QGraphicsSceneMouseEvent* event)
{
    if (event->button() != Qt::LeftButton) {
        QGraphicsRectItem::mousePressEvent(event);
        return;
    }
    event->accept();
    d->dragArmed = false;
    KrBrickUserScene* scene = getBrickScene();
    if (event->modifiers() & Qt::ShiftModifier) {
        if (!scene)
            return;
        if (scene->isConnectMode()) {
            KrConnectorItem* start = scene->getConnectionItem();
            KrBrickParam* other = start ? start->getParam() : nullptr;
            scene->setConnectMode(false);
            if (other && d->param)
                scene->connectParameters(d->param, other);
        } else {
            scene->setConnectMode(true, this, getConnectPoint(), isOutput());
        }
        return;
    }
    if (scene)
        scene->setConnectMode(false);
    // The drag starts once the pointer has moved: a plain click only ends connect mode.
    d->dragArmed = true;
    d->pressScreenPos = event->screenPos();
}

void KrConnectorItem::mouseMoveEvent(QGraphicsSceneMouseEvent* event)
{
    if (!d->dragArmed || !(event->buttons() & Qt::LeftButton))
        return;
    if ((event->screenPos() - d->pressScreenPos).manhattanLength() <
        QApplication::startDragDistance())
        return;
    d->dragArmed = false;
    QPointer<KrBrickUserScene> scene = getBrickScene();
    QPointer<QGraphicsScene> graphicsScene = this->scene();
    QPointer<KrConnectorItem> guard(this);
    auto* drag = new QDrag(event->widget());
    drag->setMimeData(new KrBrickParamMime(d->param));
    if (scene) {
        scene->followPathStart(getConnectPoint(), isOutput());
        scene->setConnectMode(false);
    }
    drag->exec(Qt::MoveAction);
    if (scene)
        scene->followPathEnd();
    // The drag took the release; the plug (or the part of it pressed) must not keep the mouse.
    if (guard && graphicsScene) {
        QGraphicsItem* grabber = graphicsScene->mouseGrabberItem();
        if (grabber && (grabber == guard || guard->isAncestorOf(grabber)))
            grabber->ungrabMouse();
    }
}

void KrConnectorItem::mouseReleaseEvent(QGraphicsSceneMouseEvent* event)
{
    d->dragArmed = false;
    event->accept();
}

void KrConnectorItem::dragEnterEvent(QGraphicsSceneDragDropEvent* event)
{
    const QMimeData* data = event->mimeData();
    KrBrickParam* source = data && data->hasFormat(KrBrickParamMime::s_mimeType)
                               ? KrBrickParamMime::decode(data)
                               : nullptr;
    event->setAccepted(acceptsParam(source));
}

void KrConnectorItem::dragMoveEvent(QGraphicsSceneDragDropEvent* event)
{
    dragEnterEvent(event);
}

void KrConnectorItem::dropEvent(QGraphicsSceneDragDropEvent* event)
{
    const QMimeData* data = event->mimeData();
    KrBrickParam* source = data && data->hasFormat(KrBrickParamMime::s_mimeType)
                               ? KrBrickParamMime::decode(data)
                               : nullptr;
    if (!acceptsParam(source)) {
        event->ignore();
        return;
    }
    event->accept();
    if (KrBrickUserScene* scene = getBrickScene())
        scene->connectParameters(d->param, source);
    else
        d->param->addConnection(source);
}

bool KrConnectorItem::sceneEventFilter(QGraphicsItem* watched, QEvent* event)
{
    Q_UNUSED(watched);
    switch (event->type()) {
    case QEvent::GraphicsSceneMousePress:
        mousePressEvent(static_cast<QGraphicsSceneMouseEvent*>(event));
        return true;
    case QEvent::GraphicsSceneMouseMove:
        mouseMoveEvent(static_cast<QGraphicsSceneMouseEvent*>(event));
        return true;
    case QEvent::GraphicsSceneMouseRelease:
        mouseReleaseEvent(static_cast<QGraphicsSceneMouseEvent*>(event));
        return true;
    case QEvent::GraphicsSceneContextMenu:
        contextMenuEvent(static_cast<QGraphicsSceneContextMenuEvent*>(event));
        return true;
    case QEvent::GraphicsSceneDragEnter:
        dragEnterEvent(static_cast<QGraphicsSceneDragDropEvent*>(event));
        return true;
    case QEvent::GraphicsSceneDragMove:
        dragMoveEvent(static_cast<QGraphicsSceneDragDropEvent*>(event));
        return true;
    case QEvent::GraphicsSceneDrop:
        dropEvent(static_cast<QGraphicsSceneDragDropEvent*>(event));
        return true;
    default:
        return false;
    }
}

void KrConnectorItem::syncWireScene()
{
    if (!d->wire)
        return;
    QGraphicsScene* now = scene();
    if (d->wire->scene() == now)
        return;
    if (d->wire->scene())
        d->wire->scene()->removeItem(d->wire);
    if (now)
        now->addItem(d->wire);
}

QVariant KrConnectorItem::itemChange(GraphicsItemChange change, const QVariant& value)
{
    if (d->brickItem) {
        if (change == ItemPositionHasChanged) {
            if (d->wire && d->wire->isVisible())
                updatePath();
            emit movedInScene();
        } else if (change == ItemVisibleHasChanged) {
            updatePath();
        } else if (change == ItemSceneHasChanged) {
            syncWireScene();
        }
    }
    return QGraphicsRectItem::itemChange(change, value);
}
