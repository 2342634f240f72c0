#include "krsettings.h"
#include "settings_random.h"

#include <QtTest>

#include <cmath>
#include <ctime>
#include <cstring>
#include <limits>

namespace {

quint64 bitsOf(double v)
{
    quint64 bits;
    std::memcpy(&bits, &v, sizeof bits);
    return bits;
}

double fromBits(quint64 bits)
{
    double v;
    std::memcpy(&v, &bits, sizeof v);
    return v;
}

bool isAscii(const QString& text)
{
    for (QChar c : text) {
        if (c.unicode() >= 0x80)
            return false;
    }
    return true;
}

// A record with one value of every kind, nested twice.
KrSettings sampleRecord()
{
    KrSettings s;
    s.setBoolValue(QStringLiteral("HideParams"), true);
    s.setIntValue(QStringLiteral("Width"), -120);
    s.setFloatValue(QStringLiteral("PosX"), 10.25);
    s.setStringValue(QStringLiteral("BrickTitle"), QStringLiteral("Gr\u00f6\u00dfe <1> & \"2\""));
    KrSettings* params = s.setSettingsValue(QStringLiteral("BrickParams"));
    KrSettings* color = params->setSettingsValue(QStringLiteral("Param_0"))
                            ->setSettingsValue(QStringLiteral("ConnectionColor"));
    color->setIntValue(QStringLiteral("Red"), 255);
    s.setStringValue(QString(), QString());
    return s;
}

QString nested(int levels)
{
    QString text = QStringLiteral("<settings version=\"1\">");
    for (int i = 0; i < levels; ++i)
        text += QStringLiteral("<settings key=\"n\">");
    for (int i = 0; i < levels; ++i)
        text += QStringLiteral("</settings>");
    return text + QStringLiteral("</settings>");
}

} // namespace

class TestKrSettings : public QObject
{
    Q_OBJECT

private slots:
    void typedAccess();
    void replaceKeepsPosition();
    void removeValue();
    void nestedPointersStayValid();
    void copyIntoOwnTree();
    void equality();

    void roundTripRandom_data();
    void roundTripRandom();
    void roundTripFloatBits_data();
    void roundTripFloatBits();
    void roundTripText_data();
    void roundTripText();
    void roundTripDepthLimit();

    void readsHandWritten_data();
    void readsHandWritten();
    void rejects_data();
    void rejects();
    void rejectsEveryTruncation();
    void rejectsHugeText();
    void tenThousandValuesAreFast();
};

void TestKrSettings::typedAccess()
{
    KrSettings s;
    QVERIFY(s.isEmpty());
    s.setBoolValue("B", true);
    s.setIntValue("I", 42);
    s.setFloatValue("F", 2.5);
    s.setStringValue("S", "text");
    QCOMPARE(s.getNumKeys(), 4);
    QCOMPARE(s.getKeys(), QStringList({"B", "I", "F", "S"}));
    QCOMPARE(s.getKey(3), QStringLiteral("S"));
    QVERIFY(s.getKey(4).isNull());
    QVERIFY(s.getKey(-1).isNull());
    QCOMPARE(s.getValueType("F"), KrSettings::Float);
    QCOMPARE(s.getValueType("missing"), KrSettings::Invalid);

    QCOMPARE(s.getBoolValue("B"), true);
    QCOMPARE(s.getIntValue("I"), 42);
    QCOMPARE(s.getFloatValue("F"), 2.5);
    QCOMPARE(s.getStringValue("S"), QStringLiteral("text"));

    // Missing keys and other types answer the default: no silent conversions.
    QCOMPARE(s.getIntValue("missing", 7), 7);
    QCOMPARE(s.getIntValue("F", 7), 7);
    QCOMPARE(s.getFloatValue("I", -1.0), -1.0);
    QCOMPARE(s.getBoolValue("I", false), false);
    QCOMPARE(s.getStringValue("I", "dflt"), QStringLiteral("dflt"));
    QVERIFY(!s.getSettingsValue("S"));
    QVERIFY(!static_cast<const KrSettings&>(s).getSettingsValue("missing"));
}

