// Shows a report as it will be printed.
#pragma once

#include "platform/print/Report.h"

#include <QWidget>

#include <functional>
#include <memory>
#include <optional>

class QAbstractScrollArea;
class QHBoxLayout;
class QKeySequence;
class QLabel;
class QPrintPreviewWidget;
class QPrinter;

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

protected:
    bool eventFilter(QObject* watched, QEvent* event) override;

private:
    void addTools(QHBoxLayout& row, const std::function<void()>& print);
    void addTool(QHBoxLayout& row, const QString& name, const QString& caption, const QString& hint,
                 const QKeySequence& keys, const std::function<void()>& action);
    void goTo(int page);
    void saveAsPdf();
    void showPage();

    std::optional<Report> shown;
    std::unique_ptr<QPrinter> paper;
    QPrintPreviewWidget* view;
    QAbstractScrollArea* sheet;
    QLabel* lblPage;
};

}  // namespace kest::report
