#include "krbrickmaterial.h"

#include "krbricklibrary.h"
#include "krbrickparam.h"
#include "krclassfactory.h"
#include "krdefaultmaterial.h"
#include "krplugin.h"
#include "krproperty.h"

KR_CORE_CLASS(KrBrickMaterial, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D2F01");
KR_CORE_CLASS(KrBrickLight, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D2F02");
KR_CORE_CLASS(KrBrickShaderSet, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D2F03");

namespace {
bool setValue(KrShaderBrick* brick, const QString& arg, const QVariant& value)
{
    KrBrickParam* p = brick->findParameterByArg(arg);
    KrProperty* prop = p ? p->getParamProperty(0) : nullptr;
    return prop && prop->setValue(value);
}

bool wire(KrShaderBrick* source, const QString& output, KrShaderBrick* target, const QString& input)
{
    KrBrickParam* out = source->findParameterByArg(output);
    KrBrickParam* in = target->findParameterByArg(input);
    return out && in && in->addConnection(out);
}
} // namespace

// ---------------------------------------------------------------------------- KrBrickMaterial

KrBrickMaterial::KrBrickMaterial(QObject* parent) : KrBrickUserElement(QString(), parent)
{
    addBrickSet(KrBrickSet::Surface, QStringLiteral("Surface"));
}

KrBrickMaterial::~KrBrickMaterial() = default;

IKrBrickUser* KrBrickMaterial::createNew()
{
    return new KrBrickMaterial;
}

QString KrBrickMaterial::getFileExtension() const
{
    return QStringLiteral("kbm");
}

QString KrBrickMaterial::getTypeLabel() const
{
    return QStringLiteral("Brick Material");
}

KrShaderBrick* KrBrickMaterial::createDefaultRoot(int setIndex) const
{
    return setIndex == 0 ? new KrSurfaceBrick : nullptr;
}

KrBrickMaterial* KrBrickMaterial::convertDefaultMaterial(KrDefaultMaterial* material)
{
    if (!material)
        return nullptr;
    auto* result = new KrBrickMaterial;
    result->setName(material->getName());

    auto* root = new KrSurfaceBrick;
    auto* diffuse = new KrDiffuseBrick;
    auto* specular = new KrSpecularBrick;
    auto* ambient = new KrAmbientBrick;
    auto* reflection = new KrReflectionBrick;
    auto* refraction = new KrRefractionBrick;
    auto* sum = new KrAddColorsBrick;
    auto* opacity = new KrFloatConstantBrick;
    auto* bump = new KrBumpBrick;
    const QList<KrShaderBrick*> bricks{root,       diffuse, specular, ambient, reflection,
                                       refraction, sum,     opacity,  bump};
    for (KrShaderBrick* b : bricks) {
        if (!result->insertBrick(b)) {
            // Cannot happen with a fresh material; never leak the rest.
            b->ref();
            b->unref();
        }
    }

    setValue(diffuse, QStringLiteral("Cd"), material->getDiffuseColor());
    setValue(diffuse, QStringLiteral("Kd"), material->getDiffuseAmount());
    setValue(specular, QStringLiteral("Cs"), material->getSpecularColor());
    setValue(specular, QStringLiteral("Ks"), material->getSpecularAmount());
    setValue(specular, QStringLiteral("glossiness"), material->getGlossiness());
    setValue(ambient, QStringLiteral("Ca"), material->getAmbientColor());
    setValue(ambient, QStringLiteral("Ka"), 1.0);
    setValue(reflection, QStringLiteral("Cr"), material->getReflectionColor());
    setValue(reflection, QStringLiteral("Kr"), material->getReflectionAmount());
    setValue(refraction, QStringLiteral("Ct"), material->getTransparencyColor());
    setValue(refraction, QStringLiteral("Kt"), material->getRefractionAmount());
    setValue(refraction, QStringLiteral("ior"), material->getIndexOfRefraction());
    setValue(opacity, QStringLiteral("value"), material->getOpacity());
    setValue(bump, QStringLiteral("amount"), material->getBumpAmount());
    setValue(root, QStringLiteral("Ce"), material->getEmissionColor());

    while (sum->getNumInputs() < 5)
        sum->addInput();
    wire(diffuse, QStringLiteral("result"), sum, QStringLiteral("in1"));
    wire(specular, QStringLiteral("result"), sum, QStringLiteral("in2"));
    wire(ambient, QStringLiteral("result"), sum, QStringLiteral("in3"));
    wire(reflection, QStringLiteral("result"), sum, QStringLiteral("in4"));
    wire(refraction, QStringLiteral("result"), sum, QStringLiteral("in5"));
    wire(sum, QStringLiteral("result"), root, QStringLiteral("Cs"));
    wire(opacity, QStringLiteral("result"), root, QStringLiteral("Os"));
    wire(bump, QStringLiteral("result"), root, QStringLiteral("Nn"));
    // The bent normal shades every lighting brick.
    for (KrShaderBrick* b :
         {static_cast<KrShaderBrick*>(diffuse), static_cast<KrShaderBrick*>(specular),
          static_cast<KrShaderBrick*>(reflection), static_cast<KrShaderBrick*>(refraction)})
        wire(bump, QStringLiteral("result"), b, QStringLiteral("nin"));
    return result;
}

// ------------------------------------------------------------------------------- KrBrickLight

KrBrickLight::KrBrickLight(QObject* parent) : KrBrickUserElement(QString(), parent)
{
    addBrickSet(KrBrickSet::Light, QStringLiteral("Light"));
}

KrBrickLight::~KrBrickLight() = default;

IKrBrickUser* KrBrickLight::createNew()
{
    return new KrBrickLight;
}

QString KrBrickLight::getFileExtension() const
{
    return QStringLiteral("kbl");
}

QString KrBrickLight::getTypeLabel() const
{
    return QStringLiteral("Brick Light");
}

KrShaderBrick* KrBrickLight::createDefaultRoot(int setIndex) const
{
    return setIndex == 0 ? new KrLightBrick : nullptr;
}

// --------------------------------------------------------------------------- KrBrickShaderSet

KrBrickShaderSet::KrBrickShaderSet(QObject* parent) : KrBrickUserElement(QString(), parent)
{
    addBrickSet(KrBrickSet::Function, QStringLiteral("Shader"), true);
}

KrBrickShaderSet::~KrBrickShaderSet() = default;

IKrBrickUser* KrBrickShaderSet::createNew()
{
    return new KrBrickShaderSet;
}

QString KrBrickShaderSet::getFileExtension() const
{
    return QStringLiteral("kbs");
}

QString KrBrickShaderSet::getTypeLabel() const
{
    return QStringLiteral("Brick Set");
}
