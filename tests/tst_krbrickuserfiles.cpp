// Brick-user files: the save flow with its dialogs, reading files back, and what bad files
// and failed writes do.
#include "krappsettings.h"
#include "krbrickmaterial.h"
#include "krbrickuser.h"
#include "krbrickuserfiles.h"
#include "krcorvaneutility.h"
#include "krdefaultmaterial.h"
#include "krfileio.h"
#include "krsettings.h"
#include "pane_testsupport.h"

#include <QDir>
#include <QFile>
#include <QtTest>
#include <csignal>
#include <sys/resource.h>
#include <memory>

namespace {

struct UserDeleter
{
    void operator()(IKrBrickUser* user) const
    {
        if (user)
            user->release();
    }
};
using UserPtr = std::unique_ptr<IKrBrickUser, UserDeleter>;

UserPtr defaultBrickMaterial(const QString& name)
{
    KrDefaultMaterial material(name);
    return UserPtr(KrBrickMaterial::convertDefaultMaterial(&material));
}

QString attributesText(const IKrBrickUser* user)
{
    KrSettings record;
    qobject_cast<const KrElement*>(user->getObject())->getAttributes(&record);
    return record.toString();
}

QString storedFolder(const QString& key)
{
    KrAppSettings settings;
    settings.pushPath(QStringLiteral("DuderOvid"));
    return settings.getStringValue(key, QStringLiteral("<none>"));
}

} // namespace

class TestKrBrickUserFiles : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void cleanup();

    void openFilterListsKindsThenAll();
    void saveAndReadGiveAnEqualNetwork();
    void titlesOutsideAsciiSurvive();
    void cancelledOverwriteLeavesFileAlone();
    void failedWriteKeepsOldFileAndTellsWhy();
    void writeIntoMissingFolderFails();
    void badFiles_data();
    void badFiles();
    void unknownBricksLoadWhatIsSound();
    void openFlowRemembersFolder();

private:
    std::unique_ptr<KrPaneTestEnv> m_env;
};

void TestKrBrickUserFiles::init()
{
    m_env.reset(new KrPaneTestEnv);
}

void TestKrBrickUserFiles::cleanup()
{
    m_env.reset();
}

void TestKrBrickUserFiles::openFilterListsKindsThenAll()
{
    QList<IKrBrickUser*> kinds;
    KrCorvaneUtility::getBrickUserList(kinds);
    QVERIFY(kinds.size() >= 2);

    // Seen the way the user sees it, in the open dialog.
    KrModalSeen seen;
    pnAnswerModals({pnRejectAnswer(&seen)});
    QString error;
    QVERIFY(!KrBrickUserFiles::openWithDialog(kinds, &error));
    QVERIFY(seen.handled);
    QVERIFY(error.isEmpty());
    QCOMPARE(seen.title, QStringLiteral("Open..."));

    QStringList expected;
    QStringList all;
    for (IKrBrickUser* kind : kinds) {
        expected << QStringLiteral("Brelvo Brick %1 (*.%2)")
                        .arg(kind->getTypeLabel(), kind->getFileExtension());
        all << QStringLiteral("*.") + kind->getFileExtension();
    }
    expected << QStringLiteral("All (%1)").arg(all.join(QLatin1Char(' ')));
    QCOMPARE(seen.nameFilters, expected);
    QCOMPARE(storedFolder(QStringLiteral("LastOpen")), QStringLiteral("<none>"));

    for (IKrBrickUser* kind : kinds)
        kind->release();
}

