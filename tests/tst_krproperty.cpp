#include "krproperty.h"
#include "krsettings.h"
#include "krundo.h"

#include <QSignalSpy>
#include <QtTest>
#include <cmath>
#include <limits>
#include <memory>

// Fresh properties of each kind in a known state.
static std::unique_ptr<KrProperty> makeProperty(const QString& kind)
{
    if (kind == QLatin1String("int")) {
        auto p = std::make_unique<KrIntProperty>(QStringLiteral("Count"), false, false, 5);
        p->setRange(0, 10);
        return p;
    }
    if (kind == QLatin1String("intOpen"))
        return std::make_unique<KrIntProperty>(QStringLiteral("Count"), false, false, 5);
    if (kind == QLatin1String("float")) {
        auto p = std::make_unique<KrFloatProperty>(QStringLiteral("Gain"), 0.5);
        p->setRange(-1.0, 1.0);
        return p;
    }
    if (kind == QLatin1String("floatOpen"))
        return std::make_unique<KrFloatProperty>(QStringLiteral("Gain"), 0.5);
    if (kind == QLatin1String("bool"))
        return std::make_unique<KrBoolProperty>(QStringLiteral("Visible"), false);
    if (kind == QLatin1String("string"))
        return std::make_unique<KrStringProperty>(QStringLiteral("Label"), QStringLiteral("abc"));
    if (kind == QLatin1String("color"))
        return std::make_unique<KrColorProperty>(QStringLiteral("Tint"), QColor(Qt::white));
    if (kind == QLatin1String("enum"))
        return std::make_unique<KrEnumProperty>(
            QStringLiteral("Quality"),
            QStringList{QStringLiteral("Low"), QStringLiteral("Mid"), QStringLiteral("High")}, 1);
    return nullptr;
}

class TestKrProperty : public QObject
{
    Q_OBJECT
private slots:
    void kinds_data();
    void kinds();
    void setValue_data();
    void setValue();
    void settingsRoundTrip_data();
    void settingsRoundTrip();
    void readValueRefusesWrongRecords_data();
    void readValueRefusesWrongRecords();
    void rangeChangeClamps();
    void enumItems();
    void undoableChange();
    void undoStepOutlivesProperty();
    void pushUndoStepRecordsLiveEdit();
    void noUndoWithoutStack();
    void path_data();
    void path();
    void stateSignals();
};

void TestKrProperty::kinds_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QString>("typeLabel");
    QTest::addColumn<QString>("widgetClass");
    QTest::addColumn<QVariant>("defaultValue");
    QTest::newRow("int") << "int"
                         << "int"
                         << "KrIntPropertyWgt" << QVariant(5);
    QTest::newRow("float") << "float"
                           << "float"
                           << "KrFloatPropertyWgt" << QVariant(0.5);
    QTest::newRow("bool") << "bool"
                          << "bool"
                          << "KrBoolPropertyWgt" << QVariant(false);
    QTest::newRow("string") << "string"
                            << "string"
                            << "KrStringPropertyWgt" << QVariant(QStringLiteral("abc"));
    QTest::newRow("color") << "color"
                           << "color"
                           << "KrColorPropertyWgt" << QVariant(QColor(Qt::white));
    QTest::newRow("enum") << "enum"
                          << "enum"
                          << "KrEnumPropertyWgt" << QVariant(1);
}

void TestKrProperty::kinds()
{
    QFETCH(QString, kind);
    QFETCH(QString, typeLabel);
    QFETCH(QString, widgetClass);
    QFETCH(QVariant, defaultValue);
    auto p = makeProperty(kind);
    QCOMPARE(p->getTypeLabel(), typeLabel);
    QCOMPARE(p->getWidgetClassName(), widgetClass);
    QCOMPARE(p->getValue(), defaultValue);
    QCOMPARE(p->getDefaultValue(), defaultValue);
}

