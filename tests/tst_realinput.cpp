// The brick scene driven by real X input (xdotool on an X server), as a user at a desk drives
// it: the pointer drags title bars and wires, Shift+clicks plugs, and the keyboard deletes,
// undoes and redoes. CTest runs it under xvfb-run; without a display or xdotool it skips.

#include "krbrickframe.h"
#include "krbrickgraphicsitem.h"
#include "krbricklibrary.h"
#include "krbrickparam.h"
#include "krbricktitlebar.h"
#include "krbrickuser.h"
#include "krbrickuserscene.h"
#include "krconnectoritem.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krmainwindow.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "krundo.h"
#include "pane_testsupport.h"

#include <QGraphicsView>
#include <QGuiApplication>
#include <QProcess>
#include <QStandardPaths>
#include <QtTest>
#include <memory>

namespace {

// Runs xdotool with the event loop turning, so that the program answers the input (a drag
// runs a loop of its own) while it arrives.
bool xdo(const QStringList& args)
{
    QProcess process;
    process.start(QStringLiteral("xdotool"), args);
    if (!process.waitForStarted(5000))
        return false;
    QElapsedTimer clock;
    clock.start();
    while (process.state() != QProcess::NotRunning && clock.elapsed() < 30000)
        QTest::qWait(10);
    QTest::qWait(50);
    return process.exitStatus() == QProcess::NormalExit && process.exitCode() == 0;
}

// A move and a short pause (--sync waits forever when the pointer is there already).
QStringList at(const QPoint& p)
{
    return {QStringLiteral("mousemove"), QString::number(p.x()), QString::number(p.y()),
            QStringLiteral("sleep"), QStringLiteral("0.1")};
}

// Press, several steps past the drag distance, release: a single jump starts no drag.
bool dragWithMouse(const QPoint& from, const QPoint& to)
{
    QStringList args = at(from);
    args << QStringLiteral("sleep") << QStringLiteral("0.1") << QStringLiteral("mousedown")
         << QStringLiteral("1");
    const int steps = 12;
    for (int i = 1; i <= steps; ++i) {
        const QPoint p = from + (to - from) * i / steps + QPoint(i == 1 ? 12 : 0, 0);
        args << QStringLiteral("sleep") << QStringLiteral("0.04") << QStringLiteral("mousemove")
             << QString::number(p.x()) << QString::number(p.y());
    }
    args << QStringLiteral("sleep") << QStringLiteral("0.15") << at(to) << QStringLiteral("sleep")
         << QStringLiteral("0.1") << QStringLiteral("mouseup") << QStringLiteral("1");
    return xdo(args);
}

bool key(const QString& combo)
{
    return xdo({QStringLiteral("key"), QStringLiteral("--clearmodifiers"), combo});
}

KrBrickParam* firstParam(KrShaderBrick* brick, int direction)
{
    for (int i = 0; i < brick->getNumParameters(); ++i) {
        if (brick->getParameter(i)->getDirection() == direction)
            return brick->getParameter(i);
    }
    return nullptr;
}

} // namespace

class TestRealInput : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void init();
    void cleanup();

    void dragTitleBarMovesAndUndoes();
    void dragWireConnectsAndUndoes();
    void shiftClicksConnect();
    void deleteKeyAndUndo();
    void resizeDragAndUndo();

