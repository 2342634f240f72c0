// Records of brick networks: brick-user attributes, the clipboard helpers, saved bricks
// through KrBrickFactory, and records that are wrong in every way we could think of.
#include "bricks_testutil.h"
#include "krapp.h"
#include "krbrickfactory.h"
#include "krbrickgroup.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickparam.h"
#include "krclassfactory.h"
#include "krdefaultbrickuser.h"
#include "krdefaultmaterial.h"
#include "krproperty.h"
#include "krsettings.h"
#include "settings_random.h"

#include <QPointer>
#include <QSignalSpy>
#include <QtTest>
#include <memory>

namespace {
int countWires(const IKrBrickUser* user)
{
    int n = 0;
    for (const KrShaderBrick* b : user->getBricks()) {
        for (int i = 0; i < b->getNumParameters(); ++i) {
            const KrBrickParam* p = b->getParameter(i);
            if (p->isInput())
                n += p->getNumConnections();
        }
    }
    return n;
}

// Counts warnings instead of printing them, for sweeps that make many.
struct QuietWarnings
{
    static int count;
    static void handler(QtMsgType type, const QMessageLogContext&, const QString&)
    {
        if (type == QtWarningMsg)
            ++count;
    }
    QtMessageHandler previous;
    QuietWarnings() : previous(qInstallMessageHandler(handler)) { count = 0; }
    ~QuietWarnings() { qInstallMessageHandler(previous); }
};
int QuietWarnings::count = 0;

KrSettings* sub(KrSettings* s, const QString& path)
{
    for (const QString& key : path.split(QLatin1Char('/'), Qt::SkipEmptyParts)) {
        s = s ? s->getSettingsValue(key) : nullptr;
    }
    return s;
}

// Root(1) <- diffuse(2) <- noise(3) -> multiply(4).
std::unique_ptr<KrBrickMaterial> makeSmall()
{
    std::unique_ptr<KrBrickMaterial> m(new KrBrickMaterial);
    m->setName(QStringLiteral("Small"));
    auto* root = bricksAdd<KrSurfaceBrick>(m.get());
    auto* diffuse = bricksAdd<KrDiffuseBrick>(m.get());
    auto* noise = bricksAdd<KrNoiseBrick>(m.get());
    auto* mul = bricksAdd<KrMultiplyBrick>(m.get());
    bricksWire(diffuse, "result", root, "Cs");
    bricksWire(noise, "value", diffuse, "Kd");
    bricksWire(noise, "value", mul, "a");
    return m;
}
} // namespace

class TestKrBrickRecords : public QObject
{
    Q_OBJECT

private slots:
    void roundTrip_data();
    void roundTrip();
    void fileFlow();
    void setAttributesReplacesTheNetwork();
    void clipboardFreshIds();
    void clipboardRefusesWhatTheUserRefuses();
    void badRecords_data();
    void badRecords();
    void everyKeyMissing();
    void randomValuesOfEveryType();
    void truncatedText();
    void addInputsState();
    void savedBrickThroughFactory_data();
    void savedBrickThroughFactory();
    void factoryValueType();
    void brickClassFactoryLookup();
};

void TestKrBrickRecords::roundTrip_data()
{
    QTest::addColumn<int>("kind");
    QTest::newRow("sample material with group") << 0;
    QTest::newRow("converted default material") << 1;
    QTest::newRow("light") << 2;
    QTest::newRow("plain brick set") << 3;
    QTest::newRow("empty material") << 4;
    QTest::newRow("nested groups") << 5;
}

