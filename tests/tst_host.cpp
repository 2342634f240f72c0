#include <QImage>
#include <QProcess>
#include <QTemporaryDir>
#include <QtTest>

namespace {

struct Run
{
    int exitCode = -1;
    bool finished = false;
    QString out;
    QString err;
};

} // namespace

class TestHost : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void help();
    void screenshot();
    void screenshotToAnUnwritablePlace();
    void scriptUsesContributedClasses();
    void scriptThatThrowsExitsWithOne_data();
    void scriptThatThrowsExitsWithOne();
    void missingPluginFolder();

private:
    Run run(const QStringList& arguments);
    QString writeScript(const QString& name, const QByteArray& text);

    QTemporaryDir m_home;
};

void TestHost::initTestCase()
{
    QVERIFY(m_home.isValid());
    QVERIFY(QFileInfo(KR_HOST_BINARY).isExecutable());
}

Run TestHost::run(const QStringList& arguments)
{
    QProcess process;
    QProcessEnvironment env = QProcessEnvironment::systemEnvironment();
    // The host's settings and data go to a private folder, never the user's.
    env.insert("HOME", m_home.path());
    env.insert("XDG_CONFIG_HOME", m_home.filePath("config"));
    env.insert("XDG_DATA_HOME", m_home.filePath("data"));
    env.insert("XDG_RUNTIME_DIR", m_home.path());
    env.insert("QT_QPA_PLATFORM", "offscreen");
    env.remove("KR_PLUGIN_PATH");
    process.setProcessEnvironment(env);
    process.start(KR_HOST_BINARY, arguments);
    Run result;
    if (!process.waitForStarted(20000))
        return result;
    result.finished = process.waitForFinished(120000);
    if (!result.finished) {
        process.kill();
        process.waitForFinished(5000);
    }
    result.exitCode = process.exitStatus() == QProcess::NormalExit ? process.exitCode() : -1;
    result.out = QString::fromLocal8Bit(process.readAllStandardOutput());
    result.err = QString::fromLocal8Bit(process.readAllStandardError());
    return result;
}

QString TestHost::writeScript(const QString& name, const QByteArray& text)
{
    const QString path = m_home.filePath(name);
    QFile file(path);
    if (!file.open(QIODevice::WriteOnly))
        return QString();
    file.write(text);
    return path;
}

void TestHost::help()
{
    const Run r = run({"--help"});
    QVERIFY(r.finished);
    QCOMPARE(r.exitCode, 0);
    for (const char* option : {"--script", "--screenshot", "--plugins", "--help"})
        QVERIFY2(r.out.contains(option), qPrintable(r.out));
}

void TestHost::screenshot()
{
    QTemporaryDir shots;
    const QString path = shots.filePath("host.png");
    const Run r = run({"--screenshot", path});
    QVERIFY2(r.finished, qPrintable(r.err));
    QCOMPARE(r.exitCode, 0);
    QVERIFY2(r.err.contains("Plug-in Corvane loaded"), qPrintable(r.err));
    QVERIFY(QFileInfo(path).size() > 0);
    QImage image(path, "PNG");
    QVERIFY(!image.isNull());
    QVERIFY2(image.width() >= 600 && image.width() <= 4000,
             qPrintable(QString::number(image.width())));
    QVERIFY2(image.height() >= 400 && image.height() <= 3000,
             qPrintable(QString::number(image.height())));
    // A real picture: many colours, not one flat fill.
    QSet<QRgb> colours;
    for (int y = 0; y < image.height(); y += 7) {
        for (int x = 0; x < image.width(); x += 7)
            colours.insert(image.pixel(x, y));
    }
    QVERIFY2(colours.size() > 10, qPrintable(QString::number(colours.size())));
}

void TestHost::screenshotToAnUnwritablePlace()
{
    const Run r = run({"--screenshot", m_home.filePath("no/such/folder/host.png")});
    QVERIFY(r.finished);
    QVERIFY(r.exitCode != 0);
    QVERIFY2(r.err.contains("Cannot write the screenshot"), qPrintable(r.err));
}

void TestHost::scriptUsesContributedClasses()
{
    const QString script = writeScript(
        "make.js", "var action = new KrCorvanePaneShowMenus();\n"
                   "print('made', action.text);\n"
                   "print('title', mainWindow.windowTitle);\n"
                   "print('installed', mainWindow.installAction(action));\n"
                   "var pane = new KrCorvanePane();\n"
                   "print('pane', pane.minimumWidth, pane.minimumHeight);\n"
                   "pane.deleteLater();\n"
                   "var shown = mainWindow.getPaneMgr().findPane('KrCorvanePane');\n"
                   "print('shown', shown.windowTitle);\n"
                   "print('save', mainWindow.getActionMgr().findAction('KrSaveAction').text);\n"
                   "exit(3);\n");
    const Run r = run({"--script", script});
    QVERIFY2(r.finished, qPrintable(r.err));
    QCOMPARE(r.exitCode, 3); // the script's own exit code
    QVERIFY2(r.out.contains("made Open To User Menus..."), qPrintable(r.out + r.err));
    QVERIFY2(r.out.contains("title krhost"), qPrintable(r.out));
    QVERIFY2(r.out.contains("installed true"), qPrintable(r.out));
    QVERIFY2(r.out.contains("pane 165 165"), qPrintable(r.out));
    QVERIFY2(r.out.contains("shown Corvane[BETA]"), qPrintable(r.out));
    QVERIFY2(r.out.contains("save &Save"), qPrintable(r.out));
}

void TestHost::scriptThatThrowsExitsWithOne_data()
{
    QTest::addColumn<QByteArray>("text");
    QTest::addColumn<QString>("expected");
    QTest::newRow("throw") << QByteArray("var a = 1;\nthrow new Error('boom');\n")
                           << QString("throws.js:2: Error: boom");
    QTest::newRow("unknown name") << QByteArray("print('start');\n\nnoSuchFunction();\n")
                                  << QString("throws.js:3: ReferenceError");
    QTest::newRow("syntax") << QByteArray("var x = ;\n") << QString("throws.js:1:");
}

void TestHost::scriptThatThrowsExitsWithOne()
{
    QFETCH(QByteArray, text);
    QFETCH(QString, expected);
    const Run r = run({"--script", writeScript("throws.js", text)});
    QVERIFY(r.finished);
    QCOMPARE(r.exitCode, 1);
    QVERIFY2(r.err.contains(expected), qPrintable(r.err));
}

void TestHost::missingPluginFolder()
{
    const Run r =
        run({"--plugins", m_home.filePath("nowhere"), "--screenshot", m_home.filePath("x.png")});
    QVERIFY(r.finished);
    QCOMPARE(r.exitCode, 1);
    QVERIFY2(r.err.contains("nowhere"), qPrintable(r.err));
}

QTEST_MAIN(TestHost)
#include "tst_host.moc"
