#pragma once

#include "krbase.h"

#include <QVariant>

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

private:
    QString m_path = QStringLiteral("/");
    bool m_hidden = false;
    bool m_advanced = false;
    bool m_readOnly = false;
};
