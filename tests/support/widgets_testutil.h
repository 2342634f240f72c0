#pragma once

#include <QColor>
#include <QImage>
#include <QPoint>
#include <functional>

class QWidget;

// Helpers for the widget tests.

// Sends a mouse move with buttons held straight to widget (QTest's move only warps the cursor).
void krWidgetsMouseMove(QWidget* widget, const QPoint& pos,
                        Qt::MouseButtons buttons = Qt::LeftButton);

// Pixels of image within tolerance (per channel) of color.
int krWidgetsCountPixels(const QImage& image, const QColor& color, int tolerance = 0);

// Runs action on the next modal widget (a dialog run with exec()) once it is up; gives up
// after timeoutMs. Call before the code that opens the dialog.
void krWidgetsWhenModal(const std::function<void(QWidget*)>& action, int timeoutMs = 5000);
