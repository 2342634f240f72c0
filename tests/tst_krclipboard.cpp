// Copy, cut and paste of bricks between brick-user windows through the system clipboard, with
// their undo steps.
#include "krapp.h"
#include "krbrickgraphicsitem.h"
#include "krbrickmaterial.h"
#include "krbrickparam.h"
#include "krbrickuser.h"
#include "krbrickuserscene.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krdefaultbrickuser.h"
#include "krmainwindow.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "krundo.h"
#include "pane_testsupport.h"

#include <QClipboard>
#include <QGraphicsView>
#include <QMimeData>
#include <QtTest>

namespace {

// Adds a brick of className to the window and answers it.
KrShaderBrick* addBrick(KrCorvaneDockWidget* window, const QString& className, QPointF pos)
{
    KrShaderBrick* brick = KrDefaultBrickUser::createBrick(className);
    brick->ref();
    window->getBrickScene()->addBrickAt(brick, pos);
    brick->unref();
    return brick;
}

// Wires the first output of source into the first input of target that takes it.
bool wire(KrShaderBrick* source, KrShaderBrick* target)
{
    for (int i = 0; i < source->getNumParameters(); ++i) {
        KrBrickParam* out = source->getParameter(i);
        if (out->getDirection() != KrBrickParam::Output)
            continue;
        for (int j = 0; j < target->getNumParameters(); ++j) {
            KrBrickParam* in = target->getParameter(j);
            if (in->getDirection() == KrBrickParam::Input && out->canConnectTo(in))
                return in->addConnection(out);
        }
    }
    return false;
}

void select(KrCorvaneDockWidget* window, const QList<KrShaderBrick*>& bricks)
{
    KrBrickUserScene* scene = window->getBrickScene();
    scene->clearSelection();
    for (KrShaderBrick* brick : bricks)
        scene->findBrick(brick->getBrickID())->setSelected(true);
}

QStringList brickKeys(const QString& text)
{
    KrSettings record;
    if (!record.fromString(text))
        return {QStringLiteral("<not a record>")};
    QStringList keys;
    for (const QString& key : record.getKeys()) {
        if (key.startsWith(QLatin1String("Brick_")))
            keys << key;
    }
    return keys;
}

int wiresAmong(const QList<KrShaderBrick*>& bricks)
{
    int count = 0;
    for (KrShaderBrick* brick : bricks) {
        for (int i = 0; i < brick->getNumParameters(); ++i) {
            KrBrickParam* param = brick->getParameter(i);
            if (param->isInput() && param->getSource() &&
                bricks.contains(param->getSource()->getBrick()))
                ++count;
        }
    }
    return count;
}

QList<KrShaderBrick*> newBricks(IKrBrickUser* user, const QList<uint>& before)
{
    QList<KrShaderBrick*> bricks;
    const QMap<uint, KrShaderBrick*> all = user->getBricks();
    for (auto it = all.begin(); it != all.end(); ++it) {
        if (!before.contains(it.key()))
            bricks << it.value();
    }
    return bricks;
}

} // namespace

class TestKrClipboard : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void cleanup();

    void copyTwoBricksAndPasteIntoAnotherWindow();
    void pasteIsOneUndoStep();
    void pasteTwiceGivesTwoSets();
    void cutAndUndo();
    void emptySelection();
    void foreignTextIsIgnored_data();
    void foreignTextIsIgnored();
    void keysActInTheFocusedWindowOnly();

private:
    std::unique_ptr<KrPaneTestEnv> m_env;
    KrCorvanePane* m_pane = nullptr;
    KrCorvaneDockWidget* m_first = nullptr;
    KrCorvaneDockWidget* m_second = nullptr;
    KrShaderBrick* m_a = nullptr;
    KrShaderBrick* m_b = nullptr;
    KrShaderBrick* m_c = nullptr;
};

void TestKrClipboard::init()
{
    m_env.reset(new KrPaneTestEnv);
    m_pane = new KrCorvanePane;
    m_env->mainWindow()->addPane(m_pane);
    m_env->mainWindow()->resize(1200, 800);
    m_env->mainWindow()->show();
    QVERIFY(QTest::qWaitForWindowExposed(m_env->mainWindow()));
    KrCorvanePaneMainWgt* main = m_pane->getMainWidget();
    m_first = main->getCurrentWindow();

    auto* shaderSet = new KrBrickShaderSet;
    shaderSet->setName(QStringLiteral("Target"));
    QMetaObject::invokeMethod(main, "newWindow", Qt::DirectConnection,
                              Q_RETURN_ARG(KrCorvaneDockWidget*, m_second),
                              Q_ARG(IKrBrickUser*, static_cast<IKrBrickUser*>(shaderSet)));
    QVERIFY(m_second);

    m_a = addBrick(m_first, QStringLiteral("KrFloatConstantBrick"), QPointF(40, 900));
    m_b = addBrick(m_first, QStringLiteral("KrMultiplyBrick"), QPointF(400, 900));
    m_c = addBrick(m_first, QStringLiteral("KrClampBrick"), QPointF(800, 900));
    QVERIFY(wire(m_a, m_b));
    QVERIFY(wire(m_b, m_c));
    krApp->getUndoStack()->clear();
}