void TestKrProperty::setValue_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QVariant>("input");
    QTest::addColumn<bool>("accepted");
    QTest::addColumn<QVariant>("expected");
    QTest::addColumn<bool>("changed");

    const double nan = std::numeric_limits<double>::quiet_NaN();
    const double inf = std::numeric_limits<double>::infinity();
    const int intMax = std::numeric_limits<int>::max();
    const int intMin = std::numeric_limits<int>::min();

    QTest::newRow("int in range") << "int" << QVariant(7) << true << QVariant(7) << true;
    QTest::newRow("int same") << "int" << QVariant(5) << true << QVariant(5) << false;
    QTest::newRow("int above max") << "int" << QVariant(42) << true << QVariant(10) << true;
    QTest::newRow("int below min") << "int" << QVariant(-3) << true << QVariant(0) << true;
    QTest::newRow("int from text")
        << "int" << QVariant(QStringLiteral(" 9 ")) << true << QVariant(9) << true;
    QTest::newRow("int rounds real") << "int" << QVariant(3.6) << true << QVariant(4) << true;
    QTest::newRow("int huge clamps")
        << "int" << QVariant(qlonglong(1e12)) << true << QVariant(10) << true;
    QTest::newRow("int word") << "int" << QVariant(QStringLiteral("abc")) << false << QVariant(5)
                              << false;
    QTest::newRow("int empty text")
        << "int" << QVariant(QString()) << false << QVariant(5) << false;
    QTest::newRow("int invalid") << "int" << QVariant() << false << QVariant(5) << false;
    QTest::newRow("int bool") << "int" << QVariant(true) << false << QVariant(5) << false;
    QTest::newRow("int colour") << "int" << QVariant(QColor(Qt::red)) << false << QVariant(5)
                                << false;
    QTest::newRow("int nan") << "int" << QVariant(nan) << false << QVariant(5) << false;
    QTest::newRow("open int over")
        << "intOpen" << QVariant(qlonglong(5e9)) << true << QVariant(intMax) << true;
    QTest::newRow("open int under")
        << "intOpen" << QVariant(-5e9) << true << QVariant(intMin) << true;
    QTest::newRow("open int ulonglong")
        << "intOpen" << QVariant(qulonglong(1) << 63) << true << QVariant(intMax) << true;

    QTest::newRow("float in range") << "float" << QVariant(0.25) << true << QVariant(0.25) << true;
    QTest::newRow("float same") << "float" << QVariant(0.5) << true << QVariant(0.5) << false;
    QTest::newRow("float above max") << "float" << QVariant(2.0) << true << QVariant(1.0) << true;
    QTest::newRow("float from text")
        << "float" << QVariant(QStringLiteral("-0.75")) << true << QVariant(-0.75) << true;
    QTest::newRow("float exponent text")
        << "float" << QVariant(QStringLiteral("1e-3")) << true << QVariant(0.001) << true;
    QTest::newRow("float from int") << "float" << QVariant(1) << true << QVariant(1.0) << true;
    QTest::newRow("float inf") << "float" << QVariant(inf) << false << QVariant(0.5) << false;
    QTest::newRow("float nan") << "float" << QVariant(nan) << false << QVariant(0.5) << false;
    QTest::newRow("float nan text")
        << "float" << QVariant(QStringLiteral("nan")) << false << QVariant(0.5) << false;
    QTest::newRow("float word") << "float" << QVariant(QStringLiteral("x")) << false
                                << QVariant(0.5) << false;
    QTest::newRow("open float tiny")
        << "floatOpen" << QVariant(1e-300) << true << QVariant(1e-300) << true;

    QTest::newRow("bool true") << "bool" << QVariant(true) << true << QVariant(true) << true;
    QTest::newRow("bool same") << "bool" << QVariant(false) << true << QVariant(false) << false;
    QTest::newRow("bool text") << "bool" << QVariant(QStringLiteral("TRUE")) << true
                               << QVariant(true) << true;
    QTest::newRow("bool one") << "bool" << QVariant(1) << true << QVariant(true) << true;
    QTest::newRow("bool two") << "bool" << QVariant(2) << false << QVariant(false) << false;
    QTest::newRow("bool word") << "bool" << QVariant(QStringLiteral("maybe")) << false
                               << QVariant(false) << false;
    QTest::newRow("bool real") << "bool" << QVariant(1.0) << false << QVariant(false) << false;

    QTest::newRow("string same") << "string" << QVariant(QStringLiteral("abc")) << true
                                 << QVariant(QStringLiteral("abc")) << false;
    QTest::newRow("string markup") << "string" << QVariant(QStringLiteral("x<y&\"z\"")) << true
                                   << QVariant(QStringLiteral("x<y&\"z\"")) << true;
    QTest::newRow("string number")
        << "string" << QVariant(12) << true << QVariant(QStringLiteral("12")) << true;
    QTest::newRow("string invalid")
        << "string" << QVariant() << false << QVariant(QStringLiteral("abc")) << false;
    QTest::newRow("string list") << "string" << QVariant(QStringList{QStringLiteral("a")}) << false
                                 << QVariant(QStringLiteral("abc")) << false;

    QTest::newRow("color red") << "color" << QVariant(QColor(Qt::red)) << true
                               << QVariant(QColor(Qt::red)) << true;
    QTest::newRow("color text") << "color" << QVariant(QStringLiteral("#00ff00")) << true
                                << QVariant(QColor(0, 255, 0)) << true;
    QTest::newRow("color hsv kept as rgb") << "color" << QVariant(QColor::fromHsv(0, 255, 255))
                                           << true << QVariant(QColor(Qt::red)) << true;
    QTest::newRow("color same") << "color" << QVariant(QColor(255, 255, 255)) << true
                                << QVariant(QColor(Qt::white)) << false;
    QTest::newRow("color bad text") << "color" << QVariant(QStringLiteral("notacolor")) << false
                                    << QVariant(QColor(Qt::white)) << false;
    QTest::newRow("color invalid")
        << "color" << QVariant(QColor()) << false << QVariant(QColor(Qt::white)) << false;
    QTest::newRow("color int") << "color" << QVariant(0xff0000) << false
                               << QVariant(QColor(Qt::white)) << false;

    QTest::newRow("enum index") << "enum" << QVariant(2) << true << QVariant(2) << true;
    QTest::newRow("enum same") << "enum" << QVariant(1) << true << QVariant(1) << false;
    QTest::newRow("enum text") << "enum" << QVariant(QStringLiteral("Low")) << true << QVariant(0)
                               << true;
    QTest::newRow("enum past end") << "enum" << QVariant(3) << false << QVariant(1) << false;
    QTest::newRow("enum negative") << "enum" << QVariant(-1) << false << QVariant(1) << false;
    QTest::newRow("enum unknown text")
        << "enum" << QVariant(QStringLiteral("Ultra")) << false << QVariant(1) << false;
}

