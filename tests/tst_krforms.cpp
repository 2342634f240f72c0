// The designer forms: the object names, classes, containers and properties that the pane,
// the brick-user windows and the dialogs reach by name.
// The path tells the form compiler where the .ui files are; the headers are generated for
// this test from the same files the plug-in uses.
#include "../krcorvanegui/ui/ui_krbrickuserprefdlg.h"
#include "../krcorvanegui/ui/ui_krcorvanebrickuserwindow.h"
#include "../krcorvanegui/ui/ui_krcorvanechooserdlg.h"
#include "../krcorvanegui/ui/ui_krcorvanemainwindow.h"
#include "../krcorvanegui/ui/ui_krgenerealprefsdlg.h"

#include <QMenu>
#include <QMenuBar>
#include <QtTest>

namespace {

enum Form
{
    MainWindow,
    BrickUserWindow,
    Chooser,
    BrickUserPrefs,
    GeneralPrefs
};

// Builds one form on a bare widget of the form's base class.
QWidget* buildForm(Form form)
{
    switch (form) {
    case MainWindow: {
        auto* w = new QMainWindow;
        Ui::KrCorvaneMainWindow().setupUi(w);
        return w;
    }
    case BrickUserWindow: {
        auto* w = new QDockWidget;
        Ui::KrCorvaneBrickUserWindow().setupUi(w);
        return w;
    }
    case Chooser: {
        auto* w = new QDialog;
        Ui::KrChooserDialog().setupUi(w);
        return w;
    }
    case BrickUserPrefs: {
        auto* w = new QDialog;
        Ui::KrBrikcUserPrefDlgUi().setupUi(w);
        return w;
    }
    case GeneralPrefs: {
        auto* w = new QDialog;
        Ui::KrDuderOvidPrefsDlg().setupUi(w);
        return w;
    }
    }
    return nullptr;
}

QObject* findNamed(QObject* root, const QString& name)
{
    if (root->objectName() == name)
        return root;
    return root->findChild<QObject*>(name);
}

// The widgets and nested layouts held by a layout, in order, by object name.
QStringList layoutContents(const QLayout* layout)
{
    QStringList names;
    for (int i = 0; i < layout->count(); ++i) {
        QLayoutItem* item = layout->itemAt(i);
        if (item->widget())
            names << item->widget()->objectName();
        else if (item->layout())
            names << item->layout()->objectName();
        else
            names << QStringLiteral("<spacer>");
    }
    return names;
}

QMargins margins(const QLayout* layout)
{
    return layout->contentsMargins();
}

} // namespace

Q_DECLARE_METATYPE(Form)
Q_DECLARE_METATYPE(QMargins)

class TestKrForms : public QObject
{
    Q_OBJECT
private slots:
    void objectClasses_data();
    void objectClasses();
    void layoutShapes_data();
    void layoutShapes();
    void mainWindowProperties();
    void mainWindowKeepsExistingName();
    void brickTreePlaceholders();
    void brickUserWindowProperties();
    void zoomSpinRange_data();
    void zoomSpinRange();
    void formRows_data();
    void formRows();
    void dialogButtons_data();
    void dialogButtons();
};

