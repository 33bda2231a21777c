#include "platform/print/Preview.h"

#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/desktop/Colours.h"
#include "platform/desktop/PageTools.h"
#include "platform/desktop/SaveDialog.h"
#include "platform/desktop/Window.h"
#include "platform/print/Pages.h"

#include <QAbstractScrollArea>
#include <QPrintPreviewWidget>
#include <QPrinter>
#include <QScrollBar>
#include <QVBoxLayout>

namespace kest::report {

using namespace Qt::StringLiterals;

namespace {

constexpr double zoomStep = 1.25;

}  // namespace

Preview::Preview(QWidget* parent, const std::function<void()>& print)
    : QWidget(parent),
      paper(std::make_unique<QPrinter>(QPrinter::HighResolution)),
      view(new QPrintPreviewWidget(paper.get(), this)),  // before the tools: Tab leads from the pages to them
      sheet(view->findChild<QAbstractScrollArea*>())
{
    setPaper(*paper);
    tools = new desktop::PageTools(this, u"frmPrintPreview"_s,
                                   {.print = print,
                                    .save = [this] { saveAsPdf(); },
                                    .goTo =
                                        [this](int page) {
                                            view->setCurrentPage(page);
                                            showPage();
                                        },
                                    .enlarge = [this] { view->zoomIn(zoomStep); },
                                    .reduce = [this] { view->zoomOut(zoomStep); },
                                    .fitWidth = [this] { view->fitToWidth(); },
                                    .fitPage = [this] { view->fitInView(); },
                                    .view = sheet,
                                    .showsOnePage = true});
    auto* all = new QVBoxLayout(this);
    all->setContentsMargins({});
    all->setSpacing(0);
    all->addWidget(view, 1);
    all->addWidget(tools);

    view->setViewMode(QPrintPreviewWidget::SinglePageView);
    view->setZoomMode(QPrintPreviewWidget::FitToWidth);
    sheet->setObjectName(u"crvPages"_s);
    sheet->setAccessibleName(u"Report"_s);
    setFocusProxy(sheet);
    desktop::showFocus(*sheet);
    const QString source = u"frmPrintPreview.crvPreview_View"_s;
    desktop::onEvent(view, &QPrintPreviewWidget::paintRequested, this, source, [this](QPrinter* printer) {
        if (shown)
            paint(*shown, *printer);
    });
    desktop::onEvent(view, &QPrintPreviewWidget::previewChanged, this, source, [this] { showPage(); });
    desktop::onEvent(sheet->verticalScrollBar(), &QScrollBar::valueChanged, this, source, [this] { showPage(); });
}

Preview::~Preview() = default;

void Preview::setReport(Report report)
{
    shown = std::move(report);
    view->updatePreview();
}

int Preview::pageCount() const
{
    return view->pageCount();
}

void Preview::saveAsPdf()
{
    const QString path = desktop::askForPdf(this, shown->heading());
    if (path.isEmpty())
        return;
    try {
        writePdf(*shown, path);
    } catch (const RuntimeError& error) {
        desktop::msgBox(u"The report can't be saved as %1: %2"_s.arg(path, error.description()),
                        desktop::Icon::Critical);
    }
}

void Preview::showPage()
{
    tools->showPage(view->currentPage(), view->pageCount());
}

}  // namespace kest::report
