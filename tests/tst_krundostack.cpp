#include "krundo.h"

#include <QAction>
#include <QSignalSpy>
#include <QUndoStack>
#include <QtTest>

#include <functional>

namespace {

// Every call goes to one shared journal, so tests can check order across items.
QStringList journal;
int liveItems = 0;

class LogItem : public KrUndoItem
{
public:
    explicit LogItem(const QString& name, int size = 0) : m_name(name), m_size(size)
    {
        ++liveItems;
    }
    ~LogItem() override { --liveItems; }
    void undo() override
    {
        journal << "undo " + m_name;
        if (onUndo)
            onUndo();
    }
    void redo() override
    {
        journal << "redo " + m_name;
        if (onRedo)
            onRedo();
    }
    int size() const override { return m_size; }

    std::function<void()> onUndo;
    std::function<void()> onRedo;

private:
    QString m_name;
    int m_size;
};

// An item that only overrides undo(): the base redo() must be harmless.
class UndoOnlyItem : public KrUndoItem
{
public:
    void undo() override { journal << "undo only"; }
};

} // namespace

class TestKrUndoStack : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void cleanup();

    void globalStack();
    void pushOutsideHoldIsOneStep();
    void holdMakesOneStepInOrder();
    void unacceptedHoldMakesNothing();
    void acceptedEmptyHoldMakesNothing();
    void nestedHolds_data();
    void nestedHolds();
    void pushDuringUndoIsRefused();
    void replayIsAnnouncedOnce();
    void redoDoesNotRecordASecondStep();
    void holdOpenedDuringReplayMakesNothing();
    void clearDuringReplayWaits();
    void newStepDropsRedo();
    void actionsFollowSteps();
    void holdsWithoutStack();
    void stackDestroyedWhileHoldOpen();
    void stepSizeAddsItems();
    void oneHoldTwoStacks();
};

void TestKrUndoStack::init()
{
    journal.clear();
    QCOMPARE(liveItems, 0);
    QVERIFY(!krUndoStack);
}

void TestKrUndoStack::cleanup()
{
    QCOMPARE(liveItems, 0);
}

void TestKrUndoStack::globalStack()
{
    {
        KrUndoStack first;
        QCOMPARE(krUndoStack, &first);
        {
            KrUndoStack second;
            QCOMPARE(krUndoStack, &first);
        }
        QCOMPARE(krUndoStack, &first);
    }
    QVERIFY(!krUndoStack);
}

void TestKrUndoStack::pushOutsideHoldIsOneStep()
{
    KrUndoStack stack;
    QSignalSpy indexSpy(&stack, &KrUndoStack::indexChanged);
    stack.push(new LogItem("a"));
    stack.push(new LogItem("b"));
    stack.push(nullptr);
    QCOMPARE(stack.count(), 2);
    QCOMPARE(stack.text(0), QString());
    QVERIFY(journal.isEmpty()); // pushing never replays the change
    QCOMPARE(indexSpy.count(), 2);
    QCOMPARE(indexSpy.last().at(0).toInt(), 2);

    stack.undo();
    QCOMPARE(journal, QStringList({"undo b"}));
    stack.redo();
    QCOMPARE(journal, QStringList({"undo b", "redo b"}));
}

void TestKrUndoStack::holdMakesOneStepInOrder()
{
    KrUndoStack stack;
    {
        KrUndoStackHold hold;
        stack.push(new LogItem("1"));
        stack.push(new LogItem("2"));
        stack.push(new UndoOnlyItem);
        stack.push(new LogItem("3"));
        QCOMPARE(stack.count(), 0); // nothing until the hold ends
        hold.accept("Delete Bricks");
    }
    QVERIFY(journal.isEmpty());
    QCOMPARE(stack.count(), 1);
    QCOMPARE(stack.undoText(), QStringLiteral("Delete Bricks"));

    stack.undo();
    QCOMPARE(journal, QStringList({"undo 3", "undo only", "undo 2", "undo 1"}));
    QCOMPARE(stack.redoText(), QStringLiteral("Delete Bricks"));
    journal.clear();
    stack.redo();
    QCOMPARE(journal, QStringList({"redo 1", "redo 2", "redo 3"}));
    QVERIFY(stack.canPushItems());
}

