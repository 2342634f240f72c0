#pragma once

#include "kraction.h"
#include "krclassfactory.h"
#include "krpane.h"

#include <QApplication>
#include <QPointer>
#include <QTemporaryDir>
#include <QTimer>
#include <functional>

// Points the application's settings and standard folders away from the user's files for the
// life of the object.
class KrAppTestScope
{
public:
    KrAppTestScope();
    ~KrAppTestScope();
    QString path() const { return m_dir.path(); }
    bool isValid() const { return m_dir.isValid(); }

private:
    QTemporaryDir m_dir;
};

// Calls handler with the next modal widget that opens (a dialog run with exec()), polling
// every 20 ms for up to timeoutMs. Sets *handled when it ran.
void krOnNextModal(const std::function<void(QWidget*)>& handler, bool* handled = nullptr,
                   int timeoutMs = 5000);

// A chain of classes for the class-factory tests.
class KrTestBaseAction : public KrAction
{
    Q_OBJECT
public:
    explicit KrTestBaseAction(QObject* parent = nullptr);
    QString getActionGroup() const override;
    QString getDefaultMenuPath() const override;
    void setGroupAndPath(const QString& group, const QString& path);
    void executeAction() override;
    int executions() const { return m_executions; }

private:
    QString m_group = QStringLiteral("Test");
    QString m_path = QStringLiteral("Tools");
    int m_executions = 0;
};

class KrTestDerivedAction : public KrTestBaseAction
{
    Q_OBJECT
public:
    enum Flavour
    {
        Plain = 0,
        Spicy = 7
    };
    Q_ENUM(Flavour)
    explicit KrTestDerivedAction(QObject* parent = nullptr);
};

// A pane that remembers what the main window told it.
class KrTestPane : public KrPane
{
    Q_OBJECT
public:
    explicit KrTestPane(const QString& name = QStringLiteral("Test Pane"),
                        QWidget* parent = nullptr);
    void saveSettings(KrPaneSettings& settings) override;
    void restoreSettings(const KrPaneSettings& settings) override;

    int saves = 0;
    int restores = 0;
    KrPaneSettings lastSaved;
    KrPaneSettings lastRestored;
};

class KrOtherTestPane : public KrPane
{
    Q_OBJECT
public:
    KrOtherTestPane();
};

// A factory for the test classes above, not filed with any plug-in record.
template <class T> class KrTestFactory : public KrClassFactory
{
public:
    explicit KrTestFactory(const char* guid)
        : KrClassFactory(&T::staticMetaObject, KrGUID::fromString(QString::fromLatin1(guid)))
    {
    }
    using KrClassFactory::createInstance;
    QObject* createInstance() override
    {
        ++created;
        return failing ? nullptr : new T();
    }
    bool failing = false;
    int created = 0;
};
