#include "krdividerbar.h"
#include "krstyle.h"
#include "widgets_testutil.h"

#include <QSignalSpy>
#include <QtTest>

namespace {
int sum(const QSignalSpy& spy)
{
    int total = 0;
    for (const QList<QVariant>& args : spy)
        total += args.at(0).toInt();
    return total;
}
} // namespace

class TestKrDividerBar : public QObject
{
    Q_OBJECT
private slots:
    void construction();
    void dragReportsTravel_data();
    void dragReportsTravel();
    void toggleClick();
    void toggleNeedsPressAndReleaseInside();
    void otherButtonsIgnored();
    void cursors();
    void looks_data();
    void looks();
};

void TestKrDividerBar::construction()
{
    QWidget parent;
    KrStyle style;
    KrDividerBar bar(&parent, Qt::Horizontal, QStringLiteral("Split"), KrDividerBar::GripBar);
    bar.setStyle(&style);
    QCOMPARE(bar.objectName(), QStringLiteral("Split"));
    QCOMPARE(bar.orientation(), Qt::Horizontal);
    QCOMPARE(bar.barStyle(), KrDividerBar::GripBar);
    QCOMPARE(int(KrDividerBar::FlatBar), 0);
    QCOMPARE(int(KrDividerBar::RaisedBar), 1);
    QCOMPARE(int(KrDividerBar::GripBar), 2);
    QCOMPARE(bar.barThickness(), 6);
    QCOMPARE(bar.sizeHint().height(), 6);
    QVERIFY(!bar.toggleEnabled());
    QVERIFY(bar.toggleRect().isNull());
    bar.enableToggleBar(true);
    QVERIFY(bar.toggleEnabled());
}

void TestKrDividerBar::dragReportsTravel_data()
{
    QTest::addColumn<int>("orientation");
    QTest::newRow("vertical bar, x axis") << int(Qt::Vertical);
    QTest::newRow("horizontal bar, y axis") << int(Qt::Horizontal);
}

// Every report is the travel since the last one, so the reports add up to the whole drag;
// draggedTo gives the pointer in the parent's coordinates.
void TestKrDividerBar::dragReportsTravel()
{
    QFETCH(int, orientation);
    const bool vertical = orientation == Qt::Vertical;
    QWidget parent;
    parent.resize(400, 400);
    KrDividerBar bar(&parent, Qt::Orientation(orientation), QStringLiteral("Bar"),
                     KrDividerBar::RaisedBar);
    bar.enableToggleBar(true);
    bar.setGeometry(vertical ? QRect(200, 0, 6, 400) : QRect(0, 200, 400, 6));
    parent.show();
    QVERIFY(QTest::qWaitForWindowExposed(&parent));
    QSignalSpy moved(&bar, &KrDividerBar::moved);
    QSignalSpy draggedTo(&bar, &KrDividerBar::draggedTo);
    QSignalSpy toggled(&bar, &KrDividerBar::toggleBarActivated);

    const QPoint start = vertical ? QPoint(3, 50) : QPoint(50, 3); // away from the toggle
    const QPoint step = vertical ? QPoint(7, 1) : QPoint(1, 7);    // sideways jitter is ignored
    QTest::mousePress(&bar, Qt::LeftButton, Qt::NoModifier, start);
    QVERIFY(bar.isDragging());
    QPoint pos = start;
    for (int i = 0; i < 10; ++i) {
        pos += step;
        krWidgetsMouseMove(&bar, pos);
    }
    krWidgetsMouseMove(&bar, pos + (vertical ? QPoint(0, 5) : QPoint(5, 0))); // no travel
    QCOMPARE(moved.count(), 10);
    for (const QList<QVariant>& args : moved)
        QCOMPARE(args.at(0).toInt(), 7);
    QTest::mouseRelease(&bar, Qt::LeftButton, Qt::NoModifier, pos - step * 3);
    QVERIFY(!bar.isDragging());
    QCOMPARE(moved.count(), 11);
    QCOMPARE(moved.last().at(0).toInt(), -21);
    QCOMPARE(sum(moved), 49);
    const QPoint end = bar.mapToParent(pos - step * 3);
    QCOMPARE(draggedTo.last().at(0).toInt(), vertical ? end.x() : end.y());
    QCOMPARE(toggled.count(), 0);

    // Moves without a press report nothing.
    krWidgetsMouseMove(&bar, start, Qt::NoButton);
    krWidgetsMouseMove(&bar, start + step, Qt::NoButton);
    QCOMPARE(moved.count(), 11);
}

void TestKrDividerBar::toggleClick()
{
    QWidget parent;
    parent.resize(300, 300);
    KrDividerBar bar(&parent, Qt::Vertical, QStringLiteral("Bar"), KrDividerBar::FlatBar);
    bar.setGeometry(100, 0, 6, 300);
    parent.show();
    QSignalSpy toggled(&bar, &KrDividerBar::toggleBarActivated);
    QSignalSpy moved(&bar, &KrDividerBar::moved);
    const QPoint middle(3, 150);

    // Disabled: a click in the middle is just a drag that went nowhere.
    QTest::mouseClick(&bar, Qt::LeftButton, Qt::NoModifier, middle);
    QCOMPARE(toggled.count(), 0);
    QCOMPARE(moved.count(), 0);

    bar.enableToggleBar(true);
    QVERIFY(bar.toggleRect().contains(middle));
    QTest::mouseClick(&bar, Qt::LeftButton, Qt::NoModifier, middle);
    QCOMPARE(toggled.count(), 1);
    QCOMPARE(moved.count(), 0);
    // Moving inside the toggle with the button down does not drag.
    QTest::mousePress(&bar, Qt::LeftButton, Qt::NoModifier, middle);
    krWidgetsMouseMove(&bar, middle + QPoint(2, 0));
    QTest::mouseRelease(&bar, Qt::LeftButton, Qt::NoModifier, middle + QPoint(2, 0));
    QCOMPARE(moved.count(), 0);
    QCOMPARE(toggled.count(), 2);
    // Outside the toggle a click does not toggle.
    QTest::mouseClick(&bar, Qt::LeftButton, Qt::NoModifier, QPoint(3, 10));
    QCOMPARE(toggled.count(), 2);
}

