// Asks a person for the printer, the pages and the copies.
#pragma once

#include <QList>

class QPrinter;
class QWidget;

namespace kest::report {

/// Shows the system's printer dialog for a document of so many pages. Returns false if the user has cancelled it.
bool askForPrinter(QPrinter& printer, QWidget* parent, int pageCount);

/// Returns the pages to print, counted from 0, in the order in which the printer needs them: those that the user has
/// chosen, once for each copy that the printer does not make itself.
QList<int> pagesToPrint(const QPrinter& printer, int pageCount);

}  // namespace kest::report
