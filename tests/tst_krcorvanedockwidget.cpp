// One brick-user window: toolbar and keys, zoom, placing bricks, direction and the requests a
// brick set carries, Apply and closing.
#include "krbrickgraphicsitem.h"
#include "krbrickmaterial.h"
#include "krbrickset.h"
#include "krbrickuser.h"
#include "krbrickuserscene.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krdefaultbrickuser.h"
#include "krdefaultmaterial.h"
#include "krmainwindow.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "pane_testsupport.h"

#include <QCheckBox>
#include <QDialogButtonBox>
#include <QDoubleSpinBox>
#include <QLineEdit>
#include <QGraphicsView>
#include <QMenu>
#include <QPushButton>
#include <QScrollBar>
#include <QSignalSpy>
#include <QTabWidget>
#include <QToolBar>
#include <QtTest>

namespace {

QMap<uint, QPointF> positions(KrBrickUserScene* scene)
{
    QMap<uint, QPointF> map;
    for (auto it = scene->getItemsById().begin(); it != scene->getItemsById().end(); ++it)
        map.insert(it.key(), it.value()->pos());
    return map;
}

// Bricks spread along a row, so a mirror shows.
KrBrickMaterial* newMaterial(const QString& name)
{
    KrDefaultMaterial material(name);
    KrBrickMaterial* brickMaterial = KrBrickMaterial::convertDefaultMaterial(&material);
    int i = 0;
    for (KrShaderBrick* brick : brickMaterial->getBricks()) {
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosX"), 10.0 + 300.0 * i++);
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosY"), 10.0);
    }
    return brickMaterial;
}

} // namespace

class TestKrCorvaneDockWidget : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void cleanup();

    void toolBarAndKeys();
    void zoom_data();
    void zoom();
    void addBrickInCenter();
    void directionChanges();
    void openCarriesOutStoredRequests();
    void editItemsMenuAndImport();
    void deleteKeyRemovesSelectedBricks();
    void applyWithoutSceneTellsWhy();
    void cancelledPreferencesChangeNothing();
    void preferencesFlipWhenDirectionChanges();

private:
    KrCorvaneDockWidget* open(IKrBrickUser* user);

    std::unique_ptr<KrPaneTestEnv> m_env;
    KrCorvanePane* m_pane = nullptr;
    KrCorvaneDockWidget* m_window = nullptr;
};

void TestKrCorvaneDockWidget::init()
{
    m_env.reset(new KrPaneTestEnv);
    m_pane = new KrCorvanePane;
    m_env->mainWindow()->addPane(m_pane);
    m_env->mainWindow()->resize(1200, 800);
    m_env->mainWindow()->show();
    QVERIFY(QTest::qWaitForWindowExposed(m_env->mainWindow()));
    m_window = m_pane->getMainWidget()->getCurrentWindow();
    QVERIFY(m_window);
}

void TestKrCorvaneDockWidget::cleanup()
{
    m_window = nullptr;
    m_pane = nullptr;
    m_env.reset();
}

KrCorvaneDockWidget* TestKrCorvaneDockWidget::open(IKrBrickUser* user)
{
    KrCorvaneDockWidget* window = nullptr;
    QMetaObject::invokeMethod(m_pane->getMainWidget(), "newWindow", Qt::DirectConnection,
                              Q_RETURN_ARG(KrCorvaneDockWidget*, window),
                              Q_ARG(IKrBrickUser*, user));
    return window;
}

