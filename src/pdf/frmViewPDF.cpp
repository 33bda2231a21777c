#include "pdf/frmViewPDF.h"

#include "base/QuoteKey.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/TrialRun.h"
#include "platform/Waiting.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/PageTools.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/SaveDialog.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "platform/print/PrinterDialog.h"

#include <QPainter>
#include <QPdfDocument>
#include <QPdfPageNavigator>
#include <QPdfView>
#include <QPrinter>
#include <QRegularExpression>
#include <QScreen>
#include <QScrollBar>

#include <algorithm>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr double zoomStep = 1.25;
constexpr double smallestZoom = 0.1;
constexpr double largestZoom = 8;
constexpr int printResolution = 300;  // dots per inch
constexpr double pointsPerInch = 72;
constexpr int rightMargin = 150;      // twips
constexpr int longestReading = 5000;  // milliseconds

QString whyNotOpened(QPdfDocument::Error error)
{
    switch (error) {
        case QPdfDocument::Error::FileNotFound:
            return u"the file does not exist"_s;
        case QPdfDocument::Error::InvalidFileFormat:
            return u"the file is not a PDF document"_s;
        case QPdfDocument::Error::IncorrectPassword:
        case QPdfDocument::Error::UnsupportedSecurityScheme:
            return u"the document is protected"_s;
        default:
            return u"the file could not be read"_s;
    }
}

/// Returns true if the library can read the document and all its pages. Some damaged documents keep it busy for ever.
bool isReadable(const QString& systemPath)
{
    bool isRead = false;
    patiently(u"Opening the document..."_s, [&] {
        isRead = endsInTime(
            [&] {
                QPdfDocument document;
                document.load(systemPath);
                for (int page = 0; page < document.pageCount(); ++page)
                    document.pagePointSize(page);
            },
            longestReading);
    });
    return isRead;
}

/// Returns a name for a copy of a sublet document that says what it is.
QString nameOfCopy(const QString& fileName)
{
    static const QRegularExpression ofLine(u"^(.+\\.\\d+)_(\\d+)$"_s);
    const QRegularExpressionMatch match = ofLine.match(fileName);
    const QString quote = match.captured(1);
    const QuoteKey key{quote.section(u'.', 0, -2), quote.section(u'.', -1)};
    return match.hasMatch() ? u"Sublet authority %1 line %2"_s.arg(key.reference(), match.captured(2)) : fileName;
}

}  // namespace

frmViewPDF::frmViewPDF(QPdfDocument& document, const QString& fileName)
    : Form(u"frmViewPDF"_s, fileName.section(u'\\', -1)),
      pdf(document),
      path(fileName),
      AcroPDF1(new QPdfView(this)),
      tools(new desktop::PageTools(this, u"frmViewPDF"_s,
                                   {.print = [this] { print(); },
                                    .save = [this] { save(); },
                                    .goTo = [this](int page) { goTo(page - 1); },
                                    .enlarge = [this] { zoom(zoomStep); },
                                    .reduce = [this] { zoom(1 / zoomStep); },
                                    .fitWidth = [this] { AcroPDF1->setZoomMode(QPdfView::ZoomMode::FitToWidth); },
                                    .fitPage = [this] { AcroPDF1->setZoomMode(QPdfView::ZoomMode::FitInView); },
                                    .view = AcroPDF1}))
{
    setWindowFlag(Qt::WindowMaximizeButtonHint);
    resize(desktop::pixels(12000, 10500));

    AcroPDF1->setObjectName("AcroPDF1"_L1);
    AcroPDF1->setAccessibleName(u"Document"_s);
    AcroPDF1->setDocument(&pdf);
    AcroPDF1->setPageMode(QPdfView::PageMode::MultiPage);
    AcroPDF1->setZoomMode(QPdfView::ZoomMode::FitToWidth);
    desktop::showFocus(*AcroPDF1);
    AcroPDF1->setFocus();
    setMinimumSize(tools->sizeHint().width() + desktop::pixels(rightMargin), desktop::pixels(4500));
    tools->showPage(1, pdf.pageCount());
    on(AcroPDF1->pageNavigator(), &QPdfPageNavigator::currentPageChanged, u"AcroPDF1_Page"_s,
       [this](int page) { tools->showPage(page + 1, pdf.pageCount()); });
}

