#include "bricks_testutil.h"

#include "krapp.h"
#include "krbrickgroup.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickparam.h"
#include "krclassfactory.h"
#include "krproperty.h"
#include "krsettings.h"

#include <QColor>
#include <QStringList>

QString bricksRecordText(const KrElement* element)
{
    KrSettings settings;
    element->getAttributes(&settings);
    return settings.toString();
}

namespace {
QString valueText(const KrProperty* p)
{
    KrSettings s;
    p->writeValue(&s, QStringLiteral("v"));
    return s.toString().simplified();
}

void describeBrick(const KrShaderBrick* b, QStringList& lines, const QString& indent)
{
    lines << QStringLiteral("%1brick %2 %3 '%4' name='%5'")
                 .arg(indent)
                 .arg(b->getBrickID())
                 .arg(QString::fromLatin1(b->metaObject()->className()), b->getBrickTitle(),
                      b->getName());
    lines << indent + QStringLiteral("  settings ") +
                 b->getBrickSettings()->toString().simplified();
    for (int i = 0; i < b->getNumParameters(); ++i) {
        const KrBrickParam* p = b->getParameter(i);
        QString line = QStringLiteral("%1  param %2 '%3' %4 dir=%5 adv=%6")
                           .arg(indent, p->getParamArg(0), p->getLabel(), p->getType())
                           .arg(p->getDirection())
                           .arg(p->getIsAdvanced());
        for (int j = 0; j < p->getNumParamProperties(); ++j) {
            const KrProperty* prop = p->getParamProperty(j);
            line += QStringLiteral(" [%1 %2 %3]")
                        .arg(prop->getName(), prop->getPath(), valueText(prop));
        }
        // An output's wires are a set: their order follows the order they were made in.
        QStringList wires;
        for (int c = 0; c < p->getNumConnections(); ++c) {
            const KrBrickParam* other = p->getConnection(c)->getParam();
            wires << QStringLiteral(" <-> %1.%2")
                         .arg(other->getBrick() ? other->getBrick()->getBrickID() : 0)
                         .arg(other->getParamArg(0));
        }
        wires.sort();
        line += wires.join(QString());
        lines << line;
    }
    for (const KrProperty* prop : b->getLocalProperties())
        lines << QStringLiteral("%1  local [%2 %3]").arg(indent, prop->getName(), valueText(prop));
    if (auto* group = qobject_cast<const KrBrickGroup*>(b)) {
        for (const KrShaderBrick* inner : group->getBricks())
            describeBrick(inner, lines, indent + QStringLiteral("    "));
    }
}
} // namespace

QString bricksDescribe(const IKrBrickUser* user)
{
    QStringList lines;
    lines << QStringLiteral("user '%1' %2").arg(user->getName(), user->getTypeLabel());
    for (int i = 0; i < user->getNumBrickSets(); ++i) {
        const KrBrickSet* set = user->getBrickSet(i);
        lines << QStringLiteral("set %1 '%2' type=%3 root=%4")
                     .arg(i)
                     .arg(set->getName())
                     .arg(set->getShaderType())
                     .arg(set->getRoot() ? set->getRoot()->getBrickID() : 0);
    }
    for (const KrShaderBrick* b : user->getBricks())
        describeBrick(b, lines, QString());
    return lines.join(QLatin1Char('\n'));
}

bool bricksWire(KrShaderBrick* src, const QString& out, KrShaderBrick* dst, const QString& in)
{
    KrBrickParam* o = src ? src->findParameterByArg(out) : nullptr;
    KrBrickParam* i = dst ? dst->findParameterByArg(in) : nullptr;
    return o && i && i->addConnection(o);
}

bool bricksSetValue(KrShaderBrick* brick, const QString& arg, const QVariant& value)
{
    KrBrickParam* p = brick->findParameterByArg(arg);
    KrProperty* prop = p ? p->getParamProperty(0) : nullptr;
    return prop && prop->setValue(value);
}

QVariant bricksValue(const KrShaderBrick* brick, const QString& arg)
{
    KrBrickParam* p = brick->findParameterByArg(arg);
    KrProperty* prop = p ? p->getParamProperty(0) : nullptr;
    return prop ? prop->getValue() : QVariant();
}

