#include "app_testsupport.h"
#include "frame_testsupport.h"
#include "krapp.h"
#include "kroutputlabel.h"
#include "krproperty.h"
#include "krstandardbrickwidget.h"
#include "krundo.h"
#include "krwidgetgroup.h"

#include <QInputDialog>
#include <QMenu>
#include <QPointer>
#include <QSignalSpy>
#include <QVBoxLayout>
#include <QtTest>
#include <memory>

namespace {
// A property whose widget class nobody offers.
class OrphanProperty : public KrIntProperty
{
public:
    OrphanProperty() : KrIntProperty(QStringLiteral("Orphan")) {}
    QString getWidgetClassName() const override { return QStringLiteral("KrNoSuchWgt"); }
};

// Counts the rebuilds a widget runs: each is one delivered rebuild event.
class RebuildCounter : public QObject
{
public:
    int rebuilds = 0;
    int refreshes = 0;
    bool eventFilter(QObject*, QEvent* event) override
    {
        if (event->type() == QEvent::Type(KrStandardBrickWidget::RebuildEvent))
            ++rebuilds;
        if (event->type() == QEvent::Type(KrStandardBrickWidget::LayoutRefreshEvent))
            ++refreshes;
        return false;
    }
};

QList<KrWidgetGroup*> topGroups(KrStandardBrickWidget* widget)
{
    auto* list = qobject_cast<KrWidgetListLayout*>(widget->layout());
    return list ? list->getGroups() : QList<KrWidgetGroup*>();
}

KrWidgetGroup* group(KrStandardBrickWidget* widget, const QString& name)
{
    for (KrWidgetGroup* g : topGroups(widget)) {
        if (g->objectName() == name)
            return g;
    }
    return nullptr;
}

QString rowText(QWidget* row)
{
    if (auto* sub = qobject_cast<KrWidgetGroup*>(row))
        return sub->getTitle();
    if (auto* label = qobject_cast<KrPropertyWgt*>(row))
        return label->getFirstProperty() ? label->getFirstProperty()->getName() : QString();
    if (auto* sub = qobject_cast<KrWidgetGroup*>(row ? row->parentWidget() : nullptr))
        return sub->getTitle();
    return QString();
}

float centreOf(QWidget* row, QWidget* in)
{
    return float(row->mapTo(in, QPoint(0, 0)).y() + row->height() / 2.0);
}
} // namespace

class TestKrStandardBrickWidget : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void cleanupTestCase();
    void init();

    void groupsInOrder_data();
    void groupsInOrder();
    void rowsInDirectionOrder();
    void parameterWithPropertiesIsCollapsedSubGroup();
    void advancedParameters();
    void advancedParameterFollowsItsWires();
    void missingWidgets();
    void rebuildCoalescing();
    void paramYPositionInsideRow();
    void paramYPositionOfCollapsedGroups();
    void connectorSize();
    void layoutRefreshResizesFrame();
    void setBrickSwitchesSignals();
    void changeLabelFromContextMenu();
    void contextMenuOnlyOverParameters();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

void TestKrStandardBrickWidget::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
}

void TestKrStandardBrickWidget::cleanupTestCase()
{
    m_scope.reset();
}

void TestKrStandardBrickWidget::init()
{
    krApp->getUndoStack()->clear();
}

void TestKrStandardBrickWidget::groupsInOrder_data()
{
    // Parameters by direction, "L" a local property.
    QTest::addColumn<QString>("content");
    QTest::addColumn<bool>("separate");
    QTest::addColumn<QStringList>("groups");
    QTest::newRow("outputs only, separated") << "2" << true << QStringList{"OutputsGroup"};
    QTest::newRow("outputs only, not separated")
        << "2" << false << QStringList{"OutputsGroup", "InputsGroup"};
    QTest::newRow("everything, separated")
        << "1 L 2" << true << QStringList{"OutputsGroup", "InputsGroup", "SettingsGroup"};
    QTest::newRow("everything, not separated")
        << "1 L 2" << false << QStringList{"OutputsGroup", "InputsGroup"};
    QTest::newRow("inputs before outputs in the brick")
        << "0 3 L" << true << QStringList{"OutputsGroup", "InputsGroup", "SettingsGroup"};
    QTest::newRow("local only, separated") << "L" << true << QStringList{"SettingsGroup"};
    QTest::newRow("nothing, separated") << "" << true << QStringList();
    QTest::newRow("nothing, not separated") << "" << false << QStringList{"InputsGroup"};
}

