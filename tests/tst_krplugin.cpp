#include "app_testsupport.h"

#include "krapp.h"
#include "krcorvanepane.h"
#include "krcorvanepaneactions.h"
#include "krcorvaneplugin.h"
#include "krmainwindow.h"
#include "krstandardbrickwidget.h"

#include <QDockWidget>
#include <QMenu>
#include <QVBoxLayout>
#include <QScriptEngine>
#include <QStandardPaths>
#include <QtTest>

class TestKrPlugin : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void entryPoints();
    void recordListsTheFiveFactoriesInOrder();
    void hostLoadsTheLibraryAsThatRecord();
    void factoriesCreateTheirClasses_data();
    void factoriesCreateTheirClasses();
    void pointerTypeIsRegisteredOnceAcrossEngines();
    void existingGlobalKeepsItsFlags();
    void scriptConstructsContributedClasses_data();
    void scriptConstructsContributedClasses();
    void scriptConversionOfPointers();
    void brickItemEventTypesAreDistinct();
    void paneAndItsMainWidget();
    void paneActionShowsThePane();
    void showMenusHandsTheFolderURLUnchanged();
    void refreshNeedsTheHostWindowAndPane();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrPlugin::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
    QVERIFY(krApp->loadPlugin(QStringLiteral(KR_PLUGIN_DIR "/libkrcorvanegui.so")));
}

void TestKrPlugin::entryPoints()
{
    QCOMPARE(getSDKVersion(), 0x0300013DUL);
    KrPlugin* first = getPluginDefinition();
    QVERIFY(first);
    QCOMPARE(getPluginDefinition(), first);
    QCOMPARE(first->getName(), QStringLiteral("Corvane"));
    QCOMPARE(first->getAuthor(), QString());
    QCOMPARE(first->getURL(), QString());
    QCOMPARE(first->getVersion(), 0x01000000UL);
    QCOMPARE(first->getDescription(),
             QStringLiteral("Provides the interface for the Corvane development environment."));
}

void TestKrPlugin::recordListsTheFiveFactoriesInOrder()
{
    const QStringList classes = {"KrCorvanePane", "KrCorvanePaneAction", "KrStandardBrickWidget",
                                 "KrCorvanePaneItemRefresh", "KrCorvanePaneShowMenus"};
    const QStringList guids = {
        "2C701AFF-5E3A-4674-A9AC-AD9D9F4DA499", "20005FA4-A33A-446E-BCDC-F266AC891353",
        "2C5A65C3-5E4B-4676-AF7C-DEDD9E44FCC8", "91EA4029-77CC-4D7F-9215-4D378E3CEFC7",
        "3E36075B-82A9-44F7-A085-08137AE33B9B"};
    const QStringList parents = {"KrPane", "KrPaneAction", "KrBrickOptionsFrame", "KrAction",
                                 "KrAction"};
    KrPlugin* record = getPluginDefinition();
    QCOMPARE(record->getNumClassFactories(), 5);
    for (int i = 0; i < 5; ++i) {
        KrClassFactory* f = record->getClassFactory(i);
        QVERIFY(f);
        QCOMPARE(f->className(), classes.at(i));
        QCOMPARE(f->classID().toString(), guids.at(i));
        QCOMPARE(QString::fromLatin1(f->metaObject()->superClass()->className()), parents.at(i));
    }
    QVERIFY(dynamic_cast<KrCorvanePaneFactory*>(record->getClassFactory(0)));
    QVERIFY(dynamic_cast<KrCorvanePaneShowMenusFactory*>(record->getClassFactory(4)));
    QCOMPARE(KrClassFactory::s_ownership, QScriptEngine::QtOwnership);
}

void TestKrPlugin::hostLoadsTheLibraryAsThatRecord()
{
    // Loaded again (the host reaches the library under its own path): the same record, once.
    const int factories = krApp->getNumClassFactories();
    QString error;
    KrPlugin* loaded =
        krApp->loadPlugin(QStringLiteral(KR_PLUGIN_DIR "/libkrcorvanegui.so"), &error);
    QVERIFY2(loaded, qPrintable(error));
    QCOMPARE(loaded, getPluginDefinition());
    QCOMPARE(krApp->getNumClassFactories(), factories);
    QCOMPARE(krApp->getPlugins().count(loaded), 1);
    for (int i = 0; i < loaded->getNumClassFactories(); ++i) {
        KrClassFactory* f = loaded->getClassFactory(i);
        QCOMPARE(krApp->findClassFactory(f->className()), f);
    }
}

