#include "krwidgetgroup.h"
#include "widgets_testutil.h"

#include <QLabel>
#include <QPointer>
#include <QSignalSpy>
#include <QtTest>

namespace {
QLabel* row(const QString& text)
{
    auto* label = new QLabel(text);
    label->setMinimumHeight(20);
    return label;
}

// x of the first dark pixel on the bar's middle line: where the arrow starts.
int arrowX(QWidget* bar)
{
    const QImage image = bar->grab().toImage();
    const int y = image.height() / 2;
    for (int x = 0; x < image.width(); ++x) {
        if (qGray(image.pixel(x, y)) < 100)
            return x;
    }
    return -1;
}
} // namespace

class TestKrWidgetGroup : public QObject
{
    Q_OBJECT
private slots:
    void constructionAppendsToLayout();
    void subGroupsAndWidgets();
    void collapse();
    void barTogglesByMouseAndKeyboard();
    void collapsedIsShorter();
    void removeAllChildren();
    void levelIndents();
    void titleAndLevel();
};

void TestKrWidgetGroup::constructionAppendsToLayout()
{
    QWidget container;
    auto* layout = new KrWidgetListLayout(&container);
    QLabel* first = row(QStringLiteral("first"));
    layout->addWidget(first);
    auto* outputs =
        new KrWidgetGroup(layout, QStringLiteral("Outputs"), QStringLiteral("OutputsGroup"), 0);
    auto* inputs =
        new KrWidgetGroup(layout, QStringLiteral("Inputs"), QStringLiteral("InputsGroup"), 0);
    QCOMPARE(layout->count(), 3);
    QCOMPARE(layout->itemAt(0)->widget(), first);
    QCOMPARE(layout->itemAt(1)->widget(), outputs);
    QCOMPARE(layout->itemAt(2)->widget(), inputs);
    QCOMPARE(outputs->parentWidget(), &container);
    QCOMPARE(outputs->objectName(), QStringLiteral("OutputsGroup"));
    QCOMPARE(layout->getGroups(), (QList<KrWidgetGroup*>{outputs, inputs}));
    layout->addGroup(outputs); // already listed
    QCOMPARE(layout->count(), 3);

    // Removing a group from the list and deleting it leaves the rest in order.
    layout->removeWidget(outputs);
    delete outputs;
    QCOMPARE(layout->getGroups(), (QList<KrWidgetGroup*>{inputs}));
}

void TestKrWidgetGroup::subGroupsAndWidgets()
{
    QWidget container;
    auto* layout = new KrWidgetListLayout(&container);
    auto* inputs =
        new KrWidgetGroup(layout, QStringLiteral("Inputs"), QStringLiteral("InputsGroup"), 0);
    QLabel* a = row(QStringLiteral("a"));
    inputs->addWidget(a);
    auto* param =
        new KrWidgetGroup(inputs, QStringLiteral("Color"), QStringLiteral("WidgetGroup"), 1);
    inputs->addGroup(param); // constructing already put it there: no second entry
    QLabel* b = row(QStringLiteral("b"));
    inputs->addWidget(b);
    inputs->addWidget(b);
    QCOMPARE(inputs->getChildren(), (QList<QWidget*>{a, param, b}));
    QCOMPARE(param->parentWidget(), inputs->getBody());
    QCOMPARE(a->parentWidget(), inputs->getBody());
    QCOMPARE(layout->count(), 1);

    inputs->removeWidget(a);
    QCOMPARE(inputs->getChildren(), (QList<QWidget*>{param, b}));
    QVERIFY(!a->parentWidget());
    delete a;
}

void TestKrWidgetGroup::collapse()
{
    QWidget container;
    auto* layout = new KrWidgetListLayout(&container);
    auto* group = new KrWidgetGroup(layout, QStringLiteral("G"), QStringLiteral("G"), 0);
    group->addWidget(row(QStringLiteral("x")));
    container.show();
    QSignalSpy spy(group, &KrWidgetGroup::collapsedChanged);
    QVERIFY(!group->isCollapsed());
    QVERIFY(group->getBody()->isVisible());
    group->setCollapsed(true);
    QCOMPARE(spy.count(), 1);
    QCOMPARE(spy.at(0).at(0).toBool(), true);
    QVERIFY(group->isCollapsed());
    QVERIFY(!group->getBody()->isVisible());
    QVERIFY(group->getBar()->isVisible());
    group->setCollapsed(true);
    QCOMPARE(spy.count(), 1);
    group->toggleCollapsed();
    QCOMPARE(spy.count(), 2);
    QCOMPARE(spy.at(1).at(0).toBool(), false);
    QVERIFY(group->getBody()->isVisible());

    // Collapsing before the group is shown keeps the body hidden once it is.
    QWidget later;
    auto* laterLayout = new KrWidgetListLayout(&later);
    auto* hidden = new KrWidgetGroup(laterLayout, QStringLiteral("H"), QStringLiteral("H"), 0);
    hidden->addWidget(row(QStringLiteral("y")));
    hidden->setCollapsed(true);
    later.show();
    QVERIFY(hidden->getBar()->isVisible());
    QVERIFY(!hidden->getBody()->isVisible());
}

