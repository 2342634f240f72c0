#include "app_testsupport.h"

#include "kraction.h"
#include "krapp.h"
#include "krappsettings.h"
#include "krfileio.h"
#include "krmainwindow.h"
#include "krpane.h"
#include "krundo.h"

#include <QClipboard>
#include <QDockWidget>
#include <QFileDialog>
#include <QLineEdit>
#include <QMenu>
#include <QMenuBar>
#include <QMessageBox>
#include <QVBoxLayout>
#include <QtTest>

namespace {

class NoteItem : public KrUndoItem
{
public:
    void undo() override {}
};

QStringList menuTexts(const QMenu* menu)
{
    QStringList texts;
    for (QAction* a : menu->actions())
        texts.append(a->isSeparator() ? QStringLiteral("-") : a->text());
    return texts;
}

} // namespace

class TestKrMainWindow : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void init();
    void panesAreDockedAndFindable();
    void actionsArePlacedByMenuPath_data();
    void actionsArePlacedByMenuPath();
    void menuOrderAndGroups();
    void hostActions_data();
    void hostActions();
    void hostActionsActOnTheFocusedWindow();
    void quitShortcut();
    void aboutListsLoadedPlugins();
    void undoRedoFollowTheStack();
    void paneOptionsMenuFromTheDock();
    void fileDialogAcceptsATypedName();
    void fileDialogOpensAnExistingFile();
    void fileDialogCancel();
    void layoutSurvivesTwoLifetimes();
    void restoreWithoutStoredLayout();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrMainWindow::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
}

void TestKrMainWindow::init()
{
    krApp->setClosing(false);
}

void TestKrMainWindow::panesAreDockedAndFindable()
{
    KrMainWindow window;
    auto* pane = new KrTestPane("Test Pane");
    QDockWidget* dock = window.addPane(pane, Qt::LeftDockWidgetArea);
    QVERIFY(dock);
    QCOMPARE(window.addPane(pane), dock); // a pane is added once
    QCOMPARE(dock->widget(), pane);
    QCOMPARE(dock->objectName(), QStringLiteral("KrTestPane"));
    QCOMPARE(dock->windowTitle(), QStringLiteral("Test Pane"));
    QCOMPARE(window.dockWidgetArea(dock), Qt::LeftDockWidgetArea);

    KrPaneMgr* panes = window.getPaneMgr();
    QCOMPARE(panes->findPane("Test Pane"), pane);
    QCOMPARE(panes->findPane("KrTestPane"), pane);
    QCOMPARE(panes->findPane("KrPane"), nullptr);
    QCOMPARE(panes->findPane("Nothing"), nullptr);

    auto* second = new KrTestPane("Second");
    QCOMPARE(window.addPane(second)->objectName(), QStringLiteral("KrTestPane_2"));
    QCOMPARE(panes->findPane("Second"), second);
    QCOMPARE(panes->getNumPanes(), 2);
    delete second;
    QCOMPARE(panes->getNumPanes(), 1);
    QCOMPARE(panes->findPane("Second"), nullptr);
}

void TestKrMainWindow::actionsArePlacedByMenuPath_data()
{
    QTest::addColumn<QString>("path");
    QTest::addColumn<QStringList>("titles"); // from the menu bar down
    QTest::newRow("top") << "Tools" << QStringList{"&Tools"};
    QTest::newRow("existing") << "Edit" << QStringList{"&Edit"};
    QTest::newRow("sub") << "Window/Panes" << QStringList{"&Window", "Panes"};
    QTest::newRow("deep") << "Render/Preview/Size" << QStringList{"Render", "Preview", "Size"};
    QTest::newRow("untidy") << " Render / Preview/ " << QStringList{"Render", "Preview"};
    QTest::newRow("pane options") << "::KrTestPane" << QStringList{"&Window", "Test Pane Options"};
}

void TestKrMainWindow::actionsArePlacedByMenuPath()
{
    QFETCH(QString, path);
    QFETCH(QStringList, titles);
    KrMainWindow window;
    window.addPane(new KrTestPane);
    auto* action = new KrTestBaseAction;
    action->setGroupAndPath("Test", path);
    window.addKrAction(action);
    QCOMPARE(action->parent(), &window);
    QCOMPARE(window.getActionMgr()->findAction("KrTestBaseAction"), action);

    QMenu* menu = window.findMenu(path);
    QVERIFY(menu);
    QVERIFY(menu->actions().contains(action));
    // Walk the titles from the menu bar to the menu.
    QWidget* container = window.menuBar();
    for (const QString& title : titles) {
        QMenu* found = nullptr;
        for (QAction* a : container->actions()) {
            if (a->menu() && a->menu()->title() == title)
                found = a->menu();
        }
        QVERIFY2(found, qPrintable(title));
        container = found;
    }
    QCOMPARE(container, menu);
    action->trigger();
    QCOMPARE(action->executions(), 1);
}

