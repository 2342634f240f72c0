#pragma once

#include "krpropertywgt.h"

#include <QColor>

class QAbstractSlider;
class QCheckBox;
class QComboBox;
class QDoubleSpinBox;
class QLineEdit;
class QSlider;
class QSpinBox;
class QToolButton;

// The editors of the property kinds. Each is made by name through its class factory.

// A spin box, plus a slider when the property has a range.
class KRCORE_EXPORT KrIntPropertyWgt : public KrBasicPropertyWgt
{
    Q_OBJECT
public:
    explicit KrIntPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrIntPropertyWgt() override;

    QSpinBox* spinBox() const;
    QSlider* slider() const; // hidden without a range

protected:
    void updateEditor() override;
    void updateEditorState() override;

private:
    struct Private;
    std::unique_ptr<Private> d;
};

// A spin box with the property's decimals and step, plus a slider when it has a range.
class KRCORE_EXPORT KrFloatPropertyWgt : public KrBasicPropertyWgt
{
    Q_OBJECT
public:
    explicit KrFloatPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrFloatPropertyWgt() override;

    QDoubleSpinBox* spinBox() const;
    QSlider* slider() const; // hidden without a range
    static constexpr int SliderSteps = 1000;

protected:
    void updateEditor() override;
    void updateEditorState() override;

private:
    struct Private;
    std::unique_ptr<Private> d;
};

class KRCORE_EXPORT KrBoolPropertyWgt : public KrBasicPropertyWgt
{
    Q_OBJECT
public:
    explicit KrBoolPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrBoolPropertyWgt() override;

    QCheckBox* checkBox() const;

protected:
    void updateEditor() override;
    void updateEditorState() override;

private:
    QCheckBox* m_check;
};

// A line edit; the text is taken when editing finishes, Escape goes back to the value.
class KRCORE_EXPORT KrStringPropertyWgt : public KrBasicPropertyWgt
{
    Q_OBJECT
public:
    explicit KrStringPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrStringPropertyWgt() override;

    QLineEdit* lineEdit() const;

protected:
    void updateEditor() override;
    void updateEditorState() override;
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    void commit();
    QLineEdit* m_edit;
};

// A colour swatch button that opens a colour dialog over the host's main window.
class KRCORE_EXPORT KrColorPropertyWgt : public KrBasicPropertyWgt
{
    Q_OBJECT
public:
    explicit KrColorPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrColorPropertyWgt() override;

    QToolButton* colorButton() const;

public slots:
    // Runs the colour dialog; the chosen colour becomes one undo step.
    void chooseColor();

protected:
    void updateEditor() override;
    void updateEditorState() override;

private:
    QToolButton* m_button;
    QColor m_color;
};

class KRCORE_EXPORT KrEnumPropertyWgt : public KrBasicPropertyWgt
{
    Q_OBJECT
public:
    explicit KrEnumPropertyWgt(QWidget* parent = nullptr, const QString& name = QString());
    ~KrEnumPropertyWgt() override;

    QComboBox* comboBox() const;

protected:
    void updateEditor() override;
    void updateEditorState() override;

private:
    QComboBox* m_combo;
};
