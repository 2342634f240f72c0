#pragma once

#include "krcore_global.h"
#include "krbrickuser.h"

class KrDefaultMaterial;

// A material whose surface shader is a brick network: one brick set of type Surface.
class KRCORE_EXPORT KrBrickMaterial : public KrBrickUserElement
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrBrickMaterial(QObject* parent = nullptr);
    ~KrBrickMaterial() override;

    // A brick material whose network reproduces the default material: a surface root fed by
    // diffuse, specular, ambient, reflection, refraction, bump and opacity bricks carrying its
    // values. Named like it. Null for a null material.
    static KrBrickMaterial* convertDefaultMaterial(KrDefaultMaterial* material);

    IKrBrickUser* createNew() override;
    QString getFileExtension() const override;
    QString getTypeLabel() const override;

protected:
    KrShaderBrick* createDefaultRoot(int setIndex) const override;
};

// A light whose shader is a brick network: one brick set of type Light.
class KRCORE_EXPORT KrBrickLight : public KrBrickUserElement
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrBrickLight(QObject* parent = nullptr);
    ~KrBrickLight() override;

    IKrBrickUser* createNew() override;
    QString getFileExtension() const override;
    QString getTypeLabel() const override;

protected:
    KrShaderBrick* createDefaultRoot(int setIndex) const override;
};

// A plain brick network: one brick set that takes a root of any kind.
class KRCORE_EXPORT KrBrickShaderSet : public KrBrickUserElement
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrBrickShaderSet(QObject* parent = nullptr);
    ~KrBrickShaderSet() override;

    IKrBrickUser* createNew() override;
    QString getFileExtension() const override;
    QString getTypeLabel() const override;
};