void TestKrMainWindow::menuOrderAndGroups()
{
    KrMainWindow window;
    auto* first = new KrTestBaseAction;
    first->setGroupAndPath("One", "File");
    auto* second = new KrTestBaseAction;
    second->setGroupAndPath("One", "File");
    auto* other = new KrTestBaseAction;
    other->setGroupAndPath("Two", "File");
    window.addKrAction(first);
    window.addKrAction(second);
    window.addKrAction(other);
    window.getMenu("Zeta");

    QStringList bar;
    for (QAction* a : window.menuBar()->actions())
        bar.append(a->text());
    QCOMPARE(bar, (QStringList{"&File", "&Edit", "&Window", "Zeta", "&Help"}));

    const QStringList file = menuTexts(window.findMenu("File"));
    QCOMPARE(file, (QStringList{"&Save", "&Import...", "-", "Test Action", "Test Action", "-",
                                "Test Action", "-", "&Quit"}));
    const QStringList edit = menuTexts(window.findMenu("Edit"));
    QCOMPARE(edit.mid(2), (QStringList{"-", "&Copy", "Cu&t", "&Paste", "-", "Pr&eferences..."}));
}

void TestKrMainWindow::hostActions_data()
{
    QTest::addColumn<QString>("className");
    QTest::addColumn<QKeySequence>("shortcut");
    QTest::addColumn<QString>("menu");
    QTest::newRow("save") << "KrSaveAction" << QKeySequence(QKeySequence::Save) << "File";
    QTest::newRow("copy") << "KrCopyAction" << QKeySequence(QKeySequence::Copy) << "Edit";
    QTest::newRow("cut") << "KrSICutAction" << QKeySequence(QKeySequence::Cut) << "Edit";
    QTest::newRow("paste") << "KrPasteAction" << QKeySequence(QKeySequence::Paste) << "Edit";
    QTest::newRow("customize") << "KrCustomizeAction" << QKeySequence() << "Edit";
    QTest::newRow("import") << "KrImportAction" << QKeySequence() << "File";
}

void TestKrMainWindow::hostActions()
{
    QFETCH(QString, className);
    QFETCH(QKeySequence, shortcut);
    QFETCH(QString, menu);
    KrMainWindow window;
    KrAction* action = window.getActionMgr()->findAction(className);
    QVERIFY(action);
    QCOMPARE(QString::fromLatin1(action->metaObject()->className()), className);
    QCOMPARE(action->shortcut(), shortcut);
    QVERIFY(window.findMenu(menu)->actions().contains(action));
    QCOMPARE(window.getActionMgr()->findAction("KrNoSuchAction"), nullptr);
}

void TestKrMainWindow::hostActionsActOnTheFocusedWindow()
{
    KrMainWindow window;
    auto* pane = new KrTestPane;
    auto* layout = new QVBoxLayout(pane);
    auto* editorWindow = new QWidget;
    auto* focusInside = new QWidget; // a scene view, say: no text commands of its own
    focusInside->setFocusPolicy(Qt::StrongFocus);
    auto* editorLayout = new QVBoxLayout(editorWindow);
    editorLayout->addWidget(focusInside);
    layout->addWidget(editorWindow);
    auto* plainEdit = new QLineEdit;
    layout->addWidget(plainEdit);
    // The editor window's own Copy, with the shortcut it borrowed from the host action.
    auto* windowCopy = new QAction("Copy bricks", editorWindow);
    windowCopy->setShortcut(QKeySequence::Copy);
    editorWindow->addAction(windowCopy);
    auto* windowPrefs = new QAction("Preferences", editorWindow);
    windowPrefs->setProperty("krHostAction", "KrCustomizeAction");
    editorWindow->addAction(windowPrefs);
    QSignalSpy copied(windowCopy, &QAction::triggered);
    QSignalSpy prefs(windowPrefs, &QAction::triggered);
    window.addPane(pane);
    window.show();
    QApplication::setActiveWindow(&window);
    QVERIFY(QTest::qWaitForWindowActive(&window));

    auto* copy = qobject_cast<KrRoutedAction*>(window.getActionMgr()->findAction("KrCopyAction"));
    auto* paste = qobject_cast<KrRoutedAction*>(window.getActionMgr()->findAction("KrPasteAction"));
    auto* customize =
        qobject_cast<KrRoutedAction*>(window.getActionMgr()->findAction("KrCustomizeAction"));
    auto* save = qobject_cast<KrRoutedAction*>(window.getActionMgr()->findAction("KrSaveAction"));

    focusInside->setFocus();
    QTRY_COMPARE(QApplication::focusWidget(), focusInside);
    QCOMPARE(copy->findTarget(), windowCopy);
    copy->trigger();
    QCOMPARE(copied.count(), 1);
    customize->trigger();
    QCOMPARE(prefs.count(), 1);
    // The key itself reaches the window's action alone: no ambiguity with the host's.
    QTest::keySequence(focusInside, QKeySequence(QKeySequence::Copy));
    QCOMPARE(copied.count(), 2);
    QVERIFY(!save->hasTarget());

    // Outside that window, a text field takes the command itself.
    plainEdit->setFocus();
    QTRY_COMPARE(QApplication::focusWidget(), plainEdit);
    QVERIFY(!customize->hasTarget());
    QVERIFY(paste->hasTarget());
    QApplication::clipboard()->setText("pasted text");
    paste->trigger();
    QCOMPARE(plainEdit->text(), QStringLiteral("pasted text"));
    QCOMPARE(copied.count(), 2);
}

