#pragma once

class QWidget;

// One builder per area of the library; each returns the content of a gallery row.
QWidget *createNibSection();
// A country picker: one button per filter mode opens the country dialog, and the chosen
// country is shown with its flag.
QWidget *createCountrySection();
// Information, warning and error buttons with their balloon tips.
QWidget *createTipsSection();
// A selection of a few items with images, and the selection of an EU country.
QWidget *createSelectionSection();
