#include "krbrickframe.h"

#include "krapp.h"
#include "krbrickaction.h"
#include "krbrickgraphicsitem.h"
#include "krbrickoptionsframe.h"
#include "krbricktitlebar.h"
#include "krbrickuserscene.h"
#include "krclassfactory.h"
#include "krcorvanedockwidget.h"
#include "krcorvanepane.h"
#include "krcorvaneutility.h"
#include "krdefaultbrickuser.h"
#include "krmainwindow.h"
#include "krsettings.h"
#include "krshaderbrick.h"
#include "krstandardbrickwidget.h"
#include "krundo.h"

#include <QBitmap>
#include <QFileDialog>
#include <QGraphicsProxyWidget>
#include <QGraphicsScene>
#include <QGraphicsView>
#include <QGridLayout>
#include <QHBoxLayout>
#include <QHash>
#include <QInputDialog>
#include <QMenu>
#include <QMessageBox>
#include <QMouseEvent>
#include <QPainter>
#include <QPixmap>
#include <QPointer>
#include <QSaveFile>
#include <QStackedLayout>
#include <QStyleOption>
#include <QVBoxLayout>

namespace {
const QString kHideParamsKey = QStringLiteral("HideParams");
const QString kShowAdvancedKey = QStringLiteral("ShowAdvanced");
const QString kBrickTitleKey = QStringLiteral("BrickTitle");

// Brick action classes found so far. Emptied whenever the host's factories change, so that a
// factory of an unloaded plug-in is never used.
QHash<QString, KrClassFactory*>& actionFactoryCache()
{
    static QHash<QString, KrClassFactory*> cache;
    static bool watching = false;
    if (!watching) {
        watching = true;
        QObject::connect(krApp, &KrApp::classFactoriesChanged, [] { cache.clear(); });
    }
    return cache;
}

KrClassFactory* findActionFactory(const QString& className)
{
    QHash<QString, KrClassFactory*>& cache = actionFactoryCache();
    if (KrClassFactory* factory = cache.value(className))
        return factory;
    KrClassFactory* factory = krApp->findClassFactory(className);
    if (!factory || !factory->provides("KrBrickAction"))
        return nullptr;
    cache.insert(className, factory);
    return factory;
}

QHash<KrShaderBrick*, KrBrickFrame*>& liveFrames()
{
    static QHash<KrShaderBrick*, KrBrickFrame*> frames;
    return frames;
}

QWidget* dialogParent()
{
    return krApp->getInterface();
}

// Undo of "Change Title": the title lives in the brick; views follow its brickTitleChanged().
class KrBrickTitleUndoItem : public KrUndoItem
{
public:
    KrBrickTitleUndoItem(KrShaderBrick* brick, const QString& oldTitle, const QString& newTitle)
        : m_brick(brick), m_old(oldTitle), m_new(newTitle)
    {
    }
    void undo() override { apply(m_old); }
    void redo() override { apply(m_new); }
    int size() const override { return int(sizeof(*this)) + 2 * (m_old.size() + m_new.size()); }

private:
    void apply(const QString& title)
    {
        if (m_brick)
            m_brick->setBrickTitle(title);
    }
    QPointer<KrShaderBrick> m_brick;
    QString m_old, m_new;
};

// Undo of "Hide Parameters" and "Show Advanced". The brick's settings record has no change
// signal, so the live frame (if any) is told directly.
class KrBrickViewFlagUndoItem : public KrUndoItem
{
public:
    enum Flag
    {
        HideParams,
        ShowAdvanced
    };
    KrBrickViewFlagUndoItem(KrShaderBrick* brick, Flag flag, bool oldValue, bool newValue)
        : m_brick(brick), m_flag(flag), m_old(oldValue), m_new(newValue)
    {
    }
    void undo() override { apply(m_old); }
    void redo() override { apply(m_new); }

private:
    void apply(bool value)
    {
        if (!m_brick)
            return;
        if (KrBrickFrame* frame = KrBrickFrame::findFrame(m_brick)) {
            if (m_flag == HideParams)
                frame->applyHideParams(value);
            else
                frame->applyShowAdvanced(value);
        } else if (KrSettings* settings = m_brick->getBrickSettings()) {
            settings->setBoolValue(m_flag == HideParams ? kHideParamsKey : kShowAdvancedKey, value);
        }
    }
    QPointer<KrShaderBrick> m_brick;
    Flag m_flag;
    bool m_old, m_new;
};

void pushStep(KrUndoItem* item, const QString& text)
{
    KrUndoStackHold hold;
    krApp->getUndoStack()->push(item);
    hold.accept(text);
}
} // namespace

