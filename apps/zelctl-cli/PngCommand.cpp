#include "Command.h"
#include "InputFile.h"

#include "png/PngDecoder.h"
#include "png/StdPNG.h"
#include "png/stdPNGdata.h"

#include <QFile>

namespace {

QString joined(const auto &values)
{
    QStringList parts;
    for (const auto value : values)
        parts.append(QString::number(value));
    return parts.join(' ');
}

// The bitmap as R, G, B, A per pixel: table-based pixels through their table.
QByteArray rgbaPixels(const zelctl::StdPNG &image)
{
    const zelctl::png::BitmapView bits = image.ImageData().Bits();
    const std::vector<uint32_t> &table = image.ImageData().ColorTable();
    QByteArray out;
    out.reserve(qsizetype(bits.width) * bits.height * 4);
    for (int y = 0; y < bits.height; ++y) {
        const uint8_t *row = bits.row(y);
        for (int x = 0; x < bits.width; ++x) {
            if (bits.bitCount == 32) {
                out.append(char(row[4 * x + 2])).append(char(row[4 * x + 1])).append(char(row[4 * x]));
                out.append(char(row[4 * x + 3]));
                continue;
            }
            if (bits.bitCount == 24) {
                out.append(char(row[3 * x + 2])).append(char(row[3 * x + 1])).append(char(row[3 * x]));
                out.append(char(0xFF));
                continue;
            }
            unsigned index = row[x * bits.bitCount / 8];
            if (bits.bitCount == 4)
                index = (index >> (x % 2 ? 0 : 4)) & 0xF;
            else if (bits.bitCount == 1)
                index = (index >> (7 - x % 8)) & 1;
            const uint32_t color = index < table.size() ? table[index] : 0;
            out.append(char(color >> 16)).append(char(color >> 8)).append(char(color)).append(char(0xFF));
        }
    }
    return out;
}

} // namespace

// zelctl png-info FILE: the header and ancillary data, one "Name: value" a line.
int runPngInfo(const QStringList &args, QTextStream &out, QTextStream &err)
{
    if (args.size() != 1) {
        err << "usage: zelctl png-info FILE\n";
        return 2;
    }
    const std::optional<QByteArray> file = readInputFile(args.first(), MaxPngFileBytes, "png-info", err);
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
    const std::optional<QByteArray> file = readInputFile(files[0], MaxPngFileBytes, "png-decode", err);
    if (!file)
        return 1;
    if (!image.LoadData(*file, true, make32, quint8(alpha))) {
        err << "zelctl png-decode: " << files[0] << ": " << image.FailureReason() << '\n';
        return 1;
    }
    QFile pam(files[1]);
    const QByteArray header
        = QStringLiteral("P7\nWIDTH %1\nHEIGHT %2\nDEPTH 4\nMAXVAL 255\nTUPLTYPE RGB_ALPHA\nENDHDR\n")
              .arg(image.Width())
              .arg(image.Height())
              .toLatin1();
    if (!pam.open(QIODevice::WriteOnly) || pam.write(header) != header.size() || !pam.write(rgbaPixels(image))
        || !pam.flush()) {
        err << "zelctl png-decode: cannot write " << files[1] << '\n';
        return 1;
    }
    return 0;
}
