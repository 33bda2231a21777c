// Tests the preview: which template it opens, which values it fills in, its window, and the pages.
#include "platform/desktop/Person.h"
#include "platform/print/Pages.h"
#include "platform/script/Gestures.h"
#include "reports/Previews.h"
#include "reports/frmPrintPreview.h"
#include "support/Hands.h"

struct Preview : Previews {
    static void show(int number, db::Recordset* table = nullptr)
    {
        const QVariant parameters =
            number == 720 ? QVariant(QStringList{u""_s, u"Assessment Result"_s}) : QVariant(u""_s);
        frmPrintPreview::ShowForm(number, parameters, table);
    }
    static db::Recordset table(const QString& cells)
    {
        db::Recordset row;
        for (const auto& [field, value] : pairsIn(cells))
            row.declare(field, db::Kind::Text);
        row.openDeclared();
        row.addNew();
        for (const auto& [field, value] : pairsIn(cells))
            row.set(field, value);
        return row;
    }
};

static report::Report comparisonOf(int lines, const QString& script, const QString& comment = u"A comment"_s)
{
    report::Table table{{u"quote_ref"_s, u"quote_type"_s, u"comment"_s, u"action"_s, u"category"_s, u"script"_s}, {}};
    const QString categories[] = {u"RR"_s, u""_s, u"PAIN"_s, u"WHAL"_s};
    for (int i = 0; i < lines; ++i)
        table.rows.append(
            {u"500"_s, u"AUTR"_s, comment, u"ICD"_s.sliced(i % 3, 1), categories[i * 4 / lines], script.arg(i + 1)});
    report::Report report(u"c:\\wirra32\\report\\730.html"_s);
    report.setTable(table);
    return report;
}

TEST_F(Preview, ATemplateIsFilledAsTheTableSays)
{
    db::Recordset row = table(u"name=A & B amount=1,234.5 text=n/a day=2008-04-11 kind=A none="_s);
    for (const auto& [tags, text] : casesIn<2>("reports/template-tags.txt")) {
        putTemplate("test.html", dataFile("reports/tags.html").replace("@tags@", tags.toUtf8()));
        report::Report report(u"c:\\wirra32\\report\\test.html"_s);
        report.setTable(report::tableOf(row));
        EXPECT_EQ(report.body().section(u"<body>"_s, 1).section(u"</body>"_s, 0, 0), text) << tags;
    }
}

TEST_F(Preview, WhatCannotBeShownEndsInSilenceButAnUnknownNumber)
{
    db::Recordset closed;
    show(710, &closed);  // a table that can't be used
    putTemplate("710.html", "no template");
    putTemplate("730.html", "<body>{{#rows}}</body>");
    gConn->execute(u"UPDATE ReportDefinition SET ReportName='..\\report\\720.html' WHERE ReportID=720"_s);
    for (int number : {710, 720, 730})
        show(number);
    EXPECT_EQ(shown(), "");
    show(740);
    EXPECT_EQ(shown(), "[none] Report ID 740 does not exist");
    EXPECT_EQ(shownReports(), "");

    gConn->execute(u"UPDATE ReportDefinition SET ReportName='720.html' WHERE ReportID=720"_s);
    show(720);
    EXPECT_EQ(shownReports(), "frmPrintPreview720");
    setSetting(u"ReportPath"_s, u"c:\\wirra32\\report"_s);  // without the last backslash
    show(720);
    EXPECT_EQ(shownReports() + shown(), "");
}

TEST_F(Preview, EachPreviewIsKeptInTheFolderOfReports)
{
    const QString folder = root() + u"/out/deep"_s;
    report::setOutputFolder(folder);
    db::Recordset rows = table(u"KESTQuoteNo=KQ1 QTNNO=500"_s);
    show(720, &rows);
    show(720);
    EXPECT_EQ(filesIn(folder).join(u' '), u"1-720.json 1-720.pdf 2-720.json 2-720.pdf"_s);
    const QString text = pdfText(folder + u"/1-720.pdf"_s);
    EXPECT_TRUE(text.contains(u"Assessment Result"_s) && text.contains(u"KQ1"_s)) << text;
    EXPECT_TRUE(pdfText(folder + u"/2-720.pdf"_s).contains(u"sample"_s)) << "the template's own saved rows";
    EXPECT_EQ(QJsonDocument::fromJson(files::readBytes(folder + u"/1-720.json"_s)).object(), windows()[0]);
    EXPECT_TRUE(QJsonDocument::fromJson(files::readBytes(folder + u"/2-720.json"_s))[u"table"].isNull());

    files::makeFolder(folder + u"/3-720.pdf"_s);  // a folder with the name of the file
    ::testing::internal::CaptureStderr();
    show(720);
    EXPECT_NE(::testing::internal::GetCapturedStderr().find("3-720 can't be written"), std::string::npos);
    EXPECT_EQ(shownReports(), "frmPrintPreview720");
}

