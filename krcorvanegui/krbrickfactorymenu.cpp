#include "krbrickfactorymenu.h"

#include "krapp.h"
#include "krbrickuserfiles.h"
#include "krclassfactory.h"
#include "krcorvaneutility.h"
#include "krdefaultbrickuser.h"
#include "krshaderbrick.h"

#include <QDir>
#include <QFileInfo>
#include <QSet>
#include <QTreeWidget>
#include <QTreeWidgetItem>
#include <QVariant>

KrBrickFactoryAction::KrBrickFactoryAction(const KrBrickFactory& factory, QObject* parent)
    : QAction(parent), m_factory(factory)
{
}

KrBrickFactoryAction::~KrBrickFactoryAction() = default;

KrBrickFactoryMenu::KrBrickFactoryMenu(const QString& title, QWidget* parent) : QMenu(title, parent)
{
}

KrBrickFactoryMenu::~KrBrickFactoryMenu() = default;

KrBrickFactoryAction* KrBrickFactoryMenu::addFactoryAction(QMenu* menu,
                                                           const KrBrickFactory& factory,
                                                           const QString& text)
{
    auto* action = new KrBrickFactoryAction(factory, this);
    action->setText(text);
    menu->addAction(action);
    connect(action, &QAction::triggered, this,
            [this, action]() { emit factoryTriggered(action->m_factory); });
    return action;
}

void KrBrickFactoryMenu::triggered(bool)
{
    // For entries connected by signature from elsewhere; our own carry the action directly.
    if (auto* action = qobject_cast<KrBrickFactoryAction*>(sender()))
        emit factoryTriggered(action->m_factory);
}

namespace {

const Qt::ItemFlags kGroupFlags =
    Qt::ItemIsSelectable | Qt::ItemIsUserCheckable | Qt::ItemIsEnabled;
const Qt::ItemFlags kCategoryFlags = Qt::ItemIsSelectable | Qt::ItemIsEnabled;
const QDir::Filters kListFilter = QDir::Dirs | QDir::Files;
const QDir::SortFlags kListSort = QDir::Name | QDir::DirsFirst | QDir::IgnoreCase;

QTreeWidgetItem* makeGroupItem(const QString& text)
{
    auto* item = new QTreeWidgetItem(QStringList(text), 0);
    item->setFlags(kGroupFlags);
    return item;
}

// Holds a reference on a trial brick for as long as the library looks at it.
class KrTrialBrick
{
public:
    explicit KrTrialBrick(KrShaderBrick* brick) : m_brick(brick)
    {
        if (m_brick)
            m_brick->ref();
    }
    ~KrTrialBrick()
    {
        if (m_brick)
            m_brick->unref();
    }
    KrShaderBrick* get() const { return m_brick; }

private:
    Q_DISABLE_COPY(KrTrialBrick)
    KrShaderBrick* m_brick;
};

} // namespace

KrDuderovid::KrDuderovid(QTreeWidget* tree, KrBrickFactoryMenu* menu) : m_tree(tree), m_menu(menu)
{
}

bool KrDuderovid::factoryOf(const QTreeWidgetItem* item, KrBrickFactory* factory)
{
    if (!item)
        return false;
    const QVariant data = item->data(0, Qt::UserRole);
    if (data.userType() != qMetaTypeId<KrBrickFactory>())
        return false;
    *factory = data.value<KrBrickFactory>();
    return true;
}

void KrDuderovid::setFactory(QTreeWidgetItem* item, const KrBrickFactory& factory)
{
    item->setData(0, Qt::UserRole, QVariant::fromValue(factory));
}

QStringList KrDuderovid::categoryParts(const KrShaderBrick* brick)
{
    return brick->getDefaultCategory().split(QLatin1Char('/'), Qt::SkipEmptyParts,
                                             Qt::CaseSensitive);
}

void KrDuderovid::buildBrickLibrary()
{
    QMenu* allMenu = m_menu->addMenu(QStringLiteral("All Bricks"));
    QMenu* rootsMenu = allMenu->addMenu(QStringLiteral("Roots"));
    QMenu* functionsMenu = allMenu->addMenu(QStringLiteral("Functions"));
    QHash<QString, QMenu*> rootsCache;
    QHash<QString, QMenu*> functionsCache;

    QTreeWidgetItem* allItem = makeGroupItem(QStringLiteral("!All Bricks"));
    m_tree->addTopLevelItem(allItem);
    QTreeWidgetItem* rootsItem = makeGroupItem(QStringLiteral("Roots"));
    allItem->addChild(rootsItem);
    QTreeWidgetItem* functionsItem = makeGroupItem(QStringLiteral("Functions"));
    allItem->addChild(functionsItem);

    KrApp* app = krApp;
    for (int i = 0; i < app->getNumClassFactories(); ++i) {
        const KrClassFactory* classFactory = app->getClassFactory(i);
        if (!classFactory || !classFactory->provides("KrShaderBrick"))
            continue;
        const KrBrickFactory factory(classFactory);
        // A kind that cannot make a brick is left out; the kinds after it are still listed.
        KrTrialBrick trial(factory.generateBrick());
        if (!trial.get())
            continue;
        addFactoryToTree(factory, trial.get(), rootsItem, functionsItem);
        addFactoryToMenu(factory, trial.get(), rootsCache, functionsCache, rootsMenu,
                         functionsMenu);
    }
}

