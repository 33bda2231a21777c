"""The databases of the stand-in: one SQLite file each, with its own list of tables, columns and triggers."""

import datetime
import functools
import json
import os
import re
import sqlite3

from translation import INT, NAME, Column, ServerError
from wire import Type

SYSTEM = """
CREATE TABLE sys_of_columns (table_name, ordinal, name, type, size, scale, nullable, fallback, is_identity, key_place,
                             schema);
CREATE TABLE sys_of_triggers (name, parent, events, body, is_disabled);
CREATE TABLE sys_of_indexes (name, parent, columns, has_filter, ignores_duplicates, is_disabled);
CREATE VIEW sys_triggers AS SELECT name, OBJECT_ID(parent) AS parent_id, is_disabled FROM sys_of_triggers;
CREATE VIEW sys_indexes AS
    SELECT name, OBJECT_ID(parent) AS object_id, rowid AS index_id, is_disabled, has_filter, 0 AS is_hypothetical
    FROM sys_of_indexes;
CREATE VIEW sys_index_columns AS
    SELECT OBJECT_ID(i.parent) AS object_id, i.rowid AS index_id, c.ordinal AS column_id, part.key + 1 AS key_ordinal
    FROM sys_of_indexes i, json_each(i.columns) part, sys_of_columns c
    WHERE c.name=part.value COLLATE NOCASE AND OBJECT_ID(c.schema || '.' || c.table_name)=OBJECT_ID(i.parent);
CREATE VIEW sys_databases AS SELECT DB_NAME() AS name, 150 AS compatibility_level;
CREATE VIEW sys_dm_exec_sessions AS SELECT SPID() AS session_id, 'mdy' AS date_format;
CREATE VIEW information_schema_tables AS
    SELECT DISTINCT 'standin' AS TABLE_CATALOG, schema AS TABLE_SCHEMA, table_name AS TABLE_NAME,
           'BASE TABLE' AS TABLE_TYPE FROM sys_of_columns;
CREATE VIEW information_schema_columns AS
    SELECT 'standin' AS TABLE_CATALOG, schema AS TABLE_SCHEMA, table_name AS TABLE_NAME, name AS COLUMN_NAME,
           ordinal AS ORDINAL_POSITION, fallback AS COLUMN_DEFAULT, nullable AS IS_NULLABLE, type AS DATA_TYPE,
           CASE WHEN type='text' THEN 2147483647 WHEN type='ntext' THEN 1073741823
                WHEN type LIKE '%char' OR type='varbinary' THEN size END AS CHARACTER_MAXIMUM_LENGTH,
           CASE WHEN type IN ('decimal', 'numeric') THEN size END AS NUMERIC_PRECISION,
           CASE WHEN type IN ('money', 'smallmoney') THEN 4 WHEN type IN ('decimal', 'numeric') THEN scale END AS NUMERIC_SCALE,
           CASE WHEN type='datetime' THEN 3 WHEN type='datetime2' THEN IFNULL(size, 7) END AS DATETIME_PRECISION
    FROM sys_of_columns;
CREATE VIEW information_schema_key_column_usage AS
    SELECT 'standin' AS TABLE_CATALOG, schema AS TABLE_SCHEMA, table_name AS TABLE_NAME, name AS COLUMN_NAME,
           key_place AS ORDINAL_POSITION, 'PK_' || table_name AS CONSTRAINT_NAME, schema AS CONSTRAINT_SCHEMA
    FROM sys_of_columns WHERE key_place IS NOT NULL;
CREATE VIEW information_schema_table_constraints AS
    SELECT DISTINCT TABLE_CATALOG, TABLE_SCHEMA, TABLE_NAME, CONSTRAINT_NAME, CONSTRAINT_SCHEMA,
           'PRIMARY KEY' AS CONSTRAINT_TYPE FROM information_schema_key_column_usage;
"""
NUMBERS_OF_VIEWS = ("ordinal_position", "character_maximum_length", "numeric_precision", "numeric_scale",
                    "datetime_precision", "parent_id", "compatibility_level", "session_id", "object_id", "index_id",
                    "column_id", "key_ordinal", "is_disabled", "has_filter", "is_hypothetical", "request_session_id")


def key_of(text):
    return text.rstrip(" ").casefold()


