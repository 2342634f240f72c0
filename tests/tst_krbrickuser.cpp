// Brick users: filing by id, brick sets and roots, the properties they show, the kinds, the
// default material's conversion and brick groups.
#include "app_testsupport.h"
#include "bricks_testutil.h"
#include "krapp.h"
#include "krbrickgroup.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickparam.h"
#include "krcorvaneutility.h"
#include "krdefaultbrickuser.h"
#include "krdefaultmaterial.h"
#include "krproperty.h"
#include "krsettings.h"

#include <QPointer>
#include <QSignalSpy>
#include <QStandardPaths>
#include <QtTest>
#include <memory>

namespace {
struct UserDeleter
{
    void operator()(IKrBrickUser* u) const { u->release(); }
};
using UserPtr = std::unique_ptr<IKrBrickUser, UserDeleter>;

KrBrickParam* param(KrShaderBrick* b, const QString& arg)
{
    return b->findParameterByArg(arg);
}
} // namespace

class TestKrBrickUser : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void idsAreNeverReused();
    void setBrickIdRefiles();
    void rootsAndBrickSets();
    void insertAndTake();
    void bricksOfTwoUsersNeverWire();
    void exposedProperties();
    void exposedPathsFollowTitleAndLabel();
    void kinds();
    void prepareBricksAddsMissingRoot();
    void convertDefaultMaterial();
    void groupPlugs();
    void groupFollowsInnerChanges();
    void groupingLikeTheScene();
    void groupCannotHoldRootsOrItself();
    void sceneBridge();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrBrickUser::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
    QVERIFY(m_scope->isValid());
}

void TestKrBrickUser::idsAreNeverReused()
{
    KrBrickMaterial m;
    QSignalSpy added(&m, &KrBrickUserElement::brickAdded);
    auto* a = bricksAdd<KrDiffuseBrick>(&m);
    auto* b = bricksAdd<KrNoiseBrick>(&m);
    auto* c = bricksAdd<KrCheckerBrick>(&m);
    QCOMPARE(a->getBrickID(), 1u);
    QCOMPARE(b->getBrickID(), 2u);
    QCOMPARE(c->getBrickID(), 3u);
    QCOMPARE(added.count(), 3);
    QVERIFY(m.takeBrick(c)); // the highest id goes
    auto* d = bricksAdd<KrInvertBrick>(&m);
    QCOMPARE(d->getBrickID(), 4u);
    QVERIFY(m.takeBrick(a));
    QVERIFY(m.takeBrick(b));
    QVERIFY(m.takeBrick(d));
    QVERIFY(m.getBricks().isEmpty());
    auto* e = bricksAdd<KrInvertBrick>(&m);
    QCOMPARE(e->getBrickID(), 5u);
    QCOMPARE(m.findBrick(5), e);
    QVERIFY(m.findBrick(1) == nullptr);
    // Inserting a brick that is already filed gives its id again.
    QCOMPARE(m.insertBrick(e), 5u);
    QCOMPARE(m.getBricks().size(), 1);
}

void TestKrBrickUser::setBrickIdRefiles()
{
    KrBrickMaterial m;
    auto* a = bricksAdd<KrDiffuseBrick>(&m);
    auto* b = bricksAdd<KrNoiseBrick>(&m);
    QSignalSpy spy(a, &KrShaderBrick::brickIDChanged);
    a->setBrickID(10);
    QCOMPARE(spy.count(), 1);
    QCOMPARE(spy.first().first().toInt(), 1);
    QCOMPARE(a->getBrickID(), 10u);
    QCOMPARE(m.findBrick(10), a);
    QVERIFY(m.findBrick(1) == nullptr);
    QCOMPARE(m.getBricks().keys(), (QList<uint>{2, 10}));

    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("id 2 is not free"));
    a->setBrickID(2); // taken by b
    QCOMPARE(spy.count(), 1);
    QCOMPARE(a->getBrickID(), 10u);
    QCOMPARE(m.findBrick(2), b);
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("id 0 is not free"));
    a->setBrickID(0);
    QCOMPARE(a->getBrickID(), 10u);
    a->setBrickID(10); // unchanged: no signal
    QCOMPARE(spy.count(), 1);

    // A fresh id comes after every id ever used.
    QCOMPARE(bricksAdd<KrInvertBrick>(&m)->getBrickID(), 11u);

    // Undo of a deletion: the brick comes back under a fresh id and is moved to its old one.
    KrShaderBrick* brick = b;
    brick->ref();
    QVERIFY(m.takeBrick(brick));
    QCOMPARE(brick->getBrickID(), 2u); // kept while outside
    QCOMPARE(m.insertBrick(brick), 12u);
    brick->setBrickID(2);
    QCOMPARE(m.findBrick(2), brick);
    QCOMPARE(bricksAdd<KrInvertBrick>(&m)->getBrickID(), 13u);
    brick->unref();
    // Outside a brick user any id goes.
    auto* loose = new KrDiffuseBrick;
    loose->setBrickID(77);
    QCOMPARE(loose->getBrickID(), 77u);
    delete loose;
}

