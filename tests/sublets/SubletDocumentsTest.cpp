// Tests sublet documents: which belong to a quote, how they are listed, and a file that is not a PDF.
#include "platform/script/Gestures.h"
#include "sublets/PdfViewer.h"
#include "sublets/SubletDocuments.h"
#include "sublets/frmSubletAuth.h"
#include "support/Hands.h"
#include "support/Shop.h"

#include <QPdfDocument>

namespace gestures = desktop::gestures;

struct Sublet : Shop {
    static void document(const char* name, const QByteArray& content = "%PDF-1.4")
    {
        files::writeBytes(u"c:\\wirdoc\\PDF\\"_s + QString::fromLatin1(name), content);
    }
    static void documentOfTwoPages(const QString& name)
    {
        QPdfWriter writer(files::systemPath(u"c:\\wirdoc\\PDF\\"_s + name));
        const QPainter painter(&writer);
        writer.newPage();
    }
    QJsonArray windows() const { return desktop->record().windows; }
};

TEST_F(Sublet, ADocumentBelongsToTheQuoteWithWhoseNumberItsNameBegins)
{
    for (const char* name : {"500.1_7.pdf", "500.1_12.PDF", "500.1_7.old.pdf", "500.10_4.pdf", "500.0_3.pdf",
                             "5001.1_3.pdf", "500.1_0.pdf", "500.1_x.pdf", "500.1_-2.pdf", "500.1.pdf"})
        document(name);
    EXPECT_EQ(subletDocumentNumbers({u"500"_s, u"1"_s}), (QStringList{u"4"_s, u"12"_s, u"7"_s}));
    document("Q7.0_2.pdf");
    EXPECT_EQ(subletDocumentNumbers({u"q7"_s, u"0"_s}), QStringList(u"2"_s));
    EXPECT_EQ(subletDocumentNumbers({u"500"_s, u"10"_s}), QStringList(u"4"_s));
    gsUnreadPath = u"c:\\nowhere\\AUnread\\"_s;
    EXPECT_EQ(subletDocumentNumbers({u"500"_s, u"1"_s}), QStringList());
}

TEST_F(Sublet, TheListShowsTheLineOfEachDocumentAndOpensTheChosenOne)
{
    auto row = quote("500");
    row.line(1, "MIS", "Wheel alignment").set("VENDOR", test::vendor("Straight Track").id());
    row.line(2, "MIS", "Windscreen").set("VENDOR", 0);
    row.line(3, "MIS", "Trim").set("VENDOR", nullptr);
    for (const char* name : {"500.0_1.pdf", "500.0_3.pdf", "500.0_9.pdf"})
        document(name, "this is no PDF");
    documentOfTwoPages(u"500.0_2.pdf"_s);
    desktop.emplace(R"({"windows": {"frmSubletAuth": [[ {"click": "Command1"},
        {"select": "ListView1", "item": "Windscreen"}, {"click": "Command1"}, {"click": "Command2"} ]],
        "frmViewPDF": [[ {"key": "AcroPDF1", "keys": ["Ctrl+=", "End", "Ctrl+1", "Home", "PgDown", "PgDown"]},
                         {"read": true} ]]}})");
    frmSubletAuth::ShowForm(u"500"_s, u"1"_s);
    EXPECT_EQ(windows().size(), 0) << "no documents, no window";
    frmSubletAuth::ShowForm(u"500"_s, u"0"_s);
    EXPECT_EQ(shown(),
              "[critical] The document c:\\wirdoc\\PDF\\500.0_1.pdf can't be shown: the file is not a PDF document.");
    ASSERT_EQ(windows().size(), 2);
    EXPECT_EQ(windows()[0][u"rows"_s],
              (QJsonArray{QJsonArray{u"Wheel alignment"_s, u"Straight Track"_s}, QJsonArray{u"Windscreen"_s, QString()},
                          QJsonArray{u"Trim"_s, QString()}}));
    EXPECT_EQ(windows()[1][u"file"_s], u"c:\\wirdoc\\PDF\\500.0_2.pdf"_s);
    EXPECT_EQ(desktop->read(u"lblPage"_s), u"Page 2 of 2"_s);

    showPdf(u"c:\\wirdoc\\PDF\\gone.pdf"_s);
    EXPECT_EQ(shown(), "[critical] The document c:\\wirdoc\\PDF\\gone.pdf can't be shown: the file does not exist.");
}

TEST_F(Sublet, ADocumentThatContainsItselfIsRefused)
{
    const QByteArray file = files::readBytes(checkoutFile(u"tests/corpus/sublets/pages-circle.pdf"_s));
    document("500.0_1.pdf", file.sliced(file.indexOf('\n') + 1));
    showPdf(u"c:\\wirdoc\\PDF\\500.0_1.pdf"_s);
    EXPECT_EQ(shown(),
              "[critical] The document c:\\wirdoc\\PDF\\500.0_1.pdf can't be shown: it is damaged, so that "
              "reading it does not end.");
    EXPECT_EQ(windows().size(), 0);
}

TEST_F(Sublet, ASavedCopyIsNamedAfterItsLine)
{
    documentOfTwoPages(u"500.2_7.pdf"_s);
    const QString folder = root() + uR"(/my\documents/)"_s;
    ASSERT_TRUE(QDir().mkpath(folder) && QFile(folder + u"COPY.pdf"_s).open(QFile::WriteOnly));
    const QString copy = folder + u"copy.pdf"_s;
    QString offered;
    const test::Hands hands({{u"frmViewPDF"_s, [](QDialog& window) { gestures::press(window, Qt::CTRL | Qt::Key_S); }},
                             {u"SaveDialog"_s, [&](QDialog& dialog) {
                                  auto& files = static_cast<QFileDialog&>(dialog);
                                  offered = files.selectedFiles().first();
                                  dialog.hide();  // while it is shown, the field that has the focus keeps its text
                                  files.selectFile(copy);
                                  dialog.setResult(QDialog::Accepted);
                              }}});
    showPdf(u"c:\\wirdoc\\PDF\\500.2_7.pdf"_s);
    EXPECT_TRUE(offered.endsWith(u"/Sublet authority 500-2 line 7.pdf"_s)) << offered;
    EXPECT_TRUE(QFile::exists(folder + u"COPY.pdf"_s)) << "another file";
    QFile saved(copy);
    EXPECT_TRUE(saved.open(QFile::ReadOnly));
    EXPECT_EQ(saved.readAll(), files::readBytes(u"c:\\wirdoc\\PDF\\500.2_7.pdf"_s));
}

TEST_F(Sublet, APrintTakesThePagesThatWereChosen)
{
    documentOfTwoPages(u"500.0_1.pdf"_s);
    const QString output = root() + u"/printed.pdf"_s;
    for (const int only : {0, 2}) {
        const test::Hands hands(test::printing(u"frmViewPDF"_s, output, only ? QString::number(only) : QString()));
        showPdf(u"c:\\wirdoc\\PDF\\500.0_1.pdf"_s);
        QPdfDocument printed;
        ASSERT_EQ(printed.load(output), QPdfDocument::Error::None);
        EXPECT_EQ(printed.pageCount(), only ? 1 : 2);
    }
}
