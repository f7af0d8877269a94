#pragma once

#include "zelctl_export.h"

#include "PngFormat.h"

#include <QtGlobal>

#include <array>
#include <cstdint>
#include <functional>
#include <vector>

// Turns the inflated stream into bitmap rows: reverses the row filters, walks the Adam7
// passes and converts every sample to the bitmap's format (colour tables, premultiplied
// alpha, colour keys).
namespace zelctl::png {

// Bitmap memory the decoder writes into: top-down rows of `stride` bytes. 32-bit pixels are
// B, G, R, A with premultiplied colour, 24-bit B, G, R, lower bit counts colour-table indices
// (1- and 4-bit pixels from the high bits of a byte).
struct BitmapView
{
    uint8_t *bits = nullptr;
    int32_t width = 0;
    int32_t height = 0;
    qsizetype stride = 0;
    int bitCount = 0;

    uint8_t *row(int32_t y) const { return bits + y * stride; }
};

inline qsizetype bitmapStride(int64_t width, int bitCount)
{
    return qsizetype(((width * bitCount + 31) & ~int64_t(31)) / 8);
}

struct DecodeOptions
{
    bool alphaNotKept = false; // lay alpha images flat into 24 bits (or their own format)
    bool make32 = false; // a 32-bit bitmap whatever the image
    bool fadeIn = false; // fade-in display of an interlaced image, which needs 32 bits
    bool pixelated = false; // early passes also fill the blocks below and right of each pixel
    int32_t displayBackground = -1; // 0x00BBGGRR to lay partly transparent pixels on; -1 for none
};

// Bits per pixel of the bitmap for an image; 0 when the header's colour type and bit depth do
// not form a PNG format, which the decoder refuses.
ZELCTL_EXPORT int outputBitCount(const Header &header, const FileInfo &info, const DecodeOptions &options);

// Colour table of a bitmap below 16 bits, entries 0x00RRGGBB. Grey images of bit depth 2 get
// their four levels written into info.paletteBytes first.
std::vector<uint32_t> colorTable(const Header &header, FileInfo &info, int bitCount);

// What the decoder tells its caller while it works.
struct DecodeObserver
{
    // False stops the decoding (the receiver is gone).
    std::function<bool(int percentage)> progress;
    // Rows [first, first + count) of a non-interlaced image are in the bitmap.
    std::function<void(int32_t first, int32_t count)> rowsConverted;
    // An Adam7 pass (1-7) is in the bitmap.
    std::function<void(int pass)> passConverted;
};

class ImageStream;

// Decodes the image stream into bitmap. False on a bad filter type, a broken stream or one
// whose length differs from the header's, or a format the decoder refuses.
ZELCTL_EXPORT bool decodeImage(const Header &header, const FileInfo &info, const DecodeOptions &options,
    ImageStream &stream, const BitmapView &bitmap, const DecodeObserver &observer);

// Multiplies every byte of a 32-bit bitmap by opacity / 255, keeping it premultiplied.
void applyConstantOpacity(const BitmapView &bitmap, uint8_t opacity);

} // namespace zelctl::png
