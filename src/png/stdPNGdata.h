#pragma once

#include "zelctl_export.h"

#include "frame/ClassRegistry.h"

#include <QObject>

#include <cstdint>
#include <memory>
#include <vector>

namespace zelctl {

namespace png {
struct BitmapView;
}

// The bitmap of a StdPNG: a top-down device-independent section, its colour table and the
// memory DC it is selected into. Its public interface is empty; StdPNG creates and drives it.
class ZELCTL_EXPORT stdPNGdata : public QObject
{
    Q_OBJECT

public:
    explicit stdPNGdata(QObject *parent = nullptr);
    ~stdPNGdata() override;

    // Replaces the bitmap by a new one with all bytes 0, selected into a new memory DC of its
    // own; colours are 0x00RRGGBB entries for bit counts up to 8. False when the bitmap
    // cannot be made.
    bool CreateBitmap(int32_t width, int32_t height, int bitCount, const std::vector<uint32_t> &colors);
    // Releases the bitmap and its own DC.
    void ReleaseBitmap();
    bool HasBitmap() const;

    // The bitmap handle, 0 without a bitmap; the own DC, 0 without one.
    qint32 BitmapHandle() const;
    qint32 OwnDC() const;
    // Creates (selecting the bitmap) or deletes (deselecting it first) the own DC.
    void SetOwnDC(bool own);

    png::BitmapView Bits() const;
    int BitCount() const;
    // Bytes of the pixel memory: stride × height.
    int64_t ImageSize() const;
    const std::vector<uint32_t> &ColorTable() const;

private:
    class Private;
    std::unique_ptr<Private> const d;
    LiveObject m_live;
};

} // namespace zelctl
