#pragma once

#include "krcore_global.h"
#include "krclassfactory.h"

#include <QList>
#include <QString>

// A plug-in's record: its name, version, description and the class factories it contributes.
// It keeps the factory pointers; the factories belong to the plug-in.
class KRCORE_EXPORT KrPlugin
{
public:
    KrPlugin(const QString& name, const QString& author, const QString& url,
             unsigned long version);
    virtual ~KrPlugin();

    QString getName() const { return m_name; }
    QString getAuthor() const { return m_author; }
    QString getURL() const { return m_url; }
    unsigned long getVersion() const { return m_version; }
    void setVersion(unsigned long version) { m_version = version; }
    QString getDescription() const { return m_description; }
    void setDescription(const QString& description) { m_description = description; }

    void addClassFactory(KrClassFactory* factory);
    void removeClassFactory(KrClassFactory* factory);
    int getNumClassFactories() const { return m_factories.size(); }
    KrClassFactory* getClassFactory(int i) const { return m_factories.value(i); }

private:
    Q_DISABLE_COPY(KrPlugin)
    QString m_name, m_author, m_url, m_description;
    unsigned long m_version;
    QList<KrClassFactory*> m_factories;
};

template <class T>
KrCoreClassFactory<T>::KrCoreClassFactory(const char* guid)
    : KrClassFactory(&T::staticMetaObject, KrGUID::fromString(QString::fromLatin1(guid)))
{
    krCorePlugin().addClassFactory(this);
}

// The two entry points a plug-in library exports with C linkage.
typedef unsigned long (*KrGetSDKVersionFn)();
typedef KrPlugin* (*KrGetPluginDefinitionFn)();

// The SDK version this host is built with: 3.0.1.61. A plug-in whose major byte differs is
// refused.
constexpr unsigned long KR_SDK_VERSION = 0x0300013DUL;
