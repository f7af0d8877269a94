// Decoding speed of StdPNG on large photo-like images, beside libpng producing the same
// bitmap rows and beside zlib's uncompress alone on the same IDAT stream (the floor every
// PNG decoder stands on).
//
//   build/bench/bench_png --benchmark_time_unit=ms

#include "png/StdPNG.h"

#include <benchmark/benchmark.h>
#include <png.h>
#include <zlib.h>

#include <QByteArray>

#include <cmath>
#include <cstring>
#include <map>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

constexpr int imageWidth = 3000;
constexpr int imageHeight = 2000;

enum class Kind { Rgb8, Rgba8, Grey8, Palette8, Rgb16, InterlacedRgb8 };

struct Sample
{
    const char *name;
    Kind kind;
    int colorType;
    int bitDepth;
    bool interlaced;
};

const Sample samples[] = {
    { "RGB8", Kind::Rgb8, PNG_COLOR_TYPE_RGB, 8, false },
    { "RGBA8", Kind::Rgba8, PNG_COLOR_TYPE_RGB_ALPHA, 8, false },
    { "grey8", Kind::Grey8, PNG_COLOR_TYPE_GRAY, 8, false },
    { "palette8", Kind::Palette8, PNG_COLOR_TYPE_PALETTE, 8, false },
    { "RGB16", Kind::Rgb16, PNG_COLOR_TYPE_RGB, 16, false },
    { "interlaced-RGB8", Kind::InterlacedRgb8, PNG_COLOR_TYPE_RGB, 8, true },
};

// Smooth light and shade with a little sensor noise, so the filters and deflate see what
// they see in photographs.
double scene(int x, int y, int channel)
{
    const double phase = channel * 1.7;
    return 128 + 55 * std::sin(x / (90.0 + 13 * channel) + phase) * std::cos(y / 70.0)
        + 35 * std::sin((x + 2 * y) / 211.0 - phase) + 20 * std::cos(std::hypot(x - 1400, y - 900) / 45.0);
}

struct Noise
{
    uint32_t state = 12345;
    int next(int spread)
    {
        state = state * 1664525u + 1013904223u;
        return int(state >> 24) % (2 * spread + 1) - spread;
    }
};

int clampByte(double v)
{
    return v < 0 ? 0 : v > 255 ? 255 : int(v);
}

void appendToBuffer(png_structp png, png_bytep data, png_size_t length)
{
    static_cast<QByteArray *>(png_get_io_ptr(png))->append(reinterpret_cast<const char *>(data), qsizetype(length));
}

QByteArray encode(const Sample &sample)
{
    QByteArray out;
    png_structp png = png_create_write_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png_create_info_struct(png);
    if (setjmp(png_jmpbuf(png)))
        throw std::runtime_error("libpng could not write the benchmark image");
    png_set_write_fn(png, &out, appendToBuffer, nullptr);
    png_set_IHDR(png, info, imageWidth, imageHeight, sample.bitDepth, sample.colorType,
        sample.interlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_BASE, PNG_FILTER_TYPE_BASE);
    if (sample.kind == Kind::Palette8) {
        std::vector<png_color> palette(256);
        for (int i = 0; i < 256; ++i)
            palette[size_t(i)] = { png_byte(i), png_byte(clampByte(i * 0.8 + 30)), png_byte(255 - i) };
        png_set_PLTE(png, info, palette.data(), 256);
    }
    png_write_info(png, info);

    const int channels = sample.colorType == PNG_COLOR_TYPE_RGB_ALPHA ? 4
        : sample.colorType == PNG_COLOR_TYPE_RGB                      ? 3
                                                                      : 1;
    const int bytes = sample.bitDepth / 8;
    std::vector<png_byte> pixels(size_t(imageWidth) * imageHeight * channels * bytes);
    Noise noise;
    for (int y = 0; y < imageHeight; ++y) {
        for (int x = 0; x < imageWidth; ++x) {
            png_byte *p = pixels.data() + (size_t(y) * imageWidth + x) * channels * bytes;
            for (int c = 0; c < channels; ++c) {
                double value = scene(x, y, c) + noise.next(3);
                if (c == 3) // an alpha that fades out towards the corners
                    value = 255 - std::hypot(x - 1500, y - 1000) / 7;
                if (bytes == 2) {
                    const int wide = clampByte(value) * 257 + noise.next(100);
                    const int w = wide < 0 ? 0 : wide > 65535 ? 65535 : wide;
                    p[2 * c] = png_byte(w >> 8);
                    p[2 * c + 1] = png_byte(w);
                } else {
                    p[c] = png_byte(clampByte(value));
                }
            }
        }
    }
    std::vector<png_bytep> rows;
    for (int y = 0; y < imageHeight; ++y)
        rows.push_back(pixels.data() + size_t(y) * imageWidth * channels * bytes);
    png_write_image(png, rows.data());
    png_write_end(png, nullptr);
    png_destroy_write_struct(&png, &info);
    return out;
}

const QByteArray &fileOf(const Sample &sample)
{
    static std::map<std::string, QByteArray> files;
    QByteArray &file = files[sample.name];
    if (file.isEmpty())
        file = encode(sample);
    return file;
}

// The IDAT chunks' data joined, as StdPNG hands it to uncompress.
QByteArray imageDataOf(const QByteArray &file)
{
    QByteArray data;
    qsizetype position = 8;
    while (position + 12 <= file.size()) {
        const auto *p = reinterpret_cast<const uchar *>(file.constData() + position);
        const qsizetype length = qsizetype(uint32_t(p[0]) << 24 | uint32_t(p[1]) << 16 | uint32_t(p[2]) << 8 | p[3]);
        if (std::memcmp(p + 4, "IDAT", 4) == 0)
            data.append(file.constData() + position + 8, length);
        position += length + 12;
    }
    return data;
}

