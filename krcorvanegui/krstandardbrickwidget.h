#pragma once

#include "krbrickoptionsframe.h"

#include <memory>

class KrBrickParam;
class KrProperty;
class KrPropertyWgt;
class KrShaderBrick;
class KrWidgetGroup;

// The default option widget of a brick: lists the brick's parameters in the collapsible
// groups "Outputs", "Inputs" and "Settings" and tells where each parameter's row lies, so
// that the brick's plugs sit beside their rows. Bursts of model changes are coalesced into one
// rebuild and one layout refresh through events posted to the widget itself.
class KrStandardBrickWidget : public KrBrickOptionsFrame
{
    Q_OBJECT
public:
    KrStandardBrickWidget();
    ~KrStandardBrickWidget() override;

    enum EventType
    {
        RebuildEvent = 61124,
        LayoutRefreshEvent = 61125
    };

    void setBrickFrame(QWidget* frame) override;
    void setBrick(KrShaderBrick* brick) override;
    float getParamYPosition(KrBrickParam* param) override;
    int getConnectorSize(KrBrickParam* param) override;
    KrShaderBrick* getBrick() override;

    // The row shown for param (its sub-group's bar or its label widget), or null.
    QWidget* getParamWidget(KrBrickParam* param) const;

private slots:
    void resetLayout(bool updateParent);
    void collapsedFired();
    void paramChange();
    void connectionsChanged();
    void promptForLabel();

protected:
    bool event(QEvent* event) override;
    bool eventFilter(QObject* watched, QEvent* event) override;
    void contextMenuEvent(QContextMenuEvent* event) override;
    void showEvent(QShowEvent* event) override;
    void changeEvent(QEvent* event) override;

private:
    void rebuild();
    void addParams(int direction, KrWidgetGroup*& group, const QString& title);
    KrWidgetGroup* makeGroup(const QString& title, const QString& objectName);
    KrPropertyWgt* addPropertyWidget(KrProperty* property, KrWidgetGroup* group);

    struct Private;
    std::unique_ptr<Private> d;
};
