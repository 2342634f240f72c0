#include "krshaderbrick.h"

#include "krbrickparam.h"
#include "krbrickuser.h"
#include "krdefaultbrickuser.h"
#include "krproperty.h"
#include "krsettings.h"

#include <QSet>

namespace {
const char kPathAssigned[] = "krPathAssigned";
// Signals carry bricks and parameters; queued connections and signal spies need the types.
const int s_brickTypeId = qRegisterMetaType<KrShaderBrick*>("KrShaderBrick*");
const int s_paramTypeId = qRegisterMetaType<KrBrickParam*>("KrBrickParam*");
const QString kTitleKey = QStringLiteral("BrickTitle");

// The form KrProperty keeps paths in: "/" and parts without surrounding blanks.
QString normalizedPath(const QString& path)
{
    QStringList parts;
    for (const QString& part : path.split(QLatin1Char('/'), Qt::SkipEmptyParts)) {
        const QString t = part.trimmed();
        if (!t.isEmpty())
            parts.append(t);
    }
    return QLatin1Char('/') + parts.join(QLatin1Char('/'));
}

// "/old" and "/old/..." become "/new" and "/new/..."; other paths stay.
bool renamePathPrefix(KrProperty* property, QString oldPrefix, QString newPrefix)
{
    oldPrefix = normalizedPath(oldPrefix);
    newPrefix = normalizedPath(newPrefix);
    if (oldPrefix == QLatin1String("/"))
        return false;
    const QString path = property->getPath();
    if (path == oldPrefix || path.startsWith(oldPrefix + QLatin1Char('/'))) {
        property->setPath(newPrefix + path.mid(oldPrefix.size()));
        return true;
    }
    return false;
}

void collectFeeders(const KrShaderBrick* brick, bool recursive, bool unique,
                    QList<KrShaderBrick*>* list, QList<const KrShaderBrick*>& path)
{
    path.append(brick);
    for (int i = 0; i < brick->getNumParameters(); ++i) {
        const KrBrickParam* p = brick->getParameter(i);
        const KrBrickParam* src = p ? p->getSource() : nullptr;
        KrShaderBrick* feeder = src ? src->getBrick() : nullptr;
        if (!feeder || path.contains(feeder))
            continue;
        const bool listed = list->contains(feeder);
        if (!unique || !listed)
            list->append(feeder);
        if (recursive && !(unique && listed))
            collectFeeders(feeder, recursive, unique, list, path);
    }
    path.removeLast();
}
} // namespace

KrShaderBrick::KrShaderBrick(const QString& name, QObject* parent)
    : KrElement(name, parent), m_settings(new KrSettings)
{
}

KrShaderBrick::~KrShaderBrick()
{
    m_destroying = true;
    if (m_container)
        m_container->brickDestroyed(this);
    for (KrBrickParam* p : qAsConst(m_params))
        p->dropConnectionsQuietly();
    // Nobody is to hear about a brick that is going away.
    const bool blocked = blockSignals(true);
    setProperties({});
    blockSignals(blocked);
    const QList<KrBrickParam*> params = m_params;
    m_params.clear();
    qDeleteAll(params);
    const QList<KrProperty*> locals = m_localProperties;
    m_localProperties.clear();
    qDeleteAll(locals);
    delete m_settings;
}

void KrShaderBrick::releaseItem()
{
    // Unwire while the brick is whole, so every other end hears of it.
    removeAllConnections();
    delete this;
}

void KrShaderBrick::getAttributes(KrSettings* settings) const
{
    KrDefaultBrickUser::writeBrickRecord(this, settings, true);
}

bool KrShaderBrick::setAttributes(const KrSettings* settings)
{
    return KrDefaultBrickUser::readBrickRecord(this, settings);
}

void KrShaderBrick::writeBrickState(KrSettings*) const {}

bool KrShaderBrick::readBrickState(const KrSettings*)
{
    return true;
}

QString KrShaderBrick::getShaderCode() const
{
    return QString();
}

void KrShaderBrick::setPropertyPath(KrProperty* property, const QString& path)
{
    if (!property)
        return;
    property->setProperty(kPathAssigned, true);
    property->setPath(path);
}

