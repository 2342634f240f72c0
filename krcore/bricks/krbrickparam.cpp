#include "krbrickparam.h"

#include "krbrickgroup.h"
#include "krproperty.h"
#include "krshaderbrick.h"

#include <QColor>
#include <QLocale>
#include <QPointer>
#include <QSet>

namespace {

// One end of a wire while it is being checked: the parameter and the brick it counts as.
struct End
{
    KrBrickParam* param;
    KrShaderBrick* brick;
};

// Seen from a brick outside the group, a parameter inside a group is the group's parameter
// standing for it. Lifts the end until its brick shares a level with other.
bool liftEnd(End& end, const KrShaderBrick* other, bool forAdding)
{
    while (end.brick) {
        KrBrickGroup* group = KrBrickGroup::enclosingGroup(end.brick);
        if (!group || group->containsBrick(other))
            break;
        KrBrickParam* proxy = nullptr;
        if (end.param)
            proxy = forAdding ? group->proxyForAdding(end.param) : group->findProxy(end.param);
        if (!proxy && forAdding)
            return false;
        // Without a proxy (an input fed inside the group) the inner parameter still tells the
        // direction and type of what a wire would reach.
        if (proxy)
            end.param = proxy;
        end.brick = group;
    }
    return end.param != nullptr;
}

bool liftPair(End& a, End& b, bool forAdding)
{
    const KrShaderBrick* otherOfA = b.brick;
    if (!liftEnd(a, otherOfA, forAdding))
        return false;
    return liftEnd(b, a.brick, forAdding);
}

QString numberText(double v)
{
    return QLocale::c().toString(v, 'g', 9);
}

} // namespace

// ------------------------------------------------------------------------------ KrBrickParam

KrBrickParam::KrBrickParam(KrShaderBrick* brick, const QString& arg, const QString& label,
                           Direction direction, const QString& type, QObject* parent)
    : QObject(parent), m_brick(brick), m_arg(arg), m_label(label.isEmpty() ? arg : label),
      m_direction(direction), m_type(type)
{
}

KrBrickParam::~KrBrickParam()
{
    dropConnectionsQuietly();
}

QString KrBrickParam::canonicalType(const QString& type)
{
    QStringList words = type.simplified().toLower().split(QLatin1Char(' '), Qt::SkipEmptyParts);
    static const QSet<QString> qualifiers = {QStringLiteral("uniform"), QStringLiteral("varying"),
                                             QStringLiteral("output"), QStringLiteral("input")};
    while (!words.isEmpty() && qualifiers.contains(words.first()))
        words.removeFirst();
    return words.join(QLatin1Char(' '));
}

QString KrBrickParam::typeLabelFor(const QString& type)
{
    const QString t = canonicalType(type);
    if (t.startsWith(QLatin1String("closure")))
        return QStringLiteral("closure");
    return t;
}

bool KrBrickParam::isTypeCompatible(const QString& from, const QString& to)
{
    const QString f = typeLabelFor(from);
    const QString t = typeLabelFor(to);
    if (f.isEmpty() || t.isEmpty())
        return false;
    if (f == t)
        return true;
    static const QSet<QString> spatial = {QStringLiteral("point"), QStringLiteral("vector"),
                                          QStringLiteral("normal")};
    const bool scalarFrom = f == QLatin1String("float") || f == QLatin1String("int");
    if (scalarFrom &&
        (t == QLatin1String("float") || t == QLatin1String("color") || spatial.contains(t)))
        return true;
    return spatial.contains(f) && spatial.contains(t);
}

void KrBrickParam::setDefaultExpression(const QString& expression)
{
    if (m_defaultExpression == expression)
        return;
    m_defaultExpression = expression;
    m_tokensValid = false;
}

QString KrBrickParam::getParamArg(int i) const
{
    return i == 0 ? m_arg : QString();
}

