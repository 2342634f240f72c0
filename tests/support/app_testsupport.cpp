#include "app_testsupport.h"

#include "krappsettings.h"

#include <QElapsedTimer>
#include <QStandardPaths>

KrAppTestScope::KrAppTestScope()
{
    QStandardPaths::setTestModeEnabled(true);
    KrAppSettings::setStorageFolder(m_dir.path());
}

KrAppTestScope::~KrAppTestScope()
{
    KrAppSettings::setStorageFolder(QString());
}

void krOnNextModal(const std::function<void(QWidget*)>& handler, bool* handled, int timeoutMs)
{
    auto* timer = new QTimer(qApp);
    auto* clock = new QElapsedTimer;
    clock->start();
    timer->setInterval(20);
    QObject::connect(timer, &QTimer::timeout, timer, [=]() {
        QWidget* modal = QApplication::activeModalWidget();
        if (modal && modal->isVisible()) {
            timer->stop();
            if (handled)
                *handled = true;
            handler(modal);
        } else if (clock->elapsed() < timeoutMs) {
            return;
        }
        timer->stop();
        timer->deleteLater();
        delete clock;
    });
    timer->start();
}

KrTestBaseAction::KrTestBaseAction(QObject* parent)
    : KrAction(QStringLiteral("Test Action"), QStringLiteral("An action of the tests."), parent)
{
}

QString KrTestBaseAction::getActionGroup() const
{
    return m_group;
}

QString KrTestBaseAction::getDefaultMenuPath() const
{
    return m_path;
}

void KrTestBaseAction::setGroupAndPath(const QString& group, const QString& path)
{
    m_group = group;
    m_path = path;
}

void KrTestBaseAction::executeAction()
{
    ++m_executions;
}

KrTestDerivedAction::KrTestDerivedAction(QObject* parent) : KrTestBaseAction(parent) {}

KrTestPane::KrTestPane(const QString& name, QWidget* parent) : KrPane(name, parent)
{
    setMinimumSize(100, 100);
}

void KrTestPane::saveSettings(KrPaneSettings& settings)
{
    ++saves;
    lastSaved = settings;
}

void KrTestPane::restoreSettings(const KrPaneSettings& settings)
{
    ++restores;
    lastRestored = settings;
}

KrOtherTestPane::KrOtherTestPane() : KrPane(QStringLiteral("Other Pane"))
{
    setMinimumSize(100, 100);
}
