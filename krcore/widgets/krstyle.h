#pragma once

#include "krcore_global.h"

#include <QColor>
#include <QIcon>
#include <QProxyStyle>

// The colours of the host's look, for code that paints by hand (brick items, wires).
struct KRCORE_EXPORT KrColors
{
    QColor window, base, text, dimText, highlight, highlightedText, border;
    QColor brickBody, brickTitle, brickTitleText, brickSelected, wire, wireSelected;
};

// The host's style. It answers the host's custom pixel metrics, primitives, controls and hints
// (QStyle::PM_CustomBase + n, ...) used by the editor's small widgets, over a Fusion base.
class KRCORE_EXPORT KrStyle : public QProxyStyle
{
    Q_OBJECT
public:
    KrStyle();
    ~KrStyle() override;

    QIcon getActionIcon(const QString& name) const;
    const KrColors& getColors() const;
    // QProxyStyle overrides are declared in the implementation's header section below.
    int pixelMetric(PixelMetric metric, const QStyleOption* option = nullptr,
                    const QWidget* widget = nullptr) const override;
    void drawPrimitive(PrimitiveElement element, const QStyleOption* option, QPainter* painter,
                       const QWidget* widget = nullptr) const override;
    void drawControl(ControlElement element, const QStyleOption* option, QPainter* painter,
                     const QWidget* widget = nullptr) const override;
    int styleHint(StyleHint hint, const QStyleOption* option = nullptr,
                  const QWidget* widget = nullptr, QStyleHintReturn* returnData = nullptr) const override;

private:
    KrColors m_colors;
};
