#include "app_testsupport.h"
#include "krapp.h"
#include "krbrickframe.h"
#include "krbrickgraphicsitem.h"
#include "krbrickparammime.h"
#include "krbrickuserscene.h"
#include "krconnectoritem.h"
#include "krsettings.h"
#include "krundo.h"
#include "scene_testutil.h"

#include <QColorDialog>
#include <QGraphicsEllipseItem>
#include <QGraphicsPolygonItem>
#include <QGraphicsSceneDragDropEvent>
#include <QGraphicsSimpleTextItem>
#include <QMenu>
#include <QtTest>
#include <memory>

namespace {
KrUndoStack* undoStack()
{
    return krApp->getUndoStack();
}

// Two bricks: a feeding a (float, color) pair of outputs, b with two inputs and an output.
struct Pair
{
    KrSceneTestBrick* a = nullptr;
    KrSceneTestBrick* b = nullptr;
};

Pair makePair(KrSceneHarness& h)
{
    Pair p;
    p.a = new KrSceneTestBrick(QStringLiteral("Source"));
    p.a->addOutput(QStringLiteral("out"));
    p.a->addOutput(QStringLiteral("col"), QStringLiteral("color"));
    p.b = new KrSceneTestBrick(QStringLiteral("Target"));
    p.b->addInput(QStringLiteral("in"));
    p.b->addInput(QStringLiteral("in2"));
    p.b->addOutput(QStringLiteral("res"));
    h.add(p.a, QPointF(500, 100));
    h.add(p.b, QPointF(100, 100));
    return p;
}

// Sends a drag of param's data over the scene at pos and drops it there, as the view would.
bool dropParam(KrBrickUserScene* scene, KrBrickParam* param, const QPointF& pos)
{
    // What the plug does as its drag begins.
    scene->followPathStart(QPointF(0, 0), param->isOutput());
    KrBrickParamMime mime(param);
    auto send = [&](QEvent::Type type) {
        QGraphicsSceneDragDropEvent event(type);
        event.setScenePos(pos);
        event.setMimeData(&mime);
        event.setPossibleActions(Qt::MoveAction | Qt::CopyAction);
        event.setProposedAction(Qt::MoveAction);
        event.setDropAction(Qt::MoveAction);
        event.setButtons(Qt::LeftButton);
        QCoreApplication::sendEvent(scene, &event);
        return event.isAccepted();
    };
    send(QEvent::GraphicsSceneDragEnter);
    const bool overTarget = send(QEvent::GraphicsSceneDragMove);
    // The dashed wire with its arrow follows the drag.
    if (!scene->getWireItem()->isVisible() || !scene->getArrowItem()->isVisible())
        return false;
    send(QEvent::GraphicsSceneDrop);
    krSceneSettle();
    return overTarget;
}

QPointF circleCenter(KrConnectorItem* plug)
{
    QGraphicsEllipseItem* circle = plug->getPlugCircle();
    return circle->mapToScene(circle->rect().center());
}
} // namespace

class TestKrConnectorItem : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void geometry_data();
    void geometry();
    void labelBrightness_data();
    void labelBrightness();
    void wireCurve_data();
    void wireCurve();
    void generatedColorAvoidsWindow();
    void storedColorSurvivesRebuild();
    void wireBelongsToInput_data();
    void wireBelongsToInput();
    void wireFollowsBricks();
    void wireReattachesAfterSourceRebuild();
    void dropConnects();
    void dropReplacingSourceKeepsOldWireForUndo();
    void dropRefused_data();
    void dropRefused();
    void shiftClickConnects();
    void shiftClickRefusedPairMakesNoStep();
    void disconnectMenu();
    void disconnectWithoutWiresLeavesStack();
    void connectorColorDialog_data();
    void connectorColorDialog();
    void temporaryWireDirection_data();
    void temporaryWireDirection();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrConnectorItem::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
}

void TestKrConnectorItem::geometry_data()
{
    QTest::addColumn<int>("size");
    QTest::addColumn<bool>("rightToLeft");
    QTest::addColumn<QPolygonF>("arrow");
    QTest::newRow("20, right to left")
        << 20 << true << QPolygonF({{16, 4}, {24, -4}, {24, 4}, {24, 12}});
    QTest::newRow("20, left to right")
        << 20 << false << QPolygonF({{16, 4}, {24, -4}, {24, 4}, {24, 12}});
    QTest::newRow("30") << 30 << true << QPolygonF({{24, 6}, {36, -6}, {36, 6}, {36, 18}});
}