void TestKrSettings::replaceKeepsPosition()
{
    KrSettings s;
    s.setIntValue("A", 1);
    KrSettings* child = s.setSettingsValue("B");
    child->setIntValue("x", 1);
    s.setIntValue("C", 3);

    s.setStringValue("A", "now a string");
    QCOMPARE(s.getKeys(), QStringList({"A", "B", "C"}));
    QCOMPARE(s.getValueType("A"), KrSettings::String);
    QCOMPARE(s.getIntValue("A", -1), -1);

    // Making a record where one is empties it in place, so the old pointer still works.
    QCOMPARE(s.setSettingsValue("B"), child);
    QVERIFY(child->isEmpty());

    s.setBoolValue("B", true);
    QCOMPARE(s.getKeys(), QStringList({"A", "B", "C"}));
    QVERIFY(!s.getSettingsValue("B"));
}

void TestKrSettings::removeValue()
{
    KrSettings s;
    for (int i = 0; i < 5; ++i)
        s.setIntValue(QString::number(i), i);
    QVERIFY(!s.removeValue("missing"));
    QVERIFY(s.removeValue("1"));
    QVERIFY(!s.removeValue("1"));
    QCOMPARE(s.getKeys(), QStringList({"0", "2", "3", "4"}));
    // Keys after the removed one must still be found (their positions moved).
    QCOMPARE(s.getIntValue("4", -1), 4);
    QCOMPARE(s.getIntValue("2", -1), 2);
    s.setIntValue("1", 10);
    QCOMPARE(s.getKeys(), QStringList({"0", "2", "3", "4", "1"}));
    QVERIFY(s.removeValue("0"));
    QCOMPARE(s.getIntValue("1", -1), 10);
    s.clear();
    QVERIFY(s.isEmpty());
    QVERIFY(!s.hasKey("2"));
}

void TestKrSettings::nestedPointersStayValid()
{
    KrSettings s;
    KrSettings* first = s.setSettingsValue("First");
    first->setStringValue("Name", "kept");
    for (int i = 0; i < 10000; ++i)
        s.setIntValue(QStringLiteral("K%1").arg(i), i);
    QCOMPARE(s.getSettingsValue("First"), first);
    QCOMPARE(first->getStringValue("Name"), QStringLiteral("kept"));
    first->setIntValue("After", 1);
    QCOMPARE(s.getSettingsValue("First")->getIntValue("After"), 1);
}

void TestKrSettings::copyIntoOwnTree()
{
    KrSettings s = sampleRecord();
    const KrSettings before = s;

    // A record stored under one of its own keys is a copy of what it was.
    KrSettings* self = s.setSettingsValue("Self", s);
    QCOMPARE(*self, before);

    // Copying an ancestor into a descendant and a descendant over its ancestor.
    KrSettings* params = s.getSettingsValue("BrickParams");
    QVERIFY(params);
    *params = before;
    QCOMPARE(*s.getSettingsValue("BrickParams"), before);
    s = *s.getSettingsValue("Self");
    QCOMPARE(s, before);

    KrSettings copy(s);
    copy.getSettingsValue("BrickParams")->setIntValue("Extra", 1);
    QVERIFY(!s.getSettingsValue("BrickParams")->hasKey("Extra"));
}

void TestKrSettings::equality()
{
    KrSettings a;
    a.setIntValue("x", 1);
    a.setIntValue("y", 2);
    KrSettings b;
    b.setIntValue("y", 2);
    b.setIntValue("x", 1);
    QVERIFY(a != b); // order matters

    KrSettings i, f;
    i.setIntValue("v", 1);
    f.setFloatValue("v", 1.0);
    QVERIFY(i != f);

    KrSettings zero, negZero, nan1, nan2;
    zero.setFloatValue("v", 0.0);
    negZero.setFloatValue("v", -0.0);
    nan1.setFloatValue("v", std::numeric_limits<double>::quiet_NaN());
    nan2.setFloatValue("v", std::numeric_limits<double>::quiet_NaN());
    QVERIFY(zero != negZero);
    QVERIFY(nan1 == nan2);

    KrSettings n1 = sampleRecord(), n2 = sampleRecord();
    QVERIFY(n1 == n2);
    n2.getSettingsValue("BrickParams")
        ->getSettingsValue("Param_0")
        ->getSettingsValue("ConnectionColor")
        ->setIntValue("Red", 254);
    QVERIFY(n1 != n2);
}

void TestKrSettings::roundTripRandom_data()
{
    QTest::addColumn<quint32>("seed");
    for (quint32 seed = 1; seed <= 300; ++seed)
        QTest::addRow("seed %u", seed) << seed;
}

