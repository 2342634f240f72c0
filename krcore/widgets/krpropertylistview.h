#pragma once

#include "krcore_global.h"

#include <QScrollArea>
#include <memory>

class KrProperty;
class KrPropertyWgt;
class KrWidgetGroup;
class KrWidgetListLayout;

// A scrolling list of property widgets. Properties are grouped by their path: "/" rows sit
// at the top level, "/A/B" rows in group "B" inside group "A".
class KRCORE_EXPORT KrPropertyListView : public QScrollArea
{
    Q_OBJECT
public:
    explicit KrPropertyListView(QWidget* parent = nullptr, const QString& name = QString());
    ~KrPropertyListView() override;

public slots:
    // Makes the widget named by the property's getWidgetClassName() through its class
    // factory (a read-only KrBasicPropertyWgt when there is none) and lists it. Null for a
    // null property.
    KrPropertyWgt* addProperty(KrProperty* property);
    void clear();
    QList<KrPropertyWgt*> getPropertyWidgets() const;
    KrWidgetGroup* findGroup(const QString& path) const; // null for "/" or an unknown path
    KrWidgetListLayout* getListLayout() const;

private:
    KrWidgetGroup* groupForPath(const QString& path);
    struct Private;
    std::unique_ptr<Private> d;
};