void TestKrProperty::setValue()
{
    QFETCH(QString, kind);
    QFETCH(QVariant, input);
    QFETCH(bool, accepted);
    QFETCH(QVariant, expected);
    QFETCH(bool, changed);
    auto p = makeProperty(kind);
    QSignalSpy spy(p.get(), &KrProperty::valueChanged);
    QCOMPARE(p->setValue(input), accepted);
    QCOMPARE(p->getValue(), expected);
    QCOMPARE(spy.count(), changed ? 1 : 0);
}

void TestKrProperty::settingsRoundTrip_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QVariant>("value");
    QTest::addColumn<int>("storedType");

    QTest::newRow("float third") << "floatOpen" << QVariant(1.0 / 3.0) << int(KrSettings::Float);
    QTest::newRow("float tenth") << "floatOpen" << QVariant(0.1) << int(KrSettings::Float);
    QTest::newRow("float tiny") << "floatOpen" << QVariant(-1e-300) << int(KrSettings::Float);
    QTest::newRow("float huge") << "floatOpen" << QVariant(1.7976931348623157e308)
                                << int(KrSettings::Float);
    QTest::newRow("float long") << "floatOpen" << QVariant(123456789.123456789)
                                << int(KrSettings::Float);
    QTest::newRow("int min") << "intOpen" << QVariant(std::numeric_limits<int>::min())
                             << int(KrSettings::Int);
    QTest::newRow("int max") << "intOpen" << QVariant(std::numeric_limits<int>::max())
                             << int(KrSettings::Int);
    QTest::newRow("bool true") << "bool" << QVariant(true) << int(KrSettings::Bool);
    QTest::newRow("string markup")
        << "string" << QVariant(QStringLiteral("Gr\u00fc\u00dfe \u2211 <&>\"' ]]>\n\ttab"))
        << int(KrSettings::String);
    QTest::newRow("string spaces")
        << "string" << QVariant(QStringLiteral("  x  ")) << int(KrSettings::String);
    QTest::newRow("string empty") << "string" << QVariant(QString()) << int(KrSettings::String);
    QTest::newRow("color 16 bit") << "color"
                                  << QVariant(QColor::fromRgbF(0.1234, 0.5, 0.99991, 0.25))
                                  << int(KrSettings::Settings);
    QTest::newRow("color bytes") << "color" << QVariant(QColor(1, 2, 3))
                                 << int(KrSettings::Settings);
    QTest::newRow("enum") << "enum" << QVariant(2) << int(KrSettings::Int);
}

