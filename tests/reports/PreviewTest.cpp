// The preview: which template it opens, what it puts in, its window, and the pages as a reader gets them.
#include "platform/database/Recordset.h"
#include "platform/files/files.h"
#include "platform/report/OutputFolder.h"
#include "platform/report/Pages.h"
#include "platform/settings/registry.h"
#include "reports/BuildAuthReport.h"
#include "reports/Previews.h"
#include "reports/frmPrintPreview.h"
#include "shell/SharedVariables.h"
#include "support/Hands.h"

#include <QFileInfo>
#include <QJsonDocument>
#include <QKeyEvent>
#include <QLabel>
#include <QPdfWriter>
#include <QPrintDialog>
#include <QPrinter>
#include <QPushButton>
#include <QRegularExpression>
#include <QToolButton>

namespace kest::test {

using namespace Qt::StringLiterals;

namespace {

class Preview : public Previews {
protected:
    ~Preview() override { report::setOutputFolder({}); }

    static db::Recordset table(std::initializer_list<std::pair<QString, QString>> cells)
    {
        db::Recordset rows;
        for (const auto& [field, value] : cells)
            rows.declare(field, db::Kind::Text);
        rows.openDeclared();
        rows.addNew();
        for (const auto& [field, value] : cells)
            rows.set(field, value);
        return rows;
    }
    /// The text of a template filled with one row.
    QString filled(const QByteArray& content, std::initializer_list<std::pair<QString, QString>> cells)
    {
        putTemplate("test.html", content);
        report::Report opened(u"c:\\wirra32\\report\\test.html"_s);
        db::Recordset rows = table(cells);
        opened.setTable(report::tableOf(rows));
        return opened.body();
    }
};

report::Report comparisonOf(int lines, const QString& script, const QString& comment = u"A comment"_s)
{
    report::Table rows{{u"quote_ref"_s, u"quote_type"_s, u"comment"_s, u"action"_s, u"line_no"_s, u"category"_s,
                        u"script"_s, u"amount"_s, u"old_amount"_s, u"qty"_s, u"old_qty"_s, u"quote_total"_s},
                       {}};
    const QString indicators[] = {u"I"_s, u"C"_s, u"D"_s};
    const QString categories[] = {u"RR"_s, u""_s, u"PAIN"_s, u"WHAL"_s};
    for (int i = 0; i < lines; ++i)
        rows.rows.append({u"500"_s, u"AUTR"_s, comment, indicators[i % 3], QString::number(i + 1),
                          categories[i * 4 / lines], script.arg(i + 1), u"1234.5"_s, u"99"_s, u"1"_s, u"1"_s,
                          u"1000"_s});
    report::Report report(u"c:\\wirra32\\report\\730.html"_s);
    report.setTable(rows);
    return report;
}

}  // namespace

TEST_F(Preview, ATemplateIsFilledByFieldConditionAndRow)
{
    const std::pair<const char*, const char*> cases[] = {
        {"{{Name}} {{NAME}}", "A &amp; B A &amp; B"},
        {"{{amount:money}} {{text:money}} {{day:date}} {{text:date}}", "1234.50 n/a 11/04/2008 n/a"},
        {"{{#kind=a|b}}in{{/kind=a|b}}{{^kind=a|b}}out{{/kind=a|b}}", "in"},
        {"{{#kind=b|c}}in{{/kind=b|c}}{{^kind=b|c}}out{{/kind=b|c}}", "out"},
        {"{{#none=}}empty{{/none=}}{{#kind!=a}}other{{/kind!=a}}", "empty"},
        {"{{#rows}}[{{name}}]{{/rows}}", "[A &amp; B]"},
        {"{{#rows:kind=b}}[{{name}}]{{/rows:kind=b}}{{#any:kind=b}}some{{/any:kind=b}}", ""},
        {"{{#rows:kind=a,none!=}}[{{name}}]{{/rows:kind=a,none!=}}", ""},
        {"{{#rows:kind=b;none=,kind=a}}[{{name}}]{{/rows:kind=b;none=,kind=a}}{{#any:bs}}some{{/any:bs}}",
         "[A &amp; B]"},
        {"<template id=\"x\">({{name}})</template>{{>x}}{{>x}}", "(A &amp; B)(A &amp; B)"},
        {"{{unknown}}{{Comp}}", "the shop"},
    };
    for (const auto& [tags, expected] : cases) {
        const QByteArray page =
            "<html><head><script type=\"application/json\">{\"parameters\": [{\"name\": \"Comp\", \"value\": "
            "\"the shop\"}], \"groups\": {\"bs\": \"kind=b\"}}</script></head><body>" +
            QByteArray(tags) + "</body></html>";
        const QString text = filled(page, {{u"name"_s, u"A & B"_s},
                                           {u"amount"_s, u"1,234.5"_s},
                                           {u"text"_s, u"n/a"_s},
                                           {u"day"_s, u"2008-04-11"_s},
                                           {u"kind"_s, u"A"_s},
                                           {u"none"_s, u""_s}});
        EXPECT_EQ(text.section(u"<body>"_s, 1).section(u"</body>"_s, 0, 0).toStdString(), expected) << tags;
    }
}

TEST_F(Preview, ParametersAreSetByReportNumberAndName)
{
    const QByteArray page =
        "<html><script type=\"application/json\">{\"parameters\": [{\"name\": \"cOmp\", \"value\": \"1\"}, {\"name\": "
        "\"TITLE\", \"value\": \"2\"}, {\"name\": \"Third\", \"value\": \"3\"}]}</script><body>x</body></html>";
    for (const char* name : {"710.html", "720.html", "730.html"})
        putTemplate(name, page);
    const auto parameters = [&](qint32 number, const QVariant& value) {
        frmPrintPreview::ShowForm(number, value, nullptr);
        const QList<QJsonObject> all = windows();
        return all.isEmpty() ? QJsonObject() : all.first()[u"parameters"].toObject();
    };
    const auto three = [](const char* a, const char* b, const char* c) {
        return QJsonObject{
            {u"cOmp"_s, QLatin1String(a)}, {u"TITLE"_s, QLatin1String(b)}, {u"Third"_s, QLatin1String(c)}};
    };
    EXPECT_EQ(parameters(710, u"v"_s), three("v", "v", "v"));
    EXPECT_EQ(parameters(730, u""_s), three("", "", ""));
    EXPECT_EQ(parameters(720, QStringList({u"a"_s, u"b"_s})), three("a", "b", "3"));
}

TEST_F(Preview, WhatCannotBeShownEndsInSilenceButAnUnknownNumber)
{
    db::Recordset closed;
    frmPrintPreview::ShowForm(710, u""_s, &closed);  // no usable table
    putTemplate("710.html", "no template");
    frmPrintPreview::ShowForm(710, u""_s, nullptr);
    putTemplate("730.html", "<body>{{#rows}}</body>");
    frmPrintPreview::ShowForm(730, u""_s, nullptr);
    gConn->execute(u"UPDATE ReportDefinition SET ReportName='..\\report\\720.html' WHERE ReportID=720"_s);
    frmPrintPreview::ShowForm(720, QStringList(), nullptr);
    EXPECT_EQ(shown(), "");
    frmPrintPreview::ShowForm(740, u""_s, nullptr);
    EXPECT_EQ(shown(), "[none] Report ID 740 does not exist");
    EXPECT_EQ(shownReports(), "");

    gConn->execute(u"UPDATE ReportDefinition SET ReportName='720.html' WHERE ReportID=720"_s);
    frmPrintPreview::ShowForm(720, QStringList(), nullptr);
    EXPECT_EQ(shownReports(), "frmPrintPreview720");
    const QString key = u"SOFTWARE\\wirra32\\frmsplash"_s;  // the path stands there since the first preview
    ASSERT_TRUE(settings::setValue(settings::Hive::LocalMachine, key, u"ReportPath"_s,
                                   {settings::Type::Text, u"c:\\wirra32\\report"_s}));
    frmPrintPreview::ShowForm(720, QStringList(), nullptr);
    EXPECT_EQ(shownReports() + shown(), "");
}

TEST_F(Preview, EachPreviewIsKeptInTheFolderOfReports)
{
    const QString folder = root() + u"/out/deep"_s;
    report::setOutputFolder(folder);
    db::Recordset rows = table({{u"KESTQuoteNo"_s, u"KQ1"_s}, {u"QTNNO"_s, u"500"_s}});
    frmPrintPreview::ShowForm(720, QStringList{u""_s, u"Assessment Result"_s}, &rows);
    frmPrintPreview::ShowForm(720, QStringList{u""_s, u"Assessment Result"_s}, nullptr);
    EXPECT_EQ(filesIn(folder), (QStringList{u"1-720.json"_s, u"1-720.pdf"_s, u"2-720.json"_s, u"2-720.pdf"_s}));
    const QString text = pdfText(folder + u"/1-720.pdf"_s);
    EXPECT_TRUE(text.contains(u"Assessment Result"_s) && text.contains(u"KQ1"_s)) << text.toStdString();
    EXPECT_TRUE(pdfText(folder + u"/2-720.pdf"_s).contains(u"sample"_s));  // the template's own saved rows
    const auto json = [&](int number) {
        return QJsonDocument::fromJson(files::readBytes(folder + u"/%1-720.json"_s.arg(number))).object();
    };
    EXPECT_EQ(json(1), desktop->record().windows[0].toObject());
    EXPECT_TRUE(json(2)[u"table"].isNull());

    windows();
    files::makeFolder(folder + u"/3-720.pdf"_s);  // in the way
    ::testing::internal::CaptureStderr();
    frmPrintPreview::ShowForm(720, QStringList(), nullptr);
    EXPECT_NE(::testing::internal::GetCapturedStderr().find("3-720 can't be written"), std::string::npos);
    EXPECT_EQ(shownReports(), "frmPrintPreview720");
}

TEST_F(Preview, EveryLineStandsOnceOnAPageAndPagesAreCounted)
{
    const QString pdf = root() + u"/out.pdf"_s;
    for (const int lines : {1, 30, 300}) {
        report::writePdf(comparisonOf(lines, u"Café & line <%1> end"_s), pdf);
        QStringList pages = pdfText(pdf).split(u'\f');
        pages.removeLast();  // behind the last form feed
        const QString text = pages.join(u'\n');
        for (int i = 1; i <= lines; ++i)
            EXPECT_EQ(text.count(u"Café & line <%1> end"_s.arg(i)), 1) << i << " of " << lines;
        for (qsizetype i = 0; i < pages.size(); ++i) {
            EXPECT_TRUE(pages[i].contains(u"Page %1 of %2"_s.arg(i + 1).arg(pages.size()))) << i;
            EXPECT_EQ(pages[i].contains(u" end"_s), pages[i].contains(u"Description"_s)) << "no head on page " << i;
        }
        EXPECT_EQ(pages.size() == 1, lines == 1);
    }
    const QString none = root() + u"/none.pdf"_s;
    QPdfWriter writer(none);
    report::paint(comparisonOf(1, u"%1"_s), writer, 2, 3);  // pages that the report has not
    EXPECT_EQ(QFileInfo(none).size(), 0);
}

TEST_F(Preview, ARowOfSeveralLinesIsNeverDividedAndALongTextIsWhole)
{
    const QString pdf = root() + u"/out.pdf"_s;
    const QString word = QString(u"Kühlerfrontblende"_s).repeated(12);
    report::writePdf(comparisonOf(120, u"first%1 "_s + word + u" last%1"_s), pdf);
    for (const QString& page : pdfText(pdf).split(u'\f')) {
        static const QRegularExpression first(u"first(\\d+)"_s);
        for (auto match = first.globalMatch(page); match.hasNext();)
            EXPECT_TRUE(page.contains(u"last"_s + match.next().captured(1)));
    }
    QString comment;  // longer than a page
    for (int i = 0; i < 900; ++i)
        comment += u"word%1 "_s.arg(i);
    for (const QString& text : {comment, QString(comment).replace(u' ', u'\n')}) {
        report::writePdf(comparisonOf(3, u"line %1"_s, text), pdf);
        const QString read = pdfText(pdf);
        for (int i = 0; i < 900; ++i)
            EXPECT_EQ(read.count(QRegularExpression(u"\\bword%1\\b"_s.arg(i))), 1) << i;
    }
}

TEST_F(Preview, TheViewerFillsTheWindowAboveItsButton)
{
    db::Recordset rows = table({{u"comment"_s, QString(u"word\n"_s).repeated(300)}});
    const Hands hands({{u"frmPrintPreview"_s, [](QDialog& window) {
                            const auto& viewer = control<QWidget>(window, "crvPreview");
                            const auto& exit = control<QPushButton>(window, "cmdExit");
                            for (const QSize size : {QSize(700, 500), QSize(900, 800)}) {
                                window.resize(size);
                                QCoreApplication::processEvents();
                                EXPECT_EQ(
                                    viewer.geometry(),
                                    QRect(0, 0, size.width(), size.height() - exit.height() - desktop::pixels(160)));
                                EXPECT_EQ(exit.y() - viewer.height(), desktop::pixels(80));
                                EXPECT_EQ(size.width() - exit.geometry().right() - 1, desktop::pixels(80));
                            }
                            const auto& page = control<QLabel>(window, "lblPage");
                            EXPECT_EQ(page.text(), u"Page 1 of 5"_s);
                            QKeyEvent end(QEvent::KeyPress, Qt::Key_End, Qt::NoModifier);
                            QCoreApplication::sendEvent(&control<QWidget>(window, "crvPages"), &end);
                            EXPECT_EQ(page.text(), u"Page 5 of 5"_s);
                            control<QToolButton>(window, "cmdPrevious").click();
                            EXPECT_EQ(page.text(), u"Page 4 of 5"_s);
                        }}});
    frmPrintPreview::ShowForm(730, u""_s, &rows);
}

TEST_F(Preview, ThePrintButtonAsksForAPrinterAndPrintsWhatWasChosen)
{
    const QString output = root() + u"/printed.pdf"_s;
    db::Recordset rows = table({{u"comment"_s, QString(u"word\n"_s).repeated(300)}});
    for (const bool onlySecond : {false, true}) {
        const auto choose = [&](QDialog& window) {
            QPrinter& printer = *static_cast<QPrintDialog&>(window).printer();
            printer.setOutputFileName(output);
            printer.setPrintRange(onlySecond ? QPrinter::PageRange : QPrinter::AllPages);
            printer.setFromTo(onlySecond ? 2 : 0, onlySecond ? 2 : 0);
            window.hide();
            window.setResult(QDialog::Accepted);
        };
        const auto print = [](QDialog& window) { control<QToolButton>(window, "cmdPrint").click(); };
        const Hands hands({{u"frmPrintPreview"_s, print}, {u"PrintDialog"_s, choose}});
        frmPrintPreview::ShowForm(730, u""_s, &rows);
        const QString text = pdfText(output);
        EXPECT_EQ(text.contains(u"Page 1 of 5"_s), !onlySecond);
        EXPECT_TRUE(text.contains(u"Page 2 of 5"_s));
        EXPECT_EQ(text.count(u'\f'), onlySecond ? 1 : 5);
    }
}

}  // namespace kest::test
