#include "PngChunkReader.h"

#include <libdeflate.h>

#include <cstring>
#include <limits>
#include <new>

namespace zelctl::png {

namespace {

constexpr uint8_t signature[8] = { 0x89, 0x50, 0x4E, 0x47, 0x0D, 0x0A, 0x1A, 0x0A };

uint32_t readU32(const uint8_t *p)
{
    return uint32_t(p[0]) << 24 | uint32_t(p[1]) << 16 | uint32_t(p[2]) << 8 | uint32_t(p[3]);
}

int32_t readI32(const uint8_t *p)
{
    return int32_t(readU32(p));
}

constexpr uint32_t typeCode(const char (&name)[5])
{
    return uint32_t(uint8_t(name[0])) << 24 | uint32_t(uint8_t(name[1])) << 16 | uint32_t(uint8_t(name[2])) << 8
        | uint32_t(uint8_t(name[3]));
}

struct Chunk
{
    uint32_t type;
    const uint8_t *data;
    qsizetype length;
    QByteArrayView typeAndData;
    uint32_t storedCrc;

    bool crcMatches() const { return chunkCrc(typeAndData) == storedCrc; }
};

// Checks of the header in their documented order; the first failure names the reason.
const char *parseHeader(const Chunk &chunk, Header &header, FileInfo &info)
{
    if (!chunk.crcMatches())
        return reason::HeaderCrc;
    if (chunk.length < 13)
        return reason::HeaderCorrupt;
    const uint8_t *d = chunk.data;
    header.width = readI32(d);
    header.height = readI32(d + 4);
    header.bitDepth = d[8];
    header.colorType = d[9];
    header.interlaceMethod = d[12];
    info.headerSeen = true;
    if (header.width < 1 || header.height < 1)
        return reason::HeaderCorrupt;
    if (d[10] > 0)
        return reason::CompressionFlag;
    if (d[11] > 0)
        return reason::FilterFlag;
    if (!header.validBitDepth())
        return reason::BitDepthFlag;
    if (header.colorType > 6 || header.colorType == 1 || header.colorType == 5)
        return reason::ColorTypeFlag;
    if (header.interlaceMethod > 1)
        return reason::InterlacingFlag;
    // Sizes are kept to what a 32-bit signed computation of the bitmap and the stream allows.
    constexpr int64_t limit = std::numeric_limits<int32_t>::max();
    const int64_t stride32 = ((int64_t(header.width) * 32 + 31) & ~int64_t(31)) / 8;
    const int64_t inflated = inflatedSize(header);
    if (int64_t(header.width) * 32 + 31 > limit || stride32 * header.height > limit || inflated > limit
        || inflated == 0)
        return reason::TooLarge;
    return nullptr;
}

const char *parsePalette(const Chunk &chunk, const Header &header, FileInfo &info)
{
    if (header.colorType != Rgb && header.colorType != Indexed && header.colorType != Rgba)
        return nullptr;
    if (!chunk.crcMatches())
        return reason::PaletteCrc;
    if (chunk.length % 3 != 0)
        return reason::PaletteCorrupt;
    info.paletteBytes = chunk.typeAndData.sliced(4).toByteArray();
    return nullptr;
}

void parseTransparency(const Chunk &chunk, const Header &header, FileInfo &info)
{
    if (header.colorType != Grey && header.colorType != Rgb && header.colorType != Indexed)
        return;
    if (!chunk.crcMatches())
        return;
    info.transparencyBytes = chunk.typeAndData.sliced(4).toByteArray();
    const uint8_t *d = chunk.data;
    switch (header.colorType) {
    case Grey:
        info.transparentColor = chunk.length >= 2 ? d[1] : -1;
        break;
    case Rgb:
        info.transparentColor = chunk.length >= 6 ? d[1] << 16 | d[3] << 8 | d[5] : -1;
        break;
    default:
        if (info.transparencyBytes.size() < 256)
            info.transparencyBytes.append(256 - info.transparencyBytes.size(), char(0xFF));
        info.transparentColor = 0;
        break;
    }
}

void parseBackground(const Chunk &chunk, const Header &header, FileInfo &info)
{
    const uint8_t *d = chunk.data;
    std::optional<int32_t> color;
    switch (header.colorType) {
    case Rgb:
    case Rgba:
        if (chunk.length >= 6)
            color = d[1] | d[3] << 8 | d[5] << 16;
        break;
    case Indexed:
        color = sampleColor(header, info.paletteBytes, d[0]);
        break;
    default:
        if (chunk.length >= 2)
            color = sampleColor(header, info.paletteBytes, d[1]);
        break;
    }
    info.backgroundColor = color.value_or(-1);
}

void appendTextRecord(const Chunk &chunk, FileInfo &info)
{
    const uint32_t length = uint32_t(chunk.length);
    const char lengthBytes[4] = { char(length), char(length >> 8), char(length >> 16), char(length >> 24) };
    info.textRecords.append(lengthBytes, 4);
    info.textRecords.append(chunk.typeAndData.data(), chunk.typeAndData.size());
}

void parseAncillary(const Chunk &chunk, const Header &header, FileInfo &info)
{
    const uint8_t *d = chunk.data;
    switch (chunk.type) {
    case typeCode("bKGD"):
        parseBackground(chunk, header, info);
        break;
    case typeCode("tIME"):
        if (chunk.length > 6) {
            const int year = d[0] << 8 | d[1];
            info.timeBytes
                = std::array<uint8_t, 8> { uint8_t(year), uint8_t(year >> 8), d[2], d[3], d[4], d[5], d[6], 0 };
        }
        break;
    case typeCode("gAMA"):
        if (chunk.length == 4)
            info.gammaValue = readI32(d);
        break;
    case typeCode("cHRM"):
        if (chunk.length >= 32) {
            std::array<int32_t, 8> values;
            for (int i = 0; i < 8; ++i)
                values[i] = readI32(d + 4 * i);
            info.chromaticity = values;
        }
        break;
    case typeCode("sRGB"):
        if (d[0] < 4)
            info.stdRgbIntent = uint8_t(d[0] + 1);
        break;
    case typeCode("pHYs"):
        if (chunk.length > 8)
            info.physical = std::array<int32_t, 3> { readI32(d), readI32(d + 4), d[8] };
        break;
    case typeCode("oFFs"):
        if (chunk.length > 8)
            info.offsets = std::array<int32_t, 3> { readI32(d), readI32(d + 4), d[8] };
        break;
    case typeCode("tEXt"):
    case typeCode("zTXt"):
        appendTextRecord(chunk, info);
        break;
    default:
        break;
    }
}

// The ancillary chunks the reader understands; their CRC is only checked when all data is
// validated.
bool isValidatedAncillary(uint32_t type)
{
    switch (type) {
    case typeCode("bKGD"):
    case typeCode("tIME"):
    case typeCode("gAMA"):
    case typeCode("cHRM"):
    case typeCode("sRGB"):
    case typeCode("pHYs"):
    case typeCode("oFFs"):
    case typeCode("tEXt"):
    case typeCode("zTXt"):
        return true;
    default:
        return false;
    }
}

ReadResult refused(const char *why)
{
    ReadResult result;
    result.reason = why;
    return result;
}

} // namespace

uint32_t chunkCrc(QByteArrayView typeAndData)
{
    // zlib's crc32 with initial value 0; libdeflate computes the same sum several times faster.
    return libdeflate_crc32(0, typeAndData.data(), size_t(typeAndData.size()));
}

ReadResult readChunks(QByteArrayView file, bool validateAllData, Header &header, FileInfo &info)
{
    const auto *bytes = reinterpret_cast<const uint8_t *>(file.data());
    const qsizetype size = file.size();
    if (size < MinimumFileLength || std::memcmp(bytes, signature, sizeof signature) != 0)
        return refused(reason::NotPng);

    ReadResult result;
    const char *failure = nullptr;
    qsizetype position = 8;
    bool ended = false;
    while (!ended && !failure) {
        if (size - position < 12)
            return refused(reason::Truncated); // no IEND before the end of the file
        const uint32_t length = readU32(bytes + position);
        if (length > uint32_t(size - position - 12))
            return refused(reason::Truncated); // the chunk runs past the end of the file
        Chunk chunk;
        chunk.type = readU32(bytes + position + 4);
        chunk.data = bytes + position + 8;
        chunk.length = qsizetype(length);
        chunk.typeAndData = file.sliced(position + 4, chunk.length + 4);
        chunk.storedCrc = readU32(chunk.data + chunk.length);
        position += chunk.length + 12;

        if (chunk.length == 0) {
            ended = chunk.type == typeCode("IEND");
            continue;
        }
        switch (chunk.type) {
        case typeCode("IHDR"):
            failure = parseHeader(chunk, header, info);
            break;
        case typeCode("PLTE"):
            failure = parsePalette(chunk, header, info);
            break;
        case typeCode("IDAT"):
            if (!chunk.crcMatches()) {
                failure = reason::DataCrc;
                break;
            }
            try {
                result.imageData.push_back(chunk.typeAndData.sliced(4));
                result.imageDataSize += chunk.length;
            } catch (const std::bad_alloc &) {
                failure = reason::DataExtract;
            }
            break;
        case typeCode("tRNS"):
            parseTransparency(chunk, header, info);
            break;
        case typeCode("IEND"):
            ended = true;
            break;
        default:
            if (!isValidatedAncillary(chunk.type))
                break;
            if (!validateAllData || chunk.storedCrc == 0 || chunk.crcMatches())
                parseAncillary(chunk, header, info);
            break;
        }
    }
    if (!failure && !info.headerSeen)
        failure = reason::HeaderCorrupt;
    if (!failure && result.imageDataSize == 0)
        failure = reason::NoData;
    result.ok = !failure;
    result.reason = failure;
    if (failure)
        result.imageData.clear();
    return result;
}

} // namespace zelctl::png
