#include "Command.h"
#include "InputFile.h"

#include "png/PngChunkReader.h"
#include "png/PngDecoder.h"
#include "png/StdPNG.h"
#include "png/stdPNGdata.h"

#include <QFile>

#include <algorithm>
#include <array>
#include <cstring>
#include <vector>

namespace {

QString joined(const auto &values)
{
    QStringList parts;
    for (const auto value : values)
        parts.append(QString::number(value));
    return parts.join(' ');
}

// The bitmap's pixels as R, G, B, A bytes (a little-endian word): table-based pixels through
// their table (entries it lacks are black), 24-bit pixels opaque, 32-bit ones as stored.
class PamRows
{
public:
    explicit PamRows(const zelctl::stdPNGdata &image)
        : m_bits(image.Bits())
    {
        m_table.fill(0xFF000000u);
        const std::vector<uint32_t> &table = image.ColorTable();
        for (size_t i = 0; i < std::min<size_t>(table.size(), 256); ++i)
            m_table[i] = 0xFF000000u | (table[i] >> 16 & 0xFF) | (table[i] & 0xFF00) | (table[i] & 0xFF) << 16;
    }

    void convert(int y, uint32_t *out) const
    {
        const uint8_t *row = m_bits.row(y);
        const int width = m_bits.width;
        switch (m_bits.bitCount) {
        case 32:
            for (int x = 0; x < width; ++x) {
                uint32_t bgra;
                std::memcpy(&bgra, row + 4 * x, 4);
                out[x] = (bgra & 0xFF00FF00u) | (bgra >> 16 & 0xFF) | (bgra & 0xFF) << 16;
            }
            break;
        case 24:
            for (int x = 0; x < width; ++x, row += 3)
                out[x] = 0xFF000000u | row[2] | row[1] << 8 | uint32_t(row[0]) << 16;
            break;
        case 8:
            for (int x = 0; x < width; ++x)
                out[x] = m_table[row[x]];
            break;
        case 4:
            for (int x = 0; x < width; ++x)
                out[x] = m_table[(row[x / 2] >> (x % 2 ? 0 : 4)) & 0xF];
            break;
        default:
            for (int x = 0; x < width; ++x)
                out[x] = m_table[(row[x / 8] >> (7 - x % 8)) & 1];
            break;
        }
    }

private:
    zelctl::png::BitmapView m_bits;
    std::array<uint32_t, 256> m_table;
};

// Writes the bitmap as an 8-bit RGB_ALPHA PAM, a band of rows of about a megabyte at a time.
bool writePam(const zelctl::StdPNG &image, QFile &pam)
{
    const QByteArray header
        = QStringLiteral("P7\nWIDTH %1\nHEIGHT %2\nDEPTH 4\nMAXVAL 255\nTUPLTYPE RGB_ALPHA\nENDHDR\n")
              .arg(image.Width())
              .arg(image.Height())
              .toLatin1();
    if (pam.write(header) != header.size())
        return false;
    static_assert(Q_BYTE_ORDER == Q_LITTLE_ENDIAN, "PAM words are written as R, G, B, A bytes");
    const PamRows rows(image.ImageData());
    const int width = image.Width();
    const int height = image.Height();
    const int band = std::max(1, (1 << 18) / width);
    std::vector<uint32_t> pixels(size_t(width) * size_t(std::min(band, height)));
    for (int top = 0; top < height; top += band) {
        const int count = std::min(band, height - top);
        for (int k = 0; k < count; ++k)
            rows.convert(top + k, pixels.data() + size_t(k) * size_t(width));
        const qint64 bytes = qint64(width) * count * 4;
        if (pam.write(reinterpret_cast<const char *>(pixels.data()), bytes) != bytes)
            return false;
    }
    return true;
}

} // namespace

