// The host scene: its default contents, reading brick users from it and applying them back,
// and the Scene pane.

#include "app_testsupport.h"
#include "pane_testsupport.h"
#include "krappsettings.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krmainwindow.h"
#include "bricks_testutil.h"
#include "krbrickmaterial.h"
#include "krbrickparam.h"
#include "krdefaultmaterial.h"
#include "krproperty.h"
#include "krscene.h"
#include "krscenepane.h"
#include "krsettings.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QLineEdit>
#include <QMenu>
#include <QPushButton>
#include <QSignalSpy>
#include <QTreeWidget>
#include <QtTest>
#include <memory>

namespace {

// The copy the read-from-scene flow makes: a new brick user with the scene user's record.
IKrBrickUser* copyFromScene(IKrBrickUser* sceneUser)
{
    IKrBrickUser* copy = sceneUser->createNew();
    if (!copy)
        return nullptr;
    KrSettings record;
    qobject_cast<KrElement*>(sceneUser->getObject())->getAttributes(&record);
    qobject_cast<KrElement*>(copy->getObject())->setAttributes(&record);
    copy->setFromScene(true);
    return copy;
}

// Changes the first float value of the network; answers false when it has none.
bool changeSomeFloat(IKrBrickUser* user, double value)
{
    const QMap<uint, KrShaderBrick*> bricks = user->getBricks();
    for (KrShaderBrick* brick : bricks) {
        for (int i = 0; i < brick->getNumParameters(); ++i) {
            KrProperty* property = brick->getParameter(i)->getParamProperty(0);
            if (qobject_cast<KrFloatProperty*>(property) && property->setValue(value) &&
                qFuzzyCompare(property->getValue().toDouble(), value))
                return true;
        }
    }
    return false;
}

QString recordText(const IKrBrickUser* user)
{
    return bricksRecordText(qobject_cast<const KrElement*>(user->getObject()));
}

KrObject* object(KrScene& scene, const QString& name)
{
    return qobject_cast<KrObject*>(scene.findNode(name));
}

// Picks the kind in the chooser and accepts it, naming the new brick user when asked.
KrModalAnswer chooseKind(int kind, const QString& name = QString())
{
    return [=](QWidget* modal) {
        auto* box = modal->findChild<QComboBox*>(QStringLiteral("selectionBox"));
        auto* edit = modal->findChild<QLineEdit*>(QStringLiteral("nameBox"));
        auto* buttons = modal->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"));
        if (!box || !buttons) {
            modal->close();
            return;
        }
        box->setCurrentIndex(kind);
        if (edit && !name.isNull())
            edit->setText(name);
        buttons->button(QDialogButtonBox::Ok)->click();
    };
}

struct UserDeleter
{
    void operator()(IKrBrickUser* user) const
    {
        if (user)
            user->release();
    }
};
using UserPtr = std::unique_ptr<IKrBrickUser, UserDeleter>;

} // namespace

class TestKrScene : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void init();
    void cleanup();

    void defaultContents_data();
    void defaultContents();
    void materialsAreDistinctAndShared();
    void sceneBrickUsers_data();
    void sceneBrickUsers();
    void readFromSceneAppliesBack_data();
    void readFromSceneAppliesBack();
    void appliedCopyOfRemovedObjectFails();
    void newMaterialAppliesToSelection_data();
    void newMaterialAppliesToSelection();
    void brickLightCreatesOnceThenUpdates();
    void lightReadFromSceneAppliesBack();
    void withoutCurrentSceneNothingApplies();
    void paneListsNodes();
    void paneSelectionFollowsBothWays();
    void paneFollowsSceneChanges();
    void editorReadsFromSceneAndAppliesBack();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
    std::unique_ptr<KrScene> m_scene;
};

void TestKrScene::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
    QVERIFY(m_scope->isValid());
}

void TestKrScene::init()
{
    m_scene.reset(new KrScene);
    m_scene->createDefaultContents();
    m_scene->makeCurrent();
}

