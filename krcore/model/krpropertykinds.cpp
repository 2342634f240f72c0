// The property kinds declared in krproperty.h.
#include "krproperty.h"

#include "krsettings.h"

#include <QLocale>
#include <cmath>
#include <limits>

namespace {
bool isIntegerType(int type)
{
    switch (type) {
    case QMetaType::Int:
    case QMetaType::UInt:
    case QMetaType::LongLong:
    case QMetaType::ULongLong:
    case QMetaType::Short:
    case QMetaType::UShort:
    case QMetaType::Long:
    case QMetaType::ULong:
    case QMetaType::Char:
    case QMetaType::SChar:
    case QMetaType::UChar:
        return true;
    default:
        return false;
    }
}

bool isRealType(int type)
{
    return type == QMetaType::Double || type == QMetaType::Float;
}

// Numbers (and texts of numbers in the C locale) only: a bool, a colour or a word is refused
// rather than read as 0.
bool toDouble(const QVariant& v, double* out)
{
    const int type = v.userType();
    bool ok = false;
    double d = 0.0;
    if (isIntegerType(type) || isRealType(type)) {
        d = v.toDouble(&ok);
    } else if (type == QMetaType::QString) {
        d = QLocale::c().toDouble(v.toString().trimmed(), &ok);
    }
    if (!ok || !std::isfinite(d))
        return false;
    *out = d;
    return true;
}

bool toInt(const QVariant& v, int* out)
{
    const int type = v.userType();
    if (isIntegerType(type)) {
        if (type == QMetaType::ULongLong || type == QMetaType::ULong || type == QMetaType::UInt) {
            const qulonglong u = v.toULongLong();
            *out = u > qulonglong(std::numeric_limits<int>::max()) ? std::numeric_limits<int>::max()
                                                                   : int(u);
        } else {
            *out = int(qBound<qlonglong>(std::numeric_limits<int>::min(), v.toLongLong(),
                                         std::numeric_limits<int>::max()));
        }
        return true;
    }
    if (type == QMetaType::QString) {
        bool ok = false;
        const qlonglong ll = QLocale::c().toLongLong(v.toString().trimmed(), &ok);
        if (ok) {
            *out = int(qBound<qlonglong>(std::numeric_limits<int>::min(), ll,
                                         std::numeric_limits<int>::max()));
            return true;
        }
    }
    double d = 0.0;
    if (!toDouble(v, &d))
        return false;
    d = std::round(d);
    *out = d >= double(std::numeric_limits<int>::max())   ? std::numeric_limits<int>::max()
           : d <= double(std::numeric_limits<int>::min()) ? std::numeric_limits<int>::min()
                                                          : int(d);
    return true;
}

bool toBool(const QVariant& v, bool* out)
{
    const int type = v.userType();
    if (type == QMetaType::Bool) {
        *out = v.toBool();
        return true;
    }
    if (isIntegerType(type)) {
        const qlonglong n = v.toLongLong();
        if (n != 0 && n != 1)
            return false;
        *out = n == 1;
        return true;
    }
    if (type == QMetaType::QString) {
        const QString s = v.toString().trimmed().toLower();
        if (s == QLatin1String("true") || s == QLatin1String("1")) {
            *out = true;
            return true;
        }
        if (s == QLatin1String("false") || s == QLatin1String("0")) {
            *out = false;
            return true;
        }
    }
    return false;
}

bool toText(const QVariant& v, QString* out)
{
    const int type = v.userType();
    if (type == QMetaType::QString || type == QMetaType::QByteArray || type == QMetaType::QChar ||
        type == QMetaType::Bool || isIntegerType(type)) {
        *out = v.toString();
        return true;
    }
    if (isRealType(type)) {
        const double d = v.toDouble();
        if (!std::isfinite(d))
            return false;
        *out = QString::number(d, 'g', 17);
        return true;
    }
    return false;
}
} // namespace

// ---------------------------------------------------------------------------- KrIntProperty

KrIntProperty::KrIntProperty(const QString& name, bool readOnly, bool hidden, int value,
                             QObject* parent)
    : KrProperty(name, parent), m_value(value), m_default(value),
      m_min(std::numeric_limits<int>::min()), m_max(std::numeric_limits<int>::max())
{
    setReadOnly(readOnly);
    setHidden(hidden);
}

KrIntProperty::~KrIntProperty() = default;

