#pragma once

#include <QWidget>
#include <memory>

// The drag handle on top of a brick frame: dragging it moves the frame (or the graphics item
// that embeds it), a click on the square close area at its right end asks for the brick to be
// deleted.
class KrBrickTitleBar : public QWidget
{
    Q_OBJECT
public:
    KrBrickTitleBar(QWidget* parent, const QString& name);
    ~KrBrickTitleBar() override;

    QRect getCloseRect() const;
    bool isDragging() const;

signals:
    void closeClicked();
    // Around a drag that moves the brick: one pair per drag, however many moves it has.
    void dragStarted();
    void dragFinished();

protected:
    void changeEvent(QEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;
    void paintEvent(QPaintEvent* event) override;
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;

private:
    void updateHeight();
    void moveTargetBy(const QPoint& delta);

    struct Private;
    std::unique_ptr<Private> d;
};
