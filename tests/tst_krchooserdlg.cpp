// The chooser of a brick-user kind and name, and the unique names it proposes.
#include "krbrickmaterial.h"
#include "krchooserdlg.h"
#include "krcorvaneutility.h"
#include "krmainwindow.h"
#include "pane_testsupport.h"

#include <QComboBox>
#include <QDialogButtonBox>
#include <QLineEdit>
#include <QPushButton>
#include <QtTest>

class TestKrChooserDlg : public QObject
{
    Q_OBJECT

private slots:
    void init();
    void cleanup();

    void uniqueName_data();
    void uniqueName();
    void listsKindsWithTheirPrototypes();
    void changingKindReplacesTypedName();
    void sameLabelsStayApart();
    void noKinds();
    void acceptedChoice();

private:
    QList<IKrBrickUser*> m_kinds;
    std::unique_ptr<KrPaneTestEnv> m_env;
};

void TestKrChooserDlg::init()
{
    m_env.reset(new KrPaneTestEnv);
    KrCorvaneUtility::getBrickUserList(m_kinds);
}

void TestKrChooserDlg::cleanup()
{
    for (IKrBrickUser* kind : m_kinds)
        kind->release();
    m_kinds.clear();
    m_env.reset();
}

void TestKrChooserDlg::uniqueName_data()
{
    QTest::addColumn<QStringList>("taken");
    QTest::addColumn<QString>("expected");
    QTest::newRow("free") << QStringList() << QStringLiteral("Mat");
    QTest::newRow("first clash") << QStringList({"Mat"}) << QStringLiteral("Mat_0");
    QTest::newRow("second clash") << QStringList({"Mat_0", "Mat"}) << QStringLiteral("Mat_1");
    QTest::newRow("base free") << QStringList({"Mat_0"}) << QStringLiteral("Mat");
    QTest::newRow("case counts") << QStringList({"mat", "MAT"}) << QStringLiteral("Mat");
    QTest::newRow("gap") << QStringList({"Mat", "Mat_1"}) << QStringLiteral("Mat_0");
    QTest::newRow("run") << QStringList({"Mat_2", "Mat_1", "Mat", "Mat_0"})
                         << QStringLiteral("Mat_3");
}

void TestKrChooserDlg::uniqueName()
{
    QFETCH(QStringList, taken);
    QFETCH(QString, expected);
    QCOMPARE(KrCorvaneChooser::uniqueName(QStringLiteral("Mat"), taken), expected);
}

void TestKrChooserDlg::listsKindsWithTheirPrototypes()
{
    KrCorvaneChooser chooser(QStringLiteral("New"), m_kinds, nullptr, m_env->mainWindow());
    QCOMPARE(chooser.windowTitle(), QStringLiteral("New"));
    QComboBox* box = chooser.getSelectionBox();
    QCOMPARE(box->count(), m_kinds.size());
    for (int i = 0; i < m_kinds.size(); ++i) {
        QCOMPARE(box->itemText(i), m_kinds.at(i)->getTypeLabel());
        box->setCurrentIndex(i);
        QCOMPARE(chooser.getSelectedBrickUser(), m_kinds.at(i));
    }
    QCOMPARE(box->itemData(0, Qt::UserRole).typeName(), "IKrBrickUser*");
}

void TestKrChooserDlg::changingKindReplacesTypedName()
{
    KrCorvaneChooser chooser(QStringLiteral("New"), m_kinds, nullptr, m_env->mainWindow());
    QCOMPARE(chooser.getNameText(), m_kinds.at(0)->getTypeLabel());
    chooser.getNameBox()->setText(QStringLiteral("  typed name "));
    QCOMPARE(chooser.getNameText(), QStringLiteral("  typed name "));
    chooser.getSelectionBox()->setCurrentIndex(1);
    QCOMPARE(chooser.getNameText(), m_kinds.at(1)->getTypeLabel());
}

void TestKrChooserDlg::sameLabelsStayApart()
{
    KrBrickMaterial first;
    KrBrickMaterial second;
    KrCorvaneChooser chooser(QStringLiteral("New"), {&first, &second}, nullptr,
                             m_env->mainWindow());
    QComboBox* box = chooser.getSelectionBox();
    QCOMPARE(box->itemText(0), box->itemText(1));
    box->setCurrentIndex(1);
    QCOMPARE(chooser.getSelectedBrickUser(), static_cast<IKrBrickUser*>(&second));
    box->setCurrentIndex(0);
    QCOMPARE(chooser.getSelectedBrickUser(), static_cast<IKrBrickUser*>(&first));
}

void TestKrChooserDlg::noKinds()
{
    KrCorvaneChooser chooser(QStringLiteral("Read from scene"), {}, nullptr, m_env->mainWindow());
    QCOMPARE(chooser.getSelectionBox()->count(), 0);
    QVERIFY(chooser.getNameText().isEmpty());
    pnAnswerModals({[](QWidget* w) {
        auto* box = w->findChild<QDialogButtonBox*>(QStringLiteral("buttonBox"));
        box->button(QDialogButtonBox::Ok)->click();
    }});
    QCOMPARE(chooser.exec(), int(QDialog::Accepted));
    QVERIFY(!chooser.getSelectedBrickUser());
}

void TestKrChooserDlg::acceptedChoice()
{
    KrCorvaneChooser chooser(QStringLiteral("New"), m_kinds, nullptr, m_env->mainWindow());
    KrModalSeen seen;
    pnAnswerModals({[&seen](QWidget* w) {
        seen.handled = true;
        seen.title = w->windowTitle();
        auto* box = w->findChild<QComboBox*>(QStringLiteral("selectionBox"));
        box->setCurrentIndex(2);
        auto* name = w->findChild<QLineEdit*>(QStringLiteral("nameBox"));
        QTest::keyClicks(name, QStringLiteral("x"));
        QTest::keyClick(name, Qt::Key_Return);
    }});
    QCOMPARE(chooser.exec(), int(QDialog::Accepted));
    QVERIFY(seen.handled);
    QCOMPARE(seen.title, QStringLiteral("New"));
    QCOMPARE(chooser.getSelectedBrickUser(), m_kinds.at(2));
    QCOMPARE(chooser.getNameText(), m_kinds.at(2)->getTypeLabel() + QStringLiteral("x"));
}

QTEST_MAIN(TestKrChooserDlg)
#include "tst_krchooserdlg.moc"
