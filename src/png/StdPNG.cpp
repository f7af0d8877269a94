#include "StdPNG.h"

#include "PngChunkReader.h"
#include "PngDecoder.h"
#include "PngImageStream.h"
#include "PngProgressiveDisplay.h"
#include "PngText.h"
#include "platform/FileRead.h"
#include "platform/OleColor.h"
#include "platform/gdi/Gdi.h"
#include "stdPNGdata.h"

#include <QGuiApplication>
#include <QPointer>
#include <QScreen>

#include <cstring>
#include <new>
#include <optional>

namespace zelctl {

ZELCTL_REGISTER_CLASS(StdPNG)

namespace {

// Bits of the load and display state.
enum StateFlag : qint32 {
    NoProgressiveTarget = 1,
    FadeInDisplay = 2,
    PixelatedDisplay = 4,
    ScannerDisplay = 8,
    AlphaNotKept = 16,
    Want32Bits = 32,
    DisplayBits = FadeInDisplay | PixelatedDisplay | ScannerDisplay,
    LoadInProgress = 2048,
    PropertiesHidden = 4096,
};

constexpr qint32 white = 0xFFFFFF;
// A deflate stream cannot expand its input by more than this, so a header that asks for
// more than the IDAT data can hold is refused before the bitmap is made.
constexpr qint64 maximumInflateRatio = 1032;

bool isAlphaImage(const png::Header &header, const png::FileInfo &info)
{
    return header.colorType == png::GreyAlpha || header.colorType == png::Rgba || info.transparentColor != -1;
}

// Moves the parts of the compressed stream together at the front of a file no one else
// holds, so that it is inflated at once without a copy.
QByteArrayView joinInPlace(QByteArray &file, const std::vector<QByteArrayView> &parts)
{
    char *bytes = file.data();
    qsizetype end = 0;
    for (const QByteArrayView part : parts) {
        std::memmove(bytes + end, part.data(), size_t(part.size()));
        end += part.size();
    }
    return QByteArrayView(bytes, end);
}

} // namespace

class StdPNG::Private
{
public:
    explicit Private(StdPNG *owner)
        : q(owner)
    { }

    bool load(QByteArray file, bool validateAllData, bool make32, quint8 alphaBlendValue);
    void reset();
    bool fail(const char *reason);
    void chooseDisplay(qint32 destinationDC, qint32 destinationHwnd);
    void chooseBackground();
    bool hidden() const { return stateFlags & PropertiesHidden; }

