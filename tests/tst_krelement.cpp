#include "krelement.h"
#include "krproperty.h"
#include "krsettings.h"

#include <QPointer>
#include <QSignalSpy>
#include <QtTest>

namespace {
// A reference-counted QObject, like the editor's label properties.
class CountedProperty : public KrIntProperty, public KrRefCountedItem
{
public:
    explicit CountedProperty(const QString& name) : KrIntProperty(name, false, false, 0) {}
};
} // namespace

class TestKrElement : public QObject
{
    Q_OBJECT
private slots:
    void baseName();
    void isPropertyNameUnique_data();
    void isPropertyNameUnique();
    void listSignals();
    void treeSignals();
    void deletedPropertyLeavesList();
    void lookups();
    void attributesRoundTrip();
    void attributesKeepDuplicateNames();
    void attributesPartialRecord();
    void refCounting();
};

void TestKrElement::baseName()
{
    KrBase base(QStringLiteral("A"));
    QSignalSpy spy(&base, &KrBase::nameChanged);
    base.setName(QStringLiteral("A"));
    QCOMPARE(spy.count(), 0);
    base.setName(QStringLiteral("B"));
    QCOMPARE(spy.count(), 1);
    QCOMPARE(spy.at(0).at(0).toString(), QStringLiteral("B"));
    QCOMPARE(base.getName(), QStringLiteral("B"));
}

void TestKrElement::isPropertyNameUnique_data()
{
    QTest::addColumn<QStringList>("existing");
    QTest::addColumn<QString>("name");
    QTest::addColumn<bool>("makeUnique");
    QTest::addColumn<bool>("result");
    QTest::addColumn<QString>("expected");

    const QStringList colors{QStringLiteral("Color"), QStringLiteral("Intensity")};
    QTest::newRow("free") << colors << "Spread" << false << true << "Spread";
    QTest::newRow("free, make unique") << colors << "Spread" << true << true << "Spread";
    QTest::newRow("used") << colors << "Color" << false << false << "Color";
    QTest::newRow("used, make unique") << colors << "Color" << true << true << "Color1";
    QTest::newRow("next number") << QStringList{"Color", "Color1"} << "Color" << true << true
                                 << "Color2";
    QTest::newRow("numbered name counts from its stem")
        << QStringList{"Color", "Color1"} << "Color1" << true << true << "Color2";
    QTest::newRow("case matters") << QStringList{"color"} << "Color" << false << true << "Color";
    QTest::newRow("digits only") << QStringList{"7"} << "7" << true << true << "1";
    QTest::newRow("empty name used") << QStringList{""} << "" << true << true << "1";
    QTest::newRow("no properties") << QStringList{} << "" << false << true << "";
}

void TestKrElement::isPropertyNameUnique()
{
    QFETCH(QStringList, existing);
    QFETCH(QString, name);
    QFETCH(bool, makeUnique);
    QFETCH(bool, result);
    QFETCH(QString, expected);
    KrElement element;
    for (const QString& n : existing)
        element.addProperty(new KrBoolProperty(n, false, &element));
    QCOMPARE(element.isPropertyNameUnique(name, makeUnique), result);
    QCOMPARE(name, expected);
    if (makeUnique)
        QVERIFY(!element.findProperty(name));
}

void TestKrElement::listSignals()
{
    KrElement element(QStringLiteral("Material"));
    auto* a = new KrIntProperty(QStringLiteral("A"), false, false, 0, &element);
    auto* b = new KrIntProperty(QStringLiteral("B"), false, false, 0, &element);
    QSignalSpy list(&element, &KrElement::propertyListChanged);

    element.addProperty(a);
    element.addProperty(a); // already there
    element.addProperty(nullptr);
    QCOMPARE(list.count(), 1);
    element.addProperty(b);
    QCOMPARE(list.count(), 2);
    QCOMPARE(element.getProperties(), (QList<KrProperty*>{a, b}));

    element.removeProperty(b);
    element.removeProperty(b); // no longer there
    QCOMPARE(list.count(), 3);

    element.setProperties({b, nullptr, a, b});
    QCOMPARE(list.count(), 4);
    QCOMPARE(element.getProperties(), (QList<KrProperty*>{b, a}));

    // Hiding changes what views list.
    a->setHidden(true);
    QCOMPARE(list.count(), 5);
    a->setReadOnly(true);
    QCOMPARE(list.count(), 5);

    // A removed property no longer reaches the element.
    element.removeProperty(a);
    QCOMPARE(list.count(), 6);
    a->setHidden(false);
    QCOMPARE(list.count(), 6);
}

