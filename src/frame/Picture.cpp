#include "Picture.h"

#include <QBuffer>
#include <QImageReader>

namespace zelctl {

Picture::Picture(QImage image)
    : m_image(std::move(image))
{ }

Picture Picture::fromFile(const QString &path)
{
    QImageReader reader(path);
    return Picture(reader.read());
}

Picture Picture::fromData(const QByteArray &data)
{
    QBuffer buffer;
    buffer.setData(data);
    QImageReader reader(&buffer);
    return Picture(reader.read());
}

} // namespace zelctl