void TestKrCorvaneDockWidget::toolBarAndKeys()
{
    QCOMPARE(m_window->windowTitle(), QStringLiteral("Brick Material"));
    auto* toolBar = m_window->findChild<QToolBar*>();
    QVERIFY(toolBar);
    QStringList texts;
    for (QAction* action : toolBar->actions())
        texts << (action->isSeparator() ? QStringLiteral("|") : action->text());
    QCOMPARE(texts,
             QStringList({"Save", "|", "Copy", "Cut", "Paste", "|", "Import", "|", "Preferences"}));

    QStringList own;
    for (QAction* action : m_window->actions())
        own << action->text();
    QCOMPARE(own, QStringList({"Save", "Copy", "Cut", "Paste", "Preferences", "Import"}));

    const QList<QPair<QString, QKeySequence::StandardKey>> keys = {
        {"saveAction", QKeySequence::Save},
        {"copyAction", QKeySequence::Copy},
        {"cutAction", QKeySequence::Cut},
        {"pasteAction", QKeySequence::Paste}};
    for (const auto& key : keys) {
        QAction* action = m_window->findChild<QAction*>(key.first);
        QVERIFY(action);
        QCOMPARE(action->shortcuts(), QKeySequence::keyBindings(key.second));
        QCOMPARE(action->shortcutContext(), Qt::WidgetWithChildrenShortcut);
    }
    QCOMPARE(m_window->findChild<QAction*>("saveAction")->property("krHostAction").toString(),
             QStringLiteral("KrSaveAction"));
    QCOMPARE(m_window->findChild<QAction*>("importAction")->shortcutContext(),
             Qt::WidgetWithChildrenShortcut);
    QVERIFY(!m_window->findChild<QAction*>("importAction")->isVisible());
    QCOMPARE(m_window->getView()->focusPolicy(), Qt::StrongFocus);
    QCOMPARE(m_window->findChild<QPushButton*>("applyButton")->text(), QStringLiteral("Apply"));
}

void TestKrCorvaneDockWidget::zoom_data()
{
    QTest::addColumn<QString>("typed");
    QTest::addColumn<double>("value");
    QTest::addColumn<double>("scale");
    QTest::newRow("100") << QStringLiteral("100") << 0.0 << 1.0;
    QTest::newRow("1") << QStringLiteral("1") << 0.0 << 0.01;
    QTest::newRow("250") << QStringLiteral("250") << 0.0 << 2.5;
    // The box refuses the third digit of 900 as typed; set from code it is clamped.
    QTest::newRow("typed beyond") << QStringLiteral("900") << 0.0 << 0.9;
    QTest::newRow("set beyond") << QString() << 900.0 << 5.0;
    QTest::newRow("set below") << QString() << 0.2 << 0.01;
}

void TestKrCorvaneDockWidget::zoom()
{
    QFETCH(QString, typed);
    QFETCH(double, value);
    QFETCH(double, scale);
    auto* spin = m_window->findChild<QDoubleSpinBox*>(QStringLiteral("zoomSpin"));
    spin->setValue(50.0);
    if (typed.isEmpty()) {
        spin->setValue(value);
    } else {
        spin->selectAll();
        auto* edit = spin->findChild<QLineEdit*>();
        QTest::keyClicks(edit, typed);
        QTest::keyClick(edit, Qt::Key_Return);
    }
    const QTransform t = m_window->getView()->transform();
    QVERIFY2(qFuzzyCompare(t.m11(), scale), qPrintable(QString::number(t.m11())));
    QVERIFY(qFuzzyCompare(t.m22(), scale));
    QCOMPARE(t.m12(), 0.0);
    QCOMPARE(t.dx(), 0.0);
}

