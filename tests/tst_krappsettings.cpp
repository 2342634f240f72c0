#include "krappsettings.h"

#include <QDir>
#include <QFile>
#include <QStandardPaths>
#include <QTemporaryDir>
#include <QtTest>

#include <memory>

class TestKrAppSettings : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void init();
    void cleanupTestCase();

    void valuesSurviveANewObject();
    void storedInOneFileInTheFolder();
    void defaultsAndOkFlags_data();
    void defaultsAndOkFlags();
    void stringsRoundTrip_data();
    void stringsRoundTrip();
    void binaryRoundTrip();
    void groupsAreSeparate();
    void popWithoutPushIsHarmless();
    void removeValue();
    void liveObjectsSeeEachOther();
    void userLocationWithoutFolder();

private:
    std::unique_ptr<QTemporaryDir> m_dir;
};

void TestKrAppSettings::initTestCase()
{
    QStandardPaths::setTestModeEnabled(true);
}

void TestKrAppSettings::init()
{
    m_dir.reset(new QTemporaryDir);
    QVERIFY(m_dir->isValid());
    KrAppSettings::setStorageFolder(m_dir->path());
}

void TestKrAppSettings::cleanupTestCase()
{
    KrAppSettings::setStorageFolder(QString());
}

void TestKrAppSettings::valuesSurviveANewObject()
{
    {
        KrAppSettings s;
        s.pushPath("DuderOvid");
        s.setBoolValue("TabsRight", true);
        s.setIntValue("Count", -17);
        s.setStringValue("LastOpen", "/home/user/materials/Brass.kbm");
    }
    KrAppSettings s;
    s.pushPath("DuderOvid");
    bool ok = false;
    QCOMPARE(s.getBoolValue("TabsRight", false, &ok), true);
    QVERIFY(ok);
    QCOMPARE(s.getIntValue("Count", 0, &ok), -17);
    QVERIFY(ok);
    QCOMPARE(s.getStringValue("LastOpen", QString(), &ok),
             QStringLiteral("/home/user/materials/Brass.kbm"));
    QVERIFY(ok);
}

void TestKrAppSettings::storedInOneFileInTheFolder()
{
    {
        KrAppSettings s;
        s.pushPath("DuderOvid");
        s.setBoolValue("RightToLeft", true);
        QCOMPARE(QFileInfo(s.fileName()).absolutePath(), QDir(m_dir->path()).absolutePath());
    }
    const QStringList files = QDir(m_dir->path()).entryList(QDir::Files);
    QCOMPARE(files, QStringList({"krhost.ini"}));
    QFile file(QDir(m_dir->path()).filePath(files.first()));
    QVERIFY(file.open(QIODevice::ReadOnly));
    const QByteArray content = file.readAll();
    QVERIFY2(content.contains("[DuderOvid]") && content.contains("RightToLeft=true"),
             content.constData());

    // Another folder is another, empty store.
    QTemporaryDir other;
    KrAppSettings::setStorageFolder(other.path());
    QCOMPARE(KrAppSettings::storageFolder(), other.path());
    KrAppSettings s;
    s.pushPath("DuderOvid");
    QVERIFY(!s.contains("RightToLeft"));
}

void TestKrAppSettings::defaultsAndOkFlags_data()
{
    QTest::addColumn<QString>("stored"); // written as a string; empty name below: nothing
    QTest::addColumn<bool>("present");
    QTest::addColumn<bool>("boolOk");
    QTest::addColumn<bool>("boolValue");
    QTest::addColumn<bool>("intOk");
    QTest::addColumn<int>("intValue");

    QTest::newRow("missing") << "" << false << false << true << false << 99;
    QTest::newRow("true") << "true" << true << true << true << false << 99;
    QTest::newRow("false") << "false" << true << true << false << false << 99;
    QTest::newRow("number") << "42" << true << false << true << true << 42;
    QTest::newRow("zero") << "0" << true << true << false << true << 0;
    QTest::newRow("word") << "maybe" << true << false << true << false << 99;
    QTest::newRow("too big") << "4294967296" << true << false << true << false << 99;
    QTest::newRow("empty") << "" << true << false << true << false << 99;
}

void TestKrAppSettings::defaultsAndOkFlags()
{
    QFETCH(QString, stored);
    QFETCH(bool, present);
    QFETCH(bool, boolOk);
    QFETCH(bool, boolValue);
    QFETCH(bool, intOk);
    QFETCH(int, intValue);
    {
        KrAppSettings s;
        s.pushPath("Test");
        if (present)
            s.setStringValue("Value", stored);
    }
    KrAppSettings s;
    s.pushPath("Test");
    QCOMPARE(s.contains("Value"), present);
    bool ok = !boolOk;
    QCOMPARE(s.getBoolValue("Value", true, &ok), boolValue);
    QCOMPARE(ok, boolOk);
    ok = !intOk;
    QCOMPARE(s.getIntValue("Value", 99, &ok), intValue);
    QCOMPARE(ok, intOk);
    ok = !present;
    QCOMPARE(s.getStringValue("Value", "dflt", &ok), present ? stored : QStringLiteral("dflt"));
    QCOMPARE(ok, present);
}