void TestKrBrickUser::rootsAndBrickSets()
{
    KrBrickMaterial m;
    QCOMPARE(m.getNumBrickSets(), 1);
    KrBrickSet* set = m.getBrickSet(0);
    QCOMPARE(set->getShaderType(), int(KrBrickSet::Surface));
    QVERIFY(m.getBrickSet(1) == nullptr);
    QVERIFY(!set->getRoot());

    auto* light = new KrLightBrick;
    QVERIFY(!m.acceptsBrick(light));
    QCOMPARE(m.insertBrick(light), 0u);
    QCOMPARE(light->refCount(), 0);
    auto* root = bricksAdd<KrSurfaceBrick>(&m);
    QVERIFY(root);
    QCOMPARE(set->getRoot(), root);
    auto* second = new KrSurfaceBrick;
    QVERIFY(!m.acceptsBrick(second)); // the set has its root
    QVERIFY(!set->setRoot(light));
    QVERIFY(!set->setRoot(bricksAdd<KrDiffuseBrick>(&m)));
    QVERIFY(m.takeBrick(root));
    QVERIFY(!set->getRoot());
    QVERIFY(m.acceptsBrick(second));
    QVERIFY(m.insertBrick(second));
    QCOMPARE(set->getRoot(), second);
    QVERIFY(!m.acceptsBrick(nullptr));

    KrBrickLight l;
    QCOMPARE(l.getBrickSet(0)->getShaderType(), int(KrBrickSet::Light));
    QVERIFY(l.insertBrick(light));
    QCOMPARE(l.getBrickSet(0)->getRoot(), light);

    // A plain brick set takes one root of any kind and reports its type.
    KrBrickShaderSet plain;
    KrBrickSet* ps = plain.getBrickSet(0);
    QCOMPARE(ps->getShaderType(), int(KrBrickSet::Function));
    auto* anyRoot = bricksAdd<KrLightBrick>(&plain);
    QVERIFY(anyRoot);
    QCOMPARE(ps->getShaderType(), int(KrBrickSet::Light));
    auto* extra = new KrSurfaceBrick;
    QVERIFY(!plain.acceptsBrick(extra));
    delete extra;
    QList<KrShaderBrick*> inSet = ps->getBrickList();
    QCOMPARE(inSet, QList<KrShaderBrick*>{anyRoot});
}

void TestKrBrickUser::insertAndTake()
{
    KrBrickMaterial m;
    QSignalSpy removed(&m, &KrBrickUserElement::brickRemoved);
    auto* src = bricksAdd<KrColorConstantBrick>(&m);
    auto* dst = bricksAdd<KrInvertColorBrick>(&m);
    QVERIFY(bricksWire(src, "result", dst, "value"));
    QCOMPARE(src->getElementParent(), &m);
    QCOMPARE(m.getObject(), &m);

    QPointer<KrShaderBrick> guard(src);
    uint seenId = 0;
    connect(&m, &KrBrickUserElement::brickRemoved, this,
            [&](KrShaderBrick* b) { seenId = b->getBrickID(); });
    QVERIFY(m.takeBrick(src));
    QCOMPARE(removed.count(), 1);
    QCOMPARE(seenId, 1u); // alive and still numbered while listeners hear of it
    QVERIFY(!guard);      // the user held the only reference
    QCOMPARE(param(dst, "value")->getNumConnections(), 0);
    QVERIFY(!m.takeBrick(nullptr));

    // A brick filed in one user is refused by another.
    KrBrickMaterial other;
    QVERIFY(!other.acceptsBrick(dst));
    QCOMPARE(other.insertBrick(dst), 0u);
    QVERIFY(!other.takeBrick(dst));
    QCOMPARE(m.findBrick(dst->getBrickID()), dst);
}

