#pragma once

#include "krcore_global.h"

#include <QMainWindow>
#include <memory>

class KrAction;
class KrActionMgr;
class KrFileFilter;
class KrPane;
class KrPaneMgr;
class QAction;
class QDockWidget;
class QMenu;

// The host's main window: menus filled by menu path, panes in docks, the application's undo
// and redo, file dialogs, and the window layout kept between sessions.
class KRCORE_EXPORT KrMainWindow : public QMainWindow
{
    Q_OBJECT
public:
    explicit KrMainWindow(QWidget* parent = nullptr);
    ~KrMainWindow() override;

    // Puts pane in a dock of its own (the window owns both); returns the dock. A pane added
    // after restoreLayout() goes where the restored layout had it.
    QDockWidget* addPane(KrPane* pane, Qt::DockWidgetArea area = Qt::RightDockWidgetArea);
    // Files action with the action manager and places it by its menu path. The window takes
    // it over when it has no parent.
    void addKrAction(KrAction* action);

    // The menu at path ("Edit", "Window/Panes"), made on first use; "::PaneClass" is the
    // options menu of that pane.
    QMenu* getMenu(const QString& path);
    QMenu* findMenu(const QString& path) const;
    // The options menu of the panes of paneClassName: shown from the pane's dock (context
    // menu on its title) and under Window.
    QMenu* getPaneOptionsMenu(const QString& paneClassName);

    QAction* getUndoAction() const;
    QAction* getRedoAction() const;
    QAction* getQuitAction() const;

    // Runs a file dialog. open: choose an existing file, else a name to save under (the
    // caller asks before overwriting). fileName is the proposal and, when accepted, the
    // chosen path; a name typed without extension gets the selected filter's first one.
    // selectedFilter, when given, is the filter to start with and the one chosen. False when
    // cancelled.
    bool doFileDialog(bool open, const QString& title, const QString& startFolder,
                      const KrFileFilter& filter, QString& fileName, int* selectedFilter = nullptr,
                      QWidget* parent = nullptr);

    // Brings back the geometry, dock layout and pane settings stored by saveLayout().
    // False when nothing was stored or it could not be used.
    bool restoreLayout();
    void saveLayout();

public slots:
    KrPaneMgr* getPaneMgr() const;
    KrActionMgr* getActionMgr() const;
    // For scripts: adds a pane or an action made from a class factory.
    bool installPane(QObject* pane);
    bool installAction(QObject* action);
    void showAbout();

protected:
    void closeEvent(QCloseEvent* event) override;

private:
    void placeAction(QMenu* menu, KrAction* action);
    void showPaneMenu(QDockWidget* dock, const QPoint& pos);

    struct Private;
    std::unique_ptr<Private> d;
};
