#include "kroutputlabel.h"

#include <QLabel>
#include <QPointer>
#include <QRegularExpression>
#include <QtTest>

namespace {
using LabelArray = KrTArray<KrTSharedPointer<KrOutputLabelProperty>>;

// A warning of the array: "<header>(<line>): <message>", the header being the one that
// declares the array.
QRegularExpression arrayWarning(const QString& message)
{
    const QString header = LabelArray::sourceFile();
    return QRegularExpression(
        QStringLiteral("^%1\\(\\d+\\): %2$")
            .arg(QRegularExpression::escape(header), QRegularExpression::escape(message)));
}

KrTSharedPointer<KrOutputLabelProperty> label(const QString& name)
{
    return KrTSharedPointer<KrOutputLabelProperty>(new KrOutputLabelProperty(name));
}

QStringList names(const LabelArray& array)
{
    QStringList list;
    for (int i = 0; i < array.count(); ++i)
        list << (array.at(i) ? array.at(i)->getName() : QStringLiteral("null"));
    return list;
}
} // namespace

class TestKrOutputLabel : public QObject
{
    Q_OBJECT
private slots:
    void labelWidget();
    void growth();
    void addSpace_data();
    void addSpace();
    void removeByIndex_data();
    void removeByIndex();
    void warningNamesItsSource();
    void removalKeepsReferencesRight();
    void overwrittenSlotReleasesLabel();
    void emptyAndFreeAll();
};

void TestKrOutputLabel::labelWidget()
{
    QWidget parent;
    KrLabelPropertyWgt widget(&parent, QStringLiteral("row"));
    QCOMPARE(widget.parentWidget(), &parent);
    QVERIFY(!widget.showsValue());
    KrOutputLabelProperty property(QStringLiteral("Colour Out"));
    widget.addProperty(&property);
    QCOMPARE(widget.getFirstProperty(), &property);
    // Only the name shows, over the whole row; the value (always 0) does not.
    auto* name = widget.findChild<QLabel*>(QStringLiteral("PropertyName"));
    QVERIFY(name);
    QCOMPARE(name->text(), QStringLiteral("Colour Out"));
    QVERIFY(widget.findChild<QWidget*>(QStringLiteral("PropertyEditor"))->isHidden());
    QVERIFY(!widget.findChild<QLabel*>(QStringLiteral("PropertyValue")));

    // What a plain row would have shown.
    KrBasicPropertyWgt plain(&parent, QStringLiteral("plain"));
    plain.addProperty(&property);
    auto* value = plain.findChild<QLabel*>(QStringLiteral("PropertyValue"));
    QVERIFY(value);
    QCOMPARE(value->text(), QStringLiteral("0"));
}

void TestKrOutputLabel::growth()
{
    LabelArray array;
    QCOMPARE(array.capacity(), 0);
    QCOMPARE(array.growth(), 8);
    array.append(label(QStringLiteral("0")));
    QCOMPARE(array.capacity(), 8);
    for (int i = 1; i < 8; ++i)
        array.append(label(QString::number(i)));
    QCOMPARE(array.capacity(), 8);
    array.append(label(QStringLiteral("8")));
    QCOMPARE(array.capacity(), 16);
    QCOMPARE(array.count(), 9);
    QCOMPARE(names(array), (QStringList{"0", "1", "2", "3", "4", "5", "6", "7", "8"}));
    for (int i = 0; i < array.count(); ++i)
        QCOMPARE(array.at(i)->refCount(), 1);
}

void TestKrOutputLabel::addSpace_data()
{
    QTest::addColumn<int>("n");
    QTest::addColumn<bool>("keep");
    QTest::addColumn<bool>("ok");
    QTest::addColumn<int>("capacity");
    QTest::addColumn<int>("count");
    QTest::newRow("zero") << 0 << true << false << 8 << 3;
    QTest::newRow("negative") << -4 << true << false << 8 << 3;
    QTest::newRow("overflowing") << INT_MAX << true << false << 8 << 3;
    QTest::newRow("keep") << 5 << true << true << 13 << 3;
    QTest::newRow("drop") << 5 << false << true << 13 << 3;
}

void TestKrOutputLabel::addSpace()
{
    QFETCH(int, n);
    QFETCH(bool, keep);
    QFETCH(bool, ok);
    QFETCH(int, capacity);
    QFETCH(int, count);
    LabelArray array;
    for (const char* name : {"a", "b", "c"})
        array.append(label(QString::fromLatin1(name)));
    QPointer<KrOutputLabelProperty> first = array.at(0).data();
    if (!ok)
        QTest::ignoreMessage(
            QtWarningMsg,
            arrayWarning(
                QStringLiteral("Invalid size '%1' passed to KrTArray::addSpace()").arg(n)));
    QCOMPARE(array.addSpace(n, keep), ok);
    QCOMPARE(array.capacity(), capacity);
    QCOMPARE(array.count(), count);
    if (ok && !keep) {
        // The dropped elements are released; their slots are empty.
        QVERIFY(!first);
        QCOMPARE(names(array), (QStringList{"null", "null", "null"}));
    } else {
        QCOMPARE(names(array), (QStringList{"a", "b", "c"}));
        QCOMPARE(first->refCount(), 1);
    }
}

