#include "krbricklibrary.h"

#include "krclassfactory.h"
#include "krplugin.h"
#include "krproperty.h"
#include "krsettings.h"
#include "krbrickuser.h"
#include "krundo.h"

#include <QPointer>

#include <limits>

KR_CORE_CLASS(KrSurfaceBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3000");
KR_CORE_CLASS(KrLightBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3001");
KR_CORE_CLASS(KrFloatConstantBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3002");
KR_CORE_CLASS(KrAddBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3003");
KR_CORE_CLASS(KrSubtractBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3004");
KR_CORE_CLASS(KrMultiplyBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3005");
KR_CORE_CLASS(KrDivideBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3006");
KR_CORE_CLASS(KrPowerBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3007");
KR_CORE_CLASS(KrMixBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3008");
KR_CORE_CLASS(KrClampBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3009");
KR_CORE_CLASS(KrInvertBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D300A");
KR_CORE_CLASS(KrSmoothstepBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D300B");
KR_CORE_CLASS(KrColorConstantBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D300C");
KR_CORE_CLASS(KrAddColorsBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D300D");
KR_CORE_CLASS(KrMultiplyColorsBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D300E");
KR_CORE_CLASS(KrMixColorsBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D300F");
KR_CORE_CLASS(KrInvertColorBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3010");
KR_CORE_CLASS(KrSplitColorBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3011");
KR_CORE_CLASS(KrCombineColorBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3012");
KR_CORE_CLASS(KrLuminanceBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3013");
KR_CORE_CLASS(KrColorCorrectBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3014");
KR_CORE_CLASS(KrNoiseBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3015");
KR_CORE_CLASS(KrCheckerBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3016");
KR_CORE_CLASS(KrGradientBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3017");
KR_CORE_CLASS(KrStripesBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3018");
KR_CORE_CLASS(KrNormalBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3019");
KR_CORE_CLASS(KrPositionBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D301A");
KR_CORE_CLASS(KrTextureCoordinatesBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D301B");
KR_CORE_CLASS(KrBumpBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D301C");
KR_CORE_CLASS(KrFacingRatioBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D301D");
KR_CORE_CLASS(KrFresnelBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D301E");
KR_CORE_CLASS(KrDiffuseBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D301F");
KR_CORE_CLASS(KrSpecularBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3020");
KR_CORE_CLASS(KrAmbientBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3021");
KR_CORE_CLASS(KrReflectionBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3022");
KR_CORE_CLASS(KrRefractionBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3023");
KR_CORE_CLASS(KrImageTextureBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3024");
KR_CORE_CLASS(KrEnvironmentBrick, "6B1D2E40-3C57-4F0A-9E21-5A7C0B1D3025");

namespace {
const QString kFloat = QStringLiteral("float");
const QString kColor = QStringLiteral("color");
const QString kPoint = QStringLiteral("point");
const QString kVector = QStringLiteral("vector");
const QString kNormal = QStringLiteral("normal");
const QString kString = QStringLiteral("string");
const QString kInt = QStringLiteral("int");
const QString kBool = QStringLiteral("bool");
const QString kMath = QStringLiteral("Math");
const QString kColorCategory = QStringLiteral("Color");
const QString kPattern = QStringLiteral("Pattern");
const QString kGeometry = QStringLiteral("Geometry");
const QString kLighting = QStringLiteral("Lighting");
const QString kTexture = QStringLiteral("Texture");
const double kBig = 1.0e6;
const QString kNumInputsKey = QStringLiteral("NumInputs");
const QString kAddInput = QStringLiteral("Add Input");
const QString kRemoveInput = QStringLiteral("Remove Input");
// The editor's generic brick action: it runs executeBrickAction(<argument>) on the brick.
const QString kActionClass = QStringLiteral("KrBrickCommandAction");

// Undoes "Add Input" and "Remove Input". Whichever way it goes, the input that is removed is
// remembered (label, value, source) and the input added again gets it back.
class KrAddInputsUndoItem : public KrUndoItem
{
public:
    KrAddInputsUndoItem(KrAddInputsBrick* brick, bool added, const KrSettings& removed)
        : m_brick(brick), m_added(added), m_removed(removed)
    {
    }
    void undo() override { apply(!m_added); }
    void redo() override { apply(m_added); }
    int size() const override { return 64; }

    // The record of the last input: label, value and the source's id and argument.
    static KrSettings capture(KrAddInputsBrick* brick)
    {
        KrSettings r;
        KrBrickParam* p =
            brick->findParameterByArg(QStringLiteral("in%1").arg(brick->getNumInputs()));
        if (!p)
            return r;
        r.setStringValue(QStringLiteral("Label"), p->getLabel());
        if (KrProperty* prop = p->getParamProperty(0))
            prop->writeValue(&r, QStringLiteral("Value"));
        if (const KrBrickParam* src = p->getSource()) {
            r.setIntValue(QStringLiteral("SourceBrick"), int(src->getBrick()->getBrickID()));
            r.setStringValue(QStringLiteral("SourceParam"), src->getParamArg(0));
        }
        return r;
    }

private:
    void apply(bool add)
    {
        if (!m_brick)
            return;
        if (!add) {
            m_removed = capture(m_brick);
            m_brick->removeInput();
            return;
        }
        if (!m_brick->addInput() || m_removed.isEmpty())
            return;
        KrBrickParam* p =
            m_brick->findParameterByArg(QStringLiteral("in%1").arg(m_brick->getNumInputs()));
        p->setLabel(m_removed.getStringValue(QStringLiteral("Label"), p->getLabel()));
        if (KrProperty* prop = p->getParamProperty(0))
            prop->readValue(&m_removed, QStringLiteral("Value"));
        KrBrickContainer* container = m_brick->getContainer();
        KrShaderBrick* src =
            container
                ? container->findBrick(uint(m_removed.getIntValue(QStringLiteral("SourceBrick"))))
                : nullptr;
        KrBrickParam* out =
            src ? src->findParameterByArg(m_removed.getStringValue(QStringLiteral("SourceParam")))
                : nullptr;
        if (out)
            p->addConnection(out);
    }

    QPointer<KrAddInputsBrick> m_brick;
    bool m_added;
    KrSettings m_removed;
};

void pushUndo(KrAddInputsBrick* brick, bool added, const KrSettings& removed)
{
    if (krUndoStack && krUndoStack->canPushItems())
        krUndoStack->push(new KrAddInputsUndoItem(brick, added, removed));
}
} // namespace

// ---------------------------------------------------------------------------- KrLibraryBrick

KrLibraryBrick::KrLibraryBrick(QObject* parent) : KrShaderBrick(QString(), parent) {}

KrLibraryBrick::~KrLibraryBrick() = default;

QString KrLibraryBrick::getPreferredName() const
{
    return getName().isEmpty() ? m_name : getName();
}

void KrLibraryBrick::setInfo(const QString& name, const QString& category,
                             const QString& description, const QString& code, int type)
{
    m_name = name;
    m_category = category;
    m_description = description;
    m_code = code;
    m_type = type;
}

KrPropertyParam* KrLibraryBrick::addProperty(const QString& arg, const QString& label,
                                             const QString& type, KrProperty* property,
                                             bool advanced, KrBrickParam::Direction direction)
{
    auto* param = new KrPropertyParam(this, arg, label, direction, type);
    param->setIsAdvanced(advanced);
    property->setAdvanced(advanced);
    param->addParamProperty(property);
    addParameter(param);
    return param;
}

KrPropertyParam* KrLibraryBrick::addFloat(const QString& arg, const QString& label, double value,
                                          double minimum, double maximum, bool advanced)
{
    auto* p = new KrFloatProperty(label, value);
    p->setRange(minimum, maximum);
    p->setStep(maximum - minimum <= 2.0 ? 0.01 : 0.1);
    return addProperty(arg, label, kFloat, p, advanced);
}

KrPropertyParam* KrLibraryBrick::addColor(const QString& arg, const QString& label,
                                          const QColor& value, bool advanced)
{
    return addProperty(arg, label, kColor, new KrColorProperty(label, value), advanced);
}

KrPropertyParam* KrLibraryBrick::addInt(const QString& arg, const QString& label, int value,
                                        int minimum, int maximum, bool advanced)
{
    auto* p = new KrIntProperty(label, false, false, value);
    p->setRange(minimum, maximum);
    return addProperty(arg, label, kInt, p, advanced);
}

KrPropertyParam* KrLibraryBrick::addString(const QString& arg, const QString& label,
                                           const QString& value, bool advanced)
{
    return addProperty(arg, label, kString, new KrStringProperty(label, value), advanced);
}

KrPropertyParam* KrLibraryBrick::addBool(const QString& arg, const QString& label, bool value,
                                         bool advanced)
{
    return addProperty(arg, label, kBool, new KrBoolProperty(label, value), advanced,
                       KrBrickParam::ConstantInput);
}

KrPropertyParam* KrLibraryBrick::addEnum(const QString& arg, const QString& label,
                                         const QStringList& items, int index, bool advanced)
{
    return addProperty(arg, label, kInt, new KrEnumProperty(label, items, index), advanced,
                       KrBrickParam::ConstantInput);
}

KrBrickParam* KrLibraryBrick::addExpression(const QString& arg, const QString& label,
                                            const QString& type, const QString& expression,
                                            bool advanced)
{
    auto* param = new KrBrickParam(this, arg, label, KrBrickParam::Input, type);
    param->setDefaultExpression(expression);
    param->setIsAdvanced(advanced);
    addParameter(param);
    return param;
}

KrBrickParam* KrLibraryBrick::addOutput(const QString& arg, const QString& label,
                                        const QString& type, KrBrickParam::Direction direction)
{
    auto* param = new KrBrickParam(this, arg, label, direction, type);
    addParameter(param);
    return param;
}

// -------------------------------------------------------------------------- KrAddInputsBrick

KrAddInputsBrick::KrAddInputsBrick(const QString& valueType, QObject* parent)
    : KrLibraryBrick(parent), m_valueType(valueType)
{
}

QStringList KrAddInputsBrick::getBrickActionList() const
{
    QStringList list;
    if (m_inputs < s_maxInputs)
        list << kActionClass + QStringLiteral("::") + kAddInput;
    if (m_inputs > s_minInputs)
        list << kActionClass + QStringLiteral("::") + kRemoveInput;
    return list;
}

bool KrAddInputsBrick::executeBrickAction(const QString& action)
{
    if (action == kAddInput) {
        if (!addInput())
            return false;
        pushUndo(this, true, KrSettings());
        return true;
    }
    if (action == kRemoveInput) {
        const KrSettings removed = KrAddInputsUndoItem::capture(this);
        if (!removeInput())
            return false;
        pushUndo(this, false, removed);
        return true;
    }
    return false;
}

bool KrAddInputsBrick::addInput()
{
    if (m_inputs >= s_maxInputs)
        return false;
    const int n = m_inputs + 1;
    const QString arg = QStringLiteral("in%1").arg(n);
    const QString label = QStringLiteral("Input %1").arg(n);
    // Inputs go before the output so the list reads inputs first.
    KrProperty* property = nullptr;
    if (m_valueType == kColor)
        property = new KrColorProperty(label, Qt::black);
    else
        property = new KrFloatProperty(label, 0.0);
    auto* param = new KrPropertyParam(this, arg, label, KrBrickParam::Input, m_valueType);
    param->addParamProperty(property);
    if (!insertParameter(m_inputs, param)) {
        delete param;
        return false;
    }
    m_inputs = n;
    emit brickActionListChanged();
    return true;
}

bool KrAddInputsBrick::removeInput()
{
    if (m_inputs <= s_minInputs)
        return false;
    KrBrickParam* last = findParameterByArg(QStringLiteral("in%1").arg(m_inputs));
    if (!last || !removeParameter(last))
        return false;
    --m_inputs;
    emit brickActionListChanged();
    return true;
}

void KrAddInputsBrick::writeBrickState(KrSettings* state) const
{
    state->setIntValue(kNumInputsKey, m_inputs);
}

bool KrAddInputsBrick::readBrickState(const KrSettings* state)
{
    if (!state->hasKey(kNumInputsKey))
        return true;
    if (state->getValueType(kNumInputsKey) != KrSettings::Int)
        return false;
    const int wanted = state->getIntValue(kNumInputsKey);
    const int target = qBound(s_minInputs, wanted, s_maxInputs);
    while (m_inputs < target && addInput()) {
    }
    while (m_inputs > target && removeInput()) {
    }
    return wanted == target;
}

QString KrAddInputsBrick::getShaderCode() const
{
    QStringList terms;
    for (int i = 1; i <= m_inputs; ++i)
        terms << QStringLiteral("in%1").arg(i);
    return QStringLiteral("result = %1;").arg(terms.join(QLatin1String(" + ")));
}

// ------------------------------------------------------------------------------------ Roots

KrSurfaceBrick::KrSurfaceBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Surface"), QStringLiteral("Materials"),
            QStringLiteral("The surface shader of a material: the colour a surface shows, its "
                           "opacity, the normal it is shaded with and the light it emits."),
            QStringLiteral("Oi = Os;\nCi = Oi * (Cs + Ce);"), 1);
    addColor(QStringLiteral("Cs"), QStringLiteral("Color"), QColor(204, 204, 204));
    addFloat(QStringLiteral("Os"), QStringLiteral("Opacity"), 1.0, 0.0, 1.0);
    addExpression(QStringLiteral("Nn"), QStringLiteral("Normal"), kNormal,
                  QStringLiteral("normalize(N)"), false);
    addColor(QStringLiteral("Ce"), QStringLiteral("Emission"), Qt::black, true);
    addOutput(QStringLiteral("Ci"), QStringLiteral("Surface Color"), kColor,
              KrBrickParam::InternalOutput);
    addOutput(QStringLiteral("Oi"), QStringLiteral("Surface Opacity"), kColor,
              KrBrickParam::InternalOutput);
}

KrLightBrick::KrLightBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Light"), QStringLiteral("Lights"),
            QStringLiteral("The light shader of a light: the colour and intensity it sends "
                           "towards a point, weakened by distance as the falloff chooses."),
            QStringLiteral("float d = length(L);\n"
                           "float f = falloff == 0 ? 1 : falloff == 1 ? 1 / d : 1 / (d * d);\n"
                           "Cl = intensity * lightcolor * f;"),
            4);
    addColor(QStringLiteral("lightcolor"), QStringLiteral("Color"), Qt::white);
    addFloat(QStringLiteral("intensity"), QStringLiteral("Intensity"), 1.0, 0.0, 1000.0);
    addEnum(QStringLiteral("falloff"), QStringLiteral("Falloff"),
            {QStringLiteral("None"), QStringLiteral("Linear"), QStringLiteral("Quadratic")}, 0,
            true);
    addOutput(QStringLiteral("Cl"), QStringLiteral("Light Color"), kColor,
              KrBrickParam::InternalOutput);
}

// ------------------------------------------------------------------------------------- Math

KrFloatConstantBrick::KrFloatConstantBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Float"), kMath, QStringLiteral("A constant number."),
            QStringLiteral("result = value;"));
    addFloat(QStringLiteral("value"), QStringLiteral("Value"), 0.5, -kBig, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Value"), kFloat);
}

KrAddBrick::KrAddBrick(QObject* parent) : KrAddInputsBrick(kFloat, parent)
{
    setInfo(QStringLiteral("Add"), kMath,
            QStringLiteral("The sum of its inputs; \"Add Input\" adds one more."), QString());
    addOutput(QStringLiteral("result"), QStringLiteral("Sum"), kFloat);
    addInput();
    addInput();
}

KrSubtractBrick::KrSubtractBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Subtract"), kMath,
            QStringLiteral("A minus B: the first input less the second."),
            QStringLiteral("result = a - b;"));
    addFloat(QStringLiteral("a"), QStringLiteral("A"), 0.0, -kBig, kBig);
    addFloat(QStringLiteral("b"), QStringLiteral("B"), 0.0, -kBig, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Difference"), kFloat);
}

KrMultiplyBrick::KrMultiplyBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Multiply"), kMath,
            QStringLiteral("A times B: the product of the two inputs."),
            QStringLiteral("result = a * b;"));
    addFloat(QStringLiteral("a"), QStringLiteral("A"), 1.0, -kBig, kBig);
    addFloat(QStringLiteral("b"), QStringLiteral("B"), 1.0, -kBig, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Product"), kFloat);
}

KrDivideBrick::KrDivideBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Divide"), kMath,
            QStringLiteral("A divided by B; where B is 0 the result is the fallback value."),
            QStringLiteral("result = b != 0 ? a / b : fallback;"));
    addFloat(QStringLiteral("a"), QStringLiteral("A"), 1.0, -kBig, kBig);
    addFloat(QStringLiteral("b"), QStringLiteral("B"), 1.0, -kBig, kBig);
    addFloat(QStringLiteral("fallback"), QStringLiteral("Fallback"), 0.0, -kBig, kBig, true);
    addOutput(QStringLiteral("result"), QStringLiteral("Quotient"), kFloat);
}

KrPowerBrick::KrPowerBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Power"), kMath,
            QStringLiteral("Base raised to the exponent; a negative base gives 0."),
            QStringLiteral("result = base < 0 ? 0 : pow(base, exponent);"));
    addFloat(QStringLiteral("base"), QStringLiteral("Base"), 1.0, -kBig, kBig);
    addFloat(QStringLiteral("exponent"), QStringLiteral("Exponent"), 2.0, -100.0, 100.0);
    addOutput(QStringLiteral("result"), QStringLiteral("Power"), kFloat);
}

KrMixBrick::KrMixBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Mix"), kMath,
            QStringLiteral("Blends A into B: A where Amount is 0, B where it is 1."),
            QStringLiteral("result = mix(a, b, clamp(amount, 0, 1));"));
    addFloat(QStringLiteral("a"), QStringLiteral("A"), 0.0, -kBig, kBig);
    addFloat(QStringLiteral("b"), QStringLiteral("B"), 1.0, -kBig, kBig);
    addFloat(QStringLiteral("amount"), QStringLiteral("Amount"), 0.5, 0.0, 1.0);
    addOutput(QStringLiteral("result"), QStringLiteral("Result"), kFloat);
}

KrClampBrick::KrClampBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Clamp"), kMath,
            QStringLiteral("The input kept between Minimum and Maximum."),
            QStringLiteral("result = clamp(value, min(lo, hi), max(lo, hi));"));
    addFloat(QStringLiteral("value"), QStringLiteral("Input"), 0.5, -kBig, kBig);
    addFloat(QStringLiteral("lo"), QStringLiteral("Minimum"), 0.0, -kBig, kBig);
    addFloat(QStringLiteral("hi"), QStringLiteral("Maximum"), 1.0, -kBig, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Result"), kFloat);
}

KrInvertBrick::KrInvertBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Invert"), kMath, QStringLiteral("One minus the input."),
            QStringLiteral("result = 1 - value;"));
    addFloat(QStringLiteral("value"), QStringLiteral("Input"), 0.0, -kBig, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Result"), kFloat);
}

KrSmoothstepBrick::KrSmoothstepBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Smoothstep"), kMath,
            QStringLiteral("0 below Edge 0, 1 above Edge 1 and a smooth S-curve between."),
            QStringLiteral("result = smoothstep(edge0, edge1, value);"));
    addFloat(QStringLiteral("value"), QStringLiteral("Input"), 0.5, -kBig, kBig);
    addFloat(QStringLiteral("edge0"), QStringLiteral("Edge 0"), 0.0, -kBig, kBig);
    addFloat(QStringLiteral("edge1"), QStringLiteral("Edge 1"), 1.0, -kBig, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Result"), kFloat);
}

// ------------------------------------------------------------------------------------ Color

KrColorConstantBrick::KrColorConstantBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Color"), kColorCategory, QStringLiteral("A constant colour."),
            QStringLiteral("result = value;"));
    addColor(QStringLiteral("value"), QStringLiteral("Color"), QColor(204, 204, 204));
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
}

KrAddColorsBrick::KrAddColorsBrick(QObject* parent) : KrAddInputsBrick(kColor, parent)
{
    setInfo(QStringLiteral("Add Colors"), kColorCategory,
            QStringLiteral("The sum of its colour inputs; \"Add Input\" adds one more."),
            QString());
    addOutput(QStringLiteral("result"), QStringLiteral("Sum"), kColor);
    addInput();
    addInput();
}

KrMultiplyColorsBrick::KrMultiplyColorsBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Multiply Colors"), kColorCategory,
            QStringLiteral("A times B, channel by channel; a number feeds all three channels."),
            QStringLiteral("result = a * b;"));
    addColor(QStringLiteral("a"), QStringLiteral("A"), Qt::white);
    addColor(QStringLiteral("b"), QStringLiteral("B"), Qt::white);
    addOutput(QStringLiteral("result"), QStringLiteral("Product"), kColor);
}

KrMixColorsBrick::KrMixColorsBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Mix Colors"), kColorCategory,
            QStringLiteral("Blends colour A into B: A where Amount is 0, B where it is 1."),
            QStringLiteral("result = mix(a, b, clamp(amount, 0, 1));"));
    addColor(QStringLiteral("a"), QStringLiteral("A"), Qt::black);
    addColor(QStringLiteral("b"), QStringLiteral("B"), Qt::white);
    addFloat(QStringLiteral("amount"), QStringLiteral("Amount"), 0.5, 0.0, 1.0);
    addOutput(QStringLiteral("result"), QStringLiteral("Result"), kColor);
}

KrInvertColorBrick::KrInvertColorBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Invert Color"), kColorCategory,
            QStringLiteral("White minus the colour: its complement."),
            QStringLiteral("result = color(1) - value;"));
    addColor(QStringLiteral("value"), QStringLiteral("Color"), Qt::black);
    addOutput(QStringLiteral("result"), QStringLiteral("Inverted"), kColor);
}

KrSplitColorBrick::KrSplitColorBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Split Color"), kColorCategory,
            QStringLiteral("The red, green and blue channels of a colour as three numbers."),
            QStringLiteral("r = comp(value, 0);\ng = comp(value, 1);\nb = comp(value, 2);"));
    addColor(QStringLiteral("value"), QStringLiteral("Color"), Qt::white);
    addOutput(QStringLiteral("r"), QStringLiteral("Red"), kFloat);
    addOutput(QStringLiteral("g"), QStringLiteral("Green"), kFloat);
    addOutput(QStringLiteral("b"), QStringLiteral("Blue"), kFloat);
}

KrCombineColorBrick::KrCombineColorBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Combine Color"), kColorCategory,
            QStringLiteral("A colour made of three numbers for red, green and blue."),
            QStringLiteral("result = color(r, g, b);"));
    addFloat(QStringLiteral("r"), QStringLiteral("Red"), 1.0, 0.0, kBig);
    addFloat(QStringLiteral("g"), QStringLiteral("Green"), 1.0, 0.0, kBig);
    addFloat(QStringLiteral("b"), QStringLiteral("Blue"), 1.0, 0.0, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
}

KrLuminanceBrick::KrLuminanceBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Luminance"), kColorCategory,
            QStringLiteral("The brightness of a colour as the eye weighs it (Rec. 709)."),
            QStringLiteral("result = 0.2126 * comp(value, 0) + 0.7152 * comp(value, 1) + "
                           "0.0722 * comp(value, 2);"));
    addColor(QStringLiteral("value"), QStringLiteral("Color"), Qt::white);
    addOutput(QStringLiteral("result"), QStringLiteral("Luminance"), kFloat);
}

KrColorCorrectBrick::KrColorCorrectBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Color Correct"), kColorCategory,
            QStringLiteral("A colour with its saturation changed, multiplied by Gain and "
                           "raised to one over Gamma."),
            QStringLiteral("float l = 0.2126 * comp(value, 0) + 0.7152 * comp(value, 1) + "
                           "0.0722 * comp(value, 2);\n"
                           "color c = mix(color(l), value, saturation) * gain;\n"
                           "result = pow(max(c, 0), 1 / max(gamma, 0.001));"));
    addColor(QStringLiteral("value"), QStringLiteral("Color"), Qt::white);
    addColor(QStringLiteral("gain"), QStringLiteral("Gain"), Qt::white);
    addFloat(QStringLiteral("saturation"), QStringLiteral("Saturation"), 1.0, 0.0, 10.0);
    addFloat(QStringLiteral("gamma"), QStringLiteral("Gamma"), 1.0, 0.01, 10.0, true);
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
}

// ---------------------------------------------------------------------------------- Pattern

KrNoiseBrick::KrNoiseBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Noise"), kPattern,
            QStringLiteral("Fractal Perlin noise over space: a sum of Octaves layers, each of "
                           "twice the frequency and half the weight of the one before."),
            QStringLiteral("float v = 0, w = 0.5;\npoint q = pos * scale;\n"
                           "for (int i = 0; i < octaves; i += 1) {\n"
                           "    v += w * noise(q); q *= 2; w *= 0.5;\n}\n"
                           "value = v;\nresult = color noise(pos * scale);"));
    addFloat(QStringLiteral("scale"), QStringLiteral("Scale"), 1.0, 0.0001, kBig);
    addInt(QStringLiteral("octaves"), QStringLiteral("Octaves"), 4, 1, 12, true);
    addExpression(QStringLiteral("pos"), QStringLiteral("Position"), kPoint, QStringLiteral("P"));
    addOutput(QStringLiteral("value"), QStringLiteral("Value"), kFloat);
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
}

KrCheckerBrick::KrCheckerBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Checker"), kPattern,
            QStringLiteral("A checkerboard of two colours over the texture coordinates, "
                           "Frequency squares to a unit."),
            QStringLiteral("float u = floor(xcomp(uv) * freq), v = floor(ycomp(uv) * freq);\n"
                           "result = mod(u + v, 2) == 0 ? color1 : color2;"));
    addColor(QStringLiteral("color1"), QStringLiteral("Color 1"), Qt::white);
    addColor(QStringLiteral("color2"), QStringLiteral("Color 2"), Qt::black);
    addFloat(QStringLiteral("freq"), QStringLiteral("Frequency"), 8.0, 0.0, kBig);
    addExpression(QStringLiteral("uv"), QStringLiteral("Coordinates"), kPoint,
                  QStringLiteral("point(s, t, 0)"));
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
}

KrGradientBrick::KrGradientBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Gradient"), kPattern,
            QStringLiteral("A ramp from Color 1 to Color 2 along u, along v or outwards from "
                           "the middle of the texture space."),
            QStringLiteral("float x = direction == 0 ? s : direction == 1 ? t : "
                           "clamp(2 * distance(point(s, t, 0), point(0.5, 0.5, 0)), 0, 1);\n"
                           "value = x;\nresult = mix(color1, color2, x);"));
    addColor(QStringLiteral("color1"), QStringLiteral("Color 1"), Qt::black);
    addColor(QStringLiteral("color2"), QStringLiteral("Color 2"), Qt::white);
    addEnum(QStringLiteral("direction"), QStringLiteral("Direction"),
            {QStringLiteral("U"), QStringLiteral("V"), QStringLiteral("Radial")}, 0);
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
    addOutput(QStringLiteral("value"), QStringLiteral("Position"), kFloat);
}

