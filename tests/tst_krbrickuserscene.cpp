#include "app_testsupport.h"
#include "krapp.h"
#include "krbrickfactory.h"
#include "krbrickfactorymenu.h"
#include "krbrickframe.h"
#include "krbrickgraphicsitem.h"
#include "krbrickgroup.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickset.h"
#include "krbrickuserscene.h"
#include "krclassfactory.h"
#include "krconnectoritem.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krmainwindow.h"
#include "krsettings.h"
#include "krundo.h"
#include "pane_testsupport.h"
#include "scene_testutil.h"

#include <QGraphicsSceneDragDropEvent>
#include <QMenu>
#include <QMimeData>
#include <QPointer>
#include <QRandomGenerator>
#include <QSignalSpy>
#include <QStandardItemModel>
#include <QtTest>
#include <memory>

namespace {
KrUndoStack* undoStack()
{
    return krApp->getUndoStack();
}

KrSceneTestBrick* chainBrick(const QString& name)
{
    auto* brick = new KrSceneTestBrick(name);
    brick->addInput(QStringLiteral("in"));
    brick->addOutput(QStringLiteral("out"));
    return brick;
}

// A brick whose frame has exactly the size given, for the arrangement numbers.
KrBrickGraphicsItem* sizedBrick(KrSceneHarness& h, KrShaderBrick* brick, QSize size,
                                QPointF pos = QPointF(600, 600))
{
    KrBrickGraphicsItem* item = h.add(brick, pos);
    item->getFrame()->setFixedSize(size);
    krSceneSettle();
    return item;
}

bool sendDrag(KrBrickUserScene* scene, QEvent::Type type, QMimeData* data, const QPointF& pos)
{
    QGraphicsSceneDragDropEvent event(type);
    event.setScenePos(pos);
    event.setMimeData(data);
    event.setPossibleActions(Qt::CopyAction | Qt::MoveAction);
    event.setProposedAction(Qt::CopyAction);
    event.setDropAction(Qt::CopyAction);
    event.setAccepted(false);
    QCoreApplication::sendEvent(scene, &event);
    return event.isAccepted();
}

void selectOnly(KrBrickUserScene* scene, const QList<KrShaderBrick*>& bricks)
{
    scene->clearSelection();
    for (KrShaderBrick* brick : bricks)
        scene->findBrick(brick->getBrickID())->setSelected(true);
}

void invoke(KrBrickUserScene* scene, const char* slot)
{
    QVERIFY(QMetaObject::invokeMethod(scene, slot));
    krSceneSettle();
}
} // namespace

class TestKrBrickUserScene : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void addClampsAndRecords_data();
    void addClampsAndRecords();
    void refusedBrickMakesNothing();
    void followsTheBrickUser();
    void idChangeRefilesItem();
    void deleteSelectedIsOneStep();
    void deleteKey();
    void selectAllAndEscapeKeys();
    void undoAfterSceneClosedDoesNothing();
    void removedConnectionWithoutSourceUndoesNothing();
    void arrangeTree();
    void arrangeTwoSetsAndLeftToRight();
    void arrangeSharedFeedersOnce();
    void arrangedBricksDoNotOverlap_data();
    void arrangedBricksDoNotOverlap();
    void arrangeManyKeepsSceneSearchable();
    void flipStaysInside_data();
    void flipStaysInside();
    void flipWithDirectionIsOneStep();
    void depth_data();
    void depth();
    void groupThreeBricks();
    void groupLeavesRootsOut();
    void contextMenuOnEmptySpace();
    void contextMenuOfWindow();
    void rightPressKeepsSelection();
    void ctrlDragScrolls();
    void dropFromLibrary_data();
    void dropFromLibrary();
    void itemModelReader();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrBrickUserScene::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
}

void TestKrBrickUserScene::addClampsAndRecords_data()
{
    QTest::addColumn<QPointF>("at");
    QTest::addColumn<QPointF>("placed");
    QTest::newRow("above and left") << QPointF(3, -20) << QPointF(10, 10);
    QTest::newRow("fractions") << QPointF(250.7, 40.2) << QPointF(250, 40);
    QTest::newRow("just inside") << QPointF(10, 10.9) << QPointF(10, 10);
}

void TestKrBrickUserScene::addClampsAndRecords()
{
    QFETCH(QPointF, at);
    QFETCH(QPointF, placed);
    KrSceneHarness h;
    KrSceneTestBrick* brick = chainBrick(QStringLiteral("A"));
    const int before = undoStack()->count();
    KrBrickGraphicsItem* item = h.add(brick, at);
    QVERIFY(item);
    QCOMPARE(item->pos(), placed);
    QCOMPARE(item->zValue(), 9.0);
    QCOMPARE(brick->getBrickSettings()->getFloatValue(QStringLiteral("PosX")), placed.x());
    QCOMPARE(brick->getBrickSettings()->getFloatValue(QStringLiteral("PosY")), placed.y());
    // One item, though the brick user told the scene about the brick while it was added.
    QCOMPARE(h.scene->getItemsById().size(), 1);
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Add Brick"));

    const uint id = brick->getBrickID();
    QPointer<KrShaderBrick> guard(brick);
    undoStack()->undo();
    krSceneSettle();
    QVERIFY(guard);
    QVERIFY(!h.user->findBrick(id));
    QVERIFY(!h.scene->findBrick(id));
    undoStack()->redo();
    krSceneSettle();
    QCOMPARE(h.user->findBrick(id), brick);
    QCOMPARE(h.scene->findBrick(id)->pos(), placed);
}

