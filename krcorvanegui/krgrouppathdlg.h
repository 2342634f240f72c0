#pragma once

#include "krbasicdialog.h"

#include <QStringList>
#include <memory>

class KrPathSelectionWgt;

// Asks for a property's group path (or, retitled, its name), offering suggestions.
// exec() == QDialog::Accepted means the user confirmed getPath().
class KrGroupPathDlg : public KrBasicDialog
{
    Q_OBJECT
public:
    KrGroupPathDlg(QWidget* parent, const QString& label, const QString& defaultsLabel,
                   const QString& name);
    ~KrGroupPathDlg() override;

    void setDefaults(const QStringList& defaults);
    void setPath(const QString& path);
    QString getPath() const;

    KrPathSelectionWgt* getPathSelection() const;

private:
    struct Private;
    std::unique_ptr<Private> d;
};
