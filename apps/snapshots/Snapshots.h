#pragma once

#include <QImage>
#include <QList>
#include <QString>

#include <functional>

// Pictures of every control in its main states, drawn offscreen with the bundled fonts: the
// golden pictures the tests compare with, and the contact sheet of the documentation.
namespace zelctl::snapshots {

// One control (or dialog) in one state.
struct Scene
{
    QString group; // what is shown: "cNIF", "skGoButton", "frmSelector" ...
    QString state; // "valid", "hover" ...
    std::function<QImage()> render;

    // The picture's file name without ".png": "cnif-valid".
    QString name() const;
};

// Every scene, in the order of the contact sheet.
QList<Scene> scenes();

// Call before the QApplication is made: fonts are then looked up among the Debian fonts the
// project installs only, with fixed aliases for the faces the controls ask for.
void useBundledFonts();

// Call once the QApplication exists: the style, palette and font of every picture.
void setFixedLook();

// Writes a picture as a PNG file, compressed as far as the writer goes.
bool savePicture(const QImage &picture, const QString &file);

// The pictures side by side in rows of their groups, each captioned with its state.
struct Shot
{
    Scene scene;
    QImage picture;
};
QImage contactSheet(const QList<Shot> &shots);

} // namespace zelctl::snapshots
