// The dynamic divider: split geometry, ratio limits, resize modes, collapse and bar drags.
#include "divider_style.h"
#include "krdynamicdivider.h"

#include <QHBoxLayout>
#include <QPointer>
#include <QtTest>

namespace {

// A shown top-level holding one divider at (0, 0), so resizes arrive at once with old sizes.
struct Fixture
{
    QWidget host;
    QPointer<QWidget> first;
    QPointer<QWidget> second;
    KrDynamicDivider* divider = nullptr;

    Fixture(Qt::Orientation orientation, int margin, const QSize& size, bool withFirst = true,
            bool withSecond = true)
    {
        DividerTestStyle::margin = margin;
        if (withFirst)
            first = new QWidget;
        if (withSecond)
            second = new QWidget;
        divider = new KrDynamicDivider(first, second, &host, orientation,
                                       QStringLiteral("TestDivider"), KrDividerBar::RaisedBar);
        host.resize(size + QSize(50, 50));
        host.show();
        divider->resize(size);
    }

    KrDividerBar* bar() const { return divider->getBar(); }
};

} // namespace

class TestKrDynamicDivider : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void construction();
    void initialGeometry_data();
    void initialGeometry();
    void minimumSizeHint_data();
    void minimumSizeHint();
    void dragBySignal_data();
    void dragBySignal();
    void dragWithMouse_data();
    void dragWithMouse();
    void resizeModes_data();
    void resizeModes();
    void resizeBelowMinimum();
    void toggle_data();
    void toggle();
    void toggleByClick();
    void toggleIgnored();
    void deletedChild();
};

void TestKrDynamicDivider::initTestCase()
{
    QApplication::setStyle(new DividerTestStyle);
}

void TestKrDynamicDivider::construction()
{
    Fixture f(Qt::Horizontal, 4, QSize(300, 300));
    QCOMPARE(f.divider->objectName(), QStringLiteral("TestDivider"));
    QCOMPARE(f.bar()->objectName(), QStringLiteral("TestDivider"));
    QCOMPARE(f.bar()->orientation(), Qt::Horizontal);
    QCOMPARE(f.bar()->barStyle(), KrDividerBar::RaisedBar);
    QCOMPARE(f.divider->getMargin(), 4);
    QCOMPARE(f.divider->getSpacing(), 4);
    QCOMPARE(f.divider->getResizeMode(), 2);
    QVERIFY(f.divider->getCollapseSecond());
    QVERIFY(!f.divider->isToggled());
    QVERIFY(!f.bar()->toggleEnabled());
    // Children are owned by the divider, stacked first, bar, second.
    const QObjectList children = f.divider->children();
    QCOMPARE(children.indexOf(f.first) + 1, children.indexOf(f.bar()));
    QCOMPARE(children.indexOf(f.bar()) + 1, children.indexOf(f.second));
    QCOMPARE(f.divider->sizePolicy().horizontalPolicy(), QSizePolicy::Expanding);
    QCOMPARE(f.divider->sizePolicy().verticalPolicy(), QSizePolicy::Expanding);
    QCOMPARE(f.divider->minimumSize(), f.divider->minimumSizeHint());

    // Children die with the divider.
    delete f.divider;
    QVERIFY(f.first.isNull());
    QVERIFY(f.second.isNull());
}

void TestKrDynamicDivider::initialGeometry_data()
{
    QTest::addColumn<Qt::Orientation>("orientation");
    QTest::addColumn<int>("margin");
    QTest::addColumn<QSize>("size");
    QTest::addColumn<QRect>("first");
    QTest::addColumn<QRect>("bar");
    QTest::addColumn<QRect>("second");

    QTest::newRow("side by side, margin 4")
        << Qt::Vertical << 4 << QSize(1000, 500) << QRect(4, 4, 492, 484) << QRect(500, 0, 6, 500)
        << QRect(510, 4, 482, 484);
    QTest::newRow("stacked, margin 4")
        << Qt::Horizontal << 4 << QSize(500, 1000) << QRect(4, 4, 492, 492) << QRect(0, 500, 500, 6)
        << QRect(4, 510, 492, 490);
    // 801 * 0.5 truncates to 400.
    QTest::newRow("side by side, odd width")
        << Qt::Vertical << 2 << QSize(801, 300) << QRect(2, 2, 396, 292) << QRect(400, 0, 6, 300)
        << QRect(408, 2, 389, 292);
    QTest::newRow("stacked, no margin")
        << Qt::Horizontal << 0 << QSize(300, 201) << QRect(0, 0, 300, 100) << QRect(0, 100, 300, 6)
        << QRect(0, 106, 300, 95);
}