void KrShaderBrick::addLocalProperty(KrProperty* property)
{
    if (!property || m_localProperties.contains(property))
        return;
    property->setParent(this);
    m_localProperties.append(property);
    updatePropertyList();
}

void KrShaderBrick::setBrickID(uint id)
{
    if (id == m_id)
        return;
    if (m_container && !m_container->refile(this, id)) {
        qWarning("KrShaderBrick::setBrickID: id %u is not free; brick %u keeps its id", id, m_id);
        return;
    }
    const uint old = m_id;
    m_id = id;
    emit brickIDChanged(int(old));
}

KrSettings* KrShaderBrick::getBrickSettings() const
{
    return m_settings;
}

QListIterator<KrBrickParam*> KrShaderBrick::getParameterIterator() const
{
    return QListIterator<KrBrickParam*>(m_params);
}

KrBrickParam* KrShaderBrick::getParameter(int i) const
{
    return m_params.value(i, nullptr);
}

int KrShaderBrick::findParameterIndex(KrBrickParam* param) const
{
    return param ? m_params.indexOf(param) : -1;
}

KrBrickParam* KrShaderBrick::findParameterByArg(const QString& arg) const
{
    for (KrBrickParam* p : m_params) {
        if (p->getParamArg(0) == arg)
            return p;
    }
    return nullptr;
}

int KrShaderBrick::type() const
{
    return 0;
}

QString KrShaderBrick::getPreferredName() const
{
    if (!getName().isEmpty())
        return getName();
    QString name = QString::fromLatin1(metaObject()->className());
    if (name.startsWith(QLatin1String("Kr")))
        name = name.mid(2);
    if (name.endsWith(QLatin1String("Brick")) && name.size() > 5)
        name.chop(5);
    return name;
}

QString KrShaderBrick::getDefaultCategory() const
{
    return QString();
}

QString KrShaderBrick::getOptionsFrameClassName() const
{
    return QStringLiteral("KrStandardBrickWidget");
}

QStringList KrShaderBrick::getBrickActionList() const
{
    return QStringList();
}

bool KrShaderBrick::executeBrickAction(const QString&)
{
    return false;
}

bool KrShaderBrick::shouldSeperateLocalProperties() const
{
    return false;
}

QString KrShaderBrick::getDescription() const
{
    return QString();
}

void KrShaderBrick::getBrickList(bool recursive, bool includeSelf, bool unique,
                                 QList<KrShaderBrick*>* list) const
{
    if (!list)
        return;
    KrShaderBrick* self = const_cast<KrShaderBrick*>(this);
    if (includeSelf && (!unique || !list->contains(self)))
        list->append(self);
    QList<const KrShaderBrick*> path;
    collectFeeders(this, recursive, unique, list, path);
}

bool KrShaderBrick::isFedBy(const KrShaderBrick* other) const
{
    if (!other)
        return false;
    QSet<const KrShaderBrick*> seen;
    QList<const KrShaderBrick*> stack{this};
    while (!stack.isEmpty()) {
        const KrShaderBrick* b = stack.takeLast();
        for (const KrBrickParam* p : b->m_params) {
            const KrBrickParam* src = p->getSource();
            const KrShaderBrick* feeder = src ? src->getBrick() : nullptr;
            if (!feeder)
                continue;
            if (feeder == other)
                return true;
            if (!seen.contains(feeder)) {
                seen.insert(feeder);
                stack.append(feeder);
            }
        }
    }
    return false;
}

bool KrShaderBrick::addConnection(int paramIndex, KrShaderBrick* source, int srcParamIndex)
{
    KrBrickParam* param = getParameter(paramIndex);
    KrBrickParam* src = source ? source->getParameter(srcParamIndex) : nullptr;
    if (!param || !src)
        return false;
    return param->addConnection(src);
}

void KrShaderBrick::removeAllConnections()
{
    const QList<KrBrickParam*> params = m_params;
    for (KrBrickParam* p : params)
        p->removeAllConnections();
}

bool KrShaderBrick::addParameter(KrBrickParam* param)
{
    return insertParameter(m_params.size(), param);
}

