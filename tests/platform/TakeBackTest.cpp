// A recorded change is taken back whole, and only while the row holds what the change left there.
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
              "'O''Brien \\ says')"_s.arg(stored(u"2026-10-25"_s, u"02:30:00"_s)),
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
            for (Recordset rows = query(select); !rows.eof(); rows.moveNext())
                for (const QString& column : rows.columns())
                    all += rows.isNull(column) ? u"(Null) "_s : u'[' + rows.text(column) + u"] "_s;
        return all;
    }

    bool takenBack(const db::RowChange& change) const
    {
        db::TakeBack back(*connection);
        const bool isTaken = back.undo(change);
        back.commit();
        return isTaken;
    }

    std::shared_ptr<Seen> seen = std::make_shared<Seen>();
};

TEST_P(TakeBackOn, EveryKindOfChangeIsTakenBack)
{
    const auto edit = [&](const QString& select, const QString& column, const QVariant& value) {
        Recordset rows = query(select);
        EXPECT_EQ(written(rows, column, value), 0);
    };
    const auto add = [&](const QString& select, const QString& column, const QVariant& value) {
        Recordset rows = query(select);
        EXPECT_EQ(added(rows, column, value), 0);
    };
    const std::function<void()> changes[] = {
        [&] { edit(u"SELECT * FROM LINE"_s, u"amount"_s, 0.3); },
        [&] { edit(u"SELECT * FROM LINE"_s, u"notes"_s, QVariant()); },
        [&] { edit(u"SELECT * FROM LINE WHERE CODE=''"_s, u"CODE"_s, QVariant()); },
        [&] { edit(u"SELECT * FROM CAR"_s, u"REGO"_s, u"ABC2"_s); },
        [&] { edit(u"SELECT * FROM Tints"_s, u"Script"_s, u"Blue"_s); },
        [&] { add(u"SELECT * FROM LINE"_s, u"amount"_s, 1.1); },
        [&] { add(u"SELECT * FROM CAR"_s, u"REGO"_s, u"XYZ"_s); },
        [&] { add(u"SELECT * FROM Tints"_s, u"Code"_s, u"G"_s); },
        [&] { query(u"SELECT * FROM LINE"_s).remove(); },
        [&] { query(u"SELECT * FROM Tints"_s).remove(); },
        [&] { connection->execute(u"DELETE FROM LINE WHERE CODE='A' OR SEQ IS NULL"_s); },
        [&] { connection->execute(u"DELETE FROM CAR WHERE REGO='ABC1'"_s); },
        [&] { connection->execute(u"UPDATE CAR SET REGO='N2', owner=NULL WHERE REGO='abc1'"_s); },
    };
    const QString before = everything();
    for (size_t i = 0; i < std::size(changes); ++i) {
        seen->changes.clear();
        changes[i]();
        EXPECT_NE(everything(), before) << "case " << i;
        const QList<db::RowChange> recorded = seen->changes;
        for (const db::RowChange& change : recorded)
            EXPECT_TRUE(takenBack(change)) << "case " << i;
        EXPECT_EQ(everything(), before) << "case " << i;
        EXPECT_EQ(seen->changes.size(), recorded.size()) << "it is not observed itself";
    }
    add(u"SELECT * FROM LINE"_s, u"CODE"_s, u"last"_s);
    EXPECT_EQ(count(u"CODE='last'"_s), 1) << "an identity that came back does not disturb the next insert";
}

TEST_P(TakeBackOn, ARowThatSomeoneElseHasChangedSinceStays)
{
    const QString add;  // a row with the code "new"
    const std::pair<QString, QString> cases[] = {
        {u"UPDATE LINE SET amount=5 WHERE CODE='A'"_s, u"UPDATE LINE SET amount=6"_s},
        {u"UPDATE LINE SET notes='x' WHERE CODE='A'"_s, u"UPDATE LINE SET notes='X'"_s},
        {u"UPDATE LINE SET flag=0 WHERE CODE='A'"_s, u"DELETE FROM LINE"_s},
        {add, u"UPDATE LINE SET SEQ=9 WHERE CODE='new'"_s},
        {add, u"UPDATE LINE SET CODE='NEW' WHERE CODE='new'"_s},
        {u"DELETE FROM CAR WHERE REGO='ABC1'"_s, u"INSERT INTO CAR (REGO, owner) VALUES ('abc1', 'Bob')"_s},
    };
    for (const auto& [change, theirs] : cases) {
        seen->changes.clear();
        if (Recordset lines = query(u"SELECT * FROM LINE"_s); change == add)
            added(lines, u"CODE"_s, u"new"_s);
        else
            connection->execute(change);
        elsewhere(theirs);
        const QString meanwhile = everything();
        EXPECT_FALSE(takenBack(seen->changes.front())) << theirs;
        EXPECT_EQ(everything(), meanwhile) << theirs;
    }
}

TEST_P(TakeBackOn, SeveralRowsGoBackTogetherOrNotAtAll)
{
    connection->execute(u"DELETE FROM LINE WHERE CODE='A' OR SEQ IS NULL"_s);
    const QString before = everything();
    {
        db::TakeBack unfinished(*connection);
        for (const db::RowChange& change : seen->changes)
            EXPECT_TRUE(unfinished.undo(change));
        EXPECT_NE(everything(), before);
    }
    EXPECT_EQ(everything(), before);
    EXPECT_TRUE(takenBack(seen->changes.front())) << "it can be tried again";
}

TEST_P(TakeBackOn, AComputedColumnIsLeftToTheDatabase)
{
    if (GetParam() == On::Tds)  // the simulated server has none
        return;
    connection->execute(u"ALTER TABLE LINE ADD COLUMN twice INTEGER GENERATED ALWAYS AS (SEQ * 2) VIRTUAL"_s);
    connection->execute(u"DELETE FROM LINE WHERE CODE='A'"_s);
    EXPECT_TRUE(takenBack(seen->changes.front()));
    EXPECT_EQ(count(u"CODE='A' AND twice=2"_s), 1);
}

INSTANTIATE_TEST_SUITE_P(On, TakeBackOn, ::testing::Values(On::Embedded, On::MySql, On::Odbc, On::Tds));