// A value written into a record, carried through its text form and read into another property
// comes back exactly, with the kind's type in the record.
void TestKrProperty::settingsRoundTrip()
{
    QFETCH(QString, kind);
    QFETCH(QVariant, value);
    QFETCH(int, storedType);
    auto source = makeProperty(kind);
    QVERIFY(source->setValue(value));
    const QVariant written = source->getValue();

    KrSettings settings;
    source->writeValue(&settings, QStringLiteral("Value"));
    QCOMPARE(int(settings.getValueType(QStringLiteral("Value"))), storedType);
    KrSettings copy;
    QVERIFY(copy.fromString(settings.toString()));

    auto target = makeProperty(kind);
    QVERIFY(target->getValue() != written);
    QVERIFY(target->readValue(&copy, QStringLiteral("Value")));
    QCOMPARE(target->getValue(), written);
}

void TestKrProperty::readValueRefusesWrongRecords_data()
{
    QTest::addColumn<QString>("kind");
    QTest::addColumn<QString>("record"); // how the record is filled

    QTest::newRow("int from string") << "int"
                                     << "string";
    QTest::newRow("int missing") << "int"
                                 << "none";
    QTest::newRow("float from string") << "float"
                                       << "string";
    QTest::newRow("bool from int") << "bool"
                                   << "int";
    QTest::newRow("string from int") << "string"
                                     << "int";
    QTest::newRow("color from string") << "color"
                                       << "string";
    QTest::newRow("color channel out of range") << "color"
                                                << "badChannel";
    QTest::newRow("color channel missing") << "color"
                                           << "noGreen";
    QTest::newRow("enum index past end") << "enum"
                                         << "int";
    QTest::newRow("enum from float") << "enum"
                                     << "float";
}

void TestKrProperty::readValueRefusesWrongRecords()
{
    QFETCH(QString, kind);
    QFETCH(QString, record);
    KrSettings settings;
    const QString key = QStringLiteral("Value");
    if (record == QLatin1String("string")) {
        settings.setStringValue(key, QStringLiteral("7"));
    } else if (record == QLatin1String("int")) {
        settings.setIntValue(key, 7);
    } else if (record == QLatin1String("float")) {
        settings.setFloatValue(key, 1.0);
    } else if (record == QLatin1String("badChannel") || record == QLatin1String("noGreen")) {
        KrSettings* c = settings.setSettingsValue(key);
        c->setFloatValue(QStringLiteral("Red"), record == QLatin1String("badChannel") ? 1.5 : 0.5);
        if (record != QLatin1String("noGreen"))
            c->setFloatValue(QStringLiteral("Green"), 0.5);
        c->setFloatValue(QStringLiteral("Blue"), 0.5);
    }
    auto p = makeProperty(kind);
    const QVariant before = p->getValue();
    QSignalSpy spy(p.get(), &KrProperty::valueChanged);
    QVERIFY(!p->readValue(&settings, key));
    QCOMPARE(p->getValue(), before);
    QCOMPARE(spy.count(), 0);
    QVERIFY(!p->readValue(nullptr, key));
}

