#include "outbound/frmViewPDF.h"

#include "platform/desktop/Prompt.h"
#include "platform/desktop/Script.h"
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

QString whyNotOpened(QPdfDocument::Error error)
{
    switch (error) {
        case QPdfDocument::Error::FileNotFound:
            return u"the file is not there"_s;
        case QPdfDocument::Error::InvalidFileFormat:
            return u"the file is no PDF document"_s;
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
    setMinimumSize(desktop::pixels(6000, 4500));
    resize(desktop::pixels(12000, 10500));

    AcroPDF1->setObjectName("AcroPDF1"_L1);
    AcroPDF1->setDocument(&pdf);
    AcroPDF1->setPageMode(QPdfView::PageMode::MultiPage);
    AcroPDF1->setZoomMode(QPdfView::ZoomMode::FitToWidth);
    AcroPDF1->setFocus();
    lblPage->setObjectName("lblPage"_L1);
    toolStrip->layout()->addWidget(lblPage);
    showPage();
    desktop::onEvent(AcroPDF1->pageNavigator(), &QPdfPageNavigator::currentPageChanged, this,
                     u"frmViewPDF.AcroPDF1_Page"_s, [this] { showPage(); });
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
    if (desktop::Script* script = desktop::currentScript())
        script->addWindow({{u"name"_s, u"frmViewPDF"_s}, {u"file"_s, fileName}});
    frmViewPDF form(document, fileName.section(u'\\', -1));
    desktop::showModal(form);
}

QWidget* frmViewPDF::tools()
{
    auto* strip = new QWidget(this);
    auto* row = new QHBoxLayout(strip);
    row->setContentsMargins({});
    const auto add = [&](const QString& caption, const QString& hint, const QKeySequence& keys, auto action) {
        auto* tool = new QToolButton;
        tool->setText(caption);
        tool->setAutoRaise(true);
        tool->setToolTip(u"%1 (%2)"_s.arg(hint, keys.toString(QKeySequence::NativeText)));
        row->addWidget(tool);
        const QString source = u"frmViewPDF.Tool_Click"_s;
        desktop::onEvent(tool, &QToolButton::clicked, this, source, action);
        desktop::onEvent(new QShortcut(keys, this), &QShortcut::activated, this, source, action);
    };
    const auto page = [this] { return AcroPDF1->pageNavigator()->currentPage(); };
    add(u"First"_s, u"First page"_s, Qt::Key_Home, [this] { goTo(0); });
    add(u"Previous"_s, u"Previous page"_s, Qt::CTRL | Qt::Key_PageUp, [this, page] { goTo(page() - 1); });
    add(u"Next"_s, u"Next page"_s, Qt::CTRL | Qt::Key_PageDown, [this, page] { goTo(page() + 1); });
    add(u"Last"_s, u"Last page"_s, Qt::Key_End, [this] { goTo(pdf.pageCount() - 1); });
    add(u"Zoom in"_s, u"Larger"_s, QKeySequence::ZoomIn, [this] { zoom(zoomStep); });
    add(u"Zoom out"_s, u"Smaller"_s, QKeySequence::ZoomOut, [this] { zoom(1 / zoomStep); });
    add(u"Fit width"_s, u"As wide as the window"_s, Qt::CTRL | Qt::Key_0,
        [this] { AcroPDF1->setZoomMode(QPdfView::ZoomMode::FitToWidth); });
    add(u"Print..."_s, u"Print"_s, QKeySequence::Print, [this] { print(); });
    row->addStretch();
    return strip;
}

void frmViewPDF::resizeEvent(QResizeEvent* event)
{
    Form::resizeEvent(event);
    const int right = desktop::pixels(150);
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
    bar->setValue(qRound(middle * next / now - bar->pageStep() / 2.0));  // what stood in the middle stays there
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
    for (int page = first; page <= last; ++page) {
        if (page > first)
            printer.newPage();
        const QRect sheet = painter.viewport();
        const QSize size = pdf.pagePointSize(page).scaled(sheet.size(), Qt::KeepAspectRatio).toSize();
        painter.drawImage(QRect(QPoint((sheet.width() - size.width()) / 2, 0), size), pdf.render(page, size));
    }
}

void frmViewPDF::showPage()
{
    lblPage->setText(u"Page %1 of %2"_s.arg(AcroPDF1->pageNavigator()->currentPage() + 1).arg(pdf.pageCount()));
}

}  // namespace kest
