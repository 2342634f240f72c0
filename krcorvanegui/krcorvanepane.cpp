#include "krcorvanepane.h"

#include "ui_krcorvanemainwindow.h"

#include "krapp.h"
#include "krappsettings.h"
#include "krbrickfactorymenu.h"
#include "krbrickmaterial.h"
#include "krbrickuser.h"
#include "krbrickuserfiles.h"
#include "krbrickuserpropertiesview.h"
#include "krbrickuserscene.h"
#include "krchooserdlg.h"
#include "krcorvanedockwidget.h"
#include "krcorvaneutility.h"
#include "krdefaultmaterial.h"
#include "krdynamicdivider.h"
#include "krelement.h"
#include "krprefdialogs.h"
#include "krpreviewnode.h"
#include "krsettings.h"
#include "krshaderbrick.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QLineEdit>
#include <QMenuBar>
#include <QMessageBox>
#include <QPointer>
#include <QSet>
#include <QStatusBar>
#include <QTreeWidget>
#include <QVBoxLayout>
#include <type_traits>
#include <utility>

namespace {

const char* const kGroup = "DuderOvid";
const char* const kDefaultMaterialName = "Brelvo Default Material";

// Hands the material to the preview button's node, for buttons that have one (the node comes
// with the renderer).
template <class Button, class = void> struct KrHasPreviewNode : std::false_type
{
};
template <class Button>
struct KrHasPreviewNode<Button, std::void_t<decltype(std::declval<Button&>().getPreviewNode())>>
    : std::true_type
{
};

template <class Button> void setPreviewMaterial(Button* button, KrBrickMaterial* material)
{
    if constexpr (KrHasPreviewNode<Button>::value) {
        if (auto* node = button->getPreviewNode())
            node->setMaterialPreview(material);
    } else {
        Q_UNUSED(button)
        Q_UNUSED(material)
    }
}

// A brick material made from a fresh default material; the default material itself goes.
IKrBrickUser* newDefaultBrickMaterial()
{
    KrDefaultMaterial material;
    material.setName(QString::fromLatin1(kDefaultMaterialName));
    return KrBrickMaterial::convertDefaultMaterial(&material);
}

} // namespace

// ---------------------------------------------------------------------------------------------

struct KrCorvanePane::Private
{
    QList<IKrBrickUser*> brickUserKinds;
    KrCorvanePaneMainWgt* mainWidget = nullptr;
};

KrCorvanePane::KrCorvanePane(QWidget* parent)
    : KrPane(QStringLiteral("Corvane[BETA]"), parent), d(new Private)
{
    KrCorvaneUtility::getBrickUserList(d->brickUserKinds);
    build();
}

KrCorvanePane::KrCorvanePane(const QList<IKrBrickUser*>& kinds, QWidget* parent)
    : KrPane(QStringLiteral("Corvane[BETA]"), parent), d(new Private)
{
    d->brickUserKinds = kinds;
    build();
}

void KrCorvanePane::build()
{
    auto* layout = new QVBoxLayout;
    d->mainWidget = new KrCorvanePaneMainWgt(this);
    layout->addWidget(d->mainWidget, 0);
    setLayout(layout);
    setMinimumSize(165, 165);
}

KrCorvanePane::~KrCorvanePane()
{
    // The main widget and its windows go before the prototypes they were made from.
    delete d->mainWidget;
    d->mainWidget = nullptr;
    while (!d->brickUserKinds.isEmpty()) {
        if (IKrBrickUser* kind = d->brickUserKinds.takeLast())
            kind->release();
    }
}

KrCorvanePaneMainWgt* KrCorvanePane::getMainWidget() const
{
    return d->mainWidget;
}

QList<IKrBrickUser*> KrCorvanePane::getBrickUserKinds() const
{
    return d->brickUserKinds;
}

void KrCorvanePane::saveSettings(KrPaneSettings&)
{
    if (d->mainWidget)
        d->mainWidget->saveDividerState();
}

// ---------------------------------------------------------------------------------------------