BricksSample bricksMakeSample()
{
    BricksSample s;
    s.material = new KrBrickMaterial;
    s.material->setName(QStringLiteral("Sample <&> \"Material\""));
    KrBrickMaterial* m = s.material;
    auto* root = bricksAdd<KrSurfaceBrick>(m);
    auto* diffuse = bricksAdd<KrDiffuseBrick>(m);
    auto* specular = bricksAdd<KrSpecularBrick>(m);
    auto* sum = bricksAdd<KrAddColorsBrick>(m);
    auto* noise = bricksAdd<KrNoiseBrick>(m);
    auto* checker = bricksAdd<KrCheckerBrick>(m);
    auto* color = bricksAdd<KrColorConstantBrick>(m);
    auto* texture = bricksAdd<KrImageTextureBrick>(m);
    // A deleted brick leaves a gap in the ids.
    auto* gone = bricksAdd<KrInvertBrick>(m);
    m->takeBrick(gone);

    sum->executeBrickAction(QStringLiteral("Add Input"));
    bricksWire(diffuse, QStringLiteral("result"), sum, QStringLiteral("in1"));
    bricksWire(specular, QStringLiteral("result"), sum, QStringLiteral("in2"));
    bricksWire(checker, QStringLiteral("result"), sum, QStringLiteral("in3"));
    bricksWire(sum, QStringLiteral("result"), root, QStringLiteral("Cs"));
    bricksWire(noise, QStringLiteral("value"), specular, QStringLiteral("glossiness"));
    bricksWire(noise, QStringLiteral("value"), root, QStringLiteral("Os"));
    bricksWire(texture, QStringLiteral("result"), checker, QStringLiteral("color2"));

    bricksSetValue(diffuse, QStringLiteral("Kd"), 0.3125);
    bricksSetValue(diffuse, QStringLiteral("Cd"), QColor(10, 200, 30));
    bricksSetValue(noise, QStringLiteral("octaves"), 7);
    bricksSetValue(texture, QStringLiteral("file"), QStringLiteral("C:/maps/wood \"old\".png"));
    bricksSetValue(root, QStringLiteral("Ce"), QColor(1, 2, 3));
    texture->getLocalProperties().at(0)->setValue(2);
    noise->findParameterByArg(QStringLiteral("value"))->setLabel(QStringLiteral("Grain"));
    specular->setBrickTitle(QStringLiteral("Shine"));
    specular->getBrickSettings()->setFloatValue(QStringLiteral("PosX"), 120.5);
    specular->getBrickSettings()->setIntValue(QStringLiteral("Width"), 200);

    // A group: multiply feeding invert inside, fed by the colour constant outside, feeding
    // the diffuse colour.
    auto* group = new KrBrickGroup;
    auto* mul = bricksAdd<KrMultiplyColorsBrick>(group);
    auto* inv = bricksAdd<KrInvertColorBrick>(group);
    bricksWire(mul, QStringLiteral("result"), inv, QStringLiteral("value"));
    bricksSetValue(mul, QStringLiteral("b"), QColor(128, 64, 32));
    m->insertBrick(group);
    bricksWire(color, QStringLiteral("result"), mul, QStringLiteral("a"));
    bricksWire(inv, QStringLiteral("result"), diffuse, QStringLiteral("Cd"));

    s.root = root->getBrickID();
    s.diffuse = diffuse->getBrickID();
    s.specular = specular->getBrickID();
    s.sum = sum->getBrickID();
    s.noise = noise->getBrickID();
    s.checker = checker->getBrickID();
    s.color = color->getBrickID();
    s.group = group->getBrickID();
    s.texture = texture->getBrickID();
    return s;
}

QList<KrClassFactory*> bricksLibraryFactories()
{
    QList<KrClassFactory*> list;
    for (int i = 0; i < krApp->getNumClassFactories(); ++i) {
        KrClassFactory* f = krApp->getClassFactory(i);
        if (f && f->provides("KrShaderBrick"))
            list << f;
    }
    return list;
}
