#pragma once

class QWidget;

// One builder per area of the library; each returns the content of a gallery row.
QWidget *createNibSection();
// A country picker: one button per filter mode opens the country dialog, and the chosen
// country is shown with its flag.
QWidget *createCountrySection();
// Information, warning and error buttons with their balloon tips.
QWidget *createTipsSection();
// A subject selector offering every kind, bound to the bundled declaration.
QWidget *createSubjectSection();
// A NIF box on the bundled declaration and directory of holders.
QWidget *createNifSection();
// Skinned navigation buttons with tips, number badges, a sub-menu, a frame, a growing
// panel and a slide-open panel.
QWidget *createSkinsSection();
// A selection of a few items with images, and the selection of an EU country.
QWidget *createSelectionSection();
QWidget *createGifSection();
