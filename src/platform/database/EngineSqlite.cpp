// The embedded engine: a file of the profile, with our comparison of texts.
#include "platform/RuntimeError.h"
#include "platform/database/Collation.h"
#include "platform/database/Engine.h"
#include "platform/database/Shape.h"
#include "platform/files/Lock.h"
#include "platform/values.h"

#include <QDeadlineTimer>
#include <QFileInfo>

#include <sqlite3.h>

#include <algorithm>
#include <map>
#include <optional>
#include <unordered_map>

namespace kest::db {

using namespace Qt::StringLiterals;

namespace {

constexpr int busySeconds = 5;
constexpr int instructionsBetweenLooks = 100000;  // some milliseconds

bool isPlain(QByteArrayView text)
{
    return std::all_of(text.begin(), text.end(), [](char c) { return static_cast<signed char>(c) >= 0; });
}

char lower(char c)
{
    return c >= 'A' && c <= 'Z' ? char(c + ('a' - 'A')) : c;
}

/// Compares texts for the collation NOCASE of the schema, by our full rule. ASCII texts, which are nearly all, need no
/// conversion.
int compareWithoutCase(void*, int leftSize, const void* leftBytes, int rightSize, const void* rightBytes)
{
    QByteArrayView left(static_cast<const char*>(leftBytes), leftSize);
    QByteArrayView right(static_cast<const char*>(rightBytes), rightSize);
    if (!isPlain(left) || !isPlain(right))
        return compareTexts(QString::fromUtf8(left), QString::fromUtf8(right));
    while (left.endsWith(' '))
        left.chop(1);
    while (right.endsWith(' '))
        right.chop(1);
    const auto [l, r] = std::mismatch(left.begin(), left.end(), right.begin(), right.end(),
                                      [](char a, char b) { return lower(a) == lower(b); });
    if (l == left.end() || r == right.end())
        return int(left.size() > right.size()) - int(left.size() < right.size());
    return lower(*l) - lower(*r);
}

QStringView textOfValue(sqlite3_value* value)
{
    const auto* text = static_cast<const char16_t*>(sqlite3_value_text16(value));
    return QStringView(text, text ? sqlite3_value_bytes16(value) / 2 : 0);
}

/// SQLite calls like(Y, X) for X LIKE Y.
void likeFunction(sqlite3_context* context, int, sqlite3_value** arguments)
{
    if (sqlite3_value_type(arguments[0]) == SQLITE_NULL || sqlite3_value_type(arguments[1]) == SQLITE_NULL)
        return sqlite3_result_null(context);
    const QString pattern = textOfValue(arguments[0]).toString();  // because the next call may move the first text
    sqlite3_result_int(context, isLike(textOfValue(arguments[1]), pattern));
}

using Handle = std::unique_ptr<sqlite3, decltype([](sqlite3* handle) { sqlite3_close(handle); })>;

/// A prepared statement. It can be executed any number of times.
struct Prepared {
    std::unique_ptr<sqlite3_stmt, decltype([](sqlite3_stmt* statement) { sqlite3_finalize(statement); })> statement;
    QStringList names;  // of the columns
    int times = -1;     // how often SQLite had prepared it again when the names were read
};

void bindValues(sqlite3_stmt* statement, const QList<QString>& values)
{
    int parameter = 0;
    for (const QString& value : values) {
        ++parameter;
        bool isWhole = false;
        const qint64 whole = value.toLongLong(&isWhole);
        if (value.startsWith(u'\'')) {
            const QString text = value.sliced(1, value.size() - 2).replace(u"''"_s, u"'"_s);
            sqlite3_bind_text16(statement, parameter, text.utf16(), int(text.size() * 2), SQLITE_TRANSIENT);
        } else if (isWhole) {
            sqlite3_bind_int64(statement, parameter, whole);
        } else {
            sqlite3_bind_double(statement, parameter, value.toDouble());
        }
    }
}

QVariant valueOf(sqlite3_stmt* statement, int column)
{
    switch (sqlite3_column_type(statement, column)) {
        case SQLITE_NULL:
            return {};
        case SQLITE_INTEGER:
            return qint64(sqlite3_column_int64(statement, column));
        case SQLITE_FLOAT:
            return sqlite3_column_double(statement, column);
        case SQLITE_BLOB:
            return QByteArray(static_cast<const char*>(sqlite3_column_blob(statement, column)),
                              sqlite3_column_bytes(statement, column));
        default: {
            const auto* text = reinterpret_cast<const char*>(sqlite3_column_text(statement, column));
            return QString::fromUtf8(text, sqlite3_column_bytes(statement, column));
        }
    }
}

class EngineSqlite final : public Engine {
public:
    explicit EngineSqlite(const QString& file) : file_(file)
    {
        if (!QFileInfo(file).isFile())
            throw RuntimeError(CannotOpen, u"There is no database "_s + file)
                .withDatabaseCodes(QString::number(SQLITE_CANTOPEN), u"08001"_s);
        sqlite3* opened = nullptr;
        const int result =
            sqlite3_open_v2(file.toUtf8().constData(), &opened, SQLITE_OPEN_READWRITE | SQLITE_OPEN_NOMUTEX, nullptr);
        handle.reset(opened);
        if (result != SQLITE_OK)
            fail(CannotOpen);
        sqlite3_extended_result_codes(opened, 1);
        sqlite3_busy_timeout(opened, busySeconds * 1000);
        teachComparison();
        try {
            run(u"PRAGMA journal_mode=WAL"_s);
            run(u"PRAGMA synchronous=FULL"_s);
            run(u"PRAGMA foreign_keys=OFF"_s);
        } catch (const RuntimeError& error) {
            throw RuntimeError(CannotOpen, error.description()).withDatabaseCodes(error.nativeCode(), error.sqlState());
        }
        sqlite3_progress_handler(opened, instructionsBetweenLooks, &isLate, this);
    }

