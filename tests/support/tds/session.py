"""What one client's statements do: batches, variables, triggers, named locks."""

import re
import sqlite3
import threading
import time

import databases
import wire
from translation import ServerError, Translator, shape_of, statements_of
from wire import Type

VERSION = "Microsoft SQL Server (stand-in for tests, no SQL Server) - 15.0.2000.5"
FAILURES = [  # what SQLite says, and what the server says to that
    (r"no such table: (\S+)", 208, "Invalid object name '%s'."),
    (r"no such column: (\S+)", 207, "Invalid column name '%s'."),
    (r"UNIQUE constraint failed: (\w+)", 2627, "Cannot insert duplicate key in object 'dbo.%s'."),
    (r"NOT NULL constraint failed: \w+\.(\w+)", 515, "Cannot insert the value NULL into column '%s'."),
    (r"CHECK constraint failed: (truncated)", 8152, "String or binary data would be %s."),
    (r"CHECK constraint failed: (\w+)", 245, "Conversion failed: %s."),
    (r"database (?:table )?is (locked)", 1222, "Lock request time out period exceeded (%s)."),
    (r"(.*)", 102, "Incorrect syntax: %s."),
]
STATEMENT_ONLY = (2627, 515, 8152, 245, 241, 1222)  # the batch goes on after these
plans = {}


class NamedLocks:
    """sp_getapplock for owners "Session": exclusive, counted, of one database."""

    def __init__(self):
        self.held, self.changed = {}, threading.Condition()

    def get(self, name, owner, seconds, given_up):
        """0 at once, 1 after a wait, -1 after the time, -2 if the client gave up."""
        end = None if seconds < 0 else time.monotonic() + seconds
        with self.changed:
            waited = 0
            while self.held.get(name, (owner, 0))[0] is not owner:
                if end is not None and time.monotonic() >= end:
                    return -1
                if given_up():
                    return -2
                waited = 1
                self.changed.wait(0.05)
            self.held[name] = (owner, self.held.get(name, (owner, 0))[1] + 1)
            return waited

    def release(self, name, owner):
        with self.changed:
            holder, count = self.held.get(name, (None, 0))
            if holder is not owner:
                return False
            self.held[name] = (owner, count - 1)
            if count == 1:
                del self.held[name]
            self.changed.notify_all()
            return True

    def release_all(self, owner):
        with self.changed:
            self.held = {name: held for name, held in self.held.items() if held[0] is not owner}
            self.changed.notify_all()


locks = NamedLocks()


