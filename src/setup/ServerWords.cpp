#include "setup/ServerWords.h"

namespace kest::app {

using namespace Qt::StringLiterals;

const ServerWords& wordsOf(Server server)
{
    static const ServerWords embedded{.identity = u"INTEGER PRIMARY KEY AUTOINCREMENT"_s,
                                      .text = u"VARCHAR(20) COLLATE NOCASE"_s,
                                      .national = u"VARCHAR(20) COLLATE NOCASE"_s,
                                      .number = u"DOUBLE"_s,
                                      .flag = u"BOOLEAN"_s,
                                      .money = u"DECIMAL(19,4)"_s,
                                      .moment = u"DATETIME"_s,
                                      .longText = u"LONGTEXT COLLATE NOCASE"_s,
                                      .nationalLongText = u"LONGTEXT COLLATE NOCASE"_s,
                                      .olderLongText = u"LONGTEXT COLLATE NOCASE"_s,
                                      .trigger = {},
                                      .slow =
                                          u"WITH RECURSIVE n(i) AS (SELECT 1 UNION ALL SELECT i + 1 FROM n) "
                                          "SELECT COUNT(*) FROM n"_s,
                                      .ownNumber = {},
                                      .facts = {{u"server"_s, u"'SQLite ' + sqlite_version()"_s}}};
    static const ServerWords mySql{
        .identity = u"INTEGER NOT NULL AUTO_INCREMENT PRIMARY KEY"_s,
        .text = u"VARCHAR(20)"_s,
        .national = u"VARCHAR(20)"_s,
        .number = u"DOUBLE"_s,
        .flag = u"BOOLEAN"_s,
        .money = u"DECIMAL(19,4)"_s,
        .moment = u"DATETIME(6)"_s,
        .longText = u"LONGTEXT"_s,
        .nationalLongText = u"LONGTEXT"_s,
        .olderLongText = u"LONGTEXT"_s,
        .trigger = u"CREATE TRIGGER %1_T AFTER INSERT ON %1 FOR EACH ROW INSERT INTO %2 (what) VALUES ('x')"_s,
        .slow =
            u"SELECT COUNT(*) FROM INFORMATION_SCHEMA.COLLATIONS a, INFORMATION_SCHEMA.COLLATIONS b, "
            "INFORMATION_SCHEMA.COLLATIONS c, INFORMATION_SCHEMA.COLLATIONS d WHERE a.ID+b.ID+c.ID+d.ID=0"_s,
        .ownNumber = u"CONNECTION_ID()"_s,
        .facts = {
            {u"server"_s, u"VERSION()"_s}, {u"collation"_s, u"@@collation_database"_s}, {u"mode"_s, u"@@sql_mode"_s}}};
    static const ServerWords sqlServer{
        .identity = u"INT IDENTITY(1,1) NOT NULL PRIMARY KEY"_s,
        .text = u"VARCHAR(20)"_s,
        .national = u"NVARCHAR(20)"_s,
        .number = u"FLOAT"_s,
        .flag = u"BIT"_s,
        .money = u"MONEY"_s,
        .moment = u"DATETIME2"_s,
        .longText = u"VARCHAR(MAX)"_s,
        .nationalLongText = u"NVARCHAR(MAX)"_s,
        .olderLongText = u"TEXT"_s,
        .trigger = u"CREATE TRIGGER %1_T ON %1 AFTER INSERT, UPDATE AS INSERT INTO %2 (what) VALUES ('x')"_s,
        .slow = u"WAITFOR DELAY '00:00:20'"_s,
        .ownNumber = u"@@SPID"_s,
        .facts = {{u"server"_s, u"@@VERSION"_s},
                  {u"collation"_s, u"DATABASEPROPERTYEX(DB_NAME(), 'Collation')"_s},
                  {u"compatibility level"_s, u"compatibility_level FROM sys.databases WHERE name=DB_NAME()"_s},
                  {u"language"_s, u"@@LANGUAGE"_s},
                  {u"date format"_s, u"date_format FROM sys.dm_exec_sessions WHERE session_id=@@SPID"_s},
                  {u"ANSI nulls"_s, u"SESSIONPROPERTY('ANSI_NULLS')"_s}}};
    return server == Server::Embedded ? embedded : server == Server::MySql ? mySql : sqlServer;
}

}  // namespace kest::app
