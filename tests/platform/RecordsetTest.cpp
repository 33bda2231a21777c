// Tests the recordset: what it reads, writes, refuses and finds on each engine.
#include "platform/Databases.h"

using db::Kind;
using db::Recordset;

struct RecordsetOn : Databases {
    RecordsetOn() : lines(query(u"SELECT * FROM LINE ORDER BY id"_s)) {}

    /// Begins a row such as "CODE=A SEQ=1".
    void add(const QString& columns)
    {
        lines.addNew();
        fill(lines, columns);
    }

    void write(const QString& column, const QVariant& value) { EXPECT_EQ(written(lines, column, value), 0) << column; }

    /// Returns the position of the first row that meets the criterion, or has this value in a column.
    template <class... Wanted>
    int found(const Wanted&... wanted)
    {
        lines.moveFirst();
        lines.find(wanted...);
        EXPECT_EQ(lines.eof(), lines.absolutePosition() < 0);
        return lines.absolutePosition();
    }

    /// Does a step of recordset-steps.txt and returns what it gives.
    QString done(const QString& step)
    {
        static const std::map<QString, void (Recordset::*)()> plain{
            {u"first"_s, &Recordset::moveFirst}, {u"next"_s, &Recordset::moveNext},
            {u"last"_s, &Recordset::moveLast},   {u"remove"_s, &Recordset::remove},
            {u"update"_s, &Recordset::update},   {u"cancel"_s, &Recordset::cancelUpdate},
            {u"requery"_s, &Recordset::requery}, {u"close"_s, &Recordset::close}};
        const std::map<QString, std::function<void(const QString&)>> others{
            {u"execute"_s, [&](const QString& statement) { connection->execute(statement); }},
            {u"elsewhere"_s, [&](const QString& statement) { elsewhere(statement); }},
            {u"open"_s, [&](const QString& select) { lines = query(select); }},
            {u"add"_s, [&](const QString& columns) { add(columns); }},
            {u"set"_s, [&](const QString& columns) { fill(lines, columns); }},
            {u"find"_s, [&](const QString& criterion) { lines.find(criterion); }},
            {u"filter"_s, [&](const QString& criteria) { lines.setFilter(criteria); }},
            {u"disconnect"_s, [&](const QString&) {
                 lines.disconnect();
                 connection->close();
             }}};
        const QString what = step.section(u' ', 0, 0);
        const QString with = step.section(u' ', 1);
        if (what == u"count"_s)
            return QString::number(query(u"SELECT * FROM "_s + with).recordCount());
        if (what == u"rows"_s)
            return QString::number(lines.recordCount());
        if (what == u"value"_s)
            return lines.text(with);
        if (const auto move = plain.find(what); move != plain.end())
            (lines.*move->second)();
        else
            others.at(what)(with);
        if (!lines.isOpen())
            return u"closed"_s;
        return lines.eof() ? u"end"_s : QString::number(lines.absolutePosition());
    }

    Recordset lines;
};

const QDateTime someDay = columnDate(QDate(2026, 2, 28), QTime(13, 5, 59));

TEST_P(RecordsetOn, AKindOfColumnHasOneTypeOnEveryEngine)
{
    const QString longText(100000, u'n');
    const std::tuple<QString, Kind, QString, QVariant> columns[] = {
        {u"code"_s, Kind::Text, u"Größe €5"_s, u"Größe €5"_s},
        {u"SEQ"_s, Kind::WholeNumber, u" 1,200 "_s, qint64(1200)},
        {u"amount"_s, Kind::Number, u"12.5"_s, 12.5},
        {u"flag"_s, Kind::Flag, u"True"_s, true},
        {u"notes"_s, Kind::LongText, longText, longText},
        {u"day"_s, Kind::Date, u"28/02/2026 1:05:59 PM"_s, someDay}};
    lines.addNew();
    for (const auto& [name, kind, text, value] : columns)
        lines.set(name, text);
    lines.update();
    lines.requery();
    for (const auto& [name, kind, text, value] : columns) {
        EXPECT_EQ(lines.kind(name), kind) << name;
        EXPECT_EQ(lines.value(name).typeId(), value.typeId()) << name;
        EXPECT_EQ(lines.value(name), value) << name;
    }
    EXPECT_EQ(lines.value(u"id"_s), QVariant(qint64(1)));
    EXPECT_EQ(lines.size(u"code"_s), 20);
    EXPECT_EQ(query(u"SELECT COUNT(*) AS n FROM LINE"_s).value(u"n"_s), QVariant(qint64(1)));
    EXPECT_TRUE(query(u"SELECT MAX(SEQ) AS n FROM LINE WHERE SEQ=1"_s).isNull(u"N"_s));
}

