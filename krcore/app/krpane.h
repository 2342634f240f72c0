#pragma once

#include "krcore_global.h"
#include "kraction.h"

#include <QByteArray>
#include <QList>
#include <QObject>
#include <QString>
#include <QWidget>

class KrMainWindow;
class QDockWidget;

// What the main window stores of a pane between sessions; handed to the pane so it can add
// its own state when the layout is saved.
struct KRCORE_EXPORT KrPaneSettings
{
    QString name;
    bool visible = true;
    Qt::DockWidgetArea area = Qt::RightDockWidgetArea;
};

// A dockable pane of the main window. The main window puts it in a QDockWidget whose object
// name is the pane's class name, so saved layouts find it again.
class KRCORE_EXPORT KrPane : public QWidget
{
    Q_OBJECT
public:
    explicit KrPane(const QString& name, QWidget* parent = nullptr);
    ~KrPane() override;

    QString getName() const { return m_name; }

public slots:
    // Called when the main window stores its layout (on exit) and after it restored one.
    virtual void saveSettings(KrPaneSettings& settings);
    virtual void restoreSettings(const KrPaneSettings& settings);

private:
    QString m_name;
};

// The panes of the main window and their docks.
class KRCORE_EXPORT KrPaneMgr : public QObject
{
    Q_OBJECT
public:
    explicit KrPaneMgr(QObject* parent = nullptr);
    ~KrPaneMgr() override;

    // Files pane with the dock that holds it (neither owned).
    void addPane(KrPane* pane, QDockWidget* dock);
    QDockWidget* getDock(const KrPane* pane) const;

public slots:
    // The pane whose name or class name is name, or null.
    KrPane* findPane(const QString& name) const;
    int getNumPanes() const;
    KrPane* getPane(int i) const;

signals:
    void paneAdded(KrPane* pane);

private:
    struct Entry
    {
        KrPane* pane;
        QDockWidget* dock;
    };
    QList<Entry> m_entries;
};

// The Window menu's command that shows and hides the pane of one class. When the pane does
// not exist yet, showing it creates it through its class factory.
class KRCORE_EXPORT KrPaneAction : public KrAction
{
    Q_OBJECT
public:
    explicit KrPaneAction(const char* paneClassName, QObject* parent = nullptr);
    ~KrPaneAction() override;

    QString getPaneClassName() const { return QString::fromLatin1(m_paneClassName); }
    // Follows dock's visibility from now on (the main window calls it when both exist).
    void attachToDock(QDockWidget* dock);

public slots:
    QString getActionGroup() const override;
    QString getDefaultMenuPath() const override;
    void executeAction() override;

private:
    QByteArray m_paneClassName;
};
