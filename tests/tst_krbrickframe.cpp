#include "app_testsupport.h"
#include "frame_testsupport.h"
#include "krapp.h"
#include "krbrickframe.h"
#include "krbricktitlebar.h"
#include "krcorvaneutility.h"
#include "krdefaultbrickuser.h"
#include "krproperty.h"
#include "krsettings.h"
#include "krstandardbrickwidget.h"
#include "krstyle.h"
#include "krundo.h"

#include <QFileDialog>
#include <QGraphicsProxyWidget>
#include <QGraphicsScene>
#include <QGraphicsView>
#include <QInputDialog>
#include <QLayout>
#include <QLineEdit>
#include <QMenu>
#include <QMessageBox>
#include <QPointer>
#include <QScrollBar>
#include <QSignalSpy>
#include <QTabBar>
#include <QtTest>
#include <memory>

namespace {
// A step of the brick's own command, to see that the command's changes are one named step.
class NoteItem : public KrUndoItem
{
public:
    void undo() override {}
};

KrUndoStack* undoStack()
{
    return krApp->getUndoStack();
}

// Sends a mouse event to widget as if the cursor were at the global point.
void mouseAt(QWidget* widget, QEvent::Type type, const QPoint& global,
             Qt::MouseButton button = Qt::LeftButton, Qt::MouseButtons buttons = Qt::LeftButton)
{
    const QPoint local = widget->mapFromGlobal(global);
    QMouseEvent event(type, QPointF(local), QPointF(local), QPointF(global), button, buttons,
                      Qt::NoModifier);
    QApplication::sendEvent(widget, &event);
}

QStringList fixedEntries()
{
    return {QStringLiteral("-"),
            QStringLiteral("Hide Parameters"),
            QStringLiteral("Show Advanced"),
            QStringLiteral("-"),
            QStringLiteral("Delete"),
            QStringLiteral("-"),
            QStringLiteral("Change Title..."),
            QStringLiteral("Save Brick...")};
}

// Answers the next file dialog with fileName typed into its name field; records what the
// dialog proposed.
struct SaveDialogAnswer
{
    QString title, proposed;
    QStringList filters;
    bool seen = false;
};
void answerSaveDialog(SaveDialogAnswer* answer, const QString& fileName)
{
    krOnNextModal([=](QWidget* w) {
        auto* dialog = qobject_cast<QFileDialog*>(w);
        if (!dialog) {
            w->close();
            return;
        }
        answer->seen = true;
        answer->title = dialog->windowTitle();
        answer->filters = dialog->nameFilters();
        answer->proposed = dialog->selectedFiles().value(0);
        if (fileName.isEmpty()) {
            dialog->reject();
            return;
        }
        dialog->findChild<QLineEdit*>(QStringLiteral("fileNameEdit"))->setText(fileName);
        static_cast<QDialog*>(dialog)->accept(); // the file dialog's own check of the name
    });
}
} // namespace

class TestKrBrickFrame : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void cleanupTestCase();
    void init();

    void titleAtConstruction_data();
    void titleAtConstruction();
    void settingsAtConstruction_data();
    void settingsAtConstruction();
    void layoutAndObjectNames();
    void optionWidgetFromFactory();
    void menuEntries_data();
    void menuEntries();
    void brickActionSetUpOrder();
    void commandActionRunsBrickCommand();
    void menuRebuildKeepsChecks();
    void deleteAndCloseAskToClose();
    void hideParamsShrinksAndUndoes();
    void showAdvancedAddsRows();
    void changeTitleDialog_data();
    void changeTitleDialog();
    void titleUndoAndPaths();
    void frameRegistry();

    void titleBarGeometryAndPaint();
    void titleBarDragMovesAndClamps();
    void titleBarCloseArea();
    void titleBarDragInZoomedView();

    void resizeButtonSide_data();
    void resizeButtonSide();
    void resizeButtonDrag();
    void optionsButtonMask();
    void optionsButtonPaintState();

    void saveBrickWritesKcb();
    void saveBrickAddsSuffixAndCancels();
    void saveBrickFailureIsReported();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
    KrFrameTestFactory<KrFrameTestAction> m_actionFactory{"5D0A7C21-0B4E-4C8E-9F10-3E2A1B7C9D01"};
    KrFrameTestFactory<KrFrameTestPlainAction> m_plainFactory{
        "5D0A7C21-0B4E-4C8E-9F10-3E2A1B7C9D02"};
    // Claims to be a brick action, makes a plain QAction.
    KrFrameTestFactory<KrFrameTestAction, KrFrameTestPlainAction> m_liarFactory{
        "5D0A7C21-0B4E-4C8E-9F10-3E2A1B7C9D03"};
    KrFrameTestFactory<KrFrameTestOptions> m_optionsFactory{"5D0A7C21-0B4E-4C8E-9F10-3E2A1B7C9D04"};
    // Claims to be an option widget, makes an action.
    KrFrameTestFactory<KrFrameTestOptions, KrFrameTestPlainAction> m_badOptionsFactory{
        "5D0A7C21-0B4E-4C8E-9F10-3E2A1B7C9D05"};
};

void TestKrBrickFrame::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
    // Names the test classes differently from what the liars claim, so each is found by one.
    krApp->registerClassFactory(&m_actionFactory);
    krApp->registerClassFactory(&m_plainFactory);
    krApp->registerClassFactory(&m_optionsFactory);
    QVERIFY(krApp->findClassFactory(QStringLiteral("KrBrickCommandAction")));
}

void TestKrBrickFrame::cleanupTestCase()
{
    krApp->unregisterClassFactory(&m_actionFactory);
    krApp->unregisterClassFactory(&m_plainFactory);
    krApp->unregisterClassFactory(&m_optionsFactory);
    QDir(KrCorvaneUtility::getCustomBrickPath()).removeRecursively();
    m_scope.reset();
}

