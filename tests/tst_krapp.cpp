#include "app_testsupport.h"

#include "krapp.h"
#include "krclassfactory.h"
#include "krcontentmgr.h"
#include "krfileio.h"
#include "krmainwindow.h"
#include "krplugin.h"
#include "krundo.h"

#include <QRegularExpression>
#include <QStandardPaths>
#include <QtTest>

namespace {

QString fixture(const char* name)
{
    return QStringLiteral(KR_FIXTURE_DIR "/lib%1.so").arg(QLatin1String(name));
}

} // namespace

class TestKrApp : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void coreFactoriesComeFirst();
    void pluginFolderLoadsOnlyGoodPlugins();
    void goodPluginLoadsOnceAndItsClassesAreFindable();
    void wrongSdkMajorVersionIsRefused();
    void libraryWithoutEntryPointsIsRefused();
    void nonLibraryIsRefused();
    void missingFolderIsReported();
    void defaultPluginFolder();
    void tempFilenamesAreUniqueAndRemovedAtExit();
    void undoStackIsMadeWhenMissing();
    void contentFolderIsCreatedOnFirstUse();
    void showURL_data();
    void showURL();
    void dialogParentIsTheMainWindow();
    void fileFilterText_data();
    void fileFilterText();
    void fileIO_data();
    void fileIO();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrApp::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
    QVERIFY(m_scope->isValid());
}

void TestKrApp::coreFactoriesComeFirst()
{
    KrPlugin& core = krCorePlugin();
    QCOMPARE(core.getName(), QStringLiteral("krcore"));
    QVERIFY(krApp->getNumClassFactories() >= core.getNumClassFactories());
    for (int i = 0; i < core.getNumClassFactories(); ++i)
        QCOMPARE(krApp->getClassFactory(i), core.getClassFactory(i));
}

void TestKrApp::pluginFolderLoadsOnlyGoodPlugins()
{
    QTemporaryDir folder;
    QVERIFY(folder.isValid());
    // Links, so that the libraries are the ones other tests load by their own paths.
    for (const char* name : {"krfixturegood", "krfixturebadsdk", "krfixturenoentry"}) {
        QVERIFY(QFile::link(fixture(name),
                            folder.filePath(QStringLiteral("lib%1.so").arg(QLatin1String(name)))));
    }
    QFile notes(folder.filePath("notes.txt"));
    QVERIFY(notes.open(QIODevice::WriteOnly));
    notes.write("not a plug-in\n");
    notes.close();
    QFile fake(folder.filePath("libfake.so"));
    QVERIFY(fake.open(QIODevice::WriteOnly));
    fake.write("text pretending to be a library\n");
    fake.close();

    QTest::ignoreMessage(QtWarningMsg,
                         QRegularExpression("libfake\\.so refused: it cannot be loaded"));
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("libkrfixturebadsdk\\.so refused"));
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("libkrfixturenoentry\\.so refused"));
    QTest::ignoreMessage(QtInfoMsg, QRegularExpression("Skipping .*notes\\.txt.*not a library"));
    QTest::ignoreMessage(QtInfoMsg, QRegularExpression("Plug-in FixtureGood loaded"));
    QSignalSpy loadedSpy(krApp, &KrApp::pluginLoaded);

    const QList<KrPlugin*> loaded = krApp->loadPlugins(folder.path());
    QCOMPARE(loaded.size(), 1);
    QCOMPARE(loaded.first()->getName(), QStringLiteral("FixtureGood"));
    QCOMPARE(loadedSpy.count(), 1);
    QVERIFY(krApp->getPlugins().contains(loaded.first()));
    QVERIFY(krApp->findClassFactory("KrFixtureAction"));
    QCOMPARE(krApp->findClassFactory("KrFixtureBadSdkAction"), nullptr);
}

void TestKrApp::goodPluginLoadsOnceAndItsClassesAreFindable()
{
    const int factoriesBefore = krApp->getNumClassFactories();
    QString error;
    KrPlugin* plugin = krApp->loadPlugin(fixture("krfixturegood"), &error);
    QVERIFY2(plugin, qPrintable(error));
    QCOMPARE(plugin->getVersion(), 0x00020000UL);
    // Already loaded through the folder: same record, nothing registered twice.
    QCOMPARE(krApp->getNumClassFactories(), factoriesBefore);
    QCOMPARE(krApp->getPlugins().count(plugin), 1);

    KrClassFactory* factory = krApp->findClassFactory("KrFixtureAction");
    QVERIFY(factory);
    QCOMPARE(factory->classID().toString(), QStringLiteral("6F1D7C1E-2B0A-4E55-9C35-0D7A41A3B001"));
    QVERIFY(factory->provides("KrAction"));
    std::unique_ptr<QObject> object(factory->createInstance());
    auto* action = qobject_cast<KrAction*>(object.get());
    QVERIFY(action);
    QCOMPARE(action->text(), QStringLiteral("Fixture Action"));
    QCOMPARE(action->getDefaultMenuPath(), QStringLiteral("Fixture"));
}

