#include "krapp.h"
#include "krclassfactory.h"
#include "krmainwindow.h"
#include "krproperty.h"
#include "krpropertylistview.h"
#include "krpropertywidgets.h"
#include "krundo.h"
#include "krwidgetgroup.h"
#include "widgets_testutil.h"

#include <QCheckBox>
#include <QColorDialog>
#include <QComboBox>
#include <QDoubleSpinBox>
#include <QLabel>
#include <QLineEdit>
#include <QPointer>
#include <QSignalSpy>
#include <QSlider>
#include <QSpinBox>
#include <QStyleOptionSlider>
#include <QToolButton>
#include <QtTest>
#include <memory>

namespace {
// A row that shows only the name, as the editor's output labels do.
class LabelOnlyWgt : public KrBasicPropertyWgt
{
public:
    bool showsValue() const override { return false; }
};

QPoint sliderHandleCenter(QSlider* slider)
{
    QStyleOptionSlider opt;
    opt.initFrom(slider);
    opt.orientation = slider->orientation();
    opt.minimum = slider->minimum();
    opt.maximum = slider->maximum();
    opt.sliderPosition = slider->sliderPosition();
    opt.sliderValue = slider->value();
    opt.singleStep = slider->singleStep();
    opt.pageStep = slider->pageStep();
    opt.upsideDown = false;
    opt.subControls = QStyle::SC_All;
    return slider->style()
        ->subControlRect(QStyle::CC_Slider, &opt, QStyle::SC_SliderHandle, slider)
        .center();
}

template <class W> std::unique_ptr<W> shownWidget(KrProperty* p)
{
    auto w = std::make_unique<W>();
    w->addProperty(p);
    w->resize(320, w->sizeHint().height());
    w->show();
    return w;
}
} // namespace

class TestKrPropertyWgt : public QObject
{
    Q_OBJECT
private slots:
    void factories_data();
    void factories();
    void intSpinBoxEditIsOneStep();
    void sliderDragIsOneStep_data();
    void sliderDragIsOneStep();
    void sliderKeyIsOneStep();
    void floatSpinBoxStep();
    void boolCheckBox();
    void stringCommitAndEscape();
    void enumComboBox();
    void colorDialogAccept();
    void colorDialogCancel();
    void readOnlyFollowsProperty();
    void severalPropertiesOneStep();
    void deletedPropertyDropsOut();
    void labelFollowsName();
    void labelOnlyRow();
    void listViewGroupsByPath();
    void listViewFallbackAndClear();
};

void TestKrPropertyWgt::factories_data()
{
    QTest::addColumn<QString>("className");
    QTest::newRow("basic") << "KrBasicPropertyWgt";
    QTest::newRow("int") << "KrIntPropertyWgt";
    QTest::newRow("float") << "KrFloatPropertyWgt";
    QTest::newRow("bool") << "KrBoolPropertyWgt";
    QTest::newRow("string") << "KrStringPropertyWgt";
    QTest::newRow("color") << "KrColorPropertyWgt";
    QTest::newRow("enum") << "KrEnumPropertyWgt";
}

void TestKrPropertyWgt::factories()
{
    QFETCH(QString, className);
    KrClassFactory* factory = krApp->findClassFactory(className);
    QVERIFY(factory);
    QCOMPARE(factory->className(), className);
    QVERIFY(factory->provides("KrPropertyWgt"));
    QVERIFY(factory->provides("KrBasicPropertyWgt"));
    QVERIFY(!factory->classID().isNull());
    std::unique_ptr<QObject> object(factory->createInstance());
    auto* widget = qobject_cast<KrPropertyWgt*>(object.get());
    QVERIFY(widget);
    QCOMPARE(widget->metaObject()->className(), className.toLatin1().constData());
    QCOMPARE(widget->getNumProperties(), 0);
    QVERIFY(!widget->getFirstProperty());
}

