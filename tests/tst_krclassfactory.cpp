#include "app_testsupport.h"

#include "krapp.h"
#include "krclassfactory.h"
#include "krcorvanepane.h"
#include "krcorvanepaneactions.h"
#include "krguid.h"
#include "krstandardbrickwidget.h"

#include <QScriptEngine>
#include <QtTest>

class TestKrClassFactory : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void provides_data();
    void provides();
    void guidText_data();
    void guidText();
    void createdGuidsAreDistinct();
    void createInstanceWithIgnoresItsArgument();
    void scriptConstructionThroughBaseRegistration();
    void scriptConstructionReportsAFailedCreation();
    void enumsAreDefinedOnValues();
    void appFindsRegisteredFactoriesAndForgetsDestroyedOnes();
};

void TestKrClassFactory::initTestCase()
{
    QVERIFY(krApp->loadPlugin(QStringLiteral(KR_PLUGIN_DIR "/libkrcorvanegui.so")));
}

void TestKrClassFactory::provides_data()
{
    QTest::addColumn<QString>("factoryClass");
    QTest::addColumn<QString>("baseName");
    QTest::addColumn<bool>("expected");

    QTest::newRow("itself") << "KrTestDerivedAction"
                            << "KrTestDerivedAction" << true;
    QTest::newRow("direct parent") << "KrTestDerivedAction"
                                   << "KrTestBaseAction" << true;
    QTest::newRow("grandparent") << "KrTestDerivedAction"
                                 << "KrAction" << true;
    QTest::newRow("Qt base") << "KrTestDerivedAction"
                             << "QAction" << true;
    QTest::newRow("root") << "KrTestDerivedAction"
                          << "QObject" << true;
    QTest::newRow("a child is not provided") << "KrTestBaseAction"
                                             << "KrTestDerivedAction" << false;
    QTest::newRow("unrelated") << "KrTestDerivedAction"
                               << "KrPane" << false;
    QTest::newRow("prefix of a name") << "KrTestDerivedAction"
                                      << "KrTestDerived" << false;
    QTest::newRow("case matters") << "KrTestDerivedAction"
                                  << "kraction" << false;
    QTest::newRow("empty") << "KrTestDerivedAction"
                           << "" << false;
    QTest::newRow("pane") << "KrCorvanePane"
                          << "KrPane" << true;
    QTest::newRow("pane is a widget") << "KrCorvanePane"
                                      << "QWidget" << true;
    QTest::newRow("pane is no action") << "KrCorvanePane"
                                       << "KrAction" << false;
    QTest::newRow("pane action") << "KrCorvanePaneAction"
                                 << "KrPaneAction" << true;
    QTest::newRow("pane action is an action") << "KrCorvanePaneAction"
                                              << "KrAction" << true;
    QTest::newRow("brick widget") << "KrStandardBrickWidget"
                                  << "KrBrickOptionsFrame" << true;
    QTest::newRow("brick widget is a frame") << "KrStandardBrickWidget"
                                             << "QFrame" << true;
    QTest::newRow("refresh") << "KrCorvanePaneItemRefresh"
                             << "KrAction" << true;
    QTest::newRow("refresh is no pane action") << "KrCorvanePaneItemRefresh"
                                               << "KrPaneAction" << false;
}

void TestKrClassFactory::provides()
{
    QFETCH(QString, factoryClass);
    QFETCH(QString, baseName);
    QFETCH(bool, expected);

    KrTestFactory<KrTestBaseAction> base("00000000-0000-0000-0000-000000000001");
    KrTestFactory<KrTestDerivedAction> derived("00000000-0000-0000-0000-000000000002");
    KrClassFactory* factory = nullptr;
    if (factoryClass == QLatin1String("KrTestBaseAction"))
        factory = &base;
    else if (factoryClass == QLatin1String("KrTestDerivedAction"))
        factory = &derived;
    else
        factory = krApp->findClassFactory(factoryClass);
    QVERIFY2(factory, qPrintable(factoryClass));
    QCOMPARE(factory->provides(baseName), expected);
    QCOMPARE(factory->provides(baseName.toLatin1().constData()), expected);
}

void TestKrClassFactory::guidText_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("expected"); // empty: a null GUID

    QTest::newRow("canonical") << "2C701AFF-5E3A-4674-A9AC-AD9D9F4DA499"
                               << "2C701AFF-5E3A-4674-A9AC-AD9D9F4DA499";
    QTest::newRow("lower case") << "2c701aff-5e3a-4674-a9ac-ad9d9f4da499"
                                << "2C701AFF-5E3A-4674-A9AC-AD9D9F4DA499";
    QTest::newRow("braces") << "{3E36075B-82A9-44F7-A085-08137AE33B9B}"
                            << "3E36075B-82A9-44F7-A085-08137AE33B9B";
    QTest::newRow("surrounding blanks") << "  91EA4029-77CC-4D7F-9215-4D378E3CEFC7 "
                                        << "91EA4029-77CC-4D7F-9215-4D378E3CEFC7";
    QTest::newRow("empty") << ""
                           << "";
    QTest::newRow("not a guid") << "Corvane"
                                << "";
    QTest::newRow("too short") << "2C701AFF-5E3A-4674-A9AC"
                               << "";
}

