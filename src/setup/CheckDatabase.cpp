#include "setup/CheckDatabase.h"

#include "platform/RuntimeError.h"
#include "platform/database/Session.h"
#include "setup/CheckPoints.h"
#include "setup/HostTables.h"
#include "setup/PrepareDatabase.h"

#include <algorithm>
#include <utility>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

const std::pair<QString, void (CheckPoints::*)()> points[] = {
    {u"the columns of a query are known, in a join too"_s, &CheckPoints::knowsColumns},
    {u"a new row gets its number and its defaults"_s, &CheckPoints::numbersRows},
    {u"triggers change neither the number of a new row nor the count of changed rows"_s, &CheckPoints::bearsTriggers},
    {u"a change is written, also one to the same value"_s, &CheckPoints::writesChanges},
    {u"a transaction is committed or taken back whole"_s, &CheckPoints::keepsTransactions},
    {u"a deleted row can be put back with its number"_s, &CheckPoints::takesDeletedRowsBack},
    {u"what someone else has changed is not overwritten"_s, &CheckPoints::noticesOthers},
    {u"a row that someone else has locked is not waited for too long"_s, &CheckPoints::waitsForLockedRows},
    {u"texts of any length come back letter by letter"_s, &CheckPoints::keepsTexts},
    {u"dates and numbers come back as they were"_s, &CheckPoints::keepsDatesAndNumbers},
    {u"a comparison means what it means on other databases"_s, &CheckPoints::compares},
    {u"a row with a version column can be changed"_s, &CheckPoints::keepsVersions},
    {u"a named lock keeps others out"_s, &CheckPoints::locks},
    {u"a statement that takes too long is given up"_s, &CheckPoints::givesUp},
    {u"a lost connection is noticed and can be opened again"_s, &CheckPoints::noticesLostConnections}};

class Check {
public:
    explicit Check(const std::function<db::ConnectionPtr()>& connect) : points_(connect, wrong_) {}

    DatabaseCheck run();

private:
    void point(const QString& what, const std::function<void()>& step);
    void lookAtHost();

    QStringList wrong_;  // about the point in hand
    CheckPoints points_;
    DatabaseCheck check_;
};

DatabaseCheck Check::run()
{
    check_.facts = points_.connection()->session().engine().versions();
    for (const auto& [name, expression] : points_.words().facts)
        check_.facts.append({name, points_.fact(expression)});

    point(u"a table can be made"_s, [this] { points_.makesTables(); });
    for (const auto& [what, step] : points) {
        point(what, [this, step = step] {
            points_.begin();
            (points_.*step)();
        });
    }
    point(u"the quote tables have every column that is used"_s, [this] { lookAtHost(); });
    return check_;
}

void Check::point(const QString& what, const std::function<void()>& step)
{
    wrong_.clear();
    CheckedPoint checked{.what = what, .result = CheckedPoint::Result::Holds, .why = {}};
    try {
        step();
    } catch (const Skip& skip) {
        checked.result = CheckedPoint::Result::Skipped;
        checked.why = skip.why;
    } catch (const RuntimeError& error) {
        wrong_ += u"%1 %2"_s.arg(error.number()).arg(error.description());
    }
    if (!wrong_.isEmpty()) {
        checked.result = CheckedPoint::Result::Fails;
        checked.why = wrong_.join(u"; "_s);
    }
    check_.points += checked;
}

void Check::lookAtHost()
{
    const HostTables host = lookAtHostTables(points_.connection());
    wrong_ = host.missing;
    check_.notes = host.notes;
    for (const MissingPart& part : missingParts(points_.connection()))
        check_.notes += u"there is no %1; --prepare creates it"_s.arg(part.what);
}

}  // namespace

bool DatabaseCheck::holds() const
{
    return std::none_of(points.begin(), points.end(),
                        [](const CheckedPoint& point) { return point.result == CheckedPoint::Result::Fails; });
}

DatabaseCheck checkDatabase(const std::function<db::ConnectionPtr()>& connect)
{
    return Check(connect).run();
}

}  // namespace kest::app