void TestKrBrickRecords::roundTrip()
{
    QFETCH(int, kind);
    std::unique_ptr<KrBrickUserElement> original;
    switch (kind) {
    case 0:
        original.reset(bricksMakeSample().material);
        break;
    case 1: {
        KrDefaultMaterial dm(QStringLiteral("Default"));
        dm.findProperty("Glossiness")->setValue(0.123456789);
        original.reset(KrBrickMaterial::convertDefaultMaterial(&dm));
        break;
    }
    case 2: {
        auto* light = new KrBrickLight;
        light->setName(QStringLiteral("Key"));
        light->prepareBricks();
        KrShaderBrick* root = light->getBrickSet(0)->getRoot();
        bricksSetValue(root, "falloff", 2);
        auto* noise = bricksAdd<KrNoiseBrick>(light);
        auto* color = bricksAdd<KrColorConstantBrick>(light);
        bricksWire(noise, "value", root, "intensity");
        bricksWire(color, "result", root, "lightcolor");
        original.reset(light);
        break;
    }
    case 3: {
        auto* set = new KrBrickShaderSet;
        auto* root = bricksAdd<KrLightBrick>(set);
        auto* split = bricksAdd<KrSplitColorBrick>(set);
        auto* combine = bricksAdd<KrCombineColorBrick>(set);
        bricksWire(split, "r", combine, "b");
        bricksWire(split, "b", combine, "r");
        bricksWire(combine, "result", root, "lightcolor");
        original.reset(set);
        break;
    }
    case 4:
        original.reset(new KrBrickMaterial);
        break;
    case 5: {
        auto* m = new KrBrickMaterial;
        auto* root = bricksAdd<KrSurfaceBrick>(m);
        auto* outer = bricksAdd<KrBrickGroup>(m);
        auto* inner = bricksAdd<KrBrickGroup>(outer);
        auto* mix = bricksAdd<KrMixColorsBrick>(inner);
        auto* c = bricksAdd<KrColorConstantBrick>(outer);
        auto* src = bricksAdd<KrFloatConstantBrick>(m);
        inner->setBrickTitle(QStringLiteral("Inner"));
        QVERIFY(bricksWire(c, "result", mix, "a"));
        QVERIFY(bricksWire(src, "result", mix, "amount"));
        QVERIFY(bricksWire(mix, "result", root, "Cs"));
        bricksSetValue(mix, "b", QColor(9, 8, 7));
        original.reset(m);
        break;
    }
    }
    const QString text = bricksRecordText(original.get());
    const QString described = bricksDescribe(original.get());

    KrSettings read;
    QVERIFY(read.fromString(text));
    std::unique_ptr<IKrBrickUser, void (*)(IKrBrickUser*)> copy(
        original->createNew(), [](IKrBrickUser* u) { u->release(); });
    auto* element = static_cast<KrElement*>(copy->getObject());
    QVERIFY(element->setAttributes(&read));
    QCOMPARE(bricksRecordText(element), text);
    QCOMPARE(bricksDescribe(copy.get()), described);
    QCOMPARE(countWires(copy.get()), countWires(original.get()));
    // Reading it once more changes nothing.
    QVERIFY(element->setAttributes(&read));
    QCOMPARE(bricksDescribe(copy.get()), described);
}

void TestKrBrickRecords::fileFlow()
{
    BricksSample s = bricksMakeSample();
    std::unique_ptr<KrBrickMaterial> original(s.material);
    KrSettings file;
    file.setStringValue("BrelvoHallixClassName", original->metaObject()->className());
    original->getAttributes(file.setSettingsValue("BrickSet"));
    const QString text = file.toString();

    KrSettings loaded;
    QVERIFY(loaded.fromString(text));
    QCOMPARE(loaded.getKeys(), (QStringList{"BrelvoHallixClassName", "BrickSet"}));
    KrClassFactory* f = krApp->findClassFactory(loaded.getStringValue("BrelvoHallixClassName"));
    QVERIFY(f);
    std::unique_ptr<QObject> object(f->createInstance());
    auto* element = qobject_cast<KrElement*>(object.get());
    QVERIFY(element);
    QVERIFY(element->setAttributes(loaded.getSettingsValue("BrickSet")));
    auto* user = dynamic_cast<IKrBrickUser*>(element);
    QVERIFY(user);
    QCOMPARE(bricksDescribe(user), bricksDescribe(original.get()));
    QCOMPARE(user->getBrickSet(0)->getRoot()->getBrickID(), s.root);
    // Ids after loading continue after the saved ones (the deleted one included).
    auto* fresh = bricksAdd<KrInvertBrick>(user);
    QVERIFY(fresh->getBrickID() > s.texture);
    KrShaderBrick* probe = bricksAdd<KrInvertBrick>(original.get());
    QCOMPARE(probe->getBrickID(), fresh->getBrickID());
}

