// The Corvane pane as a user meets it: the default material at start, the library, the File
// menu's flows with their dialogs answered, renaming windows and laying out the divider.
#include "krappsettings.h"
#include "krbrickfactorymenu.h"
#include "krbrickgraphicsitem.h"
#include "krbrickmaterial.h"
#include "krbrickset.h"
#include "krbrickuser.h"
#include "krbrickuserfiles.h"
#include "krbrickuserpropertiesview.h"
#include "krbrickuserscene.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krcorvanepaneactions.h"
#include "krdefaultmaterial.h"
#include "krdynamicdivider.h"
#include "krelement.h"
#include "krmainwindow.h"
#include "krpreviewnode.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "krundo.h"
#include "pane_testsupport.h"

#include "krproperty.h"
#include "krpropertywgt.h"

#include <QCheckBox>
#include <QContextMenuEvent>
#include <QComboBox>
#include <QDialogButtonBox>
#include <QGraphicsView>
#include <QLineEdit>
#include <QMenu>
#include <QPushButton>
#include <QStatusBar>
#include <QTabWidget>
#include <QTreeWidget>
#include <QtTest>

namespace {

// The host scene of the tests: brick users filed under keys.
class PaneSceneBridge : public IKrBrickSceneBridge
{
public:
    struct Entry
    {
        IKrBrickUser* user;
        QString key;
    };
    QList<Entry> entries;
    int applied = 0;

    bool apply(IKrBrickUser*) override
    {
        ++applied;
        return true;
    }
    QList<IKrBrickUser*> getSceneBrickUsers(const IKrBrickUser* prototype) override
    {
        QList<IKrBrickUser*> users;
        for (const Entry& e : entries) {
            if (e.user->getTypeLabel() == prototype->getTypeLabel())
                users << e.user;
        }
        return users;
    }
    QString getSceneKey(const IKrBrickUser* user) const override
    {
        for (const Entry& e : entries) {
            if (e.user == user)
                return e.key;
        }
        return QString();
    }
};

QString attributesText(const IKrBrickUser* user)
{
    KrSettings record;
    qobject_cast<const KrElement*>(user->getObject())->getAttributes(&record);
    return record.toString();
}

// The network without the bricks' settings (which the window fills with positions and sizes).
QString networkText(const IKrBrickUser* user)
{
    KrSettings record;
    qobject_cast<const KrElement*>(user->getObject())->getAttributes(&record);
    if (KrSettings* bricks = record.getSettingsValue(QStringLiteral("Bricks"))) {
        for (const QString& key : bricks->getKeys())
            bricks->getSettingsValue(key)->removeValue(QStringLiteral("BrickSettings"));
    }
    return record.toString();
}

// Answers the chooser: kind index, name (null: leave the proposal), Ok or Cancel.
KrModalAnswer chooserAnswer(int kind, const QString& name, bool ok, QString* proposal = nullptr,
                            bool* nameVisible = nullptr)
{
    return [=](QWidget* modal) {
        auto* box = modal->findChild<QComboBox*>(QStringLiteral("selectionBox"));
        auto* edit = modal->findChild<QLineEdit*>(QStringLiteral("nameBox"));
        auto* buttons = modal->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"));
        if (!box || !edit || !buttons) {
            modal->close();
            return;
        }
        box->setCurrentIndex(kind);
        if (proposal)
            *proposal = edit->text();
        if (nameVisible)
            *nameVisible = edit->isVisible();
        if (!name.isNull())
            edit->setText(name);
        buttons->button(ok ? QDialogButtonBox::Ok : QDialogButtonBox::Cancel)->click();
    };
}

// A user's double click: press, release, then the second press.
void doubleClick(QTreeWidget* tree, QTreeWidgetItem* item)
{
    tree->scrollToItem(item);
    const QPoint pos = tree->visualItemRect(item).center();
    QTest::mouseClick(tree->viewport(), Qt::LeftButton, {}, pos);
    QTest::mouseDClick(tree->viewport(), Qt::LeftButton, {}, pos);
}

QAction* windowAction(KrCorvaneDockWidget* window, const char* name)
{
    return window->findChild<QAction*>(QString::fromLatin1(name));
}

QTreeWidgetItem* findEntry(QTreeWidgetItem* item, const QString& text)
{
    if (item->text(0) == text)
        return item;
    for (int i = 0; i < item->childCount(); ++i) {
        if (QTreeWidgetItem* found = findEntry(item->child(i), text))
            return found;
    }
    return nullptr;
}

QTreeWidgetItem* findTreeEntry(QTreeWidget* tree, const QString& text)
{
    for (int i = 0; i < tree->topLevelItemCount(); ++i) {
        if (QTreeWidgetItem* found = findEntry(tree->topLevelItem(i), text))
            return found;
    }
    return nullptr;
}

} // namespace