void TestKrConnectorItem::geometry()
{
    QFETCH(int, size);
    QFETCH(bool, rightToLeft);
    QFETCH(QPolygonF, arrow);
    KrSceneHarness h;
    h.scene->setIsRightToLeft(rightToLeft);
    Pair p = makePair(h);
    KrBrickGraphicsItem* item = h.scene->findBrick(p.b->getBrickID());
    KrConnectorItem plug(p.b->getParameter(0), item, size);
    const qreal d = 0.82f * size;

    QCOMPARE(plug.rect(), QRectF(0, 0, d, d / 2));
    QCOMPARE(plug.getPlugCircle()->rect(), QRectF(0, 0, d, d));
    QCOMPARE(plug.getPlugCircle()->pos(), QPointF(-d / 8, -d / 4));
    QCOMPARE(plug.getArrowHead()->polygon(), arrow);
    QVERIFY(!plug.getArrowHead()->isVisible());
    QCOMPARE(plug.zValue(), -5.0);
    QCOMPARE(plug.getPlugCircle()->zValue(), -3.0);
    QCOMPARE(plug.getTextItem()->zValue(), -2.0);
    QCOMPARE(plug.getWire()->zValue(), -10.0);
    // The connect point is the bar's outer end, at mid-height.
    QCOMPARE(plug.getConnectPoint(), plug.mapToScene(QPointF(float(d), float(d / 4))));

    // A built plug on the inputs' edge: mirrored when the inputs are on the left (left to
    // right), so it always sticks out of the frame.
    KrConnectorItem* built = h.plug(p.b, QStringLiteral("in"));
    QVERIFY(built);
    const bool mirrored = built->transform().m11() < 0;
    QCOMPARE(mirrored, !rightToLeft);
    const QRectF frame = item->mapRectToScene(item->rect());
    const QPointF connect = built->getConnectPoint();
    QVERIFY2(connect.x() < frame.left() || connect.x() > frame.right(),
             "the wire end lies outside the frame");
    // The label reads normally inside a mirrored plug.
    QGraphicsSimpleTextItem* text = built->getTextItem();
    QVERIFY(text->sceneTransform().m11() > 0);
    QVERIFY(plug.getTextItem()->boundingRect().width() <= d + 0.01);
}

void TestKrConnectorItem::labelBrightness_data()
{
    QTest::addColumn<QColor>("color");
    QTest::addColumn<QColor>("label");
    QTest::newRow("brightness 127") << QColor(128, 128, 127) << QColor(Qt::white);
    QTest::newRow("brightness 128") << QColor(128, 128, 128) << QColor(Qt::black);
    QTest::newRow("pure red") << QColor(255, 0, 0) << QColor(Qt::white);
    QTest::newRow("yellow") << QColor(255, 255, 0) << QColor(Qt::black);
    QTest::newRow("black") << QColor(0, 0, 0) << QColor(Qt::white);
}

void TestKrConnectorItem::labelBrightness()
{
    QFETCH(QColor, color);
    QFETCH(QColor, label);
    QCOMPARE(KrConnectorItem::labelColor(color), label);
    KrSceneHarness h;
    Pair p = makePair(h);
    KrConnectorItem* plug = h.plug(p.a, QStringLiteral("out"));
    plug->setColor(color);
    QCOMPARE(plug->getTextItem()->brush().color(), label);
    QCOMPARE(plug->getPlugCircle()->brush().color(), color);
}

void TestKrConnectorItem::wireCurve_data()
{
    QTest::addColumn<QPointF>("b");
    QTest::addColumn<QPointF>("a");
    QTest::addColumn<QPointF>("c1");
    QTest::addColumn<QPointF>("c2");
    QTest::newRow("fractions") << QPointF(10.7, 20.2) << QPointF(110.2, 20.9) << QPointF(60, 20)
                               << QPointF(60, 20);
    QTest::newRow("truncation toward zero")
        << QPointF(-10.7, -5.5) << QPointF(29.9, -5.2) << QPointF(9.5, -5) << QPointF(9.5, -5);
    QTest::newRow("vertical") << QPointF(0, 0) << QPointF(0, 100) << QPointF(50, 0)
                              << QPointF(-50, 100);
}

