#pragma once

#include "krdividerbar.h"

#include <QWidget>
#include <memory>

class QResizeEvent;

// Two widgets side by side (vertical bar) or one above the other (horizontal bar) with a
// divider bar between them. The split is kept as a fraction of the extent so it survives
// resizing; the geometry is computed here, not by a layout, so the bar can be dragged freely
// and one side collapsed by the bar's toggle.
class KrDynamicDivider : public QWidget
{
    Q_OBJECT
public:
    // How the split follows a resize of the divider.
    enum ResizeMode
    {
        SecondKeepsSize = 0,
        FirstKeepsSize = 1,
        KeepRatio = 2 // and any other value
    };

    KrDynamicDivider(QWidget* first, QWidget* second, QWidget* parent, Qt::Orientation orientation,
                     const QString& name, KrDividerBar::BarStyle barStyle);
    ~KrDynamicDivider() override;

    // Enables the bar's toggle; a toggle then collapses the second widget (collapseSecond)
    // or the first.
    void setToggleEnabled(bool enable, bool collapseSecond);
    void setResizeMode(int mode);
    int getResizeMode() const;
    bool getCollapseSecond() const;

    // The bar position as a fraction of the extent along the split axis.
    double getRatio() const;
    int getMargin() const;
    int getSpacing() const;
    KrDividerBar* getBar() const;
    QWidget* getFirst() const;
    QWidget* getSecond() const;

    QSize minimumSizeHint() const override;

public slots:
    void toggleWidget();
    void moveDivider(int distance);
    bool isToggled();

protected:
    void resizeEvent(QResizeEvent* event) override;

private:
    void limitRatio(const QSize& size);
    void layoutChildren(const QSize& size);
    struct Private;
    std::unique_ptr<Private> d;
};
