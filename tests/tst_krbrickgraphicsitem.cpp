#include "app_testsupport.h"
#include "krapp.h"
#include "krbrickframe.h"
#include "krbrickgraphicsitem.h"
#include "krbrickoptionsframe.h"
#include "krbricktitlebar.h"
#include "krbrickuserscene.h"
#include "krconnectoritem.h"
#include "krpreviewnode.h"
#include "krsettings.h"
#include "krundo.h"
#include "scene_testutil.h"

#include <QPushButton>
#include <QSignalSpy>
#include <QtTest>
#include <memory>

namespace {
KrUndoStack* undoStack()
{
    return krApp->getUndoStack();
}

KrSceneTestBrick* makeBrick(const QString& name = QStringLiteral("Test"))
{
    auto* brick = new KrSceneTestBrick(name);
    brick->addInput(QStringLiteral("a"));
    brick->addInput(QStringLiteral("b"), QStringLiteral("color"));
    brick->addInput(QStringLiteral("hidden"), QStringLiteral("float"), true);
    brick->addOutput(QStringLiteral("out"));
    return brick;
}

QPoint titleBarPoint(KrSceneHarness& h, KrBrickGraphicsItem* item)
{
    KrBrickTitleBar* bar = item->getFrame()->getTitleBar();
    const QPoint inFrame = bar->mapTo(item->getFrame(), QPoint(20, bar->height() / 2));
    return h.view->mapFromScene(item->mapToScene(QPointF(inFrame)));
}

// A press at from, moves in steps to to, and a release: a drag as a hand makes it.
void dragInView(KrSceneHarness& h, const QPoint& from, const QPoint& to)
{
    krSceneMouse(h.view, QEvent::MouseButtonPress, from);
    for (int i = 1; i <= 5; ++i)
        krSceneMouse(h.view, QEvent::MouseMove, from + (to - from) * i / 5);
    krSceneMouse(h.view, QEvent::MouseButtonRelease, to);
    krSceneSettle();
}
} // namespace

class TestKrBrickGraphicsItem : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void storedPlace_data();
    void storedPlace();
    void plugsSitOnTheirEdges_data();
    void plugsSitOnTheirEdges();
    void advancedPlugFollowsWires();
    void collapsedPlugsAtMiddle_data();
    void collapsedPlugsAtMiddle();
    void rebuildsCoalesce();
    void selectionTintsFrame();
    void titleBarDragMovesSelectionAsOneStep();
    void titleBarDragStaysInside();
    void directDragMovesBrick();
    void resizeIsOneStep();
    void closeRemovesBrickUnderUndo();
    void preview();
    void previewDisabledForSomeRoots_data();
    void previewDisabledForSomeRoots();
    void drawnAtEveryZoom_data();
    void drawnAtEveryZoom();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrBrickGraphicsItem::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
}

void TestKrBrickGraphicsItem::storedPlace_data()
{
    QTest::addColumn<double>("x");
    QTest::addColumn<double>("y");
    QTest::addColumn<int>("width");
    QTest::addColumn<int>("height");
    QTest::addColumn<QPointF>("pos");
    QTest::addColumn<bool>("sized");
    QTest::newRow("clamped, no size") << -40.0 << 3.0 << 0 << 0 << QPointF(10, 10) << false;
    // Added from its settings as any brick is: at whole units.
    QTest::newRow("kept, sized") << 250.5 << 40.25 << 333 << 420 << QPointF(250, 40) << true;
    QTest::newRow("width only") << 10.0 << 10.0 << 333 << 0 << QPointF(10, 10) << false;
}

