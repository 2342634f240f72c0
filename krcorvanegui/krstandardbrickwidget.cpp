#include "krstandardbrickwidget.h"

#include "krapp.h"
#include "krbrickparam.h"
#include "krclassfactory.h"
#include "krmainwindow.h"
#include "kroutputlabel.h"
#include "krpropertywgt.h"
#include "krshaderbrick.h"
#include "krundo.h"
#include "krwidgetgroup.h"

#include <QContextMenuEvent>
#include <QCoreApplication>
#include <QHash>
#include <QInputDialog>
#include <QMap>
#include <QMenu>
#include <QPointer>
#include <QSet>

namespace {
const QString kInputs = QStringLiteral("Inputs");
const QString kOutputs = QStringLiteral("Outputs");
const QString kSettings = QStringLiteral("Settings");

// Property widget classes found so far; emptied when the host's factories change so that a
// factory of an unloaded plug-in is never used.
KrClassFactory* findWidgetFactory(const QString& className)
{
    static QHash<QString, KrClassFactory*> cache;
    static bool watching = false;
    if (!watching) {
        watching = true;
        QObject::connect(krApp, &KrApp::classFactoriesChanged, [] { cache.clear(); });
    }
    if (KrClassFactory* factory = cache.value(className))
        return factory;
    KrClassFactory* factory = krApp->findClassFactory(className);
    if (factory)
        cache.insert(className, factory);
    return factory;
}

// Undo of "Change Label...".
class KrParamLabelUndoItem : public KrUndoItem
{
public:
    KrParamLabelUndoItem(KrBrickParam* param, const QString& oldLabel, const QString& newLabel)
        : m_param(param), m_old(oldLabel), m_new(newLabel)
    {
    }
    void undo() override
    {
        if (m_param)
            m_param->setLabel(m_old);
    }
    void redo() override
    {
        if (m_param)
            m_param->setLabel(m_new);
    }

private:
    QPointer<KrBrickParam> m_param;
    QString m_old, m_new;
};

// A wired advanced parameter stays: its wire must end somewhere.
bool listsParam(const KrBrickParam* param, bool hideAdvanced)
{
    return !(param->getIsAdvanced() && hideAdvanced && param->getNumConnections() < 1);
}
} // namespace

struct KrStandardBrickWidget::Private
{
    QPointer<KrShaderBrick> brick;
    KrWidgetListLayout* listLayout = nullptr;
    KrWidgetGroup* inputsGroup = nullptr;
    KrWidgetGroup* outputsGroup = nullptr;
    KrWidgetGroup* settingsGroup = nullptr;
    QMap<KrBrickParam*, QPointer<QWidget>> paramWidgets;
    KrTArray<KrTSharedPointer<KrOutputLabelProperty>> outputLabels{8};
    QPointer<QWidget> brickFrame;
    bool rebuildPending = false;
    bool layoutRefreshPending = false;
    QPointer<KrBrickParam> labelParam;
};

KrStandardBrickWidget::KrStandardBrickWidget() : KrBrickOptionsFrame(nullptr), d(new Private)
{
    setContentsMargins(0, 0, 0, 0);
    d->listLayout = new KrWidgetListLayout(this);
    d->listLayout->setContentsMargins(0, 0, 0, 0);
    d->listLayout->setSpacing(0);
    d->listLayout->setAlignment(Qt::AlignTop);
    connect(this, &KrBrickOptionsFrame::hideAdvancedChanged, this,
            &KrStandardBrickWidget::paramChange);
}

KrStandardBrickWidget::~KrStandardBrickWidget() = default;

void KrStandardBrickWidget::setBrickFrame(QWidget* frame)
{
    d->brickFrame = frame;
}

void KrStandardBrickWidget::setBrick(KrShaderBrick* brick)
{
    if (KrShaderBrick* old = d->brick) {
        disconnect(old, nullptr, this, nullptr);
        for (int i = 0; i < old->getNumParameters(); ++i) {
            if (KrBrickParam* param = old->getParameter(i))
                disconnect(param, nullptr, this, nullptr);
        }
    }
    d->brick = brick;
    KrBrickOptionsFrame::setBrick(brick);
    rebuild();
    if (brick) {
        connect(brick, &KrShaderBrick::paramAdded, this, &KrStandardBrickWidget::paramChange);
        connect(brick, &KrShaderBrick::paramRemoved, this, &KrStandardBrickWidget::paramChange);
        connect(brick, &KrShaderBrick::connectionsChanged, this,
                &KrBrickOptionsFrame::updateConnections);
        connect(brick, &KrShaderBrick::connectionsChanged, this,
                &KrStandardBrickWidget::connectionsChanged);
    }
}

void KrStandardBrickWidget::connectionsChanged()
{
    // A hidden advanced parameter that gets a wire (a paste, an undone disconnect) must be
    // listed to carry it, and one that loses its last wire goes back out of sight.
    KrShaderBrick* brick = d->brick;
    if (!brick || !hidesAdvanced())
        return;
    for (QListIterator<KrBrickParam*> it = brick->getParameterIterator(); it.hasNext();) {
        KrBrickParam* param = it.next();
        if (param && param->getIsAdvanced() &&
            listsParam(param, true) != d->paramWidgets.contains(param)) {
            paramChange();
            return;
        }
    }
}

