#pragma once

#include "krbrickaction.h"
#include "krbrickoptionsframe.h"
#include "krbrickparam.h"
#include "krclassfactory.h"
#include "krshaderbrick.h"

#include <QEvent>
#include <QProxyStyle>
#include <QStringList>
#include <functional>

class KrProperty;
class QWidget;

// A brick whose menu entries, option widget class and settings layout the test chooses.
class KrFrameTestBrick : public KrShaderBrick
{
    Q_OBJECT
public:
    explicit KrFrameTestBrick(const QString& preferredName = QStringLiteral("Diffuse"),
                              uint id = 3);
    ~KrFrameTestBrick() override;

    QString getPreferredName() const override { return m_preferred; }
    QStringList getBrickActionList() const override { return m_actions; }
    bool executeBrickAction(const QString& action) override;
    QString getOptionsFrameClassName() const override { return m_optionsClass; }
    bool shouldSeperateLocalProperties() const override { return m_separate; }

    void setActions(const QStringList& actions); // emits brickActionListChanged()
    void setOptionsClass(const QString& name) { m_optionsClass = name; }
    void setSeparateLocal(bool separate) { m_separate = separate; }

    // A parameter without properties (an output, or an input of direction 0 or 1).
    KrBrickParam* addPlain(const QString& arg, const QString& label, int direction,
                           bool advanced = false);
    // An input holding one float property named like the label.
    KrPropertyParam* addWithProperty(const QString& arg, const QString& label, int direction = 1,
                                     bool advanced = false);
    KrProperty* addLocal(const QString& name);

    QStringList executed;
    // Run by executeBrickAction() before it answers.
    std::function<void(const QString&)> onExecute;

private:
    QString m_preferred;
    QStringList m_actions;
    QString m_optionsClass = QStringLiteral("KrStandardBrickWidget");
    bool m_separate = false;
};

// A style with chosen answers to the brick frame's custom numbers; it records what the frame's
// widgets ask it to draw.
class KrFrameTestStyle : public QProxyStyle
{
    Q_OBJECT
public:
    KrFrameTestStyle();
    int titleHeight = 22;
    int resizeMetric = 15;
    int optionsSide = 12;
    int maskHint = 0;

    int pixelMetric(PixelMetric metric, const QStyleOption* option = nullptr,
                    const QWidget* widget = nullptr) const override;
    int styleHint(StyleHint hint, const QStyleOption* option = nullptr,
                  const QWidget* widget = nullptr,
                  QStyleHintReturn* returnData = nullptr) const override;
    void drawControl(ControlElement element, const QStyleOption* option, QPainter* painter,
                     const QWidget* widget = nullptr) const override;

    mutable QList<int> controls;           // custom control numbers drawn (minus the base)
    mutable QStyle::State lastButtonState; // of the last CE_CustomBase + 0
    mutable int lastOptionVersion = -1;
    mutable int lastOptionType = -1;
};

// A brick action that records the order of its set-up calls.
class KrFrameTestAction : public KrBrickAction
{
    Q_OBJECT
public:
    explicit KrFrameTestAction(QObject* parent = nullptr);
    void setOptionsFrame(KrBrickOptionsFrame* frame) override;
    void setActionArgument(const QString& argument) override;
    QStringList calls;
};

// A QAction that is no brick action.
class KrFrameTestPlainAction : public QAction
{
    Q_OBJECT
public:
    explicit KrFrameTestPlainAction(QObject* parent = nullptr) : QAction(parent) {}
};

// An option widget of its own, made by a class factory.
class KrFrameTestOptions : public KrBrickOptionsFrame
{
    Q_OBJECT
public:
    KrFrameTestOptions() : KrBrickOptionsFrame(nullptr) {}
    void setBrickFrame(QWidget* frame) override { holder = frame; }
    QWidget* holder = nullptr;
};

// A factory whose class claims to be T but that makes an object of class M.
template <class T, class M = T> class KrFrameTestFactory : public KrClassFactory
{
public:
    explicit KrFrameTestFactory(const char* guid)
        : KrClassFactory(&T::staticMetaObject, KrGUID::fromString(QString::fromLatin1(guid)))
    {
    }
    using KrClassFactory::createInstance;
    QObject* createInstance() override
    {
        ++created;
        return new M();
    }
    int created = 0;
};

// Sends a mouse event of type to widget at pos, with the global position its own mapping
// gives (through any graphics proxy on the way).
void frameSendMouse(QWidget* widget, QEvent::Type type, const QPoint& pos,
                    Qt::MouseButton button = Qt::LeftButton,
                    Qt::MouseButtons buttons = Qt::LeftButton);

// Runs action with the next pop-up menu that opens, polling for up to timeoutMs.
void frameWhenPopup(const std::function<void(QWidget*)>& action, int timeoutMs = 5000);

// Texts of a menu's entries, "-" for a separator.
QStringList frameMenuTexts(const class QMenu* menu);
