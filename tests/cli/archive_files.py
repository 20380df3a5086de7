"""Archives made byte by byte or by zipfile, among them what no proper program writes."""
import io
import os
import struct
import zipfile
import zlib

TIME = (2024, 5, 17, 12, 30, 40)


def zip_bytes(entries, compression=zipfile.ZIP_DEFLATED):
    """`entries` are (name, contents) or (name, contents, mode of the file)."""
    out = io.BytesIO()
    with zipfile.ZipFile(out, "w", compression) as archive:
        for name, contents, *mode in entries:
            info = zipfile.ZipInfo("placeholder", TIME)
            info.filename = name
            info.compress_type = compression
            info.external_attr = (mode[0] if mode else 0o100644) << 16
            info.create_system = 3
            archive.writestr(info, contents)
    return out.getvalue()


def raw_name_zip(raw, contents):
    """A ZIP archive with one stored entry whose name is not flagged as UTF-8."""
    crc = zlib.crc32(contents)
    local = (
        struct.pack(
            "<4s5H3I2H",
            b"PK\3\4",
            20,
            0,
            0,
            0x63D4,
            0x58B1,
            crc,
            len(contents),
            len(contents),
            len(raw),
            0,
        )
        + raw
    )
    central = (
        struct.pack(
            "<4s6H3I5H2I",
            b"PK\1\2",
            20,
            20,
            0,
            0,
            0x63D4,
            0x58B1,
            crc,
            len(contents),
            len(contents),
            len(raw),
            0,
            0,
            0,
            0,
            0,
            0,
        )
        + raw
    )
    start = len(local) + len(contents)
    return (
        local
        + contents
        + central
        + struct.pack("<4s4H2IH", b"PK\5\6", 0, 0, 1, 1, len(central), start, 0)
    )


def zip_crypto(name, contents, password):
    """The traditional encryption of PKWARE (APPNOTE.TXT, section 6.1)."""
    keys = [0x12345678, 0x23456789, 0x34567890]

    def crc(value, byte):
        return zlib.crc32(bytes([byte]), value ^ 0xFFFFFFFF) ^ 0xFFFFFFFF

    def update(byte):
        keys[0] = crc(keys[0], byte)
        keys[1] = ((keys[1] + (keys[0] & 0xFF)) * 134775813 + 1) & 0xFFFFFFFF
        keys[2] = crc(keys[2], keys[1] >> 24)

    for byte in password:
        update(byte)
    checksum = zlib.crc32(contents)
    encrypted = bytearray()
    for byte in bytes(11) + bytes([checksum >> 24]) + contents:
        temporary = keys[2] | 2
        encrypted.append(byte ^ (temporary * (temporary ^ 1) >> 8 & 0xFF))
        update(byte)
    plain = bytearray(raw_name_zip(name.encode(), contents))
    header = 30 + len(name)
    result = plain[:header] + encrypted + plain[header + len(contents) :]
    central = result.index(b"PK\1\2")
    end = result.index(b"PK\5\6")
    for flags, size in ((6, 18), (central + 8, central + 20)):
        struct.pack_into("<H", result, flags, 1)
        struct.pack_into("<I", result, size, len(encrypted))
    struct.pack_into("<I", result, end + 16, central)
    return bytes(result)


def number5(value):
    out = bytearray()
    while True:
        out.append(value & 0x7F | (0x80 if value > 0x7F else 0))
        value >>= 7
        if not value:
            return bytes(out)


def block5(kind, flags, fields, data=b""):
    body = (
        number5(kind)
        + number5(flags | (2 if data else 0))
        + (number5(len(data)) if data else b"")
        + fields
    )
    body = number5(len(body)) + body
    return struct.pack("<I", zlib.crc32(body)) + body + data


def rar5(entries, archive_flags=0):
    """A RAR 5 archive of stored files."""
    out = b"Rar!\x1a\7\1\0" + block5(1, 0, number5(archive_flags))
    for name, contents in entries:
        raw = name.encode()
        fields = (
            number5(4)
            + number5(len(contents))
            + number5(0o100644)
            + struct.pack("<I", zlib.crc32(contents))
            + number5(0)
            + number5(1)
            + number5(len(raw))
            + raw
        )
        out += block5(2, 0, fields, contents)
    return out + block5(5, 0, number5(0))


def locked_rar5():
    return b"Rar!\x1a\7\1\0" + block5(4, 0, number5(0) * 2 + b"\x0f" + bytes(16))


def rar4(entries, archive_flags=0, file_flags=0):
    """An older RAR archive of stored files."""

    def block(kind, flags, fields, data=b""):
        body = struct.pack("<BHH", kind, flags, 7 + len(fields)) + fields
        return struct.pack("<H", zlib.crc32(body) & 0xFFFF) + body + data

    out = b"Rar!\x1a\7\0" + block(0x73, archive_flags, bytes(6))
    for name, contents in entries:
        raw = name.encode()
        fields = (
            struct.pack(
                "<IIBIIBBHI",
                len(contents),
                len(contents),
                3,
                zlib.crc32(contents),
                0x58B163D4,
                20,
                0x30,
                len(raw),
                0o100644,
            )
            + raw
        )
        out += block(0x74, 0x8000 | file_flags, fields, contents)
    return out + block(0x7B, 0x4000, b"")


def sparse_zip(path, size):
    """An archive of one stored entry of zeros, a sparse file. Its checksum is wrong."""
    made = raw_name_zip(b"zeros", b"")
    local, central, end = made[:35], bytearray(made[35 : 35 + 51]), bytearray(made[35 + 51 :])
    local = bytearray(local)
    struct.pack_into("<II", local, 18, size, size)
    struct.pack_into("<II", central, 20, size, size)
    struct.pack_into("<I", end, 16, len(local) + size)
    with open(path, "wb") as out:
        out.write(local)
        out.seek(size, os.SEEK_CUR)
        out.write(central + end)
