// The embedded engine: a file of the profile, opened by QSQLITE, with our comparison of texts.
#include "platform/RuntimeError.h"
#include "platform/database/Collation.h"
#include "platform/database/QtSqlEngine.h"
#include "platform/files/Lock.h"
#include "platform/values.h"

#include <QDeadlineTimer>
#include <QFileInfo>
#include <QSqlDriver>
#include <QSqlError>

#include <sqlite3.h>

#include <algorithm>
#include <cstring>
#include <map>

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

class EngineSqlite final : public QtSqlEngine {
public:
    explicit EngineSqlite(const QString& file) : QtSqlEngine(u"QSQLITE"_s)
    {
        if (!QFileInfo(file).isFile())
            throw RuntimeError(CannotOpen, u"There is no database "_s + file)
                .withDatabaseCodes(QString::number(SQLITE_CANTOPEN), u"08001"_s);
        database.setDatabaseName(file);
        database.setConnectOptions(u"QSQLITE_BUSY_TIMEOUT="_s + QString::number(busySeconds * 1000));
        openDatabase();
        teachComparison();
        try {
            run(u"PRAGMA journal_mode=WAL"_s);
            run(u"PRAGMA synchronous=FULL"_s);
            run(u"PRAGMA foreign_keys=OFF"_s);
        } catch (const RuntimeError& error) {
            throw RuntimeError(CannotOpen, error.description()).withDatabaseCodes(error.nativeCode(), error.sqlState());
        }
        sqlite3_progress_handler(handle(), instructionsBetweenLooks, &isLate, this);
        sqlite3_prepare_v2(handle(), "SELECT 1 FROM sqlite_master LIMIT 0", -1, &schemaReader, nullptr);
    }
    ~EngineSqlite() override { sqlite3_finalize(schemaReader); }

    void setTimeout(int seconds) override { timeout = seconds; }

    void rebuildIndexes() override { run(u"REINDEX"_s); }

    bool lock(const QString& name, int seconds) override
    {
        std::unique_ptr<files::Lock> lock;
        if (!attempt([&] {
                lock = std::make_unique<files::Lock>(database.databaseName() + u"-locks"_s, name, seconds * 1000);
            }))
            return true;  // the folder can't be written, which the next statement will report
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
                column.size = int(leadingNumber(type.sliced(width + 1)));
            column.hasDefault = !row[2].isNull() && row[2].toString().compare(u"NULL"_s, Qt::CaseInsensitive) != 0;
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

protected:
    bool meansConnectionLost(const QSqlError& error) const override
    {
        const int code = error.nativeErrorCode().toInt() & 0xff;
        return code == SQLITE_CANTOPEN || code == SQLITE_NOTADB;
    }

    QString sqlState(const QSqlError& error) const override
    {
        switch (error.nativeErrorCode().toInt() & 0xff) {
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

    /// Makes SQLite read the current schema. Otherwise it may prepare a statement with an old schema, and again with
    /// the new one, and the driver does not expect that the number of columns changes.
    void beforeStatement() override
    {
        sqlite3_step(schemaReader);
        sqlite3_reset(schemaReader);
        deadline = timeout > 0 ? QDeadlineTimer(qint64(timeout) * 1000) : QDeadlineTimer(QDeadlineTimer::Forever);
    }

private:
    sqlite3* handle() const { return *static_cast<sqlite3* const*>(database.driver()->handle().constData()); }

    /// Call this directly after opening: later, SQLite refuses to change a collation while a statement is active.
    void teachComparison()
    {
        const int collation =
            sqlite3_create_collation_v2(handle(), "NOCASE", SQLITE_UTF8, nullptr, &compareWithoutCase, nullptr);
        const int like = sqlite3_create_function_v2(handle(), "like", 2, SQLITE_UTF16 | SQLITE_DETERMINISTIC, nullptr,
                                                    &likeFunction, nullptr, nullptr, nullptr);
        if (collation != SQLITE_OK || like != SQLITE_OK)
            throw RuntimeError(CannotOpen, QString::fromUtf8(sqlite3_errmsg(handle())));
    }

    static int isLate(void* self) { return static_cast<EngineSqlite*>(self)->deadline.hasExpired(); }

    std::map<QString, std::unique_ptr<files::Lock>> locks;
    sqlite3_stmt* schemaReader = nullptr;
    int timeout = 0;
    QDeadlineTimer deadline{QDeadlineTimer::Forever};
};

}  // namespace

std::unique_ptr<Engine> openEmbedded(const QString& file)
{
    return std::make_unique<EngineSqlite>(file);
}

}  // namespace kest::db