class TestKrCorvanePane : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void cleanup();

    void startShowsDefaultMaterialArranged();
    void noKindsNoWindow();
    void doubleClickInsertsBrick();
    void saveCloseOpenGivesEqualNetwork();
    void closeAnsweredNoKeepsWindow();
    void openReportsBadFile();
    void renameThroughPreferencesFollowsTab();
    void newWindowsGetUniqueNames();
    void newWithBlankNameAndOtherKinds();
    void cancelledNewOpensNothing();
    void fromSceneOpensCopies();
    void preferencesRebuildDivider();
    void collapsedDividerIsRestored();
    void refreshActionRebuildsUserBricks();
    void currentTabFeedsPropertiesAndPreview();
    void fileMenuKeys();
    void windowSaveKey();
    void regroupInPropertiesTab();

private:
    KrCorvanePaneMainWgt* main() const { return m_pane->getMainWidget(); }

    std::unique_ptr<KrPaneTestEnv> m_env;
    KrCorvanePane* m_pane = nullptr;
};

void TestKrCorvanePane::init()
{
    m_env.reset(new KrPaneTestEnv);
    m_pane = new KrCorvanePane;
    m_env->mainWindow()->addPane(m_pane);
    m_env->mainWindow()->resize(1200, 800);
    m_env->mainWindow()->show();
    QVERIFY(QTest::qWaitForWindowExposed(m_env->mainWindow()));
}

void TestKrCorvanePane::cleanup()
{
    KrBrickUserElement::setSceneBridge(nullptr);
    m_pane = nullptr;
    m_env.reset();
}

void TestKrCorvanePane::startShowsDefaultMaterialArranged()
{
    QCOMPARE(main()->getOpenWindows().size(), 1);
    KrCorvaneDockWidget* window = main()->getCurrentWindow();
    QVERIFY(window);
    QCOMPARE(main()->getRightTabs()->count(), 1);
    QCOMPARE(main()->getRightTabs()->tabText(0), QStringLiteral("Brelvo Default Material"));
    IKrBrickUser* user = window->getBrickUser();
    QVERIFY(qobject_cast<KrBrickMaterial*>(user->getObject()));
    QCOMPARE(user->getName(), QStringLiteral("Brelvo Default Material"));
    QCOMPARE(main()->getOpenBrickUsers(), QList<IKrBrickUser*>({user}));

    // Every brick has its item, and the arrangement spread them out.
    KrBrickUserScene* scene = window->getBrickScene();
    QVERIFY(user->getBricks().size() >= 6);
    QCOMPARE(scene->getItemsById().keys(), user->getBricks().keys());
    QSet<QPair<int, int>> places;
    for (KrShaderBrick* brick : user->getBricks()) {
        const KrSettings* s = brick->getBrickSettings();
        places.insert(qMakePair(int(s->getFloatValue(QStringLiteral("PosX"))),
                                int(s->getFloatValue(QStringLiteral("PosY")))));
    }
    QCOMPARE(places.size(), user->getBricks().size());

    // The form's layout as the pane rearranged it.
    QCOMPARE(main()->getLeftTabs()->tabText(0), QStringLiteral("Duderovid"));
    QCOMPARE(main()->getLeftTabs()->tabText(1), QStringLiteral("Properties"));
    QVERIFY(!main()->statusBar()->isVisible());
    QCOMPARE(main()->centralWidget(), static_cast<QWidget*>(main()->getDivider()));
    QCOMPARE(main()->getDivider()->getFirst(), static_cast<QWidget*>(main()->getLeftTabs()));
    QCOMPARE(main()->getDivider()->getSecond(), static_cast<QWidget*>(main()->getRightTabs()));

    QTreeWidget* tree = main()->getBrickTree();
    QCOMPARE(tree->topLevelItemCount(), 2);
    QCOMPARE(tree->topLevelItem(0)->text(0), QStringLiteral("!All Bricks"));
    QCOMPARE(tree->topLevelItem(1)->text(0), QStringLiteral("User"));
    QVERIFY(main()->getBrickMenu()->title() == QStringLiteral("Insert Brick..."));
}

