// Writes the page that shows the day in pictures.
#pragma once

#include "platform/script/Script.h"

#include <QString>

namespace kest::app {

/// A page with the steps of a day, the boxes that each has shown and its pictures, for someone without a display.
class DayPage {
public:
    /// `pictures` is the folder of the pictures, a path of this system. The page is its "index.html".
    explicit DayPage(const QString& pictures) : folder(pictures) {}

    /// Adds a step that has been played. The page is complete after each step.
    void add(const QString& step, const desktop::Record& shown);

private:
    QString folder;
    QString steps;
};

}  // namespace kest::app
