#include "krdefaultbrickuser.h"

#include "krapp.h"
#include "krbrickparam.h"
#include "krbrickuser.h"
#include "krclassfactory.h"
#include "krproperty.h"
#include "krsettings.h"
#include "krshaderbrick.h"

namespace {
const QString kClassKey = QStringLiteral("BrelvoHallixClassName");
const QString kNameKey = QStringLiteral("Name");
const QString kBrickSettingsKey = QStringLiteral("BrickSettings");
const QString kStateKey = QStringLiteral("State");
const QString kParamsKey = QStringLiteral("Params");
const QString kArgKey = QStringLiteral("Arg");
const QString kLabelKey = QStringLiteral("Label");
const QString kPropertiesKey = QStringLiteral("Properties");
const QString kLocalPropertiesKey = QStringLiteral("LocalProperties");
const QString kPathKey = QStringLiteral("Path");
const QString kValueKey = QStringLiteral("Value");
const QString kSourceKey = QStringLiteral("Source");
const QString kSourceBrickKey = QStringLiteral("Brick");
const QString kSourceParamKey = QStringLiteral("Param");
const QString kNextIdKey = QStringLiteral("NextBrickID");
const QString kBrickSetsKey = QStringLiteral("BrickSets");
const QString kShaderTypeKey = QStringLiteral("ShaderType");
const QString kRootKey = QStringLiteral("Root");
const QString kBricksKey = QStringLiteral("Bricks");
const QString kTitleKey = QStringLiteral("BrickTitle");
const QString kBrickPrefix = QStringLiteral("Brick_");

void warn(const QString& message)
{
    qWarning("KrDefaultBrickUser: %s", qPrintable(message));
}

void writeProperty(const KrProperty* property, KrSettings* record)
{
    record->setStringValue(kNameKey, property->getName());
    record->setStringValue(kPathKey, property->getPath());
    property->writeValue(record, kValueKey);
}

void readProperty(KrProperty* property, const KrSettings* record, const QString& where)
{
    if (record->getValueType(kNameKey) == KrSettings::String) {
        const QString name = record->getStringValue(kNameKey);
        if (!name.isEmpty())
            property->setName(name);
    }
    if (record->getValueType(kPathKey) == KrSettings::String)
        KrShaderBrick::setPropertyPath(property, record->getStringValue(kPathKey));
    if (record->hasKey(kValueKey) && !property->readValue(record, kValueKey))
        warn(QStringLiteral("%1: the value of %2 is not a %3; it keeps its value")
                 .arg(where, property->getName(), property->getTypeLabel()));
}

// "Property_<j>" keys in order, each with its index.
QList<QPair<int, const KrSettings*>> propertyRecords(const KrSettings* records,
                                                     const QString& where)
{
    QList<QPair<int, const KrSettings*>> list;
    if (!records)
        return list;
    for (const QString& key : records->getKeys()) {
        const KrSettings* r = records->getSettingsValue(key);
        bool ok = false;
        const int index = key.startsWith(QLatin1String("Property_")) ? key.mid(9).toInt(&ok) : -1;
        if (!r || !ok || index < 0) {
            warn(QStringLiteral("%1: '%2' is not a property record").arg(where, key));
            continue;
        }
        list.append(qMakePair(index, r));
    }
    return list;
}

const KrSettings* bricksOf(const KrSettings* settings)
{
    for (const QString& key : settings->getKeys()) {
        if (key.startsWith(kBrickPrefix))
            return settings;
    }
    const KrSettings* nested = settings->getSettingsValue(kBricksKey);
    return nested ? nested : settings;
}
} // namespace

QString KrDefaultBrickUser::brickKey(uint id)
{
    return kBrickPrefix + QString::number(id);
}

uint KrDefaultBrickUser::brickIdFromKey(const QString& key)
{
    if (!key.startsWith(kBrickPrefix))
        return 0;
    const QString digits = key.mid(kBrickPrefix.size());
    if (digits.isEmpty() || digits.size() > 12)
        return 0;
    for (const QChar c : digits) {
        if (c < QLatin1Char('0') || c > QLatin1Char('9'))
            return 0;
    }
    const qint64 id = digits.toLongLong();
    return KrBrickContainer::isValidId(id) ? uint(id) : 0;
}

