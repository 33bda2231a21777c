#include "app/DatabaseCommand.h"

#include "base/modDBAccess.h"
#include "platform/Prompt.h"
#include "setup/CheckDatabase.h"
#include "setup/PrepareDatabase.h"

#include <QJsonArray>

namespace kest::app {

using namespace Qt::StringLiterals;

namespace {

QString wordFor(CheckedPoint::Result result)
{
    return result == CheckedPoint::Result::Holds   ? u"holds"_s
           : result == CheckedPoint::Result::Fails ? u"fails"_s
                                                   : u"skipped"_s;
}

/// Shows the statements that create what the database lacks, and executes them unless the answer is No.
void prepare(const db::ConnectionPtr& connection)
{
    const QList<MissingPart> parts = missingParts(connection);
    if (parts.isEmpty())
        return;
    QString statements;
    for (const MissingPart& part : parts)
        statements += part.statements.join(u";\n"_s) + u";\n"_s;
    if (desktop::ask(u"These statements create what the database lacks:\n\n"_s + statements + u"\nExecute them?"_s,
                     desktop::Icon::Question, u"check-database"_s))
        createParts(connection, parts);
}

}  // namespace

Outcome checkDatabase(const QStringList& arguments)
{
    if (!arguments.isEmpty()) {
        if (arguments[0] != u"--prepare"_s)
            return refused(u"check-database takes only --prepare"_s, Usage);
        prepare(gcnDB);
    }
    const DatabaseCheck check = checkDatabase(anotherConnection);
    QString text;
    QJsonObject facts;
    for (const auto& [name, value] : check.facts) {
        facts[name] = value;
        text += name + u": "_s + value + u'\n';
    }
    QJsonArray points;
    text += u'\n';
    for (const CheckedPoint& point : check.points) {
        const QString result = wordFor(point.result);
        points += QJsonObject{{u"point"_s, point.what}, {u"result"_s, result}, {u"why"_s, point.why}};
        text += result.leftJustified(9) + point.what + (point.why.isEmpty() ? u"\n"_s : u": "_s + point.why + u'\n');
    }
    for (const QString& note : check.notes)
        text += u"note     "_s + note + u'\n';
    text += check.holds() ? u"\nThe database can be used.\n"_s : u"\nThe database can't be used as it is.\n"_s;
    return {
        .exitCode = check.holds() ? Done : Refused,
        .fields = {{u"facts"_s, facts}, {u"points"_s, points}, {u"notes"_s, QJsonArray::fromStringList(check.notes)}},
        .text = text};
}

}  // namespace kest::app