void TestKrForms::objectClasses_data()
{
    QTest::addColumn<Form>("form");
    QTest::addColumn<QString>("name");
    QTest::addColumn<QString>("className");
    QTest::addColumn<QString>("text");

    const struct
    {
        Form form;
        const char* name;
        const char* className;
        const char* text;
    } rows[] = {
        {MainWindow, "KrCorvaneMainWindow", "QMainWindow", "CorvaneMainWindow"},
        {MainWindow, "actionNew", "QAction", "&New..."},
        {MainWindow, "actionOpen", "QAction", "&Open..."},
        {MainWindow, "actionPreference", "QAction", "Preferences..."},
        {MainWindow, "actionFromScene", "QAction", "From &Scene..."},
        {MainWindow, "centralwidget", "QWidget", ""},
        {MainWindow, "horizontalLayout_2", "QHBoxLayout", ""},
        {MainWindow, "lefttabs", "QTabWidget", ""},
        {MainWindow, "birckyardtab", "QWidget", ""},
        {MainWindow, "horizontalLayout_4", "QHBoxLayout", ""},
        {MainWindow, "brickFrame", "QFrame", ""},
        {MainWindow, "verticalLayout_2", "QVBoxLayout", ""},
        {MainWindow, "verticalLayout", "QVBoxLayout", ""},
        {MainWindow, "imageWidget", "QWidget", ""},
        {MainWindow, "horizontalLayout_3", "QHBoxLayout", ""},
        {MainWindow, "horizontalLayout", "QHBoxLayout", ""},
        {MainWindow, "spacerW2", "QWidget", ""},
        {MainWindow, "imageFrame", "QFrame", ""},
        {MainWindow, "spacerW1", "QWidget", ""},
        {MainWindow, "brickTree", "QTreeWidget", ""},
        {MainWindow, "propertiestab", "QWidget", ""},
        {MainWindow, "righttabs", "QTabWidget", ""},
        {MainWindow, "tab", "QWidget", ""},
        {MainWindow, "statusbar", "QStatusBar", ""},
        {BrickUserWindow, "KrCorvaneBrickUserWindow", "QDockWidget", "MyMaterial"},
        {BrickUserWindow, "dockWidgetContents", "QWidget", ""},
        {BrickUserWindow, "verticalLayout_2", "QVBoxLayout", ""},
        {BrickUserWindow, "verticalLayout", "QVBoxLayout", ""},
        {BrickUserWindow, "topFunctions", "QWidget", ""},
        {BrickUserWindow, "horizontalLayout_2", "QHBoxLayout", ""},
        {BrickUserWindow, "graphicsView", "QGraphicsView", ""},
        {BrickUserWindow, "controlFrame", "QFrame", ""},
        {BrickUserWindow, "horizontalLayout", "QHBoxLayout", ""},
        {BrickUserWindow, "label_2", "QLabel", "Zoom:"},
        {BrickUserWindow, "zoomSpin", "QDoubleSpinBox", ""},
        {BrickUserWindow, "widget", "QWidget", ""},
        {BrickUserWindow, "applyButton", "QPushButton", "Apply"},
        {Chooser, "KrChooserDialog", "QDialog", "New..."},
        {Chooser, "verticalLayout", "QVBoxLayout", ""},
        {Chooser, "widget", "QWidget", ""},
        {Chooser, "verticalLayout_2", "QVBoxLayout", ""},
        {Chooser, "typeLabel", "QLabel", "Type:"},
        {Chooser, "selectionBox", "QComboBox", ""},
        {Chooser, "nameLabel", "QLabel", "Name:"},
        {Chooser, "nameBox", "QLineEdit", ""},
        {Chooser, "buttonBox", "QDialogButtonBox", ""},
        {BrickUserPrefs, "KrBrikcUserPrefDlgUi", "QDialog", "Dialog"},
        {BrickUserPrefs, "formLayout", "QFormLayout", ""},
        {BrickUserPrefs, "nameLabel", "QLabel", "Name:"},
        {BrickUserPrefs, "nameEdit", "QLineEdit", ""},
        {BrickUserPrefs, "label", "QLabel", "Outputs Left:"},
        {BrickUserPrefs, "orientationCheck", "QCheckBox", ""},
        {BrickUserPrefs, "buttonBox", "QDialogButtonBox", ""},
        {GeneralPrefs, "KrDuderOvidPrefsDlg", "QDialog", "Dialog"},
        {GeneralPrefs, "formLayout", "QFormLayout", ""},
        {GeneralPrefs, "label", "QLabel", "DuderOvid Left"},
        {GeneralPrefs, "duderOvidCheck", "QCheckBox", ""},
        {GeneralPrefs, "label_2", "QLabel", "Outputs Left on Open"},
        {GeneralPrefs, "outPutsCheck", "QCheckBox", ""},
        {GeneralPrefs, "buttonBox", "QDialogButtonBox", ""},
    };
    const char* formNames[] = {"main", "brickuser", "chooser", "brickprefs", "generalprefs"};
    for (const auto& row : rows)
        QTest::addRow("%s/%s", formNames[row.form], row.name)
            << row.form << QString::fromLatin1(row.name) << QString::fromLatin1(row.className)
            << QString::fromLatin1(row.text);
}

