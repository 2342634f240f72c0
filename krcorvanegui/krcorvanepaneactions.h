#pragma once

#include "kraction.h"

// Rebuilds the "User" part of the brick library from the custom brick folder.
class KrCorvanePaneItemRefresh : public KrAction
{
    Q_OBJECT
public:
    KrCorvanePaneItemRefresh();

public slots:
    QString getActionGroup() const override;
    QString getDefaultMenuPath() const override;
    void executeAction() override;
};

// Opens the custom brick folder in the system's file browser.
class KrCorvanePaneShowMenus : public KrAction
{
    Q_OBJECT
public:
    KrCorvanePaneShowMenus();

    // The URL executeAction() hands to the desktop.
    static QString userBricksURL();

public slots:
    QString getActionGroup() const override;
    QString getDefaultMenuPath() const override;
    void executeAction() override;

private:
    static QString customBrickPath();
};
