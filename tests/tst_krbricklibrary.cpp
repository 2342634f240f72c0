// The library of brick kinds: every kind the class factories offer is a usable, described,
// typed brick whose record carries every value it has.
#include "bricks_testutil.h"
#include "krapp.h"
#include "krbrickgroup.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickparam.h"
#include "krbrickset.h"
#include "krclassfactory.h"
#include "krdefaultbrickuser.h"
#include "krproperty.h"
#include "krsettings.h"

#include <QColor>
#include <QSet>
#include <QtTest>

namespace {
// The property kind that holds a value of a parameter type.
QString propertyKindFor(const KrBrickParam* p)
{
    const QString t = p->getTypeLabel();
    if (p->getDirection() == KrBrickParam::ConstantInput && t == "int")
        return QStringLiteral("enum");
    return t;
}

// A value different from the current one, of the property's kind.
QVariant otherValue(const KrProperty* prop, int salt)
{
    const QString kind = prop->getTypeLabel();
    const QVariant v = prop->getValue();
    if (kind == "float")
        return v.toDouble() == 0.25 + salt ? 0.75 + salt : 0.25 + salt;
    if (kind == "int")
        return v.toInt() == 3 ? 2 : 3;
    if (kind == "bool")
        return !v.toBool();
    if (kind == "string")
        return QStringLiteral("text %1 <&>").arg(salt);
    if (kind == "color")
        return QColor((salt * 37) % 256, 100, 200);
    if (kind == "enum") {
        const auto* e = qobject_cast<const KrEnumProperty*>(prop);
        return e && e->getItems().size() > 1 ? (e->getIndex() + 1) % e->getItems().size() : 0;
    }
    return v;
}
} // namespace

class TestKrBrickLibrary : public QObject
{
    Q_OBJECT

private slots:
    void everyKind_data();
    void everyKind();
    void recordCarriesEveryValue_data() { everyKind_data(); }
    void recordCarriesEveryValue();
    void theLibraryAsAWhole();
};

void TestKrBrickLibrary::everyKind_data()
{
    QTest::addColumn<QString>("className");
    for (KrClassFactory* f : bricksLibraryFactories())
        QTest::newRow(qPrintable(f->className())) << f->className();
}

void TestKrBrickLibrary::everyKind()
{
    QFETCH(QString, className);
    KrShaderBrick* brick = KrDefaultBrickUser::createBrick(className);
    QVERIFY(brick);
    brick->ref();
    QCOMPARE(brick->refCount(), 1);
    QVERIFY(!brick->getPreferredName().isEmpty());
    QVERIFY(!brick->getDefaultCategory().isEmpty());
    QVERIFY(!brick->getDescription().isEmpty());
    QVERIFY(brick->getDescription().size() > 15);
    QCOMPARE(brick->getOptionsFrameClassName(), QStringLiteral("KrStandardBrickWidget"));
    QVERIFY(KrBrickSet::isValidShaderType(brick->type()));
    const bool group = qobject_cast<KrBrickGroup*>(brick) != nullptr;
    if (!group)
        QVERIFY(!brick->getShaderCode().isEmpty());

    static const QSet<QString> labels = {"float",  "color",  "point", "vector",
                                         "normal", "string", "int",   "bool"};
    QSet<QString> args;
    int outputs = 0;
    for (int i = 0; i < brick->getNumParameters(); ++i) {
        const KrBrickParam* p = brick->getParameter(i);
        QCOMPARE(p->getBrick(), brick);
        QVERIFY(!p->getParamArg().isEmpty());
        QVERIFY2(!args.contains(p->getParamArg()), "arguments are unique");
        args.insert(p->getParamArg());
        QVERIFY(!p->getLabel().isEmpty());
        QVERIFY2(labels.contains(p->getTypeLabel()), qPrintable(p->getTypeLabel()));
        QCOMPARE(p->getToken(KrBrickParam::ArgToken), p->getParamArg());
        if (p->isOutput()) {
            ++outputs;
            QCOMPARE(p->getNumParamProperties(), 0);
            continue;
        }
        // An input either holds its value in one property of the matching kind, or takes an
        // expression when unwired.
        if (p->getNumParamProperties() == 0) {
            QVERIFY2(!p->getDefaultValueText().isEmpty(), qPrintable(p->getParamArg()));
            QVERIFY(p->getDirection() == KrBrickParam::Input);
        } else {
            QCOMPARE(p->getNumParamProperties(), 1);
            QCOMPARE(p->getParamProperty(0)->getTypeLabel(), propertyKindFor(p));
            QCOMPARE(p->getParamProperty(0)->getName(), p->getLabel());
            QVERIFY(!p->getToken(KrBrickParam::DefaultToken).isEmpty() ||
                    p->getTypeLabel() == "string");
        }
    }
    if (brick->type() == KrBrickSet::Function && !group)
        QVERIFY2(outputs > 0, "a function brick computes something");
    // Its properties are its parameters' properties and its own settings.
    int expected = brick->getLocalProperties().size();
    for (int i = 0; i < brick->getNumParameters(); ++i)
        expected += brick->getParameter(i)->getNumParamProperties();
    QCOMPARE(brick->getNumProperties(), expected);
    if (!brick->getLocalProperties().isEmpty())
        QVERIFY(brick->shouldSeperateLocalProperties());
    brick->unref();
}