void TestKrBrickGraphicsItem::storedPlace()
{
    QFETCH(double, x);
    QFETCH(double, y);
    QFETCH(int, width);
    QFETCH(int, height);
    QFETCH(QPointF, pos);
    QFETCH(bool, sized);
    KrSceneHarness h;
    KrSceneTestBrick* brick = makeBrick();
    KrSettings* settings = brick->getBrickSettings();
    settings->setFloatValue(QStringLiteral("PosX"), x);
    settings->setFloatValue(QStringLiteral("PosY"), y);
    settings->setIntValue(QStringLiteral("Width"), width);
    settings->setIntValue(QStringLiteral("Height"), height);
    h.user->insertBrick(brick); // the scene follows the brick user
    krSceneSettle();
    KrBrickGraphicsItem* item = h.scene->findBrick(brick->getBrickID());
    QVERIFY(item);
    QCOMPARE(item->pos(), pos);
    // The height follows the parameters; the stored width is taken.
    if (sized)
        QCOMPARE(item->getFrame()->width(), width);
    else
        QVERIFY(item->getFrame()->width() != 333);
    // The place it took is what the brick keeps.
    QCOMPARE(settings->getFloatValue(QStringLiteral("PosX")), pos.x());
    QCOMPARE(settings->getFloatValue(QStringLiteral("PosY")), pos.y());
    QCOMPARE(settings->getIntValue(QStringLiteral("Width")), width);
}

void TestKrBrickGraphicsItem::plugsSitOnTheirEdges_data()
{
    QTest::addColumn<bool>("rightToLeft");
    QTest::newRow("right to left") << true;
    QTest::newRow("left to right") << false;
}

void TestKrBrickGraphicsItem::plugsSitOnTheirEdges()
{
    QFETCH(bool, rightToLeft);
    KrSceneHarness h;
    h.scene->setIsRightToLeft(rightToLeft);
    KrSceneTestBrick* brick = makeBrick();
    KrBrickGraphicsItem* item = h.add(brick, QPointF(300, 200));
    QCOMPARE(item->isRightToLeft(), rightToLeft);
    // Two inputs and one output; the advanced input is hidden.
    QCOMPARE(item->getConnectors().size(), 3);
    KrBrickOptionsFrame* options = item->getFrame()->getOptionFrame();
    for (KrConnectorItem* plug : item->getConnectors()) {
        KrBrickParam* param = plug->getParam();
        const QPointF row = options->getParamPosition(param);
        QCOMPARE(plug->pos(), QPointF(row.x(), row.y() - plug->boundingRect().height() / 2));
        const bool onRight = plug->pos().x() > item->getFrame()->width() / 2;
        QCOMPARE(onRight, param->isInput() == rightToLeft);
        // The bar points out of the frame.
        const QPointF connect = item->mapFromScene(plug->getConnectPoint());
        QVERIFY(onRight ? connect.x() > item->getFrame()->width() : connect.x() < 0);
    }
    // Turning the direction round moves the plugs to the other edges.
    h.scene->setIsRightToLeft(!rightToLeft);
    krSceneSettle();
    KrConnectorItem* out = item->getConnector(3);
    QVERIFY(out);
    QCOMPARE(out->pos().x() > item->getFrame()->width() / 2, rightToLeft);
}

void TestKrBrickGraphicsItem::advancedPlugFollowsWires()
{
    KrSceneHarness h;
    KrSceneTestBrick* brick = makeBrick();
    auto* source = new KrSceneTestBrick(QStringLiteral("Source"));
    source->addOutput(QStringLiteral("out"));
    KrBrickGraphicsItem* item = h.add(brick, QPointF(100, 100));
    h.add(source, QPointF(500, 100));
    QVERIFY(!item->getConnector(2));
    // Wired through the model (as an undo would): the plug comes, and the wire with it.
    QVERIFY(brick->addConnection(2, source, 0));
    krSceneSettle();
    KrConnectorItem* plug = item->getConnector(2);
    QVERIFY(plug);
    QVERIFY(plug->getWire()->isVisible());
    brick->getParameter(2)->removeAllConnections();
    krSceneSettle();
    QVERIFY(!item->getConnector(2));
    // Shown advanced parameters have plugs whatever their wires.
    item->getFrame()->getOptionFrame()->setHideAdvanced(false);
    krSceneSettle();
    QVERIFY(item->getConnector(2));
}

void TestKrBrickGraphicsItem::collapsedPlugsAtMiddle_data()
{
    QTest::addColumn<bool>("rightToLeft");
    QTest::newRow("right to left") << true;
    QTest::newRow("left to right") << false;
}

