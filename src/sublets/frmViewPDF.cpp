#include "sublets/frmViewPDF.h"

#include "platform/Prompt.h"
#include "platform/desktop/Progress.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"

#include <QHBoxLayout>
#include <QLabel>
#include <QPainter>
#include <QPdfDocument>
#include <QPdfPageNavigator>
#include <QPdfView>
#include <QPrintDialog>
#include <QPrinter>
#include <QScreen>
#include <QScrollBar>
#include <QShortcut>
#include <QToolButton>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr double zoomStep = 1.25;
constexpr double smallestZoom = 0.1;
constexpr double largestZoom = 8;
constexpr int printResolution = 300;  // dots per inch
constexpr double pointsPerInch = 72;
constexpr int rightMargin = 150;  // twips
constexpr int stripMargin = 75;   // twips

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

}  // namespace

frmViewPDF::frmViewPDF(QPdfDocument& document, const QString& caption)
    : Form(u"frmViewPDF"_s, caption),
      pdf(document),
      AcroPDF1(new QPdfView(this)),
      toolStrip(tools()),
      lblPage(new QLabel)
{
    setWindowFlag(Qt::WindowMaximizeButtonHint);
    resize(desktop::pixels(12000, 10500));

    AcroPDF1->setObjectName("AcroPDF1"_L1);
    AcroPDF1->setAccessibleName(u"Document"_s);
    AcroPDF1->setDocument(&pdf);
    AcroPDF1->setPageMode(QPdfView::PageMode::MultiPage);
    AcroPDF1->setZoomMode(QPdfView::ZoomMode::FitToWidth);
    AcroPDF1->setFocus();
    lblPage->setObjectName("lblPage"_L1);
    toolStrip->layout()->addWidget(lblPage);
    showPage(pdf.pageCount());  // the longest text determines the minimum width
    setMinimumSize(toolStrip->sizeHint().width() + desktop::pixels(rightMargin), desktop::pixels(4500));
    showPage(1);
    desktop::onEvent(AcroPDF1->pageNavigator(), &QPdfPageNavigator::currentPageChanged, this,
                     u"frmViewPDF.AcroPDF1_Page"_s, [this](int page) { showPage(page + 1); });
}

void frmViewPDF::ShowForm(const QString& fileName)
{
    QPdfDocument document;
    const QPdfDocument::Error error = document.load(files::systemPath(fileName));
    if (error != QPdfDocument::Error::None) {
        desktop::msgBox(u"The document %1 can't be shown: %2."_s.arg(fileName, whyNotOpened(error)),
                        desktop::Icon::Critical);
        return;
    }
    desktop::recordWindow({{u"name"_s, u"frmViewPDF"_s}, {u"file"_s, fileName}});
    frmViewPDF form(document, fileName.section(u'\\', -1));
    desktop::showModal(form);
}

QWidget* frmViewPDF::tools()
{
    auto* strip = new QWidget(this);
    auto* row = new QHBoxLayout(strip);
    row->setContentsMargins({desktop::pixels(stripMargin), 0, desktop::pixels(stripMargin), 0});
    row->setSpacing(0);
    const auto turn = [this](int pages) {
        return [this, pages] { goTo(AcroPDF1->pageNavigator()->currentPage() + pages); };
    };
    const auto enlarge = [this](double factor) { return [this, factor] { zoom(factor); }; };
    const auto fitWidth = [this] { AcroPDF1->setZoomMode(QPdfView::ZoomMode::FitToWidth); };
    const QList<QKeySequence> zoomIn{QKeySequence::ZoomIn, Qt::CTRL | Qt::Key_Equal};  // "+" without Shift
    const struct {
        QLatin1StringView name, caption, hint;
        QList<QKeySequence> keys;
        std::function<void()> action;
    } list[] = {
        {"cmdFirst"_L1, "First"_L1, "First page"_L1, {Qt::Key_Home}, [this] { goTo(0); }},
        {"cmdPrevious"_L1, "Previous"_L1, "Previous page"_L1, {Qt::CTRL | Qt::Key_PageUp}, turn(-1)},
        {"cmdNext"_L1, "Next"_L1, "Next page"_L1, {Qt::CTRL | Qt::Key_PageDown}, turn(1)},
        {"cmdLast"_L1, "Last"_L1, "Last page"_L1, {Qt::Key_End}, [this] { goTo(pdf.pageCount() - 1); }},
        {"cmdZoomIn"_L1, "Zoom in"_L1, "Larger"_L1, zoomIn, enlarge(zoomStep)},
        {"cmdZoomOut"_L1, "Zoom out"_L1, "Smaller"_L1, {QKeySequence::ZoomOut}, enlarge(1 / zoomStep)},
        {"cmdFitWidth"_L1, "Fit width"_L1, "As wide as the window"_L1, {Qt::CTRL | Qt::Key_0}, fitWidth},
        {"cmdPrint"_L1, "Print..."_L1, "Print"_L1, {QKeySequence::Print}, [this] { print(); }},
    };
    for (const auto& [name, caption, hint, keys, action] : list) {
        auto* tool = new QToolButton;
        tool->setObjectName(name);
        tool->setText(caption);
        tool->setAutoRaise(true);
        tool->setToolTip(u"%1 (%2)"_s.arg(hint, keys.first().toString(QKeySequence::NativeText)));
        row->addWidget(tool);
        auto* shortcut = new QShortcut(this);
        shortcut->setKeys(keys);
        const QString source = u"frmViewPDF.%1_Click"_s.arg(name);
        desktop::onEvent(tool, &QToolButton::clicked, this, source, action);
        desktop::onEvent(shortcut, &QShortcut::activated, this, source, action);
    }
    row->addStretch();
    return strip;
}