void TestKrMainWindow::quitShortcut()
{
    KrMainWindow window;
    QAction* quit = window.getQuitAction();
    QVERIFY(quit->shortcuts().contains(QKeySequence(Qt::CTRL | Qt::Key_Q)));
    for (const QKeySequence& key : QKeySequence::keyBindings(QKeySequence::Quit))
        QVERIFY(quit->shortcuts().contains(key));
    QVERIFY(menuTexts(window.findMenu("File")).endsWith("&Quit"));
}

void TestKrMainWindow::aboutListsLoadedPlugins()
{
    QVERIFY(krApp->loadPlugin(QStringLiteral(KR_PLUGIN_DIR "/libkrcorvanegui.so")));
    KrMainWindow window;
    QString text;
    bool handled = false;
    krOnNextModal(
        [&text](QWidget* modal) {
            auto* box = qobject_cast<QMessageBox*>(modal);
            QVERIFY(box);
            text = box->text();
            box->accept();
        },
        &handled);
    QAction* about = nullptr;
    for (QAction* a : window.findMenu("Help")->actions()) {
        if (a->text().contains("About"))
            about = a;
    }
    QVERIFY(about);
    about->trigger();
    QVERIFY(handled);
    QVERIFY2(text.contains("Corvane") && text.contains("1.0.0.0"), qPrintable(text));
    QVERIFY(text.contains("Provides the interface for the Corvane development environment."));
}

void TestKrMainWindow::undoRedoFollowTheStack()
{
    KrMainWindow window;
    KrUndoStack* stack = krApp->getUndoStack();
    stack->clear();
    QAction* undo = window.getUndoAction();
    QAction* redo = window.getRedoAction();
    QVERIFY(window.findMenu("Edit")->actions().mid(0, 2) == (QList<QAction*>{undo, redo}));
    QVERIFY(!undo->isEnabled());
    QVERIFY(undo->shortcuts().contains(QKeySequence(QKeySequence::Undo)));
    {
        KrUndoStackHold hold;
        stack->push(new NoteItem);
        hold.accept("Move Bricks");
    }
    QVERIFY(undo->isEnabled());
    QVERIFY2(undo->text().contains("Move Bricks"), qPrintable(undo->text()));
    QVERIFY(!redo->isEnabled());
    undo->trigger();
    QVERIFY(!undo->isEnabled());
    QVERIFY(redo->isEnabled());
    QVERIFY2(redo->text().contains("Move Bricks"), qPrintable(redo->text()));
    stack->clear();
}

void TestKrMainWindow::paneOptionsMenuFromTheDock()
{
    KrMainWindow window;
    auto* pane = new KrTestPane;
    QDockWidget* dock = window.addPane(pane);
    QMenu* options = window.getPaneOptionsMenu("KrTestPane");
    QCOMPARE(window.getMenu("::KrTestPane"), options);
    QCOMPARE(options->title(), QStringLiteral("Test Pane Options"));
    auto* action = new KrTestBaseAction;
    action->setGroupAndPath("Test", "::KrTestPane");
    window.addKrAction(action);
    QVERIFY(options->actions().contains(action));
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    emit dock->customContextMenuRequested(QPoint(10, 5));
    QTRY_VERIFY(options->isVisible());
    options->hide();
}

