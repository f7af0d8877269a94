// Feeds arbitrary bytes to the animated GIF control and draws every frame it finds, the
// way a host showing an untrusted GIF would.

#include "gif/GifScanner.h"
#include "gif/ucAniGIF.h"

#include <QApplication>
#include <QImage>

#include <cstdint>
#include <cstdlib>

namespace {

QApplication *application = nullptr;

} // namespace

extern "C" int LLVMFuzzerInitialize(int *argc, char ***argv)
{
    qputenv("QT_QPA_PLATFORM", "offscreen");
    application = new QApplication(*argc, *argv);
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    const QByteArray bytes(reinterpret_cast<const char *>(data), qsizetype(size));
    // Files that declare huge frames cost their allocation on every run and find nothing
    // new, so only their scan is fuzzed; the memory limits have tests of their own.
    const zelctl::gifScanner::GifLayout layout = zelctl::gifScanner::scan(bytes);
    qint64 declared = qint64(layout.CanvasWidth) * layout.CanvasHeight;
    for (const zelctl::gifScanner::FrameRecord &frame : layout.Frames)
        declared += qint64(frame.Width) * frame.Height;
    if (declared > (qint64(1) << 18))
        return 0;

    zelctl::ucAniGIF gif;
    gif.setDelayAnimation(zelctl::ucAniGIF::gfdDoNotAnimate);
    // Mostly unscaled, which is fast; every fourth input scaled with halftone.
    gif.setStretch(size % 4 == 0 ? zelctl::ucAniGIF::gfsStretch : zelctl::ucAniGIF::gfsActualSize);
    gif.resize(37, 23);
    if (!gif.LoadAnimatedGIF_Array(bytes))
        return 0;
    gif.setMirrored(int(size % 4));
    QImage target(gif.size(), QImage::Format_ARGB32);
    // Every frame once, then a jump back, which composes from the first frame again.
    const int frames = std::min(gif.FrameCount(), 24);
    for (int i = 0; i <= frames; ++i) {
        gif.render(&target);
        gif.setAction(zelctl::ucAniGIF::gfaForward);
    }
    gif.setAction(zelctl::ucAniGIF::gfaStop);
    gif.render(&target);
    if (size < 4096)
        gif.AnimatedGIF();
    return 0;
}