void TestKrBrickUserScene::refusedBrickMakesNothing()
{
    KrSceneHarness h(new KrSceneTestUser(1));
    auto* root = new KrSceneTestBrick(QStringLiteral("Root"), 1);
    QVERIFY(h.add(root, QPointF(100, 100)));
    // The only brick set has its root: a second one is refused.
    auto* second = new KrSceneTestBrick(QStringLiteral("Second"), 1);
    second->ref();
    const int before = undoStack()->count();
    QVERIFY(!h.add(second, QPointF(100, 300)));
    QCOMPARE(h.scene->getItemsById().size(), 1);
    QCOMPARE(undoStack()->count(), before);
    second->unref();
    QVERIFY(!h.add(nullptr, QPointF(100, 300)));
}

void TestKrBrickUserScene::followsTheBrickUser()
{
    KrSceneHarness h;
    KrSceneTestBrick* brick = chainBrick(QStringLiteral("A"));
    brick->getBrickSettings()->setFloatValue(QStringLiteral("PosX"), 321);
    brick->getBrickSettings()->setFloatValue(QStringLiteral("PosY"), 123);
    const int before = undoStack()->count();
    const uint id = h.user->insertBrick(brick);
    krSceneSettle();
    QVERIFY(h.scene->findBrick(id));
    QCOMPARE(h.scene->findBrick(id)->pos(), QPointF(321, 123));
    // Not an edit of this scene.
    QCOMPARE(undoStack()->count(), before);
    brick->ref();
    h.user->takeBrick(brick);
    krSceneSettle();
    QVERIFY(!h.scene->findBrick(id));
    // Taken by the model, not by the scene: no step of the scene's.
    QCOMPARE(undoStack()->count(), before);
    brick->unref();
}

void TestKrBrickUserScene::idChangeRefilesItem()
{
    KrSceneHarness h;
    KrSceneTestBrick* brick = chainBrick(QStringLiteral("A"));
    KrBrickGraphicsItem* item = h.add(brick, QPointF(100, 100));
    const uint old = brick->getBrickID();
    brick->setBrickID(old + 40);
    QCOMPARE(h.scene->findBrick(old + 40), item);
    QVERIFY(!h.scene->findBrick(old));
    QVERIFY(!h.scene->findBrick(9999));
}

void TestKrBrickUserScene::deleteSelectedIsOneStep()
{
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    KrSceneTestBrick* b = chainBrick(QStringLiteral("B"));
    KrSceneTestBrick* c = chainBrick(QStringLiteral("C"));
    KrSceneTestBrick* kept = chainBrick(QStringLiteral("Kept"));
    h.add(a, QPointF(100, 100));
    h.add(b, QPointF(400, 100));
    h.add(c, QPointF(700, 100));
    h.add(kept, QPointF(700, 400));
    QVERIFY(h.scene->connectParameters(a->getParameter(1), b->getParameter(0)));
    QVERIFY(h.scene->connectParameters(b->getParameter(1), c->getParameter(0)));
    QVERIFY(h.scene->connectParameters(c->getParameter(1), kept->getParameter(0)));
    krSceneSettle();
    const QList<uint> ids = {a->getBrickID(), b->getBrickID(), c->getBrickID()};
    const QString record = krSceneRecord(h.user);
    const int before = undoStack()->count();

    // Views of the brick user's properties are told once per step, not once per brick.
    QSignalSpy exposed(h.user->getBrickContainer(), &KrBrickContainer::exposedPropertiesChanged);
    selectOnly(h.scene, {a, b, c});
    const QPointer<KrBrickGraphicsItem> item = h.scene->findBrick(ids[1]);
    QVERIFY(QMetaObject::invokeMethod(h.scene, "deleteSelected"));
    QCOMPARE(exposed.count(), 1);
    // The items go later, all together: one of them may be handling the event that deletes.
    QVERIFY(item);
    QVERIFY(!item->scene());
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(!item);
    krSceneSettle();
    QCOMPARE(h.scene->getItemsById().size(), 1);
    QCOMPARE(h.user->getBricks().size(), 1);
    QCOMPARE(kept->getParameter(0)->getNumConnections(), 0);
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Delete Bricks"));
    // The focus went to the scene's holder, away from the deleted bricks.
    QCOMPARE(h.scene->focusItem(), h.scene->getFocusHolder());

    exposed.clear();
    undoStack()->undo();
    QCOMPARE(exposed.count(), 1);
    krSceneSettle();
    for (uint id : ids)
        QVERIFY(h.scene->findBrick(id));
    QCOMPARE(h.scene->findBrick(ids[1])->pos(), QPointF(400, 100));
    QVERIFY(c->getParameter(0)->isConnectedTo(b->getParameter(1)));
    QVERIFY(kept->getParameter(0)->isConnectedTo(c->getParameter(1)));
    QCOMPARE(krSceneRecord(h.user), record);
    QVERIFY(h.plug(kept, "in")->getWire()->isVisible());

    undoStack()->redo();
    krSceneSettle();
    QCOMPARE(h.user->getBricks().size(), 1);
    undoStack()->undo();
    krSceneSettle();
    QCOMPARE(krSceneRecord(h.user), record);
}

void TestKrBrickUserScene::deleteKey()
{
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    h.add(a, QPointF(100, 100));
    selectOnly(h.scene, {a});
    h.view->setFocus();
    h.scene->setFocusItem(h.scene->getFocusHolder());
    QTest::keyClick(h.view->viewport(), Qt::Key_Delete);
    krSceneSettle();
    QVERIFY(h.scene->getItemsById().isEmpty());
}

