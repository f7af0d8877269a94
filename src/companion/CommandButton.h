#pragma once

#include "zelctl_export.h"

#include "frame/Picture.h"

#include <QPushButton>

#include <memory>

namespace zelctl {

class CommandButtonArray;

// The companion command button: an ordinary push button with the members the library's
// forms use. Positions and sizes are in twips. A button that belongs to a
// CommandButtonArray knows its Index and passes it with each of its events; a lone button
// passes -1.
class ZELCTL_EXPORT CommandButton : public QPushButton
{
    Q_OBJECT
    Q_PROPERTY(QString Caption READ Caption WRITE setCaption)
    Q_PROPERTY(QString ToolTip READ ToolTip WRITE setToolTip)
    Q_PROPERTY(bool Toggle READ Toggle WRITE setToggle)
    Q_PROPERTY(bool Value READ Value WRITE setValue)
    Q_PROPERTY(bool Default READ Default WRITE setDefault)
    Q_PROPERTY(bool Enabled READ Enabled WRITE setEnabled)
    Q_PROPERTY(zelctl::Picture Picture READ Picture WRITE setPicture)
    Q_PROPERTY(bool Visible READ Visible WRITE setVisible)
    Q_PROPERTY(QString Tag READ Tag WRITE setTag)
    Q_PROPERTY(int Index READ Index)
    Q_PROPERTY(int Left READ Left WRITE setLeft)
    Q_PROPERTY(int Top READ Top WRITE setTop)
    Q_PROPERTY(int Width READ Width WRITE setWidth)
    Q_PROPERTY(int Height READ Height WRITE setHeight)
    Q_PROPERTY(quint32 ForeColor READ ForeColor WRITE setForeColor)
    Q_PROPERTY(qint32 ButtonStyle READ ButtonStyle WRITE setButtonStyle)
    Q_PROPERTY(qint32 BevelWidth READ BevelWidth WRITE setBevelWidth)

public:
    explicit CommandButton(QWidget *parent = nullptr);
    ~CommandButton() override;

    // The text; "&" marks the access key ("&OK" is pressed with Alt+O). A caption set in a
    // symbol font the system lacks shows the symbols it stands for (platform::symbolFonts);
    // one too long for the button is cut short with "…" and shown whole as the tooltip
    // while the button has no tooltip of its own.
    QString Caption() const;
    void setCaption(const QString &caption);

    QString ToolTip() const { return toolTip(); }

    // A toggle button stays pressed after a click until the next click releases it.
    bool Toggle() const { return isCheckable(); }
    void setToggle(bool toggle);

    // Whether a toggle button is pressed; always false for an ordinary button. Setting it
    // raises no Click.
    bool Value() const { return isChecked(); }
    void setValue(bool pressed) { setChecked(pressed); }

    // The default button of a form is clicked by Enter.
    bool Default() const { return isDefault(); }

    bool Enabled() const { return isEnabled(); }

    // Shown before the caption, at its own size; a null picture shows none.
    zelctl::Picture Picture() const;
    void setPicture(const zelctl::Picture &picture);

    // Whether the button is shown when its form is; true while the form itself is hidden.
    bool Visible() const { return !isHidden(); }

    QString Tag() const;
    void setTag(const QString &tag);

    // The element's index in its array, or -1 for a lone button.
    int Index() const;

    // Colour of the caption, 0x00BBGGRR or a system colour.
    quint32 ForeColor() const;
    void setForeColor(quint32 color);

    // How the button is drawn: FlatStyle without a frame until pressed, any other value as
    // a raised push button (the default, 0).
    static constexpr qint32 FlatStyle = 5;
    qint32 ButtonStyle() const;
    void setButtonStyle(qint32 style);

    // Width in pixels of a raised edge drawn just inside the button's border, light on the
    // top and left, dark on the bottom and right; 0 (the default) for none.
    qint32 BevelWidth() const;
    void setBevelWidth(qint32 pixels);

    int Left() const;
    int Top() const;
    int Width() const;
    int Height() const;
    void setLeft(int twips);
    void setTop(int twips);
    void setWidth(int twips);
    void setHeight(int twips);
    Q_INVOKABLE void Move(int left, int top);
    Q_INVOKABLE void Move(int left, int top, int width, int height);

    // Redraws the button now.
    Q_INVOKABLE void Refresh();

    // Room for the whole caption, whether it is shown cut short or not.
    QSize sizeHint() const override;

Q_SIGNALS:
    void Click(int Index);
    void DblClick(int Index);
    // Before the button handles the key; setting KeyCode to 0 keeps the key from it.
    void KeyDown(int Index, int &KeyCode, int Shift);
    // The pointer came onto the button (true) or left it (false), so a container can
    // restyle it.
    void MouseHover(bool Hovering);

protected:
    bool event(QEvent *event) override;
    void changeEvent(QEvent *event) override;
    void resizeEvent(QResizeEvent *event) override;
    void paintEvent(QPaintEvent *event) override;
    void enterEvent(QEnterEvent *event) override;
    void leaveEvent(QEvent *event) override;
    void mouseDoubleClickEvent(QMouseEvent *event) override;
    void keyPressEvent(QKeyEvent *event) override;

private:
    friend class CommandButtonArray;
    void setIndex(int index);
    // The caption as drawn, symbols mapped; and the size a push button takes for a text.
    QString wholeCaption() const;
    QSize sizeFor(const QString &text) const;
    // Puts the caption as shown (mapped, cut to the width) on the push button.
    void showCaption();

    std::unique_ptr<class CommandButtonPrivate> const d;
};

} // namespace zelctl
