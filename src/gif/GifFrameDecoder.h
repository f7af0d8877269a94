#pragma once

#include "zelctl_export.h"

#include "gif/GifScanner.h"

#include <QByteArrayView>

namespace zelctl::gifFrameDecoder {

// Decodes the LZW data of one frame into its palette indices: row y of the frame goes to
// target + y × stride, Width bytes each (interlaced frames are put in their right rows).
// The image block is taken from the GIF as the scanner found it and handed to giflib as a
// stream of its own. Rows the data does not reach are left as they were. False when the
// frame's data is damaged.
ZELCTL_EXPORT bool decode(QByteArrayView gif, const gifScanner::BlockEntry &block, const gifScanner::FrameRecord &frame,
    uchar *target, qsizetype stride);

} // namespace zelctl::gifFrameDecoder
