// Lays a report out on pages and paints them: header and footer on each, no row and no line cut by a page's end.
#pragma once

#include <QList>
#include <QTextBlock>
#include <QTextDocument>

#include <memory>

class QPagedPaintDevice;
class QPainter;
class QTextFrame;
class QTextTable;

namespace kest::report {

class Report;

/// The pages of a report as they come out on one device.
class Pages {
public:
    /// `device` gives the paper, its margins and its resolution; it must outlive the pages.
    Pages(const Report& report, QPagedPaintDevice& device);

    int count() const { return static_cast<int>(slices.size()); }
    /// Paints a page, numbered from 0; the painter stands at the top left corner inside the margins.
    void paint(QPainter& painter, int page) const;

private:
    // Where one page cuts the body: from `top` to `bottom`, below the repeated head of a table.
    struct Slice {
        double top;
        double bottom;
        double headTop = 0;
        double headBottom = 0;
        qsizetype firstPiece = 0;
    };
    // What should stay in one piece: a row of a table with its head, or a paragraph's line.
    struct Piece {
        double top;
        double bottom;
        double headTop = 0;  // of the table that the piece is a row of
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

/// Paints all pages, or those that the user chose for a printer.
void paint(const Report& report, QPagedPaintDevice& device, int firstPage = 1, int lastPage = 0);
/// Puts a device on A4 with the margins of a report.
void setPaper(QPagedPaintDevice& device);
/// Writes the report as a PDF file of this system.
void writePdf(const Report& report, const QString& systemPath);

}  // namespace kest::report
