#pragma once

#include "krcore_global.h"
#include "krpane.h"

#include <memory>

class KrNode;
class KrScene;
class QTreeWidget;
class QTreeWidgetItem;

// The "Scene" pane: one row per node of a scene with its kind and the name of its material
// or light network. Selecting rows selects the nodes, and the other way round.
class KRCORE_EXPORT KrScenePane : public KrPane
{
    Q_OBJECT
public:
    explicit KrScenePane(KrScene* scene = nullptr, QWidget* parent = nullptr);
    ~KrScenePane() override;

    KrScene* getScene() const;
    void setScene(KrScene* scene);
    QTreeWidget* getTree() const;
    // The row of node, or null.
    QTreeWidgetItem* findItem(const KrNode* node) const;
    KrNode* getNode(const QTreeWidgetItem* item) const;

private:
    void rebuild();
    void addRow(KrNode* node);
    void removeRow(KrNode* node);
    void updateRow(KrNode* node);
    void treeSelectionChanged();
    void sceneSelectionChanged();

    struct Private;
    std::unique_ptr<Private> d;
};
