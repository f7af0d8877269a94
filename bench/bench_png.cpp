// StdPNG beside libpng, libspng and stb_image on large photo-like images of every colour
// type, in one run: every decoder decodes every image once per round, in an order that
// turns from round to round, and the table gives the median of the rounds. A machine
// shared with other work slows all decoders of a round alike, so the ratios hold.
//
// Two outputs are compared:
// - the bitmap StdPNG makes by default (TransparentStyle alphaTransparent) beside libpng
//   producing the same rows (B, G, R order, 16-bit samples cut to 8, alpha premultiplied)
//   and libspng and stb_image producing their nearest format (they do not premultiply);
// - StdPNG with Make32Bit beside the RGBA8 output of each peer.
// Then the peak memory of StdPNG.LoadFile, each image in a fresh process.
//
//   build/bench/bench_png [--rounds N] [--write DIR]
// --write DIR only writes the images as DIR/NAME.png (for bench/png-decode-vs-libpng).

#include "png/StdPNG.h"

#include <png.h>
#include <spng.h>
#include <stb_image.h>

#include <QByteArray>
#include <QDir>
#include <QFile>
#include <QTemporaryDir>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <functional>
#include <malloc.h>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

namespace {

struct Sample
{
    const char *name;
    int colorType;
    int bitDepth;
    bool interlaced;
    bool transparency;
    int width = 3000;
    int height = 2000;

