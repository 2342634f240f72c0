#pragma once

#include "krpane.h"

#include <QList>
#include <QMainWindow>
#include <memory>

class IKrBrickUser;
class KrBrickFactoryMenu;
class KrBrickUserPropertiesView;
class KrCorvaneDockWidget;
class KrCorvanePaneMainWgt;
class KrDynamicDivider;
class KrPreviewButton;
class QMenu;
class QTabWidget;
class QTreeWidget;
class QTreeWidgetItem;

// The editor's dockable pane, "Corvane[BETA]". It holds exactly one main widget.
class KrCorvanePane : public KrPane
{
    Q_OBJECT
public:
    explicit KrCorvanePane(QWidget* parent = nullptr);
    // With the given brick-user kinds instead of the host's; the pane owns them.
    KrCorvanePane(const QList<IKrBrickUser*>& kinds, QWidget* parent);
    ~KrCorvanePane() override;

    KrCorvanePaneMainWgt* getMainWidget() const;
    // One prototype per kind of brick user the host offers.
    QList<IKrBrickUser*> getBrickUserKinds() const;

public slots:
    void saveSettings(KrPaneSettings& settings) override;

private:
    void build();
    struct Private;
    std::unique_ptr<Private> d;
};

// The hub of the editor inside the pane (a QMainWindow used as a plain child widget): the brick
// library and properties on one side of a divider, one tab per open brick user on the other. It
// owns the brick users of its windows.
class KrCorvanePaneMainWgt : public QMainWindow
{
    Q_OBJECT
public:
    explicit KrCorvanePaneMainWgt(KrCorvanePane* pane);
    ~KrCorvanePaneMainWgt() override;

    KrCorvanePane* getPane() const;
    // Stores the divider's collapsed state.
    void saveDividerState();
    // Puts the divider back together from the "DuderOvid" preferences.
    void layoutTabs();
    // base made unique among the names of the open brick users: base, base_0, base_1, ...
    QString uniqueBrickUserName(const QString& base) const;
    // The "Insert Brick..." menu.
    KrBrickFactoryMenu* getBrickMenu() const;
    // Called by a window whose close was confirmed: it and its brick user leave the lists.
    void windowClosed(KrCorvaneDockWidget* window);

    QList<IKrBrickUser*> getOpenBrickUsers() const;
    QList<KrCorvaneDockWidget*> getOpenWindows() const;
    KrCorvaneDockWidget* getCurrentWindow() const;
    QTabWidget* getLeftTabs() const;
    QTabWidget* getRightTabs() const;
    QTreeWidget* getBrickTree() const;
    QTreeWidgetItem* getUserItem() const;
    QMenu* getUserMenu() const;
    QMenu* getFileMenu() const;
    KrDynamicDivider* getDivider() const;
    KrBrickUserPropertiesView* getPropertiesView() const;
    KrPreviewButton* getPreviewButton() const;

public slots:
    // Rebuilds the user's saved bricks in the library tree and the brick menu.
    void createUserMenuAndTree();

private slots:
    KrCorvaneDockWidget* newWindow();
    void nameChanged(const QString& newName);
    KrCorvaneDockWidget* newWindow(IKrBrickUser* user);
    void open();
    void errorToUserAndLog(const QString& error);
    void fromScene();
    void preferences();
    void itemDoubleClicked(QTreeWidgetItem* item, int column);
    void currentTabChanged();
    void previewSizeChanged();

private:
    void buildMenuBar();
    void renameTab(QWidget* page, const QString& newName);
    struct Private;
    std::unique_ptr<Private> d;
};

// The Window menu's command that shows and hides the Corvane pane.
class KrCorvanePaneAction : public KrPaneAction
{
    Q_OBJECT
public:
    KrCorvanePaneAction();
};