struct KrCorvanePaneMainWgt::Private
{
    Ui::KrCorvaneMainWindow ui;
    KrCorvanePane* pane = nullptr;
    QList<IKrBrickUser*> openBrickUsers;
    QList<KrCorvaneDockWidget*> openWindows;
    // Brick users of closed windows: nothing edits them any more, but undo steps and the host may
    // still know them, so they are released only with the main widget.
    QList<IKrBrickUser*> closedBrickUsers;
    KrDynamicDivider* divider = nullptr;
    KrBrickFactoryMenu* brickMenu = nullptr;
    std::unique_ptr<KrDuderovid> duderovid;
    KrBrickUserPropertiesView* propertiesView = nullptr;
    KrPreviewButton* previewButton = nullptr;
    QMenu* fileMenu = nullptr;

    QList<IKrBrickUser*> kinds() const
    {
        return pane ? pane->getBrickUserKinds() : QList<IKrBrickUser*>();
    }
};

KrCorvanePaneMainWgt::KrCorvanePaneMainWgt(KrCorvanePane* pane)
    : QMainWindow(pane, Qt::WindowFlags()), d(new Private)
{
    d->ui.setupUi(this);
    Ui::KrCorvaneMainWindow& ui = d->ui;

    ui.righttabs->setUsesScrollButtons(true);
    // A child widget, not a window of its own.
    setWindowFlags(Qt::WindowFlags());
    setTabPosition(Qt::RightDockWidgetArea, QTabWidget::North);
    setTabPosition(Qt::LeftDockWidgetArea, QTabWidget::North);
    statusBar()->hide();
    d->pane = pane;

    buildMenuBar();
    connect(ui.actionNew, &QAction::triggered, this,
            static_cast<KrCorvaneDockWidget* (KrCorvanePaneMainWgt::*)()>(
                &KrCorvanePaneMainWgt::newWindow));
    connect(ui.actionOpen, &QAction::triggered, this, &KrCorvanePaneMainWgt::open);
    connect(ui.actionFromScene, &QAction::triggered, this, &KrCorvanePaneMainWgt::fromScene);
    connect(ui.actionPreference, &QAction::triggered, this, &KrCorvanePaneMainWgt::preferences);
    connect(ui.brickTree, &QTreeWidget::itemDoubleClicked, this,
            &KrCorvanePaneMainWgt::itemDoubleClicked);

    d->brickMenu = new KrBrickFactoryMenu(QStringLiteral("Insert Brick..."), this);
    d->brickMenu->clear();
    ui.brickTree->clear();
    d->duderovid.reset(new KrDuderovid(ui.brickTree, d->brickMenu));
    d->duderovid->buildBrickLibrary();
    createUserMenuAndTree();
    ui.brickTree->sortByColumn(0, Qt::AscendingOrder);

    d->previewButton = new KrPreviewButton;
    auto* imageLayout = new QVBoxLayout(ui.imageFrame);
    imageLayout->setContentsMargins(0, 0, 0, 0);
    imageLayout->addWidget(d->previewButton);
    connect(d->previewButton, &KrPreviewButton::sizeChanged, this,
            &KrCorvanePaneMainWgt::previewSizeChanged);

    d->propertiesView = new KrBrickUserPropertiesView(ui.propertiestab, QString());
    auto* propertiesLayout = new QHBoxLayout(ui.propertiestab);
    propertiesLayout->addWidget(d->propertiesView);

    layoutTabs();

    // The form's placeholder page goes; the first window becomes page 0.
    while (ui.righttabs->count() > 0) {
        QWidget* page = ui.righttabs->widget(0);
        ui.righttabs->removeTab(0);
        delete page;
    }
    connect(ui.righttabs, &QTabWidget::currentChanged, this,
            &KrCorvanePaneMainWgt::currentTabChanged);
    currentTabChanged();

    if (!d->kinds().isEmpty()) {
        if (IKrBrickUser* material = newDefaultBrickMaterial()) {
            KrCorvaneDockWidget* window = newWindow(material);
            window->getBrickScene()->arrange();
        }
    }
}

