#include "krstyle.h"

#include <QLinearGradient>
#include <QPainter>
#include <QPainterPath>
#include <QPixmap>
#include <QRadialGradient>
#include <QStyleFactory>
#include <QStyleOption>
#include <QWidget>
#include <QtMath>

namespace {
// Icon colours, shared by every drawn icon so the set looks like one family.
const QColor kInk(0x3b, 0x42, 0x49);
const QColor kAccent(0x3a, 0x78, 0xc9);
const QColor kPaper(0xff, 0xff, 0xff);
const QColor kFolder(0xe8, 0xb7, 0x4a);
const QColor kGreen(0x3e, 0x9b, 0x4f);
const QColor kRed(0xd1, 0x4b, 0x4b);

QPen inkPen(const QColor& color, qreal width)
{
    QPen pen(color, width);
    pen.setCapStyle(Qt::RoundCap);
    pen.setJoinStyle(Qt::RoundJoin);
    return pen;
}

void drawPage(QPainter& p, const QRectF& r)
{
    p.setPen(inkPen(kInk, 1.0));
    p.setBrush(kPaper);
    p.drawRect(r);
}

void drawFolder(QPainter& p, bool open)
{
    p.setPen(inkPen(kFolder.darker(150), 1.0));
    p.setBrush(kFolder.darker(115));
    QPainterPath back;
    back.moveTo(1.5, 3.5);
    back.lineTo(6.0, 3.5);
    back.lineTo(7.5, 5.0);
    back.lineTo(14.5, 5.0);
    back.lineTo(14.5, 13.5);
    back.lineTo(1.5, 13.5);
    back.closeSubpath();
    p.drawPath(back);
    p.setBrush(kFolder);
    if (open) {
        QPolygonF front;
        front << QPointF(3.5, 7.5) << QPointF(15.5, 7.5) << QPointF(13.5, 13.5)
              << QPointF(1.5, 13.5);
        p.drawPolygon(front);
    } else {
        p.drawRect(QRectF(1.5, 6.5, 13.0, 7.0));
    }
}

void drawMagnifier(QPainter& p)
{
    p.setPen(inkPen(kInk, 2.5));
    p.drawLine(QPointF(10.5, 10.5), QPointF(14.5, 14.5));
    p.setPen(inkPen(kInk, 1.5));
    p.setBrush(QColor(0xe6, 0xf0, 0xfb));
    p.drawEllipse(QPointF(6.5, 6.5), 4.75, 4.75);
}

void drawCurvedArrow(QPainter& p)
{
    p.setPen(inkPen(kAccent, 2.0));
    p.setBrush(Qt::NoBrush);
    QPainterPath path;
    path.moveTo(13.0, 13.0);
    path.cubicTo(13.5, 7.0, 10.0, 5.0, 5.0, 5.0);
    p.drawPath(path);
    p.setPen(Qt::NoPen);
    p.setBrush(kAccent);
    QPolygonF head;
    head << QPointF(0.5, 5.0) << QPointF(5.5, 0.5) << QPointF(5.5, 9.5);
    p.drawPolygon(head);
}

void drawBox(QPainter& p, const QRectF& r, const QColor& fill)
{
    p.setPen(inkPen(kInk, 1.0));
    p.setBrush(fill);
    p.drawRoundedRect(r, 1.0, 1.0);
}

// Draws the icon name into a 16 x 16 unit square. False for names without a drawing.
bool paintActionIcon(QPainter& p, const QString& name)
{
    if (name == QLatin1String("new")) {
        QPainterPath page;
        page.moveTo(3.5, 1.5);
        page.lineTo(10.0, 1.5);
        page.lineTo(13.5, 5.0);
        page.lineTo(13.5, 14.5);
        page.lineTo(3.5, 14.5);
        page.closeSubpath();
        p.setPen(inkPen(kInk, 1.0));
        p.setBrush(kPaper);
        p.drawPath(page);
        p.setBrush(Qt::NoBrush);
        p.drawPolyline(QPolygonF()
                       << QPointF(10.0, 1.5) << QPointF(10.0, 5.0) << QPointF(13.5, 5.0));
        p.setPen(inkPen(kAccent, 1.5));
        p.drawLine(QPointF(8.5, 8.0), QPointF(8.5, 12.0));
        p.drawLine(QPointF(6.5, 10.0), QPointF(10.5, 10.0));
    } else if (name == QLatin1String("open")) {
        drawFolder(p, true);
    } else if (name == QLatin1String("folder")) {
        drawFolder(p, false);
    } else if (name == QLatin1String("save")) {
        p.setPen(inkPen(kAccent.darker(140), 1.0));
        p.setBrush(kAccent);
        p.drawRoundedRect(QRectF(1.5, 1.5, 13.0, 13.0), 1.5, 1.5);
        p.setPen(Qt::NoPen);
        p.setBrush(kPaper);
        p.drawRect(QRectF(4.0, 2.0, 8.0, 4.5));
        p.drawRect(QRectF(4.5, 9.0, 7.0, 5.5));
        p.setBrush(kInk);
        p.drawRect(QRectF(9.0, 2.5, 2.0, 3.0));
    } else if (name == QLatin1String("copy")) {
        drawPage(p, QRectF(1.5, 1.5, 8.0, 10.0));
        drawPage(p, QRectF(6.5, 4.5, 8.0, 10.0));
    } else if (name == QLatin1String("cut")) {
        p.setPen(inkPen(kInk, 1.5));
        p.drawLine(QPointF(5.5, 10.5), QPointF(11.5, 1.5));
        p.drawLine(QPointF(10.5, 10.5), QPointF(4.5, 1.5));
        p.setBrush(kPaper);
        p.setPen(inkPen(kRed, 1.5));
        p.drawEllipse(QPointF(4.5, 12.5), 2.25, 2.25);
        p.drawEllipse(QPointF(11.5, 12.5), 2.25, 2.25);
    } else if (name == QLatin1String("paste")) {
        p.setPen(inkPen(QColor(0x8a, 0x6a, 0x3a), 1.0));
        p.setBrush(QColor(0xc9, 0xa4, 0x6a));
        p.drawRoundedRect(QRectF(2.5, 2.5, 10.0, 12.0), 1.0, 1.0);
        p.setBrush(kInk);
        p.drawRect(QRectF(5.5, 1.0, 4.0, 3.0));
        drawPage(p, QRectF(6.5, 6.5, 8.0, 8.5));
    } else if (name == QLatin1String("undo")) {
        drawCurvedArrow(p);
    } else if (name == QLatin1String("redo")) {
        p.translate(16.0, 0.0);
        p.scale(-1.0, 1.0);
        drawCurvedArrow(p);
    } else if (name == QLatin1String("zoomin") || name == QLatin1String("zoomout")) {
        drawMagnifier(p);
        p.setPen(inkPen(kAccent, 1.5));
        p.drawLine(QPointF(4.5, 6.5), QPointF(8.5, 6.5));
        if (name == QLatin1String("zoomin"))
            p.drawLine(QPointF(6.5, 4.5), QPointF(6.5, 8.5));
    } else if (name == QLatin1String("zoomfit")) {
        p.setPen(inkPen(kInk, 1.5));
        p.setBrush(Qt::NoBrush);
        const QPointF corners[4][3] = {{{1, 5}, {1, 1}, {5, 1}},
                                       {{11, 1}, {15, 1}, {15, 5}},
                                       {{15, 11}, {15, 15}, {11, 15}},
                                       {{5, 15}, {1, 15}, {1, 11}}};
        for (const auto& c : corners)
            p.drawPolyline(c, 3);
        p.setPen(Qt::NoPen);
        p.setBrush(kAccent);
        p.drawRect(QRectF(5.0, 5.0, 6.0, 6.0));
    } else if (name == QLatin1String("arrange")) {
        p.setPen(inkPen(kInk, 1.0));
        p.drawLine(QPointF(6.0, 4.0), QPointF(10.0, 8.0));
        p.drawLine(QPointF(6.0, 12.0), QPointF(10.0, 8.0));
        drawBox(p, QRectF(1.5, 2.0, 5.0, 4.0), kPaper);
        drawBox(p, QRectF(1.5, 10.0, 5.0, 4.0), kPaper);
        drawBox(p, QRectF(9.5, 6.0, 5.0, 4.0), kAccent);
    } else if (name == QLatin1String("apply")) {
        p.setPen(inkPen(kGreen, 2.5));
        p.drawPolyline(QPolygonF()
                       << QPointF(2.5, 8.5) << QPointF(6.5, 12.5) << QPointF(13.5, 3.5));
    } else if (name == QLatin1String("delete") || name == QLatin1String("close")) {
        p.setPen(inkPen(name == QLatin1String("delete") ? kRed : kInk, 2.5));
        p.drawLine(QPointF(3.5, 3.5), QPointF(12.5, 12.5));
        p.drawLine(QPointF(12.5, 3.5), QPointF(3.5, 12.5));
    } else if (name == QLatin1String("add") || name == QLatin1String("remove")) {
        p.setPen(inkPen(name == QLatin1String("add") ? kGreen : kRed, 2.5));
        p.drawLine(QPointF(3.0, 8.0), QPointF(13.0, 8.0));
        if (name == QLatin1String("add"))
            p.drawLine(QPointF(8.0, 3.0), QPointF(8.0, 13.0));
    } else if (name == QLatin1String("group")) {
        QPen dash = inkPen(kInk, 1.0);
        dash.setStyle(Qt::DashLine);
        p.setPen(dash);
        p.setBrush(Qt::NoBrush);
        p.drawRoundedRect(QRectF(0.5, 0.5, 15.0, 15.0), 2.0, 2.0);
        drawBox(p, QRectF(3.0, 3.0, 6.0, 5.0), kPaper);
        drawBox(p, QRectF(7.0, 8.0, 6.0, 5.0), kAccent);
    } else if (name == QLatin1String("refresh")) {
        p.setPen(inkPen(kAccent, 2.0));
        p.setBrush(Qt::NoBrush);
        p.drawArc(QRectF(2.5, 2.5, 11.0, 11.0), 60 * 16, 290 * 16);
        p.setPen(Qt::NoPen);
        p.setBrush(kAccent);
        QPolygonF head;
        head << QPointF(8.5, 0.0) << QPointF(13.5, 2.0) << QPointF(9.5, 6.0);
        p.drawPolygon(head);
    } else if (name == QLatin1String("preferences")) {
        p.setPen(Qt::NoPen);
        p.setBrush(kInk);
        p.save();
        p.translate(8.0, 8.0);
        for (int i = 0; i < 8; ++i) {
            p.drawRect(QRectF(-1.5, -7.5, 3.0, 4.0));
            p.rotate(45.0);
        }
        p.restore();
        p.drawEllipse(QPointF(8.0, 8.0), 5.0, 5.0);
        p.setBrush(kPaper);
        p.drawEllipse(QPointF(8.0, 8.0), 2.0, 2.0);
    } else if (name == QLatin1String("import") || name == QLatin1String("export")) {
        p.setPen(inkPen(kInk, 1.5));
        p.setBrush(Qt::NoBrush);
        p.drawPolyline(QPolygonF() << QPointF(1.5, 10.0) << QPointF(1.5, 14.5)
                                   << QPointF(14.5, 14.5) << QPointF(14.5, 10.0));
        p.setPen(inkPen(kAccent, 2.0));
        p.drawLine(QPointF(8.0, 1.5), QPointF(8.0, 11.0));
        if (name == QLatin1String("import")) {
            p.drawPolyline(QPolygonF()
                           << QPointF(4.5, 7.5) << QPointF(8.0, 11.0) << QPointF(11.5, 7.5));
        } else {
            p.drawPolyline(QPolygonF()
                           << QPointF(4.5, 5.0) << QPointF(8.0, 1.5) << QPointF(11.5, 5.0));
        }
    } else if (name == QLatin1String("preview")) {
        QRadialGradient g(QPointF(6.0, 6.0), 8.0);
        g.setColorAt(0.0, kPaper);
        g.setColorAt(1.0, kAccent.darker(130));
        p.setPen(Qt::NoPen);
        p.setBrush(g);
        p.drawEllipse(QPointF(8.0, 8.0), 6.5, 6.5);
    } else {
        return false;
    }
    return true;
}

// "KrSaveAction" -> "save", "Zoom-In" -> "zoomin": action class names and loose spellings
// lead to the same drawing.
QString iconKey(const QString& name)
{
    QString key = name.trimmed();
    if (key.startsWith(QLatin1String("Kr")) && key.endsWith(QLatin1String("Action")) &&
        key.size() > 8)
        key = key.mid(2, key.size() - 8);
    key = key.toLower();
    key.remove(QLatin1Char('-'));
    key.remove(QLatin1Char('_'));
    key.remove(QLatin1Char(' '));
    static const QHash<QString, QString> aliases = {
        {QStringLiteral("sicut"), QStringLiteral("cut")},
        {QStringLiteral("customize"), QStringLiteral("preferences")},
        {QStringLiteral("settings"), QStringLiteral("preferences")},
        {QStringLiteral("options"), QStringLiteral("preferences")},
        {QStringLiteral("erase"), QStringLiteral("delete")},
        {QStringLiteral("reload"), QStringLiteral("refresh")},
        {QStringLiteral("ok"), QStringLiteral("apply")},
        {QStringLiteral("fit"), QStringLiteral("zoomfit")},
        {QStringLiteral("layout"), QStringLiteral("arrange")},
        {QStringLiteral("autoarrange"), QStringLiteral("arrange")},
    };
    return aliases.value(key, key);
}

QStyle::StandardPixmap standardPixmapFor(const QString& key, bool* found)
{
    static const QHash<QString, QStyle::StandardPixmap> map = {
        {QStringLiteral("help"), QStyle::SP_DialogHelpButton},
        {QStringLiteral("home"), QStyle::SP_DirHomeIcon},
        {QStringLiteral("back"), QStyle::SP_ArrowBack},
        {QStringLiteral("forward"), QStyle::SP_ArrowForward},
        {QStringLiteral("up"), QStyle::SP_ArrowUp},
        {QStringLiteral("down"), QStyle::SP_ArrowDown},
        {QStringLiteral("left"), QStyle::SP_ArrowLeft},
        {QStringLiteral("right"), QStyle::SP_ArrowRight},
        {QStringLiteral("stop"), QStyle::SP_BrowserStop},
        {QStringLiteral("info"), QStyle::SP_MessageBoxInformation},
        {QStringLiteral("warning"), QStyle::SP_MessageBoxWarning},
        {QStringLiteral("error"), QStyle::SP_MessageBoxCritical},
        {QStringLiteral("critical"), QStyle::SP_MessageBoxCritical},
        {QStringLiteral("question"), QStyle::SP_MessageBoxQuestion},
        {QStringLiteral("trash"), QStyle::SP_TrashIcon},
        {QStringLiteral("computer"), QStyle::SP_ComputerIcon},
        {QStringLiteral("file"), QStyle::SP_FileIcon},
        {QStringLiteral("play"), QStyle::SP_MediaPlay},
        {QStringLiteral("pause"), QStyle::SP_MediaPause},
        {QStringLiteral("cancel"), QStyle::SP_DialogCancelButton},
        {QStringLiteral("discard"), QStyle::SP_DialogDiscardButton},
    };
    *found = map.contains(key);
    return map.value(key, QStyle::SP_CustomBase);
}

QColor mix(const QColor& a, const QColor& b, qreal t)
{
    return QColor::fromRgbF(a.redF() + (b.redF() - a.redF()) * t,
                            a.greenF() + (b.greenF() - a.greenF()) * t,
                            a.blueF() + (b.blueF() - a.blueF()) * t);
}
} // namespace

