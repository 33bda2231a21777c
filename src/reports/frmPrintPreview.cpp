#include "reports/frmPrintPreview.h"

#include "base/Journal.h"
#include "base/ModRegistry.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/Prompt.h"
#include "platform/RuntimeError.h"
#include "platform/database/Recordset.h"
#include "platform/database/Sql.h"
#include "platform/desktop/Window.h"
#include "platform/files/files.h"
#include "platform/print/OutputFolder.h"
#include "platform/print/Pages.h"
#include "platform/print/Preview.h"
#include "platform/print/PrinterDialog.h"
#include "platform/values.h"
#include "reports/ReportTable.h"

#include <QGuiApplication>
#include <QJsonArray>
#include <QPrinter>
#include <QPushButton>

#include <optional>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

constexpr int gap = 80;  // twips, around the button

/// Returns the path of the template. If the report does not exist, shows a box and returns nothing.
std::optional<QString> templateOf(qint32 number)
{
    db::Recordset definition(gConn);
    definition.open(sql("select * from ReportDefinition where ReportID = {}", number));
    if (definition.eof()) {
        desktop::msgBox(u"Report ID %1 does not exist"_s.arg(number));
        return {};
    }
    const QString name = definition.text(u"ReportName"_s);
    if (!files::isPlainName(name))
        throw RuntimeError(FileNotFound, u"There is no report "_s + name);
    return GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"ReportPath"_s, u"c:\\wirra32\\report\\"_s) + name;
}

void setParameters(report::Report& report, qint32 number, const QVariant& value)
{
    for (qsizetype i = 0; i < report.parameters().size(); ++i) {
        const QString name = report.parameters()[i].name.toUpper();
        if (number == QuoteRequestReport || number == ComparisonReport)
            report.setParameter(i, textOrEmpty(value));
        else if (number == AssessmentReport && name == u"COMP"_s)
            report.setParameter(i, value.toStringList().value(0));
        else if (number == AssessmentReport && name == u"TITLE"_s)
            report.setParameter(i, value.toStringList().value(1));
    }
}

QJsonValue asJson(const std::optional<report::Table>& table)
{
    if (!table)
        return QJsonValue::Null;
    QJsonArray rows;
    for (const QVariantList& row : table->rows) {
        QJsonArray cells;
        for (const QVariant& cell : row)
            cells.append(cell.isNull() ? QJsonValue(QJsonValue::Null) : QJsonValue(cell.toString()));
        rows.append(cells);
    }
    return QJsonObject{{u"fields"_s, QJsonArray::fromStringList(table->fields)}, {u"rows"_s, rows}};
}

/// Records the preview for an unattended run.
void recordPreview(qint32 number, const report::Report& report, const std::optional<report::Table>& table)
{
    QJsonObject parameters;
    for (const report::Parameter& parameter : report.parameters())
        parameters.insert(parameter.name, parameter.value);
    const QJsonObject shown{{u"name"_s, u"frmPrintPreview"_s},
                            {u"report"_s, number},
                            {u"parameters"_s, parameters},
                            {u"table"_s, asJson(table)}};
    desktop::recordWindow(shown);
    report::writeOutput(number, report, shown);
}

void setDefaultPointer()
{
    while (QGuiApplication::overrideCursor())
        QGuiApplication::restoreOverrideCursor();
}

}  // namespace

frmPrintPreview::frmPrintPreview(const report::Report& report)
    : Form(u"frmPrintPreview"_s, u"Print Preview"_s),
      crvPreview(new report::Preview(this, [this] { crvPreview_PrintButtonClicked(); })),
      cmdExit(new QPushButton(u"E&xit"_s, this))
{
    setWindowFlag(Qt::WindowMaximizeButtonHint);
    crvPreview->setObjectName(u"crvPreview"_s);
    cmdExit->setObjectName(u"cmdExit"_s);
    cmdExit->resize(cmdExit->sizeHint());
    on(cmdExit, &QPushButton::clicked, u"cmdExit_Click"_s, [this] { close(); });
    resize(desktop::pixels(13500, 11250));
    crvPreview->hide();
    crvPreview->setReport(report);
    crvPreview->show();
    crvPreview->setFocus();
    setMinimumSize(crvPreview->minimumSizeHint().width(), desktop::pixels(4500));
    setDefaultPointer();
}

void frmPrintPreview::ShowForm(qint32 peReportType, const QVariant& pvValue, db::Recordset* table,
                               const report::Table& outside)
{
    attempt([&] {
        const std::optional<QString> path = templateOf(peReportType);
        if (!path)
            return;
        report::Report report(*path);
        std::optional<report::Table> rows;
        if (table) {
            rows = report::tableOf(*table);
            report.setTable(*rows);
            report.setOutside(outside);
        }
        setParameters(report, peReportType, pvValue);
        report.setAuthor(GetRegSetting(u"wirra32"_s, u"frmsplash"_s, u"ShopName"_s, {}, CopyUp::No));
        recordPreview(peReportType, report, rows);
        frmPrintPreview form(report);
        desktop::showModal(form);
        EnsureConnection();  // the server may have dropped it while the window was open
        journal::keep(u"reportShown"_s, true);
    });
    setDefaultPointer();
}

void frmPrintPreview::crvPreview_PrintButtonClicked()
{
    QPrinter printer(QPrinter::HighResolution);
    report::setPaper(printer);
    if (!report::askForPrinter(printer, this, crvPreview->pageCount()))
        return;
    try {
        report::paint(crvPreview->report(), printer,
                      [&](int pageCount) { return report::pagesToPrint(printer, pageCount); });
    } catch (const RuntimeError& error) {
        desktop::msgBox(u"The report can't be printed: %1"_s.arg(error.description()), desktop::Icon::Critical);
    }
}

void frmPrintPreview::resizeEvent(QResizeEvent* event)
{
    Form::resizeEvent(event);
    if (isMinimized())
        return;
    const int space = desktop::pixels(gap);
    crvPreview->setGeometry(0, 0, width(), height() - cmdExit->height() - desktop::pixels(2 * gap));
    cmdExit->move(width() - cmdExit->width() - space, crvPreview->height() + space);
}

}  // namespace kest
