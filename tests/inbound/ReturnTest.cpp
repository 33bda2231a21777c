// Sends made-up quotes and lets them come back as authorised quotes in which no line has changed, or each to the values
// that it had.
#include "outbound/Sending.h"
#include "support/Chance.h"

namespace {

/// Adds a line of any kind with all the values that a document can carry.
void addLine(db::Recordset& lines, int number, Chance& chance)
{
    const QString category = chance.one({u"PRT"_s, u"R&R"_s, u"RA"_s, u"PAINT"_s, u"OPG"_s, u"MIS"_s});
    lines.addNew();
    lines.set(u"QTNNO"_s, u"500"_s);
    lines.set(u"Subquote"_s, 0);
    if (!chance.once(4))
        lines.set(u"SEQ_NO"_s, number);
    lines.set(u"category"_s, category);
    lines.set(u"script"_s,
              chance.one({u"L/H guard & liner"_s, u"caf\u00e9 \u20ac <5>"_s, u"Bonnet 'x' blend"_s, u""_s}));
    lines.set(u"PartNo"_s, category == u"R&R"_s && chance.once(3) ? u"M"_s : chance.one({u""_s, u"53876-C1200"_s}));
    lines.set(u"MARK"_s, chance.one({u""_s, u" "_s, u"U"_s, u"X"_s}));
    for (const auto& column : {u"rr_rate2"_s, u"opg_rate"_s, u"qty"_s})
        lines.set(column, chance.number(1, 900) / 10.0);
    for (const auto& column : {u"rrhour"_s, u"rahour"_s, u"pthour"_s, u"unitcost"_s})
        lines.set(column, chance.number(0, 90'000) / 1000.0);  // the send rounds them
    lines.set(u"blend"_s, chance.once(4));
    lines.set(u"itemno"_s, chance.one({u""_s, u"140"_s}));
    lines.set(u"VENDOR"_s, chance.once(3) ? vendor("Straight Track").id() : 0);
    lines.update();
}

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

/// Returns all columns of all lines.
QStringList linesHeld()
{
    return QString::fromStdString(holdings()).split(u'\n').filter(QRegularExpression(u"^QUOTE2 "_s));
}

/// Returns what an insurer's change to the same values leaves: number, text without the blend of paint, and amount in
/// cents. That of a part is its price, as its mark-up comes back as a rounded percentage.
QStringList linesSeen()
{
    static const QMap<QString, std::pair<QString, QString>> factors{
        {u"R&R"_s, {u"rr_rate2"_s, u"rrhour"_s}},   {u"RA"_s, {u"rr_rate2"_s, u"rahour"_s}},
        {u"PAINT"_s, {u"rr_rate2"_s, u"pthour"_s}}, {u"OPG"_s, {u"opg_rate"_s, u"pthour"_s}},
        {u"PRT"_s, {u"qty"_s, u"unitcost"_s}},      {u"MIS"_s, {{}, u"unitcost"_s}}};
    QStringList seen;
    for (const QSqlRecord& line : plainRows(u"SELECT * FROM QUOTE2 ORDER BY SEQ_NO"_s)) {
        const auto held = [&](const QString& column) { return plainText(line.value(column)); };
        const auto& [factor, hours] = factors[held(u"category"_s)];
        const double amount = (factor.isEmpty() ? 1 : toDouble(line.value(factor))) * toDouble(line.value(hours));
        seen += u"%1 %2 %3"_s.arg(held(u"SEQ_NO"_s), held(u"script"_s).remove(u" blend"_s)).arg(qRound64(amount * 100));
    }
    return seen;
}

}  // namespace

using Return = Sending;

TEST_F(Return, LinesThatTheInsurerKeepsOrChangesToTheSameStayAsTheyAre)
{
    const Snapshot empty;
    for (quint32 seed = 0; seed < 12; ++seed)
        for (const bool isChanged : {false, true}) {
            SCOPED_TRACE(seed);
            empty.restore();
            Chance chance(seed);
            sendable().request("QR1").note("Active Quote Request");
            db::Recordset lines = opened(u"SELECT * FROM QUOTE2 WHERE 1=0"_s);
            for (int number = 2, last = chance.number(2, 12); number <= last; ++number)
                addLine(lines, number, chance);
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