void TestKrBrickUserScene::selectAllAndEscapeKeys()
{
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    KrSceneTestBrick* b = chainBrick(QStringLiteral("B"));
    h.add(a, QPointF(100, 100));
    h.add(b, QPointF(400, 100));
    h.view->setFocus();
    h.scene->setFocusItem(h.scene->getFocusHolder());

    QTest::keyClick(h.view->viewport(), Qt::Key_A, Qt::ControlModifier);
    QCOMPARE(h.scene->getSelectedBricks().size(), 2);

    // Escape first gives up a connection begun with Shift+click, then the selection.
    h.scene->setConnectMode(true, h.plug(a, QStringLiteral("out")), QPointF(), true);
    QVERIFY(h.scene->isConnectMode());
    QTest::keyClick(h.view->viewport(), Qt::Key_Escape);
    QVERIFY(!h.scene->isConnectMode());
    QCOMPARE(h.scene->getSelectedBricks().size(), 2);
    QTest::keyClick(h.view->viewport(), Qt::Key_Escape);
    QVERIFY(h.scene->getSelectedBricks().isEmpty());
    QCOMPARE(h.scene->getItemsById().size(), 2);
}

void TestKrBrickUserScene::undoAfterSceneClosedDoesNothing()
{
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    KrSceneTestBrick* b = chainBrick(QStringLiteral("B"));
    h.add(a, QPointF(100, 100));
    h.add(b, QPointF(400, 100));
    QVERIFY(h.scene->connectParameters(a->getParameter(1), b->getParameter(0)));
    selectOnly(h.scene, {a});
    invoke(h.scene, "deleteSelected");
    QVERIFY(h.scene->getNumUndoItems() > 0);
    const QString record = krSceneRecord(h.user);
    const int steps = undoStack()->count();

    h.closeScene();
    while (undoStack()->canUndo())
        undoStack()->undo();
    krSceneSettle();
    QCOMPARE(krSceneRecord(h.user), record);
    while (undoStack()->canRedo())
        undoStack()->redo();
    QCOMPARE(krSceneRecord(h.user), record);
    QCOMPARE(undoStack()->count(), steps);
}

void TestKrBrickUserScene::removedConnectionWithoutSourceUndoesNothing()
{
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    KrSceneTestBrick* b = chainBrick(QStringLiteral("B"));
    h.add(a, QPointF(100, 100));
    h.add(b, QPointF(400, 100));
    KrConnectionRemovedItem item(h.scene, b->getBrickID(), 777, 0, 1);
    item.undo();
    QCOMPARE(b->getParameter(0)->getNumConnections(), 0);
    KrConnectionRemovedItem real(h.scene, b->getBrickID(), a->getBrickID(), 0, 1);
    real.undo();
    QVERIFY(b->getParameter(0)->isConnectedTo(a->getParameter(1)));
    real.redo();
    QCOMPARE(b->getParameter(0)->getNumConnections(), 0);
    QCOMPARE(item.size(), 24);
    QCOMPARE(KrBrickDeleteUndoItem(a, h.scene).size(), 12);
}

void TestKrBrickUserScene::arrangeTree()
{
    KrSceneHarness h;
    auto* root = new KrSceneTestBrick(QStringLiteral("Root"), 1);
    root->addInput(QStringLiteral("x"));
    root->addInput(QStringLiteral("y"));
    KrSceneTestBrick* first = chainBrick(QStringLiteral("First"));
    KrSceneTestBrick* second = chainBrick(QStringLiteral("Second"));
    KrSceneTestBrick* grand = chainBrick(QStringLiteral("Grand"));
    KrBrickGraphicsItem* rootItem = sizedBrick(h, root, QSize(120, 80));
    KrBrickGraphicsItem* firstItem = sizedBrick(h, first, QSize(100, 60));
    KrBrickGraphicsItem* secondItem = sizedBrick(h, second, QSize(100, 40));
    KrBrickGraphicsItem* grandItem = sizedBrick(h, grand, QSize(100, 30));
    QVERIFY(root->addConnection(0, first, 1));
    QVERIFY(root->addConnection(1, second, 1));
    QVERIFY(second->addConnection(0, grand, 1));
    krSceneSettle();
    QCOMPARE(h.user->getBrickSet(0)->getRoot(), root);

    const int before = undoStack()->count();
    h.scene->autoArrange();
    QCOMPARE(rootItem->pos(), QPointF(10, 148));
    QCOMPARE(firstItem->pos(), QPointF(190, 148));
    QCOMPARE(secondItem->pos(), QPointF(190, 228));
    // A brick's feeders start level with it.
    QCOMPARE(grandItem->pos(), QPointF(340, 228));
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Auto Arrange"));
    // The wires followed the bricks they join.
    auto wireJoins = [&](KrShaderBrick* consumer, const char* in, KrShaderBrick* feeder) {
        KrConnectorItem* input = h.plug(consumer, in);
        return input && input->getWire()->path().pointAtPercent(1) ==
                            h.plug(feeder, "out")->getConnectPoint();
    };
    QVERIFY(wireJoins(root, "x", first));
    QVERIFY(wireJoins(second, "in", grand));
    undoStack()->undo();
    QVERIFY(wireJoins(root, "y", second));
    QCOMPARE(rootItem->pos(), QPointF(600, 600));
    QCOMPARE(grandItem->pos(), QPointF(600, 600));
    QCOMPARE(grand->getBrickSettings()->getFloatValue(QStringLiteral("PosX")), 600.0);
    // Arranging what is arranged already is no step.
    undoStack()->redo();
    h.scene->autoArrange();
    QCOMPARE(undoStack()->count(), before + 1);

    int yMax = 148;
    h.scene->arrangeChildren(root, 190, 148, yMax);
    QCOMPARE(yMax, 288);

    // Arranged while its window is not shown yet (as a window opens): no step.
    undoStack()->undo();
    h.view->hide();
    h.scene->autoArrange();
    QCOMPARE(rootItem->pos(), QPointF(10, 148));
    QCOMPARE(undoStack()->count(), before + 1);
    QVERIFY(undoStack()->canRedo());
}

