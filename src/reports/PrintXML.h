// Turns one message into a printed report.
#pragma once

#include <QString>

namespace kest {

/// Shows the report of a message of the folder that the list was filled from last; an empty name shows nothing, and so
/// does a message of a type that has no report. `Reprint` leaves the deleted lines of an adjusted or authorised quote
/// out. False after a refusal or a failure, whose box has been shown.
bool PrintXML(const QString& fileName, bool Reprint);

}  // namespace kest
