#pragma once

#include "krcore_global.h"
#include "krelement.h"

#include <QColor>
#include <QHash>

class KrColorProperty;
class KrFloatProperty;
class KrProperty;

// The plain material of the host: the properties a 3D user expects, without a network.
// Brick materials are made from it (KrBrickMaterial::convertDefaultMaterial).
class KRCORE_EXPORT KrDefaultMaterial : public KrElement
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrDefaultMaterial(const QString& name = QString(),
                                           QObject* parent = nullptr);
    ~KrDefaultMaterial() override;

public slots:
    QColor getDiffuseColor() const;
    double getDiffuseAmount() const;
    QColor getSpecularColor() const;
    double getSpecularAmount() const;
    double getGlossiness() const;
    QColor getAmbientColor() const;
    double getOpacity() const;
    double getBumpAmount() const;
    double getReflectionAmount() const;
    double getRefractionAmount() const;
    double getIndexOfRefraction() const;
    QColor getReflectionColor() const;
    QColor getTransparencyColor() const;
    QColor getEmissionColor() const;

    // A property by its original name (a later rename does not count) as a float or colour;
    // 0 or an invalid colour when there is none.
    double floatValue(const QString& name) const;
    QColor colorValue(const QString& name) const;
    KrProperty* findOriginalProperty(const QString& name) const;

private:
    QHash<QString, KrProperty*> m_byName;
    KrColorProperty* addColor(const QString& name, const QColor& value, bool advanced = false);
    KrFloatProperty* addFloat(const QString& name, double value, double minimum, double maximum,
                              bool advanced = false);
};
