#include "krviewport.h"

#include <QLinearGradient>
#include <QPainter>

KrViewport::KrViewport(QWidget* parent) : QWidget(parent)
{
    setObjectName(QStringLiteral("Viewport"));
    setMinimumSize(120, 120);
}

QSize KrViewport::sizeHint() const
{
    return QSize(360, 600);
}

void KrViewport::paintEvent(QPaintEvent*)
{
    QPainter p(this);
    p.setRenderHint(QPainter::Antialiasing);
    QLinearGradient sky(0, 0, 0, height());
    sky.setColorAt(0.0, QColor(58, 62, 70));
    sky.setColorAt(1.0, QColor(28, 30, 34));
    p.fillRect(rect(), sky);

    // A ground grid in simple perspective towards a horizon at 40% of the height.
    const qreal horizon = height() * 0.4;
    const qreal cx = width() / 2.0;
    p.setPen(QPen(QColor(90, 96, 108), 1));
    for (int i = -10; i <= 10; ++i) {
        const qreal bottomX = cx + i * width() / 6.0;
        p.drawLine(QPointF(cx + i * width() / 60.0, horizon), QPointF(bottomX, height()));
    }
    for (int j = 1; j <= 12; ++j) {
        const qreal t = j / 12.0;
        const qreal y = horizon + (height() - horizon) * t * t;
        p.drawLine(QPointF(0, y), QPointF(width(), y));
    }
    p.setPen(QColor(170, 176, 188));
    p.drawText(rect().adjusted(8, 8, -8, -8), Qt::AlignLeft | Qt::AlignTop, tr("Viewport"));
}
