#pragma once

#include "app_testsupport.h"

#include <QMessageBox>
#include <QString>
#include <QStringList>
#include <functional>
#include <memory>

class KrMainWindow;
class KrSettings;
class QWidget;

// Private settings and folders and a host main window for the pane's tests.
class KrPaneTestEnv
{
public:
    KrPaneTestEnv();
    ~KrPaneTestEnv();
    KrMainWindow* mainWindow() const { return m_window.get(); }
    QString path() const { return m_scope.path(); }
    // The folder of the user's saved bricks, created.
    QString brickFolder() const;

private:
    KrAppTestScope m_scope;
    std::unique_ptr<KrMainWindow> m_window;
};

// What a modal answer saw.
struct KrModalSeen
{
    bool handled = false;
    QString className;
    QString title;
    QString text;
    QStringList nameFilters;
};

using KrModalAnswer = std::function<void(QWidget*)>;

// Answers the next modal widgets in order: each answer runs once the previous one is done.
void pnAnswerModals(const QList<KrModalAnswer>& answers);

// Answers: a file dialog accepted with fileName; a message box answered with button; any
// modal rejected. Each records what it saw in seen (when given).
KrModalAnswer pnFileAnswer(const QString& fileName, KrModalSeen* seen = nullptr);
KrModalAnswer pnMessageAnswer(QMessageBox::StandardButton button, KrModalSeen* seen = nullptr);
KrModalAnswer pnRejectAnswer(KrModalSeen* seen = nullptr);

QByteArray pnReadBytes(const QString& fileName);
bool pnWriteBytes(const QString& fileName, const QByteArray& bytes);
// A saved-brick (".kcb") record of a new brick of className, titled title.
QString pnSavedBrickText(const QString& className, const QString& title);