void KrBrickParam::setLabel(const QString& label)
{
    if (label == m_label)
        return;
    const QString old = m_label;
    m_label = label;
    if (m_brick)
        m_brick->paramLabelChanged(this, old);
    emit labelChanged();
}

void KrBrickParam::setType(const QString& type)
{
    if (type == m_type)
        return;
    m_type = type;
    m_tokensValid = false;
    emit typeChanged();
    // Wires the new type cannot carry go.
    QList<KrBrickParam*> changed;
    const QList<KrParamConnection*> connections = m_connections;
    for (KrParamConnection* c : connections) {
        KrBrickParam* other = c->getParam();
        const KrBrickParam* src = isOutput() ? this : other;
        const KrBrickParam* dst = isOutput() ? other : this;
        if (!isTypeCompatible(src->getType(), dst->getType()) && unlink(this, other))
            changed << other;
    }
    if (!changed.isEmpty()) {
        changed.prepend(this);
        notifyChanged(changed);
    }
}

void KrBrickParam::setIsAdvanced(bool advanced)
{
    if (advanced == m_advanced)
        return;
    m_advanced = advanced;
    emit advancedChanged();
}

const KrParamConnection* KrBrickParam::getConnection(int i) const
{
    return m_connections.value(i, nullptr);
}

KrBrickParam* KrBrickParam::getSource() const
{
    if (!isInput() || m_connections.isEmpty())
        return nullptr;
    return m_connections.first()->getParam();
}

bool KrBrickParam::canConnectDirect(const KrBrickParam* a, const KrBrickParam* b)
{
    if (!a || !b || a == b)
        return false;
    const KrShaderBrick* brickA = a->getBrick();
    const KrShaderBrick* brickB = b->getBrick();
    if (!brickA || !brickB || brickA == brickB)
        return false;
    if (a->isInput() == b->isInput())
        return false;
    const KrBrickParam* src = a->isOutput() ? a : b;
    const KrBrickParam* dst = a->isOutput() ? b : a;
    if (src->getDirection() != Output || dst->getDirection() != Input)
        return false;
    if (!isTypeCompatible(src->getType(), dst->getType()))
        return false;
    // Bricks of two different brick users are never wired.
    const KrElement* userA = brickA->getElementParent();
    const KrElement* userB = brickB->getElementParent();
    if (userA && userB && userA != userB)
        return false;
    // Source already fed by the target, directly or not: the wire would close a cycle.
    return !src->getBrick()->isFedBy(dst->getBrick());
}

bool KrBrickParam::canConnectTo(KrBrickParam* target) const
{
    if (!target || target == this)
        return false;
    End a{const_cast<KrBrickParam*>(this), m_brick};
    End b{target, target->getBrick()};
    if (!a.brick || !b.brick || !liftPair(a, b, false))
        return false;
    if (a.brick == b.brick)
        return false;
    // An inner input fed inside its group and seen from outside has no group parameter yet;
    // its own direction and type decide, and the cycle test runs on the group.
    if (a.param->getBrick() != a.brick || b.param->getBrick() != b.brick) {
        const KrBrickParam* src = a.param->isOutput() ? a.param : b.param;
        const KrBrickParam* dst = a.param->isOutput() ? b.param : a.param;
        if (a.param->isInput() == b.param->isInput() || src->getDirection() != Output ||
            dst->getDirection() != Input || !isTypeCompatible(src->getType(), dst->getType()))
            return false;
        const KrShaderBrick* srcBrick = a.param->isOutput() ? a.brick : b.brick;
        const KrShaderBrick* dstBrick = a.param->isOutput() ? b.brick : a.brick;
        const KrElement* userA = a.brick->getElementParent();
        const KrElement* userB = b.brick->getElementParent();
        if (userA && userB && userA != userB)
            return false;
        return !srcBrick->isFedBy(dstBrick);
    }
    return canConnectDirect(a.param, b.param);
}

