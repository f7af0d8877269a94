#include "Command.h"

#include "gif/GifFrameDecoder.h"
#include "gif/GifLimits.h"
#include "gif/GifScanner.h"

#include <QFile>

namespace {

quint32 fnv1a(QByteArrayView bytes)
{
    quint32 hash = 2166136261u;
    for (char byte : bytes) {
        hash ^= quint8(byte);
        hash *= 16777619u;
    }
    return hash;
}

} // namespace

// zelctl gif-info [--hash] FILE: the loop count and each frame as the animated GIF control
// reads it; with --hash, the FNV-1a hash of each frame's palette indices.
int runGifInfo(const QStringList &args, QTextStream &out, QTextStream &err)
{
    QStringList rest = args;
    const bool withHash = rest.removeAll(QStringLiteral("--hash")) > 0;
    if (rest.size() != 1 || rest.first().startsWith(QLatin1String("--"))) {
        err << "usage: zelctl gif-info [--hash] FILE\n";
        return 2;
    }
    QFile file(rest.first());
    if (!file.open(QIODevice::ReadOnly)) {
        err << "zelctl gif-info: cannot read " << rest.first() << ": " << file.errorString() << '\n';
        return 1;
    }
    if (file.size() > zelctl::gifLimits::MaxFileBytes) {
        err << "zelctl gif-info: " << rest.first() << " is larger than " << zelctl::gifLimits::MaxFileBytes
            << " bytes\n";
        return 1;
    }
    const QByteArray bytes = file.readAll();
    const zelctl::gifScanner::GifLayout layout = zelctl::gifScanner::scan(bytes);
    if (layout.Frames.isEmpty()) {
        err << "zelctl gif-info: " << rest.first() << " holds no GIF frame that can be shown\n";
        return 1;
    }

    out << "loops: " << layout.LoopCount << '\n';
    out << "frames: " << layout.Frames.size() << '\n';
    for (qsizetype i = 0; i < layout.Frames.size(); ++i) {
        const zelctl::gifScanner::FrameRecord &frame = layout.Frames[i];
        const int localSize = frame.ColorTable > 0 ? layout.ColorTables[frame.ColorTable].count : 0;
        out << "frame " << i + 1 << ": left " << frame.Left << " top " << frame.Top << " width " << frame.Width
            << " height " << frame.Height << " delay " << frame.Delay << " disposal " << int(frame.Disposal)
            << " transparent " << (frame.HasTransparency ? int(frame.TransparentIndex) : -1) << " local-table "
            << localSize;
        if (withHash) {
            QByteArray indices(qsizetype(frame.Width) * frame.Height, '\0');
            if (!zelctl::gifFrameDecoder::decode(
                    bytes, layout.BlockList[i], frame, reinterpret_cast<uchar *>(indices.data()), frame.Width))
                out << " damaged";
            out << " hash " << QStringLiteral("%1").arg(fnv1a(indices), 8, 16, QLatin1Char('0'));
        }
        out << '\n';
    }
    return 0;
}
