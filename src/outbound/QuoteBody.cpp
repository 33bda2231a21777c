#include "outbound/QuoteBody.h"

#include "base/Helpers.h"
#include "base/modDBAccess.h"
#include "base/modLoggerEx.h"
#include "platform/RuntimeError.h"
#include "platform/database/Sql.h"
#include "platform/values.h"
#include "quotedata/NetworkCodes.h"
#include "quotedata/Rounding.h"

#include <cmath>

using namespace Qt::StringLiterals;

namespace kest {

namespace {

constexpr double taxRate = 0.1;

QString description(const db::Recordset& line, const QString& suffix = {})
{
    return QuoteClean(line.text(u"SCRIPT"_s) + suffix);
}

/// Returns a number of the line. Throws RuntimeError if it is Null.
double number(const db::Recordset& line, const QString& column)
{
    if (line.isNull(column))
        throw RuntimeError(NullValue,
                           u"The quote line \"%1\" has no value in %2."_s.arg(line.text(u"SCRIPT"_s), column));
    return toDouble(line.value(column));
}

bool isAboveZero(const db::Recordset& line, const QString& column)
{
    return !line.isNull(column) && toDouble(line.value(column)) > 0;
}

bool isZero(const db::Recordset& line, const QString& column)
{
    return !line.isNull(column) && toDouble(line.value(column)) == 0;
}

QString rounded(double amount)
{
    return numberText(RoundAmount(amount, 2));
}

}  // namespace

QuoteBody::QuoteBody(const QuoteKey& key, const QString& authorisedNumber)
    : reference(key.fullReference().trimmed()), isMainQuote(key.isMain()), isAuthorised(authorisedNumber.size() > 1)
{
    const auto& [q, s] = key;
    removeAndReplace =
        opened(sql("SELECT ITEMID, PARTNO, SCRIPT, RRHOUR, RR_RATE2, SEQ_NO FROM QUOTE2 WHERE "
                   "CATEGORY='R&R' AND PARTNO <> 'M' AND REPORT_ON='0' AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
    repair =
        opened(sql("SELECT ITEMID, PARTNO, SCRIPT, RAHOUR, RR_RATE2, SEQ_NO FROM QUOTE2 WHERE CATEGORY='RA' AND "
                   "REPORT_ON='0' AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
    mechanical =
        opened(sql("SELECT ITEMID, PARTNO, SCRIPT, RRHOUR, RR_RATE2, SEQ_NO FROM QUOTE2 WHERE CATEGORY='R&R' "
                   "AND PARTNO='M' AND REPORT_ON='0' AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
    miscellaneous =
        opened(sql("SELECT ITEMID, SCRIPT, VENDOR, UNITCOST, SEQ_NO FROM QUOTE2 WHERE CATEGORY='MIS' AND "
                   "REPORT_ON='0' AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
    partLines =
        opened(sql("SELECT ITEMID, SCRIPT, UNITCOST, RRHOUR, QTY, PARTNO, SEQ_NO, MARK FROM QUOTE2 WHERE "
                   "CATEGORY='PRT' AND REPORT_ON='0' AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
    paint =
        opened(sql("SELECT ITEMID, SCRIPT, PTHOUR, RR_RATE2, BLEND, SEQ_NO FROM QUOTE2 WHERE CATEGORY='PAINT' AND "
                   "REPORT_ON='0' AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
    otherPaint =
        opened(sql("SELECT ITEMID, SCRIPT, PTHOUR, OPG_RATE, BLEND, SEQ_NO FROM QUOTE2 WHERE CATEGORY='OPG' "
                   "AND REPORT_ON='0' AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
    sublet =
        opened(sql("SELECT QUOTE2.ITEMID, QUOTE2.SCRIPT, QUOTE2.UNITCOST, QUOTE2.VENDOR, QUOTE2.SEQ_NO, "
                   "QUOTE2.PARTNO, VENDOR.NAME, VENDOR.STREET, VENDOR.SUBURB, VENDOR.PHONE FROM QUOTE2 INNER JOIN "
                   "VENDOR ON QUOTE2.VENDOR = VENDOR.VENDOR_ID WHERE (QUOTE2.CATEGORY = 'MIS') AND REPORT_ON='0' "
                   "AND (QUOTE2.SUBQUOTE='{}') AND (QUOTE2.QTNNO = '{}')",
                   s, q));
    reportItem =
        opened(sql("SELECT ITEMID, SCRIPT, RRHOUR, RAHOUR, PTHOUR, RR_RATE2, SEQ_NO FROM QUOTE2 WHERE "
                   "REPORT_ON=1 AND SUBQUOTE='{}' AND QTNNO='{}'",
                   s, q));
}

double QuoteBody::addTo(const Branch& request)
{
    const Branch body = request.add("quoteBody");
    body.add("quoteReference", reference);
    body.add("quoteType", isAuthorised ? u"S"_s : u"R"_s);
    addLabours(body.add("labours"));
    body.add("labourTotal", rounded(labourSum));
    addPaints(body.add("paints"));
    body.add("paintTotal", numberText(paintSum));
    addParts(body.add("parts"));
    body.add("partTotal", rounded(partSum));
    body.add("partMarkUpTotal", rounded(markUpSum));

    const double net = RoundAmount(labourSum + paintSum + partSum + markUpSum, 2);
    const double tax = RoundAmount(net * taxRate, 2);
    const double total = RoundAmount(tax + net, 2);
    body.add("gst", numberText(tax));
    body.add("quoteTotal", numberText(total));
    if (total == 0)
        return 0;

    // the report items and sublets of an authorised quote get numbers, but are not sent
    if (isAuthorised) {
        addReportItems(nullptr);
        addSublets(nullptr);
    } else {
        const Branch reportItems = body.add("reportItems");
        addReportItems(&reportItems);
        const Branch sublets = body.add("sublets");
        addSublets(&sublets);
    }
    return total;
}

void QuoteBody::walk(db::Recordset& lines, const Branch* section, const char* element, const Elements& elements,
                     const Skip& skip)
{
    for (; !lines.eof(); lines.moveNext()) {
        if (skip && skip(lines))
            continue;
        const QString lineNumber = QString::number(numbers.NextDocumentLine(lines.text(u"SEQ_NO"_s)));
        const Leaves leaves = elements(lines);
        lines.set(u"SEQ_NO"_s, lineNumber);
        lines.update();
        if (section) {
            const Branch line = section->add(element);
            line.add("quoteLineNumber", lineNumber);
            line.add(leaves);
        }
    }
}

void QuoteBody::addLabours(const Branch& labours)
{
    const auto labourLine = [](const LabourType& type, const Line& line, const QString& amount) {
        return Leaves{
            {"labourType", always, type.code},
            {"labourDescription", always, description(line)},
            {"labourAmount", always, amount},
        };
    };
    const auto unrounded = [&](const LabourType& type, const Line& line, double amount) {
        labourSum += amount;
        return labourLine(type, line, numberText(amount));
    };
    const auto hoursAtRate = [](const Line& line, const QString& hours) {
        return number(line, hours) * number(line, u"RR_RATE2"_s);
    };

    walk(removeAndReplace, &labours, "labour",
         [&](const Line& line) { return unrounded(labour::removeAndReplace, line, hoursAtRate(line, u"RRHOUR"_s)); });
    walk(
        repair, &labours, "labour",
        [&](const Line& line) {
            const double amount = hoursAtRate(line, u"RAHOUR"_s);
            labourSum = RoundAmount(labourSum + amount, 2);
            return labourLine(labour::repair, line, rounded(amount));
        },
        [](const Line& line) { return line.text(u"PARTNO"_s) == "M"_L1; });
    walk(
        miscellaneous, &labours, "labour",
        [&](const Line& line) {
            return unrounded(labour::other, line, SafeVal(line.text(u"UNITCOST"_s).trimmed(), u"0"_s));
        },
        [&](const Line& line) {
            // a line with a vendor is a sublet; a main quote sends it only with the sublets
            return isMainQuote ? isAboveZero(line, u"VENDOR"_s) : isZero(line, u"UNITCOST"_s);
        });
    walk(mechanical, &labours, "labour",
         [&](const Line& line) { return unrounded(labour::other, line, hoursAtRate(line, u"RRHOUR"_s)); });
}

void QuoteBody::addPaints(const Branch& paints)
{
    const auto paintAt = [&](const QString& rate) {
        return [this, rate](const Line& line) {
            const double amount = number(line, u"PTHOUR"_s) * number(line, rate);
            paintSum = RoundAmount(paintSum + amount, 2);
            return Leaves{
                {"paintWorkType", always, u"PAIN"_s},
                {"paintDescription", always, description(line, isTrue(line.value(u"BLEND"_s)) ? u" blend"_s : u""_s)},
                {"paintAmount", always, rounded(amount)},
            };
        };
    };
    walk(paint, &paints, "paint", paintAt(u"RR_RATE2"_s));
    walk(otherPaint, &paints, "paint", paintAt(u"OPG_RATE"_s));
}

void QuoteBody::addParts(const Branch& parts)
{
    walk(
        partLines, &parts, "part", [this](const Line& line) { return part(line); },
        [](const Line& line) { return isZero(line, u"QTY"_s); });
}

Leaves QuoteBody::part(const Line& line)
{
    const double quantity = number(line, u"QTY"_s);
    const double sign = quantity < 0 ? -1 : 1;  // for a returned part the price is negative, not the quantity
    const double count = std::abs(quantity);
    QString price = u"0"_s;
    QString amount = u"0"_s;
    QString markUpPercentage = u"0"_s;
    QString markUpAmount = u"0"_s;
    if (isAboveZero(line, u"UNITCOST"_s)) {
        const double cost = number(line, u"UNITCOST"_s);
        const double sellingPrice = number(line, u"RRHOUR"_s);
        price = rounded(cost * sign);
        amount = rounded(cost * count * sign);
        markUpPercentage = rounded((sellingPrice / cost) * 100 - 100);
        markUpAmount = rounded(toDouble(amount) * (toDouble(markUpPercentage) / 100));
    }
    partSum = RoundAmount(toDouble(amount) + partSum, 2);
    markUpSum = RoundAmount(toDouble(markUpAmount) + markUpSum, 2);

    const QString mark = line.text(u"MARK"_s);  // not trimmed: a load writes a single blank, which is a mark too
    return {
        filled("partNumber", mark.isEmpty() ? line.text(u"PARTNO"_s) : QString()),
        {"partType", always, partTypeOfMark(mark)},
        {"partDescription", always, description(line)},
        {"partQuantity", always, numberText(count)},
        {"partUnitPrice", always, price},
        {"partAmount", always, amount},
        {"partMarkUpPercentage", always, markUpPercentage},
        {"partMarkUpAmount", always, markUpAmount},
    };
}

void QuoteBody::addReportItems(const Branch* reportItems)
{
    walk(reportItem, reportItems, "reportItem", [](const Line& line) {
        return Leaves{{"reportItemDescription", always, description(line)}};
    });
}

void QuoteBody::addSublets(const Branch* sublets)
{
    db::Recordset types = opened(u"SELECT Type, Script FROM SUBLET WHERE Sublet=1"_s);
    const auto subletType = [&](const QString& partNumber) {
        if (types.recordCount() > 0)
            types.moveFirst();
        types.find(u"Type"_s, partNumber);
        return types.eof() ? u"OTH"_s : types.text(u"Type"_s);
    };
    sublet.requery();  // in a supplementary quote they have got their numbers with the labour lines
    walk(sublet, sublets, "sublet", [&](const Line& line) {
        return Leaves{
            {"subletType", always, subletType(line.text(u"PARTNO"_s))},
            {"subletDescription", always, description(line)},
            {"subletRepairer", always, line.text(u"NAME"_s).trimmed().left(30)},
        };
    });
}

}  // namespace kest