KrStripesBrick::KrStripesBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Stripes"), kPattern,
            QStringLiteral("Stripes across u: Color 1 for Width of each period, Color 2 for the "
                           "rest, Frequency periods to a unit."),
            QStringLiteral("result = mod(s * freq, 1) < width ? color1 : color2;"));
    addColor(QStringLiteral("color1"), QStringLiteral("Color 1"), Qt::white);
    addColor(QStringLiteral("color2"), QStringLiteral("Color 2"), Qt::black);
    addFloat(QStringLiteral("width"), QStringLiteral("Width"), 0.5, 0.0, 1.0);
    addFloat(QStringLiteral("freq"), QStringLiteral("Frequency"), 4.0, 0.0, kBig);
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
}

// --------------------------------------------------------------------------------- Geometry

KrNormalBrick::KrNormalBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Normal"), kGeometry,
            QStringLiteral("The shading normal of the point being shaded, of unit length, "
                           "turned towards the viewer when Face Forward is on."),
            QStringLiteral("result = forward ? faceforward(normalize(N), I) : normalize(N);"));
    addBool(QStringLiteral("forward"), QStringLiteral("Face Forward"), true, true);
    addOutput(QStringLiteral("result"), QStringLiteral("Normal"), kNormal);
}

KrPositionBrick::KrPositionBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Position"), kGeometry,
            QStringLiteral("The position of the point being shaded, in the chosen space."),
            QStringLiteral("result = transform({\"current\", \"object\", \"world\"}[space], P);"));
    addEnum(QStringLiteral("space"), QStringLiteral("Space"),
            {QStringLiteral("Current"), QStringLiteral("Object"), QStringLiteral("World")}, 0);
    addOutput(QStringLiteral("result"), QStringLiteral("Position"), kPoint);
}