void TestKrPropertyWgt::intSpinBoxEditIsOneStep()
{
    KrUndoStack stack;
    KrIntProperty p(QStringLiteral("Count"), false, false, 10);
    p.setRange(0, 100);
    auto w = shownWidget<KrIntPropertyWgt>(&p);
    QSpinBox* spin = w->spinBox();
    QCOMPARE(spin->value(), 10);
    QVERIFY(w->slider()->isVisible());

    spin->setFocus();
    spin->selectAll();
    QTest::keyClicks(spin, QStringLiteral("42"));
    QCOMPARE(p.getIntValue(), 10); // nothing taken while typing
    QTest::keyClick(spin, Qt::Key_Return);
    QCOMPARE(p.getIntValue(), 42);
    QCOMPARE(stack.count(), 1);
    QCOMPARE(stack.undoText(), QStringLiteral("Change Count"));
    QCOMPARE(w->slider()->value(), 42);

    stack.undo();
    QCOMPARE(p.getIntValue(), 10);
    QCOMPARE(spin->value(), 10); // the widget follows the property
    QCOMPARE(w->slider()->value(), 10);
    QCOMPARE(stack.count(), 1); // following made no step of its own
    stack.redo();
    QCOMPARE(spin->value(), 42);
}

void TestKrPropertyWgt::sliderDragIsOneStep_data()
{
    QTest::addColumn<QString>("kind");
    QTest::newRow("int") << "int";
    QTest::newRow("float") << "float";
}

// Values follow the handle live; the whole drag is one step back to the value at the press.
void TestKrPropertyWgt::sliderDragIsOneStep()
{
    QFETCH(QString, kind);
    KrUndoStack stack;
    std::unique_ptr<KrProperty> p;
    std::unique_ptr<KrBasicPropertyWgt> w;
    QSlider* slider = nullptr;
    if (kind == QLatin1String("int")) {
        auto* ip = new KrIntProperty(QStringLiteral("Count"), false, false, 20);
        ip->setRange(0, 100);
        p.reset(ip);
        auto iw = shownWidget<KrIntPropertyWgt>(ip);
        slider = iw->slider();
        w = std::move(iw);
    } else {
        auto* fp = new KrFloatProperty(QStringLiteral("Gain"), 0.2);
        fp->setRange(0.0, 1.0);
        p.reset(fp);
        auto fw = shownWidget<KrFloatPropertyWgt>(fp);
        slider = fw->slider();
        w = std::move(fw);
    }
    QVERIFY(QTest::qWaitForWindowExposed(w.get()));
    QVERIFY(slider->isVisible());
    QVERIFY(slider->width() > 60);
    const QVariant pressValue = p->getValue();

    QPoint pos = sliderHandleCenter(slider);
    QTest::mousePress(slider, Qt::LeftButton, Qt::NoModifier, pos);
    QVERIFY(slider->isSliderDown());
    QVariant last = p->getValue();
    int liveChanges = 0;
    for (int i = 0; i < 10; ++i) {
        pos += QPoint(3, 0);
        krWidgetsMouseMove(slider, pos);
        if (p->getValue() != last)
            ++liveChanges;
        last = p->getValue();
    }
    QVERIFY2(liveChanges >= 5, qPrintable(QString::number(liveChanges)));
    QCOMPARE(stack.count(), 0); // nothing recorded while dragging
    QTest::mouseRelease(slider, Qt::LeftButton, Qt::NoModifier, pos);
    QVERIFY(!slider->isSliderDown());
    const QVariant finalValue = p->getValue();
    QVERIFY(finalValue.toDouble() > pressValue.toDouble());

    QCOMPARE(stack.count(), 1);
    stack.undo();
    QCOMPARE(p->getValue(), pressValue);
    QCOMPARE(stack.count(), 1);
    stack.redo();
    QCOMPARE(p->getValue(), finalValue);
}

