#pragma once

#include "krcore_global.h"

#include <QHash>
#include <QList>
#include <QSet>
#include <QString>

class IKrBrickUser;
class KrClassFactory;
class KrSettings;
class KrShaderBrick;

// Records of bricks and brick users, as brick-user files, saved bricks (".kcb") and the
// clipboard keep them.
//
// A brick record (under "Brick_<id>"):
//   "BrelvoHallixClassName"  the brick's class
//   "Name"                   the brick's own name, when it has one
//   "BrickSettings"          the brick's settings record (title, position, ...)
//   "State"                  what the brick keeps beyond its values (added inputs, a group's
//                            inner network)
//   "Params" / "Param_<i>"   "Arg", "Label", "Properties" / "Property_<j>" ("Name", "Path",
//                            "Value"), and for a wired input "Source" ("Brick": "Brick_<id>",
//                            "Param": the source's argument)
//   "LocalProperties"        / "Property_<j>" as above
// A brick-user record: "Name", "NextBrickID", "BrickSets" / "BrickSet_<i>" ("Name",
// "ShaderType", "Root": "Brick_<id>" or empty) and "Bricks" (brick records).
//
// Readers load what is sound and skip the rest with a warning: unknown classes, bad or
// duplicate ids, values of the wrong type, wires to bricks that are not in the record and
// wires the connection rules refuse.
class KRCORE_EXPORT KrDefaultBrickUser
{
public:
    static QString brickKey(uint id); // "Brick_<id>"
    // The id of a "Brick_<id>" key; 0 when key is not one.
    static uint brickIdFromKey(const QString& key);

    // Writes the brick's record under "Brick_<id>" of settings.
    static void writeBrickToSettings(KrShaderBrick* brick, KrSettings* settings,
                                     bool withConnections);
    // Writes the records of the user's bricks listed in ids (all of them when ids is empty).
    // Only wires among the listed bricks are written.
    static void getAttributesHelper(const IKrBrickUser* brickUser, QList<uint>& ids,
                                    KrSettings* settings, bool withConnections);
    // Makes the bricks of the record (its "Brick_<id>" keys, or those of its "Bricks" record)
    // in brickUser and wires them as the record says. With freshIds the bricks get new ids;
    // otherwise each keeps its recorded id where that is free. created maps "Brick_<recorded
    // id>" to the brick made for it. Answers the number of bricks made.
    static int setAttributesHelper(IKrBrickUser* brickUser, const KrSettings* settings,
                                   QHash<QString, KrShaderBrick*>& created, bool freshIds);
    // The class factory of a brick class, or null for a name that is no shader brick.
    static KrClassFactory* getBrickClassFactory(const QString& className);
    // A new brick of the class (reference count 0), or null.
    static KrShaderBrick* createBrick(const QString& className);

    // One brick's record without the "Brick_<id>" level. With sources, only wires from those
    // brick ids are written.
    static void writeBrickRecord(const KrShaderBrick* brick, KrSettings* record,
                                 bool withConnections, const QSet<uint>* sources = nullptr);
    // Reads settings, state, labels and values back (no wires). False for a null brick or
    // record.
    static bool readBrickRecord(KrShaderBrick* brick, const KrSettings* record);
    // Wires the brick's inputs as its record says; sources are looked up by recorded id.
    // Answers the number of wires made.
    static int readConnections(KrShaderBrick* brick, const KrSettings* record,
                               const QHash<uint, KrShaderBrick*>& byRecordedId);

    static void writeUserRecord(const IKrBrickUser* brickUser, KrSettings* record);
    // Replaces the user's network with the record's. False for a null user or record.
    static bool readUserRecord(IKrBrickUser* brickUser, const KrSettings* record);
};
