#include "krbrickuserpropertiesview.h"

#include "krapp.h"
#include "krbrickmaterial.h"
#include "krdefaultmaterial.h"
#include "krelement.h"
#include "krgrouppathdlg.h"
#include "krproperty.h"
#include "krpropertywgt.h"

#include <QContextMenuEvent>
#include <QMenu>

namespace {

bool isMaterial(const QObject* element)
{
    return element->inherits("KrMaterial") || qobject_cast<const KrBrickMaterial*>(element) ||
           qobject_cast<const KrDefaultMaterial*>(element);
}

bool isLight(const QObject* element)
{
    return element->inherits("KrLight") || qobject_cast<const KrBrickLight*>(element);
}

} // namespace

KrBrickUserPropertiesView::KrBrickUserPropertiesView(QWidget* parent, const QString& name)
    : KrPropertyListView(parent, name)
{
}

KrBrickUserPropertiesView::~KrBrickUserPropertiesView() = default;

KrElement* KrBrickUserPropertiesView::getElement() const
{
    return m_element;
}

void KrBrickUserPropertiesView::setElement(KrElement* element)
{
    if (m_element)
        disconnect(m_element, nullptr, this, nullptr);
    m_element = element;
    updateProperties();
    if (element) {
        connect(element, &KrElement::propertyListChanged, this,
                &KrBrickUserPropertiesView::updateProperties);
        connect(element, &KrElement::propertyTreeChanged, this,
                &KrBrickUserPropertiesView::updateProperties);
    }
}

void KrBrickUserPropertiesView::updateProperties()
{
    KrApp* app = KrApp::existingInstance();
    if (app && app->isClosing())
        return;
    clear();
    if (!m_element)
        return;
    for (int i = 0; i < m_element->getNumProperties(); ++i) {
        KrProperty* property = m_element->getProperty(i);
        if (property && !property->isHidden())
            addProperty(property);
    }
}

void KrBrickUserPropertiesView::contextMenuEvent(QContextMenuEvent* event)
{
    // The event reaches the view through its viewport; the global position serves both.
    QWidget* child = viewport()->childAt(viewport()->mapFromGlobal(event->globalPos()));
    KrPropertyWgt* propertyWgt = nullptr;
    for (QWidget* w = child; w && !propertyWgt; w = w->parentWidget()) {
        propertyWgt = qobject_cast<KrPropertyWgt*>(w);
        if (w == this)
            break;
    }
    if (!propertyWgt || propertyWgt->getNumProperties() < 1)
        return;

    m_currentPropertyWgt = propertyWgt;
    QMenu menu;
    QAction* rename = menu.addAction(QStringLiteral("Change Internal Name"));
    connect(rename, &QAction::triggered, this, &KrBrickUserPropertiesView::renameProperty);
    QAction* regroup = menu.addAction(QStringLiteral("Regroup"));
    connect(regroup, &QAction::triggered, this, &KrBrickUserPropertiesView::regroupProperty);
    menu.exec(event->globalPos());
    m_currentPropertyWgt = nullptr;
    event->accept();
}

QStringList KrBrickUserPropertiesView::defaultPropertyNames() const
{
    QStringList names;
    if (!m_element)
        return names;
    if (isMaterial(m_element)) {
        const KrDefaultMaterial material;
        for (int i = 0; i < material.getNumProperties(); ++i) {
            const QString name = material.getProperty(i)->getName();
            if (!names.contains(name, Qt::CaseSensitive))
                names.append(name);
            if (name == QLatin1String("Index of Refraction"))
                break;
        }
    } else if (isLight(m_element)) {
        names << QStringLiteral("Color") << QStringLiteral("Intensity")
              << QStringLiteral("Shadow Type") << QStringLiteral("Shadow Bias")
              << QStringLiteral("Shadow Softness") << QStringLiteral("Illumination")
              << QStringLiteral("Spread Angle");
    } else if (m_element->inherits("KrCamera")) {
        names << QStringLiteral("Background Color");
    } else {
        names << QStringLiteral("Color");
    }
    return names;
}

QStringList KrBrickUserPropertiesView::propertyGroupPaths() const
{
    QStringList paths;
    if (!m_element)
        return paths;
    KrPropertyIterator it = m_element->propertyListIterator();
    while (it.hasNext()) {
        KrProperty* property = it.next();
        if (property && !paths.contains(property->getPath(), Qt::CaseSensitive))
            paths.append(property->getPath());
    }
    return paths;
}

void KrBrickUserPropertiesView::renameProperty()
{
    if (!m_currentPropertyWgt || m_currentPropertyWgt->getNumProperties() < 1)
        return;
    QPointer<KrProperty> property = m_currentPropertyWgt->getFirstProperty();
    if (!property)
        return;

    KrGroupPathDlg dialog(krApp->getDialogParent(), QStringLiteral("Name"),
                          QStringLiteral("Default Names"), QString());
    dialog.setWindowTitle(QStringLiteral("Rename Property"));
    dialog.setDefaults(defaultPropertyNames());
    dialog.setPath(property->getName());
    if (dialog.exec() != QDialog::Accepted || !property)
        return;

    const QString name = dialog.getPath();
    // Another property of that name gets a free variant first, so the chosen name is free.
    if (m_element) {
        if (KrProperty* other = m_element->findProperty(name)) {
            QString unique = name;
            m_element->isPropertyNameUnique(unique, true);
            other->setName(unique);
        }
    }
    property->setName(name);
}

void KrBrickUserPropertiesView::regroupProperty()
{
    if (!m_currentPropertyWgt || m_currentPropertyWgt->getNumProperties() < 1)
        return;
    QPointer<KrProperty> property = m_currentPropertyWgt->getFirstProperty();
    if (!property)
        return;

    KrGroupPathDlg dialog(krApp->getDialogParent(), QStringLiteral("Path:"),
                          QStringLiteral("Path Defaults:"), QString());
    dialog.setDefaults(propertyGroupPaths());
    dialog.setPath(property->getPath().mid(1));
    if (dialog.exec() != QDialog::Accepted || !property)
        return;
    property->setPath(dialog.getPath());
    updateProperties();
}