bool KrBrickParam::isConnectedTo(KrBrickParam* other) const
{
    if (!other)
        return false;
    End a{const_cast<KrBrickParam*>(this), m_brick};
    End b{other, other->getBrick()};
    if (!liftPair(a, b, false))
        return false;
    for (const KrParamConnection* c : a.param->m_connections) {
        if (c->getParam() == b.param)
            return true;
    }
    return false;
}

void KrBrickParam::link(KrBrickParam* source, KrBrickParam* target)
{
    source->m_connections.append(new KrParamConnection(target));
    target->m_connections.append(new KrParamConnection(source));
}

bool KrBrickParam::unlink(KrBrickParam* a, KrBrickParam* b)
{
    bool found = false;
    for (int i = 0; i < a->m_connections.size(); ++i) {
        if (a->m_connections.at(i)->getParam() == b) {
            delete a->m_connections.takeAt(i);
            found = true;
            break;
        }
    }
    for (int i = 0; i < b->m_connections.size(); ++i) {
        if (b->m_connections.at(i)->getParam() == a) {
            delete b->m_connections.takeAt(i);
            found = true;
            break;
        }
    }
    return found;
}

void KrBrickParam::notifyChanged(const QList<KrBrickParam*>& params)
{
    // Listeners may delete bricks while they are told; hold guarded pointers.
    QList<QPointer<KrBrickParam>> guarded;
    QList<QPointer<KrShaderBrick>> bricks;
    for (KrBrickParam* p : params) {
        if (!p)
            continue;
        bool seen = false;
        for (const QPointer<KrBrickParam>& g : qAsConst(guarded))
            seen = seen || g == p;
        if (seen)
            continue;
        p->m_tokensValid = false;
        guarded.append(p);
        KrShaderBrick* b = p->getBrick();
        if (b && !bricks.contains(b))
            bricks.append(b);
    }
    for (const QPointer<KrBrickParam>& p : qAsConst(guarded)) {
        if (p && !(p->getBrick() && p->getBrick()->isBeingDestroyed()))
            emit p->connectionsChanged();
    }
    for (const QPointer<KrShaderBrick>& b : qAsConst(bricks)) {
        if (b && !b->isBeingDestroyed())
            emit b->connectionsChanged(b.data());
    }
}

bool KrBrickParam::addConnection(KrBrickParam* other)
{
    if (!canConnectTo(other))
        return false;
    End a{this, m_brick};
    End b{other, other->getBrick()};
    if (!liftPair(a, b, true) || !canConnectDirect(a.param, b.param))
        return false;
    KrBrickParam* src = a.param->isOutput() ? a.param : b.param;
    KrBrickParam* dst = a.param->isOutput() ? b.param : a.param;
    for (const KrParamConnection* c : qAsConst(dst->m_connections)) {
        if (c->getParam() == src)
            return true;
    }
    QList<KrBrickParam*> changed{src, dst};
    // An input takes one source: the new one replaces the old.
    while (!dst->m_connections.isEmpty()) {
        KrBrickParam* old = dst->m_connections.first()->getParam();
        unlink(old, dst);
        changed.append(old);
    }
    link(src, dst);
    notifyChanged(changed);
    return true;
}

bool KrBrickParam::removeConnection(KrBrickParam* other)
{
    if (!other)
        return false;
    End a{this, m_brick};
    End b{other, other->getBrick()};
    if (!liftPair(a, b, false))
        return false;
    if (!unlink(a.param, b.param))
        return false;
    notifyChanged({a.param, b.param});
    return true;
}

void KrBrickParam::removeAllConnections()
{
    if (m_connections.isEmpty())
        return;
    QList<KrBrickParam*> changed{this};
    while (!m_connections.isEmpty()) {
        KrBrickParam* other = m_connections.first()->getParam();
        unlink(this, other);
        changed.append(other);
    }
    notifyChanged(changed);
}