void TestKrScene::cleanup()
{
    m_scene.reset();
    QVERIFY(!KrBrickUserElement::getSceneBridge());
    QVERIFY(!KrScene::getCurrent());
}

void TestKrScene::defaultContents_data()
{
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QString>("shader");
    QTest::newRow("sphere") << "Sphere"
                            << "Object"
                            << "Red Plastic";
    QTest::newRow("floor") << "Floor"
                           << "Object"
                           << "Floor Grey";
    QTest::newRow("teapot") << "Teapot"
                            << "Object"
                            << "Blue Ceramic";
    QTest::newRow("pedestal") << "Pedestal"
                              << "Object"
                              << "Floor Grey";
    QTest::newRow("light") << "Key Light"
                           << "Light"
                           << "Key Light";
    QTest::newRow("camera") << "Camera"
                            << "Camera"
                            << "";
}

void TestKrScene::defaultContents()
{
    QFETCH(QString, name);
    QFETCH(QString, kind);
    QFETCH(QString, shader);
    QCOMPARE(m_scene->getNumNodes(), 6);
    KrNode* node = m_scene->findNode(name);
    QVERIFY(node);
    QCOMPARE(node->getKindLabel(), kind);
    QCOMPARE(node->getShaderName(), shader);
    QVERIFY(!node->isSelected());
    if (auto* obj = qobject_cast<KrObject*>(node)) {
        QVERIFY(obj->getMaterial());
        KrBrickMaterial* bm = obj->getMaterial()->getBrickMaterial();
        QCOMPARE(bm->getName(), shader);
        QVERIFY(bm->getBrickSet(0)->getRoot());
        QVERIFY(bm->getBricks().size() >= 6);
    }
    if (auto* light = qobject_cast<KrLight*>(node)) {
        QVERIFY(light->getBrickLight()->getBrickSet(0)->getRoot());
    }
}

void TestKrScene::materialsAreDistinctAndShared()
{
    QCOMPARE(m_scene->getMaterials().size(), 3);
    KrMaterial* red = object(*m_scene, "Sphere")->getMaterial();
    KrMaterial* blue = object(*m_scene, "Teapot")->getMaterial();
    // The colours differ, so the networks do.
    QVERIFY(recordText(red->getBrickMaterial()) != recordText(blue->getBrickMaterial()));
    QCOMPARE(object(*m_scene, "Floor")->getMaterial(), object(*m_scene, "Pedestal")->getMaterial());
    auto* camera = qobject_cast<KrCamera*>(m_scene->findNode("Camera"));
    QVERIFY(camera);
    camera->setFieldOfView(500);
    QCOMPARE(camera->getFieldOfView(), 179.0);
}

void TestKrScene::sceneBrickUsers_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QStringList>("names");
    QTest::newRow("materials") << "material"
                               << QStringList{"Red Plastic", "Floor Grey", "Blue Ceramic"};
    QTest::newRow("lights") << "light" << QStringList{"Key Light"};
    QTest::newRow("plain sets") << "set" << QStringList{};
}

void TestKrScene::sceneBrickUsers()
{
    QFETCH(QString, kind);
    QFETCH(QStringList, names);
    UserPtr prototype(kind == "material" ? static_cast<IKrBrickUser*>(new KrBrickMaterial)
                      : kind == "light"  ? static_cast<IKrBrickUser*>(new KrBrickLight)
                                         : static_cast<IKrBrickUser*>(new KrBrickShaderSet));
    const QList<IKrBrickUser*> users = prototype->getSceneBrickUsers();
    QStringList seen;
    QSet<QString> keys;
    for (IKrBrickUser* user : users) {
        seen << user->getName();
        QCOMPARE(user->getTypeLabel(), prototype->getTypeLabel());
        const QString key = user->getSceneKey();
        QVERIFY(!key.isEmpty());
        QCOMPARE(m_scene->getSceneKey(user), key);
        keys.insert(key);
        // Reading does not hand the scene's own network over.
        user->release();
        QVERIFY(!recordText(user).isEmpty());
    }
    QCOMPARE(seen, names);
    QCOMPARE(keys.size(), names.size());
    // A brick user that is not in the scene has no key there.
    QVERIFY(prototype->getSceneKey().isEmpty());
}

