#include "krbasicdialog.h"
#include "krstyle.h"
#include "krstyledbutton.h"
#include "widgets_testutil.h"

#include <QBitmap>
#include <QDialogButtonBox>
#include <QLabel>
#include <QPainter>
#include <QPushButton>
#include <QSignalSpy>
#include <QStyleFactory>
#include <QStyleOption>
#include <QVBoxLayout>
#include <QtTest>
#include <memory>

namespace {
const char* const kDrawnIcons[] = {
    "new",    "open",        "save",    "copy",    "cut",   "paste",  "undo",   "redo",
    "zoomin", "zoomout",     "zoomfit", "arrange", "apply", "delete", "group",  "refresh",
    "folder", "preferences", "import",  "export",  "close", "add",    "remove", "preview"};

QImage render(const std::function<void(QPainter&)>& paint, const QSize& size)
{
    QImage image(size, QImage::Format_ARGB32);
    image.fill(Qt::transparent);
    QPainter p(&image);
    paint(p);
    p.end();
    return image;
}

QImage optionsButton(KrStyle& style, QStyle::State state)
{
    QStyleOptionButton opt;
    opt.rect = QRect(0, 0, 14, 14);
    opt.palette = style.standardPalette();
    opt.state = state;
    return render(
        [&](QPainter& p) {
            style.drawControl(QStyle::ControlElement(QStyle::CE_CustomBase + 0), &opt, &p);
        },
        QSize(14, 14));
}

QImage titleBar(KrStyle& style, const QString& text, QStyle::State state = QStyle::State_Enabled)
{
    QStyleOptionTitleBar opt;
    opt.rect = QRect(0, 0, 160, 18);
    opt.palette = style.standardPalette();
    opt.state = state;
    opt.text = text;
    return render(
        [&](QPainter& p) {
            style.drawControl(QStyle::ControlElement(QStyle::CE_CustomBase + 1), &opt, &p);
        },
        QSize(160, 18));
}
} // namespace

class TestKrStyle : public QObject
{
    Q_OBJECT
private slots:
    void metrics_data();
    void metrics();
    void roundMask();
    void optionsButtonStates();
    void brickTitleBar();
    void brickBarGradient();
    void palette();
    void actionIcons_data();
    void actionIcons();
    void actionIconsDiffer();
    void unknownIcon();
    void styledButton();
    void basicDialogLayout();
    void basicDialogRuns_data();
    void basicDialogRuns();
};

void TestKrStyle::metrics_data()
{
    QTest::addColumn<uint>("metric");
    QTest::addColumn<int>("expected");
    QTest::newRow("divider margin") << uint(QStyle::PM_CustomBase) << 2;
    QTest::newRow("divider bar") << uint(QStyle::PM_CustomBase + 1) << 6;
    QTest::newRow("group indent") << uint(QStyle::PM_CustomBase + 2) << 8;
    QTest::newRow("resize button") << uint(QStyle::PM_CustomBase + 10) << 14;
    QTest::newRow("title bar") << uint(QStyle::PM_CustomBase + 0x13) << 18;
    QTest::newRow("options button") << uint(QStyle::PM_CustomBase + 61) << 14;
}

void TestKrStyle::metrics()
{
    QFETCH(uint, metric);
    QFETCH(int, expected);
    KrStyle style;
    QCOMPARE(style.pixelMetric(QStyle::PixelMetric(metric)), expected);
    QCOMPARE(style.styleHint(QStyle::StyleHint(QStyle::SH_CustomBase + 3)), 1);
    // Everything else is the Fusion base's.
    std::unique_ptr<QStyle> fusion(QStyleFactory::create(QStringLiteral("Fusion")));
    QCOMPARE(style.pixelMetric(QStyle::PM_ButtonMargin),
             fusion->pixelMetric(QStyle::PM_ButtonMargin));
    QCOMPARE(style.pixelMetric(QStyle::PM_IndicatorWidth),
             fusion->pixelMetric(QStyle::PM_IndicatorWidth));
    QCOMPARE(style.styleHint(QStyle::SH_DialogButtonLayout),
             fusion->styleHint(QStyle::SH_DialogButtonLayout));
}