KrTextureCoordinatesBrick::KrTextureCoordinatesBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Texture Coordinates"), kGeometry,
            QStringLiteral("The surface's texture coordinates s and t, repeated Tiling times."),
            QStringLiteral("s_out = s * tiling;\nt_out = t * tiling;\n"
                           "st = point(s_out, t_out, 0);"));
    addFloat(QStringLiteral("tiling"), QStringLiteral("Tiling"), 1.0, 0.0, kBig, true);
    addOutput(QStringLiteral("s_out"), QStringLiteral("S"), kFloat);
    addOutput(QStringLiteral("t_out"), QStringLiteral("T"), kFloat);
    addOutput(QStringLiteral("st"), QStringLiteral("ST"), kPoint);
}

KrBumpBrick::KrBumpBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Bump"), kGeometry,
            QStringLiteral("A normal bent as if the surface were raised by Height times Amount, "
                           "without moving it."),
            QStringLiteral("point p = P + normalize(nin) * height * amount;\n"
                           "result = normalize(calculatenormal(p));"));
    addFloat(QStringLiteral("height"), QStringLiteral("Height"), 0.0, -kBig, kBig);
    addFloat(QStringLiteral("amount"), QStringLiteral("Amount"), 1.0, -100.0, 100.0);
    addExpression(QStringLiteral("nin"), QStringLiteral("Normal"), kNormal, QStringLiteral("N"));
    addOutput(QStringLiteral("result"), QStringLiteral("Normal"), kNormal);
}