void TestKrPropertyWgt::sliderKeyIsOneStep()
{
    KrUndoStack stack;
    KrIntProperty p(QStringLiteral("Count"), false, false, 5);
    p.setRange(0, 10);
    auto w = shownWidget<KrIntPropertyWgt>(&p);
    w->slider()->setFocus();
    QTest::keyClick(w->slider(), Qt::Key_Right);
    QTest::keyClick(w->slider(), Qt::Key_Right);
    QCOMPARE(p.getIntValue(), 7);
    QCOMPARE(stack.count(), 2);
}

void TestKrPropertyWgt::floatSpinBoxStep()
{
    KrUndoStack stack;
    KrFloatProperty p(QStringLiteral("Gain"), 0.5);
    p.setStep(0.25);
    p.setDecimals(2);
    auto w = shownWidget<KrFloatPropertyWgt>(&p);
    QVERIFY(!w->slider()->isVisible()); // no range, no slider
    QCOMPARE(w->spinBox()->decimals(), 2);
    w->spinBox()->setFocus();
    QTest::keyClick(w->spinBox(), Qt::Key_Up);
    QCOMPARE(p.getFloatValue(), 0.75);
    QCOMPARE(stack.count(), 1);

    // A value finer than the box shows stays exact in the property.
    p.setValue(0.123456);
    QCOMPARE(w->spinBox()->value(), 0.12);
    QCOMPARE(p.getFloatValue(), 0.123456);
    QCOMPARE(stack.count(), 1);
}

void TestKrPropertyWgt::boolCheckBox()
{
    KrUndoStack stack;
    KrBoolProperty p(QStringLiteral("Visible"), false);
    auto w = shownWidget<KrBoolPropertyWgt>(&p);
    QTest::mouseClick(w->checkBox(), Qt::LeftButton);
    QCOMPARE(p.getBoolValue(), true);
    QCOMPARE(stack.count(), 1);
    stack.undo();
    QVERIFY(!w->checkBox()->isChecked());
}

void TestKrPropertyWgt::stringCommitAndEscape()
{
    KrUndoStack stack;
    KrStringProperty p(QStringLiteral("Label"), QStringLiteral("old"));
    auto w = shownWidget<KrStringPropertyWgt>(&p);
    QLineEdit* edit = w->lineEdit();
    QCOMPARE(edit->text(), QStringLiteral("old"));
    edit->setFocus();

    edit->selectAll();
    QTest::keyClicks(edit, QStringLiteral("typed"));
    QCOMPARE(p.getStringValue(), QStringLiteral("old"));
    QTest::keyClick(edit, Qt::Key_Escape);
    QCOMPARE(edit->text(), QStringLiteral("old"));
    QTest::keyClick(edit, Qt::Key_Return); // unchanged text: no step
    QCOMPARE(stack.count(), 0);

    edit->selectAll();
    QTest::keyClicks(edit, QStringLiteral("new"));
    QTest::keyClick(edit, Qt::Key_Return);
    QCOMPARE(p.getStringValue(), QStringLiteral("new"));
    QCOMPARE(stack.count(), 1);
    stack.undo();
    QCOMPARE(edit->text(), QStringLiteral("old"));
}

void TestKrPropertyWgt::enumComboBox()
{
    KrUndoStack stack;
    KrEnumProperty p(QStringLiteral("Quality"),
                     {QStringLiteral("Low"), QStringLiteral("Mid"), QStringLiteral("High")}, 0);
    auto w = shownWidget<KrEnumPropertyWgt>(&p);
    QCOMPARE(w->comboBox()->count(), 3);
    w->comboBox()->setFocus();
    QTest::keyClick(w->comboBox(), Qt::Key_Down);
    QCOMPARE(p.getIndex(), 1);
    QCOMPARE(stack.count(), 1);
    p.setItems({QStringLiteral("Draft"), QStringLiteral("Final")});
    QCOMPARE(w->comboBox()->count(), 2);
    QCOMPARE(w->comboBox()->currentText(), QStringLiteral("Final"));
}

