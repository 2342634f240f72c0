// Times the brick scene on networks of growing size: opening, painting, moving a brick,
// arranging, deleting everything and undoing it, and the peak memory.
//
//   bench_scene [--open-only] [sizes...]      (default: 100 1000 5000)
//
// Runs off screen when no display is set.

#include "krapp.h"
#include "krbrickgraphicsitem.h"
#include "krbricklibrary.h"
#include "krbrickmaterial.h"
#include "krbrickset.h"
#include "krbrickuser.h"
#include "krbrickuserscene.h"
#include "krconnectoritem.h"
#include "krsettings.h"
#include "krundo.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QFile>
#include <QGraphicsView>
#include <QImage>
#include <QPainter>
#include <QRandomGenerator>
#include <QTextStream>
#include <cstdio>

namespace {

const int kHubWires = 20;

double elapsedMs(const QElapsedTimer& clock)
{
    return clock.nsecsElapsed() / 1e6;
}

// Posted work (plug rebuilds, layouts, deferred deletion) until none is left.
void settle()
{
    for (int round = 0; round < 4; ++round) {
        QCoreApplication::sendPostedEvents();
        QCoreApplication::sendPostedEvents(nullptr, QEvent::DeferredDelete);
        QCoreApplication::processEvents();
    }
}

long peakMemoryKb()
{
    QFile status(QStringLiteral("/proc/self/status"));
    if (!status.open(QIODevice::ReadOnly | QIODevice::Text))
        return -1;
    const QList<QByteArray> lines = status.readAll().split('\n');
    for (const QByteArray& line : lines) {
        if (line.startsWith("VmHWM:"))
            return line.mid(6).trimmed().split(' ').value(0).toLong();
    }
    return -1;
}

KrShaderBrick* makeFunctionBrick(quint32 which)
{
    switch (which % 5) {
    case 0:
        return new KrMultiplyBrick;
    case 1:
        return new KrMixBrick;
    case 2:
        return new KrClampBrick;
    case 3:
        return new KrAddBrick;
    default:
        return new KrSmoothstepBrick;
    }
}

QList<KrBrickParam*> freeInputs(KrShaderBrick* brick)
{
    QList<KrBrickParam*> inputs;
    for (int i = 0; i < brick->getNumParameters(); ++i) {
        KrBrickParam* p = brick->getParameter(i);
        if (p->getDirection() == KrBrickParam::Input && !p->getSource() &&
            p->getType() == QLatin1String("float"))
            inputs << p;
    }
    return inputs;
}

KrBrickParam* outputOf(KrShaderBrick* brick)
{
    for (int i = 0; i < brick->getNumParameters(); ++i) {
        if (brick->getParameter(i)->getDirection() == KrBrickParam::Output)
            return brick->getParameter(i);
    }
    return nullptr;
}

struct Network
{
    KrBrickShaderSet* user = nullptr;
    KrShaderBrick* hub = nullptr;
    int wires = 0;
};

// A surface root fed by a tree of function bricks (each brick feeds one of lower index), half
// again as many wires between random pairs (always from higher to lower index: no cycles),
// and one constant feeding kHubWires inputs. Laid out on a grid, as a saved network would be.
Network buildNetwork(int count, quint32 seed)
{
    QRandomGenerator rng(seed);
    Network net;
    net.user = new KrBrickShaderSet;
    // The brick user's list of exposed properties is rebuilt on every brick filed; building
    // does without it (it is brought up to date by the first brick the scene files or takes).
    KrBrickContainer* container = net.user->getBrickContainer();
    const bool blocked = container->blockSignals(true);
    QList<KrShaderBrick*> bricks;
    auto place = [&](KrShaderBrick* brick, int i) {
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosX"), 20 + (i / 25) * 320);
        brick->getBrickSettings()->setFloatValue(QStringLiteral("PosY"), 20 + (i % 25) * 260);
        net.user->insertBrick(brick);
        bricks << brick;
    };
    place(new KrSurfaceBrick, 0);
    for (int i = 1; i < count - 1; ++i)
        place(makeFunctionBrick(rng.generate()), i);
    net.hub = new KrFloatConstantBrick;
    place(net.hub, count - 1);

    auto wire = [&](KrShaderBrick* feeder, KrShaderBrick* consumer) {
        QList<KrBrickParam*> inputs = freeInputs(consumer);
        KrBrickParam* out = outputOf(feeder);
        if (inputs.isEmpty() || !out)
            return false;
        if (!inputs.at(int(rng.bounded(quint32(inputs.size()))))->addConnection(out))
            return false;
        ++net.wires;
        return true;
    };
    // The tree: every function brick feeds a brick of lower index with an input free.
    for (int i = 1; i < count - 1; ++i) {
        for (int attempt = 0; attempt < 8; ++attempt) {
            const int to = attempt < 7 ? int(rng.bounded(quint32(i))) : 0;
            if (wire(bricks[i], bricks[to]))
                break;
        }
    }
    // The hub's wires, into the first bricks with a free input.
    int hubWires = 0;
    for (int i = 1; i < count - 1 && hubWires < kHubWires; ++i)
        hubWires += wire(net.hub, bricks[i]) ? 1 : 0;
    // Cross wires up to about 1.5 per brick.
    const int target = count * 3 / 2;
    for (int attempt = 0; attempt < count * 10 && net.wires < target; ++attempt) {
        const int a = 1 + int(rng.bounded(quint32(count - 2)));
        const int b = 1 + int(rng.bounded(quint32(count - 2)));
        if (a != b)
            wire(bricks[qMax(a, b)], bricks[qMin(a, b)]);
    }
    container->blockSignals(blocked);
    return net;
}

void renderView(QGraphicsView* view, QImage& image)
{
    QPainter painter(&image);
    view->render(&painter, QRectF(image.rect()), view->viewport()->rect());
}

// The brick user alone (no scene): every brick taken out and filed again in one batch, as a
// delete of everything and its undo do underneath.
QPair<double, double> modelRoundTrip(IKrBrickUser* user)
{
    const QList<KrShaderBrick*> bricks = user->getBricks().values();
    KrBrickContainer* container = user->getBrickContainer();
    QList<uint> ids;
    for (KrShaderBrick* brick : bricks) {
        brick->ref();
        ids << brick->getBrickID();
    }
    QElapsedTimer clock;
    clock.start();
    container->beginBatch();
    for (KrShaderBrick* brick : bricks)
        user->takeBrick(brick);
    container->endBatch();
    const double takeMs = elapsedMs(clock);
    clock.restart();
    container->beginBatch();
    for (int i = 0; i < bricks.size(); ++i)
        container->insertBrick(bricks[i], ids[i]);
    container->endBatch();
    const double fileMs = elapsedMs(clock);
    for (KrShaderBrick* brick : bricks)
        brick->unref();
    return qMakePair(takeMs, fileMs);
}

void runSize(int count, bool openOnly, QTextStream& out)
{
    QElapsedTimer clock;
    clock.start();
    Network net = buildNetwork(count, quint32(count));
    const double buildMs = elapsedMs(clock);

    QGraphicsView view;
    view.resize(1600, 1000);
    view.setRenderHint(QPainter::Antialiasing);
    view.show();

    clock.restart();
    auto* scene = new KrBrickUserScene(net.user, &view, nullptr);
    view.setScene(scene);
    scene->updateBricks();
    const double itemsMs = elapsedMs(clock);
    settle();
    const double openMs = elapsedMs(clock);
    int plugs = 0;
    int wiresShown = 0;
    for (KrBrickGraphicsItem* item : scene->getItemsById()) {
        for (KrConnectorItem* plug : item->getConnectors()) {
            ++plugs;
            if (plug->getWire() && plug->getWire()->isVisible())
                ++wiresShown;
        }
    }

    if (openOnly) {
        out << QStringLiteral("%1 bricks: open: items %2 ms, all in place %3 ms\n")
                   .arg(count)
                   .arg(itemsMs, 0, 'f', 1)
                   .arg(openMs, 0, 'f', 1);
        out.flush();
        view.setScene(nullptr);
        delete scene;
        settle();
        net.user->release();
        settle();
        return;
    }

    QImage image(1600, 1000, QImage::Format_ARGB32_Premultiplied);
    image.fill(Qt::white);
    view.fitInView(scene->itemsBoundingRect(), Qt::KeepAspectRatio);
    clock.restart();
    renderView(&view, image);
    const double paintAllMs = elapsedMs(clock);

    view.resetTransform();
    KrBrickGraphicsItem* hubItem = scene->findBrick(net.hub->getBrickID());
    view.centerOn(hubItem);
    clock.restart();
    renderView(&view, image);
    const double paint100Ms = elapsedMs(clock);

    // A drag of the brick with 20 wires: 100 steps, one undo step.
    const int moves = 100;
    clock.restart();
    scene->beginBrickMove(hubItem, true);
    for (int i = 0; i < moves; ++i)
        hubItem->setPos(hubItem->pos() + QPointF(3, 1));
    scene->endBrickMove();
    settle();
    const double moveMs = elapsedMs(clock) / moves;

    clock.restart();
    scene->autoArrange();
    settle();
    const double arrangeMs = elapsedMs(clock);

    clock.restart();
    for (KrBrickGraphicsItem* item : scene->getItemsById())
        item->setSelected(true);
    QMetaObject::invokeMethod(scene, "deleteSelected");
    const double deleteCallMs = elapsedMs(clock);
    settle();
    const double deleteMs = elapsedMs(clock);
    const int left = scene->getItemsById().size();
    clock.restart();
    krApp->getUndoStack()->undo();
    const double undoCallMs = elapsedMs(clock);
    settle();
    const double undoMs = elapsedMs(clock);
    const int back = scene->getItemsById().size();

    view.setScene(nullptr);
    delete scene;
    krApp->getUndoStack()->clear();
    settle();
    const QPair<double, double> model = modelRoundTrip(net.user);

    out << QStringLiteral("%1 bricks, %2 wires (%3 plugs, %4 wires shown)\n")
               .arg(count)
               .arg(net.wires)
               .arg(plugs)
               .arg(wiresShown);
    out << QStringLiteral("  build model        %1 ms\n").arg(buildMs, 0, 'f', 1);
    out << QStringLiteral("  open: items        %1 ms\n").arg(itemsMs, 0, 'f', 1);
    out << QStringLiteral("  open: all in place %1 ms\n").arg(openMs, 0, 'f', 1);
    out << QStringLiteral("  paint, all in view %1 ms\n").arg(paintAllMs, 0, 'f', 1);
    out << QStringLiteral("  paint, 100 %       %1 ms\n").arg(paint100Ms, 0, 'f', 1);
    out << QStringLiteral("  move (20 wires)    %1 ms per step\n").arg(moveMs, 0, 'f', 3);
    out << QStringLiteral("  auto-arrange       %1 ms\n").arg(arrangeMs, 0, 'f', 1);
    out << QStringLiteral("  delete all         %1 ms (%2 left)\n")
               .arg(deleteMs, 0, 'f', 1)
               .arg(left);
    out << QStringLiteral("    scene's step     %1 ms\n").arg(deleteCallMs, 0, 'f', 1);
    out << QStringLiteral("    brick user alone %1 ms\n").arg(model.first, 0, 'f', 1);
    out << QStringLiteral("  undo delete        %1 ms (%2 back)\n")
               .arg(undoMs, 0, 'f', 1)
               .arg(back);
    out << QStringLiteral("    scene's step     %1 ms\n").arg(undoCallMs, 0, 'f', 1);
    out << QStringLiteral("    brick user alone %1 ms\n").arg(model.second, 0, 'f', 1);
    out << QStringLiteral("  peak memory        %1 MB\n").arg(peakMemoryKb() / 1024.0, 0, 'f', 1);
    out.flush();

    net.user->release();
    settle();
}

} // namespace

// The off-screen platform reports what it cannot do for every embedded widget.
void quietHandler(QtMsgType, const QMessageLogContext&, const QString& message)
{
    if (!message.contains(QLatin1String("does not support")))
        fprintf(stderr, "%s\n", qPrintable(message));
}

int main(int argc, char** argv)
{
    if (qEnvironmentVariableIsEmpty("DISPLAY") && qEnvironmentVariableIsEmpty("QT_QPA_PLATFORM"))
        qputenv("QT_QPA_PLATFORM", "offscreen");
    qInstallMessageHandler(quietHandler);
    QApplication app(argc, argv);
    QList<int> sizes;
    bool openOnly = false;
    for (int i = 1; i < argc; ++i) {
        if (QByteArray(argv[i]) == "--open-only") {
            openOnly = true;
            continue;
        }
        bool ok = false;
        const int n = QString::fromLocal8Bit(argv[i]).toInt(&ok);
        if (ok && n >= 25)
            sizes << n;
    }
    if (sizes.isEmpty())
        sizes = {100, 1000, 5000};
    QTextStream out(stdout);
    for (int n : sizes)
        runSize(n, openOnly, out);
    return 0;
}
