#!/usr/bin/python3
"""Holds the statements that the suite sent to the stand-in for SQL Server against a parser of T-SQL and rules of ours.

usage: check_statements.py FILE     one statement or batch a line, as the stand-in records them
"""

import functools
import logging
import multiprocessing
import os
import re
import sys

from sqlfluff.core import Linter

sys.path.insert(0, os.path.join(os.path.dirname(__file__), "..", "support", "tds"))
from translation import tokens_of  # noqa: E402

# the driver's own, and what the server knows but the parser does not
NOT_CHECKED = re.compile(r"sp_datatype_info\w* 1|SET LOCK_TIMEOUT -?1|KILL 1|ALTER INDEX \w+ ON \w+ DISABLE", re.I)

FUNCTIONS = {"COUNT", "MAX", "SCOPE_IDENTITY", "OBJECT_ID", "OBJECT_NAME", "OBJECT_SCHEMA_NAME", "COL_NAME", "COLUMNPROPERTY", "DB_NAME",
             "DATABASEPROPERTYEX", "SESSIONPROPERTY", "SCHEMA_NAME", "CHARINDEX", "LEFT", "REPLACE"}
BEFORE_PARENTHESIS = {"IN", "VALUES", "AND", "OR", "NOT", "WHERE", "FROM", "ON", "EXISTS", "AS", "SELECT", "NVARCHAR",
                      "WITH"}

CONTROLS = [  # each is refused
    "SELECT * FROM QUOTE1 LIMIT 1",
    "SELECT REGO || 'a' FROM CAR",
    "SELECT `REGO` FROM `CAR`",
    "SELECT * FROM CAR WHERE",
    "INSERT INTO CAR SET REGO='a'",
    "SELECT * FROM CAR WHERE KEST=TRUE",
    "SELECT * FROM CAR WHERE REGO REGEXP 'a'",
    "SELECT CONCAT(REGO, 'a') FROM CAR",
    "SELECT * FROM CAR WHERE REGO='a' COLLATE BINARY",
    "SELECT * FROM CAR WHERE REGO='é'",
    "SELECT * FROM CAR WHERE REGO=N'a'",
    "SELECT * FROM QUOTE1 WHERE qtndate='1111-11-11 11:11:11'",
    "SELECT * FROM QUOTE1 WHERE qtndate='1111-11-11'",
]


def broken_literal(literal, statement):
    """Without N, letters outside of ASCII depend on the database; with it, an index on a varchar column is of no use.
    A date without its "T" depends on the language of the login."""
    value = literal[literal.index("'") + 1:-1]
    if not value.isascii() and literal[0] != "N":
        return "a literal with letters outside of ASCII lacks its N"
    if value.isascii() and literal[0] == "N" and not re.search(r"^DECLARE|^EXEC| FROM sys\.", statement, re.I):
        return "the N of an ASCII literal costs the index"
    if re.match(r"\d{4}-\d\d-\d\d(?!T\d\d:\d\d)", value):
        return "a date lacks its T"
    return None


def broken_rule(statement):
    """What no parser of the language can know."""
    tokens = [token for token in tokens_of(statement) if token[0] != "blank"]
    for place, (kind, part) in enumerate(tokens):
        after = tokens[place + 1][1] if place + 1 < len(tokens) else ""
        word = part.upper()
        if kind == "text" and (broken := broken_literal(part, statement)):
            return broken
        if kind == "word" and word in ("TRUE", "FALSE", "COLLATE", "REGEXP"):
            return "the server knows no " + word
        if kind == "word" and after == "(" and place and not part.startswith("@"):
            is_table = tokens[place - 1][1].upper() == "INTO" or tokens[0][1].upper() in ("CREATE", "ALTER")
            if word not in FUNCTIONS | BEFORE_PARENTHESIS and not is_table:
                return "the function %s is not among those that we use" % part
    return None


def form_of(statement):
    """The statement as far as the parser can tell it from others: with one name in all brackets, and equal parts of a
    list only twice."""
    form = re.sub(r"KEST2_CHECK_[0-9A-F]{8}", "KEST2_CHECK", re.sub(r"\[\w+\]", "[x]", statement))
    for part in (r"\[x\]=N?'[^']*'", r"\[x\]=[\w.]+", r"\[x\]", r"N?'[^']*'", r"[\d.]+", "NULL", r"\([^()]*\)"):
        form = re.sub(r"(%s)(?:, ?\1){2,}" % part, r"\1, \1", form)
    return form


@functools.lru_cache
def parser():
    logging.disable(logging.CRITICAL)
    return Linter(dialect="tsql")


def refusal(statement):
    violations = parser().parse_string(statement + "\n").violations
    return statement, violations[0].desc() if violations else None


def main():
    try:
        with open(sys.argv[1], encoding="utf-8") as file:
            statements = sorted(set(file.read().splitlines()))
    except OSError as failure:
        sys.exit("No statements were recorded: %s" % failure)
    failures = []
    parts = {part for batch in statements for part in batch.split("; ")}
    forms = {form_of(part): part for part in parts if not NOT_CHECKED.fullmatch(part)}
    with multiprocessing.Pool() as pool:
        for statement, why in pool.imap(refusal, map(form_of, CONTROLS)):
            if not (why or broken_rule(statement)):
                failures.append("NOT REFUSED: " + statement)
        for form, why in pool.imap_unordered(refusal, forms, 8):
            if why:
                failures.append("%s\n    %s" % (forms[form], why))
    for statement in statements:
        if why := broken_rule(statement):
            failures.append("%s\n    %s" % (statement, why))
    for failure in failures:
        print(failure)
    print("%d statements in %d forms, %d failures" % (len(statements), len(forms), len(failures)))
    sys.exit(1 if failures or not statements else 0)


if __name__ == "__main__":
    main()