void TestKrStandardBrickWidget::groupsInOrder()
{
    QFETCH(QString, content);
    QFETCH(bool, separate);
    QFETCH(QStringList, groups);
    KrFrameTestBrick brick;
    brick.setSeparateLocal(separate);
    int n = 0;
    for (const QString& item : content.split(QLatin1Char(' '), Qt::SkipEmptyParts)) {
        ++n;
        if (item == QLatin1String("L"))
            brick.addLocal(QStringLiteral("Local%1").arg(n));
        else
            brick.addPlain(QStringLiteral("p%1").arg(n), QStringLiteral("P%1").arg(n),
                           item.toInt());
    }
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    QStringList names, titles;
    for (KrWidgetGroup* g : topGroups(&widget)) {
        names << g->objectName();
        titles << g->getTitle();
        QCOMPARE(g->getLevel(), 0);
    }
    QCOMPARE(names, groups);
    QStringList expectedTitles;
    for (const QString& name : groups)
        expectedTitles << name.chopped(5);
    QCOMPARE(titles, expectedTitles);
    QCOMPARE(widget.layout()->contentsMargins(), QMargins());
    QCOMPARE(widget.layout()->spacing(), 0);
}

void TestKrStandardBrickWidget::rowsInDirectionOrder()
{
    KrFrameTestBrick brick;
    brick.setSeparateLocal(false);
    KrBrickParam* internal = brick.addPlain(QStringLiteral("i"), QStringLiteral("Internal"), 3);
    KrBrickParam* constant = brick.addPlain(QStringLiteral("c"), QStringLiteral("Constant"), 0);
    KrBrickParam* out = brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrBrickParam* in = brick.addPlain(QStringLiteral("n"), QStringLiteral("In"), 1);
    brick.addLocal(QStringLiteral("Local"));
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);

    QStringList outputs, inputs;
    for (QWidget* row : group(&widget, QStringLiteral("OutputsGroup"))->getChildren())
        outputs << rowText(row);
    for (QWidget* row : group(&widget, QStringLiteral("InputsGroup"))->getChildren())
        inputs << rowText(row);
    QCOMPARE(outputs, (QStringList{"Out", "Internal"}));
    QCOMPARE(inputs, (QStringList{"Local", "In", "Constant"}));

    // Rows without properties are label widgets over label properties.
    for (KrBrickParam* p : {internal, constant, out, in}) {
        auto* row = qobject_cast<KrLabelPropertyWgt*>(widget.getParamWidget(p));
        QVERIFY(row);
        QVERIFY(!row->showsValue());
        QCOMPARE(row->getFirstProperty()->getWidgetClassName(),
                 QStringLiteral("KrLabelPropertyWgt"));
    }
}

void TestKrStandardBrickWidget::parameterWithPropertiesIsCollapsedSubGroup()
{
    KrFrameTestBrick brick;
    KrPropertyParam* param = brick.addWithProperty(QStringLiteral("k"), QStringLiteral("Strength"));
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    KrWidgetGroup* inputs = group(&widget, QStringLiteral("InputsGroup"));
    QVERIFY(inputs);
    QCOMPARE(inputs->getChildren().size(), 1);
    auto* sub = qobject_cast<KrWidgetGroup*>(inputs->getChildren().first());
    QVERIFY(sub);
    QCOMPARE(sub->objectName(), QStringLiteral("WidgetGroup"));
    QCOMPARE(sub->getTitle(), QStringLiteral("Strength"));
    QCOMPARE(sub->getLevel(), 1);
    QVERIFY(sub->isCollapsed());
    QCOMPARE(widget.getParamWidget(param), sub->getBar());
    QCOMPARE(sub->getChildren().size(), 1);
    auto* editor = qobject_cast<KrPropertyWgt*>(sub->getChildren().first());
    QVERIFY(editor);
    QCOMPARE(editor->getFirstProperty(), param->getParamProperty(0));
}