void TestKrProperty::rangeChangeClamps()
{
    KrIntProperty i(QStringLiteral("Count"), false, false, 50);
    QVERIFY(!i.hasRange());
    QSignalSpy values(&i, &KrProperty::valueChanged);
    QSignalSpy limits(&i, &KrProperty::constraintsChanged);
    i.setRange(20, 0); // reversed bounds are taken the right way round
    QVERIFY(i.hasRange());
    QCOMPARE(i.getMinimum(), 0);
    QCOMPARE(i.getMaximum(), 20);
    QCOMPARE(i.getIntValue(), 20);
    QCOMPARE(values.count(), 1);
    QCOMPARE(limits.count(), 1);
    i.setRange(0, 20);
    QCOMPARE(limits.count(), 1);

    KrFloatProperty f(QStringLiteral("Gain"), -3.0);
    f.setRange(-1.0, 1.0);
    QCOMPARE(f.getFloatValue(), -1.0);
    f.setDecimals(40);
    QCOMPARE(f.getDecimals(), 15);
    f.setStep(-1.0);
    QCOMPARE(f.getStep(), 0.1);
}

void TestKrProperty::enumItems()
{
    KrEnumProperty e(QStringLiteral("Mode"),
                     {QStringLiteral("A"), QStringLiteral("B"), QStringLiteral("C")}, 2);
    QCOMPARE(e.getCurrentText(), QStringLiteral("C"));
    QSignalSpy values(&e, &KrProperty::valueChanged);
    e.setItems(
        {QStringLiteral("X"), QStringLiteral("Y"), QStringLiteral("Z"), QStringLiteral("W")});
    QCOMPARE(e.getIndex(), 2);
    QCOMPARE(values.count(), 0);
    e.setItems({QStringLiteral("X")});
    QCOMPARE(e.getIndex(), 0);
    QCOMPARE(values.count(), 1);
    e.setItems({});
    QCOMPARE(e.getIndex(), -1);
    QVERIFY(!e.setValue(0));

    KrEnumProperty empty(QStringLiteral("None"));
    QCOMPARE(empty.getIndex(), -1);
    QCOMPARE(empty.getCurrentText(), QString());
}

void TestKrProperty::undoableChange()
{
    KrUndoStack stack;
    QCOMPARE(krUndoStack, &stack);
    KrFloatProperty p(QStringLiteral("Gain"), 0.5);
    p.setRange(0.0, 1.0);

    QVERIFY(p.setValueUndoable(0.7));
    QCOMPARE(stack.count(), 1);
    QCOMPARE(stack.undoText(), QStringLiteral("Change Gain"));

    // No step for a value that does not change anything (same or clamped to the same).
    QVERIFY(p.setValueUndoable(0.7));
    QVERIFY(p.setValueUndoable(QStringLiteral("0.7")));
    QCOMPARE(stack.count(), 1);
    // Nor for a refused one.
    QVERIFY(!p.setValueUndoable(QStringLiteral("loud")));
    QCOMPARE(stack.count(), 1);

    QVERIFY(p.setValueUndoable(5.0, QStringLiteral("Max Out")));
    QCOMPARE(p.getFloatValue(), 1.0);
    QCOMPARE(stack.count(), 2);
    QCOMPARE(stack.undoText(), QStringLiteral("Max Out"));

    stack.undo();
    QCOMPARE(p.getFloatValue(), 0.7);
    stack.undo();
    QCOMPARE(p.getFloatValue(), 0.5);
    QVERIFY(!stack.canUndo());
    stack.redo();
    QCOMPARE(p.getFloatValue(), 0.7);
    stack.redo();
    QCOMPARE(p.getFloatValue(), 1.0);
}

