#include "krdynamicdivider.h"

#include <QLayout>
#include <QPointer>
#include <QResizeEvent>
#include <QStyle>

struct KrDynamicDivider::Private
{
    // Guarded: a child deleted by its owner must not leave a dangling pointer behind.
    QPointer<QWidget> first;
    QPointer<QWidget> second;
    KrDividerBar* bar = nullptr;
    bool collapseSecond = true;
    bool toggled = false;
    // The side collapsed by the last toggle; a later setToggleEnabled() cannot change it
    // until the divider is expanded again.
    bool collapsedIsSecond = true;
    int margin = 0;
    int spacing = 0;
    double ratio = 0.5;
    int resizeMode = KeepRatio;

    bool vertical() const { return bar->orientation() == Qt::Vertical; }
    // The toggle arrow points the way the next toggle moves the bar.
    void updateArrow()
    {
        const bool towardsEnd = toggled ? !collapsedIsSecond : collapseSecond;
        if (vertical())
            bar->setToggleArrow(towardsEnd ? Qt::RightArrow : Qt::LeftArrow);
        else
            bar->setToggleArrow(towardsEnd ? Qt::DownArrow : Qt::UpArrow);
    }
    int extent(const QSize& size) const { return vertical() ? size.width() : size.height(); }
    int thickness() const { return bar->barThickness(); }
};

namespace {

QSize childMinimumSize(const QWidget* widget)
{
    if (!widget)
        return QSize(0, 0);
    QSize size = widget->minimumSize().expandedTo(widget->minimumSizeHint());
    if (widget->layout())
        size = size.expandedTo(widget->layout()->minimumSize());
    return size.expandedTo(QSize(0, 0));
}

} // namespace

KrDynamicDivider::KrDynamicDivider(QWidget* first, QWidget* second, QWidget* parent,
                                   Qt::Orientation orientation, const QString& name,
                                   KrDividerBar::BarStyle barStyle)
    : QWidget(parent), d(new Private)
{
    d->first = first;
    d->second = second;
    // A style that does not know the metric answers 0 or less; the divider then has no margin.
    const int metric = qMax(0, style()->pixelMetric(QStyle::PM_CustomBase));
    d->margin = metric;
    d->spacing = metric;

    setObjectName(name);
    // Stacking order first, bar, second.
    if (first)
        first->setParent(this);
    d->bar = new KrDividerBar(this, orientation, name, barStyle);
    if (second)
        second->setParent(this);

    connect(d->bar, &KrDividerBar::toggleBarActivated, this, &KrDynamicDivider::toggleWidget);
    connect(d->bar, &KrDividerBar::moved, this, &KrDynamicDivider::moveDivider);
    d->updateArrow();

    setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Expanding);
    setMinimumSize(minimumSizeHint());
}

KrDynamicDivider::~KrDynamicDivider() = default;

void KrDynamicDivider::setToggleEnabled(bool enable, bool collapseSecond)
{
    d->bar->enableToggleBar(enable);
    d->collapseSecond = collapseSecond;
    d->updateArrow();
}

void KrDynamicDivider::setResizeMode(int mode)
{
    d->resizeMode = mode;
}

int KrDynamicDivider::getResizeMode() const
{
    return d->resizeMode;
}

bool KrDynamicDivider::getCollapseSecond() const
{
    return d->collapseSecond;
}

double KrDynamicDivider::getRatio() const
{
    return d->ratio;
}

int KrDynamicDivider::getMargin() const
{
    return d->margin;
}

int KrDynamicDivider::getSpacing() const
{
    return d->spacing;
}

KrDividerBar* KrDynamicDivider::getBar() const
{
    return d->bar;
}

QWidget* KrDynamicDivider::getFirst() const
{
    return d->first;
}

QWidget* KrDynamicDivider::getSecond() const
{
    return d->second;
}

QSize KrDynamicDivider::minimumSizeHint() const
{
    const int m = d->margin;
    const int s = d->spacing;
    const int b = d->thickness();
    const QSize f = childMinimumSize(d->first);
    const QSize g = childMinimumSize(d->second);
    int along = 2 * m + b;
    if (d->first)
        along += s + (d->vertical() ? f.width() : f.height());
    if (d->second)
        along += s + (d->vertical() ? g.width() : g.height());
    if (d->vertical())
        return QSize(along, 2 * m + qMax(f.height(), g.height()));
    return QSize(2 * m + qMax(f.width(), g.width()), along);
}

