#pragma once

#include "zelctl_export.h"

#include "platform/OleColor.h"

#include <QWidget>

namespace zelctl {

// A rectangle outline drawn over its parent, as forms draw frames and status marks. It
// takes no pointer input, so whatever lies under it stays usable.
class ZELCTL_EXPORT ShapeWidget : public QWidget
{
    Q_OBJECT
    // Outline colour (OLE_COLOR).
    Q_PROPERTY(quint32 BorderColor READ BorderColor WRITE setBorderColor)
    // Outline width in pixels; at least 1.
    Q_PROPERTY(int BorderWidth READ BorderWidth WRITE setBorderWidth)

public:
    explicit ShapeWidget(QWidget *parent = nullptr);

    platform::OleColor BorderColor() const { return m_borderColor; }
    void setBorderColor(platform::OleColor color);

    int BorderWidth() const { return m_borderWidth; }
    void setBorderWidth(int width);

protected:
    void paintEvent(QPaintEvent *event) override;

private:
    platform::OleColor m_borderColor = 0;
    int m_borderWidth = 1;
};

} // namespace zelctl
