#include "krpreviewnode.h"

#include <QIcon>
#include <QLayout>

namespace {
const int kDefaultSize = 128;
const int kBorder = 5;
} // namespace

struct KrPreviewButton::Private
{
    int size = kDefaultSize;
};

KrPreviewButton::KrPreviewButton(QWidget* parent) : QPushButton(parent), d(new Private)
{
    setSize(kDefaultSize);
}

KrPreviewButton::~KrPreviewButton() = default;

void KrPreviewButton::setSize(int size)
{
    size = qMax(1, size);
    setFixedSize(size + kBorder, size + kBorder);
    d->size = size;
    setIconSize(QSize(size, size));
    // The old picture no longer fits.
    setIcon(QIcon());
    setText(QStringLiteral("Preview..."));
    update();
    resize(minimumSize());
    if (QWidget* parent = parentWidget()) {
        if (QLayout* layout = parent->layout())
            layout->invalidate();
    }
    emit sizeChanged();
}

int KrPreviewButton::getSize() const
{
    return d->size;
}

int KrPreviewButton::getItemSize() const
{
    return d->size + kBorder;
}

void KrPreviewButton::clearIcon()
{
    setIcon(QIcon());
    setText(QStringLiteral("Click to preview"));
}