bool KrShaderBrick::insertParameter(int index, KrBrickParam* param)
{
    if (!param || m_params.contains(param) || (param->getBrick() && param->getBrick() != this))
        return false;
    const QString arg = param->getParamArg(0);
    if (arg.isEmpty() || findParameterByArg(arg)) {
        qWarning("KrShaderBrick::addParameter: argument '%s' is empty or taken in %s",
                 qPrintable(arg), metaObject()->className());
        return false;
    }
    param->setBrick(this);
    param->setParent(this);
    m_params.insert(qBound(0, index, m_params.size()), param);
    if (auto* pp = qobject_cast<KrPropertyParam*>(param))
        connect(pp, &KrPropertyParam::paramPropertiesChanged, this,
                &KrShaderBrick::paramPropertiesChanged);
    updatePropertyList();
    emit paramAdded();
    return true;
}

bool KrShaderBrick::removeParameter(KrBrickParam* param)
{
    if (!param || !m_params.contains(param))
        return false;
    param->removeAllConnections();
    m_params.removeOne(param);
    // Listed nowhere any more before it goes.
    updatePropertyList();
    emit paramRemoved();
    delete param;
    return true;
}

void KrShaderBrick::paramPropertiesChanged()
{
    updatePropertyList();
}

void KrShaderBrick::updatePropertyList()
{
    if (m_destroying)
        return;
    if (m_container)
        assignDefaultPaths();
    QList<KrProperty*> properties;
    for (const KrBrickParam* p : qAsConst(m_params)) {
        for (int i = 0; i < p->getNumParamProperties(); ++i) {
            KrProperty* prop = p->getParamProperty(i);
            if (prop && !properties.contains(prop))
                properties.append(prop);
        }
    }
    for (KrProperty* prop : qAsConst(m_localProperties)) {
        if (!properties.contains(prop))
            properties.append(prop);
    }
    if (properties != getProperties())
        setProperties(properties);
}

void KrShaderBrick::assignDefaultPaths()
{
    const QString title = getBrickTitle();
    for (const KrBrickParam* p : qAsConst(m_params)) {
        // A group's parameters show the properties of the bricks inside, which have paths.
        if (p->getProxiedParam())
            continue;
        for (int i = 0; i < p->getNumParamProperties(); ++i) {
            KrProperty* prop = p->getParamProperty(i);
            if (!prop || prop->property(kPathAssigned).toBool())
                continue;
            prop->setProperty(kPathAssigned, true);
            prop->setPath(QLatin1Char('/') + title + QLatin1Char('/') + p->getLabel());
        }
    }
}

void KrShaderBrick::paramLabelChanged(KrBrickParam* param, const QString& oldLabel)
{
    if (param->getProxiedParam())
        return;
    const QString prefix = QLatin1Char('/') + getBrickTitle() + QLatin1Char('/');
    for (int i = 0; i < param->getNumParamProperties(); ++i) {
        if (KrProperty* prop = param->getParamProperty(i))
            renamePathPrefix(prop, prefix + oldLabel, prefix + param->getLabel());
    }
}

QString KrShaderBrick::getBrickTitle() const
{
    const QString title = m_settings->getStringValue(kTitleKey);
    return title.isEmpty() ? getPreferredName() : title;
}

void KrShaderBrick::setBrickTitle(const QString& title)
{
    const QString oldTitle = getBrickTitle();
    if (title == m_settings->getStringValue(kTitleKey))
        return;
    m_settings->setStringValue(kTitleKey, title);
    const QString newTitle = getBrickTitle();
    if (newTitle != oldTitle) {
        const QString oldPrefix = QLatin1Char('/') + oldTitle;
        const QString newPrefix = QLatin1Char('/') + newTitle;
        for (KrProperty* prop : getProperties()) {
            // Properties of bricks inside a group keep their own titles.
            if (prop->parent() && prop->parent()->parent() != this && prop->parent() != this)
                continue;
            renamePathPrefix(prop, oldPrefix, newPrefix);
        }
    }
    emit brickTitleChanged(newTitle);
}
