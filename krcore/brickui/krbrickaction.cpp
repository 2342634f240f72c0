#include "krbrickaction.h"

#include "krbrickoptionsframe.h"
#include "krclassfactory.h"
#include "krplugin.h"
#include "krshaderbrick.h"
#include "krundo.h"

KR_CORE_CLASS(KrBrickCommandAction, "3F8C2D71-5A4E-4B19-8E6D-2C7B9A0F4E15");

KrBrickAction::KrBrickAction(QObject* parent) : QAction(parent) {}

KrBrickAction::~KrBrickAction() = default;

void KrBrickAction::setOptionsFrame(KrBrickOptionsFrame* frame)
{
    m_frame = frame;
}

void KrBrickAction::setActionArgument(const QString& argument)
{
    m_argument = argument;
}

KrBrickOptionsFrame* KrBrickAction::getOptionsFrame() const
{
    return m_frame;
}

QString KrBrickAction::getActionArgument() const
{
    return m_argument;
}

KrBrickCommandAction::KrBrickCommandAction(QObject* parent) : KrBrickAction(parent)
{
    connect(this, &QAction::triggered, this, &KrBrickCommandAction::execute);
}

KrBrickCommandAction::~KrBrickCommandAction() = default;

void KrBrickCommandAction::setActionArgument(const QString& argument)
{
    KrBrickAction::setActionArgument(argument);
    setText(argument);
}

bool KrBrickCommandAction::execute()
{
    KrBrickOptionsFrame* frame = getOptionsFrame();
    KrShaderBrick* brick = frame ? frame->getBrick() : nullptr;
    const QString command = getActionArgument();
    if (!brick || command.isEmpty())
        return false;
    // Whatever the brick records while it runs the command becomes one step.
    KrUndoStackHold hold;
    const bool done = brick->executeBrickAction(command);
    if (done)
        hold.accept(command);
    return done;
}