void TestKrConnectorItem::wireCurve()
{
    QFETCH(QPointF, b);
    QFETCH(QPointF, a);
    QFETCH(QPointF, c1);
    QFETCH(QPointF, c2);
    const QPainterPath path = KrWireItem::curve(b, a);
    QCOMPARE(path.elementCount(), 4);
    QCOMPARE(QPointF(path.elementAt(0)), QPointF(int(b.x()), int(b.y())));
    QCOMPARE(QPointF(path.elementAt(1)), c1);
    QCOMPARE(QPointF(path.elementAt(2)), c2);
    // The end is the point itself, not rounded.
    QCOMPARE(QPointF(path.elementAt(3)), a);
}

void TestKrConnectorItem::generatedColorAvoidsWindow()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    KrBrickParam* out = p.a->getParameter(0);
    const QColor far = KrConnectorItem::generatedColor(out, QColor(Qt::black));
    const QColor farAgain = KrConnectorItem::generatedColor(out, QColor(Qt::black));
    QCOMPARE(far, farAgain);
    QCOMPARE(far.alpha(), 255);
    // A window of exactly that colour: one component moves by about 0.1 (25 or 26 of 255).
    const QColor nudged = KrConnectorItem::generatedColor(out, far);
    const int dr = qAbs(nudged.red() - far.red());
    const int dg = qAbs(nudged.green() - far.green());
    const int db = qAbs(nudged.blue() - far.blue());
    QCOMPARE((dr > 0) + (dg > 0) + (db > 0), 1);
    QVERIFY(qMax(dr, qMax(dg, db)) >= 25 && qMax(dr, qMax(dg, db)) <= 26);
    // A brick of another id gets another colour.
    KrConnectorItem* plugA = h.plug(p.a, QStringLiteral("out"));
    KrConnectorItem* plugB = h.plug(p.b, QStringLiteral("res"));
    QVERIFY(plugA->getColor() != plugB->getColor());
}

void TestKrConnectorItem::storedColorSurvivesRebuild()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    KrSettings* settings = p.a->getBrickSettings();
    // Showing a plug stores nothing: only a chosen colour is kept.
    QVERIFY(!settings->getSettingsValue(QStringLiteral("BrickParams")));
    KrConnectorItem* plug = h.plug(p.a, QStringLiteral("col"));
    plug->setColor(QColor(10, 200, 30));
    const KrSettings* record = settings->getSettingsValue(QStringLiteral("BrickParams"))
                                   ->getSettingsValue(QStringLiteral("Param_1"))
                                   ->getSettingsValue(QStringLiteral("ConnectionColor"));
    QVERIFY(record);
    QCOMPARE(record->getFloatValue(QStringLiteral("Green")), 200.0);

    h.scene->findBrick(p.a->getBrickID())->doConnections();
    krSceneSettle();
    KrConnectorItem* rebuilt = h.plug(p.a, QStringLiteral("col"));
    QVERIFY(rebuilt && rebuilt != plug);
    QCOMPARE(rebuilt->getColor(), QColor(10, 200, 30));
    QCOMPARE(h.plug(p.a, QStringLiteral("out"))->getColor(),
             KrConnectorItem::generatedColor(
                 p.a->getParameter(0),
                 h.scene->findBrick(p.a->getBrickID())->palette().color(QPalette::Window)));
}

void TestKrConnectorItem::wireBelongsToInput_data()
{
    QTest::addColumn<bool>("fromOutput");
    QTest::newRow("output to input") << true;
    QTest::newRow("input to output") << false;
}

void TestKrConnectorItem::wireBelongsToInput()
{
    QFETCH(bool, fromOutput);
    KrSceneHarness h;
    Pair p = makePair(h);
    KrBrickParam* out = p.a->getParameter(0);
    KrBrickParam* in = p.b->getParameter(0);
    QVERIFY(fromOutput ? h.scene->connectParameters(out, in) : h.scene->connectParameters(in, out));
    krSceneSettle();
    KrConnectorItem* outPlug = h.plug(p.a, QStringLiteral("out"));
    KrConnectorItem* inPlug = h.plug(p.b, QStringLiteral("in"));
    QVERIFY(!outPlug->getWire());
    QCOMPARE(inPlug->getTarget(), outPlug);
    QVERIFY(inPlug->getWire()->isVisible());
    QVERIFY(inPlug->getArrowHead()->isVisible());
    const QPen pen = inPlug->getWire()->pen();
    QCOMPARE(pen.widthF(), 2.0);
    QCOMPARE(pen.capStyle(), Qt::RoundCap);
    QCOMPARE(pen.color(), outPlug->getColor());
    // The input shows the colour of what feeds it without taking it as its own.
    QCOMPARE(inPlug->getPlugCircle()->brush().color(), outPlug->getColor());
    QVERIFY(inPlug->getColor() != outPlug->getColor());
    // Right to left: the curve starts at the input and ends at the output.
    const QPainterPath path = inPlug->getWire()->path();
    QCOMPARE(path.pointAtPercent(1), outPlug->getConnectPoint());
}