void TestKrBrickUserScene::arrangeTwoSetsAndLeftToRight()
{
    KrSceneHarness h(new KrSceneTestUser(2));
    auto* root1 = new KrSceneTestBrick(QStringLiteral("R1"), 1);
    auto* root2 = new KrSceneTestBrick(QStringLiteral("R2"), 1);
    root2->addInput(QStringLiteral("in"));
    KrSceneTestBrick* child = chainBrick(QStringLiteral("Child"));
    KrBrickGraphicsItem* item1 = sizedBrick(h, root1, QSize(120, 100), QPointF(400, 400));
    KrBrickGraphicsItem* item2 = sizedBrick(h, root2, QSize(120, 100), QPointF(500, 500));
    KrBrickGraphicsItem* childItem = sizedBrick(h, child, QSize(100, 50), QPointF(700, 700));
    QVERIFY(root2->addConnection(0, child, 1));
    h.scene->autoArrange();
    // The second tree goes below the first.
    QCOMPARE(item1->pos(), QPointF(10, 148));
    QCOMPARE(item2->pos(), QPointF(10, 268));
    QCOMPARE(childItem->pos(), QPointF(190, 268));

    // Left to right: the arrangement ends mirrored, roots to the right of their children.
    h.scene->setIsRightToLeft(false);
    h.scene->autoArrange();
    QVERIFY(item2->pos().x() > childItem->pos().x());
    QVERIFY(childItem->pos().x() >= 10);
    QCOMPARE(item2->pos().y(), 268.0);
}

void TestKrBrickUserScene::arrangeSharedFeedersOnce()
{
    // Every level feeds both bricks of the level below it: 2^24 paths lead to the last level.
    KrSceneHarness h;
    auto twoInputs = [](const QString& name, int type) {
        auto* brick = new KrSceneTestBrick(name, type);
        brick->addInput(QStringLiteral("in1"));
        brick->addInput(QStringLiteral("in2"));
        if (type == 0)
            brick->addOutput(QStringLiteral("out"));
        return brick;
    };
    KrSceneTestBrick* root = twoInputs(QStringLiteral("Root"), 1);
    QList<KrShaderBrick*> below = {root};
    QList<KrBrickGraphicsItem*> items = {sizedBrick(h, root, QSize(100, 50))};
    for (int level = 0; level < 24; ++level) {
        QList<KrShaderBrick*> current;
        for (int j = 0; j < 2; ++j) {
            KrSceneTestBrick* brick = twoInputs(QStringLiteral("L%1").arg(level), 0);
            items << sizedBrick(h, brick, QSize(100, 50));
            for (KrShaderBrick* consumer : qAsConst(below))
                QVERIFY(consumer->addConnection(j, brick, 2));
            current << brick;
        }
        below = current;
    }
    QElapsedTimer clock;
    clock.start();
    h.scene->autoArrange();
    QVERIFY2(clock.elapsed() < 5000, "each brick is placed once");
    // The first consumer to reach a brick places it: level k at x = 10 + 150 (k + 1).
    QCOMPARE(items.last()->pos().x(), qreal(10 + 150 * 24));
    QSet<QPair<qreal, qreal>> places;
    for (KrBrickGraphicsItem* item : qAsConst(items))
        places.insert(qMakePair(item->pos().x(), item->pos().y()));
    QCOMPARE(places.size(), items.size());
}

void TestKrBrickUserScene::arrangedBricksDoNotOverlap_data()
{
    QTest::addColumn<quint32>("seed");
    QTest::addColumn<int>("count");
    QTest::addColumn<bool>("deep"); // most bricks feed the one made just before them
    QTest::newRow("bushy") << 7u << 40 << false;
    QTest::newRow("deep") << 11u << 60 << true;
    QTest::newRow("wide") << 23u << 80 << false;
}

