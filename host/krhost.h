#pragma once

#include <QObject>
#include <QScriptEngine>
#include <QString>
#include <memory>

class KrMainWindow;
class KrScene;

// The host application: its main window, the plug-ins' panes and actions, and the script
// engine that knows every contributed class.
class KrHost : public QObject
{
    Q_OBJECT
public:
    struct Options
    {
        QString pluginFolder;
        QString scriptFile;
        QString screenshotFile;
    };

    explicit KrHost(const Options& options, QObject* parent = nullptr);
    ~KrHost() override;

    // Builds the window, loads plug-ins and shows the window; the script and the screenshot
    // follow from the event loop.
    void start();

    KrMainWindow* mainWindow() const;
    KrScene* scene() const;
    QScriptEngine* scriptEngine();

private:
    void createContributedObjects();
    void setUpScriptEngine();
    void afterStart();
    bool runScript(const QString& fileName);
    bool writeScreenshot(const QString& fileName);

    Options m_options;
    // Outlives the window: the panes show and edit it.
    std::unique_ptr<KrScene> m_scene;
    std::unique_ptr<KrMainWindow> m_window;
    std::unique_ptr<QScriptEngine> m_engine;
    bool m_exitRequested = false;
};