void TestKrBrickRecords::setAttributesReplacesTheNetwork()
{
    auto small = makeSmall();
    KrSettings record;
    small->getAttributes(&record);
    KrBrickMaterial target;
    auto* old = bricksAdd<KrCheckerBrick>(&target);
    QPointer<KrShaderBrick> guard(old);
    QVERIFY(target.setAttributes(&record));
    QVERIFY(!guard);
    QCOMPARE(target.getName(), QStringLiteral("Small"));
    QCOMPARE(bricksDescribe(&target), bricksDescribe(small.get()));
    QVERIFY(!target.setAttributes(nullptr));

    // Views hear of a whole loaded network once, not once per brick.
    KrBrickMaterial fresh;
    QSignalSpy spy(&fresh, &KrElement::propertyListChanged);
    QVERIFY(fresh.setAttributes(&record));
    QCOMPARE(spy.count(), 1);
    QCOMPARE(fresh.getNumProperties(), target.getNumProperties());
}

void TestKrBrickRecords::clipboardFreshIds()
{
    BricksSample s = bricksMakeSample();
    std::unique_ptr<KrBrickMaterial> m(s.material);
    const int wiresBefore = countWires(m.get());
    const QList<uint> oldIds = m->getBricks().keys();

    QList<uint> ids{s.diffuse, s.sum, s.checker, s.group};
    KrSettings clip;
    KrDefaultBrickUser::getAttributesHelper(m.get(), ids, &clip, true);
    QCOMPARE(clip.getNumKeys(), 4);
    const QString text = clip.toString();

    QSet<uint> seen(oldIds.begin(), oldIds.end());
    for (int round = 0; round < 2; ++round) {
        KrSettings pasted;
        QVERIFY(pasted.fromString(text));
        QHash<QString, KrShaderBrick*> created;
        QCOMPARE(KrDefaultBrickUser::setAttributesHelper(m.get(), &pasted, created, true), 4);
        QCOMPARE(created.size(), 4);
        for (uint old : ids) {
            KrShaderBrick* copy = created.value(KrDefaultBrickUser::brickKey(old));
            QVERIFY(copy);
            QCOMPARE(m->findBrick(copy->getBrickID()), copy);
            QVERIFY2(!seen.contains(copy->getBrickID()), "an id was used twice");
            QVERIFY(copy->getBrickID() > oldIds.last());
            seen.insert(copy->getBrickID());
        }
        KrShaderBrick* diffuse = created.value(KrDefaultBrickUser::brickKey(s.diffuse));
        KrShaderBrick* sum = created.value(KrDefaultBrickUser::brickKey(s.sum));
        KrShaderBrick* checker = created.value(KrDefaultBrickUser::brickKey(s.checker));
        KrShaderBrick* group = created.value(KrDefaultBrickUser::brickKey(s.group));
        // Wires among the copies are kept...
        QCOMPARE(sum->findParameterByArg("in1")->getSource()->getBrick(), diffuse);
        QCOMPARE(sum->findParameterByArg("in3")->getSource()->getBrick(), checker);
        QCOMPARE(diffuse->findParameterByArg("Cd")->getSource()->getBrick(), group);
        // ...wires from bricks that were not copied are not.
        QVERIFY(!sum->findParameterByArg("in2")->getSource());
        QVERIFY(!checker->findParameterByArg("color2")->getSource());
        QVERIFY(!group->findParameterByArg("b1_a")->getSource());
        QCOMPARE(bricksValue(diffuse, "Kd").toDouble(), 0.3125);
        QCOMPARE(qobject_cast<KrAddColorsBrick*>(sum)->getNumInputs(), 3);
        QCOMPARE(qobject_cast<KrBrickGroup*>(group)->getBricks().size(), 2);
        // A title made from the old id follows the new id; a chosen title stays.
        QCOMPARE(diffuse->getBrickTitle(),
                 QStringLiteral("Diffuse(%1)").arg(diffuse->getBrickID()));
        QCOMPARE(diffuse->findParameterByArg("Kd")->getParamProperty(0)->getPath(),
                 QStringLiteral("/Diffuse(%1)/Amount").arg(diffuse->getBrickID()));
    }
    // The originals are untouched.
    QCOMPARE(countWires(m.get()) - 2 * 3, wiresBefore);
    QCOMPARE(m->findBrick(s.sum)->findParameterByArg("in2")->getSource()->getBrick()->getBrickID(),
             s.specular);

    // Another kind of brick user takes the function bricks as well.
    KrBrickLight light;
    KrSettings again;
    QVERIFY(again.fromString(text));
    QHash<QString, KrShaderBrick*> created;
    QCOMPARE(KrDefaultBrickUser::setAttributesHelper(&light, &again, created, true), 4);
    QCOMPARE(countWires(&light), 3);

    // Empty ids copy every brick.
    QList<uint> all;
    KrSettings everything;
    KrDefaultBrickUser::getAttributesHelper(m.get(), all, &everything, true);
    QCOMPARE(everything.getNumKeys(), m->getBricks().size());
    QVERIFY(all.isEmpty());
}