void TestKrDynamicDivider::initialGeometry()
{
    QFETCH(Qt::Orientation, orientation);
    QFETCH(int, margin);
    QFETCH(QSize, size);
    QFETCH(QRect, first);
    QFETCH(QRect, bar);
    QFETCH(QRect, second);

    Fixture f(orientation, margin, size);
    QCOMPARE(f.divider->size(), size);
    QCOMPARE(f.divider->getRatio(), 0.5);
    QCOMPARE(f.first->geometry(), first);
    QCOMPARE(f.bar()->geometry(), bar);
    QCOMPARE(f.second->geometry(), second);
    QVERIFY(f.first->isVisible());
    QVERIFY(f.second->isVisible());
}

void TestKrDynamicDivider::minimumSizeHint_data()
{
    QTest::addColumn<Qt::Orientation>("orientation");
    QTest::addColumn<bool>("withFirst");
    QTest::addColumn<bool>("withSecond");
    QTest::addColumn<QSize>("expected");

    // First: minimum size 50 x 30. Second: a layout around a fixed 70 x 40 widget.
    // Margin and spacing 4, bar 6.
    QTest::newRow("side by side") << Qt::Vertical << true << true << QSize(142, 48);
    QTest::newRow("stacked") << Qt::Horizontal << true << true << QSize(78, 92);
    QTest::newRow("side by side, no first") << Qt::Vertical << false << true << QSize(88, 48);
    QTest::newRow("stacked, no second") << Qt::Horizontal << true << false << QSize(58, 48);
    QTest::newRow("no children") << Qt::Vertical << false << false << QSize(14, 8);
}

void TestKrDynamicDivider::minimumSizeHint()
{
    QFETCH(Qt::Orientation, orientation);
    QFETCH(bool, withFirst);
    QFETCH(bool, withSecond);
    QFETCH(QSize, expected);

    DividerTestStyle::margin = 4;
    QWidget* first = nullptr;
    if (withFirst) {
        first = new QWidget;
        first->setMinimumSize(50, 30);
    }
    QWidget* second = nullptr;
    if (withSecond) {
        second = new QWidget;
        auto* layout = new QHBoxLayout(second);
        layout->setContentsMargins(0, 0, 0, 0);
        auto* fixed = new QWidget;
        fixed->setFixedSize(70, 40);
        layout->addWidget(fixed);
    }
    KrDynamicDivider divider(first, second, nullptr, orientation, QStringLiteral("d"),
                             KrDividerBar::FlatBar);
    QCOMPARE(divider.minimumSizeHint(), expected);
    QCOMPARE(divider.minimumSize(), expected);
}

void TestKrDynamicDivider::dragBySignal_data()
{
    QTest::addColumn<Qt::Orientation>("orientation");
    QTest::addColumn<QList<int>>("moves");
    QTest::addColumn<double>("ratio");
    QTest::addColumn<int>("barPos");
    QTest::addColumn<int>("firstExtent");

    // Extent 1000, margin 4, bar 6; first at least 50, second at least 80 along the axis.
    for (Qt::Orientation o : {Qt::Vertical, Qt::Horizontal}) {
        const char* name = o == Qt::Vertical ? "side by side" : "stacked";
        QTest::addRow("%s, +100", name) << o << QList<int>{100} << 0.6 << 600 << 592;
        QTest::addRow("%s, -100", name) << o << QList<int>{-100} << 0.4 << 400 << 392;
        QTest::addRow("%s, two steps", name) << o << QList<int>{30, 30} << 0.56 << 560 << 552;
        // Pulled back to the limits: the second keeps 80 plus spacing and margin to the end,
        // the first keeps its 50.
        QTest::addRow("%s, far right", name) << o << QList<int>{10000} << 0.906 << 906 << 898;
        QTest::addRow("%s, far left", name) << o << QList<int>{-10000} << 0.058 << 58 << 50;
        QTest::addRow("%s, back from the limit", name)
            << o << QList<int>{-10000, 100} << 0.158 << 158 << 150;
    }
}

