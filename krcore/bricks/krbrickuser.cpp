#include "krbrickuser.h"

#include "krbrickgroup.h"
#include "krbrickparam.h"
#include "krdefaultbrickuser.h"
#include "krproperty.h"
#include "krsettings.h"
#include "krshaderbrick.h"

#include <QSet>
#include <limits>

namespace {
IKrBrickSceneBridge* s_sceneBridge = nullptr;
const QString kTitleKey = QStringLiteral("BrickTitle");
} // namespace

// ------------------------------------------------------------------------------ IKrBrickUser

IKrBrickUser::~IKrBrickUser() = default;

KrShaderBrick* IKrBrickUser::findBrick(uint id) const
{
    return getBricks().value(id, nullptr);
}

IKrBrickSceneBridge::~IKrBrickSceneBridge() = default;

// -------------------------------------------------------------------------- KrBrickContainer

KrBrickContainer::KrBrickContainer(KrElement* owner, IKrBrickUser* user)
    : QObject(nullptr), m_owner(owner), m_user(user)
{
}

KrBrickContainer::~KrBrickContainer()
{
    // Owners clear while they are whole; this only catches what is left.
    const bool blocked = blockSignals(true);
    clear();
    blockSignals(blocked);
}

bool KrBrickContainer::isValidId(qint64 id)
{
    return id > 0 && id <= std::numeric_limits<int>::max();
}

bool KrBrickContainer::contains(const KrShaderBrick* brick) const
{
    return brick && brick->getContainer() == this &&
           m_bricks.value(brick->getBrickID(), nullptr) == brick;
}

bool KrBrickContainer::canFile(KrShaderBrick* brick, bool functionsOnly) const
{
    if (!brick)
        return false;
    if (contains(brick))
        return true;
    if (brick->getContainer() || brick->isBeingDestroyed())
        return false;
    // A group never goes into itself or into a group inside it.
    if (brick == m_owner)
        return false;
    if (auto* group = qobject_cast<KrBrickGroup*>(brick)) {
        if (group->containsBrick(qobject_cast<KrShaderBrick*>(m_owner)))
            return false;
    }
    if (brick->type() == KrBrickSet::Function)
        return true;
    if (functionsOnly)
        return false;
    return findSetForRoot(brick) != nullptr;
}

uint KrBrickContainer::insertBrick(KrShaderBrick* brick, uint wantedId)
{
    if (!brick)
        return 0;
    if (contains(brick))
        return brick->getBrickID();
    if (brick->getContainer())
        return 0;
    uint id = 0;
    if (wantedId && isValidId(wantedId) && !m_bricks.contains(wantedId)) {
        id = wantedId;
    } else {
        id = m_nextId;
        while (m_bricks.contains(id))
            ++id;
        if (!isValidId(id)) {
            qWarning("KrBrickContainer::insertBrick: no brick id left");
            return 0;
        }
    }
    m_nextId = qMax<uint>(m_nextId, id + 1);
    brick->ref();
    m_bricks.insert(id, brick);
    brick->m_id = id;
    brick->m_container = this;
    brick->setElementParent(m_owner);
    if (brick->type() != KrBrickSet::Function) {
        if (KrBrickSet* set = findSetForRoot(brick))
            set->setRoot(brick);
    }
    // The title the editor shows for a new brick; property paths are made from it.
    KrSettings* settings = brick->getBrickSettings();
    if (settings->getStringValue(kTitleKey).isEmpty())
        settings->setStringValue(kTitleKey,
                                 brick->getPreferredName() + QStringLiteral("(%1)").arg(id));
    brick->updatePropertyList();
    watchBrick(brick);
    emit brickAdded(brick);
    propertiesChanged();
    return id;
}

void KrBrickContainer::watchBrick(KrShaderBrick* brick)
{
    connect(brick, &KrElement::propertyListChanged, this, &KrBrickContainer::propertiesChanged);
}

