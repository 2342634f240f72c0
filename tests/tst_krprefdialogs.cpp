// The preference dialogs, driven as a user drives them: the pane's layout preferences in the
// application settings, and one brick-user window's name and direction.
#include "krappsettings.h"
#include "krbrickuser.h"
#include "krcorvanedockwidget.h"
#include "krprefdialogs.h"

#include <QAction>
#include <QCheckBox>
#include <QDialogButtonBox>
#include <QLabel>
#include <QLineEdit>
#include <QPushButton>
#include <QStandardPaths>
#include <QStyleOptionButton>
#include <QTemporaryDir>
#include <QtTest>
#include <functional>

namespace {

// A brick-user kind of its own, so the dialog sees a real brick user.
class PrefsTestMaterial : public KrBrickUserElement
{
public:
    explicit PrefsTestMaterial(const QString& name) : KrBrickUserElement(name) {}
    QString getTypeLabel() const override { return QStringLiteral("Test Material"); }
    QString getFileExtension() const override { return QStringLiteral(".ktm"); }
    IKrBrickUser* createNew() override { return new PrefsTestMaterial(QString()); }
};

// Runs the dialog modally and lets act() drive it once it is the active modal widget.
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

// Closes the dialog the way named: "ok", "cancel", "escape" or "return".
void finish(QDialog* dialog, const QString& how)
{
    auto* box = dialog->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"));
    if (how == QLatin1String("ok"))
        QTest::mouseClick(box->button(QDialogButtonBox::Ok), Qt::LeftButton);
    else if (how == QLatin1String("cancel"))
        QTest::mouseClick(box->button(QDialogButtonBox::Cancel), Qt::LeftButton);
    else if (how == QLatin1String("escape"))
        QTest::keyClick(dialog, Qt::Key_Escape);
    else
        QTest::keyClick(dialog->focusWidget() ? dialog->focusWidget() : dialog, Qt::Key_Return);
}

// Clicks the box's indicator, where a user clicks a check box without text.
void clickCheck(QCheckBox* check)
{
    QStyleOptionButton option;
    option.initFrom(check);
    const QRect indicator =
        check->style()->subElementRect(QStyle::SE_CheckBoxIndicator, &option, check);
    QTest::mouseClick(check, Qt::LeftButton, Qt::NoModifier, indicator.center());
}

// -1: no value stored; 0 or 1: the stored bool.
int storedValue(const QString& key)
{
    KrAppSettings settings;
    settings.pushPath(QStringLiteral("DuderOvid"));
    if (!settings.contains(key))
        return -1;
    return settings.getBoolValue(key, false) ? 1 : 0;
}

void store(const QString& key, int value)
{
    KrAppSettings settings;
    settings.pushPath(QStringLiteral("DuderOvid"));
    if (value < 0)
        settings.removeValue(key);
    else
        settings.setBoolValue(key, value == 1);
}

} // namespace

class TestKrPrefDialogs : public QObject
{
    Q_OBJECT
private slots:
    void initTestCase();
    void init();
    void generalDialog_data();
    void generalDialog();
    void generalDialogOtherKeysUntouched();
    void brickDialog_data();
    void brickDialog();
    void brickDialogRejectsEmptyName();
    void brickDialogFromWindow();
    void windowPreferences_data();
    void windowPreferences();

private:
    QTemporaryDir m_storage;
};

void TestKrPrefDialogs::initTestCase()
{
    QStandardPaths::setTestModeEnabled(true);
    QVERIFY(m_storage.isValid());
    KrAppSettings::setStorageFolder(m_storage.path());
}

void TestKrPrefDialogs::init()
{
    store(QStringLiteral("TabsRight"), -1);
    store(QStringLiteral("RightToLeft"), -1);
}

