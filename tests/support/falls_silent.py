#!/usr/bin/python3
"""Passes bytes between clients and a server until a client sends a word, and nothing from then on.

The connections stay open, as those of a server that hangs. It takes the server's address and port and the word, prints
its own port on 127.0.0.1 and then that it is silent, and ends when its standard input is closed.
"""

import socket
import sys
import threading


def pass_on(source, target, words, silent):
    while data := source.recv(65536):
        if any(word in data for word in words):
            silent.set()
            print("silent", flush=True)
        if not silent.is_set():
            target.sendall(data)


def main():
    host, port, word = sys.argv[1:]
    silent = threading.Event()
    listener = socket.create_server(("127.0.0.1", 0))

    def serve():
        while True:
            client, _ = listener.accept()
            server = socket.create_connection((host, int(port)))
            words = word.encode(), word.encode("utf-16-le")
            for ends in (client, server, words, silent), (server, client, (), silent):
                threading.Thread(target=pass_on, args=ends, daemon=True).start()

    threading.Thread(target=serve, daemon=True).start()
    print(listener.getsockname()[1], flush=True)
    sys.stdin.read()


main()