void TestKrBrickFrame::init()
{
    undoStack()->clear();
}

void TestKrBrickFrame::titleAtConstruction_data()
{
    QTest::addColumn<bool>("stored");
    QTest::addColumn<QString>("storedTitle");
    QTest::addColumn<QString>("expected");
    QTest::newRow("none stored") << false << QString() << "Diffuse(3)";
    QTest::newRow("stored") << true << "Shiny"
                            << "Shiny";
    QTest::newRow("stored empty") << true << QString() << "Diffuse(3)";
}

void TestKrBrickFrame::titleAtConstruction()
{
    QFETCH(bool, stored);
    QFETCH(QString, storedTitle);
    QFETCH(QString, expected);
    KrFrameTestBrick brick(QStringLiteral("Diffuse"), 3);
    if (stored)
        brick.getBrickSettings()->setStringValue(QStringLiteral("BrickTitle"), storedTitle);
    KrBrickFrame frame(&brick, nullptr, nullptr);
    auto* bar = frame.findChild<QTabBar*>();
    QVERIFY(bar);
    QCOMPARE(bar->count(), 1);
    QCOMPARE(bar->tabText(0), expected);
    QCOMPARE(brick.getBrickSettings()->getStringValue(QStringLiteral("BrickTitle")), expected);
    QCOMPARE(undoStack()->count(), 0);
}

void TestKrBrickFrame::settingsAtConstruction_data()
{
    QTest::addColumn<int>("hideParams"); // -1: not stored
    QTest::addColumn<int>("showAdvanced");
    QTest::newRow("nothing stored") << -1 << -1;
    QTest::newRow("hidden") << 1 << -1;
    QTest::newRow("advanced shown") << 0 << 1;
    QTest::newRow("both") << 1 << 1;
}

void TestKrBrickFrame::settingsAtConstruction()
{
    QFETCH(int, hideParams);
    QFETCH(int, showAdvanced);
    KrFrameTestBrick brick;
    brick.addWithProperty(QStringLiteral("a"), QStringLiteral("A"));
    KrSettings* settings = brick.getBrickSettings();
    if (hideParams >= 0)
        settings->setBoolValue(QStringLiteral("HideParams"), hideParams);
    if (showAdvanced >= 0)
        settings->setBoolValue(QStringLiteral("ShowAdvanced"), showAdvanced);
    KrBrickFrame frame(&brick, nullptr, nullptr);

    // "HideParams" is written back as applied; "ShowAdvanced" only by the menu.
    QVERIFY(settings->hasKey(QStringLiteral("HideParams")));
    QCOMPARE(settings->hasKey(QStringLiteral("ShowAdvanced")), showAdvanced >= 0);
    QCOMPARE(frame.getOptionFrame()->isHidden(), hideParams == 1);
    QCOMPARE(frame.getOptionFrame()->hidesAdvanced(), showAdvanced != 1);
    const QList<QAction*> actions = frame.getBrickMenu()->actions();
    QAction* hide = nullptr;
    QAction* advanced = nullptr;
    for (QAction* a : actions) {
        if (a->text() == QLatin1String("Hide Parameters"))
            hide = a;
        if (a->text() == QLatin1String("Show Advanced"))
            advanced = a;
    }
    QVERIFY(hide && advanced);
    QVERIFY(hide->isCheckable() && advanced->isCheckable());
    QCOMPARE(hide->isChecked(), hideParams == 1);
    QCOMPARE(advanced->isChecked(), showAdvanced == 1);
}

void TestKrBrickFrame::layoutAndObjectNames()
{
    KrFrameTestBrick brick;
    KrBrickFrame frame(&brick, nullptr, nullptr);
    QCOMPARE(frame.frameShape(), QFrame::Panel);
    QCOMPARE(frame.frameShadow(), QFrame::Raised);
    QCOMPARE(frame.lineWidth(), 2);
    QVERIFY(frame.autoFillBackground());

    QCOMPARE(frame.getTitleBar()->objectName(), QStringLiteral("BrickTitleBar"));
    QCOMPARE(frame.findChild<KrBrickBar*>()->objectName(), QStringLiteral("BrickTitleBar"));
    auto* options = frame.findChild<KrTabBarOptionsBtn*>();
    QVERIFY(options);
    QCOMPARE(options->objectName(), QStringLiteral("BrickOptionsButton"));
    auto* resize = frame.findChild<KrBrickResizeButton*>();
    QVERIFY(resize);
    QCOMPARE(resize->objectName(), QStringLiteral("ResizeButton"));
    QVERIFY(qobject_cast<KrStandardBrickWidget*>(frame.getOptionFrame()));
    QCOMPARE(frame.getOptionFrame()->getBrick(), &brick);

    frame.resize(260, 300);
    frame.show();
    QCoreApplication::processEvents();
    // Top to bottom: title bar, bar with the options button at its right end, parameters,
    // resize grip in the bottom-right corner.
    auto* bar = frame.findChild<KrBrickBar*>();
    const QRect titleRect = frame.getTitleBar()->geometry();
    const QRect barRect(bar->mapTo(&frame, QPoint(0, 0)), bar->size());
    const QRect optionsRect(options->mapTo(&frame, QPoint(0, 0)), options->size());
    const QRect resizeRect(resize->mapTo(&frame, QPoint(0, 0)), resize->size());
    QVERIFY(titleRect.bottom() < barRect.top());
    QVERIFY(barRect.contains(optionsRect.center()));
    QVERIFY(optionsRect.right() >= barRect.right() - 1);
    QVERIFY(options->isVisible());
    QVERIFY(resizeRect.top() > barRect.bottom());
    QVERIFY(resizeRect.right() >= frame.contentsRect().right() - 1);
}

