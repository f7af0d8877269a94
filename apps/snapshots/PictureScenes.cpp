#include "Stage.h"

#include "gif/GifEncoder.h"
#include "gif/ucAniGIF.h"
#include "platform/gdi/Gdi.h"
#include "platform/gdi/Pictures.h"
#include "png/StdPNG.h"

#include <QBuffer>
#include <QPainter>

#include <functional>

namespace zelctl::snapshots {

namespace {

constexpr int Side = 48;

// A picture whose alpha shows: a disc fading out to its edge and a half-transparent square,
// over nothing.
QByteArray pngWithAlpha()
{
    QImage image(Side, Side, QImage::Format_ARGB32);
    image.fill(Qt::transparent);
    QPainter painter(&image);
    QRadialGradient fade(QPointF(20, 20), 18);
    fade.setColorAt(0, QColor(200, 30, 40, 255));
    fade.setColorAt(0.6, QColor(200, 30, 40, 255));
    fade.setColorAt(1, QColor(200, 30, 40, 0));
    painter.setPen(Qt::NoPen);
    painter.setBrush(fade);
    painter.drawEllipse(QPointF(20, 20), 18, 18);
    painter.fillRect(QRect(24, 24, 20, 20), QColor(20, 60, 200, 128));
    painter.end();
    QByteArray file;
    QBuffer out(&file);
    out.open(QIODevice::WriteOnly);
    image.save(&out, "PNG");
    return file;
}

// A checkerboard, so what the picture leaves see-through shows.
QImage checkerboard(QSize size)
{
    QImage board(size, QImage::Format_RGB32);
    for (int y = 0; y < board.height(); ++y)
        for (int x = 0; x < board.width(); ++x)
            board.setPixel(x, y, ((x / 8 + y / 8) % 2) ? 0xFFFFFFFF : 0xFFC8C8C8);
    return board;
}

// What paint draws on a checkerboard of that size.
QImage paintedOnCheckerboard(QSize size, const std::function<void(qint32 dc)> &paint)
{
    const gdi::HBITMAP bitmap = gdi::createBitmapFromImage(checkerboard(size));
    const gdi::HDC dc = gdi::CreateCompatibleDC(0);
    const gdi::HGDIOBJ previous = gdi::SelectObject(dc, bitmap);
    paint(dc);
    gdi::SelectObject(dc, previous);
    gdi::DeleteDC(dc);
    const QImage picture = gdi::imageFromBitmap(bitmap).convertToFormat(QImage::Format_RGB32);
    gdi::DeleteObject(bitmap);
    return picture;
}

QImage pngStyle(qint32 style)
{
    StdPNG png;
    png.setTransparentStyle(style);
    if (!png.LoadData(pngWithAlpha()))
        return {};
    return paintedOnCheckerboard(QSize(Side + 16, Side + 16), [&png](qint32 dc) { png.Paint(dc, 8, 8); });
}

// Each way a host paints: with alpha as it is, shrunk to half, its bottom-right quarter
// doubled, half opaque; without alpha, the quarter doubled.
QImage pngPaintedWays()
{
    StdPNG withAlpha;
    withAlpha.setTransparentStyle(StdPNG::alphaTransparent);
    StdPNG opaque;
    opaque.setTransparentStyle(StdPNG::alphaNoBkgNoAlpha);
    if (!withAlpha.LoadData(pngWithAlpha()) || !opaque.LoadData(pngWithAlpha()))
        return {};
    constexpr int Half = Side / 2;
    return paintedOnCheckerboard(QSize(4 * Side + 48, 2 * Side + 24), [&](qint32 dc) {
        withAlpha.Paint(dc, 8, 8);
        withAlpha.Paint(dc, Side + 16, 8, Half, Half);
        withAlpha.Paint(dc, Side + Half + 24, 8, Side, Side, 0, Half, Half, Half, Half);
        withAlpha.Paint(dc, 2 * Side + Half + 32, 8, 0, 0, 0, 0, 0, 0, 0, 128);
        opaque.Paint(dc, 8, Side + 16, Side, Side, 0, Half, Half, Half, Half);
    });
}

// Three frames on a grey field: a red square whose disposal is under test, then a small
// blue square, shown once both have been drawn.
QByteArray disposalGif(quint8 disposal)
{
    gifEncoder::Animation gif;
    gif.width = 40;
    gif.height = 40;
    gifScanner::ColorTable colours;
    colours.count = 4;
    colours.entries = { 0xFFFFFF, 0xC81E28, 0x143CC8, 0xA0A0A0 };
    gif.colorTables = { colours };
    const auto frame = [](int left, int top, int side, char index, quint8 disposal) {
        gifEncoder::Frame f;
        f.record.Left = left;
        f.record.Top = top;
        f.record.Width = side;
        f.record.Height = side;
        f.record.Delay = 100;
        f.record.Disposal = disposal;
        f.indices = QByteArray(side * side, index);
        return f;
    };
    gifEncoder::Frame field = frame(0, 0, 40, 3, 1);
    // A white stripe, so a restored field shows it is the field.
    for (int y = 18; y < 22; ++y)
        for (int x = 0; x < 40; ++x)
            field.indices[y * 40 + x] = 0;
    gif.frames = { field, frame(6, 6, 20, 1, disposal), frame(24, 24, 12, 2, 0) };
    return gifEncoder::encode(gif);
}

QImage gifAfterDisposal(quint8 disposal)
{
    Stage stage(QSize(80, 80));
    auto *gif = new ucAniGIF(stage.form());
    gif->InitNew();
    gif->move(12, 12);
    gif->LoadAnimatedGIF_Array(disposalGif(disposal));
    gif->resize(gif->sizeHint());
    gif->setAction(ucAniGIF::gfaForward);
    gif->setAction(ucAniGIF::gfaForward);
    return stage.shoot(gif);
}

} // namespace

void addPictureScenes(QList<Scene> &scenes)
{
    const std::pair<qint32, const char *> styles[] = { { StdPNG::alphaTransparent, "transparent" },
        { StdPNG::alphaNoBkgNoAlpha, "no background" }, { StdPNG::alphaTransColorBkg, "key colour background" },
        { StdPNG::alphaPNGwindowBkg, "file background" }, { 0x80FFFF, "colour background" } };
    for (const auto &[style, name] : styles)
        scenes.append({ QStringLiteral("StdPNG"), QLatin1String(name), [style = style] { return pngStyle(style); } });
    scenes.append({ QStringLiteral("StdPNG"), QStringLiteral("painted ways"), pngPaintedWays });
    const std::pair<quint8, const char *> disposals[]
        = { { 1, "kept" }, { 2, "cleared to background" }, { 3, "restored to previous" } };
    for (const auto &[disposal, name] : disposals)
        scenes.append({ QStringLiteral("ucAniGIF"), QLatin1String(name),
            [disposal = disposal] { return gifAfterDisposal(disposal); } });
}

} // namespace zelctl::snapshots
