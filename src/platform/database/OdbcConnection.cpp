#include "platform/database/OdbcConnection.h"

#include "platform/values.h"

#include <QDateTime>

#include <sql.h>
#include <sqlext.h>

#include <algorithm>
#include <array>
#include <charconv>
#include <optional>

namespace kest::db {

using namespace Qt::StringLiterals;

static_assert(sizeof(SQLWCHAR) == sizeof(char16_t), "the driver manager passes texts as UTF-16");

namespace {

constexpr int nanosecondsPerMillisecond = 1000000;

SQLWCHAR* wide(const QString& text)
{
    return reinterpret_cast<SQLWCHAR*>(const_cast<char16_t*>(QStringView(text).utf16()));
}

template <size_t size>
QString fromWide(const std::array<SQLWCHAR, size>& buffer)
{
    const QStringView all(reinterpret_cast<const char16_t*>(buffer.data()), size);
    return all.first(std::max<qsizetype>(0, all.indexOf(u'\0'))).toString();
}

/// Returns the shortest number that is meant, instead of the nearest one of double precision.
double shortest(float number)
{
    std::array<char, 32> text{};
    const auto end = std::to_chars(text.data(), text.data() + text.size(), number);
    return QByteArray(text.data(), end.ptr - text.data()).toDouble();
}

SQLPOINTER asPointer(SQLULEN number)
{
    return reinterpret_cast<SQLPOINTER>(number);  // as the interface demands
}

QList<OdbcMessage> messagesOf(SQLSMALLINT type, SQLHANDLE handle)
{
    QList<OdbcMessage> messages;
    std::array<SQLWCHAR, 6> state{};
    std::array<SQLWCHAR, SQL_MAX_MESSAGE_LENGTH> text{};
    SQLINTEGER native = 0;
    for (SQLSMALLINT i = 1;
         SQL_SUCCEEDED(SQLGetDiagRecW(type, handle, i, state.data(), &native, text.data(), text.size() - 1, nullptr));
         ++i)
        messages.append({fromWide(state), native, fromWide(text)});
    return messages;
}

/// A handle of the driver manager, which the destructor frees.
class Handle {
public:
    Handle(SQLSMALLINT handleType, SQLHANDLE parent, SQLSMALLINT parentType) : type(handleType)
    {
        if (!SQL_SUCCEEDED(SQLAllocHandle(type, parent, &handle)))
            throw OdbcFailure{parent ? messagesOf(parentType, parent) : QList<OdbcMessage>(), false};
    }
    ~Handle() { SQLFreeHandle(type, handle); }
    Handle(const Handle&) = delete;
    Handle& operator=(const Handle&) = delete;

    operator SQLHANDLE() const { return handle; }
    QList<OdbcMessage> messages() const { return messagesOf(type, handle); }

private:
    SQLSMALLINT type;
    SQLHANDLE handle = SQL_NULL_HANDLE;
};

/// Executes one statement.
class Statement {
public:
    Statement(const Handle& dbc, int seconds) : connection(dbc), statement(SQL_HANDLE_STMT, dbc, SQL_HANDLE_DBC)
    {
        if (seconds > 0)
            SQLSetStmtAttr(statement, SQL_ATTR_QUERY_TIMEOUT, asPointer(SQLULEN(seconds)), SQL_IS_UINTEGER);
        SQLSetStmtAttr(statement, SQL_ATTR_NOSCAN, asPointer(SQL_NOSCAN_ON), SQL_IS_UINTEGER);  // "{" has no meaning
    }

    Answer run(const QString& text)
    {
        Answer answer;
        SQLRETURN done = SQLExecDirectW(statement, wide(text), SQLINTEGER(text.size()));
        for (; done != SQL_NO_DATA;
             done = SQLMoreResults(statement)) {  // no data: no row was hit, or no result is left
            check(done);
            readResult(answer);
        }
        return answer;
    }

private:
    struct Column {
        QString name;
        SQLSMALLINT type = SQL_WVARCHAR;
    };