void TestKrCorvanePane::noKindsNoWindow()
{
    KrCorvanePane pane(QList<IKrBrickUser*>(), nullptr);
    QVERIFY(pane.getMainWidget()->getOpenWindows().isEmpty());
    QCOMPARE(pane.getMainWidget()->getRightTabs()->count(), 0);
    QVERIFY(!pane.getMainWidget()->getPreviewButton()->isEnabled());
    QVERIFY(!pane.getMainWidget()->getPropertiesView()->getElement());
}

void TestKrCorvanePane::doubleClickInsertsBrick()
{
    KrCorvaneDockWidget* window = main()->getCurrentWindow();
    IKrBrickUser* user = window->getBrickUser();
    const QList<uint> before = user->getBricks().keys();

    QTreeWidget* tree = main()->getBrickTree();
    tree->expandAll();
    QTreeWidgetItem* roots = findTreeEntry(tree, QStringLiteral("Roots"));
    QVERIFY(roots);
    doubleClick(tree, roots);
    QCOMPARE(user->getBricks().keys(), before);

    QTreeWidgetItem* entry = findTreeEntry(tree, QStringLiteral("Checker"));
    if (!entry) {
        // Any brick entry will do.
        KrBrickFactory factory;
        QTreeWidgetItem* functions = findTreeEntry(tree, QStringLiteral("Functions"));
        for (QTreeWidgetItem* it = functions; it && !entry; it = it->child(0)) {
            if (KrDuderovid::factoryOf(it, &factory))
                entry = it;
        }
    }
    QVERIFY(entry);
    doubleClick(tree, entry);
    QCOMPARE(user->getBricks().size(), before.size() + 1);
    const uint added = user->getBricks().lastKey();
    QVERIFY(!before.contains(added));
    QVERIFY(window->getBrickScene()->findBrick(added));
}

void TestKrCorvanePane::saveCloseOpenGivesEqualNetwork()
{
    KrCorvaneDockWidget* window = main()->getCurrentWindow();
    IKrBrickUser* user = window->getBrickUser();
    const QString expected = attributesText(user);
    const QString fileName = m_env->path() + QStringLiteral("/default.kbm");

    KrModalSeen saveDialog;
    pnAnswerModals({pnFileAnswer(fileName, &saveDialog)});
    windowAction(window, "saveAction")->trigger();
    QVERIFY(saveDialog.handled);
    QVERIFY(QFile::exists(fileName));

    // Closing asks first.
    QPointer<KrCorvaneDockWidget> guard(window);
    KrModalSeen question;
    pnAnswerModals({pnMessageAnswer(QMessageBox::Yes, &question)});
    window->close();
    QVERIFY(question.handled);
    QCOMPARE(question.title, QStringLiteral("Close..."));
    QCOMPARE(question.text,
             QStringLiteral("Are you sure you want to close Brelvo Default Material?"));
    QVERIFY(main()->getOpenWindows().isEmpty());
    QVERIFY(main()->getOpenBrickUsers().isEmpty());
    QTRY_VERIFY(!guard);
    QCOMPARE(main()->getRightTabs()->count(), 0);

    KrModalSeen openDialog;
    pnAnswerModals({pnFileAnswer(fileName, &openDialog)});
    QMetaObject::invokeMethod(main(), "open");
    QVERIFY(openDialog.handled);
    QCOMPARE(main()->getOpenWindows().size(), 1);
    KrCorvaneDockWidget* reopened = main()->getCurrentWindow();
    QVERIFY(reopened);
    QCOMPARE(main()->getRightTabs()->tabText(0), QStringLiteral("Brelvo Default Material"));
    QCOMPARE(attributesText(reopened->getBrickUser()), expected);
    QCOMPARE(reopened->getBrickScene()->getItemsById().size(),
             reopened->getBrickUser()->getBricks().size());
}

