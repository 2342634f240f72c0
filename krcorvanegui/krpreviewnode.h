#pragma once

#include <QPushButton>
#include <memory>

// The square button above a brick that will show a rendered preview of the brick's result.
// It keeps the preview's place in the brick item; until a renderer is attached it shows the
// text "Preview..." and draws no picture.
class KrPreviewButton : public QPushButton
{
    Q_OBJECT
public:
    explicit KrPreviewButton(QWidget* parent = nullptr);
    ~KrPreviewButton() override;

signals:
    void sizeChanged();

public slots:
    // Side of the preview picture in pixels (default 128); the button is 5 pixels larger.
    void setSize(int size);
    int getSize() const;
    int getItemSize() const;
    // Removes the picture and asks for a click.
    void clearIcon();

private:
    struct Private;
    std::unique_ptr<Private> d;
};
