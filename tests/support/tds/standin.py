#!/usr/bin/python3
"""A stand-in for SQL Server in tests: it speaks TDS 7.4 with a real driver and keeps its tables in SQLite files.

What it shows: how the driver and the component cope with a server that names no base table of a column, sends one result
at a time, counts what triggers do, gives identities, drops a connection, or is slow.

What it is not: it has no lock manager (a change locks its whole database), knows few of the server's conversions, one
collation (without regard to case and trailing blanks, accents told apart) and no query plans, and it takes only the
statements that tests and the component send. Whether a statement is correct T-SQL a parser of that language has to say.

It prints "ready ADDRESS" and listens there on the server's usual port 1433, on a loopback address of its own, and
answers as the instance browser on UDP port 1434. It ends when its standard input is closed.
"""

import argparse
import os
import random
import re
import select
import socket
import struct
import sys
import threading

import databases
import session
import wire
from translation import ServerError, tokens_of

INSTANCE = "SHOP"


class Interrupted(Exception):
    pass


class Client(threading.Thread):
    """One connection: packets in, packets out."""

    def __init__(self, server, number, connection):
        super().__init__(daemon=True)
        self.server, self.number, self.connection, self.session = server, number, connection, None
        self.stream = connection.makefile("rb")

    def run(self):
        try:
            while True:
                kind, message = self.receive()
                if kind == wire.PRELOGIN:
                    self.send(wire.prelogin_answer())
                elif kind == wire.LOGIN:
                    if not self.login(message):
                        break
                elif kind == wire.SQL_BATCH:
                    self.batch(wire.batch_text(message))
                elif kind == wire.ATTENTION:
                    self.session.attentions += 1
                    self.send(wire.done(wire.ATTENDED))
                elif kind == wire.TRANSACTION:
                    self.transaction(message)
                else:
                    self.send(wire.error(2812, "The stand-in knows no remote procedures.") + wire.done(wire.ERROR))
        except OSError:
            pass  # the client has gone, or was dropped
        finally:
            self.server.clients.pop(self.number, None)
            if self.session:
                self.session.close()
            self.connection.close()

    def receive(self):
        parts, last = [], False
        while not last:
            kind, status, length = struct.unpack(">BBH", self.read(8)[:4])
            parts.append(self.read(length - 8))
            last = status & 1
        return kind, b"".join(parts)

    def read(self, length):
        data = self.stream.read(length)
        if len(data) < length:
            raise OSError("closed")
        return data

    def send(self, tokens):
        for number, start in enumerate(range(0, max(len(tokens), 1), 4088), 1):
            part = tokens[start:start + 4088]
            last = start + 4088 >= len(tokens)
            head = struct.pack(">BBHHBB", wire.RESPONSE, last, len(part) + 8, self.number, number & 255, 0)
            self.connection.sendall(head + part)

    def login(self, message):
        user, password, database = wire.login_fields(message)
        refusal = b""
        if self.server.logins.get(user) != password:
            refusal = wire.error(18456, "Login failed for user '%s'." % user, 14)
        elif not os.path.exists(databases.file_of(self.server.folder, database or "master")):
            refusal = wire.error(4060, 'Cannot open database "%s" requested by the login.' % database, 11)
        if refusal:
            self.send(refusal + wire.done(wire.ERROR))
            return False
        self.session = session.Session(self.server, self.number, database or "master", self.interrupted)
        self.send(wire.login_answer(database or "master"))
        return True

    def interrupted(self):
        """True if the client has sent something while its batch runs: only an attention can come then."""
        return bool(select.select([self.connection], [], [], 0)[0])

    def batch(self, text):
        tokens = self.session.answer(text)
        if tokens is not None:
            self.send(tokens)

    def transaction(self, message):
        kind = struct.unpack_from("<H", message, struct.unpack_from("<I", message)[0])[0]
        text, number = {5: ("BEGIN TRANSACTION", 8), 7: ("COMMIT", 9), 8: ("ROLLBACK", 10)}[kind]
        descriptor = b"\x08" + struct.pack("<Q", self.number)
        new, old = (descriptor, b"\x00") if kind == 5 else (b"\x00", descriptor)
        try:
            self.session.transaction(text)
            self.send(wire.change(number, new, old) + wire.done())
        except ServerError as failure:
            self.send(wire.error(failure.number, failure.message) + wire.done(wire.ERROR))


class Server:
    def __init__(self, folder, logins, statements):
        self.folder, self.logins, self.statements = folder, logins, statements
        self.clients, self.recorded, self.lock = {}, set(), threading.Lock()
        databases.create(folder, "master")
        self.address, self.listener, self.browser = self.listen()

    @staticmethod
    def listen():
        """An address of 127.0.0.0/8 whose two ports nobody has."""
        while True:
            address = "127.%d.%d.%d" % (random.randint(1, 254), random.randint(0, 254), random.randint(1, 254))
            listener, browser = socket.socket(), socket.socket(type=socket.SOCK_DGRAM)
            try:
                listener.bind((address, 1433))
                browser.bind((address, 1434))
                listener.listen(20)
                return address, listener, browser
            except OSError:
                listener.close()
                browser.close()

    def accept(self):
        number = 50
        while True:
            connection, _ = self.listener.accept()
            connection.setsockopt(socket.IPPROTO_TCP, socket.TCP_NODELAY, 1)
            number += 1
            client = self.clients[number] = Client(self, number, connection)
            client.start()

    def browse(self):
        """Tells the port of the one instance, as the browser service does."""
        while True:
            question, asker = self.browser.recvfrom(1024)
            if question[:1] == b"\x04" and question[1:].rstrip(b"\0").decode().upper() == INSTANCE:
                answer = "ServerName;STANDIN;InstanceName;%s;IsClustered;No;Version;15.0.2000.5;tcp;1433;;" % INSTANCE
                self.browser.sendto(b"\x05" + struct.pack("<H", len(answer)) + answer.encode(), asker)

    def drop(self, number):
        if client := self.clients.get(number):
            client.connection.shutdown(socket.SHUT_RDWR)

    def record(self, batch):
        """Keeps a batch for the check of the dialect, once for all that differ in their values only."""
        if not self.statements:
            return
        kept = "".join(representative(kind, part) for kind, part in tokens_of(batch))
        kept = re.sub(r"\s+", " ", kept).strip()
        with self.lock:
            if kept not in self.recorded:
                self.recorded.add(kept)
                with open(self.statements, "a", encoding="utf-8") as file:
                    file.write(kept + "\n")


def representative(kind, part):
    """A value of the same sort: what a parser or the rules for literals see is kept."""
    if kind == "number":
        return "1" if part.isdigit() else "1.5"
    if kind != "text":
        return part
    prefix, value = ("N", part[2:-1]) if part[0] in "Nn" else ("", part[1:-1])
    if re.fullmatch(r"\d{4}-\d\d-\d\d.*", value):
        value = re.sub(r"\d", "1", value[:19])
    elif not value.isascii():
        value = "é"
    elif value:
        value = "a"
    return "%s'%s'" % (prefix, value)


def main():
    options = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    options.add_argument("--folder", required=True, help="where its databases lie")
    options.add_argument("--login", action="append", default=[], metavar="USER:PASSWORD")
    options.add_argument("--statements", help="a file that distinct statements are added to")
    given = options.parse_args()
    server = Server(given.folder, dict(login.split(":", 1) for login in given.login), given.statements)
    for task in (server.accept, server.browse):
        threading.Thread(target=task, daemon=True).start()
    print("ready", server.address, flush=True)
    sys.stdin.read()


if __name__ == "__main__":
    main()