void TestKrPrefDialogs::generalDialog_data()
{
    QTest::addColumn<int>("tabsRight"); // stored before: -1 none, 0 false, 1 true
    QTest::addColumn<int>("rightToLeft");
    QTest::addColumn<bool>("clickDuderOvid");
    QTest::addColumn<bool>("clickOutputs");
    QTest::addColumn<QString>("how");
    QTest::addColumn<bool>("duderOvidShown"); // the boxes as the dialog opens
    QTest::addColumn<bool>("outputsShown");
    QTest::addColumn<int>("tabsRightAfter");
    QTest::addColumn<int>("rightToLeftAfter");

    QTest::newRow("nothing stored, Ok")
        << -1 << -1 << false << false << "ok" << true << true << 1 << 1;
    QTest::newRow("nothing stored, cancel")
        << -1 << -1 << true << true << "cancel" << true << true << -1 << -1;
    QTest::newRow("nothing stored, escape")
        << -1 << -1 << true << false << "escape" << true << true << -1 << -1;
    QTest::newRow("uncheck outputs, Ok")
        << 1 << 1 << false << true << "ok" << true << true << 1 << 0;
    QTest::newRow("uncheck duderovid, Return")
        << 1 << 1 << true << false << "return" << true << true << 0 << 1;
    QTest::newRow("stored false shown, both back on")
        << 0 << 0 << true << true << "ok" << false << false << 1 << 1;
    QTest::newRow("mixed stored, cancel keeps it")
        << 0 << 1 << true << true << "cancel" << false << true << 0 << 1;
}

// The boxes show the stored values (both checked when none are stored), and the values are
// written only when the dialog is accepted.
void TestKrPrefDialogs::generalDialog()
{
    QFETCH(int, tabsRight);
    QFETCH(int, rightToLeft);
    QFETCH(bool, clickDuderOvid);
    QFETCH(bool, clickOutputs);
    QFETCH(QString, how);
    QFETCH(bool, duderOvidShown);
    QFETCH(bool, outputsShown);
    QFETCH(int, tabsRightAfter);
    QFETCH(int, rightToLeftAfter);

    store(QStringLiteral("TabsRight"), tabsRight);
    store(QStringLiteral("RightToLeft"), rightToLeft);

    KrGenerealPrefDialog dialog(QStringLiteral("Duderovid Preferences..."), nullptr);
    QCOMPARE(dialog.windowTitle(), QStringLiteral("Duderovid Preferences..."));
    bool shownDuderOvid = false;
    bool shownOutputs = false;
    int storedWhileOpen = -2;
    const int result = runDialog(dialog, [&](QDialog* d) {
        auto* duderOvid = d->findChild<QCheckBox*>(QStringLiteral("duderOvidCheck"));
        auto* outputs = d->findChild<QCheckBox*>(QStringLiteral("outPutsCheck"));
        shownDuderOvid = duderOvid->isChecked();
        shownOutputs = outputs->isChecked();
        if (clickDuderOvid)
            clickCheck(duderOvid);
        if (clickOutputs)
            clickCheck(outputs);
        storedWhileOpen = storedValue(QStringLiteral("RightToLeft"));
        finish(d, how);
    });

    QCOMPARE(shownDuderOvid, duderOvidShown);
    QCOMPARE(shownOutputs, outputsShown);
    QCOMPARE(storedWhileOpen, rightToLeft); // nothing is written while the dialog is open
    const bool accepted = how == "ok" || how == "return";
    QCOMPARE(result, int(accepted ? QDialog::Accepted : QDialog::Rejected));
    QCOMPARE(storedValue(QStringLiteral("TabsRight")), tabsRightAfter);
    QCOMPARE(storedValue(QStringLiteral("RightToLeft")), rightToLeftAfter);
}

