#include "platform/database/Engine.h"

#include "platform/RuntimeError.h"
#include "platform/database/FaultInjection.h"
#include "platform/values.h"

#include <QDateTime>
#include <QRegularExpression>
#include <QSqlField>
#include <QSqlQuery>
#include <QSqlRecord>

#include <atomic>
#include <cmath>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

std::function<bool()> statementFault;
int statementFaultNumber = StatementFailed;

QString nextConnectionName()
{
    static std::atomic<int> last{0};
    return u"kest2-"_s + QString::number(++last);
}

Kind kindOfValue(const QVariant& value)
{
    switch (value.typeId()) {
        case QMetaType::Bool:
            return Kind::Flag;
        case QMetaType::Int:
        case QMetaType::UInt:
        case QMetaType::LongLong:
        case QMetaType::ULongLong:
            return Kind::WholeNumber;
        case QMetaType::Double:
        case QMetaType::Float:
            return Kind::Number;
        case QMetaType::QDate:
        case QMetaType::QDateTime:
            return Kind::Date;
        default:
            return Kind::Text;
    }
}

/// Most values come in the type of their kind already, and stay as they are.
bool isNormal(const QVariant& value, Kind kind)
{
    const int type = value.typeId();
    switch (kind) {
        case Kind::Text:
        case Kind::LongText:
            return type == QMetaType::QString && !value.isNull();
        case Kind::WholeNumber:
            return type == QMetaType::LongLong && !value.isNull();
        case Kind::Number:
            return type == QMetaType::Double && !value.isNull();
        default:
            return false;
    }
}

QString textOf(const QVariant& value)
{
    if (value.typeId() == QMetaType::QByteArray)
        return QString::fromUtf8(value.toByteArray());
    return value.typeId() == QMetaType::QString ? value.toString() : toText(value);
}

/// "yyyy-MM-dd HH:mm:ss", the form in which dates are stored, without the cost of a general parser.
QDateTime storedDate(const QString& text)
{
    if (text.size() != 19 || text[4] != u'-' || text[7] != u'-' || text[10] != u' ' || text[13] != u':')
        return {};
    const auto number = [&](int start, int length) { return QStringView(text).sliced(start, length).toInt(); };
    const QDate date(number(0, 4), number(5, 2), number(8, 2));
    const QTime time(number(11, 2), number(14, 2), number(17, 2));
    return date.isValid() && time.isValid() ? columnDate(date, time) : QDateTime();
}

QVariant asDate(const QVariant& value)
{
    if (value.typeId() == QMetaType::QDateTime)
        return columnDate(value.toDateTime().date(), value.toDateTime().time());
    if (value.typeId() == QMetaType::QDate)
        return columnDate(value.toDate(), QTime(0, 0));
    const QString text = textOf(value);
    if (const QDateTime stored = storedDate(text); stored.isValid())
        return stored;
    const std::optional<QDateTime> read = dateIn(text);
    return read ? QVariant(*read) : QVariant(text);
}

QVariant asNumber(const QVariant& value, Kind kind)
{
    std::optional<double> number;
    switch (kindOfValue(value)) {
        case Kind::Flag:
            return kind == Kind::Number ? QVariant(value.toBool() ? 1.0 : 0.0) : QVariant(qint64(value.toBool()));
        case Kind::WholeNumber:
            return kind == Kind::Number ? QVariant(value.toDouble()) : QVariant(value.toLongLong());
        case Kind::Number:
            number = value.toDouble();
            break;
        default:
            number = numberIn(textOf(value));
            break;
    }
    if (!number)
        return textOf(value);
    const bool whole = kind == Kind::WholeNumber && std::floor(*number) == *number && std::abs(*number) < 9.2e18;
    return whole ? QVariant(qint64(*number)) : QVariant(*number);
}

QVariant asFlag(const QVariant& value)
{
    if (kindOfValue(value) != Kind::Text)
        return value.toDouble() != 0;
    const QString text = textOf(value);
    if (text.size() == 1 && text[0] < u' ')  // a bit that arrives as one raw byte
        return text[0] != u'\0';
    if (const std::optional<double> number = numberIn(text))
        return *number != 0;
    if (text.compare(u"true"_s, Qt::CaseInsensitive) == 0 || text.compare(u"false"_s, Qt::CaseInsensitive) == 0)
        return text.size() == 4;
    return text;
}

}  // namespace

