#include "kroutputlabel.h"

KrOutputLabelProperty::KrOutputLabelProperty(const QString& name)
    : KrIntProperty(name, false, false, 0)
{
}

KrOutputLabelProperty::~KrOutputLabelProperty() = default;

QString KrOutputLabelProperty::getWidgetClassName() const
{
    return QStringLiteral("KrLabelPropertyWgt");
}

KrLabelPropertyWgt::KrLabelPropertyWgt(QWidget* parent, const QString& name)
    : KrBasicPropertyWgt(parent, name)
{
}

KrLabelPropertyWgt::~KrLabelPropertyWgt() = default;

bool KrLabelPropertyWgt::showsValue() const
{
    return false;
}