void TestKrScene::readFromSceneAppliesBack_data()
{
    QTest::addColumn<QString>("objectName");
    QTest::addColumn<QString>("sharedWith");
    QTest::newRow("sphere") << "Sphere"
                            << "";
    QTest::newRow("teapot") << "Teapot"
                            << "";
    QTest::newRow("shared floor") << "Pedestal"
                                  << "Floor";
}

void TestKrScene::readFromSceneAppliesBack()
{
    QFETCH(QString, objectName);
    QFETCH(QString, sharedWith);
    KrObject* target = object(*m_scene, objectName);
    KrBrickMaterial* sceneMaterial = target->getMaterial()->getBrickMaterial();
    QMap<QString, QString> before;
    for (KrMaterial* m : m_scene->getMaterials())
        before.insert(m->getKey(), recordText(m->getBrickMaterial()));

    UserPtr copy(copyFromScene(sceneMaterial));
    QVERIFY(copy);
    QVERIFY(qobject_cast<KrBrickMaterial*>(copy->getObject()));
    QVERIFY(copy->getObject() != sceneMaterial);
    QCOMPARE(copy->getSceneKey(), target->getMaterial()->getKey());
    QCOMPARE(recordText(copy.get()), recordText(sceneMaterial));

    QVERIFY(changeSomeFloat(copy.get(), 0.123));
    copy->setName(QStringLiteral("Edited"));
    QVERIFY(recordText(copy.get()) != recordText(sceneMaterial));
    // Editing the copy leaves the scene alone until it is applied.
    QCOMPARE(recordText(sceneMaterial), before.value(target->getMaterial()->getKey()));

    QSignalSpy changed(m_scene.get(), &KrScene::nodeChanged);
    QVERIFY(copy->apply());
    QCOMPARE(target->getMaterial()->getBrickMaterial(), sceneMaterial);
    QCOMPARE(recordText(sceneMaterial), recordText(copy.get()));
    QCOMPARE(target->getShaderName(), QStringLiteral("Edited"));
    QList<KrNode*> changedNodes;
    for (const QList<QVariant>& args : qAsConst(changed))
        changedNodes << args.at(0).value<KrNode*>();
    QVERIFY(changedNodes.contains(target));
    if (!sharedWith.isEmpty()) {
        QCOMPARE(object(*m_scene, sharedWith)->getShaderName(), QStringLiteral("Edited"));
        QVERIFY(changedNodes.contains(m_scene->findNode(sharedWith)));
    }
    // Every other material is as it was.
    for (KrMaterial* m : m_scene->getMaterials()) {
        if (m != target->getMaterial())
            QCOMPARE(recordText(m->getBrickMaterial()), before.value(m->getKey()));
    }
    QCOMPARE(m_scene->getMaterials().size(), 3);
}

void TestKrScene::appliedCopyOfRemovedObjectFails()
{
    KrObject* sphere = object(*m_scene, "Sphere");
    UserPtr copy(copyFromScene(sphere->getMaterial()->getBrickMaterial()));
    QVERIFY(m_scene->removeNode(sphere));
    // Nobody carries the red material any more.
    QCOMPARE(m_scene->getMaterials().size(), 2);
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("no longer in the scene"));
    QVERIFY(!copy->apply());
    QCOMPARE(m_scene->getMaterials().size(), 2);
    QCOMPARE(m_scene->getNumNodes(), 5);
}

void TestKrScene::newMaterialAppliesToSelection_data()
{
    QTest::addColumn<QStringList>("selected");
    QTest::addColumn<bool>("applied");
    QTest::addColumn<int>("materials");
    QTest::newRow("nothing selected") << QStringList{} << false << 3;
    QTest::newRow("light and camera only") << QStringList{"Key Light", "Camera"} << false << 3;
    // The red material goes: nobody carries it any more.
    QTest::newRow("sphere") << QStringList{"Sphere"} << true << 3;
    QTest::newRow("sphere and teapot") << QStringList{"Sphere", "Teapot"} << true << 2;
    QTest::newRow("one of two sharing") << QStringList{"Floor", "Camera"} << true << 4;
}

