#pragma once

#include <QByteArray>
#include <QString>

namespace zelctl::png {

// The lines "keyword: text" of the tEXt and zTXt records gathered by the reader (each a
// 4-byte little-endian length, the type, the data), joined by CR LF. Records without a
// keyword, and zTXt records that do not inflate, are left out.
QString commentText(const QByteArray &textRecords);

} // namespace zelctl::png
