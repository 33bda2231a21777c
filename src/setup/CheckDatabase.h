// Tries on a database what the component relies on, for a person who has just connected it.
#pragma once

#include "platform/database/Connection.h"

#include <QList>
#include <QString>
#include <QStringList>

#include <functional>
#include <utility>

namespace kest::app {

/// Something that the component relies on, and whether the database does it.
struct CheckedPoint {
    enum class Result { Holds, Fails, Skipped };
    QString what;
    Result result = Result::Holds;
    QString why;  // what was found instead, or why it could not be tried
};

/// The result of a check.
struct DatabaseCheck {
    QList<std::pair<QString, QString>> facts;  // what the server, its driver and the database say of themselves
    QList<CheckedPoint> points;
    QStringList notes;  // what is worth knowing about the host's tables

    /// Returns false if any point fails.
    bool holds() const;
};

/// Works in scratch tables of its own, named KEST2_CHECK_ and a random number, and removes them at the end, after a
/// failure too. The host's tables are only read. `connect` opens a connection to the database: the check needs two, and
/// a new one after it has let the server drop one.
DatabaseCheck checkDatabase(const std::function<db::ConnectionPtr()>& connect);

}  // namespace kest::app
