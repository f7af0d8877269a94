#pragma once

#include "zelctl_export.h"

#include "frame/ClassRegistry.h"

#include <QByteArray>
#include <QDateTime>
#include <QList>
#include <QObject>
#include <QString>

#include <memory>

namespace zelctl {

class stdPNGdata;

// Loads a PNG file into a device-independent bitmap, reports the file's header and
// ancillary data, and paints the bitmap into a device context. A load can show the image
// on a caller's DC while it decodes (ProgessiveDisplay). Property reads give 0, "" or an
// empty list while a load hides them: an opaque image from its ProgessiveDisplay event to the
// end of the load.
class ZELCTL_EXPORT StdPNG : public QObject
{
    Q_OBJECT
    // Header of the last file read; kept when a later file fails before its header.
    Q_PROPERTY(qint32 Width READ Width)
    Q_PROPERTY(qint32 Height READ Height)
    Q_PROPERTY(quint8 ColorType READ ColorType)
    Q_PROPERTY(bool IsInterlaced READ IsInterlaced)
    // Bits per pixel of the file, and of the bitmap (0 without one).
    Q_PROPERTY(quint8 BitCount_PNG READ BitCount_PNG)
    Q_PROPERTY(quint8 BitCount_BMP READ BitCount_BMP)
    // Bytes per bitmap row; 0 without a bitmap.
    Q_PROPERTY(qint32 ScanLineWidth READ ScanLineWidth)
    // gAMA as a number (0.45455); 0 when absent.
    Q_PROPERTY(double GammaCorrection READ GammaCorrection)
    // cHRM: white x, y, red x, y, green x, y, blue x, y; empty when absent.
    Q_PROPERTY(QList<double> Chromaticity READ Chromaticity)
    // pHYs: pixels per unit x, y, unit; empty when absent.
    Q_PROPERTY(QList<qint32> AspectRatio READ AspectRatio)
    // oFFs: x, y, unit; empty when absent.
    Q_PROPERTY(QList<qint32> Offsets READ Offsets)
    // sRGB rendering intent + 1; 0 when absent.
    Q_PROPERTY(quint8 StdRGB READ StdRGB)
    // tIME as stored (no time zone); invalid when absent or not a real moment.
    Q_PROPERTY(QDateTime LastModified READ LastModified)
    // R, G, B per entry. Palette images give their palette, grey images a grey ramp, others
    // nothing. Writing replaces the palette of palette and grey images; a grey image becomes a
    // palette image, and a palette image given nothing (and without tRNS) becomes grey.
    Q_PROPERTY(QByteArray Palette READ Palette WRITE setPalette)
    // Handle of the bitmap and of its own memory DC; 0 when there is none.
    Q_PROPERTY(qint32 handle READ handle)
    Q_PROPERTY(qint32 hdc READ hdc)
    // Whether the bitmap keeps a memory DC of its own (default true).
    Q_PROPERTY(bool HasOwnDC READ HasOwnDC WRITE setHasOwnDC)
    // enumAlphaBkg, or a background colour (OLE_COLOR); used by the next load.
    Q_PROPERTY(qint32 TransparentStyle READ TransparentStyle WRITE setTransparentStyle)
    // enumPgDsply flags below 7; used by the next load.
    Q_PROPERTY(quint8 ProgressiveDisplay READ ProgressiveDisplay WRITE setProgressiveDisplay)
    // Why the last LoadFile failed, in English; "" after a successful load.
    Q_PROPERTY(QString FailureReason READ FailureReason)

public:
    enum enumPgDsply {
        pngAuto = 0,
        pngFadeIn = 1,
        pngScanner = 2,
        pngNeverProgressive = 4,
        pngPixelated = 8,
    };
    Q_ENUM(enumPgDsply)

    enum enumAlphaBkg {
        alphaTransparent = -1,
        alphaNoBkgNoAlpha = -2,
        alphaTransColorBkg = -3,
        alphaPNGwindowBkg = -4,
    };
    Q_ENUM(enumAlphaBkg)

    explicit StdPNG(QObject *parent = nullptr);
    ~StdPNG() override;

    // Loads a file; true on success. ValidateAllData also checks the CRCs of the ancillary
    // chunks. Make32Bit, or an AlphaBlendValue below 255, gives a 32-bit bitmap; the value is
    // the opacity of the final paint to a progressive target and of an image laid on a
    // background. Returns false at once while a load of this object runs.
    Q_INVOKABLE bool LoadFile(
        const QString &FileName, bool ValidateAllData = true, bool Make32Bit = false, quint8 AlphaBlendValue = 255);
    // LoadFile on the bytes of a file already in memory.
    bool LoadData(
        const QByteArray &file, bool ValidateAllData = true, bool Make32Bit = false, quint8 AlphaBlendValue = 255);

    // Draws the image, or its part (pngX, pngY, pngCx, pngCy), at (destX, destY) of hdc, scaled
    // to destCx × destCy (0: the image's size). 32-bit bitmaps are blended with their alpha and
    // the constant opacity AlphaBlend; others are copied. PngDC 0 draws from the own DC.
    Q_INVOKABLE void Paint(qint32 hdc, qint32 destX, qint32 destY, qint32 destCx = 0, qint32 destCy = 0,
        qint32 PngDC = 0, qint32 pngX = 0, qint32 pngY = 0, qint32 pngCx = 0, qint32 pngCy = 0,
        quint8 AlphaBlend = 255);

    // Lines "keyword: text" of every tEXt and zTXt chunk, joined by CR LF; sNoCommentPrefix
    // when there are none.
    Q_INVOKABLE QString Comments(const QString &sNoCommentPrefix = QString()) const;

    qint32 Width() const;
    qint32 Height() const;
    quint8 ColorType() const;
    bool IsInterlaced() const;
    quint8 BitCount_PNG() const;
    quint8 BitCount_BMP() const;
    qint32 ScanLineWidth() const;
    double GammaCorrection() const;
    QList<double> Chromaticity() const;
    QList<qint32> AspectRatio() const;
    QList<qint32> Offsets() const;
    quint8 StdRGB() const;
    QDateTime LastModified() const;
    QByteArray Palette() const;
    void setPalette(const QByteArray &palette);
    qint32 handle() const;
    qint32 hdc() const;
    bool HasOwnDC() const;
    void setHasOwnDC(bool own);
    qint32 TransparentStyle() const;
    void setTransparentStyle(qint32 style);
    quint8 ProgressiveDisplay() const;
    void setProgressiveDisplay(quint8 mode);
    QString FailureReason() const;

    // The bitmap holder, for code of the library that draws the pixels itself.
    const stdPNGdata &ImageData() const;

Q_SIGNALS:
    // Percentage of the decoding done: 0 when decompression starts, 100 after the last row.
    void Progress(qint32 Percentage);
    // Once per load, after decompression, unless ProgressiveDisplay is pngNeverProgressive.
    // Set destinationDC and destinationHwnd (and X, Y) to watch the image appear on that DC at
    // (X, Y), with the window repainted as rows arrive.
    void ProgessiveDisplay(qint32 Width, qint32 Height, qint32 &destinationDC, qint32 &destinationHwnd,
        qint32 WinBkgColor, bool AlphaPng, qint32 &X, qint32 &Y, bool IsInterlaced, bool useProgression);

private:
    class Private;
    std::unique_ptr<Private> const d;
    LiveObject m_live;
};

} // namespace zelctl
