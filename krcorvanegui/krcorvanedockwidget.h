#pragma once

#include <QDockWidget>
#include <QPointF>
#include <memory>

class IKrBrickUser;
class KrBrickGraphicsItem;
class KrBrickUserScene;
class KrSettings;
class QGraphicsView;
class KrCorvanePaneMainWgt;
class KrShaderBrick;
class QMenu;

namespace Ui {
class KrCorvaneBrickUserWindow;
}

// The window in which one brick user is edited: toolbar, view over the brick user's scene,
// zoom and "Apply". Owns its scene, not its brick user.
class KrCorvaneDockWidget : public QDockWidget
{
    Q_OBJECT
public:
    KrCorvaneDockWidget(IKrBrickUser* user, KrCorvanePaneMainWgt* mainParent, bool rightToLeft);
    ~KrCorvaneDockWidget() override;

    IKrBrickUser* getBrickUser() const;
    QGraphicsView* getView() const;

    // Adds the bricks of a clipboard record to user with fresh ids; answers their ids.
    static QList<uint> pasteRecord(IKrBrickUser* user, const KrSettings& record);

signals:
    void nameChanged(const QString& name);

public slots:
    bool isRightToLeft();
    void setIsRightToLeft(bool onOff, bool doFlip);
    void addBrickInCenter(KrShaderBrick* brick);
    KrCorvanePaneMainWgt* getMainParent();
    void addEditItemsToMenu(QMenu* menu);
    KrBrickUserScene* getBrickScene();

private slots:
    void save();
    void apply();
    void import();
    void copy();
    void copyOrCut(bool delBricks);
    void cut();
    void paste();
    void preferences();
    void updateZoom();

protected:
    void closeEvent(QCloseEvent* event) override;

private:
    void buildToolBar();
    QList<KrBrickGraphicsItem*> selectedBrickItems() const;

    struct Private;
    std::unique_ptr<Private> d;
};
