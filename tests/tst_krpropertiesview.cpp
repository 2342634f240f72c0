// The Properties tab: which properties it lists, how it follows its element, and renaming and
// regrouping a property from its context menu with the dialogs answered.
#include "krapp.h"
#include "krbrickmaterial.h"
#include "krbrickuserpropertiesview.h"
#include "krdefaultmaterial.h"
#include "krelement.h"
#include "krgrouppathdlg.h"
#include "krpathselectionwgt.h"
#include "krproperty.h"
#include "krpropertywgt.h"
#include "pane_testsupport.h"

#include <QComboBox>
#include <QContextMenuEvent>
#include <QDialogButtonBox>
#include <QLineEdit>
#include <QMenu>
#include <QPushButton>
#include <QtTest>

namespace {

// A dialog answer seen by the test: the title, the suggestions and the text shown.
struct PathDialogSeen
{
    bool handled = false;
    QString title;
    QStringList defaults;
    QString text;
};

KrModalAnswer pathAnswer(const QString& newText, bool accept, PathDialogSeen* seen)
{
    return [=](QWidget* modal) {
        auto* dialog = dynamic_cast<KrGroupPathDlg*>(modal);
        if (!dialog) {
            modal->close();
            return;
        }
        seen->handled = true;
        seen->title = dialog->windowTitle();
        QComboBox* combo = dialog->getPathSelection()->getCombo();
        for (int i = 0; i < combo->count(); ++i)
            seen->defaults << combo->itemText(i);
        seen->text = dialog->getPath();
        dialog->getPathSelection()->getEdit()->setText(newText);
        if (accept)
            dialog->accept();
        else
            dialog->reject();
    };
}

// Chooses entry (0 or 1) of the next popup menu with the keyboard.
void chooseFromNextPopup(int entry, QStringList* texts)
{
    QTimer* timer = new QTimer;
    timer->setInterval(20);
    QObject::connect(timer, &QTimer::timeout, [=]() {
        auto* menu = qobject_cast<QMenu*>(QApplication::activePopupWidget());
        if (!menu)
            return;
        timer->stop();
        timer->deleteLater();
        for (QAction* action : menu->actions())
            texts->append(action->text());
        for (int i = 0; i <= entry; ++i)
            QTest::keyClick(menu, Qt::Key_Down);
        QTest::keyClick(menu, Qt::Key_Return);
    });
    timer->start();
}

} // namespace

class TestKrPropertiesView : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void cleanup();

    void listsVisibleProperties();
    void followsElement();
    void ignoresChangesWhileClosing();
    void defaultNames();
    void renameToAnotherPropertysName();
    void renameToOwnName();
    void cancelledRenameChangesNothing();
    void regroup();
    void rightClickOutsideShowsNoMenu();

private:
    KrPropertyWgt* widgetFor(const QString& name) const;
    void contextMenuOn(KrPropertyWgt* widget);

    std::unique_ptr<KrPaneTestEnv> m_env;
    std::unique_ptr<KrElement> m_element;
    std::unique_ptr<KrBrickUserPropertiesView> m_view;
    KrFloatProperty* m_a = nullptr;
    KrFloatProperty* m_b = nullptr;
    KrFloatProperty* m_hidden = nullptr;
};

void TestKrPropertiesView::init()
{
    m_env.reset(new KrPaneTestEnv);
    m_element.reset(new KrElement(QStringLiteral("Thing")));
    m_a = new KrFloatProperty(QStringLiteral("Alpha"), 1.0, m_element.get());
    m_a->setPath(QStringLiteral("/Group/Sub"));
    m_b = new KrFloatProperty(QStringLiteral("Beta"), 2.0, m_element.get());
    m_b->setPath(QStringLiteral("/Other"));
    m_hidden = new KrFloatProperty(QStringLiteral("Secret"), 3.0, m_element.get());
    m_hidden->setHidden(true);
    m_element->setProperties({m_a, m_hidden, m_b});

    m_view.reset(new KrBrickUserPropertiesView(nullptr, QString()));
    m_view->resize(400, 400);
    m_view->show();
    m_view->setElement(m_element.get());
    QVERIFY(QTest::qWaitForWindowExposed(m_view.get()));
}