// The round options button's mask, built the way the editor builds it: a black pixmap, the
// mask primitive drawn on it, the pixmap turned into a bitmap.
void TestKrStyle::roundMask()
{
    KrStyle style;
    const int side = style.pixelMetric(QStyle::PixelMetric(QStyle::PM_CustomBase + 61));
    QPixmap pixmap(side, side);
    pixmap.fill(Qt::black);
    QStyleOptionButton opt;
    opt.rect = QRect(0, 0, side, side);
    QPainter p(&pixmap);
    style.drawPrimitive(QStyle::PrimitiveElement(QStyle::PE_CustomBase + 44), &opt, &p);
    p.end();
    const QBitmap bitmap(pixmap);
    const QRegion region(bitmap);
    QVERIFY(region.contains(QPoint(side / 2, side / 2)));
    QVERIFY(region.contains(QPoint(side / 2, 0)));
    QVERIFY(region.contains(QPoint(0, side / 2)));
    for (const QPoint& corner :
         {QPoint(0, 0), QPoint(side - 1, 0), QPoint(0, side - 1), QPoint(side - 1, side - 1)})
        QVERIFY2(!region.contains(corner),
                 qPrintable(QStringLiteral("%1,%2").arg(corner.x()).arg(corner.y())));
}

void TestKrStyle::optionsButtonStates()
{
    KrStyle style;
    const QImage normal = optionsButton(style, QStyle::State_Enabled | QStyle::State_Raised);
    const QImage pressed = optionsButton(style, QStyle::State_Enabled | QStyle::State_DownArrow);
    const QImage hover = optionsButton(style, QStyle::State_Enabled | QStyle::State_Raised |
                                                  QStyle::State_MouseOver);
    const QImage disabled = optionsButton(style, QStyle::State_Raised);
    QVERIFY(normal != pressed);
    QVERIFY(normal != hover);
    QVERIFY(normal != disabled);
    // A dark arrow in the middle, the corners left clear by the rounding.
    const QColor text = style.standardPalette().color(QPalette::ButtonText);
    QVERIFY(krWidgetsCountPixels(normal, text, 10) >= 4);
    QCOMPARE(qAlpha(normal.pixel(0, 0)), 0);
    QVERIFY(qAlpha(normal.pixel(7, 1)) > 200);
}

void TestKrStyle::brickTitleBar()
{
    KrStyle style;
    const QColor ink = style.getColors().brickTitleText;
    const QImage empty = titleBar(style, QString());
    const QImage named = titleBar(style, QStringLiteral("Diffuse Surface"));
    // The close mark sits in the last square (18 x 18) whatever the title.
    QVERIFY(krWidgetsCountPixels(empty.copy(142, 0, 18, 18), ink, 40) >= 6);
    QCOMPARE(krWidgetsCountPixels(empty.copy(0, 0, 142, 18), ink, 40), 0);
    // The title is written on the left.
    QVERIFY(krWidgetsCountPixels(named.copy(0, 0, 142, 18), ink, 40) >= 10);
    QCOMPARE(named.copy(142, 0, 18, 18), empty.copy(142, 0, 18, 18));
    // Filled edge to edge, opaque.
    QCOMPARE(qAlpha(empty.pixel(0, 0)), 255);
    QCOMPARE(qAlpha(empty.pixel(159, 17)), 255);
    QVERIFY(titleBar(style, QString(), QStyle::State_None) != empty);

    // From a widget, the title comes from its window title.
    QWidget w;
    w.setWindowTitle(QStringLiteral("Widget Title"));
    QStyleOption opt;
    opt.initFrom(&w);
    opt.rect = QRect(0, 0, 160, 18);
    opt.state |= QStyle::State_Enabled;
    const QImage fromWidget = render(
        [&](QPainter& p) {
            style.drawControl(QStyle::ControlElement(QStyle::CE_CustomBase + 1), &opt, &p, &w);
        },
        QSize(160, 18));
    QVERIFY(krWidgetsCountPixels(fromWidget.copy(0, 0, 142, 18), ink, 40) >= 10);
}