// Accepting writes its two keys and leaves the group's other preferences as they were.
void TestKrPrefDialogs::generalDialogOtherKeysUntouched()
{
    {
        KrAppSettings settings;
        settings.pushPath(QStringLiteral("DuderOvid"));
        settings.setBoolValue(QStringLiteral("DividerCollapsed"), true);
        settings.setStringValue(QStringLiteral("LastOpen"), QStringLiteral("/some/folder"));
    }
    KrGenerealPrefDialog dialog(QStringLiteral("Prefs"), nullptr);
    QCOMPARE(runDialog(dialog, [](QDialog* d) { finish(d, QStringLiteral("ok")); }),
             int(QDialog::Accepted));
    KrAppSettings settings;
    settings.pushPath(QStringLiteral("DuderOvid"));
    QVERIFY(settings.getBoolValue(QStringLiteral("DividerCollapsed"), false));
    QCOMPARE(settings.getStringValue(QStringLiteral("LastOpen")), QStringLiteral("/some/folder"));
    QVERIFY(settings.getBoolValue(QStringLiteral("TabsRight"), false));
    QVERIFY(settings.getBoolValue(QStringLiteral("RightToLeft"), false));
}

void TestKrPrefDialogs::brickDialog_data()
{
    QTest::addColumn<bool>("rightToLeft");
    QTest::addColumn<QString>("typed"); // empty: the name is left alone
    QTest::addColumn<bool>("clickDirection");
    QTest::addColumn<QString>("how");
    QTest::addColumn<QString>("name");
    QTest::addColumn<bool>("direction");

    QTest::newRow("rename only") << true << "Granite" << false << "ok"
                                 << "Granite" << true;
    QTest::newRow("flip only") << false << "" << true << "ok"
                               << "Marble" << true;
    QTest::newRow("both, Return") << true << "Slate" << true << "return"
                                  << "Slate" << false;
    QTest::newRow("blanks trimmed") << false << "  Basalt " << false << "ok"
                                    << "Basalt" << false;
}

// The dialog shows the brick user's kind, name and direction, and hands back what was
// edited; it does not rename the brick user itself.
void TestKrPrefDialogs::brickDialog()
{
    QFETCH(bool, rightToLeft);
    QFETCH(QString, typed);
    QFETCH(bool, clickDirection);
    QFETCH(QString, how);
    QFETCH(QString, name);
    QFETCH(bool, direction);

    PrefsTestMaterial material(QStringLiteral("Marble"));
    KrBrickPrefDialog dialog(QStringLiteral("Preferences..."), &material, rightToLeft, nullptr);
    QCOMPARE(dialog.windowTitle(), QStringLiteral("Preferences..."));

    QString label;
    QString shownName;
    bool shownDirection = !rightToLeft;
    bool nameFocused = false;
    const int result = runDialog(dialog, [&](QDialog* d) {
        label = d->findChild<QLabel*>(QStringLiteral("nameLabel"))->text();
        auto* edit = d->findChild<QLineEdit*>(QStringLiteral("nameEdit"));
        auto* check = d->findChild<QCheckBox*>(QStringLiteral("orientationCheck"));
        shownName = edit->text();
        shownDirection = check->isChecked();
        nameFocused = d->focusWidget() == edit;
        if (!typed.isEmpty()) {
            edit->selectAll();
            QTest::keyClicks(edit, typed);
        }
        if (clickDirection)
            clickCheck(check);
        finish(d, how);
    });

    QCOMPARE(label, QStringLiteral("Test Material Name"));
    QCOMPARE(shownName, QStringLiteral("Marble"));
    QCOMPARE(shownDirection, rightToLeft);
    QVERIFY(nameFocused);
    QCOMPARE(result, int(QDialog::Accepted));
    QCOMPARE(dialog.getNameText(), name);
    QCOMPARE(dialog.isRightToLeft(), direction);
    QCOMPARE(material.getName(), QStringLiteral("Marble"));
}