void TestKrOutputLabel::removeByIndex_data()
{
    QTest::addColumn<int>("index");
    QTest::addColumn<int>("count");
    QTest::addColumn<QString>("warning");
    QTest::addColumn<QStringList>("left");
    QTest::newRow("first") << 0 << 1 << QString() << QStringList{"b", "c"};
    QTest::newRow("middle") << 1 << 1 << QString() << QStringList{"a", "c"};
    QTest::newRow("last two") << 1 << 2 << QString() << QStringList{"a"};
    QTest::newRow("too many") << 1 << 5
                              << "Too many items specified for removal in KrTArray::removeByIndex()"
                              << QStringList{"a"};
    QTest::newRow("index at the end")
        << 3 << 1 << "Invalid starting index specified in KrTArray::removeByIndex()"
        << QStringList{"a", "b", "c"};
    QTest::newRow("negative index")
        << -1 << 1 << "Invalid starting index specified in KrTArray::removeByIndex()"
        << QStringList{"a", "b", "c"};
    QTest::newRow("negative count")
        << 0 << -2 << "Invalid count '-2' specified in KrTArray::removeByIndex()"
        << QStringList{"a", "b", "c"};
}

void TestKrOutputLabel::removeByIndex()
{
    QFETCH(int, index);
    QFETCH(int, count);
    QFETCH(QString, warning);
    QFETCH(QStringList, left);
    LabelArray array;
    for (const char* name : {"a", "b", "c"})
        array.append(label(QString::fromLatin1(name)));
    if (!warning.isEmpty())
        QTest::ignoreMessage(QtWarningMsg, arrayWarning(warning));
    array.removeByIndex(index, count);
    QCOMPARE(names(array), left);
    QCOMPARE(array.capacity(), 8);
}

namespace {
QStringList s_messages;
void collect(QtMsgType, const QMessageLogContext&, const QString& message)
{
    s_messages << message;
}
} // namespace

void TestKrOutputLabel::warningNamesItsSource()
{
    QVERIFY(LabelArray::sourceFile().endsWith(QLatin1String("krcorvanegui/kroutputlabel.h")));
    s_messages.clear();
    QtMessageHandler previous = qInstallMessageHandler(collect);
    LabelArray array;
    array.addSpace(0, true);
    array.removeByIndex(0, 1);
    qInstallMessageHandler(previous);
    QCOMPARE(s_messages.size(), 2);

    QFile header(QStringLiteral(KR_SOURCE_DIR "/krcorvanegui/kroutputlabel.h"));
    QVERIFY(header.open(QIODevice::ReadOnly | QIODevice::Text));
    const QStringList lines = QString::fromUtf8(header.readAll()).split(QLatin1Char('\n'));
    const QStringList texts{QStringLiteral("Invalid size '%1' passed"),
                            QStringLiteral("Invalid starting index specified")};
    for (int i = 0; i < 2; ++i) {
        const QRegularExpressionMatch match =
            QRegularExpression(QStringLiteral("\\((\\d+)\\): ")).match(s_messages.at(i));
        QVERIFY(match.hasMatch());
        // The line named is the one that reports this message.
        const int line = match.captured(1).toInt();
        QVERIFY(line >= 1 && line <= lines.size());
        QVERIFY2(lines.mid(line - 1, 3).join(QLatin1Char(' ')).contains(texts.at(i)),
                 qPrintable(s_messages.at(i)));
    }
}

void TestKrOutputLabel::removalKeepsReferencesRight()
{
    LabelArray array;
    for (const char* name : {"a", "b", "c"})
        array.append(label(QString::fromLatin1(name)));
    QPointer<KrOutputLabelProperty> a = array.at(0).data();
    QPointer<KrOutputLabelProperty> b = array.at(1).data();
    QPointer<KrOutputLabelProperty> c = array.at(2).data();
    array.removeByIndex(0, 1);
    QVERIFY(!a); // overwritten by the move, nobody else held it
    QCOMPARE(b->refCount(), 1);
    // The slot past the end keeps its element until it is reused.
    QCOMPARE(c->refCount(), 2);
    array.append(label(QStringLiteral("d")));
    QCOMPARE(c->refCount(), 1);
    QCOMPARE(names(array), (QStringList{"b", "c", "d"}));
}

void TestKrOutputLabel::overwrittenSlotReleasesLabel()
{
    LabelArray array;
    QPointer<KrOutputLabelProperty> held;
    QPointer<KrOutputLabelProperty> dropped;
    {
        KrTSharedPointer<KrOutputLabelProperty> keep = label(QStringLiteral("held"));
        held = keep.data();
        array.append(keep);
        array.append(label(QStringLiteral("dropped")));
        dropped = array.at(1).data();
        // The rebuild's way of emptying the list: the slots still hold the labels.
        array.empty();
        QVERIFY(held && dropped);
        array.append(label(QStringLiteral("new 0")));
        QVERIFY(held); // still held by keep
        QCOMPARE(held->refCount(), 1);
        array.append(label(QStringLiteral("new 1")));
        QVERIFY(!dropped); // its last reference went with the slot
    }
    QVERIFY(!held);
    QCOMPARE(names(array), (QStringList{"new 0", "new 1"}));
}

void TestKrOutputLabel::emptyAndFreeAll()
{
    LabelArray array;
    array.append(label(QStringLiteral("a")));
    QPointer<KrOutputLabelProperty> a = array.at(0).data();
    array.empty();
    QCOMPARE(array.count(), 0);
    QCOMPARE(array.capacity(), 8);
    QVERIFY(a);
    array.freeAll();
    QVERIFY(!a);
    QCOMPARE(array.count(), 0);
    QCOMPARE(array.capacity(), 0);
    array.append(label(QStringLiteral("again")));
    QCOMPARE(array.capacity(), 8);
    {
        auto* owned = new LabelArray;
        owned->append(label(QStringLiteral("gone")));
        QPointer<KrOutputLabelProperty> gone = owned->at(0).data();
        delete owned;
        QVERIFY(!gone);
    }
}

QTEST_MAIN(TestKrOutputLabel)
#include "tst_kroutputlabel.moc"
