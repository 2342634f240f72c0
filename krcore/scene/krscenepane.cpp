#include "krscenepane.h"

#include "krscene.h"

#include <QHash>
#include <QHeaderView>
#include <QPointer>
#include <QTreeWidget>
#include <QVBoxLayout>

struct KrScenePane::Private
{
    QPointer<KrScene> scene;
    QTreeWidget* tree = nullptr;
    QHash<const KrNode*, QTreeWidgetItem*> rows;
    QList<QMetaObject::Connection> connections;
    // Set while one side's selection is copied to the other, so the echo is ignored.
    bool syncing = false;
};

KrScenePane::KrScenePane(KrScene* scene, QWidget* parent)
    : KrPane(QStringLiteral("Scene"), parent), d(new Private)
{
    auto* layout = new QVBoxLayout(this);
    layout->setContentsMargins(0, 0, 0, 0);
    d->tree = new QTreeWidget(this);
    d->tree->setObjectName(QStringLiteral("SceneTree"));
    d->tree->setColumnCount(3);
    d->tree->setHeaderLabels(
        {QStringLiteral("Name"), QStringLiteral("Kind"), QStringLiteral("Material")});
    d->tree->setRootIsDecorated(false);
    d->tree->setUniformRowHeights(true);
    d->tree->setSelectionMode(QAbstractItemView::ExtendedSelection);
    d->tree->header()->setStretchLastSection(true);
    layout->addWidget(d->tree);
    connect(d->tree, &QTreeWidget::itemSelectionChanged, this, &KrScenePane::treeSelectionChanged);
    setScene(scene);
}

KrScenePane::~KrScenePane()
{
    for (const QMetaObject::Connection& c : qAsConst(d->connections))
        disconnect(c);
}

KrScene* KrScenePane::getScene() const
{
    return d->scene;
}

QTreeWidget* KrScenePane::getTree() const
{
    return d->tree;
}

void KrScenePane::setScene(KrScene* scene)
{
    for (const QMetaObject::Connection& c : qAsConst(d->connections))
        disconnect(c);
    d->connections.clear();
    d->scene = scene;
    if (scene) {
        d->connections << connect(scene, &KrScene::nodeAdded, this, &KrScenePane::addRow)
                       << connect(scene, &KrScene::nodeAboutToBeRemoved, this,
                                  &KrScenePane::removeRow)
                       << connect(scene, &KrScene::nodeChanged, this, &KrScenePane::updateRow)
                       << connect(scene, &KrScene::selectionChanged, this,
                                  &KrScenePane::sceneSelectionChanged)
                       << connect(scene, &QObject::destroyed, this, [this]() {
                              // Rows must not outlive the nodes they point at.
                              d->syncing = true;
                              d->rows.clear();
                              d->tree->clear();
                              d->syncing = false;
                          });
    }
    rebuild();
}

QTreeWidgetItem* KrScenePane::findItem(const KrNode* node) const
{
    return d->rows.value(node, nullptr);
}

KrNode* KrScenePane::getNode(const QTreeWidgetItem* item) const
{
    for (auto it = d->rows.cbegin(); it != d->rows.cend(); ++it) {
        if (it.value() == item)
            return const_cast<KrNode*>(it.key());
    }
    return nullptr;
}

void KrScenePane::rebuild()
{
    d->syncing = true;
    d->rows.clear();
    d->tree->clear();
    d->syncing = false;
    if (!d->scene)
        return;
    const QList<KrNode*> nodes = d->scene->getNodes();
    for (KrNode* node : nodes)
        addRow(node);
    sceneSelectionChanged();
    for (int column = 0; column < 2; ++column)
        d->tree->resizeColumnToContents(column);
}

void KrScenePane::addRow(KrNode* node)
{
    if (!node || d->rows.contains(node))
        return;
    auto* item = new QTreeWidgetItem(d->tree);
    d->rows.insert(node, item);
    updateRow(node);
    if (node->isSelected())
        sceneSelectionChanged();
}

void KrScenePane::removeRow(KrNode* node)
{
    QTreeWidgetItem* item = d->rows.take(node);
    d->syncing = true;
    delete item;
    d->syncing = false;
}

void KrScenePane::updateRow(KrNode* node)
{
    QTreeWidgetItem* item = d->rows.value(node, nullptr);
    if (!item)
        return;
    item->setText(0, node->getName());
    item->setText(1, node->getKindLabel());
    item->setText(2, node->getShaderName());
    item->setToolTip(0, node->getName());
}

void KrScenePane::treeSelectionChanged()
{
    if (d->syncing || !d->scene)
        return;
    QList<KrNode*> nodes;
    const QList<QTreeWidgetItem*> items = d->tree->selectedItems();
    for (QTreeWidgetItem* item : items) {
        if (KrNode* node = getNode(item))
            nodes.append(node);
    }
    d->syncing = true;
    d->scene->setSelection(nodes);
    d->syncing = false;
}

void KrScenePane::sceneSelectionChanged()
{
    if (d->syncing || !d->scene)
        return;
    d->syncing = true;
    for (auto it = d->rows.cbegin(); it != d->rows.cend(); ++it)
        it.value()->setSelected(it.key()->isSelected());
    d->syncing = false;
}
