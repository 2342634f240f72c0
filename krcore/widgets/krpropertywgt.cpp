#include "krpropertywgt.h"

#include "krclassfactory.h"
#include "krplugin.h"
#include "krproperty.h"
#include "krundo.h"
#include "krwidgetgroup.h"

#include <QEvent>
#include <QHBoxLayout>
#include <QLabel>
#include <QPointer>

KR_CORE_CLASS(KrBasicPropertyWgt, "6F1C2A10-3B4D-4E5F-8A9B-0C1D2E3F4A50");

// ----------------------------------------------------------------------------- KrPropertyWgt

struct KrPropertyWgt::Private
{
    QList<QPointer<KrProperty>> properties;
    bool selected = false;
    int level = 0;
    bool updating = false;
    bool live = false;
    // Values at the start of a live edit, paired with their properties.
    QList<QPair<QPointer<KrProperty>, QVariant>> liveBefore;

    QList<KrProperty*> live_properties() const
    {
        QList<KrProperty*> list;
        for (const QPointer<KrProperty>& p : properties) {
            if (p)
                list.append(p.data());
        }
        return list;
    }
};

KrPropertyWgt::KrPropertyWgt(QWidget* parent, const QString& name) : QWidget(parent), d(new Private)
{
    setObjectName(name);
}

KrPropertyWgt::~KrPropertyWgt() = default;

void KrPropertyWgt::addProperty(KrProperty* property)
{
    if (!property || d->properties.contains(property))
        return;
    d->properties.append(property);
    connect(property, &KrProperty::valueChanged, this, [this]() { propertyValueChanged(); });
    connect(property, &KrProperty::stateChanged, this, [this]() { propertyStateChanged(); });
    connect(property, &KrBase::nameChanged, this, [this]() { propertyNameChanged(); });
    connect(property, &KrProperty::constraintsChanged, this,
            [this]() { propertyConstraintsChanged(); });
    connect(property, &QObject::destroyed, this, [this]() {
        // The QPointer is already null here.
        d->properties.removeAll(QPointer<KrProperty>());
        propertiesChanged();
    });
    propertiesChanged();
}

int KrPropertyWgt::getNumProperties() const
{
    return d->live_properties().size();
}

KrProperty* KrPropertyWgt::getFirstProperty() const
{
    return getProperty(0);
}

KrProperty* KrPropertyWgt::getProperty(int i) const
{
    return d->live_properties().value(i, nullptr);
}

void KrPropertyWgt::setSelected(bool selected)
{
    d->selected = selected;
}

bool KrPropertyWgt::showsValue() const
{
    return true;
}

void KrPropertyWgt::setLevel(int level)
{
    d->level = qMax(0, level);
}

bool KrPropertyWgt::isSelected() const
{
    return d->selected;
}

int KrPropertyWgt::getLevel() const
{
    return d->level;
}

void KrPropertyWgt::propertyValueChanged() {}
void KrPropertyWgt::propertyStateChanged() {}
void KrPropertyWgt::propertyNameChanged() {}
void KrPropertyWgt::propertyConstraintsChanged() {}
void KrPropertyWgt::propertiesChanged() {}

bool KrPropertyWgt::isEditable() const
{
    const QList<KrProperty*> props = d->live_properties();
    if (props.isEmpty())
        return false;
    for (KrProperty* p : props) {
        if (p->isReadOnly())
            return false;
    }
    return true;
}

namespace {
QString changeText(KrProperty* first)
{
    return KrPropertyWgt::tr("Change %1").arg(first->getName());
}

// One step for every property whose value moved away from its value before.
void commitSteps(const QList<QPair<QPointer<KrProperty>, QVariant>>& before)
{
    QList<QPair<KrProperty*, QVariant>> changed;
    for (const auto& pair : before) {
        if (pair.first && pair.first->getValue() != pair.second)
            changed.append(qMakePair(pair.first.data(), pair.second));
    }
    if (changed.isEmpty() || !krUndoStack)
        return;
    const QString text = changeText(changed.first().first);
    KrUndoStackHold hold;
    for (const auto& pair : changed)
        pair.first->pushUndoStep(pair.second, text);
    hold.accept(text);
}
} // namespace

void KrPropertyWgt::applyValue(const QVariant& value)
{
    if (!isEditable() || d->live)
        return;
    QList<QPair<QPointer<KrProperty>, QVariant>> before;
    for (KrProperty* p : d->live_properties())
        before.append(qMakePair(QPointer<KrProperty>(p), p->getValue()));
    for (const auto& pair : before) {
        if (pair.first)
            pair.first->setValue(value);
    }
    commitSteps(before);
}

void KrPropertyWgt::beginLiveEdit()
{
    if (d->live || !isEditable())
        return;
    d->live = true;
    d->liveBefore.clear();
    for (KrProperty* p : d->live_properties())
        d->liveBefore.append(qMakePair(QPointer<KrProperty>(p), p->getValue()));
}

void KrPropertyWgt::applyLiveValue(const QVariant& value)
{
    if (!d->live)
        return;
    for (const auto& pair : d->liveBefore) {
        if (pair.first)
            pair.first->setValue(value);
    }
}

void KrPropertyWgt::endLiveEdit()
{
    if (!d->live)
        return;
    d->live = false;
    const auto before = d->liveBefore;
    d->liveBefore.clear();
    commitSteps(before);
}

bool KrPropertyWgt::isLiveEditing() const
{
    return d->live;
}

bool KrPropertyWgt::isUpdating() const
{
    return d->updating;
}

