#include "krbasicdialog.h"

#include <QDialogButtonBox>
#include <QPushButton>
#include <QVBoxLayout>

struct KrBasicDialog::Private
{
    QVBoxLayout* layout = nullptr;
    QDialogButtonBox* buttons = nullptr;
};

KrBasicDialog::KrBasicDialog(QWidget* parent, const QString& name) : QDialog(parent), d(new Private)
{
    setObjectName(name);
    d->layout = new QVBoxLayout(this);
    d->buttons = new QDialogButtonBox(QDialogButtonBox::Ok | QDialogButtonBox::Cancel, this);
    d->layout->addWidget(d->buttons);
    connect(d->buttons, &QDialogButtonBox::accepted, this, &QDialog::accept);
    connect(d->buttons, &QDialogButtonBox::rejected, this, &QDialog::reject);
    if (QPushButton* ok = d->buttons->button(QDialogButtonBox::Ok))
        ok->setDefault(true);
}

KrBasicDialog::~KrBasicDialog() = default;

void KrBasicDialog::addWidget(QWidget* widget, int stretch)
{
    if (!widget)
        return;
    // Above the button box, which stays last.
    d->layout->insertWidget(d->layout->indexOf(d->buttons), widget, stretch);
}

QDialogButtonBox* KrBasicDialog::getButtonBox() const
{
    return d->buttons;
}

QVBoxLayout* KrBasicDialog::getLayout() const
{
    return d->layout;
}