TEST_P(RecordsetOn, DoesWhatTheTableOfStepsSays)
{
    QString rule;
    bool isOfThisEngine = false;
    for (const QStringList& row : rowsIn("recordset-steps.txt")) {
        if (row.size() == 1) {
            rule = row[0];
            isOfThisEngine = !rule.startsWith(u'[') || isOneOf(rule.section(u']', 0, 0).sliced(1));
            connection = connect();
            for (const QString& table : {u"LINE"_s, u"CAR"_s, u"Tints"_s})
                connection->execute(u"DELETE FROM "_s + table);
            lines = query(u"SELECT * FROM LINE ORDER BY id"_s);
        } else if (isOfThisEngine) {
            ASSERT_EQ(row.size(), 2) << rule << ' ' << row[0];
            EXPECT_EQ(outcomeOf([&] { return done(row[0]); }), row[1]) << rule << ' ' << row[0];
        }
    }
}

TEST_P(RecordsetOn, AnUpdateThatNobodyWatchesIsOneStatement)
{
    add(u"CODE=A"_s);
    lines.update();
    int statements = 0;
    db::setStatementFault([&] { return ++statements < 0; });
    for (const auto& [code, sent] : {std::pair(u"A"_s, 0), {u"a"_s, 1}}) {
        lines.set(u"CODE"_s, code);
        lines.update();
        EXPECT_EQ(statements, sent) << code;
    }
}

TEST_P(RecordsetOn, ARowThatSomeoneElseHasChangedIsNotOverwritten)
{
    for (const auto& [column, before, theirs, ours, outcome] : casesIn<5>("other-users.txt")) {
        elsewhere(u"DELETE FROM LINE"_s);
        elsewhere(u"INSERT INTO LINE (%1) VALUES (%2)"_s.arg(column, before));
        lines.requery();
        lines.set(column, ours.isEmpty() ? QVariant() : ours);
        elsewhere(u"UPDATE LINE SET %1=%2"_s.arg(column, theirs));
        EXPECT_EQ(failureOf([&] { lines.update(); }), outcome == u"refused"_s ? RowChanged : 0)
            << column << ' ' << before << ' ' << theirs;
        lines.cancelUpdate();
    }
}

TEST_P(RecordsetOn, ALongTextThatSomeoneWritesDuringAnUpdateIsNotOverwritten)
{
    const db::ConnectionPtr other = connect();
    other->setCommandTimeout(1);  // it waits for a locked row
    bool isPast = false;
    for (int number = 1; !isPast; ++number) {
        connection->execute(u"DELETE FROM LINE"_s);
        connection->execute(u"INSERT INTO LINE (notes) VALUES ('before')"_s);
        lines.requery();
        lines.set(u"notes"_s, u"ours"_s);
        int statement = 0;
        bool isTheirs = false;
        db::setStatementFault([&] {
            if (++statement == number)
                isTheirs = attempt([&] { other->execute(u"UPDATE LINE SET notes='theirs'"_s); });
            return false;
        });
        const int refused = failureOf([&] { lines.update(); });
        db::setStatementFault({});
        EXPECT_EQ(refused, isTheirs ? RowChanged : 0) << number;
        lines.cancelUpdate();
        EXPECT_EQ(query(u"SELECT notes FROM LINE"_s).text(u"notes"_s), isTheirs ? u"theirs"_s : u"ours"_s) << number;
        isPast = statement < number;
    }
}