// Every named object exists with its exact class, and its visible text where it has one.
void TestKrForms::objectClasses()
{
    QFETCH(Form, form);
    QFETCH(QString, name);
    QFETCH(QString, className);
    QFETCH(QString, text);

    QScopedPointer<QWidget> root(buildForm(form));
    QObject* object = findNamed(root.data(), name);
    QVERIFY2(object, qPrintable(name));
    QCOMPARE(QString::fromLatin1(object->metaObject()->className()), className);
    // Each name is unique within its form.
    QCOMPARE(root->findChildren<QObject*>(name).size() + (root->objectName() == name ? 1 : 0), 1);

    QString shown;
    if (auto* action = qobject_cast<QAction*>(object))
        shown = action->text();
    else if (auto* label = qobject_cast<QLabel*>(object))
        shown = label->text();
    else if (auto* button = qobject_cast<QAbstractButton*>(object))
        shown = button->text();
    else if (object == root.data())
        shown = root->windowTitle();
    QCOMPARE(shown, text);
    if (auto* action = qobject_cast<QAction*>(object))
        QCOMPARE(action->parent(), root.data());
}

void TestKrForms::layoutShapes_data()
{
    QTest::addColumn<Form>("form");
    QTest::addColumn<QString>("owner");  // widget the layout is set on, or a parent layout
    QTest::addColumn<QString>("layout"); // object name of the layout
    QTest::addColumn<QStringList>("contents");
    QTest::addColumn<int>("spacing");
    QTest::addColumn<QMargins>("margins");

    QTest::newRow("main/central") << MainWindow << "centralwidget"
                                  << "horizontalLayout_2" << QStringList{"lefttabs", "righttabs"}
                                  << 0 << QMargins(2, 2, 2, 2);
    QTest::newRow("main/duderovid page")
        << MainWindow << "birckyardtab"
        << "horizontalLayout_4" << QStringList{"brickFrame"} << 0 << QMargins(1, 1, 1, 1);
    QTest::newRow("main/brick frame")
        << MainWindow << "brickFrame"
        << "verticalLayout_2" << QStringList{"verticalLayout"} << 0 << QMargins(0, 2, 0, 2);
    QTest::newRow("main/library") << MainWindow << "verticalLayout_2"
                                  << "verticalLayout" << QStringList{"imageWidget", "brickTree"}
                                  << 0 << QMargins();
    QTest::newRow("main/image widget")
        << MainWindow << "imageWidget"
        << "horizontalLayout_3" << QStringList{"horizontalLayout"} << 0 << QMargins(1, 1, 1, 1);
    QTest::newRow("main/preview strip")
        << MainWindow << "horizontalLayout_3"
        << "horizontalLayout" << QStringList{"spacerW2", "imageFrame", "spacerW1"} << 0
        << QMargins();
    QTest::newRow("brickuser/contents")
        << BrickUserWindow << "dockWidgetContents"
        << "verticalLayout_2" << QStringList{"verticalLayout"} << -2 << QMargins(-1, -1, -1, -1);
    QTest::newRow("brickuser/column")
        << BrickUserWindow << "verticalLayout_2"
        << "verticalLayout" << QStringList{"topFunctions", "graphicsView", "controlFrame"} << 2
        << QMargins();
    QTest::newRow("brickuser/toolbar row")
        << BrickUserWindow << "topFunctions"
        << "horizontalLayout_2" << QStringList{} << 0 << QMargins(0, 0, 0, 0);
    QTest::newRow("brickuser/control strip")
        << BrickUserWindow << "controlFrame"
        << "horizontalLayout" << QStringList{"label_2", "zoomSpin", "widget", "applyButton"} << 1
        << QMargins(0, 1, 0, 0);
    QTest::newRow("chooser/dialog")
        << Chooser << "KrChooserDialog"
        << "verticalLayout" << QStringList{"widget", "buttonBox"} << 0 << QMargins(3, 0, 3, 0);
    QTest::newRow("chooser/fields")
        << Chooser << "widget"
        << "verticalLayout_2" << QStringList{"typeLabel", "selectionBox", "nameLabel", "nameBox"}
        << 0 << QMargins(0, 0, 0, 0);
}

