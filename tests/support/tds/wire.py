"""TDS 7.4 as bytes: packets, tokens, and the types of columns with their values."""

import datetime
import decimal
import struct
from typing import NamedTuple, Optional

COLLATION = bytes([0x09, 0x04, 0xD0, 0x00, 0x34])  # Latin, without regard to case, code page 1252
CODE_PAGE = "cp1252"

# packet types
SQL_BATCH, RPC, RESPONSE, ATTENTION, TRANSACTION, LOGIN, PRELOGIN = 0x01, 0x03, 0x04, 0x06, 0x0E, 0x10, 0x12
# bits of the status of a DONE token
MORE, ERROR, COUNT, ATTENDED = 0x01, 0x02, 0x10, 0x20


class Type(NamedTuple):
    """A column's declared type; size None for none, -1 for "max"."""

    name: str
    size: Optional[int] = None
    scale: int = 0

    @property
    def is_text(self):
        return self.name in ("varchar", "nvarchar", "char", "nchar", "text", "ntext")

    @property
    def is_number(self):
        return self.name in INTEGERS or self.name in ("float", "real", "money", "smallmoney", "decimal", "numeric", "bit")

    @property
    def is_date(self):
        return self.name in ("datetime", "datetime2")

    @property
    def is_comparable(self):
        return self.name not in ("text", "ntext", "image", "xml", "sql_variant")

    @property
    def is_national(self):
        return self.name in ("nvarchar", "nchar", "ntext")


INTEGERS = {"tinyint": (1, "<B"), "smallint": (2, "<h"), "int": (4, "<i"), "bigint": (8, "<q")}
TEXT_TOKENS = {"varchar": 0xA7, "char": 0xAF, "nvarchar": 0xE7, "nchar": 0xEF}
LONG_TOKENS = {"text": 0x23, "ntext": 0x63, "image": 0x22}


def short_text(text):
    return bytes([len(text)]) + text.encode("utf-16-le")


def long_text(text):
    return struct.pack("<H", len(text)) + text.encode("utf-16-le")


def sized(body):
    return struct.pack("<H", len(body)) + body


def done(status=0, count=None, token=0xFD):
    """DONE, or DONEINPROC (0xFF) and DONEPROC (0xFE)."""
    status |= 0 if count is None else COUNT
    return struct.pack("<BHHQ", token, status, 0xC1, count or 0)


def error(number, message, severity=16, information=False):
    body = struct.pack("<iBB", number, 1, severity) + long_text(message)
    body += short_text("STANDIN") + short_text("") + struct.pack("<I", 1)
    return (b"\xab" if information else b"\xaa") + sized(body)


def change(kind, new, old=b"\x00"):
    return b"\xe3" + sized(bytes([kind]) + new + old)


def return_status(value):
    return b"\x79" + struct.pack("<i", value)


def login_answer(database):
    name = short_text("Microsoft SQL Server")
    acknowledged = b"\x01\x74\x00\x00\x04" + name + bytes([15, 0, 7, 0xD0])
    return (change(1, short_text(database)) + change(7, b"\x05" + COLLATION) + change(2, short_text("us_english")) +
            b"\xad" + sized(acknowledged) + change(4, short_text("4096"), short_text("4096")) + done())


def prelogin_answer():
    """Version, "no encryption", no instance, no thread, one statement at a time."""
    options = [(0, bytes([15, 0, 7, 0xD0, 0, 0])), (1, b"\x02"), (2, b"\x00"), (3, b""), (4, b"\x00")]
    head, body = b"", b""
    for kind, value in options:
        head += struct.pack(">BHH", kind, 5 * len(options) + 1 + len(body), len(value))
        body += value
    return head + b"\xff" + body


def login_fields(message):
    """User, password and database of a login."""
    places = struct.unpack_from("<18H", message, 36)

    def field(number):
        start, length = places[2 * number:2 * number + 2]
        return message[start:start + 2 * length]

    hidden = bytes(((byte ^ 0xA5) << 4 | (byte ^ 0xA5) >> 4) & 0xFF for byte in field(2))
    return tuple(part.decode("utf-16-le", "replace") for part in (field(1), hidden, field(8)))


def batch_text(message):
    return message[struct.unpack_from("<I", message)[0]:].decode("utf-16-le", "replace")


