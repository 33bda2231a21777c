// Compares complete quote documents with files. The quote lines come from a file of tests/data/outbound, too.
#include "Sending.h"

/// Returns the document with each element on a line of its own, and without the version of the software.
static std::string byElement(const QString& document)
{
    static const QRegularExpression version(u"(SoftwareVersion>)[^<]*"_s);
    static const QRegularExpression between(u">\\s*<"_s);
    return QString(document)
        .remove(u'\r')
        .replace(version, u"\\1"_s)
        .replace(between, u">\n<"_s)
        .trimmed()
        .toStdString();
}

struct GoldenDocument : Sending {
    /// Adds the lines to the quote, sends it, and compares the total and the document.
    static void sends(const QuoteRow& quote, const std::string& name, double total, const QString& file)
    {
        for (const auto& [category, script, repairer, columns] : casesIn<4>("outbound/" + name + ".txt"))
            addRow("QUOTE2",
                   {{"QTNNO", quote.value("QTNNO")},
                    {"Subquote", quote.value("Subquote")},
                    {"category", category},
                    {"script", script},
                    {"PartNo", ""},
                    {"VENDOR", repairer.isEmpty() ? QVariant() : vendor(repairer).id()}},
                   columns);
        EXPECT_DOUBLE_EQ(send(quote.text("QTNNO")), total);
        const QString document =
            u"<request xmlns=\"http://quote3.webservice.orla.example\">"_s + outgoing(file) + u"</request>"_s;
        EXPECT_EQ(byElement(document), byElement(QString::fromUtf8(dataFile("outbound/" + name + ".xml"))));
    }
};

TEST_F(GoldenDocument, AMainQuoteFromARequest)
{
    customer("Holloway").set("PHONE_P", "(02) 5550 1234").set("PHONE_B", " +61 2 5550 98765");
    car("ABC123").set("XMission", "a").set("CYLINDERS", 4).set("ENG_SIZE", "1.8L").set("VIN", " 6T1BD0001 ");
    QuoteRow row = quote("1201").request("QR88123", "2").note("Active Quote Request");
    fill(row, "kms=84210 ExtraInfo=0 CAR_IN=2024-02-26 targetdate=2024-03-04");
    row.remarks("Repairs < 1 week & \"guaranteed\",\r\ncaf\u00e9 next door", "P_REMARKS");
    for (const QString& name : {u"1201_0001.jpg"_s, u"1201_0012.jpg"_s, u"1201_1001.jpg"_s, u"120_0001.jpg"_s})
        files::write(gsImagesPath + name, u"a photograph"_s);
    sends(row, "main-from-request", 747.22, u"1201.0_1.xml"_s);
}

TEST_F(GoldenDocument, AMainQuoteWithTheExtraInformation)
{
    desktop.emplace(dataFile("outbound/extra-information.json"));
    car("ABC123").set("PAINT_GP", "m2");
    fill(customer("Holloway"), "FIRSTNAME= SALUTATION= NAME=Holloway Haulage");
    sends(quote("777").claim(" C-5512 ").set("ExtraInfo", true), "main-with-claim", 325.23, u"777.0_1.xml"_s);
    EXPECT_TRUE(car("ABC123").shows("Year=11/1998 COLOUR=Green CYLINDERS=6"));
    EXPECT_TRUE(quote("777").shows("kms=120500"));
}

TEST_F(GoldenDocument, ASupplementaryQuoteThatWasAuthorised)
{
    fill(customer("Holloway"), "SALUTATION=- FIRSTNAME=-");
    quote("1201").quoteNumber("KQ55");
    QuoteRow row = quote("1201", 1).authorised(" AU900 ").request("QR88123").set("CAR_IN", QDate(2024, 3, 4));
    sends(row, "supplementary-authorised", 413.49, u"1201.1_1.xml"_s);
    // the report item and the second trim, a sublet, get numbers but are not sent
    std::string numbers;
    for (const char* script : {"Mirror", "Sill", "Seen on the hoist", "Seat trim", "Without charge"})
        numbers += Row("QUOTE2", u"script='%1'"_s.arg(QLatin1StringView(script))).text("SEQ_NO") + ' ';
    EXPECT_EQ(numbers, "7 8 1 3 4 ");
}

TEST_F(GoldenDocument, AMainQuoteOfFortyLinesInEverySet)
{
    sends(quote("A-40").request("QR40", "1").note("Active Quote Request"), "forty-lines", 3843.5, u"A-40.0_1.xml"_s);
}
