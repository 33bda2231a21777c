// Measures report 730: the table for each line of the quote, and the PDF against painting the same document.
#include "platform/print/Report.h"

#include "BenchShop.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "messages/Envelope.h"
#include "platform/database/Sql.h"
#include "platform/print/Pages.h"
#include "reports/BuildAuthReport.h"

#include <QAbstractTextDocumentLayout>
#include <QElapsedTimer>
#include <QPainter>
#include <QPdfWriter>
#include <QTextDocument>

#include <benchmark/benchmark.h>

using namespace Qt::StringLiterals;

namespace kest {
namespace {

/// A shop with a quote, and a message that changes all its lines.
class ChangedQuote : public BenchShop {
public:
    explicit ChangedQuote(int lines)
    {
        gConn->execute(
            u"INSERT INTO QUOTE1 (QTNNO, Subquote, KESTQRNo, excess, contri) VALUES ('500', 0, 'QR1', 0, 0)"_s);
        const auto element = [](const QString& name, const QString& text) {
            return u"<p754:%1>%2</p754:%1>"_s.arg(name, text);
        };
        QString labours;
        gConn->execute(u"PRAGMA synchronous=OFF"_s);
        for (int line = 1; line <= lines; ++line) {
            gConn->execute(
                sql("INSERT INTO QUOTE2 (QTNNO, Subquote, SEQ_NO, category, script, rrhour, rr_rate2, qty) "
                    "VALUES ('500', 0, {}, 'R&R', 'Front bumper bar', 2, 30, 1)",
                    line));
            labours += element(u"labour"_s, element(u"quoteLineChangeIndicator"_s, u"C"_s) +
                                                element(u"quoteLineNumber"_s, QString::number(line)) +
                                                element(u"labourType"_s, u"RR"_s) +
                                                element(u"labourDescription"_s, u"Front bumper bar"_s) +
                                                element(u"labourAmount"_s, u"45.6"_s));
        }
        QString text = u"<p754:getAuthorisedQuoteResponse xmlns:p754=\"%1\">"_s.arg(GetNamespaceURI());
        for (const QString& name : {u"kestAuthorisedQuoteNumber"_s, u"assessmentComment"_s, u"authorityNumber"_s,
                                    u"repairCompletionDate"_s, u"authorisedAmount"_s})
            text += element(name, u"1"_s);
        text += element(u"quoteRequestNumber"_s, u"QR1"_s);
        text += element(u"orlaContact"_s,
                        element(u"name"_s, u"A"_s) + element(u"phone"_s, u"1"_s) + element(u"fax"_s, u"1"_s));
        text += element(u"quoteBody"_s, element(u"quoteReference"_s, u"500"_s) + element(u"gst"_s, u"1"_s) +
                                            element(u"quoteTotal"_s, u"11"_s) + element(u"labours"_s, labours));
        text += u"</p754:getAuthorisedQuoteResponse>"_s;
        message = parsedMessage(text);
    }

    db::Recordset table() const
    {
        QString number;
        QString subquote;
        auto built = BuildAuthReport(message, number, subquote, false);
        if (!built)
            qFatal("no table");
        return std::move(*built);
    }
    QString pdf(const char* name) const { return root() + u'/' + QString::fromLatin1(name); }

private:
    xml::Document message;
};

/// Measures the table. The time for each line must not grow with the number of lines.
void buildTable(benchmark::State& state)
{
    const auto lines = static_cast<int>(state.range(0));
    const ChangedQuote quote(lines);
    for (auto _ : state)
        benchmark::DoNotOptimize(quote.table().recordCount());
    state.counters["seconds_per_line"] =
        benchmark::Counter(lines, benchmark::Counter::kIsIterationInvariantRate | benchmark::Counter::kInvert);
}

void paintBare(const QString& html, const QString& path)
{
    QPdfWriter writer(path);
    writer.setResolution(600);
    report::setPaper(writer);
    QPainter painter(&writer);
    QTextDocument document;
    document.documentLayout()->setPaintDevice(&writer);
    document.setHtml(html);
    const QSizeF page = writer.pageLayout().paintRectPixels(writer.resolution()).size();
    document.setPageSize(page);
    for (int i = 0; i < document.pageCount(); ++i) {
        if (i > 0)
            writer.newPage();
        painter.save();
        painter.translate(0, -i * page.height());
        QAbstractTextDocumentLayout::PaintContext context;
        context.clip = QRectF(0, i * page.height(), page.width(), page.height());
        document.documentLayout()->draw(&painter, context);
        painter.restore();
    }
}

/// Measures the way from the table to the file, in turn with painting the same document.
void writePdf(benchmark::State& state)
{
    const ChangedQuote quote(static_cast<int>(state.range(0)));
    report::Report report(QStringLiteral(KEST_TEMPLATES "/730.html"));
    db::Recordset table = quote.table();
    qint64 floor = 0;  // nanoseconds
    qint64 writing = 0;
    for (auto _ : state) {
        QElapsedTimer timer;
        timer.start();
        report.setTable(report::tableOf(table));
        report::writePdf(report, quote.pdf("whole.pdf"));
        const qint64 elapsed = timer.nsecsElapsed();
        const QString html = report.body();
        timer.restart();
        paintBare(html, quote.pdf("bare.pdf"));
        floor += timer.nsecsElapsed();
        writing += elapsed;
        state.SetIterationTime(static_cast<double>(elapsed) / 1e9);
    }
    state.counters["ratio_to_floor"] = static_cast<double>(writing) / static_cast<double>(floor);
}

BENCHMARK(buildTable)->Name("table")->Arg(10)->Arg(100)->Arg(1000)->UseRealTime()->Unit(benchmark::kMillisecond);
BENCHMARK(writePdf)->Name("PDF")->Arg(10)->Arg(100)->Arg(1000)->UseManualTime()->Unit(benchmark::kMillisecond);

}  // namespace
}  // namespace kest