QString KrIntProperty::getTypeLabel() const
{
    return QStringLiteral("int");
}

QString KrIntProperty::getWidgetClassName() const
{
    return QStringLiteral("KrIntPropertyWgt");
}

QVariant KrIntProperty::getValue() const
{
    return QVariant(m_value);
}

bool KrIntProperty::setValue(const QVariant& value)
{
    int v = 0;
    if (!toInt(value, &v))
        return false;
    return setIntValue(v);
}

bool KrIntProperty::setIntValue(int value)
{
    value = qBound(m_min, value, m_max);
    if (value != m_value) {
        m_value = value;
        emit valueChanged();
    }
    return true;
}

QVariant KrIntProperty::getDefaultValue() const
{
    return QVariant(m_default);
}

void KrIntProperty::writeValue(KrSettings* settings, const QString& key) const
{
    if (settings)
        settings->setIntValue(key, m_value);
}

bool KrIntProperty::readValue(const KrSettings* settings, const QString& key)
{
    if (!settings || settings->getValueType(key) != KrSettings::Int)
        return false;
    return setIntValue(settings->getIntValue(key));
}

bool KrIntProperty::hasRange() const
{
    return m_min != std::numeric_limits<int>::min() || m_max != std::numeric_limits<int>::max();
}

void KrIntProperty::setRange(int minimum, int maximum)
{
    if (minimum > maximum)
        std::swap(minimum, maximum);
    if (minimum == m_min && maximum == m_max)
        return;
    m_min = minimum;
    m_max = maximum;
    emit constraintsChanged();
    setIntValue(m_value);
}

void KrIntProperty::setStep(int step)
{
    step = qMax(1, step);
    if (step == m_step)
        return;
    m_step = step;
    emit constraintsChanged();
}

// -------------------------------------------------------------------------- KrFloatProperty

KrFloatProperty::KrFloatProperty(const QString& name, double value, QObject* parent)
    : KrProperty(name, parent), m_value(std::isfinite(value) ? value : 0.0), m_default(m_value),
      m_min(-std::numeric_limits<double>::max()), m_max(std::numeric_limits<double>::max())
{
}

KrFloatProperty::~KrFloatProperty() = default;

QString KrFloatProperty::getTypeLabel() const
{
    return QStringLiteral("float");
}

QString KrFloatProperty::getWidgetClassName() const
{
    return QStringLiteral("KrFloatPropertyWgt");
}

QVariant KrFloatProperty::getValue() const
{
    return QVariant(m_value);
}

bool KrFloatProperty::setValue(const QVariant& value)
{
    double v = 0.0;
    if (!toDouble(value, &v))
        return false;
    return setFloatValue(v);
}

bool KrFloatProperty::setFloatValue(double value)
{
    if (!std::isfinite(value))
        return false;
    value = qBound(m_min, value, m_max);
    if (value != m_value) {
        m_value = value;
        emit valueChanged();
    }
    return true;
}

QVariant KrFloatProperty::getDefaultValue() const
{
    return QVariant(m_default);
}

void KrFloatProperty::writeValue(KrSettings* settings, const QString& key) const
{
    if (settings)
        settings->setFloatValue(key, m_value);
}

bool KrFloatProperty::readValue(const KrSettings* settings, const QString& key)
{
    if (!settings)
        return false;
    switch (settings->getValueType(key)) {
    case KrSettings::Float:
        return setFloatValue(settings->getFloatValue(key));
    case KrSettings::Int:
        return setFloatValue(settings->getIntValue(key));
    default:
        return false;
    }
}

bool KrFloatProperty::hasRange() const
{
    return m_min != -std::numeric_limits<double>::max() ||
           m_max != std::numeric_limits<double>::max();
}

void KrFloatProperty::setRange(double minimum, double maximum)
{
    if (!std::isfinite(minimum))
        minimum = -std::numeric_limits<double>::max();
    if (!std::isfinite(maximum))
        maximum = std::numeric_limits<double>::max();
    if (minimum > maximum)
        std::swap(minimum, maximum);
    if (minimum == m_min && maximum == m_max)
        return;
    m_min = minimum;
    m_max = maximum;
    emit constraintsChanged();
    setFloatValue(m_value);
}

void KrFloatProperty::setStep(double step)
{
    if (!std::isfinite(step) || step <= 0.0 || step == m_step)
        return;
    m_step = step;
    emit constraintsChanged();
}