void TestKrSettings::roundTripRandom()
{
    QFETCH(quint32, seed);
    QRandomGenerator rng(seed);
    KrSettings original;
    KrSettingsRandom::fillRecord(rng, original, 24, 4);

    const QString text = original.toString();
    QVERIFY(isAscii(text));
    KrSettings read;
    read.setIntValue("stale", 1); // must be replaced, not merged
    QVERIFY2(read.fromString(text), qPrintable(text.left(2000)));
    QCOMPARE(read.getKeys(), original.getKeys());
    QVERIFY(read == original);
    QCOMPARE(read.toString(), text);
}

void TestKrSettings::roundTripFloatBits_data()
{
    QTest::addColumn<quint64>("bits");
    QTest::newRow("+0") << bitsOf(0.0);
    QTest::newRow("-0") << bitsOf(-0.0);
    QTest::newRow("inf") << bitsOf(std::numeric_limits<double>::infinity());
    QTest::newRow("-inf") << bitsOf(-std::numeric_limits<double>::infinity());
    QTest::newRow("nan") << Q_UINT64_C(0x7ff8000000000000);
    QTest::newRow("-nan (x86 default)") << Q_UINT64_C(0xfff8000000000000);
    QTest::newRow("nan payload") << Q_UINT64_C(0x7ff8000000000123);
    QTest::newRow("signaling nan") << Q_UINT64_C(0x7ff0000000000001);
    QTest::newRow("smallest denormal") << Q_UINT64_C(0x0000000000000001);
    QTest::newRow("largest denormal") << Q_UINT64_C(0x000fffffffffffff);
    QTest::newRow("-denormal") << Q_UINT64_C(0x800000000000abcd);
    QTest::newRow("max") << bitsOf(std::numeric_limits<double>::max());
    QTest::newRow("lowest") << bitsOf(std::numeric_limits<double>::lowest());
    QTest::newRow("0.1") << bitsOf(0.1);
    QTest::newRow("1/3") << bitsOf(1.0 / 3.0);
    QTest::newRow("1e23") << bitsOf(1e23);
    QTest::newRow("2^53+2") << bitsOf(9007199254740994.0);
    QRandomGenerator rng(7);
    for (int i = 0; i < 200; ++i)
        QTest::addRow("random %d", i) << rng.generate64();
}

void TestKrSettings::roundTripFloatBits()
{
    QFETCH(quint64, bits);
    KrSettings s;
    s.setFloatValue("v", fromBits(bits));
    KrSettings read;
    QVERIFY(read.fromString(s.toString()));
    QCOMPARE(QString::number(bitsOf(read.getFloatValue("v")), 16), QString::number(bits, 16));
}

void TestKrSettings::roundTripText_data()
{
    QTest::addColumn<QString>("text");
    QTest::newRow("empty") << QString();
    QTest::newRow("spaces only") << QStringLiteral("   ");
    QTest::newRow("edges") << QStringLiteral("  padded\t\n");
    QTest::newRow("markup") << QStringLiteral("<a href=\"x\">&amp; ]]> '</a>");
    QTest::newRow("crlf") << QStringLiteral("line1\r\nline2\rline3");
    QTest::newRow("nul") << QString::fromUtf16(u"a\u0000b", 3);
    QTest::newRow("controls") << QString::fromUtf16(u"\u0001\u001f\u007f\u0085", 4);
    QTest::newRow("lone high") << QString(QChar(0xD800)) + "x";
    QTest::newRow("lone low") << "x" + QString(QChar(0xDC00));
    QTest::newRow("swapped pair") << QString(QChar(0xDC00)) + QChar(0xD800);
    QTest::newRow("noncharacters") << QString(QChar(0xFFFE)) + QChar(0xFFFF);
    QTest::newRow("astral") << QString::fromUtf8("\xF0\x9F\x98\x80 smile");
    QTest::newRow("latin and cjk") << QString::fromUtf8("Gr\xC3\xB6\xC3\x9F"
                                                        "e \xE4\xB8\xAD");
    QTest::newRow("bom and nbsp") << QString::fromUtf16(u"\uFEFF\u00A0", 2);
    QTest::newRow("looks like a reference") << QStringLiteral("&#x41; &lt;");
}