void TestKrBrickUserFiles::saveAndReadGiveAnEqualNetwork()
{
    UserPtr material = defaultBrickMaterial(QStringLiteral("Marble"));
    QVERIFY(material);
    QVERIFY(material->getBricks().size() >= 3);
    const QString fileName = m_env->path() + QStringLiteral("/marble.kbm");

    KrModalSeen seen;
    pnAnswerModals({pnFileAnswer(fileName, &seen)});
    QVERIFY(KrBrickUserFiles::saveWithDialog(material.get()));
    QCOMPARE(seen.title, QStringLiteral("Save Brick Material setup..."));
    QCOMPARE(seen.nameFilters, QStringList(QStringLiteral("Brelvo Brick Brick Material (*.kbm)")));
    QCOMPARE(storedFolder(QStringLiteral("LastSave")), m_env->path());

    // The file is the record's text: the class name, then the network.
    KrSettings record;
    QVERIFY(record.fromString(QString::fromUtf8(pnReadBytes(fileName))));
    QCOMPARE(record.getKeys(),
             QStringList({QStringLiteral("BrelvoHallixClassName"), QStringLiteral("BrickSet")}));
    QCOMPARE(record.getStringValue(QStringLiteral("BrelvoHallixClassName")),
             QStringLiteral("KrBrickMaterial"));

    QString error;
    UserPtr read(KrBrickUserFiles::readBrickUserFile(fileName, &error));
    QVERIFY2(read, qPrintable(error));
    QVERIFY(error.isEmpty());
    QCOMPARE(read->getName(), QStringLiteral("Marble"));
    QCOMPARE(read->getBricks().keys(), material->getBricks().keys());
    QCOMPARE(attributesText(read.get()), attributesText(material.get()));
}

void TestKrBrickUserFiles::titlesOutsideAsciiSurvive()
{
    const QString name = QStringLiteral("Matériau à l'été \u2603");
    UserPtr material = defaultBrickMaterial(name);
    const QString fileName = m_env->path() + QStringLiteral("/utf.kbm");
    QVERIFY(KrBrickUserFiles::writeBrickUserFile(material.get(), fileName));
    QString error;
    UserPtr read(KrBrickUserFiles::readBrickUserFile(fileName, &error));
    QVERIFY(read);
    QCOMPARE(read->getName(), name);

    // A file holding the characters themselves (as an editor saves it) reads as UTF-8.
    KrSettings record;
    KrBrickUserFiles::writeRecord(material.get(), &record);
    QString text = record.toString();
    for (const QChar c : name) {
        if (c.unicode() >= 0x80)
            text.replace(QStringLiteral("&#x%1;")
                             .arg(c.unicode(), 0, 16)
                             .toUpper()
                             .replace(QStringLiteral("&#X"), QStringLiteral("&#x")),
                         QString(c));
    }
    QVERIFY(text.contains(name));
    QVERIFY(pnWriteBytes(fileName, text.toUtf8()));
    UserPtr raw(KrBrickUserFiles::readBrickUserFile(fileName, &error));
    QVERIFY2(raw, qPrintable(error));
    QCOMPARE(raw->getName(), name);
}

void TestKrBrickUserFiles::cancelledOverwriteLeavesFileAlone()
{
    const QString fileName = m_env->path() + QStringLiteral("/keep.kbm");
    const QByteArray before("an older file \x01\x02 that must stay\n");
    QVERIFY(pnWriteBytes(fileName, before));
    UserPtr material = defaultBrickMaterial(QStringLiteral("Other"));

    KrModalSeen question;
    pnAnswerModals({pnFileAnswer(fileName), pnMessageAnswer(QMessageBox::Cancel, &question)});
    QVERIFY(!KrBrickUserFiles::saveWithDialog(material.get()));
    QVERIFY(question.handled);
    QCOMPARE(question.title, QStringLiteral("File Already Exists..."));
    QCOMPARE(question.text, QStringLiteral("Would you like to overwrite keep.kbm?"));
    QCOMPARE(pnReadBytes(fileName), before);
    QCOMPARE(storedFolder(QStringLiteral("LastSave")), QStringLiteral("<none>"));

    // Ok replaces it.
    pnAnswerModals({pnFileAnswer(fileName), pnMessageAnswer(QMessageBox::Ok)});
    QVERIFY(KrBrickUserFiles::saveWithDialog(material.get()));
    QVERIFY(pnReadBytes(fileName) != before);
}

