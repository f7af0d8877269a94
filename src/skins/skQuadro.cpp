#include "skQuadro.h"

#include "skinCommon.h"

#include "frame/PropertyReaders.h"

#include <QMouseEvent>

namespace zelctl {

class skQuadroPrivate
{
public:
    platform::OleColor transparencyColor = 0x000000;
    qint32 debugDesign = 0;
    skinCommon::ImageFileSlots slices;
};

skQuadro::skQuadro(QWidget *parent)
    : SurfaceHost(parent)
    , d(std::make_unique<skQuadroPrivate>())
{
    setMouseTracking(true);
}

skQuadro::~skQuadro() = default;

platform::OleColor skQuadro::TransparencyColor() const
{
    return d->transparencyColor;
}

void skQuadro::setTransparencyColor(platform::OleColor color)
{
    d->transparencyColor = color;
}

qint32 skQuadro::DebugDesign() const
{
    return d->debugDesign;
}

void skQuadro::setDebugDesign(qint32 set)
{
    d->debugDesign = set;
}

QString skQuadro::ImageFile(const QVariant &nIndex) const
{
    return d->slices.path(nIndex);
}

void skQuadro::setImageFile(const QVariant &nIndex, const QString &path)
{
    d->slices.set(nIndex, path);
}

void skQuadro::Redraw()
{
    if (ambient().UIDead)
        return;
    const QImage &top = d->slices.picture(0);
    const QImage &middle = d->slices.picture(1);
    const QImage &bottom = d->slices.picture(2);
    // A frame with a slice missing keeps its previous look.
    if (top.isNull() || middle.isNull() || bottom.isNull())
        return;
    surface().clear(d->transparencyColor);
    const gdi::HDC dc = surface().hdc();
    const int w = width();
    const int h = height();
    gdi::drawPicture(dc, top, 0, 0, w, top.height());
    gdi::drawPicture(dc, middle, 0, top.height(), w, h - top.height() - bottom.height());
    gdi::drawPicture(dc, bottom, 0, h - bottom.height(), w, bottom.height());
    surface().setMaskColor(d->transparencyColor);
    update();
}

void skQuadro::InitProperties()
{
    d->transparencyColor = 0x000000;
    QFont frameFont(QStringLiteral("Arial"), 11);
    frameFont.setBold(true);
    setFont(frameFont);
    loadDesignPreview();
}

void skQuadro::ReadProperties(const PropertyBag &bag)
{
    d->transparencyColor = readColor(bag, QStringLiteral("TransparentBack"), 0);
    d->debugDesign = readLong(bag, QStringLiteral("DebugDesignImgID"), d->debugDesign);
    loadDesignPreview();
    QPalette colours = palette();
    colours.setColor(QPalette::WindowText, Qt::black);
    colours.setColor(QPalette::Window, Qt::white);
    setPalette(colours);
}

void skQuadro::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("TransparentBack"), d->transparencyColor);
    bag.WriteProperty(QStringLiteral("DebugDesignImgID"), d->debugDesign);
}

void skQuadro::Terminate()
{
    d->slices.releasePictures();
}

void skQuadro::resizeEvent(QResizeEvent *event)
{
    SurfaceHost::resizeEvent(event);
    Q_EMIT Resize();
}

void skQuadro::mouseMoveEvent(QMouseEvent *event)
{
    skinCommon::MouseArgs args = skinCommon::mouseArgs(event);
    Q_EMIT MouseMove(args.Button, args.Shift, args.X, args.Y);
}

void skQuadro::mousePressEvent(QMouseEvent *event)
{
    skinCommon::MouseArgs args = skinCommon::mouseArgs(event);
    Q_EMIT MouseDown(args.Button, args.Shift, args.X, args.Y);
}

void skQuadro::mouseReleaseEvent(QMouseEvent *event)
{
    skinCommon::MouseArgs args = skinCommon::mouseArgs(event);
    Q_EMIT MouseUp(args.Button, args.Shift, args.X, args.Y);
}

void skQuadro::loadDesignPreview()
{
    if (!designMode())
        return;
    const QString folder = skinCommon::previewFolder();
    QStringList names;
    if (d->debugDesign == 0) {
        names = { QStringLiteral("topo_laranja.gif"), QStringLiteral("topo_repeat.gif"),
            QStringLiteral("fundo_fundo.gif") };
    } else {
        const QString set = QStringLiteral("quadro_%1_").arg(qint64(d->debugDesign) - 1);
        names
            = { set + QStringLiteral("top.gif"), set + QStringLiteral("back.gif"), set + QStringLiteral("bottom.gif") };
    }
    for (int slot = 0; slot < names.size(); ++slot)
        setImageFile(slot, folder + names[slot]);
    Redraw();
}

ZELCTL_REGISTER_CLASS(skQuadro)

} // namespace zelctl
