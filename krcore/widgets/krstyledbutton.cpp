#include "krstyledbutton.h"

#include "krstyle.h"

#include <QPainter>
#include <QStyleOptionButton>

KrStyledButton::KrStyledButton(QWidget* parent, const QString& name) : QAbstractButton(parent)
{
    setObjectName(name);
    setAttribute(Qt::WA_Hover, true);
    setFocusPolicy(Qt::NoFocus);
}

KrStyledButton::~KrStyledButton() = default;

QSize KrStyledButton::sizeHint() const
{
    return QSize(16, 16);
}

void KrStyledButton::paintEvent(QPaintEvent*)
{
    QPainter painter(this);
    QStyleOptionButton option;
    option.initFrom(this);
    option.rect = rect();
    if (isDown())
        option.state |= QStyle::State_Sunken;
    if (isChecked())
        option.state |= QStyle::State_On;
    if (!isDown() && !isChecked())
        option.state |= QStyle::State_Raised;
    option.text = text();
    option.icon = icon();
    option.iconSize = iconSize();
    // Only the host style knows the face; under any other style the button is a tool button.
    if (qobject_cast<KrStyle*>(style()))
        style()->drawPrimitive(QStyle::PrimitiveElement(KrStyle::PE_StyledButton), &option,
                               &painter, this);
    else
        style()->drawPrimitive(QStyle::PE_PanelButtonTool, &option, &painter, this);
}

void KrStyledButton::enterEvent(QEvent* event)
{
    update();
    QAbstractButton::enterEvent(event);
}

void KrStyledButton::leaveEvent(QEvent* event)
{
    update();
    QAbstractButton::leaveEvent(event);
}
