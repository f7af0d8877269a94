// Megapixels per second of the raster layer's blits on 1920 × 1080 targets, each beside
// QPainter doing the same work on the same sizes (drawImage with the matching composition
// mode). Compare the "MP/s" counters of each Gdi_ / QPainter_ pair. Times are wall-clock
// times, because QPainter spreads some of its work over threads.

#include "platform/gdi/Gdi.h"

#include <QImage>
#include <QPainter>

#include <benchmark/benchmark.h>

#include <cstring>
#include <random>

using namespace zelctl::gdi;

namespace {

constexpr int Width = 1920;
constexpr int Height = 1080;
// Stretches enlarge 1280 × 720 to the full target.
constexpr int SmallWidth = 1280;
constexpr int SmallHeight = 720;

// Premultiplied pixels with random alpha, or opaque random colours.
void fillRandom(uchar *bits, qsizetype stride, int width, int height, int bpp, bool premultiplied)
{
    std::mt19937 random(42);
    for (int y = 0; y < height; ++y) {
        uchar *row = bits + y * stride;
        for (int x = 0; x < width; ++x) {
            const quint32 v = random();
            if (bpp == 32) {
                const quint32 a = premultiplied ? v >> 24 : 255;
                const quint32 pixel = a << 24 | ((v >> 16 & 0xFF) * a / 255) << 16 | ((v >> 8 & 0xFF) * a / 255) << 8
                    | ((v & 0xFF) * a / 255);
                std::memcpy(row + 4 * x, &pixel, 4);
            } else if (bpp == 24) {
                std::memcpy(row + 3 * x, &v, 3);
            } else {
                row[x] = uchar(v);
            }
        }
    }
}

// A DIB section in its own DC, with the same pixels in a QImage for QPainter.
struct Pair
{
    Pair(int width, int height, int bpp, bool premultiplied = false)
    {
        BITMAPINFO info;
        info.bmiHeader.biWidth = width;
        info.bmiHeader.biHeight = -height;
        info.bmiHeader.biBitCount = quint16(bpp);
        std::mt19937 random(7);
        for (auto &entry : info.bmiColors)
            entry = rgbQuad(random() & 0xFFFFFF);
        void *bits = nullptr;
        bitmap = CreateDIBSection(0, &info, DIB_RGB_COLORS, &bits);
        dc = CreateCompatibleDC(0);
        previous = SelectObject(dc, bitmap);
        BITMAP description;
        GetObject(bitmap, description);
        fillRandom(static_cast<uchar *>(bits), description.bmWidthBytes, width, height, bpp, premultiplied);

        const QImage::Format format = bpp == 32
            ? (premultiplied ? QImage::Format_ARGB32_Premultiplied : QImage::Format_RGB32)
            : bpp == 24 ? QImage::Format_BGR888
                        : QImage::Format_Indexed8;
        image = QImage(static_cast<const uchar *>(bits), width, height, description.bmWidthBytes, format).copy();
        if (bpp == 8) {
            QList<QRgb> table;
            for (const auto &entry : info.bmiColors)
                table << qRgb(entry.rgbRed, entry.rgbGreen, entry.rgbBlue);
            image.setColorTable(table);
        }
    }
    ~Pair()
    {
        SelectObject(dc, previous);
        DeleteObject(bitmap);
        DeleteDC(dc);
    }
    HDC dc = 0;
    HBITMAP bitmap = 0;
    HGDIOBJ previous = 0;
    QImage image;
};

void countPixels(benchmark::State &state)
{
    state.counters["MP/s"]
        = benchmark::Counter(double(state.iterations()) * Width * Height / 1e6, benchmark::Counter::kIsRate);
}

void gdiBlit(benchmark::State &state, int srcBpp, int dstBpp, quint32 rop)
{
    Pair src(Width, Height, srcBpp);
    Pair dst(Width, Height, dstBpp);
    for (auto _ : state)
        benchmark::DoNotOptimize(BitBlt(dst.dc, 0, 0, Width, Height, src.dc, 0, 0, rop));
    countPixels(state);
}

void painterBlit(benchmark::State &state, int srcBpp, int dstBpp, QPainter::CompositionMode mode)
{
    Pair src(Width, Height, srcBpp);
    Pair dst(Width, Height, dstBpp);
    QPainter painter(&dst.image);
    painter.setCompositionMode(mode);
    for (auto _ : state)
        painter.drawImage(0, 0, src.image);
    countPixels(state);
}

void gdiStretch(benchmark::State &state, int mode)
{
    Pair src(SmallWidth, SmallHeight, 32);
    Pair dst(Width, Height, 32);
    SetStretchBltMode(dst.dc, mode);
    for (auto _ : state)
        benchmark::DoNotOptimize(
            StretchBlt(dst.dc, 0, 0, Width, Height, src.dc, 0, 0, SmallWidth, SmallHeight, SRCCOPY));
    countPixels(state);
}

void painterStretch(benchmark::State &state, bool smooth)
{
    Pair src(SmallWidth, SmallHeight, 32);
    Pair dst(Width, Height, 32);
    QPainter painter(&dst.image);
    painter.setCompositionMode(QPainter::CompositionMode_Source);
    painter.setRenderHint(QPainter::SmoothPixmapTransform, smooth);
    for (auto _ : state)
        painter.drawImage(QRect(0, 0, Width, Height), src.image);
    countPixels(state);
}

void gdiAlpha(benchmark::State &state, quint8 constant)
{
    Pair src(Width, Height, 32, true);
    Pair dst(Width, Height, 32, true);
    BLENDFUNCTION blend;
    blend.SourceConstantAlpha = constant;
    blend.AlphaFormat = AC_SRC_ALPHA;
    for (auto _ : state)
        benchmark::DoNotOptimize(AlphaBlend(dst.dc, 0, 0, Width, Height, src.dc, 0, 0, Width, Height, blend));
    countPixels(state);
}

void painterAlpha(benchmark::State &state, quint8 constant)
{
    Pair src(Width, Height, 32, true);
    Pair dst(Width, Height, 32, true);
    QPainter painter(&dst.image);
    painter.setOpacity(constant / 255.0);
    for (auto _ : state)
        painter.drawImage(0, 0, src.image);
    countPixels(state);
}

// The arrow box of a sub-menu item a host stretched to 4 × 60000 pixels: long pen lines,
// nearly all of them beside the narrow target.
void gdiLinesBesideTheTarget(benchmark::State &state)
{
    Pair dst(4, 60000, 32);
    for (auto _ : state) {
        for (int i = 0; i < 30000; i += 8) {
            MoveToEx(dst.dc, i, i, nullptr);
            LineTo(dst.dc, i, 60000 - i);
        }
    }
}

// The disc of a number badge a host made 3000 pixels wide.
void gdiLargeDot(benchmark::State &state)
{
    Pair dst(3000, 3000, 32);
    const HPEN pen = CreatePen(PS_SOLID, 2999, 0x404040);
    SelectObject(dst.dc, pen);
    for (auto _ : state)
        benchmark::DoNotOptimize(PSet(dst.dc, 1500, 1500, 0x404040));
    SelectObject(dst.dc, GetStockObject(BLACK_PEN));
    DeleteObject(pen);
}

} // namespace

