#include "skGrowth.h"

#include "skinCommon.h"

#include "common/modFuncs.h"
#include "frame/PropertyReaders.h"

#include <QLabel>
#include <QPointer>

#include <array>

namespace zelctl {

namespace {

constexpr int SlotCount = 6;
enum Slot { TopLeft = 0, TopRight = 1, TopEdge = 2, Background = 3, BottomEdge = 4 };

// Pixel sizes of the default red slices.
constexpr int HeaderHeight = 26;
constexpr int CornerWidth = 11;
constexpr int BottomHeight = 16;

constexpr platform::OleColor InitialCaptionColor = 0xFFFFFF;

const char *const DefaultPictures[] = {
    "data/skins/default/gr-corner1-red.gif",
    "data/skins/default/gr-corner2-red.gif",
    "data/skins/default/gr-top-red.gif",
    "data/skins/default/gr-background-red.gif",
    "data/skins/default/gr-bottom-red.gif",
};

// A slice read just before it is drawn; a file that cannot be read is simply skipped.
QImage slice(const QString &path)
{
    QImage picture;
    if (!path.isEmpty())
        skinCommon::loadPicture(path, picture);
    return picture;
}

} // namespace

class skGrowthPrivate
{
public:
    std::array<QString, SlotCount> paths;
    QString skinId;
    QLabel *caption = nullptr;
};

skGrowth::skGrowth(QWidget *parent)
    : SurfaceHost(parent)
    , d(std::make_unique<skGrowthPrivate>())
{
    d->caption = new QLabel(this);
    d->caption->setObjectName(QStringLiteral("lblCaption"));
    d->caption->move(16, 5);
    QFont captionFont(QStringLiteral("Arial"), 10);
    captionFont.setBold(true);
    d->caption->setFont(captionFont);
    setCaptionColor(InitialCaptionColor);
}

skGrowth::~skGrowth() = default;

QString skGrowth::ImageSource(qint32 imgID) const
{
    if (imgID < 0 || imgID >= SlotCount)
        return QString();
    return d->paths[size_t(imgID)];
}

qint32 skGrowth::setImageSource(qint32 imgID, const QString &path)
{
    if (imgID < 0 || imgID >= SlotCount)
        return skinCommon::ErrSubscriptOutOfRange;
    d->paths[size_t(imgID)] = path;
    return skinCommon::ErrNone;
}

QString skGrowth::SkinID() const
{
    return d->skinId;
}

void skGrowth::setSkinID(const QString &skinId)
{
    if (skinId == d->skinId)
        return;
    d->skinId = skinId;
    PropertyChanged(QStringLiteral("SkinID"));
    Q_EMIT RequestSkinRepait();
}

QString skGrowth::Caption() const
{
    return d->caption->text();
}

void skGrowth::setCaption(const QString &caption)
{
    d->caption->setText(caption);
    d->caption->adjustSize();
    PropertyChanged(QStringLiteral("Caption"));
}

platform::OleColor skGrowth::CaptionColor() const
{
    return platform::fromQColor(d->caption->palette().color(QPalette::WindowText));
}

void skGrowth::setCaptionColor(platform::OleColor color)
{
    QPalette colours = d->caption->palette();
    colours.setColor(QPalette::WindowText, platform::toQColor(color));
    d->caption->setPalette(colours);
    PropertyChanged(QStringLiteral("CaptionColor"));
}

void skGrowth::Repaint()
{
    if (d->skinId.isEmpty() && d->paths[TopLeft].isEmpty()) {
        const QString root = modFuncs::GetRootPath();
        for (size_t slot = 0; slot < std::size(DefaultPictures); ++slot)
            d->paths[slot] = root + QLatin1String(DefaultPictures[slot]);
    }
    const gdi::HDC dc = surface().hdc();
    const int w = width();
    const int h = height();
    // The rounding of the corners shows the container.
    surface().clear(platform::fromQColor(palette().color(QPalette::Window)));
    // The top edge runs between the corners: under them it would fill their rounding.
    const QImage left = slice(d->paths[TopLeft]);
    const QImage right = slice(d->paths[TopRight]);
    const int edgeLeft = left.isNull() ? 0 : left.width();
    const int edgeRight = right.isNull() ? w : w - CornerWidth;
    if (const QImage top = slice(d->paths[TopEdge]); !top.isNull() && edgeRight > edgeLeft)
        gdi::drawPicture(dc, top, edgeLeft, 0, edgeRight - edgeLeft, HeaderHeight);
    if (!left.isNull())
        gdi::drawPicture(dc, left, 0, 0, left.width(), HeaderHeight);
    if (!right.isNull())
        gdi::drawPicture(dc, right, w - CornerWidth, 0, right.width(), HeaderHeight);
    if (const QImage background = slice(d->paths[Background]); !background.isNull())
        gdi::drawPicture(dc, background, 0, HeaderHeight, w, h - BottomHeight);
    if (const QImage bottom = slice(d->paths[BottomEdge]); !bottom.isNull())
        gdi::drawPicture(dc, bottom, 0, h - BottomHeight, w, bottom.height());
    update();
}

void skGrowth::ReadProperties(const PropertyBag &bag)
{
    setCaption(bag.ReadProperty(QStringLiteral("Caption"), QString()).toString());
    setCaptionColor(readColor(bag, QStringLiteral("CaptionColor"), CaptionColor()));
    d->skinId = bag.ReadProperty(QStringLiteral("SkinID"), QString()).toString();
}

void skGrowth::WriteProperties(PropertyBag &bag)
{
    bag.WriteProperty(QStringLiteral("Caption"), Caption(), QString());
    bag.WriteProperty(QStringLiteral("CaptionColor"), CaptionColor());
    bag.WriteProperty(QStringLiteral("SkinID"), d->skinId, QString());
}

void skGrowth::resizeEvent(QResizeEvent *event)
{
    SurfaceHost::resizeEvent(event);
    const QPointer<skGrowth> alive(this);
    Q_EMIT Resize();
    if (alive)
        Repaint();
}

ZELCTL_REGISTER_CLASS(skGrowth)

} // namespace zelctl
