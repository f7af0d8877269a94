#pragma once

#include "platform/gdi/Surface.h"

#include <QRect>

#include <utility>
#include <vector>

// Pixel-exact pens: lines, outlines and round dots, in copy or XOR mode.
namespace zelctl::gdi::detail {

enum class PenMode { Copy, Xor };

// The pixels a pen touches, gathered first so that XOR changes each of them only once
// however often the shape passes over it.
class Coverage
{
public:
    // Only pixels inside bounds (the surface) are kept.
    explicit Coverage(const QRect &bounds);

    void addPoint(int x, int y);
    // A filled circle with the given diameter round the centre of pixel (x, y); an even
    // diameter is centred on the pixel's top-left corner.
    void addDot(int x, int y, int diameter);
    // From (x0, y0) up to, not including, (x1, y1), stamped with dots of the pen width.
    void addLine(int x0, int y0, int x1, int y1, int width);

    void apply(const Surface &surface, quint32 value, PenMode mode) const;

private:
    // Pixels left to right on one row, from x0 to x1 inclusive.
    struct Span
    {
        int y, x0, x1;
    };

    void mark(int x, int y);
    void keep(int y, int x0, int x1);

    QRect m_bounds;
    std::vector<Span> m_spans;
    // Whether each span lies after the one before it on the page, so no pixel repeats.
    bool m_ordered = true;
};

} // namespace zelctl::gdi::detail