// Containers hold their children in order with the given spacing and margins. A spacing of -2
// means "the style's default", margins of -1 "the parent's default" (only checked as given).
void TestKrForms::layoutShapes()
{
    QFETCH(Form, form);
    QFETCH(QString, owner);
    QFETCH(QString, layout);
    QFETCH(QStringList, contents);
    QFETCH(int, spacing);
    QFETCH(QMargins, margins);

    QScopedPointer<QWidget> root(buildForm(form));
    QObject* ownerObject = findNamed(root.data(), owner);
    QVERIFY(ownerObject);
    QLayout* found = nullptr;
    if (auto* widget = qobject_cast<QWidget*>(ownerObject)) {
        found = widget->layout();
    } else {
        auto* parentLayout = qobject_cast<QLayout*>(ownerObject);
        QVERIFY(parentLayout);
        for (int i = 0; i < parentLayout->count() && !found; ++i)
            found = parentLayout->itemAt(i)->layout();
    }
    QVERIFY2(found, qPrintable(owner));
    QCOMPARE(found->objectName(), layout);
    QCOMPARE(layoutContents(found), contents);
    if (spacing != -2)
        QCOMPARE(found->spacing(), spacing);
    if (margins != QMargins(-1, -1, -1, -1))
        QCOMPARE(::margins(found), margins);
}

void TestKrForms::mainWindowProperties()
{
    QMainWindow window;
    Ui::KrCorvaneMainWindow ui;
    ui.setupUi(&window);

    QCOMPARE(window.size(), QSize(399, 631));
    QCOMPARE(window.sizePolicy().horizontalPolicy(), QSizePolicy::Minimum);
    QCOMPARE(window.sizePolicy().verticalPolicy(), QSizePolicy::MinimumExpanding);
    QCOMPARE(int(window.dockOptions()), 0x0F);
    QCOMPARE(window.centralWidget(), ui.centralwidget);
    QCOMPARE(window.statusBar(), ui.statusbar);
    QCOMPARE(ui.centralwidget->sizePolicy().horizontalPolicy(), QSizePolicy::Minimum);
    QCOMPARE(ui.centralwidget->sizePolicy().horizontalStretch(), 1);
    QCOMPARE(ui.centralwidget->sizePolicy().verticalPolicy(), QSizePolicy::MinimumExpanding);
    // No menu in the form: the pane builds its own "&File" menu.
    QVERIFY(!window.findChild<QMenuBar*>());
    QVERIFY(!window.findChild<QMenu*>());

    QCOMPARE(ui.lefttabs->count(), 2);
    QCOMPARE(ui.lefttabs->currentIndex(), 0);
    QCOMPARE(ui.lefttabs->widget(0), ui.birckyardtab);
    QCOMPARE(ui.lefttabs->tabText(0), QStringLiteral("Duderovid"));
    QCOMPARE(ui.lefttabs->widget(1), ui.propertiestab);
    QCOMPARE(ui.lefttabs->tabText(1), QStringLiteral("Properties"));
    QVERIFY(ui.propertiestab->isEnabled());
    QCOMPARE(ui.lefttabs->sizePolicy().horizontalPolicy(), QSizePolicy::Minimum);
    QCOMPARE(ui.lefttabs->sizePolicy().verticalPolicy(), QSizePolicy::Expanding);
    QCOMPARE(ui.righttabs->count(), 1);
    QCOMPARE(ui.righttabs->widget(0), ui.tab);
    QCOMPARE(ui.righttabs->tabText(0), QStringLiteral("Tab 1"));

    QCOMPARE(ui.verticalLayout_2->sizeConstraint(), QLayout::SetNoConstraint);
    QCOMPARE(ui.brickFrame->frameShape(), QFrame::StyledPanel);
    QCOMPARE(ui.brickFrame->frameShadow(), QFrame::Raised);
    QCOMPARE(ui.imageFrame->minimumSize(), QSize(64, 8));
    QCOMPARE(ui.imageFrame->maximumSize(), QSize(10000, 10000));
    QCOMPARE(ui.imageFrame->frameShape(), QFrame::StyledPanel);
    QCOMPARE(ui.spacerW2->sizePolicy().horizontalPolicy(), QSizePolicy::Expanding);
    QCOMPARE(ui.spacerW2->sizePolicy().verticalPolicy(), QSizePolicy::Minimum);
    QCOMPARE(ui.spacerW2->sizePolicy().verticalStretch(), 1);
    QCOMPARE(ui.spacerW1->sizePolicy().verticalPolicy(), QSizePolicy::Expanding);
    QCOMPARE(ui.spacerW1->sizePolicy().verticalStretch(), 1);
    QCOMPARE(ui.brickTree->sizePolicy().horizontalStretch(), 1);
    QCOMPARE(ui.brickTree->sizePolicy().verticalPolicy(), QSizePolicy::MinimumExpanding);
    QCOMPARE(ui.brickTree->dragDropMode(), QAbstractItemView::DragOnly);
    QVERIFY(ui.brickTree->isSortingEnabled());
}

