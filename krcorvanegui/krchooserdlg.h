#pragma once

#include "krbrickuser.h"

#include <QDialog>
#include <QList>
#include <QStringList>
#include <memory>

class QComboBox;
class QLabel;
class QLineEdit;

namespace Ui {
class KrChooserDialog;
}

class IKrBrickUser;
class KrCorvanePaneMainWgt;

// Picks the kind of a brick user and, for a new one, its name. The kinds are the host's
// prototypes; the name proposed is unique among the brick users open in the pane.
class KrCorvaneChooser : public QDialog
{
    Q_OBJECT
public:
    KrCorvaneChooser(const QString& title, const QList<IKrBrickUser*>& userTypes,
                     KrCorvanePaneMainWgt* mainWgt, QWidget* parent);
    ~KrCorvaneChooser() override;

    // The prototype of the current entry, or null.
    IKrBrickUser* getSelectedBrickUser() const;
    // The name box's text as typed.
    QString getNameText() const;

    QLabel* getNameLabel() const;
    QLineEdit* getNameBox() const;
    QComboBox* getSelectionBox() const;

    // base, else base_0, base_1, ...: the first that none of takenNames equals (exact,
    // case-sensitive).
    static QString uniqueName(const QString& base, const QStringList& takenNames);

public slots:
    void updateDefaultName();

private:
    std::unique_ptr<Ui::KrChooserDialog> m_ui;
    KrCorvanePaneMainWgt* m_mainWgt;
};

Q_DECLARE_METATYPE(IKrBrickUser*)
