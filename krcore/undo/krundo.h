#pragma once

#include "krcore_global.h"

#include <QObject>
#include <QString>
#include <memory>

class QAction;
class QUndoStack;

// One undoable change. The code that pushes it has already changed the model: pushing never
// runs redo(). undo() takes the change back, redo() makes it again.
class KRCORE_EXPORT KrUndoItem
{
public:
    KrUndoItem();
    virtual ~KrUndoItem();
    virtual void undo() = 0;
    virtual void redo();
    virtual int size() const; // rough memory cost, for the stack's accounting

private:
    Q_DISABLE_COPY(KrUndoItem)
};

// The application's undo stack, a QUndoStack underneath. Every step is a group of items.
class KRCORE_EXPORT KrUndoStack : public QObject
{
    Q_OBJECT
public:
    explicit KrUndoStack(QObject* parent = nullptr);
    ~KrUndoStack() override;

    // Takes ownership. Outside a hold the item is a step of its own (empty text). While the
    // stack replays an undo or redo the item is deleted at once.
    void push(KrUndoItem* item);
    // False while an undo or redo is being replayed.
    bool canPushItems() const;

    QUndoStack* undoStack() const;
    int count() const;
    int index() const;
    bool canUndo() const;
    bool canRedo() const;
    QString undoText() const;
    QString redoText() const;
    QString text(int index) const;
    // Sum of the size() of the items of step index (0 for no such step).
    int stepSize(int index) const;
    // During a replay the clearing waits until the replay is over.
    void clear();

    // Edit menu actions whose texts follow the next step ("Undo Move Bricks").
    QAction* createUndoAction(QObject* parent) const;
    QAction* createRedoAction(QObject* parent) const;

public slots:
    void undo();
    void redo();

signals:
    void indexChanged(int index);
    void cleanChanged(bool clean);
    // Around each outermost undo or redo of a step: listeners can hold back work that a
    // step of many items would otherwise repeat per item.
    void replayStarted();
    void replayFinished();

private:
    friend class KrUndoStackHold;
    void finishReplay();
    struct Private;
    std::unique_ptr<Private> d;
};

// The application's stack, or null when none exists (set while a KrUndoStack lives; the first
// one made becomes the global one).
extern KRCORE_EXPORT KrUndoStack* krUndoStack;

// Gathers every item pushed while it lives into one step named by accept(text). A hold that
// is never accepted makes no step (its items are discarded). Holds nest: an inner hold joins
// the outer step, which is made when the outermost hold ends and is named by the outermost
// hold that was accepted. Holds opened while a stack replays an undo or redo make nothing.
class KRCORE_EXPORT KrUndoStackHold
{
public:
    KrUndoStackHold();
    ~KrUndoStackHold();
    void accept(const QString& text);

private:
    Q_DISABLE_COPY(KrUndoStackHold)
    bool m_accepted = false;
    int m_level = 0; // 0 for the outermost hold of a nest
};
