// Feeds arbitrary bytes to StdPNG's loader: any outcome but a crash, a sanitizer report or
// a hang is fine.

#include "png/StdPNG.h"

#include <QByteArray>

#include <cstddef>
#include <cstdint>

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    const QByteArray file = QByteArray::fromRawData(reinterpret_cast<const char *>(data), qsizetype(size));
    zelctl::StdPNG image;
    image.setTransparentStyle(size % 2 ? zelctl::StdPNG::alphaTransparent : zelctl::StdPNG::alphaPNGwindowBkg);
    image.LoadData(file, size % 3 != 0, size % 5 == 0, uint8_t(size % 7 == 0 ? 128 : 255));
    image.Comments();
    image.Palette();
    image.LastModified();
    return 0;
}