void TestKrClipboard::cleanup()
{
    m_pane = nullptr;
    m_env.reset();
}

void TestKrClipboard::copyTwoBricksAndPasteIntoAnotherWindow()
{
    IKrBrickUser* target = m_second->getBrickUser();
    const QList<uint> before = target->getBricks().keys();

    select(m_first, {m_a, m_b});
    m_first->findChild<QAction*>(QStringLiteral("copyAction"))->trigger();
    const QString text = QApplication::clipboard()->text();
    // In the order the scene lists its selection.
    QStringList keys = brickKeys(text);
    keys.sort();
    QStringList expected = {KrDefaultBrickUser::brickKey(m_a->getBrickID()),
                            KrDefaultBrickUser::brickKey(m_b->getBrickID())};
    expected.sort();
    QCOMPARE(keys, expected);
    QCOMPARE(m_first->getBrickUser()->getBricks().size(),
             m_first->getBrickScene()->getItemsById().size());

    m_second->findChild<QAction*>(QStringLiteral("pasteAction"))->trigger();
    const QList<KrShaderBrick*> pasted = newBricks(target, before);
    QCOMPARE(pasted.size(), 2);
    // The wire between the two comes along; the one to the third brick does not.
    QCOMPARE(wiresAmong(pasted), 1);
    for (KrShaderBrick* brick : pasted) {
        QVERIFY(m_second->getBrickScene()->findBrick(brick->getBrickID()));
        QVERIFY(brick->getBrickID() != 0);
    }
    // Where the copies stood.
    QSet<int> xs;
    for (KrShaderBrick* brick : pasted)
        xs.insert(int(m_second->getBrickScene()->findBrick(brick->getBrickID())->pos().x()));
    QCOMPARE(xs, QSet<int>({40, 400}));
    // The source is untouched and the clipboard keeps its text.
    QCOMPARE(m_a->getBrickID() != 0, true);
    QCOMPARE(QApplication::clipboard()->text(), text);
}

void TestKrClipboard::pasteIsOneUndoStep()
{
    KrUndoStack* stack = krApp->getUndoStack();
    IKrBrickUser* target = m_second->getBrickUser();
    const QList<uint> before = target->getBricks().keys();
    select(m_first, {m_a, m_b, m_c});
    m_first->findChild<QAction*>(QStringLiteral("copyAction"))->trigger();
    const int steps = stack->count();

    m_second->findChild<QAction*>(QStringLiteral("pasteAction"))->trigger();
    QCOMPARE(stack->count(), steps + 1);
    QCOMPARE(stack->undoText(), QStringLiteral("Paste Bricks"));
    QCOMPARE(newBricks(target, before).size(), 3);

    stack->undo();
    QCOMPARE(target->getBricks().keys(), before);
    QCOMPARE(m_second->getBrickScene()->getItemsById().keys(), before);

    stack->redo();
    const QList<KrShaderBrick*> again = newBricks(target, before);
    QCOMPARE(again.size(), 3);
    QCOMPARE(wiresAmong(again), 2);
    QCOMPARE(m_second->getBrickScene()->getItemsById().size(), target->getBricks().size());
    QCOMPARE(stack->count(), steps + 1);
}

void TestKrClipboard::pasteTwiceGivesTwoSets()
{
    IKrBrickUser* user = m_first->getBrickUser();
    const QList<uint> before = user->getBricks().keys();
    select(m_first, {m_b, m_c});
    m_first->findChild<QAction*>(QStringLiteral("copyAction"))->trigger();
    m_first->findChild<QAction*>(QStringLiteral("pasteAction"))->trigger();
    m_first->findChild<QAction*>(QStringLiteral("pasteAction"))->trigger();
    const QList<KrShaderBrick*> pasted = newBricks(user, before);
    QCOMPARE(pasted.size(), 4);
    QCOMPARE(wiresAmong(pasted), 2);
    QCOMPARE(m_first->getBrickScene()->getItemsById().size(), user->getBricks().size());
}

