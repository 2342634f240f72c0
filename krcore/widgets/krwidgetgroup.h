#pragma once

#include "krcore_global.h"

#include <QVBoxLayout>
#include <QWidget>
#include <memory>

class KrWidgetGroup;

// A vertical list of widgets and groups, top to bottom.
class KRCORE_EXPORT KrWidgetListLayout : public QVBoxLayout
{
    Q_OBJECT
public:
    explicit KrWidgetListLayout(QWidget* parent = nullptr);
    ~KrWidgetListLayout() override;

    void addGroup(KrWidgetGroup* group);     // at the end; nothing when already in this list
    QList<KrWidgetGroup*> getGroups() const; // in list order
};

// A collapsible section: a title bar (with an arrow; a click or Space toggles) above a body
// that holds widgets and sub-groups. Indented by 8 pixels per level.
class KRCORE_EXPORT KrWidgetGroup : public QWidget
{
    Q_OBJECT
public:
    // Puts the group at the end of layout (a child of the layout's widget).
    KrWidgetGroup(KrWidgetListLayout* layout, const QString& title, const QString& objectName,
                  int level = 0);
    // Puts the group at the end of parentGroup's body.
    KrWidgetGroup(KrWidgetGroup* parentGroup, const QString& title, const QString& objectName,
                  int level = 1);
    ~KrWidgetGroup() override;

    static constexpr int IndentPerLevel = 8;

public slots:
    void addGroup(KrWidgetGroup* group); // at the end of the body; nothing when already there
    void addWidget(QWidget* widget);     // at the end of the body (re-parented)
    void removeWidget(QWidget* widget);  // out of the body; not deleted
    // Deletes every widget and sub-group in the body.
    void removeAllChildren();
    QList<QWidget*> getChildren() const; // body items in order

    QWidget* getBar() const;
    QWidget* getBody() const;
    QString getTitle() const;
    void setTitle(const QString& title);
    int getLevel() const;
    void setLevel(int level);
    bool isCollapsed() const;
    void setCollapsed(bool collapsed); // emits collapsedChanged() when it changes
    void toggleCollapsed();

signals:
    void collapsedChanged(bool collapsed);

private:
    void init(const QString& title, const QString& objectName, int level);
    void relayout();
    struct Private;
    std::unique_ptr<Private> d;
};