    int channels() const { return colorType == PNG_COLOR_TYPE_RGB_ALPHA ? 4 : colorType == PNG_COLOR_TYPE_RGB ? 3 : 1; }
    bool alpha() const { return colorType == PNG_COLOR_TYPE_RGB_ALPHA || transparency; }
};

const Sample samples[] = {
    { "grey8", PNG_COLOR_TYPE_GRAY, 8, false, false },
    { "palette8", PNG_COLOR_TYPE_PALETTE, 8, false, false },
    { "palette8+tRNS", PNG_COLOR_TYPE_PALETTE, 8, false, true },
    { "RGB8", PNG_COLOR_TYPE_RGB, 8, false, false },
    { "RGB16", PNG_COLOR_TYPE_RGB, 16, false, false },
    { "RGBA8", PNG_COLOR_TYPE_RGB_ALPHA, 8, false, false },
    { "RGBA16", PNG_COLOR_TYPE_RGB_ALPHA, 16, false, false },
    { "interlaced-RGB8", PNG_COLOR_TYPE_RGB, 8, true, false },
};

// Only in the memory table: an image whose bitmap is over 64 MiB, which StdPNG streams.
const Sample large = { "RGBA8-6000x4000", PNG_COLOR_TYPE_RGB_ALPHA, 8, false, false, 6000, 4000 };

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

int clampTo(double v, int maximum)
{
    return v < 0 ? 0 : v > maximum ? maximum : int(v);
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
    png_set_IHDR(png, info, png_uint_32(sample.width), png_uint_32(sample.height), sample.bitDepth, sample.colorType,
        sample.interlaced ? PNG_INTERLACE_ADAM7 : PNG_INTERLACE_NONE, PNG_COMPRESSION_TYPE_BASE, PNG_FILTER_TYPE_BASE);
    if (sample.colorType == PNG_COLOR_TYPE_PALETTE) {
        std::vector<png_color> palette(256);
        std::vector<png_byte> alpha(256);
        for (int i = 0; i < 256; ++i) {
            palette[size_t(i)] = { png_byte(i), png_byte(clampTo(i * 0.8 + 30, 255)), png_byte(255 - i) };
            alpha[size_t(i)] = png_byte(i < 40 ? 0 : i > 200 ? 255 : (i - 40) * 255 / 160);
        }
        png_set_PLTE(png, info, palette.data(), 256);
        if (sample.transparency)
            png_set_tRNS(png, info, alpha.data(), 256, nullptr);
    }
    png_write_info(png, info);

    const int channels = sample.channels();
    const int bytes = sample.bitDepth / 8;
    const size_t rowBytes = size_t(sample.width) * size_t(channels * bytes);
    std::vector<png_byte> pixels(rowBytes * size_t(sample.height));
    Noise noise;
    for (int y = 0; y < sample.height; ++y) {
        for (int x = 0; x < sample.width; ++x) {
            png_byte *p = pixels.data() + size_t(y) * rowBytes + size_t(x) * size_t(channels * bytes);
            for (int c = 0; c < channels; ++c) {
                double value = scene(x, y, c) + noise.next(3);
                if (c == 3) // an alpha that fades out towards the corners
                    value = 255 - std::hypot(x - sample.width / 2, y - sample.height / 2) / 7;
                if (bytes == 2) {
                    const int wide = clampTo(clampTo(value, 255) * 257 + noise.next(100), 65535);
                    p[2 * c] = png_byte(wide >> 8);
                    p[2 * c + 1] = png_byte(wide);
                } else {
                    p[c] = png_byte(clampTo(value, 255));
                }
            }
        }
    }
    std::vector<png_bytep> rows;
    for (int y = 0; y < sample.height; ++y)
        rows.push_back(pixels.data() + size_t(y) * rowBytes);
    png_write_image(png, rows.data());
    png_write_end(png, nullptr);
    png_destroy_write_struct(&png, &info);
    return out;
}

// --- The decoders ---------------------------------------------------------------------------

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

void premultiply(png_bytep row, int width)
{
    for (int x = 0; x < width; ++x) {
        png_bytep p = row + 4 * x;
        const unsigned a = p[3];
        p[0] = png_byte(p[0] * a / 255);
        p[1] = png_byte(p[1] * a / 255);
        p[2] = png_byte(p[2] * a / 255);
    }
}

// libpng into a bitmap of 4-byte aligned rows: StdPNG's rows, or RGBA8.
bool libpngDecode(const QByteArray &file, bool rgba8)
{
    ReadCursor cursor { &file };
    png_structp png = png_create_read_struct(PNG_LIBPNG_VER_STRING, nullptr, nullptr, nullptr);
    png_infop info = png_create_info_struct(png);
    std::unique_ptr<png_byte[]> bitmap;
    if (setjmp(png_jmpbuf(png))) {
        png_destroy_read_struct(&png, &info, nullptr);
        return false;
    }
    png_set_read_fn(png, &cursor, readFromBuffer);
    png_read_info(png, info);
    const bool keyed = png_get_valid(png, info, PNG_INFO_tRNS);
    png_set_strip_16(png);
    if (rgba8) {
        png_set_expand(png);
        png_set_gray_to_rgb(png);
        png_set_add_alpha(png, 0xFF, PNG_FILLER_AFTER);
    } else {
        if (keyed)
            png_set_expand(png);
        png_set_bgr(png);
    }
    const int passes = png_set_interlace_handling(png);
    png_read_update_info(png, info);
    const int width = int(png_get_image_width(png, info));
    const int height = int(png_get_image_height(png, info));
    const bool premultiplied = !rgba8 && png_get_channels(png, info) == 4;
    const size_t stride = (png_get_rowbytes(png, info) + 3) & ~size_t(3);
    bitmap.reset(new png_byte[stride * size_t(height)]);
    if (passes > 1) {
        std::vector<png_bytep> rows;
        for (int y = 0; y < height; ++y)
            rows.push_back(bitmap.get() + stride * size_t(y));
        png_read_image(png, rows.data());
        for (int y = 0; premultiplied && y < height; ++y)
            premultiply(rows[size_t(y)], width);
    } else {
        for (int y = 0; y < height; ++y) {
            png_bytep row = bitmap.get() + stride * size_t(y);
            png_read_row(png, row, nullptr);
            if (premultiplied)
                premultiply(row, width);
        }
    }
    png_read_end(png, nullptr);
    png_destroy_read_struct(&png, &info, nullptr);
    return true;
}

// libspng's nearest format to StdPNG's bitmap, or RGBA8.
bool spngDecode(const QByteArray &file, const Sample &sample, bool rgba8)
{
    spng_ctx *context = spng_ctx_new(0);
    spng_set_png_buffer(context, file.constData(), size_t(file.size()));
    int format = SPNG_FMT_RGBA8;
    if (!rgba8 && !sample.alpha()) {
        format = sample.colorType == PNG_COLOR_TYPE_PALETTE ? SPNG_FMT_PNG
            : sample.colorType == PNG_COLOR_TYPE_GRAY       ? SPNG_FMT_G8
                                                            : SPNG_FMT_RGB8;
    }
    size_t size = 0;
    bool ok = spng_decoded_image_size(context, format, &size) == 0;
    if (ok) {
        std::unique_ptr<unsigned char[]> image(new unsigned char[size]);
        ok = spng_decode_image(context, image.get(), size, format, SPNG_DECODE_TRNS) == 0;
    }
    spng_ctx_free(context);
    return ok;
}

// stb_image's own channel count (palette images expanded), or RGBA8.
bool stbDecode(const QByteArray &file, bool rgba8)
{
    int width = 0, height = 0, channels = 0;
    stbi_uc *image = stbi_load_from_memory(reinterpret_cast<const stbi_uc *>(file.constData()), int(file.size()),
        &width, &height, &channels, rgba8 ? 4 : 0);
    stbi_image_free(image);
    return image != nullptr;
}

bool stdPngDecode(const QByteArray &file, bool make32)
{
    zelctl::StdPNG image;
    image.setTransparentStyle(zelctl::StdPNG::alphaTransparent);
    return image.LoadData(file, true, make32);
}

struct Decoder
{
    const char *name;
    std::function<bool(const QByteArray &, const Sample &, bool)> decode;
};

const Decoder decoders[] = {
    { "libpng", [](const QByteArray &f, const Sample &, bool rgba8) { return libpngDecode(f, rgba8); } },
    { "libspng", [](const QByteArray &f, const Sample &s, bool rgba8) { return spngDecode(f, s, rgba8); } },
    { "stb_image", [](const QByteArray &f, const Sample &, bool rgba8) { return stbDecode(f, rgba8); } },
    { "StdPNG", [](const QByteArray &f, const Sample &, bool make32) { return stdPngDecode(f, make32); } },
};
constexpr int decoderCount = int(std::size(decoders));
constexpr int stdPng = decoderCount - 1;

// --- Timing ---------------------------------------------------------------------------------

double median(std::vector<double> values)
{
    std::sort(values.begin(), values.end());
    const size_t n = values.size();
    return n % 2 ? values[n / 2] : (values[n / 2 - 1] + values[n / 2]) / 2;
}

// times[sample][output][decoder]: one duration in ms per round.
using Times = std::vector<std::vector<std::vector<std::vector<double>>>>;

Times measure(const std::vector<QByteArray> &files, int rounds)
{
    const int sampleCount = int(files.size());
    Times times(size_t(sampleCount), std::vector(2, std::vector(size_t(decoderCount), std::vector<double>())));
    for (int round = 0; round < rounds; ++round) {
        for (int s = 0; s < sampleCount; ++s) {
            for (int output = 0; output < 2; ++output) {
                for (int k = 0; k < decoderCount; ++k) {
                    const int d = (k + round + s) % decoderCount; // who goes first turns
                    const auto start = std::chrono::steady_clock::now();
                    if (!decoders[d].decode(files[size_t(s)], samples[s], output == 1))
                        throw std::runtime_error(std::string(decoders[d].name) + " failed on " + samples[s].name);
                    const std::chrono::duration<double, std::milli> took = std::chrono::steady_clock::now() - start;
                    times[size_t(s)][size_t(output)][size_t(d)].push_back(took.count());
                }
            }
        }
        std::fprintf(stderr, "\rround %d of %d", round + 1, rounds);
    }
    std::fprintf(stderr, "\n");
    return times;
}

void printTable(const Times &times, int output)
{
    std::printf("\n%s\n",
        output == 0 ? "Default bitmap (libpng: the same rows; libspng, stb_image: nearest format)"
                    : "Make32Bit (peers: RGBA8)");
    std::printf("%-16s", "image");
    for (const Decoder &decoder : decoders)
        std::printf(" %11s", decoder.name);
    std::printf("   StdPNG/libpng  /libspng  /stb_image\n");
    double logSum = 0;
    double worst = 0;
    bool aheadOfAll = true;
    for (size_t s = 0; s < times.size(); ++s) {
        std::vector<double> medians;
        for (int d = 0; d < decoderCount; ++d)
            medians.push_back(median(times[s][size_t(output)][size_t(d)]));
        std::printf("%-16s", samples[s].name);
        for (const double m : medians)
            std::printf(" %8.1f ms", m);
        const double ratio = medians[stdPng] / medians[0];
        std::printf("   %13.2f %9.2f %10.2f\n", ratio, medians[stdPng] / medians[1], medians[stdPng] / medians[2]);
        logSum += std::log(ratio);
        worst = std::max(worst, ratio);
        aheadOfAll = aheadOfAll && medians[stdPng] < medians[1] && medians[stdPng] < medians[2];
    }
    std::printf("geometric mean StdPNG/libpng %.2f (goal <= 0.75), worst %.2f (goal <= 1.00), %s\n",
        std::exp(logSum / double(times.size())), worst,
        aheadOfAll ? "ahead of libspng and stb_image on every image" : "NOT ahead of libspng and stb_image everywhere");
}

// --- Memory ---------------------------------------------------------------------------------

long statusKilobytes(const char *field)
{
    std::ifstream status("/proc/self/status");
    std::string line;
    while (std::getline(status, line)) {
        if (line.rfind(field, 0) == 0)
            return std::stol(line.substr(std::strlen(field)));
    }
    return -1;
}

// Peak growth of the resident memory while StdPNG loads the file, measured in the process
// itself (run fresh for each image by peakMegabytes). Every large block is mapped on its own,
// so that what is freed leaves the count.
double measurePeak(const QString &path, bool make32)
{
    mallopt(M_MMAP_THRESHOLD, 128 * 1024);
    mallopt(M_TRIM_THRESHOLD, 128 * 1024);
    zelctl::StdPNG image;
    image.setTransparentStyle(zelctl::StdPNG::alphaTransparent);
    std::ofstream("/proc/self/clear_refs") << "5";
    const long before = statusKilobytes("VmRSS:");
    if (!image.LoadFile(path, true, make32))
        return -1;
    return double(statusKilobytes("VmHWM:") - before) / 1024;
}

double peakMegabytes(const QString &path, bool make32)
{
    const std::string command = std::filesystem::read_symlink("/proc/self/exe").string() + " --peak "
        + path.toStdString() + (make32 ? " 32" : " default");
    FILE *child = popen(command.c_str(), "r");
    double peak = -1;
    if (!child || std::fscanf(child, "%lf", &peak) != 1)
        peak = -1;
    if (child)
        pclose(child);
    return peak;
}

double megabytes(double bytes)
{
    return bytes / (1024 * 1024);
}

void printMemory(const std::vector<Sample> &all, const std::vector<QByteArray> &files)
{
    QTemporaryDir folder;
    std::printf("\nPeak memory of StdPNG.LoadFile (MiB; growth of the resident set during the call)\n");
    std::printf("%-16s %8s %8s %8s %8s %9s  %s\n", "image", "output", "file", "bitmap", "inflated", "peak",
        "goal: peak <= file + bitmap + inflated; over 64 MiB of bitmap, <= 2 x bitmap");
    for (size_t s = 0; s < all.size(); ++s) {
        const Sample &sample = all[s];
        const QString path = folder.filePath(QString::number(s) + ".png");
        QFile out(path);
        if (!out.open(QIODevice::WriteOnly) || out.write(files[s]) != files[s].size())
            throw std::runtime_error("cannot write " + path.toStdString());
        out.close();
        const int streamBytes = sample.channels() * sample.bitDepth / 8;
        const double inflated = double(sample.height) * (double(sample.width) * streamBytes + 1);
        for (const bool make32 : { false, true }) {
            const int bitCount = make32 || sample.alpha() ? 32 : sample.colorType == PNG_COLOR_TYPE_RGB ? 24 : 8;
            const double bitmap = double(sample.height) * double((sample.width * bitCount + 31) / 32 * 4);
            const double peak = peakMegabytes(path, make32);
            const double file = megabytes(double(files[s].size()));
            const bool streamed = inflated > (int64_t(64) << 20);
            const bool met = streamed ? peak <= 2 * megabytes(bitmap) : peak <= file + megabytes(bitmap + inflated);
            std::printf("%-16s %8s %8.1f %8.1f %8.1f %9.1f  %s%s\n", sample.name, make32 ? "32-bit" : "default", file,
                megabytes(bitmap), megabytes(inflated), peak, met ? "met" : "NOT MET", streamed ? " (streamed)" : "");
        }
    }
}

} // namespace