KrFacingRatioBrick::KrFacingRatioBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Facing Ratio"), kGeometry,
            QStringLiteral("How squarely the surface faces the viewer: 1 head-on, 0 at the "
                           "silhouette."),
            QStringLiteral("result = abs(normalize(nin) . normalize(-I));"));
    addExpression(QStringLiteral("nin"), QStringLiteral("Normal"), kNormal, QStringLiteral("N"));
    addOutput(QStringLiteral("result"), QStringLiteral("Ratio"), kFloat);
}

// --------------------------------------------------------------------------------- Lighting

KrFresnelBrick::KrFresnelBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Fresnel"), kLighting,
            QStringLiteral("The share of light a surface of this index of refraction reflects "
                           "and transmits at the viewing angle (Schlick's approximation)."),
            QStringLiteral("float r0 = ((1 - ior) / (1 + ior)) ^ 2;\n"
                           "float c = 1 - abs(normalize(nin) . normalize(-I));\n"
                           "kr = r0 + (1 - r0) * c ^ 5;\nkt = 1 - kr;"));
    addFloat(QStringLiteral("ior"), QStringLiteral("Index of Refraction"), 1.5, 1.0, 10.0);
    addExpression(QStringLiteral("nin"), QStringLiteral("Normal"), kNormal, QStringLiteral("N"));
    addOutput(QStringLiteral("kr"), QStringLiteral("Reflected"), kFloat);
    addOutput(QStringLiteral("kt"), QStringLiteral("Transmitted"), kFloat);
}