void TestKrBrickRecords::clipboardRefusesWhatTheUserRefuses()
{
    BricksSample s = bricksMakeSample();
    std::unique_ptr<KrBrickMaterial> m(s.material);
    QList<uint> ids{s.root, s.diffuse};
    KrSettings clip;
    KrDefaultBrickUser::getAttributesHelper(m.get(), ids, &clip, true);
    QHash<QString, KrShaderBrick*> created;
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("refused by the brick user"));
    QCOMPARE(KrDefaultBrickUser::setAttributesHelper(m.get(), &clip, created, true), 1);
    QVERIFY(!created.contains(KrDefaultBrickUser::brickKey(s.root)));
    // Into a group only function bricks go.
    KrBrickGroup* group = qobject_cast<KrBrickGroup*>(m->findBrick(s.group));
    created.clear();
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("refused by the brick user"));
    QCOMPARE(KrDefaultBrickUser::setAttributesHelper(group, &clip, created, true), 1);
    // Nothing happens without a user or a record.
    QCOMPARE(KrDefaultBrickUser::setAttributesHelper(nullptr, &clip, created, true), 0);
    QCOMPARE(KrDefaultBrickUser::setAttributesHelper(m.get(), nullptr, created, true), 0);
    KrDefaultBrickUser::getAttributesHelper(nullptr, ids, &clip, true);
    // Ids that are not filed are skipped with a warning.
    QList<uint> missing{999};
    KrSettings none;
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("no brick 999 to write"));
    KrDefaultBrickUser::getAttributesHelper(m.get(), missing, &none, true);
    QVERIFY(none.isEmpty());
}

void TestKrBrickRecords::badRecords_data()
{
    QTest::addColumn<int>("mutation");
    QTest::addColumn<int>("bricks");
    QTest::addColumn<int>("wires");
    QTest::addColumn<QStringList>("warnings");
    QTest::newRow("sound") << 0 << 4 << 3 << QStringList();
    QTest::newRow("unknown class") << 1 << 3 << 1
                                   << QStringList{"Brick_3: unknown brick class 'KrNoSuchBrick'",
                                                  "Brick_3, which is not in the record",
                                                  "Brick_3, which is not in the record"};
    QTest::newRow("class that is no brick")
        << 2 << 3 << 1
        << QStringList{"unknown brick class 'KrBrickMaterial'", "not in the record",
                       "not in the record"};
    QTest::newRow("dangling source id")
        << 3 << 4 << 2 << QStringList{"wire from Brick_99, which is not in"};
    QTest::newRow("duplicate id") << 4 << 4 << 3 << QStringList{"brick id 3 appears twice"};
    QTest::newRow("bad ids") << 5 << 4 << 3
                             << QStringList{"'Brick_x' is not a brick id",
                                            "'Brick_0' is not a brick id",
                                            "'Brick_99999999999' is not a brick id",
                                            "'Brick_-1' is not a brick id"};
    QTest::newRow("value of the wrong type")
        << 6 << 4 << 3 << QStringList{"the value of Amount is not a float"};
    QTest::newRow("colour into float")
        << 7 << 4 << 2 << QStringList{"wire Brick_2.result -> a refused"};
    QTest::newRow("cycle") << 8 << 4 << 3 << QStringList{"refused"};
    QTest::newRow("into itself") << 9 << 4 << 2 << QStringList{"wire Brick_4.result -> a refused"};
    QTest::newRow("unknown source parameter")
        << 10 << 4 << 2 << QStringList{"unknown parameter Brick_3.nope"};
    QTest::newRow("parameters not a record")
        << 11 << 4 << 2 << QStringList{"parameters are not a record"};
    QTest::newRow("brick record not a record")
        << 12 << 3 << 2 << QStringList{"'Brick_4' is not a brick record"};
    QTest::newRow("root not in the record")
        << 13 << 4 << 3 << QStringList{"root Brick_42 of brick set 0"};
    QTest::newRow("second surface root")
        << 14 << 4 << 3 << QStringList{"Brick_5 (KrSurfaceBrick) is refused"};
    QTest::newRow("wire into an output") << 15 << 4 << 3 << QStringList{"-> result refused"};
    QTest::newRow("no class name")
        << 16 << 3 << 1
        << QStringList{"unknown brick class ''", "not in the record", "not in the record"};
    QTest::newRow("unknown parameter record")
        << 17 << 4 << 3 << QStringList{"no parameter for the record"};
    QTest::newRow("settings not a record")
        << 18 << 4 << 3 << QStringList{"brick settings are not a record"};
    QTest::newRow("root is a function brick")
        << 19 << 4 << 3 << QStringList{"Brick_2 cannot be the root"};
    QTest::newRow("bricks not a record")
        << 20 << 0 << 0 << QStringList{"are not a record", "root Brick_1"};
    QTest::newRow("property index out of range")
        << 21 << 4 << 3 << QStringList{"parameter Kd has no property 7"};
    QTest::newRow("title not a text") << 22 << 4 << 3 << QStringList{"brick title is not a text"};
}

