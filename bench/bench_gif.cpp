// Loading and drawing a large animated GIF in the control, beside giflib's own DGifSlurp of
// the same bytes.
//
//   bench_gif [--benchmark_filter=...]

#include "gif/GifCanvas.h"
#include "gif/GifEncoder.h"
#include "gif/GifFrames.h"
#include "gif/ucAniGIF.h"

#include <QApplication>

#include <benchmark/benchmark.h>
#include <gif_lib.h>

#include <cstring>

using namespace zelctl;

namespace {

constexpr int Side = 500;
constexpr int FrameTotal = 120;

// 120 frames of 500 × 500, each with a local table of 256 colours, a transparent index and
// disposals 0 to 3 in turn: soft gradients with some noise, as a photographic GIF has.
const QByteArray &largeGif()
{
    static const QByteArray gif = [] {
        gifEncoder::Animation animation;
        animation.width = Side;
        animation.height = Side;
        animation.colorTables.append(gifScanner::ColorTable {});
        quint32 seed = 12345;
        auto random = [&seed] {
            seed = seed * 1103515245u + 12345u;
            return seed >> 16;
        };
        for (int f = 0; f < FrameTotal; ++f) {
            gifScanner::ColorTable table;
            table.count = 256;
            for (int k = 0; k < 256; ++k)
                table.entries[size_t(k)] = quint32((k + f) & 0xFF) << 16 | quint32(k) << 8 | quint32(255 - k);
            animation.colorTables.append(table);
            gifEncoder::Frame frame;
            frame.record.Width = Side;
            frame.record.Height = Side;
            frame.record.Delay = 40;
            frame.record.ColorTable = f + 1;
            frame.record.Disposal = quint8(f % 4);
            frame.record.HasTransparency = 1;
            frame.record.TransparentIndex = 0;
            frame.indices.resize(Side * Side);
            for (int y = 0; y < Side; ++y) {
                for (int x = 0; x < Side; ++x) {
                    const int gradient = (x + y + 4 * f) / 4 % 255 + 1;
                    const bool hole = ((x / 50 + y / 50 + f) % 5) == 0;
                    const int noise = int(random() % 5) - 2;
                    frame.indices[y * Side + x] = char(hole ? 0 : std::clamp(gradient + noise, 1, 255));
                }
            }
            animation.frames.append(frame);
        }
        return gifEncoder::encode(animation);
    }();
    return gif;
}

struct MemorySource
{
    const QByteArray *bytes;
    qsizetype pos = 0;
};

int readMemory(GifFileType *file, GifByteType *out, int n)
{
    auto *source = static_cast<MemorySource *>(file->UserData);
    const int count = int(std::min<qsizetype>(n, source->bytes->size() - source->pos));
    std::memcpy(out, source->bytes->constData() + source->pos, size_t(count));
    source->pos += count;
    return count;
}

void BM_DGifSlurp(benchmark::State &state)
{
    const QByteArray &gif = largeGif();
    for (auto _ : state) {
        MemorySource source { &gif };
        int error = 0;
        GifFileType *file = DGifOpen(&source, readMemory, &error);
        if (!file || DGifSlurp(file) != GIF_OK || file->ImageCount != FrameTotal)
            state.SkipWithError("giflib could not read the GIF");
        DGifCloseFile(file, &error);
    }
    state.SetBytesProcessed(qint64(state.iterations()) * gif.size());
}
BENCHMARK(BM_DGifSlurp)->Unit(benchmark::kMillisecond);

void BM_LoadIntoControl(benchmark::State &state)
{
    const QByteArray &gif = largeGif();
    ucAniGIF control;
    control.setDelayAnimation(ucAniGIF::gfdNone);
    for (auto _ : state) {
        if (!control.LoadAnimatedGIF_Array(gif) || control.FrameCount() != FrameTotal)
            state.SkipWithError("the control could not load the GIF");
    }
    state.SetBytesProcessed(qint64(state.iterations()) * gif.size());
}
BENCHMARK(BM_LoadIntoControl)->Unit(benchmark::kMillisecond);

// One frame after the other as the animation shows them: compose the next frame on the
// canvas (disposal, transparency, colour table) and draw the canvas through its mask onto
// the control's 32-bit surface.
void BM_DrawComposedFrame(benchmark::State &state)
{
    GifFrames frames;
    GifCanvas canvas;
    MemoryBitmap surface;
    if (!frames.load(largeGif()) || !canvas.create(Side, Side) || !surface.create(Side, Side, 32)) {
        state.SkipWithError("setup failed");
        return;
    }
    frames.decodeUpTo(frames.count());
    const bool scaled = state.range(0) != 0;
    const QRect to = scaled ? QRect(0, 0, Side * 3 / 4, Side * 3 / 4) : QRect(0, 0, Side, Side);
    if (scaled)
        gdi::SetStretchBltMode(surface.dc(), gdi::HALFTONE);
    int next = 1;
    for (auto _ : state) {
        canvas.show(frames, next);
        canvas.paint(surface.dc(), to);
        next = next % frames.count() + 1;
    }
    state.SetItemsProcessed(state.iterations());
    state.SetLabel(scaled ? "scaled to 375 x 375, halftone" : "500 x 500");
}
BENCHMARK(BM_DrawComposedFrame)->Arg(0)->Arg(1)->Unit(benchmark::kMicrosecond);

} // namespace

int main(int argc, char **argv)
{
    qputenv("QT_QPA_PLATFORM", "offscreen");
    QApplication app(argc, argv);
    benchmark::Initialize(&argc, argv);
    benchmark::AddCustomContext("gif bytes", std::to_string(largeGif().size()));
    benchmark::RunSpecifiedBenchmarks();
    benchmark::Shutdown();
    return 0;
}
