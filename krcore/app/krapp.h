#pragma once

#include "krcore_global.h"

#include <QList>
#include <QObject>
#include <QString>
#include <memory>

class KrClassFactory;
class KrContentMgr;
class KrMainWindow;
class KrPlugin;
class KrRenderMgr;
class KrStyle;
class KrUndoStack;
class QWidget;

// The application's services: class factories, plug-ins, the main window, style, content
// folders, temporary files. One per process, reached through krApp.
class KRCORE_EXPORT KrApp : public QObject
{
    Q_OBJECT
public:
    explicit KrApp(QObject* parent = nullptr);
    ~KrApp() override;

    // The process's KrApp; made on first use (owned by the QCoreApplication) when none exists.
    static KrApp* instance();
    // The process's KrApp if one exists; never makes one (safe during shutdown).
    static KrApp* existingInstance();

    // Class factories of krcore and of every loaded plug-in, in registration order.
    KrClassFactory* findClassFactory(const QString& className) const; // null if none
    int getNumClassFactories() const;
    KrClassFactory* getClassFactory(int i) const;
    void registerClassFactory(KrClassFactory* factory);
    void unregisterClassFactory(KrClassFactory* factory);

    // Loads one plug-in library. Null with a reason in error when it is not a plug-in or
    // was built for another SDK major version. The library stays loaded.
    KrPlugin* loadPlugin(const QString& path, QString* error = nullptr);
    // Loads every library in folder; returns the records loaded.
    QList<KrPlugin*> loadPlugins(const QString& folder);
    QList<KrPlugin*> getPlugins() const;
    // The host's plug-in folder: $KR_PLUGIN_PATH, else ../plugins beside the executable.
    static QString defaultPluginFolder();

    KrMainWindow* getInterface() const; // the main window, or null
    void setInterface(KrMainWindow* window);
    QWidget* getDialogParent() const; // the main window or the active window
    bool isClosing() const;
    void setClosing(bool closing);

    // A new unique file name in a private temporary folder removed when the application exits.
    QString getTempFilename(const QString& suffix = QString());

    KrStyle* getStyle();
    KrContentMgr* getContentMgr();
    KrRenderMgr* getRenderMgr() const; // null until a renderer is installed
    void setRenderMgr(KrRenderMgr* mgr);
    KrUndoStack* getUndoStack() const;

    // Hands url to the desktop's handler. False when the URL is invalid or no handler could
    // take it (as on a platform without a desktop, where the request is only logged).
    bool showURL(const QString& url);

signals:
    void classFactoriesChanged();
    void pluginLoaded(KrPlugin* plugin);
    void urlRequested(const QString& url);

private:
    struct Private;
    std::unique_ptr<Private> d;
};

#define krApp (KrApp::instance())
