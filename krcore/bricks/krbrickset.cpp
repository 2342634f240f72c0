#include "krbrickset.h"

#include "krshaderbrick.h"

KrBrickSet::KrBrickSet(ShaderType type, const QString& name, bool acceptsAnyRoot, QObject* parent)
    : QObject(parent), m_type(type), m_name(name), m_anyRoot(acceptsAnyRoot)
{
}

KrBrickSet::~KrBrickSet() = default;

QString KrBrickSet::shaderTypeName(int type)
{
    switch (type) {
    case Function:
        return QStringLiteral("Function");
    case Surface:
        return QStringLiteral("Surface");
    case Displacement:
        return QStringLiteral("Displacement");
    case Light:
        return QStringLiteral("Light");
    case Imager:
        return QStringLiteral("Imager");
    default:
        return QString();
    }
}

bool KrBrickSet::isValidShaderType(int type)
{
    return !shaderTypeName(type).isEmpty();
}

KrShaderBrick* KrBrickSet::getRoot() const
{
    return static_cast<KrShaderBrick*>(m_root.data());
}

bool KrBrickSet::canTakeRoot(const KrShaderBrick* root) const
{
    if (!root)
        return true;
    const int t = root->type();
    if (t == Function || !isValidShaderType(t))
        return false;
    return m_anyRoot || t == m_type;
}

bool KrBrickSet::setRoot(KrShaderBrick* root)
{
    if (!canTakeRoot(root))
        return false;
    if (getRoot() == root)
        return true;
    m_root = root;
    emit rootChanged(root);
    return true;
}

int KrBrickSet::getShaderType() const
{
    if (m_anyRoot)
        return m_root ? getRoot()->type() : int(Function);
    return m_type;
}

void KrBrickSet::setName(const QString& name)
{
    if (name == m_name)
        return;
    m_name = name;
    emit nameChanged(name);
}

QList<KrShaderBrick*> KrBrickSet::getBrickList() const
{
    QList<KrShaderBrick*> list;
    if (KrShaderBrick* root = getRoot())
        root->getBrickList(true, true, true, &list);
    return list;
}