void TestKrConnectorItem::wireFollowsBricks()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    QVERIFY(h.scene->connectParameters(p.a->getParameter(0), p.b->getParameter(0)));
    krSceneSettle();
    KrConnectorItem* outPlug = h.plug(p.a, QStringLiteral("out"));
    KrConnectorItem* inPlug = h.plug(p.b, QStringLiteral("in"));
    h.scene->findBrick(p.a->getBrickID())->setPos(700, 400);
    QCOMPARE(inPlug->getWire()->path().pointAtPercent(1), outPlug->getConnectPoint());
    h.scene->findBrick(p.b->getBrickID())->setPos(50, 300);
    QCOMPARE(inPlug->getWire()->path().elementAt(0).x, qreal(int(inPlug->getConnectPoint().x())));
    QCOMPARE(inPlug->getWire()->path().pointAtPercent(1), outPlug->getConnectPoint());
}

void TestKrConnectorItem::wireReattachesAfterSourceRebuild()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    QVERIFY(h.scene->connectParameters(p.a->getParameter(0), p.b->getParameter(0)));
    krSceneSettle();
    KrConnectorItem* inPlug = h.plug(p.b, QStringLiteral("in"));
    KrBrickGraphicsItem* source = h.scene->findBrick(p.a->getBrickID());
    // The feeding plug goes: the wire hides until the rebuild finds the connection again.
    source->clearConnectorItems();
    QVERIFY(!inPlug->getTarget());
    QVERIFY(!inPlug->getWire()->isVisible());
    source->doConnections();
    krSceneSettle();
    QCOMPARE(inPlug->getTarget(), h.plug(p.a, QStringLiteral("out")));
    QVERIFY(inPlug->getWire()->isVisible());
}

void TestKrConnectorItem::dropConnects()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    const int before = undoStack()->count();
    KrConnectorItem* inPlug = h.plug(p.b, QStringLiteral("in"));
    QVERIFY(dropParam(h.scene, p.a->getParameter(0), circleCenter(inPlug)));
    QVERIFY(p.b->getParameter(0)->isConnectedTo(p.a->getParameter(0)));
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Brick Connection..."));
    QVERIFY(!h.scene->getWireItem()->isVisible());
    KrBrickGraphicsItem* target = h.scene->findBrick(p.b->getBrickID());
    const int rebuilds = target->getConnectorRebuildCount();
    for (int round = 0; round < 2; ++round) {
        undoStack()->undo();
        QCOMPARE(p.b->getParameter(0)->getNumConnections(), 0);
        undoStack()->redo();
        QVERIFY(p.b->getParameter(0)->isConnectedTo(p.a->getParameter(0)));
    }
    krSceneSettle();
    QCOMPARE(target->getConnectorRebuildCount(), rebuilds);
    QVERIFY(inPlug->getWire()->isVisible());
}

void TestKrConnectorItem::dropReplacingSourceKeepsOldWireForUndo()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    auto* other = new KrSceneTestBrick(QStringLiteral("Other"));
    other->addOutput(QStringLiteral("out"));
    h.add(other, QPointF(500, 400));
    KrBrickParam* in = p.b->getParameter(0);
    QVERIFY(h.scene->connectParameters(p.a->getParameter(0), in));
    krSceneSettle();
    const int before = undoStack()->count();
    QVERIFY(dropParam(h.scene, other->getParameter(0), circleCenter(h.plug(p.b, "in"))));
    QCOMPARE(in->getSource(), other->getParameter(0));
    QCOMPARE(p.a->getParameter(0)->getNumConnections(), 0);
    QCOMPARE(undoStack()->count(), before + 1);
    undoStack()->undo();
    QCOMPARE(in->getSource(), p.a->getParameter(0));
    QCOMPARE(other->getParameter(0)->getNumConnections(), 0);
    krSceneSettle();
    QCOMPARE(h.plug(p.b, "in")->getTarget(), h.plug(p.a, "out"));
    undoStack()->redo();
    QCOMPARE(in->getSource(), other->getParameter(0));
}

