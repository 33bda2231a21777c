"""From T-SQL to SQLite: one statement, with the types of what it gives.

Parsing is sqlglot's. Added is what the types of columns decide: "+" joins texts, a literal that meets a number or a
date is converted or refused, a long text is not compared.
"""

import re
from typing import NamedTuple

import sqlglot
from sqlglot import exp

from wire import Type


class ServerError(Exception):
    def __init__(self, number, message, severity=16):
        super().__init__(message)
        self.number, self.message, self.severity = number, message, severity


TOKEN = re.compile(
    r"""(?P<text>N?'(?:[^']|'')*')
      | (?P<name>\[(?:[^\]]|\]\])*\]|"(?:[^"]|"")*")
      | (?P<number>\d+(?P<fraction>\.\d*)?(?P<exponent>e[+-]?\d+)?)
      | (?P<word>[@\w\#$]+)
      | (?P<blank>\s+|--[^\n]*)
      | (?P<symbol>.)""",
    re.X | re.S | re.I)


def tokens_of(batch):
    return [(match.lastgroup if match.lastgroup not in ("fraction", "exponent") else "number", match.group())
            for match in TOKEN.finditer(batch)]


def statements_of(batch):
    """The statements between the semicolons, as tokens."""
    statements = [[]]
    for token in tokens_of(batch):
        if token == ("symbol", ";"):
            statements.append([])
        else:
            statements[-1].append(token)
    return [statement for statement in statements if any(kind != "blank" for kind, _ in statement)]


def shape_of(statement):
    """The statement with a parameter in place of each literal, and the values of those.

    A parameter's first letter tells what it was: s text, u national text, i whole number, f another number.
    """
    text, values, after_top = "", {}, False
    for kind, part in statement:
        if (kind, part.upper()) in (("word", "LIMIT"), ("symbol", "|"), ("symbol", "`")):
            raise ServerError(102, "Incorrect syntax near '%s'." % part, 15)
        if kind == "text":
            national = part[0] in "Nn"
            value = part[2 if national else 1:-1].replace("''", "'")
            name = ("u%d" if national else "s%d") % len(values)
            values[name] = value if national else value.encode("cp1252", "replace").decode("cp1252")
        elif kind == "number" and not after_top:
            whole = part.isdigit()
            name = ("i%d" if whole else "f%d") % len(values)
            values[name] = int(part) if whole else float(part)
        elif kind == "word" and part.startswith("@@"):
            name = "v_" + part[2:].lower()
        else:
            text += part
            after_top = kind == "blank" and after_top or part == "(" and after_top or part.upper() == "TOP"
            continue
        text += "@" + name
    return text, values


INT, BIGINT, FLOAT, NAME = Type("int"), Type("bigint"), Type("float"), Type("nvarchar", 128)
PARAMETERS = {"s": Type("varchar", 8000), "u": Type("nvarchar", 4000), "i": INT, "f": FLOAT}
VARIABLES = {"v_identity": Type("numeric", 38), "v_version": Type("nvarchar", 300), "v_language": NAME}
FUNCTIONS = {"SCOPE_IDENTITY": Type("numeric", 38), "DB_NAME": NAME, "SCHEMA_NAME": NAME, "SERVERPROPERTY": NAME,
             "DATABASEPROPERTYEX": NAME, "OBJECT_NAME": NAME, "OBJECT_SCHEMA_NAME": NAME, "COL_NAME": NAME}


class Plan(NamedTuple):
    text: str  # in SQLite's words
    verb: str  # SELECT, INSERT, UPDATE, DELETE
    table: str  # that is changed
    columns: list  # (name, type, table) of what it gives


class Column(NamedTuple):
    name: str
    kind: Type
    identity: bool


