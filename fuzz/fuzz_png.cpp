// Feeds arbitrary bytes to StdPNG's loader, with a progressive target so the display paths
// run too, then paints the result: any outcome but a crash, a sanitizer report or a hang is
// fine. Then decodes the same bytes twice with the decoder alone, inflated at once with the
// vector kernels and streamed with the per-pixel rules: the two must agree on whether the
// image decodes and, when it does, on every byte of the bitmap and every event.

#include "platform/gdi/Gdi.h"
#include "png/PngChunkReader.h"
#include "png/PngConverter.h"
#include "png/PngDecoder.h"
#include "png/PngImageStream.h"
#include "png/StdPNG.h"

#include <QByteArray>

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <vector>

namespace {

using namespace zelctl;

// A 32-bit surface that outlives every input. Window 1 names no window, so repaints are
// skipped while the display still runs.
struct Target
{
    Target()
    {
        gdi::BITMAPINFO info;
        info.bmiHeader.biWidth = 48;
        info.bmiHeader.biHeight = -48;
        info.bmiHeader.biBitCount = 32;
        dc = gdi::CreateCompatibleDC(0);
        gdi::SelectObject(dc, gdi::CreateDIBSection(0, &info, gdi::DIB_RGB_COLORS, nullptr));
    }
    qint32 dc = 0;
    qint32 window = 1;
};

struct Decoded
{
    bool ok = false;
    std::vector<uint8_t> bits;
    std::vector<int> events;
};

Decoded decode(const png::Header &header, const png::FileInfo &info, const png::DecodeOptions &options,
    const png::ReadResult &read, png::ImageStream::Mode mode, png::Simd simd)
{
    const int bitCount = png::outputBitCount(header, info, options);
    const qsizetype stride = png::bitmapStride(header.width, bitCount);
    Decoded result;
    result.bits.assign(size_t(stride * header.height), 0);
    const png::BitmapView bitmap { result.bits.data(), header.width, header.height, stride, bitCount };
    png::DecodeObserver observer;
    observer.progress = [&](int percentage) {
        result.events.push_back(percentage);
        return true;
    };
    observer.rowsConverted = [&](int32_t first, int32_t count) { result.events.push_back(-first - count); };
    observer.passConverted = [&](int pass) { result.events.push_back(-pass); };
    png::setSimdLevel(simd);
    png::ImageStream stream(read.imageData, png::inflatedSize(header), mode);
    result.ok = !stream.failed() && png::decodeImage(header, info, options, stream, bitmap, observer);
    return result;
}

void compareDecoders(QByteArrayView file, size_t size)
{
    png::Header header;
    png::FileInfo info;
    const png::ReadResult read = png::readChunks(file, true, header, info);
    png::DecodeOptions options;
    options.make32 = size % 5 == 0;
    options.alphaNotKept = size % 11 == 0;
    options.displayBackground = size % 2 ? -1 : 0x336699;
    const int bitCount = read.ok ? png::outputBitCount(header, info, options) : 0;
    const int64_t inflated = png::inflatedSize(header);
    // What StdPNG would refuse, and bitmaps too large to decode many times a second.
    if (bitCount == 0 || inflated > (read.imageDataSize + 1) * 1032
        || png::bitmapStride(header.width, bitCount) * header.height > (int64_t(8) << 20))
        return;
    static const png::Simd best = png::simdLevel();
    const Decoded whole = decode(header, info, options, read, png::ImageStream::Mode::Whole, best);
    const Decoded streamed = decode(header, info, options, read, png::ImageStream::Mode::Streaming, png::Simd::None);
    png::setSimdLevel(best);
    if (whole.ok != streamed.ok || (whole.ok && (whole.bits != streamed.bits || whole.events != streamed.events)))
        std::abort();
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    static Target target;
    const QByteArray file = QByteArray::fromRawData(reinterpret_cast<const char *>(data), qsizetype(size));
    StdPNG image;
    image.setTransparentStyle(size % 2 ? StdPNG::alphaTransparent : StdPNG::alphaPNGwindowBkg);
    image.setProgressiveDisplay(quint8(size % 3));
    QObject::connect(&image, &StdPNG::ProgessiveDisplay,
        [](qint32, qint32, qint32 &dc, qint32 &hwnd, qint32, bool, qint32 &x, qint32 &y, bool, bool) {
            dc = target.dc;
            hwnd = target.window;
            x = 3;
            y = 5;
        });
    image.LoadData(file, size % 3 != 0, size % 5 == 0, uint8_t(size % 7 == 0 ? 128 : 255));
    image.Paint(target.dc, 1, 1, 20, 30, 0, 2, 2, 0, 0, 200);
    image.Comments();
    image.Palette();
    image.LastModified();
    compareDecoders(file, size);
    return 0;
}