void TestKrClassFactory::guidText()
{
    QFETCH(QString, text);
    QFETCH(QString, expected);
    const KrGUID guid = KrGUID::fromString(text);
    QCOMPARE(guid.isNull(), expected.isEmpty());
    if (!expected.isEmpty()) {
        QCOMPARE(guid.toString(), expected);
        QCOMPARE(KrGUID::fromString(guid.toString()), guid);
    }
}

void TestKrClassFactory::createdGuidsAreDistinct()
{
    QSet<QString> seen;
    for (int i = 0; i < 100; ++i) {
        const KrGUID g = KrGUID::createGUID();
        QVERIFY(!g.isNull());
        const QString text = g.toString();
        QCOMPARE(text, text.toUpper());
        QCOMPARE(text.size(), 36);
        QVERIFY(!text.contains(QLatin1Char('{')));
        seen.insert(text);
    }
    QCOMPARE(seen.size(), 100);
}

void TestKrClassFactory::createInstanceWithIgnoresItsArgument()
{
    KrTestFactory<KrTestDerivedAction> factory("00000000-0000-0000-0000-000000000003");
    int argument = 5;
    std::unique_ptr<QObject> object(factory.createInstanceWith(&argument));
    QVERIFY(qobject_cast<KrTestDerivedAction*>(object.get()));
    QCOMPARE(factory.created, 1);
    std::unique_ptr<QObject> fromScript(factory.createInstance(nullptr));
    QVERIFY(qobject_cast<KrTestDerivedAction*>(fromScript.get()));
    QCOMPARE(factory.created, 2);
}

void TestKrClassFactory::scriptConstructionThroughBaseRegistration()
{
    KrTestFactory<KrTestDerivedAction> factory("00000000-0000-0000-0000-000000000004");
    QScriptEngine engine;
    factory.registerClass(&engine);
    QVERIFY(engine.globalObject().property("KrTestDerivedAction").isQMetaObject());

    const QScriptValue made = engine.evaluate("new KrTestDerivedAction()");
    QVERIFY2(!engine.hasUncaughtException(), qPrintable(made.toString()));
    std::unique_ptr<QObject> object(made.toQObject());
    QVERIFY(qobject_cast<KrTestDerivedAction*>(object.get()));
    QCOMPARE(factory.created, 1);
    QCOMPARE(engine.evaluate("KrTestDerivedAction.Spicy").toInt32(), 7);
}

void TestKrClassFactory::scriptConstructionReportsAFailedCreation()
{
    KrTestFactory<KrTestDerivedAction> factory("00000000-0000-0000-0000-000000000005");
    factory.failing = true;
    QScriptEngine engine;
    factory.registerClass(&engine);
    const QScriptValue made = engine.evaluate("new KrTestDerivedAction()");
    QVERIFY(engine.hasUncaughtException());
    QVERIFY2(made.toString().contains("KrTestDerivedAction"), qPrintable(made.toString()));
    QCOMPARE(factory.created, 1);
}

void TestKrClassFactory::enumsAreDefinedOnValues()
{
    QScriptEngine engine;
    KrTestDerivedAction action;
    QScriptValue value = engine.newQObject(&action);
    KrClassFactory::registerEnumsOnClass(&engine, &KrTestDerivedAction::staticMetaObject, value);
    QCOMPARE(value.property("Spicy").toInt32(), 7);
    QCOMPARE(value.property("Plain").toInt32(), 0);
    // Inherited enumerators come along (QAction's menu roles).
    QCOMPARE(value.property("QuitRole").toInt32(), int(QAction::QuitRole));

    QScriptValue notAnObject(42);
    KrClassFactory::registerEnumsOnClass(&engine, &KrTestDerivedAction::staticMetaObject,
                                         notAnObject);
    QCOMPARE(notAnObject.toInt32(), 42);
}

void TestKrClassFactory::appFindsRegisteredFactoriesAndForgetsDestroyedOnes()
{
    const int before = krApp->getNumClassFactories();
    {
        KrTestFactory<KrTestBaseAction> factory("00000000-0000-0000-0000-000000000006");
        QSignalSpy changed(krApp, &KrApp::classFactoriesChanged);
        krApp->registerClassFactory(&factory);
        krApp->registerClassFactory(&factory); // twice is once
        QCOMPARE(changed.count(), 1);
        QCOMPARE(krApp->getNumClassFactories(), before + 1);
        QCOMPARE(krApp->findClassFactory("KrTestBaseAction"), &factory);
        QCOMPARE(krApp->getClassFactory(before), &factory);
    }
    QCOMPARE(krApp->findClassFactory("KrTestBaseAction"), nullptr);
    QCOMPARE(krApp->getNumClassFactories(), before);
    QCOMPARE(krApp->findClassFactory("NoSuchClass"), nullptr);
    QCOMPARE(krApp->getClassFactory(-1), nullptr);
}

QTEST_MAIN(TestKrClassFactory)
#include "tst_krclassfactory.moc"
