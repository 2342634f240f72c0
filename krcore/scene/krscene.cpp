#include "krscene.h"

#include "krdefaultmaterial.h"
#include "krproperty.h"
#include "krsettings.h"

#include <QPointer>
#include <QUuid>
#include <QtDebug>

namespace {

QPointer<KrScene> s_current;

// Copies the whole network (and name) of one brick user into another.
bool copyNetwork(const IKrBrickUser* source, IKrBrickUser* target)
{
    const auto* from = qobject_cast<const KrElement*>(source ? source->getObject() : nullptr);
    auto* to = qobject_cast<KrElement*>(target ? target->getObject() : nullptr);
    if (!from || !to)
        return false;
    KrSettings record;
    from->getAttributes(&record);
    return to->setAttributes(&record);
}

} // namespace

// ----------------------------------------------------------------------- KrSceneBrickMaterial

KrSceneBrickMaterial::KrSceneBrickMaterial(const QString& key, QObject* parent)
    : KrBrickMaterial(parent), m_key(key)
{
    setSceneKey(key);
}

KrSceneBrickMaterial::~KrSceneBrickMaterial() = default;

IKrBrickUser* KrSceneBrickMaterial::createNew()
{
    auto* copy = new KrBrickMaterial;
    copy->setSceneKey(m_key);
    return copy;
}

void KrSceneBrickMaterial::release()
{
    // Owned by its scene material; whoever read it from the scene must not delete it.
}

// -------------------------------------------------------------------------- KrSceneBrickLight

KrSceneBrickLight::KrSceneBrickLight(const QString& key, QObject* parent)
    : KrBrickLight(parent), m_key(key)
{
    setSceneKey(key);
}

KrSceneBrickLight::~KrSceneBrickLight() = default;

IKrBrickUser* KrSceneBrickLight::createNew()
{
    auto* copy = new KrBrickLight;
    copy->setSceneKey(m_key);
    return copy;
}

void KrSceneBrickLight::release()
{
    // Owned by its light node.
}

// --------------------------------------------------------------------------------- KrMaterial

KrMaterial::KrMaterial(const QString& key, KrScene* scene)
    : KrBase(QString(), scene), m_key(key), m_scene(scene),
      m_brickMaterial(new KrSceneBrickMaterial(key, this))
{
    connect(m_brickMaterial, &KrBase::nameChanged, this, [this](const QString& name) {
        KrBase::setName(name);
        emit changed();
    });
}

KrMaterial::~KrMaterial()
{
    delete m_brickMaterial;
}

KrBrickMaterial* KrMaterial::getBrickMaterial() const
{
    return m_brickMaterial;
}

void KrMaterial::setName(const QString& name)
{
    m_brickMaterial->setName(name);
    KrBase::setName(name);
}

// ------------------------------------------------------------------------------------- KrNode

KrNode::KrNode(const QString& name, const QString& key, KrScene* scene)
    : KrElement(name, scene), m_key(key), m_scene(scene)
{
    connect(this, &KrBase::nameChanged, this, &KrNode::changed);
}

KrNode::~KrNode() = default;

QString KrNode::getKindLabel() const
{
    switch (getKind()) {
    case Object:
        return QStringLiteral("Object");
    case Light:
        return QStringLiteral("Light");
    case Camera:
        return QStringLiteral("Camera");
    }
    return QString();
}

QString KrNode::getShaderName() const
{
    return QString();
}

void KrNode::setPosition(const QVector3D& position)
{
    if (position == m_position)
        return;
    m_position = position;
    emit changed();
}

KrObject::KrObject(const QString& name, const QString& shape, const QString& key, KrScene* scene)
    : KrNode(name, key, scene), m_shape(shape)
{
}

KrObject::~KrObject() = default;

QString KrObject::getShaderName() const
{
    return m_material ? m_material->getName() : QString();
}

KrLight::KrLight(const QString& name, const QString& key, KrScene* scene)
    : KrNode(name, key, scene), m_brickLight(new KrSceneBrickLight(key, this))
{
    connect(m_brickLight, &KrBase::nameChanged, this, &KrNode::changed);
}

KrLight::~KrLight()
{
    delete m_brickLight;
}