KrDiffuseBrick::KrDiffuseBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Diffuse"), kLighting,
            QStringLiteral("Lambert shading: the colour lit by every light in proportion to the "
                           "cosine between the light and the normal, times Amount."),
            QStringLiteral("result = Kd * Cd * diffuse(normalize(nin));"));
    addColor(QStringLiteral("Cd"), QStringLiteral("Color"), QColor(204, 204, 204));
    addFloat(QStringLiteral("Kd"), QStringLiteral("Amount"), 0.8, 0.0, 1.0);
    addExpression(QStringLiteral("nin"), QStringLiteral("Normal"), kNormal, QStringLiteral("N"));
    addOutput(QStringLiteral("result"), QStringLiteral("Diffuse"), kColor);
}

KrSpecularBrick::KrSpecularBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Specular"), kLighting,
            QStringLiteral("Highlights of the lights on a glossy surface (Blinn), tight for a "
                           "Glossiness near 1 and broad near 0, times Amount."),
            QStringLiteral("float roughness = max(1 - glossiness, 0.001);\n"
                           "result = Ks * Cs * specular(normalize(nin), -normalize(I), "
                           "roughness);"));
    addColor(QStringLiteral("Cs"), QStringLiteral("Color"), Qt::white);
    addFloat(QStringLiteral("Ks"), QStringLiteral("Amount"), 0.5, 0.0, 1.0);
    addFloat(QStringLiteral("glossiness"), QStringLiteral("Glossiness"), 0.5, 0.0, 1.0);
    addExpression(QStringLiteral("nin"), QStringLiteral("Normal"), kNormal, QStringLiteral("N"));
    addOutput(QStringLiteral("result"), QStringLiteral("Specular"), kColor);
}

