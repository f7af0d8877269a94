#pragma once

#include "support/TestSupport.h"

#include <QByteArray>

#include <cstdint>
#include <vector>

// Builders of PNG files for the tests: with libpng (a second, independent writer and
// reader), and chunk by chunk for the malformed files libpng refuses to write.
namespace zelctl::test {

struct ImageRecipe
{
    int width = 1;
    int height = 1;
    int colorType = 2;
    int bitDepth = 8;
    bool interlaced = false;
    bool withTransparency = false;
    uint32_t seed = 1;
    int idatBytes = 0; // the size of each IDAT chunk but the last, 0 for libpng's own

    int channels() const { return colorType == 2 ? 3 : colorType == 4 ? 2 : colorType == 6 ? 4 : 1; }
};

// A file written by libpng with seeded random samples, every filter allowed; keyed images use
// the first pixel as key, palette images get fewer tRNS entries than colours, some of them 0.
QByteArray writeWithLibpng(const ImageRecipe &recipe);

// Straight R, G, B, A per pixel as libpng reads the file: 16-bit samples cut, tRNS as alpha.
std::vector<uint8_t> readWithLibpng(const QByteArray &file, int &width, int &height);

// One chunk: length, type, data and a CRC over type and data.
QByteArray chunk(const char *type, const QByteArray &data);
QByteArray chunkWithCrc(const char *type, const QByteArray &data, uint32_t crc);
QByteArray signature();
QByteArray ihdr(
    int width, int height, int bitDepth, int colorType, int interlace = 0, int compression = 0, int filter = 0);
// IDAT data: the rows (each starting with its filter byte) deflated.
inline QByteArray deflate(const QByteArray &rows)
{
    return qCompress(rows).mid(4);
}
QByteArray be32(uint32_t value);

// A grey 8-bit file whose pixel (x, y) is x + y, every row with filter type `filter`.
QByteArray greyFile(int width, int height, const QByteArray &extraChunks = {}, uint8_t filter = 0);

} // namespace zelctl::test