KrShaderBrick* KrStandardBrickWidget::getBrick()
{
    return d->brick;
}

int KrStandardBrickWidget::getConnectorSize(KrBrickParam*)
{
    return 20;
}

QWidget* KrStandardBrickWidget::getParamWidget(KrBrickParam* param) const
{
    return d->paramWidgets.value(param);
}

void KrStandardBrickWidget::rebuild()
{
    d->rebuildPending = false;
    d->outputLabels.empty();
    d->paramWidgets.clear();
    for (KrWidgetGroup** group : {&d->inputsGroup, &d->outputsGroup, &d->settingsGroup}) {
        if (!*group)
            continue;
        (*group)->removeAllChildren();
        d->listLayout->removeWidget(*group);
        delete *group;
        *group = nullptr;
    }

    KrShaderBrick* brick = d->brick;
    if (!brick)
        return;

    QSet<KrProperty*> paramProperties;
    for (QListIterator<KrBrickParam*> it = brick->getParameterIterator(); it.hasNext();) {
        KrBrickParam* param = it.next();
        if (!param)
            continue;
        for (int i = 0; i < param->getNumParamProperties(); ++i)
            paramProperties.insert(param->getParamProperty(i));
    }
    QList<KrProperty*> localProperties;
    for (KrPropertyIterator it = brick->propertyListIterator(); it.hasNext();) {
        KrProperty* property = it.next();
        if (property && !paramProperties.contains(property))
            localProperties.append(property);
    }

    addParams(KrBrickParam::Output, d->outputsGroup, kOutputs);
    addParams(KrBrickParam::InternalOutput, d->outputsGroup, kOutputs);

    const bool separate = brick->shouldSeperateLocalProperties();
    if (!separate) {
        if (!d->inputsGroup)
            d->inputsGroup = makeGroup(kInputs, QStringLiteral("InputsGroup"));
        for (KrProperty* property : qAsConst(localProperties))
            addPropertyWidget(property, d->inputsGroup);
    }

    addParams(KrBrickParam::Input, d->inputsGroup, kInputs);
    addParams(KrBrickParam::ConstantInput, d->inputsGroup, kInputs);

    if (separate && !localProperties.isEmpty()) {
        if (!d->settingsGroup)
            d->settingsGroup = makeGroup(kSettings, QStringLiteral("SettingsGroup"));
        for (KrProperty* property : qAsConst(localProperties))
            addPropertyWidget(property, d->settingsGroup);
    }

    d->listLayout->invalidate();
    setMinimumSize(d->listLayout->totalMinimumSize());
    if (d->brickFrame)
        collapsedFired();
}

KrWidgetGroup* KrStandardBrickWidget::makeGroup(const QString& title, const QString& objectName)
{
    // The group puts itself at the end of the list, so groups show in the order made.
    auto* group = new KrWidgetGroup(d->listLayout, title, objectName, 0);
    connect(group, &KrWidgetGroup::collapsedChanged, this, &KrStandardBrickWidget::collapsedFired);
    return group;
}

void KrStandardBrickWidget::addParams(int direction, KrWidgetGroup*& group, const QString& title)
{
    const bool hideAdvanced = hidesAdvanced();
    for (QListIterator<KrBrickParam*> it = d->brick->getParameterIterator(); it.hasNext();) {
        KrBrickParam* param = it.next();
        if (!param || param->getDirection() != direction)
            continue;
        if (!listsParam(param, hideAdvanced))
            continue;
        if (!group)
            group = makeGroup(title, title + QStringLiteral("Group"));
        connect(param, &KrBrickParam::labelChanged, this, &KrStandardBrickWidget::paramChange,
                Qt::UniqueConnection);

        if (param->getNumParamProperties() > 0) {
            auto* sub =
                new KrWidgetGroup(group, param->getLabel(), QStringLiteral("WidgetGroup"), 1);
            group->addGroup(sub);
            connect(sub, &KrWidgetGroup::collapsedChanged, this,
                    &KrStandardBrickWidget::collapsedFired);
            d->paramWidgets.insert(param, sub->getBar());
            for (int i = 0; i < param->getNumParamProperties(); ++i)
                addPropertyWidget(param->getParamProperty(i), sub);
            sub->setCollapsed(true);
        } else {
            KrTSharedPointer<KrOutputLabelProperty> label(
                new KrOutputLabelProperty(param->getLabel()));
            if (KrPropertyWgt* widget = addPropertyWidget(label.data(), group)) {
                d->outputLabels.append(label);
                d->paramWidgets.insert(param, widget);
            }
        }
    }
}

