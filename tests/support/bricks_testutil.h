#pragma once

#include "krbrickuser.h"
#include "krshaderbrick.h"

#include <QList>
#include <QString>

class KrBrickGroup;
class KrBrickMaterial;
class KrClassFactory;
class KrElement;

// The text of an element's record (KrElement::getAttributes then KrSettings::toString).
QString bricksRecordText(const KrElement* element);

// A description of a brick user's network that does not depend on the record format: one line
// per brick (id, class, title), per parameter (argument, label, type, values, properties'
// names and paths) and per wire (source id and argument). Equal networks give equal text.
QString bricksDescribe(const IKrBrickUser* user);

// Makes a brick of class T, files it in user and answers it (null when refused).
template <class T> T* bricksAdd(IKrBrickUser* user)
{
    T* brick = new T;
    if (!user->insertBrick(brick)) {
        brick->ref();
        brick->unref();
        return nullptr;
    }
    return brick;
}

// Wires output `out` of src into input `in` of dst.
bool bricksWire(KrShaderBrick* src, const QString& out, KrShaderBrick* dst, const QString& in);
// Sets the first property of the parameter `arg`.
bool bricksSetValue(KrShaderBrick* brick, const QString& arg, const QVariant& value);
QVariant bricksValue(const KrShaderBrick* brick, const QString& arg);

// A material with a root, lighting and pattern bricks, an add-input brick with three inputs,
// changed values and labels, a title, and a group fed from outside whose output feeds the
// network. The ids it answers name the bricks by role.
struct BricksSample
{
    KrBrickMaterial* material = nullptr;
    uint root = 0, diffuse = 0, specular = 0, sum = 0, noise = 0, checker = 0, color = 0, group = 0,
         texture = 0;
};
BricksSample bricksMakeSample();

// Every class factory that makes shader bricks, in registration order.
QList<KrClassFactory*> bricksLibraryFactories();