    void check(SQLRETURN done)
    {
        if (SQL_SUCCEEDED(done))
            return;
        SQLUINTEGER dead = SQL_CD_FALSE;
        const QList<OdbcMessage> messages = statement.messages();
        SQLGetConnectAttr(connection, SQL_ATTR_CONNECTION_DEAD, &dead, SQL_IS_UINTEGER, nullptr);
        throw OdbcFailure{messages, dead == SQL_CD_TRUE};
    }

    void readResult(Answer& answer)
    {
        SQLSMALLINT count = 0;
        check(SQLNumResultCols(statement, &count));
        if (count == 0) {
            SQLLEN hit = 0;
            if (SQL_SUCCEEDED(SQLRowCount(statement, &hit)) && hit >= 0)
                answer.hit = hit;
            return;
        }
        answer.names.clear();
        answer.values.clear();
        QList<Column> columns;
        for (SQLUSMALLINT i = 1; i <= count; ++i) {
            columns.append(describe(i));
            answer.names.append(columns.last().name);
        }
        for (SQLRETURN row = SQLFetch(statement); row != SQL_NO_DATA; row = SQLFetch(statement)) {
            check(row);
            for (SQLUSMALLINT i = 1; i <= count; ++i)  // some drivers demand this order
                answer.values.push_back(valueOf(i, columns[i - 1].type));
        }
    }

    Column describe(SQLUSMALLINT number)
    {
        std::array<SQLWCHAR, 256> name{};
        Column column;
        SQLULEN size = 0;
        SQLSMALLINT digits = 0;
        SQLSMALLINT nullable = 0;
        check(SQLDescribeColW(statement, number, name.data(), SQLSMALLINT(name.size() - 1), nullptr, &column.type,
                              &size, &digits, &nullable));
        column.name = fromWide(name);
        return column;
    }

    QVariant valueOf(SQLUSMALLINT column, SQLSMALLINT type)
    {
        switch (type) {
            case SQL_BIT:
            case SQL_TINYINT:
            case SQL_SMALLINT:
            case SQL_INTEGER:
            case SQL_BIGINT: {
                const std::optional<SQLBIGINT> number = fixed<SQLBIGINT>(column, SQL_C_SBIGINT);
                return !number ? QVariant() : type == SQL_BIT ? QVariant(*number != 0) : QVariant(qint64(*number));
            }
            case SQL_REAL: {
                const std::optional<SQLREAL> number = fixed<SQLREAL>(column, SQL_C_FLOAT);
                return number ? QVariant(shortest(*number)) : QVariant();
            }
            case SQL_FLOAT:
            case SQL_DOUBLE: {
                const std::optional<SQLDOUBLE> number = fixed<SQLDOUBLE>(column, SQL_C_DOUBLE);
                return number ? QVariant(*number) : QVariant();
            }
            case SQL_TYPE_DATE:
            case SQL_TYPE_TIMESTAMP:
                return dateOf(fixed<SQL_TIMESTAMP_STRUCT>(column, SQL_C_TYPE_TIMESTAMP));
            case SQL_BINARY:
            case SQL_VARBINARY:
            case SQL_LONGVARBINARY:
                return bytesOf(column);
            default:
                return textOf(column);
        }
    }

    template <class Value>
    std::optional<Value> fixed(SQLUSMALLINT column, SQLSMALLINT type)
    {
        Value value{};
        SQLLEN length = 0;
        check(SQLGetData(statement, column, type, &value, sizeof value, &length));
        return length == SQL_NULL_DATA ? std::nullopt : std::optional(value);
    }

    static QVariant dateOf(const std::optional<SQL_TIMESTAMP_STRUCT>& stamp)
    {
        if (!stamp)
            return {};
        return columnDate(
            QDate(stamp->year, stamp->month, stamp->day),
            QTime(stamp->hour, stamp->minute, stamp->second, int(stamp->fraction / nanosecondsPerMillisecond)));
    }

