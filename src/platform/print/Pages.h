// Lays out and paints the pages of a report. Each has a header and a footer, and no row or line is cut at its end.
#pragma once

#include <QList>
#include <QTextBlock>
#include <QTextDocument>

#include <functional>
#include <memory>

class QPagedPaintDevice;
class QPainter;
class QTextFrame;
class QTextTable;

namespace kest::report {

class Report;

/// The pages of a report on a device.
class Pages {
public:
    /// `device` determines the paper, its margins and its resolution. It must outlive the pages, and so must `report`.
    /// Throws Overflow if header, footer and a repeated table head leave no room on the paper.
    Pages(const Report& report, QPagedPaintDevice& device);

    int count() const { return static_cast<int>(slices.size()); }
    /// Paints a page, counted from 0. The painter's origin must be the top left corner inside the margins.
    void paint(QPainter& painter, int page) const;

private:
    // The part of the body that a page shows, from `top` to `bottom`, below the repeated head of a table.
    struct Slice {
        double top;
        double bottom;
        double headTop = 0;
        double headBottom = 0;
        qsizetype firstPiece = 0;
    };
    // A part that should not be cut: a row of a table, or a line of a paragraph.
    struct Piece {
        double top;
        double bottom;
        double headTop = 0;  // the head of the table, if the piece is a row
        double headBottom = 0;
        bool staysWithNext = false;  // a heading
        QTextBlock block = {};       // of a paragraph
        int line = 0;
    };

    std::unique_ptr<QTextDocument> laidOut(const QString& html) const;
    void collect(const QTextFrame& frame);
    void collect(const QTextTable& table);
    void collectLines(const QTextBlock& block);
    void slice();
    double lastLineAbove(double top, double limit) const;
    void draw(QPainter& painter, const QTextDocument& document, double at, double from, double to) const;
    double drawRestOfParagraph(QPainter& painter, const Slice& slice, double at) const;

    const Report& report;
    QPagedPaintDevice& device;
    double width;
    double height;
    double headerHeight;
    double footerHeight;
    std::unique_ptr<QTextDocument> body;
    QList<Piece> pieces;
    QList<std::pair<double, double>> lines;
    QList<Slice> slices;
};

/// Returns the pages to paint, counted from 0, of a report with so many pages.
using PageChoice = std::function<QList<int>(int pageCount)>;
/// Paints the chosen pages, or all.
void paint(const Report& report, QPagedPaintDevice& device, const PageChoice& choice = {});
/// Sets the device to A4 with the margins of a report.
void setPaper(QPagedPaintDevice& device);
/// Writes the report as a PDF file, whole or not at all. Throws RuntimeError if the file can't be written.
void writePdf(const Report& report, const QString& systemPath);

}  // namespace kest::report