int krBrickFrameMetric(const QStyle* style, KrBrickFrameMetric metric, const QWidget* widget)
{
    int number = QStyle::PM_CustomBase;
    int fallback = 0;
    switch (metric) {
    case KrBrickFrameMetric::TitleBarHeight:
        number += 0x13;
        fallback = 18;
        break;
    case KrBrickFrameMetric::ResizeButton:
        number += 10;
        fallback = 14;
        break;
    case KrBrickFrameMetric::OptionsButton:
        number += 61;
        fallback = 14;
        break;
    }
    const int value = style ? style->pixelMetric(QStyle::PixelMetric(number), nullptr, widget) : 0;
    return value > 0 ? value : fallback;
}

// ----------------------------------------------------------------------------- KrBrickFrame

struct KrBrickFrame::Private
{
    KrBrickResizeButton* resizeButton = nullptr;
    KrBrickTitleBar* titleBar = nullptr;
    KrTabBarOptionsBtn* optionsButton = nullptr;
    KrBrickBar* brickBar = nullptr;
    QPointer<KrShaderBrick> brick;
    // The key this frame is listed under among the live frames (the brick may be gone).
    KrShaderBrick* listedUnder = nullptr;
    KrBrickOptionsFrame* optionFrame = nullptr;
    QMenu* brickMenu = nullptr;
    QAction* hideParamsAction = nullptr;
    QAction* deleteAction = nullptr;
    QAction* showAdvancedAction = nullptr;
    QAction* saveBrickAction = nullptr;
    QAction* changeTitleAction = nullptr;
    KrBrickGraphicsItem* item = nullptr;
    // The actions the brick contributed to the menu's last build.
    QList<QPointer<QAction>> brickActions;
    bool resizing = false;

    KrSettings* settings() const { return brick ? brick->getBrickSettings() : nullptr; }
    bool flag(const QString& key) const
    {
        KrSettings* s = settings();
        return s && s->getBoolValue(key, false);
    }
    void setFlag(const QString& key, bool value)
    {
        if (KrSettings* s = settings())
            s->setBoolValue(key, value);
    }
};