void TestKrBrickUser::bricksOfTwoUsersNeverWire()
{
    KrBrickMaterial a;
    KrBrickMaterial b;
    auto* src = bricksAdd<KrColorConstantBrick>(&a);
    auto* dst = bricksAdd<KrInvertColorBrick>(&b);
    QVERIFY(!param(dst, "value")->canConnectTo(param(src, "result")));
    QVERIFY(!bricksWire(src, "result", dst, "value"));
}

void TestKrBrickUser::exposedProperties()
{
    KrBrickMaterial m;
    QSignalSpy listSpy(&m, &KrElement::propertyListChanged);
    auto* diffuse = bricksAdd<KrDiffuseBrick>(&m);
    QVERIFY(listSpy.count() >= 1);
    // Color and Amount; the normal input has no value of its own.
    QCOMPARE(m.getNumProperties(), 2);
    QCOMPARE(m.getProperty(0), param(diffuse, "Cd")->getParamProperty(0));
    QCOMPARE(m.getProperty(0)->getPath(), QStringLiteral("/Diffuse(1)/Color"));
    QCOMPARE(m.getProperty(1)->getPath(), QStringLiteral("/Diffuse(1)/Amount"));
    QCOMPARE(diffuse->getBrickSettings()->getStringValue("BrickTitle"),
             QStringLiteral("Diffuse(1)"));

    auto* add = bricksAdd<KrAddBrick>(&m);
    QCOMPARE(m.getNumProperties(), 4);
    listSpy.clear();
    add->executeBrickAction(QStringLiteral("Add Input"));
    QVERIFY(listSpy.count() >= 1);
    QCOMPARE(m.getNumProperties(), 5);
    QCOMPARE(m.getProperty(4)->getPath(), QStringLiteral("/Add(2)/Input 3"));
    // Values set through the user's list reach the brick.
    QVERIFY(m.getProperty(1)->setValue(0.125));
    QCOMPARE(bricksValue(diffuse, "Kd").toDouble(), 0.125);

    listSpy.clear();
    QVERIFY(m.takeBrick(diffuse));
    QVERIFY(listSpy.count() >= 1);
    QCOMPARE(m.getNumProperties(), 3);
    QVERIFY(m.getProperty(0)->getPath().startsWith("/Add(2)/"));
}

