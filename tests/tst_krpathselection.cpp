// The path selection widget and the group path dialog that shows it.
#include "krgrouppathdlg.h"
#include "krpathselectionwgt.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QLabel>
#include <QLayout>
#include <QLineEdit>
#include <QPushButton>
#include <QtTest>
#include <functional>

namespace {

// Runs the dialog modally and lets act() drive it once it is the active modal widget.
// A watchdog ends a dialog nobody closed, so a broken flow fails instead of hanging.
int runDialog(QDialog& dialog, const std::function<void(QDialog*)>& act)
{
    bool acted = false;
    QTimer::singleShot(0, &dialog, [&] {
        if (QApplication::activeModalWidget() == &dialog) {
            acted = true;
            act(&dialog);
        }
    });
    QTimer::singleShot(5000, &dialog, [&] { dialog.done(-7); });
    const int result = dialog.exec();
    return acted ? result : -8;
}

QStringList comboEntries(const QComboBox* combo)
{
    QStringList entries;
    for (int i = 0; i < combo->count(); ++i)
        entries << combo->itemText(i);
    return entries;
}

} // namespace

class TestKrPathSelection : public QObject
{
    Q_OBJECT
private slots:
    void layout();
    void setDefaults_data();
    void setDefaults();
    void chooseSuggestion();
    void setPathTextSelectsAll();
    void dialogFlow_data();
    void dialogFlow();
};

void TestKrPathSelection::layout()
{
    KrPathSelectionWgt widget(nullptr, QStringLiteral("Path:"), QStringLiteral("Path Defaults:"),
                              QStringLiteral("PathSel"));
    QCOMPARE(widget.objectName(), QStringLiteral("PathSel"));
    const QList<QLabel*> labels = widget.findChildren<QLabel*>();
    QCOMPARE(labels.size(), 2);
    QCOMPARE(labels.at(0)->text(), QStringLiteral("Path Defaults:"));
    QCOMPARE(labels.at(0)->buddy(), widget.getCombo());
    QCOMPARE(labels.at(1)->text(), QStringLiteral("Path:"));
    QCOMPARE(labels.at(1)->buddy(), widget.getEdit());
    for (QLabel* label : labels)
        QCOMPARE(label->width(), 80);
    QCOMPARE(widget.getCombo()->minimumWidth(), 300);
    QCOMPARE(widget.layout()->contentsMargins(), QMargins(5, 5, 5, 5));

    // The suggestions row sits above the value row.
    widget.show();
    QVERIFY(widget.getCombo()->y() < widget.getEdit()->y());
    QVERIFY(labels.at(0)->x() < widget.getCombo()->x());
    QCOMPARE(widget.focusProxy(), widget.getEdit());
}

void TestKrPathSelection::setDefaults_data()
{
    QTest::addColumn<QStringList>("first");
    QTest::addColumn<bool>("twice");
    QTest::addColumn<QStringList>("second");
    QTest::addColumn<QString>("edited"); // the edit's text before setDefaults
    QTest::addColumn<QStringList>("entries");
    QTest::addColumn<QString>("text");

    QTest::newRow("one list") << QStringList{"Color/Diffuse", "Color/Specular", "Bump"} << false
                              << QStringList() << "typed"
                              << QStringList{"Color/Diffuse", "Color/Specular", "Bump"}
                              << "Color/Diffuse";
    QTest::newRow("empty list keeps the edit")
        << QStringList() << false << QStringList() << "typed" << QStringList() << "typed";
    QTest::newRow("replaced by a second list")
        << QStringList{"A", "B"} << true << QStringList{"C/D/E", "F"} << ""
        << QStringList{"C/D/E", "F"} << "C/D/E";
    QTest::newRow("emptied by a second list")
        << QStringList{"A", "B"} << true << QStringList{} << "" << QStringList() << "A";
    QTest::newRow("duplicates and blanks kept whole")
        << QStringList{"My Group/Sub", "My Group/Sub", " "} << false << QStringList() << ""
        << QStringList{"My Group/Sub", "My Group/Sub", " "} << "My Group/Sub";
}

// Suggestions are listed whole and in order; the first one is offered in the edit.
void TestKrPathSelection::setDefaults()
{
    QFETCH(QStringList, first);
    QFETCH(bool, twice);
    QFETCH(QStringList, second);
    QFETCH(QString, edited);
    QFETCH(QStringList, entries);
    QFETCH(QString, text);

    KrPathSelectionWgt widget(nullptr, QStringLiteral("Name"), QStringLiteral("Default Names"),
                              QString());
    widget.getEdit()->setText(edited);
    widget.setDefaults(first);
    if (twice)
        widget.setDefaults(second);
    QCOMPARE(comboEntries(widget.getCombo()), entries);
    QCOMPARE(widget.getPathText(), text);
    QCOMPARE(widget.getCombo()->currentIndex(), entries.isEmpty() ? -1 : 0);
}

