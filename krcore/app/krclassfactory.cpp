#include "krclassfactory.h"
#include "krapp.h"

#include <QMetaEnum>
#include <QMetaObject>
#include <QScriptContext>

QScriptEngine::ValueOwnership KrClassFactory::s_ownership = QScriptEngine::QtOwnership;

namespace {

QScriptValue constructThroughFactory(QScriptContext* context, QScriptEngine* engine, void* arg)
{
    auto* factory = static_cast<KrClassFactory*>(arg);
    QObject* object = factory->createInstance(context);
    if (!object)
        return context->throwError(
            QStringLiteral("%1 could not be created").arg(factory->className()));
    QScriptValue value = engine->newQObject(object, KrClassFactory::s_ownership);
    KrClassFactory::registerEnumsOnClass(engine, factory->metaObject(), value);
    return value;
}

} // namespace

KrClassFactory::KrClassFactory(const QMetaObject* metaObject, const KrGUID& classID)
    : m_metaObject(metaObject), m_classID(classID)
{
}

KrClassFactory::~KrClassFactory()
{
    // A plug-in unloaded while the application lives must not leave a dangling entry.
    if (KrApp* app = KrApp::existingInstance())
        app->unregisterClassFactory(this);
}

QObject* KrClassFactory::createInstance(QScriptContext*)
{
    return createInstance();
}

QObject* KrClassFactory::createInstanceWith(void*)
{
    return createInstance();
}

void KrClassFactory::registerClass(QScriptEngine* engine)
{
    if (!engine || !m_metaObject)
        return;
    QScriptValue ctor = engine->newFunction(constructThroughFactory, this);
    QScriptValue classValue = engine->newQMetaObject(m_metaObject, ctor);
    engine->globalObject().setProperty(className(), classValue, QScriptValue::KeepExistingFlags);
}

QString KrClassFactory::className() const
{
    return m_metaObject ? QString::fromLatin1(m_metaObject->className()) : QString();
}

bool KrClassFactory::provides(const char* baseName) const
{
    if (!baseName)
        return false;
    for (const QMetaObject* mo = m_metaObject; mo; mo = mo->superClass()) {
        if (qstrcmp(mo->className(), baseName) == 0)
            return true;
    }
    return false;
}

bool KrClassFactory::provides(const QString& baseName) const
{
    return provides(baseName.toLatin1().constData());
}

void KrClassFactory::registerEnumsOnClass(QScriptEngine* engine, const QMetaObject* metaObject,
                                          QScriptValue& value)
{
    if (!engine || !metaObject || !value.isObject())
        return;
    for (int i = 0; i < metaObject->enumeratorCount(); ++i) {
        const QMetaEnum e = metaObject->enumerator(i);
        for (int k = 0; k < e.keyCount(); ++k) {
            value.setProperty(QString::fromLatin1(e.key(k)), QScriptValue(engine, e.value(k)),
                              QScriptValue::ReadOnly | QScriptValue::Undeletable);
        }
    }
}
