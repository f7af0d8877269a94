#include "PictureDiff.h"

#include <QPainter>

#include <algorithm>
#include <cstdlib>

namespace zelctl::test {

namespace {

QRgb faded(QRgb pixel)
{
    const int grey = qGray(pixel) / 3 + 170;
    return qRgb(grey, grey, grey);
}

} // namespace

PictureDifference comparePictures(const QImage &actualImage, const QImage &expectedImage, int tolerance)
{
    const QImage actual = actualImage.convertToFormat(QImage::Format_RGB32);
    const QImage expected = expectedImage.convertToFormat(QImage::Format_RGB32);
    PictureDifference difference;
    if (actual.size() != expected.size()) {
        difference.sameSize = false;
        difference.picture = QImage(
            expected.width() + 8 + actual.width(), std::max(expected.height(), actual.height()), QImage::Format_RGB32);
        difference.picture.fill(Qt::red);
        QPainter painter(&difference.picture);
        painter.drawImage(0, 0, expected);
        painter.drawImage(expected.width() + 8, 0, actual);
        return difference;
    }
    difference.picture = QImage(expected.size(), QImage::Format_RGB32);
    for (int y = 0; y < expected.height(); ++y) {
        const auto *a = reinterpret_cast<const QRgb *>(actual.constScanLine(y));
        const auto *e = reinterpret_cast<const QRgb *>(expected.constScanLine(y));
        auto *out = reinterpret_cast<QRgb *>(difference.picture.scanLine(y));
        for (int x = 0; x < expected.width(); ++x) {
            const int channel = std::max({ std::abs(qRed(a[x]) - qRed(e[x])), std::abs(qGreen(a[x]) - qGreen(e[x])),
                std::abs(qBlue(a[x]) - qBlue(e[x])) });
            difference.largest = std::max(difference.largest, channel);
            const bool differs = channel > tolerance;
            difference.pixels += differs;
            out[x] = differs ? qRgb(255, 0, 0) : faded(e[x]);
        }
    }
    return difference;
}

} // namespace zelctl::test
