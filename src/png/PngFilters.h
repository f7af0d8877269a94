#pragma once

#include <QtGlobal>

#include <cstdint>

namespace zelctl::png {

// Restores one row in place. previous is the restored row above, or nullptr for the first
// row of an image or pass; distance is the stream's bytes per pixel (at least 1). False for
// a filter type other than 0-4.
bool unfilterRow(uint8_t filterType, uint8_t *row, const uint8_t *previous, qsizetype length, int distance);

} // namespace zelctl::png