void TestKrPlugin::factoriesCreateTheirClasses_data()
{
    QTest::addColumn<int>("row");
    QTest::addColumn<QString>("className");
    for (int i = 0; i < 5; ++i) {
        const QString name = getPluginDefinition()->getClassFactory(i)->className();
        QTest::newRow(qPrintable(name)) << i << name;
    }
}

void TestKrPlugin::factoriesCreateTheirClasses()
{
    QFETCH(int, row);
    QFETCH(QString, className);
    KrClassFactory* factory = getPluginDefinition()->getClassFactory(row);
    for (QObject* made : {factory->createInstance(), factory->createInstance(nullptr),
                          factory->createInstanceWith(nullptr)}) {
        std::unique_ptr<QObject> object(made);
        QVERIFY(object);
        QCOMPARE(QString::fromLatin1(object->metaObject()->className()), className);
        QCOMPARE(object->parent(), nullptr);
    }
}

void TestKrPlugin::pointerTypeIsRegisteredOnceAcrossEngines()
{
    using Factory = KrTCustomClassFactory<KrCorvanePaneShowMenus>;
    KrClassFactory* factory = krApp->findClassFactory("KrCorvanePaneShowMenus");
    QVERIFY(factory);
    QCOMPARE(Factory::instance(), factory);
    QCOMPARE(Factory::pointerTypeId(), 0);

    QScriptEngine first;
    factory->registerClass(&first);
    const int id = Factory::pointerTypeId();
    QVERIFY(id != 0);
    QCOMPARE(QMetaType::type("KrCorvanePaneShowMenus*"), id);
    QVERIFY(QMetaType::typeFlags(id) & QMetaType::PointerToQObject);

    QScriptEngine second;
    factory->registerClass(&second);
    QCOMPARE(Factory::pointerTypeId(), id);
    for (QScriptEngine* engine : {&first, &second}) {
        const QScriptValue cls = engine->globalObject().property("KrCorvanePaneShowMenus");
        QVERIFY(cls.isQMetaObject());
        QCOMPARE(cls.toQMetaObject(), &KrCorvanePaneShowMenus::staticMetaObject);
    }
}

void TestKrPlugin::existingGlobalKeepsItsFlags()
{
    QScriptEngine engine;
    // The engine's built-in global object does not keep property flags at all; a plain
    // object as global does, so the registration's effect on them can be seen.
    engine.setGlobalObject(engine.newObject());
    engine.globalObject().setProperty("KrCorvanePaneItemRefresh", QScriptValue(1),
                                      QScriptValue::SkipInEnumeration);
    krApp->findClassFactory("KrCorvanePaneItemRefresh")->registerClass(&engine);
    QCOMPARE(engine.globalObject().propertyFlags("KrCorvanePaneItemRefresh"),
             QScriptValue::PropertyFlags(QScriptValue::SkipInEnumeration));
    QVERIFY(engine.globalObject().property("KrCorvanePaneItemRefresh").isQMetaObject());
    // A fresh name gets ordinary flags and is constructible.
    krApp->findClassFactory("KrCorvanePaneShowMenus")->registerClass(&engine);
    QCOMPARE(engine.globalObject().propertyFlags("KrCorvanePaneShowMenus"),
             QScriptValue::PropertyFlags());
    std::unique_ptr<QObject> made(engine.evaluate("new KrCorvanePaneItemRefresh()").toQObject());
    QVERIFY(qobject_cast<KrCorvanePaneItemRefresh*>(made.get()));
}