void TestKrClipboard::cutAndUndo()
{
    KrUndoStack* stack = krApp->getUndoStack();
    IKrBrickUser* user = m_first->getBrickUser();
    const QList<uint> before = user->getBricks().keys();
    const uint idA = m_a->getBrickID();
    const uint idB = m_b->getBrickID();
    const uint idC = m_c->getBrickID();
    const int steps = stack->count();

    select(m_first, {m_a, m_b, m_c});
    m_first->findChild<QAction*>(QStringLiteral("cutAction"))->trigger();
    QCOMPARE(brickKeys(QApplication::clipboard()->text()).size(), 3);
    QVERIFY(!user->getBricks().contains(idA));
    QVERIFY(!user->getBricks().contains(idB));
    QVERIFY(!user->getBricks().contains(idC));
    QVERIFY(!m_first->getBrickScene()->findBrick(idB));
    QCOMPARE(stack->count(), steps + 1);
    QCOMPARE(stack->undoText(), QStringLiteral("Cut Bricks"));

    stack->undo();
    QCOMPARE(user->getBricks().keys(), before);
    QCOMPARE(m_first->getBrickScene()->getItemsById().keys(), before);
    const QList<KrShaderBrick*> back = {user->findBrick(idA), user->findBrick(idB),
                                        user->findBrick(idC)};
    QCOMPARE(wiresAmong(back), 2);

    // The cut bricks paste back in (into a window of another kind as well).
    const QList<uint> targetBefore = m_second->getBrickUser()->getBricks().keys();
    m_second->findChild<QAction*>(QStringLiteral("pasteAction"))->trigger();
    QCOMPARE(newBricks(m_second->getBrickUser(), targetBefore).size(), 3);
}

void TestKrClipboard::emptySelection()
{
    QApplication::clipboard()->setText(QStringLiteral("something else"));
    m_first->getBrickScene()->clearSelection();
    const int bricks = m_first->getBrickUser()->getBricks().size();
    m_first->findChild<QAction*>(QStringLiteral("cutAction"))->trigger();
    const QString text = QApplication::clipboard()->text();
    QVERIFY(brickKeys(text).isEmpty());
    QCOMPARE(m_first->getBrickUser()->getBricks().size(), bricks);

    const int steps = krApp->getUndoStack()->count();
    m_second->findChild<QAction*>(QStringLiteral("pasteAction"))->trigger();
    QCOMPARE(krApp->getUndoStack()->count(), steps);
}

void TestKrClipboard::foreignTextIsIgnored_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<bool>("asHtml");
    QTest::newRow("words") << QStringLiteral("Dear diary, today I copied a recipe.") << false;
    QTest::newRow("xml") << QStringLiteral("<?xml version=\"1.0\"?><note><to>A</to></note>")
                         << false;
    QTest::newRow("html") << QStringLiteral("<b>bold</b> text") << true;
    QTest::newRow("empty") << QString() << false;
    QTest::newRow("cut off record")
        << QStringLiteral("<?xml version=\"1.0\"?><KrSettings><Brick_1") << false;
}

void TestKrClipboard::foreignTextIsIgnored()
{
    QFETCH(QString, text);
    QFETCH(bool, asHtml);
    if (asHtml) {
        auto* mime = new QMimeData;
        mime->setHtml(text);
        QApplication::clipboard()->setMimeData(mime);
    } else {
        QApplication::clipboard()->setText(text);
    }
    IKrBrickUser* user = m_second->getBrickUser();
    const QList<uint> before = user->getBricks().keys();
    const int steps = krApp->getUndoStack()->count();
    m_second->findChild<QAction*>(QStringLiteral("pasteAction"))->trigger();
    QCOMPARE(user->getBricks().keys(), before);
    QCOMPARE(krApp->getUndoStack()->count(), steps);
}

void TestKrClipboard::keysActInTheFocusedWindowOnly()
{
    // Both windows hold Ctrl+C; the one with the focus copies its own selection.
    KrCorvanePaneMainWgt* main = m_pane->getMainWidget();
    KrShaderBrick* other = addBrick(m_second, QStringLiteral("KrNoiseBrick"), QPointF(60, 60));
    select(m_second, {other});
    select(m_first, {m_c});

    main->getRightTabs()->setCurrentWidget(m_first);
    m_env->mainWindow()->activateWindow();
    QVERIFY(QTest::qWaitForWindowActive(m_env->mainWindow()));
    m_first->getView()->setFocus();
    QTRY_VERIFY(m_first->getView()->hasFocus());
    QApplication::clipboard()->clear();
    QTest::keySequence(m_first->getView(), QKeySequence(QKeySequence::Copy));
    QCOMPARE(brickKeys(QApplication::clipboard()->text()),
             QStringList(KrDefaultBrickUser::brickKey(m_c->getBrickID())));

    main->getRightTabs()->setCurrentWidget(m_second);
    m_second->getView()->setFocus();
    QTRY_VERIFY(m_second->getView()->hasFocus());
    QTest::keySequence(m_second->getView(), QKeySequence(QKeySequence::Copy));
    QCOMPARE(brickKeys(QApplication::clipboard()->text()),
             QStringList(KrDefaultBrickUser::brickKey(other->getBrickID())));
}

QTEST_MAIN(TestKrClipboard)
#include "tst_krclipboard.moc"