KrPropertyWgt* KrStandardBrickWidget::addPropertyWidget(KrProperty* property, KrWidgetGroup* group)
{
    if (!property || !group)
        return nullptr;
    const QString className = property->getWidgetClassName();
    KrPropertyWgt* widget = nullptr;
    if (KrClassFactory* factory = findWidgetFactory(className)) {
        QObject* object = factory->createInstance();
        widget = qobject_cast<KrPropertyWgt*>(object);
        if (!widget)
            delete object;
    } else if (className == QLatin1String("KrLabelPropertyWgt")) {
        widget = new KrLabelPropertyWgt(nullptr, QString());
    }
    if (!widget)
        return nullptr;
    widget->setParent(this);
    widget->addProperty(property);
    group->addWidget(widget);
    widget->installEventFilter(this);
    return widget;
}

void KrStandardBrickWidget::resetLayout(bool updateParent)
{
    d->listLayout->invalidate();
    setMinimumSize(d->listLayout->totalMinimumSize());
    QWidget* frame = d->brickFrame;
    if (!frame)
        return;
    if (!updateParent) {
        collapsedFired();
        return;
    }
    const QSize remembered = frame->size();
    if (QLayout* frameLayout = frame->layout()) {
        frameLayout->invalidate();
        // With the frame's border, which its layout's own minimum leaves out.
        frame->setMinimumSize(frameLayout->totalMinimumSize());
    }
    if (remembered.width() >= 0 && remembered.height() >= 0)
        frame->resize(remembered.width(), frame->minimumHeight());
}

void KrStandardBrickWidget::collapsedFired()
{
    QCoreApplication::postEvent(this, new QEvent(QEvent::Type(LayoutRefreshEvent)));
    d->layoutRefreshPending = true;
}

void KrStandardBrickWidget::paramChange()
{
    if (d->rebuildPending)
        return;
    QCoreApplication::postEvent(this, new QEvent(QEvent::Type(RebuildEvent)));
    d->rebuildPending = true;
}

bool KrStandardBrickWidget::event(QEvent* event)
{
    switch (int(event->type())) {
    case RebuildEvent:
        rebuild();
        return true;
    case LayoutRefreshEvent:
        resetLayout(true);
        emit updateConnections();
        d->layoutRefreshPending = false;
        return true;
    default:
        return KrBrickOptionsFrame::event(event);
    }
}

bool KrStandardBrickWidget::eventFilter(QObject* watched, QEvent* event)
{
    if (event->type() == QEvent::LayoutRequest && !d->layoutRefreshPending &&
        qobject_cast<KrPropertyWgt*>(watched))
        collapsedFired();
    return false;
}

void KrStandardBrickWidget::showEvent(QShowEvent* event)
{
    collapsedFired();
    KrBrickOptionsFrame::showEvent(event);
}

void KrStandardBrickWidget::changeEvent(QEvent* event)
{
    if (event->type() == QEvent::StyleChange)
        collapsedFired();
    KrBrickOptionsFrame::changeEvent(event);
}

float KrStandardBrickWidget::getParamYPosition(KrBrickParam* param)
{
    if (!param)
        return -1;
    QWidget* widget = d->paramWidgets.value(param);
    const int direction = param->getDirection();
    if (d->outputsGroup && direction == KrBrickParam::Output && d->outputsGroup->isCollapsed())
        widget = d->outputsGroup->getBar();
    else if (d->inputsGroup && d->inputsGroup->isCollapsed() &&
             (direction == KrBrickParam::Input || direction == KrBrickParam::ConstantInput))
        widget = d->inputsGroup->getBar();
    if (!widget)
        return -1;
    return float(widget->mapTo(this, QPoint(0, 0)).y() + widget->height() / 2.0);
}

void KrStandardBrickWidget::contextMenuEvent(QContextMenuEvent* event)
{
    QWidget* child = childAt(event->pos());
    KrBrickParam* found = nullptr;
    for (QWidget* w : {child, child ? child->parentWidget() : nullptr}) {
        if (!w || found)
            continue;
        for (auto it = d->paramWidgets.cbegin(); it != d->paramWidgets.cend(); ++it) {
            if (it.value() == w) {
                found = it.key();
                break;
            }
        }
    }
    if (!found) {
        event->ignore();
        return;
    }
    d->labelParam = found;
    QMenu menu;
    QAction* change = menu.addAction(QStringLiteral("Change Label..."));
    connect(change, &QAction::triggered, this, &KrStandardBrickWidget::promptForLabel);
    menu.exec(event->globalPos());
    event->accept();
}

void KrStandardBrickWidget::promptForLabel()
{
    // Forgotten whatever the answer; the guard notices a parameter removed meanwhile.
    const QPointer<KrBrickParam> param = d->labelParam;
    d->labelParam = nullptr;
    if (!param)
        return;
    const QString old = param->getLabel();
    bool ok = false;
    const QString text =
        QInputDialog::getText(krApp->getInterface(), QStringLiteral("Set Label"),
                              QStringLiteral("Label"), QLineEdit::Normal, old, &ok);
    // The parameter may have gone while the question was open.
    if (!ok || text.isEmpty() || !param || text == old)
        return;
    KrUndoStackHold hold;
    param->setLabel(text);
    if (param)
        krApp->getUndoStack()->push(new KrParamLabelUndoItem(param, old, text));
    hold.accept(QStringLiteral("Change Label"));
}