void TestKrProperty::undoStepOutlivesProperty()
{
    KrUndoStack stack;
    auto* p = new KrStringProperty(QStringLiteral("Label"), QStringLiteral("a"));
    QVERIFY(p->setValueUndoable(QStringLiteral("b")));
    delete p;
    QCOMPARE(stack.count(), 1);
    stack.undo(); // the step refers to a property that is gone: nothing happens
    stack.redo();
    QCOMPARE(stack.count(), 1);
}

void TestKrProperty::pushUndoStepRecordsLiveEdit()
{
    KrUndoStack stack;
    KrIntProperty p(QStringLiteral("Count"), false, false, 3);
    const QVariant before = p.getValue();
    for (int v = 4; v <= 9; ++v)
        p.setValue(v);
    QCOMPARE(stack.count(), 0);
    QVERIFY(p.pushUndoStep(before));
    QCOMPARE(stack.count(), 1);
    QVERIFY(!p.pushUndoStep(p.getValue())); // nothing moved
    QCOMPARE(stack.count(), 1);
    stack.undo();
    QCOMPARE(p.getIntValue(), 3);
    stack.redo();
    QCOMPARE(p.getIntValue(), 9);
}

void TestKrProperty::noUndoWithoutStack()
{
    QVERIFY(!krUndoStack);
    KrBoolProperty p(QStringLiteral("On"));
    QVERIFY(p.setValueUndoable(true));
    QCOMPARE(p.getBoolValue(), true);
}

void TestKrProperty::path_data()
{
    QTest::addColumn<QString>("input");
    QTest::addColumn<QString>("expected");
    QTest::newRow("top") << "/"
                         << "/";
    QTest::newRow("empty") << ""
                           << "/";
    QTest::newRow("plain") << "/Diffuse"
                           << "/Diffuse";
    QTest::newRow("without leading slash") << "Diffuse/Color"
                                           << "/Diffuse/Color";
    QTest::newRow("doubled and trailing") << "//Diffuse//Color/"
                                          << "/Diffuse/Color";
    QTest::newRow("blank parts") << " / Shine / "
                                 << "/Shine";
}

void TestKrProperty::path()
{
    QFETCH(QString, input);
    QFETCH(QString, expected);
    KrBoolProperty p(QStringLiteral("On"));
    QCOMPARE(p.getPath(), QStringLiteral("/"));
    QSignalSpy spy(&p, &KrProperty::pathChanged);
    p.setPath(input);
    QCOMPARE(p.getPath(), expected);
    QCOMPARE(spy.count(), expected == QLatin1String("/") ? 0 : 1);
    p.setPath(expected);
    QCOMPARE(spy.count(), expected == QLatin1String("/") ? 0 : 1);
}

void TestKrProperty::stateSignals()
{
    KrIntProperty p(QStringLiteral("Count"), true, true, 0);
    QVERIFY(p.isReadOnly());
    QVERIFY(p.isHidden());
    QSignalSpy state(&p, &KrProperty::stateChanged);
    QSignalSpy hidden(&p, &KrProperty::hiddenChanged);
    p.setHidden(true);
    p.setReadOnly(true);
    QCOMPARE(state.count(), 0);
    p.setHidden(false);
    QCOMPARE(hidden.count(), 1);
    QCOMPARE(hidden.at(0).at(0).toBool(), false);
    p.setReadOnly(false);
    QCOMPARE(state.count(), 2);
    // A read-only property still takes values set by code; only editors refuse edits.
    QVERIFY(p.setValue(4));
}

QTEST_MAIN(TestKrProperty)
#include "tst_krproperty.moc"
