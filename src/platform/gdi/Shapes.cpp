#include "Shapes.h"

#include <algorithm>
#include <cstdlib>

namespace zelctl::gdi::detail {

Coverage::Coverage(const QRect &bounds)
    : m_bounds(bounds)
{ }

void Coverage::mark(int x, int y)
{
    if (m_bounds.contains(x, y))
        keep(y, x, x);
}

void Coverage::keep(int y, int x0, int x1)
{
    if (!m_spans.empty() && (y < m_spans.back().y || (y == m_spans.back().y && x0 <= m_spans.back().x1)))
        m_ordered = false;
    m_spans.push_back({ y, x0, x1 });
}

void Coverage::addPoint(int x, int y)
{
    mark(x, y);
}

void Coverage::addDot(int x, int y, int diameter)
{
    if (diameter <= 1) {
        mark(x, y);
        return;
    }
    // In half-pixel units: pixel centres are odd, the circle's centre is odd for an odd
    // diameter (a pixel centre) and even for an even one (a pixel corner).
    const qint64 odd = diameter & 1;
    const qint64 cx = 2 * qint64(x) + odd, cy = 2 * qint64(y) + odd;
    const qint64 limit = qint64(diameter) * diameter;
    const int reach = diameter / 2 + 1;
    const int top = std::max(y - reach, m_bounds.top()), bottom = std::min(y + reach, m_bounds.bottom());
    const int left = std::max(x - reach, m_bounds.left()), right = std::min(x + reach, m_bounds.right());
    const auto inside = [&](int px, qint64 dy) {
        const qint64 dx = 2 * qint64(px) + 1 - cx;
        return dx * dx + dy * dy <= limit;
    };
    for (int py = top; py <= bottom; ++py) {
        const qint64 dy = 2 * qint64(py) + 1 - cy;
        // A row of a disc is one run: its first and last pixel inside the circle.
        int first = left;
        while (first <= right && !inside(first, dy))
            ++first;
        int last = right;
        while (last >= first && !inside(last, dy))
            --last;
        if (first <= last)
            keep(py, first, last);
    }
}

void Coverage::addLine(int x0, int y0, int x1, int y1, int width)
{
    // Only the part within a dot's reach of the bounds can mark anything: a line wholly
    // beyond them costs nothing, and a straight one is walked only where it is inside.
    const int reach = std::max(width, 1) / 2 + 1;
    const QRect near = m_bounds.adjusted(-reach, -reach, reach, reach);
    if (std::max(x0, x1) < near.left() || std::min(x0, x1) > near.right() || std::max(y0, y1) < near.top()
        || std::min(y0, y1) > near.bottom())
        return;
    if (x0 == x1 || y0 == y1) {
        const bool across = y0 == y1;
        const int from = across ? x0 : y0, to = across ? x1 : y1;
        const int low = across ? near.left() : near.top(), high = across ? near.right() : near.bottom();
        const int step = from < to ? 1 : -1;
        // The end point is left out, as below.
        const int first = step > 0 ? std::max(from, low) : std::min(from, high);
        const int last = step > 0 ? std::min(to - 1, high) : std::max(to + 1, low);
        for (int v = first; step > 0 ? v <= last : v >= last; v += step)
            addDot(across ? v : x0, across ? y0 : v, width);
        return;
    }
    // Bresenham; the end point is left out so that joined lines meet without overlap.
    const int dx = std::abs(x1 - x0), dy = -std::abs(y1 - y0);
    const int sx = x0 < x1 ? 1 : -1, sy = y0 < y1 ? 1 : -1;
    int error = dx + dy;
    int x = x0, y = y0;
    while (x != x1 || y != y1) {
        addDot(x, y, width);
        const int twice = 2 * error;
        if (twice >= dy) {
            error += dy;
            x += sx;
        }
        if (twice <= dx) {
            error += dx;
            y += sy;
        }
    }
}

void Coverage::apply(const Surface &surface, quint32 value, PenMode mode) const
{
    // XOR leaves the alpha of a 32-bit pixel as it was.
    const quint32 xorMask = surface.bpp == 32 ? value & 0xFFFFFFu : value;
    const auto set = [&](int y, int x) {
        uchar *row = surface.row(y);
        const quint32 old = readPixel(row, x, surface.bpp);
        writePixel(row, x, surface.bpp, mode == PenMode::Xor ? old ^ xorMask : value);
    };
    // Each pixel once, so XOR marks it once; a single dot or straight line comes in order.
    if (m_ordered) {
        for (const Span &span : m_spans)
            for (int x = span.x0; x <= span.x1; ++x)
                set(span.y, x);
        return;
    }
    std::vector<std::pair<int, int>> points; // (y, x)
    for (const Span &span : m_spans)
        for (int x = span.x0; x <= span.x1; ++x)
            points.emplace_back(span.y, x);
    std::sort(points.begin(), points.end());
    points.erase(std::unique(points.begin(), points.end()), points.end());
    for (const auto &[y, x] : points)
        set(y, x);
}

} // namespace zelctl::gdi::detail
