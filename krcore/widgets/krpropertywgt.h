#pragma once

#include "krcore_global.h"

#include <QVariant>
#include <QWidget>
#include <memory>

class KrProperty;
class QHBoxLayout;
class QLabel;

// Base of the widgets that show and edit properties. A widget may edit several properties at
// once (the first one's value is shown; an edit goes to all of them as one undo step). It
// follows the properties' value, name and state; a deleted property simply drops out.
class KRCORE_EXPORT KrPropertyWgt : public QWidget
{
    Q_OBJECT
public:
    explicit KrPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrPropertyWgt() override;

public slots:
    virtual void addProperty(KrProperty* property);
    int getNumProperties() const;
    KrProperty* getFirstProperty() const;
    KrProperty* getProperty(int i) const; // null when out of range
    virtual void setSelected(bool selected);
    // Whether the widget shows the value next to the name (label-only widgets answer false).
    virtual bool showsValue() const;
    virtual void setLevel(int level);
    bool isSelected() const;
    int getLevel() const;

protected:
    // Property notifications, for subclasses to reflect.
    virtual void propertyValueChanged();
    virtual void propertyStateChanged();
    virtual void propertyNameChanged();
    virtual void propertyConstraintsChanged();
    virtual void propertiesChanged(); // added or deleted

    // Sets value on every property as one undo step ("Change <name>").
    void applyValue(const QVariant& value);
    // Live edits without undo, then one step from the values at beginLiveEdit().
    void beginLiveEdit();
    void applyLiveValue(const QVariant& value);
    void endLiveEdit();
    bool isLiveEditing() const;
    // True while the widget itself writes to its properties or to its editors.
    bool isUpdating() const;
    void setUpdating(bool updating);
    bool isEditable() const; // has properties, none read-only

private:
    struct Private;
    std::unique_ptr<Private> d;
};

// A row with the property's name on the left and an editor area on the right. By itself it
// shows the value as read-only text; subclasses put their editors in the area.
class KRCORE_EXPORT KrBasicPropertyWgt : public KrPropertyWgt
{
    Q_OBJECT
public:
    explicit KrBasicPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrBasicPropertyWgt() override;

public slots:
    void setSelected(bool selected) override;
    void setLevel(int level) override;

protected:
    QLabel* nameLabel() const;
    QWidget* editorArea() const;
    QHBoxLayout* editorLayout() const;
    // Sets the editors from the first property's value; called with isUpdating() set.
    virtual void updateEditor();
    // Enables the editors as isEditable() says.
    virtual void updateEditorState();

    void propertyValueChanged() override;
    void propertyStateChanged() override;
    void propertyNameChanged() override;
    void propertyConstraintsChanged() override;
    void propertiesChanged() override;
    void changeEvent(QEvent* event) override;
    void resizeEvent(QResizeEvent* event) override;

private:
    void refresh();
    void updateNameColumn();
    struct Private;
    std::unique_ptr<Private> d;
};