void TestKrForms::mainWindowKeepsExistingName()
{
    QMainWindow window;
    window.setObjectName(QStringLiteral("PaneMain"));
    Ui::KrCorvaneMainWindow().setupUi(&window);
    QCOMPARE(window.objectName(), QStringLiteral("PaneMain"));
}

void TestKrForms::brickTreePlaceholders()
{
    QMainWindow window;
    Ui::KrCorvaneMainWindow ui;
    ui.setupUi(&window);

    QCOMPARE(ui.brickTree->headerItem()->text(0), QStringLiteral("Bricks"));
    QCOMPARE(ui.brickTree->topLevelItemCount(), 1);
    QTreeWidgetItem* all = ui.brickTree->topLevelItem(0);
    QCOMPARE(all->text(0), QStringLiteral("!All Bricks"));
    QStringList children;
    for (int i = 0; i < all->childCount(); ++i)
        children << all->child(i)->text(0);
    children.sort();
    QCOMPARE(children, (QStringList{"Functions", "Roots"}));
    const Qt::ItemFlags flags = Qt::ItemIsSelectable | Qt::ItemIsUserCheckable | Qt::ItemIsEnabled;
    QCOMPARE(all->flags(), flags);
    for (int i = 0; i < all->childCount(); ++i)
        QCOMPARE(all->child(i)->flags(), flags);

    // Retranslating keeps the tree's sorting as it was.
    ui.brickTree->setSortingEnabled(false);
    ui.retranslateUi(&window);
    QVERIFY(!ui.brickTree->isSortingEnabled());
    QCOMPARE(all->text(0), QStringLiteral("!All Bricks"));
}