TEST_F(Preview, EveryLineStandsOnOnePage)
{
    const QString pdf = root() + u"/out.pdf"_s;
    for (const int lines : {1, 30, 300}) {
        report::writePdf(comparisonOf(lines, u"Café & line <%1> end"_s), pdf);
        const QString text = pdfText(pdf);
        QStringList pages = text.split(u'\f');
        pages.removeLast();  // the empty text after the last form feed
        for (int i = 1; i <= lines; ++i)
            EXPECT_EQ(text.count(u"Café & line <%1> end"_s.arg(i)), 1) << i << " of " << lines;
        for (qsizetype i = 0; i < pages.size(); ++i) {
            EXPECT_TRUE(pages[i].contains(u"Page %1 of %2"_s.arg(i + 1).arg(pages.size()))) << i;
            EXPECT_EQ(pages[i].contains(u" end"_s), pages[i].contains(u"Description"_s)) << "no head on page " << i;
        }
        EXPECT_EQ(pages.size() == 1, lines == 1);
    }
}

TEST_F(Preview, ATextIsWholeHoweverLongItIs)
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

TEST_F(Preview, ALayoutWithoutRoomIsAFailureThatIsTold)
{
    const QString pdf = root() + u"/out.pdf"_s;
    const auto print = [&](const QByteArray& body) {
        putTemplate("test.html", "<body>" + body + "</body>");
        return failureOf([&] { report::writePdf(report::Report(u"c:\\wirra32\\report\\test.html"_s), pdf); });
    };
    const QByteArray tall = QByteArray("<p>text</p>").repeated(100);
    const QByteArray row = "<tr><td>x</td></tr>";
    for (const QByteArray& body : {"<header>" + tall + "</header><p>x</p>", "<p>x</p><footer>" + tall + "</footer>",
                                   "<table><thead><tr><th>" + tall + "</th></tr></thead>" + row.repeated(200)}) {
        EXPECT_EQ(print(body), Overflow) << body.left(20).toStdString();
        EXPECT_FALSE(files::exists(pdf));
    }
    EXPECT_EQ(print(("<table>" + row + "</table>").repeated(30)), 0) << "only tables within tables have a limit";
    EXPECT_EQ(print("<table><TD class=a ColSpan = '100'>x</table>"), TypeMismatch);
    EXPECT_EQ(print("<table><tr><td colspan=\"99\" rowspan=1>colspan=100</td></tr></table>"), 0);
    QPdfWriter label(pdf);
    label.setPageSize(QPageSize(QSizeF(62, 29), QPageSize::Millimeter));
    label.setPageMargins(QMarginsF(3, 3, 3, 3), QPageLayout::Millimeter);
    EXPECT_EQ(failureOf([&] { report::paint(comparisonOf(3, u"line %1"_s), label); }), Overflow);

    putTemplate("720.html", "<title>T</title><body><header>" + tall + "</header><p>x</p></body>");
    show(720);
    EXPECT_NE(shown().find("The report \"T\" does not fit on this paper"), std::string::npos);
}