private:
    KrBrickUserScene* scene() const
    {
        return m_pane->getMainWidget()->getCurrentWindow()->getBrickScene();
    }
    QGraphicsView* view() const { return m_pane->getMainWidget()->getCurrentWindow()->getView(); }
    QPoint onScreen(const QPointF& scenePos) const
    {
        return view()->viewport()->mapToGlobal(view()->mapFromScene(scenePos));
    }
    QPoint plugOnScreen(KrBrickGraphicsItem* item, KrBrickParam* param) const
    {
        KrConnectorItem* plug = item->getConnector(item->getBrick()->findParameterIndex(param));
        return plug ? onScreen(plug->sceneBoundingRect().center()) : QPoint();
    }
    QPoint titleOnScreen(KrBrickGraphicsItem* item) const
    {
        KrBrickTitleBar* bar = item->getFrame()->getTitleBar();
        const QPoint local =
            bar->mapTo(item->getFrame(), QPoint(bar->width() / 3, bar->height() / 2));
        return onScreen(item->mapToScene(local));
    }
    // A constant beside a multiply, both in view, and the output and input to wire.
    struct Pair
    {
        KrBrickGraphicsItem* source;
        KrBrickGraphicsItem* target;
        KrBrickParam* out;
        KrBrickParam* in;
    };
    Pair addPair()
    {
        KrBrickGraphicsItem* source = add(new KrFloatConstantBrick, QPointF(3000, 3000));
        KrBrickGraphicsItem* target = add(new KrMultiplyBrick, QPointF(3300, 3050));
        view()->centerOn(QPointF(3200, 3100));
        QTest::qWait(100);
        return {source, target, firstParam(source->getBrick(), KrBrickParam::Output),
                firstParam(target->getBrick(), KrBrickParam::Input)};
    }
    KrBrickGraphicsItem* add(KrShaderBrick* brick, const QPointF& pos)
    {
        KrBrickGraphicsItem* item = scene()->addBrickAt(brick, pos);
        QTest::qWait(100);
        return item;
    }

    std::unique_ptr<KrPaneTestEnv> m_env;
    KrCorvanePane* m_pane = nullptr;
};

void TestRealInput::initTestCase()
{
    if (QGuiApplication::platformName() != QLatin1String("xcb"))
        QSKIP("needs an X server (CTest runs this under xvfb-run)");
    if (QStandardPaths::findExecutable(QStringLiteral("xdotool")).isEmpty())
        QSKIP("needs xdotool");
}

void TestRealInput::init()
{
    m_env.reset(new KrPaneTestEnv);
    m_pane = new KrCorvanePane;
    KrMainWindow* window = m_env->mainWindow();
    window->addPane(m_pane);
    window->setGeometry(0, 0, 1500, 950);
    window->show();
    QVERIFY(QTest::qWaitForWindowExposed(window));
    // No window manager: the window is given the keyboard directly.
    QVERIFY(xdo({QStringLiteral("windowfocus"), QStringLiteral("--sync"),
                 QString::number(window->winId())}));
    QTRY_VERIFY(window->isActiveWindow());
    QVERIFY(m_pane->getMainWidget()->getCurrentWindow());
}

void TestRealInput::cleanup()
{
    m_pane = nullptr;
    m_env.reset();
}

void TestRealInput::dragTitleBarMovesAndUndoes()
{
    KrBrickGraphicsItem* item = add(new KrMultiplyBrick, QPointF(3000, 3000));
    view()->centerOn(item);
    QTest::qWait(100);
    const QPointF start = item->pos();
    const int steps = krUndoStack->count();

    const QPoint grip = titleOnScreen(item);
    QVERIFY(dragWithMouse(grip, grip + QPoint(120, 70)));
    QTRY_COMPARE(item->pos(), start + QPointF(120, 70));
    QCOMPARE(krUndoStack->count(), steps + 1);
    QCOMPARE(krUndoStack->undoText(), QStringLiteral("Move Bricks"));
    // The stored place follows, so a saved network keeps it.
    QCOMPARE(item->getBrick()->getBrickSettings()->getFloatValue(QStringLiteral("PosX")),
             start.x() + 120);

    QVERIFY(key(QStringLiteral("ctrl+z")));
    QTRY_COMPARE(item->pos(), start);
    QVERIFY(key(QStringLiteral("ctrl+shift+z")));
    QTRY_COMPARE(item->pos(), start + QPointF(120, 70));
}