void TestKrUndoStack::unacceptedHoldMakesNothing()
{
    KrUndoStack stack;
    stack.push(new LogItem("before"));
    {
        KrUndoStackHold hold;
        stack.push(new LogItem("x"));
        stack.push(new LogItem("y"));
        QCOMPARE(liveItems, 3);
    }
    QCOMPARE(liveItems, 1); // the hold's items are gone, the earlier step is kept
    QCOMPARE(stack.count(), 1);
    QVERIFY(journal.isEmpty());
    // A later lone push is still a step of its own.
    stack.push(new LogItem("after"));
    QCOMPARE(stack.count(), 2);
}

void TestKrUndoStack::acceptedEmptyHoldMakesNothing()
{
    KrUndoStack stack;
    {
        KrUndoStackHold hold;
        hold.accept("Brick Disconnect...");
    }
    QCOMPARE(stack.count(), 0);
    QVERIFY(!stack.canUndo());
}

void TestKrUndoStack::nestedHolds_data()
{
    QTest::addColumn<QString>("outerText"); // empty: not accepted
    QTest::addColumn<QString>("innerText");
    QTest::addColumn<bool>("outerAcceptsFirst");
    QTest::addColumn<int>("steps");
    QTest::addColumn<QString>("stepText");

    QTest::newRow("both, inner first") << "Delete Bricks"
                                       << "Brick delete..." << false << 1 << "Delete Bricks";
    QTest::newRow("both, outer first") << "Delete Bricks"
                                       << "Brick delete..." << true << 1 << "Delete Bricks";
    QTest::newRow("inner only") << ""
                                << "Brick delete..." << false << 1 << "Brick delete...";
    QTest::newRow("outer only") << "Group Bricks"
                                << "" << false << 1 << "Group Bricks";
    QTest::newRow("neither") << ""
                             << "" << false << 0 << "";
}

void TestKrUndoStack::nestedHolds()
{
    QFETCH(QString, outerText);
    QFETCH(QString, innerText);
    QFETCH(bool, outerAcceptsFirst);
    QFETCH(int, steps);
    QFETCH(QString, stepText);

    KrUndoStack stack;
    {
        KrUndoStackHold outer;
        stack.push(new LogItem("outer 1"));
        if (outerAcceptsFirst && !outerText.isEmpty())
            outer.accept(outerText);
        for (int i = 0; i < 2; ++i) {
            KrUndoStackHold inner;
            stack.push(new LogItem(QStringLiteral("inner %1").arg(i)));
            {
                KrUndoStackHold innermost; // never accepted: joins the step all the same
                stack.push(new LogItem(QStringLiteral("innermost %1").arg(i)));
            }
            if (!innerText.isEmpty())
                inner.accept(innerText);
        }
        QCOMPARE(stack.count(), 0); // inner holds ending make no step of their own
        stack.push(new LogItem("outer 2"));
        if (!outerAcceptsFirst && !outerText.isEmpty())
            outer.accept(outerText);
    }
    QCOMPARE(stack.count(), steps);
    if (steps == 0) {
        QCOMPARE(liveItems, 0);
        return;
    }
    QCOMPARE(stack.text(0), stepText);
    stack.undo();
    QCOMPARE(journal, QStringList({"undo outer 2", "undo innermost 1", "undo inner 1",
                                   "undo innermost 0", "undo inner 0", "undo outer 1"}));
}