void TestKrStyle::brickBarGradient()
{
    KrStyle style;
    QStyleOption opt;
    opt.rect = QRect(0, 0, 100, 20);
    opt.palette = style.standardPalette();
    const QImage bar = render(
        [&](QPainter& p) {
            style.drawPrimitive(QStyle::PrimitiveElement(QStyle::PE_CustomBase + 42), &opt, &p);
        },
        QSize(100, 20));
    QVERIFY(qGray(bar.pixel(50, 0)) > qGray(bar.pixel(50, 17)));
    QCOMPARE(qAlpha(bar.pixel(50, 10)), 255);
}

void TestKrStyle::palette()
{
    KrStyle style;
    const QPalette pal = style.standardPalette();
    const KrColors& c = style.getColors();
    QCOMPARE(pal.color(QPalette::Window), c.window);
    QCOMPARE(pal.color(QPalette::Highlight), c.highlight);
    // A light look: dark text on light ground, readable selection.
    QVERIFY(qGray(c.window.rgb()) > 200);
    QVERIFY(qGray(c.text.rgb()) < 60);
    QVERIFY(qAbs(qGray(c.highlight.rgb()) - qGray(c.highlightedText.rgb())) > 80);
    QVERIFY(pal.color(QPalette::Disabled, QPalette::Text) != pal.color(QPalette::Text));
}

void TestKrStyle::actionIcons_data()
{
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("sameAs");
    for (const char* n : kDrawnIcons)
        QTest::newRow(n) << QString::fromLatin1(n) << QString();
    QTest::newRow("KrSaveAction") << "KrSaveAction"
                                  << "save";
    QTest::newRow("KrCopyAction") << "KrCopyAction"
                                  << "copy";
    QTest::newRow("KrSICutAction") << "KrSICutAction"
                                   << "cut";
    QTest::newRow("KrPasteAction") << "KrPasteAction"
                                   << "paste";
    QTest::newRow("KrCustomizeAction") << "KrCustomizeAction"
                                       << "preferences";
    QTest::newRow("KrImportAction") << "KrImportAction"
                                    << "import";
    QTest::newRow("Zoom-In") << "Zoom-In"
                             << "zoomin";
    QTest::newRow("help from base style") << "help" << QString();
}

void TestKrStyle::actionIcons()
{
    QFETCH(QString, name);
    QFETCH(QString, sameAs);
    KrStyle style;
    const QIcon icon = style.getActionIcon(name);
    QVERIFY(!icon.isNull());
    const QImage image = icon.pixmap(24, 24).toImage().convertToFormat(QImage::Format_ARGB32);
    QCOMPARE(image.size(), QSize(24, 24));
    int opaque = 0;
    for (int y = 0; y < image.height(); ++y)
        for (int x = 0; x < image.width(); ++x)
            opaque += qAlpha(image.pixel(x, y)) > 128;
    QVERIFY2(opaque > 20, qPrintable(QString::number(opaque)));
    QVERIFY2(opaque < 24 * 24, "an icon is a shape, not a filled square");
    if (!sameAs.isEmpty())
        QCOMPARE(image, style.getActionIcon(sameAs).pixmap(24, 24).toImage().convertToFormat(
                            QImage::Format_ARGB32));
}

void TestKrStyle::actionIconsDiffer()
{
    KrStyle style;
    QStringList names;
    QList<QImage> images;
    for (const char* n : kDrawnIcons) {
        names.append(QString::fromLatin1(n));
        images.append(style.getActionIcon(names.last()).pixmap(16, 16).toImage());
    }
    for (int i = 0; i < images.size(); ++i)
        for (int j = i + 1; j < images.size(); ++j)
            QVERIFY2(images.at(i) != images.at(j),
                     qPrintable(names.at(i) + QStringLiteral(" = ") + names.at(j)));
}

void TestKrStyle::unknownIcon()
{
    KrStyle style;
    QVERIFY(style.getActionIcon(QStringLiteral("no such thing")).isNull());
    QVERIFY(style.getActionIcon(QString()).isNull());
}