int main(int argc, char **argv)
{
    int rounds = 15;
    QString writeTo;
    for (int i = 1; i < argc; ++i) {
        const std::string arg = argv[i];
        if (arg == "--rounds" && i + 1 < argc) {
            rounds = std::max(1, std::atoi(argv[++i]));
        } else if (arg == "--peak" && i + 2 < argc) {
            std::printf(
                "%.1f\n", measurePeak(QString::fromLocal8Bit(argv[i + 1]), std::strcmp(argv[i + 2], "32") == 0));
            return 0;
        } else if (arg == "--write" && i + 1 < argc) {
            writeTo = QString::fromLocal8Bit(argv[++i]);
        } else {
            std::fprintf(stderr, "usage: bench_png [--rounds N] [--write DIR]\n");
            return 2;
        }
    }
    std::vector<QByteArray> files;
    for (const Sample &sample : samples)
        files.push_back(encode(sample));
    if (!writeTo.isEmpty()) {
        QDir().mkpath(writeTo);
        for (size_t s = 0; s < files.size(); ++s) {
            QFile out(QDir(writeTo).filePath(QString::fromLatin1(samples[s].name) + ".png"));
            if (!out.open(QIODevice::WriteOnly) || out.write(files[s]) != files[s].size())
                return 1;
        }
        return 0;
    }
    const Times times = measure(files, rounds);
    std::printf(
        "%d images of %d x %d, %d rounds, medians\n", int(files.size()), samples[0].width, samples[0].height, rounds);
    printTable(times, 0);
    printTable(times, 1);

    std::vector<Sample> all(std::begin(samples), std::end(samples));
    all.push_back(large);
    files.push_back(encode(large));
    printMemory(all, files);
    return 0;
}
