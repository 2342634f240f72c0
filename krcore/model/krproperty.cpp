#include "krproperty.h"

#include "krundo.h"

#include <QPointer>

namespace {
// One change of a property's value. It holds the property weakly: once the property is gone
// the step does nothing.
class KrPropertyUndoItem : public KrUndoItem
{
public:
    KrPropertyUndoItem(KrProperty* property, const QVariant& before, const QVariant& after)
        : m_property(property), m_before(before), m_after(after)
    {
    }
    void undo() override
    {
        if (m_property)
            m_property->setValue(m_before);
    }
    void redo() override
    {
        if (m_property)
            m_property->setValue(m_after);
    }
    int size() const override { return int(sizeof(*this)) + 2 * int(sizeof(QVariant)); }

private:
    QPointer<KrProperty> m_property;
    QVariant m_before;
    QVariant m_after;
};

QString normalizedPath(const QString& path)
{
    const QStringList parts = path.split(QLatin1Char('/'), Qt::SkipEmptyParts);
    QStringList trimmed;
    for (const QString& part : parts) {
        const QString t = part.trimmed();
        if (!t.isEmpty())
            trimmed.append(t);
    }
    return QLatin1Char('/') + trimmed.join(QLatin1Char('/'));
}
} // namespace

KrProperty::KrProperty(const QString& name, QObject* parent) : KrBase(name, parent) {}

KrProperty::~KrProperty() = default;

bool KrProperty::setValueUndoable(const QVariant& value, const QString& text)
{
    const QVariant before = getValue();
    if (!setValue(value))
        return false;
    pushUndoStep(before, text);
    return true;
}

bool KrProperty::pushUndoStep(const QVariant& before, const QString& text)
{
    const QVariant after = getValue();
    if (before == after || !krUndoStack || !krUndoStack->canPushItems())
        return false;
    KrUndoStackHold hold;
    krUndoStack->push(new KrPropertyUndoItem(this, before, after));
    hold.accept(text.isEmpty() ? tr("Change %1").arg(getName()) : text);
    return true;
}

// Paths are kept as "/A/B": one leading slash, no empty or blank parts, so "A/B", "/A/B/"
// and "//A//B" name the same group.
void KrProperty::setPath(const QString& path)
{
    const QString p = normalizedPath(path);
    if (p == m_path)
        return;
    m_path = p;
    emit pathChanged(m_path);
}

void KrProperty::setHidden(bool hidden)
{
    if (hidden == m_hidden)
        return;
    m_hidden = hidden;
    emit hiddenChanged(hidden);
    emit stateChanged();
}

void KrProperty::setReadOnly(bool readOnly)
{
    if (readOnly == m_readOnly)
        return;
    m_readOnly = readOnly;
    emit stateChanged();
}