def compare(left, right):
    left, right = key_of(left), key_of(right)
    return (left > right) - (left < right)


@functools.lru_cache(maxsize=1000)
def expression_for(pattern):
    """A LIKE pattern; None for one with a bracket that is not closed, which nothing is like."""
    parts, rest = [], pattern.casefold()
    while rest:
        element = re.match(r"\[(\^?)([^\]]*)\]|.", rest, re.S)
        rest = rest[element.end():]
        if element.group() == "[":
            return None
        if element.group(2) is not None:
            inner = re.sub(r"([\\\[&~|])", r"\\\1", element.group(2))
            parts.append("[%s%s]" % (element.group(1), inner))
        else:
            parts.append({"%": ".*", "_": "."}.get(element.group(), re.escape(element.group())))
    return re.compile("".join(parts) + r" *\Z", re.S)


def is_like(pattern, text):
    if pattern is None or text is None:
        return None
    expression = expression_for(str(pattern))
    return expression is not None and expression.match(str(text).casefold()) is not None


def failing(function):
    """SQLite tells only that a function failed: the error is kept for the session that called it."""

    def call(self, *arguments):
        try:
            return function(*arguments)
        except ServerError as failure:
            self.conversion = failure
            raise

    return call


def as_number(text):
    try:
        return int(text) if re.fullmatch(r"\s*[+-]?\d+\s*", text) else float(text) if text.strip() else 0
    except ValueError as failure:
        raise ServerError(245, "Conversion failed when converting the varchar value '%s'." % text) from failure


def as_bit(text):
    word = text.strip().lower()
    return int(word == "true") if word in ("true", "false") else int(as_number(text) != 0)


def as_datetime(text):
    """The form with its T, and those of a server in English. Stored to the second's 300th in SQLite's usual form."""
    for form in ("%Y-%m-%dT%H:%M:%S", "%Y-%m-%dT%H:%M:%S.%f", "%Y-%m-%d %H:%M:%S", "%Y-%m-%d", "%Y%m%d"):
        try:
            moment = datetime.datetime.strptime(text.strip(), form)
        except ValueError:
            continue
        return moment.isoformat(" ", "milliseconds" if moment.microsecond else "seconds")
    raise ServerError(241, "Conversion failed when converting date and/or time from character string '%s'." % text)


def as_datetime2(text):
    """As datetime, with up to seven digits of a second."""
    whole, _, fraction = text.strip().partition(".")
    fraction = fraction[:7].rstrip("0")
    if not (fraction + "0").isdigit():
        raise ServerError(241, "Conversion failed when converting date and/or time from character string '%s'." % text)
    return as_datetime(whole) + ("." + fraction if fraction else "")


def as_code_page(text):
    return text.encode("cp1252", "replace").decode("cp1252")