void TestKrPlugin::scriptConstructsContributedClasses_data()
{
    QTest::addColumn<QString>("className");
    QTest::addColumn<QString>("baseName");
    QTest::newRow("pane") << "KrCorvanePane"
                          << "KrPane";
    QTest::newRow("pane action") << "KrCorvanePaneAction"
                                 << "KrPaneAction";
    QTest::newRow("brick widget") << "KrStandardBrickWidget"
                                  << "KrBrickOptionsFrame";
    QTest::newRow("refresh") << "KrCorvanePaneItemRefresh"
                             << "KrAction";
    QTest::newRow("show menus") << "KrCorvanePaneShowMenus"
                                << "KrAction";
}

void TestKrPlugin::scriptConstructsContributedClasses()
{
    QFETCH(QString, className);
    QFETCH(QString, baseName);
    QScriptEngine engine;
    krApp->findClassFactory(className)->registerClass(&engine);
    const QScriptValue value = engine.evaluate(QStringLiteral("new %1()").arg(className));
    QVERIFY2(!engine.hasUncaughtException(), qPrintable(value.toString()));
    // Qt ownership: the object outlives the engine and is ours to delete.
    std::unique_ptr<QObject> object(value.toQObject());
    QVERIFY(object);
    QCOMPARE(QString::fromLatin1(object->metaObject()->className()), className);
    QVERIFY(object->inherits(baseName.toLatin1().constData()));
    QCOMPARE(engine.evaluate(QStringLiteral("typeof %1").arg(className)).toString(),
             QStringLiteral("function"));
}

void TestKrPlugin::scriptConversionOfPointers()
{
    QScriptEngine engine;
    krApp->findClassFactory("KrCorvanePaneShowMenus")->registerClass(&engine);
    KrCorvanePaneShowMenus menus;
    KrCorvanePaneItemRefresh refresh;

    const QScriptValue wrapped = engine.toScriptValue(&menus);
    QCOMPARE(wrapped.toQObject(), &menus);
    QCOMPARE(wrapped.property("text").toString(), QStringLiteral("Open To User Menus..."));
    QCOMPARE(qscriptvalue_cast<KrCorvanePaneShowMenus*>(wrapped), &menus);

    // A value that does not wrap the class converts to null.
    QCOMPARE(qscriptvalue_cast<KrCorvanePaneShowMenus*>(engine.newQObject(&refresh)), nullptr);
    QCOMPARE(qscriptvalue_cast<KrCorvanePaneShowMenus*>(QScriptValue(3)), nullptr);
    QCOMPARE(qscriptvalue_cast<KrCorvanePaneShowMenus*>(engine.newObject()), nullptr);

    // Destroying the engine leaves a Qt-owned object alone.
    {
        QScriptEngine shortLived;
        krApp->findClassFactory("KrCorvanePaneShowMenus")->registerClass(&shortLived);
        shortLived.toScriptValue(&menus);
    }
    QCOMPARE(menus.text(), QStringLiteral("Open To User Menus..."));
}

void TestKrPlugin::brickItemEventTypesAreDistinct()
{
    const KrBrickItemEventTypes& types = krBrickItemEventTypes();
    QVERIFY(types.updateConnector >= QEvent::User && types.updateConnector <= QEvent::MaxUser);
    QVERIFY(types.updatePosition >= QEvent::User && types.updatePosition <= QEvent::MaxUser);
    QVERIFY(types.updateConnector != types.updatePosition);
    // Registered ids are taken: a new registration never hands them out again.
    const int next = QEvent::registerEventType(-1);
    QVERIFY(next != types.updateConnector && next != types.updatePosition);
    QCOMPARE(&krBrickItemEventTypes(), &types);
}

void TestKrPlugin::paneAndItsMainWidget()
{
    KrCorvanePane pane;
    QCOMPARE(pane.getName(), QStringLiteral("Corvane[BETA]"));
    QCOMPARE(pane.minimumSize(), QSize(165, 165));
    auto* layout = qobject_cast<QVBoxLayout*>(pane.layout());
    QVERIFY(layout);
    QCOMPARE(layout->count(), 1);
    KrCorvanePaneMainWgt* main = pane.getMainWidget();
    QCOMPARE(layout->itemAt(0)->widget(), main);
    QCOMPARE(main->parentWidget(), &pane);
    QCOMPARE(main->getPane(), &pane);
    QVERIFY(!main->isWindow());
    QVERIFY(main->centralWidget());
    KrPaneSettings settings;
    pane.saveSettings(settings); // safe to call at any time

    KrStandardBrickWidget widget;
    QCOMPARE(widget.getConnectorSize(nullptr), 20);
}