    /// Prepares statements of one shape only once.
    Answer run(const QString& statement) override
    {
        if (!isOpen())
            throw RuntimeError(CannotOpen, u"The connection to the database is lost."_s);
        deadline = timeout > 0 ? QDeadlineTimer(qint64(timeout) * 1000) : QDeadlineTimer(QDeadlineTimer::Forever);
        const Shape shape = Shape::toPrepare(statement);
        if (Prepared* known = preparedShape(shape)) {
            bindValues(known->statement.get(), shape.values);
            return rowsOf(*known);
        }
        Prepared once = prepared(statement);
        if (!once.statement)
            fail(StatementFailed);
        return rowsOf(once);
    }
    QVariant insert(const QString& statement) override
    {
        run(statement);
        return qint64(sqlite3_last_insert_rowid(handle.get()));
    }

    void setTimeout(int seconds) override
    {
        timeout = seconds;
        sqlite3_busy_timeout(handle.get(), (seconds > 0 ? std::min(seconds, busySeconds) : busySeconds) * 1000);
    }

    void rebuildIndexes() override { run(u"REINDEX"_s); }

    bool lock(const QString& name, int seconds) override
    {
        auto lock = std::make_unique<files::Lock>(file_ + u"-locks"_s, name, seconds * 1000, file_);
        if (!lock->isHeld())
            return false;
        locks[name] = std::move(lock);
        return true;
    }
    void unlock(const QString& name) override { locks.erase(name); }

    const Dialect& dialect() const override { return embeddedDialect(); }

    QStringList tableNames() override
    {
        QStringList names;
        for (const QVariant& name : run(u"SELECT name FROM sqlite_master WHERE type IN ('table', 'view')"_s).values)
            names.append(name.toString());
        return names;
    }

    std::unique_ptr<TableInfo> readTable(const QString& name) override
    {
        auto info = std::make_unique<TableInfo>();
        info->name = name;
        const Answer rows =
            run(u"SELECT name, type, dflt_value, pk FROM pragma_table_info("_s + dialect().literal(name) + u')');
        QMap<int, QString> key;
        QString keyType;
        for (size_t i = 0; i < rows.values.size(); i += 4) {
            const QVariant* row = &rows.values[i];
            TableColumn column;
            column.name = row[0].toString();
            const QString type = row[1].toString();
            column.kind = kindOfType(type);
            const qsizetype width = type.indexOf(u'(');
            if (column.kind == Kind::Text && width > 0)
                column.size = int(leadingNumber(type.sliced(width + 1).section(u')', 0, 0)));
            column.hasDefault = !row[2].isNull() && row[2].toString().compare(u"NULL"_s, Qt::CaseInsensitive) != 0;
            if (column.hasDefault)
                column.fixedDefault = fixedDefault(row[2].toString(), column.kind);
            if (row[3].toInt() > 0) {
                key.insert(row[3].toInt(), column.name);
                keyType = type;
            }
            info->columns.append(column);
        }
        info->key = key.values();
        if (info->key.size() == 1 && keyType.compare(u"INTEGER"_s, Qt::CaseInsensitive) == 0) {
            for (TableColumn& column : info->columns)
                column.identity = column.name == info->key.first();
        }
        return info;
    }

private:
    /// Prepares a statement. The result has none if SQLite refuses it, or if a second one follows.
    Prepared prepared(const QString& text)
    {
        Prepared made;
        sqlite3_stmt* statement = nullptr;
        const void* rest = nullptr;
        sqlite3_prepare16_v3(handle.get(), text.utf16(), int(text.size() * 2), SQLITE_PREPARE_PERSISTENT, &statement,
                             &rest);
        made.statement.reset(statement);
        if (statement && !QStringView(static_cast<const QChar*>(rest), text.cend()).trimmed().isEmpty())
            throw RuntimeError(StatementFailed, u"A second statement follows a semicolon."_s);
        return made;
    }

