// Prints the report of a message.
#pragma once

#include <QString>

namespace kest {

/// Shows the report of a message in `gsListFolder`. Does nothing if the name is empty or the message has no report. If
/// `Reprint` is true, the deleted lines of an adjusted or authorised quote are left out. Returns false after a refusal
/// or failure, for which a box has been shown.
bool PrintXML(const QString& fileName, bool Reprint);

}  // namespace kest
