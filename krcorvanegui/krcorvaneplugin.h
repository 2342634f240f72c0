#pragma once

#include "krclassfactory.h"
#include "krplugin.h"

#include <QByteArray>
#include <QMetaType>
#include <QScriptContext>
#include <QScriptEngine>
#include <QScriptValue>
#include <new>

class KrCorvanePane;
class KrCorvanePaneAction;
class KrStandardBrickWidget;
class KrCorvanePaneItemRefresh;
class KrCorvanePaneShowMenus;

// Event types of the brick graphics items, registered once when the library is loaded.
struct KrBrickItemEventTypes
{
    int updateConnector = 0;
    int updatePosition = 0;
};
Q_DECL_EXPORT const KrBrickItemEventTypes& krBrickItemEventTypes();

// A factory of the library's class T: registers itself with the library's record and makes T
// known to script engines, with T* as a script type that converts in both directions.
template <class T> class KrTCustomClassFactory : public KrClassFactory
{
public:
    KrTCustomClassFactory(const KrGUID& classID, KrPlugin& plugin)
        : KrClassFactory(&T::staticMetaObject, classID)
    {
        s_instance = this;
        KrClassFactory::s_ownership = QScriptEngine::QtOwnership;
        plugin.addClassFactory(this);
    }
    ~KrTCustomClassFactory() override
    {
        // A script constructor called after this is gone makes nothing.
        if (s_instance == this)
            s_instance = nullptr;
    }

    using KrClassFactory::createInstance;

    void registerClass(QScriptEngine* engine) override
    {
        KrClassFactory::registerClass(engine);
        if (!engine)
            return;
        if (s_pointerTypeId == 0) {
            const QByteArray name = QByteArray(T::staticMetaObject.className()) + '*';
            int id = QMetaType::type(name.constData());
            if (id == QMetaType::UnknownType) {
                id = QMetaType::registerType(name.constData(), deletePointer, createPointer,
                                             destructPointer, constructPointer, int(sizeof(T*)),
                                             QMetaType::MovableType | QMetaType::PointerToQObject,
                                             &T::staticMetaObject);
            }
            s_pointerTypeId = id;
        }
        // The engine's registerCustomType(), reached through Qt's public helper.
        qScriptRegisterMetaType_helper(engine, s_pointerTypeId, toScript, fromScript,
                                       QScriptValue());
        QScriptValue ctor = engine->newFunction(scriptConstructor, 0);
        QScriptValue classValue = engine->newQMetaObject(metaObject(), ctor);
        engine->globalObject().setProperty(className(), classValue,
                                           QScriptValue::KeepExistingFlags);
    }

    static KrTCustomClassFactory* instance() { return s_instance; }
    // The meta type of T*, 0 until the class was first registered with an engine.
    static int pointerTypeId() { return s_pointerTypeId; }

private:
    static QScriptValue scriptConstructor(QScriptContext* context, QScriptEngine* engine)
    {
        if (!s_instance)
            return QScriptValue();
        QObject* object = s_instance->createInstance(context);
        QScriptValue value = engine->newQObject(object, KrClassFactory::s_ownership);
        KrClassFactory::registerEnumsOnClass(engine, &T::staticMetaObject, value);
        return value;
    }
    static QScriptValue toScript(QScriptEngine* engine, const void* cell)
    {
        T* object = *static_cast<T* const*>(cell);
        QScriptValue value = engine->newQObject(object, QScriptEngine::QtOwnership);
        KrClassFactory::registerEnumsOnClass(engine, &T::staticMetaObject, value);
        return value;
    }
    static void fromScript(const QScriptValue& value, void* cell)
    {
        *static_cast<T**>(cell) = static_cast<T*>(T::staticMetaObject.cast(value.toQObject()));
    }
    static void deletePointer(void* cell) { delete static_cast<T**>(cell); }
    static void* createPointer(const void* copy)
    {
        return copy ? new T*(*static_cast<T* const*>(copy)) : new T*(nullptr);
    }
    static void destructPointer(void*) {}
    static void* constructPointer(void* where, const void* copy)
    {
        return new (where) T*(copy ? *static_cast<T* const*>(copy) : nullptr);
    }

    static inline KrTCustomClassFactory* s_instance = nullptr;
    static inline int s_pointerTypeId = 0;
};

// Adds the one-argument creation entry, which ignores its argument.
template <class T> class KrTClassFactory : public KrTCustomClassFactory<T>
{
public:
    using KrTCustomClassFactory<T>::KrTCustomClassFactory;
    QObject* createInstanceWith(void*) override { return this->createInstance(); }
};

class KrCorvanePaneFactory : public KrTClassFactory<KrCorvanePane>
{
public:
    KrCorvanePaneFactory();
    using KrClassFactory::createInstance;
    QObject* createInstance() override;
};

class KrCorvanePaneActionFactory : public KrTClassFactory<KrCorvanePaneAction>
{
public:
    KrCorvanePaneActionFactory();
    using KrClassFactory::createInstance;
    QObject* createInstance() override;
};

class KrStandardBrickWidgetFactory : public KrTClassFactory<KrStandardBrickWidget>
{
public:
    KrStandardBrickWidgetFactory();
    using KrClassFactory::createInstance;
    QObject* createInstance() override;
};

class KrCorvanePaneItemRefreshFactory : public KrTClassFactory<KrCorvanePaneItemRefresh>
{
public:
    KrCorvanePaneItemRefreshFactory();
    using KrClassFactory::createInstance;
    QObject* createInstance() override;
};

class KrCorvanePaneShowMenusFactory : public KrTClassFactory<KrCorvanePaneShowMenus>
{
public:
    KrCorvanePaneShowMenusFactory();
    using KrClassFactory::createInstance;
    QObject* createInstance() override;
};

// The library's two entry points.
extern "C" {
Q_DECL_EXPORT unsigned long getSDKVersion();
Q_DECL_EXPORT KrPlugin* getPluginDefinition();
}
