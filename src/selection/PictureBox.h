#pragma once

#include "zelctl_export.h"

#include "frame/Picture.h"
#include "platform/OleColor.h"

#include <QImage>
#include <QWidget>

namespace zelctl {

// A picture box: a surface in pixels that keeps what is drawn on it in a backing image
// and shows that image. Cls() resets the image to the background colour with the picture
// on it; setting the picture does the same.
class ZELCTL_EXPORT PictureBox : public QWidget
{
    Q_OBJECT
    Q_PROPERTY(quint32 BackColor READ BackColor WRITE setBackColor)
    Q_PROPERTY(zelctl::Picture Picture READ Picture WRITE setPicture)

public:
    explicit PictureBox(QWidget *parent = nullptr);

    platform::OleColor BackColor() const { return m_backColor; }
    void setBackColor(platform::OleColor color);

    zelctl::Picture Picture() const { return m_picture; }
    void setPicture(const zelctl::Picture &picture);

    // Clears what was drawn: the background colour, then the picture at the origin.
    Q_INVOKABLE void Cls();

    // The backing image that drawing goes to; at least as large as the box.
    QImage &Image();
    // Grows the backing image so drawing up to that size is kept, even beyond the box.
    void reserveImage(QSize size);

protected:
    void paintEvent(QPaintEvent *event) override;
    void resizeEvent(QResizeEvent *event) override;

private:
    platform::OleColor m_backColor;
    zelctl::Picture m_picture;
    QImage m_image;
};

} // namespace zelctl