void TestKrSettings::roundTripText()
{
    QFETCH(QString, text);
    // The same text as a key, as a string value and as the key of a nested record.
    KrSettings s;
    s.setStringValue(text, text);
    s.setSettingsValue("n")->setStringValue(text, text);
    const QString xml = s.toString();
    QVERIFY(isAscii(xml));
    KrSettings read;
    QVERIFY2(read.fromString(xml), qPrintable(xml));
    QCOMPARE(read.getKey(0), text);
    QCOMPARE(read.getStringValue(text, "missing"), text);
    QCOMPARE(read.getSettingsValue("n")->getStringValue(text, "missing"), text);
    QVERIFY(read == s);
}

void TestKrSettings::roundTripDepthLimit()
{
    // 256 levels below the top record are readable, so they round-trip.
    KrSettings top;
    KrSettings* r = &top;
    for (int i = 0; i < 256; ++i)
        r = r->setSettingsValue("n");
    r->setIntValue("leaf", 1);
    KrSettings read;
    QVERIFY(read.fromString(top.toString()));
    QVERIFY(read == top);
    QVERIFY(read.fromString(nested(256)));
    QVERIFY(!read.fromString(nested(257)));
}

void TestKrSettings::readsHandWritten_data()
{
    QTest::addColumn<QString>("text");
    QTest::addColumn<QString>("key");
    QTest::addColumn<QString>("expected"); // the value's text form

    QTest::newRow("declaration")
        << "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<settings version=\"1\"><int "
           "key=\"a\">5</int></settings>"
        << "a"
        << "5";
    QTest::newRow("comments and spaces")
        << "<!-- saved -->\n<settings version=\"1\">\n  <!-- x -->\n  <bool key=\"a\">true</bool>\n"
           "</settings>\n<!-- end -->"
        << "a"
        << "true";
    QTest::newRow("raw unicode") << QString::fromUtf8(
                                        "<settings version=\"1\"><string key=\"\xC3\xA9\">"
                                        "\xE4\xB8\xAD</string></settings>")
                                 << QString::fromUtf8("\xC3\xA9")
                                 << QString::fromUtf8("\xE4\xB8\xAD");
    QTest::newRow("references")
        << "<settings version=\"1\"><string key=\"&#x41;\">&lt;&#66;&gt;</string></settings>"
        << "A"
        << "<B>";
    QTest::newRow("cdata") << "<settings version=\"1\"><string key=\"s\"><![CDATA[<&>]]></string>"
                              "</settings>"
                           << "s"
                           << "<&>";
    QTest::newRow("self-closing string") << "<settings version=\"1\"><string key=\"s\"/></settings>"
                                         << "s"
                                         << "";
    QTest::newRow("int min")
        << "<settings version=\"1\"><int key=\"i\">-2147483648</int></settings>"
        << "i"
        << "-2147483648";
    QTest::newRow("float exponent")
        << "<settings version=\"1\"><float key=\"f\">1.5e+3</float></settings>"
        << "f"
        << "1500";
}

void TestKrSettings::readsHandWritten()
{
    QFETCH(QString, text);
    QFETCH(QString, key);
    QFETCH(QString, expected);
    KrSettings s;
    QVERIFY(s.fromString(text));
    QCOMPARE(s.getNumKeys(), 1);
    QCOMPARE(s.getKey(0), key);
    QString value;
    switch (s.getValueType(key)) {
    case KrSettings::Bool:
        value = s.getBoolValue(key) ? "true" : "false";
        break;
    case KrSettings::Int:
        value = QString::number(s.getIntValue(key));
        break;
    case KrSettings::Float:
        value = QString::number(s.getFloatValue(key));
        break;
    case KrSettings::String:
        value = s.getStringValue(key);
        break;
    default:
        QFAIL("unexpected type");
    }
    QCOMPARE(value, expected);
}

