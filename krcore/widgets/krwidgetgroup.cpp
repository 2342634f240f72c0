#include "krwidgetgroup.h"

#include <QKeyEvent>
#include <QLinearGradient>
#include <QMouseEvent>
#include <QPainter>

// ------------------------------------------------------------------------ KrWidgetListLayout

KrWidgetListLayout::KrWidgetListLayout(QWidget* parent) : QVBoxLayout(parent) {}

KrWidgetListLayout::~KrWidgetListLayout() = default;

void KrWidgetListLayout::addGroup(KrWidgetGroup* group)
{
    if (group && indexOf(group) < 0)
        addWidget(group);
}

QList<KrWidgetGroup*> KrWidgetListLayout::getGroups() const
{
    QList<KrWidgetGroup*> groups;
    for (int i = 0; i < count(); ++i) {
        if (auto* g = qobject_cast<KrWidgetGroup*>(itemAt(i)->widget()))
            groups.append(g);
    }
    return groups;
}

// ----------------------------------------------------------------------------- the title bar

namespace {
// The clickable strip on top of a group. It draws the arrow and title and toggles its group.
class KrWidgetGroupBar : public QWidget
{
public:
    explicit KrWidgetGroupBar(KrWidgetGroup* group) : QWidget(group), m_group(group)
    {
        setObjectName(QStringLiteral("WidgetGroupBar"));
        setFocusPolicy(Qt::TabFocus);
        setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Fixed);
        setCursor(Qt::PointingHandCursor);
    }

    QSize sizeHint() const override
    {
        return QSize(indent() + 16 + fontMetrics().horizontalAdvance(m_group->getTitle()) + 8,
                     qMax(18, fontMetrics().height() + 6));
    }
    QSize minimumSizeHint() const override { return QSize(indent() + 24, sizeHint().height()); }

protected:
    int indent() const { return 4 + KrWidgetGroup::IndentPerLevel * m_group->getLevel(); }

    void paintEvent(QPaintEvent*) override
    {
        QPainter p(this);
        const QRect r = rect();
        const QPalette& pal = palette();
        const bool top = m_group->getLevel() == 0;
        const QColor base = pal.color(QPalette::Window);
        QLinearGradient g(r.topLeft(), r.bottomLeft());
        g.setColorAt(0.0, top ? base.darker(103) : base.lighter(104));
        g.setColorAt(1.0, top ? base.darker(110) : base.darker(103));
        p.fillRect(r, g);
        p.setPen(pal.color(QPalette::Mid));
        p.drawLine(r.bottomLeft(), r.bottomRight());
        if (hasFocus()) {
            p.setPen(pal.color(QPalette::Highlight));
            p.drawRect(r.adjusted(0, 0, -1, -1));
        }

        // The arrow points right when collapsed, down when open.
        p.setRenderHint(QPainter::Antialiasing, true);
        const qreal cx = indent() + 5.0;
        const qreal cy = r.height() / 2.0;
        QPolygonF tri;
        if (m_group->isCollapsed())
            tri << QPointF(cx - 2.0, cy - 4.0) << QPointF(cx + 2.5, cy)
                << QPointF(cx - 2.0, cy + 4.0);
        else
            tri << QPointF(cx - 4.0, cy - 2.0) << QPointF(cx + 4.0, cy - 2.0)
                << QPointF(cx, cy + 2.5);
        p.setPen(Qt::NoPen);
        p.setBrush(pal.color(QPalette::WindowText));
        p.drawPolygon(tri);

        QFont f = font();
        f.setBold(top);
        p.setFont(f);
        p.setPen(
            pal.color(isEnabled() ? QPalette::Active : QPalette::Disabled, QPalette::WindowText));
        const QRect textRect(indent() + 14, 0, r.width() - indent() - 18, r.height());
        p.drawText(
            textRect, Qt::AlignLeft | Qt::AlignVCenter,
            QFontMetrics(f).elidedText(m_group->getTitle(), Qt::ElideRight, textRect.width()));
    }

    void mousePressEvent(QMouseEvent* event) override
    {
        m_pressed = event->button() == Qt::LeftButton;
        event->setAccepted(m_pressed);
    }

    void mouseReleaseEvent(QMouseEvent* event) override
    {
        if (event->button() != Qt::LeftButton || !m_pressed) {
            event->ignore();
            return;
        }
        m_pressed = false;
        if (rect().contains(event->pos()))
            m_group->toggleCollapsed();
    }

