#!/usr/bin/python3
"""Holds the statements that the suite sent to the stand-in for SQL Server against a parser of T-SQL and rules of ours.

usage: check_statements.py FILE     one statement or batch a line, as the stand-in records them
"""

import logging
import multiprocessing
import os
import re
import sys

from sqlfluff.core import Linter

sys.path.insert(0, os.path.join(os.path.dirname(__file__), "..", "support", "tds"))
from translation import tokens_of  # noqa: E402

# the driver's own, and what the server knows but the parser does not
NOT_CHECKED = re.compile(r"sp_datatype_info\w* 1|SET LOCK_TIMEOUT -?1|KILL 1", re.I)

FUNCTIONS = {"COUNT", "MAX", "SCOPE_IDENTITY", "OBJECT_ID", "OBJECT_NAME", "COL_NAME", "COLUMNPROPERTY", "DB_NAME",
             "DATABASEPROPERTYEX", "SESSIONPROPERTY", "SCHEMA_NAME"}
BEFORE_PARENTHESIS = {"IN", "VALUES", "AND", "OR", "NOT", "WHERE", "FROM", "ON", "EXISTS", "AS", "SELECT", "NVARCHAR", "WITH"}

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
]


def broken_rule(statement):
    """What no parser of the language can know."""
    tokens = [token for token in tokens_of(statement) if token[0] != "blank"]
    for place, (kind, part) in enumerate(tokens):
        after = tokens[place + 1][1] if place + 1 < len(tokens) else ""
        word = part.upper()
        if kind == "word" and word in ("TRUE", "FALSE", "COLLATE", "REGEXP"):
            return "the server knows no " + word
        if kind == "word" and after == "(" and place and not part.startswith("@"):
            is_table = tokens[place - 1][1].upper() == "INTO" or tokens[0][1].upper() in ("CREATE", "ALTER")
            if word not in FUNCTIONS | BEFORE_PARENTHESIS and not is_table:
                return "the function %s is not among those that we use" % part
    return None


def refusal(statement):
    logging.disable(logging.CRITICAL)
    broken = broken_rule(statement)
    if broken or NOT_CHECKED.fullmatch(statement):
        return statement, broken
    violations = Linter(dialect="tsql").parse_string(statement + "\n").violations
    return statement, violations[0].desc() if violations else None


def main():
    try:
        with open(sys.argv[1], encoding="utf-8") as file:
            statements = sorted(set(file.read().splitlines()))
    except OSError as failure:
        sys.exit("No statements were recorded: %s" % failure)
    failures = 0
    with multiprocessing.Pool() as pool:
        for statement, why in pool.imap(refusal, CONTROLS):
            if why is None:
                failures += 1
                print("NOT REFUSED: %s" % statement)
        for statement, why in pool.imap_unordered(refusal, statements, 8):
            if why is not None:
                failures += 1
                print("%s\n    %s" % (statement, why))
    print("%d statements, %d failures" % (len(statements), failures))
    sys.exit(1 if failures or not statements else 0)


if __name__ == "__main__":
    main()