void TestKrBrickRecords::badRecords()
{
    QFETCH(int, mutation);
    QFETCH(int, bricks);
    QFETCH(int, wires);
    QFETCH(QStringList, warnings);
    auto small = makeSmall();
    KrSettings record;
    small->getAttributes(&record);
    KrSettings* b = record.getSettingsValue("Bricks");
    QVERIFY(b);
    switch (mutation) {
    case 0:
        break;
    case 1:
        sub(b, "Brick_3")->setStringValue("BrelvoHallixClassName", "KrNoSuchBrick");
        break;
    case 2:
        sub(b, "Brick_3")->setStringValue("BrelvoHallixClassName", "KrBrickMaterial");
        break;
    case 3:
        sub(b, "Brick_2/Params/Param_1/Source")->setStringValue("Brick", "Brick_99");
        break;
    case 4:
        b->setSettingsValue("Brick_03", *sub(b, "Brick_4"));
        break;
    case 5:
        for (const char* key : {"Brick_x", "Brick_0", "Brick_99999999999", "Brick_-1"})
            b->setSettingsValue(key, *sub(b, "Brick_4"));
        break;
    case 6:
        sub(b, "Brick_2/Params/Param_1/Properties/Property_0")->setStringValue("Value", "abc");
        break;
    case 7: {
        KrSettings* src = sub(b, "Brick_4/Params/Param_0/Source");
        src->setStringValue("Brick", "Brick_2");
        src->setStringValue("Param", "result");
        break;
    }
    case 8: {
        KrSettings* src = sub(b, "Brick_3/Params/Param_0")->setSettingsValue("Source");
        src->setStringValue("Brick", "Brick_4");
        src->setStringValue("Param", "result");
        break;
    }
    case 9: {
        KrSettings* src = sub(b, "Brick_4/Params/Param_0/Source");
        src->setStringValue("Brick", "Brick_4");
        src->setStringValue("Param", "result");
        break;
    }
    case 10:
        sub(b, "Brick_4/Params/Param_0/Source")->setStringValue("Param", "nope");
        break;
    case 11:
        sub(b, "Brick_2")->setIntValue("Params", 5);
        break;
    case 12:
        b->setIntValue("Brick_4", 12);
        break;
    case 13:
        sub(&record, "BrickSets/BrickSet_0")->setStringValue("Root", "Brick_42");
        break;
    case 14:
        b->setSettingsValue("Brick_5", *sub(b, "Brick_1"));
        break;
    case 15: {
        KrSettings* src = sub(b, "Brick_4/Params/Param_2")->setSettingsValue("Source");
        src->setStringValue("Brick", "Brick_3");
        src->setStringValue("Param", "value");
        break;
    }
    case 16:
        sub(b, "Brick_3")->removeValue("BrelvoHallixClassName");
        break;
    case 17:
        sub(b, "Brick_2/Params/Param_0")->setStringValue("Arg", "zzz");
        break;
    case 18:
        sub(b, "Brick_2")->setStringValue("BrickSettings", "oops");
        break;
    case 19:
        sub(&record, "BrickSets/BrickSet_0")->setStringValue("Root", "Brick_2");
        break;
    case 20:
        record.setStringValue("Bricks", "none");
        break;
    case 21:
        sub(b, "Brick_2/Params/Param_1/Properties")
            ->setSettingsValue("Property_7",
                               *sub(b, "Brick_2/Params/Param_1/Properties/Property_0"));
        break;
    case 22:
        sub(b, "Brick_2/BrickSettings")->setIntValue("BrickTitle", 4);
        break;
    }
    // Through text, as a file or the clipboard would bring it.
    KrSettings read;
    QVERIFY(read.fromString(record.toString()));
    for (const QString& w : warnings)
        QTest::ignoreMessage(QtWarningMsg, QRegularExpression(QRegularExpression::escape(w)));
    KrBrickMaterial target;
    QVERIFY(target.setAttributes(&read));
    QCOMPARE(target.getBricks().size(), bricks);
    QCOMPARE(countWires(&target), wires);
    // What loaded is usable: it writes, reads back and takes new bricks.
    const QString text = bricksRecordText(&target);
    KrSettings again;
    QVERIFY(again.fromString(text));
    KrBrickMaterial second;
    QVERIFY(second.setAttributes(&again));
    QCOMPARE(bricksDescribe(&second), bricksDescribe(&target));
    QVERIFY(bricksAdd<KrInvertBrick>(&target));
    if (mutation == 6) // the value that could not be read kept its default
        QCOMPARE(bricksValue(target.findBrick(2), "Kd").toDouble(), 0.8);
    if (mutation == 4) // the first of the two records won
        QVERIFY(qobject_cast<KrNoiseBrick*>(target.findBrick(3)));
}

