#include "platform/print/Preview.h"

#include "platform/desktop/Window.h"
#include "platform/print/Pages.h"

#include <QAbstractScrollArea>
#include <QFileDialog>
#include <QHBoxLayout>
#include <QKeyEvent>
#include <QLabel>
#include <QPrintPreviewWidget>
#include <QPrinter>
#include <QScrollBar>
#include <QShortcut>
#include <QToolButton>

namespace kest::report {

using namespace Qt::StringLiterals;

namespace {

constexpr double zoomStep = 1.25;

}  // namespace

Preview::Preview(QWidget* parent, const std::function<void()>& print)
    : QWidget(parent),
      paper(std::make_unique<QPrinter>(QPrinter::HighResolution)),
      view(new QPrintPreviewWidget(paper.get())),
      sheet(view->findChild<QAbstractScrollArea*>()),
      lblPage(new QLabel)
{
    setPaper(*paper);
    auto* all = new QVBoxLayout(this);
    all->setContentsMargins({});
    all->setSpacing(0);
    auto* row = new QHBoxLayout;
    row->setSpacing(0);  // so that all tools fit side by side on a small screen
    all->addLayout(row);
    all->addWidget(view, 1);
    addTools(*row, print);
    lblPage->setObjectName(u"lblPage"_s);
    lblPage->setContentsMargins({desktop::pixels(90), 0, desktop::pixels(90), 0});
    lblPage->setMinimumWidth(lblPage->fontMetrics().horizontalAdvance(u"Page 88 of 88"_s) + desktop::pixels(180));
    row->addWidget(lblPage);
    row->addStretch();

    view->setViewMode(QPrintPreviewWidget::SinglePageView);
    view->setZoomMode(QPrintPreviewWidget::FitToWidth);
    sheet->setObjectName(u"crvPages"_s);
    sheet->setAccessibleName(u"Report"_s);
    sheet->installEventFilter(this);
    setFocusProxy(sheet);
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

void Preview::addTools(QHBoxLayout& row, const std::function<void()>& print)
{
    const auto add = [&](const char* name, const char* caption, const char* hint, const QKeySequence& keys,
                         const std::function<void()>& action) {
        addTool(row, QString::fromLatin1(name), QString::fromLatin1(caption), QString::fromLatin1(hint), keys, action);
    };
    add("cmdPrint", "Print...", "Print", QKeySequence::Print, print);
    add("cmdSave", "Save PDF...", "Save as a PDF file", QKeySequence::Save, [this] { saveAsPdf(); });
    add("cmdFirst", "First", "First page", Qt::CTRL | Qt::Key_Home, [this] { goTo(1); });
    add("cmdPrevious", "Previous", "Previous page", Qt::CTRL | Qt::Key_PageUp,
        [this] { goTo(view->currentPage() - 1); });
    add("cmdNext", "Next", "Next page", Qt::CTRL | Qt::Key_PageDown, [this] { goTo(view->currentPage() + 1); });
    add("cmdLast", "Last", "Last page", Qt::CTRL | Qt::Key_End, [this] { goTo(view->pageCount()); });
    add("cmdZoomIn", "Zoom in", "Larger", QKeySequence::ZoomIn, [this] { view->zoomIn(zoomStep); });
    add("cmdZoomOut", "Zoom out", "Smaller", QKeySequence::ZoomOut, [this] { view->zoomOut(zoomStep); });
    add("cmdFitWidth", "Fit width", "As wide as the window", Qt::CTRL | Qt::Key_0, [this] { view->fitToWidth(); });
    add("cmdFitPage", "Fit page", "The whole page", Qt::CTRL | Qt::Key_1, [this] { view->fitInView(); });
}

void Preview::addTool(QHBoxLayout& row, const QString& name, const QString& caption, const QString& hint,
                      const QKeySequence& keys, const std::function<void()>& action)
{
    auto* tool = new QToolButton;
    tool->setObjectName(name);
    tool->setText(caption);
    tool->setAutoRaise(true);
    tool->setToolTip(u"%1 (%2)"_s.arg(hint, keys.toString(QKeySequence::NativeText)));
    row.addWidget(tool);
    const QString source = u"frmPrintPreview.%1_Click"_s.arg(name);
    desktop::onEvent(tool, &QToolButton::clicked, this, source, [action] { action(); });
    desktop::onEvent(new QShortcut(keys, this), &QShortcut::activated, this, source, [action] { action(); });
}

void Preview::goTo(int page)
{
    view->setCurrentPage(qBound(1, page, qMax(1, view->pageCount())));
    showPage();
}

bool Preview::eventFilter(QObject* watched, QEvent* event)
{
    if (watched != sheet || event->type() != QEvent::KeyPress)
        return QWidget::eventFilter(watched, event);
    switch (static_cast<QKeyEvent*>(event)->key()) {
        case Qt::Key_Home:  // the view itself handles the other page keys
            goTo(1);
            return true;
        case Qt::Key_End:
            goTo(view->pageCount());
            return true;
        default:
            return false;
    }
}

void Preview::saveAsPdf()
{
    QFileDialog dialog(this, u"Save as PDF"_s, shown->title() + u".pdf"_s, u"PDF files (*.pdf)"_s);
    dialog.setObjectName(u"SaveDialog"_s);
    dialog.setAcceptMode(QFileDialog::AcceptSave);
    dialog.setDefaultSuffix(u"pdf"_s);
    desktop::showModal(dialog);
    if (dialog.result() == QDialog::Accepted && !dialog.selectedFiles().isEmpty())
        writePdf(*shown, dialog.selectedFiles().first());
}

void Preview::showPage()
{
    lblPage->setText(u"Page %1 of %2"_s.arg(view->currentPage()).arg(view->pageCount()));
}

}  // namespace kest::report