KrBrickFrame::KrBrickFrame(KrShaderBrick* brick, KrBrickGraphicsItem* item, QWidget* parent)
    : QFrame(parent), d(new Private)
{
    d->item = item;
    d->brick = brick;

    setAutoFillBackground(true);
    setBackgroundRole(QPalette::Window);
    setContentsMargins(0, 0, 0, 0);
    setFrameShape(QFrame::Panel);
    setFrameShadow(QFrame::Raised);
    setLineWidth(2);

    auto* vbox = new QVBoxLayout;
    vbox->setContentsMargins(0, 0, 0, 0);
    vbox->setSpacing(0);
    auto* grid = new QGridLayout;
    grid->setContentsMargins(0, 0, 0, 0);

    d->titleBar = new KrBrickTitleBar(this, QStringLiteral("BrickTitleBar"));
    d->brickBar = new KrBrickBar(this, QStringLiteral("BrickTitleBar"));

    QString title;
    if (KrSettings* settings = d->settings()) {
        title = settings->getStringValue(kBrickTitleKey);
        // An empty stored title is no title: the brick would show a blank bar.
        if (title.isEmpty())
            title = defaultTitle();
    }
    d->brickBar->addTab(title);
    // Through the brick, so that property groups named after the brick follow the title.
    if (brick)
        brick->setBrickTitle(title);

    d->optionsButton = new KrTabBarOptionsBtn(nullptr, QStringLiteral("BrickOptionsButton"));

    auto* stack = new QStackedLayout;
    stack->setStackingMode(QStackedLayout::StackAll);
    stack->setContentsMargins(0, 0, 0, 0);
    auto* overlay = new QWidget;
    auto* overlayLayout = new QHBoxLayout(overlay);
    overlayLayout->setContentsMargins(0, 0, 0, 0);
    overlayLayout->addStretch(1);
    overlayLayout->addWidget(d->optionsButton, 0);
    stack->addWidget(d->brickBar);
    stack->addWidget(overlay);
    // The overlay is the top of the stack, over the bar.
    stack->setCurrentWidget(overlay);

    vbox->addWidget(d->titleBar, 0);
    vbox->addLayout(stack);

    KrBrickOptionsFrame* optionFrame = nullptr;
    if (brick) {
        if (KrClassFactory* factory = krApp->findClassFactory(brick->getOptionsFrameClassName())) {
            QObject* object = factory->createInstance();
            optionFrame = qobject_cast<KrBrickOptionsFrame*>(object);
            if (!optionFrame)
                delete object;
        }
    }
    if (!optionFrame)
        optionFrame = new KrStandardBrickWidget();
    optionFrame->setBrickFrame(this);
    optionFrame->setBrick(brick);
    vbox->addWidget(optionFrame, 10);
    d->optionFrame = optionFrame;

    vbox->addLayout(grid);
    d->resizeButton = new KrBrickResizeButton(this);
    d->resizeButton->installEventFilter(this);
    grid->setColumnStretch(0, 0);
    grid->setColumnStretch(1, 2);
    grid->addWidget(d->resizeButton, 0, 2);

    d->brickMenu = new QMenu(this);
    // A real pop-up, not a widget inside the scene: readable at every zoom.
    d->brickMenu->setWindowFlags(d->brickMenu->windowFlags() | Qt::BypassGraphicsProxyWidget);
    d->hideParamsAction = new QAction(QStringLiteral("Hide Parameters"), this);
    d->hideParamsAction->setCheckable(true);
    d->showAdvancedAction = new QAction(QStringLiteral("Show Advanced"), this);
    d->showAdvancedAction->setCheckable(true);
    d->deleteAction = new QAction(QStringLiteral("Delete"), this);
    d->changeTitleAction = new QAction(QStringLiteral("Change Title..."), this);
    d->saveBrickAction = new QAction(QStringLiteral("Save Brick..."), this);
    connect(d->hideParamsAction, &QAction::triggered, this, &KrBrickFrame::hideParams);
    connect(d->deleteAction, &QAction::triggered, this, &KrBrickFrame::closeClicked);
    connect(d->showAdvancedAction, &QAction::triggered, this, &KrBrickFrame::advanceView);
    connect(d->saveBrickAction, &QAction::triggered, this, &KrBrickFrame::saveBrick);
    connect(d->changeTitleAction, &QAction::triggered, this, &KrBrickFrame::changeTitle);
    setLayout(vbox);

    applyHideParams(d->flag(kHideParamsKey));
    optionFrame->setHideAdvanced(!d->flag(kShowAdvancedKey));

    setUpBrickActions();

    if (brick) {
        liveFrames().insert(brick, this);
        d->listedUnder = brick;
        // A later brick at the same address must not find this frame.
        connect(brick, &QObject::destroyed, this, [this, brick] {
            if (liveFrames().value(brick) == this)
                liveFrames().remove(brick);
        });
        connect(brick, &KrShaderBrick::brickActionListChanged, this,
                &KrBrickFrame::setUpBrickActions);
        connect(brick, &KrShaderBrick::brickTitleChanged, this, &KrBrickFrame::brickTitleChanged);
    }
    connect(d->optionsButton, &QPushButton::clicked, this, &KrBrickFrame::doMenu);
    connect(d->titleBar, &KrBrickTitleBar::closeClicked, this, &KrBrickFrame::closeClicked);
    connect(d->titleBar, &KrBrickTitleBar::dragStarted, this, &KrBrickFrame::moveStarted);
    connect(d->titleBar, &KrBrickTitleBar::dragFinished, this, &KrBrickFrame::moveFinished);
}

