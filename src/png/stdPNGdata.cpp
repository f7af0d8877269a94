#include "stdPNGdata.h"

#include "PngDecoder.h"

#include <new>

namespace zelctl {

ZELCTL_REGISTER_CLASS(stdPNGdata)

class stdPNGdata::Private
{
public:
    std::unique_ptr<uint8_t[]> memory;
    png::BitmapView view;
    std::vector<uint32_t> colors;
};

stdPNGdata::stdPNGdata(QObject *parent)
    : QObject(parent)
    , d(std::make_unique<Private>())
{ }

stdPNGdata::~stdPNGdata() = default;

bool stdPNGdata::CreateBitmap(int32_t width, int32_t height, int bitCount, const std::vector<uint32_t> &colors)
{
    ReleaseBitmap();
    if (width < 1 || height < 1)
        return false;
    const qsizetype stride = png::bitmapStride(width, bitCount);
    d->memory.reset(new (std::nothrow) uint8_t[size_t(stride) * size_t(height)]());
    if (!d->memory)
        return false;
    d->view = { d->memory.get(), width, height, stride, bitCount };
    d->colors = colors;
    return true;
}

void stdPNGdata::ReleaseBitmap()
{
    d->memory.reset();
    d->view = {};
    d->colors.clear();
}

bool stdPNGdata::HasBitmap() const
{
    return d->view.bits != nullptr;
}

png::BitmapView stdPNGdata::Bits() const
{
    return d->view;
}

int stdPNGdata::BitCount() const
{
    return d->view.bitCount;
}

int64_t stdPNGdata::ImageSize() const
{
    return int64_t(d->view.stride) * d->view.height;
}

const std::vector<uint32_t> &stdPNGdata::ColorTable() const
{
    return d->colors;
}

} // namespace zelctl