KrAmbientBrick::KrAmbientBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Ambient"), kLighting,
            QStringLiteral("The colour lit by the scene's ambient light, times Amount."),
            QStringLiteral("result = Ka * Ca * ambient();"));
    addColor(QStringLiteral("Ca"), QStringLiteral("Color"), Qt::black);
    addFloat(QStringLiteral("Ka"), QStringLiteral("Amount"), 1.0, 0.0, 1.0);
    addOutput(QStringLiteral("result"), QStringLiteral("Ambient"), kColor);
}

KrReflectionBrick::KrReflectionBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Reflection"), kLighting,
            QStringLiteral("What the surface mirrors, traced along the reflected ray (Samples "
                           "rays spread by Blur), tinted by Color and times Amount."),
            QStringLiteral("vector R = reflect(normalize(I), normalize(nin));\n"
                           "result = Kr * Cr * trace(P, R, samples, blur);"));
    addColor(QStringLiteral("Cr"), QStringLiteral("Color"), Qt::white);
    addFloat(QStringLiteral("Kr"), QStringLiteral("Amount"), 0.0, 0.0, 1.0);
    addInt(QStringLiteral("samples"), QStringLiteral("Samples"), 1, 1, 256, true);
    addFloat(QStringLiteral("blur"), QStringLiteral("Blur"), 0.0, 0.0, 1.0, true);
    addExpression(QStringLiteral("nin"), QStringLiteral("Normal"), kNormal, QStringLiteral("N"));
    addOutput(QStringLiteral("result"), QStringLiteral("Reflection"), kColor);
}