KrBrickFrame::~KrBrickFrame()
{
    QHash<KrShaderBrick*, KrBrickFrame*>& frames = liveFrames();
    const auto it = frames.find(d->listedUnder);
    if (it != frames.end() && it.value() == this)
        frames.erase(it);
}

KrBrickFrame* KrBrickFrame::findFrame(KrShaderBrick* brick)
{
    return brick ? liveFrames().value(brick) : nullptr;
}

QString KrBrickFrame::defaultTitle() const
{
    if (!d->brick)
        return QString();
    return d->brick->getPreferredName() + QStringLiteral("(%1)").arg(d->brick->getBrickID());
}

KrShaderBrick* KrBrickFrame::getBrick()
{
    return d->brick;
}

KrBrickOptionsFrame* KrBrickFrame::getOptionFrame()
{
    return d->optionFrame;
}

KrBrickTitleBar* KrBrickFrame::getTitleBar()
{
    return d->titleBar;
}

QMenu* KrBrickFrame::getBrickMenu()
{
    return d->brickMenu;
}

void KrBrickFrame::setUpBrickActions()
{
    QMenu* menu = d->brickMenu;
    menu->clear();
    // An action may be the one whose trigger made the brick change its list: let it finish.
    for (const QPointer<QAction>& action : qAsConst(d->brickActions)) {
        if (action)
            action->deleteLater();
    }
    d->brickActions.clear();

    const QStringList entries = d->brick ? d->brick->getBrickActionList() : QStringList();
    for (const QString& entry : entries) {
        if (entry.isEmpty()) {
            menu->addSeparator();
            continue;
        }
        const int split = entry.indexOf(QLatin1String("::"));
        const QString className = split >= 1 ? entry.left(split) : entry;
        const QString argument = split >= 1 ? entry.mid(split + 2) : QString();
        KrClassFactory* factory = findActionFactory(className);
        if (!factory)
            continue;
        QObject* object = factory->createInstance();
        auto* action = qobject_cast<KrBrickAction*>(object);
        if (!action) {
            delete object;
            continue;
        }
        action->setParent(this);
        action->setOptionsFrame(d->optionFrame);
        action->setActionArgument(argument);
        menu->addAction(action);
        d->brickActions.append(action);
    }

    menu->addSeparator();
    menu->addAction(d->hideParamsAction);
    menu->addAction(d->showAdvancedAction);
    menu->addSeparator();
    menu->addAction(d->deleteAction);
    menu->addSeparator();
    menu->addAction(d->changeTitleAction);
    menu->addAction(d->saveBrickAction);
    // The check marks always tell the stored state, also after a rebuild.
    d->hideParamsAction->setChecked(d->flag(kHideParamsKey));
    d->showAdvancedAction->setChecked(d->flag(kShowAdvancedKey));
}

void KrBrickFrame::doMenu()
{
    d->brickMenu->exec(d->optionsButton->mapToGlobal(QPoint(0, 0)));
}

void KrBrickFrame::shrinkToLayout()
{
    QLayout* l = layout();
    if (!l)
        return;
    l->invalidate();
    setMinimumHeight(l->totalMinimumSize().height());
    setMaximumHeight(l->totalMaximumSize().height());
    resize(width(), minimumHeight());
}