void KrDuderovid::addFactoryToTree(const KrBrickFactory& factory, const KrShaderBrick* brick,
                                   QTreeWidgetItem* roots, QTreeWidgetItem* functions)
{
    QTreeWidgetItem* start = brick->type() == 0 ? functions : roots;
    QTreeWidgetItem* parent = findOrAddTreePath(start, categoryParts(brick));
    auto* entry = new QTreeWidgetItem(QStringList(brick->getPreferredName()), s_entryType);
    setFactory(entry, factory);
    parent->addChild(entry);
}

QTreeWidgetItem* KrDuderovid::findOrAddTreePath(QTreeWidgetItem* item, QStringList parts)
{
    while (!parts.isEmpty()) {
        const QString part = parts.takeFirst();
        QTreeWidgetItem* next = nullptr;
        for (int i = 0; i < item->childCount() && !next; ++i) {
            if (item->child(i)->text(0) == part)
                next = item->child(i);
        }
        if (!next) {
            next = new QTreeWidgetItem(QStringList(part), s_entryType);
            next->setFlags(kCategoryFlags);
            item->addChild(next);
        }
        item = next;
    }
    return item;
}

void KrDuderovid::addFactoryToMenu(const KrBrickFactory& factory, const KrShaderBrick* brick,
                                   QHash<QString, QMenu*>& rootsCache,
                                   QHash<QString, QMenu*>& functionsCache, QMenu* rootsMenu,
                                   QMenu* functionsMenu)
{
    const bool function = brick->type() == 0;
    QMenu* menu = findOrAddMenuPath(function ? functionsMenu : rootsMenu,
                                    function ? functionsCache : rootsCache, categoryParts(brick));
    m_menu->addFactoryAction(menu, factory, brick->getPreferredName());
}

QMenu* KrDuderovid::findOrAddMenuPath(QMenu* menu, QHash<QString, QMenu*>& cache, QStringList parts)
{
    // The cache is keyed by the single part's text for the whole menu, so a category name met
    // again elsewhere continues in the submenu first made for it.
    while (!parts.isEmpty()) {
        const QString part = parts.takeFirst();
        QMenu* next = cache.value(part, nullptr);
        if (!next) {
            next = menu->addMenu(part);
            cache.insert(part, next);
        }
        menu = next;
    }
    return menu;
}

void KrDuderovid::createUserMenuAndTree()
{
    if (!m_userItem) {
        m_userItem = makeGroupItem(QStringLiteral("User"));
        m_tree->addTopLevelItem(m_userItem);
    } else {
        qDeleteAll(m_userItem->takeChildren());
    }
    if (!m_userMenu) {
        m_userMenu = m_menu->addMenu(QStringLiteral("User"));
    } else {
        // The entries are children of the brick menu and the folders submenus of the user
        // menu; both go, so a rebuild leaves nothing behind.
        const QList<QMenu*> folders = m_userMenu->findChildren<QMenu*>();
        for (QMenu* menu : folders + QList<QMenu*>{m_userMenu}) {
            for (QAction* action : menu->actions())
                delete qobject_cast<KrBrickFactoryAction*>(action);
        }
        m_userMenu->clear();
        qDeleteAll(m_userMenu->findChildren<QMenu*>(QString(), Qt::FindDirectChildrenOnly));
    }

    const QString folder = KrCorvaneUtility::getCustomBrickPath();
    KrCorvaneUtility::createDirs(folder);
    addUserFolder(folder, m_userMenu, m_userItem);
}

void KrDuderovid::addUserFolder(const QString& path, QMenu* menu, QTreeWidgetItem* item)
{
    const QFileInfoList entries = QDir(path).entryInfoList(kListFilter, kListSort);
    for (const QFileInfo& entry : entries)
        addUserBrickEntry(entry, menu, item);
}

void KrDuderovid::addUserBrickEntry(const QFileInfo& info, QMenu* menu, QTreeWidgetItem* item)
{
    const QString name = info.fileName();
    if (name.endsWith(QLatin1Char('.')) || name.startsWith(QLatin1Char('.')))
        return;

    if (info.isDir()) {
        // A link back up the tree would otherwise be walked for ever.
        if (info.isSymLink())
            return;
        QMenu* subMenu = menu->addMenu(info.baseName());
        QTreeWidgetItem* subItem = makeGroupItem(info.baseName());
        item->addChild(subItem);
        addUserFolder(info.filePath(), subMenu, subItem);
        return;
    }

    if (info.suffix() != QLatin1String("kcb"))
        return;
    KrBrickFactory factory;
    if (!readSavedBrick(info.filePath(), &factory))
        return;
    auto* entry = new QTreeWidgetItem(QStringList(info.baseName()), s_entryType);
    setFactory(entry, factory);
    item->addChild(entry);
    m_menu->addFactoryAction(menu, factory, info.baseName());
}

bool KrDuderovid::readSavedBrick(const QString& fileName, KrBrickFactory* factory)
{
    QString text;
    if (!KrBrickUserFiles::readTextFile(fileName, &text))
        return false;
    if (!factory->getSettings()->fromString(text))
        return false;
    const QString className =
        factory->getSettings()->getStringValue(KrBrickUserFiles::classNameKey());
    KrClassFactory* classFactory = KrDefaultBrickUser::getBrickClassFactory(className);
    if (!classFactory || !classFactory->provides("KrShaderBrick"))
        return false;
    factory->setClassFactory(classFactory);
    return true;
}
