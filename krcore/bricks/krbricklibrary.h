#pragma once

#include "krcore_global.h"
#include "krbrickparam.h"
#include "krshaderbrick.h"

#include <QColor>
#include <QStringList>

class KrPropertyParam;

// The shader bricks krcore offers. Each kind is a class with a class factory providing
// "KrShaderBrick"; its preferred name, category, description and shader code are set by its
// constructor.
class KRCORE_EXPORT KrLibraryBrick : public KrShaderBrick
{
    Q_OBJECT
public:
    explicit KrLibraryBrick(QObject* parent = nullptr);
    ~KrLibraryBrick() override;

    int type() const override { return m_type; }
    QString getPreferredName() const override;
    QString getDefaultCategory() const override { return m_category; }
    QString getDescription() const override { return m_description; }
    QString getShaderCode() const override { return m_code; }

protected:
    void setInfo(const QString& name, const QString& category, const QString& description,
                 const QString& code, int type = 0);
    // Inputs holding their value in a property named like the label.
    KrPropertyParam* addFloat(const QString& arg, const QString& label, double value,
                              double minimum, double maximum, bool advanced = false);
    KrPropertyParam* addColor(const QString& arg, const QString& label, const QColor& value,
                              bool advanced = false);
    KrPropertyParam* addInt(const QString& arg, const QString& label, int value, int minimum,
                            int maximum, bool advanced = false);
    KrPropertyParam* addString(const QString& arg, const QString& label, const QString& value,
                               bool advanced = false);
    KrPropertyParam* addBool(const QString& arg, const QString& label, bool value,
                             bool advanced = false);
    // A constant input: a choice that shapes the code, never wired.
    KrPropertyParam* addEnum(const QString& arg, const QString& label, const QStringList& items,
                             int index, bool advanced = false);
    // An input without a value of its own; unwired it takes the expression ("N", "P").
    KrBrickParam* addExpression(const QString& arg, const QString& label, const QString& type,
                                const QString& expression, bool advanced = true);
    KrBrickParam* addOutput(const QString& arg, const QString& label, const QString& type,
                            KrBrickParam::Direction direction = KrBrickParam::Output);

private:
    KrPropertyParam* addProperty(const QString& arg, const QString& label, const QString& type,
                                 KrProperty* property, bool advanced,
                                 KrBrickParam::Direction direction = KrBrickParam::Input);

    int m_type = 0;
    QString m_name;
    QString m_category;
    QString m_description;
    QString m_code;
};

// A brick whose inputs are a list the user lengthens with the brick action "Add Input" and
// shortens with "Remove Input" (never below two).
class KRCORE_EXPORT KrAddInputsBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    static constexpr int s_minInputs = 2;
    static constexpr int s_maxInputs = 32;

    KrAddInputsBrick(const QString& valueType, QObject* parent = nullptr);

    QStringList getBrickActionList() const override;
    bool executeBrickAction(const QString& action) override;
    void writeBrickState(KrSettings* state) const override;
    bool readBrickState(const KrSettings* state) override;
    QString getShaderCode() const override;

    int getNumInputs() const { return m_inputs; }
    bool addInput();
    bool removeInput();

private:
    QString m_valueType;
    int m_inputs = 0;
};

class KRCORE_EXPORT KrSurfaceBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrSurfaceBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrLightBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrLightBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrFloatConstantBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrFloatConstantBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrAddBrick : public KrAddInputsBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrAddBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrSubtractBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrSubtractBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrMultiplyBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrMultiplyBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrDivideBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrDivideBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrPowerBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrPowerBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrMixBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrMixBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrClampBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrClampBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrInvertBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrInvertBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrSmoothstepBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrSmoothstepBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrColorConstantBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrColorConstantBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrAddColorsBrick : public KrAddInputsBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrAddColorsBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrMultiplyColorsBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrMultiplyColorsBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrMixColorsBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrMixColorsBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrInvertColorBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrInvertColorBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrSplitColorBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrSplitColorBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrCombineColorBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrCombineColorBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrLuminanceBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrLuminanceBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrColorCorrectBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrColorCorrectBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrNoiseBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrNoiseBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrCheckerBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrCheckerBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrGradientBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrGradientBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrStripesBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrStripesBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrNormalBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrNormalBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrPositionBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrPositionBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrTextureCoordinatesBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrTextureCoordinatesBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrBumpBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrBumpBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrFacingRatioBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrFacingRatioBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrFresnelBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrFresnelBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrDiffuseBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrDiffuseBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrSpecularBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrSpecularBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrAmbientBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrAmbientBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrReflectionBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrReflectionBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrRefractionBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrRefractionBrick(QObject* parent = nullptr);
};
class KRCORE_EXPORT KrImageTextureBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrImageTextureBrick(QObject* parent = nullptr);
    bool shouldSeperateLocalProperties() const override { return true; }
};
class KRCORE_EXPORT KrEnvironmentBrick : public KrLibraryBrick
{
    Q_OBJECT
public:
    Q_INVOKABLE explicit KrEnvironmentBrick(QObject* parent = nullptr);
};