void TestKrAppSettings::stringsRoundTrip_data()
{
    QTest::addColumn<QString>("value");
    QTest::newRow("empty") << QString("");
    QTest::newRow("commas") << QStringLiteral("a, b, c");
    QTest::newRow("at sign") << QStringLiteral("@ByteArray(x)");
    QTest::newRow("quotes and semicolon") << QStringLiteral("\"x\"; y = z");
    QTest::newRow("lines") << QStringLiteral("one\ntwo\r\nthree\t!");
    QTest::newRow("unicode") << QString::fromUtf8("Gr\xC3\xB6\xC3\x9F"
                                                  "e \xE4\xB8\xAD \xF0\x9F\x98\x80");
    QTest::newRow("windows path") << QStringLiteral("C:\\Users\\me\\bricks");
    QTest::newRow("spaces") << QStringLiteral("  padded  ");
}

void TestKrAppSettings::stringsRoundTrip()
{
    QFETCH(QString, value);
    {
        KrAppSettings s;
        s.pushPath("DuderOvid");
        s.setStringValue("LastSave", value);
    }
    KrAppSettings s;
    s.pushPath("DuderOvid");
    bool ok = false;
    QCOMPARE(s.getStringValue("LastSave", "dflt", &ok), value);
    QVERIFY(ok);
}

void TestKrAppSettings::binaryRoundTrip()
{
    QByteArray bytes;
    for (int i = 0; i < 512; ++i)
        bytes.append(char(i % 256));
    {
        KrAppSettings s;
        s.pushPath("Window");
        s.setBinaryValue("Geometry", bytes);
        s.setBinaryValue("Empty", QByteArray());
        s.setStringValue("Text", "not binary");
    }
    KrAppSettings s;
    s.pushPath("Window");
    QCOMPARE(s.getBinaryValue("Geometry"), bytes);
    QVERIFY(s.contains("Empty"));
    QVERIFY(s.getBinaryValue("Empty").isEmpty());
    QVERIFY(s.getBinaryValue("Missing").isNull());
    QVERIFY(s.getBinaryValue("Text").isNull());
    bool ok = true;
    QCOMPARE(s.getStringValue("Geometry", "dflt", &ok), QStringLiteral("dflt"));
    QVERIFY(!ok);
}

void TestKrAppSettings::groupsAreSeparate()
{
    {
        KrAppSettings s;
        s.setIntValue("Level", 0);
        s.pushPath("A");
        s.setIntValue("Level", 1);
        s.pushPath("B");
        QCOMPARE(s.currentPath(), QStringLiteral("A/B"));
        s.setIntValue("Level", 2);
        s.popPath();
        QCOMPARE(s.currentPath(), QStringLiteral("A"));
        QCOMPARE(s.getIntValue("Level"), 1);
        s.pushPath("C/D");
        s.setIntValue("Level", 4);
        s.popPath(); // one pop undoes one push, however deep it went
        QCOMPARE(s.currentPath(), QStringLiteral("A"));
    }
    KrAppSettings s;
    QCOMPARE(s.currentPath(), QString());
    QCOMPARE(s.getIntValue("Level", -1), 0);
    QCOMPARE(s.getIntValue("A/B/Level", -1), 2);
    s.pushPath("A");
    QCOMPARE(s.getIntValue("Level", -1), 1);
    QCOMPARE(s.getIntValue("C/D/Level", -1), 4);
    s.pushPath("B");
    QCOMPARE(s.getIntValue("Level", -1), 2);
}

void TestKrAppSettings::popWithoutPushIsHarmless()
{
    KrAppSettings s;
    s.popPath();
    s.pushPath("A");
    s.popPath();
    s.popPath();
    QCOMPARE(s.currentPath(), QString());
    s.setIntValue("Top", 1);
    QCOMPARE(s.getIntValue("Top"), 1);
}

void TestKrAppSettings::removeValue()
{
    {
        KrAppSettings s;
        s.pushPath("DuderOvid");
        s.setBoolValue("TabsRight", true);
        s.setBoolValue("DividerCollapsed", true);
        s.removeValue("TabsRight");
        s.removeValue(QString()); // must not wipe the group
    }
    KrAppSettings s;
    s.pushPath("DuderOvid");
    QVERIFY(!s.contains("TabsRight"));
    QCOMPARE(s.getBoolValue("TabsRight", false), false);
    QVERIFY(s.contains("DividerCollapsed"));
}

void TestKrAppSettings::liveObjectsSeeEachOther()
{
    // The editor builds one object per use; a reader made while a writer lives must see it.
    KrAppSettings writer;
    KrAppSettings reader;
    writer.pushPath("DuderOvid");
    reader.pushPath("DuderOvid");
    writer.setStringValue("LastOpen", "/tmp/a.kbm");

    QCOMPARE(reader.getStringValue("LastOpen"), QStringLiteral("/tmp/a.kbm"));
}

void TestKrAppSettings::userLocationWithoutFolder()
{
    KrAppSettings::setStorageFolder(QString());
    QVERIFY(KrAppSettings::storageFolder().isEmpty());
    KrAppSettings s; // only looked at, never written
    QVERIFY2(s.fileName().endsWith(QStringLiteral("krcorvane/krhost.ini")),
             qPrintable(s.fileName()));
    KrAppSettings::setStorageFolder(m_dir->path());
}

QTEST_GUILESS_MAIN(TestKrAppSettings)
#include "tst_krappsettings.moc"
