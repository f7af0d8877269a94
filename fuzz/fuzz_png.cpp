// Feeds arbitrary bytes to StdPNG's loader, with a progressive target so the display paths
// run too, then paints the result: any outcome but a crash, a sanitizer report or a hang is
// fine.

#include "platform/gdi/Gdi.h"
#include "png/StdPNG.h"

#include <QByteArray>

#include <cstddef>
#include <cstdint>

namespace {

// A 32-bit surface that outlives every input. Window 1 names no window, so repaints are
// skipped while the display still runs.
struct Target
{
    Target()
    {
        zelctl::gdi::BITMAPINFO info;
        info.bmiHeader.biWidth = 48;
        info.bmiHeader.biHeight = -48;
        info.bmiHeader.biBitCount = 32;
        dc = zelctl::gdi::CreateCompatibleDC(0);
        zelctl::gdi::SelectObject(dc, zelctl::gdi::CreateDIBSection(0, &info, zelctl::gdi::DIB_RGB_COLORS, nullptr));
    }
    qint32 dc = 0;
    qint32 window = 1;
};

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    static Target target;
    const QByteArray file = QByteArray::fromRawData(reinterpret_cast<const char *>(data), qsizetype(size));
    zelctl::StdPNG image;
    image.setTransparentStyle(size % 2 ? zelctl::StdPNG::alphaTransparent : zelctl::StdPNG::alphaPNGwindowBkg);
    image.setProgressiveDisplay(quint8(size % 3));
    QObject::connect(&image, &zelctl::StdPNG::ProgessiveDisplay,
        [](qint32, qint32, qint32 &dc, qint32 &hwnd, qint32, bool, qint32 &x, qint32 &y, bool, bool) {
            dc = target.dc;
            hwnd = target.window;
            x = 3;
            y = 5;
        });
    image.LoadData(file, size % 3 != 0, size % 5 == 0, uint8_t(size % 7 == 0 ? 128 : 255));
    image.Paint(target.dc, 1, 1, 20, 30, 0, 2, 2, 0, 0, 200);
    image.Comments();
    image.Palette();
    image.LastModified();
    return 0;
}