void TestKrBrickFrame::optionWidgetFromFactory()
{
    KrFrameTestBrick brick;
    brick.setOptionsClass(QStringLiteral("KrFrameTestOptions"));
    {
        KrBrickFrame frame(&brick, nullptr, nullptr);
        auto* options = qobject_cast<KrFrameTestOptions*>(frame.getOptionFrame());
        QVERIFY(options);
        QCOMPARE(options->holder, &frame);
        QCOMPARE(options->getBrick(), &brick);
        QCOMPARE(options->parentWidget(), &frame);
    }
    // A factory that makes something else, and a name nobody knows, give the standard widget.
    krApp->unregisterClassFactory(&m_optionsFactory);
    krApp->registerClassFactory(&m_badOptionsFactory);
    const int made = m_badOptionsFactory.created;
    for (const QString& name : {QStringLiteral("KrFrameTestOptions"), QStringLiteral("KrNoSuch")}) {
        brick.setOptionsClass(name);
        KrBrickFrame frame(&brick, nullptr, nullptr);
        QVERIFY(qobject_cast<KrStandardBrickWidget*>(frame.getOptionFrame()));
    }
    QCOMPARE(m_badOptionsFactory.created, made + 1);
    krApp->unregisterClassFactory(&m_badOptionsFactory);
    krApp->registerClassFactory(&m_optionsFactory);
}

void TestKrBrickFrame::menuEntries_data()
{
    QTest::addColumn<QStringList>("entries");
    QTest::addColumn<QStringList>("expected");
    QTest::newRow("none") << QStringList() << QStringList();
    QTest::newRow("command") << QStringList{"KrBrickCommandAction::Add Input"}
                             << QStringList{"Add Input"};
    QTest::newRow("separator between")
        << QStringList{"KrBrickCommandAction::Add Input", "", "KrBrickCommandAction::Remove Input"}
        << QStringList{"Add Input", "-", "Remove Input"};
    // Split at the first "::" only: the argument keeps any later one.
    QTest::newRow("argument with separator")
        << QStringList{"KrFrameTestAction::a::b"} << QStringList{"Test a::b"};
    QTest::newRow("separator at the end")
        << QStringList{"KrFrameTestAction::"} << QStringList{"Test "};
    // At position 0 the whole entry is the class name, which no factory has.
    QTest::newRow("separator first") << QStringList{"::KrFrameTestAction"} << QStringList();
    QTest::newRow("no separator") << QStringList{"KrFrameTestAction"} << QStringList{"Test "};
    QTest::newRow("unknown class")
        << QStringList{"KrNoSuchAction::x", "KrFrameTestAction::y"} << QStringList{"Test y"};
    QTest::newRow("not a brick action")
        << QStringList{"KrFrameTestPlainAction::x"} << QStringList();
    QTest::newRow("case matters") << QStringList{"krframetestaction::x"} << QStringList();
}

void TestKrBrickFrame::menuEntries()
{
    QFETCH(QStringList, entries);
    QFETCH(QStringList, expected);
    KrFrameTestBrick brick;
    brick.setActions(entries);
    KrBrickFrame frame(&brick, nullptr, nullptr);
    QCOMPARE(frameMenuTexts(frame.getBrickMenu()), expected + fixedEntries());
}

void TestKrBrickFrame::brickActionSetUpOrder()
{
    KrFrameTestBrick brick;
    brick.setActions({QStringLiteral("KrFrameTestAction::go")});
    KrBrickFrame frame(&brick, nullptr, nullptr);
    auto* action = qobject_cast<KrFrameTestAction*>(frame.getBrickMenu()->actions().value(0));
    QVERIFY(action);
    QCOMPARE(action->calls, (QStringList{"frame", "argument:go"}));
    QCOMPARE(action->getOptionsFrame(), frame.getOptionFrame());

    // A factory that claims the base but makes something else adds nothing.
    krApp->unregisterClassFactory(&m_actionFactory);
    krApp->registerClassFactory(&m_liarFactory);
    const int made = m_liarFactory.created;
    brick.setActions({QStringLiteral("KrFrameTestAction::go")});
    QCOMPARE(m_liarFactory.created, made + 1);
    QCOMPARE(frameMenuTexts(frame.getBrickMenu()), fixedEntries());
    krApp->unregisterClassFactory(&m_liarFactory);
    krApp->registerClassFactory(&m_actionFactory);
}

