// The single points that the check of a database tries, each in scratch tables.
#pragma once

#include "platform/database/Connection.h"
#include "platform/database/Recordset.h"
#include "setup/HostTables.h"
#include "setup/ServerWords.h"

#include <QString>
#include <QStringList>

#include <functional>

namespace kest::app {

/// Why a point can't be tried here.
struct Skip {
    QString why;
};

/// The points, and what they work on: two connections, and scratch tables that go with this object. A point adds what
/// it finds wrong to `wrong`; it throws Skip if it can't be tried, and RuntimeError if it fails.
class CheckPoints {
public:
    CheckPoints(const std::function<db::ConnectionPtr()>& connect, QStringList& wrong);
    ~CheckPoints();
    CheckPoints(const CheckPoints&) = delete;
    CheckPoints& operator=(const CheckPoints&) = delete;

    const db::ConnectionPtr& connection() const { return ours_; }
    const ServerWords& words() const { return words_; }
    /// Returns what the server says of itself, or why it says nothing.
    QString fact(const QString& expression) const;

    void makesTables();  // first, since the others need these tables

    /// Prepares one of the following: empties the table, and opens the connections again that the last one has lost.
    void begin();
    void knowsColumns();
    void numbersRows();
    void bearsTriggers();
    void writesChanges();
    void keepsTransactions();
    void takesDeletedRowsBack();
    void noticesOthers();
    void waitsForLockedRows();
    void keepsTexts();
    void keepsDatesAndNumbers();
    void compares();
    void keepsVersions();
    void locks();
    void givesUp();
    void noticesLostConnections();

private:
    void expect(bool holds, const QString& otherwise);
    /// Notes if a step is not given up within its time, or if the connection is lost with it.
    void expectGivenUp(const std::function<void()>& step);
    void makeTable(const QString& name, const QStringList& columns);
    db::Recordset rows(const QString& condition = QStringLiteral("1=1")) const;
    void clear() const;

    const std::function<db::ConnectionPtr()>& connect_;
    db::ConnectionPtr ours_;
    db::ConnectionPtr others_;  // of another workstation
    const Server server_;
    const ServerWords& words_;
    const QString table_;
    const QString log_;
    QStringList made_;  // the tables that must go
    QStringList& wrong_;
};

}  // namespace kest::app