void TestKrStandardBrickWidget::advancedParameters()
{
    KrFrameTestBrick brick;
    KrBrickParam* wired = brick.addPlain(QStringLiteral("w"), QStringLiteral("Wired"), 1, true);
    KrBrickParam* loose = brick.addPlain(QStringLiteral("l"), QStringLiteral("Loose"), 1, true);
    KrFrameTestBrick source(QStringLiteral("Source"), 4);
    KrBrickParam* out = source.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    QVERIFY(wired->addConnection(out));

    KrStandardBrickWidget widget;
    QVERIFY(widget.hidesAdvanced());
    widget.setBrick(&brick);
    QVERIFY(widget.getParamWidget(wired)); // its wire must end somewhere
    QVERIFY(!widget.getParamWidget(loose));
    QCOMPARE(widget.getParamYPosition(loose), -1.0f);

    widget.setHideAdvanced(false);
    QVERIFY(!widget.getParamWidget(loose)); // queued
    QCoreApplication::processEvents();
    QVERIFY(widget.getParamWidget(loose));
}

void TestKrStandardBrickWidget::advancedParameterFollowsItsWires()
{
    KrFrameTestBrick brick;
    KrBrickParam* advanced = brick.addPlain(QStringLiteral("a"), QStringLiteral("Adv"), 1, true);
    KrFrameTestBrick source(QStringLiteral("Source"), 4);
    KrBrickParam* out = source.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);

    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    QVERIFY(!widget.getParamWidget(advanced));

    // A wire made without the plug in view (a paste, an undone disconnect) lists it.
    QVERIFY(advanced->addConnection(out));
    QCoreApplication::processEvents();
    QVERIFY(widget.getParamWidget(advanced));
    QVERIFY(widget.getParamYPosition(advanced) >= 0);

    advanced->removeAllConnections();
    QCoreApplication::processEvents();
    QVERIFY(!widget.getParamWidget(advanced));

    // With advanced parameters shown a wire changes nothing.
    widget.setHideAdvanced(false);
    QCoreApplication::processEvents();
    RebuildCounter counter;
    widget.installEventFilter(&counter);
    QVERIFY(advanced->addConnection(out));
    QCoreApplication::processEvents();
    QCOMPARE(counter.rebuilds, 0);
    QVERIFY(widget.getParamWidget(advanced));
}

void TestKrStandardBrickWidget::missingWidgets()
{
    KrFrameTestBrick brick;
    brick.setSeparateLocal(true);
    auto* orphan = new OrphanProperty;
    brick.addLocalProperty(orphan);
    brick.addLocal(QStringLiteral("Known"));
    KrBrickParam* out = brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    {
        KrStandardBrickWidget widget;
        widget.setBrick(&brick);
        QCOMPARE(group(&widget, QStringLiteral("SettingsGroup"))->getChildren().size(), 1);
        QVERIFY(widget.getParamWidget(out));
    }
    // A label widget class that makes something else: the output has no row.
    KrFrameTestFactory<KrLabelPropertyWgt, KrFrameTestPlainAction> liar(
        "5D0A7C21-0B4E-4C8E-9F10-3E2A1B7C9D11");
    krApp->registerClassFactory(&liar);
    {
        KrStandardBrickWidget widget;
        widget.setBrick(&brick);
        QCOMPARE(liar.created, 1);
        QVERIFY(!widget.getParamWidget(out));
        QCOMPARE(widget.getParamYPosition(out), -1.0f);
        QVERIFY(group(&widget, QStringLiteral("OutputsGroup"))->getChildren().isEmpty());
    }
    krApp->unregisterClassFactory(&liar);
    // Once the factory is gone the built-in label widget is used again.
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    QVERIFY(widget.getParamWidget(out));
    QCOMPARE(liar.created, 1);
}

