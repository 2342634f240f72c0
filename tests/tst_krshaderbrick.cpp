// Bricks, parameters and wires: the connection rules, both ends of every wire, the brick's
// feeder list, reference counting and the parameter drag data.
#include "bricks_testutil.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickparam.h"
#include "krbrickparammime.h"
#include "krproperty.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "krundo.h"

#include <QPointer>
#include <QSignalSpy>
#include <QtTest>

namespace {
// A bare brick with parameters "<arg>:<direction>:<type>".
KrShaderBrick* makeBrick(const QStringList& params, const QString& name = QString())
{
    auto* b = new KrShaderBrick(name);
    for (const QString& entry : params) {
        const QStringList parts = entry.split(QLatin1Char(':'));
        b->addParameter(new KrBrickParam(b, parts.at(0), parts.at(0),
                                         KrBrickParam::Direction(parts.at(1).toInt()),
                                         parts.at(2)));
    }
    return b;
}

// Owns test bricks: each holds one reference while the test runs.
struct Holder
{
    QList<KrShaderBrick*> bricks;
    KrShaderBrick* operator()(KrShaderBrick* b)
    {
        b->ref();
        bricks << b;
        return b;
    }
    ~Holder()
    {
        for (KrShaderBrick* b : bricks)
            b->unref();
    }
};

KrBrickParam* param(KrShaderBrick* b, const char* arg)
{
    return b->findParameterByArg(QString::fromLatin1(arg));
}
} // namespace

class TestKrShaderBrick : public QObject
{
    Q_OBJECT

private slots:
    void typeRules_data();
    void typeRules();
    void directionRules_data();
    void directionRules();
    void cycles_data();
    void cycles();
    void replacingSourceUpdatesEveryEnd();
    void bothEndsAndRemoval();
    void feederList();
    void refCountingReleasesOnLastUnref();
    void setTypeDropsWiresItCannotCarry();
    void labelsAndPropertyNames();
    void tokensFollowValues();
    void addingAndRemovingParameters();
    void addInputAction();
    void addInputActionUndo();
    void paramMime();
};

void TestKrShaderBrick::typeRules_data()
{
    QTest::addColumn<QString>("from");
    QTest::addColumn<QString>("to");
    QTest::addColumn<bool>("allowed");
    const QStringList types = {"float",  "int",    "color", "point",  "vector",
                               "normal", "string", "bool",  "matrix", "closure color"};
    // Allowed beyond equal types: a scalar into float, colour and the spatial types; spatial
    // types among each other.
    const QSet<QString> spatial = {"point", "vector", "normal"};
    for (const QString& from : types) {
        for (const QString& to : types) {
            bool allowed = from == to;
            if ((from == "float" || from == "int") &&
                (to == "float" || to == "color" || spatial.contains(to)))
                allowed = true;
            if (spatial.contains(from) && spatial.contains(to))
                allowed = true;
            QTest::addRow("%s->%s", qPrintable(from), qPrintable(to)) << from << to << allowed;
        }
    }
    QTest::newRow("qualifiers ignored") << "uniform float"
                                        << "varying color" << true;
    QTest::newRow("case ignored") << "FLOAT"
                                  << "Color" << true;
    QTest::newRow("colour never into float") << "color"
                                             << "uniform float" << false;
    QTest::newRow("empty type") << ""
                                << "" << false;
}

void TestKrShaderBrick::typeRules()
{
    QFETCH(QString, from);
    QFETCH(QString, to);
    QFETCH(bool, allowed);
    Holder hold;
    KrShaderBrick* src = hold(makeBrick({"out:2:" + from}));
    KrShaderBrick* dst = hold(makeBrick({"in:1:" + to}));
    QCOMPARE(KrBrickParam::isTypeCompatible(from, to), allowed);
    // Either end may ask and wire.
    QCOMPARE(param(src, "out")->canConnectTo(param(dst, "in")), allowed);
    QCOMPARE(param(dst, "in")->canConnectTo(param(src, "out")), allowed);
    QCOMPARE(param(dst, "in")->addConnection(param(src, "out")), allowed);
    QCOMPARE(param(dst, "in")->getNumConnections(), allowed ? 1 : 0);
    QCOMPARE(param(src, "out")->getNumConnections(), allowed ? 1 : 0);
}

