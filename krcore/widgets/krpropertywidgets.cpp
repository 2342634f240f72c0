#include "krpropertywidgets.h"

#include "krapp.h"
#include "krclassfactory.h"
#include "krplugin.h"
#include "krproperty.h"

#include <QCheckBox>
#include <QColorDialog>
#include <QComboBox>
#include <QDoubleSpinBox>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLineEdit>
#include <QPainter>
#include <QSlider>
#include <QSpinBox>
#include <QToolButton>
#include <cmath>
#include <limits>

KR_CORE_CLASS(KrIntPropertyWgt, "6F1C2A10-3B4D-4E5F-8A9B-0C1D2E3F4A51");
KR_CORE_CLASS(KrFloatPropertyWgt, "6F1C2A10-3B4D-4E5F-8A9B-0C1D2E3F4A52");
KR_CORE_CLASS(KrBoolPropertyWgt, "6F1C2A10-3B4D-4E5F-8A9B-0C1D2E3F4A53");
KR_CORE_CLASS(KrStringPropertyWgt, "6F1C2A10-3B4D-4E5F-8A9B-0C1D2E3F4A54");
KR_CORE_CLASS(KrColorPropertyWgt, "6F1C2A10-3B4D-4E5F-8A9B-0C1D2E3F4A55");
KR_CORE_CLASS(KrEnumPropertyWgt, "6F1C2A10-3B4D-4E5F-8A9B-0C1D2E3F4A56");

namespace {
// Spin boxes size themselves by the text of their limits, which for an open range is absurdly
// wide; property rows keep a compact width and stretch from there.
template <class Base> class KrCompactSpinBox : public Base
{
public:
    using Base::Base;
    QSize sizeHint() const override { return compact(Base::sizeHint()); }
    QSize minimumSizeHint() const override { return compact(Base::minimumSizeHint()); }

private:
    QSize compact(QSize s) const
    {
        const int cap = this->fontMetrics().horizontalAdvance(QStringLiteral("-000000.000")) + 28;
        s.setWidth(qMin(s.width(), cap));
        return s;
    }
};

QSlider* makeSlider(QWidget* parent)
{
    auto* slider = new QSlider(Qt::Horizontal, parent);
    slider->setObjectName(QStringLiteral("PropertySlider"));
    slider->setMinimumWidth(40);
    slider->setFocusPolicy(Qt::StrongFocus);
    slider->hide();
    return slider;
}

bool intRanged(const KrIntProperty* p)
{
    return p && p->getMinimum() != std::numeric_limits<int>::min() &&
           p->getMaximum() != std::numeric_limits<int>::max() && p->getMaximum() > p->getMinimum();
}

bool floatRanged(const KrFloatProperty* p)
{
    return p && p->getMinimum() > -std::numeric_limits<double>::max() &&
           p->getMaximum() < std::numeric_limits<double>::max() &&
           p->getMaximum() > p->getMinimum();
}
} // namespace

// -------------------------------------------------------------------------- KrIntPropertyWgt

struct KrIntPropertyWgt::Private
{
    QSpinBox* spin = nullptr;
    QSlider* slider = nullptr;
};

KrIntPropertyWgt::KrIntPropertyWgt(QWidget* parent, const QString& name)
    : KrBasicPropertyWgt(parent, name), d(new Private)
{
    d->spin = new KrCompactSpinBox<QSpinBox>(editorArea());
    d->spin->setObjectName(QStringLiteral("PropertySpinBox"));
    // Commit on Return, focus loss and arrow steps, not on every keystroke.
    d->spin->setKeyboardTracking(false);
    d->spin->setAccelerated(true);
    d->spin->setRange(std::numeric_limits<int>::min(), std::numeric_limits<int>::max());
    d->slider = makeSlider(editorArea());
    editorLayout()->addWidget(d->spin, 1);
    editorLayout()->addWidget(d->slider, 2);

    connect(d->spin, QOverload<int>::of(&QSpinBox::valueChanged), this, [this](int v) {
        if (!isUpdating())
            applyValue(v);
    });
    // A drag is applied live and recorded as one step when the handle is let go.
    connect(d->slider, &QSlider::sliderPressed, this, [this]() { beginLiveEdit(); });
    connect(d->slider, &QSlider::valueChanged, this, [this](int v) {
        if (isUpdating())
            return;
        if (isLiveEditing())
            applyLiveValue(v);
        else
            applyValue(v);
    });
    connect(d->slider, &QSlider::sliderReleased, this, [this]() { endLiveEdit(); });
}

