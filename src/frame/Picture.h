#pragma once

#include "zelctl_export.h"

#include <QImage>
#include <QPixmap>
#include <QString>

namespace zelctl {

// A loaded picture, as the public interfaces pass pictures: a value over a QImage. A null
// picture stands for "nothing".
class ZELCTL_EXPORT Picture
{
public:
    Picture() = default;
    explicit Picture(QImage image);

    // Loads any format Qt reads (GIF, PNG, BMP ...); a null picture when it cannot.
    static Picture fromFile(const QString &path);
    static Picture fromData(const QByteArray &data);

    bool isNull() const { return m_image.isNull(); }
    const QImage &image() const { return m_image; }
    QPixmap pixmap() const { return QPixmap::fromImage(m_image); }
    // Size in pixels.
    int width() const { return m_image.width(); }
    int height() const { return m_image.height(); }

    bool operator==(const Picture &other) const { return m_image == other.m_image; }

private:
    QImage m_image;
};

} // namespace zelctl
