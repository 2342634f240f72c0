#pragma once

#include "krcore_global.h"

#include <QAction>
#include <QList>
#include <QObject>
#include <QString>

// A command of the application. The main window files it into the menu named by
// getDefaultMenuPath() ("File", "Edit", "Window/Panes", or "::PaneClass" for a pane's options
// menu) and calls executeAction() when it is triggered.
class KRCORE_EXPORT KrAction : public QAction
{
    Q_OBJECT
public:
    KrAction(const QString& text, const QString& description, QObject* parent = nullptr);
    ~KrAction() override;

    QString getDescription() const { return m_description; }

public slots:
    // Actions of one group sit together, separated from other groups.
    virtual QString getActionGroup() const;
    virtual QString getDefaultMenuPath() const;
    virtual void executeAction();

private:
    QString m_description;
};

// A host command that acts on whatever has the keyboard focus: it triggers the matching
// action of the focused widget or one of its ancestors (an action with the same shortcut, or
// whose "krHostAction" property names this class), and otherwise calls the focused widget's
// own slot of the same purpose when it has one (copy() on a line edit). Its shortcut only
// shows in the menu: the focused window's own action takes the key, so the two never clash.
class KRCORE_EXPORT KrRoutedAction : public KrAction
{
    Q_OBJECT
public:
    // fallbackSlot: the focused widget's slot to call when nothing else takes the command.
    KrRoutedAction(const QString& text, const QString& description, const QString& group,
                   const QString& menuPath, const char* fallbackSlot, QObject* parent = nullptr);

    // The action that executeAction() would trigger now, or null.
    QAction* findTarget() const;
    // True when executing would do something.
    bool hasTarget() const;

public slots:
    QString getActionGroup() const override;
    QString getDefaultMenuPath() const override;
    void executeAction() override;

private:
    QWidget* focusStart() const;
    QString m_group;
    QString m_menuPath;
    QByteArray m_fallbackSlot;
};

class KRCORE_EXPORT KrSaveAction : public KrRoutedAction
{
    Q_OBJECT
public:
    explicit KrSaveAction(QObject* parent = nullptr);
};

class KRCORE_EXPORT KrImportAction : public KrRoutedAction
{
    Q_OBJECT
public:
    explicit KrImportAction(QObject* parent = nullptr);
};

class KRCORE_EXPORT KrCopyAction : public KrRoutedAction
{
    Q_OBJECT
public:
    explicit KrCopyAction(QObject* parent = nullptr);
};

class KRCORE_EXPORT KrSICutAction : public KrRoutedAction
{
    Q_OBJECT
public:
    explicit KrSICutAction(QObject* parent = nullptr);
};

class KRCORE_EXPORT KrPasteAction : public KrRoutedAction
{
    Q_OBJECT
public:
    explicit KrPasteAction(QObject* parent = nullptr);
};

class KRCORE_EXPORT KrCustomizeAction : public KrRoutedAction
{
    Q_OBJECT
public:
    explicit KrCustomizeAction(QObject* parent = nullptr);
};

// Every KrAction of the main window: the host's own and those made from plug-in factories.
class KRCORE_EXPORT KrActionMgr : public QObject
{
    Q_OBJECT
public:
    explicit KrActionMgr(QObject* parent = nullptr);
    ~KrActionMgr() override;

    // Files action (not owned); it leaves the list when it is destroyed.
    void addAction(KrAction* action);
    void removeAction(KrAction* action);
    bool contains(KrAction* action) const { return m_actions.contains(action); }

public slots:
    // The first action whose class is className, or null.
    KrAction* findAction(const QString& className) const;
    int getNumActions() const;
    KrAction* getAction(int i) const;

signals:
    void actionAdded(KrAction* action);

private:
    QList<KrAction*> m_actions;
};