void TestKrShaderBrick::directionRules_data()
{
    QTest::addColumn<QString>("a");
    QTest::addColumn<QString>("b");
    QTest::addColumn<bool>("sameBrick");
    QTest::addColumn<bool>("allowed");
    QTest::newRow("output into input") << "x:2:float"
                                       << "y:1:float" << false << true;
    QTest::newRow("input into output (asked from the input)") << "y:1:float"
                                                              << "x:2:float" << false << true;
    QTest::newRow("two inputs") << "x:1:float"
                                << "y:1:float" << false << false;
    QTest::newRow("two outputs") << "x:2:float"
                                 << "y:2:float" << false << false;
    QTest::newRow("into a constant input") << "x:2:float"
                                           << "y:0:float" << false << false;
    QTest::newRow("from an internal output") << "x:3:float"
                                             << "y:1:float" << false << false;
    QTest::newRow("own input") << "x:2:float"
                               << "y:1:float" << true << false;
}

void TestKrShaderBrick::directionRules()
{
    QFETCH(QString, a);
    QFETCH(QString, b);
    QFETCH(bool, sameBrick);
    QFETCH(bool, allowed);
    Holder hold;
    KrShaderBrick* one = hold(makeBrick(sameBrick ? QStringList{a, b} : QStringList{a}));
    KrShaderBrick* two = sameBrick ? one : hold(makeBrick({b}));
    KrBrickParam* pa = one->getParameter(0);
    KrBrickParam* pb = sameBrick ? one->getParameter(1) : two->getParameter(0);
    QCOMPARE(pa->canConnectTo(pb), allowed);
    QCOMPARE(pa->addConnection(pb), allowed);
    QCOMPARE(pa->isConnectedTo(pb), allowed);
    QCOMPARE(pb->isConnectedTo(pa), allowed);
    QVERIFY(!pa->canConnectTo(nullptr));
    QVERIFY(!pa->addConnection(nullptr));
    QVERIFY(!pa->canConnectTo(pa));
}

void TestKrShaderBrick::cycles_data()
{
    QTest::addColumn<int>("length");
    QTest::newRow("1: a brick into itself") << 1;
    QTest::newRow("2") << 2;
    QTest::newRow("3") << 3;
    QTest::newRow("5") << 5;
}

void TestKrShaderBrick::cycles()
{
    QFETCH(int, length);
    Holder hold;
    QList<KrShaderBrick*> chain;
    for (int i = 0; i < length; ++i)
        chain << hold(makeBrick({"in:1:float", "out:2:float", "other:1:float"}));
    // b0 -> b1 -> ... -> b(n-1): every step is allowed.
    for (int i = 0; i + 1 < length; ++i)
        QVERIFY(param(chain[i + 1], "in")->addConnection(param(chain[i], "out")));
    // Closing the ring is refused on any input of the first brick, from either end.
    KrBrickParam* last = param(chain.last(), "out");
    QVERIFY(!last->canConnectTo(param(chain.first(), "in")));
    QVERIFY(!param(chain.first(), "other")->canConnectTo(last));
    QVERIFY(!param(chain.first(), "other")->addConnection(last));
    QCOMPARE(param(chain.first(), "other")->getNumConnections(), 0);
    // The refusal left the chain as it was.
    for (int i = 0; i + 1 < length; ++i)
        QCOMPARE(param(chain[i + 1], "in")->getSource(), param(chain[i], "out"));
    // A brick outside the ring may still feed it, and a brick fed by the ring is fine.
    KrShaderBrick* outside = hold(makeBrick({"in:1:float", "out:2:float"}));
    QVERIFY(param(chain.first(), "other")->addConnection(param(outside, "out")));
    if (length > 1)
        QVERIFY(!param(outside, "in")->canConnectTo(param(chain.last(), "out")));
}

