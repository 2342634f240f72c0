#pragma once

#include "krbrickparam.h"
#include "krbrickuser.h"
#include "krshaderbrick.h"

#include <QEvent>
#include <QGraphicsView>
#include <QPointF>
#include <QString>

class KrBrickGraphicsItem;
class KrBrickUserScene;
class KrConnectorItem;
class QMimeData;

// A brick whose parameters the test chooses. type() answers the shader type given.
class KrSceneTestBrick : public KrShaderBrick
{
    Q_OBJECT
public:
    explicit KrSceneTestBrick(const QString& name = QStringLiteral("Test"), int type = 0);
    KrBrickParam* addInput(const QString& arg, const QString& type = QStringLiteral("float"),
                           bool advanced = false);
    KrBrickParam* addOutput(const QString& arg, const QString& type = QStringLiteral("float"));
    int type() const override { return m_type; }

private:
    int m_type;
};

// A brick user with any number of brick sets, each taking a root of any kind.
class KrSceneTestUser : public KrBrickUserElement
{
    Q_OBJECT
public:
    explicit KrSceneTestUser(int brickSets = 1);
    IKrBrickUser* createNew() override { return new KrSceneTestUser; }
    QString getFileExtension() const override { return QStringLiteral("kts"); }
    QString getTypeLabel() const override { return QStringLiteral("Test Bricks"); }
};

// A view over a brick scene of a brick user it owns, shown off screen. The undo stack is
// emptied when it is made and when it goes.
class KrSceneHarness
{
public:
    explicit KrSceneHarness(IKrBrickUser* user = nullptr, QSize viewSize = QSize(1200, 800));
    ~KrSceneHarness();

    // The scene goes (as when its window closes); the brick user stays.
    void closeScene();

    // addBrickAt and the deferred work it leaves.
    KrBrickGraphicsItem* add(KrShaderBrick* brick, const QPointF& pos);
    KrConnectorItem* plug(KrShaderBrick* brick, const QString& arg) const;
    // Where a plug's circle is, in view coordinates.
    QPoint viewPointOf(KrConnectorItem* plug) const;

    IKrBrickUser* user = nullptr;
    QGraphicsView* view = nullptr;
    KrBrickUserScene* scene = nullptr;
};

// Runs posted events (deferred deletion included) until none are left.
void krSceneSettle();

// The brick user's record as text; without withNextId, less the next free brick id (which
// only ever grows, so undo does not take it back).
QString krSceneRecord(IKrBrickUser* user, bool withNextId = true);

// Item-view drag data of one library entry carrying factory class className.
QMimeData* krSceneFactoryMime(const QString& className);

// Sends a mouse event straight to the view's viewport (QTest cannot move with a button held).
void krSceneMouse(QGraphicsView* view, QEvent::Type type, const QPoint& pos,
                  Qt::MouseButton button = Qt::LeftButton,
                  Qt::KeyboardModifiers modifiers = Qt::NoModifier);