void TestKrUndoStack::pushDuringUndoIsRefused()
{
    KrUndoStack stack;
    stack.push(new LogItem("first"));
    auto* item = new LogItem("second");
    bool couldPush = true;
    int liveDuringUndo = 0;
    item->onUndo = [&]() {
        // Model code run by the undo records again, as it would for a user edit.
        couldPush = stack.canPushItems();
        KrUndoStackHold hold;
        stack.push(new LogItem("echo"));
        liveDuringUndo = liveItems;
        hold.accept("Echo");
    };
    stack.push(item);

    stack.undo();
    QVERIFY(!couldPush);
    QCOMPARE(liveDuringUndo, 2); // the echo was deleted at once
    QVERIFY(stack.canPushItems());
    QCOMPARE(stack.count(), 2);
    QCOMPARE(stack.index(), 1);
    QVERIFY(stack.canRedo()); // an echo step would have dropped the redo
    stack.redo();
    QCOMPARE(stack.index(), 2);
}

void TestKrUndoStack::replayIsAnnouncedOnce()
{
    KrUndoStack stack;
    QSignalSpy started(&stack, &KrUndoStack::replayStarted);
    QSignalSpy finished(&stack, &KrUndoStack::replayFinished);
    QStringList seen;
    connect(&stack, &KrUndoStack::replayStarted, [&] { seen << "started"; });
    connect(&stack, &KrUndoStack::replayFinished, [&] { seen << "finished"; });
    {
        KrUndoStackHold hold;
        for (const char* name : {"a", "b", "c"}) {
            auto* item = new LogItem(name);
            item->onUndo = [&seen, name] { seen << QString("undo ") + name; };
            stack.push(item);
        }
        hold.accept("Three");
    }
    QCOMPARE(started.count(), 0); // pushing replays nothing

    stack.undo();
    QCOMPARE(seen, QStringList({"started", "undo c", "undo b", "undo a", "finished"}));
    stack.redo();
    QCOMPARE(started.count(), 2);
    QCOMPARE(finished.count(), 2);
    stack.redo(); // nothing to redo
    QCOMPARE(started.count(), 2);
}

void TestKrUndoStack::redoDoesNotRecordASecondStep()
{
    KrUndoStack stack;
    auto* item = new LogItem("delete");
    // Redo removes the brick through the same path the user's delete takes, which records.
    item->onRedo = [&]() {
        KrUndoStackHold hold;
        stack.push(new LogItem("delete again"));
        hold.accept("Brick delete...");
    };
    {
        KrUndoStackHold hold;
        stack.push(item);
        hold.accept("Brick delete...");
    }
    QCOMPARE(stack.count(), 1);
    for (int round = 0; round < 3; ++round) {
        stack.undo();
        stack.redo();
    }
    QCOMPARE(stack.count(), 1);
    QCOMPARE(stack.index(), 1);
    QCOMPARE(liveItems, 1);
    QCOMPARE(journal.count("redo delete"), 3);
}

void TestKrUndoStack::holdOpenedDuringReplayMakesNothing()
{
    KrUndoStack stack;
    KrUndoStack other; // not replaying, but a hold opened during a replay makes nothing
    auto* item = new LogItem("a");
    item->onUndo = [&]() {
        KrUndoStackHold hold;
        QVERIFY(other.canPushItems());
        other.push(new LogItem("b"));
        hold.accept("Echo");
    };
    stack.push(item);
    stack.undo();
    QCOMPARE(other.count(), 0);
    QCOMPARE(liveItems, 1);
}

void TestKrUndoStack::clearDuringReplayWaits()
{
    KrUndoStack stack;
    auto* item = new LogItem("a");
    item->onUndo = [&]() { stack.clear(); };
    stack.push(new LogItem("b"));
    stack.push(item);
    stack.undo(); // would delete the running step if the clear were not held back
    QCOMPARE(journal, QStringList({"undo a"}));
    QCOMPARE(stack.count(), 0);
    QCOMPARE(liveItems, 0);
}

void TestKrUndoStack::newStepDropsRedo()
{
    KrUndoStack stack;
    stack.push(new LogItem("a"));
    stack.push(new LogItem("b"));
    stack.undo();
    QCOMPARE(liveItems, 2);
    stack.push(new LogItem("c"));
    QCOMPARE(stack.count(), 2);
    QCOMPARE(liveItems, 2); // b's step was deleted with its item
    QVERIFY(!stack.canRedo());
}

