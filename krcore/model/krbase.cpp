#include "krbase.h"

KrBase::KrBase(const QString& name, QObject* parent) : QObject(parent), m_name(name) {}

KrBase::~KrBase() = default;

void KrBase::setName(const QString& name)
{
    if (name == m_name)
        return;
    m_name = name;
    emit nameChanged(m_name);
}

KrRefCountedItem::~KrRefCountedItem() = default;

void KrRefCountedItem::unref() const
{
    // An unbalanced unref must not delete twice.
    if (m_refCount <= 0) {
        qWarning("KrRefCountedItem::unref(): no reference left to drop");
        return;
    }
    if (--m_refCount == 0)
        const_cast<KrRefCountedItem*>(this)->releaseItem();
}

void KrRefCountedItem::releaseItem()
{
    delete this;
}
