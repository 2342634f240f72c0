#include "krcorvaneutility.h"

#include "krbrickmaterial.h"
#include "krbrickuser.h"

#include <QDir>
#include <QFileInfo>
#include <QStandardPaths>

void KrCorvaneUtility::getBrickUserList(QList<IKrBrickUser*>& list)
{
    list.append(new KrBrickMaterial);
    list.append(new KrBrickLight);
    list.append(new KrBrickShaderSet);
}

IKrBrickUser* KrCorvaneUtility::toBrickUser(QObject* object)
{
    return dynamic_cast<IKrBrickUser*>(object);
}

QString KrCorvaneUtility::getCustomBrickPath()
{
    return QStandardPaths::writableLocation(QStandardPaths::AppDataLocation) +
           QStringLiteral("/UserBricks");
}

bool KrCorvaneUtility::createDirs(const QString& path)
{
    if (path.isEmpty())
        return false;
    if (QFileInfo(path).isDir())
        return true;
    return QDir().mkpath(path) && QFileInfo(path).isDir();
}