// A blank name cannot be confirmed: Ok is disabled and Return does nothing; Cancel still works.
void TestKrPrefDialogs::brickDialogRejectsEmptyName()
{
    PrefsTestMaterial material(QStringLiteral("Marble"));
    KrBrickPrefDialog dialog(QStringLiteral("Preferences..."), &material, true, nullptr);
    bool okWhileBlank = true;
    bool okAgain = false;
    bool stillOpenAfterReturn = false;
    const int result = runDialog(dialog, [&](QDialog* d) {
        auto* edit = d->findChild<QLineEdit*>(QStringLiteral("nameEdit"));
        auto* ok = d->findChild<QDialogButtonBox*>()->button(QDialogButtonBox::Ok);
        edit->selectAll();
        QTest::keyClicks(edit, QStringLiteral("   "));
        okWhileBlank = ok->isEnabled();
        QTest::keyClick(edit, Qt::Key_Return);
        stillOpenAfterReturn = d->isVisible();
        QTest::keyClicks(edit, QStringLiteral("X"));
        okAgain = ok->isEnabled();
        finish(d, QStringLiteral("cancel"));
    });
    QVERIFY(!okWhileBlank);
    QVERIFY(stillOpenAfterReturn);
    QVERIFY(okAgain);
    QCOMPARE(result, int(QDialog::Rejected));
    QCOMPARE(material.getName(), QStringLiteral("Marble"));
}

// Built from a brick-user window, the dialog takes the window's brick user and direction.
void TestKrPrefDialogs::brickDialogFromWindow()
{
    for (bool rightToLeft : {false, true}) {
        PrefsTestMaterial material(QStringLiteral("Obsidian"));
        KrCorvaneDockWidget window(&material, nullptr, rightToLeft);
        KrBrickPrefDialog dialog(QStringLiteral("Preferences..."), &window, nullptr);
        QCOMPARE(dialog.getNameText(), QStringLiteral("Obsidian"));
        QCOMPARE(dialog.isRightToLeft(), rightToLeft);
        QCOMPARE(dialog.findChild<QLabel*>(QStringLiteral("nameLabel"))->text(),
                 QStringLiteral("Test Material Name"));
    }
}

void TestKrPrefDialogs::windowPreferences_data()
{
    QTest::addColumn<QString>("typed");
    QTest::addColumn<bool>("clickDirection");
    QTest::addColumn<QString>("how");
    QTest::addColumn<QString>("name");
    QTest::addColumn<bool>("direction");
    QTest::addColumn<int>("emitted");

    QTest::newRow("rename") << "Granite" << false << "ok"
                            << "Granite" << true << 1;
    QTest::newRow("flip") << "" << true << "ok"
                          << "Marble" << false << 1;
    QTest::newRow("cancel") << "Granite" << true << "cancel"
                            << "Marble" << true << 0;
}

// The window's "Preferences" action runs the dialog and applies it only when accepted.
void TestKrPrefDialogs::windowPreferences()
{
    QFETCH(QString, typed);
    QFETCH(bool, clickDirection);
    QFETCH(QString, how);
    QFETCH(QString, name);
    QFETCH(bool, direction);
    QFETCH(int, emitted);

    PrefsTestMaterial material(QStringLiteral("Marble"));
    KrCorvaneDockWidget window(&material, nullptr, true);
    QSignalSpy renamed(&window, &KrCorvaneDockWidget::nameChanged);
    QAction* preferences = nullptr;
    for (QAction* action : window.actions()) {
        if (action->text() == QLatin1String("Preferences"))
            preferences = action;
    }
    QVERIFY(preferences);

    bool ran = false;
    QTimer::singleShot(0, &window, [&] {
        auto* dialog = qobject_cast<KrBrickPrefDialog*>(QApplication::activeModalWidget());
        if (!dialog)
            return;
        ran = true;
        auto* edit = dialog->findChild<QLineEdit*>(QStringLiteral("nameEdit"));
        if (!typed.isEmpty()) {
            edit->selectAll();
            QTest::keyClicks(edit, typed);
        }
        if (clickDirection)
            clickCheck(dialog->findChild<QCheckBox*>(QStringLiteral("orientationCheck")));
        finish(dialog, how);
    });
    preferences->trigger();

    QVERIFY(ran);
    QCOMPARE(material.getName(), name);
    QCOMPARE(window.isRightToLeft(), direction);
    QCOMPARE(renamed.count(), emitted);
    if (emitted)
        QCOMPARE(renamed.first().first().toString(), name);
}

QTEST_MAIN(TestKrPrefDialogs)
#include "tst_krprefdialogs.moc"
