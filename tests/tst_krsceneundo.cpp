#include "app_testsupport.h"
#include "krapp.h"
#include "krbrickframe.h"
#include "krbrickgraphicsitem.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickuserscene.h"
#include "krconnectoritem.h"
#include "krsettings.h"
#include "krundo.h"
#include "scene_testutil.h"

#include <QRandomGenerator>
#include <QtTest>
#include <functional>
#include <memory>

// A seeded sequence of edits made through the scene's own operations; undoing all of them
// must give back the network as it was, and redoing all of them the network as it became.
class TestKrSceneUndo : public QObject
{
    Q_OBJECT

private slots:
    void initTestCase();
    void randomEdits_data();
    void randomEdits();

private:
    std::unique_ptr<KrAppTestScope> m_scope;
};

namespace {
KrUndoStack* undoStack()
{
    return krApp->getUndoStack();
}

KrShaderBrick* newLibraryBrick(quint32 which)
{
    switch (which % 6) {
    case 0:
        return new KrMultiplyBrick;
    case 1:
        return new KrAddBrick;
    case 2:
        return new KrMixBrick;
    case 3:
        return new KrInvertBrick;
    case 4:
        return new KrFloatConstantBrick;
    default:
        return new KrClampBrick;
    }
}

class Editor
{
public:
    Editor(KrSceneHarness& harness, quint32 seed) : h(harness), rng(seed) {}

    // One random edit; answers its name, empty when it changed nothing.
    QString step()
    {
        switch (rng.bounded(10)) {
        case 0:
        case 1:
            return add();
        case 2:
            return remove();
        case 3:
        case 4:
            return connect();
        case 5:
            return disconnect();
        case 6:
            return group();
        case 7:
            return move();
        case 8:
            return retitle();
        default:
            return rng.bounded(3) == 0 ? layout() : connect();
        }
    }

    QList<KrBrickGraphicsItem*> items() const { return h.scene->getItemsById().values(); }

    KrBrickGraphicsItem* anyItem()
    {
        const QList<KrBrickGraphicsItem*> all = items();
        return all.isEmpty() ? nullptr : all.at(int(rng.bounded(quint32(all.size()))));
    }

    QList<KrConnectorItem*> plugs(bool outputs) const
    {
        QList<KrConnectorItem*> found;
        for (KrBrickGraphicsItem* item : items()) {
            for (KrConnectorItem* plug : item->getConnectors()) {
                if (plug->isOutput() == outputs)
                    found << plug;
            }
        }
        return found;
    }

    QString add()
    {
        KrShaderBrick* brick = newLibraryBrick(rng.generate());
        brick->ref();
        const QPointF at(rng.bounded(900) - 20, rng.bounded(700) - 20);
        const bool added = h.scene->addBrickAt(brick, at) != nullptr;
        brick->unref();
        return added ? QStringLiteral("add") : QString();
    }

    QString remove()
    {
        KrBrickGraphicsItem* item = anyItem();
        if (!item || items().size() < 3)
            return QString();
        h.scene->clearSelection();
        item->setSelected(true);
        if (rng.bounded(2))
            anyItem()->setSelected(true);
        QMetaObject::invokeMethod(h.scene, "deleteSelected");
        return QStringLiteral("delete");
    }

    QString connect()
    {
        const QList<KrConnectorItem*> outs = plugs(true);
        QList<KrConnectorItem*> ins = plugs(false);
        // Half the time onto an input that has a source already: the source is replaced.
        QList<KrConnectorItem*> fed;
        for (KrConnectorItem* plug : qAsConst(ins)) {
            if (plug->getParam()->getSource())
                fed << plug;
        }
        if (!fed.isEmpty() && rng.bounded(2))
            ins = fed;
        if (outs.isEmpty() || ins.isEmpty())
            return QString();
        for (int attempt = 0; attempt < 8; ++attempt) {
            KrBrickParam* out = outs.at(int(rng.bounded(quint32(outs.size()))))->getParam();
            KrBrickParam* in = ins.at(int(rng.bounded(quint32(ins.size()))))->getParam();
            if (h.scene->connectParameters(rng.bounded(2) ? out : in, rng.bounded(2) ? in : out))
                return QStringLiteral("connect");
        }
        return QString();
    }

    QString disconnect()
    {
        QList<KrConnectorItem*> wired;
        for (KrConnectorItem* plug : plugs(rng.bounded(2) == 0)) {
            if (plug->getParam()->getNumConnections() > 0)
                wired << plug;
        }
        if (wired.isEmpty())
            return QString();
        wired.at(int(rng.bounded(quint32(wired.size()))))->disconnectParam();
        return QStringLiteral("disconnect");
    }