void KrBrickParam::dropConnectionsQuietly()
{
    QList<KrBrickParam*> others;
    while (!m_connections.isEmpty()) {
        KrBrickParam* other = m_connections.first()->getParam();
        unlink(this, other);
        others.append(other);
    }
    notifyChanged(others);
}

KrProperty* KrBrickParam::getParamProperty(int) const
{
    return nullptr;
}

void KrBrickParam::clearTokens()
{
    m_tokensValid = false;
    m_tokens.clear();
}

int KrBrickParam::getNumTokens() const
{
    getToken(0);
    return m_tokens.size();
}

QString KrBrickParam::getToken(int i) const
{
    if (!m_tokensValid) {
        m_tokens = QStringList{getParamArg(0), canonicalType(m_type), getDefaultValueText()};
        m_tokensValid = true;
    }
    return m_tokens.value(i);
}

QString KrBrickParam::getDefaultValueText() const
{
    return m_defaultExpression;
}

// ---------------------------------------------------------------------------- KrPropertyParam

KrPropertyParam::KrPropertyParam(KrShaderBrick* brick, const QString& arg, const QString& label,
                                 Direction direction, const QString& type, QObject* parent)
    : KrBrickParam(brick, arg, label, direction, type, parent)
{
}

KrPropertyParam::~KrPropertyParam()
{
    // The brick drops them from its list through their destroyed() signal.
    const QList<KrProperty*> properties = m_properties;
    m_properties.clear();
    qDeleteAll(properties);
}

void KrPropertyParam::addParamProperty(KrProperty* property)
{
    if (!property || m_properties.contains(property))
        return;
    property->setParent(this);
    m_properties.append(property);
    connect(property, &KrProperty::valueChanged, this, [this]() {
        tokensChanged();
        emit valueChanged();
    });
    tokensChanged();
    emit paramPropertiesChanged();
}

void KrPropertyParam::removeParamProperty(KrProperty* property)
{
    if (!m_properties.removeOne(property))
        return;
    tokensChanged();
    emit paramPropertiesChanged();
    delete property;
}

KrProperty* KrPropertyParam::getParamProperty(int i) const
{
    return m_properties.value(i, nullptr);
}

QString KrPropertyParam::valueText(const KrProperty* property)
{
    if (!property)
        return QString();
    const QString kind = property->getTypeLabel();
    const QVariant v = property->getValue();
    if (kind == QLatin1String("float"))
        return numberText(v.toDouble());
    if (kind == QLatin1String("int") || kind == QLatin1String("enum"))
        return QString::number(v.toInt());
    if (kind == QLatin1String("bool"))
        return v.toBool() ? QStringLiteral("1") : QStringLiteral("0");
    if (kind == QLatin1String("color")) {
        const QColor c = v.value<QColor>();
        return QStringLiteral("color(%1, %2, %3)")
            .arg(numberText(c.redF()), numberText(c.greenF()), numberText(c.blueF()));
    }
    if (kind == QLatin1String("string")) {
        QString s = v.toString();
        s.replace(QLatin1Char('\\'), QLatin1String("\\\\"));
        s.replace(QLatin1Char('"'), QLatin1String("\\\""));
        s.replace(QLatin1Char('\n'), QLatin1String("\\n"));
        return QLatin1Char('"') + s + QLatin1Char('"');
    }
    return v.toString();
}

QString KrPropertyParam::getDefaultValueText() const
{
    if (m_properties.isEmpty())
        return KrBrickParam::getDefaultValueText();
    QStringList parts;
    for (const KrProperty* p : m_properties)
        parts << valueText(p);
    return parts.join(QLatin1String(", "));
}

void KrPropertyParam::setLabel(const QString& label)
{
    const QString old = getLabel();
    if (label == old)
        return;
    // A property named after the parameter keeps following it.
    for (KrProperty* p : qAsConst(m_properties)) {
        if (p->getName() == old)
            p->setName(label);
    }
    KrBrickParam::setLabel(label);
}
