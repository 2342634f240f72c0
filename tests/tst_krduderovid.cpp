// The brick library (tree and "Insert Brick..." menu): shapes built from the host's brick
// classes, kinds that cannot make a brick, and the user's saved bricks.
#include "krapp.h"
#include "krbrickfactorymenu.h"
#include "krbrickuserfiles.h"
#include "krclassfactory.h"
#include "krshaderbrick.h"
#include "krsettings.h"
#include "pane_testsupport.h"

#include <QDir>
#include <QFile>
#include <QSignalSpy>
#include <QTreeWidget>
#include <QtTest>
#include <memory>

// Brick kinds of the test, with categories chosen to show how paths are shared.
class PnBrickAB : public KrShaderBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit PnBrickAB(QObject* parent = nullptr) : KrShaderBrick(QString(), parent) {}
    int type() const override { return 0; }
    QString getPreferredName() const override { return QStringLiteral("Pn AB"); }
    QString getDefaultCategory() const override { return QStringLiteral("/PnA//PnB/"); }
};

class PnBrickCB : public KrShaderBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit PnBrickCB(QObject* parent = nullptr) : KrShaderBrick(QString(), parent) {}
    int type() const override { return 0; }
    QString getPreferredName() const override { return QStringLiteral("Pn CB"); }
    QString getDefaultCategory() const override { return QStringLiteral("PnC/PnB"); }
};

class PnBrickTop : public KrShaderBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit PnBrickTop(QObject* parent = nullptr) : KrShaderBrick(QString(), parent) {}
    int type() const override { return 0; }
    QString getPreferredName() const override { return QStringLiteral("Pn Top"); }
    QString getDefaultCategory() const override { return QString(); }
};

class PnRootBrick : public KrShaderBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit PnRootBrick(QObject* parent = nullptr) : KrShaderBrick(QString(), parent)
    {
    }
    int type() const override { return 1; }
    QString getPreferredName() const override { return QStringLiteral("Pn Root"); }
    QString getDefaultCategory() const override { return QStringLiteral("PnB"); }
};

// Its factory makes nothing; it is registered before the kind after it.
class PnBrokenBrick : public KrShaderBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit PnBrokenBrick(QObject* parent = nullptr) : KrShaderBrick(QString(), parent)
    {
    }
};

class PnAfterBrick : public KrShaderBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit PnAfterBrick(QObject* parent = nullptr) : KrShaderBrick(QString(), parent)
    {
    }
    int type() const override { return 0; }
    QString getPreferredName() const override { return QStringLiteral("Pn After"); }
    QString getDefaultCategory() const override { return QStringLiteral("PnLater"); }
};

namespace {

QTreeWidgetItem* child(QTreeWidgetItem* item, const QString& text)
{
    for (int i = 0; item && i < item->childCount(); ++i) {
        if (item->child(i)->text(0) == text)
            return item->child(i);
    }
    return nullptr;
}

QTreeWidgetItem* topItem(QTreeWidget* tree, const QString& text)
{
    for (int i = 0; i < tree->topLevelItemCount(); ++i) {
        if (tree->topLevelItem(i)->text(0) == text)
            return tree->topLevelItem(i);
    }
    return nullptr;
}

QTreeWidgetItem* path(QTreeWidget* tree, const QStringList& texts)
{
    QTreeWidgetItem* item = topItem(tree, texts.value(0));
    for (int i = 1; i < texts.size() && item; ++i)
        item = child(item, texts.at(i));
    return item;
}

QMenu* subMenu(QMenu* menu, const QString& title)
{
    for (QAction* action : menu ? menu->actions() : QList<QAction*>()) {
        if (action->menu() && action->text() == title)
            return action->menu();
    }
    return nullptr;
}

QMenu* menuPath(QMenu* menu, const QStringList& titles)
{
    for (const QString& title : titles)
        menu = subMenu(menu, title);
    return menu;
}

QStringList entryTexts(QMenu* menu)
{
    QStringList texts;
    for (QAction* action : menu ? menu->actions() : QList<QAction*>()) {
        if (!action->menu() && !action->isSeparator())
            texts << action->text();
    }
    return texts;
}

QStringList childTexts(QTreeWidgetItem* item)
{
    QStringList texts;
    for (int i = 0; item && i < item->childCount(); ++i)
        texts << item->child(i)->text(0);
    return texts;
}

QString dump(QTreeWidgetItem* item, int level = 0)
{
    QString text = QString(level * 2, QLatin1Char(' ')) + item->text(0) + QLatin1Char('\n');
    for (int i = 0; i < item->childCount(); ++i)
        text += dump(item->child(i), level + 1);
    return text;
}

int countEntries(QTreeWidgetItem* item)
{
    int count = 0;
    KrBrickFactory factory;
    if (KrDuderovid::factoryOf(item, &factory))
        ++count;
    for (int i = 0; i < item->childCount(); ++i)
        count += countEntries(item->child(i));
    return count;
}

} // namespace