void TestKrApp::wrongSdkMajorVersionIsRefused()
{
    const int factoriesBefore = krApp->getNumClassFactories();
    // The log line names the file and both versions.
    QTest::ignoreMessage(
        QtWarningMsg,
        QRegularExpression("libkrfixturebadsdk\\.so refused: .*SDK version 4\\.0\\.1\\.61.*"
                           "this host has SDK version 3\\.0\\.1\\.61"));
    QString error;
    QCOMPARE(krApp->loadPlugin(fixture("krfixturebadsdk"), &error), nullptr);
    QVERIFY(error.contains("4.0.1.61"));
    QVERIFY(error.contains("3.0.1.61"));
    QCOMPARE(krApp->getNumClassFactories(), factoriesBefore);
    QCOMPARE(krApp->findClassFactory("KrFixtureBadSdkAction"), nullptr);
}

void TestKrApp::libraryWithoutEntryPointsIsRefused()
{
    QTest::ignoreMessage(QtWarningMsg,
                         QRegularExpression("libkrfixturenoentry\\.so refused: .*getSDKVersion"));
    QString error;
    QCOMPARE(krApp->loadPlugin(fixture("krfixturenoentry"), &error), nullptr);
    QVERIFY(error.contains("getPluginDefinition"));
}

void TestKrApp::nonLibraryIsRefused()
{
    QTemporaryDir folder;
    const QString path = folder.filePath("libtext.so");
    QFile file(path);
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.write("hello");
    file.close();
    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("libtext\\.so refused"));
    QString error;
    QCOMPARE(krApp->loadPlugin(path, &error), nullptr);
    QVERIFY(!error.isEmpty());

    QTest::ignoreMessage(QtWarningMsg, QRegularExpression("nothing-here\\.so refused"));
    QCOMPARE(krApp->loadPlugin(folder.filePath("nothing-here.so")), nullptr);
}

void TestKrApp::missingFolderIsReported()
{
    QTest::ignoreMessage(QtWarningMsg,
                         QRegularExpression("Plug-in folder .*/no/such/folder.* does not exist"));
    QVERIFY(krApp->loadPlugins("/no/such/folder").isEmpty());
}

void TestKrApp::defaultPluginFolder()
{
    const QByteArray saved = qgetenv("KR_PLUGIN_PATH");
    qputenv("KR_PLUGIN_PATH", "/opt/kr/plugins");
    QCOMPARE(KrApp::defaultPluginFolder(), QStringLiteral("/opt/kr/plugins"));
    qunsetenv("KR_PLUGIN_PATH");
    QCOMPARE(KrApp::defaultPluginFolder(),
             QDir::cleanPath(QCoreApplication::applicationDirPath() + "/../plugins"));
    if (!saved.isEmpty())
        qputenv("KR_PLUGIN_PATH", saved);
}

void TestKrApp::tempFilenamesAreUniqueAndRemovedAtExit()
{
    QString folder;
    {
        KrApp app; // a second services object, with a temporary folder of its own
        QSet<QString> names;
        for (int i = 0; i < 300; ++i) {
            const QString name = app.getTempFilename(i % 2 ? "png" : ".kcb");
            QVERIFY(!name.isEmpty());
            QVERIFY(!QFileInfo::exists(name));
            QVERIFY(name.endsWith(i % 2 ? ".png" : ".kcb"));
            QVERIFY(!name.endsWith("..kcb"));
            names.insert(name);
            if (folder.isEmpty())
                folder = QFileInfo(name).path();
            QCOMPARE(QFileInfo(name).path(), folder);
        }
        QCOMPARE(names.size(), 300);
        QVERIFY(QFileInfo(folder).isDir());
        // A file made under a name does not make the next name collide.
        const QString used = app.getTempFilename();
        QFile f(used);
        QVERIFY(f.open(QIODevice::WriteOnly));
        f.close();
        QVERIFY(app.getTempFilename() != used);
        QVERIFY(krApp->getTempFilename() != app.getTempFilename());
    }
    QVERIFY(!folder.isEmpty());
    QVERIFY(!QFileInfo::exists(folder));
}

void TestKrApp::undoStackIsMadeWhenMissing()
{
    KrUndoStack* stack = krApp->getUndoStack();
    QVERIFY(stack);
    QCOMPARE(krUndoStack, stack);
    QCOMPARE(krApp->getUndoStack(), stack);
}

void TestKrApp::contentFolderIsCreatedOnFirstUse()
{
    KrContentMgr* content = krApp->getContentMgr();
    QVERIFY(content);
    QCOMPARE(krApp->getContentMgr(), content);
    const QString expected = QDir::cleanPath(
        QStandardPaths::writableLocation(QStandardPaths::AppDataLocation) + "/Content");
    QDir(expected).removeRecursively();
    QCOMPARE(content->getContentDirectoryPath(0), expected);
    QVERIFY(QFileInfo(expected).isDir());
    QVERIFY(content->getContentDirectoryPath(1).isEmpty());
    QVERIFY(content->getContentDirectoryPath(-1).isEmpty());
}