void TestKrShaderBrick::replacingSourceUpdatesEveryEnd()
{
    Holder hold;
    KrShaderBrick* a = hold(makeBrick({"out:2:float"}));
    KrShaderBrick* b = hold(makeBrick({"out:2:float"}));
    KrShaderBrick* c = hold(makeBrick({"in:1:float"}));
    QVERIFY(param(c, "in")->addConnection(param(a, "out")));

    QSignalSpy oldEnd(param(a, "out"), &KrBrickParam::connectionsChanged);
    QSignalSpy newEnd(param(b, "out"), &KrBrickParam::connectionsChanged);
    QSignalSpy input(param(c, "in"), &KrBrickParam::connectionsChanged);
    QSignalSpy brickA(a, &KrShaderBrick::connectionsChanged);
    QSignalSpy brickB(b, &KrShaderBrick::connectionsChanged);
    QSignalSpy brickC(c, &KrShaderBrick::connectionsChanged);
    // Listeners see the finished change: the old end is already free when told.
    int oldCountSeen = -1;
    connect(param(a, "out"), &KrBrickParam::connectionsChanged, this,
            [&]() { oldCountSeen = param(a, "out")->getNumConnections(); });

    QVERIFY(param(b, "out")->addConnection(param(c, "in"))); // asked from the output end
    QCOMPARE(param(c, "in")->getNumConnections(), 1);
    QCOMPARE(param(c, "in")->getSource(), param(b, "out"));
    QCOMPARE(param(a, "out")->getNumConnections(), 0);
    QCOMPARE(param(b, "out")->getNumConnections(), 1);
    QCOMPARE(oldEnd.count(), 1);
    QCOMPARE(newEnd.count(), 1);
    QCOMPARE(input.count(), 1);
    QCOMPARE(oldCountSeen, 0);
    QCOMPARE(brickA.count(), 1);
    QCOMPARE(brickB.count(), 1);
    QCOMPARE(brickC.count(), 1);
    QCOMPARE(brickC.first().first().value<KrShaderBrick*>(), c);

    // Wiring the same pair again changes nothing and tells nobody.
    QVERIFY(param(c, "in")->addConnection(param(b, "out")));
    QCOMPARE(input.count(), 1);
    QCOMPARE(param(b, "out")->getNumConnections(), 1);
}

void TestKrShaderBrick::bothEndsAndRemoval()
{
    Holder hold;
    KrShaderBrick* src = hold(makeBrick({"out:2:color"}));
    QList<KrShaderBrick*> sinks;
    for (int i = 0; i < 3; ++i) {
        sinks << hold(makeBrick({"in:1:color"}));
        QVERIFY(param(sinks[i], "in")->addConnection(param(src, "out")));
    }
    KrBrickParam* out = param(src, "out");
    QCOMPARE(out->getNumConnections(), 3);
    for (int i = 0; i < 3; ++i) {
        QCOMPARE(out->getConnection(i)->getParam(), param(sinks[i], "in"));
        QCOMPARE(param(sinks[i], "in")->getConnection(0)->getParam(), out);
    }
    QVERIFY(out->getConnection(3) == nullptr);
    QVERIFY(out->getConnection(-1) == nullptr);

    // Removal from either end.
    QSignalSpy spy(param(sinks[1], "in"), &KrBrickParam::connectionsChanged);
    QVERIFY(param(sinks[1], "in")->removeConnection(out));
    QCOMPARE(spy.count(), 1);
    QVERIFY(!param(sinks[1], "in")->removeConnection(out));
    QVERIFY(out->removeConnection(param(sinks[2], "in")));
    QCOMPARE(out->getNumConnections(), 1);
    QCOMPARE(param(sinks[2], "in")->getNumConnections(), 0);

    // Through the brick, by index, as undo items do it.
    QVERIFY(sinks[1]->addConnection(0, src, 0));
    QVERIFY(!sinks[1]->addConnection(5, src, 0));
    QVERIFY(!sinks[1]->addConnection(0, nullptr, 0));
    QCOMPARE(out->getNumConnections(), 2);

    QSignalSpy sinkSpy(param(sinks[0], "in"), &KrBrickParam::connectionsChanged);
    src->removeAllConnections();
    QCOMPARE(out->getNumConnections(), 0);
    QCOMPARE(sinkSpy.count(), 1);
    for (KrShaderBrick* s : sinks)
        QCOMPARE(param(s, "in")->getNumConnections(), 0);
}

