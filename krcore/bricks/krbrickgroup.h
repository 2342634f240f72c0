#pragma once

#include "krcore_global.h"
#include "krbrickparam.h"
#include "krbrickuser.h"
#include "krshaderbrick.h"

#include <QHash>
#include <QPointer>

class KrBrickGroup;

// A parameter of a group that stands for a parameter of a brick inside it. Wires from outside
// the group are kept here; its value properties are the inner parameter's.
class KRCORE_EXPORT KrBrickGroupParam : public KrBrickParam
{
    Q_OBJECT
public:
    KrBrickGroupParam(KrBrickGroup* group, KrBrickParam* inner);
    ~KrBrickGroupParam() override;

    KrBrickParam* getInner() const { return m_inner.data(); }
    KrBrickParam* getProxiedParam() const override { return getInner(); }
    // "b<inner brick id>_<inner argument>": unique within the group.
    QString getParamArg(int i = 0) const override;
    int getNumParamProperties() const override;
    KrProperty* getParamProperty(int i) const override;
    QString getDefaultValueText() const override;

private:
    void innerTypeChanged();
    void innerLabelChanged();

    QPointer<KrBrickParam> m_inner;
    QString m_innerLabel;
};

// A brick made of bricks. Inside it is a brick user of function bricks; outside it shows as
// one function brick whose inputs are the inner inputs that no inner brick feeds and whose
// outputs are all inner outputs. Wiring an inner parameter from outside the group wires the
// group's parameter that stands for it.
class KRCORE_EXPORT KrBrickGroup : public KrShaderBrick, public IKrBrickUser
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrBrickGroup(QObject* parent = nullptr);
    ~KrBrickGroup() override;

    // The group a brick is filed in, or null.
    static KrBrickGroup* enclosingGroup(const KrShaderBrick* brick);
    // Whether brick sits in this group, directly or in a group inside it.
    bool containsBrick(const KrShaderBrick* brick) const;
    // The group parameter standing for inner, or null (an input fed inside the group has none).
    KrBrickGroupParam* findProxy(const KrBrickParam* inner) const;
    // As findProxy; an input fed inside the group first loses that wire so that it gets one.
    KrBrickGroupParam* proxyForAdding(KrBrickParam* inner);

    void writeBrickState(KrSettings* state) const override;
    bool readBrickState(const KrSettings* state) override;
    QString getShaderCode() const override;

    QString getPreferredName() const override;
    QString getDefaultCategory() const override;
    QString getDescription() const override;

    // IKrBrickUser
    void release() override;
    bool acceptsBrick(KrShaderBrick* brick) override;
    QMap<uint, KrShaderBrick*> getBricks() const override;
    QObject* getObject() const override;
    IKrBrickUser* createNew() override;
    QString getFileExtension() const override;
    QString getTypeLabel() const override;
    QString getName() const override { return KrShaderBrick::getName(); }
    void setName(const QString& name) override;
    int getNumBrickSets() const override { return 0; }
    KrBrickSet* getBrickSet(int) const override { return nullptr; }
    uint insertBrick(KrShaderBrick* brick) override;
    bool takeBrick(KrShaderBrick* brick) override;
    bool apply() override { return false; }
    QList<IKrBrickUser*> getSceneBrickUsers() override { return {}; }
    QString getSceneKey() const override { return QString(); }
    void setFromScene(bool) override {}
    bool prepareBricks() override { return false; }
    KrShaderBrick* findBrick(uint id) const override;
    KrBrickContainer* getBrickContainer() const override { return m_inner; }

signals:
    void brickAdded(KrShaderBrick* brick);
    void brickRemoved(KrShaderBrick* brick);

private:
    void innerBrickAdded(KrShaderBrick* brick);
    void innerBrickRemoved(KrShaderBrick* brick);
    // Brings the group's parameters in line with the inner network.
    void updateProxies();

    KrBrickContainer* m_inner;
    QHash<const KrBrickParam*, KrBrickGroupParam*> m_proxies;
    bool m_updating = false;
};
