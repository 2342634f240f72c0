#include "krbrickgroup.h"

#include "krclassfactory.h"
#include "krdefaultbrickuser.h"
#include "krplugin.h"
#include "krsettings.h"

KR_CORE_CLASS(KrBrickGroup, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D2E01");

namespace {
const QString kNextIdKey = QStringLiteral("NextBrickID");
const QString kBricksKey = QStringLiteral("Bricks");
} // namespace

// ------------------------------------------------------------------------- KrBrickGroupParam

KrBrickGroupParam::KrBrickGroupParam(KrBrickGroup* group, KrBrickParam* inner)
    : KrBrickParam(group, QString(), inner->getLabel(), Direction(inner->getDirection()),
                   inner->getType()),
      m_inner(inner), m_innerLabel(inner->getLabel())
{
    setIsAdvanced(inner->getIsAdvanced());
    connect(inner, &KrBrickParam::typeChanged, this, &KrBrickGroupParam::innerTypeChanged);
    connect(inner, &KrBrickParam::labelChanged, this, &KrBrickGroupParam::innerLabelChanged);
    connect(inner, &KrBrickParam::advancedChanged, this,
            [this]() { setIsAdvanced(m_inner && m_inner->getIsAdvanced()); });
    connect(inner, &KrBrickParam::valueChanged, this, [this]() {
        tokensChanged();
        emit valueChanged();
    });
}

KrBrickGroupParam::~KrBrickGroupParam() = default;

QString KrBrickGroupParam::getParamArg(int i) const
{
    if (i != 0 || !m_inner)
        return QString();
    const KrShaderBrick* brick = m_inner->getBrick();
    return QStringLiteral("b%1_%2")
        .arg(brick ? brick->getBrickID() : 0)
        .arg(m_inner->getParamArg(0));
}

int KrBrickGroupParam::getNumParamProperties() const
{
    return m_inner ? m_inner->getNumParamProperties() : 0;
}

KrProperty* KrBrickGroupParam::getParamProperty(int i) const
{
    return m_inner ? m_inner->getParamProperty(i) : nullptr;
}

QString KrBrickGroupParam::getDefaultValueText() const
{
    return m_inner ? m_inner->getDefaultValueText() : QString();
}

void KrBrickGroupParam::innerTypeChanged()
{
    if (m_inner)
        setType(m_inner->getType());
}

void KrBrickGroupParam::innerLabelChanged()
{
    if (!m_inner)
        return;
    // A label the user gave the group's parameter stays.
    if (getLabel() == m_innerLabel)
        setLabel(m_inner->getLabel());
    m_innerLabel = m_inner->getLabel();
}

// ------------------------------------------------------------------------------ KrBrickGroup

KrBrickGroup::KrBrickGroup(QObject* parent)
    : KrShaderBrick(QString(), parent), m_inner(new KrBrickContainer(this, this))
{
    connect(m_inner, &KrBrickContainer::brickAdded, this, &KrBrickGroup::innerBrickAdded);
    connect(m_inner, &KrBrickContainer::brickRemoved, this, &KrBrickGroup::innerBrickRemoved);
}

KrBrickGroup::~KrBrickGroup()
{
    beginDestruction();
    // Outside wires go first, while the group's parameters still stand for something.
    for (int i = 0; i < getNumParameters(); ++i)
        getParameter(i)->dropConnectionsQuietly();
    const bool blocked = blockSignals(true);
    setProperties({});
    for (KrShaderBrick* brick : m_inner->getBricks())
        disconnect(brick, nullptr, this, nullptr);
    m_inner->blockSignals(true);
    m_inner->clear();
    delete m_inner;
    m_inner = nullptr;
    blockSignals(blocked);
}

KrBrickGroup* KrBrickGroup::enclosingGroup(const KrShaderBrick* brick)
{
    return brick ? qobject_cast<KrBrickGroup*>(brick->getElementParent()) : nullptr;
}

bool KrBrickGroup::containsBrick(const KrShaderBrick* brick) const
{
    for (const KrShaderBrick* b = brick; b && b->getContainer();) {
        const KrBrickContainer* container = b->getContainer();
        if (container == m_inner)
            return true;
        b = qobject_cast<const KrShaderBrick*>(container->getOwner());
    }
    return false;
}

KrBrickGroupParam* KrBrickGroup::findProxy(const KrBrickParam* inner) const
{
    return m_proxies.value(inner, nullptr);
}

KrBrickGroupParam* KrBrickGroup::proxyForAdding(KrBrickParam* inner)
{
    if (!inner || !m_inner || !m_inner->contains(inner->getBrick()))
        return nullptr;
    if (KrBrickGroupParam* proxy = findProxy(inner))
        return proxy;
    // An input fed inside the group: the new source from outside replaces that wire.
    if (inner->isInput()) {
        inner->removeAllConnections();
        return findProxy(inner);
    }
    return nullptr;
}

void KrBrickGroup::innerBrickAdded(KrShaderBrick* brick)
{
    connect(brick, &KrShaderBrick::connectionsChanged, this, &KrBrickGroup::updateProxies);
    connect(brick, &KrShaderBrick::paramAdded, this, &KrBrickGroup::updateProxies);
    connect(brick, &KrShaderBrick::paramRemoved, this, &KrBrickGroup::updateProxies);
    connect(brick, &KrShaderBrick::brickIDChanged, this, &KrBrickGroup::updateProxies);
    updateProxies();
    emit brickAdded(brick);
}

void KrBrickGroup::innerBrickRemoved(KrShaderBrick* brick)
{
    disconnect(brick, nullptr, this, nullptr);
    updateProxies();
    emit brickRemoved(brick);
}

void KrBrickGroup::updateProxies()
{
    if (m_updating || isBeingDestroyed() || !m_inner)
        return;
    m_updating = true;
    QList<KrBrickParam*> wanted;
    for (const KrShaderBrick* brick : m_inner->getBricks()) {
        for (int i = 0; i < brick->getNumParameters(); ++i) {
            KrBrickParam* p = brick->getParameter(i);
            if (p->isInput()) {
                const KrBrickParam* src = p->getSource();
                if (src && m_inner->contains(src->getBrick()))
                    continue;
            }
            wanted.append(p);
        }
    }
    // Parameters that no longer stand for anything go with their outside wires.
    const QList<KrBrickGroupParam*> proxies = m_proxies.values();
    for (KrBrickGroupParam* proxy : proxies) {
        KrBrickParam* inner = proxy->getInner();
        if (inner && wanted.contains(inner))
            continue;
        for (auto it = m_proxies.begin(); it != m_proxies.end(); ++it) {
            if (it.value() == proxy) {
                m_proxies.erase(it);
                break;
            }
        }
        removeParameter(proxy);
    }
    for (int i = 0; i < wanted.size(); ++i) {
        KrBrickParam* inner = wanted.at(i);
        if (m_proxies.contains(inner))
            continue;
        auto* proxy = new KrBrickGroupParam(this, inner);
        // Two inner parameters of one label are told apart by their brick.
        QString label = inner->getLabel();
        auto taken = [this](const QString& l) {
            for (int k = 0; k < getNumParameters(); ++k) {
                if (getParameter(k)->getLabel() == l)
                    return true;
            }
            return false;
        };
        if (taken(label))
            label = inner->getBrick()->getPreferredName() + QLatin1Char(' ') + inner->getLabel();
        for (int n = 2; taken(label); ++n)
            label = inner->getBrick()->getPreferredName() + QLatin1Char(' ') + inner->getLabel() +
                    QLatin1Char(' ') + QString::number(n);
        proxy->setLabel(label);
        m_proxies.insert(inner, proxy);
        if (!insertParameter(qMin(i, getNumParameters()), proxy)) {
            m_proxies.remove(inner);
            delete proxy;
        }
    }
    m_updating = false;
}

void KrBrickGroup::writeBrickState(KrSettings* state) const
{
    if (!m_inner)
        return;
    state->setIntValue(kNextIdKey, int(m_inner->getNextId()));
    QList<uint> all;
    KrDefaultBrickUser::getAttributesHelper(this, all, state->setSettingsValue(kBricksKey), true);
}

bool KrBrickGroup::readBrickState(const KrSettings* state)
{
    if (!m_inner || !state)
        return false;
    m_inner->clear();
    const KrSettings* bricks = state->getSettingsValue(kBricksKey);
    if (bricks) {
        QHash<QString, KrShaderBrick*> created;
        KrDefaultBrickUser::setAttributesHelper(this, bricks, created, false);
    }
    if (state->getValueType(kNextIdKey) == KrSettings::Int)
        m_inner->setNextId(uint(qMax(0, state->getIntValue(kNextIdKey))));
    return bricks || !state->hasKey(kBricksKey);
}

QString KrBrickGroup::getShaderCode() const
{
    QStringList lines;
    if (!m_inner)
        return QString();
    for (const KrShaderBrick* brick : m_inner->getBricks()) {
        const QString code = brick->getShaderCode();
        if (!code.isEmpty())
            lines << QStringLiteral("// %1").arg(brick->getBrickTitle()) << code;
    }
    return lines.join(QLatin1Char('\n'));
}

QString KrBrickGroup::getPreferredName() const
{
    return getName().isEmpty() ? QStringLiteral("Group") : getName();
}

QString KrBrickGroup::getDefaultCategory() const
{
    return QStringLiteral("Utility");
}

QString KrBrickGroup::getDescription() const
{
    return QStringLiteral(
        "Several bricks shown as one. Its inputs are the inner inputs that no inner brick "
        "feeds; its outputs are the inner outputs.");
}

void KrBrickGroup::release()
{
    if (refCount() == 0)
        delete this;
}

bool KrBrickGroup::acceptsBrick(KrShaderBrick* brick)
{
    return m_inner && m_inner->canFile(brick, true);
}

QMap<uint, KrShaderBrick*> KrBrickGroup::getBricks() const
{
    return m_inner ? m_inner->getBricks() : QMap<uint, KrShaderBrick*>();
}

QObject* KrBrickGroup::getObject() const
{
    return const_cast<KrBrickGroup*>(this);
}

IKrBrickUser* KrBrickGroup::createNew()
{
    return new KrBrickGroup;
}

QString KrBrickGroup::getFileExtension() const
{
    return QStringLiteral("kbg");
}

QString KrBrickGroup::getTypeLabel() const
{
    return QStringLiteral("Brick Group");
}

void KrBrickGroup::setName(const QString& name)
{
    KrShaderBrick::setName(name);
}

uint KrBrickGroup::insertBrick(KrShaderBrick* brick)
{
    if (!acceptsBrick(brick))
        return 0;
    return m_inner->insertBrick(brick);
}

bool KrBrickGroup::takeBrick(KrShaderBrick* brick)
{
    return m_inner && m_inner->takeBrick(brick);
}

KrShaderBrick* KrBrickGroup::findBrick(uint id) const
{
    return m_inner ? m_inner->findBrick(id) : nullptr;
}