void TestKrPropertyWgt::colorDialogAccept()
{
    KrUndoStack stack;
    KrColorProperty p(QStringLiteral("Tint"), QColor(Qt::white));
    auto w = shownWidget<KrColorPropertyWgt>(&p);
    QVERIFY(QTest::qWaitForWindowExposed(w.get()));
    const QColor chosen(200, 30, 60);
    QCOMPARE(krWidgetsCountPixels(w->grab().toImage(), chosen), 0);

    // The dialog belongs to the host's main window.
    KrMainWindow mainWindow;
    krApp->setInterface(&mainWindow);
    struct Reset
    {
        ~Reset() { krApp->setInterface(nullptr); }
    } reset;
    QString title;
    QWidget* parent = nullptr;
    QColor initial;
    krWidgetsWhenModal([&](QWidget* modal) {
        auto* dialog = qobject_cast<QColorDialog*>(modal);
        QVERIFY(dialog);
        title = dialog->windowTitle();
        parent = dialog->parentWidget();
        initial = dialog->currentColor();
        dialog->setCurrentColor(chosen);
        dialog->accept();
    });
    QTest::mouseClick(w->colorButton(), Qt::LeftButton);
    QCOMPARE(title, QStringLiteral("Select Tint"));
    QCOMPARE(parent, &mainWindow);
    QCOMPARE(initial, QColor(Qt::white));
    QCOMPARE(p.getColorValue(), chosen);
    QCOMPARE(stack.count(), 1);

    // The swatch shows the colour.
    QVERIFY(krWidgetsCountPixels(w->grab().toImage(), chosen) > 100);
    QCOMPARE(w->colorButton()->text(), QStringLiteral("#C81E3C"));
    stack.undo();
    QCOMPARE(krWidgetsCountPixels(w->grab().toImage(), chosen), 0);
}

void TestKrPropertyWgt::colorDialogCancel()
{
    KrUndoStack stack;
    KrColorProperty p(QStringLiteral("Tint"), QColor(Qt::blue));
    auto w = shownWidget<KrColorPropertyWgt>(&p);
    bool ran = false;
    krWidgetsWhenModal([&](QWidget* modal) {
        auto* dialog = qobject_cast<QColorDialog*>(modal);
        QVERIFY(dialog);
        dialog->setCurrentColor(Qt::green);
        dialog->reject();
        ran = true;
    });
    w->chooseColor();
    QVERIFY(ran);
    QCOMPARE(p.getColorValue(), QColor(Qt::blue));
    QCOMPARE(stack.count(), 0);

    // A read-only colour opens no dialog.
    p.setReadOnly(true);
    QVERIFY(!w->colorButton()->isEnabled());
    w->chooseColor();
    QVERIFY(!QApplication::activeModalWidget());
}

void TestKrPropertyWgt::readOnlyFollowsProperty()
{
    KrUndoStack stack;
    KrIntProperty p(QStringLiteral("Count"), true, false, 3);
    p.setRange(0, 9);
    auto w = shownWidget<KrIntPropertyWgt>(&p);
    QVERIFY(!w->spinBox()->isEnabled());
    QVERIFY(!w->slider()->isEnabled());
    p.setReadOnly(false);
    QVERIFY(w->spinBox()->isEnabled());
    QVERIFY(w->slider()->isEnabled());

    KrStringProperty s(QStringLiteral("Label"), QStringLiteral("x"));
    s.setReadOnly(true);
    auto sw = shownWidget<KrStringPropertyWgt>(&s);
    QVERIFY(sw->lineEdit()->isReadOnly());
    sw->lineEdit()->setFocus();
    QTest::keyClicks(sw->lineEdit(), QStringLiteral("abc"));
    QTest::keyClick(sw->lineEdit(), Qt::Key_Return);
    QCOMPARE(s.getStringValue(), QStringLiteral("x"));
    QCOMPARE(stack.count(), 0);
}