void TestKrBrickLibrary::recordCarriesEveryValue()
{
    QFETCH(QString, className);
    KrShaderBrick* brick = KrDefaultBrickUser::createBrick(className);
    QVERIFY(brick);
    brick->ref();
    int salt = 0;
    for (KrProperty* prop : brick->getProperties()) {
        ++salt;
        QVERIFY2(prop->setValue(otherValue(prop, salt)), qPrintable(prop->getName()));
    }
    for (int i = 0; i < brick->getNumParameters(); ++i)
        brick->getParameter(i)->setLabel(QStringLiteral("Label %1").arg(i));
    KrSettings record;
    brick->getAttributes(&record);

    KrShaderBrick* copy = KrDefaultBrickUser::createBrick(className);
    copy->ref();
    QVERIFY(copy->setAttributes(&record));
    KrSettings again;
    copy->getAttributes(&again);
    QCOMPARE(again.toString(), record.toString());
    for (int i = 0; i < brick->getNumProperties(); ++i)
        QCOMPARE(copy->getProperty(i)->getValue(), brick->getProperty(i)->getValue());
    copy->unref();
    brick->unref();
}

void TestKrBrickLibrary::theLibraryAsAWhole()
{
    int roots = 0, functions = 0, advanced = 0, multiOutput = 0, withActions = 0;
    QSet<int> rootTypes;
    QSet<QString> categories, names;
    QSet<QString> guids;
    for (KrClassFactory* f : bricksLibraryFactories()) {
        QVERIFY(!f->classID().isNull());
        QVERIFY2(!guids.contains(f->classID().toString()), "class ids are unique");
        guids.insert(f->classID().toString());
        KrShaderBrick* b = qobject_cast<KrShaderBrick*>(f->createInstance());
        QVERIFY(b);
        b->ref();
        if (b->type() == KrBrickSet::Function) {
            ++functions;
            categories.insert(b->getDefaultCategory().split('/').first());
        } else {
            ++roots;
            rootTypes.insert(b->type());
        }
        names.insert(b->getDefaultCategory() + "/" + b->getPreferredName());
        int outs = 0;
        for (int i = 0; i < b->getNumParameters(); ++i) {
            advanced += b->getParameter(i)->getIsAdvanced() ? 1 : 0;
            outs += b->getParameter(i)->getDirection() == KrBrickParam::Output ? 1 : 0;
        }
        multiOutput += outs > 1 ? 1 : 0;
        withActions += b->getBrickActionList().isEmpty() ? 0 : 1;
        b->unref();
    }
    QVERIFY(roots >= 2);
    QVERIFY(rootTypes.contains(KrBrickSet::Surface));
    QVERIFY(rootTypes.contains(KrBrickSet::Light));
    QVERIFY2(functions >= 25, qPrintable(QString::number(functions)));
    for (const char* c : {"Math", "Color", "Pattern", "Geometry", "Lighting", "Texture"})
        QVERIFY2(categories.contains(c), c);
    QVERIFY(advanced > 5);
    QVERIFY(multiOutput >= 2);
    QVERIFY(withActions >= 1);
    QCOMPARE(names.size(), roots + functions); // no two entries look the same in the tree

    // Every kind the library offers goes into the brick user made for it.
    KrBrickLight light;
    KrBrickMaterial material;
    for (KrClassFactory* f : bricksLibraryFactories()) {
        auto* b = qobject_cast<KrShaderBrick*>(f->createInstance());
        IKrBrickUser* user =
            b->type() == KrBrickSet::Light ? static_cast<IKrBrickUser*>(&light) : &material;
        QVERIFY2(user->insertBrick(b), qPrintable(f->className()));
    }
    QVERIFY(qobject_cast<KrSurfaceBrick*>(material.getBrickSet(0)->getRoot()));
    QVERIFY(qobject_cast<KrLightBrick*>(light.getBrickSet(0)->getRoot()));
    QCOMPARE(material.getBricks().size() + light.getBricks().size(), roots + functions);
}

QTEST_MAIN(TestKrBrickLibrary)
#include "tst_krbricklibrary.moc"