// The bar reports drags as pixel distances; the ratio moves by distance / extent.
void TestKrDynamicDivider::dragBySignal()
{
    QFETCH(Qt::Orientation, orientation);
    QFETCH(QList<int>, moves);
    QFETCH(double, ratio);
    QFETCH(int, barPos);
    QFETCH(int, firstExtent);

    const bool vertical = orientation == Qt::Vertical;
    Fixture f(orientation, 4, vertical ? QSize(1000, 500) : QSize(500, 1000));
    f.first->setMinimumSize(50, 50);
    f.second->setMinimumSize(80, 80);
    for (int distance : moves)
        emit f.bar()->moved(distance);

    QCOMPARE(f.divider->getRatio(), ratio);
    QCOMPARE(vertical ? f.bar()->x() : f.bar()->y(), barPos);
    QCOMPARE(vertical ? f.first->width() : f.first->height(), firstExtent);
    const int secondStart = vertical ? f.second->x() : f.second->y();
    QCOMPARE(secondStart, barPos + 6 + 4);
}

void TestKrDynamicDivider::dragWithMouse_data()
{
    QTest::addColumn<Qt::Orientation>("orientation");
    QTest::addColumn<int>("distance");
    QTest::addColumn<int>("barPos");

    QTest::newRow("side by side, right") << Qt::Vertical << 100 << 600;
    QTest::newRow("side by side, left") << Qt::Vertical << -250 << 250;
    QTest::newRow("stacked, down") << Qt::Horizontal << 120 << 620;
    QTest::newRow("stacked, up") << Qt::Horizontal << -50 << 450;
}

// A real press, move and release on the bar (outside its toggle area) moves the split.
void TestKrDynamicDivider::dragWithMouse()
{
    QFETCH(Qt::Orientation, orientation);
    QFETCH(int, distance);
    QFETCH(int, barPos);

    const bool vertical = orientation == Qt::Vertical;
    Fixture f(orientation, 4, vertical ? QSize(1000, 500) : QSize(500, 1000));
    f.divider->setToggleEnabled(true, true);
    KrDividerBar* bar = f.bar();
    // Near one end of the bar, away from the toggle in its middle.
    const QPoint start = vertical ? QPoint(3, 20) : QPoint(20, 3);
    QVERIFY(!bar->toggleRect().contains(start));
    const QPoint globalStart = bar->mapToGlobal(start);
    const QPoint globalEnd = globalStart + (vertical ? QPoint(distance, 0) : QPoint(0, distance));

    QTest::mousePress(bar, Qt::LeftButton, Qt::NoModifier, start);
    // Two steps, as a real pointer would; the bar follows the pointer in between.
    const QPoint globalMid = globalStart + (globalEnd - globalStart) / 2;
    QTest::mouseMove(bar, bar->mapFromGlobal(globalMid));
    QTest::mouseMove(bar, bar->mapFromGlobal(globalEnd));
    QTest::mouseRelease(bar, Qt::LeftButton, Qt::NoModifier, bar->mapFromGlobal(globalEnd));

    QCOMPARE(vertical ? bar->x() : bar->y(), barPos);
    QCOMPARE(f.divider->getRatio(), barPos / 1000.0);
    QVERIFY(!f.divider->isToggled());
}

void TestKrDynamicDivider::resizeModes_data()
{
    QTest::addColumn<Qt::Orientation>("orientation");
    QTest::addColumn<int>("mode");
    QTest::addColumn<int>("from");
    QTest::addColumn<int>("to");
    QTest::addColumn<double>("ratio");

    for (Qt::Orientation o : {Qt::Vertical, Qt::Horizontal}) {
        const char* name = o == Qt::Vertical ? "side by side" : "stacked";
        QTest::addRow("%s, second keeps, grow", name) << o << 0 << 800 << 1000 << 0.6;
        QTest::addRow("%s, first keeps, grow", name) << o << 1 << 800 << 1000 << 0.4;
        QTest::addRow("%s, ratio stays, grow", name) << o << 2 << 800 << 1000 << 0.5;
        QTest::addRow("%s, unknown mode keeps ratio", name) << o << 7 << 800 << 1000 << 0.5;
        QTest::addRow("%s, second keeps, shrink", name) << o << 0 << 1000 << 800 << 0.375;
        QTest::addRow("%s, first keeps, shrink", name) << o << 1 << 1000 << 800 << 0.625;
    }
}