    QString group()
    {
        QList<KrBrickGraphicsItem*> functions;
        for (KrBrickGraphicsItem* item : items()) {
            if (item->getBrick()->type() == 0)
                functions << item;
        }
        if (functions.size() < 3)
            return QString();
        h.scene->clearSelection();
        const int count = 2 + int(rng.bounded(2));
        for (int i = 0; i < count; ++i)
            functions.at(int(rng.bounded(quint32(functions.size()))))->setSelected(true);
        h.scene->setLastMenuPos(QPointF(rng.bounded(800), rng.bounded(600)));
        QMetaObject::invokeMethod(h.scene, "toGroup");
        return QStringLiteral("group");
    }

    QString move()
    {
        KrBrickGraphicsItem* item = anyItem();
        if (!item)
            return QString();
        h.scene->clearSelection();
        item->setSelected(true);
        if (rng.bounded(2))
            anyItem()->setSelected(true);
        // The gesture of a title bar drag: the other selected bricks follow.
        KrBrickFrame* frame = item->getFrame();
        emit frame->moveStarted();
        for (int i = 0; i < 3; ++i)
            item->setPos(item->pos() + QPointF(rng.bounded(120) - 60, rng.bounded(120) - 60));
        emit frame->moveFinished();
        return QStringLiteral("move");
    }

    QString retitle()
    {
        KrBrickGraphicsItem* item = anyItem();
        if (!item)
            return QString();
        item->getFrame()->setBrickTitle(QStringLiteral("Title %1").arg(rng.bounded(1000)));
        return QStringLiteral("title");
    }

    QString layout()
    {
        switch (rng.bounded(3)) {
        case 0:
            h.scene->autoArrange();
            return QStringLiteral("arrange");
        case 1:
            h.scene->flipBricksAboutCenter();
            return QStringLiteral("flip");
        default:
            if (KrBrickGraphicsItem* item = anyItem()) {
                h.scene->clearSelection();
                item->setSelected(true);
            }
            QMetaObject::invokeMethod(h.scene, "toBack");
            return QStringLiteral("to back");
        }
    }

private:
    KrSceneHarness& h;
    QRandomGenerator rng;
};
} // namespace

void TestKrSceneUndo::initTestCase()
{
    m_scope.reset(new KrAppTestScope);
}

void TestKrSceneUndo::randomEdits_data()
{
    QTest::addColumn<quint32>("seed");
    QTest::addColumn<int>("edits");
    for (quint32 seed : {1u, 7u, 42u, 1234u, 9001u, 31337u})
        QTest::addRow("seed %u", seed) << seed << 45;
}

void TestKrSceneUndo::randomEdits()
{
    QFETCH(quint32, seed);
    QFETCH(int, edits);
    auto* material = new KrBrickMaterial;
    KrSceneHarness h(material);
    // A small network to start from, made through the model: not an edit of the scene.
    QList<KrShaderBrick*> start;
    for (quint32 i = 0; i < 4; ++i) {
        KrShaderBrick* brick = newLibraryBrick(i + seed);
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosX"), 100 + 250 * i);
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosY"), 400);
        QVERIFY(material->insertBrick(brick));
        start << brick;
    }
    KrShaderBrick* root = material->getBrickSet(0)->getRoot();
    QVERIFY(root);
    QVERIFY(root->addConnection(0, start[0], start[0]->getNumParameters() - 1));
    krSceneSettle();
    undoStack()->clear();
    const QString before = krSceneRecord(material, false);

    Editor editor(h, seed);
    QStringList done;
    for (int i = 0; i < edits; ++i) {
        const QString name = editor.step();
        krSceneSettle();
        if (!name.isEmpty())
            done << name;
    }
    QVERIFY2(undoStack()->count() >= edits / 2, qPrintable(done.join(QLatin1Char(','))));
    const QString after = krSceneRecord(material);

    int undone = 0;
    while (undoStack()->canUndo()) {
        undoStack()->undo();
        krSceneSettle();
        ++undone;
    }
    QCOMPARE(undone, undoStack()->count());
    QCOMPARE(krSceneRecord(material, false), before);
    // Every brick of the network has its item again, and only those.
    QCOMPARE(h.scene->getItemsById().keys(), material->getBricks().keys());

    while (undoStack()->canRedo()) {
        undoStack()->redo();
        krSceneSettle();
    }
    QCOMPARE(krSceneRecord(material), after);
    QCOMPARE(h.scene->getItemsById().keys(), material->getBricks().keys());
}

QTEST_MAIN(TestKrSceneUndo)
#include "tst_krsceneundo.moc"