void TestKrBrickUserScene::arrangedBricksDoNotOverlap()
{
    QFETCH(quint32, seed);
    QFETCH(int, count);
    QFETCH(bool, deep);
    QRandomGenerator rng(seed);
    KrSceneHarness h;
    auto* root = new KrSceneTestBrick(QStringLiteral("Root"), 1);
    for (int i = 0; i < 4; ++i)
        root->addInput(QStringLiteral("in%1").arg(i));
    QList<KrSceneTestBrick*> bricks = {root};
    QList<KrBrickGraphicsItem*> items = {sizedBrick(h, root, QSize(120, 90))};
    for (int i = 1; i < count; ++i) {
        auto* brick = new KrSceneTestBrick(QStringLiteral("B%1").arg(i), 0);
        for (int j = 0; j < 3; ++j)
            brick->addInput(QStringLiteral("in%1").arg(j));
        brick->addOutput(QStringLiteral("out"));
        const QSize size(80 + int(rng.bounded(80)), 30 + int(rng.bounded(120)));
        items << sizedBrick(h, brick, size, QPointF(rng.bounded(900), rng.bounded(900)));
        // Feeds a free input of a brick made before it, so every brick is reached from the
        // root.
        int to = deep && i > 1 && rng.bounded(4) ? i - 1 : int(rng.bounded(i));
        bool wired = false;
        for (int tries = 0; tries < i && !wired; ++tries, to = (to + 1) % i) {
            KrSceneTestBrick* consumer = bricks.at(to);
            for (int j = 0; j < consumer->getNumParameters() && !wired; ++j) {
                KrBrickParam* input = consumer->getParameter(j);
                wired = input->isInput() && input->getNumConnections() == 0 &&
                        consumer->addConnection(j, brick, brick->getNumParameters() - 1);
            }
        }
        QVERIFY(wired);
        bricks << brick;
    }
    h.scene->autoArrange();
    for (int i = 0; i < items.size(); ++i) {
        const QRectF a(items.at(i)->pos(), items.at(i)->getFrame()->size());
        for (int j = i + 1; j < items.size(); ++j) {
            const QRectF b(items.at(j)->pos(), items.at(j)->getFrame()->size());
            QVERIFY2(!a.intersects(b), qPrintable(QStringLiteral("%1 and %2 overlap")
                                                      .arg(items.at(i)->getBrick()->getName(),
                                                           items.at(j)->getBrick()->getName())));
        }
    }
}

void TestKrBrickUserScene::arrangeManyKeepsSceneSearchable()
{
    KrSceneHarness h;
    auto* root = new KrSceneTestBrick(QStringLiteral("Root"), 1);
    root->addInput(QStringLiteral("in"));
    h.add(root, QPointF(10, 10));
    KrShaderBrick* consumer = root;
    QList<KrBrickGraphicsItem*> items;
    for (int i = 0; i < 220; ++i) {
        KrSceneTestBrick* brick = chainBrick(QStringLiteral("B%1").arg(i));
        items << h.scene->addBrickAt(brick, QPointF(10 + (i % 20) * 50, 10 + (i / 20) * 40));
        QVERIFY(consumer->addConnection(0, brick, 1));
        consumer = brick;
    }
    krSceneSettle();
    h.scene->autoArrange();
    h.scene->flipBricksAboutCenter();
    krSceneSettle();
    // Every brick is found where it now is, and its wire reaches its consumer.
    for (KrBrickGraphicsItem* item : qAsConst(items)) {
        const QPointF inside = item->mapToScene(item->rect().center());
        QVERIFY(h.scene->items(inside).contains(item));
    }
    KrConnectorItem* last = h.plug(items.at(218)->getBrick(), QStringLiteral("in"));
    QCOMPARE(last->getWire()->path().pointAtPercent(1),
             h.plug(items.at(219)->getBrick(), QStringLiteral("out"))->getConnectPoint());
    undoStack()->undo();
    undoStack()->undo();
    for (int i = 0; i < items.size(); i += 37)
        QCOMPARE(items.at(i)->pos(), QPointF(10 + (i % 20) * 50, 10 + (i / 20) * 40));
}

void TestKrBrickUserScene::flipStaysInside_data()
{
    QTest::addColumn<bool>("rightToLeft");
    QTest::newRow("right to left") << true;
    QTest::newRow("left to right") << false;
}

void TestKrBrickUserScene::flipStaysInside()
{
    QFETCH(bool, rightToLeft);
    KrSceneHarness h;
    h.scene->setIsRightToLeft(rightToLeft);
    QList<KrBrickGraphicsItem*> items;
    const QList<QPointF> places = {{10, 10}, {15, 200}, {300, 50}, {900, 120}, {905, 400}};
    for (const QPointF& place : places)
        items << h.add(chainBrick(QStringLiteral("B")), place);
    const int before = undoStack()->count();
    h.scene->flipBricksAboutCenter();
    for (int i = 0; i < items.size(); ++i) {
        QVERIFY(items[i]->pos().x() >= 10);
        QCOMPARE(items[i]->pos().y(), places[i].y());
        QCOMPARE(items[i]->getBrick()->getBrickSettings()->getFloatValue("PosX"),
                 items[i]->pos().x());
    }
    // The order from left to right is turned round.
    QVERIFY(items[3]->pos().x() < items[2]->pos().x());
    QVERIFY(items[2]->pos().x() < items[1]->pos().x());
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Flip Bricks"));
    undoStack()->undo();
    for (int i = 0; i < items.size(); ++i)
        QCOMPARE(items[i]->pos(), places[i]);
}

void TestKrBrickUserScene::flipWithDirectionIsOneStep()
{
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    KrBrickGraphicsItem* item = h.add(a, QPointF(100, 100));
    h.add(chainBrick(QStringLiteral("B")), QPointF(500, 100));
    const int before = undoStack()->count();
    // As the window turns its bricks round.
    h.scene->flipBricksAboutCenter();
    h.scene->setIsRightToLeft(false);
    krSceneSettle();
    QCOMPARE(undoStack()->count(), before + 1);
    QVERIFY(!item->isRightToLeft());
    undoStack()->undo();
    krSceneSettle();
    QVERIFY(h.scene->isRightToLeft());
    QVERIFY(item->isRightToLeft());
    QCOMPARE(item->pos(), QPointF(100, 100));
    undoStack()->redo();
    QVERIFY(!h.scene->isRightToLeft());
    // A direction change on its own, later, is no part of an earlier flip.
    undoStack()->undo();
    h.scene->flipBricksAboutCenter();
    krSceneSettle();
    h.scene->setIsRightToLeft(false);
    undoStack()->undo();
    QVERIFY(!h.scene->isRightToLeft());
}

