#include "frame_testsupport.h"

#include "krproperty.h"
#include "krundo.h"

#include <QApplication>
#include <QElapsedTimer>
#include <QMenu>
#include <QMouseEvent>
#include <QStyleFactory>
#include <QStyleOption>
#include <QTimer>

KrFrameTestBrick::KrFrameTestBrick(const QString& preferredName, uint id)
    : KrShaderBrick(QString()), m_preferred(preferredName)
{
    setBrickID(id);
}

KrFrameTestBrick::~KrFrameTestBrick()
{
    beginDestruction();
}

bool KrFrameTestBrick::executeBrickAction(const QString& action)
{
    executed << action;
    if (onExecute)
        onExecute(action);
    return action != QLatin1String("Refuse");
}

void KrFrameTestBrick::setActions(const QStringList& actions)
{
    m_actions = actions;
    emit brickActionListChanged();
}

KrBrickParam* KrFrameTestBrick::addPlain(const QString& arg, const QString& label, int direction,
                                         bool advanced)
{
    auto* param = new KrBrickParam(this, arg, label, KrBrickParam::Direction(direction),
                                   QStringLiteral("color"));
    param->setIsAdvanced(advanced);
    addParameter(param);
    return param;
}

KrPropertyParam* KrFrameTestBrick::addWithProperty(const QString& arg, const QString& label,
                                                   int direction, bool advanced)
{
    auto* param = new KrPropertyParam(this, arg, label, KrBrickParam::Direction(direction),
                                      QStringLiteral("float"));
    param->addParamProperty(new KrFloatProperty(label, 0.5));
    param->setIsAdvanced(advanced);
    addParameter(param);
    return param;
}

KrProperty* KrFrameTestBrick::addLocal(const QString& name)
{
    auto* property = new KrIntProperty(name);
    addLocalProperty(property);
    return property;
}

KrFrameTestStyle::KrFrameTestStyle() : QProxyStyle(QStyleFactory::create(QStringLiteral("Fusion")))
{
}

int KrFrameTestStyle::pixelMetric(PixelMetric metric, const QStyleOption* option,
                                  const QWidget* widget) const
{
    switch (uint(metric)) {
    case uint(PM_CustomBase) + 0x13:
        return titleHeight;
    case uint(PM_CustomBase) + 10:
        return resizeMetric;
    case uint(PM_CustomBase) + 61:
        return optionsSide;
    default:
        return QProxyStyle::pixelMetric(metric, option, widget);
    }
}

int KrFrameTestStyle::styleHint(StyleHint hint, const QStyleOption* option, const QWidget* widget,
                                QStyleHintReturn* returnData) const
{
    if (uint(hint) == uint(SH_CustomBase) + 3)
        return maskHint;
    return QProxyStyle::styleHint(hint, option, widget, returnData);
}

void KrFrameTestStyle::drawControl(ControlElement element, const QStyleOption* option,
                                   QPainter* painter, const QWidget* widget) const
{
    if (uint(element) >= uint(CE_CustomBase)) {
        controls << int(uint(element) - uint(CE_CustomBase));
        if (uint(element) == uint(CE_CustomBase) && option)
            lastButtonState = option->state;
        if (option) {
            lastOptionVersion = option->version;
            lastOptionType = option->type;
        }
        return;
    }
    QProxyStyle::drawControl(element, option, painter, widget);
}

KrFrameTestAction::KrFrameTestAction(QObject* parent) : KrBrickAction(parent) {}

void KrFrameTestAction::setOptionsFrame(KrBrickOptionsFrame* frame)
{
    calls << QStringLiteral("frame");
    KrBrickAction::setOptionsFrame(frame);
}

void KrFrameTestAction::setActionArgument(const QString& argument)
{
    calls << QStringLiteral("argument:") + argument;
    KrBrickAction::setActionArgument(argument);
    setText(QStringLiteral("Test ") + argument);
}

void frameSendMouse(QWidget* widget, QEvent::Type type, const QPoint& pos, Qt::MouseButton button,
                    Qt::MouseButtons buttons)
{
    QMouseEvent event(type, QPointF(pos), QPointF(pos), QPointF(widget->mapToGlobal(pos)), button,
                      buttons, Qt::NoModifier);
    QApplication::sendEvent(widget, &event);
}

void frameWhenPopup(const std::function<void(QWidget*)>& action, int timeoutMs)
{
    auto* timer = new QTimer(qApp);
    auto* clock = new QElapsedTimer;
    clock->start();
    timer->setInterval(20);
    QObject::connect(timer, &QTimer::timeout, timer, [=]() {
        QWidget* popup = QApplication::activePopupWidget();
        if (popup && popup->isVisible()) {
            timer->stop();
            action(popup);
        } else if (clock->elapsed() < timeoutMs) {
            return;
        }
        timer->stop();
        timer->deleteLater();
        delete clock;
    });
    timer->start();
}

QStringList frameMenuTexts(const QMenu* menu)
{
    QStringList texts;
    for (QAction* action : menu->actions())
        texts << (action->isSeparator() ? QStringLiteral("-") : action->text());
    return texts;
}
