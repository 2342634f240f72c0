#pragma once

#include "krcore_global.h"
#include "krbrickmaterial.h"
#include "krbrickuser.h"
#include "krelement.h"

#include <QColor>
#include <QList>
#include <QObject>
#include <QString>
#include <QVector3D>

class KrScene;

// The scene's own network of a material. A copy made with createNew() remembers which scene
// material it came from, so that applying the copy writes back into this one.
class KRCORE_EXPORT KrSceneBrickMaterial : public KrBrickMaterial
{
    Q_OBJECT
public:
    explicit KrSceneBrickMaterial(const QString& key, QObject* parent = nullptr);
    ~KrSceneBrickMaterial() override;

    IKrBrickUser* createNew() override;
    void release() override;

private:
    QString m_key;
};

// The scene's own network of a light; copies remember their light node as above.
class KRCORE_EXPORT KrSceneBrickLight : public KrBrickLight
{
    Q_OBJECT
public:
    explicit KrSceneBrickLight(const QString& key, QObject* parent = nullptr);
    ~KrSceneBrickLight() override;

    IKrBrickUser* createNew() override;
    void release() override;

private:
    QString m_key;
};

// A material of the scene, shared by the objects that carry it. It owns its brick network.
class KRCORE_EXPORT KrMaterial : public KrBase
{
    Q_OBJECT
public:
    ~KrMaterial() override;

    KrBrickMaterial* getBrickMaterial() const;
    QString getKey() const { return m_key; }
    KrScene* getScene() const { return m_scene; }

    void setName(const QString& name) override;

signals:
    void changed();

private:
    friend class KrScene;
    KrMaterial(const QString& key, KrScene* scene);

    QString m_key;
    KrScene* m_scene;
    KrSceneBrickMaterial* m_brickMaterial;
};

// An item of the scene: an object, a light or a camera.
class KRCORE_EXPORT KrNode : public KrElement
{
    Q_OBJECT
public:
    enum Kind
    {
        Object,
        Light,
        Camera
    };
    Q_ENUM(Kind)

    ~KrNode() override;

    virtual Kind getKind() const = 0;
    QString getKey() const { return m_key; }
    KrScene* getScene() const { return m_scene; }

public slots:
    QString getKindLabel() const; // "Object", "Light", "Camera"
    bool isSelected() const { return m_selected; }
    // What the node's look comes from: its material's or its light network's name.
    virtual QString getShaderName() const;

    QVector3D getPosition() const { return m_position; }
    void setPosition(const QVector3D& position);

signals:
    void changed();

protected:
    KrNode(const QString& name, const QString& key, KrScene* scene);

private:
    friend class KrScene;
    QString m_key;
    KrScene* m_scene;
    QVector3D m_position;
    bool m_selected = false;
};

// A piece of geometry ("Sphere", "Plane", "Teapot", "Box") with a material.
class KRCORE_EXPORT KrObject : public KrNode
{
    Q_OBJECT
public:
    ~KrObject() override;

    Kind getKind() const override { return Object; }

public slots:
    QString getShape() const { return m_shape; }
    KrMaterial* getMaterial() const { return m_material; }
    QString getShaderName() const override;

private:
    friend class KrScene;
    KrObject(const QString& name, const QString& shape, const QString& key, KrScene* scene);
    KrMaterial* m_material = nullptr;
    QString m_shape;
};

// A light whose shader is a brick network owned by the node.
class KRCORE_EXPORT KrLight : public KrNode
{
    Q_OBJECT
public:
    ~KrLight() override;

    Kind getKind() const override { return Light; }
    KrBrickLight* getBrickLight() const;

public slots:
    QString getShaderName() const override;

private:
    friend class KrScene;
    KrLight(const QString& name, const QString& key, KrScene* scene);
    KrSceneBrickLight* m_brickLight;
};

// The view the scene is rendered from.
class KRCORE_EXPORT KrCamera : public KrNode
{
    Q_OBJECT
public:
    ~KrCamera() override;

    Kind getKind() const override { return Camera; }

public slots:
    QVector3D getTarget() const { return m_target; }
    void setTarget(const QVector3D& target);
    double getFieldOfView() const { return m_fieldOfView; }
    // Degrees, kept between 1 and 179.
    void setFieldOfView(double degrees);

private:
    friend class KrScene;
    KrCamera(const QString& name, const QString& key, KrScene* scene);
    QVector3D m_target;
    double m_fieldOfView = 45.0;
};

// The host scene: nodes in order, the materials they share and the selection. The current
// scene is the one brick users read from and apply to.
class KRCORE_EXPORT KrScene : public QObject, public IKrBrickSceneBridge
{
    Q_OBJECT
public:
    explicit KrScene(QObject* parent = nullptr);
    ~KrScene() override;

    // The scene brick users talk to; null when none was made current.
    static KrScene* getCurrent();
    // Makes this the scene of apply() and of reading from the scene.
    void makeCurrent();

    // Fills an empty scene with the start-up contents: objects with brick materials, a key
    // light and a camera.
    void createDefaultContents();

    // A new material whose network is a copy of source's (named like it). Unused until an
    // object carries it.
    KrMaterial* addMaterial(const KrBrickMaterial* source);
    // A material made from a default material with the given colour and name.
    KrMaterial* addMaterial(const QString& name, const QColor& diffuse);
    KrObject* addObject(const QString& name, const QString& shape, KrMaterial* material);
    // A light node; its network is a copy of source's, or a fresh light root without one.
    KrLight* addLight(const QString& name, const KrBrickLight* source = nullptr);
    KrCamera* addCamera(const QString& name);
    // Deletes the node; materials nobody carries any more go with it.
    bool removeNode(KrNode* node);
    // Gives the object the material (null takes it off); unused materials are dropped.
    bool setMaterial(KrObject* object, KrMaterial* material);

    QList<KrNode*> getNodes() const { return m_nodes; }
    QList<KrMaterial*> getMaterials() const { return m_materials; }
    KrMaterial* findMaterialByKey(const QString& key) const;

    void setSelected(KrNode* node, bool selected);
    // Replaces the selection; nodes of other scenes are ignored.
    void setSelection(const QList<KrNode*>& nodes);
    QList<KrNode*> getSelectedNodes() const;
    QList<KrObject*> getSelectedObjects() const;

    // IKrBrickSceneBridge
    bool apply(IKrBrickUser* brickUser) override;
    QList<IKrBrickUser*> getSceneBrickUsers(const IKrBrickUser* prototype) override;
    QString getSceneKey(const IKrBrickUser* brickUser) const override;

public slots:
    int getNumNodes() const { return m_nodes.size(); }
    KrNode* getNode(int i) const { return m_nodes.value(i, nullptr); }
    KrNode* findNode(const QString& name) const;
    KrNode* findNodeByKey(const QString& key) const;
    void clearSelection();

signals:
    void nodeAdded(KrNode* node);
    // Emitted while the node still exists, just before it is deleted.
    void nodeAboutToBeRemoved(KrNode* node);
    // The node's name, material or network changed.
    void nodeChanged(KrNode* node);
    void materialChanged(KrMaterial* material);
    void selectionChanged();

private:
    friend class KrMaterial;
    friend class KrNode;
    void addNode(KrNode* node);
    void pruneMaterials();
    void materialUpdated(KrMaterial* material);
    void materialChangedInPlace(KrMaterial* material);
    bool applyMaterial(KrBrickMaterial* brickMaterial);
    bool applyLight(KrBrickLight* brickLight);
    static QString newKey(const QString& kind);

    QList<KrNode*> m_nodes;
    QList<KrMaterial*> m_materials;
};
