#pragma once

#include <QStringList>
#include <QWidget>
#include <memory>

class QComboBox;
class QLineEdit;

// A row of suggestions above the value being edited: choosing a suggestion copies it into the
// line edit, where it can be changed further. Suggestions are offered whole, never split.
class KrPathSelectionWgt : public QWidget
{
    Q_OBJECT
public:
    KrPathSelectionWgt(QWidget* parent, const QString& label, const QString& defaultsLabel,
                       const QString& name);
    ~KrPathSelectionWgt() override;

    // Replaces the suggestions; a non-empty list also puts its first entry into the edit.
    void setDefaults(const QStringList& defaults);
    // Sets the value and selects all of it, so typing replaces it.
    void setPathText(const QString& text);
    QString getPathText() const;

    QComboBox* getCombo() const;
    QLineEdit* getEdit() const;

private:
    struct Private;
    std::unique_ptr<Private> d;
};