void TestKrBrickUser::exposedPathsFollowTitleAndLabel()
{
    KrBrickMaterial m;
    auto* shiny = bricksAdd<KrSpecularBrick>(&m);
    KrProperty* color = param(shiny, "Cs")->getParamProperty(0);
    QCOMPARE(color->getPath(), QStringLiteral("/Specular(1)/Color"));
    QSignalSpy tree(&m, &KrElement::propertyTreeChanged);
    QSignalSpy title(shiny, &KrShaderBrick::brickTitleChanged);
    shiny->setBrickTitle(QStringLiteral("Shine"));
    QCOMPARE(title.count(), 1);
    QCOMPARE(shiny->getBrickTitle(), QStringLiteral("Shine"));
    QCOMPARE(color->getPath(), QStringLiteral("/Shine/Color"));
    QVERIFY(tree.count() >= 1);

    // A property the user regrouped elsewhere stays; one under the title follows.
    KrProperty* amount = param(shiny, "Ks")->getParamProperty(0);
    amount->setPath(QStringLiteral("/Looks/Amount"));
    KrProperty* gloss = param(shiny, "glossiness")->getParamProperty(0);
    gloss->setPath(QStringLiteral("/Shine"));
    shiny->setBrickTitle(QStringLiteral("Shiny"));
    QCOMPARE(amount->getPath(), QStringLiteral("/Looks/Amount"));
    QCOMPARE(gloss->getPath(), QStringLiteral("/Shiny"));
    QCOMPARE(color->getPath(), QStringLiteral("/Shiny/Color"));
    shiny->setBrickTitle(QStringLiteral("Shiny")); // same title: nothing
    QCOMPARE(title.count(), 2);

    // The editor's own rename writes the settings and rewrites paths by prefix itself; a
    // title that merely starts like ours is not ours.
    gloss->setPath(QStringLiteral("/ShinyFloor/Glossiness"));
    shiny->setBrickTitle(QStringLiteral("Gloss"));
    QCOMPARE(gloss->getPath(), QStringLiteral("/ShinyFloor/Glossiness"));

    // Parameter labels follow too.
    param(shiny, "Cs")->setLabel(QStringLiteral("Tint"));
    QCOMPARE(color->getPath(), QStringLiteral("/Gloss/Tint"));
    QCOMPARE(color->getName(), QStringLiteral("Tint"));
}

void TestKrBrickUser::kinds()
{
    struct Kind
    {
        const char* className;
        const char* label;
        const char* extension;
    };
    const Kind kinds[] = {{"KrBrickMaterial", "Brick Material", "kbm"},
                          {"KrBrickLight", "Brick Light", "kbl"},
                          {"KrBrickShaderSet", "Brick Set", "kbs"}};
    QList<IKrBrickUser*> list;
    KrCorvaneUtility::getBrickUserList(list);
    QCOMPARE(list.size(), 3);
    for (int i = 0; i < 3; ++i) {
        UserPtr proto(list.at(i));
        QCOMPARE(proto->getObject()->metaObject()->className(), kinds[i].className);
        QCOMPARE(proto->getTypeLabel(), QString::fromLatin1(kinds[i].label));
        QCOMPARE(proto->getFileExtension(), QString::fromLatin1(kinds[i].extension));
        QCOMPARE(KrCorvaneUtility::toBrickUser(proto->getObject()), proto.get());
        UserPtr fresh(proto->createNew());
        QVERIFY(fresh);
        QCOMPARE(fresh->getObject()->metaObject()->className(), kinds[i].className);
        QVERIFY(fresh->getBricks().isEmpty());
        fresh->setName(QStringLiteral("Named"));
        QCOMPARE(fresh->getName(), QStringLiteral("Named"));
        QCOMPARE(static_cast<KrElement*>(fresh->getObject())->getName(), QStringLiteral("Named"));
        // The open flow makes brick users by class name.
        KrClassFactory* f = krApp->findClassFactory(QString::fromLatin1(kinds[i].className));
        QVERIFY(f);
        QVERIFY(!f->provides("KrShaderBrick"));
        QObject* made = f->createInstance();
        QVERIFY(KrCorvaneUtility::toBrickUser(made));
        delete made;
        QVERIFY(!proto->apply()); // no scene
        QVERIFY(proto->getSceneBrickUsers().isEmpty());
    }
    KrDefaultMaterial notAUser;
    QVERIFY(KrCorvaneUtility::toBrickUser(&notAUser) == nullptr);
    QVERIFY(KrCorvaneUtility::toBrickUser(nullptr) == nullptr);

    const QString path = KrCorvaneUtility::getCustomBrickPath();
    QVERIFY(path.endsWith("/UserBricks"));
    QVERIFY(path.startsWith(QStandardPaths::writableLocation(QStandardPaths::AppDataLocation)));
    const QString nested = m_scope->path() + "/a b/c/UserBricks";
    QVERIFY(KrCorvaneUtility::createDirs(nested));
    QVERIFY(QFileInfo(nested).isDir());
    QVERIFY(KrCorvaneUtility::createDirs(nested)); // already there
    QVERIFY(!KrCorvaneUtility::createDirs(QString()));
    QFile file(m_scope->path() + "/plainfile");
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.close();
    QVERIFY(!KrCorvaneUtility::createDirs(file.fileName()));
}

