#pragma once

#include <QImage>

namespace zelctl::test {

// How a drawn picture differs from the one it should be.
struct PictureDifference
{
    bool sameSize = true;
    // Pixels where some colour channel differs by more than the tolerance, and the largest
    // difference of a channel anywhere.
    int pixels = 0;
    int largest = 0;
    // The expected picture faded to grey, with every differing pixel in red; for pictures of
    // different sizes, both side by side.
    QImage picture;

    bool matches() const { return sameSize && pixels == 0; }
};

PictureDifference comparePictures(const QImage &actual, const QImage &expected, int tolerance);

} // namespace zelctl::test