void TestKrConnectorItem::dropRefused_data()
{
    QTest::addColumn<QString>("source");
    QTest::addColumn<QString>("target");
    QTest::newRow("color into float") << "a:col"
                                      << "b:in";
    QTest::newRow("own brick") << "b:res"
                               << "b:in2";
    QTest::newRow("output on output") << "a:out"
                                      << "b:res";
}

void TestKrConnectorItem::dropRefused()
{
    QFETCH(QString, source);
    QFETCH(QString, target);
    KrSceneHarness h;
    Pair p = makePair(h);
    auto brickOf = [&](const QString& which) { return which.startsWith('a') ? p.a : p.b; };
    KrBrickParam* sourceParam = brickOf(source)->findParameterByArg(source.mid(2));
    KrConnectorItem* targetPlug = h.plug(brickOf(target), target.mid(2));
    QVERIFY(sourceParam && targetPlug);
    const int before = undoStack()->count();
    QVERIFY(!dropParam(h.scene, sourceParam, circleCenter(targetPlug)));
    QCOMPARE(targetPlug->getParam()->getNumConnections(), 0);
    QCOMPARE(undoStack()->count(), before);
}

void TestKrConnectorItem::shiftClickConnects()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    const int before = undoStack()->count();
    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::ShiftModifier,
                      h.viewPointOf(h.plug(p.a, "out")));
    QVERIFY(h.scene->isConnectMode());
    QCOMPARE(h.scene->getConnectionItem(), h.plug(p.a, "out"));
    // The wire follows the pointer.
    krSceneMouse(h.view, QEvent::MouseMove, QPoint(300, 300), Qt::NoButton);
    QVERIFY(h.scene->getWireItem()->isVisible());
    QCOMPARE(h.scene->getWireItem()->zValue(), 25.0);
    QCOMPARE(h.scene->getWireItem()->pen().style(), Qt::DashLine);

    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::ShiftModifier,
                      h.viewPointOf(h.plug(p.b, "in")));
    QVERIFY(!h.scene->isConnectMode());
    QVERIFY(!h.scene->getWireItem()->isVisible());
    QVERIFY(p.b->getParameter(0)->isConnectedTo(p.a->getParameter(0)));
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Brick Connection..."));
    undoStack()->undo();
    QCOMPARE(p.b->getParameter(0)->getNumConnections(), 0);

    // Shift+click on empty space ends connect mode; nothing holds the mouse afterwards.
    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::ShiftModifier,
                      h.viewPointOf(h.plug(p.a, "out")));
    QVERIFY(h.scene->isConnectMode());
    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::ShiftModifier, QPoint(5, 790));
    QVERIFY(!h.scene->isConnectMode());
    QVERIFY(!h.scene->mouseGrabberItem());
}

void TestKrConnectorItem::shiftClickRefusedPairMakesNoStep()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    const int before = undoStack()->count();
    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::ShiftModifier,
                      h.viewPointOf(h.plug(p.a, "col")));
    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::ShiftModifier,
                      h.viewPointOf(h.plug(p.b, "in")));
    QVERIFY(!h.scene->isConnectMode());
    QCOMPARE(p.b->getParameter(0)->getNumConnections(), 0);
    QCOMPARE(undoStack()->count(), before);
}

void TestKrConnectorItem::disconnectMenu()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    auto* third = new KrSceneTestBrick(QStringLiteral("Third"));
    third->addInput(QStringLiteral("in"));
    h.add(third, QPointF(100, 400));
    KrBrickParam* out = p.a->getParameter(0);
    QVERIFY(h.scene->connectParameters(out, p.b->getParameter(0)));
    QVERIFY(h.scene->connectParameters(out, p.b->getParameter(1)));
    QVERIFY(h.scene->connectParameters(out, third->getParameter(0)));
    krSceneSettle();
    const int before = undoStack()->count();

    QStringList entries;
    QTimer::singleShot(50, [&] {
        auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
        if (!menu)
            return;
        for (QAction* action : menu->actions())
            entries << (action->isSeparator() ? QStringLiteral("-") : action->text());
        menu->actions().first()->trigger();
        menu->close();
    });
    const QPoint at = h.viewPointOf(h.plug(p.a, "out"));
    QContextMenuEvent event(QContextMenuEvent::Mouse, at, h.view->viewport()->mapToGlobal(at));
    QApplication::sendEvent(h.view->viewport(), &event);
    krSceneSettle();
    QCOMPARE(entries, QStringList({"Disconnect", "-", "Connector Color"}));
    QCOMPARE(out->getNumConnections(), 0);
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Brick Disconnect..."));
    QCOMPARE(undoStack()->stepSize(undoStack()->count() - 1), 3 * 24);
    undoStack()->undo();
    QCOMPARE(out->getNumConnections(), 3);
    QVERIFY(third->getParameter(0)->isConnectedTo(out));
}

