// Feeds arbitrary bytes to the animated GIF control and draws every frame it finds, the
// way a host showing an untrusted GIF would, up to the largest frames the control takes.

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
    // Frames up to the control's own limits are loaded and drawn; a big canvas costs its
    // composition on every frame, so those files draw only their first two frames.
    const zelctl::gifScanner::GifLayout layout = zelctl::gifScanner::scan(bytes);
    const bool big = qint64(layout.CanvasWidth) * layout.CanvasHeight > (qint64(1) << 20);

    zelctl::ucAniGIF gif;
    gif.setDelayAnimation(zelctl::ucAniGIF::gfdDoNotAnimate);
    // Mostly unscaled, which is fast; every fourth input scaled with halftone. A big canvas
    // is clipped to the small control: its halftone would cost seconds an input.
    if (big)
        gif.setStretch(zelctl::ucAniGIF::gfsClip);
    else
        gif.setStretch(size % 4 == 0 ? zelctl::ucAniGIF::gfsStretch : zelctl::ucAniGIF::gfsActualSize);
    gif.resize(37, 23);
    if (!gif.LoadAnimatedGIF_Array(bytes))
        return 0;
    gif.setMirrored(int(size % 4));
    QImage target(gif.size(), QImage::Format_ARGB32);
    // Every frame once, then a jump back, which composes from the first frame again.
    const int frames = std::min(gif.FrameCount(), big ? 2 : 24);
    for (int i = 0; i <= frames; ++i) {
        gif.render(&target);
        gif.setAction(zelctl::ucAniGIF::gfaForward);
    }
    gif.setAction(zelctl::ucAniGIF::gfaStop);
    gif.render(&target);
    if (size < 4096 && !big)
        gif.AnimatedGIF();
    return 0;
}