void TestKrSettings::rejects_data()
{
    QTest::addColumn<QString>("text");
    const QString head = "<settings version=\"1\">";
    const QString tail = "</settings>";
    auto wrap = [&](const QString& body) { return head + body + tail; };

    QTest::newRow("empty") << QString();
    QTest::newRow("whitespace") << QStringLiteral("  \n ");
    QTest::newRow("plain text") << QStringLiteral("PosX=10");
    QTest::newRow("json") << QStringLiteral("{\"a\": 1}");
    QTest::newRow("other root") << QStringLiteral("<config version=\"1\"/>");
    QTest::newRow("no version") << QStringLiteral("<settings/>");
    QTest::newRow("future version") << QStringLiteral("<settings version=\"2\"/>");
    QTest::newRow("root with key") << QStringLiteral("<settings version=\"1\" key=\"a\"/>");
    QTest::newRow("two roots") << head + tail + head + tail;
    QTest::newRow("text after root") << head + tail + "x";
    QTest::newRow("stray text") << wrap("hello");
    QTest::newRow("unknown element") << wrap("<double key=\"a\">1</double>");
    QTest::newRow("namespaced") << wrap("<x:int xmlns:x=\"urn:x\" key=\"a\">1</x:int>");
    QTest::newRow("default namespace") << "<settings xmlns=\"urn:x\" version=\"1\"/>";
    QTest::newRow("missing key") << wrap("<int>1</int>");
    QTest::newRow("two keys") << wrap("<int key=\"a\" key-base64=\"YQA=\">1</int>");
    QTest::newRow("unknown attribute") << wrap("<int key=\"a\" unit=\"px\">1</int>");
    QTest::newRow("encoding on int") << wrap("<int key=\"a\" encoding=\"base64\">1</int>");
    QTest::newRow("unknown encoding") << wrap("<string key=\"a\" encoding=\"hex\">41</string>");
    QTest::newRow("bad base64 value") << wrap("<string key=\"a\" encoding=\"base64\">@@@</string>");
    QTest::newRow("odd base64 value")
        << wrap("<string key=\"a\" encoding=\"base64\">QQ==</string>");
    QTest::newRow("bad base64 key") << wrap("<int key-base64=\"!\">1</int>");
    QTest::newRow("int text") << wrap("<int key=\"a\">abc</int>");
    QTest::newRow("int empty") << wrap("<int key=\"a\"></int>");
    QTest::newRow("int float") << wrap("<int key=\"a\">1.5</int>");
    QTest::newRow("int spaces") << wrap("<int key=\"a\"> 1</int>");
    QTest::newRow("int plus") << wrap("<int key=\"a\">+1</int>");
    QTest::newRow("int hex") << wrap("<int key=\"a\">0x10</int>");
    QTest::newRow("int too big") << wrap("<int key=\"a\">2147483648</int>");
    QTest::newRow("int too small") << wrap("<int key=\"a\">-2147483649</int>");
    QTest::newRow("int huge") << wrap("<int key=\"a\">99999999999999999999</int>");
    QTest::newRow("bool yes") << wrap("<bool key=\"a\">yes</bool>");
    QTest::newRow("bool 1") << wrap("<bool key=\"a\">1</bool>");
    QTest::newRow("bool case") << wrap("<bool key=\"a\">True</bool>");
    QTest::newRow("float text") << wrap("<float key=\"a\">abc</float>");
    QTest::newRow("float comma") << wrap("<float key=\"a\">1,5</float>");
    QTest::newRow("float overflow") << wrap("<float key=\"a\">1e999</float>");
    QTest::newRow("float NaN spelling") << wrap("<float key=\"a\">NaN</float>");
    QTest::newRow("float short payload") << wrap("<float key=\"a\">nan:7ff8</float>");
    QTest::newRow("float payload not nan") << wrap("<float key=\"a\">nan:3ff0000000000000</float>");
    QTest::newRow("element in value") << wrap("<int key=\"a\"><int key=\"b\">1</int></int>");
    QTest::newRow("duplicate key") << wrap("<int key=\"a\">1</int><bool key=\"a\">true</bool>");
    QTest::newRow("duplicate empty key") << wrap("<int key=\"\">1</int><int key=\"\">2</int>");
    QTest::newRow("duplicate via base64")
        << wrap("<int key=\"a\">1</int><int key-base64=\"YQA=\">2</int>");
    QTest::newRow("duplicate nested")
        << wrap("<settings key=\"n\"><int key=\"a\">1</int><int key=\"a\">2</int></settings>");
    QTest::newRow("unclosed") << head + "<int key=\"a\">1</int>";
    QTest::newRow("mismatched") << wrap("<int key=\"a\">1</bool>");
    QTest::newRow("raw nul") << wrap(QStringLiteral("<string key=\"a\">") + QChar(0) + "</string>");
    QTest::newRow("nul reference") << wrap("<string key=\"a\">&#0;</string>");
    QTest::newRow("undeclared entity") << wrap("<string key=\"a\">&nbsp;</string>");
    QTest::newRow("doctype") << "<!DOCTYPE settings [<!ENTITY e \"x\">]>" +
                                    wrap("<string key=\"a\">&e;</string>");
    QTest::newRow("processing instruction") << head + "<?run me?>" + tail;
    QTest::newRow("too deep") << nested(257);
    QTest::newRow("far too deep") << nested(100000);

    QRandomGenerator rng(99);
    for (int i = 0; i < 20; ++i) {
        QString garbage(200 + rng.bounded(2000), Qt::Uninitialized);
        for (QChar& c : garbage)
            c = QChar(ushort(rng.bounded(0x10000)));
        QTest::addRow("binary %d", i) << garbage;
        QByteArray bytes(300, Qt::Uninitialized);
        rng.fillRange(reinterpret_cast<quint32*>(bytes.data()), bytes.size() / 4);
        QTest::addRow("latin1 bytes %d", i) << QString::fromLatin1(bytes);
    }
}