void TestKrCorvanePane::closeAnsweredNoKeepsWindow()
{
    KrCorvaneDockWidget* window = main()->getCurrentWindow();
    pnAnswerModals({pnMessageAnswer(QMessageBox::No)});
    QVERIFY(!window->close());
    QTest::qWait(50);
    QCOMPARE(main()->getOpenWindows(), QList<KrCorvaneDockWidget*>({window}));
    QCOMPARE(main()->getOpenBrickUsers().size(), 1);
    QCOMPARE(main()->getRightTabs()->count(), 1);
    QCOMPARE(main()->getCurrentWindow(), window);
}

void TestKrCorvanePane::openReportsBadFile()
{
    const QString fileName = m_env->path() + QStringLiteral("/notes.kbm");
    QVERIFY(pnWriteBytes(fileName, "shopping list: eggs, milk\n"));
    const QString message = QStringLiteral("Error reading file %1.\nNo class name.").arg(fileName);

    KrModalSeen error;
    pnAnswerModals({pnFileAnswer(fileName), pnMessageAnswer(QMessageBox::Ok, &error)});
    QTest::ignoreMessage(QtWarningMsg, qPrintable(message));
    QMetaObject::invokeMethod(main(), "open");
    QVERIFY(error.handled);
    QCOMPARE(error.title, QStringLiteral("File read error"));
    QCOMPARE(error.text, message);
    QCOMPARE(main()->getOpenWindows().size(), 1);
}

void TestKrCorvanePane::renameThroughPreferencesFollowsTab()
{
    KrCorvaneDockWidget* window = main()->getCurrentWindow();
    KrBrickUserScene* scene = window->getBrickScene();
    QMap<uint, QPointF> before;
    for (auto it = scene->getItemsById().begin(); it != scene->getItemsById().end(); ++it)
        before.insert(it.key(), it.value()->pos());
    const bool direction = window->isRightToLeft();

    KrModalSeen seen;
    pnAnswerModals({[&seen](QWidget* modal) {
        seen.handled = true;
        seen.title = modal->windowTitle();
        auto* edit = modal->findChild<QLineEdit*>(QStringLiteral("nameEdit"));
        edit->setText(QStringLiteral("Polished Steel"));
        modal->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"))
            ->button(QDialogButtonBox::Ok)
            ->click();
    }});
    windowAction(window, "preferencesAction")->trigger();
    QVERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("Preferences..."));
    QCOMPARE(window->getBrickUser()->getName(), QStringLiteral("Polished Steel"));
    QCOMPARE(main()->getRightTabs()->tabText(0), QStringLiteral("Polished Steel"));
    QCOMPARE(window->isRightToLeft(), direction);
    for (auto it = scene->getItemsById().begin(); it != scene->getItemsById().end(); ++it)
        QCOMPARE(it.value()->pos(), before.value(it.key()));

    // The window's name is the new base for unique names.
    QCOMPARE(main()->uniqueBrickUserName(QStringLiteral("Polished Steel")),
             QStringLiteral("Polished Steel_0"));
}

void TestKrCorvanePane::newWindowsGetUniqueNames()
{
    QVERIFY(krUndoStack);
    const int steps = krUndoStack->count();
    for (int i = 0; i < 3; ++i) {
        QString proposal;
        pnAnswerModals({chooserAnswer(0, QStringLiteral("Mat"), true, &proposal)});
        main()->getFileMenu()->actions().at(0)->trigger();
        if (i == 0)
            QCOMPARE(proposal, QStringLiteral("Brick Material"));
    }
    QTabWidget* tabs = main()->getRightTabs();
    QCOMPARE(tabs->count(), 4);
    QCOMPARE(tabs->tabText(1), QStringLiteral("Mat"));
    QCOMPARE(tabs->tabText(2), QStringLiteral("Mat_0"));
    QCOMPARE(tabs->tabText(3), QStringLiteral("Mat_1"));
    QCOMPARE(main()->getCurrentWindow(), main()->getOpenWindows().last());
    // Laying out a new window is no edit: nothing to undo.
    QCOMPARE(krUndoStack->count(), steps);

    // A new material starts from the default material's network, arranged.
    IKrBrickUser* user = main()->getOpenWindows().last()->getBrickUser();
    QVERIFY(qobject_cast<KrBrickMaterial*>(user->getObject()));
    QCOMPARE(user->getBricks().size(),
             main()->getOpenWindows().first()->getBrickUser()->getBricks().size());

    // The chooser proposes the next free name of the kind.
    QString proposal;
    pnAnswerModals({chooserAnswer(0, QString(), false, &proposal)});
    main()->getFileMenu()->actions().at(0)->trigger();
    QCOMPARE(proposal, QStringLiteral("Brick Material"));
}