class TestKrDuderovid : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void cleanupTestCase();
    void init();
    void cleanup();

    void treeAndMenuShapes();
    void entriesCarryTheirFactory();
    void kindWithoutBrickIsLeftOut();
    void everyLibraryKindIsListed();
    void userBricks();
    void refreshDoesNotDouble();
    void savedBrickTitleOutsideAscii();

private:
    void build();

    std::unique_ptr<KrPaneTestEnv> m_env;
    std::unique_ptr<QTreeWidget> m_tree;
    std::unique_ptr<KrBrickFactoryMenu> m_menu;
    std::unique_ptr<KrDuderovid> m_library;
    QList<KrClassFactory*> m_factories;
    KrTestFactory<PnBrokenBrick>* m_broken = nullptr;
};

void TestKrDuderovid::initTestCase()
{
    m_factories << new KrTestFactory<PnBrickAB>("7E2C0001-0000-4000-8000-00000000A001")
                << new KrTestFactory<PnBrickCB>("7E2C0001-0000-4000-8000-00000000A002")
                << new KrTestFactory<PnBrickTop>("7E2C0001-0000-4000-8000-00000000A003")
                << new KrTestFactory<PnRootBrick>("7E2C0001-0000-4000-8000-00000000A004");
    m_broken = new KrTestFactory<PnBrokenBrick>("7E2C0001-0000-4000-8000-00000000A005");
    m_broken->failing = true;
    m_factories << m_broken
                << new KrTestFactory<PnAfterBrick>("7E2C0001-0000-4000-8000-00000000A006");
    for (KrClassFactory* factory : m_factories)
        krApp->registerClassFactory(factory);
}

void TestKrDuderovid::cleanupTestCase()
{
    for (KrClassFactory* factory : m_factories) {
        krApp->unregisterClassFactory(factory);
        delete factory;
    }
}

void TestKrDuderovid::init()
{
    m_env.reset(new KrPaneTestEnv);
    m_tree.reset(new QTreeWidget);
    m_menu.reset(new KrBrickFactoryMenu(QStringLiteral("Insert Brick...")));
    m_library.reset(new KrDuderovid(m_tree.get(), m_menu.get()));
}

void TestKrDuderovid::cleanup()
{
    m_library.reset();
    m_menu.reset();
    m_tree.reset();
    m_env.reset();
}

void TestKrDuderovid::build()
{
    m_library->buildBrickLibrary();
    m_library->createUserMenuAndTree();
}

void TestKrDuderovid::treeAndMenuShapes()
{
    build();
    const QString all = QStringLiteral("!All Bricks");
    const QString functions = QStringLiteral("Functions");

    // The tree matches categories per parent: two branches ending in PnB.
    QVERIFY2(path(m_tree.get(), {all, functions, "PnA", "PnB", "Pn AB"}),
             qPrintable(dump(topItem(m_tree.get(), all))));
    QVERIFY(path(m_tree.get(), {all, functions, "PnC", "PnB", "Pn CB"}));
    QVERIFY(path(m_tree.get(), {all, functions, "Pn Top"}));
    QVERIFY(path(m_tree.get(), {all, "Roots", "PnB", "Pn Root"}));
    QCOMPARE(childTexts(path(m_tree.get(), {all})),
             QStringList({QStringLiteral("Roots"), QStringLiteral("Functions")}));

    // The menu shares a category name across the whole Functions menu.
    QMenu* allMenu = subMenu(m_menu.get(), QStringLiteral("All Bricks"));
    QVERIFY(allMenu);
    QMenu* functionsMenu = subMenu(allMenu, functions);
    QCOMPARE(entryTexts(menuPath(functionsMenu, {"PnA", "PnB"})),
             QStringList({QStringLiteral("Pn AB"), QStringLiteral("Pn CB")}));
    QMenu* c = subMenu(functionsMenu, QStringLiteral("PnC"));
    QVERIFY(c);
    QVERIFY(c->actions().isEmpty());
    QVERIFY(entryTexts(functionsMenu).contains(QStringLiteral("Pn Top")));
    // The Roots menu has a cache of its own.
    QCOMPARE(entryTexts(menuPath(allMenu, {"Roots", "PnB"})),
             QStringList(QStringLiteral("Pn Root")));
    QCOMPARE(m_menu->actions().size(), 2);
    QCOMPARE(m_menu->actions().at(1)->text(), QStringLiteral("User"));

    // Top and category items are not dragged; brick entries are.
    QTreeWidgetItem* category = path(m_tree.get(), {all, functions, "PnA"});
    QCOMPARE(category->type(), 1000);
    QCOMPARE(category->flags(), Qt::ItemIsSelectable | Qt::ItemIsEnabled);
    QCOMPARE(topItem(m_tree.get(), all)->flags(),
             Qt::ItemIsSelectable | Qt::ItemIsUserCheckable | Qt::ItemIsEnabled);
    QTreeWidgetItem* entry = path(m_tree.get(), {all, functions, "PnA", "PnB", "Pn AB"});
    QCOMPARE(entry->type(), 1000);
    QVERIFY(entry->flags() & Qt::ItemIsDragEnabled);
}