// Modes 0 and 1 keep one child's extent across a resize; the others keep the proportion.
void TestKrDynamicDivider::resizeModes()
{
    QFETCH(Qt::Orientation, orientation);
    QFETCH(int, mode);
    QFETCH(int, from);
    QFETCH(int, to);
    QFETCH(double, ratio);

    const bool vertical = orientation == Qt::Vertical;
    auto sized = [vertical](int extent) {
        return vertical ? QSize(extent, 300) : QSize(300, extent);
    };
    auto extentOf = [vertical](const QWidget* w) { return vertical ? w->width() : w->height(); };

    Fixture f(orientation, 4, sized(from));
    QCOMPARE(f.divider->getRatio(), 0.5);
    const int firstBefore = extentOf(f.first);
    const int secondBefore = extentOf(f.second);

    f.divider->setResizeMode(mode);
    f.divider->resize(sized(to));
    QCOMPARE(f.divider->getRatio(), ratio);
    if (mode == 0)
        QCOMPARE(extentOf(f.second), secondBefore);
    else if (mode == 1)
        QCOMPARE(extentOf(f.first), firstBefore);
    else
        QCOMPARE(vertical ? f.bar()->x() : f.bar()->y(), to / 2);
}

// The divider never lays out smaller than its minimum, and a resize that would squeeze a
// child below its minimum moves the split instead.
void TestKrDynamicDivider::resizeBelowMinimum()
{
    Fixture f(Qt::Vertical, 4, QSize(1000, 300));
    f.first->setMinimumSize(300, 10);
    f.second->setMinimumSize(100, 10);
    f.divider->setResizeMode(1); // the first would keep 492 pixels
    f.divider->resize(500, 300);
    // lo = (4 + 4 + 300) / 500, hi = (500 - 6 - 4 - 4 - 100) / 500
    QCOMPARE(f.divider->getRatio(), 386 / 500.0);
    QCOMPARE(f.bar()->x(), 386);

    f.divider->resize(10, 10);
    QCOMPARE(f.divider->size(), f.divider->minimumSizeHint());
    QCOMPARE(f.divider->size(), QSize(8 + 6 + 304 + 104, 18));
    QCOMPARE(f.first->width(), 300);
}

void TestKrDynamicDivider::toggle_data()
{
    QTest::addColumn<Qt::Orientation>("orientation");
    QTest::addColumn<bool>("collapseSecond");
    QTest::addColumn<QRect>("shown");
    QTest::addColumn<QRect>("bar");
    QTest::addColumn<Qt::ArrowType>("arrowBefore");
    QTest::addColumn<Qt::ArrowType>("arrowAfter");

    QTest::newRow("side by side, second collapses")
        << Qt::Vertical << true << QRect(4, 4, 978, 484) << QRect(994, 0, 6, 500) << Qt::RightArrow
        << Qt::LeftArrow;
    QTest::newRow("side by side, first collapses")
        << Qt::Vertical << false << QRect(10, 4, 978, 484) << QRect(0, 0, 6, 500) << Qt::LeftArrow
        << Qt::RightArrow;
    QTest::newRow("stacked, second collapses")
        << Qt::Horizontal << true << QRect(4, 4, 492, 986) << QRect(0, 994, 500, 6) << Qt::DownArrow
        << Qt::UpArrow;
    QTest::newRow("stacked, first collapses")
        << Qt::Horizontal << false << QRect(4, 10, 492, 986) << QRect(0, 0, 500, 6) << Qt::UpArrow
        << Qt::DownArrow;
}