TEST_P(RecordsetOn, AnHourThatTheClocksLeaveOutIsADateLikeOthers)
{
    const QString gap = u"4/10/2026 2:30:00 AM"_s;  // in the time zone of the tests
    elsewhere(u"INSERT INTO LINE (day) VALUES (%1)"_s.arg(stored(u"2026-10-04"_s, u"02:30:00"_s)));
    for (const QString& date : {u"2026-10-05 12:00:00"_s, gap, u"5/10/2026"_s}) {  // before, in and after the gap
        lines.requery();
        EXPECT_EQ(lines.recordCount(), count(u"day='%1'"_s.arg(lines.text(u"day"_s))));
        write(u"day"_s, date);
    }
    write(u"day"_s, QDateTime(QDate(2026, 10, 4), QTime(2, 30)));
    lines.requery();
    EXPECT_EQ(lines.text(u"day"_s), u"04/10/2026 2:30:00 AM"_s);
    EXPECT_EQ(found(u"day='%1'"_s.arg(gap)), 1);
}

TEST_P(RecordsetOn, AValueOfAnyTypeTellsItsRow)
{
    for (const auto& [engines, type, stored, ours, theirs] : casesIn<5>("row-types.txt")) {
        if (!isOneOf(engines))
            continue;
        connection->execute(u"CREATE TABLE HOST (what VARCHAR(20), host %1)"_s.arg(type));
        elsewhere(u"INSERT INTO HOST (what, host) VALUES ('a', %1)"_s.arg(stored));
        Recordset rows = query(u"SELECT * FROM HOST"_s);
        if (!ours.isEmpty()) {
            EXPECT_EQ(written(rows, u"host"_s, ours), 0) << type << ours;
        }
        EXPECT_EQ(written(rows, u"what"_s, u"b"_s), 0) << type << ours;
        elsewhere(u"UPDATE HOST SET host=%1"_s.arg(theirs));
        EXPECT_EQ(written(rows, u"what"_s, u"c"_s), RowChanged) << type << ours;
        EXPECT_EQ(query(u"SELECT * FROM HOST WHERE what='b'"_s).recordCount(), 1);
        rows.cancelUpdate();
        rows.close();
        connection->execute(u"DROP TABLE HOST"_s);
    }
}

TEST_P(RecordsetOn, SearchesCompareByTheKindOfTheColumn)
{
    for (const QString& row : {u"CODE=red SEQ=1"_s, u"CODE=\"Blue \" SEQ=2"_s, u"CODE=Österreich SEQ=3"_s,
                               u"CODE=RED SEQ=4"_s, u"CODE=O'Brien SEQ=0"_s})
        add(row);
    lines.set(u"flag"_s, true);
    write(u"day"_s, someDay);
    static const QRegularExpression equality(u"^(\\w+)=('?)(?!NULL)(.*)\\2$"_s);
    for (const QStringList& row : rowsIn("criteria.txt"))
        for (const QString& criterion : row.mid(1)) {
            EXPECT_EQ(found(criterion), row[0].toInt()) << criterion;
            if (const auto match = equality.match(criterion); match.hasMatch()) {
                EXPECT_EQ(found(match.captured(1), match.captured(3).replace(u"''"_s, u"'"_s)), row[0].toInt())
                    << "by column and value: " << criterion;
            }
        }
    for (const auto& [column, value] :
         {std::pair(u"SEQ"_s, QVariant(0)), {u"seq"_s, qint64(0)}, {u"SEQ"_s, -0.0}, {u"flag"_s, true}})
        EXPECT_EQ(found(column, value), 5) << value.typeName();
    EXPECT_EQ(found(u"day"_s, QVariant()), -1) << "no value equals Null";
    EXPECT_EQ(failureOf([&] { found(u"nosuch"_s, 1); }), NoSuchColumn);
}

INSTANTIATE_TEST_SUITE_P(Engines, RecordsetOn, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));
