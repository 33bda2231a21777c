#!/usr/bin/python3
"""Holds what the stand-in answers against what SQL Server answers.

usage: check_answers.py FILE     one statement a line: client | statement | answer
"""

import sys
import tempfile
from unittest import mock

import databases
import wire
from session import Session

TABLES = """
CREATE TABLE SIMULATED (id INT IDENTITY(1,1) NOT NULL PRIMARY KEY, CODE VARCHAR(20), SEQ INT, flag BIT, day DATETIME,
    notes TEXT, local NVARCHAR(20), version TIMESTAMP);
CREATE TABLE AUDIT (id INT IDENTITY(1,1) PRIMARY KEY, what VARCHAR(20));
INSERT INTO AUDIT (what) VALUES ('first'); INSERT INTO AUDIT (what) VALUES ('second')"""


class Server:
    """What a session needs of its server."""

    def __init__(self, folder):
        self.folder = folder
        databases.create(folder, "shop")
        self.clients = [Session(self, number, "shop", lambda: False) for number in range(2)]

    def record(self, batch):
        pass

    def drop(self, number):
        self.clients[number].close()


def answer(client, batch):
    """The last value, 0 if there is none, or the first error."""
    with mock.patch.object(wire, "rows", wraps=wire.rows) as rows, \
            mock.patch.object(wire, "error", wraps=wire.error) as error:
        client.answer(batch)
    if error.called:
        return "error %d" % error.call_args_list[0].args[0]
    values = [value for call in rows.call_args_list for row in call.args[1] for value in row]
    return str(values[-1]) if values else "0"


def main():
    cases = faults = 0
    with open(sys.argv[1], encoding="utf-8") as file, tempfile.TemporaryDirectory() as folder:
        server = Server(folder)
        server.clients[0].answer(TABLES)
        for line in file:
            if line.startswith("#") or not line.strip():
                continue
            cases += 1
            client, statement, expected = (cell.strip() for cell in line.split(" | "))
            found = answer(server.clients[("one", "two").index(client)], statement)
            if found != expected:
                faults += 1
                print("%s: %s instead of %s" % (statement, found, expected))
    sys.exit(faults > 0 or cases == 0)


if __name__ == "__main__":
    main()
