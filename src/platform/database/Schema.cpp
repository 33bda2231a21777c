#include "platform/database/Schema.h"

#include "platform/database/ColumnValues.h"

#include <QRegularExpression>

#include <algorithm>

namespace kest::db {

using namespace Qt::StringLiterals;

const TableColumn* TableInfo::column(const QString& columnName) const
{
    const auto found = std::find_if(columns.begin(), columns.end(), [&](const TableColumn& column) {
        return column.name.compare(columnName, Qt::CaseInsensitive) == 0;
    });
    return found == columns.end() ? nullptr : &*found;
}

const TableColumn* TableInfo::identity() const
{
    const auto found =
        std::find_if(columns.begin(), columns.end(), [](const TableColumn& column) { return column.identity; });
    return found == columns.end() ? nullptr : &*found;
}

QVariant fixedDefault(QString text, Kind kind)
{
    while (text.startsWith(u'(') && text.endsWith(u')'))
        text = text.sliced(1, text.size() - 2);
    static const QRegularExpression literal(u"\\A(?:N?'((?:[^']|'')*)'|([-+]?[0-9.]+))\\z"_s);
    const QRegularExpressionMatch match = literal.match(text);
    if (!match.hasMatch())
        return {};
    const bool isNumber = match.hasCaptured(2);
    return normalised(isNumber ? match.captured(2) : match.captured(1).replace(u"''"_s, u"'"_s), kind);
}

Kind kindOfType(const QString& declaredType)
{
    const QString type = declaredType.toUpper();
    const auto has = [&](QLatin1StringView word) { return type.contains(word); };
    if (type.startsWith("BIT"_L1) || has("BOOL"_L1))
        return Kind::Flag;
    if (has("LONG"_L1) && (has("TEXT"_L1) || has("CHAR"_L1)))
        return Kind::LongText;
    if (has("CLOB"_L1) || has("MEMO"_L1) || has("MEDIUMTEXT"_L1))
        return Kind::LongText;
    if (has("INT"_L1))
        return Kind::WholeNumber;
    if (has("REAL"_L1) || has("FLOA"_L1) || has("DOUB"_L1) || has("DEC"_L1) || has("NUM"_L1) || has("MONEY"_L1))
        return Kind::Number;
    if (has("DATE"_L1) || has("TIME"_L1))
        return Kind::Date;
    return Kind::Text;
}

}  // namespace kest::db