void setStatementFault(std::function<bool()> fault, int number)
{
    statementFault = std::move(fault);
    statementFaultNumber = number;
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

QVariant normalised(const QVariant& value, Kind kind)
{
    if (value.isNull())
        return {};
    switch (kind) {
        case Kind::Text:
        case Kind::LongText:
            return textOf(value);
        case Kind::WholeNumber:
        case Kind::Number:
            return asNumber(value, kind);
        case Kind::Flag:
            return asFlag(value);
        case Kind::Date:
            return asDate(value);
    }
    return value;
}

Engine::Engine(const QString& driver) : connectionName(nextConnectionName())
{
    database = QSqlDatabase::addDatabase(driver, connectionName);
}

Engine::~Engine()
{
    database.close();
    database = {};
    QSqlDatabase::removeDatabase(connectionName);
}

void Engine::openDatabase()
{
    if (!database.open()) {
        const QSqlError error = database.lastError();
        throw RuntimeError(CannotOpen, error.databaseText().isEmpty() ? error.driverText() : error.databaseText())
            .withDatabaseCodes(error.nativeErrorCode(), sqlState(error));
    }
    open_ = true;
}

Rows Engine::select(const QString& statement)
{
    return selectNative(translated(statement, dialect(), *this));
}

qint64 Engine::execute(const QString& statement)
{
    static const QRegularExpression definition(u"\\A\\s*(CREATE|ALTER|DROP)\\b"_s,
                                               QRegularExpression::CaseInsensitiveOption);
    const qint64 hit = executeNative(translated(statement, dialect(), *this));
    if (definition.match(statement).hasMatch())
        forgetSchema();
    return hit;
}

Rows Engine::selectNative(const QString& statement)
{
    checkFault();
    QSqlQuery query(database);
    run(query, statement);
    const QList<ResultColumn> columns = describe(query);
    Rows rows = fetch(query);
    rows.columns = columns;
    const size_t width = size_t(columns.size());
    for (size_t column = 0; column < width; ++column) {
        ResultColumn& described = rows.columns[qsizetype(column)];
        for (size_t i = column; described.table.isEmpty() && i < rows.values.size(); i += width) {
            if (rows.values[i].isNull())
                continue;
            described.kind = kindOfValue(rows.values[i]);
            break;
        }
        for (size_t i = column; i < rows.values.size(); i += width) {
            if (!isNormal(rows.values[i], described.kind))
                rows.values[i] = normalised(rows.values[i], described.kind);
        }
    }
    return rows;
}

qint64 Engine::executeNative(const QString& statement)
{
    checkFault();
    QSqlQuery query(database);
    run(query, statement);
    return query.numRowsAffected();
}

QVariant Engine::insert(const TableInfo& info, const QStringList& columns, const QStringList& literals)
{
    checkFault();
    QSqlQuery query(database);
    run(query,
        u"INSERT INTO "_s + quoted(info.name) + u' ' +
            (columns.isEmpty() ? defaultsOnly()
                               : u'(' + columns.join(u", "_s) + u") VALUES ("_s + literals.join(u", "_s) + u')'));
    if (!info.identity())
        return {};
    const QVariant identity = lastIdentity(query);
    return identity.isNull() ? QVariant() : QVariant(identity.toLongLong());
}

QVariant Engine::lastIdentity(QSqlQuery& query)
{
    return query.lastInsertId();
}

Rows Engine::ask(const QString& statement)
{
    QSqlQuery query(database);
    run(query, statement);
    return fetch(query);
}

void Engine::tell(const QString& statement)
{
    QSqlQuery query(database);
    run(query, statement);
}

void Engine::run(QSqlQuery& query, const QString& statement)
{
    if (!open_)
        throw RuntimeError(CannotOpen, u"The connection to the database has gone."_s);
    query.setForwardOnly(true);
    beforeStatement();
    if (!query.exec(statement))
        fail(query.lastError());
}

void Engine::checkFault()
{
    if (!statementFault || !statementFault())
        return;
    if (statementFaultNumber == CannotOpen)
        open_ = false;
    throw RuntimeError(statementFaultNumber, u"A fault set by a test."_s).withDatabaseCodes(u"0"_s, u"HY000"_s);
}

void Engine::fail(const QSqlError& error)
{
    const bool lost = meansConnectionLost(error);
    const QString description = error.databaseText().isEmpty() ? error.driverText() : error.databaseText();
    const QString state = sqlState(error);
    if (lost)
        open_ = false;
    throw RuntimeError(lost ? CannotOpen : StatementFailed, description)
        .withDatabaseCodes(error.nativeErrorCode(), state);
}

Rows Engine::fetch(QSqlQuery& query)
{
    Rows rows;
    rows.columns.resize(query.record().count());
    while (query.next()) {
        for (int column = 0; column < rows.columns.size(); ++column)
            rows.values.push_back(query.value(column));
    }
    if (query.lastError().isValid())
        fail(query.lastError());
    return rows;
}

QList<ResultColumn> Engine::describe(const QSqlQuery& query)
{
    const QSqlRecord record = query.record();
    QList<ResultColumn> columns;
    for (int i = 0; i < record.count(); ++i) {
        ResultColumn column;
        column.name = record.fieldName(i);
        const QString reported = baseTable(query, i, record.field(i).tableName());
        const TableInfo* info = reported.isEmpty() ? nullptr : table(reported);
        if (const TableColumn* base = info ? info->column(column.name) : nullptr) {
            column.table = info->name;
            column.kind = base->kind;
            column.size = base->size;
        }
        columns.append(column);
    }
    return columns;
}

QString Engine::baseTable(const QSqlQuery&, int, const QString& reported) const
{
    return reported;
}

const TableInfo* Engine::table(const QString& name)
{
    const QString key = name.toLower();
    const auto known = tables.constFind(key);
    if (known != tables.constEnd())
        return known->get();
    const QString spelling = tableSpelling(name);
    std::shared_ptr<TableInfo> read = spelling.isEmpty() ? nullptr : readTable(spelling);
    if (!read || read->columns.isEmpty())
        return nullptr;
    return tables.insert(key, std::move(read))->get();
}

QString Engine::tableSpelling(const QString& name)
{
    if (!spellingsKnown) {
        for (const QString& table : tableNames())
            spellings.insert(table.toLower(), table);
        spellingsKnown = true;
    }
    return spellings.value(name.toLower());
}

void Engine::forgetSchema()
{
    spellings.clear();
    tables.clear();
    spellingsKnown = false;
}

QString Engine::quoted(const QString& identifier) const
{
    const Dialect wanted = dialect();
    QString inner = identifier;
    inner.replace(wanted.closeQuote, QString(2, wanted.closeQuote));
    return wanted.openQuote + inner + wanted.closeQuote;
}

QString Engine::literal(const QVariant& value) const
{
    if (value.isNull())
        return u"NULL"_s;
    switch (value.typeId()) {
        case QMetaType::Bool:
            return value.toBool() ? u"1"_s : u"0"_s;
        case QMetaType::LongLong:
            return QString::number(value.toLongLong());
        case QMetaType::Double:
            if (!std::isfinite(value.toDouble()))
                throw RuntimeError(Overflow, u"Overflow"_s);
            return QString::number(value.toDouble(), 'g', QLocale::FloatingPointShortest);
        case QMetaType::QDateTime: {
            const QDateTime date = value.toDateTime();
            const QString separator = dialect().isoDates ? u"T"_s : u" "_s;
            const QString fraction = date.time().msec() == 0 ? QString() : u".zzz"_s;
            return u'\'' + date.toString(u"yyyy-MM-dd"_s) + separator + date.toString(u"HH:mm:ss"_s + fraction) + u'\'';
        }
        default: {
            QString text = value.toString();
            text.replace(u'\'', u"''"_s);
            if (dialect().backslashEscapes)
                text.replace(u'\\', u"\\\\"_s);
            return u'\'' + text + u'\'';
        }
    }
}

QString Engine::holds(const QString& column, Kind kind, const QVariant& value) const
{
    const QString name = quoted(column);
    if (value.isNull())
        return name + u" IS NULL"_s;
    if (kind == Kind::Flag && value.typeId() == QMetaType::Bool)
        return name + (value.toBool() ? u"<>0"_s : u"=0"_s);
    if (kind == Kind::Date && value.typeId() == QMetaType::QDateTime)
        return sameDate(name, literal(value));
    if (kind == Kind::LongText)
        return sameLongText(name, literal(value));
    return name + u'=' + literal(value);
}

QString Engine::sameDate(const QString& column, const QString& dateLiteral) const
{
    return column + u'=' + dateLiteral;
}

/// The drivers of the servers keep the state to themselves; it follows from the server's own code.
QString Engine::sqlState(const QSqlError& error)
{
    static const QHash<int, QString> states{
        {1044, u"42000"_s}, {1045, u"28000"_s}, {1049, u"42000"_s}, {1054, u"42S22"_s}, {1062, u"23000"_s},
        {1064, u"42000"_s}, {1146, u"42S02"_s}, {1205, u"40001"_s}, {1969, u"70100"_s}, {2002, u"08001"_s},
        {2003, u"08001"_s}, {2005, u"08001"_s}, {2006, u"08S01"_s}, {2013, u"08S01"_s}, {102, u"42000"_s},
        {207, u"42S22"_s},  {208, u"42S02"_s},  {2601, u"23000"_s}, {2627, u"23000"_s}, {4060, u"42000"_s},
        {18456, u"28000"_s}};
    return states.value(error.nativeErrorCode().section(u';', 0, 0).toInt(), u"HY000"_s);
}

static QString serverLock(const QString& literal)
{
    return u"SHA1(CONCAT(DATABASE(), '/', "_s + literal + u"))"_s;  // a name may have 64 characters
}

bool Engine::lockOnServer(const QString& name, int seconds)
{
    return ask(u"SELECT GET_LOCK(%1, %2)"_s.arg(serverLock(literal(name))).arg(seconds)).values.front().toInt() == 1;
}

void Engine::unlockOnServer(const QString& name)
{
    tell(u"DO RELEASE_LOCK(%1)"_s.arg(serverLock(literal(name))));
}

std::unique_ptr<TableInfo> Engine::fromInformationSchema(const QString& name, const InformationSchemaTerms& terms)
{
    auto info = std::make_unique<TableInfo>();
    info->name = name;
    const QString ofTable = u"TABLE_NAME="_s + literal(name) + u" AND "_s + terms.ofDatabase;
    const Rows columns =
        ask(u"SELECT COLUMN_NAME, "_s + terms.type + u", CHARACTER_MAXIMUM_LENGTH, COLUMN_DEFAULT, "_s +
            terms.identity + u" FROM INFORMATION_SCHEMA.COLUMNS WHERE "_s + ofTable + u" ORDER BY ORDINAL_POSITION"_s);
    for (size_t i = 0; i < columns.values.size(); i += 5) {
        const QVariant* row = &columns.values[i];
        TableColumn column;
        column.name = textOf(row[0]);
        column.kind = kindOfType(textOf(row[1]));
        column.size = column.kind == Kind::Text && row[2].toLongLong() < 65536 ? row[2].toInt() : 0;
        column.hasDefault = !row[3].isNull() && textOf(row[3]) != u"NULL"_s;
        column.identity = row[4].toInt() == 1;
        info->columns.append(column);
    }
    const Rows key = ask(u"SELECT COLUMN_NAME FROM INFORMATION_SCHEMA.KEY_COLUMN_USAGE WHERE "_s + ofTable +
                         u" AND CONSTRAINT_NAME IN (SELECT CONSTRAINT_NAME FROM INFORMATION_SCHEMA.TABLE_CONSTRAINTS "
                         "WHERE "_s +
                         ofTable + u" AND CONSTRAINT_TYPE='PRIMARY KEY') ORDER BY ORDINAL_POSITION"_s);
    for (const QVariant& column : key.values)
        info->key.append(textOf(column));
    return info;
}

}  // namespace kest::db
