#include "krbrickoptionsframe.h"

#include "krbrickparam.h"

KrBrickOptionsFrame::KrBrickOptionsFrame(QWidget* parent) : QFrame(parent) {}

KrBrickOptionsFrame::~KrBrickOptionsFrame() = default;

QPointF KrBrickOptionsFrame::getParamPosition(KrBrickParam* param)
{
    const float y = getParamYPosition(param);
    if (!param || y < 0)
        return QPointF(-1, -1);
    // Inputs enter on the leading edge, outputs leave on the trailing one.
    const bool leftEdge = param->isInput() != isRightToLeft();
    QWidget* holder = parentWidget();
    const QPoint origin = holder ? mapTo(holder, QPoint(0, 0)) : QPoint(0, 0);
    const int width = holder ? holder->width() : this->width();
    return QPointF(leftEdge ? 0 : width, origin.y() + y);
}

void KrBrickOptionsFrame::setBrickFrame(QWidget*) {}

void KrBrickOptionsFrame::setBrick(KrShaderBrick* brick)
{
    m_brick = brick;
}

float KrBrickOptionsFrame::getParamYPosition(KrBrickParam*)
{
    return -1;
}

int KrBrickOptionsFrame::getConnectorSize(KrBrickParam*)
{
    return 20;
}

KrShaderBrick* KrBrickOptionsFrame::getBrick()
{
    return m_brick;
}

bool KrBrickOptionsFrame::isRightToLeft() const
{
    return m_rightToLeft;
}

void KrBrickOptionsFrame::setIsRightToLeft(bool rightToLeft)
{
    m_rightToLeft = rightToLeft;
}

void KrBrickOptionsFrame::setHideAdvanced(bool hide)
{
    if (hide == m_hideAdvanced)
        return;
    m_hideAdvanced = hide;
    emit hideAdvancedChanged();
}