void TestKrElement::treeSignals()
{
    KrElement element;
    auto* a = new KrIntProperty(QStringLiteral("A"), false, false, 0, &element);
    element.addProperty(a);
    QSignalSpy tree(&element, &KrElement::propertyTreeChanged);
    QSignalSpy list(&element, &KrElement::propertyListChanged);
    a->setPath(QStringLiteral("/Diffuse"));
    QCOMPARE(tree.count(), 1);
    a->setPath(QStringLiteral("Diffuse")); // the same group
    QCOMPARE(tree.count(), 1);
    a->setValue(3);
    a->setName(QStringLiteral("Renamed"));
    QCOMPARE(tree.count(), 1);
    QCOMPARE(list.count(), 0);

    // setProperties replaces the watched set.
    auto* b = new KrIntProperty(QStringLiteral("B"), false, false, 0, &element);
    element.setProperties({b});
    a->setPath(QStringLiteral("/Other"));
    QCOMPARE(tree.count(), 1);
    b->setPath(QStringLiteral("/Other"));
    QCOMPARE(tree.count(), 2);
}

void TestKrElement::deletedPropertyLeavesList()
{
    KrElement element;
    auto* a = new KrIntProperty(QStringLiteral("A"));
    auto* b = new KrIntProperty(QStringLiteral("B"));
    element.setProperties({a, b});
    QSignalSpy list(&element, &KrElement::propertyListChanged);
    delete a;
    QCOMPARE(list.count(), 1);
    QCOMPARE(element.getNumProperties(), 1);
    QCOMPARE(element.getProperty(0), b);
    QVERIFY(!element.findProperty(QStringLiteral("A")));
    delete b;
    QCOMPARE(element.getNumProperties(), 0);
}

void TestKrElement::lookups()
{
    KrElement element;
    auto* a = new KrIntProperty(QStringLiteral("Color"), false, false, 0, &element);
    auto* b = new KrIntProperty(QStringLiteral("Spread"), false, false, 0, &element);
    element.setProperties({a, b});
    QCOMPARE(element.getNumProperties(), 2);
    QCOMPARE(element.getProperty(1), b);
    QVERIFY(!element.getProperty(2));
    QVERIFY(!element.getProperty(-1));
    QCOMPARE(element.findProperty(QStringLiteral("Spread")), b);
    QVERIFY(!element.findProperty(QStringLiteral("spread")));
    KrPropertyIterator it = element.propertyListIterator();
    QVERIFY(it.hasNext());
    QCOMPARE(it.next(), a);
    QCOMPARE(it.next(), b);
    QVERIFY(!it.hasNext());
}

namespace {
struct Sample
{
    KrElement element;
    KrIntProperty* count;
    KrFloatProperty* gain;
    KrStringProperty* name; // a property called "Name" must not clash with the element's name
    KrColorProperty* tint;
    KrEnumProperty* mode;
    KrBoolProperty* on;

    Sample()
    {
        count = new KrIntProperty(QStringLiteral("Count"), false, false, 1, &element);
        gain = new KrFloatProperty(QStringLiteral("Gain"), 0.5, &element);
        name = new KrStringProperty(QStringLiteral("Name"), QStringLiteral("label"), &element);
        tint = new KrColorProperty(QStringLiteral("Tint"), QColor(Qt::white), &element);
        mode = new KrEnumProperty(QStringLiteral("Mode"),
                                  {QStringLiteral("A"), QStringLiteral("B")}, 0, &element);
        on = new KrBoolProperty(QStringLiteral("On"), false, &element);
        element.setProperties({count, gain, name, tint, mode, on});
    }
};
} // namespace

