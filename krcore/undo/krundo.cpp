#include "krundo.h"

#include <QAction>
#include <QKeySequence>
#include <QUndoCommand>
#include <QUndoStack>

#include <memory>
#include <vector>

KrUndoStack* krUndoStack = nullptr;

namespace {

// Replays under way in one stack; shared with its steps.
struct ReplayCounter
{
    int depth = 0;
    KrUndoStack* owner = nullptr;
};

int s_replaying = 0; // replays under way in any stack

class Replay
{
public:
    explicit Replay(ReplayCounter* counter) : m_counter(counter)
    {
        ++s_replaying;
        if (m_counter->depth++ == 0 && m_counter->owner)
            emit m_counter->owner->replayStarted();
    }
    ~Replay()
    {
        --s_replaying;
        if (--m_counter->depth == 0 && m_counter->owner)
            emit m_counter->owner->replayFinished();
    }

private:
    ReplayCounter* m_counter;
};

// One step: items of one hold (or one lone push). Pushing must not replay the change the
// caller already made, so the first redo() that QUndoStack::push() runs is skipped.
class KrUndoStep : public QUndoCommand
{
public:
    KrUndoStep(ReplayCounter* counter, std::vector<std::unique_ptr<KrUndoItem>> items,
               const QString& text)
        : QUndoCommand(text), m_counter(counter), m_items(std::move(items))
    {
    }

    void undo() override;
    void redo() override;

    int size() const
    {
        int total = 0;
        for (const auto& item : m_items)
            total += item->size();
        return total;
    }

private:
    ReplayCounter* m_counter;
    std::vector<std::unique_ptr<KrUndoItem>> m_items;
    bool m_pushed = false;
};

// Items waiting for the outermost hold to end. Holds are process-wide (they do not know a
// stack), so pending items remember the stack they were pushed to.
struct PendingItem
{
    KrUndoStack* stack;
    KrUndoItem* item;
};

struct HoldState
{
    int depth = 0;
    int acceptedLevel = -1; // level of the outermost accepted hold of the nest, -1 for none
    QString text;
    bool inert = false; // the outermost hold was opened during a replay
    std::vector<PendingItem> pending;
};

HoldState& holds()
{
    static HoldState state;
    return state;
}

} // namespace

KrUndoItem::KrUndoItem() = default;

KrUndoItem::~KrUndoItem() = default;

void KrUndoItem::redo() {}

int KrUndoItem::size() const
{
    return 0;
}

struct KrUndoStack::Private
{
    ReplayCounter replay; // declared first: the steps in stack point at it
    QUndoStack stack;
    bool clearWhenDone = false;

    bool replaying() const { return replay.depth > 0; }
};

void KrUndoStep::undo()
{
    Replay replay(m_counter);
    for (auto it = m_items.rbegin(); it != m_items.rend(); ++it)
        (*it)->undo();
}

void KrUndoStep::redo()
{
    if (!m_pushed) {
        m_pushed = true;
        return;
    }
    Replay replay(m_counter);
    for (const auto& item : m_items)
        item->redo();
}

KrUndoStack::KrUndoStack(QObject* parent) : QObject(parent), d(new Private)
{
    if (!krUndoStack)
        krUndoStack = this;
    d->replay.owner = this;
    connect(&d->stack, &QUndoStack::indexChanged, this, &KrUndoStack::indexChanged);
    connect(&d->stack, &QUndoStack::cleanChanged, this, &KrUndoStack::cleanChanged);
}

KrUndoStack::~KrUndoStack()
{
    if (krUndoStack == this)
        krUndoStack = nullptr;
    // Items pushed inside a hold that is still open die with their stack.
    std::vector<PendingItem>& pending = holds().pending;
    std::vector<PendingItem> mine;
    for (auto it = pending.begin(); it != pending.end();) {
        if (it->stack == this) {
            mine.push_back(*it);
            it = pending.erase(it);
        } else {
            ++it;
        }
    }
    for (const PendingItem& p : mine)
        delete p.item;
    disconnect(&d->stack, nullptr, this, nullptr);
}

void KrUndoStack::push(KrUndoItem* item)
{
    if (!item)
        return;
    if (d->replaying()) {
        // An undo or redo replays a change through model code that also records; the step
        // being replayed already covers it.
        delete item;
        return;
    }
    HoldState& h = holds();
    if (h.depth > 0) {
        h.pending.push_back({this, item});
        return;
    }
    std::vector<std::unique_ptr<KrUndoItem>> items;
    items.emplace_back(item);
    d->stack.push(new KrUndoStep(&d->replay, std::move(items), QString()));
}

bool KrUndoStack::canPushItems() const
{
    return !d->replaying();
}

