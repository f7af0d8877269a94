#pragma once

#include "zelctl_export.h"

#include <QByteArray>
#include <QString>

#include <array>
#include <cstdint>
#include <optional>

// What the chunk reader keeps of one PNG file, and the fixed tables of the format. Shared by
// the reader, the decoder and StdPNG; nothing here needs a QApplication.
namespace zelctl::png {

enum ColorType : uint8_t {
    Grey = 0,
    Rgb = 2,
    Indexed = 3,
    GreyAlpha = 4,
    Rgba = 6,
};

// Adam7 passes 0-6, and index 7 for a non-interlaced image (start 0, step 1).
inline constexpr int NonInterlacedPass = 7;
inline constexpr std::array<int, 8> rowStart = { 0, 0, 4, 0, 2, 0, 1, 0 };
inline constexpr std::array<int, 8> columnStart = { 0, 4, 0, 2, 0, 1, 0, 0 };
inline constexpr std::array<int, 8> rowStep = { 8, 8, 8, 4, 4, 2, 2, 1 };
inline constexpr std::array<int, 8> columnStep = { 8, 8, 4, 4, 2, 2, 1, 1 };
// Size of the block a pixel covers in the pixelated display, so early passes fill the image.
// A block covers only pixels of later passes (pass 2 starts at column 4 with step 8, so its
// blocks are 4 wide): a wider block would overwrite pixels that are already final.
inline constexpr std::array<int, 8> blockHeight = { 8, 8, 4, 4, 2, 2, 1, 1 };
inline constexpr std::array<int, 8> blockWidth = { 8, 4, 4, 2, 2, 1, 1, 1 };

struct Header
{
    int32_t width = 0;
    int32_t height = 0;
    uint8_t bitDepth = 0;
    uint8_t colorType = 0;
    uint8_t interlaceMethod = 0;

    // Bits per pixel of the stream: 0 for a colour type the reader rejects.
    int streamBitsPerPixel() const;
    bool interlaced() const { return interlaceMethod == 1; }
    bool validBitDepth() const
    {
        return bitDepth == 1 || bitDepth == 2 || bitDepth == 4 || bitDepth == 8 || bitDepth == 16;
    }
};

// Pixels of a pass (0-6, or NonInterlacedPass) in one dimension.
inline int64_t passExtent(int64_t size, int start, int step)
{
    return size / step + (size % step > start ? 1 : 0);
}

inline int64_t rowBytes(int64_t pixels, int bitsPerPixel)
{
    return (pixels * bitsPerPixel + 7) / 8;
}

// Bytes of the whole filtered stream (filter bytes included) for a header; 0 when any size
// is out of range.
ZELCTL_EXPORT int64_t inflatedSize(const Header &header);

// Everything a load gathers from the chunks. The header survives a reset (see StdPNG).
struct FileInfo
{
    int32_t backgroundColor = -1; // 0x00BBGGRR
    int32_t gammaValue = 0;
    QByteArray paletteBytes;
    QByteArray transparencyBytes;
    int32_t transparentColor = -1;
    std::optional<std::array<int32_t, 8>> chromaticity;
    std::optional<std::array<int32_t, 3>> physical;
    std::optional<std::array<int32_t, 3>> offsets;
    QByteArray textRecords;
    std::optional<std::array<uint8_t, 8>> timeBytes;
    uint8_t stdRgbIntent = 0;
    bool headerSeen = false;
};

// The colour of a grey level or palette index as 0x00BBGGRR, as the bitmap's colour table
// shows it; nullopt when the palette has no such entry.
std::optional<int32_t> sampleColor(const Header &header, const QByteArray &palette, int sample);

} // namespace zelctl::png