KrRefractionBrick::KrRefractionBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Refraction"), kLighting,
            QStringLiteral("What shows through the surface, traced along the ray bent by the "
                           "index of refraction, tinted by Color and times Amount."),
            QStringLiteral("vector T = refract(normalize(I), normalize(nin), 1 / ior);\n"
                           "result = Kt * Ct * trace(P, T);"));
    addColor(QStringLiteral("Ct"), QStringLiteral("Color"), Qt::white);
    addFloat(QStringLiteral("Kt"), QStringLiteral("Amount"), 0.0, 0.0, 1.0);
    addFloat(QStringLiteral("ior"), QStringLiteral("Index of Refraction"), 1.5, 1.0, 10.0);
    addExpression(QStringLiteral("nin"), QStringLiteral("Normal"), kNormal, QStringLiteral("N"));
    addOutput(QStringLiteral("result"), QStringLiteral("Refraction"), kColor);
}

// ---------------------------------------------------------------------------------- Texture

KrImageTextureBrick::KrImageTextureBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Image Texture"), kTexture,
            QStringLiteral("The colour and alpha of an image file at the texture coordinates, "
                           "filtered and wrapped as the settings say; black without a file."),
            QStringLiteral("result = file == \"\" ? color(0) : color texture(file, xcomp(uv), "
                           "ycomp(uv), \"filter\", filter, \"wrap\", wrap);\n"
                           "alpha = file == \"\" ? 0 : float texture(file[3], xcomp(uv), "
                           "ycomp(uv));"));
    addString(QStringLiteral("file"), QStringLiteral("File"), QString());
    addExpression(QStringLiteral("uv"), QStringLiteral("Coordinates"), kPoint,
                  QStringLiteral("point(s, t, 0)"));
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
    addOutput(QStringLiteral("alpha"), QStringLiteral("Alpha"), kFloat);
    addLocalProperty(new KrEnumProperty(
        QStringLiteral("Filter"),
        {QStringLiteral("Box"), QStringLiteral("Gaussian"), QStringLiteral("Disk")}, 1));
    addLocalProperty(new KrEnumProperty(
        QStringLiteral("Wrap"),
        {QStringLiteral("Periodic"), QStringLiteral("Clamp"), QStringLiteral("Black")}, 0));
}

KrEnvironmentBrick::KrEnvironmentBrick(QObject* parent) : KrLibraryBrick(parent)
{
    setInfo(QStringLiteral("Environment"), kTexture,
            QStringLiteral("The colour an environment map shows in a direction (by default "
                           "the reflected view ray); black without a file."),
            QStringLiteral("result = file == \"\" ? color(0) : color environment(file, dir);"));
    addString(QStringLiteral("file"), QStringLiteral("File"), QString());
    addExpression(QStringLiteral("dir"), QStringLiteral("Direction"), kVector,
                  QStringLiteral("reflect(I, normalize(N))"));
    addOutput(QStringLiteral("result"), QStringLiteral("Color"), kColor);
}