// Collapsing spreads the other child over the freed space and puts the bar at the end;
// drags are ignored while collapsed, and a second toggle restores everything.
void TestKrDynamicDivider::toggle()
{
    QFETCH(Qt::Orientation, orientation);
    QFETCH(bool, collapseSecond);
    QFETCH(QRect, shown);
    QFETCH(QRect, bar);
    QFETCH(Qt::ArrowType, arrowBefore);
    QFETCH(Qt::ArrowType, arrowAfter);

    const bool vertical = orientation == Qt::Vertical;
    Fixture f(orientation, 4, vertical ? QSize(1000, 500) : QSize(500, 1000));
    f.divider->setToggleEnabled(true, collapseSecond);
    emit f.bar()->moved(-100);
    QCOMPARE(f.bar()->toggleArrow(), arrowBefore);
    const QRect firstBefore = f.first->geometry();
    const QRect secondBefore = f.second->geometry();
    const QRect barBefore = f.bar()->geometry();
    const double ratioBefore = f.divider->getRatio();
    QWidget* collapsed = collapseSecond ? f.second.data() : f.first.data();
    QWidget* kept = collapseSecond ? f.first.data() : f.second.data();

    emit f.bar()->toggleBarActivated();
    QVERIFY(f.divider->isToggled());
    QVERIFY(collapsed->isHidden());
    QVERIFY(kept->isVisible());
    QCOMPARE(kept->geometry(), shown);
    QCOMPARE(f.bar()->geometry(), bar);
    QCOMPARE(f.bar()->toggleArrow(), arrowAfter);

    // Dragging while collapsed changes nothing.
    emit f.bar()->moved(150);
    QCOMPARE(f.divider->getRatio(), ratioBefore);
    QCOMPARE(kept->geometry(), shown);
    QCOMPARE(f.bar()->geometry(), bar);

    // Changing the collapsing side while collapsed does not strand the hidden child.
    f.divider->setToggleEnabled(true, !collapseSecond);
    emit f.bar()->toggleBarActivated();
    QVERIFY(!f.divider->isToggled());
    QVERIFY(f.first->isVisible());
    QVERIFY(f.second->isVisible());
    QCOMPARE(f.divider->getRatio(), ratioBefore);
    QCOMPARE(f.first->geometry(), firstBefore);
    QCOMPARE(f.second->geometry(), secondBefore);
    QCOMPARE(f.bar()->geometry(), barBefore);
}

// A click on the bar's toggle area collapses; clicking the moved bar's toggle expands again.
void TestKrDynamicDivider::toggleByClick()
{
    Fixture f(Qt::Vertical, 4, QSize(1000, 500));
    f.divider->setToggleEnabled(true, true);
    QTest::mouseClick(f.bar(), Qt::LeftButton, Qt::NoModifier, f.bar()->toggleRect().center());
    QVERIFY(f.divider->isToggled());
    QVERIFY(f.second->isHidden());
    QCOMPARE(f.bar()->x(), 994);
    QTest::mouseClick(f.bar(), Qt::LeftButton, Qt::NoModifier, f.bar()->toggleRect().center());
    QVERIFY(!f.divider->isToggled());
    QVERIFY(f.second->isVisible());
    QCOMPARE(f.bar()->x(), 500);
}

void TestKrDynamicDivider::toggleIgnored()
{
    {
        Fixture f(Qt::Vertical, 4, QSize(1000, 500));
        f.divider->toggleWidget(); // toggle not enabled
        QVERIFY(!f.divider->isToggled());
        QVERIFY(f.second->isVisible());
        QCOMPARE(f.bar()->x(), 500);
    }
    {
        Fixture f(Qt::Vertical, 4, QSize(1000, 500), true, false);
        f.divider->setToggleEnabled(true, false);
        f.divider->toggleWidget(); // no second child
        QVERIFY(!f.divider->isToggled());
        QVERIFY(f.first->isVisible());
    }
}

// A child deleted by someone else leaves a divider that still resizes, drags and ignores
// toggles instead of touching freed memory.
void TestKrDynamicDivider::deletedChild()
{
    Fixture f(Qt::Vertical, 4, QSize(1000, 500));
    f.divider->setToggleEnabled(true, true);
    delete f.second.data();
    QVERIFY(!f.divider->getSecond());
    f.divider->toggleWidget();
    QVERIFY(!f.divider->isToggled());
    emit f.bar()->moved(100);
    QCOMPARE(f.divider->getRatio(), 0.6);
    f.divider->resize(700, 400);
    QCOMPARE(f.divider->minimumSizeHint(), QSize(8 + 6 + 4, 8));
}

QTEST_MAIN(TestKrDynamicDivider)
#include "tst_krdynamicdivider.moc"