void TestKrPropertyWgt::severalPropertiesOneStep()
{
    KrUndoStack stack;
    KrBoolProperty a(QStringLiteral("A"), false);
    KrBoolProperty b(QStringLiteral("B"), false);
    KrBoolPropertyWgt w;
    w.addProperty(&a);
    w.addProperty(&b);
    w.addProperty(&a); // once only
    QCOMPARE(w.getNumProperties(), 2);
    QCOMPARE(w.getFirstProperty(), &a);
    QCOMPARE(w.getProperty(1), &b);
    QVERIFY(!w.getProperty(2));
    w.show();
    QTest::mouseClick(w.checkBox(), Qt::LeftButton);
    QVERIFY(a.getBoolValue());
    QVERIFY(b.getBoolValue());
    QCOMPARE(stack.count(), 1);
    stack.undo();
    QVERIFY(!a.getBoolValue());
    QVERIFY(!b.getBoolValue());
}

void TestKrPropertyWgt::deletedPropertyDropsOut()
{
    KrUndoStack stack;
    auto* p = new KrIntProperty(QStringLiteral("Count"), false, false, 1);
    auto w = shownWidget<KrIntPropertyWgt>(p);
    delete p;
    QCOMPARE(w->getNumProperties(), 0);
    QVERIFY(!w->getFirstProperty());
    QVERIFY(!w->spinBox()->isEnabled());
    w->spinBox()->setValue(5); // no property to write to
    QCOMPARE(stack.count(), 0);
}

void TestKrPropertyWgt::labelFollowsName()
{
    KrIntProperty p(QStringLiteral("Count"), false, false, 1);
    auto w = shownWidget<KrIntPropertyWgt>(&p);
    auto* label = w->findChild<QLabel*>(QStringLiteral("PropertyName"));
    QVERIFY(label);
    QCOMPARE(label->text(), QStringLiteral("Count"));
    p.setName(QStringLiteral("Samples"));
    QCOMPARE(label->text(), QStringLiteral("Samples"));
    QCOMPARE(label->toolTip(), QStringLiteral("Samples (int)"));
}

void TestKrPropertyWgt::labelOnlyRow()
{
    KrIntProperty p(QStringLiteral("Out Color"), false, false, 0);
    LabelOnlyWgt label;
    label.addProperty(&p);
    label.resize(200, label.sizeHint().height());
    label.show();
    QVERIFY(!label.findChild<QWidget*>(QStringLiteral("PropertyEditor"))->isVisible());
    QVERIFY(!label.findChild<QLabel*>(QStringLiteral("PropertyValue")));

    KrBasicPropertyWgt basic;
    basic.addProperty(&p);
    basic.show();
    auto* value = basic.findChild<QLabel*>(QStringLiteral("PropertyValue"));
    QVERIFY(value);
    QCOMPARE(value->text(), QStringLiteral("0"));
    p.setValue(12);
    QCOMPARE(value->text(), QStringLiteral("12"));
}