void TestKrForms::brickUserWindowProperties()
{
    QDockWidget window;
    Ui::KrCorvaneBrickUserWindow ui;
    ui.setupUi(&window);

    QCOMPARE(window.size(), QSize(503, 286));
    QCOMPARE(window.sizePolicy().horizontalPolicy(), QSizePolicy::Expanding);
    QCOMPARE(window.sizePolicy().horizontalStretch(), 10);
    QCOMPARE(window.sizePolicy().verticalPolicy(), QSizePolicy::MinimumExpanding);
    QCOMPARE(window.features(), QDockWidget::DockWidgetClosable);
    QCOMPARE(window.allowedAreas(), Qt::LeftDockWidgetArea);
    QCOMPARE(window.widget(), ui.dockWidgetContents);

    QVERIFY(ui.graphicsView->acceptDrops());
    QCOMPARE(ui.graphicsView->sceneRect(), QRectF(0, 0, 5000, 5000));
    const QPainter::RenderHints hints =
        QPainter::Antialiasing | QPainter::TextAntialiasing | QPainter::SmoothPixmapTransform;
    QCOMPARE(ui.graphicsView->renderHints() & hints, hints);
    QCOMPARE(ui.graphicsView->dragMode(), QGraphicsView::RubberBandDrag);
    QCOMPARE(ui.graphicsView->transformationAnchor(), QGraphicsView::NoAnchor);
    QCOMPARE(ui.graphicsView->resizeAnchor(), QGraphicsView::NoAnchor);
    QCOMPARE(ui.graphicsView->viewportUpdateMode(), QGraphicsView::SmartViewportUpdate);

    QCOMPARE(ui.controlFrame->frameShape(), QFrame::StyledPanel);
    QCOMPARE(ui.controlFrame->frameShadow(), QFrame::Raised);
    QCOMPARE(ui.controlFrame->sizePolicy().horizontalPolicy(), QSizePolicy::MinimumExpanding);
    QCOMPARE(ui.controlFrame->sizePolicy().verticalPolicy(), QSizePolicy::Minimum);
    QCOMPARE(ui.widget->sizePolicy().horizontalPolicy(), QSizePolicy::Expanding);
    QCOMPARE(ui.widget->sizePolicy().verticalPolicy(), QSizePolicy::Preferred);
}

void TestKrForms::zoomSpinRange_data()
{
    QTest::addColumn<QString>("typed");
    QTest::addColumn<double>("value");

    QTest::newRow("hundred") << "100" << 100.0;
    QTest::newRow("one") << "1" << 1.0;
    QTest::newRow("one decimal") << "12.5" << 12.5;
    // The digit that would pass 500 is refused, so the value never leaves the range.
    QTest::newRow("beyond maximum") << "900" << 90.0;
    QTest::newRow("below minimum") << "0" << 100.0;
    QTest::newRow("maximum") << "500" << 500.0;
}

// The zoom box takes 1 to 500 percent with one decimal; out-of-range input is not taken.
void TestKrForms::zoomSpinRange()
{
    QFETCH(QString, typed);
    QFETCH(double, value);

    QDockWidget window;
    Ui::KrCorvaneBrickUserWindow ui;
    ui.setupUi(&window);
    QCOMPARE(ui.zoomSpin->value(), 100.0);
    QCOMPARE(ui.zoomSpin->minimum(), 1.0);
    QCOMPARE(ui.zoomSpin->maximum(), 500.0);
    QCOMPARE(ui.zoomSpin->singleStep(), 10.0);
    QCOMPARE(ui.zoomSpin->decimals(), 1);
    QCOMPARE(ui.zoomSpin->suffix(), QStringLiteral("%"));

    window.show();
    ui.zoomSpin->setFocus();
    ui.zoomSpin->selectAll();
    QTest::keyClicks(ui.zoomSpin, typed);
    QTest::keyClick(ui.zoomSpin, Qt::Key_Return);
    ui.zoomSpin->interpretText();
    QCOMPARE(ui.zoomSpin->value(), value);
}

void TestKrForms::formRows_data()
{
    QTest::addColumn<Form>("form");
    QTest::addColumn<int>("row");
    QTest::addColumn<QString>("labelName");
    QTest::addColumn<QString>("fieldName");

    QTest::newRow("brickprefs/name") << BrickUserPrefs << 2 << "nameLabel"
                                     << "nameEdit";
    QTest::newRow("brickprefs/orientation") << BrickUserPrefs << 4 << "label"
                                            << "orientationCheck";
    QTest::newRow("brickprefs/buttons") << BrickUserPrefs << 5 << ""
                                        << "buttonBox";
    QTest::newRow("generalprefs/duderovid") << GeneralPrefs << 0 << "label"
                                            << "duderOvidCheck";
    QTest::newRow("generalprefs/outputs") << GeneralPrefs << 1 << "label_2"
                                          << "outPutsCheck";
    QTest::newRow("generalprefs/buttons") << GeneralPrefs << 2 << ""
                                          << "buttonBox";
}