void TestKrBrickRecords::everyKeyMissing()
{
    // Drop each key of each record in turn, at every depth: never a crash, never more than
    // the sound record gives.
    BricksSample s = bricksMakeSample();
    std::unique_ptr<KrBrickMaterial> m(s.material);
    KrSettings record;
    m->getAttributes(&record);
    const int allBricks = m->getBricks().size();
    const int allWires = countWires(m.get());

    QList<QStringList> paths;
    std::function<void(const KrSettings*, const QStringList&)> walk = [&](const KrSettings* r,
                                                                          const QStringList& at) {
        for (const QString& key : r->getKeys()) {
            paths << (at + QStringList{key});
            if (const KrSettings* child = r->getSettingsValue(key))
                walk(child, at + QStringList{key});
        }
    };
    walk(&record, {});
    QVERIFY(paths.size() > 200);
    QuietWarnings quiet;
    for (const QStringList& path : qAsConst(paths)) {
        KrSettings copy = record;
        KrSettings* parent = &copy;
        for (int i = 0; i + 1 < path.size(); ++i)
            parent = parent->getSettingsValue(path.at(i));
        QVERIFY(parent->removeValue(path.last()));
        KrBrickMaterial target;
        QVERIFY(target.setAttributes(&copy));
        QVERIFY(target.getBricks().size() <= allBricks);
        QVERIFY(countWires(&target) <= allWires);
    }
    QVERIFY(QuietWarnings::count > 0);
}