void TestKrCorvanePane::newWithBlankNameAndOtherKinds()
{
    pnAnswerModals({chooserAnswer(1, QStringLiteral("   "), true)});
    main()->getFileMenu()->actions().at(0)->trigger();
    pnAnswerModals({chooserAnswer(1, QString(), true)});
    main()->getFileMenu()->actions().at(0)->trigger();
    pnAnswerModals({chooserAnswer(2, QStringLiteral("  Network  "), true)});
    main()->getFileMenu()->actions().at(0)->trigger();

    const QList<KrCorvaneDockWidget*> windows = main()->getOpenWindows();
    QCOMPARE(windows.size(), 4);
    QCOMPARE(windows.at(1)->getBrickUser()->getName(), QStringLiteral("Brick Light"));
    QCOMPARE(windows.at(2)->getBrickUser()->getName(), QStringLiteral("Brick Light_0"));
    QCOMPARE(windows.at(3)->getBrickUser()->getName(), QStringLiteral("Network"));
    QCOMPARE(windows.at(1)->getBrickUser()->getTypeLabel(), QStringLiteral("Brick Light"));
    // Each kind is made ready: its brick set has a root.
    QVERIFY(windows.at(1)->getBrickUser()->getNumBrickSets() > 0);
    QVERIFY(windows.at(1)->getBrickUser()->getBrickSet(0)->getRoot());
}

void TestKrCorvanePane::cancelledNewOpensNothing()
{
    pnAnswerModals({chooserAnswer(0, QStringLiteral("Never"), false)});
    main()->getFileMenu()->actions().at(0)->trigger();
    pnAnswerModals({chooserAnswer(0, QString(), false)});
    main()->getFileMenu()->actions().at(2)->trigger();
    QCOMPARE(main()->getOpenWindows().size(), 1);
}

void TestKrCorvanePane::fromSceneOpensCopies()
{
    KrDefaultMaterial red(QStringLiteral("Red"));
    std::unique_ptr<KrBrickMaterial> first(KrBrickMaterial::convertDefaultMaterial(&red));
    KrDefaultMaterial blue(QStringLiteral("Blue"));
    std::unique_ptr<KrBrickMaterial> second(KrBrickMaterial::convertDefaultMaterial(&blue));
    std::unique_ptr<KrBrickMaterial> twin(KrBrickMaterial::convertDefaultMaterial(&blue));
    KrBrickLight light;
    PaneSceneBridge bridge;
    bridge.entries = {
        {first.get(), "red"}, {&light, "lamp"}, {second.get(), "blue"}, {twin.get(), "blue"}};
    KrBrickUserElement::setSceneBridge(&bridge);

    bool nameVisible = true;
    KrModalSeen seen;
    pnAnswerModals({[&](QWidget* modal) {
        seen.title = modal->windowTitle();
        chooserAnswer(0, QString(), true, nullptr, &nameVisible)(modal);
    }});
    QCOMPARE(main()->getFileMenu()->actions().at(2)->text(), QStringLiteral("From &Scene..."));
    main()->getFileMenu()->actions().at(2)->trigger();
    QCOMPARE(seen.title, QStringLiteral("Read from scene"));
    QVERIFY(!nameVisible);

    // One window per scene key, each on a copy carrying the scene's network.
    const QList<KrCorvaneDockWidget*> windows = main()->getOpenWindows();
    QCOMPARE(windows.size(), 3);
    IKrBrickUser* redCopy = windows.at(1)->getBrickUser();
    IKrBrickUser* blueCopy = windows.at(2)->getBrickUser();
    QVERIFY(redCopy != first.get());
    QCOMPARE(redCopy->getName(), QStringLiteral("Red"));
    QCOMPARE(blueCopy->getName(), QStringLiteral("Blue"));
    QCOMPARE(networkText(redCopy), networkText(first.get()));
    QVERIFY(static_cast<KrBrickUserElement*>(qobject_cast<KrBrickMaterial*>(redCopy->getObject()))
                ->isFromScene());
    QCOMPARE(main()->getRightTabs()->tabText(2), QStringLiteral("Blue"));

    // Apply hands the copy to the scene.
    QTest::mouseClick(windows.at(1)->findChild<QPushButton*>(QStringLiteral("applyButton")),
                      Qt::LeftButton);
    QCOMPARE(bridge.applied, 1);
}