KrStyle::KrStyle() : QProxyStyle(QStyleFactory::create(QStringLiteral("Fusion")))
{
    setObjectName(QStringLiteral("KrStyle"));
    m_colors.window = QColor(0xee, 0xf0, 0xf3);
    m_colors.base = QColor(0xff, 0xff, 0xff);
    m_colors.text = QColor(0x1f, 0x23, 0x28);
    m_colors.dimText = QColor(0x6b, 0x71, 0x78);
    m_colors.highlight = QColor(0x3a, 0x78, 0xc9);
    m_colors.highlightedText = QColor(0xff, 0xff, 0xff);
    m_colors.border = QColor(0xb9, 0xbf, 0xc7);
    m_colors.brickBody = QColor(0xf7, 0xf8, 0xfa);
    m_colors.brickTitle = QColor(0x5b, 0x7f, 0xa8);
    m_colors.brickTitleText = QColor(0xff, 0xff, 0xff);
    m_colors.brickSelected = QColor(0xf2, 0xb5, 0x44);
    m_colors.wire = QColor(0x5e, 0x66, 0x70);
    m_colors.wireSelected = QColor(0x3a, 0x78, 0xc9);
}

KrStyle::~KrStyle() = default;

const KrColors& KrStyle::getColors() const
{
    return m_colors;
}