void TestKrStandardBrickWidget::rebuildCoalescing()
{
    KrFrameTestBrick brick;
    KrBrickParam* out = brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrPropertyParam* in = brick.addWithProperty(QStringLiteral("k"), QStringLiteral("K"));
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    RebuildCounter counter;
    widget.installEventFilter(&counter);

    for (int i = 0; i < 10; ++i)
        out->setLabel(QStringLiteral("Out %1").arg(i));
    in->setLabel(QStringLiteral("Renamed"));
    brick.addPlain(QStringLiteral("x"), QStringLiteral("Extra"), 2);
    widget.setHideAdvanced(false);
    QCOMPARE(counter.rebuilds, 0);
    QCoreApplication::processEvents();
    QCOMPARE(counter.rebuilds, 1);
    QCOMPARE(rowText(widget.getParamWidget(out)), QStringLiteral("Out 9"));
    QCOMPARE(rowText(widget.getParamWidget(in)), QStringLiteral("Renamed"));
    QCOMPARE(group(&widget, QStringLiteral("OutputsGroup"))->getChildren().size(), 2);

    // Rebuilding does not stack connections: one change is still one rebuild, and the next
    // burst queues a new one.
    out->setLabel(QStringLiteral("Again"));
    QCoreApplication::processEvents();
    QCOMPARE(counter.rebuilds, 2);
    brick.removeParameter(brick.findParameterByArg(QStringLiteral("x")));
    QCoreApplication::processEvents();
    QCOMPARE(counter.rebuilds, 3);
    QCOMPARE(group(&widget, QStringLiteral("OutputsGroup"))->getChildren().size(), 1);
}

void TestKrStandardBrickWidget::paramYPositionInsideRow()
{
    KrFrameTestBrick brick;
    KrBrickParam* out = brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrPropertyParam* in = brick.addWithProperty(QStringLiteral("k"), QStringLiteral("K"));
    KrBrickParam* plainIn = brick.addPlain(QStringLiteral("n"), QStringLiteral("N"), 1);
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    widget.resize(240, 300);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QCoreApplication::processEvents();

    float last = -1;
    for (KrBrickParam* param : {out, static_cast<KrBrickParam*>(in), plainIn}) {
        QWidget* row = widget.getParamWidget(param);
        QVERIFY(row);
        const float y = widget.getParamYPosition(param);
        QCOMPARE(y, centreOf(row, &widget));
        const QRect rowRect(row->mapTo(&widget, QPoint(0, 0)), row->size());
        QVERIFY(y > rowRect.top() && y < rowRect.bottom() + 1);
        QVERIFY(y > last); // rows go down the widget in the order shown
        last = y;
    }
    QCOMPARE(widget.getParamYPosition(nullptr), -1.0f);
}

void TestKrStandardBrickWidget::paramYPositionOfCollapsedGroups()
{
    KrFrameTestBrick brick;
    KrBrickParam* out = brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrBrickParam* internal = brick.addPlain(QStringLiteral("i"), QStringLiteral("Internal"), 3);
    KrBrickParam* in = brick.addPlain(QStringLiteral("n"), QStringLiteral("In"), 1);
    KrBrickParam* constant = brick.addPlain(QStringLiteral("c"), QStringLiteral("Constant"), 0);
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    widget.resize(240, 300);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    KrWidgetGroup* outputs = group(&widget, QStringLiteral("OutputsGroup"));
    KrWidgetGroup* inputs = group(&widget, QStringLiteral("InputsGroup"));

    inputs->setCollapsed(true);
    QCoreApplication::processEvents();
    const float inputsBar = centreOf(inputs->getBar(), &widget);
    QCOMPARE(widget.getParamYPosition(in), inputsBar);
    QCOMPARE(widget.getParamYPosition(constant), inputsBar);
    QCOMPARE(widget.getParamYPosition(out), centreOf(widget.getParamWidget(out), &widget));

    inputs->setCollapsed(false);
    outputs->setCollapsed(true);
    QCoreApplication::processEvents();
    QCOMPARE(widget.getParamYPosition(out), centreOf(outputs->getBar(), &widget));
    // Internal outputs keep their own row, as they have no plug.
    QCOMPARE(widget.getParamYPosition(internal),
             centreOf(widget.getParamWidget(internal), &widget));
    QCOMPARE(widget.getParamYPosition(in), centreOf(widget.getParamWidget(in), &widget));
}

