#include "inbound/NextNumbers.h"

#include "base/Helpers.h"
#include "base/QuoteKey.h"
#include "base/SharedVariables.h"
#include "base/modDBAccess.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/files/files.h"
#include "platform/values.h"
#include "sublets/SubletDocuments.h"

#include <QSet>

#include <algorithm>
#include <array>
#include <functional>
#include <span>
#include <utility>

namespace kest {

using namespace Qt::StringLiterals;

namespace {

using CodeRange = std::pair<int, int>;  // first and last

constexpr int mostNumbers = 256;  // of quotes, in one statement

constexpr CodeRange labourCodes[] = {{137, 151}, {287, 303}, {447, 459}};
constexpr CodeRange otherPaintCodes[] = {{153, 155}, {304, 306}, {462, 464}};
constexpr CodeRange partCodes[] = {{780, 800}};
constexpr CodeRange miscellaneousCodes[] = {{990, 994}, {997, 998}};

struct CodePool {
    QLatin1StringView category;
    std::span<const CodeRange> codes;
};

const CodePool codePools[] = {
    {"R&R"_L1, labourCodes},     {"RA"_L1, labourCodes}, {"PAINT"_L1, labourCodes},
    {"OPG"_L1, otherPaintCodes}, {"PRT"_L1, partCodes},  {"MIS"_L1, miscellaneousCodes},
};

std::span<const CodeRange> codesOf(const QString& category)
{
    for (const CodePool& pool : codePools) {
        if (pool.category == category)
            return pool.codes;
    }
    return {};
}

bool isTaken(db::Recordset& rows, const QString& code)
{
    rows.moveFirst();
    rows.find(u"itemno"_s, code);
    return !rows.eof();
}

/// Returns the first code in the ranges that no row has, or an empty text if all are taken.
QString freeCode(db::Recordset& rows, std::span<const CodeRange> ranges)
{
    for (const auto& [first, last] : ranges) {
        for (int code = first; code <= last; ++code) {
            if (!isTaken(rows, QString::number(code)))
                return QString::number(code);
        }
    }
    return {};
}

/// Returns the first number that no quote has, or the last one if all are taken.
QString firstFree(const QStringList& numbers, const std::function<QString(const QString& number)>& searched)
{
    QStringList pasted;
    for (const QString& number : numbers)
        pasted += sql("'{}'", searched(number));
    db::Recordset taken = opened(sql("SELECT QTNNO FROM QUOTE1 WHERE QTNNO IN (") + pasted.join(u", "_s) + u')');
    for (const QString& number : numbers) {
        if (taken.recordCount() == 0)
            return number;
        taken.moveFirst();
        taken.find(u"QTNNO"_s, searched(number));
        if (taken.eof())
            return number;
    }
    return numbers.constLast();
}

/// The last number that NextLineNumber() returned, and its quote.
struct LastNumber {
    QuoteKey quote{{}, {}};
    qint64 number = 0;
};
LastNumber lastNumber;

}  // namespace

std::unique_ptr<db::Lock> lockNewQuotes()
{
    constexpr int patience = 20;  // seconds; a load holds the lock for less than one
    auto lock = std::make_unique<db::Lock>(gConn, u"new quote"_s, patience);
    if (!lock->isHeld())
        throw RuntimeError(StatementFailed, u"Another workstation is creating a quote."_s);
    return lock;
}

QString NextQuoteNumber(const QString& given, const db::Recordset& cinfo, db::Recordset& quote, bool valueOnly)
{
    const QString prefix = cinfo.text(u"QUOTE_PRE"_s);
    const QString suffix = cinfo.text(u"QUOTE_SUF"_s);
    const auto searched = [&](const QString& number) { return valueOnly ? prefix + number + suffix : number; };
    const auto isTaken = [&](const QString& number) {
        if (quote.isOpen())
            quote.close();
        quote.open(sql("SELECT * FROM QUOTE1 WHERE QTNNO='{}'", searched(number)));
        return !quote.eof();
    };
    const auto counted = [&](const QString& value) { return valueOnly ? value : prefix + value + suffix; };

    const bool usable = given != u"MANQ"_s && given.size() >= 2 && given.size() <= 8;
    QString number = usable ? given : counted(toText(cinfo.value(u"QUOTE_VAL"_s)));
    qint64 counter = 0;
    // More and more at a time: manual quotes take numbers, but don't move the counter.
    for (int count = 1; isTaken(number); count = std::min(count * 4, mostNumbers)) {
        QStringList next;
        for (int i = 0; i < count; ++i)
            next += counted(QString::number(toLong(cinfo.value(u"QUOTE_VAL"_s)) + ++counter));
        number = count == 1 ? next.constFirst() : firstFree(next, searched);
    }
    return number;
}

int NextImageNumber(const QString& quoteNumber, const QStringList& images)
{
    int highest = 0;
    for (const QString& name : images) {
        // the digits follow the quote number, "_" and the digit of the subquote; names match in any case
        if (!name.startsWith(quoteNumber + u'_', Qt::CaseInsensitive))
            continue;
        bool isNumber = false;
        const int number = name.sliced(quoteNumber.size()).mid(2, 3).toInt(&isNumber);
        if (isNumber)
            highest = qMax(highest, number);
    }
    return highest + 1;
}

qint64 NextLineNumber(qint64 number, const QString& qtnno, const QString& subquote)
{
    if (number > 0)
        return number;
    const QuoteKey quote{qtnno, subquote};
    if (lastNumber.quote != quote) {
        const db::Recordset rows =
            opened(sql("SELECT MAX(SEQ_NO) FROM QUOTE2 WHERE QTNNO='{}' AND SUBQUOTE='{}'", qtnno, subquote));
        lastNumber = {quote, toLong(rows.value(rows.columns().constFirst()))};
    }
    return ++lastNumber.number;
}

void forgetLineNumbers()
{
    lastNumber = {};
}

QString NextItemNo(db::Recordset& rsLines)
{
    QString chosen = u"999"_s;
    const int position = rsLines.absolutePosition();
    attempt([&] {
        const QString code = freeCode(rsLines, codesOf(rsLines.text(u"category"_s).trimmed()));
        if (!code.isEmpty())
            chosen = code;
    });
    attempt([&] {  // even after a failure, because the caller sets the code in this row
        rsLines.moveFirst();
        rsLines.setAbsolutePosition(position);
    });
    return chosen;
}

qint64 NextDocumentLine(qint64 highest)
{
    for (const QString& name : files::list(subletFolder())) {
        if (name.startsWith(u'.') || GetExtensionUpper(name) != u"PDF"_s)  // a name with a dot in front is hidden
            continue;
        const QString lastCharacter = name.left(name.lastIndexOf(u'.')).right(1);
        highest = qMax(highest, qint64(leadingNumber(lastCharacter)));
    }
    return highest + 1;
}

QString NextDocumentName(const QString& qtnno, const QString& subquote, qint64 number)
{
    if (qtnno.isEmpty() || subquote.isEmpty())
        return {};
    const QuoteKey quote{qtnno, subquote};
    QSet<qint64> taken;
    qint64 highest = 0;
    for (const QString& name : files::list(subletFolder(), u"*pdf"_s)) {
        bool isNumber = false;
        const qint64 found = name.section(u'_', -1).section(u'.', 0, 0).toLongLong(&isNumber);
        if (!quote.begins(name) || !isNumber || !name.contains(u'_'))
            continue;
        taken.insert(found);
        highest = qMax(highest, found);
    }
    const qint64 free = taken.contains(number) ? highest + 1 : number;
    return files::pathForWriting(subletFolder(), quote.filePrefix() + QString::number(free) + u".pdf"_s);
}

}  // namespace kest