QPalette KrStyle::palette() const
{
    const KrColors& c = m_colors;
    QPalette pal(c.text, c.window);
    pal.setColor(QPalette::Window, c.window);
    pal.setColor(QPalette::WindowText, c.text);
    pal.setColor(QPalette::Base, c.base);
    pal.setColor(QPalette::AlternateBase, QColor(0xf5, 0xf7, 0xfa));
    pal.setColor(QPalette::Text, c.text);
    pal.setColor(QPalette::Button, QColor(0xf4, 0xf5, 0xf7));
    pal.setColor(QPalette::ButtonText, c.text);
    pal.setColor(QPalette::BrightText, Qt::white);
    pal.setColor(QPalette::Highlight, c.highlight);
    pal.setColor(QPalette::HighlightedText, c.highlightedText);
    pal.setColor(QPalette::Light, Qt::white);
    pal.setColor(QPalette::Midlight, QColor(0xf7, 0xf8, 0xfa));
    pal.setColor(QPalette::Mid, QColor(0xc4, 0xc9, 0xd0));
    pal.setColor(QPalette::Dark, QColor(0xa0, 0xa6, 0xae));
    pal.setColor(QPalette::Shadow, QColor(0x6b, 0x71, 0x78));
    pal.setColor(QPalette::ToolTipBase, QColor(0xff, 0xfb, 0xe6));
    pal.setColor(QPalette::ToolTipText, c.text);
    pal.setColor(QPalette::Link, QColor(0x2a, 0x64, 0xb8));
    pal.setColor(QPalette::PlaceholderText, QColor(0x8a, 0x90, 0x99));
    const QColor disabledText(0x9a, 0xa0, 0xa6);
    pal.setColor(QPalette::Disabled, QPalette::WindowText, disabledText);
    pal.setColor(QPalette::Disabled, QPalette::Text, disabledText);
    pal.setColor(QPalette::Disabled, QPalette::ButtonText, disabledText);
    pal.setColor(QPalette::Disabled, QPalette::Base, c.window);
    pal.setColor(QPalette::Disabled, QPalette::Highlight, QColor(0xa8, 0xb4, 0xc4));
    pal.setColor(QPalette::Inactive, QPalette::Highlight, QColor(0x6f, 0x9a, 0xd3));
    return pal;
}