void TestKrBrickGraphicsItem::collapsedPlugsAtMiddle()
{
    QFETCH(bool, rightToLeft);
    KrSceneHarness h;
    h.scene->setIsRightToLeft(rightToLeft);
    KrSceneTestBrick* brick = makeBrick();
    KrBrickGraphicsItem* item = h.add(brick, QPointF(100, 100));
    item->getFrame()->applyHideParams(true);
    krSceneSettle();
    const QRect frame = item->getFrame()->rect();
    const int middle = (frame.top() + frame.bottom()) / 2;
    QCOMPARE(item->getConnectors().size(), 3);
    for (KrConnectorItem* plug : item->getConnectors()) {
        const bool input = plug->getParam()->isInput();
        QCOMPARE(plug->pos().y(), qreal(middle));
        QCOMPARE(plug->pos().x(), input == rightToLeft ? qreal(frame.width()) : 0.0);
    }
}

void TestKrBrickGraphicsItem::rebuildsCoalesce()
{
    KrSceneHarness h;
    KrSceneTestBrick* brick = makeBrick();
    KrBrickGraphicsItem* item = h.add(brick, QPointF(100, 100));
    const int before = item->getConnectorRebuildCount();
    KrConnectorItem* oldPlug = item->getConnector(0);
    QPointer<QObject> guard(oldPlug);
    for (int i = 0; i < 50; ++i)
        emit brick->paramAdded();
    for (int i = 0; i < 50; ++i)
        item->doConnections();
    item->setOutputIsRightToLeft(false);
    item->getFrame()->getOptionFrame()->setHideAdvanced(false);
    // Nothing happens until the posted work runs, and then once.
    QCOMPARE(item->getConnectorRebuildCount(), before);
    QVERIFY(guard);
    krSceneSettle();
    QCOMPARE(item->getConnectorRebuildCount(), before + 1);
    QVERIFY(!guard);
    QCOMPARE(item->getConnectors().size(), 4);
    // A new parameter gets a plug.
    brick->addOutput(QStringLiteral("extra"));
    krSceneSettle();
    QCOMPARE(item->getConnectorRebuildCount(), before + 2);
    QVERIFY(item->getConnector(4));
}

void TestKrBrickGraphicsItem::selectionTintsFrame()
{
    KrSceneHarness h;
    KrBrickGraphicsItem* item = h.add(makeBrick(), QPointF(100, 100));
    const QColor highlight = QApplication::palette().color(QPalette::Highlight);
    item->setSelected(true);
    QCOMPARE(item->getFrame()->palette().color(QPalette::Active, QPalette::Window), highlight);
    QCOMPARE(item->getFrame()->palette().color(QPalette::Inactive, QPalette::Window), highlight);
    item->setSelected(false);
    QCOMPARE(item->getFrame()->palette().color(QPalette::Window),
             QApplication::palette().color(QPalette::Window));
    // A click into the brick selects it and only it.
    KrBrickGraphicsItem* other = h.add(makeBrick(), QPointF(500, 100));
    other->setSelected(true);
    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::NoModifier, titleBarPoint(h, item));
    QVERIFY(item->isSelected());
    QVERIFY(!other->isSelected());
}

void TestKrBrickGraphicsItem::titleBarDragMovesSelectionAsOneStep()
{
    KrSceneHarness h;
    KrBrickGraphicsItem* a = h.add(makeBrick(QStringLiteral("A")), QPointF(100, 100));
    KrBrickGraphicsItem* b = h.add(makeBrick(QStringLiteral("B")), QPointF(400, 100));
    KrBrickGraphicsItem* c = h.add(makeBrick(QStringLiteral("C")), QPointF(700, 100));
    KrBrickGraphicsItem* still = h.add(makeBrick(QStringLiteral("D")), QPointF(700, 400));
    a->setSelected(true);
    b->setSelected(true);
    c->setSelected(true);
    const int before = undoStack()->count();
    const QPoint from = titleBarPoint(h, b);
    dragInView(h, from, from + QPoint(40, 60));

    const QPointF delta = b->pos() - QPointF(400, 100);
    QVERIFY(!delta.isNull());
    QCOMPARE(a->pos(), QPointF(100, 100) + delta);
    QCOMPARE(c->pos(), QPointF(700, 100) + delta);
    QCOMPARE(still->pos(), QPointF(700, 400));
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Move Bricks"));
    QCOMPARE(a->getBrick()->getBrickSettings()->getFloatValue(QStringLiteral("PosX")),
             a->pos().x());

    undoStack()->undo();
    QCOMPARE(a->pos(), QPointF(100, 100));
    QCOMPARE(b->pos(), QPointF(400, 100));
    QCOMPARE(c->pos(), QPointF(700, 100));
    QCOMPARE(b->getBrick()->getBrickSettings()->getFloatValue(QStringLiteral("PosY")), 100.0);
    undoStack()->redo();
    QCOMPARE(c->pos(), QPointF(700, 100) + delta);
}

