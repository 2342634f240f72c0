#pragma once

#include "krcore_global.h"

#include <QWidget>
#include <memory>

// The bar between the two sides of a divider. A Qt::Vertical bar stands between widgets laid
// side by side (the split axis is x); a Qt::Horizontal one between widgets stacked vertically.
// Dragging it reports moved(distance) with the pointer's travel along the split axis since the
// last report; a click on the toggle area in its middle (when enabled) reports
// toggleBarActivated().
class KRCORE_EXPORT KrDividerBar : public QWidget
{
    Q_OBJECT
public:
    enum BarStyle
    {
        FlatBar = 0,   // a plain strip with a hairline
        RaisedBar = 1, // a shaded strip
        GripBar = 2    // a shaded strip with grip dots
    };
    Q_ENUM(BarStyle)

    explicit KrDividerBar(QWidget* parent = nullptr, Qt::Orientation orientation = Qt::Vertical,
                          const QString& name = QString(), BarStyle barStyle = RaisedBar);
    ~KrDividerBar() override;

    Qt::Orientation orientation() const;
    BarStyle barStyle() const;
    // Thickness along the split axis (the style's KrStyle::PM_DividerBarWidth, 6 elsewhere).
    int barThickness() const;

    void enableToggleBar(bool enable);
    bool toggleEnabled() const;
    // The direction the toggle arrow points (towards the side that collapses).
    void setToggleArrow(Qt::ArrowType arrow);
    Qt::ArrowType toggleArrow() const;
    // The toggle area in bar coordinates (empty when the toggle is disabled).
    QRect toggleRect() const;
    bool isDragging() const;

    QSize sizeHint() const override;
    QSize minimumSizeHint() const override;

signals:
    void toggleBarActivated();
    // Pointer travel in pixels along the split axis since the previous report of this drag.
    void moved(int distance);
    // The pointer's position along the split axis in the parent's coordinates, while dragging.
    void draggedTo(int position);

protected:
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void leaveEvent(QEvent* event) override;
    void changeEvent(QEvent* event) override;

private:
    void updateCursor(const QPoint& pos);
    struct Private;
    std::unique_ptr<Private> d;
};