void TestKrBrickFrame::commandActionRunsBrickCommand()
{
    KrFrameTestBrick brick;
    brick.setActions({QStringLiteral("KrBrickCommandAction::Add Input")});
    // The command changes the brick's list while its own action is being triggered.
    brick.onExecute = [&](const QString&) {
        undoStack()->push(new NoteItem);
        brick.setActions({QStringLiteral("KrBrickCommandAction::Remove Input")});
    };
    KrBrickFrame frame(&brick, nullptr, nullptr);
    QPointer<QAction> add = frame.getBrickMenu()->actions().value(0);
    QVERIFY(add);
    QCOMPARE(add->text(), QStringLiteral("Add Input"));
    add->trigger();
    QCOMPARE(brick.executed, QStringList{"Add Input"});
    QCOMPARE(frameMenuTexts(frame.getBrickMenu()).value(0), QStringLiteral("Remove Input"));
    QCOMPARE(undoStack()->count(), 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Add Input"));
    QVERIFY(add); // still alive while its trigger unwinds
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(!add);

    // A command the brick refuses makes no step.
    brick.onExecute = [&](const QString&) { undoStack()->push(new NoteItem); };
    brick.setActions({QStringLiteral("KrBrickCommandAction::Refuse")});
    frame.getBrickMenu()->actions().value(0)->trigger();
    QCOMPARE(undoStack()->count(), 1);
}

void TestKrBrickFrame::menuRebuildKeepsChecks()
{
    KrFrameTestBrick brick;
    KrBrickFrame frame(&brick, nullptr, nullptr);
    frame.hideParams(true);
    frame.advanceView(true);
    brick.setActions({QStringLiteral("KrBrickCommandAction::Add Input")});
    const QList<QAction*> actions = frame.getBrickMenu()->actions();
    QCOMPARE(actions.size(), 1 + fixedEntries().size());
    QVERIFY(actions.at(2)->isChecked());
    QVERIFY(actions.at(3)->isChecked());
}

void TestKrBrickFrame::deleteAndCloseAskToClose()
{
    KrFrameTestBrick brick;
    KrBrickFrame frame(&brick, nullptr, nullptr);
    QSignalSpy closed(&frame, &KrBrickFrame::closeClicked);
    for (QAction* a : frame.getBrickMenu()->actions()) {
        if (a->text() == QLatin1String("Delete"))
            a->trigger();
    }
    QCOMPARE(closed.count(), 1);
    emit frame.getTitleBar()->closeClicked();
    QCOMPARE(closed.count(), 2);
}

void TestKrBrickFrame::hideParamsShrinksAndUndoes()
{
    KrFrameTestBrick brick;
    brick.addWithProperty(QStringLiteral("a"), QStringLiteral("A"));
    brick.addPlain(QStringLiteral("out"), QStringLiteral("Out"), 2);
    brick.addPlain(QStringLiteral("in"), QStringLiteral("In"), 1);
    KrBrickFrame frame(&brick, nullptr, nullptr);
    frame.resize(240, 500);
    frame.show();
    QCoreApplication::processEvents();
    const int open = frame.height();
    QCOMPARE(frame.width(), 240);

    frame.hideParams(true);
    QVERIFY(frame.getOptionFrame()->isHidden());
    QCOMPARE(frame.width(), 240);
    QCOMPARE(frame.height(), frame.layout()->totalMinimumSize().height());
    QVERIFY(frame.height() < open - 20);
    QCOMPARE(brick.getBrickSettings()->getBoolValue(QStringLiteral("HideParams")), true);
    QCOMPARE(undoStack()->count(), 1);
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Hide Parameters"));

    // Hiding again is no new step.
    frame.hideParams(true);
    QCOMPARE(undoStack()->count(), 1);

    // Showing leaves the size to the parameter list, which grows the frame once it settles.
    const int collapsed = frame.height();
    undoStack()->undo();
    QVERIFY(!frame.getOptionFrame()->isHidden());
    QCOMPARE(brick.getBrickSettings()->getBoolValue(QStringLiteral("HideParams")), false);
    QCOMPARE(frame.height(), collapsed);
    QCOMPARE(frame.maximumHeight(), QWIDGETSIZE_MAX);
    QCoreApplication::processEvents();
    QCOMPARE(frame.height(), open);
    QVERIFY(!frame.getBrickMenu()->actions().at(1)->isChecked());

    undoStack()->redo();
    QVERIFY(frame.getOptionFrame()->isHidden());
    QVERIFY(frame.getBrickMenu()->actions().at(1)->isChecked());
}

void TestKrBrickFrame::showAdvancedAddsRows()
{
    KrFrameTestBrick brick;
    brick.addWithProperty(QStringLiteral("a"), QStringLiteral("A"));
    KrBrickParam* advanced =
        brick.addWithProperty(QStringLiteral("adv"), QStringLiteral("Advanced"), 1, true);
    KrBrickFrame frame(&brick, nullptr, nullptr);
    auto* widget = qobject_cast<KrStandardBrickWidget*>(frame.getOptionFrame());
    QVERIFY(widget);
    QCoreApplication::processEvents();
    QVERIFY(!widget->getParamWidget(advanced));

    frame.advanceView(true);
    QCOMPARE(brick.getBrickSettings()->getBoolValue(QStringLiteral("ShowAdvanced")), true);
    QCoreApplication::processEvents();
    QVERIFY(widget->getParamWidget(advanced));
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Show Advanced"));

    undoStack()->undo();
    QCoreApplication::processEvents();
    QVERIFY(!widget->getParamWidget(advanced));
    QCOMPARE(brick.getBrickSettings()->getBoolValue(QStringLiteral("ShowAdvanced"), true), false);
    undoStack()->redo();
    QCoreApplication::processEvents();
    QVERIFY(widget->getParamWidget(advanced));
}

void TestKrBrickFrame::changeTitleDialog_data()
{
    QTest::addColumn<bool>("accept");
    QTest::addColumn<QString>("typed");
    QTest::addColumn<QString>("expected");
    QTest::newRow("accepted") << true << "Rusty Metal"
                              << "Rusty Metal";
    QTest::newRow("not ascii") << true << QStringLiteral("Ölfarbe ✓")
                               << QStringLiteral("Ölfarbe ✓");
    QTest::newRow("cancelled") << false << "Ignored"
                               << "Diffuse(3)";
    QTest::newRow("empty") << true << QString() << "Diffuse(3)";
}

void TestKrBrickFrame::changeTitleDialog()
{
    QFETCH(bool, accept);
    QFETCH(QString, typed);
    QFETCH(QString, expected);
    KrFrameTestBrick brick;
    KrBrickFrame frame(&brick, nullptr, nullptr);
    QString title, label, proposed;
    bool handled = false;
    krOnNextModal(
        [&](QWidget* w) {
            auto* dialog = qobject_cast<QInputDialog*>(w);
            QVERIFY(dialog);
            title = dialog->windowTitle();
            label = dialog->labelText();
            proposed = dialog->textValue();
            dialog->setTextValue(typed);
            if (accept)
                dialog->accept();
            else
                dialog->reject();
        },
        &handled);
    frame.changeTitle();
    QVERIFY(handled);
    QCOMPARE(title, QStringLiteral("Set Title"));
    QCOMPARE(label, QStringLiteral("Title"));
    QCOMPARE(proposed, QStringLiteral("Diffuse(3)"));
    QCOMPARE(frame.findChild<QTabBar*>()->tabText(0), expected);
    QCOMPARE(brick.getBrickSettings()->getStringValue(QStringLiteral("BrickTitle")), expected);
    QCOMPARE(undoStack()->count(), expected == QLatin1String("Diffuse(3)") ? 0 : 1);
}

void TestKrBrickFrame::titleUndoAndPaths()
{
    KrFrameTestBrick brick;
    KrPropertyParam* param = brick.addWithProperty(QStringLiteral("a"), QStringLiteral("Color"));
    KrProperty* property = param->getParamProperty(0);
    KrBrickFrame frame(&brick, nullptr, nullptr);
    KrShaderBrick::setPropertyPath(property, QStringLiteral("/Diffuse(3)/Color"));
    QTabBar* bar = frame.findChild<QTabBar*>();

    // Views follow the model, whoever changes it.
    brick.setBrickTitle(QStringLiteral("From Model"));
    QCOMPARE(bar->tabText(0), QStringLiteral("From Model"));
    QCOMPARE(property->getPath(), QStringLiteral("/From Model/Color"));
    QCOMPARE(undoStack()->count(), 0);

    frame.setBrickTitle(QStringLiteral("Mine"));
    QCOMPARE(property->getPath(), QStringLiteral("/Mine/Color"));
    QCOMPARE(undoStack()->undoText(), QStringLiteral("Change Title"));
    frame.setBrickTitle(QStringLiteral("Mine"));
    QCOMPARE(undoStack()->count(), 1);

    undoStack()->undo();
    QCOMPARE(bar->tabText(0), QStringLiteral("From Model"));
    QCOMPARE(property->getPath(), QStringLiteral("/From Model/Color"));
    undoStack()->redo();
    QCOMPARE(bar->tabText(0), QStringLiteral("Mine"));
    QCOMPARE(brick.getBrickSettings()->getStringValue(QStringLiteral("BrickTitle")),
             QStringLiteral("Mine"));
}

void TestKrBrickFrame::frameRegistry()
{
    KrFrameTestBrick brick;
    auto* frame = new KrBrickFrame(&brick, nullptr, nullptr);
    QCOMPARE(KrBrickFrame::findFrame(&brick), frame);
    frame->hideParams(true);
    delete frame;
    QVERIFY(!KrBrickFrame::findFrame(&brick));
    // With no frame left the step still keeps the brick's record right.
    undoStack()->undo();
    QCOMPARE(brick.getBrickSettings()->getBoolValue(QStringLiteral("HideParams"), true), false);
    undoStack()->redo();
    QCOMPARE(brick.getBrickSettings()->getBoolValue(QStringLiteral("HideParams")), true);

    // A step whose brick is gone does nothing.
    auto* gone = new KrFrameTestBrick;
    {
        KrBrickFrame other(gone, nullptr, nullptr);
        other.advanceView(true);
    }
    delete gone;
    undoStack()->undo();
    undoStack()->redo();
    QCOMPARE(undoStack()->count(), 2);
}

void TestKrBrickFrame::titleBarGeometryAndPaint()
{
    KrFrameTestStyle style;
    QWidget host;
    KrBrickTitleBar bar(&host, QStringLiteral("BrickTitleBar"));
    QCOMPARE(bar.objectName(), QStringLiteral("BrickTitleBar"));
    QVERIFY(bar.hasMouseTracking());
    QCOMPARE(bar.height(), 18);
    bar.setStyle(&style);
    QCOMPARE(bar.minimumHeight(), 22);
    QCOMPARE(bar.maximumHeight(), 22);
    bar.resize(150, 22);
    host.show();
    QVERIFY(QTest::qWaitForWindowExposed(&host));
    QCOMPARE(bar.getCloseRect(), QRect(128, 0, 22, 22));
    bar.grab();
    QVERIFY(style.controls.contains(1));
    QCOMPARE(style.lastOptionVersion, 1);
    QCOMPARE(style.lastOptionType, 0);
    bar.setStyle(nullptr);
}

void TestKrBrickFrame::titleBarDragMovesAndClamps()
{
    QWidget host;
    host.resize(600, 400);
    auto* target = new QWidget(&host);
    target->setGeometry(50, 60, 200, 100);
    auto* bar = new KrBrickTitleBar(target, QStringLiteral("BrickTitleBar"));
    bar->setGeometry(0, 0, 200, 18);
    host.show();
    QVERIFY(QTest::qWaitForWindowExposed(&host));
    QSignalSpy started(bar, &KrBrickTitleBar::dragStarted);
    QSignalSpy finished(bar, &KrBrickTitleBar::dragFinished);
    QSignalSpy closed(bar, &KrBrickTitleBar::closeClicked);

    const QPoint g0 = bar->mapToGlobal(QPoint(20, 9));
    mouseAt(bar, QEvent::MouseButtonPress, g0);
    // The point pressed stays under the pointer from the first move on.
    mouseAt(bar, QEvent::MouseMove, g0 + QPoint(3, 0));
    QCOMPARE(target->pos(), QPoint(53, 60));
    QCOMPARE(started.count(), 1);
    mouseAt(bar, QEvent::MouseMove, g0 + QPoint(23, 10));
    QCOMPARE(target->pos(), QPoint(73, 70));
    QCOMPARE(bar->cursor().shape(), Qt::SizeAllCursor);
    mouseAt(bar, QEvent::MouseMove, g0 + QPoint(-300, -300));
    QCOMPARE(target->pos(), QPoint(10, 10));
    mouseAt(bar, QEvent::MouseMove, g0 + QPoint(-300, 33));
    QCOMPARE(target->pos(), QPoint(10, 93));
    mouseAt(bar, QEvent::MouseButtonRelease, g0 + QPoint(-300, 33), Qt::LeftButton, Qt::NoButton);
    QCOMPARE(started.count(), 1);
    QCOMPARE(finished.count(), 1);
    QCOMPARE(closed.count(), 0);

    // Moves without a press only set the cursor.
    const QPoint closePoint = bar->mapToGlobal(bar->getCloseRect().center());
    mouseAt(bar, QEvent::MouseMove, closePoint, Qt::NoButton, Qt::NoButton);
    QCOMPARE(bar->cursor().shape(), Qt::ArrowCursor);
    QCOMPARE(target->pos(), QPoint(10, 93));

    // Only the left button drags.
    QMouseEvent right(QEvent::MouseButtonPress, QPointF(20, 9), QPointF(20, 9),
                      QPointF(bar->mapToGlobal(QPoint(20, 9))), Qt::RightButton, Qt::RightButton,
                      Qt::NoModifier);
    right.setAccepted(true);
    QApplication::sendEvent(bar, &right);
    QVERIFY(!right.isAccepted());
}

void TestKrBrickFrame::titleBarCloseArea()
{
    QWidget host;
    auto* target = new QWidget(&host);
    target->setGeometry(40, 40, 200, 100);
    auto* bar = new KrBrickTitleBar(target, QStringLiteral("BrickTitleBar"));
    bar->setGeometry(0, 0, 200, 18);
    host.resize(400, 300);
    host.show();
    QVERIFY(QTest::qWaitForWindowExposed(&host));
    QSignalSpy closed(bar, &KrBrickTitleBar::closeClicked);
    QSignalSpy started(bar, &KrBrickTitleBar::dragStarted);
    const QPoint close = bar->mapToGlobal(bar->getCloseRect().center());

    // Pressed on the close area and dragged off: neither moved nor closed.
    mouseAt(bar, QEvent::MouseButtonPress, close);
    mouseAt(bar, QEvent::MouseMove, close - QPoint(5, 0));
    mouseAt(bar, QEvent::MouseMove, close - QPoint(60, 0));
    mouseAt(bar, QEvent::MouseButtonRelease, close - QPoint(60, 0), Qt::LeftButton, Qt::NoButton);
    QCOMPARE(target->pos(), QPoint(40, 40));
    QCOMPARE(closed.count(), 0);
    QCOMPARE(started.count(), 0);

    // Pressed and released on it: closes.
    mouseAt(bar, QEvent::MouseButtonPress, close);
    mouseAt(bar, QEvent::MouseButtonRelease, close, Qt::LeftButton, Qt::NoButton);
    QCOMPARE(closed.count(), 1);

    // A drag that ends over the close area is still a drag.
    const QPoint grip = bar->mapToGlobal(QPoint(30, 9));
    mouseAt(bar, QEvent::MouseButtonPress, grip);
    mouseAt(bar, QEvent::MouseMove, grip + QPoint(1, 0));
    mouseAt(bar, QEvent::MouseMove, close);
    mouseAt(bar, QEvent::MouseButtonRelease, bar->mapToGlobal(bar->getCloseRect().center()),
            Qt::LeftButton, Qt::NoButton);
    QCOMPARE(closed.count(), 1);
    QVERIFY(target->pos() != QPoint(40, 40));
}

void TestKrBrickFrame::titleBarDragInZoomedView()
{
    QGraphicsScene scene;
    scene.setSceneRect(0, 0, 2000, 2000);
    QGraphicsView view(&scene);
    view.setAlignment(Qt::AlignLeft | Qt::AlignTop);
    view.scale(2.0, 2.0);
    view.resize(800, 600);
    auto* frame = new QWidget;
    frame->resize(200, 100);
    auto* bar = new KrBrickTitleBar(frame, QStringLiteral("BrickTitleBar"));
    bar->setGeometry(0, 0, 200, 18);
    QGraphicsProxyWidget* proxy = scene.addWidget(frame);
    proxy->setPos(100, 100);
    view.show();
    QVERIFY(QTest::qWaitForWindowExposed(&view));
    view.horizontalScrollBar()->setValue(0);
    view.verticalScrollBar()->setValue(0);
    QSignalSpy finished(bar, &KrBrickTitleBar::dragFinished);

    QWidget* port = view.viewport();
    const QPoint start = view.mapFromScene(proxy->mapToScene(QPointF(20, 9)));
    frameSendMouse(port, QEvent::MouseButtonPress, start);
    frameSendMouse(port, QEvent::MouseMove, start + QPoint(4, 0), Qt::NoButton);
    frameSendMouse(port, QEvent::MouseMove, start + QPoint(44, 20), Qt::NoButton);
    // 44 by 20 pixels at 200 % are 22 by 10 in the scene: the bar stays under the cursor.
    QCOMPARE(proxy->pos(), QPointF(122, 110));
    frameSendMouse(port, QEvent::MouseMove, start + QPoint(-400, 20), Qt::NoButton);
    QCOMPARE(proxy->pos(), QPointF(10, 110));
    frameSendMouse(port, QEvent::MouseButtonRelease, start + QPoint(-400, 20), Qt::LeftButton,
                   Qt::NoButton);
    QCOMPARE(finished.count(), 1);
}

void TestKrBrickFrame::resizeButtonSide_data()
{
    QTest::addColumn<int>("metric");
    QTest::addColumn<int>("side");
    QTest::newRow("odd") << 15 << 7;
    QTest::newRow("even") << 20 << 10;
    QTest::newRow("unknown to the style") << 0 << 7;
}

void TestKrBrickFrame::resizeButtonSide()
{
    QFETCH(int, metric);
    QFETCH(int, side);
    KrFrameTestStyle style;
    style.resizeMetric = metric;
    QWidget host;
    KrBrickResizeButton button(&host);
    QCOMPARE(button.objectName(), QStringLiteral("ResizeButton"));
    button.setStyle(&style);
    QCOMPARE(button.minimumSize(), QSize(side, side));
    QCOMPARE(button.maximumSize(), QSize(side, side));
    button.setStyle(krApp->getStyle());
    QCOMPARE(button.size(), QSize(7, 7));
    button.setStyle(nullptr);
}

void TestKrBrickFrame::resizeButtonDrag()
{
    KrFrameTestBrick brick;
    brick.addPlain(QStringLiteral("out"), QStringLiteral("Out"), 2);
    KrBrickFrame frame(&brick, nullptr, nullptr);
    frame.resize(220, 200);
    frame.show();
    QVERIFY(QTest::qWaitForWindowExposed(&frame));
    QCoreApplication::processEvents();
    const int width = frame.width();
    const int height = frame.height();
    auto* button = frame.findChild<KrBrickResizeButton*>();
    QSignalSpy clicked(button, &QAbstractButton::clicked);
    QSignalSpy started(&frame, &KrBrickFrame::resizeStarted);
    QSignalSpy finished(&frame, &KrBrickFrame::resizeFinished);

    const QPoint g0 = button->mapToGlobal(QPoint(2, 2));
    mouseAt(button, QEvent::MouseButtonPress, g0);
    QCOMPARE(started.count(), 1);
    // The edge follows the pointer from the first move on.
    mouseAt(button, QEvent::MouseMove, g0 + QPoint(10, 0));
    QCOMPARE(frame.width(), width + 10);
    mouseAt(button, QEvent::MouseMove, g0 + QPoint(20, 5));
    mouseAt(button, QEvent::MouseMove, g0 + QPoint(30, 9));
    QCOMPARE(frame.width(), width + 30);
    QCOMPARE(frame.height(), height);
    mouseAt(button, QEvent::MouseMove, g0 + QPoint(25, 9));
    QCOMPARE(frame.width(), width + 25);
    mouseAt(button, QEvent::MouseButtonRelease, g0 + QPoint(25, 9), Qt::LeftButton, Qt::NoButton);
    QCOMPARE(finished.count(), 1);
    QCOMPARE(clicked.count(), 0);
    QVERIFY(!button->isDown());

    // A new drag starts from where it is pressed: nothing of the last drag carries over.
    const QPoint g1 = button->mapToGlobal(QPoint(2, 2));
    mouseAt(button, QEvent::MouseButtonPress, g1);
    mouseAt(button, QEvent::MouseMove, g1 + QPoint(40, 0));
    QCOMPARE(frame.width(), width + 65);
    mouseAt(button, QEvent::MouseMove, g1 + QPoint(30, 0));
    QCOMPARE(frame.width(), width + 55);
    mouseAt(button, QEvent::MouseButtonRelease, g1, Qt::LeftButton, Qt::NoButton);
    QCOMPARE(started.count(), 2);
    QCOMPARE(finished.count(), 2);
}

void TestKrBrickFrame::optionsButtonMask()
{
    KrFrameTestStyle style;
    style.maskHint = 0;
    KrTabBarOptionsBtn button(nullptr, QStringLiteral("BrickOptionsButton"));
    QCOMPARE(button.objectName(), QStringLiteral("BrickOptionsButton"));
    button.setStyle(&style);
    QCOMPARE(button.size(), QSize(12, 12));
    QVERIFY(button.mask().isEmpty());

    // The host style masks it round: the centre stays, the corners go.
    button.setStyle(krApp->getStyle());
    QCOMPARE(button.size(), QSize(14, 14));
    const QRegion mask = button.mask();
    QVERIFY(!mask.isEmpty());
    QVERIFY(mask.contains(QPoint(7, 7)));
    QVERIFY(!mask.contains(QPoint(0, 0)));
    QVERIFY(!mask.contains(QPoint(13, 13)));

    button.setStyle(&style);
    QVERIFY(button.mask().isEmpty());
    button.setStyle(nullptr);
}

void TestKrBrickFrame::optionsButtonPaintState()
{
    KrFrameTestStyle style;
    KrTabBarOptionsBtn button(nullptr, QStringLiteral("BrickOptionsButton"));
    button.setStyle(&style);
    button.grab();
    QVERIFY(style.lastButtonState & QStyle::State_Raised);
    QVERIFY(style.lastButtonState & QStyle::State_Enabled);
    QVERIFY(!(style.lastButtonState & QStyle::State_DownArrow));
    button.setDown(true);
    button.grab();
    QVERIFY(style.lastButtonState & QStyle::State_DownArrow);
    QVERIFY(!(style.lastButtonState & QStyle::State_Raised));
    button.setDown(false);
    button.setEnabled(false);
    button.grab();
    QVERIFY(!(style.lastButtonState & QStyle::State_Enabled));
    button.setStyle(nullptr);
}

void TestKrBrickFrame::saveBrickWritesKcb()
{
    KrShaderBrick* brick = KrDefaultBrickUser::createBrick(QStringLiteral("KrDiffuseBrick"));
    QVERIFY(brick);
    brick->ref();
    brick->setBrickID(7);
    {
        KrBrickFrame frame(brick, nullptr, nullptr);
        frame.setBrickTitle(QStringLiteral("Grüner Lack ✓"));
        QTemporaryDir dir;
        const QString target = dir.filePath(QStringLiteral("saved.kcb"));
        SaveDialogAnswer answer;
        QSignalSpy saved(&frame, &KrBrickFrame::brickSaved);
        answerSaveDialog(&answer, target);
        frame.saveBrick();
        QVERIFY(answer.seen);
        QCOMPARE(answer.title, QStringLiteral("Save brick.."));
        QCOMPARE(answer.filters, QStringList{QStringLiteral("Bricks(*.kcb)")});
        // The custom folder is made and proposed with the title as the file name.
        const QString folder = KrCorvaneUtility::getCustomBrickPath();
        QVERIFY(QFileInfo(folder).isDir());
        QCOMPARE(answer.proposed, folder + QStringLiteral("/Grüner Lack ✓.kcb"));
        QCOMPARE(saved.count(), 1);

        QFile file(target);
        QVERIFY(file.open(QIODevice::ReadOnly));
        const QByteArray bytes = file.readAll();
        QVERIFY(!bytes.startsWith("\xEF\xBB\xBF"));
        KrSettings record;
        QVERIFY(record.fromString(QString::fromUtf8(bytes)));
        QCOMPARE(record.getStringValue(QStringLiteral("BrelvoHallixClassName")),
                 QStringLiteral("KrDiffuseBrick"));
        KrSettings expected;
        KrDefaultBrickUser::writeBrickToSettings(brick, &expected, false);
        QCOMPARE(QString::fromUtf8(bytes),
                 expected.getSettingsValue(expected.getKey(0))->toString());
        const KrSettings* settings = record.getSettingsValue(QStringLiteral("BrickSettings"));
        QVERIFY(settings);
        QCOMPARE(settings->getStringValue(QStringLiteral("BrickTitle")),
                 QStringLiteral("Grüner Lack ✓"));
        // And a brick made from the file is the same kind with the same title.
        KrShaderBrick* copy = KrDefaultBrickUser::createBrick(
            record.getStringValue(QStringLiteral("BrelvoHallixClassName")));
        QVERIFY(copy);
        copy->ref();
        QVERIFY(KrDefaultBrickUser::readBrickRecord(copy, &record));
        QCOMPARE(copy->getBrickTitle(), QStringLiteral("Grüner Lack ✓"));
        copy->unref();
    }
    brick->unref();
}

void TestKrBrickFrame::saveBrickAddsSuffixAndCancels()
{
    KrFrameTestBrick brick;
    KrBrickFrame frame(&brick, nullptr, nullptr);
    QTemporaryDir dir;
    SaveDialogAnswer answer;

    // Typed without the extension the brick library lists.
    answerSaveDialog(&answer, dir.filePath(QStringLiteral("plain")));
    frame.saveBrick();
    QVERIFY(answer.seen);
    QVERIFY(QFileInfo::exists(dir.filePath(QStringLiteral("plain.kcb"))));
    QVERIFY(!QFileInfo::exists(dir.filePath(QStringLiteral("plain"))));

    // Cancelled: nothing written anywhere.
    answer = SaveDialogAnswer();
    QSignalSpy saved(&frame, &KrBrickFrame::brickSaved);
    answerSaveDialog(&answer, QString());
    frame.saveBrick();
    QVERIFY(answer.seen);
    QCOMPARE(saved.count(), 0);
    QCOMPARE(QDir(dir.path()).entryList(QDir::Files), QStringList{"plain.kcb"});
    QVERIFY(!QFileInfo::exists(answer.proposed));
}

void TestKrBrickFrame::saveBrickFailureIsReported()
{
    KrFrameTestBrick brick;
    KrBrickFrame frame(&brick, nullptr, nullptr);
    QTemporaryDir dir;
    // A folder that is a file cannot take the brick, whoever runs the test.
    const QString blocker = dir.filePath(QStringLiteral("notafolder"));
    {
        QFile f(blocker);
        QVERIFY(f.open(QIODevice::WriteOnly));
        f.write("x");
    }
    const QString target = blocker + QStringLiteral("/brick.kcb");
    SaveDialogAnswer answer;
    QString message;
    QMessageBox::Icon icon = QMessageBox::NoIcon;
    bool reported = false;
    krOnNextModal([&](QWidget* w) {
        auto* dialog = qobject_cast<QFileDialog*>(w);
        QVERIFY(dialog);
        answer.seen = true;
        dialog->findChild<QLineEdit*>(QStringLiteral("fileNameEdit"))->setText(target);
        krOnNextModal([&](QWidget* box) {
            auto* messageBox = qobject_cast<QMessageBox*>(box);
            QVERIFY(messageBox);
            reported = true;
            message = messageBox->text();
            icon = messageBox->icon();
            messageBox->accept();
        });
        static_cast<QDialog*>(dialog)->accept();
    });
    QSignalSpy saved(&frame, &KrBrickFrame::brickSaved);
    frame.saveBrick();
    QVERIFY(answer.seen);
    QTRY_VERIFY(reported);
    QCOMPARE(icon, QMessageBox::Critical);
    QVERIFY2(message.contains(target), qPrintable(message));
    QCOMPARE(saved.count(), 0);
    QVERIFY(!QFileInfo::exists(target));
    QCOMPARE(QDir(dir.path()).entryList(QDir::Files | QDir::Hidden), QStringList{"notafolder"});
}

QTEST_MAIN(TestKrBrickFrame)
#include "tst_krbrickframe.moc"