void TestKrElement::attributesRoundTrip()
{
    Sample source;
    source.element.setName(QStringLiteral("Brass"));
    source.count->setValue(-42);
    source.gain->setValue(0.1 + 0.2);
    source.name->setValue(QStringLiteral("<not the element's name>"));
    source.tint->setValue(QColor::fromRgbF(0.3, 0.6, 0.9, 0.5));
    source.mode->setValue(1);
    source.on->setValue(true);

    KrSettings settings;
    source.element.getAttributes(&settings);
    QCOMPARE(settings.getStringValue(QStringLiteral("Name")), QStringLiteral("Brass"));
    KrSettings text;
    QVERIFY(text.fromString(settings.toString()));

    Sample target;
    QSignalSpy names(&target.element, &KrBase::nameChanged);
    QVERIFY(target.element.setAttributes(&text));
    QCOMPARE(target.element.getName(), QStringLiteral("Brass"));
    QCOMPARE(names.count(), 1);
    for (int i = 0; i < source.element.getNumProperties(); ++i)
        QCOMPARE(target.element.getProperty(i)->getValue(),
                 source.element.getProperty(i)->getValue());

    QVERIFY(!target.element.setAttributes(nullptr));
    source.element.getAttributes(nullptr); // harmless
}

// Two properties of one name keep both values.
void TestKrElement::attributesKeepDuplicateNames()
{
    KrElement a;
    auto* first = new KrIntProperty(QStringLiteral("Level"), false, false, 3, &a);
    auto* second = new KrIntProperty(QStringLiteral("Level"), false, false, 8, &a);
    auto* third = new KrIntProperty(QStringLiteral("Level1"), false, false, 13, &a);
    a.setProperties({first, second, third});
    KrSettings settings;
    a.getAttributes(&settings);

    KrElement b;
    auto* x = new KrIntProperty(QStringLiteral("Level"), false, false, 0, &b);
    auto* y = new KrIntProperty(QStringLiteral("Level"), false, false, 0, &b);
    auto* z = new KrIntProperty(QStringLiteral("Level1"), false, false, 0, &b);
    b.setProperties({x, y, z});
    QVERIFY(b.setAttributes(&settings));
    QCOMPARE(x->getIntValue(), 3);
    QCOMPARE(y->getIntValue(), 8);
    QCOMPARE(z->getIntValue(), 13);
}

// A record without some values leaves those properties alone; a bad value is skipped.
void TestKrElement::attributesPartialRecord()
{
    Sample target;
    target.element.setName(QStringLiteral("Keep"));
    KrSettings settings;
    KrSettings* values = settings.setSettingsValue(QStringLiteral("Properties"));
    values->setIntValue(QStringLiteral("Count"), 9);
    values->setStringValue(QStringLiteral("Gain"), QStringLiteral("loud"));
    QVERIFY(target.element.setAttributes(&settings));
    QCOMPARE(target.element.getName(), QStringLiteral("Keep"));
    QCOMPARE(target.count->getIntValue(), 9);
    QCOMPARE(target.gain->getFloatValue(), 0.5);
    QCOMPARE(target.name->getStringValue(), QStringLiteral("label"));

    KrSettings empty;
    QVERIFY(target.element.setAttributes(&empty));
    QCOMPARE(target.count->getIntValue(), 9);
}

void TestKrElement::refCounting()
{
    QPointer<CountedProperty> p = new CountedProperty(QStringLiteral("Out"));
    {
        KrTSharedPointer<CountedProperty> a(p.data());
        QCOMPARE(p->refCount(), 1);
        KrTSharedPointer<CountedProperty> b = a;
        QCOMPARE(p->refCount(), 2);
        b = a; // the same object: nothing changes
        QCOMPARE(p->refCount(), 2);
        b = KrTSharedPointer<CountedProperty>();
        QCOMPARE(p->refCount(), 1);
        QVERIFY(!b);
    }
    QVERIFY(p.isNull()); // the last holder released it

    // An unref with no reference left must not delete.
    CountedProperty kept(QStringLiteral("Kept"));
    QTest::ignoreMessage(QtWarningMsg, "KrRefCountedItem::unref(): no reference left to drop");
    kept.unref();
    QCOMPARE(kept.refCount(), 0);
}

QTEST_MAIN(TestKrElement)
#include "tst_krelement.moc"