void TestKrScene::newMaterialAppliesToSelection()
{
    QFETCH(QStringList, selected);
    QFETCH(bool, applied);
    QFETCH(int, materials);
    QList<KrNode*> nodes;
    for (const QString& name : selected)
        nodes << m_scene->findNode(name);
    m_scene->setSelection(nodes);
    QCOMPARE(m_scene->getSelectedNodes(), nodes);

    QMap<QString, KrMaterial*> before;
    for (KrNode* node : m_scene->getNodes()) {
        if (auto* obj = qobject_cast<KrObject*>(node))
            before.insert(obj->getName(), obj->getMaterial());
    }

    KrDefaultMaterial plain(QStringLiteral("Gold"));
    std::unique_ptr<KrBrickMaterial, UserDeleter> gold(
        KrBrickMaterial::convertDefaultMaterial(&plain));
    QVERIFY(gold);
    QVERIFY(changeSomeFloat(gold.get(), 0.77));
    QCOMPARE(gold->apply(), applied);
    QCOMPARE(m_scene->getMaterials().size(), materials);

    for (auto it = before.cbegin(); it != before.cend(); ++it) {
        KrObject* obj = object(*m_scene, it.key());
        if (applied && selected.contains(it.key())) {
            QVERIFY(obj->getMaterial() != it.value());
            QCOMPARE(obj->getShaderName(), QStringLiteral("Gold"));
            // The scene keeps its own copy, equal to what was applied.
            QVERIFY(obj->getMaterial()->getBrickMaterial() != gold.get());
            QCOMPARE(recordText(obj->getMaterial()->getBrickMaterial()), recordText(gold.get()));
        } else {
            QCOMPARE(obj->getMaterial(), it.value());
        }
    }
    // The window's material stays a new one: it was not turned into a scene user.
    QVERIFY(!gold->isFromScene());
}

void TestKrScene::brickLightCreatesOnceThenUpdates()
{
    KrBrickLight prototype;
    UserPtr light(prototype.createNew());
    light->prepareBricks();
    light->setName(QStringLiteral("Fill Light"));
    QSignalSpy added(m_scene.get(), &KrScene::nodeAdded);

    QVERIFY(light->apply());
    QCOMPARE(added.count(), 1);
    QCOMPARE(m_scene->getNumNodes(), 7);
    auto* node = qobject_cast<KrLight*>(m_scene->findNode("Fill Light"));
    QVERIFY(node);
    QCOMPARE(recordText(node->getBrickLight()), recordText(light.get()));
    QCOMPARE(light->getSceneKey(), node->getKey());

    QVERIFY(changeSomeFloat(light.get(), 0.31));
    QVERIFY(recordText(node->getBrickLight()) != recordText(light.get()));
    QVERIFY(light->apply());
    QCOMPARE(added.count(), 1);
    QCOMPARE(m_scene->getNumNodes(), 7);
    QCOMPARE(recordText(node->getBrickLight()), recordText(light.get()));

    // Its node gone, the light is not silently made again.
    QVERIFY(m_scene->removeNode(node));
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("no longer in the scene"));
    QVERIFY(!light->apply());
    QCOMPARE(m_scene->getNumNodes(), 6);
}

void TestKrScene::lightReadFromSceneAppliesBack()
{
    auto* key = qobject_cast<KrLight*>(m_scene->findNode("Key Light"));
    UserPtr copy(copyFromScene(key->getBrickLight()));
    QVERIFY(copy);
    QVERIFY(changeSomeFloat(copy.get(), 0.42));
    QVERIFY(copy->apply());
    QCOMPARE(m_scene->getNumNodes(), 6);
    QCOMPARE(recordText(key->getBrickLight()), recordText(copy.get()));
}

