// A recorded change is taken back whole, and only while the row holds what the change left there.
#include "base/JournalRecord.h"
#include "platform/Databases.h"
#include "platform/database/TakeBack.h"

using db::Recordset;

namespace {

/// Keeps what it sees.
struct Seen final : db::ChangeObserver {
    bool observes(const QString&) const override { return true; }
    void changed(db::Connection&, const QList<db::RowChange>& rows) override { changes += rows; }

    QList<db::RowChange> changes;
};

}  // namespace

struct TakeBackOn : Databases {
    TakeBackOn()
    {
        for (const QString& statement :
             {u"INSERT INTO LINE (CODE, SEQ, amount, flag, day, notes) VALUES ('A', 1, 0.1, 1, %1, "
              "'O''Brien \\ says \"Zoë €\"')"_s.arg(stored(u"2026-10-25"_s, u"02:30:00"_s)),
              u"INSERT INTO LINE (CODE, SEQ, amount) VALUES ('', NULL, NULL)"_s,
              u"INSERT INTO CAR (REGO, owner) VALUES ('ABC1', 'Ada')"_s,
              u"INSERT INTO Tints (Code, Script) VALUES ('R', 'Red')"_s})
            connection->execute(statement);
        connection->setObserver(seen);
    }

    /// All values of all rows.
    QString everything() const
    {
        QString all;
        for (const QString& select :
             {u"SELECT * FROM LINE ORDER BY id"_s, u"SELECT * FROM CAR ORDER BY REGO"_s, u"SELECT * FROM Tints"_s})
            all += rowsOf(connection, select).join(u'\n');
        return all;
    }

    /// Makes a change and returns what was recorded.
    QList<db::RowChange> change(const std::array<QString, 6>& row) const
    {
        const auto& [result, how, statement, column, text, theirs] = row;
        const QVariant value = text == u"Null"_s ? QVariant() : text;
        seen->changes.clear();
        if (how == u"execute"_s)
            connection->execute(statement);
        else if (Recordset rows = query(statement); how == u"remove"_s)
            rows.remove();
        else
            EXPECT_EQ(how == u"add"_s ? added(rows, column, value) : written(rows, column, value), 0) << statement;
        return seen->changes;
    }

    /// Takes back what the journal's record of the change says.
    bool takenBack(const db::RowChange& change) const
    {
        db::TakeBack back(*connection);
        const bool isTaken = back.undo(journal::changeIn(journal::textOf(change)));
        back.commit();
        return isTaken;
    }

    std::shared_ptr<Seen> seen = std::make_shared<Seen>();
};

TEST_P(TakeBackOn, AChangeIsTakenBackUnlessSomeoneElseHasChangedItsRow)
{
    const QString before = everything();
    for (const auto& row : casesIn<6>("changes.txt")) {
        const QList<db::RowChange> recorded = change(row);
        const bool isTaken = row[0] == u"is taken back"_s;
        if (!isTaken)
            elsewhere(row[5]);
        const QString meanwhile = everything();
        EXPECT_NE(meanwhile, before) << row[2];
        for (const db::RowChange& one : recorded)
            EXPECT_EQ(takenBack(one), isTaken) << row[2] << row[5];
        EXPECT_EQ(everything(), isTaken ? before : meanwhile) << row[2] << row[5];
        EXPECT_EQ(seen->changes.size(), recorded.size()) << "it is not observed itself";
    }
    Recordset lines = query(u"SELECT * FROM LINE"_s);
    EXPECT_EQ(added(lines, u"CODE"_s, u"last"_s), 0);
    EXPECT_EQ(count(u"CODE='last'"_s), 1) << "an identity that came back does not disturb the next insert";
}

TEST_P(TakeBackOn, AComputedColumnIsLeftToTheDatabase)
{
    if (GetParam() == On::Tds)  // the simulated server has none
        return;
    connection->execute(u"ALTER TABLE LINE ADD COLUMN twice INTEGER GENERATED ALWAYS AS (SEQ * 2) VIRTUAL"_s);
    for (const QString& statement : {u"DELETE FROM LINE WHERE CODE='A'"_s, u"UPDATE LINE SET SEQ=7 WHERE CODE='A'"_s}) {
        seen->changes.clear();
        connection->execute(statement);
        EXPECT_TRUE(takenBack(seen->changes.front())) << statement;
        EXPECT_EQ(count(u"CODE='A' AND twice=2"_s), 1) << statement;
    }
}

TEST_P(TakeBackOn, AValueOfTheHostComesBackBitForBit)
{
    for (const auto& [engines, type, value, other, bits] : casesIn<5>("host-columns.txt")) {
        if (!isOneOf(engines))
            continue;
        const QString same = QString(bits).replace(u"%1"_s, u"host"_s) + u'=' + QString(bits).replace(u"%1"_s, value);
        connection->setObserver(nullptr);
        connection->execute(u"CREATE TABLE HOST (id INTEGER PRIMARY KEY, host %1)"_s.arg(type));
        connection->execute(u"INSERT INTO HOST VALUES (1, %1)"_s.arg(value));
        connection->setObserver(seen);
        seen->changes.clear();
        for (const QString& statement : {u"DELETE FROM HOST"_s, u"UPDATE HOST SET host=NULL"_s}) {
            connection->execute(statement);
            EXPECT_TRUE(takenBack(seen->changes.takeFirst())) << type << statement;
            Recordset found = query(u"SELECT COUNT(*) AS n FROM HOST WHERE "_s + same);
            EXPECT_EQ(toLong(found.value(u"n"_s)), 1) << type << statement;
        }
        connection->execute(u"UPDATE HOST SET host=NULL"_s);
        connection->setObserver(nullptr);
        db::RowChange written = seen->changes.takeFirst();
        std::swap(written.columns[1].before, written.columns[1].after);
        connection->execute(u"UPDATE HOST SET host=%1"_s.arg(other));
        EXPECT_FALSE(takenBack(written)) << type;
        connection->execute(u"DROP TABLE HOST"_s);
    }
}

TEST_P(TakeBackOn, AStatementThatCannotBeRecordedIsRefused)
{
    for (const QString& statement :
         {u"INSERT INTO CAR (REGO) VALUES ('X')"_s, u"REPLACE INTO CAR (REGO) VALUES ('X')"_s})
        EXPECT_EQ(failureOf([&] { connection->execute(statement); }), StatementFailed) << statement;
    connection->execute(u"UPDATE CAR SET owner='Bob'"_s);
    EXPECT_EQ(seen->changes.size(), 1) << "without a condition, all rows";
}

INSTANTIATE_TEST_SUITE_P(On, TakeBackOn, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));
