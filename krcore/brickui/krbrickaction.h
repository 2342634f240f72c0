#pragma once

#include "krcore_global.h"

#include <QAction>
#include <QPointer>
#include <QString>

class KrBrickOptionsFrame;

// Base of the entries a brick contributes to its menu in the editor. A brick lists them as
// "<action class>::<argument>"; the editor makes the action through the class's factory, then
// hands it the brick's option widget and the argument, in that order.
class KRCORE_EXPORT KrBrickAction : public QAction
{
    Q_OBJECT
public:
    explicit KrBrickAction(QObject* parent = nullptr);
    ~KrBrickAction() override;

    virtual void setOptionsFrame(KrBrickOptionsFrame* frame);
    virtual void setActionArgument(const QString& argument);

    KrBrickOptionsFrame* getOptionsFrame() const;
    QString getActionArgument() const;

private:
    QPointer<KrBrickOptionsFrame> m_frame;
    QString m_argument;
};

// Runs the brick's own command named by the argument (KrShaderBrick::executeBrickAction).
// Its text is the argument, so "KrBrickCommandAction::Add Input" reads "Add Input". What the
// command changes is one undo step named like the entry.
class KRCORE_EXPORT KrBrickCommandAction : public KrBrickAction
{
    Q_OBJECT
public:
    explicit KrBrickCommandAction(QObject* parent = nullptr);
    ~KrBrickCommandAction() override;

    void setActionArgument(const QString& argument) override;

public slots:
    // False when there is no brick or the brick does not know the command.
    bool execute();
};