void TestKrBrickUserFiles::failedWriteKeepsOldFileAndTellsWhy()
{
    const QString fileName = m_env->path() + QStringLiteral("/full.kbm");
    const QByteArray before("the file of yesterday\n");
    QVERIFY(pnWriteBytes(fileName, before));
    UserPtr material = defaultBrickMaterial(QStringLiteral("Doomed"));

    // A full disk: writes beyond a few bytes fail (and do not kill the process).
    signal(SIGXFSZ, SIG_IGN);
    rlimit old;
    QCOMPARE(getrlimit(RLIMIT_FSIZE, &old), 0);
    rlimit tight = old;
    tight.rlim_cur = 64;

    KrModalSeen question;
    KrModalSeen failure;
    pnAnswerModals({[&](QWidget* modal) {
                        // Only the write is squeezed, not the dialog's own work.
                        pnFileAnswer(fileName)(modal);
                        setrlimit(RLIMIT_FSIZE, &tight);
                    },
                    pnMessageAnswer(QMessageBox::Ok, &question),
                    pnMessageAnswer(QMessageBox::Ok, &failure)});
    const bool saved = KrBrickUserFiles::saveWithDialog(material.get());
    setrlimit(RLIMIT_FSIZE, &old);
    QVERIFY(!saved);
    QCOMPARE(question.title, QStringLiteral("File Already Exists..."));
    QVERIFY(failure.handled);
    QCOMPARE(failure.title, QStringLiteral("File write error"));
    const QString head = QStringLiteral("Error writing file %1.\n").arg(fileName);
    QVERIFY2(failure.text.startsWith(head), qPrintable(failure.text));
    QVERIFY(failure.text.size() > head.size());
    QCOMPARE(pnReadBytes(fileName), before);
    // No half-written file is left beside it.
    QStringList files = QDir(m_env->path()).entryList(QDir::Files | QDir::Hidden);
    files = files.filter(QRegularExpression(QStringLiteral("^(?!krhost\\.ini)")));
    QCOMPARE(files, QStringList(QStringLiteral("full.kbm")));
}

void TestKrBrickUserFiles::writeIntoMissingFolderFails()
{
    UserPtr material = defaultBrickMaterial(QStringLiteral("Lost"));
    const QString fileName = m_env->path() + QStringLiteral("/no/such/folder/lost.kbm");
    QString error;
    QVERIFY(!KrBrickUserFiles::writeBrickUserFile(material.get(), fileName, &error));
    QVERIFY(!error.isEmpty());
    QVERIFY(!QFile::exists(fileName));
}

void TestKrBrickUserFiles::badFiles_data()
{
    QTest::addColumn<QByteArray>("bytes");
    QTest::addColumn<QString>("reason");

    UserPtr material = defaultBrickMaterial(QStringLiteral("Good"));
    KrSettings good;
    KrBrickUserFiles::writeRecord(material.get(), &good);
    const QByteArray goodBytes = good.toString().toUtf8();

    auto withClass = [&good](const QString& className) {
        KrSettings record(good);
        record.setStringValue(QStringLiteral("BrelvoHallixClassName"), className);
        return record.toString().toUtf8();
    };
    KrSettings noSet(good);
    noSet.removeValue(QStringLiteral("BrickSet"));
    KrSettings setIsText(good);
    setIsText.setStringValue(QStringLiteral("BrickSet"), QStringLiteral("not a record"));

    QByteArray binary;
    for (int i = 0; i < 4096; ++i)
        binary.append(char((i * 7919 + 13) % 256));

    const QString noClass = QStringLiteral("No class name.");
    QTest::newRow("empty") << QByteArray() << noClass;
    QTest::newRow("truncated") << goodBytes.left(goodBytes.size() / 2) << noClass;
    QTest::newRow("binary") << binary << noClass;
    QTest::newRow("plain text") << QByteArray("just some words\n") << noClass;
    QTest::newRow("unknown class") << withClass(QStringLiteral("KrNoSuchThing"))
                                   << QStringLiteral("Invalid class name: KrNoSuchThing.");
    QTest::newRow("not an element") << withClass(QStringLiteral("KrBrickCommandAction"))
                                    << QStringLiteral("Invalid class name: KrBrickCommandAction.");
    QTest::newRow("a brick, no brick user") << withClass(QStringLiteral("KrAddBrick"))
                                            << QStringLiteral("Invalid class name: KrAddBrick.");
    QTest::newRow("no BrickSet") << noSet.toString().toUtf8()
                                 << QStringLiteral("No brick settings given.");
    QTest::newRow("BrickSet not a record")
        << setIsText.toString().toUtf8() << QStringLiteral("No brick settings given.");
}

