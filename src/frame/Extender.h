#pragma once

#include "zelctl_export.h"

#include <QJsonObject>
#include <QString>

class QWidget;

namespace zelctl {

// The properties a container adds to every control it holds: its name, tag, visibility,
// tool tip text, and position and size in twips. Reads and writes go to the control's widget.
class ZELCTL_EXPORT Extender
{
public:
    explicit Extender(QWidget *control);

    QString Name() const;
    void setName(const QString &name);
    QString Tag() const { return m_tag; }
    void setTag(const QString &tag) { m_tag = tag; }
    bool Visible() const;
    void setVisible(bool visible);
    QString ToolTipText() const;
    void setToolTipText(const QString &text);

    int Left() const;
    int Top() const;
    int Width() const;
    int Height() const;
    void setLeft(int twips);
    void setTop(int twips);
    void setWidth(int twips);
    void setHeight(int twips);
    // Moves and sizes the control at once, in twips.
    void Move(int left, int top, int width, int height);

    // For the container's form file.
    QJsonObject toJson() const;
    void loadJson(const QJsonObject &json);

private:
    QWidget *m_control;
    QString m_tag;
    // Kept apart from the widget's visibility, which is false until the form is shown.
    bool m_visible = true;
};

} // namespace zelctl