KrCorvanePaneMainWgt::~KrCorvanePaneMainWgt()
{
    // Pages going away must not feed the views being torn down.
    disconnect(d->ui.righttabs, nullptr, this, nullptr);
    d->propertiesView->setElement(nullptr);
    // Windows (and their scenes) go first: they refer to the bricks of the brick users.
    const QList<KrCorvaneDockWidget*> windows = findChildren<KrCorvaneDockWidget*>();
    qDeleteAll(windows);
    while (!d->openBrickUsers.isEmpty()) {
        if (IKrBrickUser* user = d->openBrickUsers.takeLast())
            user->release();
    }
    while (!d->closedBrickUsers.isEmpty()) {
        if (IKrBrickUser* user = d->closedBrickUsers.takeLast())
            user->release();
    }
}

void KrCorvanePaneMainWgt::buildMenuBar()
{
    Ui::KrCorvaneMainWindow& ui = d->ui;
    QMenuBar* menubar = menuBar();
    menubar->setObjectName(QStringLiteral("menubar"));
    menubar->setGeometry(QRect(0, 0, 540, 21));
    d->fileMenu = new QMenu(menubar);
    d->fileMenu->setObjectName(QStringLiteral("menuFile"));
    d->fileMenu->setTitle(QStringLiteral("&File"));
    menubar->addAction(d->fileMenu->menuAction());
    d->fileMenu->addAction(ui.actionNew);
    d->fileMenu->addAction(ui.actionOpen);
    d->fileMenu->addAction(ui.actionFromScene);
    d->fileMenu->addSeparator();
    d->fileMenu->addAction(ui.actionPreference);

    // The platform's keys, only while the focus is inside the pane: the host keeps its own.
    ui.actionNew->setShortcuts(QKeySequence::New);
    ui.actionOpen->setShortcuts(QKeySequence::Open);
    for (QAction* action : {ui.actionNew, ui.actionOpen}) {
        action->setShortcutContext(Qt::WidgetWithChildrenShortcut);
        addAction(action);
    }
}

KrCorvanePane* KrCorvanePaneMainWgt::getPane() const
{
    return d->pane;
}

void KrCorvanePaneMainWgt::layoutTabs()
{
    bool tabsRight = true;
    bool collapsed = false;
    {
        KrAppSettings settings;
        settings.pushPath(QLatin1String(kGroup));
        tabsRight = settings.getBoolValue(QStringLiteral("TabsRight"), true);
        collapsed = settings.getBoolValue(QStringLiteral("DividerCollapsed"), false);
    }

    QWidget* first = tabsRight ? d->ui.lefttabs : d->ui.righttabs;
    QWidget* second = tabsRight ? d->ui.righttabs : d->ui.lefttabs;
    auto* divider = new KrDynamicDivider(first, second, this, Qt::Vertical, QStringLiteral("BAR"),
                                         KrDividerBar::GripBar);
    // The library side collapses and keeps its width when the pane is resized.
    if (tabsRight) {
        divider->setToggleEnabled(true, false);
        divider->setResizeMode(KrDynamicDivider::FirstKeepsSize);
    } else {
        divider->setToggleEnabled(false, true);
        divider->setResizeMode(KrDynamicDivider::SecondKeepsSize);
    }
    // Re-parenting hid the tab widgets.
    d->ui.lefttabs->show();
    d->ui.righttabs->show();
    if (collapsed)
        divider->toggleWidget();

    // QMainWindow schedules the previous central widget (the form's, then the old divider) for
    // deletion.
    setCentralWidget(divider);
    d->divider = divider;
}

void KrCorvanePaneMainWgt::saveDividerState()
{
    if (!d->divider)
        return;
    KrAppSettings settings;
    settings.pushPath(QLatin1String(kGroup));
    settings.setBoolValue(QStringLiteral("DividerCollapsed"), d->divider->isToggled());
}

QString KrCorvanePaneMainWgt::uniqueBrickUserName(const QString& base) const
{
    QStringList names;
    for (const IKrBrickUser* user : d->openBrickUsers)
        names.append(user->getName());
    return KrCorvaneChooser::uniqueName(base, names);
}

KrBrickFactoryMenu* KrCorvanePaneMainWgt::getBrickMenu() const
{
    return d->brickMenu;
}

