#pragma once

#include "krbase.h"

#include <QList>
#include <QListIterator>

class KrProperty;
class KrSettings;

typedef QListIterator<KrProperty*> KrPropertyIterator;

// An object of the host's scene or model with a list of properties (materials, lights, bricks).
// The list does not own its properties: whoever adds a property keeps it alive (usually as
// its QObject parent) and removes it before it goes.
class KRCORE_EXPORT KrElement : public KrBase
{
    Q_OBJECT
public:
    explicit KrElement(const QString& name = QString(), QObject* parent = nullptr);
    ~KrElement() override;

    KrPropertyIterator propertyListIterator() const;
    QList<KrProperty*> getProperties() const;

    void addProperty(KrProperty* property);                   // emits propertyListChanged()
    void removeProperty(KrProperty* property);                // emits propertyListChanged()
    void setProperties(const QList<KrProperty*>& properties); // one propertyListChanged()

    // Writes the element's state (name and property values) into settings; setAttributes
    // reads it back. Subclasses add what they own. setAttributes answers false when the record
    // could not be read at all.
    // Layout: "Name" (string) and the nested record "Properties" with each value under its
    // property's name (a second property of the same name under a numbered variant, so none
    // overwrites another). Values missing from the record or of the wrong type are left as
    // they are.
    virtual void getAttributes(KrSettings* settings) const;
    virtual bool setAttributes(const KrSettings* settings);

public slots:
    int getNumProperties() const;
    KrProperty* getProperty(int i) const;                // null when out of range
    KrProperty* findProperty(const QString& name) const; // null when none has that name
    // True when name is used by no property. With makeUnique, a used name is changed in place
    // to a free one ("Name1", "Name2", ...) and the answer is true.
    bool isPropertyNameUnique(QString& name, bool makeUnique) const;

signals:
    void propertyListChanged(); // properties added, removed, hidden or shown again
    void propertyTreeChanged(); // a property's path changed

private:
    void watch(KrProperty* property);
    QList<KrProperty*> m_properties;
};
