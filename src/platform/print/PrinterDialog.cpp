#include "platform/print/PrinterDialog.h"

#include "platform/desktop/Window.h"

#include <QPageRanges>
#include <QPrintDialog>
#include <QPrintEngine>
#include <QPrinter>

#include <algorithm>

namespace kest::report {

using namespace Qt::StringLiterals;

namespace {

/// Returns true if the print server picks the pages from the whole document. The dialog tells Qt's print engine so.
bool isRangeOfServer(const QPrinter& printer)
{
    constexpr auto optionsOfServer = QPrintEngine::PrintEnginePropertyKey(0xfe00);
    return printer.printEngine()->property(optionsOfServer).toStringList().contains(u"page-ranges"_s);
}

QList<int> chosenPages(const QPrinter& printer, int pageCount)
{
    const QPageRanges ranges = isRangeOfServer(printer) ? QPageRanges() : printer.pageRanges();
    QList<int> pages;
    for (int page = 0; page < pageCount; ++page)
        if (ranges.isEmpty() || ranges.contains(page + 1))
            pages.append(page);
    return pages;
}

}  // namespace

bool askForPrinter(QPrinter& printer, QWidget* parent, int pageCount)
{
    QPrintDialog dialog(&printer, parent);
    dialog.setObjectName(u"PrintDialog"_s);
    dialog.setMinMax(1, pageCount);
    desktop::showModal(dialog);
    return dialog.result() == QDialog::Accepted;
}

QList<int> pagesToPrint(const QPrinter& printer, int pageCount)
{
    const QList<int> once = chosenPages(printer, pageCount);
    if (printer.supportsMultipleCopies())
        return once;
    QList<int> pages;
    for (int copy = 0; copy < printer.copyCount(); ++copy)
        pages.append(once);
    if (!printer.collateCopies())
        std::ranges::stable_sort(pages);
    return pages;
}

}  // namespace kest::report