void KrFloatProperty::setDecimals(int decimals)
{
    decimals = qBound(0, decimals, 15);
    if (decimals == m_decimals)
        return;
    m_decimals = decimals;
    emit constraintsChanged();
}

// --------------------------------------------------------------------------- KrBoolProperty

KrBoolProperty::KrBoolProperty(const QString& name, bool value, QObject* parent)
    : KrProperty(name, parent), m_value(value), m_default(value)
{
}

KrBoolProperty::~KrBoolProperty() = default;

QString KrBoolProperty::getTypeLabel() const
{
    return QStringLiteral("bool");
}

QString KrBoolProperty::getWidgetClassName() const
{
    return QStringLiteral("KrBoolPropertyWgt");
}

QVariant KrBoolProperty::getValue() const
{
    return QVariant(m_value);
}

bool KrBoolProperty::setValue(const QVariant& value)
{
    bool v = false;
    if (!toBool(value, &v))
        return false;
    return setBoolValue(v);
}

bool KrBoolProperty::setBoolValue(bool value)
{
    if (value != m_value) {
        m_value = value;
        emit valueChanged();
    }
    return true;
}

QVariant KrBoolProperty::getDefaultValue() const
{
    return QVariant(m_default);
}

void KrBoolProperty::writeValue(KrSettings* settings, const QString& key) const
{
    if (settings)
        settings->setBoolValue(key, m_value);
}

bool KrBoolProperty::readValue(const KrSettings* settings, const QString& key)
{
    if (!settings || settings->getValueType(key) != KrSettings::Bool)
        return false;
    return setBoolValue(settings->getBoolValue(key));
}

// ------------------------------------------------------------------------- KrStringProperty

KrStringProperty::KrStringProperty(const QString& name, const QString& value, QObject* parent)
    : KrProperty(name, parent), m_value(value), m_default(value)
{
}

KrStringProperty::~KrStringProperty() = default;

QString KrStringProperty::getTypeLabel() const
{
    return QStringLiteral("string");
}

QString KrStringProperty::getWidgetClassName() const
{
    return QStringLiteral("KrStringPropertyWgt");
}

QVariant KrStringProperty::getValue() const
{
    return QVariant(m_value);
}

bool KrStringProperty::setValue(const QVariant& value)
{
    QString v;
    if (!toText(value, &v))
        return false;
    return setStringValue(v);
}

bool KrStringProperty::setStringValue(const QString& value)
{
    if (value != m_value) {
        m_value = value;
        emit valueChanged();
    }
    return true;
}

QVariant KrStringProperty::getDefaultValue() const
{
    return QVariant(m_default);
}

void KrStringProperty::writeValue(KrSettings* settings, const QString& key) const
{
    if (settings)
        settings->setStringValue(key, m_value);
}

bool KrStringProperty::readValue(const KrSettings* settings, const QString& key)
{
    if (!settings || settings->getValueType(key) != KrSettings::String)
        return false;
    return setStringValue(settings->getStringValue(key));
}

// -------------------------------------------------------------------------- KrColorProperty

namespace {
const QString kRed = QStringLiteral("Red");
const QString kGreen = QStringLiteral("Green");
const QString kBlue = QStringLiteral("Blue");
const QString kAlpha = QStringLiteral("Alpha");

QColor normalizedColor(const QColor& c)
{
    return c.isValid() ? c.toRgb() : QColor();
}
} // namespace

KrColorProperty::KrColorProperty(const QString& name, const QColor& value, QObject* parent)
    : KrProperty(name, parent), m_value(normalizedColor(value))
{
    if (!m_value.isValid())
        m_value = QColor(Qt::white);
    m_default = m_value;
}

KrColorProperty::~KrColorProperty() = default;

QString KrColorProperty::getTypeLabel() const
{
    return QStringLiteral("color");
}

QString KrColorProperty::getWidgetClassName() const
{
    return QStringLiteral("KrColorPropertyWgt");
}

QVariant KrColorProperty::getValue() const
{
    return QVariant(m_value);
}

bool KrColorProperty::setValue(const QVariant& value)
{
    if (value.userType() == QMetaType::QColor)
        return setColorValue(value.value<QColor>());
    if (value.userType() == QMetaType::QString) {
        const QString text = value.toString().trimmed();
        if (!QColor::isValidColor(text))
            return false;
        return setColorValue(QColor(text));
    }
    return false;
}