void KrCorvanePaneMainWgt::windowClosed(KrCorvaneDockWidget* window)
{
    IKrBrickUser* user = window ? window->getBrickUser() : nullptr;
    d->openWindows.removeAll(window);
    if (user && d->openBrickUsers.removeAll(user) > 0 && !d->closedBrickUsers.contains(user))
        d->closedBrickUsers.append(user);
}

QList<IKrBrickUser*> KrCorvanePaneMainWgt::getOpenBrickUsers() const
{
    return d->openBrickUsers;
}

QList<KrCorvaneDockWidget*> KrCorvanePaneMainWgt::getOpenWindows() const
{
    return d->openWindows;
}

KrCorvaneDockWidget* KrCorvanePaneMainWgt::getCurrentWindow() const
{
    return qobject_cast<KrCorvaneDockWidget*>(d->ui.righttabs->currentWidget());
}

QTabWidget* KrCorvanePaneMainWgt::getLeftTabs() const
{
    return d->ui.lefttabs;
}

QTabWidget* KrCorvanePaneMainWgt::getRightTabs() const
{
    return d->ui.righttabs;
}

QTreeWidget* KrCorvanePaneMainWgt::getBrickTree() const
{
    return d->ui.brickTree;
}

QTreeWidgetItem* KrCorvanePaneMainWgt::getUserItem() const
{
    return d->duderovid->getUserItem();
}

QMenu* KrCorvanePaneMainWgt::getUserMenu() const
{
    return d->duderovid->getUserMenu();
}

QMenu* KrCorvanePaneMainWgt::getFileMenu() const
{
    return d->fileMenu;
}

KrDynamicDivider* KrCorvanePaneMainWgt::getDivider() const
{
    return d->divider;
}

KrBrickUserPropertiesView* KrCorvanePaneMainWgt::getPropertiesView() const
{
    return d->propertiesView;
}

KrPreviewButton* KrCorvanePaneMainWgt::getPreviewButton() const
{
    return d->previewButton;
}

void KrCorvanePaneMainWgt::createUserMenuAndTree()
{
    d->duderovid->createUserMenuAndTree();
}

KrCorvaneDockWidget* KrCorvanePaneMainWgt::newWindow()
{
    KrCorvaneChooser chooser(QStringLiteral("New"), d->kinds(), this,
                             KrBrickUserFiles::dialogParent());
    if (chooser.exec() != QDialog::Accepted)
        return nullptr;
    IKrBrickUser* prototype = chooser.getSelectedBrickUser();
    if (!prototype)
        return nullptr;

    // A new material always starts from the default material's network.
    IKrBrickUser* user = qobject_cast<KrBrickMaterial*>(prototype->getObject())
                             ? newDefaultBrickMaterial()
                             : prototype->createNew();
    if (!user)
        return nullptr;
    user->prepareBricks();

    QString name = chooser.getNameText().trimmed();
    if (name.isEmpty())
        name = user->getTypeLabel();
    user->setName(uniqueBrickUserName(name));

    KrCorvaneDockWidget* window = newWindow(user);
    window->getBrickScene()->arrange();
    return window;
}

void KrCorvanePaneMainWgt::nameChanged(const QString& newName)
{
    // For callers that connect by signature; the windows' own connection names the page.
    renameTab(qobject_cast<QWidget*>(sender()), newName);
}

void KrCorvanePaneMainWgt::renameTab(QWidget* page, const QString& newName)
{
    if (!page)
        return;
    const int index = d->ui.righttabs->indexOf(page);
    if (index >= 0)
        d->ui.righttabs->setTabText(index, newName);
}