size_t inflatedSize(const Sample &sample)
{
    const size_t bpp = size_t(sample.bitDepth / 8)
        * (sample.colorType == PNG_COLOR_TYPE_RGB_ALPHA  ? 4
                : sample.colorType == PNG_COLOR_TYPE_RGB ? 3
                                                         : 1);
    if (!sample.interlaced)
        return size_t(imageHeight) * (imageWidth * bpp + 1);
    const int rs[] = { 0, 0, 4, 0, 2, 0, 1 }, cs[] = { 0, 4, 0, 2, 0, 1, 0 };
    const int rstep[] = { 8, 8, 8, 4, 4, 2, 2 }, cstep[] = { 8, 8, 4, 4, 2, 2, 1 };
    size_t total = 0;
    for (int p = 0; p < 7; ++p) {
        const size_t w = size_t(imageWidth / cstep[p] + (imageWidth % cstep[p] > cs[p]));
        const size_t h = size_t(imageHeight / rstep[p] + (imageHeight % rstep[p] > rs[p]));
        total += h * (w * bpp + 1);
    }
    return total;
}

void stdPngDecode(benchmark::State &state, const Sample &sample)
{
    const QByteArray &file = fileOf(sample);
    zelctl::StdPNG image;
    image.setTransparentStyle(zelctl::StdPNG::alphaTransparent);
    for (auto _ : state) {
        if (!image.LoadData(file))
            state.SkipWithError(image.FailureReason().toUtf8().constData());
        benchmark::DoNotOptimize(image.handle());
    }
    state.counters["MB/s"]
        = benchmark::Counter(double(imageWidth) * imageHeight * state.iterations() / 1e6, benchmark::Counter::kIsRate);
}

struct ReadCursor
{
    const QByteArray *file;
    qsizetype position = 0;
};

void readFromBuffer(png_structp png, png_bytep data, png_size_t length)
{
    auto *cursor = static_cast<ReadCursor *>(png_get_io_ptr(png));
    if (cursor->file->size() - cursor->position < qsizetype(length))
        png_error(png, "read past the end");
    std::memcpy(data, cursor->file->constData() + cursor->position, length);
    cursor->position += qsizetype(length);
}

// libpng decoding into the rows StdPNG's bitmap holds: B, G, R (premultiplied with A) for
// colour, indices for palette and grey, the first byte of 16-bit samples.
void libpngDecode(benchmark::State &state, const Sample &sample)
{
    const QByteArray &file = fileOf(sample);
    for (auto _ : state) {
        ReadCursor cursor { &file };
        png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
        png_infop info = png_create_info_struct(png);
        if (setjmp(png_jmpbuf(png))) {
            state.SkipWithError("libpng failed");
            break;
        }
        png_set_read_fn(png, &cursor, readFromBuffer);
        png_read_info(png, info);
        png_set_strip_16(png);
        png_set_bgr(png);
        const int passes = png_set_interlace_handling(png);
        png_read_update_info(png, info);
        const size_t rowBytes = png_get_rowbytes(png, info);
        const size_t stride = (rowBytes + 3) & ~size_t(3);
        std::unique_ptr<png_byte[]> bitmap(new png_byte[stride * imageHeight]);
        if (passes > 1) {
            std::vector<png_bytep> rows;
            for (int y = 0; y < imageHeight; ++y)
                rows.push_back(bitmap.get() + stride * size_t(y));
            png_read_image(png, rows.data());
        } else {
            for (int y = 0; y < imageHeight; ++y) {
                png_bytep row = bitmap.get() + stride * size_t(y);
                png_read_row(png, row, nullptr);
                if (sample.kind == Kind::Rgba8) {
                    for (int x = 0; x < imageWidth; ++x) {
                        png_bytep p = row + 4 * x;
                        const unsigned a = p[3];
                        p[0] = png_byte(p[0] * a / 255);
                        p[1] = png_byte(p[1] * a / 255);
                        p[2] = png_byte(p[2] * a / 255);
                    }
                }
            }
        }
        png_read_end(png, nullptr);
        png_destroy_read_struct(&png, &info, nullptr);
        benchmark::DoNotOptimize(bitmap.get());
    }
    state.counters["MB/s"]
        = benchmark::Counter(double(imageWidth) * imageHeight * state.iterations() / 1e6, benchmark::Counter::kIsRate);
}

void uncompressOnly(benchmark::State &state, const Sample &sample)
{
    const QByteArray data = imageDataOf(fileOf(sample));
    const size_t size = inflatedSize(sample);
    for (auto _ : state) {
        std::unique_ptr<Bytef[]> out(new Bytef[size]);
        uLongf length = uLongf(size);
        if (uncompress(out.get(), &length, reinterpret_cast<const Bytef *>(data.constData()), uLong(data.size()))
                != Z_OK
            || length != size)
            state.SkipWithError("uncompress failed");
        benchmark::DoNotOptimize(out.get());
    }
    state.counters["MB/s"]
        = benchmark::Counter(double(imageWidth) * imageHeight * state.iterations() / 1e6, benchmark::Counter::kIsRate);
}

const bool registered = [] {
    for (const Sample &sample : samples) {
        const std::string name = sample.name;
        benchmark::RegisterBenchmark(("uncompress/" + name).c_str(), uncompressOnly, sample)
            ->Unit(benchmark::kMillisecond);
        benchmark::RegisterBenchmark(("StdPNG/" + name).c_str(), stdPngDecode, sample)->Unit(benchmark::kMillisecond);
        benchmark::RegisterBenchmark(("libpng/" + name).c_str(), libpngDecode, sample)->Unit(benchmark::kMillisecond);
    }
    return true;
}();

} // namespace

BENCHMARK_MAIN();
