#include "krdividerbar.h"

#include "krstyle.h"

#include <QEvent>
#include <QLinearGradient>
#include <QMouseEvent>
#include <QPainter>
#include <QPainterPath>

namespace {
const int kDefaultThickness = 6;
const int kToggleLength = 40;
} // namespace

struct KrDividerBar::Private
{
    Qt::Orientation orientation = Qt::Vertical;
    BarStyle barStyle = RaisedBar;
    bool toggleEnabled = false;
    Qt::ArrowType arrow = Qt::RightArrow;
    bool pressedInToggle = false;
    bool dragging = false;
    bool hoverToggle = false;
    int lastAxis = 0; // global pointer position along the split axis at the last report
};

KrDividerBar::KrDividerBar(QWidget* parent, Qt::Orientation orientation, const QString& name,
                           BarStyle barStyle)
    : QWidget(parent), d(new Private)
{
    setObjectName(name);
    d->orientation = orientation;
    d->barStyle = barStyle;
    d->arrow = orientation == Qt::Vertical ? Qt::RightArrow : Qt::DownArrow;
    setMouseTracking(true);
    setAttribute(Qt::WA_Hover, true);
    if (orientation == Qt::Vertical)
        setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Expanding);
    else
        setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    setCursor(orientation == Qt::Vertical ? Qt::SplitHCursor : Qt::SplitVCursor);
}

KrDividerBar::~KrDividerBar() = default;

Qt::Orientation KrDividerBar::orientation() const
{
    return d->orientation;
}

KrDividerBar::BarStyle KrDividerBar::barStyle() const
{
    return d->barStyle;
}

int KrDividerBar::barThickness() const
{
    const int t = style()->pixelMetric(QStyle::PixelMetric(KrStyle::PM_DividerBarWidth));
    return t > 0 ? t : kDefaultThickness;
}

void KrDividerBar::enableToggleBar(bool enable)
{
    if (enable == d->toggleEnabled)
        return;
    d->toggleEnabled = enable;
    d->hoverToggle = false;
    if (underMouse())
        updateCursor(mapFromGlobal(QCursor::pos()));
    else
        setCursor(d->orientation == Qt::Vertical ? Qt::SplitHCursor : Qt::SplitVCursor);
    update();
}

bool KrDividerBar::toggleEnabled() const
{
    return d->toggleEnabled;
}

void KrDividerBar::setToggleArrow(Qt::ArrowType arrow)
{
    if (arrow == d->arrow)
        return;
    d->arrow = arrow;
    update();
}

Qt::ArrowType KrDividerBar::toggleArrow() const
{
    return d->arrow;
}

QRect KrDividerBar::toggleRect() const
{
    if (!d->toggleEnabled)
        return QRect();
    if (d->orientation == Qt::Vertical) {
        const int len = qMin(kToggleLength, height());
        return QRect(0, (height() - len) / 2, width(), len);
    }
    const int len = qMin(kToggleLength, width());
    return QRect((width() - len) / 2, 0, len, height());
}

bool KrDividerBar::isDragging() const
{
    return d->dragging;
}

QSize KrDividerBar::sizeHint() const
{
    const int t = barThickness();
    return d->orientation == Qt::Vertical ? QSize(t, kToggleLength) : QSize(kToggleLength, t);
}

QSize KrDividerBar::minimumSizeHint() const
{
    const int t = barThickness();
    return d->orientation == Qt::Vertical ? QSize(t, 0) : QSize(0, t);
}

void KrDividerBar::updateCursor(const QPoint& pos)
{
    const bool overToggle = !d->dragging && toggleRect().contains(pos);
    if (overToggle != d->hoverToggle) {
        d->hoverToggle = overToggle;
        update();
    }
    if (overToggle)
        setCursor(Qt::PointingHandCursor);
    else
        setCursor(d->orientation == Qt::Vertical ? Qt::SplitHCursor : Qt::SplitVCursor);
}

void KrDividerBar::mousePressEvent(QMouseEvent* event)
{
    if (event->button() != Qt::LeftButton) {
        event->ignore();
        return;
    }
    event->accept();
    if (toggleRect().contains(event->pos())) {
        d->pressedInToggle = true;
        return;
    }
    d->dragging = true;
    d->lastAxis = d->orientation == Qt::Vertical ? event->globalPos().x() : event->globalPos().y();
    updateCursor(event->pos());
}

void KrDividerBar::mouseMoveEvent(QMouseEvent* event)
{
    if (!d->dragging) {
        updateCursor(event->pos());
        return;
    }
    event->accept();
    // Global positions: the bar itself moves under the pointer while the split follows.
    const int axis =
        d->orientation == Qt::Vertical ? event->globalPos().x() : event->globalPos().y();
    const int distance = axis - d->lastAxis;
    if (distance == 0)
        return;
    d->lastAxis = axis;
    emit moved(distance);
    const QPoint inParent =
        parentWidget() ? parentWidget()->mapFromGlobal(event->globalPos()) : event->globalPos();
    emit draggedTo(d->orientation == Qt::Vertical ? inParent.x() : inParent.y());
}