void TestKrCorvanePane::preferencesRebuildDivider()
{
    pnAnswerModals({chooserAnswer(0, QStringLiteral("Second"), true)});
    main()->getFileMenu()->actions().at(0)->trigger();
    main()->getRightTabs()->setCurrentIndex(0);
    main()->getLeftTabs()->setCurrentIndex(1);
    QPointer<KrDynamicDivider> oldDivider = main()->getDivider();

    KrModalSeen seen;
    pnAnswerModals({[&seen](QWidget* modal) {
        seen.handled = true;
        seen.title = modal->windowTitle();
        modal->findChild<QCheckBox*>(QStringLiteral("duderOvidCheck"))->setChecked(false);
        modal->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"))
            ->button(QDialogButtonBox::Ok)
            ->click();
    }});
    main()->getFileMenu()->actions().last()->trigger();
    QVERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("Duderovid Preferences..."));

    KrDynamicDivider* divider = main()->getDivider();
    QVERIFY(divider != oldDivider);
    QTRY_VERIFY(!oldDivider);
    QCOMPARE(divider->getFirst(), static_cast<QWidget*>(main()->getRightTabs()));
    QCOMPARE(divider->getSecond(), static_cast<QWidget*>(main()->getLeftTabs()));
    QVERIFY(!divider->getBar()->toggleEnabled());
    QCOMPARE(main()->getRightTabs()->count(), 2);
    QCOMPARE(main()->getRightTabs()->currentIndex(), 0);
    QCOMPARE(main()->getLeftTabs()->currentIndex(), 1);
    QVERIFY(main()->getRightTabs()->isVisible());
    QVERIFY(main()->getLeftTabs()->isVisible());

    // Cancelling changes nothing.
    pnAnswerModals({pnRejectAnswer()});
    main()->getFileMenu()->actions().last()->trigger();
    QCOMPARE(main()->getDivider(), divider);
}

void TestKrCorvanePane::collapsedDividerIsRestored()
{
    QVERIFY(!main()->getDivider()->isToggled());
    main()->getDivider()->toggleWidget();
    KrPaneSettings settings;
    m_pane->saveSettings(settings);
    {
        KrAppSettings stored;
        stored.pushPath(QStringLiteral("DuderOvid"));
        QVERIFY(stored.getBoolValue(QStringLiteral("DividerCollapsed"), false));
    }
    KrCorvanePane again;
    QVERIFY(again.getMainWidget()->getDivider()->isToggled());

    // With the library on the right it cannot collapse, whatever is stored.
    {
        KrAppSettings stored;
        stored.pushPath(QStringLiteral("DuderOvid"));
        stored.setBoolValue(QStringLiteral("TabsRight"), false);
    }
    KrCorvanePane right;
    QVERIFY(!right.getMainWidget()->getDivider()->isToggled());
}

void TestKrCorvanePane::refreshActionRebuildsUserBricks()
{
    const QString folder = m_env->brickFolder();
    QVERIFY(KrBrickUserFiles::writeTextFile(
        folder + QStringLiteral("/Sparkle.kcb"),
        pnSavedBrickText(QStringLiteral("KrNoiseBrick"), QStringLiteral("Sparkle"))));
    KrCorvanePaneItemRefresh refresh;
    refresh.executeAction();
    refresh.executeAction();
    QTreeWidgetItem* user = main()->getUserItem();
    QCOMPARE(user->childCount(), 1);
    QCOMPARE(user->child(0)->text(0), QStringLiteral("Sparkle"));
    QCOMPARE(main()->getUserMenu()->actions().size(), 1);

    // A double-click on it adds the saved brick with its title.
    IKrBrickUser* material = main()->getCurrentWindow()->getBrickUser();
    const int count = material->getBricks().size();
    QTreeWidget* tree = main()->getBrickTree();
    tree->expandAll();
    doubleClick(tree, user->child(0));
    QCOMPARE(material->getBricks().size(), count + 1);
    QCOMPARE(material->getBricks().last()->getBrickTitle(), QStringLiteral("Sparkle"));
}

