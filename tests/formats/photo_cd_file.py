"""Creates Photo CD files of all resolutions, from public knowledge of the format, for tests.

The pictures are patterns; the larger resolutions add a few repeating rows of deltas.
"""
import random

SECTOR = 2048
FULL, ROWS_16 = (3072, 2048), 16

# Prefix codes of deltas, from short to the maximum length; none starts with twelve ones.
CODES = [
    {0: "0", 1: "100", -1: "101", 4: "1100", -4: "1101", 20: "11100", -20: "11101", 90: "111100",
     -90: "111101", 2: "1111100",
     -2: "11111010", 127: "111110110000", -128: "1111101100010", 33: "1111101100011000"},
    {0: "00", 3: "01", -3: "10", 11: "1100", -11: "11010", 60: "110110000000001",
     -60: "110110000000010"},
    {0: "1000", 5: "00", -5: "01", 40: "1001", -40: "101"},
]


def table(code):
    """A code as stored in the file."""
    words = b"".join(bytes([len(bits) - 1]) + int(bits.ljust(16, "0"), 2).to_bytes(2, "big") +
                     (delta & 255).to_bytes(1, "big")
                     for delta, bits in code.items())
    return bytes([len(code) - 1]) + words


def sectors(data):
    """Padded to whole sectors."""
    return data + bytes(-len(data) % SECTOR)


def luma(x, y):
    return (x * x // 37 + y * 3 + (x ^ y) // 2) % 200 + 20


def plain(width, height, shift):
    """The directly stored samples of a resolution with pixels 2 ** `shift` of the 768 x 512 ones
    apart."""
    data = bytearray()
    for y in range(0, height, 2):
        for row in (y, y + 1):
            data += bytes(luma(x << shift, row << shift) for x in range(width))
        data += bytes(110 + (x << shift) * 90 // 384 for x in range(width // 2))
        data += bytes(160 - ((y // 2 + x) << shift) * 60 // 640 for x in range(width // 2))
    return bytes(data)


def coded_row(plane, row, width, code, seed):
    draw = random.Random(seed)
    values = draw.choices(list(code), [8 if value == 0 else 1 for value in code], k=width)
    return "".join(code[value] for value in values)


def deltas(width, height, planes):
    """Marks and rows of all planes. There are ROWS_16 different rows per plane."""
    kinds = {plane: [coded_row(plane, i, width >> (plane > 0), CODES[max(plane - 1, 0)],
                               100 * plane + i + width)
                     for i in range(ROWS_16)] for plane in planes}
    bits = []
    for row in range(height):
        for plane in planes:
            if plane == 0 or row % 2 == 0:
                bits.append("1" * 23 + "0" + f"{plane:02b}{row:013b}0"
                            + kinds[plane][row * 7 % ROWS_16])
    bits.append("1" * 23 + "0" + f"00{height:013b}0" + "0" * 64)
    text = "".join(bits)
    text += "0" * (-len(text) % 8)
    return int(text, 2).to_bytes(len(text) // 8, "big")


def header(turns, begin16):
    facts = bytearray(SECTOR)
    facts[:7] = b"PCD_IPI"
    facts[22:34] = b"080/11 SPD  "
    facts[42:52] = b"NOBODY    "
    facts[1538] = turns | (2 << 2)
    facts[1539:1541] = begin16.to_bytes(2, "big")
    return bytes(facts)


def make(turns=0, sizes=5):
    """A file with the first `sizes` resolutions."""
    file = bytearray(384 * SECTOR)
    for sector, width, height, shift in ((4, 192, 128, 2), (23, 384, 256, 1), (96, 768, 512, 0)):
        data = plain(width, height, shift)
        file[sector * SECTOR:sector * SECTOR + len(data)] = data
    file[:SECTOR] = b"\xff" * SECTOR
    file[SECTOR:2 * SECTOR] = header(turns, 0)
    if sizes > 3:
        file += bytes(4 * SECTOR) + sectors(table(CODES[0])) + sectors(deltas(1536, 1024, [0]))
    if sizes > 4:
        begin = len(file) // SECTOR
        file[388 * SECTOR - SECTOR + 510:388 * SECTOR - SECTOR
             + 512] = (begin - 1 - 384).to_bytes(2, "big")
        file[SECTOR:2 * SECTOR] = header(turns, begin)
        file += b"\xff" * SECTOR + bytes(11 * SECTOR)
        file += sectors(b"".join(map(table, CODES))) + bytes(SECTOR)
        file += sectors(deltas(*FULL, [0, 2, 3]))
    return bytes(file)