    void keyPressEvent(QKeyEvent* event) override
    {
        switch (event->key()) {
        case Qt::Key_Space:
        case Qt::Key_Return:
        case Qt::Key_Enter:
            m_group->toggleCollapsed();
            break;
        case Qt::Key_Left:
            m_group->setCollapsed(true);
            break;
        case Qt::Key_Right:
            m_group->setCollapsed(false);
            break;
        default:
            QWidget::keyPressEvent(event);
        }
    }

private:
    KrWidgetGroup* m_group;
    bool m_pressed = false;
};
} // namespace

// ---------------------------------------------------------------------------- KrWidgetGroup

struct KrWidgetGroup::Private
{
    QString title;
    int level = 0;
    bool collapsed = false;
    QWidget* bar = nullptr;
    QWidget* body = nullptr;
    QVBoxLayout* bodyLayout = nullptr;
};

KrWidgetGroup::KrWidgetGroup(KrWidgetListLayout* layout, const QString& title,
                             const QString& objectName, int level)
    : QWidget(layout ? layout->parentWidget() : nullptr), d(new Private)
{
    init(title, objectName, level);
    if (layout)
        layout->addGroup(this);
}

KrWidgetGroup::KrWidgetGroup(KrWidgetGroup* parentGroup, const QString& title,
                             const QString& objectName, int level)
    : QWidget(parentGroup ? parentGroup->getBody() : nullptr), d(new Private)
{
    init(title, objectName, level);
    if (parentGroup)
        parentGroup->addGroup(this);
}

KrWidgetGroup::~KrWidgetGroup() = default;

void KrWidgetGroup::init(const QString& title, const QString& objectName, int level)
{
    setObjectName(objectName);
    d->title = title;
    d->level = qMax(0, level);
    setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Maximum);
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    d->bar = new KrWidgetGroupBar(this);
    layout->addWidget(d->bar);
    d->body = new QWidget(this);
    d->body->setObjectName(QStringLiteral("WidgetGroupBody"));
    d->bodyLayout = new QVBoxLayout(d->body);
    d->bodyLayout->setContentsMargins(0, 0, 0, 0);
    d->bodyLayout->setSpacing(0);
    layout->addWidget(d->body);
}

// Size caches up the chain are dropped at once, so callers that measure right after a change
// (minimum sizes of brick frames) see the new size without waiting for the event loop.
void KrWidgetGroup::relayout()
{
    d->bodyLayout->invalidate();
    d->body->updateGeometry();
    layout()->invalidate();
    updateGeometry();
}

void KrWidgetGroup::addGroup(KrWidgetGroup* group)
{
    addWidget(group);
}

void KrWidgetGroup::addWidget(QWidget* widget)
{
    if (!widget || widget == this || d->bodyLayout->indexOf(widget) >= 0)
        return;
    d->bodyLayout->addWidget(widget);
    relayout();
}

void KrWidgetGroup::removeWidget(QWidget* widget)
{
    if (widget && d->bodyLayout->indexOf(widget) >= 0) {
        d->bodyLayout->removeWidget(widget);
        widget->hide();
        widget->setParent(nullptr);
        relayout();
    }
}

void KrWidgetGroup::removeAllChildren()
{
    while (QLayoutItem* item = d->bodyLayout->takeAt(0)) {
        delete item->widget();
        delete item;
    }
    relayout();
}

QList<QWidget*> KrWidgetGroup::getChildren() const
{
    QList<QWidget*> children;
    for (int i = 0; i < d->bodyLayout->count(); ++i) {
        if (QWidget* w = d->bodyLayout->itemAt(i)->widget())
            children.append(w);
    }
    return children;
}

QWidget* KrWidgetGroup::getBar() const
{
    return d->bar;
}

QWidget* KrWidgetGroup::getBody() const
{
    return d->body;
}

QString KrWidgetGroup::getTitle() const
{
    return d->title;
}

void KrWidgetGroup::setTitle(const QString& title)
{
    if (title == d->title)
        return;
    d->title = title;
    d->bar->updateGeometry();
    d->bar->update();
}

int KrWidgetGroup::getLevel() const
{
    return d->level;
}

void KrWidgetGroup::setLevel(int level)
{
    level = qMax(0, level);
    if (level == d->level)
        return;
    d->level = level;
    d->bar->updateGeometry();
    d->bar->update();
}

bool KrWidgetGroup::isCollapsed() const
{
    return d->collapsed;
}

void KrWidgetGroup::setCollapsed(bool collapsed)
{
    if (collapsed == d->collapsed)
        return;
    d->collapsed = collapsed;
    d->body->setVisible(!collapsed);
    relayout();
    d->bar->update();
    emit collapsedChanged(collapsed);
}

void KrWidgetGroup::toggleCollapsed()
{
    setCollapsed(!d->collapsed);
}
