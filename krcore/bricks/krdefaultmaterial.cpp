#include "krdefaultmaterial.h"

#include "krproperty.h"

KrDefaultMaterial::KrDefaultMaterial(const QString& name, QObject* parent) : KrElement(name, parent)
{
    // The order is the one users know from material editors; views list it as it is.
    addColor(QStringLiteral("Diffuse Color"), QColor(204, 204, 204));
    addFloat(QStringLiteral("Diffuse Amount"), 0.8, 0.0, 1.0);
    addColor(QStringLiteral("Specular Color"), Qt::white);
    addFloat(QStringLiteral("Specular Amount"), 0.5, 0.0, 1.0);
    addFloat(QStringLiteral("Glossiness"), 0.5, 0.0, 1.0);
    addColor(QStringLiteral("Ambient Color"), Qt::black);
    addFloat(QStringLiteral("Opacity"), 1.0, 0.0, 1.0);
    addFloat(QStringLiteral("Bump Amount"), 1.0, -100.0, 100.0);
    addFloat(QStringLiteral("Reflection Amount"), 0.0, 0.0, 1.0);
    addFloat(QStringLiteral("Refraction Amount"), 0.0, 0.0, 1.0);
    addFloat(QStringLiteral("Index of Refraction"), 1.5, 1.0, 10.0);
    addColor(QStringLiteral("Reflection Color"), Qt::white, true);
    addColor(QStringLiteral("Transparency Color"), Qt::white, true);
    addColor(QStringLiteral("Emission Color"), Qt::black, true);
}

KrDefaultMaterial::~KrDefaultMaterial() = default;

KrColorProperty* KrDefaultMaterial::addColor(const QString& name, const QColor& value,
                                             bool advanced)
{
    auto* p = new KrColorProperty(name, value, this);
    p->setAdvanced(advanced);
    addProperty(p);
    m_byName.insert(name, p);
    return p;
}

KrFloatProperty* KrDefaultMaterial::addFloat(const QString& name, double value, double minimum,
                                             double maximum, bool advanced)
{
    auto* p = new KrFloatProperty(name, value, this);
    p->setRange(minimum, maximum);
    p->setStep(0.01);
    p->setAdvanced(advanced);
    addProperty(p);
    m_byName.insert(name, p);
    return p;
}

KrProperty* KrDefaultMaterial::findOriginalProperty(const QString& name) const
{
    return m_byName.value(name, nullptr);
}

double KrDefaultMaterial::floatValue(const QString& name) const
{
    const KrProperty* p = findOriginalProperty(name);
    return p ? p->getValue().toDouble() : 0.0;
}

QColor KrDefaultMaterial::colorValue(const QString& name) const
{
    const KrProperty* p = findOriginalProperty(name);
    return p ? p->getValue().value<QColor>() : QColor();
}

QColor KrDefaultMaterial::getDiffuseColor() const
{
    return colorValue(QStringLiteral("Diffuse Color"));
}

double KrDefaultMaterial::getDiffuseAmount() const
{
    return floatValue(QStringLiteral("Diffuse Amount"));
}

QColor KrDefaultMaterial::getSpecularColor() const
{
    return colorValue(QStringLiteral("Specular Color"));
}

double KrDefaultMaterial::getSpecularAmount() const
{
    return floatValue(QStringLiteral("Specular Amount"));
}

double KrDefaultMaterial::getGlossiness() const
{
    return floatValue(QStringLiteral("Glossiness"));
}

QColor KrDefaultMaterial::getAmbientColor() const
{
    return colorValue(QStringLiteral("Ambient Color"));
}

double KrDefaultMaterial::getOpacity() const
{
    return floatValue(QStringLiteral("Opacity"));
}

double KrDefaultMaterial::getBumpAmount() const
{
    return floatValue(QStringLiteral("Bump Amount"));
}

double KrDefaultMaterial::getReflectionAmount() const
{
    return floatValue(QStringLiteral("Reflection Amount"));
}

double KrDefaultMaterial::getRefractionAmount() const
{
    return floatValue(QStringLiteral("Refraction Amount"));
}

double KrDefaultMaterial::getIndexOfRefraction() const
{
    return floatValue(QStringLiteral("Index of Refraction"));
}

QColor KrDefaultMaterial::getReflectionColor() const
{
    return colorValue(QStringLiteral("Reflection Color"));
}

QColor KrDefaultMaterial::getTransparencyColor() const
{
    return colorValue(QStringLiteral("Transparency Color"));
}

QColor KrDefaultMaterial::getEmissionColor() const
{
    return colorValue(QStringLiteral("Emission Color"));
}
