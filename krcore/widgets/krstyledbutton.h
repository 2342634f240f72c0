#pragma once

#include "krcore_global.h"

#include <QAbstractButton>

// A small button whose whole face comes from the host style (KrStyle::PE_StyledButton), such
// as the grip in a brick's corner. Other styles get a plain tool-button panel.
class KRCORE_EXPORT KrStyledButton : public QAbstractButton
{
    Q_OBJECT
public:
    explicit KrStyledButton(QWidget* parent = nullptr, const QString& name = QString());
    ~KrStyledButton() override;

    QSize sizeHint() const override;

protected:
    void paintEvent(QPaintEvent* event) override;
    void enterEvent(QEvent* event) override;
    void leaveEvent(QEvent* event) override;
};