void KrBrickContainer::detach(KrShaderBrick* brick)
{
    disconnect(brick, nullptr, this, nullptr);
    for (KrBrickSet* set : qAsConst(m_sets)) {
        if (set->getRoot() == brick)
            set->setRoot(nullptr);
    }
    brick->m_container = nullptr;
    brick->setElementParent(nullptr);
}

bool KrBrickContainer::takeBrick(KrShaderBrick* brick)
{
    if (!contains(brick))
        return false;
    // No wire may lead from a brick outside the user into it.
    brick->removeAllConnections();
    m_bricks.remove(brick->getBrickID());
    detach(brick);
    emit brickRemoved(brick);
    propertiesChanged();
    brick->unref();
    return true;
}

void KrBrickContainer::clear()
{
    while (!m_bricks.isEmpty())
        takeBrick(m_bricks.last());
}

void KrBrickContainer::setNextId(uint next)
{
    if (next > m_nextId && isValidId(next))
        m_nextId = next;
}

KrBrickSet* KrBrickContainer::addBrickSet(KrBrickSet::ShaderType type, const QString& name,
                                          bool acceptsAnyRoot)
{
    auto* set = new KrBrickSet(type, name, acceptsAnyRoot, m_owner);
    m_sets.append(set);
    return set;
}

KrBrickSet* KrBrickContainer::findSetForRoot(const KrShaderBrick* brick) const
{
    for (KrBrickSet* set : m_sets) {
        if (!set->getRoot() && set->canTakeRoot(brick))
            return set;
    }
    return nullptr;
}

QList<KrProperty*> KrBrickContainer::getExposedProperties() const
{
    QList<KrProperty*> list;
    QSet<KrProperty*> listed;
    for (const KrShaderBrick* brick : m_bricks) {
        for (int i = 0; i < brick->getNumParameters(); ++i) {
            const KrBrickParam* p = brick->getParameter(i);
            for (int j = 0; j < p->getNumParamProperties(); ++j) {
                KrProperty* prop = p->getParamProperty(j);
                if (prop && !listed.contains(prop)) {
                    listed.insert(prop);
                    list.append(prop);
                }
            }
        }
    }
    return list;
}

void KrBrickContainer::propertiesChanged()
{
    if (m_batch > 0) {
        m_batchChanged = true;
        return;
    }
    emit exposedPropertiesChanged();
}

void KrBrickContainer::beginBatch()
{
    ++m_batch;
}

void KrBrickContainer::endBatch()
{
    if (m_batch == 0 || --m_batch > 0 || !m_batchChanged)
        return;
    m_batchChanged = false;
    emit exposedPropertiesChanged();
}

bool KrBrickContainer::refile(KrShaderBrick* brick, uint newId)
{
    if (!contains(brick) || !isValidId(newId) || m_bricks.contains(newId))
        return false;
    m_bricks.remove(brick->getBrickID());
    m_bricks.insert(newId, brick);
    m_nextId = qMax<uint>(m_nextId, newId + 1);
    propertiesChanged();
    return true;
}

void KrBrickContainer::brickDestroyed(KrShaderBrick* brick)
{
    // Only a brick deleted while filed (its holder did not take it first) arrives here.
    qWarning("KrBrickContainer: brick %u was deleted while filed in its brick user",
             brick->getBrickID());
    for (auto it = m_bricks.begin(); it != m_bricks.end(); ++it) {
        if (it.value() == brick) {
            m_bricks.erase(it);
            break;
        }
    }
    detach(brick);
    propertiesChanged();
}

// ------------------------------------------------------------------------ KrBrickUserElement

KrBrickUserElement::KrBrickUserElement(const QString& name, QObject* parent)
    : KrElement(name, parent), m_container(new KrBrickContainer(this, this))
{
    connect(m_container, &KrBrickContainer::brickAdded, this, &KrBrickUserElement::brickAdded);
    connect(m_container, &KrBrickContainer::brickRemoved, this, &KrBrickUserElement::brickRemoved);
    connect(m_container, &KrBrickContainer::exposedPropertiesChanged, this,
            &KrBrickUserElement::exposedPropertiesChanged);
}