void TestRealInput::dragWireConnectsAndUndoes()
{
    const auto [source, target, out, in] = addPair();
    QVERIFY(out && in);
    const int steps = krUndoStack->count();

    QVERIFY(dragWithMouse(plugOnScreen(source, out), plugOnScreen(target, in)));
    QTRY_VERIFY(in->isConnectedTo(out));
    QCOMPARE(krUndoStack->count(), steps + 1);
    QCOMPARE(krUndoStack->undoText(), QStringLiteral("Brick Connection..."));
    KrConnectorItem* plug = target->getConnector(target->getBrick()->findParameterIndex(in));
    QTRY_VERIFY(plug->getWire() && plug->getWire()->isVisible());

    // The wire follows its brick when the brick is dragged.
    const QPointF end = plug->getWire()->path().pointAtPercent(1);
    const QPoint grip = titleOnScreen(source);
    QVERIFY(dragWithMouse(grip, grip + QPoint(0, 90)));
    QTRY_VERIFY(plug->getWire()->path().pointAtPercent(1) != end);

    QVERIFY(key(QStringLiteral("ctrl+z"))); // the move
    QVERIFY(key(QStringLiteral("ctrl+z"))); // the wire
    QTRY_VERIFY(!in->isConnectedTo(out));
    QVERIFY(key(QStringLiteral("ctrl+shift+z")));
    QTRY_VERIFY(in->isConnectedTo(out));
}

void TestRealInput::shiftClicksConnect()
{
    const auto [source, target, out, in] = addPair();
    QVERIFY(out && in);
    const int steps = krUndoStack->count();

    QStringList args = {QStringLiteral("keydown"), QStringLiteral("shift")};
    args << at(plugOnScreen(source, out)) << QStringLiteral("click") << QStringLiteral("1")
         << QStringLiteral("sleep") << QStringLiteral("0.2") << at(plugOnScreen(target, in))
         << QStringLiteral("sleep") << QStringLiteral("0.1") << QStringLiteral("click")
         << QStringLiteral("1") << QStringLiteral("keyup") << QStringLiteral("shift");
    QVERIFY(xdo(args));
    QTRY_VERIFY(in->isConnectedTo(out));
    QCOMPARE(krUndoStack->count(), steps + 1);
    QCOMPARE(krUndoStack->undoText(), QStringLiteral("Brick Connection..."));
    QVERIFY(!scene()->isConnectMode());

    QVERIFY(key(QStringLiteral("ctrl+z")));
    QTRY_VERIFY(!in->isConnectedTo(out));
}

void TestRealInput::deleteKeyAndUndo()
{
    KrBrickGraphicsItem* item = add(new KrMultiplyBrick, QPointF(3000, 3000));
    view()->centerOn(item);
    QTest::qWait(100);
    const uint id = item->getBrick()->getBrickID();
    IKrBrickUser* user = scene()->getBrickUser();
    const QPointF start = item->pos();

    // A click on the title bar selects the brick; Delete removes it.
    QVERIFY(xdo(at(titleOnScreen(item)) << QStringLiteral("click") << QStringLiteral("1")));
    QTRY_VERIFY(item->isSelected());
    QVERIFY(key(QStringLiteral("Delete")));
    QTRY_VERIFY(!user->findBrick(id));
    QVERIFY(!scene()->findBrick(id));

    QVERIFY(key(QStringLiteral("ctrl+z")));
    QTRY_VERIFY(user->findBrick(id));
    QTRY_VERIFY(scene()->findBrick(id));
    QCOMPARE(scene()->findBrick(id)->pos(), start);
}

void TestRealInput::resizeDragAndUndo()
{
    KrBrickGraphicsItem* item = add(new KrMultiplyBrick, QPointF(3000, 3000));
    view()->centerOn(item);
    QTest::qWait(100);
    KrBrickFrame* frame = item->getFrame();
    auto* grip = frame->findChild<KrBrickResizeButton*>();
    QVERIFY(grip);
    const int width = frame->width();
    const QPoint from = onScreen(item->mapToScene(grip->mapTo(frame, grip->rect().center())));
    QVERIFY(dragWithMouse(from, from + QPoint(80, 0)));
    QTRY_COMPARE(frame->width(), width + 80);
    QCOMPARE(krUndoStack->undoText(), QStringLiteral("Resize Brick"));
    // Stored with the brick, so the network opens with it again.
    QCOMPARE(item->getBrick()->getBrickSettings()->getIntValue(QStringLiteral("Width")),
             width + 80);

    QVERIFY(key(QStringLiteral("ctrl+z")));
    QTRY_COMPARE(frame->width(), width);
}

QTEST_MAIN(TestRealInput)
#include "tst_realinput.moc"
