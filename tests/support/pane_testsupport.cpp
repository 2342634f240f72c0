#include "pane_testsupport.h"

#include "krcorvaneutility.h"
#include "krdefaultbrickuser.h"
#include "krmainwindow.h"
#include "krsettings.h"
#include "krshaderbrick.h"

#include <QAbstractButton>
#include <QDir>
#include <QStandardPaths>
#include <QFile>
#include <QFileDialog>
#include <QLineEdit>

KrPaneTestEnv::KrPaneTestEnv()
{
    // Test mode puts the data folder under ~/.qttest, per test program; every test starts
    // without saved bricks.
    const QString folder = KrCorvaneUtility::getCustomBrickPath();
    if (QStandardPaths::isTestModeEnabled() && folder.contains(QLatin1String("/.qttest/")))
        QDir(folder).removeRecursively();
    m_window.reset(new KrMainWindow);
}

KrPaneTestEnv::~KrPaneTestEnv() = default;

QString KrPaneTestEnv::brickFolder() const
{
    const QString folder = KrCorvaneUtility::getCustomBrickPath();
    KrCorvaneUtility::createDirs(folder);
    return folder;
}

void pnAnswerModals(const QList<KrModalAnswer>& answers)
{
    if (answers.isEmpty())
        return;
    const KrModalAnswer first = answers.first();
    const QList<KrModalAnswer> rest = answers.mid(1);
    krOnNextModal([first, rest](QWidget* modal) {
        first(modal);
        pnAnswerModals(rest);
    });
}

namespace {

void record(QWidget* modal, KrModalSeen* seen)
{
    if (!seen)
        return;
    seen->handled = true;
    seen->className = QString::fromLatin1(modal->metaObject()->className());
    seen->title = modal->windowTitle();
    if (auto* box = qobject_cast<QMessageBox*>(modal))
        seen->text = box->text();
    if (auto* dialog = qobject_cast<QFileDialog*>(modal))
        seen->nameFilters = dialog->nameFilters();
}

} // namespace

KrModalAnswer pnFileAnswer(const QString& fileName, KrModalSeen* seen)
{
    return [fileName, seen](QWidget* modal) {
        record(modal, seen);
        auto* dialog = qobject_cast<QFileDialog*>(modal);
        if (!dialog) {
            modal->close();
            return;
        }
        // Typed into the name box as a user would.
        if (auto* edit = dialog->findChild<QLineEdit*>(QStringLiteral("fileNameEdit")))
            edit->setText(fileName);
        dialog->selectFile(fileName);
        static_cast<QDialog*>(dialog)->accept();
    };
}

KrModalAnswer pnMessageAnswer(QMessageBox::StandardButton button, KrModalSeen* seen)
{
    return [button, seen](QWidget* modal) {
        record(modal, seen);
        auto* box = qobject_cast<QMessageBox*>(modal);
        if (!box || !box->button(button)) {
            modal->close();
            return;
        }
        box->button(button)->click();
    };
}

KrModalAnswer pnRejectAnswer(KrModalSeen* seen)
{
    return [seen](QWidget* modal) {
        record(modal, seen);
        if (auto* dialog = qobject_cast<QDialog*>(modal))
            dialog->reject();
        else
            modal->close();
    };
}

QByteArray pnReadBytes(const QString& fileName)
{
    QFile file(fileName);
    if (!file.open(QIODevice::ReadOnly))
        return QByteArray();
    return file.readAll();
}

bool pnWriteBytes(const QString& fileName, const QByteArray& bytes)
{
    QFile file(fileName);
    if (!file.open(QIODevice::WriteOnly | QIODevice::Truncate))
        return false;
    return file.write(bytes) == bytes.size();
}

QString pnSavedBrickText(const QString& className, const QString& title)
{
    KrShaderBrick* brick = KrDefaultBrickUser::createBrick(className);
    if (!brick)
        return QString();
    brick->ref();
    brick->setBrickTitle(title);
    KrSettings record;
    KrDefaultBrickUser::writeBrickToSettings(brick, &record, false);
    brick->unref();
    const KrSettings* inner = record.getSettingsValue(record.getKey(0));
    return inner ? inner->toString() : QString();
}