KrClassFactory* KrDefaultBrickUser::getBrickClassFactory(const QString& className)
{
    if (className.isEmpty())
        return nullptr;
    KrClassFactory* factory = krApp->findClassFactory(className);
    return factory && factory->provides("KrShaderBrick") ? factory : nullptr;
}

KrShaderBrick* KrDefaultBrickUser::createBrick(const QString& className)
{
    KrClassFactory* factory = getBrickClassFactory(className);
    if (!factory)
        return nullptr;
    QObject* object = factory->createInstance();
    auto* brick = qobject_cast<KrShaderBrick*>(object);
    if (!brick)
        delete object;
    return brick;
}

void KrDefaultBrickUser::writeBrickToSettings(KrShaderBrick* brick, KrSettings* settings,
                                              bool withConnections)
{
    if (!brick || !settings)
        return;
    writeBrickRecord(brick, settings->setSettingsValue(brickKey(brick->getBrickID())),
                     withConnections);
}

void KrDefaultBrickUser::writeBrickRecord(const KrShaderBrick* brick, KrSettings* record,
                                          bool withConnections, const QSet<uint>* sources)
{
    if (!brick || !record)
        return;
    record->setStringValue(kClassKey, QString::fromLatin1(brick->metaObject()->className()));
    if (!brick->getName().isEmpty())
        record->setStringValue(kNameKey, brick->getName());
    record->setSettingsValue(kBrickSettingsKey, *brick->getBrickSettings());
    KrSettings* state = record->setSettingsValue(kStateKey);
    brick->writeBrickState(state);
    if (state->isEmpty())
        record->removeValue(kStateKey);

    KrSettings* params = record->setSettingsValue(kParamsKey);
    for (int i = 0; i < brick->getNumParameters(); ++i) {
        const KrBrickParam* p = brick->getParameter(i);
        KrSettings* pr = params->setSettingsValue(QStringLiteral("Param_%1").arg(i));
        pr->setStringValue(kArgKey, p->getParamArg(0));
        pr->setStringValue(kLabelKey, p->getLabel());
        // A group's parameter shows the values of a brick inside, which keeps them itself.
        if (!p->getProxiedParam() && p->getNumParamProperties() > 0) {
            KrSettings* props = pr->setSettingsValue(kPropertiesKey);
            for (int j = 0; j < p->getNumParamProperties(); ++j) {
                if (const KrProperty* prop = p->getParamProperty(j))
                    writeProperty(prop,
                                  props->setSettingsValue(QStringLiteral("Property_%1").arg(j)));
            }
        }
        const KrBrickParam* src = withConnections ? p->getSource() : nullptr;
        const KrShaderBrick* srcBrick = src ? src->getBrick() : nullptr;
        if (srcBrick && (!sources || sources->contains(srcBrick->getBrickID()))) {
            KrSettings* s = pr->setSettingsValue(kSourceKey);
            s->setStringValue(kSourceBrickKey, brickKey(srcBrick->getBrickID()));
            s->setStringValue(kSourceParamKey, src->getParamArg(0));
        }
    }
    const QList<KrProperty*> locals = brick->getLocalProperties();
    if (!locals.isEmpty()) {
        KrSettings* props = record->setSettingsValue(kLocalPropertiesKey);
        for (int j = 0; j < locals.size(); ++j)
            writeProperty(locals.at(j),
                          props->setSettingsValue(QStringLiteral("Property_%1").arg(j)));
    }
}