void TestKrPropertiesView::cleanup()
{
    m_view.reset();
    m_element.reset();
    m_env.reset();
}

KrPropertyWgt* TestKrPropertiesView::widgetFor(const QString& name) const
{
    for (KrPropertyWgt* w : m_view->getPropertyWidgets()) {
        if (w->getFirstProperty() && w->getFirstProperty()->getName() == name)
            return w;
    }
    return nullptr;
}

void TestKrPropertiesView::contextMenuOn(KrPropertyWgt* widget)
{
    QApplication::processEvents();
    QVERIFY(widget);
    // What a right click on the row's name sends: the event goes to the row and up.
    const QPoint pos(8, widget->height() / 2);
    QWidget* target = widget->childAt(pos) ? widget->childAt(pos) : widget;
    QContextMenuEvent inTarget(QContextMenuEvent::Mouse, target->mapFrom(widget, pos),
                               widget->mapToGlobal(pos));
    QApplication::sendEvent(target, &inTarget);
}

void TestKrPropertiesView::listsVisibleProperties()
{
    QStringList names;
    for (KrPropertyWgt* w : m_view->getPropertyWidgets())
        names << w->getFirstProperty()->getName();
    QCOMPARE(names, QStringList({QStringLiteral("Alpha"), QStringLiteral("Beta")}));
    QVERIFY(m_view->findGroup(QStringLiteral("/Group/Sub")));
}

void TestKrPropertiesView::followsElement()
{
    auto* gamma = new KrFloatProperty(QStringLiteral("Gamma"), 0.0, m_element.get());
    m_element->addProperty(gamma);
    QVERIFY(widgetFor(QStringLiteral("Gamma")));
    m_hidden->setHidden(false);
    m_element->setProperties(m_element->getProperties());
    QVERIFY(widgetFor(QStringLiteral("Secret")));

    // Another element: the old one's changes no longer reach the view.
    KrElement other(QStringLiteral("Other"));
    auto* only = new KrFloatProperty(QStringLiteral("Only"), 0.0, &other);
    other.addProperty(only);
    m_view->setElement(&other);
    QCOMPARE(m_view->getPropertyWidgets().size(), 1);
    m_element->removeProperty(gamma);
    QCOMPARE(m_view->getPropertyWidgets().size(), 1);
    QVERIFY(widgetFor(QStringLiteral("Only")));

    m_view->setElement(nullptr);
    QVERIFY(m_view->getPropertyWidgets().isEmpty());
}

void TestKrPropertiesView::ignoresChangesWhileClosing()
{
    krApp->setClosing(true);
    m_element->addProperty(new KrFloatProperty(QStringLiteral("Late"), 0.0, m_element.get()));
    krApp->setClosing(false);
    QVERIFY(!widgetFor(QStringLiteral("Late")));
    QCOMPARE(m_view->getPropertyWidgets().size(), 2);
}

void TestKrPropertiesView::defaultNames()
{
    QCOMPARE(m_view->defaultPropertyNames(), QStringList(QStringLiteral("Color")));

    KrBrickLight light;
    m_view->setElement(&light);
    QCOMPARE(m_view->defaultPropertyNames(),
             QStringList({"Color", "Intensity", "Shadow Type", "Shadow Bias", "Shadow Softness",
                          "Illumination", "Spread Angle"}));

    KrBrickMaterial material;
    m_view->setElement(&material);
    const QStringList names = m_view->defaultPropertyNames();
    QCOMPARE(names.last(), QStringLiteral("Index of Refraction"));
    const KrDefaultMaterial reference;
    QStringList expected;
    for (int i = 0; i < reference.getNumProperties(); ++i) {
        expected << reference.getProperty(i)->getName();
        if (expected.last() == QLatin1String("Index of Refraction"))
            break;
    }
    QCOMPARE(names, expected);
    QCOMPARE(QSet<QString>(names.begin(), names.end()).size(), names.size());

    m_view->setElement(nullptr);
    QVERIFY(m_view->defaultPropertyNames().isEmpty());
}

