#include "scene_testutil.h"

#include "krapp.h"
#include "krbrickfactory.h"
#include "krbrickgraphicsitem.h"
#include "krbrickuserscene.h"
#include "krconnectoritem.h"
#include "krsettings.h"
#include "krundo.h"

#include <QApplication>
#include <QGraphicsEllipseItem>
#include <QMimeData>
#include <QMouseEvent>
#include <QStandardItemModel>

KrSceneTestBrick::KrSceneTestBrick(const QString& name, int type)
    : KrShaderBrick(name), m_type(type)
{
}

KrBrickParam* KrSceneTestBrick::addInput(const QString& arg, const QString& type, bool advanced)
{
    auto* param = new KrBrickParam(this, arg, arg, KrBrickParam::Input, type);
    param->setIsAdvanced(advanced);
    addParameter(param);
    return param;
}

KrBrickParam* KrSceneTestBrick::addOutput(const QString& arg, const QString& type)
{
    auto* param = new KrBrickParam(this, arg, arg, KrBrickParam::Output, type);
    addParameter(param);
    return param;
}

KrSceneTestUser::KrSceneTestUser(int brickSets) : KrBrickUserElement(QStringLiteral("Test User"))
{
    for (int i = 0; i < brickSets; ++i)
        addBrickSet(KrBrickSet::Function, QStringLiteral("Set %1").arg(i), true);
}

KrSceneHarness::KrSceneHarness(IKrBrickUser* brickUser, QSize viewSize)
{
    krApp->getUndoStack()->clear();
    user = brickUser ? brickUser : new KrSceneTestUser;
    view = new QGraphicsView;
    view->resize(viewSize);
    view->setDragMode(QGraphicsView::RubberBandDrag);
    scene = new KrBrickUserScene(user, view, nullptr);
    view->setScene(scene);
    view->show();
    krSceneSettle();
}

KrSceneHarness::~KrSceneHarness()
{
    closeScene();
    delete view;
    krSceneSettle();
    krApp->getUndoStack()->clear();
    if (user)
        user->release();
    krSceneSettle();
}

void KrSceneHarness::closeScene()
{
    if (!scene)
        return;
    view->setScene(nullptr);
    delete scene;
    scene = nullptr;
    krSceneSettle();
}

KrBrickGraphicsItem* KrSceneHarness::add(KrShaderBrick* brick, const QPointF& pos)
{
    KrBrickGraphicsItem* item = scene->addBrickAt(brick, pos);
    krSceneSettle();
    return item;
}

KrConnectorItem* KrSceneHarness::plug(KrShaderBrick* brick, const QString& arg) const
{
    KrBrickGraphicsItem* item = scene ? scene->findBrick(brick->getBrickID()) : nullptr;
    KrBrickParam* param = brick->findParameterByArg(arg);
    return item && param ? item->getConnector(brick->findParameterIndex(param)) : nullptr;
}

QPoint KrSceneHarness::viewPointOf(KrConnectorItem* plug) const
{
    QGraphicsEllipseItem* circle = plug->getPlugCircle();
    return view->mapFromScene(circle->mapToScene(circle->rect().center()));
}

void krSceneSettle()
{
    for (int round = 0; round < 20; ++round) {
        QCoreApplication::sendPostedEvents();
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        QCoreApplication::processEvents();
    }
}

QString krSceneRecord(IKrBrickUser* user, bool withNextId)
{
    auto* element = dynamic_cast<KrElement*>(user);
    if (!element)
        return QString();
    KrSettings record;
    element->getAttributes(&record);
    if (!withNextId)
        record.removeValue(QStringLiteral("NextBrickID"));
    return record.toString();
}

QMimeData* krSceneFactoryMime(const QString& className)
{
    QStandardItemModel model;
    auto* item = new QStandardItem(className);
    item->setData(QVariant::fromValue(KrBrickFactory(krApp->findClassFactory(className))),
                  Qt::UserRole);
    model.appendRow(item);
    return model.mimeData({model.index(0, 0)});
}

void krSceneMouse(QGraphicsView* view, QEvent::Type type, const QPoint& pos, Qt::MouseButton button,
                  Qt::KeyboardModifiers modifiers)
{
    QWidget* viewport = view->viewport();
    const Qt::MouseButtons held = type == QEvent::MouseButtonRelease ? Qt::NoButton : button;
    QMouseEvent event(type, pos, viewport->mapToGlobal(pos),
                      type == QEvent::MouseMove ? Qt::NoButton : button, held, modifiers);
    QApplication::sendEvent(viewport, &event);
}
