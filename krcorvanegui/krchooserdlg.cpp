#include "krchooserdlg.h"

#include "ui_krcorvanechooserdlg.h"

#include "krbrickuser.h"
#include "krcorvanepane.h"

namespace {

int brickUserTypeId()
{
    static const int id = qRegisterMetaType<IKrBrickUser*>("IKrBrickUser*");
    return id;
}

} // namespace

KrCorvaneChooser::KrCorvaneChooser(const QString& title, const QList<IKrBrickUser*>& userTypes,
                                   KrCorvanePaneMainWgt* mainWgt, QWidget* parent)
    : QDialog(parent, Qt::WindowFlags()), m_ui(new Ui::KrChooserDialog), m_mainWgt(mainWgt)
{
    m_ui->setupUi(this);
    setWindowTitle(title);
    brickUserTypeId();
    for (IKrBrickUser* prototype : userTypes) {
        if (!prototype)
            continue;
        m_ui->selectionBox->insertItem(m_ui->selectionBox->count(), prototype->getTypeLabel(),
                                       QVariant::fromValue(prototype));
    }
    connect(m_ui->selectionBox, QOverload<int>::of(&QComboBox::currentIndexChanged), this,
            &KrCorvaneChooser::updateDefaultName);
    updateDefaultName();
}

KrCorvaneChooser::~KrCorvaneChooser() = default;

QLabel* KrCorvaneChooser::getNameLabel() const
{
    return m_ui->nameLabel;
}

QLineEdit* KrCorvaneChooser::getNameBox() const
{
    return m_ui->nameBox;
}

QComboBox* KrCorvaneChooser::getSelectionBox() const
{
    return m_ui->selectionBox;
}

IKrBrickUser* KrCorvaneChooser::getSelectedBrickUser() const
{
    if (m_ui->selectionBox->count() == 0)
        return nullptr;
    const QVariant data = m_ui->selectionBox->currentData(Qt::UserRole);
    if (!data.isValid() || data.userType() != brickUserTypeId())
        return nullptr;
    return data.value<IKrBrickUser*>();
}

QString KrCorvaneChooser::getNameText() const
{
    return m_ui->nameBox->text();
}

QString KrCorvaneChooser::uniqueName(const QString& base, const QStringList& takenNames)
{
    QString candidate = base;
    for (int counter = 0; takenNames.contains(candidate, Qt::CaseSensitive); ++counter)
        candidate = base + QStringLiteral("_%1").arg(counter);
    return candidate;
}

void KrCorvaneChooser::updateDefaultName()
{
    IKrBrickUser* prototype = getSelectedBrickUser();
    if (!prototype)
        return;
    const QString base = prototype->getTypeLabel();
    const QString name =
        m_mainWgt ? m_mainWgt->uniqueBrickUserName(base) : uniqueName(base, QStringList());
    m_ui->nameBox->setText(name);
}