KrBrickLight* KrLight::getBrickLight() const
{
    return m_brickLight;
}

QString KrLight::getShaderName() const
{
    return m_brickLight->getName();
}

KrCamera::KrCamera(const QString& name, const QString& key, KrScene* scene)
    : KrNode(name, key, scene)
{
}

KrCamera::~KrCamera() = default;

void KrCamera::setTarget(const QVector3D& target)
{
    if (target == m_target)
        return;
    m_target = target;
    emit changed();
}

void KrCamera::setFieldOfView(double degrees)
{
    const double clamped = qBound(1.0, degrees, 179.0);
    if (qFuzzyCompare(clamped, m_fieldOfView))
        return;
    m_fieldOfView = clamped;
    emit changed();
}

// ------------------------------------------------------------------------------------ KrScene

KrScene::KrScene(QObject* parent) : QObject(parent)
{
    // Scripts walk the scene through these.
    qRegisterMetaType<KrNode*>();
    qRegisterMetaType<KrMaterial*>();
}

KrScene::~KrScene()
{
    if (s_current == this || (!s_current && KrBrickUserElement::getSceneBridge() == this)) {
        KrBrickUserElement::setSceneBridge(nullptr);
        s_current = nullptr;
    }
    // Nodes first: objects point at materials.
    qDeleteAll(m_nodes);
    m_nodes.clear();
    qDeleteAll(m_materials);
    m_materials.clear();
}

KrScene* KrScene::getCurrent()
{
    return s_current;
}

void KrScene::makeCurrent()
{
    s_current = this;
    KrBrickUserElement::setSceneBridge(this);
}

QString KrScene::newKey(const QString& kind)
{
    return kind + QLatin1Char('/') + QUuid::createUuid().toString(QUuid::WithoutBraces);
}

void KrScene::createDefaultContents()
{
    KrMaterial* red = addMaterial(QStringLiteral("Red Plastic"), QColor(200, 40, 35));
    KrMaterial* floor = addMaterial(QStringLiteral("Floor Grey"), QColor(150, 150, 145));
    KrMaterial* blue = addMaterial(QStringLiteral("Blue Ceramic"), QColor(40, 90, 200));

    addObject(QStringLiteral("Sphere"), QStringLiteral("Sphere"), red)
        ->setPosition(QVector3D(-1.5f, 1.0f, 0.0f));
    addObject(QStringLiteral("Floor"), QStringLiteral("Plane"), floor);
    addObject(QStringLiteral("Teapot"), QStringLiteral("Teapot"), blue)
        ->setPosition(QVector3D(1.5f, 0.0f, 0.0f));
    // Shares the floor's material: it is one scene material, read once.
    addObject(QStringLiteral("Pedestal"), QStringLiteral("Box"), floor)
        ->setPosition(QVector3D(1.5f, -0.5f, 0.0f));

    addLight(QStringLiteral("Key Light"))->setPosition(QVector3D(4.0f, 6.0f, 4.0f));
    KrCamera* camera = addCamera(QStringLiteral("Camera"));
    camera->setPosition(QVector3D(0.0f, 3.0f, 9.0f));
    camera->setTarget(QVector3D(0.0f, 0.5f, 0.0f));
}

KrMaterial* KrScene::addMaterial(const KrBrickMaterial* source)
{
    auto* material = new KrMaterial(newKey(QStringLiteral("Material")), this);
    if (source) {
        copyNetwork(source, material->m_brickMaterial);
        material->KrBase::setName(material->m_brickMaterial->getName());
    }
    m_materials.append(material);
    // A rename of the scene's own network shows on the objects that carry it.
    connect(material, &KrMaterial::changed, this,
            [this, material]() { materialChangedInPlace(material); });
    return material;
}

KrMaterial* KrScene::addMaterial(const QString& name, const QColor& diffuse)
{
    KrDefaultMaterial plain(name);
    if (KrProperty* color = plain.findOriginalProperty(QStringLiteral("Diffuse Color")))
        color->setValue(diffuse);
    KrBrickMaterial* converted = KrBrickMaterial::convertDefaultMaterial(&plain);
    KrMaterial* material = addMaterial(converted);
    if (converted)
        converted->release();
    material->setName(name);
    return material;
}