class Translator:
    """One statement; `schema` gives the columns of a table by its name, or None.

    An INSERT into the table `identity_insert` must give the identity, and no other may.
    """

    def __init__(self, shape, schema, identity_insert=None):
        self.schema, self.identity_insert = schema, identity_insert
        try:
            parsed = sqlglot.parse(shape, read="tsql")
            if len(parsed) != 1:
                raise ServerError(102, "Incorrect syntax.", 15)
            self.tree = parsed[0]
        except (sqlglot.ParseError, ValueError) as failure:
            raise ServerError(102, "Incorrect syntax: " + str(failure).split("\n")[0], 15) from failure

    def plan(self):
        verb = self.tree.key.upper()
        if verb not in ("SELECT", "UNION", "INSERT", "UPDATE", "DELETE"):
            raise ServerError(40510, "The stand-in knows no statement " + verb)
        for table in list(self.tree.find_all(exp.Table)):
            self.take(table)
        self.check()
        columns, table = [], ""
        if verb in ("SELECT", "UNION"):
            columns = self.result_of(self.tree if verb == "SELECT" else self.tree.find(exp.Select))
        else:
            table = self.tree.find(exp.Table).name
            self.convert_assigned(verb, table)
        self.convert_compared()
        self.join_texts()
        for function in self.tree.find_all(exp.Anonymous):
            if function.name.upper() == "LEFT":  # the name of a join in SQLite
                function.set("this", "SUBSTR")
                function.expressions.insert(1, exp.Literal.number(1))
        return Plan(self.tree.sql("sqlite").replace("CURRENT_TIMESTAMP()", "CURRENT_TIMESTAMP"), verb, table, columns)

    def take(self, table):
        """System views are tables of their own name here; the schema of all others is "dbo"."""
        qualifier = (table.args.get("db") and table.args["db"].name or "dbo").lower()
        if qualifier != "dbo":
            table.set("this", exp.to_identifier(qualifier + "_" + table.name.lower(), quoted=True))
        table.set("db", None)
        table.set("hints", None)  # about locks, which a change here has of its whole database
        if self.schema(table.name) is None:
            raise ServerError(208, "Invalid object name '%s'." % table.name)

    def check(self):
        for flag in self.tree.find_all(exp.Boolean):
            raise ServerError(207, "Invalid column name '%s'." % flag.sql())
        for column in self.tree.find_all(exp.Column):
            if not isinstance(column.this, exp.Star) and not column.name.startswith("@"):
                self.column(column)

    def tables_around(self, node):
        """(alias, table or the select in its place), from the innermost select or change outwards."""
        while node is not None:
            if isinstance(node, exp.Select):
                sources = list(node.args["from"].expressions) if node.args.get("from") else []
                sources += [join.this for join in node.args.get("joins") or []]
                yield from ((source.alias_or_name, source) for source in sources)
            elif isinstance(node, (exp.Update, exp.Delete, exp.Insert)):
                table = node.find(exp.Table)
                yield table.alias_or_name, table
            node = node.parent

    def columns_of(self, source):
        if isinstance(source, exp.Table):
            return [(column.name, column.kind, source.name) for column in self.schema(source.name)]
        return self.result_of(source.find(exp.Select))

    def column(self, node):
        wanted = node.name.lower()
        for alias, source in self.tables_around(node):
            if node.table and node.table.lower() not in (alias.lower(), source.name.lower()):
                continue
            for found in self.columns_of(source):
                if found[0].lower() == wanted:
                    return found
        select = node.find_ancestor(exp.Select)
        for given in select.expressions if select else []:
            if isinstance(given, exp.Alias) and given.alias.lower() == wanted and node.find_ancestor(exp.Order):
                return given.alias, self.type_of(given.this), ""
        raise ServerError(207, "Invalid column name '%s'." % node.name)

    def result_of(self, select):
        columns = []
        for given in select.expressions:
            if given.find(exp.Star) is given or isinstance(given, exp.Column) and isinstance(given.this, exp.Star):
                for alias, source in self.tables_around(select):
                    if not given.args.get("table") or given.table.lower() == alias.lower():
                        columns += self.columns_of(source)
            elif isinstance(given, exp.Column) and not given.name.startswith("@"):
                columns.append(self.column(given))
            else:
                inner = given.this if isinstance(given, exp.Alias) else given
                columns.append((given.alias, self.type_of(inner), ""))
        return columns

    def type_of(self, node):
        if isinstance(node, exp.Column):
            if node.name.startswith("@"):
                name = node.name[1:]
                return VARIABLES.get(name) or (INT if name.startswith("v_") else PARAMETERS.get(name[0], INT))
            return self.column(node)[1]
        if isinstance(node, exp.Cast):
            size = node.args["to"].expressions
            return Type(node.args["to"].this.name.lower().replace("double", "float"), int(size[0].name) if size else 30)
        if isinstance(node, (exp.Count, exp.Length, exp.Predicate)):
            return INT
        if isinstance(node, exp.CurrentTimestamp):
            return Type("datetime")
        if isinstance(node, exp.Anonymous):
            return FUNCTIONS.get(node.name.upper(), INT)
        if isinstance(node, exp.Case):
            node = node.args["ifs"][0].args["true"]
            return self.type_of(node)
        if isinstance(node, exp.Binary):
            kinds = [self.type_of(node.left), self.type_of(node.right)]
            return next((kind for kind in kinds if kind.is_text or kind.name == "float"), kinds[0])
        inner = node.args.get("this")
        return self.type_of(inner) if isinstance(inner, exp.Expression) else INT

    def convert(self, literal, kind):
        """Puts the server's conversion around a text literal that meets a column of another kind."""
        if not isinstance(literal, exp.Column) or literal.name[:2] not in ("@s", "@u"):
            return
        function = "as_" + kind.name if kind.is_date else "as_bit" if kind.name == "bit" else "as_number"
        if kind.name in ("image", "varbinary", "xml", "sql_variant"):
            return
        if kind.is_text:
            if kind.is_national or literal.name[1] == "s":
                return
            function = "as_code_page"  # a varchar column keeps no letter that its code page lacks
        literal.replace(exp.Anonymous(this=function, expressions=[literal.copy()]))

    def convert_compared(self):
        for node in list(self.tree.find_all(exp.EQ, exp.NEQ, exp.LT, exp.LTE, exp.GT, exp.GTE, exp.In, exp.Between)):
            if isinstance(node.parent, exp.Update) and node.arg_key == "expressions":
                continue  # an assignment
            sides = [side for side in node.args.values() for side in (side if isinstance(side, list) else [side])]
            for column in sides:
                if not isinstance(column, exp.Column) or column.name.startswith("@"):
                    continue
                kind = self.type_of(column)
                if not kind.is_comparable:
                    raise ServerError(402, "The data types %s and varchar are incompatible in the %s operator." %
                                      (kind.name, node.key))
                for side in sides:
                    if kind.is_number or kind.is_date:
                        self.convert(side, kind)

    def convert_assigned(self, verb, table):
        columns = self.schema(table)
        pairs = []
        if verb == "UPDATE":
            pairs = [(equals.left.name, equals.right) for equals in self.tree.expressions]
        elif verb == "INSERT":
            names = [column.name for column in self.tree.this.expressions]
            names = names or [column.name for column in columns if not column.identity]
            values = self.tree.args["expression"]
            rows = values.expressions if isinstance(values, exp.Values) else []
            pairs = [(name, value) for row in rows for name, value in zip(names, row.expressions)]
            pairs += [] if rows else [(name, None) for name in names]
            if table.lower() == self.identity_insert:
                identity = next(column.name.lower() for column in columns if column.identity)
                if identity not in [name.lower() for name in names]:
                    raise ServerError(545, "Explicit value must be specified for identity column in table '%s'." % table)
        for name, value in pairs:
            column = next((column for column in columns if column.name.lower() == name.lower()), None)
            if column is None:
                raise ServerError(207, "Invalid column name '%s'." % name)
            if column.identity and (verb == "UPDATE" or table.lower() != self.identity_insert):
                raise ServerError(*((8102, "Cannot update identity column '%s'." % name) if verb == "UPDATE" else
                                    (544, "Cannot insert explicit value for identity column in table '%s'." % table)))
            if column.kind.name in ("timestamp", "rowversion"):
                raise ServerError(273 if verb == "INSERT" else 272, "Cannot write a timestamp column.")
            self.convert(value, column.kind)

    def join_texts(self):
        for node in reversed(list(self.tree.find_all(exp.Add))):
            if self.type_of(node).is_text:
                node.replace(exp.DPipe(this=node.left.copy(), expression=node.right.copy()))