    /// Returns null for a statement without a shape that can be prepared: it has a literal that is no value.
    Prepared* preparedShape(const Shape& shape)
    {
        constexpr size_t mostStatements = 300;
        constexpr qsizetype mostValues = 300;
        const auto found = statements.find(shape.text);
        if (found != statements.end())
            return &found->second;
        if (shape.values.size() > mostValues)
            return nullptr;
        Prepared fresh = prepared(shape.text);
        if (!fresh.statement)
            return nullptr;
        if (statements.size() >= mostStatements)
            statements.clear();
        return &(statements[shape.text] = std::move(fresh));
    }

    Answer rowsOf(Prepared& prepared)
    {
        sqlite3_stmt* const statement = prepared.statement.get();
        const std::unique_ptr<sqlite3_stmt, decltype([](sqlite3_stmt* used) { sqlite3_reset(used); })> reset(statement);
        Answer answer;
        int result = sqlite3_step(statement);
        const int width = sqlite3_column_count(statement);  // after the step, which prepares again if a table changed
        for (; result == SQLITE_ROW; result = sqlite3_step(statement)) {
            for (int column = 0; column < width; ++column)
                answer.values.push_back(valueOf(statement, column));
        }
        if (result != SQLITE_DONE)
            fail(StatementFailed);
        answer.names = namesOf(prepared);
        answer.hit = sqlite3_changes(handle.get());
        return answer;
    }

    static const QStringList& namesOf(Prepared& prepared)
    {
        sqlite3_stmt* const statement = prepared.statement.get();
        const int times = sqlite3_stmt_status(statement, SQLITE_STMTSTATUS_REPREPARE, 0);
        if (times != prepared.times) {
            prepared.names.clear();
            for (int column = 0; column < sqlite3_column_count(statement); ++column)
                prepared.names.append(QString::fromUtf8(sqlite3_column_name(statement, column)).remove(u'"'));
            prepared.times = times;
        }
        return prepared.names;
    }

    [[noreturn]] void fail(int number)
    {
        const int code = sqlite3_extended_errcode(handle.get());
        const int kind = code & 0xff;
        if (kind == SQLITE_CANTOPEN || kind == SQLITE_NOTADB) {
            drop();
            number = CannotOpen;
        }
        throw RuntimeError(number, QString::fromUtf8(sqlite3_errmsg(handle.get())))
            .withDatabaseCodes(QString::number(code), sqlState(kind));
    }

    static QString sqlState(int kind)
    {
        switch (kind) {
            case SQLITE_ERROR:
                return u"42000"_s;
            case SQLITE_CONSTRAINT:
                return u"23000"_s;
            case SQLITE_INTERRUPT:
                return u"HYT00"_s;
            case SQLITE_CANTOPEN:
                return u"08001"_s;
            default:
                return u"HY000"_s;
        }
    }

    /// Call this directly after opening: later, SQLite refuses to change a collation while a statement is active.
    void teachComparison()
    {
        const int collation =
            sqlite3_create_collation_v2(handle.get(), "NOCASE", SQLITE_UTF8, nullptr, &compareWithoutCase, nullptr);
        const int like = sqlite3_create_function_v2(handle.get(), "like", 2, SQLITE_UTF16 | SQLITE_DETERMINISTIC,
                                                    nullptr, &likeFunction, nullptr, nullptr, nullptr);
        if (collation != SQLITE_OK || like != SQLITE_OK)
            throw RuntimeError(CannotOpen, QString::fromUtf8(sqlite3_errmsg(handle.get())));
    }

    static int isLate(void* self) { return static_cast<EngineSqlite*>(self)->deadline.hasExpired(); }

    QString file_;
    Handle handle;
    std::unordered_map<QString, Prepared> statements;  // by the text of their shape
    std::map<QString, std::unique_ptr<files::Lock>> locks;
    int timeout = 0;
    QDeadlineTimer deadline{QDeadlineTimer::Forever};
};

}  // namespace

std::unique_ptr<Engine> openEmbedded(const QString& file)
{
    return std::make_unique<EngineSqlite>(file);
}

}  // namespace kest::db