void TestKrCorvaneDockWidget::addBrickInCenter()
{
    QGraphicsView* view = m_window->getView();
    KrBrickUserScene* scene = m_window->getBrickScene();
    IKrBrickUser* user = m_window->getBrickUser();

    view->horizontalScrollBar()->setValue(0);
    view->verticalScrollBar()->setValue(0);
    const QRect r = view->rect();
    const QPointF center =
        view->mapToScene(QPoint((r.left() + r.right()) / 2, (r.top() + r.bottom()) / 2));
    KrShaderBrick* brick = KrDefaultBrickUser::createBrick(QStringLiteral("KrAddBrick"));
    brick->ref();
    m_window->addBrickInCenter(brick);
    QVERIFY(brick->getBrickID() != 0);
    KrBrickGraphicsItem* item = scene->findBrick(brick->getBrickID());
    QVERIFY(item);
    const QPointF expected(qMax(10.0, double(int(center.x() - 100))),
                           qMax(10.0, double(int(center.y() - 100))));
    QCOMPARE(item->pos(), expected);
    brick->unref();

    // Zoomed in at the scene's corner the visible centre is near (56, 55): the brick stays 10
    // units inside.
    m_window->findChild<QDoubleSpinBox*>(QStringLiteral("zoomSpin"))->setValue(500.0);
    view->horizontalScrollBar()->setValue(0);
    view->verticalScrollBar()->setValue(0);
    const QRect z = view->rect();
    const QPointF zc =
        view->mapToScene(QPoint((z.left() + z.right()) / 2, (z.top() + z.bottom()) / 2));
    QVERIFY(zc.x() < 110 && zc.y() < 110);
    KrShaderBrick* corner = KrDefaultBrickUser::createBrick(QStringLiteral("KrAddBrick"));
    corner->ref();
    m_window->addBrickInCenter(corner);
    QCOMPARE(scene->findBrick(corner->getBrickID())->pos(), QPointF(10, 10));
    corner->unref();

    // Far inside, 100 up and left of the visible centre.
    m_window->findChild<QDoubleSpinBox*>(QStringLiteral("zoomSpin"))->setValue(100.0);
    view->centerOn(2000, 1500);
    const QRect r2 = view->rect();
    const QPointF c2 =
        view->mapToScene(QPoint((r2.left() + r2.right()) / 2, (r2.top() + r2.bottom()) / 2));
    KrShaderBrick* far = KrDefaultBrickUser::createBrick(QStringLiteral("KrMixBrick"));
    far->ref();
    m_window->addBrickInCenter(far);
    QCOMPARE(scene->findBrick(far->getBrickID())->pos(),
             QPointF(int(c2.x() - 100), int(c2.y() - 100)));
    far->unref();
    QVERIFY(user->getBricks().contains(far->getBrickID()));
}

void TestKrCorvaneDockWidget::directionChanges()
{
    KrBrickUserScene* scene = m_window->getBrickScene();
    const bool current = m_window->isRightToLeft();
    const QMap<uint, QPointF> before = positions(scene);

    m_window->setIsRightToLeft(current, true);
    QCOMPARE(positions(scene), before);
    m_window->setIsRightToLeft(!current, false);
    QCOMPARE(m_window->isRightToLeft(), !current);
    QCOMPARE(positions(scene), before);
    m_window->setIsRightToLeft(current, false);

    m_window->setIsRightToLeft(!current, true);
    QCOMPARE(m_window->isRightToLeft(), !current);
    QVERIFY(positions(scene) != before);
}

void TestKrCorvaneDockWidget::openCarriesOutStoredRequests()
{
    // A network asking to be arranged, laid out in the other direction than new windows use.
    KrBrickMaterial* material = newMaterial(QStringLiteral("Requests"));
    for (KrShaderBrick* brick : material->getBricks()) {
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosX"), 10.0);
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosY"), 10.0);
    }
    KrShaderBrick* root = material->getBrickSet(0)->getRoot();
    QVERIFY(root);
    root->getBrickSettings()->setBoolValue(QStringLiteral("AutoArrange"), true);

    KrCorvaneDockWidget* window = open(material);
    QVERIFY(window);
    QVERIFY(!root->getBrickSettings()->hasKey(QStringLiteral("AutoArrange")));
    QSet<QPair<int, int>> places;
    for (const QPointF& p : positions(window->getBrickScene()))
        places.insert(qMakePair(int(p.x()), int(p.y())));
    QCOMPARE(places.size(), material->getBricks().size());

    // Reopening the same bricks does not arrange them again.
    KrSettings record;
    material->getAttributes(&record);
    KrBrickMaterial* copy = static_cast<KrBrickMaterial*>(material->createNew());
    copy->setAttributes(&record);
    KrCorvaneDockWidget* second = open(copy);
    QCOMPARE(positions(second->getBrickScene()).values(),
             positions(window->getBrickScene()).values());

    // Bricks stored left to right are mirrored into a right-to-left window.
    KrBrickMaterial* ltr = newMaterial(QStringLiteral("Mirrored"));
    for (KrShaderBrick* brick : ltr->getBricks())
        brick->getBrickSettings()->setBoolValue(QStringLiteral("BrickIsRightToLeft"), false);
    KrBrickMaterial* same = newMaterial(QStringLiteral("Unmirrored"));
    KrCorvaneDockWidget* mirrored = open(ltr);
    KrCorvaneDockWidget* plain = open(same);
    QVERIFY(mirrored->isRightToLeft());
    QVERIFY(positions(mirrored->getBrickScene()).values() !=
            positions(plain->getBrickScene()).values());
}