bool KrDefaultBrickUser::readBrickRecord(KrShaderBrick* brick, const KrSettings* record)
{
    if (!brick || !record)
        return false;
    const QString className = QString::fromLatin1(brick->metaObject()->className());
    const QString where = QStringLiteral("%1 %2").arg(className).arg(brick->getBrickID());
    const QString recorded = record->getStringValue(kClassKey);
    if (!recorded.isEmpty() && recorded != className)
        warn(QStringLiteral("%1: the record is of class %2").arg(where, recorded));
    if (record->getValueType(kNameKey) == KrSettings::String)
        brick->setName(record->getStringValue(kNameKey));
    if (const KrSettings* bs = record->getSettingsValue(kBrickSettingsKey)) {
        if (bs->hasKey(kTitleKey) && bs->getValueType(kTitleKey) != KrSettings::String)
            warn(QStringLiteral("%1: the brick title is not a text").arg(where));
        *brick->getBrickSettings() = *bs;
    } else if (record->hasKey(kBrickSettingsKey)) {
        warn(QStringLiteral("%1: the brick settings are not a record").arg(where));
    }
    if (const KrSettings* state = record->getSettingsValue(kStateKey)) {
        if (!brick->readBrickState(state))
            warn(QStringLiteral("%1: the brick state was read in part only").arg(where));
    }

    const KrSettings* params = record->getSettingsValue(kParamsKey);
    if (!params && record->hasKey(kParamsKey))
        warn(QStringLiteral("%1: the parameters are not a record").arg(where));
    for (const QString& key : params ? params->getKeys() : QStringList()) {
        const KrSettings* pr = params->getSettingsValue(key);
        const QString arg = pr ? pr->getStringValue(kArgKey) : QString();
        KrBrickParam* p = arg.isEmpty() ? nullptr : brick->findParameterByArg(arg);
        if (!p) {
            warn(QStringLiteral("%1: no parameter for the record %2 ('%3')").arg(where, key, arg));
            continue;
        }
        if (pr->getValueType(kLabelKey) == KrSettings::String) {
            const QString label = pr->getStringValue(kLabelKey);
            if (!label.isEmpty())
                p->setLabel(label);
        }
        if (p->getProxiedParam())
            continue;
        for (const auto& entry : propertyRecords(pr->getSettingsValue(kPropertiesKey), where)) {
            KrProperty* prop = p->getParamProperty(entry.first);
            if (!prop) {
                warn(QStringLiteral("%1: parameter %2 has no property %3")
                         .arg(where, arg)
                         .arg(entry.first));
                continue;
            }
            readProperty(prop, entry.second, where);
        }
    }

    const QList<KrProperty*> locals = brick->getLocalProperties();
    for (const auto& entry :
         propertyRecords(record->getSettingsValue(kLocalPropertiesKey), where)) {
        const QString name = entry.second->getStringValue(kNameKey);
        KrProperty* prop = nullptr;
        for (KrProperty* candidate : locals) {
            if (candidate->getName() == name)
                prop = candidate;
        }
        if (!prop && name.isEmpty())
            prop = locals.value(entry.first, nullptr);
        if (!prop) {
            warn(QStringLiteral("%1: no setting '%2'").arg(where, name));
            continue;
        }
        readProperty(prop, entry.second, where);
    }
    return true;
}

int KrDefaultBrickUser::readConnections(KrShaderBrick* brick, const KrSettings* record,
                                        const QHash<uint, KrShaderBrick*>& byRecordedId)
{
    const KrSettings* params = brick && record ? record->getSettingsValue(kParamsKey) : nullptr;
    if (!params)
        return 0;
    const QString where = QStringLiteral("%1 %2")
                              .arg(QString::fromLatin1(brick->metaObject()->className()))
                              .arg(brick->getBrickID());
    int made = 0;
    for (const QString& key : params->getKeys()) {
        const KrSettings* pr = params->getSettingsValue(key);
        const KrSettings* s = pr ? pr->getSettingsValue(kSourceKey) : nullptr;
        if (!s)
            continue;
        KrBrickParam* dst = brick->findParameterByArg(pr->getStringValue(kArgKey));
        const QString srcKey = s->getStringValue(kSourceBrickKey);
        const QString srcArg = s->getStringValue(kSourceParamKey);
        KrShaderBrick* srcBrick = byRecordedId.value(brickIdFromKey(srcKey), nullptr);
        KrBrickParam* src = srcBrick ? srcBrick->findParameterByArg(srcArg) : nullptr;
        if (!dst) {
            warn(QStringLiteral("%1: wire into unknown parameter '%2' dropped")
                     .arg(where, pr->getStringValue(kArgKey)));
        } else if (!srcBrick) {
            warn(QStringLiteral("%1: wire from %2, which is not in the record, dropped")
                     .arg(where, srcKey));
        } else if (!src) {
            warn(QStringLiteral("%1: wire from unknown parameter %2.%3 dropped")
                     .arg(where, srcKey, srcArg));
        } else if (!dst->canConnectTo(src) || !dst->addConnection(src)) {
            warn(QStringLiteral("%1: wire %2.%3 -> %4 refused")
                     .arg(where, srcKey, srcArg, dst->getParamArg(0)));
        } else {
            ++made;
        }
    }
    return made;
}