void KrScene::addNode(KrNode* node)
{
    m_nodes.append(node);
    connect(node, &KrNode::changed, this, [this, node]() { emit nodeChanged(node); });
    emit nodeAdded(node);
}

KrObject* KrScene::addObject(const QString& name, const QString& shape, KrMaterial* material)
{
    auto* object = new KrObject(name, shape, newKey(QStringLiteral("Object")), this);
    if (material && m_materials.contains(material))
        object->m_material = material;
    addNode(object);
    return object;
}

KrLight* KrScene::addLight(const QString& name, const KrBrickLight* source)
{
    auto* light = new KrLight(name, newKey(QStringLiteral("Light")), this);
    if (!source || !copyNetwork(source, light->m_brickLight))
        light->m_brickLight->setName(name);
    light->m_brickLight->prepareBricks();
    addNode(light);
    return light;
}

KrCamera* KrScene::addCamera(const QString& name)
{
    auto* camera = new KrCamera(name, newKey(QStringLiteral("Camera")), this);
    addNode(camera);
    return camera;
}

bool KrScene::removeNode(KrNode* node)
{
    const int index = m_nodes.indexOf(node);
    if (index < 0)
        return false;
    const bool wasSelected = node->m_selected;
    emit nodeAboutToBeRemoved(node);
    m_nodes.removeAt(index);
    delete node;
    pruneMaterials();
    if (wasSelected)
        emit selectionChanged();
    return true;
}

bool KrScene::setMaterial(KrObject* object, KrMaterial* material)
{
    if (!object || !m_nodes.contains(object) || (material && !m_materials.contains(material)))
        return false;
    if (object->m_material != material) {
        object->m_material = material;
        emit nodeChanged(object);
        pruneMaterials();
    }
    return true;
}

void KrScene::pruneMaterials()
{
    for (int i = m_materials.size() - 1; i >= 0; --i) {
        KrMaterial* material = m_materials.at(i);
        bool used = false;
        for (KrNode* node : qAsConst(m_nodes)) {
            auto* object = qobject_cast<KrObject*>(node);
            if (object && object->m_material == material) {
                used = true;
                break;
            }
        }
        if (!used) {
            m_materials.removeAt(i);
            delete material;
        }
    }
}

KrMaterial* KrScene::findMaterialByKey(const QString& key) const
{
    for (KrMaterial* material : m_materials) {
        if (material->getKey() == key)
            return material;
    }
    return nullptr;
}

KrNode* KrScene::findNode(const QString& name) const
{
    for (KrNode* node : m_nodes) {
        if (node->getName() == name)
            return node;
    }
    return nullptr;
}

KrNode* KrScene::findNodeByKey(const QString& key) const
{
    for (KrNode* node : m_nodes) {
        if (node->getKey() == key)
            return node;
    }
    return nullptr;
}

void KrScene::setSelected(KrNode* node, bool selected)
{
    if (!node || !m_nodes.contains(node) || node->m_selected == selected)
        return;
    node->m_selected = selected;
    emit selectionChanged();
}

void KrScene::setSelection(const QList<KrNode*>& nodes)
{
    bool changed = false;
    for (KrNode* node : qAsConst(m_nodes)) {
        const bool selected = nodes.contains(node);
        if (node->m_selected != selected) {
            node->m_selected = selected;
            changed = true;
        }
    }
    if (changed)
        emit selectionChanged();
}

void KrScene::clearSelection()
{
    setSelection({});
}

QList<KrNode*> KrScene::getSelectedNodes() const
{
    QList<KrNode*> selected;
    for (KrNode* node : m_nodes) {
        if (node->m_selected)
            selected.append(node);
    }
    return selected;
}

QList<KrObject*> KrScene::getSelectedObjects() const
{
    QList<KrObject*> selected;
    for (KrNode* node : m_nodes) {
        auto* object = qobject_cast<KrObject*>(node);
        if (object && object->m_selected)
            selected.append(object);
    }
    return selected;
}

void KrScene::materialUpdated(KrMaterial* material)
{
    emit material->changed();
}