QUndoStack* KrUndoStack::undoStack() const
{
    return &d->stack;
}

int KrUndoStack::count() const
{
    return d->stack.count();
}

int KrUndoStack::index() const
{
    return d->stack.index();
}

bool KrUndoStack::canUndo() const
{
    return d->stack.canUndo();
}

bool KrUndoStack::canRedo() const
{
    return d->stack.canRedo();
}

QString KrUndoStack::undoText() const
{
    return d->stack.undoText();
}

QString KrUndoStack::redoText() const
{
    return d->stack.redoText();
}

QString KrUndoStack::text(int index) const
{
    return d->stack.text(index);
}

int KrUndoStack::stepSize(int index) const
{
    const auto* step = dynamic_cast<const KrUndoStep*>(d->stack.command(index));
    return step ? step->size() : 0;
}

void KrUndoStack::clear()
{
    // Clearing deletes the step being replayed; wait until the replay is over.
    if (d->replaying()) {
        d->clearWhenDone = true;
        return;
    }
    d->stack.clear();
}

// The actions go through undo()/redo() of this class (not of the QUndoStack) so a clear
// asked for during their replay is carried out too.
QAction* KrUndoStack::createUndoAction(QObject* parent) const
{
    auto* self = const_cast<KrUndoStack*>(this);
    auto* action = new QAction(parent);
    action->setShortcuts(QKeySequence::Undo);
    auto update = [action, self]() {
        const QString step = self->undoText();
        action->setText(step.isEmpty() ? tr("Undo") : tr("Undo %1").arg(step));
        action->setEnabled(self->canUndo());
    };
    update();
    connect(&d->stack, &QUndoStack::undoTextChanged, action, update);
    connect(&d->stack, &QUndoStack::canUndoChanged, action, update);
    connect(action, &QAction::triggered, self, &KrUndoStack::undo);
    return action;
}

QAction* KrUndoStack::createRedoAction(QObject* parent) const
{
    auto* self = const_cast<KrUndoStack*>(this);
    auto* action = new QAction(parent);
    action->setShortcuts(QKeySequence::Redo);
    auto update = [action, self]() {
        const QString step = self->redoText();
        action->setText(step.isEmpty() ? tr("Redo") : tr("Redo %1").arg(step));
        action->setEnabled(self->canRedo());
    };
    update();
    connect(&d->stack, &QUndoStack::redoTextChanged, action, update);
    connect(&d->stack, &QUndoStack::canRedoChanged, action, update);
    connect(action, &QAction::triggered, self, &KrUndoStack::redo);
    return action;
}

void KrUndoStack::undo()
{
    // An item whose undo asks for another undo would replay a step inside a step.
    if (d->replaying())
        return;
    d->stack.undo();
    finishReplay();
}

void KrUndoStack::redo()
{
    if (d->replaying())
        return;
    d->stack.redo();
    finishReplay();
}

void KrUndoStack::finishReplay()
{
    if (d->clearWhenDone && !d->replaying()) {
        d->clearWhenDone = false;
        d->stack.clear();
    }
}

KrUndoStackHold::KrUndoStackHold()
{
    HoldState& h = holds();
    m_level = h.depth++;
    if (m_level == 0) {
        h.acceptedLevel = -1;
        h.text.clear();
        h.inert = s_replaying > 0;
    }
}

KrUndoStackHold::~KrUndoStackHold()
{
    HoldState& h = holds();
    if (--h.depth > 0)
        return;

    std::vector<PendingItem> pending;
    std::swap(pending, h.pending);
    const bool makeStep = h.acceptedLevel >= 0 && !h.inert;
    const QString text = h.text;
    h.acceptedLevel = -1;
    h.text.clear();
    h.inert = false;

    // One step per stack, in the order the stacks were first pushed to.
    while (!pending.empty()) {
        KrUndoStack* stack = pending.front().stack;
        std::vector<std::unique_ptr<KrUndoItem>> items;
        std::vector<PendingItem> others;
        for (const PendingItem& p : pending) {
            if (p.stack == stack)
                items.emplace_back(p.item);
            else
                others.push_back(p);
        }
        std::swap(pending, others);
        if (makeStep && !stack->d->replaying())
            stack->d->stack.push(new KrUndoStep(&stack->d->replay, std::move(items), text));
        // Otherwise the unique pointers delete the items here.
    }
}

void KrUndoStackHold::accept(const QString& text)
{
    HoldState& h = holds();
    // The outermost accepted hold names the step, whatever order the accepts come in.
    if (h.acceptedLevel < 0 || m_level <= h.acceptedLevel) {
        h.acceptedLevel = m_level;
        h.text = text;
    }
    m_accepted = true;
}