void TestKrBrickRecords::randomValuesOfEveryType()
{
    // Replace values anywhere in a record by values of any type (nested records included),
    // a few at a time, seeded so a failure repeats.
    BricksSample s = bricksMakeSample();
    std::unique_ptr<KrBrickMaterial> m(s.material);
    KrSettings record;
    m->getAttributes(&record);
    const int allBricks = m->getBricks().size();
    QRandomGenerator rng(20240611);
    QuietWarnings quiet;
    for (int round = 0; round < 400; ++round) {
        KrSettings copy = record;
        const int changes = 1 + rng.bounded(4);
        for (int c = 0; c < changes; ++c) {
            // Walk down to a random record.
            KrSettings* at = &copy;
            while (rng.bounded(4) != 0) {
                QList<KrSettings*> children;
                for (const QString& key : at->getKeys()) {
                    if (KrSettings* child = at->getSettingsValue(key))
                        children << child;
                }
                if (children.isEmpty())
                    break;
                at = children.at(int(rng.bounded(children.size())));
            }
            if (at->isEmpty())
                continue;
            const QString key = at->getKey(int(rng.bounded(at->getNumKeys())));
            switch (rng.bounded(6)) {
            case 0:
                at->setIntValue(key, int(rng.generate()));
                break;
            case 1:
                at->setFloatValue(key, KrSettingsRandom::randomDouble(rng));
                break;
            case 2:
                at->setBoolValue(key, rng.bounded(2) == 1);
                break;
            case 3:
                at->setStringValue(key, KrSettingsRandom::randomText(rng, 12));
                break;
            case 4: {
                KrSettings junk;
                KrSettingsRandom::fillRecord(rng, junk, 5, 2);
                at->setSettingsValue(key, junk);
                break;
            }
            default:
                at->removeValue(key);
                break;
            }
        }
        KrSettings read;
        QVERIFY(read.fromString(copy.toString()));
        KrBrickMaterial target;
        QVERIFY(target.setAttributes(&read));
        QVERIFY(target.getBricks().size() <= allBricks);
        // Whatever loaded writes and reads back to the same network.
        KrSettings again;
        target.getAttributes(&again);
        KrBrickMaterial second;
        QVERIFY(second.setAttributes(&again));
        QCOMPARE(bricksDescribe(&second), bricksDescribe(&target));
    }
}

void TestKrBrickRecords::truncatedText()
{
    auto small = makeSmall();
    const QString text = bricksRecordText(small.get());
    const int end = text.lastIndexOf(QLatin1Char('>'));
    for (int n = 0; n < end; n += 3) {
        KrSettings cut;
        QVERIFY2(!cut.fromString(text.left(n)), qPrintable(QString::number(n)));
    }
    KrSettings whole;
    QVERIFY(whole.fromString(text.left(end + 1)));
    KrBrickMaterial target;
    QVERIFY(target.setAttributes(&whole));
    QCOMPARE(bricksDescribe(&target), bricksDescribe(small.get()));
}

void TestKrBrickRecords::addInputsState()
{
    KrBrickMaterial m;
    auto* add = bricksAdd<KrAddBrick>(&m);
    add->addInput();
    add->addInput();
    bricksSetValue(add, "in4", 4.5);
    KrSettings record;
    add->getAttributes(&record);
    QCOMPARE(sub(&record, "State")->getIntValue("NumInputs"), 4);

    KrAddBrick copy;
    QVERIFY(copy.setAttributes(&record));
    QCOMPARE(copy.getNumInputs(), 4);
    QCOMPARE(bricksValue(&copy, "in4").toDouble(), 4.5);

    sub(&record, "State")->setIntValue("NumInputs", 100000);
    KrAddBrick big;
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("state was read in part only"));
    QVERIFY(big.setAttributes(&record));
    QCOMPARE(big.getNumInputs(), KrAddInputsBrick::s_maxInputs);
    sub(&record, "State")->setIntValue("NumInputs", -3);
    KrAddBrick small;
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("state was read in part only"));
    // The values of the inputs that are gone have nowhere to go.
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("no parameter for the record.*in3"));
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("no parameter for the record.*in4"));
    QVERIFY(small.setAttributes(&record));
    QCOMPARE(small.getNumInputs(), KrAddInputsBrick::s_minInputs);
}

void TestKrBrickRecords::savedBrickThroughFactory_data()
{
    QTest::addColumn<QString>("brick");
    QTest::newRow("diffuse") << "diffuse";
    QTest::newRow("add colors") << "sum";
    QTest::newRow("group") << "group";
    QTest::newRow("image texture") << "texture";
    QTest::newRow("root") << "root";
}