void TestKrShaderBrick::feederList()
{
    Holder hold;
    // top <- (x <- (z), y <- (z)), z feeds x and y; w feeds top twice.
    KrShaderBrick* top =
        hold(makeBrick({"a:1:float", "b:1:float", "c:1:float", "o:2:float"}, "top"));
    KrShaderBrick* x = hold(makeBrick({"i:1:float", "o:2:float"}, "x"));
    KrShaderBrick* y = hold(makeBrick({"i:1:float", "o:2:float"}, "y"));
    KrShaderBrick* z = hold(makeBrick({"o:2:float"}, "z"));
    QVERIFY(param(top, "a")->addConnection(param(x, "o")));
    QVERIFY(param(top, "b")->addConnection(param(y, "o")));
    QVERIFY(param(top, "c")->addConnection(param(x, "o")));
    QVERIFY(param(x, "i")->addConnection(param(z, "o")));
    QVERIFY(param(y, "i")->addConnection(param(z, "o")));

    auto names = [](const QList<KrShaderBrick*>& list) {
        QStringList n;
        for (KrShaderBrick* b : list)
            n << b->getName();
        return n.join(QLatin1Char(' '));
    };
    QList<KrShaderBrick*> list;
    top->getBrickList(false, false, true, &list);
    QCOMPARE(names(list), QStringLiteral("x y"));
    list.clear();
    top->getBrickList(false, false, false, &list);
    QCOMPARE(names(list), QStringLiteral("x y x"));
    list.clear();
    top->getBrickList(true, true, true, &list);
    QCOMPARE(names(list), QStringLiteral("top x z y"));
    list.clear();
    top->getBrickList(true, false, false, &list);
    QCOMPARE(names(list), QStringLiteral("x z y z x z"));
    QVERIFY(top->isFedBy(z));
    QVERIFY(!z->isFedBy(top));
    top->getBrickList(true, false, true, nullptr); // no list: nothing happens
}

void TestKrShaderBrick::refCountingReleasesOnLastUnref()
{
    KrShaderBrick* other = makeBrick({"in:1:float"});
    other->ref();
    auto* brick = makeBrick({"out:2:float"});
    QPointer<KrShaderBrick> guard(brick);
    QCOMPARE(brick->refCount(), 0);
    QVERIFY(param(other, "in")->addConnection(param(brick, "out")));

    auto* material = new KrBrickMaterial;
    QVERIFY(material->insertBrick(brick) != 0);
    QCOMPARE(brick->refCount(), 1);
    brick->ref(); // an undo item, say
    QVERIFY(material->takeBrick(brick));
    QVERIFY(guard);
    QCOMPARE(brick->refCount(), 1);

    QSignalSpy spy(param(other, "in"), &KrBrickParam::connectionsChanged);
    QVERIFY(param(other, "in")->addConnection(param(brick, "out")));
    spy.clear();
    brick->unref();
    QVERIFY(!guard);
    // No dangling wire is left at the other end, and it was told.
    QCOMPARE(param(other, "in")->getNumConnections(), 0);
    QCOMPARE(spy.count(), 1);
    other->unref();
    delete material;
}

void TestKrShaderBrick::setTypeDropsWiresItCannotCarry()
{
    Holder hold;
    KrShaderBrick* src = hold(makeBrick({"out:2:float"}));
    KrShaderBrick* f = hold(makeBrick({"in:1:float"}));
    KrShaderBrick* c = hold(makeBrick({"in:1:color"}));
    QVERIFY(param(f, "in")->addConnection(param(src, "out")));
    QVERIFY(param(c, "in")->addConnection(param(src, "out")));
    QSignalSpy typeSpy(param(src, "out"), &KrBrickParam::typeChanged);
    QSignalSpy fSpy(param(f, "in"), &KrBrickParam::connectionsChanged);
    param(src, "out")->setType(QStringLiteral("color"));
    QCOMPARE(typeSpy.count(), 1);
    QCOMPARE(param(src, "out")->getTypeLabel(), QStringLiteral("color"));
    QCOMPARE(param(f, "in")->getNumConnections(), 0); // colour into float: gone
    QCOMPARE(fSpy.count(), 1);
    QCOMPARE(param(c, "in")->getSource(), param(src, "out"));
    param(src, "out")->setType(QStringLiteral("color"));
    QCOMPARE(typeSpy.count(), 1);
}

void TestKrShaderBrick::labelsAndPropertyNames()
{
    Holder hold;
    KrShaderBrick* diffuse = hold(new KrDiffuseBrick);
    KrBrickParam* color = param(diffuse, "Cd");
    QCOMPARE(color->getLabel(), QStringLiteral("Color"));
    QCOMPARE(color->getParamProperty(0)->getName(), QStringLiteral("Color"));
    QSignalSpy spy(color, &KrBrickParam::labelChanged);
    color->setLabel(QStringLiteral("Tint"));
    color->setLabel(QStringLiteral("Tint"));
    QCOMPARE(spy.count(), 1);
    QCOMPARE(color->getParamProperty(0)->getName(), QStringLiteral("Tint"));
    // Output labels (the editor's "Change Label...").
    KrBrickParam* out = param(diffuse, "result");
    out->setLabel(QStringLiteral("Lit"));
    QCOMPARE(out->getLabel(), QStringLiteral("Lit"));
    QCOMPARE(out->getNumParamProperties(), 0);
    QVERIFY(out->getParamProperty(0) == nullptr);
}