void TestKrConnectorItem::disconnectWithoutWiresLeavesStack()
{
    KrSceneHarness h;
    Pair p = makePair(h);
    const int before = undoStack()->count();
    h.plug(p.b, "in")->disconnectParam();
    QCOMPARE(undoStack()->count(), before);
}

void TestKrConnectorItem::connectorColorDialog_data()
{
    QTest::addColumn<bool>("accept");
    QTest::newRow("chosen") << true;
    QTest::newRow("cancelled") << false;
}

void TestKrConnectorItem::connectorColorDialog()
{
    QFETCH(bool, accept);
    KrSceneHarness h;
    Pair p = makePair(h);
    QVERIFY(h.scene->connectParameters(p.a->getParameter(0), p.b->getParameter(0)));
    krSceneSettle();
    KrConnectorItem* out = h.plug(p.a, "out");
    const QColor before = out->getColor();
    const QColor chosen(12, 34, 56);
    bool handled = false;
    krOnNextModal(
        [&](QWidget* modal) {
            auto* dialog = qobject_cast<QColorDialog*>(modal);
            QVERIFY(dialog);
            QCOMPARE(dialog->currentColor(), before);
            dialog->setCurrentColor(chosen);
            if (accept)
                dialog->accept();
            else
                dialog->reject();
        },
        &handled);
    QTimer::singleShot(50, [&] {
        if (auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget())) {
            menu->actions().last()->trigger();
            menu->close();
        }
    });
    const QPoint at = h.viewPointOf(out);
    QContextMenuEvent event(QContextMenuEvent::Mouse, at, h.view->viewport()->mapToGlobal(at));
    QApplication::sendEvent(h.view->viewport(), &event);
    krSceneSettle();
    QVERIFY(handled);
    const QColor expected = accept ? chosen : before;
    QCOMPARE(out->getColor(), expected);
    // The wire it feeds takes the colour at once.
    QCOMPARE(h.plug(p.b, "in")->getWire()->pen().color(), expected);
    QCOMPARE(p.a->getBrickSettings()->getSettingsValue(QStringLiteral("BrickParams")) != nullptr,
             accept);
}

void TestKrConnectorItem::temporaryWireDirection_data()
{
    QTest::addColumn<bool>("rightToLeft");
    QTest::addColumn<bool>("fromOutput");
    QTest::addColumn<bool>("startsAtPointer");
    QTest::newRow("rtl, output") << true << true << true;
    QTest::newRow("rtl, input") << true << false << false;
    QTest::newRow("ltr, output") << false << true << false;
    QTest::newRow("ltr, input") << false << false << true;
}

void TestKrConnectorItem::temporaryWireDirection()
{
    QFETCH(bool, rightToLeft);
    QFETCH(bool, fromOutput);
    QFETCH(bool, startsAtPointer);
    KrSceneHarness h;
    h.scene->setIsRightToLeft(rightToLeft);
    Pair p = makePair(h);
    KrConnectorItem* start = fromOutput ? h.plug(p.a, "out") : h.plug(p.b, "in");
    h.scene->setConnectMode(true, start, start->getConnectPoint(), fromOutput);
    const QPoint pointer(600, 600);
    krSceneMouse(h.view, QEvent::MouseMove, pointer, Qt::NoButton);
    const QPainterPath path = h.scene->getWireItem()->path();
    const QPointF pointerScene = h.view->mapToScene(pointer);
    const QPointF first = path.elementAt(0);
    const QPointF expected = startsAtPointer ? pointerScene : start->getConnectPoint();
    QCOMPARE(first, QPointF(int(expected.x()), int(expected.y())));
    // A wire from an output leaves it toward the side its outputs are on.
    if (fromOutput) {
        const QPointF c = start->getConnectPoint();
        const QPointF control = startsAtPointer ? path.elementAt(2) : path.elementAt(1);
        QCOMPARE(control.x() < c.x(), rightToLeft);
    }
}

QTEST_MAIN(TestKrConnectorItem)
#include "tst_krconnectoritem.moc"