void TestKrCorvaneDockWidget::editItemsMenuAndImport()
{
    QMenu menu;
    m_window->addEditItemsToMenu(&menu);
    QStringList texts;
    for (QAction* action : menu.actions())
        texts << action->text();
    QCOMPARE(texts, QStringList({"Copy", "Cut", "Paste"}));
    m_window->addEditItemsToMenu(nullptr);

    const int bricks = m_window->getBrickUser()->getBricks().size();
    QMetaObject::invokeMethod(m_window, "import");
    QCOMPARE(m_window->getBrickUser()->getBricks().size(), bricks);
    QCOMPARE(m_window->getMainParent(), m_pane->getMainWidget());
}

void TestKrCorvaneDockWidget::deleteKeyRemovesSelectedBricks()
{
    IKrBrickUser* user = m_window->getBrickUser();
    KrShaderBrick* brick = KrDefaultBrickUser::createBrick(QStringLiteral("KrInvertBrick"));
    brick->ref();
    m_window->getBrickScene()->addBrickAt(brick, QPointF(30, 30));
    const uint id = brick->getBrickID();
    brick->unref();
    m_window->getBrickScene()->clearSelection();
    m_window->getBrickScene()->findBrick(id)->setSelected(true);
    const int count = user->getBricks().size();

    m_env->mainWindow()->activateWindow();
    QVERIFY(QTest::qWaitForWindowActive(m_env->mainWindow()));
    m_window->getView()->setFocus();
    QTRY_VERIFY(m_window->getView()->hasFocus());
    QTest::keyClick(m_window->getView(), Qt::Key_Delete);
    QCOMPARE(user->getBricks().size(), count - 1);
    QVERIFY(!user->getBricks().contains(id));
}

void TestKrCorvaneDockWidget::applyWithoutSceneTellsWhy()
{
    KrModalSeen seen;
    pnAnswerModals({pnMessageAnswer(QMessageBox::Ok, &seen)});
    QTest::mouseClick(m_window->findChild<QPushButton*>(QStringLiteral("applyButton")),
                      Qt::LeftButton);
    QVERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("Apply"));
    QVERIFY(seen.text.contains(QStringLiteral("Brelvo Default Material")));
}

void TestKrCorvaneDockWidget::cancelledPreferencesChangeNothing()
{
    QSignalSpy renamed(m_window, &KrCorvaneDockWidget::nameChanged);
    const bool direction = m_window->isRightToLeft();
    pnAnswerModals({[](QWidget* modal) {
        modal->findChild<QLineEdit*>(QStringLiteral("nameEdit"))->setText(QStringLiteral("X"));
        modal->findChild<QCheckBox*>(QStringLiteral("orientationCheck"))->toggle();
        pnRejectAnswer()(modal);
    }});
    m_window->findChild<QAction*>(QStringLiteral("preferencesAction"))->trigger();
    QCOMPARE(renamed.count(), 0);
    QCOMPARE(m_window->getBrickUser()->getName(), QStringLiteral("Brelvo Default Material"));
    QCOMPARE(m_window->isRightToLeft(), direction);
}

void TestKrCorvaneDockWidget::preferencesFlipWhenDirectionChanges()
{
    QSignalSpy renamed(m_window, &KrCorvaneDockWidget::nameChanged);
    const bool direction = m_window->isRightToLeft();
    const QMap<uint, QPointF> before = positions(m_window->getBrickScene());
    pnAnswerModals({[](QWidget* modal) {
        auto* check = modal->findChild<QCheckBox*>(QStringLiteral("orientationCheck"));
        check->toggle();
        modal->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"))
            ->button(QDialogButtonBox::Ok)
            ->click();
    }});
    m_window->findChild<QAction*>(QStringLiteral("preferencesAction"))->trigger();
    QCOMPARE(m_window->isRightToLeft(), !direction);
    QVERIFY(positions(m_window->getBrickScene()) != before);
    QCOMPARE(renamed.count(), 1);
    QCOMPARE(renamed.at(0).at(0).toString(), QStringLiteral("Brelvo Default Material"));
}

QTEST_MAIN(TestKrCorvaneDockWidget)
#include "tst_krcorvanedockwidget.moc"