    /// Reads a text as UTF-16, so that no letter depends on the locale of the process, and in pieces, because a driver
    /// that converts does not know the length.
    QVariant textOf(SQLUSMALLINT column)
    {
        QString text;
        const bool isThere = readPieces<char16_t>(column, SQL_C_WCHAR, 1, [&](const char16_t* piece, qsizetype size) {
            text.append(QStringView(piece, size));
        });
        return isThere ? QVariant(text) : QVariant();
    }

    QVariant bytesOf(SQLUSMALLINT column)
    {
        QByteArray bytes;
        const bool isThere = readPieces<char>(column, SQL_C_BINARY, 0,
                                              [&](const char* piece, qsizetype size) { bytes.append(piece, size); });
        return isThere ? QVariant(bytes) : QVariant();
    }

    /// Returns false for Null.
    template <class Unit, class Take>
    bool readPieces(SQLUSMALLINT column, SQLSMALLINT type, qsizetype terminators, Take&& take)
    {
        std::array<Unit, 4096> piece;
        constexpr SQLLEN room = sizeof piece;
        for (;;) {
            SQLLEN left = 0;  // bytes, including this piece
            const SQLRETURN done = SQLGetData(statement, column, type, piece.data(), room, &left);
            if (done == SQL_NO_DATA)
                return true;
            check(done);
            if (left == SQL_NULL_DATA)
                return false;
            const bool isCut = left == SQL_NO_TOTAL || left / SQLLEN(sizeof(Unit)) > SQLLEN(piece.size()) - terminators;
            take(piece.data(), isCut ? qsizetype(piece.size()) - terminators : qsizetype(left / SQLLEN(sizeof(Unit))));
            if (done == SQL_SUCCESS || !isCut)  // FreeTDS never reports the end of a variant
                return true;
        }
    }

    const Handle& connection;
    Handle statement;
};

}  // namespace

struct OdbcConnection::Handles {
    Handle environment{SQL_HANDLE_ENV, SQL_NULL_HANDLE, 0};
    std::optional<Handle> connection;
    bool isConnected = false;

    Handles()
    {
        SQLSetEnvAttr(environment, SQL_ATTR_ODBC_VERSION, asPointer(SQL_OV_ODBC3), SQL_IS_UINTEGER);
        connection.emplace(SQL_HANDLE_DBC, environment, SQL_HANDLE_ENV);
    }
    ~Handles()
    {
        if (isConnected)
            SQLDisconnect(*connection);
    }
};

OdbcConnection::OdbcConnection(const QString& connectionText, int seconds) : handles(std::make_unique<Handles>())
{
    const Handle& connection = *handles->connection;
    SQLSetConnectAttr(connection, SQL_ATTR_LOGIN_TIMEOUT, asPointer(SQLULEN(seconds)), SQL_IS_UINTEGER);
    if (!SQL_SUCCEEDED(SQLDriverConnectW(connection, nullptr, wide(connectionText), SQLSMALLINT(connectionText.size()),
                                         nullptr, 0, nullptr, SQL_DRIVER_NOPROMPT)))
        throw OdbcFailure{connection.messages(), true};
    handles->isConnected = true;
    socket_.find();
}

OdbcConnection::~OdbcConnection() = default;

Answer OdbcConnection::run(const QString& statement, int seconds)
{
    return Statement(*handles->connection, seconds).run(statement);
}

QString OdbcConnection::databaseName() const
{
    return information(SQL_DBMS_NAME);
}

QList<std::pair<QString, QString>> OdbcConnection::versions() const
{
    return {{u"driver"_s, information(SQL_DRIVER_NAME) + u' ' + information(SQL_DRIVER_VER)},
            {u"driver manager"_s, information(SQL_DM_VER)},
            {u"server version"_s, information(SQL_DBMS_VER)}};
}

/// Returns an empty text if the driver does not know.
QString OdbcConnection::information(unsigned short item) const
{
    std::array<SQLWCHAR, 256> name{};
    SQLSMALLINT length = 0;  // in bytes
    SQLGetInfoW(*handles->connection, item, name.data(), SQLSMALLINT(sizeof name - sizeof name[0]), &length);
    return fromWide(name);
}

}  // namespace kest::db
