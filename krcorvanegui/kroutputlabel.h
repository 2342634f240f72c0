#pragma once

#include "krbase.h"
#include "krproperty.h"
#include "krpropertywgt.h"

#include <QDebug>
#include <QString>
#include <QtGlobal>
#include <climits>
#include <new>

// The row of a parameter that has no properties to edit (an output): an integer property that
// only carries the parameter's label as its name and is shown by a KrLabelPropertyWgt.
class KrOutputLabelProperty : public KrIntProperty, public KrRefCountedItem
{
    Q_OBJECT
public:
    explicit KrOutputLabelProperty(const QString& name);
    ~KrOutputLabelProperty() override;

    QString getWidgetClassName() const override;
};

// Shows a property's name only, over the whole row.
class KrLabelPropertyWgt : public KrBasicPropertyWgt
{
    Q_OBJECT
public:
    KrLabelPropertyWgt(QWidget* parent, const QString& name);
    ~KrLabelPropertyWgt() override;

public slots:
    bool showsValue() const override;
};

// A growable array whose slots always hold constructed elements (default ones when unused).
// Removing moves later elements down by assignment, so shared pointers keep their counts
// right. Misuse is reported as a warning "<file>(<line>): <message>" and leaves the array as
// it was.
template <class T> class KrTArray
{
public:
    explicit KrTArray(int growth = 8) : m_growth(growth > 0 ? growth : 8) {}
    virtual ~KrTArray() { freeAll(); }

    // The header as the compiler named it: the file part of the warnings.
    static QString sourceFile() { return QString::fromLocal8Bit(__FILE__); }

    int count() const { return m_count; }
    int capacity() const { return m_capacity; }
    int growth() const { return m_growth; }
    const T& at(int i) const { return m_data[i]; }
    T& operator[](int i) { return m_data[i]; }
    const T& operator[](int i) const { return m_data[i]; }

    void append(const T& element)
    {
        if (m_count >= m_capacity && !addSpace(m_growth, true))
            return;
        m_data[m_count] = element;
        ++m_count;
    }

    // Adds n slots; with keep the elements in use are carried over, else they are dropped
    // (the count stays, the slots hold default elements).
    bool addSpace(int n, bool keep)
    {
        if (n <= 0 || n > INT_MAX - m_capacity) {
            warn(__FILE__, __LINE__,
                 QStringLiteral("Invalid size '%1' passed to KrTArray::addSpace()").arg(n));
            return false;
        }
        T* data = new (std::nothrow) T[m_capacity + n];
        if (!data) {
            warn(__FILE__, __LINE__,
                 QStringLiteral("Out of memory for size '%1' in KrTArray::addSpace()").arg(n));
            return false;
        }
        if (keep) {
            for (int i = 0; i < m_count; ++i)
                data[i] = m_data[i];
        }
        delete[] m_data;
        m_data = data;
        m_capacity += n;
        return true;
    }

    virtual void removeByIndex(int index, int count)
    {
        if (index < 0 || index >= m_count) {
            warn(__FILE__, __LINE__,
                 QStringLiteral("Invalid starting index specified in KrTArray::removeByIndex()"));
            return;
        }
        if (count <= 0) {
            warn(__FILE__, __LINE__,
                 QStringLiteral("Invalid count '%1' specified in KrTArray::removeByIndex()")
                     .arg(count));
            return;
        }
        if (count > m_count - index) {
            warn(__FILE__, __LINE__,
                 QStringLiteral(
                     "Too many items specified for removal in KrTArray::removeByIndex()"));
            count = m_count - index;
        }
        for (int i = index + count; i < m_count; ++i)
            m_data[i - count] = m_data[i];
        m_count -= count;
    }

    // Forgets the elements without releasing them: the slots are reused by later appends.
    virtual void empty() { m_count = 0; }

    // Releases every element and the storage.
    virtual void freeAll()
    {
        delete[] m_data;
        m_data = nullptr;
        m_count = 0;
        m_capacity = 0;
    }

private:
    Q_DISABLE_COPY(KrTArray)
    static void warn(const char* file, int line, const QString& message)
    {
        qWarning().noquote() << QStringLiteral("%1(%2): %3")
                                    .arg(QString::fromLocal8Bit(file))
                                    .arg(line)
                                    .arg(message);
    }

    int m_count = 0;
    int m_capacity = 0;
    int m_growth;
    T* m_data = nullptr;
};
