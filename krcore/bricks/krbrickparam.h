#pragma once

#include "krcore_global.h"

#include <QList>
#include <QObject>
#include <QString>
#include <QStringList>

class KrBrickParam;
class KrProperty;
class KrShaderBrick;

// One end of a wire as seen from the other end.
class KRCORE_EXPORT KrParamConnection
{
public:
    explicit KrParamConnection(KrBrickParam* param) : m_param(param) {}
    KrBrickParam* getParam() const { return m_param; }

private:
    KrBrickParam* m_param;
};

// A parameter of a brick: an input that takes a value (or one wire), or an output that feeds
// any number of inputs. Wires are kept at both ends. A parameter belongs to its brick.
class KRCORE_EXPORT KrBrickParam : public QObject
{
    Q_OBJECT
public:
    // 0 and 1 are inputs, 2 and 3 outputs. A constant input never takes a wire and an internal
    // output never feeds one; only inputs (1) and outputs (2) get plugs in the editor.
    enum Direction
    {
        ConstantInput = 0,
        Input = 1,
        Output = 2,
        InternalOutput = 3
    };
    Q_ENUM(Direction)

    // Tokens of the parameter's declaration, for getToken().
    enum Token
    {
        ArgToken = 0,
        TypeToken = 1,
        DefaultToken = 2
    };

    KrBrickParam(KrShaderBrick* brick, const QString& arg, const QString& label,
                 Direction direction, const QString& type, QObject* parent = nullptr);
    ~KrBrickParam() override;

    // Type names are the shading language's: "float", "color", "point", "vector", "normal",
    // "string", "int", "bool", "matrix", "closure color". Qualifiers ("uniform", "varying",
    // "output") and case do not count.
    static QString canonicalType(const QString& type);
    static QString typeLabelFor(const QString& type);
    // Whether an output of type from may feed an input of type to: equal types, a scalar (int,
    // float) into float, color, point, vector or normal, and point, vector and normal into each
    // other. Nothing else, in particular no color into float.
    static bool isTypeCompatible(const QString& from, const QString& to);
    static bool isInputDirection(int direction) { return direction == 0 || direction == 1; }
    static bool isOutputDirection(int direction) { return direction == 2 || direction == 3; }

    // For a parameter of a brick grouped inside a KrBrickGroup: the group's parameter that
    // stands for it. Null for any other parameter.
    virtual KrBrickParam* getProxiedParam() const { return nullptr; }

    // The input's source, or null (outputs: null).
    KrBrickParam* getSource() const;
    // Shader-language expression used when an input is not wired and has no value property
    // ("N", "P", "s"). Empty by default.
    QString getDefaultExpression() const { return m_defaultExpression; }
    void setDefaultExpression(const QString& expression);

    // Internal: used by KrShaderBrick when the parameter joins or leaves it.
    void setBrick(KrShaderBrick* brick) { m_brick = brick; }

public slots:
    int getDirection() const { return m_direction; }
    bool isInput() const { return isInputDirection(m_direction); }
    bool isOutput() const { return isOutputDirection(m_direction); }
    KrShaderBrick* getBrick() const { return m_brick; }
    // The argument name (i = 0), unique within the brick. Empty for other indices.
    virtual QString getParamArg(int i = 0) const;
    QString getLabel() const { return m_label; }
    virtual void setLabel(const QString& label); // emits labelChanged()
    QString getType() const { return m_type; }
    void setType(const QString& type); // emits typeChanged(); drops wires the new type refuses
    QString getTypeLabel() const { return typeLabelFor(m_type); }
    bool getIsAdvanced() const { return m_advanced; }
    void setIsAdvanced(bool advanced);

    int getNumConnections() const { return m_connections.size(); }
    const KrParamConnection* getConnection(int i) const;
    // Wires this parameter and other, whichever is the input. An input takes one source: a
    // new source replaces the old. False when canConnectTo() refuses.
    bool addConnection(KrBrickParam* other);
    bool removeConnection(KrBrickParam* other); // false when they were not wired
    void removeAllConnections();
    // Whether this parameter and target may be wired: one input and one output of two
    // different bricks, compatible types, no constant input or internal output, and no cycle.
    bool canConnectTo(KrBrickParam* target) const;
    bool isConnectedTo(KrBrickParam* other) const;

    // The properties holding an input's value; outputs have none.
    virtual int getNumParamProperties() const { return 0; }
    virtual KrProperty* getParamProperty(int i) const;

    // Declaration tokens (Token): argument name, type, default value text. Rebuilt on demand
    // after clearTokens() or any change. Empty for unknown indices.
    void clearTokens();
    QString getToken(int i) const;
    int getNumTokens() const;
    // The value of the input as shader-language text: its properties' values, else the
    // default expression.
    virtual QString getDefaultValueText() const;

signals:
    void labelChanged();
    void typeChanged();
    void connectionsChanged();
    void valueChanged(); // a value property changed
    void advancedChanged();

protected:
    void tokensChanged() { m_tokensValid = false; }

private:
    friend class KrShaderBrick;
    friend class KrBrickGroup;
    static void notifyChanged(const QList<KrBrickParam*>& params);
    static void link(KrBrickParam* source, KrBrickParam* target);
    static bool unlink(KrBrickParam* a, KrBrickParam* b);
    // Wires without the lifting into groups (both are at one level).
    static bool canConnectDirect(const KrBrickParam* a, const KrBrickParam* b);
    // Silently drops every wire (other ends are notified) while the brick goes away.
    void dropConnectionsQuietly();

    KrShaderBrick* m_brick;
    QString m_arg;
    QString m_label;
    int m_direction;
    QString m_type;
    bool m_advanced = false;
    QString m_defaultExpression;
    QList<KrParamConnection*> m_connections;
    mutable QStringList m_tokens;
    mutable bool m_tokensValid = false;
};

// A parameter that owns the properties holding its value (usually one, named like the
// parameter). Its properties are its QObject children.
class KRCORE_EXPORT KrPropertyParam : public KrBrickParam
{
    Q_OBJECT
public:
    KrPropertyParam(KrShaderBrick* brick, const QString& arg, const QString& label,
                    Direction direction, const QString& type, QObject* parent = nullptr);
    ~KrPropertyParam() override;

    // Takes ownership. The brick's property list follows.
    void addParamProperty(KrProperty* property);
    void removeParamProperty(KrProperty* property); // deletes it

    int getNumParamProperties() const override { return m_properties.size(); }
    KrProperty* getParamProperty(int i) const override;
    QString getDefaultValueText() const override;
    void setLabel(const QString& label) override;

    // Shader-language text of one property's value.
    static QString valueText(const KrProperty* property);

signals:
    void paramPropertiesChanged();

private:
    QList<KrProperty*> m_properties;
};