void TestKrBrickUser::prepareBricksAddsMissingRoot()
{
    KrBrickMaterial m;
    QVERIFY(m.prepareBricks());
    KrShaderBrick* root = m.getBrickSet(0)->getRoot();
    QVERIFY(qobject_cast<KrSurfaceBrick*>(root));
    QVERIFY(!m.prepareBricks());
    QCOMPARE(m.getBricks().size(), 1);
    KrBrickLight l;
    QVERIFY(l.prepareBricks());
    QVERIFY(qobject_cast<KrLightBrick*>(l.getBrickSet(0)->getRoot()));
    KrBrickShaderSet plain;
    QVERIFY(!plain.prepareBricks());
    QVERIFY(plain.getBricks().isEmpty());
}

void TestKrBrickUser::convertDefaultMaterial()
{
    QVERIFY(KrBrickMaterial::convertDefaultMaterial(nullptr) == nullptr);
    KrDefaultMaterial dm(QStringLiteral("Brelvo Default Material"));
    // The properties view offers the names up to "Index of Refraction"; more follow it.
    QStringList names;
    for (int i = 0; i < dm.getNumProperties(); ++i)
        names << dm.getProperty(i)->getName();
    QCOMPARE(names.mid(0, 11),
             (QStringList{"Diffuse Color", "Diffuse Amount", "Specular Color", "Specular Amount",
                          "Glossiness", "Ambient Color", "Opacity", "Bump Amount",
                          "Reflection Amount", "Refraction Amount", "Index of Refraction"}));
    QVERIFY(names.size() > 11);

    dm.findProperty("Diffuse Color")->setValue(QColor(255, 0, 0));
    dm.findProperty("Diffuse Amount")->setValue(0.75);
    dm.findProperty("Specular Amount")->setValue(0.25);
    dm.findProperty("Glossiness")->setValue(0.9);
    dm.findProperty("Ambient Color")->setValue(QColor(0, 0, 255));
    dm.findProperty("Opacity")->setValue(0.5);
    dm.findProperty("Bump Amount")->setValue(2.0);
    dm.findProperty("Reflection Amount")->setValue(0.3);
    dm.findProperty("Refraction Amount")->setValue(0.2);
    dm.findProperty("Index of Refraction")->setValue(1.33);
    dm.findProperty("Emission Color")->setValue(QColor(0, 10, 0));
    // A rename in a properties view does not lose the value.
    dm.findProperty("Opacity")->setName("Alpha");

    std::unique_ptr<KrBrickMaterial> bm(KrBrickMaterial::convertDefaultMaterial(&dm));
    QVERIFY(bm);
    QCOMPARE(bm->getName(), QStringLiteral("Brelvo Default Material"));
    KrShaderBrick* root = bm->getBrickSet(0)->getRoot();
    QVERIFY(qobject_cast<KrSurfaceBrick*>(root));
    QList<KrShaderBrick*> feeders;
    root->getBrickList(true, false, true, &feeders);
    QVERIFY2(feeders.size() >= 6 && feeders.size() <= 10,
             qPrintable(QString::number(feeders.size())));
    QCOMPARE(feeders.size(), bm->getBricks().size() - 1); // nothing left unwired

    auto find = [&](const char* cls) -> KrShaderBrick* {
        for (KrShaderBrick* b : feeders) {
            if (qstrcmp(b->metaObject()->className(), cls) == 0)
                return b;
        }
        return nullptr;
    };
    KrShaderBrick* diffuse = find("KrDiffuseBrick");
    KrShaderBrick* specular = find("KrSpecularBrick");
    KrShaderBrick* ambient = find("KrAmbientBrick");
    KrShaderBrick* refraction = find("KrRefractionBrick");
    KrShaderBrick* reflection = find("KrReflectionBrick");
    KrShaderBrick* bump = find("KrBumpBrick");
    KrShaderBrick* opacity = find("KrFloatConstantBrick");
    QVERIFY(diffuse && specular && ambient && refraction && reflection && bump && opacity);
    QCOMPARE(bricksValue(diffuse, "Cd").value<QColor>(), QColor(255, 0, 0));
    QCOMPARE(bricksValue(diffuse, "Kd").toDouble(), 0.75);
    QCOMPARE(bricksValue(specular, "Ks").toDouble(), 0.25);
    QCOMPARE(bricksValue(specular, "glossiness").toDouble(), 0.9);
    QCOMPARE(bricksValue(ambient, "Ca").value<QColor>(), QColor(0, 0, 255));
    QCOMPARE(bricksValue(opacity, "value").toDouble(), 0.5);
    QCOMPARE(bricksValue(bump, "amount").toDouble(), 2.0);
    QCOMPARE(bricksValue(reflection, "Kr").toDouble(), 0.3);
    QCOMPARE(bricksValue(refraction, "Kt").toDouble(), 0.2);
    QCOMPARE(bricksValue(refraction, "ior").toDouble(), 1.33);
    QCOMPARE(bricksValue(root, "Ce").value<QColor>(), QColor(0, 10, 0));
    QCOMPARE(param(root, "Os")->getSource()->getBrick(), opacity);
    QCOMPARE(param(root, "Nn")->getSource()->getBrick(), bump);
    QCOMPARE(param(diffuse, "nin")->getSource()->getBrick(), bump);
}

