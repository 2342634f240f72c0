#pragma once

#include <QDialog>
#include <memory>

class IKrBrickUser;

// The preferences of one brick-user window: the brick user's name and whether the window lays
// its bricks out right to left (outputs on the left). The dialog changes nothing itself; after
// acceptance the window reads getNameText() and isRightToLeft().
class KrBrickPrefDialog : public QDialog
{
    Q_OBJECT
public:
    // For a brick-user window (KrCorvaneDockWidget): it gives its brick user through
    // getBrickUser() and its scene's direction through isRightToLeft(). A template, so that
    // only the window's own code needs the window's full declaration.
    template <class Window>
    KrBrickPrefDialog(const QString& title, Window* window, QWidget* parent)
        : KrBrickPrefDialog(title, window->getBrickUser(), window->isRightToLeft(), parent)
    {
    }
    KrBrickPrefDialog(const QString& title, IKrBrickUser* brickUser, bool rightToLeft,
                      QWidget* parent);
    ~KrBrickPrefDialog() override;

    // The edited name without surrounding blanks; Ok stays disabled while it is empty.
    QString getNameText() const;
    // The state of the "Outputs Left:" box.
    bool isRightToLeft() const;

private:
    void updateOkButton();
    struct Private;
    std::unique_ptr<Private> d;
};

// The pane's layout preferences ("TabsRight", "RightToLeft" in the group "DuderOvid").
// They are written only when the dialog is accepted.
class KrGenerealPrefDialog : public QDialog
{
    Q_OBJECT
public:
    KrGenerealPrefDialog(const QString& title, QWidget* parent);
    ~KrGenerealPrefDialog() override;

public slots:
    void accept() override;

private:
    struct Private;
    std::unique_ptr<Private> d;
};