KrIntPropertyWgt::~KrIntPropertyWgt() = default;

QSpinBox* KrIntPropertyWgt::spinBox() const
{
    return d->spin;
}

QSlider* KrIntPropertyWgt::slider() const
{
    return d->slider;
}

void KrIntPropertyWgt::updateEditor()
{
    KrProperty* first = getFirstProperty();
    if (!first)
        return;
    const auto* p = qobject_cast<const KrIntProperty*>(first);
    const int value = first->getValue().toInt();
    if (p) {
        d->spin->setRange(p->getMinimum(), p->getMaximum());
        d->spin->setSingleStep(p->getStep());
    }
    d->spin->setValue(value);
    const bool ranged = intRanged(p);
    d->slider->setVisible(ranged);
    if (ranged) {
        d->slider->setRange(p->getMinimum(), p->getMaximum());
        d->slider->setSingleStep(p->getStep());
        d->slider->setPageStep(qMax(1, (p->getMaximum() - p->getMinimum()) / 10));
        if (!d->slider->isSliderDown())
            d->slider->setValue(value);
    }
}

void KrIntPropertyWgt::updateEditorState()
{
    KrBasicPropertyWgt::updateEditorState();
    d->spin->setEnabled(isEditable());
    d->slider->setEnabled(isEditable());
}

// ------------------------------------------------------------------------ KrFloatPropertyWgt

struct KrFloatPropertyWgt::Private
{
    QDoubleSpinBox* spin = nullptr;
    QSlider* slider = nullptr;
    double min = 0.0;
    double max = 1.0;

    int toSlider(double v) const { return int(std::lround((v - min) / (max - min) * SliderSteps)); }
    double fromSlider(int pos) const
    {
        return pos >= SliderSteps ? max : min + (max - min) * pos / SliderSteps;
    }
};

KrFloatPropertyWgt::KrFloatPropertyWgt(QWidget* parent, const QString& name)
    : KrBasicPropertyWgt(parent, name), d(new Private)
{
    d->spin = new KrCompactSpinBox<QDoubleSpinBox>(editorArea());
    d->spin->setObjectName(QStringLiteral("PropertySpinBox"));
    d->spin->setKeyboardTracking(false);
    d->spin->setAccelerated(true);
    d->slider = makeSlider(editorArea());
    d->slider->setRange(0, SliderSteps);
    d->slider->setPageStep(SliderSteps / 10);
    editorLayout()->addWidget(d->spin, 1);
    editorLayout()->addWidget(d->slider, 2);

    connect(d->spin, QOverload<double>::of(&QDoubleSpinBox::valueChanged), this, [this](double v) {
        if (!isUpdating())
            applyValue(v);
    });
    connect(d->slider, &QSlider::sliderPressed, this, [this]() { beginLiveEdit(); });
    connect(d->slider, &QSlider::valueChanged, this, [this](int pos) {
        if (isUpdating())
            return;
        const double v = d->fromSlider(pos);
        if (isLiveEditing())
            applyLiveValue(v);
        else
            applyValue(v);
    });
    connect(d->slider, &QSlider::sliderReleased, this, [this]() { endLiveEdit(); });
}

KrFloatPropertyWgt::~KrFloatPropertyWgt() = default;

QDoubleSpinBox* KrFloatPropertyWgt::spinBox() const
{
    return d->spin;
}

QSlider* KrFloatPropertyWgt::slider() const
{
    return d->slider;
}

void KrFloatPropertyWgt::updateEditor()
{
    KrProperty* first = getFirstProperty();
    if (!first)
        return;
    const auto* p = qobject_cast<const KrFloatProperty*>(first);
    const double value = first->getValue().toDouble();
    if (p) {
        d->spin->setDecimals(p->getDecimals());
        d->spin->setSingleStep(p->getStep());
    }
    // An open range still needs limits in the box; they widen to take the value.
    const double open = 1e15;
    const double lo = p && p->getMinimum() > -std::numeric_limits<double>::max()
                          ? p->getMinimum()
                          : qMin(-open, value);
    const double hi = p && p->getMaximum() < std::numeric_limits<double>::max() ? p->getMaximum()
                                                                                : qMax(open, value);
    d->spin->setRange(lo, hi);
    d->spin->setValue(value);
    const bool ranged = floatRanged(p);
    d->slider->setVisible(ranged);
    if (ranged) {
        d->min = p->getMinimum();
        d->max = p->getMaximum();
        if (!d->slider->isSliderDown())
            d->slider->setValue(d->toSlider(value));
    }
}