void TestKrForms::formRows()
{
    QFETCH(Form, form);
    QFETCH(int, row);
    QFETCH(QString, labelName);
    QFETCH(QString, fieldName);

    QScopedPointer<QWidget> root(buildForm(form));
    auto* layout = root->findChild<QFormLayout*>(QStringLiteral("formLayout"));
    QVERIFY(layout);
    QCOMPARE(root->layout(), layout);
    QLayoutItem* label = layout->itemAt(row, QFormLayout::LabelRole);
    QLayoutItem* field = layout->itemAt(row, QFormLayout::FieldRole);
    if (labelName.isEmpty())
        QVERIFY(!label);
    else
        QCOMPARE(label && label->widget() ? label->widget()->objectName() : QString(), labelName);
    QVERIFY(field && field->widget());
    QCOMPARE(field->widget()->objectName(), fieldName);
    if (auto* check = qobject_cast<QCheckBox*>(field->widget()))
        QVERIFY(check->text().isEmpty());

    QCOMPARE(layout->verticalSpacing(), 0);
    QCOMPARE(layout->contentsMargins(), QMargins(3, 0, 0, 0));
    if (form == BrickUserPrefs) {
        QCOMPARE(layout->horizontalSpacing(), 0);
        QCOMPARE(layout->fieldGrowthPolicy(), QFormLayout::AllNonFixedFieldsGrow);
        QCOMPARE(root->size(), QSize(240, 63));
        QCOMPARE(root->sizePolicy().horizontalPolicy(), QSizePolicy::Preferred);
        QCOMPARE(root->sizePolicy().verticalPolicy(), QSizePolicy::Preferred);
    } else {
        QCOMPARE(layout->horizontalSpacing(), 6);
        QCOMPARE(root->size(), QSize(163, 55));
    }
}

void TestKrForms::dialogButtons_data()
{
    QTest::addColumn<Form>("form");
    QTest::addColumn<int>("button");
    QTest::addColumn<int>("result");

    for (Form form : {Chooser, BrickUserPrefs, GeneralPrefs}) {
        const QByteArray name = form == Chooser          ? "chooser"
                                : form == BrickUserPrefs ? "brickprefs"
                                                         : "generalprefs";
        QTest::newRow(name + "/ok") << form << int(QDialogButtonBox::Ok) << int(QDialog::Accepted);
        QTest::newRow(name + "/cancel")
            << form << int(QDialogButtonBox::Cancel) << int(QDialog::Rejected);
    }
}

// Ok and Cancel close the dialog with the matching result; there are no other buttons.
void TestKrForms::dialogButtons()
{
    QFETCH(Form, form);
    QFETCH(int, button);
    QFETCH(int, result);

    QScopedPointer<QWidget> root(buildForm(form));
    auto* dialog = qobject_cast<QDialog*>(root.data());
    QVERIFY(dialog);
    auto* box = dialog->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"));
    QVERIFY(box);
    QCOMPARE(box->orientation(), Qt::Horizontal);
    QCOMPARE(box->standardButtons(), QDialogButtonBox::Ok | QDialogButtonBox::Cancel);
    QVERIFY(!box->centerButtons());

    int seen = -1;
    QTimer::singleShot(0, dialog, [&] {
        QWidget* modal = QApplication::activeModalWidget();
        if (modal != dialog)
            return;
        QTest::mouseClick(box->button(QDialogButtonBox::StandardButton(button)), Qt::LeftButton);
    });
    // A watchdog so a broken connection fails instead of hanging.
    QTimer::singleShot(5000, dialog, [&] { dialog->done(-7); });
    seen = dialog->exec();
    QCOMPARE(seen, result);
}

QTEST_MAIN(TestKrForms)
#include "tst_krforms.moc"