// zelctl png-info FILE: the header and ancillary data, one "Name: value" a line.
int runPngInfo(const QStringList &args, QTextStream &out, QTextStream &err)
{
    if (args.size() != 1) {
        err << "usage: zelctl png-info FILE\n";
        return 2;
    }
    const std::optional<QByteArray> file = readInputFile(args.first(), zelctl::png::MaxFileBytes, "png-info", err);
    if (!file)
        return 1;
    zelctl::StdPNG image;
    if (!image.LoadData(*file)) {
        err << "zelctl png-info: " << args.first() << ": " << image.FailureReason() << '\n';
        return 1;
    }
    out << "Width: " << image.Width() << '\n';
    out << "Height: " << image.Height() << '\n';
    out << "ColorType: " << image.ColorType() << '\n';
    out << "BitCount_PNG: " << image.BitCount_PNG() << '\n';
    out << "IsInterlaced: " << (image.IsInterlaced() ? "true" : "false") << '\n';
    out << "BitCount_BMP: " << image.BitCount_BMP() << '\n';
    out << "ScanLineWidth: " << image.ScanLineWidth() << '\n';
    if (image.GammaCorrection() != 0)
        out << "GammaCorrection: " << image.GammaCorrection() << '\n';
    if (!image.Chromaticity().isEmpty())
        out << "Chromaticity: " << joined(image.Chromaticity()) << '\n';
    if (!image.AspectRatio().isEmpty())
        out << "AspectRatio: " << joined(image.AspectRatio()) << '\n';
    if (!image.Offsets().isEmpty())
        out << "Offsets: " << joined(image.Offsets()) << '\n';
    if (image.StdRGB())
        out << "StdRGB: " << image.StdRGB() << '\n';
    if (image.LastModified().isValid())
        out << "LastModified: " << image.LastModified().toString(Qt::ISODate) << '\n';
    if (!image.Palette().isEmpty())
        out << "Palette: " << image.Palette().size() / 3 << " entries\n";
    const QString comments = image.Comments();
    if (!comments.isEmpty()) {
        for (const QString &line : comments.split(QStringLiteral("\r\n")))
            out << "Comment: " << line << '\n';
    }
    return 0;
}

// zelctl png-decode [--transparent-style N] [--make32] [--alpha A] FILE OUT.pam
int runPngDecode(const QStringList &args, QTextStream &, QTextStream &err)
{
    const char *usage = "usage: zelctl png-decode [--transparent-style N] [--make32] [--alpha A] FILE OUT.pam\n";
    zelctl::StdPNG image;
    bool make32 = false;
    int alpha = 255;
    QStringList files;
    for (int i = 0; i < args.size(); ++i) {
        bool ok = true;
        if (args[i] == "--make32") {
            make32 = true;
        } else if (args[i] == "--transparent-style" && i + 1 < args.size()) {
            image.setTransparentStyle(args[++i].toInt(&ok, 0));
        } else if (args[i] == "--alpha" && i + 1 < args.size()) {
            alpha = args[++i].toInt(&ok);
            ok = ok && alpha >= 0 && alpha <= 255;
        } else if (args[i].startsWith("--")) {
            ok = false;
        } else {
            files.append(args[i]);
        }
        if (!ok) {
            err << "zelctl png-decode: bad option '" << args[i] << "'\n" << usage;
            return 2;
        }
    }
    if (files.size() != 2) {
        err << usage;
        return 2;
    }
    const std::optional<QByteArray> file = readInputFile(files[0], zelctl::png::MaxFileBytes, "png-decode", err);
    if (!file)
        return 1;
    if (!image.LoadData(*file, true, make32, quint8(alpha))) {
        err << "zelctl png-decode: " << files[0] << ": " << image.FailureReason() << '\n';
        return 1;
    }
    QFile pam(files[1]);
    if (!pam.open(QIODevice::WriteOnly) || !writePam(image, pam) || !pam.flush()) {
        err << "zelctl png-decode: cannot write " << files[1] << '\n';
        return 1;
    }
    return 0;
}