void TestKrDuderovid::entriesCarryTheirFactory()
{
    build();
    QTreeWidgetItem* entry =
        path(m_tree.get(), {"!All Bricks", "Functions", "PnC", "PnB", "Pn CB"});
    KrBrickFactory factory;
    QVERIFY(KrDuderovid::factoryOf(entry, &factory));
    QCOMPARE(entry->data(0, Qt::UserRole).typeName(), "KrBrickFactory");
    KrShaderBrick* brick = factory.generateBrick();
    QVERIFY(qobject_cast<PnBrickCB*>(brick));
    delete brick;
    QVERIFY(!KrDuderovid::factoryOf(path(m_tree.get(), {"!All Bricks", "Roots"}), &factory));
    QVERIFY(!KrDuderovid::factoryOf(nullptr, &factory));

    // Choosing the menu entry hands out the same factory.
    QSignalSpy spy(m_menu.get(), &KrBrickFactoryMenu::factoryTriggered);
    QMenu* b = menuPath(m_menu.get(), {"All Bricks", "Functions", "PnA", "PnB"});
    b->actions().at(1)->trigger();
    QCOMPARE(spy.count(), 1);
    KrBrickFactory chosen = spy.at(0).at(0).value<KrBrickFactory>();
    QCOMPARE(chosen.getFactory(), factory.getFactory());
}

void TestKrDuderovid::kindWithoutBrickIsLeftOut()
{
    const int triesBefore = m_broken->created;
    build();
    QVERIFY(m_broken->created > triesBefore);
    // The kind after the broken one is still there, in the tree and in the menu.
    QVERIFY(path(m_tree.get(), {"!All Bricks", "Functions", "PnLater", "Pn After"}));
    QCOMPARE(entryTexts(menuPath(m_menu.get(), {"All Bricks", "Functions", "PnLater"})),
             QStringList(QStringLiteral("Pn After")));
}

void TestKrDuderovid::everyLibraryKindIsListed()
{
    build();
    int makers = 0;
    for (int i = 0; i < krApp->getNumClassFactories(); ++i) {
        KrClassFactory* factory = krApp->getClassFactory(i);
        if (!factory->provides("KrShaderBrick"))
            continue;
        if (KrShaderBrick* brick = KrBrickFactory(factory).generateBrick()) {
            ++makers;
            delete brick;
        }
    }
    QVERIFY(makers >= 25);
    QCOMPARE(countEntries(topItem(m_tree.get(), QStringLiteral("!All Bricks"))), makers);
}

