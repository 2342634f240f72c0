#pragma once

#include "krstyle.h"

// The host style with an adjustable divider margin, so divider geometry can be checked for
// more than the host's own value. The bar thickness stays the host's.
class DividerTestStyle : public KrStyle
{
public:
    // The margin and spacing answered for PM_CustomBase; read when a divider is built.
    static int margin;

    int pixelMetric(PixelMetric metric, const QStyleOption* option = nullptr,
                    const QWidget* widget = nullptr) const override;
};
