#include "setup/CheckPoints.h"

#include "platform/RuntimeError.h"
#include "platform/database/Session.h"
#include "platform/database/Sql.h"
#include "platform/database/TakeBack.h"
#include "platform/values.h"

#include <QElapsedTimer>
#include <QRandomGenerator>

namespace kest::app {

using namespace Qt::StringLiterals;
using db::Kind;
using db::Recordset;

namespace {

constexpr int timeLimit = 2;         // seconds, for the statement that takes longer
constexpr int givenUpWithin = 4500;  // milliseconds, of that statement

/// A transaction, which is rolled back unless it is committed.
class Transaction {
public:
    explicit Transaction(const db::ConnectionPtr& connection) : connection_(connection)
    {
        connection_->session().begin();
    }
    ~Transaction()
    {
        if (isOpen_ && connection_->state() == 1)
            connection_->session().abandon();
    }
    Transaction(const Transaction&) = delete;
    Transaction& operator=(const Transaction&) = delete;

    void commit()
    {
        connection_->session().commit();
        isOpen_ = false;
    }
    void rollback()
    {
        connection_->session().rollback();
        isOpen_ = false;
    }

private:
    db::ConnectionPtr connection_;
    bool isOpen_ = true;
};

}  // namespace

CheckPoints::CheckPoints(const std::function<db::ConnectionPtr()>& connect, QStringList& wrong)
    : connect_(connect),
      ours_(connect()),
      others_(connect()),
      server_(serverOf(ours_)),
      words_(wordsOf(server_)),
      table_(u"KEST2_CHECK_%1"_s.arg(QRandomGenerator::global()->generate(), 8, 16, QChar(u'0')).toUpper()),
      log_(table_ + u"_LOG"_s),
      wrong_(wrong)
{
}

CheckPoints::~CheckPoints()
{
    for (const QString& table : made_) {
        const QString drop = u"DROP TABLE "_s + table;
        if (!attempt([&] { others_->execute(drop); }))
            attempt([&] { connect_()->execute(drop); });
    }
}

void CheckPoints::begin()
{
    if (made_.isEmpty())
        throw Skip{u"there is no table to try it in"_s};
    for (db::ConnectionPtr* connection : {&ours_, &others_}) {
        if ((*connection)->state() != 1)
            *connection = connect_();
    }
    clear();
}

void CheckPoints::expect(bool holds, const QString& otherwise)
{
    if (!holds)
        wrong_ += otherwise;
}

void CheckPoints::clear() const
{
    ours_->execute(u"DELETE FROM "_s + table_);
}

Recordset CheckPoints::rows(const QString& condition) const
{
    Recordset rows(ours_);
    rows.open(u"SELECT * FROM %1 WHERE %2 ORDER BY number"_s.arg(table_, condition));
    return rows;
}

QString CheckPoints::fact(const QString& expression) const
{
    QString found;
    try {
        Recordset row(ours_);
        row.open(u"SELECT "_s + expression);
        found = row.eof() ? QString() : row.text(row.columns().constFirst());
    } catch (const RuntimeError& error) {
        found = u"not told: "_s + error.description();
    }
    return found.simplified();
}

void CheckPoints::makesTables()
{
    const QStringList columns{u"number "_s + words_.identity,
                              u"code "_s + words_.text,
                              u"wide "_s + words_.national,
                              u"seq INTEGER"_s,
                              u"amount %1 DEFAULT 0"_s.arg(words_.number),
                              u"price "_s + words_.money,
                              u"hours DECIMAL(9,2)"_s,
                              u"flag %1 DEFAULT 0"_s.arg(words_.flag),
                              u"day DATETIME"_s,
                              u"moment "_s + words_.moment,
                              u"notes "_s + words_.longText,
                              u"wideNotes "_s + words_.nationalLongText,
                              u"remarks "_s + words_.olderLongText};
    makeTable(table_, columns);
    makeTable(log_, {u"number "_s + words_.identity, u"what VARCHAR(20)"_s});
    for (int i = 0; i < 5; ++i)  // so that its numbers are not those of the other table
        ours_->execute(u"INSERT INTO %1 (what) VALUES ('x')"_s.arg(log_));
}

void CheckPoints::makeTable(const QString& name, const QStringList& columns)
{
    made_.prepend(name);
    try {
        ours_->execute(u"CREATE TABLE %1 (%2)"_s.arg(name, columns.join(u", "_s)));
    } catch (const RuntimeError&) {
        made_.removeFirst();
        throw;
    }
}

void CheckPoints::knowsColumns()
{
    const std::tuple<QString, Kind, int> expected[] = {
        {u"number"_s, Kind::WholeNumber, 0}, {u"code"_s, Kind::Text, 20},     {u"wide"_s, Kind::Text, 20},
        {u"seq"_s, Kind::WholeNumber, 0},    {u"amount"_s, Kind::Number, 0},  {u"price"_s, Kind::Number, 0},
        {u"hours"_s, Kind::Number, 0},       {u"flag"_s, Kind::Flag, 0},      {u"day"_s, Kind::Date, 0},
        {u"moment"_s, Kind::Date, 0},        {u"notes"_s, Kind::LongText, 0}, {u"wideNotes"_s, Kind::LongText, 0},
        {u"remarks"_s, Kind::LongText, 0}};
    const Recordset all = rows();
    for (const auto& [name, kind, size] : expected) {
        expect(all.hasColumn(name) && all.kind(name) == kind, name + u" is taken for another kind"_s);
        expect(all.hasColumn(name) && all.size(name) == size, u"the size of %1 is not known"_s.arg(name));
    }
    ours_->execute(u"INSERT INTO %1 (code, seq) VALUES ('a', 1)"_s.arg(table_));
    Recordset joined(ours_);
    joined.open(u"SELECT L.*, T.code FROM %1 T INNER JOIN %2 L ON L.number=T.seq"_s.arg(table_, log_));
    joined.set(u"what"_s, u"y"_s);
    joined.set(u"code"_s, u"b"_s);
    joined.update();
    expect(rows(u"code='b'"_s).recordCount() == 1, u"a change in a join did not reach its table"_s);
}

void CheckPoints::numbersRows()
{
    Recordset all = rows();
    all.addNew();
    all.set(u"code"_s, u"a"_s);
    all.update();
    const Recordset stored = rows(u"code='a'"_s);
    expect(stored.value(u"number"_s) == all.value(u"number"_s), u"the number is another one"_s);
    expect(all.value(u"amount"_s) == QVariant(0.0) && all.value(u"flag"_s) == QVariant(false),
           u"the defaults are not read back"_s);
    all.addNew();  // nothing set
    all.update();
    expect(rows().recordCount() == 2, u"a row of defaults is not written"_s);
}

void CheckPoints::bearsTriggers()
{
    if (words_.trigger.isEmpty())
        throw Skip{u"nobody else has triggers in this database"_s};
    try {
        ours_->execute(words_.trigger.arg(table_, log_));
    } catch (const RuntimeError& error) {
        throw Skip{u"no trigger can be made: "_s + error.description()};
    }
    Recordset all = rows();
    all.addNew();
    all.set(u"code"_s, u"a"_s);
    all.update();
    const Recordset stored = rows(u"code='a'"_s);
    expect(stored.value(u"number"_s) == all.value(u"number"_s), u"a new row gets the number of the trigger's row"_s);
    all.set(u"seq"_s, 5);
    all.update();
    const qint64 none = ours_->execute(u"UPDATE %1 SET seq=1 WHERE code='nothing'"_s.arg(table_));
    expect(none == 0, u"an update that hits no row counts as %1"_s.arg(none));
    attempt([&] { ours_->execute(u"DROP TRIGGER %1_T"_s.arg(table_)); });
}

void CheckPoints::writesChanges()
{
    ours_->execute(u"INSERT INTO %1 (code, seq) VALUES ('a', 1)"_s.arg(table_));
    for (const int seq : {1, 1, 2}) {
        const qint64 hit = ours_->execute(u"UPDATE %1 SET seq=%2"_s.arg(table_).arg(seq));
        expect(hit == 1, u"an update of one row counts as %1"_s.arg(hit));
    }
    expect(ours_->execute(u"DELETE FROM "_s + table_) == 1, u"a deletion of one row does not count as one"_s);
}

void CheckPoints::keepsTransactions()
{
    for (const bool isCommitted : {false, true}) {
        Transaction transaction(ours_);
        for (const QString& code : {u"a"_s, u"b"_s})
            ours_->execute(u"INSERT INTO %1 (code) VALUES ('%2')"_s.arg(table_, code));
        isCommitted ? transaction.commit() : transaction.rollback();
        Recordset stored(others_);
        stored.open(u"SELECT * FROM "_s + table_);
        expect(stored.recordCount() == (isCommitted ? 2 : 0),
               u"of two new rows, %1 are there after the %2"_s.arg(QString::number(stored.recordCount()),
                                                                   isCommitted ? u"commit"_s : u"rollback"_s));
    }
}

void CheckPoints::takesDeletedRowsBack()
{
    Recordset all = rows();
    all.addNew();
    all.set(u"code"_s, u"a"_s);
    all.update();
    const QVariant number = all.value(u"number"_s);
    all.remove();
    db::TakeBack back(*ours_);
    const bool isBack =
        back.undo({db::ChangeKind::Delete,
                   table_,
                   {u"number"_s},
                   {{u"number"_s, Kind::WholeNumber, number, {}}, {u"code"_s, Kind::Text, u"a"_s, {}}}});
    back.commit();
    expect(isBack && rows(u"code='a'"_s).recordCount() == 1 && rows().value(u"number"_s) == number,
           u"it does not come back"_s);
    all.addNew();
    all.set(u"code"_s, u"b"_s);
    all.update();
    expect(all.value(u"number"_s).toLongLong() > number.toLongLong(), u"the next row gets no number of its own"_s);
}

void CheckPoints::noticesOthers()
{
    QList<std::tuple<QString, QString, QString, QVariant>> changes{
        {u"code"_s, u"'a'"_s, u"'b'"_s, u"c"_s},
        {u"wide"_s, u"NULL"_s, u"'b'"_s, u"c"_s},
        {u"seq"_s, u"1"_s, u"2"_s, 3},
        {u"flag"_s, u"0"_s, u"1"_s, QVariant()},
        {u"day"_s, u"'2026-02-28T13:05:59'"_s, u"NULL"_s, columnDate(QDate(2026, 3, 1), {})},
        {u"notes"_s, u"'a'"_s, u"'A'"_s, u"c"_s},
        {u"wideNotes"_s, u"'a'"_s, u"'b'"_s, u"c"_s},
        {u"remarks"_s, u"'a'"_s, u"NULL"_s, u"c"_s}};
    if (server_ != Server::Embedded)  // which has no exact numbers, and dates to the second
        changes += {{u"price"_s, u"12.35"_s, u"12.36"_s, 9.5},
                    {u"hours"_s, u"0.1"_s, u"0.2"_s, 9.5},
                    {u"moment"_s, u"'2026-02-28T13:05:59.123'"_s, u"'2026-02-28T13:05:59.125'"_s, QVariant()}};
    for (const auto& [column, before, theirs, own] : std::as_const(changes)) {
        clear();
        ours_->execute(u"INSERT INTO %1 (%2) VALUES (%3)"_s.arg(table_, column, before));
        Recordset row = rows();
        row.set(column, own);
        others_->execute(u"UPDATE %1 SET %2=%3"_s.arg(table_, column, theirs));
        int failure = 0;
        try {
            row.update();
        } catch (const RuntimeError& error) {
            failure = error.number();
        }
        row.cancelUpdate();
        expect(failure == RowChanged, u"%1 is overwritten (%2)"_s.arg(column).arg(failure));
    }
}

void CheckPoints::keepsTexts()
{
    const QString letters = u"Zoë's \"50 % [off]\" {}; \\ € ´"_s.left(20);
    Recordset row = rows();
    row.addNew();
    for (const QString& text : {letters, u"x"_s, u""_s}) {
        row.set(u"code"_s, text);
        row.set(u"wide"_s, text);
        row.update();
        expect(rows().text(u"code"_s) == text && rows().text(u"wide"_s) == text,
               u"\"%1\" came back as \"%2\""_s.arg(text, rows().text(u"code"_s)));
    }
    for (const int length : {254, 255, 256, 4001, 4097, 8001, 65'536, 65'537, 200'000}) {
        const QString beginning(length - 3, u'x');
        const std::pair<QString, QString> texts[] = {{u"notes"_s, beginning + u"é€\n"_s},
                                                     {u"remarks"_s, beginning + u"é€\n"_s},
                                                     {u"wideNotes"_s, beginning + u"😀ł"_s}};
        for (const auto& [column, text] : texts)
            row.set(column, text);
        row.update();
        const Recordset stored = rows();
        for (const auto& [column, text] : texts) {
            expect(!stored.isNull(column) && stored.text(column) == text,
                   stored.isNull(column) ? u"%1 letters came back as Null"_s.arg(length)
                                         : u"of %1 letters %2 came back"_s.arg(length).arg(stored.text(column).size()));
        }
    }
    for (const QVariant& text : {QVariant(QString(u""_s)), QVariant()}) {
        for (const auto& column : {u"notes"_s, u"remarks"_s, u"wideNotes"_s})
            row.set(column, text);
        row.update();
        const Recordset stored = rows();
        for (const auto& column : {u"notes"_s, u"remarks"_s, u"wideNotes"_s})
            expect(stored.isNull(column) == text.isNull() && stored.text(column).isEmpty(),
                   u"an empty or a Null %1 came back as another"_s.arg(column));
    }
}

void CheckPoints::keepsDatesAndNumbers()
{
    Recordset row = rows();
    row.addNew();
    const QDateTime moments[] = {columnDate(QDate(2026, 12, 1), QTime(0, 0)),
                                 columnDate(QDate(2026, 1, 12), QTime(13, 45, 7)),
                                 columnDate(QDate(1999, 12, 31), QTime(23, 59, 59))};
    for (const QDateTime& moment : moments) {
        row.set(u"day"_s, moment);
        row.update();
        expect(rows().value(u"day"_s) == QVariant(moment),
               u"%1 came back as %2"_s.arg(toText(moment), rows().text(u"day"_s)));
        expect(rows(sql("day='{}'", moment)).recordCount() == 1, toText(moment) + u" is not found"_s);
    }
    for (const QTime& time : {QTime(13, 45, 7, 123), QTime(13, 45, 7, 124)}) {  // the second change finds the first one
        const QDateTime moment = columnDate(QDate(2026, 1, 12), time);
        row.set(u"moment"_s, moment);
        row.update();
        expect(rows().value(u"moment"_s) == QVariant(moment), toText(moment) + u" has lost its milliseconds"_s);
    }
    for (const double number : {0.1, -1234567.89, 0.0}) {
        row.set(u"amount"_s, number);
        row.set(u"price"_s, number);
        row.update();
        expect(
            rows().value(u"amount"_s) == QVariant(number) && rows().text(u"price"_s) == numberText(number),
            u"%1 came back as %2 and %3"_s.arg(numberText(number), rows().text(u"amount"_s), rows().text(u"price"_s)));
    }
}

void CheckPoints::compares()
{
    for (const QString& values : {u"'Red', 0, 1"_s, u"'red  ', 5, 0"_s, u"'a[b', NULL, 0"_s, u"'', 7, 0"_s,
                                  u"'it''s', 10, 0"_s, u"'öl', 20, 0"_s})
        ours_->execute(u"INSERT INTO %1 (code, seq, flag) VALUES (%2)"_s.arg(table_, values));
    const std::pair<QString, int> conditions[] = {
        {u"code='RED'"_s, 2},     {u"code='red '"_s, 2},       {u"code LIKE 'RE_'"_s, 2},
        {u"code LIKE '%D'"_s, 2}, {u"code LIKE 'a[[]b'"_s, 1}, {u"code=''"_s, 1},
        {u"code='it''s'"_s, 1},   {u"code<>'red'"_s, 4},       {u"seq=''"_s, 1},
        {u"seq='5'"_s, 1},        {u"seq='5x'"_s, 0},          {u"seq<>'x'"_s, 5},
        {u"seq IS NULL"_s, 1},    {u"flag=TRUE"_s, 1},         {u"code IN ('RED', 'IT''S')"_s, 3},
        {u"code='öl'"_s, 1},      {u"code LIKE 'ö%'"_s, 1},    {u"code LIKE '%[%'"_s, 1}};
    for (const auto& [condition, expected] : conditions) {
        const int found = rows(condition).recordCount();
        expect(found == expected, u"%1 finds %2 rows, not %3"_s.arg(condition).arg(found).arg(expected));
    }
    Recordset newest(ours_);
    newest.open(u"SELECT TOP 1 code + ' and ' + code AS joined FROM %1 WHERE seq=10"_s.arg(table_));
    expect(newest.text(u"joined"_s) == u"it's and it's"_s, u"texts are not joined"_s);
    Recordset counted(ours_);
    counted.open(u"SELECT COUNT(*) AS found, MAX(seq) AS highest FROM "_s + table_);
    expect(counted.text(u"found"_s) == u"6"_s && counted.text(u"highest"_s) == u"20"_s, u"rows are not counted"_s);
}

void CheckPoints::keepsVersions()
{
    if (server_ != Server::SqlServer)
        throw Skip{u"only SQL Server has such columns"_s};
    const QString versioned = table_ + u"_V"_s;
    makeTable(versioned, {u"code VARCHAR(20)"_s, u"version TIMESTAMP"_s});
    ours_->execute(u"INSERT INTO %1 (code) VALUES ('a')"_s.arg(versioned));
    Recordset row(ours_);
    row.open(u"SELECT * FROM "_s + versioned);
    row.set(u"code"_s, u"b"_s);
    row.update();
}

void CheckPoints::locks()
{
    {
        const db::Lock held(ours_, table_);
        expect(held.isHeld(), u"a lock is refused that nobody holds"_s);
        expect(!db::Lock(others_, table_).isHeld(), u"two connections hold one lock"_s);
    }
    expect(db::Lock(others_, table_).isHeld(), u"a lock stays when its holder lets go"_s);
}

void CheckPoints::expectGivenUp(const std::function<void()>& step)
{
    ours_->setCommandTimeout(timeLimit);
    QElapsedTimer time;
    time.start();
    const bool isGivenUp = !attempt(step);
    expect(isGivenUp && time.elapsed() < givenUpWithin,
           u"with a limit of %1 seconds it took %2 milliseconds"_s.arg(timeLimit).arg(time.elapsed()));
    expect(ours_->state() == 1, u"the connection was lost with it"_s);
}

void CheckPoints::waitsForLockedRows()
{
    ours_->execute(u"INSERT INTO %1 (code) VALUES ('a')"_s.arg(table_));
    const auto change = [this] { ours_->execute(u"UPDATE %1 SET seq=2"_s.arg(table_)); };
    {
        const Transaction theirs(others_);
        db::Session& session = others_->session();
        session.selectLocked(*session.table(table_), u"1=1"_s);
        expectGivenUp(change);
    }
    expect(attempt(change), u"the row stays locked when its holder lets go"_s);
    ours_ = connect_();
}

void CheckPoints::givesUp()
{
    expectGivenUp([this] {
        if (words_.slow.contains(u"SELECT"_s))
            Recordset(ours_).open(words_.slow);
        else
            ours_->execute(words_.slow);
    });
    ours_ = connect_();
}

void CheckPoints::noticesLostConnections()
{
    if (words_.ownNumber.isEmpty())
        throw Skip{u"there is no server that could drop it"_s};
    const QString number = fact(words_.ownNumber);
    try {
        others_->execute(u"KILL "_s + number);
    } catch (const RuntimeError& error) {
        throw Skip{u"this user may end no connection: "_s + error.description()};
    }
    expect(!ours_->answers(), u"a connection that the server has dropped counts as open"_s);
    ours_ = connect_();
    expect(ours_->answers(), u"it can't be opened again"_s);
}

}  // namespace kest::app