    StdPNG *q;
    png::Header header;
    png::FileInfo info;
    qint32 stateFlags = 0;
    bool notOwnDC = false;
    quint8 progressiveMode = 0;
    qint32 transparentStyle = 0;
    qint32 displayBackground = -1;
    QString failure;
    stdPNGdata imageData;
};

void StdPNG::Private::reset()
{
    const png::FileInfo empty;
    info = empty;
    imageData.ReleaseBitmap();
    displayBackground = -1;
    stateFlags = 0;
}

bool StdPNG::Private::fail(const char *reason)
{
    reset();
    failure = QString::fromLatin1(reason);
    return false;
}

void StdPNG::Private::chooseDisplay(qint32 destinationDC, qint32 destinationHwnd)
{
    if (destinationDC == 0 || destinationHwnd == 0)
        stateFlags |= NoProgressiveTarget;
    else if (isAlphaImage(header, info))
        stateFlags |= header.interlaced() ? FadeInDisplay : ScannerDisplay;
    else if (header.interlaced())
        stateFlags |= (progressiveMode & pngFadeIn) ? FadeInDisplay : PixelatedDisplay;
    else
        stateFlags |= ScannerDisplay;
}

void StdPNG::Private::chooseBackground()
{
    if (!isAlphaImage(header, info)) {
        stateFlags |= AlphaNotKept | PropertiesHidden;
        return;
    }
    const auto backgroundOrWhite = [this] {
        if (info.backgroundColor != -1) {
            displayBackground = info.backgroundColor;
        } else {
            stateFlags |= PropertiesHidden;
            displayBackground = white;
        }
    };
    switch (transparentStyle) {
    case alphaPNGwindowBkg:
        backgroundOrWhite();
        break;
    case alphaTransColorBkg:
        if (header.colorType == png::Indexed || header.colorType == png::GreyAlpha || header.colorType == png::Rgba) {
            stateFlags |= AlphaNotKept;
        } else if (header.colorType == png::Rgb) {
            const qint32 key = info.transparentColor;
            displayBackground = (key >> 16 & 0xFF) | (key & 0xFF00) | (key & 0xFF) << 16;
        } else {
            displayBackground = png::sampleColor(header, info.paletteBytes, info.transparentColor).value_or(-1);
        }
        if (displayBackground == -1 && !(stateFlags & AlphaNotKept))
            backgroundOrWhite();
        break;
    case alphaNoBkgNoAlpha:
        stateFlags |= AlphaNotKept | PropertiesHidden;
        break;
    case alphaTransparent:
        break;
    default:
        displayBackground = qint32(platform::translateColor(platform::OleColor(transparentStyle)));
        break;
    }
}

bool StdPNG::Private::load(QByteArray file, bool validateAllData, bool make32, quint8 alphaBlendValue)
{
    reset();
    failure.clear();
    png::ReadResult read = png::readChunks(file, validateAllData, header, info);
    if (!read.ok)
        return fail(read.reason);

    stateFlags = LoadInProgress;
    QPointer<StdPNG> alive(q);
    Q_EMIT q->Progress(0);
    if (!alive)
        return false;
    const int64_t inflatedSize = png::inflatedSize(header);
    if (inflatedSize > (read.imageDataSize + 1) * maximumInflateRatio)
        return fail(png::reason::Inflate);
    const bool whole = inflatedSize <= png::ImageStream::WholeLimit;
    if (whole && read.imageData.size() > 1 && file.isDetached())
        read.imageData = { joinInPlace(file, read.imageData) };
    png::ImageStream stream(std::move(read.imageData), inflatedSize,
        whole ? png::ImageStream::Mode::Whole : png::ImageStream::Mode::Streaming);
    if (stream.failed())
        return fail(png::reason::Inflate);
    if (whole)
        file = QByteArray(); // the bitmap takes its place

    if (make32 || alphaBlendValue < 255)
        stateFlags |= Want32Bits;
    qint32 destinationDC = 0;
    qint32 destinationHwnd = 0;
    qint32 x = 0;
    qint32 y = 0;
    if (progressiveMode < pngNeverProgressive) {
        // Decoding needs no GUI application (the command line tool makes a core one).
        const bool gui = qobject_cast<QGuiApplication *>(QCoreApplication::instance());
        const QScreen *screen = gui ? QGuiApplication::primaryScreen() : nullptr;
        const QSize screenSize = screen ? screen->size() : QSize();
        const bool useProgression = header.interlaced()
            || (header.height / 100) * (header.width / 100)
                > (screenSize.height() / 100) * (screenSize.width() / 100) / 3;
        Q_EMIT q->ProgessiveDisplay(header.width, header.height, destinationDC, destinationHwnd, info.backgroundColor,
            isAlphaImage(header, info), x, y, header.interlaced(), useProgression);
        if (!alive)
            return false;
    }
    chooseDisplay(destinationDC, destinationHwnd);
    chooseBackground();

    png::DecodeOptions options;
    options.alphaNotKept = stateFlags & AlphaNotKept;
    options.make32 = stateFlags & Want32Bits;
    options.fadeIn = stateFlags & FadeInDisplay;
    options.pixelated = stateFlags & PixelatedDisplay;
    options.displayBackground = displayBackground;
    const int bitCount = png::outputBitCount(header, info, options);
    if (bitCount == 0)
        return fail(png::reason::Format);
    if (!imageData.CreateBitmap(header.width, header.height, bitCount, png::colorTable(header, info, bitCount)))
        return fail(png::reason::Bitmap);

    std::optional<png::ProgressiveDisplay> display;
    if (!(stateFlags & NoProgressiveTarget)) {
        display.emplace(destinationDC, destinationHwnd, x, y, displayBackground);
        if (!display->start(imageData)) {
            display.reset();
            stateFlags |= NoProgressiveTarget;
        }
    }
    png::DecodeObserver observer;
    observer.progress = [&](int percentage) {
        Q_EMIT q->Progress(percentage);
        return !alive.isNull();
    };
    if (display && (stateFlags & ScannerDisplay)) {
        observer.rowsConverted = [&](qint32 first, qint32 count) { display->showRows(imageData, first, count); };
    } else if (display) {
        const bool fade = stateFlags & FadeInDisplay;
        observer.passConverted = [&, fade](int pass) { display->showPass(imageData, pass, fade); };
    }
    const bool decoded = png::decodeImage(header, info, options, stream, imageData.Bits(), observer);
    // A Progress handler may have deleted this object.
    if (!alive)
        return false;
    if (!decoded)
        return fail(stream.failed() ? png::reason::Inflate : png::reason::Unfilter);
    display.reset();
    if (displayBackground != -1)
        png::applyConstantOpacity(imageData.Bits(), alphaBlendValue);

    if (destinationDC && destinationHwnd)
        stateFlags &= ~PropertiesHidden;
    if ((stateFlags & NoProgressiveTarget) || !(stateFlags & DisplayBits)) {
        // An image laid on a background already carries the opacity.
        const quint8 opacity = displayBackground != -1 ? 255 : alphaBlendValue;
        png::ProgressiveDisplay::paintWhole(imageData, destinationDC, destinationHwnd, x, y, opacity);
    }
    if (notOwnDC)
        imageData.SetOwnDC(false);
    stateFlags = 0;
    return true;
}

StdPNG::StdPNG(QObject *parent)
    : QObject(parent)
    , d(std::make_unique<Private>(this))
{ }

StdPNG::~StdPNG() = default;

bool StdPNG::LoadFile(const QString &FileName, bool ValidateAllData, bool Make32Bit, quint8 AlphaBlendValue)
{
    if (d->stateFlags >= LoadInProgress)
        return false;
    // A FIFO or device is refused at once rather than waited on or read without end.
    platform::FileRead file = platform::readFile(FileName, png::MaxFileBytes);
    if (!file.ok()) {
        d->reset();
        d->failure = QString::fromLatin1(
            file.status == platform::FileRead::TooLarge ? png::reason::TooLarge : png::reason::Unreadable);
        return false;
    }
    return d->load(std::move(file.bytes), ValidateAllData, Make32Bit, AlphaBlendValue);
}

bool StdPNG::LoadData(const QByteArray &file, bool ValidateAllData, bool Make32Bit, quint8 AlphaBlendValue)
{
    if (d->stateFlags >= LoadInProgress)
        return false;
    return d->load(file, ValidateAllData, Make32Bit, AlphaBlendValue);
}

QString StdPNG::Comments(const QString &sNoCommentPrefix) const
{
    if (d->hidden())
        return {};
    const QString text = png::commentText(d->info.textRecords);
    return text.isEmpty() ? sNoCommentPrefix : text;
}

qint32 StdPNG::Width() const
{
    return d->hidden() ? 0 : d->header.width;
}

qint32 StdPNG::Height() const
{
    return d->hidden() ? 0 : d->header.height;
}

quint8 StdPNG::ColorType() const
{
    return d->hidden() ? 0 : d->header.colorType;
}

bool StdPNG::IsInterlaced() const
{
    return !d->hidden() && d->header.interlaced();
}

quint8 StdPNG::BitCount_PNG() const
{
    return d->hidden() ? 0 : quint8(d->header.streamBitsPerPixel());
}

quint8 StdPNG::BitCount_BMP() const
{
    return d->hidden() ? 0 : quint8(d->imageData.BitCount());
}

qint32 StdPNG::ScanLineWidth() const
{
    if (d->hidden() || !d->imageData.HasBitmap() || d->header.height < 1)
        return 0;
    return qint32(d->imageData.ImageSize() / d->header.height);
}

double StdPNG::GammaCorrection() const
{
    return d->hidden() ? 0.0 : d->info.gammaValue / 100000.0;
}

QList<double> StdPNG::Chromaticity() const
{
    QList<double> values;
    if (!d->hidden() && d->info.chromaticity) {
        for (const qint32 value : *d->info.chromaticity)
            values.append(value / 100000.0);
    }
    return values;
}

QList<qint32> StdPNG::AspectRatio() const
{
    if (d->hidden() || !d->info.physical)
        return {};
    return QList<qint32>(d->info.physical->begin(), d->info.physical->end());
}

QList<qint32> StdPNG::Offsets() const
{
    if (d->hidden() || !d->info.offsets)
        return {};
    return QList<qint32>(d->info.offsets->begin(), d->info.offsets->end());
}

quint8 StdPNG::StdRGB() const
{
    return d->hidden() ? 0 : d->info.stdRgbIntent;
}

QDateTime StdPNG::LastModified() const
{
    if (d->hidden() || !d->info.timeBytes)
        return {};
    const auto &t = *d->info.timeBytes;
    const int year = t[0] | t[1] << 8;
    const QDate date(year, t[2], t[3]);
    const QTime time(t[4], t[5], t[6]);
    if (year == 0 || !date.isValid() || !time.isValid())
        return {};
    return QDateTime(date, time);
}

QByteArray StdPNG::Palette() const
{
    if (d->hidden())
        return {};
    if (d->header.colorType == png::Indexed)
        return d->info.paletteBytes;
    if (d->header.colorType != png::Grey || !d->header.validBitDepth())
        return {};
    const int maximum = d->header.bitDepth >= 8 ? 255 : (1 << d->header.bitDepth) - 1;
    QByteArray ramp;
    for (int i = 0; i <= maximum; ++i)
        ramp.append(3, char(i * (255 / maximum)));
    return ramp;
}

void StdPNG::setPalette(const QByteArray &palette)
{
    png::Header &header = d->header;
    png::FileInfo &info = d->info;
    // A running load decodes with the header it read; the palette changes only between loads.
    if (d->stateFlags >= LoadInProgress || !header.validBitDepth()
        || (header.colorType != png::Indexed && header.colorType != png::Grey))
        return;
    if (palette.isEmpty()) {
        if (header.colorType == png::Indexed && info.transparentColor == -1) {
            header.colorType = png::Grey;
            info.paletteBytes.clear();
        }
        return;
    }
    const qsizetype size = header.bitDepth > 4 ? 768 : 3 << header.bitDepth;
    info.paletteBytes = palette.first(std::min(size, palette.size()));
    info.paletteBytes.append(size - info.paletteBytes.size(), '\0');
    if (header.colorType == png::Grey) {
        header.colorType = png::Indexed;
        if (info.transparentColor != -1) {
            info.transparencyBytes = QByteArray(size / 3, char(0xFF));
            if (info.transparentColor < size / 3)
                info.transparencyBytes[info.transparentColor] = 0;
            info.transparentColor = 0;
        }
    }
}

qint32 StdPNG::handle() const
{
    return d->imageData.BitmapHandle();
}

qint32 StdPNG::hdc() const
{
    return d->imageData.OwnDC();
}

bool StdPNG::HasOwnDC() const
{
    return !d->notOwnDC;
}

void StdPNG::setHasOwnDC(bool own)
{
    d->notOwnDC = !own;
    // A running load needs its DC for the progressive display; it applies the setting at the end.
    if (d->stateFlags < LoadInProgress)
        d->imageData.SetOwnDC(own);
}

qint32 StdPNG::TransparentStyle() const
{
    return d->transparentStyle;
}

void StdPNG::setTransparentStyle(qint32 style)
{
    d->transparentStyle = style;
}

quint8 StdPNG::ProgressiveDisplay() const
{
    return d->progressiveMode;
}

void StdPNG::setProgressiveDisplay(quint8 mode)
{
    if (mode < 7)
        d->progressiveMode = mode;
}

QString StdPNG::FailureReason() const
{
    return d->failure;
}

const stdPNGdata &StdPNG::ImageData() const
{
    return d->imageData;
}

void StdPNG::Paint(qint32 hdc, qint32 destX, qint32 destY, qint32 destCx, qint32 destCy, qint32 PngDC, qint32 pngX,
    qint32 pngY, qint32 pngCx, qint32 pngCy, quint8 AlphaBlend)
{
    const stdPNGdata &image = d->imageData;
    if (d->stateFlags >= LoadInProgress || !image.HasBitmap() || hdc == 0 || destCx < 0 || destCy < 0)
        return;
    const png::BitmapView bits = image.Bits();
    destCx = destCx ? destCx : bits.width;
    destCy = destCy ? destCy : bits.height;
    pngCx = pngCx < 1 ? bits.width : pngCx;
    pngCy = pngCy < 1 ? bits.height : pngCy;
    const qint32 source = PngDC ? PngDC : image.OwnDC();
    if (!source || !png::reachesTarget(hdc, destX, destY, destCx, destCy))
        return;
    const bool borrowed = source != image.OwnDC();
    const gdi::HGDIOBJ previous = borrowed ? gdi::SelectObject(source, image.BitmapHandle()) : 0;
    if (bits.bitCount == 32) {
        gdi::BLENDFUNCTION blend;
        blend.SourceConstantAlpha = AlphaBlend;
        blend.AlphaFormat = gdi::AC_SRC_ALPHA;
        gdi::AlphaBlend(hdc, destX, destY, destCx, destCy, source, pngX, pngY, pngCx, pngCy, blend);
    } else {
        gdi::StretchBlt(hdc, destX, destY, destCx, destCy, source, pngX, pngY, pngCx, pngCy, gdi::SRCCOPY);
    }
    if (borrowed && previous)
        gdi::SelectObject(source, previous);
}

} // namespace zelctl
