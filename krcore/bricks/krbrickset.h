#pragma once

#include "krcore_global.h"

#include <QList>
#include <QObject>
#include <QPointer>
#include <QString>

class KrShaderBrick;

// One shader network of a brick user: the root brick that the shader compiler starts from.
// Every brick feeding the root, directly or not, belongs to the network.
class KRCORE_EXPORT KrBrickSet : public QObject
{
    Q_OBJECT
public:
    enum ShaderType
    {
        Function = 0,
        Surface = 1,
        Displacement = 2,
        Light = 4,
        Imager = 8
    };
    Q_ENUM(ShaderType)

    // With acceptsAnyRoot the set takes a root of any type and reports the root's type as its
    // own (a plain brick set); otherwise only roots of type.
    KrBrickSet(ShaderType type, const QString& name, bool acceptsAnyRoot = false,
               QObject* parent = nullptr);
    ~KrBrickSet() override;

    static QString shaderTypeName(int type); // "Function", "Surface", ... empty when unknown
    static bool isValidShaderType(int type);

public slots:
    KrShaderBrick* getRoot() const;
    // Refuses (false) a function brick or a root of another type; null clears the root.
    bool setRoot(KrShaderBrick* root);
    bool canTakeRoot(const KrShaderBrick* root) const;
    int getShaderType() const;
    bool acceptsAnyRoot() const { return m_anyRoot; }
    QString getName() const { return m_name; }
    void setName(const QString& name);
    // The root followed by every brick that feeds it, each once.
    QList<KrShaderBrick*> getBrickList() const;

signals:
    void rootChanged(KrShaderBrick* root);
    void nameChanged(const QString& name);

private:
    ShaderType m_type;
    QString m_name;
    bool m_anyRoot;
    QPointer<QObject> m_root; // a KrShaderBrick
};
