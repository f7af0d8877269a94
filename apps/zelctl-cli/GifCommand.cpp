#include "Command.h"
#include "InputFile.h"

#include "gif/GifFrames.h"
#include "gif/GifLimits.h"

namespace {

struct Fnv1a
{
    quint32 value = 2166136261u;

    void add(QByteArrayView bytes)
    {
        for (char byte : bytes) {
            value ^= quint8(byte);
            value *= 16777619u;
        }
    }
};

} // namespace

// zelctl gif-info [--hash] FILE: the loop count and each frame as the animated GIF control
// loads it, within the same limits; with --hash, the FNV-1a hash of each frame's palette
// indices.
int runGifInfo(const QStringList &args, QTextStream &out, QTextStream &err)
{
    QStringList rest = args;
    const bool withHash = rest.removeAll(QStringLiteral("--hash")) > 0;
    if (rest.size() != 1 || rest.first().startsWith(QLatin1String("--"))) {
        err << "usage: zelctl gif-info [--hash] FILE\n";
        return 2;
    }
    const std::optional<QByteArray> bytes
        = readInputFile(rest.first(), zelctl::gifLimits::MaxFileBytes, "gif-info", err);
    if (!bytes)
        return 1;
    zelctl::GifFrames frames;
    if (!frames.load(*bytes)) {
        err << "zelctl gif-info: " << rest.first() << " holds no GIF frame that can be shown\n";
        return 1;
    }

    out << "loops: " << frames.loopCount() << '\n';
    out << "frames: " << frames.count() << '\n';
    for (int i = 1; i <= frames.count(); ++i) {
        const zelctl::gifScanner::FrameRecord &frame = frames.frame(i);
        const int localSize = frame.ColorTable > 0 ? frames.table(frame.ColorTable).count : 0;
        out << "frame " << i << ": left " << frame.Left << " top " << frame.Top << " width " << frame.Width
            << " height " << frame.Height << " delay " << frame.Delay << " disposal " << int(frame.Disposal)
            << " transparent " << (frame.HasTransparency ? int(frame.TransparentIndex) : -1) << " local-table "
            << localSize;
        if (withHash) {
            if (!frames.decodeUpTo(i))
                out << " damaged";
            Fnv1a hash;
            for (int y = 0; y < frame.Height; ++y) {
                if (const uchar *row = frames.frameRow(i, y))
                    hash.add(QByteArrayView(row, frame.Width));
            }
            out << " hash " << QStringLiteral("%1").arg(hash.value, 8, 16, QLatin1Char('0'));
        }
        out << '\n';
    }
    return 0;
}