bool KrColorProperty::setColorValue(const QColor& value)
{
    const QColor c = normalizedColor(value);
    if (!c.isValid())
        return false;
    if (c != m_value) {
        m_value = c;
        emit valueChanged();
    }
    return true;
}

void KrColorProperty::setAlphaEnabled(bool enabled)
{
    if (enabled == m_alpha)
        return;
    m_alpha = enabled;
    emit constraintsChanged();
}

QVariant KrColorProperty::getDefaultValue() const
{
    return QVariant(m_default);
}

void KrColorProperty::writeValue(KrSettings* settings, const QString& key) const
{
    if (!settings)
        return;
    KrSettings* record = settings->setSettingsValue(key);
    record->setFloatValue(kRed, m_value.redF());
    record->setFloatValue(kGreen, m_value.greenF());
    record->setFloatValue(kBlue, m_value.blueF());
    record->setFloatValue(kAlpha, m_value.alphaF());
}

bool KrColorProperty::readValue(const KrSettings* settings, const QString& key)
{
    const KrSettings* record = settings ? settings->getSettingsValue(key) : nullptr;
    if (!record)
        return false;
    double channels[4] = {0.0, 0.0, 0.0, 1.0};
    const QString* keys[4] = {&kRed, &kGreen, &kBlue, &kAlpha};
    for (int i = 0; i < 4; ++i) {
        const KrSettings::ValueType type = record->getValueType(*keys[i]);
        if (type == KrSettings::Invalid && i == 3)
            continue; // records without alpha are opaque
        if (type != KrSettings::Float)
            return false;
        channels[i] = record->getFloatValue(*keys[i]);
        if (!(channels[i] >= 0.0 && channels[i] <= 1.0))
            return false;
    }
    return setColorValue(QColor::fromRgbF(channels[0], channels[1], channels[2], channels[3]));
}

// --------------------------------------------------------------------------- KrEnumProperty

KrEnumProperty::KrEnumProperty(const QString& name, const QStringList& items, int index,
                               QObject* parent)
    : KrProperty(name, parent), m_items(items)
{
    m_index = items.isEmpty() ? -1 : qBound(0, index, items.size() - 1);
    m_default = m_index;
}

KrEnumProperty::~KrEnumProperty() = default;

QString KrEnumProperty::getTypeLabel() const
{
    return QStringLiteral("enum");
}

QString KrEnumProperty::getWidgetClassName() const
{
    return QStringLiteral("KrEnumPropertyWgt");
}

QVariant KrEnumProperty::getValue() const
{
    return QVariant(m_index);
}

// An index out of range is refused, not clamped: picking a neighbouring item would silently
// choose something else.
bool KrEnumProperty::setValue(const QVariant& value)
{
    const int type = value.userType();
    if (isIntegerType(type)) {
        const qlonglong i = value.toLongLong();
        if (i < 0 || i >= m_items.size())
            return false;
        return setIndex(int(i));
    }
    if (type == QMetaType::QString) {
        const int i = m_items.indexOf(value.toString());
        return i >= 0 && setIndex(i);
    }
    return false;
}

bool KrEnumProperty::setIndex(int index)
{
    if (index < 0 || index >= m_items.size())
        return false;
    if (index != m_index) {
        m_index = index;
        emit valueChanged();
    }
    return true;
}

void KrEnumProperty::setItems(const QStringList& items)
{
    if (items == m_items)
        return;
    m_items = items;
    const int index = items.isEmpty() ? -1 : (m_index >= 0 && m_index < items.size() ? m_index : 0);
    if (m_default >= items.size())
        m_default = items.isEmpty() ? -1 : 0;
    emit constraintsChanged();
    if (index != m_index) {
        m_index = index;
        emit valueChanged();
    }
}

QVariant KrEnumProperty::getDefaultValue() const
{
    return QVariant(m_default);
}

void KrEnumProperty::writeValue(KrSettings* settings, const QString& key) const
{
    if (settings)
        settings->setIntValue(key, m_index);
}

bool KrEnumProperty::readValue(const KrSettings* settings, const QString& key)
{
    if (!settings || settings->getValueType(key) != KrSettings::Int)
        return false;
    return setIndex(settings->getIntValue(key));
}