void KrDefaultBrickUser::getAttributesHelper(const IKrBrickUser* brickUser, QList<uint>& ids,
                                             KrSettings* settings, bool withConnections)
{
    if (!brickUser || !settings)
        return;
    const QMap<uint, KrShaderBrick*> bricks = brickUser->getBricks();
    const QList<uint> list = ids.isEmpty() ? bricks.keys() : ids;
    QSet<uint> listed;
    for (uint id : list) {
        if (bricks.contains(id))
            listed.insert(id);
    }
    for (uint id : list) {
        const KrShaderBrick* brick = bricks.value(id, nullptr);
        if (!brick) {
            warn(QStringLiteral("no brick %1 to write").arg(id));
            continue;
        }
        writeBrickRecord(brick, settings->setSettingsValue(brickKey(id)), withConnections, &listed);
    }
}

int KrDefaultBrickUser::setAttributesHelper(IKrBrickUser* brickUser, const KrSettings* settings,
                                            QHash<QString, KrShaderBrick*>& created, bool freshIds)
{
    if (!brickUser || !settings)
        return 0;
    const KrSettings* source = bricksOf(settings);
    KrBrickContainer* container = brickUser->getBrickContainer();
    if (container)
        container->beginBatch();

    struct Made
    {
        KrShaderBrick* brick;
        const KrSettings* record;
    };
    QList<Made> made;
    QHash<uint, KrShaderBrick*> byRecordedId;
    QSet<uint> seen;
    for (const QString& key : source->getKeys()) {
        if (!key.startsWith(kBrickPrefix))
            continue;
        const uint recordedId = brickIdFromKey(key);
        if (!recordedId) {
            warn(QStringLiteral("'%1' is not a brick id; skipped").arg(key));
            continue;
        }
        if (seen.contains(recordedId)) {
            warn(
                QStringLiteral("brick id %1 appears twice; '%2' skipped").arg(recordedId).arg(key));
            continue;
        }
        seen.insert(recordedId);
        const KrSettings* record = source->getSettingsValue(key);
        if (!record) {
            warn(QStringLiteral("'%1' is not a brick record; skipped").arg(key));
            continue;
        }
        const QString className = record->getStringValue(kClassKey);
        KrShaderBrick* brick = createBrick(className);
        if (!brick) {
            warn(QStringLiteral("%1: unknown brick class '%2'; skipped").arg(key, className));
            continue;
        }
        brick->ref(); // held while it is being read
        readBrickRecord(brick, record);
        const QString autoTitle =
            brick->getPreferredName() + QStringLiteral("(%1)").arg(recordedId);
        uint id = 0;
        if (brickUser->acceptsBrick(brick)) {
            if (!freshIds && container)
                id = container->insertBrick(brick, recordedId);
            else
                id = brickUser->insertBrick(brick);
            if (id && !freshIds && id != recordedId) {
                brick->setBrickID(recordedId);
                if (brick->getBrickID() != recordedId)
                    warn(QStringLiteral("%1 is in use; the brick was given id %2")
                             .arg(key)
                             .arg(brick->getBrickID()));
            }
        }
        if (!id) {
            warn(QStringLiteral("%1 (%2) is refused by the brick user; skipped")
                     .arg(key, className));
            brick->unref();
            continue;
        }
        // A title made from the old id follows the new one.
        if (brick->getBrickSettings()->getStringValue(kTitleKey) == autoTitle &&
            brick->getBrickID() != recordedId)
            brick->setBrickTitle(brick->getPreferredName() +
                                 QStringLiteral("(%1)").arg(brick->getBrickID()));
        made.append({brick, record});
        byRecordedId.insert(recordedId, brick);
        created.insert(brickKey(recordedId), brick);
    }
    for (const Made& m : qAsConst(made))
        readConnections(m.brick, m.record, byRecordedId);
    for (const Made& m : qAsConst(made))
        m.brick->unref();
    if (container)
        container->endBatch();
    return made.size();
}

