#pragma once

#include "krpropertylistview.h"

#include <QPointer>
#include <QStringList>

class KrElement;
class KrPropertyWgt;

// The "Properties" tab: the visible properties of the current brick user's element, kept in
// step with it, with a context menu that renames a property or moves it to another group.
class KrBrickUserPropertiesView : public KrPropertyListView
{
    Q_OBJECT
public:
    explicit KrBrickUserPropertiesView(QWidget* parent = nullptr, const QString& name = QString());
    ~KrBrickUserPropertiesView() override;

    void setElement(KrElement* element);
    KrElement* getElement() const;

    // Names offered by the rename dialog for the kind of element shown.
    QStringList defaultPropertyNames() const;
    // The element's group paths, each once, in property order.
    QStringList propertyGroupPaths() const;

public slots:
    void updateProperties();
    void renameProperty();
    void regroupProperty();

protected:
    void contextMenuEvent(QContextMenuEvent* event) override;

private:
    QPointer<KrElement> m_element;
    QPointer<KrPropertyWgt> m_currentPropertyWgt;
};
