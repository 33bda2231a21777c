// Sends made-up quotes and lets them come back as authorised quotes in which no line has changed, or each to the values
// that it had.
#include "outbound/Sending.h"
#include "support/Chance.h"

namespace {

/// Returns the authorised quote with the body of a sent document, in which each line has that indicator.
Message returned(const QString& document, const char* indicator)
{
    xml::Document sent;
    EXPECT_TRUE(sent.loadXML(u"<request>"_s + document + u"</request>"_s));
    const xml::Node body = sent.selectSingleNode(u"/request/quoteBody"_s);
    Message message = authorisedQuote("500");
    for (const char* total : {"labourTotal", "paintTotal", "partTotal", "partMarkUpTotal", "gst", "quoteTotal"})
        message.set(std::string("quoteBody/") + total, body.textOf(QString::fromLatin1(total)));
    for (const char* kind : {"labour", "part", "paint", "sublet"})
        for (const xml::Node& line : body.selectNodes(u"%1s/*"_s.arg(QLatin1StringView(kind)))) {
            Fields fields;
            for (const xml::Node& value : line.childNodes())
                fields.emplace_back(value.nodeName(), value.text());
            message.line(kind, line.textOf(u"quoteLineNumber"_s).toInt(), indicator, fields);
        }
    return message;
}

QStringList linesHeld()
{
    return QString::fromStdString(holdings()).split(u'\n').filter(QRegularExpression(u"^QUOTE2 "_s));
}

/// Returns what an insurer's change to the same values leaves: number, text without the blend of paint, and amount in
/// cents. That of a part is its price, as its mark-up comes back as a rounded percentage.
QStringList linesSeen()
{
    QStringList seen;
    for (const QSqlRecord& line : plainRows(
             u"SELECT SEQ_NO, script, CASE category WHEN 'R&R' THEN rr_rate2*rrhour WHEN 'RA' THEN rr_rate2*rahour "
             "WHEN 'PAINT' THEN rr_rate2*pthour WHEN 'OPG' THEN opg_rate*pthour WHEN 'PRT' THEN qty*unitcost "
             "ELSE unitcost END FROM QUOTE2 ORDER BY SEQ_NO"_s))
        seen += u"%1 %2 %3"_s.arg(line.value(0).toString(), line.value(1).toString().remove(u" blend"_s))
                    .arg(qRound64(line.value(2).toDouble() * 100));
    return seen;
}

}  // namespace

using Return = Sending;

TEST_F(Return, LinesThatTheInsurerKeepsOrChangesToTheSameStayAsTheyAre)
{
    const Grammar lines("inbound/made-up-lines.txt");
    EXPECT_EQ(vendor("Straight Track").id(), 1);
    const Snapshot empty;
    for (quint32 seed = 0; seed < 12; ++seed)
        for (const bool isChanged : {false, true}) {
            SCOPED_TRACE(seed);
            empty.restore();
            Chance chance(seed);
            sendable().request("QR1").note("Active Quote Request");
            for (int number = 2, last = chance.number(2, 12); number <= last; ++number)
                addRow("QUOTE2",
                       {{"QTNNO", "500"}, {"Subquote", 0}, {"SEQ_NO", chance.once(4) ? QVariant() : QVariant(number)}},
                       lines.text(chance, u"line"_s));
            const double total = send("500");
            ASSERT_GT(total, 0) << shown();
            const QStringList seen = linesSeen();
            QStringList kept = linesHeld();
            const Message message = returned(outgoing(u"500.0_1.xml"_s), isChanged ? "C" : "N");
            for (int time = 1; time <= 2; ++time) {
                EXPECT_TRUE(load(message)) << shown();
                EXPECT_EQ(linesSeen(), seen);
                if (isChanged && time == 1)
                    kept = linesHeld();  // the same once more leaves them
                EXPECT_EQ(linesHeld(), kept);
            }
            EXPECT_EQ(quote("500").stage(), 4);
            shown();
        }
}
