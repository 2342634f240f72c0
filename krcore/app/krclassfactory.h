#pragma once

#include "krcore_global.h"
#include "krguid.h"

#include <QScriptEngine>
#include <QScriptValue>
#include <QString>

class QMetaObject;
class QObject;
class QScriptContext;

// Makes objects of one class by name and makes the class known to script engines.
class KRCORE_EXPORT KrClassFactory
{
public:
    KrClassFactory(const QMetaObject* metaObject, const KrGUID& classID);
    virtual ~KrClassFactory();

    // Creation with the arguments of a script call; by default createInstance().
    virtual QObject* createInstance(QScriptContext* context);
    virtual QObject* createInstance() = 0;
    // A second creation entry taking one argument; by default it ignores it.
    virtual QObject* createInstanceWith(void* argument);
    // Makes the class constructible from scripts as a global named className().
    virtual void registerClass(QScriptEngine* engine);

    const QMetaObject* metaObject() const { return m_metaObject; }
    QString className() const;
    const KrGUID& classID() const { return m_classID; }

    // True when the class is baseName or derives from it (walks the meta-object chain).
    bool provides(const char* baseName) const;
    bool provides(const QString& baseName) const;

    // Defines the enumerators of metaObject as properties of value.
    static void registerEnumsOnClass(QScriptEngine* engine, const QMetaObject* metaObject,
                                     QScriptValue& value);
    // Ownership given to objects made from scripts.
    static QScriptEngine::ValueOwnership s_ownership;

private:
    Q_DISABLE_COPY(KrClassFactory)
    const QMetaObject* m_metaObject;
    KrGUID m_classID;
};

class KrPlugin;
// The record of the classes krcore itself contributes (property widgets, brick kinds, ...).
// KrApp registers its factories before any plug-in's.
KRCORE_EXPORT KrPlugin& krCorePlugin();

// A factory for a krcore class T with a default constructor, filed with krCorePlugin().
template <class T>
class KrCoreClassFactory : public KrClassFactory
{
public:
    explicit KrCoreClassFactory(const char* guid);
    QObject* createInstance() override { return new T(); }
    using KrClassFactory::createInstance;
};

// Declares a process-wide factory for a krcore class: KR_CORE_CLASS(KrFooWgt, "GUID-TEXT").
#define KR_CORE_CLASS(T, guid) static KrCoreClassFactory<T> s_krCoreFactory_##T(guid)