void KrBrickFrame::applyHideParams(bool onOff)
{
    if (d->optionFrame)
        d->optionFrame->setVisible(!onOff);
    if (onOff)
        shrinkToLayout();
    else
        // Drop the cap of the collapsed state so the parameters can take their room again.
        setMaximumHeight(QWIDGETSIZE_MAX);
    d->setFlag(kHideParamsKey, onOff);
    d->hideParamsAction->setChecked(onOff);
}

void KrBrickFrame::applyShowAdvanced(bool onOff)
{
    if (d->optionFrame)
        d->optionFrame->setHideAdvanced(!onOff);
    if (!onOff)
        shrinkToLayout();
    d->setFlag(kShowAdvancedKey, onOff);
    d->showAdvancedAction->setChecked(onOff);
}

void KrBrickFrame::hideParams(bool onOff)
{
    const bool old = d->flag(kHideParamsKey);
    applyHideParams(onOff);
    if (d->brick && old != onOff)
        pushStep(
            new KrBrickViewFlagUndoItem(d->brick, KrBrickViewFlagUndoItem::HideParams, old, onOff),
            QStringLiteral("Hide Parameters"));
}

void KrBrickFrame::advanceView(bool onOff)
{
    const bool old = d->flag(kShowAdvancedKey);
    applyShowAdvanced(onOff);
    if (d->brick && old != onOff)
        pushStep(new KrBrickViewFlagUndoItem(d->brick, KrBrickViewFlagUndoItem::ShowAdvanced, old,
                                             onOff),
                 QStringLiteral("Show Advanced"));
}

void KrBrickFrame::changeTitle()
{
    KrSettings* settings = d->settings();
    if (!settings)
        return;
    const QString current = settings->getStringValue(kBrickTitleKey, defaultTitle());
    bool ok = false;
    const QString text =
        QInputDialog::getText(dialogParent(), QStringLiteral("Set Title"), QStringLiteral("Title"),
                              QLineEdit::Normal, current, &ok);
    if (ok && !text.isEmpty())
        setBrickTitle(text);
}

void KrBrickFrame::setBrickTitle(const QString& title)
{
    KrSettings* settings = d->settings();
    if (!settings)
        return;
    const QString old = settings->getStringValue(kBrickTitleKey);
    if (old == title)
        return;
    d->brick->setBrickTitle(title);
    pushStep(new KrBrickTitleUndoItem(d->brick, old, title), QStringLiteral("Change Title"));
}

void KrBrickFrame::brickTitleChanged(const QString& title)
{
    d->brickBar->setTabText(0, title);
}

void KrBrickFrame::saveBrick()
{
    KrSettings* settings = d->settings();
    if (!settings)
        return;
    const QString folder = KrCorvaneUtility::getCustomBrickPath();
    KrCorvaneUtility::createDirs(folder);
    const QString title = settings->getStringValue(kBrickTitleKey);
    const QString proposed = folder + QLatin1Char('/') + title + QStringLiteral(".kcb");

    // Built here rather than through the static call so that a name typed without ".kcb"
    // gets it (the brick library lists only such files) and the overwrite question covers
    // the name actually written.
    QFileDialog dialog(dialogParent(), tr("Save brick.."), proposed, tr("Bricks(*.kcb)"));
    dialog.setAcceptMode(QFileDialog::AcceptSave);
    dialog.setFileMode(QFileDialog::AnyFile);
    dialog.setDefaultSuffix(QStringLiteral("kcb"));
    dialog.selectFile(proposed);
    if (dialog.exec() != QDialog::Accepted)
        return;
    const QString fileName = dialog.selectedFiles().value(0);
    if (fileName.isEmpty())
        return;

    QString error;
    if (!writeBrickFile(fileName, &error)) {
        QMessageBox::critical(dialogParent(), tr("File write error"),
                              tr("The brick could not be saved to %1.\n%2")
                                  .arg(QDir::toNativeSeparators(fileName), error));
    }
    rebuildUserBricks();
    if (error.isEmpty())
        emit brickSaved(fileName);
}