void TestKrShaderBrick::tokensFollowValues()
{
    Holder hold;
    KrShaderBrick* diffuse = hold(new KrDiffuseBrick);
    KrBrickParam* kd = param(diffuse, "Kd");
    QCOMPARE(kd->getToken(KrBrickParam::ArgToken), QStringLiteral("Kd"));
    QCOMPARE(kd->getToken(KrBrickParam::TypeToken), QStringLiteral("float"));
    QCOMPARE(kd->getToken(KrBrickParam::DefaultToken), QStringLiteral("0.8"));
    QVERIFY(kd->getToken(3).isEmpty());
    QVERIFY(kd->getToken(-1).isEmpty());
    kd->getParamProperty(0)->setValue(0.25);
    QCOMPARE(kd->getToken(KrBrickParam::DefaultToken), QStringLiteral("0.25"));
    kd->clearTokens();
    QCOMPARE(kd->getToken(0), QStringLiteral("Kd"));
    QCOMPARE(param(diffuse, "Cd")->getToken(2), QStringLiteral("color(0.8, 0.8, 0.8)"));
    QCOMPARE(param(diffuse, "nin")->getToken(2), QStringLiteral("N"));

    KrShaderBrick* image = hold(new KrImageTextureBrick);
    param(image, "file")->getParamProperty(0)->setValue(QStringLiteral("a\"b\\c.png"));
    QCOMPARE(param(image, "file")->getToken(2), QStringLiteral("\"a\\\"b\\\\c.png\""));
}

void TestKrShaderBrick::addingAndRemovingParameters()
{
    Holder hold;
    KrShaderBrick* b = hold(makeBrick({"in:1:float"}));
    QSignalSpy added(b, &KrShaderBrick::paramAdded);
    QSignalSpy removed(b, &KrShaderBrick::paramRemoved);
    QSignalSpy props(b, &KrElement::propertyListChanged);

    auto* dup = new KrBrickParam(b, QStringLiteral("in"), QString(), KrBrickParam::Input,
                                 QStringLiteral("float"));
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("argument 'in' is empty or taken"));
    QVERIFY(!b->addParameter(dup));
    delete dup;
    QVERIFY(!b->addParameter(nullptr));
    QCOMPARE(added.count(), 0);

    auto* p = new KrPropertyParam(b, QStringLiteral("amount"), QStringLiteral("Amount"),
                                  KrBrickParam::Input, QStringLiteral("float"));
    auto* prop = new KrFloatProperty(QStringLiteral("Amount"), 2.0);
    p->addParamProperty(prop);
    QVERIFY(b->addParameter(p));
    QCOMPARE(added.count(), 1);
    QCOMPARE(b->getNumParameters(), 2);
    QCOMPARE(b->findParameterIndex(p), 1);
    QCOMPARE(b->findParameterByArg(QStringLiteral("amount")), p);
    QCOMPARE(b->getProperties(), QList<KrProperty*>{prop});
    QVERIFY(props.count() >= 1);

    // A parameter of another brick is refused.
    KrShaderBrick* other = hold(makeBrick({"out:2:float"}));
    QVERIFY(!b->addParameter(other->getParameter(0)));

    QVERIFY(param(b, "amount")->addConnection(param(other, "out")));
    QPointer<KrProperty> propGuard(prop);
    QVERIFY(b->removeParameter(p));
    QCOMPARE(removed.count(), 1);
    QVERIFY(!propGuard);
    QVERIFY(b->getProperties().isEmpty());
    QCOMPARE(param(other, "out")->getNumConnections(), 0);
    QVERIFY(!b->removeParameter(p));

    // The iterator walks the parameters in order.
    QListIterator<KrBrickParam*> it = b->getParameterIterator();
    QVERIFY(it.hasNext());
    QCOMPARE(it.next()->getParamArg(), QStringLiteral("in"));
    QVERIFY(!it.hasNext());
    QVERIFY(b->getParameter(7) == nullptr);
    QCOMPARE(b->findParameterIndex(nullptr), -1);
}