def declaration(kind, table):
    """The type of a column. A long text names its table, as no other type does."""
    name, size, scale = kind
    if name in INTEGERS:
        return bytes([0x26, INTEGERS[name][0]])
    if name in TEXT_TOKENS:
        length = 0xFFFF if size == -1 else (size or 1) * (2 if kind.is_national else 1)
        return bytes([TEXT_TOKENS[name]]) + struct.pack("<H", length) + COLLATION
    if name in LONG_TOKENS:
        collation = b"" if name == "image" else COLLATION
        return bytes([LONG_TOKENS[name]]) + struct.pack("<I", 0x7FFFFFFF) + collation + b"\x01" + long_text(table)
    if name in ("decimal", "numeric"):
        return bytes([0x6C, 17, size or 18, scale])
    if name in ("timestamp", "rowversion"):
        return b"\xad" + struct.pack("<H", 8)
    if name == "varbinary":
        return b"\xa5" + struct.pack("<H", 0xFFFF if size == -1 else size or 1)
    if name == "datetime2":
        return bytes([0x2A, 7 if size is None else size])
    return {"bit": b"\x68\x01", "float": b"\x6d\x08", "real": b"\x6d\x04", "money": b"\x6e\x08",
            "smallmoney": b"\x6e\x04", "datetime": b"\x6f\x08", "xml": b"\xf1\x00",
            "sql_variant": b"\x62" + struct.pack("<I", 8009)}[name]


def in_parts(data):
    """A value of a "max" type."""
    if data is None:
        return b"\xff" * 8
    return struct.pack("<Q", len(data)) + (struct.pack("<I", len(data)) + data if data else b"") + bytes(4)


def encoded(kind, value):
    name, size, scale = kind
    if name in TEXT_TOKENS or name in LONG_TOKENS or name == "xml":
        if name in ("char", "nchar") and value is not None:
            value = str(value).ljust(size)
        encoding = "utf-16-le" if kind.is_national or name == "xml" else CODE_PAGE
        data = value if value is None or isinstance(value, bytes) else str(value).encode(encoding, "replace")
        if name in LONG_TOKENS:
            return b"\x00" if data is None else b"\x10" + bytes(24) + struct.pack("<I", len(data)) + data
        if size == -1 or name == "xml":
            return in_parts(data)
        return b"\xff\xff" if data is None else sized(data)
    if name in ("timestamp", "rowversion", "varbinary"):
        return in_parts(value) if size == -1 else b"\xff\xff" if value is None else sized(value)
    if name == "sql_variant":  # as an int
        return bytes(4) if value is None else struct.pack("<IBBi", 6, 0x38, 0, int(value))
    if value is None:
        return b"\x00"
    if name in INTEGERS:
        length, form = INTEGERS[name]
        return bytes([length]) + struct.pack(form, int(value))
    if name == "bit":
        return bytes([1, 1 if value else 0])
    if name in ("float", "real"):
        return struct.pack("<Bd", 8, value) if name == "float" else struct.pack("<Bf", 4, value)
    if name == "money":
        parts = round(decimal.Decimal(str(value)) * 10000)
        return struct.pack("<BiI", 8, parts >> 32, parts & 0xFFFFFFFF)
    if name == "smallmoney":
        return struct.pack("<Bi", 4, round(decimal.Decimal(str(value)) * 10000))
    if name in ("decimal", "numeric"):
        parts = round(decimal.Decimal(str(value)).scaleb(scale))
        return bytes([17, 0 if parts < 0 else 1]) + abs(parts).to_bytes(16, "little")
    if name == "datetime2":
        return finer_moment(7 if size is None else size, value)
    moment = datetime.datetime.fromisoformat(value)  # datetime, as it is stored
    ticks = round((moment - datetime.datetime.combine(moment.date(), datetime.time())).total_seconds() * 300)
    return struct.pack("<BiI", 8, (moment.date() - datetime.date(1900, 1, 1)).days, ticks)


def finer_moment(digits, value):
    """A datetime2: the time in parts of a second, then the day since the year 1."""
    whole, _, fraction = value.partition(".")
    moment = datetime.datetime.fromisoformat(whole)
    seconds = moment.hour * 3600 + moment.minute * 60 + moment.second
    parts = int(str(seconds) + fraction[:digits].ljust(digits, "0"))
    length = 3 if digits <= 2 else 4 if digits <= 4 else 5
    return bytes([length + 3]) + parts.to_bytes(length, "little") + (moment.toordinal() - 1).to_bytes(3, "little")


def rows(columns, data):
    """COLMETADATA and the rows, without their DONE. Columns are (name, type, table)."""
    out = [b"\x81", struct.pack("<H", len(columns))]
    for name, kind, table in columns:
        user_type = 0x50 if kind.name in ("timestamp", "rowversion") else 0
        out += [struct.pack("<IH", user_type, 0x09), declaration(kind, table), short_text(name)]
    for row in data:
        out.append(b"\xd1")
        out += [encoded(kind, value) for (_, kind, _), value in zip(columns, row)]
    return b"".join(out)