void frmViewPDF::resizeEvent(QResizeEvent* event)
{
    Form::resizeEvent(event);
    const int right = desktop::pixels(rightMargin);
    const int bottom = desktop::pixels(400);
    AcroPDF1->setGeometry(0, 0, width() - right, height() - bottom);
    toolStrip->setGeometry(0, height() - bottom, width() - right, bottom);
}

void frmViewPDF::goTo(int page)
{
    QPdfPageNavigator* pages = AcroPDF1->pageNavigator();
    pages->jump(qBound(0, page, pdf.pageCount() - 1), {}, pages->currentZoom());
}

void frmViewPDF::zoom(double factor)
{
    double now = AcroPDF1->zoomFactor();
    if (AcroPDF1->zoomMode() == QPdfView::ZoomMode::FitToWidth) {
        const QMargins margins = AcroPDF1->documentMargins();
        const double pageWidth = pdf.pagePointSize(AcroPDF1->pageNavigator()->currentPage()).width();
        const double dots = AcroPDF1->viewport()->width() - margins.left() - margins.right();
        now = dots / (pageWidth * screen()->logicalDotsPerInch() / pointsPerInch);
    }
    const double next = qBound(smallestZoom, now * factor, largestZoom);
    QScrollBar* const bar = AcroPDF1->verticalScrollBar();
    const double middle = bar->value() + bar->pageStep() / 2.0;
    AcroPDF1->setZoomMode(QPdfView::ZoomMode::Custom);
    AcroPDF1->setZoomFactor(next);
    bar->setValue(qRound(middle * next / now - bar->pageStep() / 2.0));  // keep the middle of the view in place
}

void frmViewPDF::print()
{
    QPrinter printer(QPrinter::HighResolution);
    printer.setResolution(printResolution);
    QPrintDialog dialog(&printer, this);
    dialog.setObjectName("PrintDialog"_L1);
    dialog.setMinMax(1, pdf.pageCount());
    desktop::showModal(dialog);
    if (dialog.result() != QDialog::Accepted)
        return;
    const bool isRange = printer.printRange() == QPrinter::PageRange;
    const int first = isRange ? printer.fromPage() - 1 : 0;
    const int last = isRange ? printer.toPage() - 1 : pdf.pageCount() - 1;
    QPainter painter(&printer);
    if (!painter.isActive()) {
        desktop::msgBox(u"The document can't be printed."_s, desktop::Icon::Critical);
        return;
    }
    desktop::Progress progress(windowTitle(), u"Printing the document..."_s);
    for (int page = first; page <= last; ++page) {
        progress.step(page - first, last - first + 1);
        if (page > first)
            printer.newPage();
        const QRect sheet = painter.viewport();
        const QSize size = pdf.pagePointSize(page).scaled(sheet.size(), Qt::KeepAspectRatio).toSize();
        painter.drawImage(QRect(QPoint((sheet.width() - size.width()) / 2, 0), size), pdf.render(page, size));
    }
}

void frmViewPDF::showPage(int page)
{
    lblPage->setText(u"Page %1 of %2"_s.arg(page).arg(pdf.pageCount()));
}

}  // namespace kest