void TestKrShaderBrick::addInputAction()
{
    Holder hold;
    auto* add = static_cast<KrAddColorsBrick*>(hold(new KrAddColorsBrick));
    QCOMPARE(add->getNumInputs(), 2);
    QCOMPARE(add->getBrickActionList(), QStringList{"KrBrickCommandAction::Add Input"});
    QSignalSpy added(add, &KrShaderBrick::paramAdded);
    QSignalSpy actions(add, &KrShaderBrick::brickActionListChanged);
    QVERIFY(add->executeBrickAction(QStringLiteral("Add Input")));
    QCOMPARE(added.count(), 1);
    QCOMPARE(actions.count(), 1);
    QCOMPARE(add->getNumInputs(), 3);
    KrBrickParam* third = param(add, "in3");
    QVERIFY(third);
    QCOMPARE(third->getTypeLabel(), QStringLiteral("color"));
    QCOMPARE(third->getNumParamProperties(), 1);
    QCOMPARE(add->findParameterIndex(third), 2); // before the output
    QVERIFY(add->getBrickActionList().contains("KrBrickCommandAction::Remove Input"));
    QCOMPARE(add->getShaderCode(), QStringLiteral("result = in1 + in2 + in3;"));

    KrShaderBrick* src = hold(new KrColorConstantBrick);
    QVERIFY(third->addConnection(param(src, "result")));
    QSignalSpy removed(add, &KrShaderBrick::paramRemoved);
    QVERIFY(add->executeBrickAction(QStringLiteral("Remove Input")));
    QCOMPARE(removed.count(), 1);
    QCOMPARE(param(src, "result")->getNumConnections(), 0);
    QVERIFY(!add->executeBrickAction(QStringLiteral("Remove Input"))); // never below two
    QVERIFY(!add->executeBrickAction(QStringLiteral("No Such Action")));
    QCOMPARE(add->getNumInputs(), 2);
}

void TestKrShaderBrick::addInputActionUndo()
{
    KrUndoStack stack;
    QCOMPARE(krUndoStack, &stack);
    KrBrickMaterial m;
    auto* add = bricksAdd<KrAddBrick>(&m);
    auto* src = bricksAdd<KrFloatConstantBrick>(&m);
    QVERIFY(add->executeBrickAction(QStringLiteral("Add Input")));
    QCOMPARE(stack.count(), 1);
    bricksSetValue(add, "in3", 7.5);
    param(add, "in3")->setLabel(QStringLiteral("Extra"));
    QVERIFY(param(add, "in3")->addConnection(param(src, "result")));

    // Removing the input is undone with its label, value and wire.
    QVERIFY(add->executeBrickAction(QStringLiteral("Remove Input")));
    QCOMPARE(stack.count(), 2);
    QVERIFY(!param(add, "in3"));
    QCOMPARE(param(src, "result")->getNumConnections(), 0);
    stack.undo();
    QVERIFY(param(add, "in3"));
    QCOMPARE(param(add, "in3")->getLabel(), QStringLiteral("Extra"));
    QCOMPARE(bricksValue(add, "in3").toDouble(), 7.5);
    QCOMPARE(param(add, "in3")->getSource(), param(src, "result"));
    // Undoing the addition removes it; redoing brings it back as it was.
    stack.undo();
    QCOMPARE(add->getNumInputs(), 2);
    stack.redo();
    QCOMPARE(add->getNumInputs(), 3);
    QCOMPARE(bricksValue(add, "in3").toDouble(), 7.5);
    QCOMPARE(param(add, "in3")->getSource(), param(src, "result"));
    stack.redo();
    QCOMPARE(add->getNumInputs(), 2);
    // A brick that is gone leaves the steps harmless.
    m.takeBrick(add);
    stack.undo();
    stack.undo();
    QCOMPARE(stack.index(), 0);
}

void TestKrShaderBrick::paramMime()
{
    auto* brick = makeBrick({"out:2:float"});
    brick->ref();
    KrBrickParam* p = brick->getParameter(0);
    KrBrickParamMime mime(p);
    QVERIFY(mime.hasFormat(KrBrickParamMime::s_mimeType));
    QCOMPARE(KrBrickParamMime::s_mimeType, QStringLiteral("application/x-krbrickparam"));
    QCOMPARE(KrBrickParamMime::decode(&mime), p);
    QMimeData foreign;
    foreign.setData(KrBrickParamMime::s_mimeType, mime.data(KrBrickParamMime::s_mimeType));
    QVERIFY(KrBrickParamMime::decode(&foreign) == nullptr);
    QVERIFY(KrBrickParamMime::decode(nullptr) == nullptr);
    brick->unref();
    QVERIFY(KrBrickParamMime::decode(&mime) == nullptr);
}

QTEST_MAIN(TestKrShaderBrick)
#include "tst_krshaderbrick.moc"