void TestKrWidgetGroup::barTogglesByMouseAndKeyboard()
{
    QWidget container;
    auto* layout = new KrWidgetListLayout(&container);
    auto* group = new KrWidgetGroup(layout, QStringLiteral("G"), QStringLiteral("G"), 0);
    group->addWidget(row(QStringLiteral("x")));
    container.show();
    QVERIFY(QTest::qWaitForWindowExposed(&container));
    QSignalSpy spy(group, &KrWidgetGroup::collapsedChanged);
    QWidget* bar = group->getBar();
    QTest::mouseClick(bar, Qt::LeftButton, Qt::NoModifier, bar->rect().center());
    QVERIFY(group->isCollapsed());
    QTest::mouseClick(bar, Qt::RightButton, Qt::NoModifier, bar->rect().center());
    QVERIFY(group->isCollapsed());
    // A press that ends outside the bar is no click.
    QTest::mousePress(bar, Qt::LeftButton, Qt::NoModifier, bar->rect().center());
    QTest::mouseRelease(bar, Qt::LeftButton, Qt::NoModifier, QPoint(-5, -5));
    QVERIFY(group->isCollapsed());
    QCOMPARE(spy.count(), 1);

    bar->setFocus();
    QTest::keyClick(bar, Qt::Key_Space);
    QVERIFY(!group->isCollapsed());
    QTest::keyClick(bar, Qt::Key_Left);
    QVERIFY(group->isCollapsed());
    QTest::keyClick(bar, Qt::Key_Right);
    QVERIFY(!group->isCollapsed());
    QCOMPARE(spy.count(), 4);
}

void TestKrWidgetGroup::collapsedIsShorter()
{
    QWidget container;
    auto* layout = new KrWidgetListLayout(&container);
    layout->setContentsMargins(0, 0, 0, 0);
    layout->setSpacing(0);
    auto* group = new KrWidgetGroup(layout, QStringLiteral("Inputs"), QStringLiteral("G"), 0);
    for (int i = 0; i < 4; ++i)
        group->addWidget(row(QStringLiteral("row %1").arg(i)));
    container.show();
    container.adjustSize();
    const QImage open = container.grab().toImage();
    group->setCollapsed(true);
    container.adjustSize();
    const QImage closed = container.grab().toImage();
    QVERIFY2(closed.height() < open.height() - 60,
             qPrintable(QStringLiteral("%1 vs %2").arg(closed.height()).arg(open.height())));
    QCOMPARE(group->height(), group->getBar()->height());
    // The arrow turns: the bar's pixels differ between the two states.
    group->setCollapsed(false);
    container.adjustSize();
    const QImage barOpen = group->getBar()->grab().toImage();
    group->setCollapsed(true);
    QVERIFY(group->getBar()->grab().toImage() != barOpen);
}

void TestKrWidgetGroup::removeAllChildren()
{
    QWidget container;
    auto* layout = new KrWidgetListLayout(&container);
    auto* group = new KrWidgetGroup(layout, QStringLiteral("G"), QStringLiteral("G"), 0);
    QPointer<QLabel> a = row(QStringLiteral("a"));
    group->addWidget(a);
    QPointer<KrWidgetGroup> sub =
        new KrWidgetGroup(group, QStringLiteral("S"), QStringLiteral("WidgetGroup"), 1);
    QPointer<QLabel> inner = row(QStringLiteral("inner"));
    sub->addWidget(inner);
    container.show();
    container.adjustSize();
    const int before = group->sizeHint().height();
    group->removeAllChildren();
    QVERIFY(a.isNull());
    QVERIFY(sub.isNull());
    QVERIFY(inner.isNull());
    QVERIFY(group->getChildren().isEmpty());
    QVERIFY(group->sizeHint().height() < before);
    QVERIFY(group->getBar()); // the group itself stays usable
    group->addWidget(row(QStringLiteral("again")));
    QCOMPARE(group->getChildren().size(), 1);
}

void TestKrWidgetGroup::levelIndents()
{
    QWidget container;
    auto* layout = new KrWidgetListLayout(&container);
    auto* top = new KrWidgetGroup(layout, QStringLiteral("Top"), QStringLiteral("G"), 0);
    auto* deep = new KrWidgetGroup(top, QStringLiteral("Deep"), QStringLiteral("G"), 2);
    container.resize(200, 100);
    container.show();
    QVERIFY(QTest::qWaitForWindowExposed(&container));
    const int x0 = arrowX(top->getBar());
    const int x2 = arrowX(deep->getBar());
    QVERIFY(x0 >= 0);
    QCOMPARE(x2 - x0, 2 * KrWidgetGroup::IndentPerLevel);
}

void TestKrWidgetGroup::titleAndLevel()
{
    KrWidgetGroup orphan(static_cast<KrWidgetListLayout*>(nullptr), QStringLiteral("A"),
                         QStringLiteral("N"), -3);
    QCOMPARE(orphan.getLevel(), 0);
    QCOMPARE(orphan.getTitle(), QStringLiteral("A"));
    orphan.resize(150, orphan.sizeHint().height());
    const QImage before = orphan.getBar()->grab().toImage();
    orphan.setTitle(QStringLiteral("Something else"));
    QCOMPARE(orphan.getTitle(), QStringLiteral("Something else"));
    QVERIFY(orphan.getBar()->grab().toImage() != before);
    orphan.setLevel(3);
    QCOMPARE(orphan.getLevel(), 3);
}

QTEST_MAIN(TestKrWidgetGroup)
#include "tst_krwidgetgroup.moc"