// Picking a suggestion replaces the whole value; typing afterwards edits the copy only.
void TestKrPathSelection::chooseSuggestion()
{
    KrPathSelectionWgt widget(nullptr, QStringLiteral("Path:"), QStringLiteral("Path Defaults:"),
                              QString());
    widget.setDefaults({"Surface", "Surface/Bump", "Lighting/Rim"});
    widget.setPathText(QStringLiteral("Something typed earlier"));
    widget.show();
    QVERIFY(QTest::qWaitForWindowExposed(&widget));

    QComboBox* combo = widget.getCombo();
    combo->setFocus();
    QTest::keyClick(combo, Qt::Key_Down);
    QCOMPARE(combo->currentText(), QStringLiteral("Surface/Bump"));
    QCOMPARE(widget.getPathText(), QStringLiteral("Surface/Bump"));

    QLineEdit* edit = widget.getEdit();
    edit->setFocus();
    edit->end(false);
    QTest::keyClicks(edit, QStringLiteral("/Fine"));
    QCOMPARE(widget.getPathText(), QStringLiteral("Surface/Bump/Fine"));
    QCOMPARE(combo->itemText(1), QStringLiteral("Surface/Bump"));
    QCOMPARE(combo->count(), 3);

    // Changing the current entry from code is no choice of the user's: the value stays.
    combo->setCurrentIndex(2);
    QCOMPARE(widget.getPathText(), QStringLiteral("Surface/Bump/Fine"));
}

void TestKrPathSelection::setPathTextSelectsAll()
{
    KrPathSelectionWgt widget(nullptr, QStringLiteral("Path:"), QStringLiteral("Path Defaults:"),
                              QString());
    widget.setDefaults({"First/Default"});
    widget.setPathText(QStringLiteral("Current/Path"));
    QCOMPARE(widget.getPathText(), QStringLiteral("Current/Path"));
    QCOMPARE(widget.getEdit()->selectedText(), QStringLiteral("Current/Path"));
    QCOMPARE(widget.getCombo()->currentText(), QStringLiteral("First/Default"));

    // Typing replaces the selected value.
    QTest::keyClicks(widget.getEdit(), QStringLiteral("New"));
    QCOMPARE(widget.getPathText(), QStringLiteral("New"));
}

void TestKrPathSelection::dialogFlow_data()
{
    QTest::addColumn<QString>("how"); // ok, cancel, escape, return, suggestion
    QTest::addColumn<int>("result");
    QTest::addColumn<QString>("path");

    QTest::newRow("typed and Ok") << "ok" << int(QDialog::Accepted) << "Layers/Top";
    QTest::newRow("typed and Return") << "return" << int(QDialog::Accepted) << "Layers/Top";
    QTest::newRow("suggestion and Ok") << "suggestion" << int(QDialog::Accepted) << "Shading";
    // The edit still holds what was typed; the callers ignore it after a rejection.
    QTest::newRow("typed and Cancel") << "cancel" << int(QDialog::Rejected) << "Layers/Top";
    QTest::newRow("typed and Escape") << "escape" << int(QDialog::Rejected) << "Layers/Top";
}

// The dialog as the properties view runs it: suggestions first, then the current path.
void TestKrPathSelection::dialogFlow()
{
    QFETCH(QString, how);
    QFETCH(int, result);
    QFETCH(QString, path);

    KrGroupPathDlg dialog(nullptr, QStringLiteral("Path:"), QStringLiteral("Path Defaults:"),
                          QStringLiteral("GroupPathDlg"));
    QCOMPARE(dialog.objectName(), QStringLiteral("GroupPathDlg"));
    QCOMPARE(dialog.windowTitle(), QStringLiteral("Create New Property Group Path..."));
    dialog.setDefaults({"Surface/Bump", "Shading"});
    dialog.setPath(QStringLiteral("Surface/Color"));

    QStringList seenEntries;
    QString seenPath;
    QString seenSelection;
    bool editHadFocus = false;
    const int answer = runDialog(dialog, [&](QDialog* d) {
        KrPathSelectionWgt* selection = dialog.getPathSelection();
        QLineEdit* edit = selection->getEdit();
        seenEntries = comboEntries(selection->getCombo());
        seenPath = edit->text();
        seenSelection = edit->selectedText();
        editHadFocus = d->focusWidget() == edit;
        auto* box = d->findChild<QDialogButtonBox*>();
        if (how == "suggestion") {
            selection->getCombo()->setFocus();
            QTest::keyClick(selection->getCombo(), Qt::Key_Down);
            QTest::mouseClick(box->button(QDialogButtonBox::Ok), Qt::LeftButton);
            return;
        }
        edit->setFocus();
        QTest::keyClicks(edit, QStringLiteral("Layers/Top"));
        if (how == "ok")
            QTest::mouseClick(box->button(QDialogButtonBox::Ok), Qt::LeftButton);
        else if (how == "cancel")
            QTest::mouseClick(box->button(QDialogButtonBox::Cancel), Qt::LeftButton);
        else if (how == "escape")
            QTest::keyClick(edit, Qt::Key_Escape);
        else
            QTest::keyClick(edit, Qt::Key_Return);
    });

    QCOMPARE(seenEntries, (QStringList{"Surface/Bump", "Shading"}));
    QCOMPARE(seenPath, QStringLiteral("Surface/Color"));
    QCOMPARE(seenSelection, QStringLiteral("Surface/Color"));
    QVERIFY(editHadFocus);
    QCOMPARE(answer, result);
    QCOMPARE(dialog.getPath(), path);
}

QTEST_MAIN(TestKrPathSelection)
#include "tst_krpathselection.moc"