void TestKrBrickGraphicsItem::titleBarDragStaysInside()
{
    KrSceneHarness h;
    KrBrickGraphicsItem* item = h.add(makeBrick(), QPointF(60, 60));
    const QPoint from = titleBarPoint(h, item);
    dragInView(h, from, from - QPoint(200, 200));
    QCOMPARE(item->pos(), QPointF(10, 10));
    // A click without a move is no step.
    const int before = undoStack()->count();
    QTest::mouseClick(h.view->viewport(), Qt::LeftButton, Qt::NoModifier, titleBarPoint(h, item));
    QCOMPARE(undoStack()->count(), before);
}

void TestKrBrickGraphicsItem::directDragMovesBrick()
{
    KrSceneHarness h;
    KrBrickGraphicsItem* item = h.add(makeBrick(), QPointF(200, 200));
    // The frame's own border: no child widget takes a press there.
    const QPoint from = h.view->mapFromScene(item->mapToScene(QPointF(1, 100)));
    const int before = undoStack()->count();
    dragInView(h, from, from + QPoint(-300, 50));
    QVERIFY(item->isSelected());
    QCOMPARE(item->pos().x(), 10.0);
    QCOMPARE(item->pos().y(), 250.0);
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Move Bricks"));
    undoStack()->undo();
    QCOMPARE(item->pos(), QPointF(200, 200));
}

