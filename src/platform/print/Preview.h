// Shows a report as it will be printed.
#pragma once

#include "platform/print/Report.h"

#include <QWidget>

#include <functional>
#include <memory>
#include <optional>

class QAbstractScrollArea;
class QPrintPreviewWidget;
class QPrinter;

namespace kest::desktop {
class PageTools;
}

namespace kest::report {

/// A page view with zoom, and a row of buttons for pages, zoom, printing and saving as PDF.
class Preview final : public QWidget {
    Q_OBJECT
public:
    /// The print button calls `print`. The view itself never prints.
    Preview(QWidget* parent, const std::function<void()>& print);
    ~Preview() override;

    /// Shows a report.
    void setReport(Report report);
    /// Returns the report that was set last.
    const Report& report() const { return shown.value(); }
    int pageCount() const;

private:
    void saveAsPdf();
    void showPage();

    std::optional<Report> shown;
    std::unique_ptr<QPrinter> paper;
    QPrintPreviewWidget* view;
    QAbstractScrollArea* sheet;
    desktop::PageTools* tools;
};

}  // namespace kest::report