bool KrBrickFrame::writeBrickFile(const QString& fileName, QString* error) const
{
    KrSettings record;
    KrDefaultBrickUser::writeBrickToSettings(d->brick, &record, false);
    const KrSettings* brickRecord = record.getSettingsValue(record.getKey(0));
    if (!brickRecord) {
        *error = tr("The brick has no record to write.");
        return false;
    }
    QSaveFile file(fileName);
    if (!file.open(QIODevice::WriteOnly)) {
        *error = file.errorString();
        return false;
    }
    // UTF-8, as the brick library reads it back, so titles outside ASCII survive.
    const QByteArray bytes = brickRecord->toString().toUtf8();
    if (file.write(bytes) != bytes.size() || !file.commit()) {
        *error = file.errorString();
        file.cancelWriting();
        return false;
    }
    return true;
}

void KrBrickFrame::rebuildUserBricks()
{
    // From the item through its scene to the window that shows it, and on to the pane.
    QGraphicsItem* item = d->item;
    if (!item)
        item = graphicsProxyWidget();
    QGraphicsScene* scene = item ? item->scene() : nullptr;
    if (!scene)
        return;
    KrCorvaneDockWidget* window = nullptr;
    if (auto* brickScene = qobject_cast<KrBrickUserScene*>(scene))
        window = brickScene->getDockWindow();
    const QList<QGraphicsView*> views = scene->views();
    for (int i = 0; !window && i < views.size(); ++i) {
        for (QWidget* w = views.at(i); w && !window; w = w->parentWidget())
            window = qobject_cast<KrCorvaneDockWidget*>(w);
    }
    if (KrCorvanePaneMainWgt* main = window ? window->getMainParent() : nullptr)
        main->createUserMenuAndTree();
}

void KrBrickFrame::resizeEvent(QResizeEvent* event)
{
    emit resized();
    QFrame::resizeEvent(event);
}

bool KrBrickFrame::eventFilter(QObject* watched, QEvent* event)
{
    if (watched == d->resizeButton) {
        if (event->type() == QEvent::MouseButtonPress &&
            static_cast<QMouseEvent*>(event)->button() == Qt::LeftButton && !d->resizing) {
            d->resizing = true;
            emit resizeStarted();
        } else if (event->type() == QEvent::MouseButtonRelease &&
                   static_cast<QMouseEvent*>(event)->button() == Qt::LeftButton && d->resizing) {
            d->resizing = false;
            emit resizeFinished();
        }
    }
    return QFrame::eventFilter(watched, event);
}

// ---------------------------------------------------------------------- KrBrickResizeButton

KrBrickResizeButton::KrBrickResizeButton(QWidget* parent)
    : KrStyledButton(parent, QStringLiteral("ResizeButton"))
{
    updateSize();
}

KrBrickResizeButton::~KrBrickResizeButton() = default;

void KrBrickResizeButton::updateSize()
{
    const int side = krBrickFrameMetric(style(), KrBrickFrameMetric::ResizeButton, this) / 2;
    setFixedSize(side, side);
}

void KrBrickResizeButton::changeEvent(QEvent* event)
{
    if (event->type() == QEvent::StyleChange) {
        updateSize();
        return;
    }
    KrStyledButton::changeEvent(event);
}

int KrBrickResizeButton::horizontalPosition(QMouseEvent* event) const
{
    return parentWidget() ? mapToParent(event->pos()).x() : event->globalX();
}

void KrBrickResizeButton::mousePressEvent(QMouseEvent* event)
{
    KrStyledButton::mousePressEvent(event);
    // The edge follows the pointer from the first move on.
    if (event->button() == Qt::LeftButton) {
        m_lastX = horizontalPosition(event);
        m_firstMove = false;
    }
}

