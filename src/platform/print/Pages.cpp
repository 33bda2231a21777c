#include "platform/print/Pages.h"

#include "platform/RuntimeError.h"
#include "platform/desktop/Progress.h"
#include "platform/files/files.h"
#include "platform/print/FaultInjection.h"
#include "platform/print/PdfAuthor.h"
#include "platform/print/Report.h"

#include <QAbstractTextDocumentLayout>
#include <QBuffer>
#include <QFileInfo>
#include <QGuiApplication>
#include <QPainter>
#include <QPdfWriter>
#include <QRegularExpression>
#include <QScreen>
#include <QTextBlock>
#include <QTextTable>

#include <algorithm>
#include <limits>
#include <numeric>

namespace kest::report {

using namespace Qt::StringLiterals;

namespace {

std::function<bool()> printFault;

constexpr double margin = 15;       // millimetres
constexpr int pdfResolution = 600;  // dots per inch
constexpr double gap = 6;           // points between the body and header or footer
constexpr double pointsPerInch = 72;
constexpr double leastRoom = 36;  // points that the body needs on a page: three lines
constexpr int deepestTable = 8;
constexpr qint64 largestResource = qint64{16} * 1024 * 1024;  // bytes

double heightOf(const QTextDocument& document)
{
    return document.documentLayout()->documentSize().height();
}

QRectF rectOf(const QTextBlock& block)
{
    return block.document()->documentLayout()->blockBoundingRect(block);
}

/// Reads pictures and style sheets from ordinary files only: a device or a pipe has no end.
class TemplateDocument final : public QTextDocument {
protected:
    QVariant loadResource(int type, const QUrl& name) override
    {
        const QFileInfo file(name.toLocalFile());
        const bool isRead = !name.isLocalFile() || (file.isFile() && file.size() <= largestResource);
        return isRead ? QTextDocument::loadResource(type, name) : QVariant();
    }
};

/// Throws TypeMismatch if a cell spans more than 99 columns or rows. The layout would have to fill them all.
void checkSpans(QStringView tag)
{
    static const QRegularExpression tooWide(u"\\b(?:col|row)span\\s*+=\\s*+[\"']?+(?!\\d{1,2}(?:[\"'\\s/]|$))"_s,
                                            QRegularExpression::CaseInsensitiveOption);
    if (tooWide.match(tag).hasMatch())
        throw RuntimeError(TypeMismatch, u"A cell of the report spans too many columns or rows"_s);
}

/// Throws TypeMismatch if the borders or spaces of a table have more than three digits. The layout of wide ones does
/// not end.
void checkSpaces(QStringView tag)
{
    static const QRegularExpression tooWide(
        u"\\b(?:border|cellpadding|cellspacing)\\s*+=\\s*+[\"']?+(?!\\d{1,3}(?:px)?(?:[\"'\\s/]|$))"_s,
        QRegularExpression::CaseInsensitiveOption);
    if (tooWide.match(tag).hasMatch())
        throw RuntimeError(TypeMismatch, u"A table of the report has borders or spaces of a wrong size"_s);
}

/// Throws TypeMismatch if tables contain each other too deeply, which doubles the time of the layout for each level, or
/// if a cell spans too much or a table has too much space.
void checkTables(const QString& html)
{
    int depth = 0;
    for (qsizetype at = html.indexOf(u'<'); at >= 0; at = html.indexOf(u'<', at + 1)) {
        const QStringView tag = QStringView(html).sliced(at + 1);
        const auto inside = [tag] { return tag.first(tag.contains(u'>') ? tag.indexOf(u'>') : tag.size()); };
        if (tag.startsWith("table"_L1, Qt::CaseInsensitive)) {
            ++depth;
            checkSpaces(inside());
        } else if (tag.startsWith("/table"_L1, Qt::CaseInsensitive)) {
            depth = std::max(0, depth - 1);
        } else if (tag.startsWith("td"_L1, Qt::CaseInsensitive) || tag.startsWith("th"_L1, Qt::CaseInsensitive)) {
            checkSpans(inside());
        }
        if (depth > deepestTable)
            throw RuntimeError(TypeMismatch, u"The tables of the report contain each other too deeply"_s);
    }
}

}  // namespace

Pages::Pages(const Report& shown, QPagedPaintDevice& onto) : report(shown), device(onto)
{
    const double space = gap / pointsPerInch * device.logicalDpiY();
    const QSizeF paper = device.pageLayout().paintRectPixels(device.logicalDpiX()).size();
    width = paper.width();
    height = paper.height();
    headerHeight = heightOf(*laidOut(report.header(1, 1))) + space;
    footerHeight = heightOf(*laidOut(report.footer(1, 1))) + space;
    body = laidOut(report.body());
    collect(*body->rootFrame());
    slice();
}

std::unique_ptr<QTextDocument> Pages::laidOut(const QString& html) const
{
    checkTables(html);
    auto document = std::make_unique<TemplateDocument>();
    document->documentLayout()->setPaintDevice(&device);
    document->setDocumentMargin(0);
    document->setDefaultFont(QFont(u"Liberation Sans"_s, 9));
    document->setHtml(html);
    document->setTextWidth(width);
    return document;
}

void Pages::collect(const QTextFrame& frame)
{
    for (auto at = frame.begin(); !at.atEnd(); ++at) {
        if (const auto* table = qobject_cast<const QTextTable*>(at.currentFrame())) {
            collect(*table);
        } else if (at.currentFrame()) {
            collect(*at.currentFrame());
        } else {
            const qsizetype first = lines.size();
            collectLines(at.currentBlock());
            for (qsizetype i = first; i < lines.size(); ++i)
                pieces.append({.top = lines[i].first,
                               .bottom = lines[i].second,
                               .staysWithNext = at.currentBlock().blockFormat().headingLevel() > 0,
                               .block = at.currentBlock(),
                               .line = static_cast<int>(i - first)});
        }
    }
}

void Pages::collect(const QTextTable& table)
{
    const QTextTableFormat format = table.format();
    const double scale = device.logicalDpiY() / QGuiApplication::primaryScreen()->logicalDotsPerInchY();
    const double above = (format.cellPadding() + format.border()) * scale;
    QList<double> tops;
    double end = 0;
    for (int row = 0; row < table.rows(); ++row) {
        double top = std::numeric_limits<double>::max();
        for (int column = 0; column < table.columns(); ++column) {
            const QTextTableCell cell = table.cellAt(row, column);
            if (cell.row() != row)
                continue;
            top = std::min(top, rectOf(cell.firstCursorPosition().block()).top());
            for (auto at = cell.begin(); !at.atEnd(); ++at) {
                if (at.currentBlock().isValid())
                    collectLines(at.currentBlock());
            }
            end = std::max(end, rectOf(cell.lastCursorPosition().block()).bottom());
        }
        tops.append(top - above);
    }
    tops.append(end + above);
    const int heads = std::min(format.headerRowCount(), table.rows());
    for (int row = 0; row < table.rows(); ++row) {
        Piece piece{.top = tops[row], .bottom = tops[row + 1]};
        if (row < heads) {
            piece.bottom = tops[std::min(heads + 1, table.rows())];  // keep the head with the first row
        } else if (heads > 0) {
            piece.headTop = tops[0];
            piece.headBottom = tops[heads];
        }
        pieces.append(piece);
    }
}

void Pages::collectLines(const QTextBlock& block)
{
    const double top = rectOf(block).top();
    const QTextLayout& layout = *block.layout();
    for (int i = 0; i < layout.lineCount(); ++i) {
        const QRectF line = layout.lineAt(i).rect();
        lines.append({top + line.top(), top + line.bottom()});
    }
}

void Pages::slice()
{
    for (qsizetype i = pieces.size() - 1; i-- > 0;)
        if (pieces[i].staysWithNext)
            pieces[i].bottom = pieces[i + 1].bottom;

    const double room = height - headerHeight - footerHeight;
    const double least = leastRoom / pointsPerInch * device.logicalDpiY();
    const double end = heightOf(*body);
    double top = 0;
    qsizetype first = 0;  // the first piece of the page
    do {
        Slice page{.top = top, .bottom = end, .firstPiece = first};
        if (first < pieces.size() && pieces[first].headBottom <= top) {
            page.headTop = pieces[first].headTop;
            page.headBottom = pieces[first].headBottom;
        }
        const double limit = top + room - (page.headBottom - page.headTop);
        if (limit < top + least)
            throw RuntimeError(Overflow,
                               u"The report \"%1\" does not fit on this paper: its header, its footer and the "
                               "repeated heads of its tables leave no room for a row."_s.arg(report.title()));
        qsizetype next = first;
        while (next < pieces.size() && pieces[next].bottom <= limit)
            ++next;
        if (next < pieces.size())
            page.bottom = next > first ? pieces[next].top : lastLineAbove(top, limit);
        if (page.bottom <= top)  // if pieces are side by side
            page.bottom = limit;
        slices.append(page);
        top = page.bottom;
        for (first = next; first < pieces.size() && pieces[first].bottom <= top;)
            ++first;
    } while (top < end);
}

/// Returns where to cut a piece that is taller than a page: below the last line that fits.
double Pages::lastLineAbove(double top, double limit) const
{
    double cut = limit;
    for (bool moved = true; moved;) {
        moved = false;
        for (const auto& [lineTop, lineBottom] : lines) {
            if (lineTop < cut && cut < lineBottom) {
                cut = lineTop;
                moved = true;
            }
        }
    }
    return cut > top ? cut : limit;
}

void Pages::draw(QPainter& painter, const QTextDocument& document, double at, double from, double to) const
{
    if (to <= from)
        return;
    painter.save();
    painter.translate(0, at - from);
    const QRectF shown(0, from, width, to - from);
    QAbstractTextDocumentLayout::PaintContext context;
    const double point = device.logicalDpiY() / pointsPerInch;
    context.clip = shown.adjusted(0, point, 0, -point);  // else text that touches the cut would appear on both pages
    context.palette.setColor(QPalette::Text, Qt::black);
    painter.setClipRect(shown);
    document.documentLayout()->draw(&painter, context);
    painter.restore();
}

/// Draws the lines of a paragraph that began on the page before, and returns where they end. QTextDocument would also
/// draw the line above the cut; it would be hidden, but a search in the PDF file would find it twice.
double Pages::drawRestOfParagraph(QPainter& painter, const Slice& slice, double at) const
{
    if (slice.firstPiece >= pieces.size() || pieces[slice.firstPiece].line == 0)
        return slice.top;
    const QTextBlock& block = pieces[slice.firstPiece].block;
    const QRectF rect = rectOf(block);
    painter.save();
    painter.translate(0, at - slice.top);
    for (int i = pieces[slice.firstPiece].line; i < block.layout()->lineCount(); ++i)
        if (const QTextLine line = block.layout()->lineAt(i); rect.top() + line.rect().bottom() <= slice.bottom)
            line.draw(&painter, rect.topLeft());
    painter.restore();
    return std::min(rect.bottom(), slice.bottom);
}

void Pages::paint(QPainter& painter, int page) const
{
    const Slice& slice = slices[page];
    const auto header = laidOut(report.header(page + 1, count()));
    draw(painter, *header, 0, 0, heightOf(*header));
    draw(painter, *body, headerHeight, slice.headTop, slice.headBottom);
    const double at = headerHeight + slice.headBottom - slice.headTop;
    const double from = drawRestOfParagraph(painter, slice, at);
    draw(painter, *body, at + from - slice.top, from, slice.bottom);
    const auto footer = laidOut(report.footer(page + 1, count()));
    draw(painter, *footer, height - heightOf(*footer), 0, heightOf(*footer));
}

void setPaper(QPagedPaintDevice& device)
{
    device.setPageLayout(QPageLayout(QPageSize(QPageSize::A4), QPageLayout::Portrait,
                                     QMarginsF(margin, margin, margin, margin), QPageLayout::Millimeter));
}

void setPrintFault(std::function<bool()> fault)
{
    printFault = std::move(fault);
}

void paint(const Report& report, QPagedPaintDevice& device, const PageChoice& choice)
{
    const Pages pages(report, device);
    QList<int> chosen(pages.count());
    std::iota(chosen.begin(), chosen.end(), 0);
    if (choice)
        chosen = choice(pages.count());
    if (chosen.isEmpty())
        return;  // QPainter::begin() would print an empty page
    QPainter painter;
    if ((printFault && printFault()) || !painter.begin(&device))
        throw RuntimeError(FileInputOutput, u"The report can't be painted."_s);
    desktop::Progress progress(report.title(), u"Laying out the pages..."_s);
    for (qsizetype painted = 0; painted < chosen.size(); ++painted) {
        if (painted > 0)
            device.newPage();
        pages.paint(painter, chosen[painted]);
        progress.step(painted + 1, chosen.size());
    }
}

void writePdf(const Report& report, const QString& systemPath)
{
    QByteArray pdf;
    QBuffer buffer(&pdf);
    buffer.open(QIODevice::WriteOnly);
    QPdfWriter writer(&buffer);
    writer.setResolution(pdfResolution);
    writer.setTitle(report.heading());
    setPaper(writer);
    paint(report, writer);
    files::writeExactly(systemPath, withAuthor(pdf, report.author()));
}

}  // namespace kest::report