void KrDynamicDivider::limitRatio(const QSize& size)
{
    const int extent = d->extent(size);
    if (extent <= 0)
        return; // nothing to measure against; keep the ratio for a later, real size
    const bool vertical = d->vertical();
    const int m = d->margin;
    const int b = d->thickness();
    const QSize fs = childMinimumSize(d->first);
    const QSize gs = childMinimumSize(d->second);
    const int f = d->first ? d->spacing + (vertical ? fs.width() : fs.height()) : 0;
    const int g = d->second ? d->spacing + (vertical ? gs.width() : gs.height()) : 0;

    const double lo = double(m + f) / extent;
    const double hi = double(extent - b - m - g) / extent;
    if (hi < lo)
        d->ratio = (lo + hi) / 2.0;
    else if (d->ratio < lo)
        d->ratio = lo;
    else if (d->ratio > hi)
        d->ratio = hi;
}

void KrDynamicDivider::layoutChildren(const QSize& size)
{
    if (!d->first || !d->second)
        return;
    const int W = size.width();
    const int H = size.height();
    const int m = d->margin;
    const int s = d->spacing;
    const int b = d->thickness();
    // Truncated, but a ratio built from whole-pixel drags must land on that pixel even when
    // the sum of the fractions comes out a hair below it.
    const int p = int(d->extent(size) * d->ratio + 1e-6);

    if (d->vertical()) {
        const int firstWidth = p - s - m;
        const int secondWidth = W - 3 * m - p - b;
        const int height = H - 4 * m;
        if (!d->toggled) {
            d->first->setGeometry(m, m, firstWidth, height);
            d->bar->setGeometry(p, 0, b, H);
            d->second->setGeometry(p + b + s, m, secondWidth, height);
        } else if (d->collapsedIsSecond) {
            d->first->setGeometry(m, m, firstWidth + s + secondWidth, height);
            d->bar->setGeometry(W - b, 0, b, H);
        } else {
            d->bar->setGeometry(0, 0, b, H);
            d->second->setGeometry(m + b, m, secondWidth + s + firstWidth, height);
        }
    } else {
        const int firstHeight = p - s - m;
        const int secondHeight = H - m - p - b;
        const int width = W - 2 * m;
        if (!d->toggled) {
            d->first->setGeometry(m, m, width, firstHeight);
            d->bar->setGeometry(0, p, W, b);
            d->second->setGeometry(m, p + b + s, width, secondHeight);
        } else if (d->collapsedIsSecond) {
            d->first->setGeometry(m, m, width, firstHeight + s + secondHeight);
            d->bar->setGeometry(0, H - b, W, b);
        } else {
            d->bar->setGeometry(0, 0, W, b);
            d->second->setGeometry(m, m + b, width, secondHeight + s + firstHeight);
        }
    }
}

void KrDynamicDivider::resizeEvent(QResizeEvent* event)
{
    if (!event)
        return;
    const QSize minimum = minimumSizeHint();
    setMinimumSize(minimum);
    const QSize size = event->size().expandedTo(minimum);

    const int o = d->extent(event->oldSize());
    const int n = d->extent(size);
    // The first resize has no old size (-1): there is no earlier split to keep.
    if (o > 0 && n > 0) {
        if (d->resizeMode == SecondKeepsSize)
            d->ratio = (n - o * (1.0 - d->ratio)) / n;
        else if (d->resizeMode == FirstKeepsSize)
            d->ratio = o * d->ratio / n;
    }
    limitRatio(size);
    layoutChildren(size);
}

void KrDynamicDivider::moveDivider(int distance)
{
    if (d->toggled)
        return;
    const QSize size = this->size().expandedTo(minimumSizeHint());
    const int extent = d->extent(size);
    if (extent <= 0)
        return;
    d->ratio += double(distance) / extent;
    limitRatio(size);
    layoutChildren(size);
}

void KrDynamicDivider::toggleWidget()
{
    if (!d->bar->toggleEnabled() || !d->first || !d->second)
        return;
    if (!d->toggled)
        d->collapsedIsSecond = d->collapseSecond;
    QWidget* collapsing = d->collapsedIsSecond ? d->second : d->first;
    d->toggled = !d->toggled;
    // Visibility follows the state, so a child hidden by someone else cannot invert it.
    collapsing->setVisible(!d->toggled);
    d->updateArrow();
    const QSize size = this->size().expandedTo(minimumSizeHint());
    limitRatio(size);
    layoutChildren(size);
}

bool KrDynamicDivider::isToggled()
{
    return d->toggled;
}
