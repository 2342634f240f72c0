#include "divider_style.h"

int DividerTestStyle::margin = 4;

int DividerTestStyle::pixelMetric(PixelMetric metric, const QStyleOption* option,
                                  const QWidget* widget) const
{
    if (metric == PM_CustomBase)
        return margin;
    return KrStyle::pixelMetric(metric, option, widget);
}