void TestKrDividerBar::toggleNeedsPressAndReleaseInside()
{
    QWidget parent;
    parent.resize(300, 300);
    KrDividerBar bar(&parent, Qt::Horizontal, QStringLiteral("Bar"), KrDividerBar::RaisedBar);
    bar.setGeometry(0, 100, 300, 6);
    bar.enableToggleBar(true);
    parent.show();
    QSignalSpy toggled(&bar, &KrDividerBar::toggleBarActivated);
    const QPoint middle = bar.toggleRect().center();
    QTest::mousePress(&bar, Qt::LeftButton, Qt::NoModifier, middle);
    QTest::mouseRelease(&bar, Qt::LeftButton, Qt::NoModifier, QPoint(10, 3));
    QCOMPARE(toggled.count(), 0);
    // Press outside, release inside: a drag, not a toggle.
    QTest::mousePress(&bar, Qt::LeftButton, Qt::NoModifier, QPoint(10, 3));
    QTest::mouseRelease(&bar, Qt::LeftButton, Qt::NoModifier, middle);
    QCOMPARE(toggled.count(), 0);
    // Disabled between press and release: nothing.
    QTest::mousePress(&bar, Qt::LeftButton, Qt::NoModifier, middle);
    bar.enableToggleBar(false);
    QTest::mouseRelease(&bar, Qt::LeftButton, Qt::NoModifier, middle);
    QCOMPARE(toggled.count(), 0);
}

void TestKrDividerBar::otherButtonsIgnored()
{
    QWidget parent;
    parent.resize(300, 300);
    KrDividerBar bar(&parent, Qt::Vertical, QStringLiteral("Bar"), KrDividerBar::RaisedBar);
    bar.setGeometry(100, 0, 6, 300);
    bar.enableToggleBar(true);
    parent.show();
    QSignalSpy toggled(&bar, &KrDividerBar::toggleBarActivated);
    QSignalSpy moved(&bar, &KrDividerBar::moved);
    QTest::mousePress(&bar, Qt::RightButton, Qt::NoModifier, QPoint(3, 20));
    QVERIFY(!bar.isDragging());
    krWidgetsMouseMove(&bar, QPoint(30, 20), Qt::RightButton);
    QTest::mouseRelease(&bar, Qt::RightButton, Qt::NoModifier, QPoint(30, 20));
    QTest::mouseClick(&bar, Qt::RightButton, Qt::NoModifier, QPoint(3, 150));
    QCOMPARE(moved.count(), 0);
    QCOMPARE(toggled.count(), 0);
}

void TestKrDividerBar::cursors()
{
    QWidget parent;
    parent.resize(300, 300);
    KrDividerBar v(&parent, Qt::Vertical, QStringLiteral("V"), KrDividerBar::RaisedBar);
    v.setGeometry(100, 0, 6, 300);
    KrDividerBar h(&parent, Qt::Horizontal, QStringLiteral("H"), KrDividerBar::RaisedBar);
    h.setGeometry(0, 200, 300, 6);
    parent.show();
    QCOMPARE(v.cursor().shape(), Qt::SplitHCursor);
    QCOMPARE(h.cursor().shape(), Qt::SplitVCursor);
    v.enableToggleBar(true);
    krWidgetsMouseMove(&v, QPoint(3, 150), Qt::NoButton);
    QCOMPARE(v.cursor().shape(), Qt::PointingHandCursor);
    krWidgetsMouseMove(&v, QPoint(3, 20), Qt::NoButton);
    QCOMPARE(v.cursor().shape(), Qt::SplitHCursor);
}

void TestKrDividerBar::looks_data()
{
    QTest::addColumn<int>("barStyle");
    QTest::newRow("flat") << int(KrDividerBar::FlatBar);
    QTest::newRow("raised") << int(KrDividerBar::RaisedBar);
    QTest::newRow("grip") << int(KrDividerBar::GripBar);
}

// The toggle area is drawn only while the toggle is enabled, and the styles differ.
void TestKrDividerBar::looks()
{
    QFETCH(int, barStyle);
    KrDividerBar bar(nullptr, Qt::Vertical, QStringLiteral("Bar"),
                     KrDividerBar::BarStyle(barStyle));
    bar.resize(8, 200);
    const QImage off = bar.grab().toImage();
    bar.enableToggleBar(true);
    const QImage on = bar.grab().toImage();
    QVERIFY(off != on);
    const QRect t = bar.toggleRect();
    // Far from the toggle nothing changed.
    QVERIFY(t.top() > 50);
    QCOMPARE(on.copy(0, 0, 8, 50), off.copy(0, 0, 8, 50));

    KrDividerBar other(nullptr, Qt::Vertical, QStringLiteral("Other"),
                       KrDividerBar::BarStyle((barStyle + 1) % 3));
    other.resize(8, 200);
    QVERIFY(other.grab().toImage() != off);
}

QTEST_MAIN(TestKrDividerBar)
#include "tst_krdividerbar.moc"
