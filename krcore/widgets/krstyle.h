#pragma once

#include "krcore_global.h"

#include <QColor>
#include <QHash>
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

    // The host's custom numbers.
    enum CustomPixelMetric
    {
        PM_DividerMargin = PM_CustomBase,              // divider margin and spacing: 2
        PM_DividerBarWidth = PM_CustomBase + 1,        // divider bar thickness: 6
        PM_GroupIndent = PM_CustomBase + 2,            // widget group indent per level: 8
        PM_ResizeButton = PM_CustomBase + 10,          // twice the resize grip side: 14
        PM_BrickTitleBarHeight = PM_CustomBase + 0x13, // brick title bar height: 18
        PM_OptionsButton = PM_CustomBase + 61          // brick options button side: 14
    };
    enum CustomPrimitive
    {
        PE_StyledButton = PE_CustomBase + 43, // face of a KrStyledButton (a corner grip)
        PE_BrickBar = PE_CustomBase + 42,     // brick tab bar background
        PE_RoundMask = PE_CustomBase + 44     // mask of a round button: outside painted white
    };
    enum CustomControl
    {
        CE_OptionsButton = CE_CustomBase + 0, // small rounded square with a down arrow
        CE_BrickTitleBar = CE_CustomBase + 1  // title strip with a close mark at the right
    };
    enum CustomStyleHint
    {
        SH_OptionsButtonMask = SH_CustomBase + 3 // non-zero: options buttons are masked round
    };

    // An icon for an action name ("save", "copy", "zoomin", ... or a host action class name
    // such as "KrSaveAction"); a standard icon of the base style for others; null when
    // nothing fits.
    QIcon getActionIcon(const QString& name) const;
    const KrColors& getColors() const;
    // Answers the custom numbers above and passes everything else to the Fusion base.
    int pixelMetric(PixelMetric metric, const QStyleOption* option = nullptr,
                    const QWidget* widget = nullptr) const override;
    void drawPrimitive(PrimitiveElement element, const QStyleOption* option, QPainter* painter,
                       const QWidget* widget = nullptr) const override;
    void drawControl(ControlElement element, const QStyleOption* option, QPainter* painter,
                     const QWidget* widget = nullptr) const override;
    int styleHint(StyleHint hint, const QStyleOption* option = nullptr,
                  const QWidget* widget = nullptr,
                  QStyleHintReturn* returnData = nullptr) const override;
    QPalette standardPalette() const override;

    // The palette of the host's light look.
    QPalette palette() const;

private:
    QIcon drawActionIcon(const QString& name) const;
    KrColors m_colors;
    mutable QHash<QString, QIcon> m_icons;
};