void TestKrScene::withoutCurrentSceneNothingApplies()
{
    KrScene other;
    other.createDefaultContents();
    other.makeCurrent();
    // The material of the first scene is not in the current one.
    KrMaterial* red = object(*m_scene, "Sphere")->getMaterial();
    QCOMPARE(KrScene::getCurrent(), &other);
    QVERIFY(red->getBrickMaterial()->getSceneKey() != QString());
    UserPtr copy(copyFromScene(red->getBrickMaterial()));
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("no longer in the scene"));
    QVERIFY(!copy->apply());
    KrBrickUserElement::setSceneBridge(nullptr);
    QVERIFY(!copy->apply());
    UserPtr prototype(new KrBrickMaterial);
    QVERIFY(prototype->getSceneBrickUsers().isEmpty());
    m_scene->makeCurrent();
    QCOMPARE(prototype->getSceneBrickUsers().size(), 3);
}

void TestKrScene::paneListsNodes()
{
    KrScenePane pane(m_scene.get());
    QCOMPARE(pane.getName(), QStringLiteral("Scene"));
    QTreeWidget* tree = pane.getTree();
    QCOMPARE(tree->topLevelItemCount(), m_scene->getNumNodes());
    for (int i = 0; i < m_scene->getNumNodes(); ++i) {
        KrNode* node = m_scene->getNode(i);
        QTreeWidgetItem* item = tree->topLevelItem(i);
        QCOMPARE(pane.findItem(node), item);
        QCOMPARE(pane.getNode(item), node);
        QCOMPARE(item->text(0), node->getName());
        QCOMPARE(item->text(1), node->getKindLabel());
        QCOMPARE(item->text(2), node->getShaderName());
    }
    QCOMPARE(pane.findItem(m_scene->findNode("Teapot"))->text(2), QStringLiteral("Blue Ceramic"));
}

void TestKrScene::paneSelectionFollowsBothWays()
{
    KrScenePane pane(m_scene.get());
    pane.show();
    QVERIFY(QTest::qWaitForWindowExposed(&pane));
    QTreeWidget* tree = pane.getTree();
    KrNode* teapot = m_scene->findNode("Teapot");
    QSignalSpy selection(m_scene.get(), &KrScene::selectionChanged);

    // A click on a row selects its node alone.
    QTreeWidgetItem* item = pane.findItem(teapot);
    const QRect rect = tree->visualItemRect(item);
    QTest::mouseClick(tree->viewport(), Qt::LeftButton, Qt::NoModifier, rect.center());
    QCOMPARE(m_scene->getSelectedNodes(), QList<KrNode*>{teapot});
    QVERIFY(teapot->isSelected());
    QCOMPARE(selection.count(), 1);

    // Ctrl-click adds the camera.
    KrNode* camera = m_scene->findNode("Camera");
    QTest::mouseClick(tree->viewport(), Qt::LeftButton, Qt::ControlModifier,
                      tree->visualItemRect(pane.findItem(camera)).center());
    QCOMPARE(m_scene->getSelectedNodes(), (QList<KrNode*>{teapot, camera}));

    // Selection made in the scene shows in the tree.
    KrNode* sphere = m_scene->findNode("Sphere");
    m_scene->setSelection({sphere});
    QCOMPARE(tree->selectedItems(), QList<QTreeWidgetItem*>{pane.findItem(sphere)});
    m_scene->clearSelection();
    QVERIFY(tree->selectedItems().isEmpty());
}

