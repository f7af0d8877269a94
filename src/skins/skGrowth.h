#pragma once

#include "zelctl_export.h"

#include "frame/UserControl.h"
#include "platform/OleColor.h"
#include "platform/gdi/PersistentSurface.h"

#include <memory>

namespace zelctl {

class skGrowthPrivate;

// A panel with a caption that the host grows with its content: a 26-pixel header of a top
// edge between two 11-pixel corners, over a background and a 16-pixel bottom edge, drawn
// from five picture files at every resize. A panel with neither a SkinID nor a first
// picture uses the red pictures of the data folder's "skins/default/".
//
// Persisted as "Caption", "CaptionColor" and "SkinID".
class ZELCTL_EXPORT skGrowth : public gdi::SurfaceHost<UserControl>
{
    Q_OBJECT
    Q_PROPERTY(QString SkinID READ SkinID WRITE setSkinID)
    Q_PROPERTY(QString Caption READ Caption WRITE setCaption)
    Q_PROPERTY(quint32 CaptionColor READ CaptionColor WRITE setCaptionColor)

public:
    explicit skGrowth(QWidget *parent = nullptr);
    ~skGrowth() override;

    // Path of slice imgID: 0 top-left corner, 1 top-right corner, 2 top edge,
    // 3 background, 4 bottom edge (5 is kept only). The files are read when the panel
    // draws. Answers 0, or 9 for an index outside 0 to 5 (nothing stored). Reading a bad
    // index gives "".
    Q_INVOKABLE QString ImageSource(qint32 imgID) const;
    Q_INVOKABLE qint32 setImageSource(qint32 imgID, const QString &path);

    // Name of the skin; a new value raises RequestSkinRepait.
    QString SkinID() const;
    void setSkinID(const QString &skinId);

    // Text and colour of the caption label lblCaption.
    QString Caption() const;
    void setCaption(const QString &caption);
    platform::OleColor CaptionColor() const;
    void setCaptionColor(platform::OleColor color);

    Q_INVOKABLE void Repaint();

Q_SIGNALS:
    void RequestSkinRepait();
    void Resize();

protected:
    void ReadProperties(const PropertyBag &bag) override;
    void WriteProperties(PropertyBag &bag) override;

    void resizeEvent(QResizeEvent *event) override;

private:
    std::unique_ptr<skGrowthPrivate> const d;
};

} // namespace zelctl
