#pragma once

#include "krcore_global.h"

#include <QDialog>
#include <memory>

class QDialogButtonBox;
class QVBoxLayout;

// The host's dialog frame: widgets stacked top to bottom above an Ok/Cancel button box.
// Ok accepts, Cancel and Escape reject.
class KRCORE_EXPORT KrBasicDialog : public QDialog
{
    Q_OBJECT
public:
    explicit KrBasicDialog(QWidget* parent = nullptr, const QString& name = QString());
    ~KrBasicDialog() override;

    // Adds widget above the button box (re-parented to the dialog).
    void addWidget(QWidget* widget, int stretch = 0);
    QDialogButtonBox* getButtonBox() const;
    QVBoxLayout* getLayout() const;

private:
    struct Private;
    std::unique_ptr<Private> d;
};