TEST_F(Preview, TheViewerFillsTheWindowAboveItsButton)
{
    db::Recordset rows = table(u"comment="_s + u"word\n"_s.repeated(300));
    const auto look = [](QDialog& window) {
        const auto pageAfter = [&](Qt::Key key) {
            desktop::gestures::press(window, key);
            return control<QLabel>(window, "lblPage").text().section(u' ', 1, 1).toInt();
        };
        window.resize(900, 800);
        QCoreApplication::processEvents();
        const int below = control<QPushButton>(window, "cmdExit").height() + desktop::pixels(160);
        EXPECT_EQ(control<QWidget>(window, "crvPreview").geometry(), QRect(0, 0, 900, 800 - below));
        EXPECT_EQ(pageAfter(Qt::Key_End), 5);
        EXPECT_FALSE(control<QToolButton>(window, "cmdNext").isEnabled()) << "there is no such page";
        control<QToolButton>(window, "cmdPrevious").click();
        EXPECT_EQ(control<QLabel>(window, "lblPage").text(), u"Page 4 of 5"_s);
        control<QPushButton>(window, "cmdExit").setFocus();
        EXPECT_EQ(pageAfter(Qt::Key_Home), 1) << "wherever the focus is";
        const QScrollBar& scrolled = *control<QAbstractScrollArea>(window, "crvPages").verticalScrollBar();
        const int before = scrolled.value();
        EXPECT_EQ(pageAfter(Qt::Key_PageDown), 1);
        EXPECT_GT(scrolled.value(), before);
        int page = 1;
        while (page == 1)
            page = pageAfter(Qt::Key_PageDown);
        EXPECT_EQ(page, 2);
        EXPECT_EQ(pageAfter(Qt::Key_PageUp), 1);
        EXPECT_GT(scrolled.value(), before) << "back at its end";
    };
    const Hands hands({{u"frmPrintPreview"_s, look}});
    show(730, &rows);
}

TEST_F(Preview, ASaveGoesWhereThePersonSays)
{
    db::Recordset rows = table(u"quote_ref=500/1 quote_type=AUTR comment=x"_s);
    const QString folder = root() + u"/chosen"_s;
    QDir().mkpath(folder + u"/folder.pdf"_s);
    setSetting(u"ShopName"_s, u"Café (Smash) Repairs"_s);
    QStringList offered;
    const auto saveAs = [&](const QString& path) {
        const auto click = [](QDialog& window) { control<QToolButton>(window, "cmdSave").click(); };
        const auto choose = [&](QDialog& dialog) {
            offered << static_cast<QFileDialog&>(dialog).selectedFiles().first();
            dialog.hide();  // while it is shown, the field that has the focus keeps its text
            static_cast<QFileDialog&>(dialog).selectFile(path);
            dialog.setResult(QDialog::Accepted);
        };
        const Hands hands({{u"frmPrintPreview"_s, click}, {u"SaveDialog"_s, choose}});
        show(730, &rows);
    };
    desktop::usePerson();
    saveAs(folder + u"/out.pdf"_s);
    desktop.emplace();
    saveAs(folder + u"/folder.pdf"_s);
    EXPECT_TRUE(pdfText(folder + u"/out.pdf"_s).contains(u"Authorised quote 500/1"_s));
    EXPECT_EQ(pdfValue(folder + u"/out.pdf"_s, QPdfDocument::MetaDataField::Author), u"Café (Smash) Repairs"_s);
    EXPECT_TRUE(offered[0].endsWith(u"/Authorised quote 500-1.pdf"_s)) << offered[0].toStdString();
    EXPECT_EQ(offered[1], folder + u"/Authorised quote 500-1.pdf"_s);
    EXPECT_EQ(desktop->boxTexts().size(), 1);
    EXPECT_TRUE(desktop->boxTexts().value(0).startsWith(u"The report can't be saved as %1/folder.pdf: "_s.arg(folder)));
}

TEST_F(Preview, ThePrintButtonPrintsWhatWasChosen)
{
    const QString output = root() + u"/printed.pdf"_s;
    db::Recordset rows = table(u"comment="_s + u"word\n"_s.repeated(300));
    for (const auto& [pages, copies, order, printed] : casesIn<4>("reports/printed-pages.txt")) {
        const Hands hands(printing(u"frmPrintPreview"_s, output, pages, copies.toInt(), order == "collated"_L1));
        show(730, &rows);
        static const QRegularExpression number(u"Page (\\d) of 5"_s);
        QString found;
        for (auto matches = number.globalMatch(pdfText(output)); matches.hasNext();)
            found += matches.next().captured(1);
        EXPECT_EQ(found, printed);
    }
}