QPalette KrStyle::standardPalette() const
{
    return palette();
}

int KrStyle::pixelMetric(PixelMetric metric, const QStyleOption* option,
                         const QWidget* widget) const
{
    switch (uint(metric)) {
    case PM_DividerMargin:
        return 2;
    case PM_DividerBarWidth:
        return 6;
    case PM_GroupIndent:
        return 8;
    case PM_ResizeButton:
        return 14;
    case PM_BrickTitleBarHeight:
        return 18;
    case PM_OptionsButton:
        return 14;
    default:
        return QProxyStyle::pixelMetric(metric, option, widget);
    }
}

int KrStyle::styleHint(StyleHint hint, const QStyleOption* option, const QWidget* widget,
                       QStyleHintReturn* returnData) const
{
    if (uint(hint) == uint(SH_OptionsButtonMask))
        return 1;
    return QProxyStyle::styleHint(hint, option, widget, returnData);
}

void KrStyle::drawPrimitive(PrimitiveElement element, const QStyleOption* option, QPainter* painter,
                            const QWidget* widget) const
{
    if (!option || !painter) {
        QProxyStyle::drawPrimitive(element, option, painter, widget);
        return;
    }
    const QRect r = option->rect;
    switch (uint(element)) {
    case PE_BrickBar: {
        const QColor base = option->palette.color(QPalette::Window);
        QLinearGradient g(r.topLeft(), r.bottomLeft());
        g.setColorAt(0.0, base.lighter(106));
        g.setColorAt(1.0, base.darker(108));
        painter->save();
        painter->fillRect(r, g);
        painter->setPen(m_colors.border);
        painter->drawLine(r.bottomLeft(), r.bottomRight());
        painter->restore();
        return;
    }
    case PE_RoundMask: {
        // Everything outside the rounded square goes white, which a mask conversion turns
        // transparent; the inside is left as the caller filled it.
        const bool mono = painter->device() && painter->device()->depth() == 1;
        const qreal radius = qMin(r.width(), r.height()) / 4.0;
        QPainterPath outside;
        outside.addRect(r);
        QPainterPath inside;
        inside.addRoundedRect(QRectF(r), radius, radius);
        painter->save();
        painter->setRenderHint(QPainter::Antialiasing, false);
        painter->fillPath(outside.subtracted(inside),
                          mono ? QColor(Qt::color0) : QColor(Qt::white));
        painter->restore();
        return;
    }
    case PE_StyledButton: {
        const bool down = option->state & (State_Sunken | State_On);
        const bool hover = option->state & State_MouseOver;
        const bool enabled = option->state & State_Enabled;
        QColor face = option->palette.color(QPalette::Button);
        if (down)
            face = face.darker(112);
        else if (hover)
            face = face.lighter(104);
        painter->save();
        painter->setRenderHint(QPainter::Antialiasing, true);
        painter->setPen(hover && enabled ? m_colors.highlight : m_colors.border);
        painter->setBrush(face);
        painter->drawRoundedRect(QRectF(r).adjusted(0.5, 0.5, -0.5, -0.5), 2.0, 2.0);
        // A corner grip: three diagonal strokes towards the bottom-right.
        painter->setPen(QPen(enabled ? m_colors.dimText : m_colors.border, 1.0));
        const QRectF in = QRectF(r).adjusted(2.5, 2.5, -2.5, -2.5);
        for (int i = 1; i <= 3; ++i) {
            const qreal t = in.width() * i / 3.0;
            painter->drawLine(QPointF(in.right() - t, in.bottom()),
                              QPointF(in.right(), in.bottom() - t));
        }
        painter->restore();
        return;
    }
    default:
        QProxyStyle::drawPrimitive(element, option, painter, widget);
    }
}

