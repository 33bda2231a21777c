// Asks for the place of a file to save.
#pragma once

#include <QString>

class QWidget;

namespace kest::desktop {

/// Asks where to save a PDF file and offers this name, of which characters that no file name may contain are replaced.
/// Starts in the folder that a person chose last in this profile, or else in the user's documents. Returns the path, or
/// an empty text if the user has cancelled.
QString askForPdf(QWidget* parent, const QString& name);

}  // namespace kest::desktop
