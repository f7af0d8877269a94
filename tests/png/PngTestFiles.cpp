#include "PngTestFiles.h"

#include <png.h>
#include <zlib.h>

#include <algorithm>
#include <cstdio>
#include <stdexcept>

namespace zelctl::test {

QByteArray writeWithLibpng(const ImageRecipe &recipe)
{
    QByteArray out;
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png_create_info_struct(png);
    if (setjmp(png_jmpbuf(png))) {
        png_destroy_write_struct(&png, &info);
        throw std::runtime_error("libpng could not write the test image");
    }
    png_set_write_fn(
        png, &out,
        [](png_structp p, png_bytep data, png_size_t length) {
            static_cast<QByteArray *>(png_get_io_ptr(p))
                ->append(reinterpret_cast<const char *>(data), qsizetype(length));
        },
        nullptr);
    png_set_filter(png, PNG_FILTER_TYPE_BASE, PNG_ALL_FILTERS);
    if (recipe.idatBytes)
        png_set_compression_buffer_size(png, size_t(recipe.idatBytes));
    png_set_IHDR(png, info, png_uint_32(recipe.width), png_uint_32(recipe.height), recipe.bitDepth, recipe.colorType,
        recipe.interlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_BASE, PNG_FILTER_TYPE_BASE);

    uint32_t state = recipe.seed;
    const auto random = [&state] {
        state = state * 1664525u + 1013904223u;
        return png_byte(state >> 16);
    };
    // Random rows in which every third pixel of 8 bits or more repeats the first, so colour
    // keys match more than once (low bit depths match often by chance).
    const int pixelBits = recipe.channels() * recipe.bitDepth;
    std::vector<std::vector<png_byte>> rows(size_t(recipe.height));
    for (int y = 0; y < recipe.height; ++y) {
        rows[size_t(y)].resize((size_t(recipe.width) * size_t(pixelBits) + 7) / 8);
        std::generate(rows[size_t(y)].begin(), rows[size_t(y)].end(), random);
        for (int x = 0; pixelBits >= 8 && x < recipe.width; ++x) {
            if ((x + y) % 3 == 0)
                std::copy_n(rows[0].begin(), pixelBits / 8, rows[size_t(y)].begin() + x * pixelBits / 8);
        }
    }
    const auto firstSample = [&](size_t i) {
        const std::vector<png_byte> &first = rows[0];
        return png_uint_16(recipe.bitDepth == 16 ? first[2 * i] << 8 | first[2 * i + 1]
                                                 : first[i] >> (8 - std::min(8, recipe.bitDepth)));
    };

    const int entries = recipe.colorType == PNG_COLOR_TYPE_PALETTE ? 1 << recipe.bitDepth : 0;
    std::vector<png_color> palette(static_cast<size_t>(entries));
    for (png_color &c : palette)
        c = { random(), random(), random() };
    if (entries)
        png_set_PLTE(png, info, palette.data(), entries);
    std::vector<png_byte> alphas(size_t(entries / 2 + 1));
    png_color_16 key {};
    if (recipe.withTransparency && entries) {
        for (size_t i = 0; i < alphas.size(); ++i)
            alphas[i] = i % 3 == 0 ? 0 : random();
        png_set_tRNS(png, info, alphas.data(), int(alphas.size()), nullptr);
    } else if (recipe.withTransparency && recipe.colorType == PNG_COLOR_TYPE_GRAY) {
        key.gray = firstSample(0);
        png_set_tRNS(png, info, nullptr, 0, &key);
    } else if (recipe.withTransparency && recipe.colorType == PNG_COLOR_TYPE_RGB) {
        key = { 0, firstSample(0), firstSample(1), firstSample(2), 0 };
        png_set_tRNS(png, info, nullptr, 0, &key);
    }
    png_write_info(png, info);

    std::vector<png_bytep> pointers;
    for (auto &row : rows)
        pointers.push_back(row.data());
    png_write_image(png, pointers.data());
    png_write_end(png, nullptr);
    png_destroy_write_struct(&png, &info);
    return out;
}

std::vector<uint8_t> readWithLibpng(const QByteArray &file, int &width, int &height)
{
    FILE *stream = fmemopen(const_cast<char *>(file.constData()), size_t(file.size()), "rb");
    png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png_create_info_struct(png);
    if (setjmp(png_jmpbuf(png))) {
        png_destroy_read_struct(&png, &info, nullptr);
        fclose(stream);
        throw std::runtime_error("libpng could not read the test image");
    }
    png_init_io(png, stream);
    png_read_info(png, info);
    png_set_expand(png);
    png_set_strip_16(png);
    png_set_gray_to_rgb(png);
    png_set_add_alpha(png, 0xFF, PNG_FILLER_AFTER);
    png_set_interlace_handling(png);
    png_read_update_info(png, info);
    width = int(png_get_image_width(png, info));
    height = int(png_get_image_height(png, info));
    std::vector<uint8_t> pixels(size_t(width) * size_t(height) * 4);
    std::vector<png_bytep> rows;
    for (int y = 0; y < height; ++y)
        rows.push_back(pixels.data() + size_t(y) * size_t(width) * 4);
    png_read_image(png, rows.data());
    png_read_end(png, nullptr);
    png_destroy_read_struct(&png, &info, nullptr);
    fclose(stream);
    return pixels;
}

QByteArray be32(uint32_t value)
{
    const char bytes[4] = { char(value >> 24), char(value >> 16), char(value >> 8), char(value) };
    return QByteArray(bytes, 4);
}

QByteArray chunkWithCrc(const char *type, const QByteArray &data, uint32_t crc)
{
    return be32(uint32_t(data.size())) + QByteArray(type, 4) + data + be32(crc);
}

QByteArray chunk(const char *type, const QByteArray &data)
{
    const QByteArray typeAndData = QByteArray(type, 4) + data;
    const uLong crc = crc32(0, reinterpret_cast<const Bytef *>(typeAndData.constData()), uInt(typeAndData.size()));
    return chunkWithCrc(type, data, uint32_t(crc));
}

QByteArray signature()
{
    return QByteArray("\x89PNG\r\n\x1a\n", 8);
}

QByteArray ihdr(int width, int height, int bitDepth, int colorType, int interlace, int compression, int filter)
{
    QByteArray data = be32(uint32_t(width)) + be32(uint32_t(height));
    data.append(char(bitDepth)).append(char(colorType)).append(char(compression)).append(char(filter));
    data.append(char(interlace));
    return chunk("IHDR", data);
}

QByteArray greyFile(int width, int height, const QByteArray &extraChunks, uint8_t filter)
{
    QByteArray rows;
    for (int y = 0; y < height; ++y) {
        rows.append(char(filter));
        for (int x = 0; x < width; ++x)
            rows.append(char(y + x));
    }
    return signature() + ihdr(width, height, 8, 0) + extraChunks + chunk("IDAT", deflate(rows)) + chunk("IEND", {});
}

} // namespace zelctl::test