class Session:
    def __init__(self, server, number, database_name, interrupted):
        self.server, self.number, self.interrupted = server, number, interrupted
        self.database = databases.Database(server.folder, database_name)
        self.no_count, self.lock_timeout = False, -1
        self.identity = self.scope_identity = None
        self.row_count, self.variables = 0, {}
        self.identity_insert = None  # the table whose identities an INSERT must give
        self.attentions, self.refuses_locks = 0, False
        self.database.lite.create_function("SCOPE_IDENTITY", 0, lambda: self.scope_identity)
        self.database.lite.create_function("SPID", 0, lambda: self.number)
        self.database.lite.execute("PRAGMA busy_timeout=30000")

    def close(self):
        locks.release_all(self)
        self.database.lite.close()

    def answer(self, batch):
        """The tokens for a batch; None if the client has interrupted it."""
        self.variables, parts = {}, []
        self.server.record(batch)
        trigger = re.match(r"\s*CREATE\s+TRIGGER\b", batch, re.I)
        statements = [[("word", batch)]] if trigger else statements_of(batch)
        for statement in statements:
            try:
                tokens = self.run(statement)
            except ServerError as failure:
                tokens = wire.error(failure.number, failure.message, failure.severity) + wire.done(wire.ERROR)
                self.row_count = 0
                if failure.number not in STATEMENT_ONLY:
                    parts.append(tokens)
                    break
            if tokens is None:
                return None
            if tokens:
                parts.append(tokens)
        return joined(parts or [wire.done()])

    def run(self, statement):
        text = "".join(part for _, part in statement).strip()
        words = re.sub(r"\s+", " ", text).upper()
        for beginning, step in self.STEPS.items():
            if words == beginning or words.startswith(beginning + " "):
                return step(self, text)
        if re.match(r"(DECLARE|EXEC|EXECUTE)\b", words):
            return self.declare_or_call(text)
        return self.query(statement)

    def query(self, statement):
        shape, values = shape_of(statement)
        if match := re.fullmatch(r"\s*INSERT\s+INTO\s+(\S+)\s+DEFAULT\s+VALUES\s*", shape, re.I):
            return self.change("INSERT", match.group(1).strip("[]"), shape, {})
        key = (self.database.schema_version(), self.database.name, self.identity_insert, shape)
        plan = plans.get(key)
        if plan is None:
            plan = plans[key] = Translator(shape, self.database.columns, self.identity_insert).plan()
        values.update(v_identity=self.identity, v_rowcount=self.row_count, v_spid=self.number, v_version=VERSION,
                      v_language="us_english", v_trancount=int(self.database.lite.in_transaction),
                      v_lock_timeout=self.lock_timeout, v_error=0, **self.variables)
        if plan.columns:
            if "dm_tran_locks" in shape:
                self.list_locks()
            rows = self.execute(plan.text, values).fetchall()
            self.row_count = len(rows)
            return wire.rows(plan.columns, rows) + wire.done(0, len(rows))
        return self.change(plan.verb, plan.table, plan.text, values)

    def execute(self, text, values=()):
        self.database.conversion = None
        try:
            return self.database.lite.execute(text, values)
        except sqlite3.Error as failure:
            if self.database.conversion:
                raise self.database.conversion from failure
            for pattern, number, message in FAILURES:
                if found := re.match(pattern, str(failure)):
                    raise ServerError(number, message % found.group(1), 14 if number == 2627 else 16) from failure

    def change(self, verb, table, text, values):
        """A change with the table's triggers, in one transaction. Their counts come before its own."""
        bodies = self.database.triggers(table, verb)
        if verb == "INSERT" and self.database.ignores_duplicates(table):
            text = re.sub("INSERT", "INSERT OR IGNORE", text, 1, re.I)
        nested = self.database.lite.in_transaction
        if bodies and not nested:
            self.execute("BEGIN IMMEDIATE")
        try:
            cursor = self.execute(text, values)
            hit = cursor.rowcount
            if verb == "INSERT":
                self.identity = self.scope_identity = cursor.lastrowid if any(
                    column.identity for column in self.database.columns(table)) else None
            scope, tokens = self.scope_identity, b""
            for body in bodies:
                for statement in statements_of(body):
                    tokens += self.in_procedure(self.run(statement))
            self.scope_identity = scope
            if bodies and not nested:
                self.execute("COMMIT")
        except ServerError:
            if bodies and not nested:
                self.execute("ROLLBACK")
            raise
        self.row_count = hit
        return tokens + wire.done(0, None if self.no_count else hit)

    def in_procedure(self, tokens):
        """The DONE at the end of a statement within a trigger; with NOCOUNT there is none."""
        return tokens[:-13] + (b"" if self.no_count else b"\xff\x11" + tokens[-11:])

    def declare_or_call(self, text):
        if match := re.fullmatch(r"DECLARE\s+(@\w+)\s+\w+", text, re.I):
            self.variables[match.group(1)[1:]] = None
            return b""
        match = re.fullmatch(r"EXEC(?:UTE)?\s+(?:(@\w+)\s*=\s*)?(?:dbo\.|sys\.)?(\w+)(.*)", text, re.I | re.S)
        procedure = self.PROCEDURES.get(match.group(2).lower()) if match else None
        if not procedure:
            raise ServerError(2812, "Could not find stored procedure: " + text)
        arguments = {name.lower(): int(value) if re.fullmatch(r"-?\d+", value) else value.lstrip("N").strip("'")
                     for name, value in re.findall(r"@(\w+)\s*=\s*(N?'(?:[^']|'')*'|-?\w+)", match.group(3))}
        result = procedure(self, arguments)
        if result is None:
            return None
        if match.group(1):
            self.variables[match.group(1)[1:]] = result
        return wire.return_status(result) + wire.done(token=0xFE)

    def get_lock(self, arguments):
        if arguments.get("lockowner") != "Session" or arguments.get("lockmode") != "Exclusive":
            raise ServerError(40510, "The stand-in knows exclusive locks of sessions only.")
        if self.refuses_locks:
            return -999
        seconds = arguments.get("locktimeout", self.lock_timeout) / 1000
        result = locks.get((self.database.name, arguments["resource"]), self, seconds, self.interrupted)
        return None if result == -2 else result

    def release_lock(self, arguments):
        if locks.release((self.database.name, arguments["resource"]), self):
            return 0
        raise ServerError(1223, "Cannot release the application lock (Resource: '%s') because it is not currently held."
                          % arguments["resource"])

    def list_locks(self):
        """The named locks as the server shows them: the first 32 characters of the name and a hash."""
        self.database.lite.execute("DELETE FROM temp.sys_dm_tran_locks")
        self.database.lite.executemany(
            "INSERT INTO temp.sys_dm_tran_locks VALUES ('APPLICATION', ?, ?)",
            [(owner.number, "0:[%s]:(%08x)" % (name[:32], hash(name) & 0xFFFFFFFF))
             for (database, name), (owner, _) in list(locks.held.items()) if database == self.database.name])

    def count_attentions(self, _):
        """How often the client has given up a statement."""
        return self.attentions

    def refuse_locks(self, _):
        self.refuses_locks = True
        return 0

    def fail(self, arguments):
        """As if the last statement had failed with that number. A deadlock ends the transaction."""
        if arguments["number"] == 1205 and self.database.lite.in_transaction:
            self.execute("ROLLBACK")
        raise ServerError(arguments["number"], "A failure that a test has asked for.")

    def copy_database(self, arguments):
        databases.copy(self.server.folder, arguments["from"], arguments["to"])
        return 0

    def set_option(self, text):
        option = re.sub(r"\s+", " ", text).upper().split(" ")[1:]
        if option[0] == "NOCOUNT":
            self.no_count = option[1] == "ON"
        elif option[0] == "IDENTITY_INSERT":
            self.identity_insert = option[1].strip("[]").lower() if option[2] == "ON" else None
        elif option[0] == "LOCK_TIMEOUT":
            self.lock_timeout = int(option[1])
            milliseconds = self.lock_timeout if self.lock_timeout >= 0 else 30000
            self.database.lite.execute("PRAGMA busy_timeout=%d" % milliseconds)
        return wire.done()

    def wait_for(self, text):
        hours, minutes, seconds = re.search(r"'(\d+):(\d+):(\d+(?:\.\d+)?)'", text).groups()
        end = time.monotonic() + int(hours) * 3600 + int(minutes) * 60 + float(seconds)
        while time.monotonic() < end:
            if self.interrupted():
                return None
            time.sleep(0.01)
        return wire.done()

    def transaction(self, text):
        verb = text.upper().split()[0]
        if verb == "IF":
            if not self.database.lite.in_transaction:
                return wire.done()
            verb = "ROLLBACK"
        if verb != "BEGIN" and not self.database.lite.in_transaction:
            raise ServerError(3902, "The %s TRANSACTION request has no corresponding BEGIN TRANSACTION." % verb)
        self.execute({"BEGIN": "BEGIN IMMEDIATE"}.get(verb, verb))
        return wire.done()

    def define(self, text):
        verb, what = text.upper().split()[:2]
        if (verb, what) == ("CREATE", "DATABASE"):
            databases.create(self.server.folder, text.split()[2].strip("[]"))
        elif (verb, what) == ("CREATE", "SCHEMA"):
            pass
        elif (verb, what) == ("CREATE", "TABLE"):
            self.database.create_table(text)
        elif (verb, what) == ("ALTER", "TABLE"):
            self.database.add_column(text)
        elif (verb, what) == ("DROP", "TABLE"):
            self.database.drop_table(text.split()[2].strip("[]"))
        elif (verb, what) == ("CREATE", "TRIGGER"):
            match = re.match(r"CREATE\s+TRIGGER\s+(\w+)\s+ON\s+([\w.]+)\s+(?:AFTER|FOR)\s+([\w\s,]+?)\s+AS\s+(.*)",
                             text, re.I | re.S)
            name, table, events, body = match.groups()
            self.execute("INSERT INTO sys_of_triggers VALUES (?,?,?,?,0)", (name, table, events.upper(), body))
        elif (verb, what) == ("DISABLE", "TRIGGER"):
            self.execute("UPDATE sys_of_triggers SET is_disabled=1 WHERE name=? COLLATE NOCASE", (text.split()[2], ))
        elif what == "TRIGGER":
            self.execute("DELETE FROM sys_of_triggers WHERE name=? COLLATE NOCASE", (text.split()[2].strip("[]"), ))
        elif (verb, what) == ("DROP", "INDEX"):
            self.execute("DROP INDEX " + text.split()[2])
            self.execute("DELETE FROM sys_of_indexes WHERE name=? COLLATE NOCASE", (text.split()[2], ))
        elif (verb, what) == ("ALTER", "INDEX"):  # to disable it
            self.execute("UPDATE sys_of_indexes SET is_disabled=1 WHERE name=? COLLATE NOCASE", (text.split()[2], ))
        else:
            index, row = databases.index_of(text)
            self.execute(index)
            self.execute("INSERT INTO sys_of_indexes VALUES (?,?,?,?,?,0)", row)
        return wire.done()

    def kill(self, text):
        self.server.drop(int(text.split()[1]))
        return wire.done()

    STEPS = {"SET": set_option, "WAITFOR DELAY": wait_for, "BEGIN TRAN": transaction, "BEGIN TRANSACTION": transaction,
             "COMMIT": transaction, "ROLLBACK": transaction, "IF @@TRANCOUNT > 0 ROLLBACK": transaction, "CREATE": define, "ALTER": define,
             "DROP": define, "DISABLE": define, "KILL": kill}
    PROCEDURES = {"sp_getapplock": get_lock, "sp_releaseapplock": release_lock, "standin_copy": copy_database,
                  "standin_fail": fail, "standin_attentions": count_attentions, "standin_refuse_locks": refuse_locks}


def joined(parts):
    """Each DONE but the last one says that more follows."""
    return b"".join(part[:-12] + bytes([part[-12] | wire.MORE]) + part[-11:] for part in parts[:-1]) + parts[-1]