void TestKrStandardBrickWidget::connectorSize()
{
    KrFrameTestBrick brick;
    KrBrickParam* out = brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    QCOMPARE(widget.getConnectorSize(out), 20);
    QCOMPARE(widget.getConnectorSize(nullptr), 20);
    QCOMPARE(widget.getBrick(), &brick);
}

void TestKrStandardBrickWidget::layoutRefreshResizesFrame()
{
    KrFrameTestBrick brick;
    brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    brick.addPlain(QStringLiteral("o2"), QStringLiteral("Out 2"), 2);
    brick.addPlain(QStringLiteral("n"), QStringLiteral("In"), 1);
    QWidget holder;
    auto* layout = new QVBoxLayout(&holder);
    auto* widget = new KrStandardBrickWidget;
    layout->addWidget(widget);
    widget->setBrickFrame(&holder);
    widget->setBrick(&brick);
    holder.resize(250, 600);
    QSignalSpy moved(widget, &KrBrickOptionsFrame::updateConnections);
    holder.show();
    QVERIFY(QTest::qWaitForWindowExposed(&holder));
    QCoreApplication::processEvents();
    QVERIFY(moved.count() >= 1);
    QCOMPARE(holder.width(), 250);
    QCOMPARE(holder.height(), holder.minimumHeight());
    const int open = holder.height();

    moved.clear();
    group(widget, QStringLiteral("OutputsGroup"))->setCollapsed(true);
    QCoreApplication::processEvents();
    QVERIFY(moved.count() >= 1);
    QVERIFY(holder.height() < open);
    QCOMPARE(holder.height(), holder.layout()->totalMinimumSize().height());
    QCOMPARE(holder.width(), 250);
}

void TestKrStandardBrickWidget::setBrickSwitchesSignals()
{
    KrFrameTestBrick first;
    KrBrickParam* firstOut = first.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrFrameTestBrick second(QStringLiteral("Second"), 5);
    KrBrickParam* secondIn = second.addPlain(QStringLiteral("n"), QStringLiteral("In"), 1);
    KrStandardBrickWidget widget;
    widget.setBrick(&first);
    widget.setBrick(&second);
    QVERIFY(widget.getParamWidget(secondIn));
    QVERIFY(!widget.getParamWidget(firstOut));
    RebuildCounter counter;
    widget.installEventFilter(&counter);
    QSignalSpy moved(&widget, &KrBrickOptionsFrame::updateConnections);

    firstOut->setLabel(QStringLiteral("Elsewhere"));
    first.addPlain(QStringLiteral("x"), QStringLiteral("X"), 2);
    QCoreApplication::processEvents();
    QCOMPARE(counter.rebuilds, 0);

    // A wire on the shown brick moves the plugs.
    KrBrickParam* firstX = first.findParameterByArg(QStringLiteral("x"));
    QVERIFY(secondIn->addConnection(firstX));
    QVERIFY(moved.count() >= 1);

    widget.setBrick(nullptr);
    QVERIFY(topGroups(&widget).isEmpty());
    QVERIFY(!widget.getBrick());
}