void TestKrBrickUser::groupPlugs()
{
    KrBrickMaterial m;
    auto* root = bricksAdd<KrSurfaceBrick>(&m);
    auto* outside = bricksAdd<KrColorConstantBrick>(&m);
    auto* group = bricksAdd<KrBrickGroup>(&m);
    QVERIFY(group);
    QCOMPARE(group->type(), 0);
    auto* mul = bricksAdd<KrMultiplyColorsBrick>(group);
    auto* inv = bricksAdd<KrInvertColorBrick>(group);
    QCOMPARE(mul->getElementParent(), group);
    QVERIFY(bricksWire(mul, "result", inv, "value"));

    // Inner inputs fed inside have no plug; every other inner parameter has one.
    QStringList args;
    for (int i = 0; i < group->getNumParameters(); ++i)
        args << group->getParameter(i)->getParamArg();
    QCOMPARE(args, (QStringList{"b1_a", "b1_b", "b1_result", "b2_result"}));
    KrBrickParam* plugA = param(group, "b1_a");
    QCOMPARE(plugA->getDirection(), int(KrBrickParam::Input));
    QCOMPARE(plugA->getTypeLabel(), QStringLiteral("color"));
    QCOMPARE(plugA->getProxiedParam(), param(mul, "a"));
    QCOMPARE(plugA->getParamProperty(0), param(mul, "a")->getParamProperty(0));

    // Wiring the inner parameter from outside wires the group's plug.
    QSignalSpy plugSpy(plugA, &KrBrickParam::connectionsChanged);
    QVERIFY(bricksWire(outside, "result", mul, "a"));
    QCOMPARE(plugSpy.count(), 1);
    QCOMPARE(plugA->getNumConnections(), 1);
    QCOMPARE(plugA->getConnection(0)->getParam(), param(outside, "result"));
    QCOMPARE(param(outside, "result")->getConnection(0)->getParam(), plugA);
    QCOMPARE(param(outside, "result")->getConnection(0)->getParam()->getBrick(), group);
    QCOMPARE(param(mul, "a")->getNumConnections(), 0);
    QVERIFY(param(mul, "a")->isConnectedTo(param(outside, "result")));

    // An inner output feeds the root through its plug.
    QVERIFY(bricksWire(inv, "result", root, "Cs"));
    QCOMPARE(param(root, "Cs")->getSource(), param(group, "b2_result"));
    QList<KrShaderBrick*> list;
    root->getBrickList(true, false, true, &list);
    QCOMPARE(list, (QList<KrShaderBrick*>{group, outside}));

    // A ring through the group is refused, inside or outside.
    QVERIFY(!param(outside, "value")->canConnectTo(param(group, "b2_result")));
    QVERIFY(!bricksWire(inv, "result", outside, "value"));
    QVERIFY(!bricksWire(inv, "result", mul, "b")); // inside: inv is fed by mul
    // Inner to inner stays inside.
    auto* third = bricksAdd<KrInvertColorBrick>(group);
    QVERIFY(bricksWire(inv, "result", third, "value"));
    QCOMPARE(param(third, "value")->getSource(), param(inv, "result"));
    // Two inner parameters of one label get plugs told apart by their brick.
    QCOMPARE(param(group, "b2_result")->getLabel(), QStringLiteral("Inverted"));
    QCOMPARE(param(group, "b3_result")->getLabel(), QStringLiteral("Invert Color Inverted"));

    // Removing the wire at the inner parameter removes the plug's.
    QVERIFY(param(mul, "a")->removeConnection(param(outside, "result")));
    QCOMPARE(plugA->getNumConnections(), 0);
    QCOMPARE(param(outside, "result")->getNumConnections(), 0);
}

