#pragma once

#include <QWidget>

// The host's central area, where a 3D host shows its scene. This host has no renderer, so it
// draws an empty ground grid.
class KrViewport : public QWidget
{
    Q_OBJECT
public:
    explicit KrViewport(QWidget* parent = nullptr);

    QSize sizeHint() const override;

protected:
    void paintEvent(QPaintEvent* event) override;
};