void KrStyle::drawControl(ControlElement element, const QStyleOption* option, QPainter* painter,
                          const QWidget* widget) const
{
    if (!option || !painter) {
        QProxyStyle::drawControl(element, option, painter, widget);
        return;
    }
    const QRect r = option->rect;
    switch (uint(element)) {
    case CE_OptionsButton: {
        const bool enabled = option->state & State_Enabled;
        const bool down = option->state & (State_DownArrow | State_Sunken);
        const bool hover = enabled && (option->state & State_MouseOver);
        QColor top = option->palette.color(QPalette::Button).lighter(104);
        QColor bottom = option->palette.color(QPalette::Button).darker(110);
        if (down) {
            top = top.darker(115);
            bottom = bottom.darker(108);
        } else if (hover) {
            top = mix(top, m_colors.highlight, 0.12);
            bottom = mix(bottom, m_colors.highlight, 0.12);
        }
        const QRectF box = QRectF(r).adjusted(0.5, 0.5, -0.5, -0.5);
        const qreal radius = qMin(r.width(), r.height()) / 4.0;
        QLinearGradient g(box.topLeft(), box.bottomLeft());
        g.setColorAt(0.0, top);
        g.setColorAt(1.0, bottom);
        painter->save();
        painter->setRenderHint(QPainter::Antialiasing, true);
        painter->setPen(hover || (option->state & State_HasFocus) ? m_colors.highlight
                                                                  : m_colors.border);
        painter->setBrush(g);
        painter->drawRoundedRect(box, radius, radius);
        // The arrow: a small triangle, nudged down while pressed.
        const qreal w = qMax<qreal>(4.0, r.width() * 0.5);
        const qreal h = w / 2.0;
        QPointF c = QRectF(r).center();
        if (down)
            c += QPointF(0.0, 1.0);
        QPolygonF arrow;
        arrow << QPointF(c.x() - w / 2.0, c.y() - h / 2.0)
              << QPointF(c.x() + w / 2.0, c.y() - h / 2.0) << QPointF(c.x(), c.y() + h / 2.0);
        painter->setPen(Qt::NoPen);
        painter->setBrush(enabled
                              ? option->palette.color(QPalette::ButtonText)
                              : option->palette.color(QPalette::Disabled, QPalette::ButtonText));
        painter->drawPolygon(arrow);
        painter->restore();
        return;
    }
    case CE_BrickTitleBar: {
        const int side = qMin(r.height(), r.width());
        const QRect closeRect(r.right() - side + 1, r.top(), side, r.height());
        QColor title = m_colors.brickTitle;
        if (!(option->state & State_Enabled))
            title = mix(title, m_colors.window, 0.5);
        QLinearGradient g(r.topLeft(), r.bottomLeft());
        g.setColorAt(0.0, title.lighter(118));
        g.setColorAt(1.0, title);
        painter->save();
        painter->fillRect(r, g);
        painter->setPen(title.darker(125));
        painter->drawLine(r.bottomLeft(), r.bottomRight());

        QString text;
        if (const auto* tb = qstyleoption_cast<const QStyleOptionTitleBar*>(option))
            text = tb->text;
        else if (widget)
            text = widget->windowTitle();
        if (!text.isEmpty()) {
            const QRect textRect = QRect(r.left() + 5, r.top(), r.width() - side - 8, r.height());
            painter->setPen(m_colors.brickTitleText);
            painter->setFont(widget ? widget->font() : painter->font());
            painter->drawText(
                textRect, Qt::AlignLeft | Qt::AlignVCenter,
                painter->fontMetrics().elidedText(text, Qt::ElideRight, textRect.width()));
        }
        // The close mark: a cross inset in the last square.
        const qreal inset = qMax<qreal>(3.0, side * 0.3);
        const QRectF cross = QRectF(closeRect).adjusted(inset, inset, -inset, -inset);
        painter->setRenderHint(QPainter::Antialiasing, true);
        painter->setPen(inkPen(m_colors.brickTitleText, 1.6));
        painter->drawLine(cross.topLeft(), cross.bottomRight());
        painter->drawLine(cross.topRight(), cross.bottomLeft());
        painter->restore();
        return;
    }
    default:
        QProxyStyle::drawControl(element, option, painter, widget);
    }
}

QIcon KrStyle::getActionIcon(const QString& name) const
{
    const QString key = iconKey(name);
    auto it = m_icons.constFind(key);
    if (it != m_icons.constEnd())
        return it.value();
    const QIcon icon = drawActionIcon(key);
    m_icons.insert(key, icon);
    return icon;
}

QIcon KrStyle::drawActionIcon(const QString& key) const
{
    if (key.isEmpty())
        return QIcon();
    QIcon icon;
    for (int size : {16, 24, 32, 48}) {
        QPixmap pixmap(size, size);
        pixmap.fill(Qt::transparent);
        QPainter p(&pixmap);
        p.setRenderHint(QPainter::Antialiasing, true);
        p.scale(size / 16.0, size / 16.0);
        if (!paintActionIcon(p, key))
            break;
        p.end();
        icon.addPixmap(pixmap);
    }
    if (!icon.isNull())
        return icon;
    bool found = false;
    const StandardPixmap sp = standardPixmapFor(key, &found);
    return found ? standardIcon(sp) : QIcon();
}