BENCHMARK(gdiLinesBesideTheTarget)->Name("Gdi_LinesBesideTheTarget")->Unit(benchmark::kMillisecond);
BENCHMARK(gdiLargeDot)->Name("Gdi_LargeDot")->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(gdiBlit, Copy, 32, 32, SRCCOPY)->Name("Gdi_Copy")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(painterBlit, Copy, 32, 32, QPainter::CompositionMode_Source)
    ->Name("QPainter_Copy")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiBlit, And, 32, 32, SRCAND)->Name("Gdi_And")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(painterBlit, And, 32, 32, QPainter::RasterOp_SourceAndDestination)
    ->Name("QPainter_And")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiBlit, Or, 32, 32, SRCPAINT)->Name("Gdi_Or")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(painterBlit, Or, 32, 32, QPainter::RasterOp_SourceOrDestination)
    ->Name("QPainter_Or")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiBlit, Copy24, 24, 24, SRCCOPY)->Name("Gdi_Copy24")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(painterBlit, Copy24, 24, 24, QPainter::CompositionMode_Source)
    ->Name("QPainter_Copy24")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiBlit, Convert8To24, 8, 24, SRCCOPY)
    ->Name("Gdi_8to24")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(painterBlit, Convert8To24, 8, 24, QPainter::CompositionMode_Source)
    ->Name("QPainter_8to24")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiStretch, Nearest, COLORONCOLOR)
    ->Name("Gdi_StretchNearest")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(painterStretch, Nearest, false)
    ->Name("QPainter_StretchNearest")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiStretch, Halftone, HALFTONE)
    ->Name("Gdi_StretchHalftone")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(painterStretch, Smooth, true)
    ->Name("QPainter_StretchSmooth")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiAlpha, PerPixel, 255)->Name("Gdi_AlphaBlend")->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK_CAPTURE(painterAlpha, PerPixel, 255)
    ->Name("QPainter_AlphaBlend")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(gdiAlpha, Constant128, 128)
    ->Name("Gdi_AlphaBlendConstant")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();
BENCHMARK_CAPTURE(painterAlpha, Constant128, 128)
    ->Name("QPainter_AlphaBlendConstant")
    ->Unit(benchmark::kMillisecond)
    ->UseRealTime();

BENCHMARK_MAIN();
