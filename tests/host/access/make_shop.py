#!/usr/bin/env python3
"""Makes shop.mdb and shop.accdb, the small databases of MS Access that the reader's tests read: make_shop.py FILE.

No free program of Debian writes such files. This one writes as much of the format (Jet 4, or ACE 12, which differs
in what the first page tells) as mdbtools reads, after the notes on it that mdbtools brings along (HACKING.md):
table definitions, rows and the rows of index definitions, but no index pages. MS Access itself has not seen the
files.
"""

import struct
import sys

PAGE = 4096
BYTE, INT, LONG, MONEY, TEXT, MEMO, BOOL, OLE, NUMERIC, DATE = 2, 3, 4, 5, 10, 12, 1, 11, 16, 8
FIXED = {BOOL: (0, ""), BYTE: (1, "B"), INT: (2, "<h"), LONG: (4, "<i"), MONEY: (8, "<q"), DATE: (8, "<d")}
SYSTEM = 0x80000002 - (1 << 32)  # as a signed number
PRIMARY, UNIQUE, PLAIN = "primary", "unique", "plain"


def rc4(key, data):
    state = list(range(256))
    j = 0
    for i in range(256):
        j = (j + state[i] + key[i % len(key)]) % 256
        state[i], state[j] = state[j], state[i]
    i = j = 0
    out = bytearray()
    for byte in data:
        i = (i + 1) % 256
        j = (j + state[i]) % 256
        state[i], state[j] = state[j], state[i]
        out.append(byte ^ state[(state[i] + state[j]) % 256])
    return bytes(out)


def utf16(text):
    return text.encode("utf-16-le")


def named(text):
    return struct.pack("<H", len(utf16(text))) + utf16(text)