KrCorvaneDockWidget* KrCorvanePaneMainWgt::newWindow(IKrBrickUser* user)
{
    bool rightToLeft = true;
    {
        KrAppSettings settings;
        settings.pushPath(QLatin1String(kGroup));
        rightToLeft = settings.getBoolValue(QStringLiteral("RightToLeft"), true);
    }
    auto* window = new KrCorvaneDockWidget(user, this, rightToLeft);
    // Filed before the page is added, so the tab change finds the window in the lists.
    d->openBrickUsers.append(user);
    d->openWindows.append(window);
    const int index = d->ui.righttabs->addTab(window, user->getName());
    d->ui.righttabs->setCurrentIndex(index);
    QPointer<KrCorvaneDockWidget> guard(window);
    connect(window, &KrCorvaneDockWidget::nameChanged, this,
            [this, guard](const QString& name) { renameTab(guard.data(), name); });
    return window;
}

void KrCorvanePaneMainWgt::open()
{
    QString error;
    IKrBrickUser* user = KrBrickUserFiles::openWithDialog(d->kinds(), &error);
    if (user)
        newWindow(user);
    else if (!error.isEmpty())
        errorToUserAndLog(error);
}

void KrCorvanePaneMainWgt::errorToUserAndLog(const QString& error)
{
    QMessageBox::critical(KrBrickUserFiles::dialogParent(), QStringLiteral("File read error"),
                          error, QMessageBox::Ok, QMessageBox::NoButton);
    qWarning("%s", qPrintable(error));
}

void KrCorvanePaneMainWgt::fromScene()
{
    KrCorvaneChooser chooser(QStringLiteral("Read from scene"), d->kinds(), this,
                             KrBrickUserFiles::dialogParent());
    chooser.getNameLabel()->hide();
    chooser.getNameBox()->hide();
    if (chooser.exec() != QDialog::Accepted)
        return;
    IKrBrickUser* prototype = chooser.getSelectedBrickUser();
    if (!prototype)
        return;

    QSet<QString> keys;
    const QList<IKrBrickUser*> sceneUsers = prototype->getSceneBrickUsers();
    for (IKrBrickUser* sceneUser : sceneUsers) {
        if (!sceneUser)
            continue;
        const QString key = sceneUser->getSceneKey();
        if (keys.contains(key))
            continue;
        keys.insert(key);
        IKrBrickUser* copy = sceneUser->createNew();
        if (!copy)
            continue;
        // The window edits a copy; the scene's brick user changes only on "Apply".
        const auto* source = qobject_cast<const KrElement*>(sceneUser->getObject());
        auto* target = qobject_cast<KrElement*>(copy->getObject());
        if (source && target) {
            KrSettings record;
            source->getAttributes(&record);
            target->setAttributes(&record);
        }
        copy->setFromScene(true);
        newWindow(copy);
    }
}

void KrCorvanePaneMainWgt::preferences()
{
    KrGenerealPrefDialog dialog(QStringLiteral("Duderovid Preferences..."),
                                KrBrickUserFiles::dialogParent());
    if (dialog.exec() == QDialog::Accepted)
        layoutTabs();
}

void KrCorvanePaneMainWgt::itemDoubleClicked(QTreeWidgetItem* item, int)
{
    KrBrickFactory factory;
    if (!KrDuderovid::factoryOf(item, &factory))
        return;
    KrShaderBrick* brick = factory.generateBrick();
    if (!brick)
        return;
    brick->ref();
    if (KrCorvaneDockWidget* window = getCurrentWindow())
        window->addBrickInCenter(brick);
    brick->unref();
}

void KrCorvanePaneMainWgt::currentTabChanged()
{
    KrCorvaneDockWidget* window = getCurrentWindow();
    KrElement* element = nullptr;
    KrBrickMaterial* material = nullptr;
    if (window) {
        element = qobject_cast<KrElement*>(window->getBrickUser()->getObject());
        material = qobject_cast<KrBrickMaterial*>(element);
    }
    d->propertiesView->setElement(element);
    setPreviewMaterial(d->previewButton, material);
    d->previewButton->setEnabled(material != nullptr);
}

void KrCorvanePaneMainWgt::previewSizeChanged()
{
    // Two toggles leave the collapsed state as it was and lay both sides out again.
    if (!d->divider)
        return;
    d->divider->toggleWidget();
    d->divider->toggleWidget();
}

// ---------------------------------------------------------------------------------------------

KrCorvanePaneAction::KrCorvanePaneAction() : KrPaneAction("KrCorvanePane") {}