void TestKrBrickUserScene::depth_data()
{
    QTest::addColumn<QByteArray>("slot");
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("selectOne");
    QTest::addColumn<qreal>("selectedZ");
    QTest::addColumn<qreal>("otherZ");
    QTest::newRow("to front") << QByteArray("toFront") << "To Front" << true << 9.0 << 8.0;
    QTest::newRow("to back") << QByteArray("toBack") << "To Back" << true << 8.0 << 9.0;
    QTest::newRow("to front, none selected")
        << QByteArray("toFront") << "To Front" << false << 8.0 << 8.0;
}

void TestKrBrickUserScene::depth()
{
    QFETCH(QByteArray, slot);
    QFETCH(QString, text);
    QFETCH(bool, selectOne);
    QFETCH(qreal, selectedZ);
    QFETCH(qreal, otherZ);
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    KrSceneTestBrick* b = chainBrick(QStringLiteral("B"));
    KrBrickGraphicsItem* itemA = h.add(a, QPointF(100, 100));
    KrBrickGraphicsItem* itemB = h.add(b, QPointF(150, 150));
    QVERIFY(h.scene->connectParameters(a->getParameter(1), b->getParameter(0)));
    krSceneSettle();
    h.scene->clearSelection();
    if (selectOne)
        itemA->setSelected(true);
    const int before = undoStack()->count();
    invoke(h.scene, slot.constData());
    QCOMPARE(itemA->zValue(), selectOne ? selectedZ : otherZ);
    QCOMPARE(itemB->zValue(), otherZ);
    QCOMPARE(undoStack()->count(), before + 1);
    QCOMPARE(undoStack()->undoText(), text);
    undoStack()->undo();
    QCOMPARE(itemA->zValue(), 9.0);
    QCOMPARE(itemB->zValue(), 9.0);
    QCOMPARE(h.plug(b, "in")->getWire()->zValue(), -10.0);
    QVERIFY(h.plug(b, "in")->getWire()->isVisible());
}