void KrDividerBar::mouseReleaseEvent(QMouseEvent* event)
{
    if (event->button() != Qt::LeftButton) {
        event->ignore();
        return;
    }
    event->accept();
    if (d->dragging) {
        mouseMoveEvent(event); // the last stretch up to the release point
        d->dragging = false;
        updateCursor(event->pos());
        return;
    }
    if (d->pressedInToggle) {
        d->pressedInToggle = false;
        if (d->toggleEnabled && toggleRect().contains(event->pos()))
            emit toggleBarActivated();
    }
}

void KrDividerBar::leaveEvent(QEvent* event)
{
    if (d->hoverToggle) {
        d->hoverToggle = false;
        update();
    }
    QWidget::leaveEvent(event);
}

void KrDividerBar::changeEvent(QEvent* event)
{
    if (event->type() == QEvent::StyleChange)
        updateGeometry();
    QWidget::changeEvent(event);
}

void KrDividerBar::paintEvent(QPaintEvent*)
{
    QPainter p(this);
    const QRect r = rect();
    const bool vertical = d->orientation == Qt::Vertical;
    const QPalette& pal = palette();
    const QColor window = pal.color(QPalette::Window);
    const QColor line = pal.color(QPalette::Mid);

    if (d->barStyle == FlatBar) {
        p.fillRect(r, window);
        p.setPen(line);
        if (vertical)
            p.drawLine(r.center().x(), r.top(), r.center().x(), r.bottom());
        else
            p.drawLine(r.left(), r.center().y(), r.right(), r.center().y());
    } else {
        // Shaded across the thickness, so the bar reads as a raised ridge.
        QLinearGradient g(r.topLeft(), vertical ? r.topRight() : r.bottomLeft());
        g.setColorAt(0.0, window.lighter(108));
        g.setColorAt(0.5, window);
        g.setColorAt(1.0, window.darker(110));
        p.fillRect(r, g);
        p.setPen(line);
        if (vertical) {
            p.drawLine(r.topLeft(), r.bottomLeft());
            p.drawLine(r.topRight(), r.bottomRight());
        } else {
            p.drawLine(r.topLeft(), r.topRight());
            p.drawLine(r.bottomLeft(), r.bottomRight());
        }
    }

    const QRect toggle = toggleRect();
    if (d->barStyle == GripBar) {
        // Dots on both sides of the middle (or of the toggle area).
        const int gap = toggle.isValid() ? kToggleLength / 2 + 6 : 0;
        p.setRenderHint(QPainter::Antialiasing, true);
        p.setPen(Qt::NoPen);
        p.setBrush(pal.color(QPalette::Dark));
        const QPointF c = QRectF(r).center();
        for (int side : {-1, 1}) {
            for (int i = 0; i < 3; ++i) {
                const qreal off = side * (gap + 4 + i * 5);
                const QPointF dot =
                    vertical ? QPointF(c.x(), c.y() + off) : QPointF(c.x() + off, c.y());
                if (r.contains(dot.toPoint()))
                    p.drawEllipse(dot, 1.2, 1.2);
            }
        }
    }

    if (toggle.isValid()) {
        p.setRenderHint(QPainter::Antialiasing, true);
        const QColor face =
            d->hoverToggle ? pal.color(QPalette::Highlight) : pal.color(QPalette::Dark);
        p.setPen(Qt::NoPen);
        p.setBrush(d->hoverToggle ? face.lighter(160) : window.darker(106));
        p.drawRoundedRect(QRectF(toggle).adjusted(0.5, 0.5, -0.5, -0.5), 2.0, 2.0);
        // A small triangle pointing the way the collapse goes.
        const QPointF c = QRectF(toggle).center();
        const qreal s = qMax<qreal>(2.0, qMin(toggle.width(), toggle.height()) / 2.0 - 0.5);
        QPolygonF tri;
        switch (d->arrow) {
        case Qt::LeftArrow:
            tri << QPointF(c.x() - s / 2, c.y()) << QPointF(c.x() + s / 2, c.y() - s)
                << QPointF(c.x() + s / 2, c.y() + s);
            break;
        case Qt::UpArrow:
            tri << QPointF(c.x(), c.y() - s / 2) << QPointF(c.x() - s, c.y() + s / 2)
                << QPointF(c.x() + s, c.y() + s / 2);
            break;
        case Qt::DownArrow:
            tri << QPointF(c.x(), c.y() + s / 2) << QPointF(c.x() - s, c.y() - s / 2)
                << QPointF(c.x() + s, c.y() - s / 2);
            break;
        default:
            tri << QPointF(c.x() + s / 2, c.y()) << QPointF(c.x() - s / 2, c.y() - s)
                << QPointF(c.x() - s / 2, c.y() + s);
            break;
        }
        p.setBrush(face.darker(d->hoverToggle ? 110 : 130));
        p.drawPolygon(tri);
    }
}