void TestKrMainWindow::fileDialogAcceptsATypedName()
{
    QTemporaryDir folder;
    KrMainWindow window;
    KrFileFilter filter;
    filter.newFilter("Brelvo Brick Material");
    filter.addExtension("kbm");
    filter.newFilter("Bricks");
    filter.addExtension("kcb");
    bool handled = false;
    QString title;
    krOnNextModal(
        [&](QWidget* modal) {
            auto* dialog = qobject_cast<QFileDialog*>(modal);
            QVERIFY(dialog);
            title = dialog->windowTitle();
            auto* name = dialog->findChild<QLineEdit*>("fileNameEdit");
            QVERIFY(name);
            name->setText("shiny");
            QTest::keyClick(name, Qt::Key_Return);
        },
        &handled);
    QString fileName;
    int selected = 1;
    QVERIFY(window.doFileDialog(false, "Save Material setup...", folder.path(), filter, fileName,
                                &selected, nullptr));
    QVERIFY(handled);
    QCOMPARE(title, QStringLiteral("Save Material setup..."));
    // Typed without extension: the chosen filter's extension is added.
    QCOMPARE(fileName, QDir(folder.path()).filePath("shiny.kcb"));
    QCOMPARE(selected, 1);
}

void TestKrMainWindow::fileDialogOpensAnExistingFile()
{
    QTemporaryDir folder;
    const QString path = QDir(folder.path()).filePath("red.kbm");
    QFile file(path);
    QVERIFY(file.open(QIODevice::WriteOnly));
    file.close();
    KrMainWindow window;
    KrFileFilter filter;
    filter.newFilter("Brelvo Brick Material");
    filter.addExtension("kbm");
    bool handled = false;
    krOnNextModal(
        [&](QWidget* modal) {
            auto* name = modal->findChild<QLineEdit*>("fileNameEdit");
            QVERIFY(name);
            name->setText("red.kbm");
            QTest::keyClick(name, Qt::Key_Return);
        },
        &handled);
    QString fileName;
    QVERIFY(window.doFileDialog(true, "Open", folder.path(), filter, fileName));
    QVERIFY(handled);
    QCOMPARE(fileName, path);
}

void TestKrMainWindow::fileDialogCancel()
{
    KrMainWindow window;
    KrFileFilter filter;
    filter.newFilter("Bricks");
    filter.addExtension("kcb");
    bool handled = false;
    krOnNextModal([](QWidget* modal) { QTest::keyClick(modal, Qt::Key_Escape); }, &handled);
    QString fileName = "/proposed/name.kcb";
    int selected = 0;
    QVERIFY(!window.doFileDialog(false, "Save", QDir::tempPath(), filter, fileName, &selected));
    QVERIFY(handled);
    QCOMPARE(fileName, QStringLiteral("/proposed/name.kcb"));
}

void TestKrMainWindow::layoutSurvivesTwoLifetimes()
{
    {
        KrMainWindow window;
        auto* a = new KrTestPane("Alpha");
        auto* b = new KrOtherTestPane;
        window.addPane(a);
        QDockWidget* dockB = window.addPane(b);
        window.resize(900, 600);
        window.show();
        QVERIFY(QTest::qWaitForWindowExposed(&window));
        window.addDockWidget(Qt::LeftDockWidgetArea, dockB);
        window.getPaneMgr()->getDock(a)->hide();
        QVERIFY(window.close());
        QVERIFY(krApp->isClosing());
        QCOMPARE(a->saves, 1);
        QCOMPARE(a->lastSaved.name, QStringLiteral("Alpha"));
        QCOMPARE(a->lastSaved.visible, false);
    }
    krApp->setClosing(false);
    {
        KrAppSettings settings;
        settings.pushPath("MainWindow");
        QVERIFY(!settings.getBinaryValue("State").isEmpty());
        QVERIFY(!settings.getBinaryValue("Geometry").isEmpty());
    }
    KrMainWindow window;
    auto* a = new KrTestPane("Alpha");
    auto* b = new KrOtherTestPane;
    QDockWidget* dockA = window.addPane(a);
    QDockWidget* dockB = window.addPane(b);
    QCOMPARE(window.dockWidgetArea(dockB), Qt::RightDockWidgetArea);
    QVERIFY(window.restoreLayout());
    window.show();
    QVERIFY(QTest::qWaitForWindowExposed(&window));
    QCOMPARE(window.dockWidgetArea(dockB), Qt::LeftDockWidgetArea);
    QVERIFY(dockA->isHidden());
    QVERIFY(!dockB->isHidden());
    QCOMPARE(a->restores, 1);
    QCOMPARE(a->lastRestored.visible, false);
    QCOMPARE(a->lastRestored.name, QStringLiteral("Alpha"));
    QCOMPARE(window.size(), QSize(900, 600));
}

void TestKrMainWindow::restoreWithoutStoredLayout()
{
    QTemporaryDir empty;
    KrAppSettings::setStorageFolder(empty.path());
    KrMainWindow window;
    auto* pane = new KrTestPane;
    window.addPane(pane);
    QVERIFY(!window.restoreLayout());
    QCOMPARE(pane->restores, 0);
    KrAppSettings::setStorageFolder(m_scope->path());
}

QTEST_MAIN(TestKrMainWindow)
#include "tst_krmainwindow.moc"
