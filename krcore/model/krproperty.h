#pragma once

#include "krbase.h"

#include <QVariant>

#include <QColor>
#include <QStringList>

class KrElement;
class KrSettings;

// One editable value of an element. Kinds (int, float, bool, string, color, enum) derive from
// it; each names the property widget class that edits it (a class factory of that name).
// getPath() is the group path under which views list it ("/Diffuse/Color", "/" for the top).
class KRCORE_EXPORT KrProperty : public KrBase
{
    Q_OBJECT
public:
    explicit KrProperty(const QString& name, QObject* parent = nullptr);
    ~KrProperty() override;

    virtual QString getTypeLabel() const = 0; // short type text: "int", "float", "color" ...
    virtual QString getWidgetClassName() const = 0;

    // The value as a variant of the kind's type. setValue() converts and clamps as the kind
    // requires; it answers false when the value cannot be taken. It emits valueChanged() only
    // when the value changes. It records no undo step.
    virtual QVariant getValue() const = 0;
    virtual bool setValue(const QVariant& value) = 0;
    // setValue() as one undo step named text (default "Change <name>").
    bool setValueUndoable(const QVariant& value, const QString& text = QString());
    virtual QVariant getDefaultValue() const = 0;

    // Store and read back the value under key of a settings record, type kept exactly.
    virtual void writeValue(KrSettings* settings, const QString& key) const = 0;
    virtual bool readValue(const KrSettings* settings, const QString& key) = 0;

    // Records one undo step from before to the current value without changing it: for edits
    // applied live with setValue() (a slider drag) and committed at the end. No step when the
    // value equals before.
    bool pushUndoStep(const QVariant& before, const QString& text = QString());

public slots:
    QString getPath() const { return m_path; }
    void setPath(const QString& path);
    bool isHidden() const { return m_hidden; }
    void setHidden(bool hidden);
    bool isAdvanced() const { return m_advanced; }
    void setAdvanced(bool advanced) { m_advanced = advanced; }
    bool isReadOnly() const { return m_readOnly; }
    void setReadOnly(bool readOnly);

signals:
    void valueChanged();
    void pathChanged(const QString& path);
    void stateChanged(); // hidden or read-only changed
    void hiddenChanged(bool hidden);
    // Range, step, decimals or items changed: editors rebuild their limits.
    void constraintsChanged();

private:
    QString m_path = QStringLiteral("/");
    bool m_hidden = false;
    bool m_advanced = false;
    bool m_readOnly = false;
};

// An integer. Without a range set, any int is taken.
class KRCORE_EXPORT KrIntProperty : public KrProperty
{
    Q_OBJECT
public:
    explicit KrIntProperty(const QString& name, bool readOnly = false, bool hidden = false,
                           int value = 0, QObject* parent = nullptr);
    ~KrIntProperty() override;

    QString getTypeLabel() const override;
    QString getWidgetClassName() const override;
    QVariant getValue() const override;
    bool setValue(const QVariant& value) override;
    QVariant getDefaultValue() const override;
    void writeValue(KrSettings* settings, const QString& key) const override;
    bool readValue(const KrSettings* settings, const QString& key) override;

public slots:
    int getIntValue() const { return m_value; }
    bool setIntValue(int value);
    int getMinimum() const { return m_min; }
    int getMaximum() const { return m_max; }
    bool hasRange() const;
    // Swaps reversed bounds; clamps the current value into the new range.
    void setRange(int minimum, int maximum);
    int getStep() const { return m_step; }
    void setStep(int step);

private:
    int m_value;
    int m_default;
    int m_min;
    int m_max;
    int m_step = 1;
};

// A double. Values are kept exactly; decimals and step only guide editors.
class KRCORE_EXPORT KrFloatProperty : public KrProperty
{
    Q_OBJECT
public:
    explicit KrFloatProperty(const QString& name, double value = 0.0, QObject* parent = nullptr);
    ~KrFloatProperty() override;