void TestKrApp::showURL_data()
{
    QTest::addColumn<QString>("url");
    QTest::addColumn<bool>("valid");
    QTest::newRow("folder with spaces") << "file:///tmp/My User Bricks/" << true;
    QTest::newRow("web") << "https://example.org/help" << true;
    QTest::newRow("empty") << "" << false;
    QTest::newRow("broken") << "http://[::1" << false;
}

void TestKrApp::showURL()
{
    QFETCH(QString, url);
    QFETCH(bool, valid);
    QSignalSpy requested(krApp, &KrApp::urlRequested);
    if (valid)
        QTest::ignoreMessage(QtInfoMsg, QRegularExpression("No desktop to show"));
    else
        QTest::ignoreMessage(QtWarningMsg, QRegularExpression("not a valid URL"));
    // Offscreen there is no desktop to take the URL, so nothing is shown either way.
    QCOMPARE(krApp->showURL(url), false);
    QCOMPARE(requested.count(), valid ? 1 : 0);
    if (valid)
        QCOMPARE(requested.first().first().toString(), url);
}

void TestKrApp::dialogParentIsTheMainWindow()
{
    QCOMPARE(krApp->getInterface(), nullptr);
    {
        KrMainWindow window;
        QCOMPARE(krApp->getInterface(), &window);
        QCOMPARE(krApp->getDialogParent(), &window);
    }
    QCOMPARE(krApp->getInterface(), nullptr);
    QWidget top;
    top.show();
    QApplication::setActiveWindow(&top);
    QVERIFY(QTest::qWaitForWindowActive(&top));
    QCOMPARE(krApp->getDialogParent(), &top);
}

void TestKrApp::fileFilterText_data()
{
    QTest::addColumn<QStringList>("steps"); // "+Desc" starts a filter, anything else an extension
    QTest::addColumn<QString>("text");
    QTest::addColumn<int>("filters");
    QTest::addColumn<QString>("firstExtension");

    QTest::newRow("one") << QStringList{"+Bricks", "kcb"} << "Bricks (*.kcb)" << 1 << "kcb";
    QTest::newRow("two") << QStringList{"+Brelvo Brick Material", "kbm", "+All", "*"}
                         << "Brelvo Brick Material (*.kbm);;All (*)" << 2 << "kbm";
    QTest::newRow("several extensions") << QStringList{"+Images", "png", ".jpg", "*.tif"}
                                        << "Images (*.png *.jpg *.tif)" << 1 << "png";
    QTest::newRow("duplicate extension")
        << QStringList{"+Bricks", "kcb", "kcb"} << "Bricks (*.kcb)" << 1 << "kcb";
    QTest::newRow("extension without filter") << QStringList{"txt"} << "(*.txt)" << 1 << "txt";
    QTest::newRow("filter without extension")
        << QStringList{"+Anything"} << "Anything (*)" << 1 << "";
    QTest::newRow("unsafe extensions are ignored")
        << QStringList{"+Text", "a b", "x;y", "(z)", "", "txt"} << "Text (*.txt)" << 1 << "txt";
    QTest::newRow("nothing") << QStringList{} << "" << 0 << "";
}

void TestKrApp::fileFilterText()
{
    QFETCH(QStringList, steps);
    QFETCH(QString, text);
    QFETCH(int, filters);
    QFETCH(QString, firstExtension);
    KrFileFilter filter;
    for (const QString& step : steps) {
        if (step.startsWith('+'))
            filter.newFilter(step.mid(1));
        else
            filter.addExtension(step);
    }
    QCOMPARE(filter.toString(), text);
    QCOMPARE(filter.getNumFilters(), filters);
    QCOMPARE(filter.getExtension(0, 0), firstExtension);
    QCOMPARE(filter.getExtension(filters, 0), QString());
    QCOMPARE(filter.getExtension(0, 99), QString());
}

void TestKrApp::fileIO_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QString>("folder");
    QTest::addColumn<QString>("shortName");
    QTest::newRow("file") << "/home/u/Content/red.kbm"
                          << "/home/u/Content"
                          << "red.kbm";
    QTest::newRow("spaces") << "/home/u/My Bricks/a b.kcb"
                            << "/home/u/My Bricks"
                            << "a b.kcb";
    QTest::newRow("root") << "/x.txt"
                          << "/"
                          << "x.txt";
    QTest::newRow("relative") << "sub/x.txt"
                              << "sub"
                              << "x.txt";
    QTest::newRow("bare name") << "x.txt"
                               << "."
                               << "x.txt";
    QTest::newRow("empty") << ""
                           << ""
                           << "";
}

void TestKrApp::fileIO()
{
    QFETCH(QString, path);
    QFETCH(QString, folder);
    QFETCH(QString, shortName);
    QCOMPARE(KrFileIO::getFilePath(path), folder);
    QCOMPARE(KrFileIO::getShortFileName(path), shortName);
}

QTEST_MAIN(TestKrApp)
#include "tst_krapp.moc"
