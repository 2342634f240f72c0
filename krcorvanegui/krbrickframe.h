#pragma once

#include "krstyledbutton.h"

#include <QFrame>
#include <QPushButton>
#include <QTabBar>
#include <memory>

class KrBrickGraphicsItem;
class KrBrickOptionsFrame;
class KrBrickTitleBar;
class KrShaderBrick;
class QMenu;
class QStyle;

// The sizes of a brick frame's small widgets, asked of the host style through its custom
// pixel metrics. A style that does not know them (answers 0 or less) gets the host's values.
enum class KrBrickFrameMetric
{
    TitleBarHeight, // QStyle::PM_CustomBase + 0x13
    ResizeButton,   // QStyle::PM_CustomBase + 10, twice the resize grip's side
    OptionsButton   // QStyle::PM_CustomBase + 61
};
int krBrickFrameMetric(const QStyle* style, KrBrickFrameMetric metric,
                       const QWidget* widget = nullptr);

// The widget a brick item embeds: title bar, a one-tab bar with the brick's title and options
// button, the brick's option widget and a resize handle. Owns the brick menu.
class KrBrickFrame : public QFrame
{
    Q_OBJECT
public:
    KrBrickFrame(KrShaderBrick* brick, KrBrickGraphicsItem* item, QWidget* parent);
    ~KrBrickFrame() override;

    // The live frame showing brick, or null (undo steps reach the view through it).
    static KrBrickFrame* findFrame(KrShaderBrick* brick);

    // What hideParams() and advanceView() do, without recording an undo step.
    void applyHideParams(bool onOff);
    void applyShowAdvanced(bool onOff);

signals:
    void resized();
    void closeClicked();
    // A drag of the title bar, and a drag of the resize grip; one pair per gesture.
    void moveStarted();
    void moveFinished();
    void resizeStarted();
    void resizeFinished();
    // The brick was saved to file (after the user bricks list was asked to rebuild).
    void brickSaved(const QString& fileName);

public slots:
    KrShaderBrick* getBrick();
    KrBrickOptionsFrame* getOptionFrame();
    KrBrickTitleBar* getTitleBar();
    void setUpBrickActions();
    QMenu* getBrickMenu();
    void doMenu();
    void hideParams(bool onOff);
    void advanceView(bool onOff);
    void saveBrick();
    void changeTitle();
    void setBrickTitle(const QString& title);

protected:
    void resizeEvent(QResizeEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    void brickTitleChanged(const QString& title);
    void shrinkToLayout();
    QString defaultTitle() const;
    // Writes the brick's record to fileName; false with a reason in error.
    bool writeBrickFile(const QString& fileName, QString* error) const;
    void rebuildUserBricks();

    struct Private;
    std::unique_ptr<Private> d;
};

// The grip in a brick frame's bottom-right corner: dragging it sideways widens or narrows the
// frame. Its height is left to the frame's layout.
class KrBrickResizeButton : public KrStyledButton
{
    Q_OBJECT
public:
    explicit KrBrickResizeButton(QWidget* parent);
    ~KrBrickResizeButton() override;

protected:
    void mousePressEvent(QMouseEvent* event) override;
    void mouseMoveEvent(QMouseEvent* event) override;
    void mouseReleaseEvent(QMouseEvent* event) override;
    void changeEvent(QEvent* event) override;

private:
    void updateSize();
    // Where the drag last was, in the frame's coordinates: they stay put while the frame's
    // width changes, whatever the zoom of the view showing it.
    int horizontalPosition(QMouseEvent* event) const;

    bool m_firstMove = true;
    int m_lastX = 0;
};

// The one-tab bar that shows a brick's title, on the host style's bar background.
class KrBrickBar : public QTabBar
{
    Q_OBJECT
public:
    KrBrickBar(QWidget* parent, const QString& name);
    ~KrBrickBar() override;

protected:
    void paintEvent(QPaintEvent* event) override;
};

// The small button over the right end of the brick bar that opens the brick menu. The host
// style draws it and may make it round through a mask.
class KrTabBarOptionsBtn : public QPushButton
{
    Q_OBJECT
public:
    KrTabBarOptionsBtn(QWidget* parent, const QString& name);
    ~KrTabBarOptionsBtn() override;

protected:
    void paintEvent(QPaintEvent* event) override;
    void changeEvent(QEvent* event) override;

private:
    void updateSize();
    void updateMask();
};