void TestKrDuderovid::userBricks()
{
    const QString folder = m_env->brickFolder();
    QDir dir(folder);
    QVERIFY(dir.mkpath(QStringLiteral("Sub")));
    QVERIFY(dir.mkpath(QStringLiteral(".hidden")));
    const QString add = pnSavedBrickText(QStringLiteral("KrAddBrick"), QStringLiteral("Adder"));
    QVERIFY(!add.isEmpty());
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/my.brick.kcb", add));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/brick.DCB", add));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/.hidden/secret.kcb", add));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/.dotted.kcb", add));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/Sub/inner.kcb", add));
    QVERIFY(pnWriteBytes(folder + "/garbage.kcb", QByteArray("\x00\xff\x13binary", 9)));
    QVERIFY(pnWriteBytes(folder + "/empty.kcb", QByteArray()));
    KrSettings unknown;
    unknown.setStringValue(QStringLiteral("BrelvoHallixClassName"), QStringLiteral("KrGone"));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/unknown.kcb", unknown.toString()));
    KrSettings notBrick;
    notBrick.setStringValue(QStringLiteral("BrelvoHallixClassName"),
                            QStringLiteral("KrBrickMaterial"));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/material.kcb", notBrick.toString()));
    // A link back up the tree must not be walked for ever.
    QVERIFY(QFile::link(folder, folder + QStringLiteral("/Sub/loop")));

    build();
    QTreeWidgetItem* user = m_library->getUserItem();
    QVERIFY(user);
    QCOMPARE(user->text(0), QStringLiteral("User"));
    QCOMPARE(childTexts(user), QStringList({QStringLiteral("Sub"), QStringLiteral("my")}));
    QCOMPARE(childTexts(child(user, QStringLiteral("Sub"))), QStringList(QStringLiteral("inner")));
    QCOMPARE(child(user, QStringLiteral("Sub"))->type(), 0);

    QMenu* userMenu = m_library->getUserMenu();
    QCOMPARE(userMenu, subMenu(m_menu.get(), QStringLiteral("User")));
    QCOMPARE(entryTexts(userMenu), QStringList(QStringLiteral("my")));
    QCOMPARE(entryTexts(subMenu(userMenu, QStringLiteral("Sub"))),
             QStringList(QStringLiteral("inner")));

    // The entry makes a brick with the saved title.
    KrBrickFactory factory;
    QVERIFY(KrDuderovid::factoryOf(child(user, QStringLiteral("my")), &factory));
    KrShaderBrick* brick = factory.generateBrick();
    QVERIFY(brick);
    QCOMPARE(QString::fromLatin1(brick->metaObject()->className()), QStringLiteral("KrAddBrick"));
    QCOMPARE(brick->getBrickTitle(), QStringLiteral("Adder"));
    delete brick;
}

void TestKrDuderovid::refreshDoesNotDouble()
{
    const QString folder = m_env->brickFolder();
    QVERIFY(QDir(folder).mkpath(QStringLiteral("Folder")));
    const QString add = pnSavedBrickText(QStringLiteral("KrAddBrick"), QStringLiteral("One"));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/one.kcb", add));
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/Folder/two.kcb", add));
    build();
    QTreeWidgetItem* user = m_library->getUserItem();
    const QString before = dump(user);
    const int actionsBefore = m_menu->findChildren<KrBrickFactoryAction*>().size();
    const int menusBefore = m_library->getUserMenu()->findChildren<QMenu*>().size();

    m_library->createUserMenuAndTree();
    m_library->createUserMenuAndTree();
    QCOMPARE(m_library->getUserItem(), user);
    QCOMPARE(dump(user), before);
    QCOMPARE(m_menu->findChildren<KrBrickFactoryAction*>().size(), actionsBefore);
    QCOMPARE(m_library->getUserMenu()->findChildren<QMenu*>().size(), menusBefore);
    QCOMPARE(entryTexts(m_library->getUserMenu()), QStringList(QStringLiteral("one")));

    // A brick saved in the meantime shows up; a removed one goes.
    QVERIFY(KrBrickUserFiles::writeTextFile(folder + "/three.kcb", add));
    QVERIFY(QFile::remove(folder + "/one.kcb"));
    m_library->createUserMenuAndTree();
    QCOMPARE(childTexts(user), QStringList({QStringLiteral("Folder"), QStringLiteral("three")}));
    QCOMPARE(entryTexts(m_library->getUserMenu()), QStringList(QStringLiteral("three")));
}

void TestKrDuderovid::savedBrickTitleOutsideAscii()
{
    const QString folder = m_env->brickFolder();
    const QString title = QStringLiteral("Été brûlant \u263C");
    QVERIFY(
        KrBrickUserFiles::writeTextFile(folder + QLatin1Char('/') + title + QStringLiteral(".kcb"),
                                        pnSavedBrickText(QStringLiteral("KrMixBrick"), title)));
    build();
    QTreeWidgetItem* entry = child(m_library->getUserItem(), title);
    QVERIFY(entry);
    KrBrickFactory factory;
    QVERIFY(KrDuderovid::factoryOf(entry, &factory));
    std::unique_ptr<KrShaderBrick> brick(factory.generateBrick());
    QVERIFY(brick);
    QCOMPARE(brick->getBrickTitle(), title);
}

QTEST_MAIN(TestKrDuderovid)
#include "tst_krduderovid.moc"