void TestKrBrickGraphicsItem::resizeIsOneStep()
{
    KrSceneHarness h;
    KrBrickGraphicsItem* item = h.add(makeBrick(), QPointF(200, 200));
    KrBrickFrame* frame = item->getFrame();
    const QSize before = frame->size();
    const int steps = undoStack()->count();
    emit frame->resizeStarted();
    frame->resize(before.width() + 30, before.height());
    frame->resize(before.width() + 60, before.height());
    emit frame->resizeFinished();
    krSceneSettle();
    QCOMPARE(undoStack()->count(), steps + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Resize Brick"));
    KrSettings* settings = item->getBrick()->getBrickSettings();
    QCOMPARE(settings->getIntValue(QStringLiteral("Width")), before.width() + 60);
    // The inputs stay on the edge that moved.
    QCOMPARE(item->getConnector(0)->pos().x(), qreal(frame->width()));
    undoStack()->undo();
    krSceneSettle();
    QCOMPARE(frame->size(), before);
    QCOMPARE(settings->getIntValue(QStringLiteral("Width")), before.width());
    // A press and release on the grip without a change is no step.
    emit frame->resizeStarted();
    emit frame->resizeFinished();
    QCOMPARE(undoStack()->count(), steps + 1);
}

void TestKrBrickGraphicsItem::closeRemovesBrickUnderUndo()
{
    KrSceneHarness h;
    KrSceneTestBrick* brick = makeBrick();
    KrBrickGraphicsItem* item = h.add(brick, QPointF(200, 200));
    const uint id = brick->getBrickID();
    emit item->getFrame()->closeClicked();
    krSceneSettle();
    QVERIFY(!h.scene->findBrick(id));
    QVERIFY(!h.user->findBrick(id));
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Brick delete..."));
    undoStack()->undo();
    krSceneSettle();
    QCOMPARE(h.user->findBrick(id), brick);
    QVERIFY(h.scene->findBrick(id));
    QCOMPARE(h.scene->findBrick(id)->pos(), QPointF(200, 200));
}

void TestKrBrickGraphicsItem::preview()
{
    KrSceneHarness h;
    KrBrickGraphicsItem* item = h.add(makeBrick(), QPointF(200, 300));
    QPushButton* toggle = item->getPreviewToggle();
    QCOMPARE(toggle->text(), QStringLiteral("Preview..."));
    QVERIFY(toggle->isCheckable());
    QVERIFY(toggle->isEnabled());
    // Hidden at first, the toggle right above the frame.
    QVERIFY(!toggle->isChecked());
    QVERIFY(!item->getPreviewProxy()->isVisible());
    const int toggleHeight = int(item->getToggleProxy()->size().height());
    QVERIFY(toggleHeight > 10);
    QCOMPARE(item->getToggleProxy()->pos(), QPointF(0, -toggleHeight));
    toggle->click();
    QVERIFY(item->getPreviewProxy()->isVisible());
    const int side = item->getPreviewWidget()->getItemSize();
    QCOMPARE(side, 133);
    QCOMPARE(item->getPreviewProxy()->pos(), QPointF(0, -side));
    QCOMPARE(item->getToggleProxy()->pos(), QPointF(0, -side - toggleHeight / 2));
    // Behind the frame.
    QVERIFY(item->getPreviewProxy()->flags() & QGraphicsItem::ItemStacksBehindParent);
    QCOMPARE(item->getPreviewProxy()->zValue(), -2.0);
    QCOMPARE(item->getToggleProxy()->zValue(), -1.0);
    item->getPreviewWidget()->setSize(64);
    QCOMPARE(item->getPreviewProxy()->pos(), QPointF(0, -69));
    QCOMPARE(item->getToggleProxy()->pos(), QPointF(0, -69 - toggleHeight / 2));
}

void TestKrBrickGraphicsItem::previewDisabledForSomeRoots_data()
{
    QTest::addColumn<int>("type");
    QTest::addColumn<bool>("enabled");
    QTest::newRow("function") << 0 << true;
    QTest::newRow("surface") << 1 << true;
    QTest::newRow("displacement") << 2 << false;
    QTest::newRow("imager") << 8 << false;
}

void TestKrBrickGraphicsItem::previewDisabledForSomeRoots()
{
    QFETCH(int, type);
    QFETCH(bool, enabled);
    KrSceneHarness h;
    auto* brick = new KrSceneTestBrick(QStringLiteral("Root"), type);
    brick->addInput(QStringLiteral("a"));
    KrBrickGraphicsItem item(brick, h.scene);
    QCOMPARE(item.getPreviewToggle()->isEnabled(), enabled);
    delete brick;
}

void TestKrBrickGraphicsItem::drawnAtEveryZoom_data()
{
    QTest::addColumn<qreal>("zoom");
    QTest::newRow("1 %") << 0.01;
    QTest::newRow("20 %") << 0.2;
    QTest::newRow("100 %") << 1.0;
    QTest::newRow("500 %") << 5.0;
}

void TestKrBrickGraphicsItem::drawnAtEveryZoom()
{
    QFETCH(qreal, zoom);
    KrSceneHarness h(nullptr, QSize(400, 300));
    KrSceneTestBrick* brick = makeBrick();
    auto* source = new KrSceneTestBrick(QStringLiteral("Source"));
    source->addOutput(QStringLiteral("out"));
    KrBrickGraphicsItem* item = h.add(brick, QPointF(100, 100));
    h.add(source, QPointF(600, 300));
    QVERIFY(h.scene->connectParameters(source->getParameter(0), brick->getParameter(0)));
    krSceneSettle();
    item->setSelected(true);
    h.view->setTransform(QTransform::fromScale(zoom, zoom));
    h.view->centerOn(item);
    const QImage image = h.view->viewport()->grab().toImage();
    const QColor highlight = QApplication::palette().color(QPalette::Highlight);
    int tinted = 0;
    for (int y = 0; y < image.height(); ++y) {
        for (int x = 0; x < image.width(); ++x)
            tinted += QColor(image.pixel(x, y)) == highlight;
    }
    // The selected brick shows plainly at every zoom: at least its outline, a few pixels.
    QVERIFY2(tinted >= 4, qPrintable(QString::number(tinted)));
}

QTEST_MAIN(TestKrBrickGraphicsItem)
#include "tst_krbrickgraphicsitem.moc"
