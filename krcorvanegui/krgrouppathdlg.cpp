#include "krgrouppathdlg.h"

#include "krpathselectionwgt.h"

struct KrGroupPathDlg::Private
{
    KrPathSelectionWgt* selection = nullptr;
};

KrGroupPathDlg::KrGroupPathDlg(QWidget* parent, const QString& label, const QString& defaultsLabel,
                               const QString& name)
    : KrBasicDialog(parent, name), d(new Private)
{
    d->selection = new KrPathSelectionWgt(this, label, defaultsLabel, QString());
    addWidget(d->selection, 0);
    setWindowTitle(QStringLiteral("Create New Property Group Path..."));
    d->selection->setFocus();
}

KrGroupPathDlg::~KrGroupPathDlg() = default;

void KrGroupPathDlg::setDefaults(const QStringList& defaults)
{
    d->selection->setDefaults(defaults);
}

void KrGroupPathDlg::setPath(const QString& path)
{
    d->selection->setPathText(path);
}

QString KrGroupPathDlg::getPath() const
{
    return d->selection->getPathText();
}

KrPathSelectionWgt* KrGroupPathDlg::getPathSelection() const
{
    return d->selection;
}
