#include "ShapeWidget.h"

#include <QPainter>

namespace zelctl {

ShapeWidget::ShapeWidget(QWidget *parent)
    : QWidget(parent)
{
    setAttribute(Qt::WA_TransparentForMouseEvents);
    setAttribute(Qt::WA_NoSystemBackground);
}

void ShapeWidget::setBorderColor(platform::OleColor color)
{
    if (color == m_borderColor)
        return;
    m_borderColor = color;
    update();
}

void ShapeWidget::setBorderWidth(int width)
{
    width = std::max(width, 1);
    if (width == m_borderWidth)
        return;
    m_borderWidth = width;
    update();
}

void ShapeWidget::paintEvent(QPaintEvent *event)
{
    Q_UNUSED(event)
    QPainter painter(this);
    const QColor colour = platform::toQColor(m_borderColor);
    // Filled bands rather than a pen, so the outline stays inside the widget at any width.
    const QRect r = rect();
    const int w = std::min({ m_borderWidth, r.width(), r.height() });
    painter.fillRect(QRect(r.left(), r.top(), r.width(), w), colour);
    painter.fillRect(QRect(r.left(), r.bottom() - w + 1, r.width(), w), colour);
    painter.fillRect(QRect(r.left(), r.top(), w, r.height()), colour);
    painter.fillRect(QRect(r.right() - w + 1, r.top(), w, r.height()), colour);
}

} // namespace zelctl
