#pragma once

#include "krcore_global.h"

#include <QList>
#include <QString>

class IKrBrickUser;
class QObject;

// Helpers the editor uses around brick users and the user's brick folder.
class KRCORE_EXPORT KrCorvaneUtility
{
public:
    // Appends one new prototype per kind of brick user (material, light, brick set); the caller
    // owns them and releases them with IKrBrickUser::release().
    static void getBrickUserList(QList<IKrBrickUser*>& list);
    // The brick user an object is, or null.
    static IKrBrickUser* toBrickUser(QObject* object);
    // The folder of the user's saved bricks: "UserBricks" in the application's data folder.
    static QString getCustomBrickPath();
    // Makes the folder and its parents; true when it exists afterwards.
    static bool createDirs(const QString& path);
};
