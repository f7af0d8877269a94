#include "GdiTestSupport.h"

#include "platform/gdi/PersistentSurface.h"
#include "platform/gdi/Pictures.h"

#include <gtest/gtest.h>

using namespace zelctl::gdi;
using namespace zelctl::gdi::test;

TEST(Pictures, becomeBitmapsAndBack)
{
    QImage withAlpha(2, 1, QImage::Format_ARGB32);
    withAlpha.setPixel(0, 0, qRgba(255, 0, 0, 255));
    withAlpha.setPixel(1, 0, qRgba(200, 100, 50, 128));
    QImage opaque(3, 2, QImage::Format_RGB32);
    opaque.fill(qRgb(1, 2, 3));
    opaque.setPixel(2, 1, qRgb(7, 8, 9));
    // With alpha: 32 bits, premultiplied; without: 24 bits.
    for (const auto &[image, back] :
        { std::pair { withAlpha, withAlpha.convertToFormat(QImage::Format_ARGB32_Premultiplied) },
            { opaque, opaque } }) {
        const HBITMAP bitmap = createBitmapFromImage(image);
        DIBSECTION section;
        ASSERT_TRUE(GetObject(bitmap, section));
        EXPECT_EQ(section.dsBm.bmBitsPixel, image.hasAlphaChannel() ? 32 : 24);
        EXPECT_LT(section.dsBmih.biHeight, 0);
        EXPECT_EQ(static_cast<const uchar *>(section.dsBm.bmBits)[0], qBlue(back.pixel(0, 0)));
        EXPECT_EQ(imageFromBitmap(bitmap), back);
        DeleteObject(bitmap);
    }

    EXPECT_EQ(createBitmapFromImage(QImage()), 0);
    EXPECT_TRUE(imageFromBitmap(0).isNull());
}

TEST(Pictures, drawStretchedLeavingTransparentPixelsAlone)
{
    QImage sprite(2, 1, QImage::Format_ARGB32);
    sprite.setPixel(0, 0, qRgba(0x80, 0x80, 0x80, 255));
    sprite.setPixel(1, 0, qRgba(0, 0, 0, 0));
    TestBitmap b(4, 1, 24);
    for (quint32 rop : { SRCCOPY, SRCAND, SRCPAINT }) {
        b.fill(0x00F0F0);
        ASSERT_TRUE(drawPicture(b.dc, sprite, 0, 0, 4, 1, rop));
        const quint32 inked = rop == SRCCOPY ? 0x808080 : rop == SRCAND ? 0x008080 : 0x80F0F0;
        for (int x = 0; x < 4; ++x)
            EXPECT_EQ(b.value(x, 0), x < 2 ? inked : 0x00F0F0) << rop << " at " << x;
    }
    EXPECT_FALSE(drawPicture(b.dc, sprite, 0, 0, 4, 1, 0x00660046));
    EXPECT_FALSE(drawPicture(b.dc, QImage(), 0, 0, 4, 1));
    EXPECT_FALSE(drawPicture(b.bitmap, sprite, 0, 0, 4, 1));
}

TEST(PersistentSurface, showsWhatWasDrawnAndKeepsItAcrossResizes)
{
    SurfaceWidget widget;
    widget.resize(20, 10);
    PersistentSurface &surface = widget.surface();
    const HDC dc = surface.hdc();
    surface.clear(0x0000FF);
    const HBRUSH blue = CreateSolidBrush(0xFF0000);
    FillRect(dc, RECT { 1, 1, 3, 3 }, blue);
    DeleteObject(blue);
    EXPECT_EQ(widget.grab().toImage().pixel(2, 2), qRgb(0, 0, 255));
    EXPECT_EQ(widget.grab().toImage().pixel(5, 5), qRgb(255, 0, 0));

    widget.resize(30, 12);
    EXPECT_EQ(surface.hdc(), dc) << "the DC outlives resizes";
    EXPECT_EQ(GetPixel(dc, 2, 2), 0xFF0000u) << "kept";
    EXPECT_EQ(GetPixel(dc, 25, 11), 0x0000FFu) << "new area in the background colour";

    // Masking by colour: only the blue square stays, for the eye and the pointer.
    surface.setMaskColor(0x0000FF);
    EXPECT_EQ(widget.mask(), QRegion(1, 1, 2, 2));
    surface.clear(0x0000FF);
    surface.setMaskColor(0x0000FF);
    EXPECT_FALSE(widget.mask().isEmpty()) << "all transparent still hides everything";
    EXPECT_FALSE(widget.mask().contains(QPoint(0, 0)));
    surface.clearMask();
    EXPECT_TRUE(widget.mask().isEmpty());
    widget.resize(0, 0);
    EXPECT_EQ(surface.size(), QSize(1, 1));
}