void TestKrPropertyWgt::listViewGroupsByPath()
{
    KrPropertyListView view(nullptr, QStringLiteral("Props"));
    QCOMPARE(view.objectName(), QStringLiteral("Props"));
    KrIntProperty top(QStringLiteral("Top"));
    KrColorProperty color(QStringLiteral("Color"));
    color.setPath(QStringLiteral("/Diffuse"));
    KrFloatProperty shine(QStringLiteral("Roughness"));
    shine.setPath(QStringLiteral("/Diffuse/Shine"));
    KrBoolProperty other(QStringLiteral("On"));
    other.setPath(QStringLiteral("/Other"));
    KrFloatProperty weight(QStringLiteral("Weight"));
    weight.setPath(QStringLiteral("/Diffuse"));

    QVERIFY(!view.addProperty(nullptr));
    for (KrProperty* p : QList<KrProperty*>{&top, &color, &shine, &other, &weight})
        QVERIFY(view.addProperty(p));
    const QList<KrPropertyWgt*> widgets = view.getPropertyWidgets();
    QCOMPARE(widgets.size(), 5);
    QCOMPARE(widgets.at(1)->metaObject()->className(), "KrColorPropertyWgt");
    QCOMPARE(widgets.at(2)->getFirstProperty(), &shine);

    KrWidgetGroup* diffuse = view.findGroup(QStringLiteral("/Diffuse"));
    KrWidgetGroup* specGroup = view.findGroup(QStringLiteral("Diffuse/Shine"));
    QVERIFY(diffuse);
    QVERIFY(specGroup);
    QVERIFY(!view.findGroup(QStringLiteral("/")));
    QCOMPARE(diffuse->getTitle(), QStringLiteral("Diffuse"));
    QCOMPARE(diffuse->getLevel(), 0);
    QCOMPARE(specGroup->getLevel(), 1);
    QCOMPARE(specGroup->parentWidget(), diffuse->getBody());
    // Rows of one group stay together, in the order they came.
    QCOMPARE(diffuse->getChildren(), (QList<QWidget*>{widgets.at(1), specGroup, widgets.at(4)}));
    QCOMPARE(widgets.at(0)->getLevel(), 0);
    QCOMPARE(widgets.at(1)->getLevel(), 1);
    QCOMPARE(widgets.at(2)->getLevel(), 2);
    // Top level: the "/" row and then the groups, in order of first use.
    KrWidgetListLayout* list = view.getListLayout();
    QCOMPARE(list->count(), 3);
    QCOMPARE(list->itemAt(0)->widget(), widgets.at(0));
    QCOMPARE(list->getGroups(),
             (QList<KrWidgetGroup*>{diffuse, view.findGroup(QStringLiteral("/Other"))}));

    view.resize(300, 400);
    view.show();
    QVERIFY(QTest::qWaitForWindowExposed(&view));
    // Indentation: a deeper row's name starts further right.
    auto nameX = [](QWidget* w) {
        return w->findChild<QLabel*>(QStringLiteral("PropertyName"))->mapTo(w, QPoint(0, 0)).x();
    };
    QCOMPARE(nameX(widgets.at(2)) - nameX(widgets.at(0)), 2 * KrWidgetGroup::IndentPerLevel);
}

void TestKrPropertyWgt::listViewFallbackAndClear()
{
    class OddProperty : public KrIntProperty
    {
    public:
        OddProperty() : KrIntProperty(QStringLiteral("Odd")) {}
        QString getWidgetClassName() const override { return QStringLiteral("NoSuchWgt"); }
    };
    KrPropertyListView view;
    OddProperty odd;
    QTest::ignoreMessage(QtWarningMsg,
                         "KrPropertyListView: no property widget \"NoSuchWgt\" for \"Odd\"");
    KrPropertyWgt* w = view.addProperty(&odd);
    QVERIFY(w);
    QCOMPARE(w->metaObject()->className(), "KrBasicPropertyWgt");
    QCOMPARE(w->getFirstProperty(), &odd);

    KrIntProperty grouped(QStringLiteral("G"));
    grouped.setPath(QStringLiteral("/Group"));
    QPointer<KrPropertyWgt> row = view.addProperty(&grouped);
    QPointer<KrWidgetGroup> group = view.findGroup(QStringLiteral("/Group"));
    view.clear();
    QVERIFY(view.getPropertyWidgets().isEmpty());
    QVERIFY(!view.findGroup(QStringLiteral("/Group")));
    QCOMPARE(view.getListLayout()->count(), 0);
    QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
    QVERIFY(row.isNull());
    QVERIFY(group.isNull());
}

QTEST_MAIN(TestKrPropertyWgt)
#include "tst_krpropertywgt.moc"