void KrPropertyWgt::setUpdating(bool updating)
{
    d->updating = updating;
}

// ------------------------------------------------------------------------ KrBasicPropertyWgt

namespace {
const int kMargin = 4;

// The name column: 40 % of the row within limits, less the row's indent, so that the editors
// of every row of one list line up whatever their level.
int nameColumnWidth(int rowWidth, int level)
{
    const int column = qBound(72, rowWidth * 2 / 5, 160);
    return qMax(32, column - KrWidgetGroup::IndentPerLevel * level);
}
} // namespace

struct KrBasicPropertyWgt::Private
{
    QHBoxLayout* layout = nullptr;
    QLabel* name = nullptr;
    QWidget* editor = nullptr;
    QHBoxLayout* editorLayout = nullptr;
    QLabel* value = nullptr; // only when no subclass shows the value
};

KrBasicPropertyWgt::KrBasicPropertyWgt(QWidget* parent, const QString& name)
    : KrPropertyWgt(parent, name), d(new Private)
{
    setSizePolicy(QSizePolicy::Preferred, QSizePolicy::Fixed);
    d->layout = new QHBoxLayout(this);
    d->layout->setContentsMargins(kMargin, 1, kMargin, 1);
    d->layout->setSpacing(6);
    d->name = new QLabel(this);
    d->name->setObjectName(QStringLiteral("PropertyName"));
    d->layout->addWidget(d->name);
    d->editor = new QWidget(this);
    d->editor->setObjectName(QStringLiteral("PropertyEditor"));
    d->editorLayout = new QHBoxLayout(d->editor);
    d->editorLayout->setContentsMargins(0, 0, 0, 0);
    d->editorLayout->setSpacing(4);
    d->layout->addWidget(d->editor, 1);
    refresh();
}

KrBasicPropertyWgt::~KrBasicPropertyWgt() = default;

QLabel* KrBasicPropertyWgt::nameLabel() const
{
    return d->name;
}

QWidget* KrBasicPropertyWgt::editorArea() const
{
    return d->editor;
}

QHBoxLayout* KrBasicPropertyWgt::editorLayout() const
{
    return d->editorLayout;
}

void KrBasicPropertyWgt::updateEditor()
{
    if (!d->value) {
        d->value = new QLabel(d->editor);
        d->value->setObjectName(QStringLiteral("PropertyValue"));
        d->value->setTextInteractionFlags(Qt::TextSelectableByMouse);
        d->editorLayout->addWidget(d->value, 1);
    }
    KrProperty* p = getFirstProperty();
    d->value->setText(p ? p->getValue().toString() : QString());
}

void KrBasicPropertyWgt::updateEditorState()
{
    d->editor->setEnabled(getNumProperties() > 0);
}

void KrBasicPropertyWgt::refresh()
{
    KrProperty* p = getFirstProperty();
    const bool showValue = showsValue();
    const QString name = p ? p->getName() : QString();
    if (showValue) {
        updateNameColumn();
    } else {
        d->name->setMinimumWidth(0);
        d->name->setMaximumWidth(QWIDGETSIZE_MAX);
        d->name->setText(name);
        d->name->setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Preferred);
    }
    d->name->setToolTip(p ? QStringLiteral("%1 (%2)").arg(name, p->getTypeLabel()) : QString());
    d->editor->setVisible(showValue);
    if (showValue && p) {
        setUpdating(true);
        updateEditor();
        setUpdating(false);
    }
    updateEditorState();
}

void KrBasicPropertyWgt::updateNameColumn()
{
    if (!showsValue())
        return;
    KrProperty* p = getFirstProperty();
    const QString name = p ? p->getName() : QString();
    const int width = nameColumnWidth(this->width(), getLevel());
    d->name->setFixedWidth(width);
    d->name->setSizePolicy(QSizePolicy::Fixed, QSizePolicy::Preferred);
    d->name->setText(d->name->fontMetrics().elidedText(name, Qt::ElideRight, width));
}

void KrBasicPropertyWgt::resizeEvent(QResizeEvent* event)
{
    KrPropertyWgt::resizeEvent(event);
    updateNameColumn();
}

void KrBasicPropertyWgt::propertyValueChanged()
{
    if (!showsValue())
        return;
    setUpdating(true);
    updateEditor();
    setUpdating(false);
}

void KrBasicPropertyWgt::propertyStateChanged()
{
    updateEditorState();
}

void KrBasicPropertyWgt::propertyNameChanged()
{
    refresh();
}

void KrBasicPropertyWgt::propertyConstraintsChanged()
{
    propertyValueChanged();
}

void KrBasicPropertyWgt::propertiesChanged()
{
    refresh();
}

void KrBasicPropertyWgt::setSelected(bool selected)
{
    KrPropertyWgt::setSelected(selected);
    // Selected rows take the highlight; others show their parent's background.
    setAutoFillBackground(selected);
    setBackgroundRole(selected ? QPalette::Highlight : QPalette::Window);
    d->name->setForegroundRole(selected ? QPalette::HighlightedText : QPalette::WindowText);
    update();
}

void KrBasicPropertyWgt::setLevel(int level)
{
    KrPropertyWgt::setLevel(level);
    d->layout->setContentsMargins(kMargin + KrWidgetGroup::IndentPerLevel * getLevel(), 1, kMargin,
                                  1);
    refresh();
}

void KrBasicPropertyWgt::changeEvent(QEvent* event)
{
    if (event->type() == QEvent::FontChange)
        refresh();
    KrPropertyWgt::changeEvent(event);
}
