#include "krelement.h"

#include "krproperty.h"
#include "krsettings.h"

#include <QSet>

namespace {
const QString kNameKey = QStringLiteral("Name");
const QString kPropertiesKey = QStringLiteral("Properties");

// Keys of the properties record: the property's name, or a free variant of it for a second
// property of the same name, so that no value overwrites another.
QStringList propertyKeys(const QList<KrProperty*>& properties)
{
    QStringList keys;
    QSet<QString> used;
    for (KrProperty* p : properties) {
        QString key = p->getName();
        if (used.contains(key)) {
            int n = 1;
            while (used.contains(key + QString::number(n)))
                ++n;
            key += QString::number(n);
        }
        used.insert(key);
        keys.append(key);
    }
    return keys;
}
} // namespace

KrElement::KrElement(const QString& name, QObject* parent) : KrBase(name, parent) {}

KrElement::~KrElement() = default;

KrPropertyIterator KrElement::propertyListIterator() const
{
    return KrPropertyIterator(m_properties);
}

QList<KrProperty*> KrElement::getProperties() const
{
    return m_properties;
}

void KrElement::watch(KrProperty* property)
{
    connect(property, &KrProperty::pathChanged, this, &KrElement::propertyTreeChanged);
    // Showing or hiding a property changes the list views show.
    connect(property, &KrProperty::hiddenChanged, this, &KrElement::propertyListChanged);
    // A property deleted without being removed must not stay in the list.
    connect(property, &QObject::destroyed, this, [this, property]() {
        if (m_properties.removeAll(property) > 0)
            emit propertyListChanged();
    });
}

void KrElement::addProperty(KrProperty* property)
{
    if (!property || m_properties.contains(property))
        return;
    m_properties.append(property);
    watch(property);
    emit propertyListChanged();
}

void KrElement::removeProperty(KrProperty* property)
{
    if (!property || m_properties.removeAll(property) == 0)
        return;
    disconnect(property, nullptr, this, nullptr);
    emit propertyListChanged();
}

void KrElement::setProperties(const QList<KrProperty*>& properties)
{
    // Brick users reset their whole list whenever a brick comes or goes: only rewire the
    // properties that changed, so large networks stay linear.
    QSet<KrProperty*> wanted;
    QList<KrProperty*> list;
    list.reserve(properties.size());
    for (KrProperty* p : properties) {
        if (p && !wanted.contains(p)) {
            wanted.insert(p);
            list.append(p);
        }
    }
    QSet<KrProperty*> had;
    for (KrProperty* p : qAsConst(m_properties)) {
        had.insert(p);
        if (!wanted.contains(p))
            disconnect(p, nullptr, this, nullptr);
    }
    m_properties = list;
    for (KrProperty* p : qAsConst(m_properties)) {
        if (!had.contains(p))
            watch(p);
    }
    emit propertyListChanged();
}

void KrElement::getAttributes(KrSettings* settings) const
{
    if (!settings)
        return;
    settings->setStringValue(kNameKey, getName());
    KrSettings* values = settings->setSettingsValue(kPropertiesKey);
    const QStringList keys = propertyKeys(m_properties);
    for (int i = 0; i < m_properties.size(); ++i)
        m_properties.at(i)->writeValue(values, keys.at(i));
}

bool KrElement::setAttributes(const KrSettings* settings)
{
    if (!settings)
        return false;
    if (settings->getValueType(kNameKey) == KrSettings::String)
        setName(settings->getStringValue(kNameKey));
    const KrSettings* values = settings->getSettingsValue(kPropertiesKey);
    if (!values)
        return true;
    // A copy: setting a value may make a listener change the list.
    const QList<KrProperty*> properties = m_properties;
    const QStringList keys = propertyKeys(properties);
    for (int i = 0; i < properties.size(); ++i) {
        if (values->hasKey(keys.at(i)))
            properties.at(i)->readValue(values, keys.at(i));
    }
    return true;
}

int KrElement::getNumProperties() const
{
    return m_properties.size();
}

KrProperty* KrElement::getProperty(int i) const
{
    return m_properties.value(i, nullptr);
}

KrProperty* KrElement::findProperty(const QString& name) const
{
    for (KrProperty* p : m_properties) {
        if (p->getName() == name)
            return p;
    }
    return nullptr;
}

bool KrElement::isPropertyNameUnique(QString& name, bool makeUnique) const
{
    if (!findProperty(name))
        return true;
    if (!makeUnique)
        return false;
    // "Color" and "Color2" both count up from "Color".
    QString base = name;
    while (!base.isEmpty() && base.at(base.size() - 1).isDigit())
        base.chop(1);
    for (int n = 1;; ++n) {
        const QString candidate = base + QString::number(n);
        if (!findProperty(candidate)) {
            name = candidate;
            return true;
        }
    }
}