void TestKrSettings::rejects()
{
    QFETCH(QString, text);
    KrSettings s = sampleRecord();
    const QString before = s.toString();
    QVERIFY(!s.fromString(text));
    QCOMPARE(s.toString(), before);
    QVERIFY(s == sampleRecord());
}

void TestKrSettings::rejectsEveryTruncation()
{
    for (quint32 seed = 1; seed <= 3; ++seed) {
        QRandomGenerator rng(seed);
        KrSettings source;
        KrSettingsRandom::fillRecord(rng, source, 10, 2);
        source.setSettingsValue("tail")->setStringValue("k", "v");
        const QString text = source.toString();
        const int lastTag = text.lastIndexOf(QLatin1Char('>'));
        KrSettings s = sampleRecord();
        const QString before = s.toString();
        for (int length = 0; length <= lastTag; ++length) {
            if (s.fromString(text.left(length)))
                QFAIL(qPrintable(QStringLiteral("accepted %1 of %2 characters: %3")
                                     .arg(length)
                                     .arg(text.size())
                                     .arg(text.left(length))));
        }
        QCOMPARE(s.toString(), before);
        QVERIFY(s.fromString(text.left(lastTag + 1)));
        QVERIFY(s == source);
    }
}

void TestKrSettings::rejectsHugeText()
{
    const QString head = "<settings version=\"1\"><string key=\"a\">";
    const QString tail = "</string></settings>";
    QString text;
    text.reserve(64 * 1024 * 1024 + 1);
    text += head;
    text += QString(64 * 1024 * 1024 - head.size() - tail.size() + 1, QLatin1Char('x'));
    text += tail;
    QCOMPARE(text.size(), 64 * 1024 * 1024 + 1);
    KrSettings s = sampleRecord();
    QVERIFY(!s.fromString(text));
    QVERIFY(s == sampleRecord());
}

void TestKrSettings::tenThousandValuesAreFast()
{
    KrSettings s;
    QRandomGenerator rng(5);
    for (int i = 0; i < 10000; ++i) {
        const QString key = QStringLiteral("Key%1").arg(i);
        switch (i % 5) {
        case 0:
            s.setBoolValue(key, i % 3 == 0);
            break;
        case 1:
            s.setIntValue(key, int(rng.generate()));
            break;
        case 2:
            s.setFloatValue(key, KrSettingsRandom::randomDouble(rng));
            break;
        case 3:
            s.setStringValue(key, KrSettingsRandom::randomText(rng, 30));
            break;
        default:
            s.setSettingsValue(key)->setIntValue("x", i);
            break;
        }
    }
    // Processor time, so a machine busy with other work does not fail the test.
    const std::clock_t start = std::clock();
    const QString text = s.toString();
    KrSettings read;
    QVERIFY(read.fromString(text));
    const qint64 elapsed = qint64(std::clock() - start) * 1000 / CLOCKS_PER_SEC;
    QVERIFY(read == s);
    QVERIFY2(elapsed < 1000, qPrintable(QStringLiteral("%1 ms").arg(elapsed)));
}

QTEST_GUILESS_MAIN(TestKrSettings)
#include "tst_krsettings.moc"
