#pragma once

#include "krbrickfactory.h"

#include <QAction>
#include <QHash>
#include <QMenu>
#include <QStringList>

class KrShaderBrick;
class QFileInfo;
class QTreeWidget;
class QTreeWidgetItem;

// A menu entry that stands for one brick kind.
class KrBrickFactoryAction : public QAction
{
    Q_OBJECT
public:
    KrBrickFactoryAction(const KrBrickFactory& factory, QObject* parent);
    ~KrBrickFactoryAction() override;

    KrBrickFactory m_factory;
};

// The "Insert Brick..." menu: emits the factory of the entry the user chose.
class KrBrickFactoryMenu : public QMenu
{
    Q_OBJECT
public:
    explicit KrBrickFactoryMenu(const QString& title, QWidget* parent = nullptr);
    ~KrBrickFactoryMenu() override;

    // Adds an entry for factory to menu (this menu or one of its submenus). The action is a
    // child of this menu and reports through factoryTriggered().
    KrBrickFactoryAction* addFactoryAction(QMenu* menu, const KrBrickFactory& factory,
                                           const QString& text);

signals:
    void factoryTriggered(const KrBrickFactory& m_factory);

private slots:
    void triggered(bool checked);
};

// The brick library ("Duderovid") shown twice: as a tree and as the "Insert Brick..." menu.
// "!All Bricks" lists every brick class of the host under "Roots" and "Functions" and their
// categories; "User" lists the saved bricks (".kcb") of the user's brick folder by folder.
class KrDuderovid
{
public:
    // Item type of category and brick entries (the toolkit's first user type).
    static const int s_entryType = 1000;

    KrDuderovid(QTreeWidget* tree, KrBrickFactoryMenu* menu);

    // Fills "!All Bricks" from the host's class factories; run once.
    void buildBrickLibrary();
    // Rebuilds the "User" item and submenu from the custom brick folder.
    void createUserMenuAndTree();

    QTreeWidgetItem* getUserItem() const { return m_userItem; }
    QMenu* getUserMenu() const { return m_userMenu; }

    // The factory an entry carries in column 0; false for category and top items.
    static bool factoryOf(const QTreeWidgetItem* item, KrBrickFactory* factory);
    static void setFactory(QTreeWidgetItem* item, const KrBrickFactory& factory);
    // Reads a saved brick: true when the file holds a record of a host shader-brick class.
    static bool readSavedBrick(const QString& fileName, KrBrickFactory* factory);
    // The category path of a brick split at "/", empty parts dropped.
    static QStringList categoryParts(const KrShaderBrick* brick);

private:
    void addFactoryToTree(const KrBrickFactory& factory, const KrShaderBrick* brick,
                          QTreeWidgetItem* roots, QTreeWidgetItem* functions);
    void addFactoryToMenu(const KrBrickFactory& factory, const KrShaderBrick* brick,
                          QHash<QString, QMenu*>& rootsCache,
                          QHash<QString, QMenu*>& functionsCache, QMenu* rootsMenu,
                          QMenu* functionsMenu);
    QTreeWidgetItem* findOrAddTreePath(QTreeWidgetItem* item, QStringList parts);
    QMenu* findOrAddMenuPath(QMenu* menu, QHash<QString, QMenu*>& cache, QStringList parts);
    void addUserBrickEntry(const QFileInfo& info, QMenu* menu, QTreeWidgetItem* item);
    void addUserFolder(const QString& path, QMenu* menu, QTreeWidgetItem* item);

    QTreeWidget* m_tree;
    KrBrickFactoryMenu* m_menu;
    QTreeWidgetItem* m_userItem = nullptr;
    QMenu* m_userMenu = nullptr;
};