void TestKrScene::paneFollowsSceneChanges()
{
    KrScenePane pane(m_scene.get());
    QTreeWidget* tree = pane.getTree();
    KrCamera* extra = m_scene->addCamera(QStringLiteral("Top View"));
    QCOMPARE(tree->topLevelItemCount(), 7);
    QCOMPARE(pane.findItem(extra)->text(1), QStringLiteral("Camera"));
    extra->setName(QStringLiteral("Top"));
    QCOMPARE(pane.findItem(extra)->text(0), QStringLiteral("Top"));

    // Removing a selected node drops its row and the selection.
    m_scene->setSelection({extra});
    QVERIFY(m_scene->removeNode(extra));
    QCOMPARE(tree->topLevelItemCount(), 6);
    QVERIFY(!pane.findItem(extra));
    QVERIFY(m_scene->getSelectedNodes().isEmpty());

    // Applying a material read from the scene updates the Material column of its objects.
    KrObject* floor = object(*m_scene, "Floor");
    UserPtr copy(copyFromScene(floor->getMaterial()->getBrickMaterial()));
    copy->setName(QStringLiteral("Marble"));
    QVERIFY(copy->apply());
    QCOMPARE(pane.findItem(floor)->text(2), QStringLiteral("Marble"));
    QCOMPARE(pane.findItem(m_scene->findNode("Pedestal"))->text(2), QStringLiteral("Marble"));

    // Renaming the scene's own network shows at once.
    KrObject* teapot = object(*m_scene, "Teapot");
    teapot->getMaterial()->getBrickMaterial()->setName(QStringLiteral("Porcelain"));
    QCOMPARE(pane.findItem(teapot)->text(2), QStringLiteral("Porcelain"));

    // The pane outlives its scene without touching deleted nodes.
    m_scene.reset();
    QCOMPARE(tree->topLevelItemCount(), 0);
    QVERIFY(!pane.getScene());
}

void TestKrScene::editorReadsFromSceneAndAppliesBack()
{
    {
        KrPaneTestEnv env;
        auto* pane = new KrCorvanePane;
        env.mainWindow()->addPane(pane);
        auto* scenePane = new KrScenePane(m_scene.get());
        env.mainWindow()->addPane(scenePane);
        env.mainWindow()->resize(1200, 800);
        env.mainWindow()->show();
        QVERIFY(QTest::qWaitForWindowExposed(env.mainWindow()));
        KrCorvanePaneMainWgt* main = pane->getMainWidget();
        const int before = main->getOpenWindows().size();

        // "From Scene..." for materials: one window per scene material.
        pnAnswerModals({chooseKind(0)});
        main->getFileMenu()->actions().at(2)->trigger();
        const QList<KrCorvaneDockWidget*> windows = main->getOpenWindows();
        QCOMPARE(windows.size(), before + 3);
        KrCorvaneDockWidget* sphereWindow = windows.at(before);
        IKrBrickUser* copy = sphereWindow->getBrickUser();
        QCOMPARE(copy->getName(), QStringLiteral("Red Plastic"));
        KrObject* sphere = object(*m_scene, "Sphere");
        QVERIFY(copy->getObject() != sphere->getMaterial()->getBrickMaterial());

        QVERIFY(changeSomeFloat(copy, 0.5));
        copy->setName(QStringLiteral("Red Lacquer"));
        QTest::mouseClick(sphereWindow->findChild<QPushButton*>(QStringLiteral("applyButton")),
                          Qt::LeftButton);
        QCOMPARE(sphere->getShaderName(), QStringLiteral("Red Lacquer"));
        QCOMPARE(scenePane->findItem(sphere)->text(2), QStringLiteral("Red Lacquer"));
        QCOMPARE(recordText(sphere->getMaterial()->getBrickMaterial()), recordText(copy));

        // A new light: its first apply makes a light node, the second updates it.
        pnAnswerModals({chooseKind(1, QStringLiteral("Rim Light"))});
        main->getFileMenu()->actions().at(0)->trigger();
        KrCorvaneDockWidget* lightWindow = main->getOpenWindows().constLast();
        QCOMPARE(lightWindow->getBrickUser()->getName(), QStringLiteral("Rim Light"));
        auto* apply = lightWindow->findChild<QPushButton*>(QStringLiteral("applyButton"));
        QTest::mouseClick(apply, Qt::LeftButton);
        QTest::mouseClick(apply, Qt::LeftButton);
        QCOMPARE(m_scene->getNumNodes(), 7);
        auto* rim = qobject_cast<KrLight*>(m_scene->findNode("Rim Light"));
        QVERIFY(rim);
        QVERIFY(scenePane->findItem(rim));
    }
    // The environment resets the settings folder on the way out.
    KrAppSettings::setStorageFolder(m_scope->path());
}

QTEST_MAIN(TestKrScene)
#include "tst_krscene.moc"