class Database:
    """One session's connection to one database."""

    def __init__(self, folder, name):
        self.name, self.file, self.conversion = name, file_of(folder, name), None
        self.lite = sqlite3.connect(self.file, isolation_level=None, check_same_thread=False)
        self.lite.execute("PRAGMA synchronous=OFF")
        self.lite.create_collation("SERVER", compare)
        add = functools.partial(self.lite.create_function, deterministic=True)
        add("like", 2, is_like)
        for function in (as_number, as_bit, as_datetime, as_datetime2, as_code_page):
            add(function.__name__, 1, functools.partial(failing(function), self))
        add("STR_POSITION", 2, lambda text, part: key_of(text).find(key_of(part)) + 1)  # CHARINDEX
        add("OBJECT_ID", -1, lambda name, *_: self.object_id(name))
        add("OBJECT_NAME", 1, lambda number: self.object_of(number)[0])
        add("OBJECT_SCHEMA_NAME", 1, lambda number: self.object_of(number)[1])
        add("COL_NAME", 2, self.column_name)
        add("COLUMNPROPERTY", 3, self.column_property)
        add("DATABASEPROPERTYEX", 2, lambda *_: "Latin1_General_CI_AS")
        add("SESSIONPROPERTY", 1, lambda _: 1)
        add("DB_NAME", 0, lambda: "standin")
        add("SCHEMA_NAME", 0, lambda: "dbo")
        self.lite.execute("CREATE TEMP TABLE sys_dm_tran_locks (resource_type, request_session_id, "
                          "resource_description)")
        add("DATALENGTH", 1, lambda value: None if value is None else len(str(value).encode("cp1252", "replace")))

    def schema_version(self):
        return self.lite.execute("PRAGMA schema_version").fetchone()[0]

    def columns(self, table):
        rows = self.lite.execute("SELECT name, type, size, scale, is_identity FROM sys_of_columns WHERE schema='dbo' "
                                 "AND table_name=? COLLATE NOCASE ORDER BY ordinal", (table, )).fetchall()
        if rows:
            return [Column(name, Type(kind, size, scale), bool(identity)) for name, kind, size, scale, identity in rows]
        if table.startswith(("information_schema_", "sys_")):
            names = [row[1] for row in self.lite.execute("SELECT * FROM pragma_table_info(?)", (table, ))]
            return [Column(name, INT if name.lower() in NUMBERS_OF_VIEWS else NAME, False) for name in names] or None
        return None

    def object_id(self, name):
        *schema, table = re.sub(r"[\[\]]", "", name).split(".")
        row = self.lite.execute("SELECT MIN(rowid) FROM sys_of_columns WHERE table_name=? COLLATE NOCASE AND schema=?",
                                (table, schema[-1] if schema else "dbo"))
        return row.fetchone()[0]

    def object_of(self, number):
        row = self.lite.execute("SELECT table_name, schema FROM sys_of_columns WHERE rowid=?", (number, )).fetchone()
        return row or (None, None)

    def column_name(self, table, ordinal):
        row = self.lite.execute("SELECT name FROM sys_of_columns WHERE (table_name, schema)=(?,?) AND ordinal=?",
                                self.object_of(table) + (ordinal, )).fetchone()
        return row and row[0]

    def column_property(self, table, column, wanted):
        if wanted.lower() != "isidentity":
            return None
        row = self.lite.execute(
            "SELECT is_identity FROM sys_of_columns WHERE name=? COLLATE NOCASE AND (table_name, schema)="
            "(SELECT table_name, schema FROM sys_of_columns WHERE rowid=?)", (column, table)).fetchone()
        return row and row[0]

    def create_table(self, statement):
        """A table of another schema than "dbo" is only listed."""
        form = r"CREATE\s+TABLE\s+(?:(\w+)\.)?\[?(\w+)\]?\s*\((.*)\)\s*\Z"
        schema, name, body = re.match(form, statement, re.I | re.S).groups()
        schema = schema or "dbo"
        if schema == "dbo" and self.columns(name):
            raise ServerError(2714, "There is already an object named '%s' in the database." % name)
        lines, rows = [], []
        for ordinal, part in enumerate(re.split(r",(?![^(]*\))", body), 1):
            column, row = column_of(part.strip())
            lines.append(column)
            rows.append((name, ordinal) + row + (schema, ))
        self.lite.executemany("INSERT INTO sys_of_columns VALUES (?,?,?,?,?,?,?,?,?,?,?)", rows)
        if schema != "dbo":
            return
        self.lite.execute('CREATE TABLE "%s" (%s)' % (name, ", ".join(lines)))
        for row in rows:
            if row[3] in ("timestamp", "rowversion"):
                for event in ("INSERT", "UPDATE"):
                    self.lite.execute('CREATE TRIGGER "{0}_{1}" AFTER {1} ON "{0}" BEGIN UPDATE "{0}" SET '
                                      '"{2}"=randomblob(8) WHERE rowid=NEW.rowid; END'.format(name, event, row[2]))

    def add_column(self, statement):
        name, declaration = re.match(r"ALTER\s+TABLE\s+\[?(\w+)\]?\s+ADD\s+(.*)", statement, re.I | re.S).groups()
        line, row = column_of(declaration.strip())
        self.lite.execute('ALTER TABLE "%s" ADD COLUMN %s' % (name, line))
        self.lite.execute("INSERT INTO sys_of_columns SELECT MIN(table_name), MAX(ordinal)+1,?,?,?,?,?,?,?,?,'dbo' "
                          "FROM sys_of_columns WHERE table_name=? COLLATE NOCASE", row + (name, ))

    def drop_table(self, name):
        if not self.columns(name):
            raise ServerError(3701, "Cannot drop the table '%s', because it does not exist." % name, 11)
        self.lite.execute('DROP TABLE "%s"' % name)
        self.lite.execute("DELETE FROM sys_of_columns WHERE table_name=? COLLATE NOCASE", (name, ))
        for listed in ("triggers", "indexes"):
            self.lite.execute("DELETE FROM sys_of_%s WHERE parent=? COLLATE NOCASE" % listed, (name, ))

    def ignores_duplicates(self, table):
        return self.lite.execute("SELECT COUNT(*) FROM sys_of_indexes WHERE parent=? COLLATE NOCASE AND "
                                 "ignores_duplicates", (table, )).fetchone()[0] > 0

    def triggers(self, table, verb):
        return [body for events, body in self.lite.execute(
            "SELECT events, body FROM sys_of_triggers WHERE parent=? COLLATE NOCASE AND NOT is_disabled", (table, )) if verb in events]


