#include "krpropertylistview.h"

#include "krapp.h"
#include "krclassfactory.h"
#include "krproperty.h"
#include "krpropertywgt.h"
#include "krwidgetgroup.h"

#include <QHash>
#include <QPointer>

struct KrPropertyListView::Private
{
    QWidget* content = nullptr;
    KrWidgetListLayout* layout = nullptr;
    QHash<QString, KrWidgetGroup*> groups; // by normalised path ("/A/B")
    QList<QPointer<KrPropertyWgt>> widgets;
};

KrPropertyListView::KrPropertyListView(QWidget* parent, const QString& name)
    : QScrollArea(parent), d(new Private)
{
    setObjectName(name);
    setWidgetResizable(true);
    setHorizontalScrollBarPolicy(Qt::ScrollBarAlwaysOff);
    setFrameShape(QFrame::NoFrame);
    d->content = new QWidget;
    d->content->setObjectName(QStringLiteral("PropertyListContent"));
    d->layout = new KrWidgetListLayout(d->content);
    d->layout->setContentsMargins(0, 0, 0, 0);
    d->layout->setSpacing(1);
    d->layout->setAlignment(Qt::AlignTop);
    setWidget(d->content);
}

KrPropertyListView::~KrPropertyListView() = default;

KrWidgetListLayout* KrPropertyListView::getListLayout() const
{
    return d->layout;
}

KrWidgetGroup* KrPropertyListView::findGroup(const QString& path) const
{
    const QStringList parts = path.split(QLatin1Char('/'), Qt::SkipEmptyParts);
    return d->groups.value(QLatin1Char('/') + parts.join(QLatin1Char('/')), nullptr);
}

KrWidgetGroup* KrPropertyListView::groupForPath(const QString& path)
{
    const QStringList parts = path.split(QLatin1Char('/'), Qt::SkipEmptyParts);
    KrWidgetGroup* parent = nullptr;
    QString key;
    for (int level = 0; level < parts.size(); ++level) {
        key += QLatin1Char('/') + parts.at(level);
        KrWidgetGroup* group = d->groups.value(key, nullptr);
        if (!group) {
            const QString objectName = QStringLiteral("WidgetGroup");
            group = parent ? new KrWidgetGroup(parent, parts.at(level), objectName, level)
                           : new KrWidgetGroup(d->layout, parts.at(level), objectName, 0);
            d->groups.insert(key, group);
        }
        parent = group;
    }
    return parent;
}

KrPropertyWgt* KrPropertyListView::addProperty(KrProperty* property)
{
    if (!property)
        return nullptr;
    KrPropertyWgt* widget = nullptr;
    const QString className = property->getWidgetClassName();
    if (KrClassFactory* factory = krApp->findClassFactory(className)) {
        QObject* object = factory->createInstance();
        widget = qobject_cast<KrPropertyWgt*>(object);
        if (!widget)
            delete object;
    }
    if (!widget) {
        // Still show the property, read-only, rather than leave it out of the list.
        qWarning("KrPropertyListView: no property widget \"%s\" for \"%s\"", qPrintable(className),
                 qPrintable(property->getName()));
        widget = new KrBasicPropertyWgt;
    }
    KrWidgetGroup* group = groupForPath(property->getPath());
    widget->addProperty(property);
    widget->setLevel(group ? group->getLevel() + 1 : 0);
    if (group)
        group->addWidget(widget);
    else
        d->layout->addWidget(widget);
    d->widgets.append(widget);
    return widget;
}

void KrPropertyListView::clear()
{
    // Top-level groups take their sub-groups and rows with them. Deleted later: the list is
    // often cleared from a signal that one of its own rows is still handling.
    while (QLayoutItem* item = d->layout->takeAt(0)) {
        if (QWidget* w = item->widget()) {
            w->hide();
            w->deleteLater();
        }
        delete item;
    }
    d->groups.clear();
    d->widgets.clear();
}

QList<KrPropertyWgt*> KrPropertyListView::getPropertyWidgets() const
{
    QList<KrPropertyWgt*> list;
    for (const QPointer<KrPropertyWgt>& w : d->widgets) {
        if (w)
            list.append(w.data());
    }
    return list;
}
