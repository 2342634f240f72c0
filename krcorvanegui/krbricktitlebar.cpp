#include "krbricktitlebar.h"

#include "krbrickframe.h"

#include <QGraphicsProxyWidget>
#include <QMouseEvent>
#include <QPainter>
#include <QPointer>
#include <QStyleOption>

namespace {
// Bricks never go left of or above this, so their title bar stays reachable.
constexpr int kMinPos = 10;
} // namespace

struct KrBrickTitleBar::Private
{
    QPointer<QWidget> target;
    bool pressed = false;
    bool dragArmed = false;
    bool dragStarted = false;
    QRect barRect;
    QRect closeRect;
    // Where the drag grabbed the target, in the target's own coordinates. Those follow the
    // target as it moves, so the drag works the same at any zoom of the view that shows it.
    QPoint grabOffset;
};

KrBrickTitleBar::KrBrickTitleBar(QWidget* parent, const QString& name)
    : QWidget(parent), d(new Private)
{
    d->target = parent;
    setObjectName(name);
    updateHeight();
    setMouseTracking(true);
}

KrBrickTitleBar::~KrBrickTitleBar() = default;

QRect KrBrickTitleBar::getCloseRect() const
{
    return d->closeRect;
}

bool KrBrickTitleBar::isDragging() const
{
    return d->dragStarted;
}

void KrBrickTitleBar::updateHeight()
{
    setFixedHeight(krBrickFrameMetric(style(), KrBrickFrameMetric::TitleBarHeight, this));
}

void KrBrickTitleBar::changeEvent(QEvent* event)
{
    if (event->type() == QEvent::StyleChange)
        updateHeight();
    QWidget::changeEvent(event);
}

void KrBrickTitleBar::resizeEvent(QResizeEvent* event)
{
    const int side = krBrickFrameMetric(style(), KrBrickFrameMetric::TitleBarHeight, this);
    d->barRect = QRect(0, 0, width(), height());
    d->closeRect = QRect(width() - side, 0, side, height());
    QWidget::resizeEvent(event);
}

void KrBrickTitleBar::paintEvent(QPaintEvent*)
{
    QStyleOption option(1, QStyleOption::SO_Default);
    option.initFrom(this);
    option.rect = QRect(0, 0, width(), height());
    QPainter painter(this);
    style()->drawControl(QStyle::ControlElement(QStyle::CE_CustomBase + 1), &option, &painter,
                         this);
}

void KrBrickTitleBar::mousePressEvent(QMouseEvent* event)
{
    if (event->button() != Qt::LeftButton) {
        event->ignore();
        return;
    }
    event->accept();
    d->pressed = true;
    d->dragStarted = false;
    d->dragArmed = d->barRect.contains(event->pos()) && !d->closeRect.contains(event->pos());
    if (d->target)
        d->grabOffset = mapTo(d->target, event->pos());
}

void KrBrickTitleBar::mouseMoveEvent(QMouseEvent* event)
{
    setCursor(d->closeRect.contains(event->pos()) ? Qt::ArrowCursor : Qt::SizeAllCursor);
    if (!d->pressed) {
        event->ignore();
        return;
    }
    event->accept();
    if (!d->dragArmed || !d->target)
        return;
    const QPoint inTarget = mapTo(d->target, event->pos());
    if (!d->dragStarted) {
        d->dragStarted = true;
        emit dragStarted();
    }
    // The point grabbed stays under the pointer, from the first move on.
    moveTargetBy(inTarget - d->grabOffset);
}

void KrBrickTitleBar::moveTargetBy(const QPoint& delta)
{
    if (delta.isNull())
        return;
    QWidget* target = d->target;
    // A frame shown in a graphics scene moves its item; the item keeps the brick's position.
    if (QGraphicsProxyWidget* proxy = target->graphicsProxyWidget()) {
        const QPointF to = proxy->mapToParent(QPointF(delta));
        proxy->setPos(qMax<qreal>(to.x(), kMinPos), qMax<qreal>(to.y(), kMinPos));
        return;
    }
    const QPoint to = target->pos() + delta;
    target->move(qMax(to.x(), kMinPos), qMax(to.y(), kMinPos));
}

void KrBrickTitleBar::mouseReleaseEvent(QMouseEvent* event)
{
    if (!d->pressed || event->button() != Qt::LeftButton) {
        event->ignore();
        return;
    }
    event->accept();
    d->pressed = false;
    if (d->dragStarted) {
        d->dragStarted = false;
        emit dragFinished();
        return;
    }
    if (d->closeRect.contains(event->pos()))
        emit closeClicked();
}
