#pragma once

// Lengths on the public interfaces are twips: 1/1440 inch, 15 twips per pixel at 96 dpi.
namespace zelctl::platform {

inline constexpr int TwipsPerPixel = 15;

constexpr int pixelsFromTwips(int twips)
{
    return twips / TwipsPerPixel;
}

constexpr int twipsFromPixels(int pixels)
{
    return pixels * TwipsPerPixel;
}

static_assert(pixelsFromTwips(twipsFromPixels(7)) == 7);

} // namespace zelctl::platform