void frmViewPDF::ShowForm(const QString& fileName)
{
    const auto refuse = [&](const QString& why) {
        desktop::msgBox(u"The document %1 can't be shown: %2."_s.arg(fileName, why), desktop::Icon::Critical);
    };
    const QString systemPath = files::systemPath(fileName);
    if (!isReadable(systemPath))
        return refuse(u"it is damaged, so that reading it does not end"_s);
    QPdfDocument document;
    const QPdfDocument::Error error = document.load(systemPath);
    if (error != QPdfDocument::Error::None)
        return refuse(whyNotOpened(error));
    desktop::recordWindow({{u"name"_s, u"frmViewPDF"_s}, {u"file"_s, fileName}});
    frmViewPDF form(document, fileName);
    desktop::showModal(form);
}

void frmViewPDF::resizeEvent(QResizeEvent* event)
{
    Form::resizeEvent(event);
    const int right = desktop::pixels(rightMargin);
    const int bottom = desktop::pixels(400);
    AcroPDF1->setGeometry(0, 0, width() - right, height() - bottom);
    tools->setGeometry(0, height() - bottom, width() - right, bottom);
}

void frmViewPDF::goTo(int page)
{
    QPdfPageNavigator* pages = AcroPDF1->pageNavigator();
    pages->jump(qBound(0, page, pdf.pageCount() - 1), {}, pages->currentZoom());
}

void frmViewPDF::zoom(double factor)
{
    double now = AcroPDF1->zoomFactor();
    if (AcroPDF1->zoomMode() != QPdfView::ZoomMode::Custom) {
        const QMargins margins = AcroPDF1->documentMargins();
        const QSizeF page = pdf.pagePointSize(AcroPDF1->pageNavigator()->currentPage()) *
                            (screen()->logicalDotsPerInch() / pointsPerInch);
        const QSizeF room = AcroPDF1->viewport()->rect().marginsRemoved(margins).size();
        now = room.width() / page.width();
        if (AcroPDF1->zoomMode() == QPdfView::ZoomMode::FitInView)
            now = std::min(now, room.height() / page.height());
    }
    const double next = qBound(smallestZoom, now * factor, largestZoom);
    QScrollBar* const bar = AcroPDF1->verticalScrollBar();
    const double middle = bar->value() + bar->pageStep() / 2.0;
    AcroPDF1->setZoomMode(QPdfView::ZoomMode::Custom);
    AcroPDF1->setZoomFactor(next);
    bar->setValue(qRound(middle * next / now - bar->pageStep() / 2.0));  // keep the middle of the view in place
}

void frmViewPDF::save()
{
    const QString target = desktop::askForPdf(this, nameOfCopy(windowTitle().section(u'.', 0, -2)));
    if (target.isEmpty())
        return;
    try {
        files::writeExactly(target, files::readBytes(path));
    } catch (const RuntimeError& error) {
        desktop::msgBox(u"The document can't be saved as %1: %2"_s.arg(target, error.description()),
                        desktop::Icon::Critical);
    }
}

void frmViewPDF::print()
{
    QPrinter printer(QPrinter::HighResolution);
    printer.setResolution(printResolution);
    if (!report::askForPrinter(printer, this, pdf.pageCount()))
        return;
    const QList<int> pages = report::pagesToPrint(printer, pdf.pageCount());
    if (pages.isEmpty())
        return;  // QPainter would print an empty page
    QPainter painter(&printer);
    if (!painter.isActive()) {
        desktop::msgBox(u"The document can't be printed."_s, desktop::Icon::Critical);
        return;
    }
    desktop::Progress progress(windowTitle(), u"Printing the document..."_s);
    for (qsizetype printed = 0; printed < pages.size(); ++printed) {
        progress.step(printed, pages.size());
        if (printed > 0)
            printer.newPage();
        const int page = pages[printed];
        const QRect sheet = painter.viewport();
        const QSize size = pdf.pagePointSize(page).scaled(sheet.size(), Qt::KeepAspectRatio).toSize();
        painter.drawImage(QRect(QPoint((sheet.width() - size.width()) / 2, 0), size), pdf.render(page, size));
    }
}

}  // namespace kest