def index_of(statement):
    """An index in SQLite's words, and its row for the list. One of a table in another schema is only listed."""
    form = r"(CREATE\s+(?:UNIQUE\s+)?INDEX\s+(\w+)\s+ON\s+([\w.]+)\s*\(([^)]*)\))(.*)"
    words, name, parent, columns, rest = re.match(form, statement, re.I | re.S).groups()
    ignores = "IGNORE_DUP_KEY" in rest.upper()
    parts = json.dumps([column.strip() for column in columns.split(",")])
    row = (name, parent, parts, "WHERE" in rest.upper(), ignores)
    return "SELECT 1" if "." in parent else words if ignores else words + rest, row


def column_of(declaration):
    """A column in SQLite's words, with the server's own limits as checks, and its row for the list of columns."""
    name, kind, size, scale, rest = re.match(
        r"\[?(\w+)\]?\s+\[?(\w+)\]?\s*(?:\(\s*(max|\d+)\s*(?:,\s*(\d+)\s*)?\))?(.*)", declaration, re.I | re.S).groups()
    kind = {"integer": "int", "rowversion": "timestamp", "double": "float"}.get(kind.lower(), kind.lower())
    declared = Type(kind, -1 if (size or "").lower() == "max" else int(size) if size else None, int(scale or 0))
    identity, key, filled = ("IDENTITY" in rest.upper(), "PRIMARY KEY" in rest.upper(), "NOT NULL" in rest.upper())
    default = re.search(r"DEFAULT\s+('(?:[^']|'')*'|\S+)", rest, re.I)
    line = '"%s" ' % name
    if identity:
        line += "INTEGER PRIMARY KEY AUTOINCREMENT"
    else:
        line += "TEXT COLLATE SERVER" if declared.is_text or kind in ("xml", "datetime", "datetime2") else \
            "NUMERIC" if declared.is_number else "BLOB"
        line += " NOT NULL" if key or filled else ""
        line += " PRIMARY KEY" if key else ""
        line += " DEFAULT " + default.group(1) if default else ""
        if declared.is_text and (declared.size or 0) > 0:
            line += ' CONSTRAINT truncated CHECK (length(rtrim("%s"))<=%d)' % (name, declared.size)
        elif declared.is_number:
            line += " CONSTRAINT unconverted CHECK (typeof(\"%s\")<>'text')" % name
    return line, (name, kind, declared.size, declared.scale, "NO" if key or filled else "YES",
                  default and "(%s)" % default.group(1), int(identity), 1 if key else None)


def file_of(folder, name):
    return os.path.join(folder, name.lower() + ".db")


def create(folder, name):
    """An empty database, in place of one of that name."""
    lite = sqlite3.connect(file_of(folder, name), isolation_level=None)
    for kind, existing in lite.execute("SELECT type, name FROM sqlite_master WHERE name NOT LIKE 'sqlite_%' AND "
                                       "type IN ('table', 'view')").fetchall():
        lite.execute('DROP %s "%s"' % (kind, existing))
    lite.executescript(SYSTEM)
    lite.close()


def copy(folder, source, target):
    origin, copied = (sqlite3.connect(file_of(folder, name)) for name in (source, target))
    origin.backup(copied)
    origin.close()
    copied.close()