void KrBrickResizeButton::mouseMoveEvent(QMouseEvent* event)
{
    if (!(event->buttons() & Qt::LeftButton))
        return;
    const int x = horizontalPosition(event);
    if (m_firstMove) {
        m_lastX = x;
        m_firstMove = false;
        return;
    }
    if (QWidget* frame = parentWidget())
        frame->resize(frame->width() + (x - m_lastX), frame->height());
    m_lastX = x;
}

void KrBrickResizeButton::mouseReleaseEvent(QMouseEvent*)
{
    m_firstMove = true;
    // No clicked() for a drag; only the pressed look is taken back.
    setDown(false);
}

// ------------------------------------------------------------------------------- KrBrickBar

KrBrickBar::KrBrickBar(QWidget* parent, const QString& name) : QTabBar(parent)
{
    setObjectName(name);
    setAutoFillBackground(true);
    setBackgroundRole(QPalette::Window);
    setDrawBase(false);
    setUsesScrollButtons(true);
    setExpanding(false);
}

KrBrickBar::~KrBrickBar() = default;

void KrBrickBar::paintEvent(QPaintEvent* event)
{
    QStyleOption option(1, QStyleOption::SO_Default);
    option.initFrom(this);
    {
        QPainter painter(this);
        style()->drawPrimitive(QStyle::PrimitiveElement(QStyle::PE_CustomBase + 42), &option,
                               &painter, this);
    }
    QTabBar::paintEvent(event);
}

// ----------------------------------------------------------------------- KrTabBarOptionsBtn

KrTabBarOptionsBtn::KrTabBarOptionsBtn(QWidget* parent, const QString& name) : QPushButton(parent)
{
    setObjectName(name);
    updateSize();
    updateMask();
    connect(this, &QPushButton::pressed, this, QOverload<>::of(&QWidget::update));
    connect(this, &QPushButton::released, this, QOverload<>::of(&QWidget::update));
}

KrTabBarOptionsBtn::~KrTabBarOptionsBtn() = default;

void KrTabBarOptionsBtn::updateSize()
{
    const int side = krBrickFrameMetric(style(), KrBrickFrameMetric::OptionsButton, this);
    setFixedSize(side, side);
}

void KrTabBarOptionsBtn::updateMask()
{
    const auto hint = QStyle::StyleHint(QStyle::SH_CustomBase + 3);
    if (style()->styleHint(hint, nullptr, this) == 0) {
        clearMask();
        return;
    }
    QPixmap pixmap(size());
    pixmap.fill(Qt::black);
    QStyleOptionButton option;
    initStyleOption(&option);
    option.rect = QRect(QPoint(0, 0), size());
    {
        QPainter painter(&pixmap);
        style()->drawPrimitive(QStyle::PrimitiveElement(QStyle::PE_CustomBase + 44), &option,
                               &painter, this);
    }
    setMask(QBitmap(pixmap));
}

void KrTabBarOptionsBtn::changeEvent(QEvent* event)
{
    QPushButton::changeEvent(event);
    if (event->type() == QEvent::StyleChange) {
        updateSize();
        updateMask();
    }
}

void KrTabBarOptionsBtn::paintEvent(QPaintEvent*)
{
    QStyle::State state = QStyle::State_None;
    if (isEnabled())
        state |= QStyle::State_Enabled;
    if (hasFocus())
        state |= QStyle::State_HasFocus;
    if (isDown())
        state |= QStyle::State_DownArrow;
    if (isChecked())
        state |= QStyle::State_On;
    if (!isFlat() && !isDown())
        state |= QStyle::State_Raised;
    QStyleOptionButton option;
    initStyleOption(&option);
    if (isDefault())
        option.features |= QStyleOptionButton::DefaultButton;
    option.rect = rect();
    option.state = state;
    QPainter painter(this);
    style()->drawControl(QStyle::ControlElement(QStyle::CE_CustomBase + 0), &option, &painter,
                         this);
}