void TestKrCorvanePane::currentTabFeedsPropertiesAndPreview()
{
    KrCorvaneDockWidget* material = main()->getCurrentWindow();
    QCOMPARE(main()->getPropertiesView()->getElement(),
             qobject_cast<KrElement*>(material->getBrickUser()->getObject()));
    QVERIFY(main()->getPreviewButton()->isEnabled());
    QVERIFY(!main()->getPropertiesView()->getPropertyWidgets().isEmpty());

    pnAnswerModals({chooserAnswer(2, QStringLiteral("Plain"), true)});
    main()->getFileMenu()->actions().at(0)->trigger();
    KrCorvaneDockWidget* plain = main()->getCurrentWindow();
    QVERIFY(plain != material);
    QCOMPARE(main()->getPropertiesView()->getElement(),
             qobject_cast<KrElement*>(plain->getBrickUser()->getObject()));
    QVERIFY(!main()->getPreviewButton()->isEnabled());

    main()->getRightTabs()->setCurrentIndex(0);
    QVERIFY(main()->getPreviewButton()->isEnabled());
}

void TestKrCorvanePane::fileMenuKeys()
{
    QMenu* file = main()->getFileMenu();
    QCOMPARE(file->title(), QStringLiteral("&File"));
    QStringList texts;
    for (QAction* action : file->actions())
        texts << (action->isSeparator() ? QStringLiteral("|") : action->text());
    QCOMPARE(texts, QStringList({"&New...", "&Open...", "From &Scene...", "|", "Preferences..."}));
    QCOMPARE(file->actions().at(0)->shortcut(), QKeySequence(QKeySequence::New));
    QCOMPARE(file->actions().at(1)->shortcut(), QKeySequence(QKeySequence::Open));

    // The key works with the focus inside the pane.
    main()->getBrickTree()->setFocus();
    QTRY_VERIFY(main()->getBrickTree()->hasFocus());
    KrModalSeen seen;
    pnAnswerModals({[&seen](QWidget* modal) {
        seen.handled = true;
        seen.title = modal->windowTitle();
        pnRejectAnswer()(modal);
    }});
    QTest::keySequence(main()->getBrickTree(), QKeySequence(QKeySequence::New));
    QTRY_VERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("New"));
}

void TestKrCorvanePane::windowSaveKey()
{
    KrCorvaneDockWidget* window = main()->getCurrentWindow();
    m_env->mainWindow()->activateWindow();
    QVERIFY(QTest::qWaitForWindowActive(m_env->mainWindow()));
    window->getView()->setFocus();
    QTRY_VERIFY(window->getView()->hasFocus());
    KrModalSeen seen;
    pnAnswerModals({pnRejectAnswer(&seen)});
    QTest::keySequence(window->getView(), QKeySequence(QKeySequence::Save));
    QTRY_VERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("Save Brick Material setup..."));
}

void TestKrCorvanePane::regroupInPropertiesTab()
{
    main()->getLeftTabs()->setCurrentIndex(1);
    KrBrickUserPropertiesView* view = main()->getPropertiesView();
    QTRY_VERIFY(!view->getPropertyWidgets().isEmpty());
    KrPropertyWgt* row = view->getPropertyWidgets().first();
    KrProperty* property = row->getFirstProperty();
    const QString name = property->getName();

    // Right click on the row, "Regroup", a new path.
    QTimer::singleShot(50, []() {
        if (auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget())) {
            QTest::keyClick(menu, Qt::Key_Down);
            QTest::keyClick(menu, Qt::Key_Down);
            QTest::keyClick(menu, Qt::Key_Return);
        }
    });
    bool answered = false;
    pnAnswerModals({[&answered](QWidget* modal) {
        answered = true;
        auto* edit = modal->findChild<QLineEdit*>();
        edit->setText(QStringLiteral("/Favourites"));
        static_cast<QDialog*>(modal)->accept();
    }});
    const QPoint pos(8, row->height() / 2);
    QWidget* target = row->childAt(pos) ? row->childAt(pos) : row;
    QContextMenuEvent event(QContextMenuEvent::Mouse, target->mapFrom(row, pos),
                            row->mapToGlobal(pos));
    QApplication::sendEvent(target, &event);
    QVERIFY(answered);
    QCOMPARE(property->getPath(), QStringLiteral("/Favourites"));
    QCOMPARE(property->getName(), name);
    QTRY_VERIFY(view->findGroup(QStringLiteral("/Favourites")));
}

QTEST_MAIN(TestKrCorvanePane)
#include "tst_krcorvanepane.moc"