void KrDefaultBrickUser::writeUserRecord(const IKrBrickUser* brickUser, KrSettings* record)
{
    if (!brickUser || !record)
        return;
    record->setStringValue(kNameKey, brickUser->getName());
    if (const KrBrickContainer* container = brickUser->getBrickContainer())
        record->setIntValue(kNextIdKey, int(container->getNextId()));
    KrSettings* sets = record->setSettingsValue(kBrickSetsKey);
    for (int i = 0; i < brickUser->getNumBrickSets(); ++i) {
        const KrBrickSet* set = brickUser->getBrickSet(i);
        if (!set)
            continue;
        KrSettings* s = sets->setSettingsValue(QStringLiteral("BrickSet_%1").arg(i));
        s->setStringValue(kNameKey, set->getName());
        s->setIntValue(kShaderTypeKey, set->getShaderType());
        const KrShaderBrick* root = set->getRoot();
        s->setStringValue(kRootKey, root ? brickKey(root->getBrickID()) : QString());
    }
    QList<uint> all;
    getAttributesHelper(brickUser, all, record->setSettingsValue(kBricksKey), true);
}

bool KrDefaultBrickUser::readUserRecord(IKrBrickUser* brickUser, const KrSettings* record)
{
    if (!brickUser || !record)
        return false;
    if (record->getValueType(kNameKey) == KrSettings::String)
        brickUser->setName(record->getStringValue(kNameKey));
    KrBrickContainer* container = brickUser->getBrickContainer();
    if (container)
        container->beginBatch();
    const QMap<uint, KrShaderBrick*> old = brickUser->getBricks();
    for (auto it = old.end(); it != old.begin();) {
        --it;
        brickUser->takeBrick(it.value());
    }
    QHash<QString, KrShaderBrick*> created;
    if (const KrSettings* bricks = record->getSettingsValue(kBricksKey))
        setAttributesHelper(brickUser, bricks, created, false);
    else if (record->hasKey(kBricksKey))
        warn(QStringLiteral("the bricks of '%1' are not a record").arg(brickUser->getName()));
    if (container && record->getValueType(kNextIdKey) == KrSettings::Int)
        container->setNextId(uint(qMax(0, record->getIntValue(kNextIdKey))));

    const KrSettings* sets = record->getSettingsValue(kBrickSetsKey);
    for (int i = 0; sets && i < brickUser->getNumBrickSets(); ++i) {
        const KrSettings* s = sets->getSettingsValue(QStringLiteral("BrickSet_%1").arg(i));
        KrBrickSet* set = brickUser->getBrickSet(i);
        if (!s || !set)
            continue;
        if (s->getValueType(kNameKey) == KrSettings::String)
            set->setName(s->getStringValue(kNameKey));
        const QString rootKey = s->getStringValue(kRootKey);
        if (rootKey.isEmpty())
            continue;
        KrShaderBrick* root = created.value(brickKey(brickIdFromKey(rootKey)), nullptr);
        if (!root) {
            warn(
                QStringLiteral("root %1 of brick set %2 is not in the record").arg(rootKey).arg(i));
            continue;
        }
        if (set->getRoot() == root)
            continue;
        bool rootElsewhere = false;
        for (int j = 0; j < brickUser->getNumBrickSets(); ++j)
            rootElsewhere =
                rootElsewhere || (j != i && brickUser->getBrickSet(j)->getRoot() == root);
        if (rootElsewhere || !set->setRoot(root))
            warn(QStringLiteral("%1 cannot be the root of brick set %2").arg(rootKey).arg(i));
    }
    if (container)
        container->endBatch();
    return true;
}
