#include "krprefdialogs.h"

#include "krappsettings.h"
#include "krbrickuser.h"
#include "ui_krbrickuserprefdlg.h"
#include "ui_krgenerealprefsdlg.h"

#include <QPushButton>

namespace {
const char* const SettingsGroup = "DuderOvid";
const char* const TabsRightKey = "TabsRight";
const char* const RightToLeftKey = "RightToLeft";
} // namespace

struct KrBrickPrefDialog::Private
{
    Ui::KrBrikcUserPrefDlgUi ui;
};

KrBrickPrefDialog::KrBrickPrefDialog(const QString& title, IKrBrickUser* brickUser,
                                     bool rightToLeft, QWidget* parent)
    : QDialog(parent), d(new Private)
{
    d->ui.setupUi(this);
    setWindowTitle(title);
    if (brickUser) {
        d->ui.nameLabel->setText(QStringLiteral("%1 Name").arg(brickUser->getTypeLabel()));
        d->ui.nameEdit->setText(brickUser->getName());
    }
    d->ui.orientationCheck->setChecked(rightToLeft);
    d->ui.nameLabel->setBuddy(d->ui.nameEdit);
    d->ui.nameEdit->selectAll();
    d->ui.nameEdit->setFocus();

    // A brick user without a name cannot be told apart in the tabs.
    connect(d->ui.nameEdit, &QLineEdit::textChanged, this, [this] { updateOkButton(); });
    updateOkButton();
}

KrBrickPrefDialog::~KrBrickPrefDialog() = default;

QString KrBrickPrefDialog::getNameText() const
{
    return d->ui.nameEdit->text().trimmed();
}

bool KrBrickPrefDialog::isRightToLeft() const
{
    return d->ui.orientationCheck->isChecked();
}

void KrBrickPrefDialog::updateOkButton()
{
    if (QPushButton* ok = d->ui.buttonBox->button(QDialogButtonBox::Ok))
        ok->setEnabled(!getNameText().isEmpty());
}

struct KrGenerealPrefDialog::Private
{
    Ui::KrDuderOvidPrefsDlg ui;
};

KrGenerealPrefDialog::KrGenerealPrefDialog(const QString& title, QWidget* parent)
    : QDialog(parent), d(new Private)
{
    d->ui.setupUi(this);
    setWindowTitle(title);

    KrAppSettings settings;
    settings.pushPath(QLatin1String(SettingsGroup));
    d->ui.duderOvidCheck->setChecked(settings.getBoolValue(QLatin1String(TabsRightKey), true));
    d->ui.outPutsCheck->setChecked(settings.getBoolValue(QLatin1String(RightToLeftKey), true));
}

KrGenerealPrefDialog::~KrGenerealPrefDialog() = default;

void KrGenerealPrefDialog::accept()
{
    {
        KrAppSettings settings;
        settings.pushPath(QLatin1String(SettingsGroup));
        settings.setBoolValue(QLatin1String(TabsRightKey), d->ui.duderOvidCheck->isChecked());
        settings.setBoolValue(QLatin1String(RightToLeftKey), d->ui.outPutsCheck->isChecked());
    }
    QDialog::accept();
}