void TestKrBrickRecords::savedBrickThroughFactory()
{
    QFETCH(QString, brick);
    BricksSample s = bricksMakeSample();
    std::unique_ptr<KrBrickMaterial> m(s.material);
    const QHash<QString, uint> ids{{"diffuse", s.diffuse},
                                   {"sum", s.sum},
                                   {"group", s.group},
                                   {"texture", s.texture},
                                   {"root", s.root}};
    KrShaderBrick* original = m->findBrick(ids.value(brick));
    QVERIFY(original);
    original->setBrickTitle(QStringLiteral("Saved %1").arg(brick));
    original->getBrickSettings()->setBoolValue("HideParams", true);

    // What the brick frame writes to a ".kcb" file...
    KrSettings written;
    KrDefaultBrickUser::writeBrickToSettings(original, &written, false);
    QCOMPARE(written.getKey(0), QStringLiteral("Brick_%1").arg(original->getBrickID()));
    const QString kcb = written.getSettingsValue(written.getKey(0))->toString();
    QVERIFY(!kcb.contains(QLatin1String("\"Source\"")) || brick == "group");

    // ...and what the library makes of it.
    KrBrickFactory factory;
    QVERIFY(factory.getSettings()->fromString(kcb));
    const QString className = factory.getSettings()->getStringValue("BrelvoHallixClassName");
    QCOMPARE(className, QString::fromLatin1(original->metaObject()->className()));
    KrClassFactory* cf = KrDefaultBrickUser::getBrickClassFactory(className);
    QVERIFY(cf);
    factory.setClassFactory(cf);
    QCOMPARE(factory.getFactory(), cf);
    KrShaderBrick* made = factory.generateBrick();
    QVERIFY(made);
    made->ref();
    QCOMPARE(made->getBrickTitle(), QStringLiteral("Saved %1").arg(brick));
    QVERIFY(made->getBrickSettings()->getBoolValue("HideParams"));
    KrSettings again;
    KrDefaultBrickUser::writeBrickRecord(made, &again, false);
    QCOMPARE(again.toString(), kcb);
    // Each generated brick is a new one.
    KrShaderBrick* second = factory.generateBrick();
    QVERIFY(second && second != made);
    second->ref();
    second->unref();
    // A fresh material files it like any brick.
    KrBrickMaterial target;
    QVERIFY(target.insertBrick(made));
    made->unref();
}

void TestKrBrickRecords::factoryValueType()
{
    KrBrickFactory none;
    QVERIFY(none.getFactory() == nullptr);
    QVERIFY(none.generateBrick() == nullptr);
    const int id = QMetaType::type("KrBrickFactory");
    QVERIFY(id != QMetaType::UnknownType);
    QCOMPARE(id, qMetaTypeId<KrBrickFactory>());

    KrClassFactory* diffuse = KrDefaultBrickUser::getBrickClassFactory("KrDiffuseBrick");
    QVERIFY(diffuse);
    KrBrickFactory f(diffuse);
    f.getSettings()->setStringValue("x", "y");
    const QVariant v = QVariant::fromValue(f);
    QCOMPARE(v.userType(), id);
    KrBrickFactory back = v.value<KrBrickFactory>();
    QVERIFY(back == f);
    QCOMPARE(back.getFactory(), diffuse);
    back.getSettings()->setStringValue("x", "z"); // copies are independent
    QCOMPARE(f.getSettings()->getStringValue("x"), QStringLiteral("y"));
    KrBrickFactory assigned;
    assigned = back;
    QVERIFY(assigned == back);

    // A factory of a class that makes no brick is unusable.
    KrBrickFactory material(krApp->findClassFactory("KrBrickMaterial"));
    QVERIFY(material.getFactory() == nullptr);
    QVERIFY(material.generateBrick() == nullptr);
}

void TestKrBrickRecords::brickClassFactoryLookup()
{
    QVERIFY(KrDefaultBrickUser::getBrickClassFactory("KrDiffuseBrick"));
    QVERIFY(KrDefaultBrickUser::getBrickClassFactory("KrBrickGroup"));
    QVERIFY(!KrDefaultBrickUser::getBrickClassFactory("KrBrickMaterial"));
    QVERIFY(!KrDefaultBrickUser::getBrickClassFactory("KrNoSuchBrick"));
    QVERIFY(!KrDefaultBrickUser::getBrickClassFactory(QString()));
    QVERIFY(!KrDefaultBrickUser::getBrickClassFactory("KrShaderBrick"));
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey("Brick_12"), 12u);
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey("Brick_012"), 12u);
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey("Brick_"), 0u);
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey("Brick_1x"), 0u);
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey("Brick_+1"), 0u);
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey("Brick_2147483647"), 2147483647u);
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey("Brick_2147483648"), 0u);
    QCOMPARE(KrDefaultBrickUser::brickIdFromKey(QString::fromUtf8("Brick_\u0663")), 0u);
}

QTEST_MAIN(TestKrBrickRecords)
#include "tst_krbrickrecords.moc"
