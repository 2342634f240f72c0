#pragma once

#include "krcore_global.h"
#include "krbase.h"
#include "krelement.h"

#include <QList>
#include <QListIterator>
#include <QStringList>

class KrBrickContainer;
class KrBrickParam;
class KrProperty;
class KrSettings;

// One node of a shader network. Its properties (KrElement) are its parameters' properties
// followed by its local properties (settings that are not parameters).
//
// Reference counted: a new brick has a count of 0; a brick user holds one reference while the
// brick is filed in it, and the last unref() deletes the brick after unwiring it.
class KRCORE_EXPORT KrShaderBrick : public KrElement, public KrRefCountedItem
{
    Q_OBJECT
public:
    explicit KrShaderBrick(const QString& name = QString(), QObject* parent = nullptr);
    ~KrShaderBrick() override;

    // The brick's record: class name, settings record, parameter values, labels and (with
    // connections) its inputs' sources by "Brick_<id>" and argument. See KrDefaultBrickUser.
    void getAttributes(KrSettings* settings) const override;
    bool setAttributes(const KrSettings* settings) override;
    // State of subclasses that is not a parameter value (added inputs, a group's network).
    // readBrickState runs before the parameter values are read back.
    virtual void writeBrickState(KrSettings* state) const;
    virtual bool readBrickState(const KrSettings* state);
    // Shader-language body computing the outputs from the inputs (argument names as
    // variables). For the compiler and for documentation.
    virtual QString getShaderCode() const;

    // Internal: the brick user bookkeeping that files the brick (null when not filed).
    KrBrickContainer* getContainer() const { return m_container; }
    void setContainer(KrBrickContainer* container) { m_container = container; }
    // True while the destructor runs: no signal is sent about the brick any more.
    bool isBeingDestroyed() const { return m_destroying; }

    // Sets a property's path and keeps it from the default "/<title>/<label>" path that bricks
    // give their properties when they are filed.
    static void setPropertyPath(KrProperty* property, const QString& path);

    QList<KrProperty*> getLocalProperties() const { return m_localProperties; }
    // Takes ownership; the property is listed after the parameters' properties.
    void addLocalProperty(KrProperty* property);

public slots:
    uint getBrickID() const { return m_id; }
    // Emits brickIDChanged(old). Filed in a brick user, the brick moves to the new id; an id
    // in use there (or 0) is refused and the brick keeps its id.
    void setBrickID(uint id);
    KrSettings* getBrickSettings() const;

    QListIterator<KrBrickParam*> getParameterIterator() const;
    int getNumParameters() const { return m_params.size(); }
    KrBrickParam* getParameter(int i) const;
    int findParameterIndex(KrBrickParam* param) const;
    KrBrickParam* findParameterByArg(const QString& arg) const;

    // A KrBrickSet::ShaderType: 0 for a function brick, else the kind of root.
    virtual int type() const;
    virtual QString getPreferredName() const;
    virtual QString getDefaultCategory() const; // "/"-separated
    virtual QString getOptionsFrameClassName() const;
    // Entries "<action class>::<argument>" for the brick's menu; empty entries are separators.
    virtual QStringList getBrickActionList() const;
    // Runs the brick action named by an entry's argument; false when there is none.
    virtual bool executeBrickAction(const QString& action);
    virtual bool shouldSeperateLocalProperties() const;
    virtual QString getDescription() const; // what the brick computes

    // The bricks that feed this one, in parameter order; recursive adds their feeders depth
    // first; includeSelf puts this brick first; unique lists each brick once. Appends to list.
    void getBrickList(bool recursive, bool includeSelf, bool unique,
                      QList<KrShaderBrick*>* list) const;
    // Whether other feeds this brick, directly or not.
    bool isFedBy(const KrShaderBrick* other) const;

    // The element of the brick user the brick is filed in, or null.
    KrElement* getElementParent() const { return m_elementParent; }
    void setElementParent(KrElement* parent) { m_elementParent = parent; }

    // Wires output srcParamIndex of source into parameter paramIndex of this brick.
    bool addConnection(int paramIndex, KrShaderBrick* source, int srcParamIndex);
    void removeAllConnections();

    // Takes ownership; refuses a null parameter, one of another brick and a duplicate
    // argument. Emits paramAdded().
    bool addParameter(KrBrickParam* param);
    bool insertParameter(int index, KrBrickParam* param);
    // Unwires and deletes the parameter. Emits paramRemoved().
    bool removeParameter(KrBrickParam* param);

    // "BrickTitle" of the settings, else the preferred name.
    QString getBrickTitle() const;
    // Stores "BrickTitle"; property paths under "/<old title>" follow. Emits
    // brickTitleChanged().
    void setBrickTitle(const QString& title);

signals:
    void brickIDChanged(int oldId);
    void brickActionListChanged();
    void connectionsChanged(KrShaderBrick* brick);
    void paramAdded();
    void paramRemoved();
    void brickTitleChanged(const QString& title);

protected:
    void releaseItem() override;
    // Subclasses call it first thing in their destructor.
    void beginDestruction() { m_destroying = true; }
    // Rebuilds the KrElement property list from the parameters and local properties.
    void updatePropertyList();

private:
    friend class KrBrickContainer;
    friend class KrBrickParam;
    void paramPropertiesChanged();
    void paramLabelChanged(KrBrickParam* param, const QString& oldLabel);
    void assignDefaultPaths();

    uint m_id = 0;
    KrSettings* m_settings;
    QList<KrBrickParam*> m_params;
    QList<KrProperty*> m_localProperties;
    KrElement* m_elementParent = nullptr;
    KrBrickContainer* m_container = nullptr;
    bool m_destroying = false;
};