void TestKrBrickUserFiles::badFiles()
{
    QFETCH(QByteArray, bytes);
    QFETCH(QString, reason);
    const QString fileName = m_env->path() + QStringLiteral("/bad.kbm");
    QVERIFY(pnWriteBytes(fileName, bytes));

    QString error;
    UserPtr read(KrBrickUserFiles::readBrickUserFile(fileName, &error));
    QVERIFY(!read);
    QCOMPARE(error, QStringLiteral("Error reading file %1.\n%2").arg(fileName, reason));

    const QString missing = m_env->path() + QStringLiteral("/missing.kbm");
    QVERIFY(!KrBrickUserFiles::readBrickUserFile(missing, &error));
    QCOMPARE(error, QStringLiteral("Error reading file %1.\nNo class name.").arg(missing));
}

void TestKrBrickUserFiles::unknownBricksLoadWhatIsSound()
{
    UserPtr material = defaultBrickMaterial(QStringLiteral("Partly"));
    const int count = material->getBricks().size();
    KrSettings record;
    KrBrickUserFiles::writeRecord(material.get(), &record);

    // One brick record turns into a class nobody knows; wires to it lose their source.
    KrSettings* bricks = record.getSettingsValue(QStringLiteral("BrickSet"))
                             ->getSettingsValue(QStringLiteral("Bricks"));
    QVERIFY(bricks);
    QString victim;
    for (const QString& key : bricks->getKeys()) {
        KrSettings* brick = bricks->getSettingsValue(key);
        if (brick->getStringValue(QStringLiteral("BrelvoHallixClassName")) !=
            QLatin1String("KrSurfaceBrick")) {
            victim = key;
            brick->setStringValue(QStringLiteral("BrelvoHallixClassName"),
                                  QStringLiteral("KrVanishedBrick"));
            break;
        }
    }
    QVERIFY(!victim.isEmpty());
    const QString fileName = m_env->path() + QStringLiteral("/partly.kbm");
    QVERIFY(KrBrickUserFiles::writeTextFile(fileName, record.toString()));

    QString error;
    UserPtr read(KrBrickUserFiles::readBrickUserFile(fileName, &error));
    QVERIFY2(read, qPrintable(error));
    QCOMPARE(read->getBricks().size(), count - 1);
    QCOMPARE(read->getName(), QStringLiteral("Partly"));
}

void TestKrBrickUserFiles::openFlowRemembersFolder()
{
    QList<IKrBrickUser*> kinds;
    KrCorvaneUtility::getBrickUserList(kinds);
    const QString fileName = m_env->path() + QStringLiteral("/broken.kbm");
    QVERIFY(pnWriteBytes(fileName, "<nothing/>"));

    pnAnswerModals({pnFileAnswer(fileName)});
    QString error;
    QVERIFY(!KrBrickUserFiles::openWithDialog(kinds, &error));
    QCOMPARE(error, QStringLiteral("Error reading file %1.\nNo class name.").arg(fileName));
    QCOMPARE(storedFolder(QStringLiteral("LastOpen")), m_env->path());

    UserPtr material = defaultBrickMaterial(QStringLiteral("Opened"));
    const QString good = m_env->path() + QStringLiteral("/good.kbm");
    QVERIFY(KrBrickUserFiles::writeBrickUserFile(material.get(), good));
    pnAnswerModals({pnFileAnswer(good)});
    UserPtr read(KrBrickUserFiles::openWithDialog(kinds, &error));
    QVERIFY(read);
    QCOMPARE(read->getName(), QStringLiteral("Opened"));

    for (IKrBrickUser* kind : kinds)
        kind->release();
}

QTEST_MAIN(TestKrBrickUserFiles)
#include "tst_krbrickuserfiles.moc"