void TestKrBrickUser::groupFollowsInnerChanges()
{
    KrBrickMaterial m;
    auto* outside = bricksAdd<KrColorConstantBrick>(&m);
    auto* group = bricksAdd<KrBrickGroup>(&m);
    auto* mul = bricksAdd<KrMultiplyColorsBrick>(group);
    auto* inv = bricksAdd<KrInvertColorBrick>(group);
    QVERIFY(param(group, "b2_value"));
    QVERIFY(bricksWire(outside, "result", inv, "value"));
    KrBrickParam* plug = param(group, "b2_value");
    QCOMPARE(plug->getNumConnections(), 1);

    // An inner source replaces the outside one: the plug goes, with its wire.
    QSignalSpy removed(group, &KrShaderBrick::paramRemoved);
    QSignalSpy outsideSpy(param(outside, "result"), &KrBrickParam::connectionsChanged);
    QVERIFY(bricksWire(mul, "result", inv, "value"));
    QVERIFY(removed.count() >= 1);
    QVERIFY(!param(group, "b2_value"));
    QCOMPARE(param(outside, "result")->getNumConnections(), 0);
    QVERIFY(outsideSpy.count() >= 1);

    // And an outside source replaces the inner one again.
    QSignalSpy added(group, &KrShaderBrick::paramAdded);
    QVERIFY(bricksWire(outside, "result", inv, "value"));
    QVERIFY(added.count() >= 1);
    QCOMPARE(param(inv, "value")->getNumConnections(), 0);
    QCOMPARE(param(group, "b2_value")->getSource(), param(outside, "result"));
    QCOMPARE(param(mul, "result")->getNumConnections(), 0);

    // The group lists the values of its plugs; the material lists them too.
    QVERIFY(group->getProperties().contains(param(mul, "a")->getParamProperty(0)));
    QVERIFY(m.getProperties().contains(param(mul, "a")->getParamProperty(0)));

    // A brick leaving the group takes its plugs and their outside wires.
    QVERIFY(group->takeBrick(inv));
    QVERIFY(!param(group, "b2_value"));
    QVERIFY(!param(group, "b2_result"));
    QCOMPARE(param(outside, "result")->getNumConnections(), 0);
}

