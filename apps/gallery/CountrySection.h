#pragma once

class QWidget;

// A country picker: one button per filter mode opens the country dialog, and the chosen
// country is shown with its flag.
QWidget *countrySection();