    QString getTypeLabel() const override;
    QString getWidgetClassName() const override;
    QVariant getValue() const override;
    bool setValue(const QVariant& value) override;
    QVariant getDefaultValue() const override;
    void writeValue(KrSettings* settings, const QString& key) const override;
    bool readValue(const KrSettings* settings, const QString& key) override;

public slots:
    double getFloatValue() const { return m_value; }
    bool setFloatValue(double value);
    double getMinimum() const { return m_min; }
    double getMaximum() const { return m_max; }
    bool hasRange() const;
    void setRange(double minimum, double maximum);
    double getStep() const { return m_step; }
    void setStep(double step);
    int getDecimals() const { return m_decimals; }
    void setDecimals(int decimals);

private:
    double m_value;
    double m_default;
    double m_min;
    double m_max;
    double m_step = 0.1;
    int m_decimals = 3;
};

class KRCORE_EXPORT KrBoolProperty : public KrProperty
{
    Q_OBJECT
public:
    explicit KrBoolProperty(const QString& name, bool value = false, QObject* parent = nullptr);
    ~KrBoolProperty() override;

    QString getTypeLabel() const override;
    QString getWidgetClassName() const override;
    QVariant getValue() const override;
    bool setValue(const QVariant& value) override;
    QVariant getDefaultValue() const override;
    void writeValue(KrSettings* settings, const QString& key) const override;
    bool readValue(const KrSettings* settings, const QString& key) override;

public slots:
    bool getBoolValue() const { return m_value; }
    bool setBoolValue(bool value);

private:
    bool m_value;
    bool m_default;
};

class KRCORE_EXPORT KrStringProperty : public KrProperty
{
    Q_OBJECT
public:
    explicit KrStringProperty(const QString& name, const QString& value = QString(),
                              QObject* parent = nullptr);
    ~KrStringProperty() override;

    QString getTypeLabel() const override;
    QString getWidgetClassName() const override;
    QVariant getValue() const override;
    bool setValue(const QVariant& value) override;
    QVariant getDefaultValue() const override;
    void writeValue(KrSettings* settings, const QString& key) const override;
    bool readValue(const KrSettings* settings, const QString& key) override;

public slots:
    QString getStringValue() const { return m_value; }
    bool setStringValue(const QString& value);

private:
    QString m_value;
    QString m_default;
};

// A colour, kept as RGB (other colour models are converted). Stored in settings as a nested record
// with "Red", "Green", "Blue" and "Alpha" floats in 0..1.
class KRCORE_EXPORT KrColorProperty : public KrProperty
{
    Q_OBJECT
public:
    explicit KrColorProperty(const QString& name, const QColor& value = QColor(Qt::white),
                             QObject* parent = nullptr);
    ~KrColorProperty() override;

    QString getTypeLabel() const override;
    QString getWidgetClassName() const override;
    QVariant getValue() const override;
    bool setValue(const QVariant& value) override;
    QVariant getDefaultValue() const override;
    void writeValue(KrSettings* settings, const QString& key) const override;
    bool readValue(const KrSettings* settings, const QString& key) override;

public slots:
    QColor getColorValue() const { return m_value; }
    bool setColorValue(const QColor& value);
    // Whether editors offer the alpha channel. Off by default.
    bool hasAlpha() const { return m_alpha; }
    void setAlphaEnabled(bool enabled);

private:
    QColor m_value;
    QColor m_default;
    bool m_alpha = false;
};

// One of a list of texts; the value is the index. setValue() also takes an item text.
class KRCORE_EXPORT KrEnumProperty : public KrProperty
{
    Q_OBJECT
public:
    explicit KrEnumProperty(const QString& name, const QStringList& items = QStringList(),
                            int index = 0, QObject* parent = nullptr);
    ~KrEnumProperty() override;

    QString getTypeLabel() const override;
    QString getWidgetClassName() const override;
    QVariant getValue() const override;
    bool setValue(const QVariant& value) override;
    QVariant getDefaultValue() const override;
    void writeValue(KrSettings* settings, const QString& key) const override;
    bool readValue(const KrSettings* settings, const QString& key) override;

public slots:
    int getIndex() const { return m_index; }
    bool setIndex(int index);
    QString getCurrentText() const { return m_items.value(m_index); }
    QStringList getItems() const { return m_items; }
    // Keeps the index when it is still valid, else goes to 0 (-1 with no items).
    void setItems(const QStringList& items);

private:
    QStringList m_items;
    int m_index;
    int m_default;
};
