"""Records as they stand in the database: BSON, as far as hosts have it."""

import struct

TEXT, DOCUMENT, ARRAY, BOOLEAN, NULL, INT32, INT64, DOUBLE = 2, 3, 4, 8, 10, 16, 18, 1
SIZED = {BOOLEAN: "<?", INT32: "<i", INT64: "<q", DOUBLE: "<d"}


def encoded(value):
    """The type of the value and its bytes."""
    if isinstance(value, (dict, list)):
        items = value.items() if isinstance(value, dict) else enumerate(value)
        body = b"".join(bytes([kind]) + str(key).encode() + b"\0" + data
                        for key, (kind, data) in ((key, encoded(item)) for key, item in items))
        return DOCUMENT if isinstance(value, dict) else ARRAY, struct.pack("<i", len(body) + 5) + body + b"\0"
    if isinstance(value, str):
        return TEXT, struct.pack("<i", len(value.encode()) + 1) + value.encode() + b"\0"
    kind = {bool: BOOLEAN, float: DOUBLE, type(None): NULL}.get(type(value)) or (INT32 if -2**31 <= value < 2**31 else INT64)
    return kind, struct.pack(SIZED[kind], value) if kind in SIZED else b""


def decoded(data, kind=DOCUMENT):
    if kind == TEXT:
        return data[4:-1].decode()
    if kind not in (DOCUMENT, ARRAY):
        return struct.unpack(SIZED[kind], data)[0] if kind in SIZED else None
    items, at = {}, 4
    while at < len(data) - 1:
        inner, end = data[at], data.index(0, at)
        key, at = data[at + 1:end].decode(), end + 1
        size = struct.calcsize(SIZED[inner]) if inner in SIZED else 0
        if inner in (TEXT, DOCUMENT, ARRAY):
            size = struct.unpack_from("<i", data, at)[0] + (4 if inner == TEXT else 0)
        items[key], at = decoded(data[at:at + size], inner), at + size
    return items if kind == DOCUMENT else list(items.values())


def nested(depth):
    """A record with so many others around the innermost one."""
    return b"".join(struct.pack("<i", 8 * inner + 5) + b"\3a\0" for inner in range(depth, 0, -1)) + encoded({})[1] + bytes(depth)