void TestKrStyle::styledButton()
{
    KrStyle style;
    KrStyledButton button(nullptr, QStringLiteral("ResizeButton"));
    button.setStyle(&style);
    QCOMPARE(button.objectName(), QStringLiteral("ResizeButton"));
    button.resize(14, 14);
    button.show();
    QVERIFY(QTest::qWaitForWindowExposed(&button));
    const QImage up = button.grab().toImage();
    button.setDown(true);
    const QImage down = button.grab().toImage();
    button.setDown(false);
    QVERIFY(up != down);
    QSignalSpy clicked(&button, &QAbstractButton::clicked);
    QTest::mouseClick(&button, Qt::LeftButton, Qt::NoModifier, QPoint(7, 7));
    QCOMPARE(clicked.count(), 1);

    // Under another style it still draws something.
    std::unique_ptr<QStyle> fusion(QStyleFactory::create(QStringLiteral("Fusion")));
    button.setStyle(fusion.get());
    QVERIFY(button.grab().toImage() != up);
    button.setStyle(&style);
}

void TestKrStyle::basicDialogLayout()
{
    QWidget parent;
    KrBasicDialog dialog(&parent, QStringLiteral("PathDlg"));
    QCOMPARE(dialog.objectName(), QStringLiteral("PathDlg"));
    QCOMPARE(dialog.parentWidget(), &parent);
    auto* a = new QLabel(QStringLiteral("a"));
    auto* b = new QLabel(QStringLiteral("b"));
    dialog.addWidget(a, 0);
    dialog.addWidget(b, 2);
    dialog.addWidget(nullptr, 0);
    QVBoxLayout* layout = dialog.getLayout();
    QCOMPARE(layout->count(), 3);
    QCOMPARE(layout->itemAt(0)->widget(), a);
    QCOMPARE(layout->itemAt(1)->widget(), b);
    QCOMPARE(layout->stretch(1), 2);
    QCOMPARE(layout->itemAt(2)->widget(), dialog.getButtonBox());
    QCOMPARE(a->parentWidget(), &dialog);
    QVERIFY(dialog.getButtonBox()->button(QDialogButtonBox::Ok));
    QVERIFY(dialog.getButtonBox()->button(QDialogButtonBox::Cancel));
    QVERIFY(dialog.getButtonBox()->button(QDialogButtonBox::Ok)->isDefault());
}

void TestKrStyle::basicDialogRuns_data()
{
    QTest::addColumn<QString>("answer");
    QTest::addColumn<int>("result");
    QTest::newRow("ok") << "ok" << int(QDialog::Accepted);
    QTest::newRow("cancel") << "cancel" << int(QDialog::Rejected);
    QTest::newRow("escape") << "escape" << int(QDialog::Rejected);
    QTest::newRow("return") << "return" << int(QDialog::Accepted);
}

void TestKrStyle::basicDialogRuns()
{
    QFETCH(QString, answer);
    QFETCH(int, result);
    KrBasicDialog dialog(nullptr, QStringLiteral("Dlg"));
    dialog.addWidget(new QLabel(QStringLiteral("Question?")));
    QWidget* seen = nullptr;
    krWidgetsWhenModal([&](QWidget* modal) {
        seen = modal;
        auto* box = modal->findChild<QDialogButtonBox*>();
        if (answer == QLatin1String("ok"))
            QTest::mouseClick(box->button(QDialogButtonBox::Ok), Qt::LeftButton);
        else if (answer == QLatin1String("cancel"))
            QTest::mouseClick(box->button(QDialogButtonBox::Cancel), Qt::LeftButton);
        else if (answer == QLatin1String("escape"))
            QTest::keyClick(modal, Qt::Key_Escape);
        else
            QTest::keyClick(modal, Qt::Key_Return);
    });
    QCOMPARE(dialog.exec(), result);
    QCOMPARE(seen, &dialog);
}

QTEST_MAIN(TestKrStyle)
#include "tst_krstyle.moc"
