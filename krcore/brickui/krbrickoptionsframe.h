#pragma once

#include "krcore_global.h"

#include <QFrame>
#include <QPointF>

class KrBrickParam;
class KrShaderBrick;

// Base of every widget that shows a brick's options inside its frame in the editor. It knows
// where each parameter's plug goes: on the frame edge that the parameter's direction and the
// layout side choose, at getParamYPosition().
class KRCORE_EXPORT KrBrickOptionsFrame : public QFrame
{
    Q_OBJECT
public:
    explicit KrBrickOptionsFrame(QWidget* parent = nullptr);
    ~KrBrickOptionsFrame() override;

    // The plug point of param in the coordinates of the frame that holds this widget (the
    // widget's parent), or of this widget when it has no parent. Inputs sit on the left edge
    // and outputs on the right, swapped when right-to-left. (-1, -1) for a parameter that has
    // no row.
    virtual QPointF getParamPosition(KrBrickParam* param);
    // The holder frame (a QWidget of the editor, opaque to krcore).
    virtual void setBrickFrame(QWidget* frame);
    virtual void setBrick(KrShaderBrick* brick);
    // Vertical centre of param's row in this widget's coordinates, -1 when it has no row.
    virtual float getParamYPosition(KrBrickParam* param);
    virtual int getConnectorSize(KrBrickParam* param);
    virtual KrShaderBrick* getBrick();
    virtual bool isRightToLeft() const;
    virtual void setIsRightToLeft(bool rightToLeft);

    void setHideAdvanced(bool hide); // emits hideAdvancedChanged() when the state changes
    bool hidesAdvanced() const { return m_hideAdvanced; }

signals:
    void updateConnections();
    void hideAdvancedChanged();

private:
    KrShaderBrick* m_brick = nullptr;
    bool m_rightToLeft = false;
    bool m_hideAdvanced = true;
};
