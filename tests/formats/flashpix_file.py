"""Creates FlashPix files according to the specification and [MS-CFB], for tests."""
import struct

SECTOR, SHORT, LIMIT = 512, 64, 4096
END, FREE, TABLE, LIST = 0xFFFFFFFE, 0xFFFFFFFF, 0xFFFFFFFD, 0xFFFFFFFC

CLASS = bytes.fromhex("00676156 54C1 CE11 8553 00AA00A1F95B")  # of pictures


def compound(tree, scatter=False):
    """A compound file from a tree: names to bytes, or to subtrees. With `scatter`, streams use
    every other sector."""
    entries = [["Root Entry", 5, None, -1]]  # name, kind, data, child

    def add(storage, folder):
        indices = []
        for name, content in folder.items():
            indices.append(len(entries))
            entries.append([name, 2 if isinstance(content, bytes) else 1, content
                            if isinstance(content, bytes) else None, -1])
            if not isinstance(content, bytes):
                add(indices[-1], content)
        siblings[storage] = indices

    siblings = {}
    add(0, tree)
    sectors, table = [], []

    def place(data):
        pieces = [data[i:i + SECTOR].ljust(SECTOR, b"\0") for i in range(0, len(data), SECTOR)]
        first = None
        for number, piece in enumerate(pieces):
            if scatter and number:
                sectors.append(b"\xAA" * SECTOR)
                table.append(FREE)
            if first is None:
                first = len(sectors)
            else:
                table[previous] = len(sectors)
            previous = len(sectors)
            sectors.append(piece)
            table.append(END)
        return first if first is not None else END

    short, short_table = b"", []
    starts = {}
    for index, (_, kind, data, _) in enumerate(entries):
        if kind != 2:
            continue
        if len(data) >= LIMIT:
            starts[index] = place(data)
            continue
        starts[index] = len(short_table) if data else END
        count = (len(data) + SHORT - 1) // SHORT
        short_table += [len(short_table) + i + 1 for i in range(count - 1)] + [END] * (count > 0)
        short += data.ljust(count * SHORT, b"\0")
    root_first = place(short)
    list_first = place(b"".join(struct.pack("<I", n) for n in short_table))
    directory = b""
    for index, (name, kind, data, _) in enumerate(entries):
        # siblings form a tree that leans to the right
        owner = next((s for s, children in siblings.items() if index in children), None)
        right = -1
        if owner is not None:
            at = siblings[owner].index(index)
            right = siblings[owner][at + 1] if at + 1 < len(siblings[owner]) else -1
        child = siblings[index][0] if siblings.get(index) else -1
        wide = name.encode("utf-16le") + b"\0\0"
        start, size = (root_first, len(short)) if index == 0 else (starts.get(index, 0),
                                                                   len(data or b""))
        directory += wide.ljust(64, b"\0") + struct.pack("<HBBiii", len(wide), kind, 1, -1, right,
                                                         child)
        directory += (CLASS if index == 0 else bytes(16)) + bytes(20)
        directory += struct.pack("<III", start, size, 0)
    directory_first = place(directory)
    # the table includes itself and the sectors that continue the list in the header
    needed = lists = 0
    while needed * 128 < len(table) + needed + lists:
        needed += 1
        lists = max(0, -(-(needed - 109) // 127))
    table_first = len(table)
    list_begin = table_first + needed
    table += [TABLE] * needed + [LIST] * lists
    table += [FREE] * (-len(table) % 128)
    sectors += [struct.pack("<128I", *table[i:i + 128]) for i in range(0, len(table), 128)]
    numbers = [table_first + i for i in range(needed)]
    numbers += [FREE] * (109 + 127 * lists - needed)
    for i in range(lists):
        follows = list_begin + i + 1 if i + 1 < lists else END
        sectors.append(struct.pack("<128I", *numbers[109 + 127 * i:109 + 127 * (i + 1)], follows))
    header = b"\xd0\xcf\x11\xe0\xa1\xb1\x1a\xe1" + bytes(16) + struct.pack("<HHHHH", 0x3E, 3,
                                                                           0xFFFE, 9, 6) + bytes(10)
    header += struct.pack("<IIIII", needed, directory_first, 0, LIMIT, list_first)
    header += struct.pack("<III", (4 * len(short_table) + SECTOR - 1) // SECTOR, list_begin
                          if lists else END, lists)
    return header + struct.pack("<109I", *numbers[:109]) + b"".join(sectors)


STREAM_HEAD = struct.pack("<HHI", 0xFFFE, 0, 3) + bytes(16) + struct.pack("<I", 1)


def property_set(properties):
    """Numbers to typed values."""
    listed, values = b"", b""
    offset = 8 + 8 * len(properties)
    for number, value in properties.items():
        listed += struct.pack("<II", number, offset + len(values))
        values += value + bytes(-len(value) % 4)
    section = struct.pack("<II", offset + len(values), len(properties)) + listed + values
    return STREAM_HEAD + bytes(16) + struct.pack("<I", len(STREAM_HEAD) + 20) + section


def number(value):
    return struct.pack("<II", 19, value)


def blob(data):
    return struct.pack("<II", 65, len(data)) + data


GRAY, YCC, RGB = 1, 2, 3


def colors(space, channels, opacity=False):
    flag = 0x8000 if opacity else 0
    numbers = [space << 16 | flag | i for i in range(channels)]
    if opacity:
        numbers[-1] = space << 16 | flag | 0x7FFE
    return blob(struct.pack("<II", 1, channels) + b"".join(struct.pack("<I", n) for n in numbers))


def flashpix(width, height, tiles, space, channels, tables=None, opacity=False, tile=64,
             smaller=None, scatter=False, extra=None):
    """A picture. A tile: compression, subtype, data. `smaller` has width, height, tiles of a
    smaller resolution."""
    sizes = ([smaller] if smaller else []) + [(width, height, tiles)]
    properties = {0x01000000: number(len(sizes)), 0x01000002: number(width),
                  0x01000003: number(height)}
    store = {}
    for index, (wide, high, listed) in enumerate(sizes):
        properties[0x02000002 | index << 16] = colors(space, channels, opacity)
        data, entries = STREAM_HEAD, b""
        for compression, subtype, content in listed:
            entries += struct.pack("<IIII", len(data) - 28, len(content), compression, subtype)
            data += content
        head = STREAM_HEAD + struct.pack("<IIIIIIIII", 36, wide, high, len(listed), tile, tile,
                                         channels, 36, 16) + entries
        store[f"Resolution {index:04d}"] = {"Subimage 0000 Header": head,
                                            "Subimage 0000 Data": data}
    for table, stream in (tables or {}).items():
        properties[0x03000001 | table << 16] = blob(stream)
    store["\5Image Contents"] = property_set(properties)
    return compound({"\5Global Info": b"x" * 100, "Data Object Store 000001": store,
                     **(extra or {})}, scatter)