void TestKrBrickUserScene::groupThreeBricks()
{
    KrSceneHarness h(new KrBrickShaderSet);
    auto* x = new KrFloatConstantBrick;
    auto* a = new KrMultiplyBrick;
    auto* b = new KrInvertBrick;
    auto* c = new KrMixBrick;
    auto* y = new KrMultiplyBrick;
    h.add(x, QPointF(900, 100));
    h.add(a, QPointF(700, 100));
    h.add(b, QPointF(500, 100));
    h.add(c, QPointF(300, 100));
    h.add(y, QPointF(100, 100));
    auto param = [](KrShaderBrick* brick, const char* arg) {
        return brick->findParameterByArg(QString::fromLatin1(arg));
    };
    QVERIFY(h.scene->connectParameters(param(x, "result"), param(a, "a")));
    QVERIFY(h.scene->connectParameters(param(a, "result"), param(b, "value")));
    QVERIFY(h.scene->connectParameters(param(b, "result"), param(c, "a")));
    QVERIFY(h.scene->connectParameters(param(a, "result"), param(c, "b")));
    QVERIFY(h.scene->connectParameters(param(c, "result"), param(y, "a")));
    krSceneSettle();
    const QString before = krSceneRecord(h.user, false);
    const QList<uint> grouped = {a->getBrickID(), b->getBrickID(), c->getBrickID()};
    const int steps = undoStack()->count();

    selectOnly(h.scene, {a, b, c});
    h.scene->setLastMenuPos(QPointF(400, 300));
    QSignalSpy exposed(h.user->getBrickContainer(), &KrBrickContainer::exposedPropertiesChanged);
    invoke(h.scene, "toGroup");
    QCOMPARE(exposed.count(), 1); // one rebuild for the whole step
    QCOMPARE(undoStack()->count(), steps + 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Group Bricks"));
    QCOMPARE(h.user->getBricks().size(), 3);
    KrBrickGroup* group = nullptr;
    for (KrShaderBrick* brick : h.user->getBricks())
        group = group ? group : qobject_cast<KrBrickGroup*>(brick);
    QVERIFY(group);
    QCOMPARE(group->getBricks().size(), 3);
    KrBrickGraphicsItem* groupItem = h.scene->findBrick(group->getBrickID());
    QVERIFY(groupItem);
    QCOMPARE(groupItem->pos(), QPointF(400, 300));
    // The group takes the wires to and from the rest of the network.
    QCOMPARE(param(x, "result")->getNumConnections(), 1);
    QCOMPARE(param(x, "result")->getConnection(0)->getParam()->getBrick(), group);
    QVERIFY(param(y, "a")->getSource());
    QCOMPARE(param(y, "a")->getSource()->getBrick(), group);
    for (uint id : grouped)
        QVERIFY(!h.scene->findBrick(id));
    const QString after = krSceneRecord(h.user);

    undoStack()->undo();
    krSceneSettle();
    // Ids are never given twice: only the next free id differs.
    QCOMPARE(krSceneRecord(h.user, false), before);
    QVERIFY(!h.scene->findBrick(group->getBrickID()));
    for (uint id : grouped)
        QVERIFY(h.scene->findBrick(id));
    QVERIFY(h.plug(y, "a")->getWire()->isVisible());

    undoStack()->redo();
    krSceneSettle();
    QCOMPARE(krSceneRecord(h.user), after);
    QCOMPARE(param(y, "a")->getSource()->getBrick(), group);
    undoStack()->undo();
    krSceneSettle();
    QCOMPARE(krSceneRecord(h.user, false), before);
}

void TestKrBrickUserScene::groupLeavesRootsOut()
{
    KrSceneHarness h(new KrBrickShaderSet);
    auto* root = new KrSurfaceBrick;
    auto* a = new KrMultiplyBrick;
    h.add(root, QPointF(100, 100));
    h.add(a, QPointF(400, 100));
    const int steps = undoStack()->count();
    // Only roots: nothing to group.
    selectOnly(h.scene, {root});
    invoke(h.scene, "toGroup");
    QCOMPARE(undoStack()->count(), steps);
    QCOMPARE(h.user->getBricks().size(), 2);
    // The root stays out of the group.
    selectOnly(h.scene, {root, a});
    invoke(h.scene, "toGroup");
    QCOMPARE(undoStack()->count(), steps + 1);
    QCOMPARE(h.user->getBricks().size(), 2);
    QVERIFY(h.scene->findBrick(root->getBrickID()));
    QVERIFY(!h.scene->findBrick(a->getBrickID()));
}

void TestKrBrickUserScene::contextMenuOnEmptySpace()
{
    KrSceneHarness h;
    KrSceneTestBrick* a = chainBrick(QStringLiteral("A"));
    KrBrickGraphicsItem* item = h.add(a, QPointF(100, 100));
    item->setSelected(true);
    QStringList entries;
    QTimer::singleShot(50, [&] {
        auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
        if (!menu)
            return;
        for (QAction* action : menu->actions())
            entries << (action->isSeparator() ? QStringLiteral("-") : action->text());
        menu->close();
    });
    const QPoint at(900, 700);
    krSceneMouse(h.view, QEvent::MouseButtonPress, at, Qt::RightButton);
    QContextMenuEvent event(QContextMenuEvent::Mouse, at, h.view->viewport()->mapToGlobal(at));
    QApplication::sendEvent(h.view->viewport(), &event);
    krSceneMouse(h.view, QEvent::MouseButtonRelease, at, Qt::RightButton);
    // Without a window, the window's entries are missing.
    QCOMPARE(entries, QStringList({"-", "-", "Group", "-", "To Front", "To Back", "-", "Delete"}));
    QCOMPARE(h.scene->getLastMenuPos(), h.view->mapToScene(at));
    QVERIFY(item->isSelected());
}

void TestKrBrickUserScene::contextMenuOfWindow()
{
    KrPaneTestEnv env;
    auto* pane = new KrCorvanePane;
    env.mainWindow()->addPane(pane);
    env.mainWindow()->resize(1400, 900);
    env.mainWindow()->show();
    QVERIFY(QTest::qWaitForWindowExposed(env.mainWindow()));
    KrCorvaneDockWidget* window = pane->getMainWidget()->getCurrentWindow();
    QVERIFY(window);
    KrBrickUserScene* scene = window->getBrickScene();
    QGraphicsView* view = scene->getView();
    QVERIFY(view);
    krSceneSettle();
    // An empty spot of the view.
    QPoint at;
    for (int y = view->viewport()->height() - 20; y > 0 && at.isNull(); y -= 20) {
        for (int x = view->viewport()->width() - 20; x > 0 && at.isNull(); x -= 20) {
            if (scene->items(view->mapToScene(QPoint(x, y))).isEmpty())
                at = QPoint(x, y);
        }
    }
    QVERIFY(!at.isNull());
    const int bricks = scene->getBrickUser()->getBricks().size();
    QStringList entries;
    QString added;
    QTimer::singleShot(50, [&] {
        auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
        if (!menu)
            return;
        for (QAction* action : menu->actions())
            entries << (action->isSeparator() ? QStringLiteral("-") : action->text());
        // The library's menu is the first entry; choosing a brick kind adds one here.
        QMenu* library = menu->actions().first()->menu();
        const QList<KrBrickFactoryAction*> kinds =
            library ? library->findChildren<KrBrickFactoryAction*>()
                    : QList<KrBrickFactoryAction*>();
        for (KrBrickFactoryAction* kind : kinds) {
            if (kind->m_factory.getFactory() &&
                kind->m_factory.getFactory()->className() == QLatin1String("KrInvertBrick")) {
                added = kind->text();
                kind->trigger();
                break;
            }
        }
        menu->close();
    });
    QContextMenuEvent event(QContextMenuEvent::Mouse, at, view->viewport()->mapToGlobal(at));
    QApplication::sendEvent(view->viewport(), &event);
    krSceneSettle();
    QVERIFY2(entries.size() > 10, qPrintable(entries.join(QLatin1Char('|'))));
    QCOMPARE(entries.mid(1), QStringList({"-", "Copy", "Cut", "Paste", "-", "Group", "-",
                                          "To Front", "To Back", "-", "Delete"}));
    QVERIFY(!added.isEmpty());
    QCOMPARE(scene->getBrickUser()->getBricks().size(), bricks + 1);
    KrShaderBrick* brick = scene->getBrickUser()->getBricks().last();
    QCOMPARE(QString(brick->metaObject()->className()), QStringLiteral("KrInvertBrick"));
    const QPointF menuPos = view->mapToScene(at);
    QCOMPARE(scene->findBrick(brick->getBrickID())->pos(),
             QPointF(int(qMax<qreal>(10, menuPos.x())), int(qMax<qreal>(10, menuPos.y()))));
    QCOMPARE(krApp->getUndoStack()->undoText(), QStringLiteral("Add Brick"));
    // The library menu is no longer tied to this scene.
    const int after = scene->getBrickUser()->getBricks().size();
    emit pane->getMainWidget()->getBrickMenu()->factoryTriggered(
        KrBrickFactory(krApp->findClassFactory(QStringLiteral("KrInvertBrick"))));
    QCOMPARE(scene->getBrickUser()->getBricks().size(), after);
}

void TestKrBrickUserScene::rightPressKeepsSelection()
{
    KrSceneHarness h;
    KrBrickGraphicsItem* a = h.add(chainBrick(QStringLiteral("A")), QPointF(100, 100));
    KrBrickGraphicsItem* b = h.add(chainBrick(QStringLiteral("B")), QPointF(500, 100));
    a->setSelected(true);
    const QPoint onB = h.view->mapFromScene(b->mapToScene(QPointF(40, 5)));
    krSceneMouse(h.view, QEvent::MouseButtonPress, onB, Qt::RightButton);
    krSceneMouse(h.view, QEvent::MouseButtonRelease, onB, Qt::RightButton);
    QVERIFY(a->isSelected());
    QVERIFY(!b->isSelected());
}

void TestKrBrickUserScene::ctrlDragScrolls()
{
    KrSceneHarness h;
    QCOMPARE(h.view->dragMode(), QGraphicsView::RubberBandDrag);
    krSceneMouse(h.view, QEvent::MouseButtonPress, QPoint(600, 600), Qt::LeftButton,
                 Qt::ControlModifier);
    QCOMPARE(h.view->dragMode(), QGraphicsView::ScrollHandDrag);
    krSceneMouse(h.view, QEvent::MouseButtonRelease, QPoint(600, 600), Qt::LeftButton,
                 Qt::ControlModifier);
    QCOMPARE(h.view->dragMode(), QGraphicsView::RubberBandDrag);
}

void TestKrBrickUserScene::dropFromLibrary_data()
{
    QTest::addColumn<QString>("className");
    QTest::addColumn<bool>("accepted");
    QTest::newRow("function brick") << "KrMultiplyBrick" << true;
    QTest::newRow("root refused") << "KrSurfaceBrick" << false;
    QTest::newRow("no brick class") << "KrBrickMaterial" << false;
}

void TestKrBrickUserScene::dropFromLibrary()
{
    QFETCH(QString, className);
    QFETCH(bool, accepted);
    // A material's only brick set has its surface root already.
    KrSceneHarness h(new KrBrickMaterial);
    krSceneSettle();
    const int bricks = h.user->getBricks().size();
    QCOMPARE(bricks, 1);
    std::unique_ptr<QMimeData> data(krSceneFactoryMime(className));
    sendDrag(h.scene, QEvent::GraphicsSceneDragEnter, data.get(), QPointF(3, -20));
    // Only a brick the brick user takes is offered a place.
    QCOMPARE(sendDrag(h.scene, QEvent::GraphicsSceneDragMove, data.get(), QPointF(3, -20)),
             accepted);
    const int before = undoStack()->count();
    sendDrag(h.scene, QEvent::GraphicsSceneDrop, data.get(), QPointF(3, -20));
    krSceneSettle();
    QCOMPARE(h.user->getBricks().size(), bricks + (accepted ? 1 : 0));
    QCOMPARE(undoStack()->count(), before + (accepted ? 1 : 0));
    if (accepted) {
        KrShaderBrick* brick = h.user->getBricks().last();
        QCOMPARE(QString(brick->metaObject()->className()), className);
        QCOMPARE(h.scene->findBrick(brick->getBrickID())->pos(), QPointF(10, 10));
        QCOMPARE(undoStack()->undoText(), QStringLiteral("Add Brick"));
    }
}

void TestKrBrickUserScene::itemModelReader()
{
    QStandardItemModel model;
    for (int i = 0; i < 3; ++i) {
        QList<QStandardItem*> row;
        row << new QStandardItem(QStringLiteral("row %1").arg(i))
            << new QStandardItem(QStringLiteral("second"));
        row[0]->setData(i * 10, Qt::UserRole);
        model.appendRow(row);
    }
    std::unique_ptr<QMimeData> data(
        model.mimeData({model.index(0, 0), model.index(2, 0), model.index(2, 1)}));
    KrItemModelReader reader;
    QVERIFY(reader.read(data.get()));
    QCOMPARE(reader.rowCount(), 2);
    QCOMPARE(reader.columnCount(), 2);
    QCOMPARE(reader.data(reader.index(1, 0), Qt::UserRole).toInt(), 20);
    QCOMPARE(reader.data(reader.index(1, 1)).toString(), QStringLiteral("second"));
    QVERIFY(!reader.data(reader.index(0, 1)).isValid());
    QVERIFY(!reader.index(5, 0).isValid());
    QVERIFY(!reader.parent(reader.index(0, 0)).isValid());
    QMimeData text;
    text.setText(QStringLiteral("plain"));
    QVERIFY(!reader.read(&text));
    QCOMPARE(reader.rowCount(), 0);
    QCOMPARE(reader.columnCount(), 0);
}

QTEST_MAIN(TestKrBrickUserScene)
#include "tst_krbrickuserscene.moc"
