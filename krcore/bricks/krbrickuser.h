#pragma once

#include "krcore_global.h"
#include "krbrickset.h"
#include "krelement.h"

#include <QList>
#include <QMap>
#include <QObject>
#include <QString>

class KrBrickContainer;
class KrProperty;
class KrSettings;
class KrShaderBrick;

// The owner of bricks: a material, a light, a plain brick set, a brick group. It files its
// bricks by id (ids are never reused within one brick user) and holds one reference on each.
class KRCORE_EXPORT IKrBrickUser
{
public:
    virtual ~IKrBrickUser();

    // Deletes the brick user (a brick group only when nobody holds a reference on it).
    virtual void release() = 0;
    // Whether insertBrick() would take the brick: a function brick, or a root that a brick set
    // without root takes; never a brick filed elsewhere.
    virtual bool acceptsBrick(KrShaderBrick* brick) = 0;
    virtual QMap<uint, KrShaderBrick*> getBricks() const = 0;
    // The element; it emits brickAdded(KrShaderBrick*) and brickRemoved(KrShaderBrick*).
    virtual QObject* getObject() const = 0;
    // A new, empty brick user of the same kind (the caller owns it), or null.
    virtual IKrBrickUser* createNew() = 0;
    virtual QString getFileExtension() const = 0;
    virtual QString getTypeLabel() const = 0;
    virtual QString getName() const = 0;
    virtual void setName(const QString& name) = 0;
    virtual int getNumBrickSets() const = 0;
    virtual KrBrickSet* getBrickSet(int i) const = 0;
    // Files the brick under a fresh id and takes a reference. Answers the id, or 0 when the
    // brick is refused. A brick already filed here keeps its id.
    virtual uint insertBrick(KrShaderBrick* brick) = 0;
    // Unwires the brick, takes it out and drops the reference (which may delete it).
    virtual bool takeBrick(KrShaderBrick* brick) = 0;
    // Hands the brick user to the host scene. False when there is no scene to take it.
    virtual bool apply() = 0;
    // The brick users of this kind in the host scene; they belong to the scene.
    virtual QList<IKrBrickUser*> getSceneBrickUsers() = 0;
    virtual QString getSceneKey() const = 0;
    virtual void setFromScene(bool fromScene) = 0;
    // Makes the brick user ready for editing: each brick set gets a root if it has none.
    // True when anything was added.
    virtual bool prepareBricks() = 0;

    virtual KrShaderBrick* findBrick(uint id) const;
    // The bookkeeping of krcore's own brick users, so that records can restore ids; null for
    // other implementations.
    virtual KrBrickContainer* getBrickContainer() const { return nullptr; }
};

// The host scene's side of brick users: reading them from the scene and applying them back.
// Installed by the scene once it exists; without one, apply() answers false and there are no
// scene brick users.
class KRCORE_EXPORT IKrBrickSceneBridge
{
public:
    virtual ~IKrBrickSceneBridge();
    virtual bool apply(IKrBrickUser* brickUser) = 0;
    virtual QList<IKrBrickUser*> getSceneBrickUsers(const IKrBrickUser* prototype) = 0;
    virtual QString getSceneKey(const IKrBrickUser* brickUser) const = 0;
};

// The bookkeeping of a brick user: bricks filed by id, brick sets and their roots, and the
// list of the bricks' parameter properties that the user shows as its own.
class KRCORE_EXPORT KrBrickContainer : public QObject
{
    Q_OBJECT
public:
    // owner is what the bricks see as their element parent; user is its IKrBrickUser side.
    KrBrickContainer(KrElement* owner, IKrBrickUser* user);
    ~KrBrickContainer() override;

    KrElement* getOwner() const { return m_owner; }
    IKrBrickUser* getUser() const { return m_user; }

    QMap<uint, KrShaderBrick*> getBricks() const { return m_bricks; }
    KrShaderBrick* findBrick(uint id) const { return m_bricks.value(id, nullptr); }
    bool contains(const KrShaderBrick* brick) const;
    int count() const { return m_bricks.size(); }