void KrFloatPropertyWgt::updateEditorState()
{
    KrBasicPropertyWgt::updateEditorState();
    d->spin->setEnabled(isEditable());
    d->slider->setEnabled(isEditable());
}

// ------------------------------------------------------------------------- KrBoolPropertyWgt

KrBoolPropertyWgt::KrBoolPropertyWgt(QWidget* parent, const QString& name)
    : KrBasicPropertyWgt(parent, name)
{
    m_check = new QCheckBox(editorArea());
    m_check->setObjectName(QStringLiteral("PropertyCheckBox"));
    editorLayout()->addWidget(m_check);
    editorLayout()->addStretch(1);
    connect(m_check, &QCheckBox::toggled, this, [this](bool on) {
        if (!isUpdating())
            applyValue(on);
    });
}

KrBoolPropertyWgt::~KrBoolPropertyWgt() = default;

QCheckBox* KrBoolPropertyWgt::checkBox() const
{
    return m_check;
}

void KrBoolPropertyWgt::updateEditor()
{
    if (KrProperty* p = getFirstProperty())
        m_check->setChecked(p->getValue().toBool());
}

void KrBoolPropertyWgt::updateEditorState()
{
    KrBasicPropertyWgt::updateEditorState();
    m_check->setEnabled(isEditable());
}

// ----------------------------------------------------------------------- KrStringPropertyWgt

KrStringPropertyWgt::KrStringPropertyWgt(QWidget* parent, const QString& name)
    : KrBasicPropertyWgt(parent, name)
{
    m_edit = new QLineEdit(editorArea());
    m_edit->setObjectName(QStringLiteral("PropertyLineEdit"));
    m_edit->installEventFilter(this);
    editorLayout()->addWidget(m_edit, 1);
    connect(m_edit, &QLineEdit::editingFinished, this, [this]() { commit(); });
}

KrStringPropertyWgt::~KrStringPropertyWgt() = default;

QLineEdit* KrStringPropertyWgt::lineEdit() const
{
    return m_edit;
}

void KrStringPropertyWgt::commit()
{
    KrProperty* p = getFirstProperty();
    if (isUpdating() || !p || m_edit->text() == p->getValue().toString())
        return;
    applyValue(m_edit->text());
}

bool KrStringPropertyWgt::eventFilter(QObject* watched, QEvent* event)
{
    if (watched == m_edit && event->type() == QEvent::KeyPress &&
        static_cast<QKeyEvent*>(event)->key() == Qt::Key_Escape) {
        setUpdating(true);
        updateEditor();
        setUpdating(false);
        m_edit->selectAll();
        return true;
    }
    return KrBasicPropertyWgt::eventFilter(watched, event);
}

void KrStringPropertyWgt::updateEditor()
{
    KrProperty* p = getFirstProperty();
    const QString text = p ? p->getValue().toString() : QString();
    if (m_edit->text() != text)
        m_edit->setText(text);
}

void KrStringPropertyWgt::updateEditorState()
{
    KrBasicPropertyWgt::updateEditorState();
    m_edit->setReadOnly(!isEditable());
}

// ------------------------------------------------------------------------ KrColorPropertyWgt

namespace {
QIcon swatchIcon(const QColor& color, const QSize& size)
{
    QPixmap pixmap(size);
    pixmap.fill(Qt::transparent);
    QPainter p(&pixmap);
    const QRect r(0, 0, size.width(), size.height());
    if (color.alpha() < 255) {
        // A checkerboard shows through a translucent colour.
        const int cell = 4;
        for (int y = 0; y < r.height(); y += cell) {
            for (int x = 0; x < r.width(); x += cell)
                p.fillRect(x, y, cell, cell, ((x + y) / cell) % 2 ? Qt::lightGray : Qt::white);
        }
    }
    p.fillRect(r, color);
    p.setPen(QColor(0, 0, 0, 110));
    p.drawRect(r.adjusted(0, 0, -1, -1));
    p.end();
    QIcon icon;
    icon.addPixmap(pixmap, QIcon::Normal);
    icon.addPixmap(pixmap, QIcon::Disabled);
    return icon;
}
} // namespace