void TestKrPlugin::paneActionShowsThePane()
{
    KrCorvanePaneAction action;
    QCOMPARE(action.getPaneClassName(), QStringLiteral("KrCorvanePane"));
    QCOMPARE(action.getActionGroup(), QStringLiteral("Panes"));
    QCOMPARE(action.getDefaultMenuPath(), QStringLiteral("Window"));
    QVERIFY(action.isCheckable());

    // With the host window and no pane yet, showing makes the pane through its factory.
    KrMainWindow window;
    auto* placed = new KrCorvanePaneAction;
    window.addKrAction(placed);
    QVERIFY(window.findMenu("Window")->actions().contains(placed));
    QCOMPARE(window.getPaneMgr()->findPane("KrCorvanePane"), nullptr);
    placed->trigger();
    KrPane* pane = window.getPaneMgr()->findPane("Corvane[BETA]");
    QVERIFY(qobject_cast<KrCorvanePane*>(pane));
    QCOMPARE(placed->text(), QStringLiteral("Corvane[BETA]"));
    QDockWidget* dock = window.getPaneMgr()->getDock(pane);
    QCOMPARE(dock->objectName(), QStringLiteral("KrCorvanePane"));
    QVERIFY(!dock->isHidden());
    placed->trigger();
    QVERIFY(dock->isHidden());
    QVERIFY(!placed->isChecked());
    dock->toggleViewAction()->trigger();
    QVERIFY(!dock->isHidden());
    QVERIFY(placed->isChecked());
}

void TestKrPlugin::showMenusHandsTheFolderURLUnchanged()
{
    const QString savedName = QCoreApplication::applicationName();
    QCoreApplication::setApplicationName("kr test host"); // puts spaces into the folder path
    const QString folder =
        QStandardPaths::writableLocation(QStandardPaths::AppDataLocation) + "/UserBricks";
    QVERIFY(folder.contains(' '));

    KrCorvanePaneShowMenus action;
    QCOMPARE(action.text(), QStringLiteral("Open To User Menus..."));
    QCOMPARE(action.getDescription(),
             QStringLiteral("Opens a file window that shows the user bricks."));
    QCOMPARE(action.getActionGroup(), QStringLiteral("Corvane"));
    QCOMPARE(action.getDefaultMenuPath(), QStringLiteral("::KrCorvanePane"));
    QSignalSpy requested(krApp, &KrApp::urlRequested);
    QTest::ignoreMessage(QtInfoMsg, QRegularExpression("No desktop to show"));
    action.trigger();
    QCoreApplication::setApplicationName(savedName);
    QCOMPARE(requested.count(), 1);
    QCOMPARE(requested.first().first().toString(), QStringLiteral("file://%1/").arg(folder));
}

void TestKrPlugin::refreshNeedsTheHostWindowAndPane()
{
    KrCorvanePaneItemRefresh refresh;
    QCOMPARE(refresh.text(), QStringLiteral("Refresh Custom Bricks"));
    QCOMPARE(refresh.getDescription(), QStringLiteral("Refreshes the list of saved bricks."));
    QCOMPARE(refresh.getActionGroup(), QStringLiteral("Corvane"));
    QCOMPARE(refresh.getDefaultMenuPath(), QStringLiteral("::KrCorvanePane"));
    QCOMPARE(krApp->getInterface(), nullptr);
    refresh.trigger(); // no host window: nothing happens

    KrMainWindow window;
    auto* placed = new KrCorvanePaneItemRefresh;
    window.addKrAction(placed);
    QMenu* options = window.findMenu("::KrCorvanePane");
    QVERIFY(options);
    QVERIFY(options->actions().contains(placed));
    QVERIFY(window.findMenu("Window")->actions().contains(options->menuAction()));
    placed->trigger(); // no pane yet: nothing happens
    window.addPane(new KrCorvanePane);
    QCOMPARE(options->title(), QStringLiteral("Corvane[BETA] Options"));
    placed->trigger();
}

QTEST_MAIN(TestKrPlugin)
#include "tst_krplugin.moc"
