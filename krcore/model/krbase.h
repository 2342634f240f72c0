#pragma once

#include "krcore_global.h"

#include <QObject>
#include <QString>

// A named object of the host.
class KRCORE_EXPORT KrBase : public QObject
{
    Q_OBJECT
public:
    explicit KrBase(const QString& name = QString(), QObject* parent = nullptr);
    ~KrBase() override;

public slots:
    QString getName() const { return m_name; }
    virtual void setName(const QString& name);

signals:
    void nameChanged(const QString& name);

private:
    QString m_name;
};

// An intrusive reference count. ref() takes one, unref() drops one and deletes the object when
// the last goes. A fresh object has a count of 0, so the first holder's ref()/unref() pair
// releases it.
class KRCORE_EXPORT KrRefCountedItem
{
public:
    KrRefCountedItem() = default;
    virtual ~KrRefCountedItem();
    void ref() const { ++m_refCount; }
    void unref() const;
    int refCount() const { return m_refCount; }

protected:
    // Called when the count drops to 0; deletes by default. QObjects may defer with deleteLater.
    virtual void releaseItem();

private:
    Q_DISABLE_COPY(KrRefCountedItem)
    mutable int m_refCount = 0;
};

// A shared pointer over KrRefCountedItem.
template <class T> class KrTSharedPointer
{
public:
    KrTSharedPointer(T* p = nullptr) : m_p(p)
    {
        if (m_p)
            m_p->ref();
    }
    KrTSharedPointer(const KrTSharedPointer& o) : KrTSharedPointer(o.m_p) {}
    ~KrTSharedPointer()
    {
        if (m_p)
            m_p->unref();
    }
    KrTSharedPointer& operator=(const KrTSharedPointer& o)
    {
        if (o.m_p != m_p) {
            if (o.m_p)
                o.m_p->ref();
            T* old = m_p;
            m_p = o.m_p;
            if (old)
                old->unref();
        }
        return *this;
    }
    T* data() const { return m_p; }
    T* operator->() const { return m_p; }
    T& operator*() const { return *m_p; }
    explicit operator bool() const { return m_p != nullptr; }
    bool operator==(const KrTSharedPointer& o) const { return m_p == o.m_p; }

private:
    T* m_p;
};