KrColorPropertyWgt::KrColorPropertyWgt(QWidget* parent, const QString& name)
    : KrBasicPropertyWgt(parent, name)
{
    m_button = new QToolButton(editorArea());
    m_button->setObjectName(QStringLiteral("PropertyColorButton"));
    m_button->setToolButtonStyle(Qt::ToolButtonTextBesideIcon);
    m_button->setIconSize(QSize(36, 14));
    m_button->setSizePolicy(QSizePolicy::Expanding, QSizePolicy::Fixed);
    editorLayout()->addWidget(m_button, 1);
    connect(m_button, &QToolButton::clicked, this, &KrColorPropertyWgt::chooseColor);
}

KrColorPropertyWgt::~KrColorPropertyWgt() = default;

QToolButton* KrColorPropertyWgt::colorButton() const
{
    return m_button;
}

void KrColorPropertyWgt::chooseColor()
{
    KrProperty* p = getFirstProperty();
    if (!p || !isEditable())
        return;
    const auto* cp = qobject_cast<const KrColorProperty*>(p);
    QColorDialog dialog(m_color, krApp->getDialogParent());
    dialog.setWindowTitle(tr("Select %1").arg(p->getName()));
    dialog.setOption(QColorDialog::DontUseNativeDialog, true);
    dialog.setOption(QColorDialog::ShowAlphaChannel, cp && cp->hasAlpha());
    if (dialog.exec() != QDialog::Accepted)
        return;
    const QColor chosen = dialog.selectedColor();
    if (chosen.isValid())
        applyValue(QVariant(chosen));
}

void KrColorPropertyWgt::updateEditor()
{
    KrProperty* p = getFirstProperty();
    m_color = p ? p->getValue().value<QColor>() : QColor();
    m_button->setIcon(
        swatchIcon(m_color.isValid() ? m_color : QColor(Qt::transparent), m_button->iconSize()));
    m_button->setText(m_color.isValid() ? m_color.name().toUpper() : QString());
    m_button->setToolTip(m_button->text());
}

void KrColorPropertyWgt::updateEditorState()
{
    KrBasicPropertyWgt::updateEditorState();
    m_button->setEnabled(isEditable());
}

// ------------------------------------------------------------------------- KrEnumPropertyWgt

KrEnumPropertyWgt::KrEnumPropertyWgt(QWidget* parent, const QString& name)
    : KrBasicPropertyWgt(parent, name)
{
    m_combo = new QComboBox(editorArea());
    m_combo->setObjectName(QStringLiteral("PropertyComboBox"));
    m_combo->setSizeAdjustPolicy(QComboBox::AdjustToMinimumContentsLengthWithIcon);
    m_combo->setMinimumContentsLength(6);
    editorLayout()->addWidget(m_combo, 1);
    connect(m_combo, QOverload<int>::of(&QComboBox::activated), this, [this](int index) {
        if (!isUpdating() && index >= 0)
            applyValue(index);
    });
}

KrEnumPropertyWgt::~KrEnumPropertyWgt() = default;

QComboBox* KrEnumPropertyWgt::comboBox() const
{
    return m_combo;
}

void KrEnumPropertyWgt::updateEditor()
{
    KrProperty* p = getFirstProperty();
    if (!p)
        return;
    QStringList items;
    if (const auto* e = qobject_cast<const KrEnumProperty*>(p))
        items = e->getItems();
    QStringList current;
    for (int i = 0; i < m_combo->count(); ++i)
        current.append(m_combo->itemText(i));
    if (current != items) {
        m_combo->clear();
        m_combo->addItems(items);
    }
    m_combo->setCurrentIndex(p->getValue().toInt());
}

void KrEnumPropertyWgt::updateEditorState()
{
    KrBasicPropertyWgt::updateEditorState();
    m_combo->setEnabled(isEditable());
}