    // Whether the brick could be filed: not filed elsewhere, and a function brick or a root
    // that a set without root takes. A brick already filed here is accepted.
    bool canFile(KrShaderBrick* brick, bool functionsOnly = false) const;
    // Files the brick under wantedId when that is free (0: a fresh id) and takes a reference.
    // 0 when refused.
    uint insertBrick(KrShaderBrick* brick, uint wantedId = 0);
    bool takeBrick(KrShaderBrick* brick);
    // Takes every brick, the last id first.
    void clear();

    // The next fresh id; never lowered, so ids are not reused.
    uint getNextId() const { return m_nextId; }
    void setNextId(uint next);
    static bool isValidId(qint64 id);

    KrBrickSet* addBrickSet(KrBrickSet::ShaderType type, const QString& name,
                            bool acceptsAnyRoot = false);
    int getNumBrickSets() const { return m_sets.size(); }
    KrBrickSet* getBrickSet(int i) const { return m_sets.value(i, nullptr); }
    // The first set without root that takes the brick as its root, or null.
    KrBrickSet* findSetForRoot(const KrShaderBrick* brick) const;

    // Every parameter property of the bricks, by brick id, parameter and property order.
    QList<KrProperty*> getExposedProperties() const;
    // While a batch is open (they nest), changes of the exposed properties are told once,
    // when the last batch closes: loading a record does not rebuild views per brick.
    void beginBatch();
    void endBatch();

    // Called by KrShaderBrick.
    bool refile(KrShaderBrick* brick, uint newId);
    void brickDestroyed(KrShaderBrick* brick);

signals:
    void brickAdded(KrShaderBrick* brick);
    void brickRemoved(KrShaderBrick* brick);
    void exposedPropertiesChanged();

private:
    void watchBrick(KrShaderBrick* brick);
    void detach(KrShaderBrick* brick);

    KrElement* m_owner;
    IKrBrickUser* m_user;
    QMap<uint, KrShaderBrick*> m_bricks;
    void propertiesChanged();

    QList<KrBrickSet*> m_sets;
    uint m_nextId = 1;
    int m_batch = 0;
    bool m_batchChanged = false;
};

// The common base of the brick users that are plain elements (materials, lights, brick sets).
// Its properties are its bricks' parameter properties, each under the path
// "/<brick title>/<parameter label>".
class KRCORE_EXPORT KrBrickUserElement : public KrElement, public IKrBrickUser
{
    Q_OBJECT
public:
    explicit KrBrickUserElement(const QString& name = QString(), QObject* parent = nullptr);
    ~KrBrickUserElement() override;

    // The whole network: name, brick sets with their roots, bricks, settings, values,
    // labels and connections.
    void getAttributes(KrSettings* settings) const override;
    // Replaces the network with the record's. Loads what is sound and warns about the rest.
    bool setAttributes(const KrSettings* settings) override;

    void release() override;
    bool acceptsBrick(KrShaderBrick* brick) override;
    QMap<uint, KrShaderBrick*> getBricks() const override;
    QObject* getObject() const override;
    QString getName() const override { return KrElement::getName(); }
    void setName(const QString& name) override;
    int getNumBrickSets() const override;
    KrBrickSet* getBrickSet(int i) const override;
    uint insertBrick(KrShaderBrick* brick) override;
    bool takeBrick(KrShaderBrick* brick) override;
    bool apply() override;
    QList<IKrBrickUser*> getSceneBrickUsers() override;
    QString getSceneKey() const override;
    void setFromScene(bool fromScene) override;
    bool prepareBricks() override;
    KrShaderBrick* findBrick(uint id) const override;
    KrBrickContainer* getBrickContainer() const override { return m_container; }

    bool isFromScene() const { return m_fromScene; }
    void setSceneKey(const QString& key) { m_sceneKey = key; }

    static void setSceneBridge(IKrBrickSceneBridge* bridge);
    static IKrBrickSceneBridge* getSceneBridge();

signals:
    void brickAdded(KrShaderBrick* brick);
    void brickRemoved(KrShaderBrick* brick);

protected:
    KrBrickSet* addBrickSet(KrBrickSet::ShaderType type, const QString& name,
                            bool acceptsAnyRoot = false);
    // A new root for brick set i, for prepareBricks(); null when the set needs none.
    virtual KrShaderBrick* createDefaultRoot(int setIndex) const;

private:
    void exposedPropertiesChanged();

    KrBrickContainer* m_container;
    bool m_fromScene = false;
    QString m_sceneKey;
};
