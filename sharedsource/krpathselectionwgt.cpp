#include "krpathselectionwgt.h"

#include <QComboBox>
#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QVBoxLayout>

struct KrPathSelectionWgt::Private
{
    QComboBox* combo = nullptr;
    QLineEdit* edit = nullptr;
};

KrPathSelectionWgt::KrPathSelectionWgt(QWidget* parent, const QString& label,
                                       const QString& defaultsLabel, const QString& name)
    : QWidget(parent), d(new Private)
{
    setObjectName(name);

    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(5, 5, 5, 5);

    auto* defaultsRow = new QHBoxLayout;
    defaultsRow->setSpacing(0);
    auto* defaultsLabelWgt = new QLabel(defaultsLabel, this);
    defaultsLabelWgt->setFixedWidth(80);
    d->combo = new QComboBox(this);
    d->combo->setMinimumWidth(300);
    defaultsLabelWgt->setBuddy(d->combo);
    defaultsRow->addWidget(defaultsLabelWgt);
    defaultsRow->addWidget(d->combo);
    layout->addLayout(defaultsRow);

    auto* valueRow = new QHBoxLayout;
    valueRow->setSpacing(0);
    auto* valueLabel = new QLabel(label, this);
    valueLabel->setFixedWidth(80);
    d->edit = new QLineEdit(this);
    valueLabel->setBuddy(d->edit);
    valueRow->addWidget(valueLabel);
    valueRow->addWidget(d->edit);
    layout->addLayout(valueRow);

    // The value is what the user confirms, so focus lands there rather than on the suggestions.
    setFocusProxy(d->edit);

    connect(d->combo, &QComboBox::textActivated, d->edit, &QLineEdit::setText);
}

KrPathSelectionWgt::~KrPathSelectionWgt() = default;

void KrPathSelectionWgt::setDefaults(const QStringList& defaults)
{
    d->combo->clear();
    d->combo->insertItems(0, defaults);
    if (defaults.isEmpty())
        return;
    d->combo->setCurrentIndex(0);
    d->edit->setText(defaults.first());
}

void KrPathSelectionWgt::setPathText(const QString& text)
{
    d->edit->setText(text);
    d->edit->selectAll();
}

QString KrPathSelectionWgt::getPathText() const
{
    return d->edit->text();
}

QComboBox* KrPathSelectionWgt::getCombo() const
{
    return d->combo;
}

QLineEdit* KrPathSelectionWgt::getEdit() const
{
    return d->edit;
}