void TestKrUndoStack::actionsFollowSteps()
{
    KrUndoStack stack;
    QObject owner;
    QAction* undo = stack.createUndoAction(&owner);
    QAction* redo = stack.createRedoAction(&owner);
    QCOMPARE(undo->parent(), &owner);
    QCOMPARE(undo->shortcuts(), QKeySequence::keyBindings(QKeySequence::Undo));
    QCOMPARE(redo->shortcuts(), QKeySequence::keyBindings(QKeySequence::Redo));
    QVERIFY(!undo->isEnabled());
    QVERIFY(!redo->isEnabled());

    {
        KrUndoStackHold hold;
        stack.push(new LogItem("x"));
        hold.accept("Delete Bricks");
    }
    QCOMPARE(undo->text(), QStringLiteral("Undo Delete Bricks"));
    QVERIFY(undo->isEnabled());

    undo->trigger();
    QCOMPARE(journal, QStringList({"undo x"}));
    QVERIFY(!undo->isEnabled());
    QCOMPARE(undo->text(), QStringLiteral("Undo"));
    QCOMPARE(redo->text(), QStringLiteral("Redo Delete Bricks"));
    QVERIFY(redo->isEnabled());

    redo->trigger();
    QCOMPARE(journal, QStringList({"undo x", "redo x"}));
    QVERIFY(!redo->isEnabled());
}

void TestKrUndoStack::holdsWithoutStack()
{
    {
        KrUndoStackHold outer;
        KrUndoStackHold inner;
        inner.accept("Brick Connection...");
        outer.accept("Brick Connection...");
    }
    // A stack made afterwards starts clean and its lone pushes are steps.
    KrUndoStack stack;
    QCOMPARE(stack.count(), 0);
    stack.push(new LogItem("a"));
    QCOMPARE(stack.count(), 1);
}

void TestKrUndoStack::stackDestroyedWhileHoldOpen()
{
    {
        KrUndoStackHold hold;
        {
            KrUndoStack stack;
            stack.push(new LogItem("a"));
            stack.push(new LogItem("b"));
            QCOMPARE(liveItems, 2);
        }
        QCOMPARE(liveItems, 0);
        QVERIFY(!krUndoStack);
        hold.accept("Delete Bricks");
    }
    KrUndoStack stack;
    {
        KrUndoStackHold hold;
        stack.push(new LogItem("c"));
        hold.accept("Cut Bricks");
    }
    QCOMPARE(stack.count(), 1);
    QCOMPARE(stack.text(0), QStringLiteral("Cut Bricks"));
}

void TestKrUndoStack::stepSizeAddsItems()
{
    KrUndoStack stack;
    {
        KrUndoStackHold hold;
        stack.push(new LogItem("a", 12));
        stack.push(new LogItem("b", 24));
        hold.accept("Group Bricks");
    }
    stack.push(new UndoOnlyItem);
    QCOMPARE(stack.stepSize(0), 36);
    QCOMPARE(stack.stepSize(1), 0);
    QCOMPARE(stack.stepSize(5), 0);
    QCOMPARE(stack.undoStack()->count(), 2);
}

void TestKrUndoStack::oneHoldTwoStacks()
{
    KrUndoStack scene;
    KrUndoStack other;
    {
        KrUndoStackHold hold;
        scene.push(new LogItem("s1"));
        other.push(new LogItem("o1"));
        scene.push(new LogItem("s2"));
        hold.accept("Group Bricks");
    }
    QCOMPARE(scene.count(), 1);
    QCOMPARE(other.count(), 1);
    QCOMPARE(other.text(0), QStringLiteral("Group Bricks"));
    scene.undo();
    QCOMPARE(journal, QStringList({"undo s2", "undo s1"}));
}

QTEST_MAIN(TestKrUndoStack)
#include "tst_krundostack.moc"