void KrScene::materialChangedInPlace(KrMaterial* material)
{
    emit materialChanged(material);
    for (KrNode* node : qAsConst(m_nodes)) {
        auto* object = qobject_cast<KrObject*>(node);
        if (object && object->m_material == material)
            emit nodeChanged(object);
    }
}

bool KrScene::apply(IKrBrickUser* brickUser)
{
    QObject* element = brickUser ? brickUser->getObject() : nullptr;
    if (auto* material = qobject_cast<KrBrickMaterial*>(element))
        return applyMaterial(material);
    if (auto* light = qobject_cast<KrBrickLight*>(element))
        return applyLight(light);
    return false;
}

bool KrScene::applyMaterial(KrBrickMaterial* brickMaterial)
{
    for (KrMaterial* material : qAsConst(m_materials)) {
        if (material->getBrickMaterial() == brickMaterial) {
            // The scene's own network was edited in place.
            materialUpdated(material);
            return true;
        }
    }
    if (brickMaterial->isFromScene()) {
        KrMaterial* material = findMaterialByKey(brickMaterial->getSceneKey());
        if (!material) {
            qWarning().noquote() << QStringLiteral("The material \"%1\" is no longer in the scene; "
                                                   "it was not applied")
                                        .arg(brickMaterial->getName());
            return false;
        }
        if (!copyNetwork(brickMaterial, material->m_brickMaterial))
            return false;
        material->KrBase::setName(material->m_brickMaterial->getName());
        materialUpdated(material);
        return true;
    }
    const QList<KrObject*> targets = getSelectedObjects();
    if (targets.isEmpty())
        return false;
    // One scene material for all of them, so that it is read back once.
    KrMaterial* material = addMaterial(brickMaterial);
    for (KrObject* object : targets) {
        object->m_material = material;
        emit nodeChanged(object);
    }
    pruneMaterials();
    emit materialChanged(material);
    return true;
}

bool KrScene::applyLight(KrBrickLight* brickLight)
{
    for (KrNode* node : qAsConst(m_nodes)) {
        auto* light = qobject_cast<KrLight*>(node);
        if (light && light->getBrickLight() == brickLight) {
            emit nodeChanged(light);
            return true;
        }
    }
    if (brickLight->isFromScene()) {
        auto* light = qobject_cast<KrLight*>(findNodeByKey(brickLight->getSceneKey()));
        if (!light) {
            qWarning().noquote()
                << QStringLiteral("The light \"%1\" is no longer in the scene; it was not applied")
                       .arg(brickLight->getName());
            return false;
        }
        if (!copyNetwork(brickLight, light->m_brickLight))
            return false;
        emit nodeChanged(light);
        return true;
    }
    // A new light network makes its node; later applies update that node.
    QString name = brickLight->getName();
    if (name.trimmed().isEmpty())
        name = QStringLiteral("Light");
    KrLight* light = addLight(name, brickLight);
    brickLight->setSceneKey(light->getKey());
    brickLight->setFromScene(true);
    return true;
}

QList<IKrBrickUser*> KrScene::getSceneBrickUsers(const IKrBrickUser* prototype)
{
    QList<IKrBrickUser*> users;
    QObject* element = prototype ? prototype->getObject() : nullptr;
    if (qobject_cast<KrBrickMaterial*>(element)) {
        // In the order the objects carry them, each material once.
        for (KrNode* node : qAsConst(m_nodes)) {
            auto* object = qobject_cast<KrObject*>(node);
            if (object && object->m_material &&
                !users.contains(object->m_material->m_brickMaterial))
                users.append(object->m_material->m_brickMaterial);
        }
    } else if (qobject_cast<KrBrickLight*>(element)) {
        for (KrNode* node : qAsConst(m_nodes)) {
            if (auto* light = qobject_cast<KrLight*>(node))
                users.append(light->m_brickLight);
        }
    }
    return users;
}

QString KrScene::getSceneKey(const IKrBrickUser* brickUser) const
{
    for (KrMaterial* material : m_materials) {
        if (material->m_brickMaterial == brickUser)
            return material->getKey();
    }
    for (KrNode* node : m_nodes) {
        auto* light = qobject_cast<KrLight*>(node);
        if (light && light->m_brickLight == brickUser)
            return light->getKey();
    }
    return QString();
}