void TestKrPropertiesView::renameToAnotherPropertysName()
{
    QStringList menuTexts;
    PathDialogSeen seen;
    chooseFromNextPopup(0, &menuTexts);
    pnAnswerModals({pathAnswer(QStringLiteral("Beta"), true, &seen)});
    contextMenuOn(widgetFor(QStringLiteral("Alpha")));

    QCOMPARE(menuTexts,
             QStringList({QStringLiteral("Change Internal Name"), QStringLiteral("Regroup")}));
    QVERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("Rename Property"));
    QCOMPARE(seen.text, QStringLiteral("Alpha"));
    QCOMPARE(seen.defaults, QStringList(QStringLiteral("Color")));
    // The property that had the name gets a free variant first.
    QCOMPARE(m_a->getName(), QStringLiteral("Beta"));
    QCOMPARE(m_b->getName(), QStringLiteral("Beta1"));
}

void TestKrPropertiesView::renameToOwnName()
{
    QStringList menuTexts;
    PathDialogSeen seen;
    chooseFromNextPopup(0, &menuTexts);
    pnAnswerModals({pathAnswer(QStringLiteral("Beta"), true, &seen)});
    contextMenuOn(widgetFor(QStringLiteral("Beta")));
    QVERIFY(seen.handled);
    QCOMPARE(m_b->getName(), QStringLiteral("Beta"));
    QCOMPARE(m_a->getName(), QStringLiteral("Alpha"));
}

void TestKrPropertiesView::cancelledRenameChangesNothing()
{
    QStringList menuTexts;
    PathDialogSeen seen;
    chooseFromNextPopup(0, &menuTexts);
    pnAnswerModals({pathAnswer(QStringLiteral("Beta"), false, &seen)});
    contextMenuOn(widgetFor(QStringLiteral("Alpha")));
    QVERIFY(seen.handled);
    QCOMPARE(m_a->getName(), QStringLiteral("Alpha"));
    QCOMPARE(m_b->getName(), QStringLiteral("Beta"));
}

void TestKrPropertiesView::regroup()
{
    QStringList menuTexts;
    PathDialogSeen seen;
    chooseFromNextPopup(1, &menuTexts);
    pnAnswerModals({pathAnswer(QStringLiteral("/New Group"), true, &seen)});
    contextMenuOn(widgetFor(QStringLiteral("Alpha")));

    QVERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("Create New Property Group Path..."));
    // The box shows the path without its first character; the suggestions are full paths.
    QCOMPARE(seen.text, QStringLiteral("Group/Sub"));
    QCOMPARE(seen.defaults, QStringList({QStringLiteral("/Group/Sub"), QStringLiteral("/"),
                                         QStringLiteral("/Other")}));
    QCOMPARE(m_a->getPath(), QStringLiteral("/New Group"));
    QApplication::processEvents();
    QVERIFY(m_view->findGroup(QStringLiteral("/New Group")));
    QVERIFY(widgetFor(QStringLiteral("Alpha")));
}

void TestKrPropertiesView::rightClickOutsideShowsNoMenu()
{
    bool popped = false;
    QTimer::singleShot(50, [&popped]() {
        if (QWidget* popup = QApplication::activePopupWidget()) {
            popped = true;
            popup->close();
        }
    });
    QWidget* viewport = m_view->viewport();
    const QPoint corner(viewport->width() - 3, viewport->height() - 3);
    QContextMenuEvent event(QContextMenuEvent::Mouse, corner, viewport->mapToGlobal(corner));
    QApplication::sendEvent(viewport, &event);
    QTest::qWait(100);
    QVERIFY(!popped);
    QCOMPARE(m_a->getName(), QStringLiteral("Alpha"));
}

QTEST_MAIN(TestKrPropertiesView)
#include "tst_krpropertiesview.moc"
