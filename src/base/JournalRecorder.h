// Records what the connection shows of the changes of an operation.
#pragma once

#include "platform/database/Change.h"
#include "platform/database/Connection.h"

#include <QList>
#include <QString>
#include <QStringList>

#include <functional>

namespace kest::journal {

/// Sees the changes of the connection, and writes each to the journal while an operation is at work.
class Recorder final : public db::ChangeObserver {
public:
    /// Looks whether a database can keep a journal. If it can't, the error log says so once for each reason. Throws if
    /// the database does not answer.
    void start(const db::Connection& connection);
    void stop();
    bool isKept() const { return isKept_; }

    /// Inserts the operation's row before its first change.
    void openNow();
    /// Records changes of the operation at work.
    void record(const QList<db::RowChange>& rows);

    bool observes(const QString& table) const override;
    QStringList wantedColumns() const override;
    void aboutToChange() override;
    void changed(db::Connection& connection, const QList<db::RowChange>& rows) override;
    void committed() override;
    void takenBack() override;

private:
    void unlessForbidden(const std::function<void()>& step);
    void write(const QList<db::RowChange>& rows);

    bool isKept_ = false;
    bool hasRights_ = false;  // known for this connection
};

}  // namespace kest::journal
