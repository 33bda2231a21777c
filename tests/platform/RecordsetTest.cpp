// Tests the recordset: what it reads, writes, refuses and finds on each engine.
#include "platform/Databases.h"

using db::Kind;
using db::Recordset;

struct RecordsetOn : Databases {
    RecordsetOn() : lines(query(u"SELECT * FROM LINE ORDER BY id"_s)) {}

    void add(const QString& code, const QVariant& seq = {})
    {
        lines.addNew();
        lines.set(u"CODE"_s, code);
        lines.set(u"SEQ"_s, seq);
        lines.update();
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

    const std::pair<QString, QString> wrong[] = {{u"SEQ"_s, u"x"_s}, {u"amount"_s, u""_s}, {u"day"_s, u"soon"_s}};
    for (const auto& [column, text] : wrong)
        EXPECT_EQ(failureOf([&] { lines.set(column, text); }), TypeMismatch) << column;
    EXPECT_EQ(failureOf([&] { lines.value(u"nosuch"_s); }), NoSuchColumn);
}

TEST_P(RecordsetOn, AnUpdateWritesOnlyWhatDiffers)
{
    add(u"A"_s, 1);
    elsewhere(u"UPDATE LINE SET SEQ=7"_s);
    lines.set(u"SEQ"_s, 1);  // the same value, so it is not written
    write(u"CODE"_s, u"B"_s);
    EXPECT_EQ(count(u"CODE='B' AND SEQ=7"_s), 1);
    int statements = 0;
    db::setStatementFault([&] { return ++statements < 0; });
    write(u"CODE"_s, u"B"_s);
    EXPECT_EQ(statements, 0);
    write(u"CODE"_s, u"b"_s);
    EXPECT_EQ(statements, 1) << "another text, though it compares equal";
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
    lines.set(u"CODE"_s, u"gone"_s);
    elsewhere(u"DELETE FROM LINE"_s);
    EXPECT_EQ(failureOf([&] { lines.moveFirst(); }), RowChanged) << "a move updates first";
    EXPECT_EQ(failureOf([&] { lines.remove(); }), RowChanged);
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

TEST_P(RecordsetOn, AJoinIsUpdatedInTheTablesThatItsColumnsComeFrom)
{
    elsewhere(u"INSERT INTO LINE (CODE, SEQ) VALUES ('L', 1), ('other', 1)"_s);
    elsewhere(u"INSERT INTO CAR (REGO, owner, CODE) VALUES ('L', 'Ann', 'C')"_s);
    Recordset join = query(u"SELECT * FROM line, car WHERE line.CODE=CAR.rego"_s);
    ASSERT_EQ(join.recordCount(), 1);
    EXPECT_EQ(join.text(u"CODE"_s), u"L"_s);  // the first of two columns with the same name
    join.set(u"code"_s, u"L2"_s);
    join.set(u"owner"_s, u"Bob"_s);
    join.update();
    EXPECT_EQ(count(u"CODE='L2'"_s), 1);
    EXPECT_EQ(count(u"CODE='other'"_s), 1);
    EXPECT_EQ(query(u"SELECT * FROM CAR WHERE owner='Bob' AND CODE='C'"_s).recordCount(), 1);

    Recordset named = query(u"SELECT REGO + ' of ' + owner AS CODE, COUNT(*) AS n FROM CAR GROUP BY REGO, owner"_s);
    EXPECT_EQ(named.text(u"CODE"_s), u"L of Bob"_s);
    EXPECT_NE(failureOf([&] { named.set(u"CODE"_s, u"x"_s); }), 0) << "a worked out value";
}

TEST_P(RecordsetOn, AColumnThatTheHostAddsMeanwhileCanBeChanged)
{
    add(u"A"_s, 1);
    elsewhere(u"ALTER TABLE LINE ADD colour VARCHAR(10)"_s);
    lines.requery();
    write(u"colour"_s, u"Red"_s);
    EXPECT_EQ(count(u"colour='Red' AND CODE='A'"_s), 1);
    EXPECT_EQ(lines.size(u"colour"_s), 10);
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

TEST_P(RecordsetOn, WithoutAKeyAllSelectedColumnsTellTheRow)
{
    elsewhere(u"INSERT INTO TINTS (Code, Script) VALUES ('R', 'Red'), ('R', NULL)"_s);
    elsewhere(u"INSERT INTO CAR (REGO, owner) VALUES ('R', 'Ann')"_s);
    Recordset tints = query(u"SELECT * FROM tints"_s);
    tints.find(u"script='red'"_s);
    EXPECT_EQ(written(tints, u"Script"_s, u"Dark"_s), 0);
    EXPECT_EQ(query(u"SELECT * FROM Tints WHERE Script='Dark'"_s).recordCount(), 1);
    tints.moveFirst();
    tints.find(u"Script=NULL"_s);
    tints.remove();
    EXPECT_EQ(query(u"SELECT * FROM Tints"_s).recordCount(), 1);

    Recordset owners = query(u"SELECT owner FROM CAR"_s);  // the key is not selected
    EXPECT_EQ(written(owners, u"owner"_s, u"Bob"_s), 0);
    EXPECT_EQ(query(u"SELECT * FROM CAR WHERE owner='Bob'"_s).recordCount(), 1);
}

TEST_P(RecordsetOn, SearchesCompareByTheKindOfTheColumn)
{
    for (const auto& [code, seq] :
         {std::pair(u"red"_s, 1), {u"Blue "_s, 2}, {u"Österreich"_s, 3}, {u"RED"_s, 4}, {u"O'Brien"_s, 0}})
        add(code, seq);
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
    lines.setAbsolutePosition(2);
    lines.find(u"code = 'Red '"_s);
    EXPECT_EQ(lines.absolutePosition(), 4);
    lines.find(u"SEQ=2"_s);
    EXPECT_TRUE(lines.eof()) << "it stands before";
    EXPECT_EQ(failureOf([&] { lines.find(u"CODE='a' OR 1=1"_s); }), StatementFailed);
    Recordset empty = query(u"SELECT * FROM LINE WHERE 1=0"_s);
    empty.find(u"SEQ=1"_s);
    EXPECT_TRUE(empty.eof());
}

TEST_P(RecordsetOn, ASearchSeesEveryChangeMadeThroughTheRecordset)
{
    for (int i = 1; i <= 3; ++i)
        add(u"c"_s, i);
    EXPECT_EQ(found(u"SEQ=3"_s), 3);  // this creates the index
    lines.set(u"SEQ"_s, 30);
    EXPECT_EQ(found(u"SEQ=3"_s), -1);
    add(u"c"_s, 3);
    lines.addNew();
    lines.set(u"SEQ"_s, 40);  // a pending change, which the search stores first
    lines.find(u"SEQ=40"_s);
    EXPECT_EQ(lines.absolutePosition(), 5);
    EXPECT_EQ(count(u"SEQ=40"_s), 1);
    EXPECT_EQ(found(u"SEQ=3"_s), 4);
    lines.remove();
    EXPECT_EQ(lines.value(u"SEQ"_s).toInt(), 40) << "behind a removed row stands the next";
    lines.set(u"SEQ"_s, 3);
    lines.cancelUpdate();
    EXPECT_EQ(found(u"SEQ=3"_s), -1);
}

TEST_P(RecordsetOn, MovingPastAnEndTwiceIsAnError)
{
    EXPECT_TRUE(lines.eof());
    for (const auto move : {&Recordset::moveFirst, &Recordset::moveLast, &Recordset::moveNext, &Recordset::remove})
        EXPECT_EQ(failureOf([&] { (lines.*move)(); }), NoCurrentRow);
    EXPECT_EQ(failureOf([&] { lines.value(u"SEQ"_s); }), NoCurrentRow);
    add(u"A"_s);
    add(u"B"_s);
    lines.moveNext();
    EXPECT_TRUE(lines.eof());
    EXPECT_EQ(failureOf([&] { lines.moveNext(); }), NoCurrentRow);
    EXPECT_EQ(failureOf([&] { lines.set(u"SEQ"_s, 1); }), NoCurrentRow);
    lines.moveFirst();
    while (!lines.eof())
        lines.remove();
    EXPECT_EQ(count(u"1=1"_s), 0);
}

TEST_P(RecordsetOn, APendingChangeIsWrittenByAMove)
{
    add(u"A"_s, 1);
    add(u"B"_s, 2);
    lines.set(u"SEQ"_s, 20);
    lines.moveFirst();
    EXPECT_EQ(count(u"SEQ=20"_s), 1);
    lines.set(u"SEQ"_s, 10);
    lines.requery();
    EXPECT_EQ(lines.value(u"SEQ"_s).toInt(), 10);
    lines.set(u"SEQ"_s, 11);
    lines.close();
    EXPECT_EQ(count(u"SEQ=11"_s), 0);
    EXPECT_EQ(failureOf([&] { lines.value(u"SEQ"_s); }), ObjectClosed);
    EXPECT_EQ(failureOf([&] { lines.moveFirst(); }), ObjectClosed);
}

TEST_P(RecordsetOn, AFilterShowsTheRowsThatMatch)
{
    for (int i = 1; i <= 6; ++i)
        add(i % 2 ? u"odd"_s : u"even"_s, i);
    lines.setFilter(u"CODE='ODD' AND SEQ>1"_s);
    EXPECT_EQ(lines.recordCount(), 2);
    EXPECT_EQ(lines.value(u"SEQ"_s).toInt(), 3);
    lines.find(u"SEQ=4"_s);
    EXPECT_TRUE(lines.eof()) << "hidden";
    lines.disconnect();
    connection->close();
    lines.setFilter({});
    EXPECT_EQ(lines.recordCount(), 6);
    lines.find(u"SEQ=4"_s);
    EXPECT_EQ(lines.text(u"CODE"_s), u"even"_s);
    EXPECT_EQ(written(lines, u"SEQ"_s, 9), ObjectClosed);
}

INSTANTIATE_TEST_SUITE_P(Engines, RecordsetOn, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));