void TestKrBrickUser::groupingLikeTheScene()
{
    // The scene groups selected bricks by copying them into a group, wiring the copies from
    // the same outside sources, filing the group and removing the originals.
    KrBrickMaterial m;
    auto* root = bricksAdd<KrSurfaceBrick>(&m);
    auto* src = bricksAdd<KrColorConstantBrick>(&m);
    auto* a = bricksAdd<KrMultiplyColorsBrick>(&m);
    auto* b = bricksAdd<KrInvertColorBrick>(&m);
    QVERIFY(bricksWire(src, "result", a, "a"));
    QVERIFY(bricksWire(a, "result", b, "value"));
    QVERIFY(bricksWire(b, "result", root, "Cs"));
    bricksSetValue(a, "b", QColor(1, 2, 3));

    QList<uint> ids{a->getBrickID(), b->getBrickID()};
    KrSettings settings;
    KrDefaultBrickUser::getAttributesHelper(&m, ids, &settings, true);
    auto* group = new KrBrickGroup;
    QHash<QString, KrShaderBrick*> nameMap;
    QCOMPARE(KrDefaultBrickUser::setAttributesHelper(group, &settings, nameMap, true), 2);
    KrShaderBrick* copyA = nameMap.value(QStringLiteral("Brick_%1").arg(a->getBrickID()));
    KrShaderBrick* copyB = nameMap.value(QStringLiteral("Brick_%1").arg(b->getBrickID()));
    QVERIFY(copyA && copyB);
    QCOMPARE(param(copyB, "value")->getSource(), param(copyA, "result"));
    QCOMPARE(bricksValue(copyA, "b").value<QColor>(), QColor(1, 2, 3));
    // The copy takes the outside source while the group is not filed yet.
    QVERIFY(param(copyA, "a")->addConnection(param(src, "result")));
    QCOMPARE(param(group, QStringLiteral("b%1_a").arg(copyA->getBrickID()))->getSource(),
             param(src, "result"));
    QVERIFY(m.insertBrick(group));
    m.takeBrick(b);
    m.takeBrick(a);
    QCOMPARE(param(src, "result")->getNumConnections(), 1);
    QCOMPARE(param(src, "result")->getConnection(0)->getParam()->getBrick(), group);
    // The group's output is wired like any brick's.
    KrBrickParam* out = param(group, QStringLiteral("b%1_result").arg(copyB->getBrickID()));
    QVERIFY(param(root, "Cs")->addConnection(out));
    QList<KrShaderBrick*> list;
    root->getBrickList(true, false, true, &list);
    QCOMPARE(list, (QList<KrShaderBrick*>{group, src}));
}

void TestKrBrickUser::groupCannotHoldRootsOrItself()
{
    auto* group = new KrBrickGroup;
    group->ref();
    auto* root = new KrSurfaceBrick;
    QVERIFY(!group->acceptsBrick(root));
    QCOMPARE(group->insertBrick(root), 0u);
    delete root;
    QVERIFY(!group->acceptsBrick(group));
    auto* inner = new KrBrickGroup;
    QVERIFY(group->insertBrick(inner));
    QVERIFY(!inner->acceptsBrick(group)); // its own container
    QVERIFY(group->containsBrick(inner));
    auto* deep = bricksAdd<KrInvertBrick>(inner);
    QVERIFY(group->containsBrick(deep));
    QCOMPARE(KrBrickGroup::enclosingGroup(deep), inner);
    // The nested group's plug shows on the outer group as a plug of its own.
    QVERIFY(param(group, QStringLiteral("b1_b1_value")));
    QPointer<KrShaderBrick> guard(deep);
    group->unref();
    QVERIFY(!guard);
}

namespace {
class FakeBridge : public IKrBrickSceneBridge
{
public:
    bool apply(IKrBrickUser* u) override
    {
        applied = u;
        return true;
    }
    QList<IKrBrickUser*> getSceneBrickUsers(const IKrBrickUser*) override { return users; }
    QString getSceneKey(const IKrBrickUser*) const override { return QStringLiteral("key"); }
    IKrBrickUser* applied = nullptr;
    QList<IKrBrickUser*> users;
};
} // namespace

void TestKrBrickUser::sceneBridge()
{
    KrBrickMaterial m;
    FakeBridge bridge;
    bridge.users << &m;
    KrBrickUserElement::setSceneBridge(&bridge);
    QVERIFY(m.apply());
    QCOMPARE(bridge.applied, &m);
    QCOMPARE(m.getSceneBrickUsers().size(), 1);
    QCOMPARE(m.getSceneKey(), QStringLiteral("key"));
    m.setSceneKey(QStringLiteral("own"));
    QCOMPARE(m.getSceneKey(), QStringLiteral("own"));
    m.setFromScene(true);
    QVERIFY(m.isFromScene());
    KrBrickUserElement::setSceneBridge(nullptr);
    QVERIFY(!m.apply());
}

QTEST_MAIN(TestKrBrickUser)
#include "tst_krbrickuser.moc"