void TestKrStandardBrickWidget::changeLabelFromContextMenu()
{
    KrFrameTestBrick brick;
    KrBrickParam* out = brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    widget.resize(240, 200);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QCoreApplication::processEvents();

    QStringList entries;
    frameWhenPopup([&](QWidget* popup) {
        auto* menu = qobject_cast<QMenu*>(popup);
        QVERIFY(menu);
        for (QAction* a : menu->actions())
            entries << a->text();
        menu->setActiveAction(menu->actions().value(0));
        QTest::keyClick(menu, Qt::Key_Return);
    });
    QString title, label, proposed;
    krOnNextModal([&](QWidget* w) {
        auto* dialog = qobject_cast<QInputDialog*>(w);
        QVERIFY(dialog);
        title = dialog->windowTitle();
        label = dialog->labelText();
        proposed = dialog->textValue();
        dialog->setTextValue(QStringLiteral("Result"));
        dialog->accept();
    });
    QWidget* row = widget.getParamWidget(out);
    const QPoint at = row->mapTo(&widget, QPoint(row->width() / 2, row->height() / 2));
    QContextMenuEvent event(QContextMenuEvent::Mouse, at, widget.mapToGlobal(at));
    QApplication::sendEvent(&widget, &event);
    QCOMPARE(entries, QStringList{"Change Label..."});
    QCOMPARE(title, QStringLiteral("Set Label"));
    QCOMPARE(label, QStringLiteral("Label"));
    QCOMPARE(proposed, QStringLiteral("Out"));
    QCOMPARE(out->getLabel(), QStringLiteral("Result"));
    QCoreApplication::processEvents();
    QCOMPARE(rowText(widget.getParamWidget(out)), QStringLiteral("Result"));

    KrUndoStack* stack = krApp->getUndoStack();
    QCOMPARE(stack->undoText(), QStringLiteral("Change Label"));
    stack->undo();
    QCOMPARE(out->getLabel(), QStringLiteral("Out"));
    stack->redo();
    QCOMPARE(out->getLabel(), QStringLiteral("Result"));

    // Cancelled: nothing changes and nothing is recorded.
    QTRY_VERIFY(widget.getParamWidget(out)->isVisible());
    bool popped = false;
    bool asked = false;
    frameWhenPopup([&](QWidget* popup) {
        popped = true;
        auto* menu = qobject_cast<QMenu*>(popup);
        menu->setActiveAction(menu->actions().value(0));
        QTest::keyClick(menu, Qt::Key_Return);
    });
    krOnNextModal([&](QWidget* w) { qobject_cast<QDialog*>(w)->reject(); }, &asked);
    row = widget.getParamWidget(out);
    const QPoint again = row->mapTo(&widget, QPoint(5, row->height() / 2));
    QContextMenuEvent second(QContextMenuEvent::Mouse, again, widget.mapToGlobal(again));
    QApplication::sendEvent(&widget, &second);
    QVERIFY(popped);
    QVERIFY(asked);
    QCOMPARE(out->getLabel(), QStringLiteral("Result"));
    QCOMPARE(stack->count(), 1);
}

void TestKrStandardBrickWidget::contextMenuOnlyOverParameters()
{
    KrFrameTestBrick brick;
    brick.addPlain(QStringLiteral("o"), QStringLiteral("Out"), 2);
    KrStandardBrickWidget widget;
    widget.setBrick(&brick);
    widget.resize(240, 300);
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));
    QCoreApplication::processEvents();
    bool popped = false;
    frameWhenPopup(
        [&](QWidget* popup) {
            popped = true;
            popup->close();
        },
        300);
    // The "Outputs" bar and the empty space below the list are no parameter rows.
    KrWidgetGroup* outputs = group(&widget, QStringLiteral("OutputsGroup"));
    for (const QPoint& at : {outputs->getBar()->mapTo(&widget, QPoint(20, 5)), QPoint(100, 290)}) {
        QContextMenuEvent event(QContextMenuEvent::Mouse, at, widget.mapToGlobal(at));
        QApplication::sendEvent(&widget, &event);
        QVERIFY(!event.isAccepted());
    }
    QTest::qWait(400);
    QVERIFY(!popped);

    // While the row of the output, just below that bar, has one.
    frameWhenPopup([&](QWidget* popup) {
        popped = true;
        popup->close();
    });
    QWidget* row = widget.getParamWidget(brick.getParameter(0));
    const QPoint onRow = row->mapTo(&widget, QPoint(20, row->height() / 2));
    QContextMenuEvent event(QContextMenuEvent::Mouse, onRow, widget.mapToGlobal(onRow));
    QApplication::sendEvent(&widget, &event);
    QVERIFY(popped);
}

QTEST_MAIN(TestKrStandardBrickWidget)
#include "tst_krstandardbrickwidget.moc"