class Table:
    """Columns are (name, type) or (name, type, size or (precision, scale)); indexes (name, kind, columns)."""

    def __init__(self, name, columns, rows=(), indexes=(), flags=0):
        self.name, self.columns, self.rows, self.indexes, self.flags = name, columns, list(rows), indexes, flags

    def definition(self, usage_row):
        cols = b""
        fixed_at = var_at = 0
        for number, (_, kind, *size) in enumerate(self.columns):
            is_fixed = kind in FIXED or kind == NUMERIC
            precision, scale = size[0] if kind == NUMERIC else (0, 0)
            length = 17 if kind == NUMERIC else FIXED[kind][0] if is_fixed else (size[0] * 2 if size else 0)
            cols += struct.pack(
                "<BIHHHBBHBBIHH",
                kind, 0, number, 0 if is_fixed else var_at, number, precision, scale, 0,
                3 if is_fixed else 2, 0, 0, fixed_at if is_fixed else 0, length,
            )
            fixed_at += length if is_fixed else 0
            var_at += 0 if is_fixed else 1
        names = [column[0] for column in self.columns]
        real = logical = b""
        for number, (_, kind, keys) in enumerate(self.indexes):
            parts = b"".join(struct.pack("<HB", names.index(key), 1) for key in keys)
            parts += struct.pack("<HB", 0xFFFF, 0) * (10 - len(keys))
            real += struct.pack("<I30sIIIB5x", 0, parts, 0, 0, 0, 0 if kind == PLAIN else 1)
            logical += struct.pack("<IIIBiIBBB4x", 0, number, number, 0, -1, 0, 0, 0, 1 if kind == PRIMARY else 0)
        count = len(self.indexes)
        head = struct.pack(
            "<IIIIB3xI8xBHHHIIII",
            0, 0, len(self.rows), 0, 1, 0, 0x53 if self.flags else 0x4E,
            len(names), var_at, len(names), count, count, usage_row, usage_row,
        )
        body = head + bytes(12 * count) + cols + b"".join(map(named, names))
        body += real + logical + b"".join(named(index[0]) for index in self.indexes) + b"\xff\xff"
        assert len(body) + 8 < PAGE
        return struct.pack("<BBHI", 2, 1, PAGE - 16 - len(body), 0) + body

    def row(self, values):
        fixed = b""
        var = []
        mask = 0
        for number, ((_, kind, *_size), value) in enumerate(zip(self.columns, values)):
            if kind in FIXED:
                size, form = FIXED[kind]
                fixed += struct.pack(form, value or 0) if form else b""
                assert not form or struct.calcsize(form) == size
            elif kind == TEXT:
                var.append(utf16(value or ""))
            elif kind == MEMO and value is not None:
                var.append(struct.pack("<III", len(utf16(value)) | 0x80000000, 0, 0) + utf16(value))
            else:
                assert value is None
                var.append(b"")
            if value is not None and value is not False:
                mask |= 1 << number
        row = struct.pack("<H", len(self.columns)) + fixed
        if var:
            starts = []
            for value in var:
                starts.append(len(row))
                row += value
            starts.append(len(row))
            row += b"".join(struct.pack("<H", start) for start in reversed(starts)) + struct.pack("<H", len(var))
        return row + mask.to_bytes((len(self.columns) + 7) // 8, "little")


def data_page(owner, rows):
    page = bytearray(PAGE)
    struct.pack_into("<BBHIIH", page, 0, 1, 1, 0, owner, 0, len(rows))
    end = PAGE
    for number, row in enumerate(rows):
        end -= len(row)
        page[end : end + len(row)] = row
        struct.pack_into("<H", page, 14 + 2 * number, end)
    assert end > 14 + 2 * len(rows)
    return bytes(page)


def make(tables, queries, is_ace):
    """Page 0 tells the version, 1 has the usage maps, 2 defines the catalogue; two pages for each table follow."""
    objects = Table(
        "MSysObjects",
        [("Id", LONG), ("ParentId", LONG), ("Name", TEXT, 255), ("Type", INT), ("DateCreate", DATE),
         ("Flags", LONG), ("LvProp", OLE)],
        flags=SYSTEM,
    )
    parts = Table(
        "MSysQueries",
        [("Attribute", BYTE), ("Expression", MEMO), ("Flag", INT), ("LvExtra", OLE), ("Name1", TEXT, 255),
         ("Name2", TEXT, 255), ("ObjectId", LONG), ("Order", OLE)],
        flags=SYSTEM,
    )
    every = [objects, *tables, parts]
    for number, table in enumerate(every):
        objects.rows.append((2 + 2 * number, 1, table.name, 1, 36526.5, table.flags, None))
    for number, (name, rows) in enumerate(queries.items()):
        identity = -(1 << 31) + number
        objects.rows.append((identity, 1, name, 5, 36526.5, 0, None))
        for attribute, flag, name1, name2, expression in rows:
            parts.rows.append((attribute, expression, flag, None, name1, name2, identity, None))

    head = bytearray(PAGE)
    head[0:20] = b"\0\1\0\0Standard ACE DB\0" if is_ace else b"\0\1\0\0Standard Jet DB\0"
    head[0x14] = 2 if is_ace else 1
    hidden = bytearray(128)
    struct.pack_into("<H", hidden, 0x3C - 0x18, 1252)
    head[0x18 : 0x18 + 128] = rc4(b"\xc7\xda\x39\x6b", hidden)

    maps = []
    pages = []
    for number, table in enumerate(every):
        definition = 2 + 2 * number
        bits = bytearray(64)
        if table.rows:
            bits[(definition + 1) // 8] |= 1 << ((definition + 1) % 8)
        maps.append(b"\0\0\0\0\0" + bytes(bits))
        pages.append(table.definition((1 << 8) | number).ljust(PAGE, b"\0"))
        pages.append(data_page(definition, [table.row(values) for values in table.rows]))
    return bytes(head) + data_page(0, maps) + b"".join(pages)


def shop(is_ace):
    relationships = Table(
        "MSysRelationships",
        [("ccolumn", LONG), ("grbit", LONG), ("icolumn", LONG), ("szColumn", TEXT, 255), ("szObject", TEXT, 255),
         ("szReferencedColumn", TEXT, 255), ("szReferencedObject", TEXT, 255), ("szRelationship", TEXT, 255)],
        [(1, 0x1100, 0, "customer", "orders", "id", "customers", "customersorders"),
         (2, 0, 0, "order", "order lines", "id", "orders", "ordersorder lines"),
         (2, 0, 1, "year", "order lines", "year", "orders", "ordersorder lines"),
         (1, 2, 0, "note", "orders", "name", "customers", "only a hint")],
        flags=SYSTEM,
    )
    tables = [
        Table("customers", [("id", LONG), ("name", TEXT, 50), ("Straße", TEXT, 80), ("vip", BOOL)],
              [(1, "Ann", "Main Street", True), (2, "Bert", None, False)],
              [("PrimaryKey", PRIMARY, ["id"]), ("by name", UNIQUE, ["name", "Straße"])]),
        Table("orders", [("id", LONG), ("year", INT), ("customer", LONG), ("total", MONEY), ("note", MEMO)],
              [(1, 2026, 1, 125000, 'She said "soon"')],
              [("PrimaryKey", PRIMARY, ["id", "year"]), ("customer", PLAIN, ["customer"])]),
        Table("order lines", [("order", LONG), ("year", INT), ("price", NUMERIC, (18, 4)), ("at", DATE)]),
        relationships,
    ]
    end = (255, None, None, None, None)
    queries = {
        "named orders": [
            (0, None, None, None, None), (1, 1, None, None, None),
            (5, None, "customers", "c", None), (5, None, "orders", "o", None),
            (6, 0, None, None, "o.id"), (6, 0, "wer", None, 'c.name & ", " & c.[Straße]'),
            (6, 0, "gross", None, "o.total * 1.2"),
            (7, 2, "c", "o", "c.id = o.customer"), (8, None, None, None, "o.total > 10"),
            (11, None, "D", None, "o.total"), end,
        ],
        "all names": [
            (1, 9, None, None, None), (3, 2, None, None, None),
            (5, None, None, "X7YZ_____1", "SELECT name FROM customers"),
            (5, None, None, "X7YZ_____2", "SELECT [named orders].wer\r\nFROM [named orders];\r\n"), end,
        ],
        "forget": [(1, 5, None, None, None), (5, None, "orders", None, None), (8, None, None, None, "id < 5"), end],
    }
    return make(tables, queries, is_ace)


if __name__ == "__main__":
    with open(sys.argv[1], "wb") as file:
        file.write(shop(is_ace=sys.argv[1].endswith(".accdb")))
