#include "PictureBox.h"

#include <QPainter>

namespace zelctl {

PictureBox::PictureBox(QWidget *parent)
    : QWidget(parent)
    , m_backColor(platform::systemColor(platform::COLOR_BTNFACE))
{ }

void PictureBox::setBackColor(platform::OleColor color)
{
    if (m_backColor == color)
        return;
    m_backColor = color;
    Cls();
}

void PictureBox::setPicture(const zelctl::Picture &picture)
{
    m_picture = picture;
    Cls();
}

void PictureBox::Cls()
{
    m_image = QImage(size().expandedTo(m_image.size()).expandedTo(QSize(1, 1)), QImage::Format_RGB32);
    m_image.fill(platform::toQColor(m_backColor));
    if (!m_picture.isNull()) {
        QPainter painter(&m_image);
        painter.drawImage(QPoint(0, 0), m_picture.image());
    }
    update();
}

QImage &PictureBox::Image()
{
    if (m_image.isNull())
        Cls();
    return m_image;
}

void PictureBox::reserveImage(QSize size)
{
    const QSize needed = Image().size().expandedTo(size);
    if (needed == m_image.size())
        return;
    QImage grown(needed, QImage::Format_RGB32);
    grown.fill(platform::toQColor(m_backColor));
    QPainter(&grown).drawImage(QPoint(0, 0), m_image);
    m_image = grown;
}

void PictureBox::paintEvent(QPaintEvent *)
{
    QPainter(this).drawImage(QPoint(0, 0), Image());
}

void PictureBox::resizeEvent(QResizeEvent *event)
{
    QWidget::resizeEvent(event);
    reserveImage(size());
}

} // namespace zelctl
