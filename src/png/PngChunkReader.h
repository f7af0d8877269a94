#pragma once

#include "zelctl_export.h"

#include "PngFormat.h"

#include <QByteArrayView>
#include <QString>

#include <vector>

// The chunk side of a PNG file: signature, chunk loop with its CRC rules, the header checks
// and every understood ancillary chunk. Every length is checked against the file first.
namespace zelctl::png {

// The largest file LoadFile reads: far above any image the bitmap limits let through, and a
// bound for a name that leads to /dev/zero or an endless file.
inline constexpr qint64 MaxFileBytes = qint64(256) << 20;

namespace reason {
inline constexpr const char *HeaderCrc = "Corrupted Image Header (bad CRC). Cannot continue.";
inline constexpr const char *HeaderCorrupt = "Corrupted Image Header. Cannot continue.";
inline constexpr const char *CompressionFlag = "Invalid Compression Flag in Header. Cannot continue.";
inline constexpr const char *FilterFlag = "Invalid Filter Flag in Header. Cannot continue.";
inline constexpr const char *BitDepthFlag = "Invalid Bit Depth Flag in Header. Cannot continue.";
inline constexpr const char *ColorTypeFlag = "Invalid Color Type Flag in Header. Cannot continue.";
inline constexpr const char *InterlacingFlag = "Invalid Interlacing Flag in Header. Cannot continue.";
inline constexpr const char *TooLarge = "Image is too large to process. Cannot continue.";
inline constexpr const char *PaletteCrc = "Invalid Palette (bad CRC). Cannot continue.";
inline constexpr const char *PaletteCorrupt = "Invalid Palette. Cannot continue.";
inline constexpr const char *DataCrc = "Corrupted Image Data (bad CRC). Cannot continue.";
inline constexpr const char *DataExtract = "Failed to extract image data. Cannot continue.";
inline constexpr const char *NoData = "No image data found. Cannot continue.";
// Failures the documented texts leave unnamed; reported the same way.
inline constexpr const char *NotPng = "Not a PNG file.";
inline constexpr const char *Truncated = "Truncated file: a chunk runs past the end or IEND is missing.";
inline constexpr const char *Unreadable = "The file cannot be read.";
inline constexpr const char *Inflate = "Failed to decompress image data.";
inline constexpr const char *Unfilter = "Invalid filter type in image data.";
inline constexpr const char *Format = "Invalid combination of color type and bit depth.";
inline constexpr const char *Bitmap = "Failed to create the bitmap.";
} // namespace reason

// Files this short cannot hold a signature, a header, one IDAT and IEND.
inline constexpr qsizetype MinimumFileLength = 57;

struct ReadResult
{
    bool ok = false; // the chunks are good enough to decode
    const char *reason = nullptr; // why not
    // The data of the IDAT chunks in file order: views into the file, the compressed stream.
    std::vector<QByteArrayView> imageData;
    qsizetype imageDataSize = 0;
};

// Reads the chunks of a whole file into header and info. The header fields are assigned
// as soon as they are read, so they show what a rejected file claimed.
ZELCTL_EXPORT ReadResult readChunks(QByteArrayView file, bool validateAllData, Header &header, FileInfo &info);

// CRC of a chunk: the CRC-32 of zlib's crc32 over type and data.
uint32_t chunkCrc(QByteArrayView typeAndData);

} // namespace zelctl::png