KrBrickUserElement::~KrBrickUserElement()
{
    // Nobody listens to a brick user that is going away.
    const bool blocked = blockSignals(true);
    m_container->blockSignals(true);
    m_container->clear();
    blockSignals(blocked);
    delete m_container;
}

void KrBrickUserElement::exposedPropertiesChanged()
{
    const QList<KrProperty*> list = m_container->getExposedProperties();
    if (list != getProperties())
        setProperties(list);
}

void KrBrickUserElement::getAttributes(KrSettings* settings) const
{
    KrDefaultBrickUser::writeUserRecord(this, settings);
}

bool KrBrickUserElement::setAttributes(const KrSettings* settings)
{
    return KrDefaultBrickUser::readUserRecord(this, settings);
}

void KrBrickUserElement::release()
{
    delete this;
}

bool KrBrickUserElement::acceptsBrick(KrShaderBrick* brick)
{
    return m_container->canFile(brick);
}

QMap<uint, KrShaderBrick*> KrBrickUserElement::getBricks() const
{
    return m_container->getBricks();
}

QObject* KrBrickUserElement::getObject() const
{
    return const_cast<KrBrickUserElement*>(this);
}

void KrBrickUserElement::setName(const QString& name)
{
    KrElement::setName(name);
}

int KrBrickUserElement::getNumBrickSets() const
{
    return m_container->getNumBrickSets();
}

KrBrickSet* KrBrickUserElement::getBrickSet(int i) const
{
    return m_container->getBrickSet(i);
}

uint KrBrickUserElement::insertBrick(KrShaderBrick* brick)
{
    if (!acceptsBrick(brick))
        return 0;
    return m_container->insertBrick(brick);
}

bool KrBrickUserElement::takeBrick(KrShaderBrick* brick)
{
    return m_container->takeBrick(brick);
}

bool KrBrickUserElement::apply()
{
    return s_sceneBridge ? s_sceneBridge->apply(this) : false;
}

QList<IKrBrickUser*> KrBrickUserElement::getSceneBrickUsers()
{
    return s_sceneBridge ? s_sceneBridge->getSceneBrickUsers(this) : QList<IKrBrickUser*>();
}

QString KrBrickUserElement::getSceneKey() const
{
    if (!m_sceneKey.isEmpty() || !s_sceneBridge)
        return m_sceneKey;
    return s_sceneBridge->getSceneKey(this);
}

void KrBrickUserElement::setFromScene(bool fromScene)
{
    m_fromScene = fromScene;
}

bool KrBrickUserElement::prepareBricks()
{
    bool added = false;
    for (int i = 0; i < m_container->getNumBrickSets(); ++i) {
        if (m_container->getBrickSet(i)->getRoot())
            continue;
        KrShaderBrick* root = createDefaultRoot(i);
        if (!root)
            continue;
        if (insertBrick(root)) {
            added = true;
        } else {
            root->ref();
            root->unref();
        }
    }
    return added;
}

KrShaderBrick* KrBrickUserElement::findBrick(uint id) const
{
    return m_container->findBrick(id);
}

void KrBrickUserElement::setSceneBridge(IKrBrickSceneBridge* bridge)
{
    s_sceneBridge = bridge;
}

IKrBrickSceneBridge* KrBrickUserElement::getSceneBridge()
{
    return s_sceneBridge;
}

KrBrickSet* KrBrickUserElement::addBrickSet(KrBrickSet::ShaderType type, const QString& name,
                                            bool acceptsAnyRoot)
{
    return m_container->addBrickSet(type, name, acceptsAnyRoot);
}

KrShaderBrick* KrBrickUserElement::createDefaultRoot(int) const
{
    return nullptr;
}
