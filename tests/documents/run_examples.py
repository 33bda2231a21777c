#!/usr/bin/python3
"""Runs the examples of the documents in fresh demo shops: run_examples.py KEST2 FOLDER_OF_THE_SOURCE

A block with lines that begin with "$ " is a session. All sessions of a document run in one shop, in their order, and
print what the document shows; "..." stands for any lines, or for the rest of a line. In other blocks, each line that begins with "kest2" runs in a
shop of its own and must do what it says: it succeeds, prints JSON if it says so, prints the rows of a list, and a setting
can be read as it was set. A block of JSON is written to the file
that the text before it names. The box of the demo's damaged message is left out, as automation.md says.
"""
import json
import os
import pathlib
import re
import shlex
import shutil
import subprocess
import sys
import tempfile

KEST2, SOURCE = pathlib.Path(sys.argv[1]), pathlib.Path(sys.argv[2])
DAMAGED = "[critical] KEST: Message QREQ_20554_1.xml unreadable"
faults = []


def blocks(text):
    """Yields the language, the lines and the text before each fenced block."""
    before, language, lines = [], None, []
    for line in text.splitlines():
        if line.startswith("```") and language is None:
            language, lines = line[3:], []
        elif line.startswith("```"):
            yield language, lines, " ".join(before[-3:])
            before, language = [], None
        elif language is not None:
            lines.append(line)
        else:
            before.append(line)


def commands(lines):
    """Yields each command of a session, which goes on to the end of its quotes, and the lines that it prints."""
    command, output = None, []
    for line in lines:
        if command is not None and not output and command.count("'") % 2:
            command += "\n" + line
        elif line.startswith("$ "):
            if command is not None:
                yield command, output
            command, output = line[2:], []
        else:
            output.append(line)
    yield command, output


def run(command, shop, folder, errors=subprocess.STDOUT):
    environment = {"PATH": f"{folder}/bin:/usr/bin:/bin", "HOME": str(folder), "KEST2_PROFILE": str(shop),
                   "LC_ALL": "C.UTF-8", "LSAN_OPTIONS": os.environ.get("LSAN_OPTIONS", "")}
    done = subprocess.run(["bash", "-c", command], cwd=folder, env=environment, input="secret\n", text=True,
                          stdout=subprocess.PIPE, stderr=errors, timeout=120)
    return done.returncode, [line for line in done.stdout.splitlines() if not line.startswith(DAMAGED)]


def check_session(where, command, expected, shop, folder):
    parts = [re.escape(line).replace(r"\.\.\.", ".*") if line != "..." else None for line in expected]
    pattern = "".join(r"(?:.*\n)*" if part is None else part + r"\n" for part in parts)
    _, printed = run(command, shop, folder)
    if not re.fullmatch(pattern, "".join(line + "\n" for line in printed)):
        faults.append(f"{where}: $ {command}\nprinted:\n" + "\n".join(printed) + "\nbut the document shows:\n" +
                      "\n".join(expected))


def does_as_told(command, printed, shop, folder):
    words = shlex.split(command)
    if words[1] == "--json":
        answer = json.loads("\n".join(printed))
        return answer["command"] == words[2] and answer["result"] is True
    if words[1:3] == ["setting", "set"] and len(words) == 7:
        return run(shlex.join(["kest2", "setting", "get", *words[3:6]]), shop, folder)[1] == [words[6]]
    return words[1] != "list" or all(line.count("\t") == 6 for line in printed) and len(printed) > 1


def check_line(where, line, fresh, folder):
    command = re.split(r" {2,}", line)[0]
    if re.search(r" open\b", command):
        return  # it needs a person
    shop = folder / "one"
    shutil.copytree(fresh, shop)
    command = re.sub(r"--profile \S+ ", "", command)
    code, printed = run(command, shop, folder, subprocess.DEVNULL)
    if code != 0 or not does_as_told(command, printed, shop, folder):
        faults.append(f"{where}: {command}\nends with {code} and prints:\n" + "\n".join(printed))
    shutil.rmtree(shop)


def check(document, fresh, folder):
    shop = folder / "shop"
    shutil.copytree(fresh, shop)
    ran = 0
    for language, lines, before in blocks((SOURCE / document).read_text()):
        if language == "json":
            if names := re.findall(r"`(\w+\.json)`", before):
                (folder / names[-1]).write_text("\n".join(lines))
        elif any(line.startswith("$ ") for line in lines):
            for command, expected in commands(lines):
                check_session(document, command, expected, shop, folder)
                ran += 1
        else:
            for line in lines:
                if re.match(r"kest2 (?!\[)", line):
                    check_line(document, line, fresh, folder)
                    ran += 1
    if ran == 0:
        faults.append(f"{document}: it has no example")
    shutil.rmtree(shop)


with tempfile.TemporaryDirectory(prefix="kest2-documents-") as name:
    place = pathlib.Path(name)
    (place / "bin").mkdir()
    (place / "bin/kest2").symlink_to(KEST2.resolve())
    made, said = run("kest2 init --demo", place / "fresh", place)
    if made != 0:
        sys.exit("kest2 init --demo fails: " + "\n".join(said))
    for document in ("README.md", "docs/automation.md", "docs/operating.md"):
        check(document, place / "fresh", place)
print("\n\n".join(faults))
sys.exit(1 if faults else 0)
