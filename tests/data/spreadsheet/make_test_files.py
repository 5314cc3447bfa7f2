#!/usr/bin/env python3
"""Writes the committed spreadsheet test files of this folder.

.xls workbooks are BIFF8 record streams in a compound file, written here from scratch (no
spreadsheet library involved); the damaged and hostile .xlsx packages are made with zipfile.
Run from anywhere: python3 make_test_files.py  (the files land beside this script).
"""
import os
import struct
import zipfile
import zlib

HERE = os.path.dirname(os.path.abspath(__file__))

# ----------------------------------------------------------------------------------------------
# Compound file (version 3, 512-byte sectors, every stream in regular sectors).

ENDOFCHAIN = 0xFFFFFFFE
FREESECT = 0xFFFFFFFF
FATSECT = 0xFFFFFFFD
NOSTREAM = 0xFFFFFFFF
SECTOR = 512
MINI_CUTOFF = 4096


def dir_entry(name, kind, start, size, child=NOSTREAM, right=NOSTREAM):
    encoded = (name + "\0").encode("utf-16-le")
    return (encoded.ljust(64, b"\0") + struct.pack("<HBB", len(encoded), kind, 1)
            + struct.pack("<III", NOSTREAM, right, child) + b"\0" * 16 + struct.pack("<I", 0)
            + b"\0" * 16 + struct.pack("<III", start, size, 0))


def compound_file(streams):
    """streams: list of (name, bytes). Streams under 4096 bytes go to the mini stream (64-byte
    mini sectors kept in the root entry's stream), the others to regular sectors."""
    mini_streams = [(n, p) for n, p in streams if len(p) < MINI_CUTOFF]
    mini = b""
    mini_fat = []
    mini_entries = {}
    for name, payload in mini_streams:
        count = max(1, (len(payload) + 63) // 64)
        first = len(mini_fat)
        mini_entries[name] = (first, len(payload))
        mini_fat += [first + i + 1 for i in range(count - 1)] + [ENDOFCHAIN]
        mini += payload.ljust(count * 64, b"\0")

    # Sector 0: FAT, 1: directory, 2: mini FAT (when used), then the mini stream, then streams.
    sectors = []
    fat = [FATSECT, ENDOFCHAIN]
    next_sector = 2
    mini_fat_sector = ENDOFCHAIN
    root_start = ENDOFCHAIN
    if mini:
        mini_fat_sector = next_sector
        fat.append(ENDOFCHAIN)
        sectors.append(struct.pack("<%dI" % len(mini_fat), *mini_fat).ljust(SECTOR, b"\xff"))
        next_sector += 1
        root_start = next_sector
        count = (len(mini) + SECTOR - 1) // SECTOR
        fat += [next_sector + i + 1 for i in range(count - 1)] + [ENDOFCHAIN]
        sectors.append(mini.ljust(count * SECTOR, b"\0"))
        next_sector += count
    entries = []
    for name, payload in streams:
        if name in mini_entries:
            entries.append((name,) + mini_entries[name])
            continue
        count = (len(payload) + SECTOR - 1) // SECTOR
        entries.append((name, next_sector, len(payload)))
        fat += [next_sector + i + 1 for i in range(count - 1)] + [ENDOFCHAIN]
        sectors.append(payload.ljust(count * SECTOR, b"\0"))
        next_sector += count
    assert next_sector <= SECTOR // 4, "one FAT sector is enough for the test files"
    fat += [FREESECT] * (SECTOR // 4 - len(fat))

    directory = dir_entry("Root Entry", 5, root_start, len(mini), child=1)
    for i, (name, start, size) in enumerate(entries):
        right = i + 2 if i + 1 < len(entries) else NOSTREAM
        directory += dir_entry(name, 2, start, size, right=right)
    directory = directory.ljust(SECTOR, b"\0")
    assert len(directory) == SECTOR

    header = (bytes.fromhex("D0CF11E0A1B11AE1") + b"\0" * 16
              + struct.pack("<HHHHH", 0x3E, 3, 0xFFFE, 9, 6) + b"\0" * 6
              + struct.pack("<IIIIIIIII", 0, 1, 1, 0, MINI_CUTOFF, mini_fat_sector, 1 if mini else 0, ENDOFCHAIN, 0)
              + struct.pack("<I", 0) + struct.pack("<I", FREESECT) * 108)
    assert len(header) == SECTOR
    return header + struct.pack("<%dI" % len(fat), *fat) + directory + b"".join(sectors)


# ----------------------------------------------------------------------------------------------
# BIFF8 records.

def record(rid, data=b""):
    return struct.pack("<HH", rid, len(data)) + data


def bof(kind):
    return record(0x0809, struct.pack("<HHHHII", 0x0600, kind, 0x0DBB, 0x07CC, 0, 6))


def unicode_string(text, length_bytes=2):
    raw = text.encode("latin-1")
    size = struct.pack("<H", len(raw)) if length_bytes == 2 else struct.pack("<B", len(raw))
    return size + b"\0" + raw


def xf(format_id, style):
    # ifnt, ifmt, then the protection/parent word: a style XF has fStyle set and no parent.
    flags = 0xFFF5 if style else 0x0001
    return record(0x00E0, struct.pack("<HHH", 0, format_id, flags) + b"\0" * 14)


XF_GENERAL, XF_DATE, XF_DATETIME, XF_TIME, XF_FIXED2 = 15, 16, 17, 18, 19


def globals_records(sheet_names, strings, sheet_offsets):
    out = bof(0x0005)
    out += record(0x0042, struct.pack("<H", 1200))      # CODEPAGE: UTF-16 (strings written 8-bit)
    out += record(0x0022, struct.pack("<H", 0))         # DATEMODE: 1900
    out += record(0x0031, struct.pack("<HHHHHBBBB", 200, 0, 0x190, 0, 0, 0, 0, 0, 0) + unicode_string("Arial", 1))
    out += record(0x041E, struct.pack("<H", 164) + unicode_string("yyyy/mm/dd hh:mm:ss"))
    for _ in range(15):
        out += xf(0, True)
    out += xf(0, False)      # 15 General
    out += xf(14, False)     # 16 date
    out += xf(164, False)    # 17 date and time
    out += xf(21, False)     # 18 time
    out += xf(2, False)      # 19 0.00
    for name, offset in zip(sheet_names, sheet_offsets):
        out += record(0x0085, struct.pack("<IBB", offset, 0, 0) + unicode_string(name, 1))
    sst = struct.pack("<II", len(strings), len(strings)) + b"".join(unicode_string(s) for s in strings)
    out += record(0x00FC, sst)
    out += record(0x000A)
    return out


def sheet_records(cells, strings):
    """cells: list of (row, col, value, xf) with row/col from 0; value str, bool, int or float."""
    out = bof(0x0010)
    if cells:
        rows = [c[0] for c in cells]
        cols = [c[1] for c in cells]
        out += record(0x0200, struct.pack("<IIHHH", min(rows), max(rows) + 1, min(cols), max(cols) + 1, 0))
    else:
        out += record(0x0200, struct.pack("<IIHHH", 0, 0, 0, 0, 0))
    for row, col, value, xf_index in cells:
        if isinstance(value, bool):
            out += record(0x0205, struct.pack("<HHHBB", row, col, xf_index, int(value), 0))
        elif isinstance(value, str):
            out += record(0x00FD, struct.pack("<HHHI", row, col, xf_index, strings.index(value)))
        elif isinstance(value, int):
            out += record(0x027E, struct.pack("<HHHI", row, col, xf_index, (value << 2) | 2))
        else:
            out += record(0x0203, struct.pack("<HHHd", row, col, xf_index, value))
    out += record(0x000A)
    return out


def workbook_stream(sheets, pad=True):
    """sheets: list of (name, cells); padded to 4096 bytes unless `pad` is false."""
    strings = []
    for _, cells in sheets:
        for cell in cells:
            if isinstance(cell[2], str) and cell[2] not in strings:
                strings.append(cell[2])
    names = [name for name, _ in sheets]
    bodies = [sheet_records(cells, strings) for _, cells in sheets]
    head_length = len(globals_records(names, strings, [0] * len(sheets)))
    offsets = []
    position = head_length
    for body in bodies:
        offsets.append(position)
        position += len(body)
    stream = globals_records(names, strings, offsets) + b"".join(bodies)
    # Streams under 4096 bytes would belong in the mini stream; readers stop at the last EOF
    # record, so zero bytes after it fill the stream up.
    return stream.ljust(MINI_CUTOFF, b"\0") if pad else stream


def series_cells():
    cells = [(0, 2, "Flow station", XF_GENERAL),
             (1, 2, "Date", XF_GENERAL), (1, 3, "A", XF_GENERAL), (1, 4, "B", XF_GENERAL)]
    for i in range(4):
        cells.append((2 + i, 2, 44333 + i, XF_DATE))
        cells.append((2 + i, 3, 1.5 * (i + 3), XF_FIXED2))
        cells.append((2 + i, 4, 1000 * (i + 3), XF_GENERAL))
    cells.append((6, 3, True, XF_GENERAL))
    return cells


def stamp_cells():
    cells = [(0, 0, "Stamp", XF_GENERAL), (0, 1, "Time", XF_GENERAL)]
    for i in range(3):
        cells.append((1 + i, 0, 44333 + 0.25 * i + 3723 / 86400, XF_DATETIME))
        cells.append((1 + i, 1, 0.5 + i / 24, XF_TIME))
    return cells


def write(name, data):
    with open(os.path.join(HERE, name), "wb") as f:
        f.write(data)


def make_xls_files():
    write("series.xls", compound_file([("Workbook", workbook_stream([("Data", series_cells()), ("Second", [])]))]))
    # A small workbook stream lives in the mini stream, as real small files have it.
    write("small.xls", compound_file([("Workbook", workbook_stream([("Data", series_cells())], pad=False))]))
    write("stamps.xls", compound_file([("Workbook", workbook_stream([("Stamps", stamp_cells())]))]))
    # A password-protected .xlsx is a compound file holding the encrypted package.
    write("password.xlsx", compound_file([("EncryptionInfo", b"\4\0\4\0" + b"\0" * 4092),
                                          ("EncryptedPackage", b"\0" * 4096)]))
    full = compound_file([("Workbook", workbook_stream([("Data", series_cells())]))])
    write("truncated.xls", full[:1100])
    # A directory entry whose name length overruns its 64-byte name field.
    bad = bytearray(full)
    bad[SECTOR * 2 + 128 + 64:SECTOR * 2 + 128 + 66] = b"\xff\xff"
    write("bad-directory.xls", bytes(bad))
    # The header points the directory at no sector at all.
    lost = bytearray(full)
    lost[48:52] = b"\xff\xff\xff\xff"
    write("lost-directory.xls", bytes(lost))
    # Records FreeXL would overrun: one longer than a BIFF8 record may be, one whose text is
    # longer than the record holding it.
    long_record = bof(0x0005) + record(0x0087, b"\0" * 9000) + record(0x000A)
    write("long-record.xls", compound_file([("Workbook", long_record.ljust(MINI_CUTOFF, b"\0"))]))
    long_text = bof(0x0005) + record(0x041E, struct.pack("<HHB", 164, 0xFFFF, 0) + b"0.00") + record(0x000A)
    write("long-text.xls", compound_file([("Workbook", long_text.ljust(MINI_CUTOFF, b"\0"))]))
    # A sheet sized twice, and a sheet sized beyond the format's grid.
    def one_sheet(dimensions):
        body = bof(0x0010) + b"".join(record(0x0200, d) for d in dimensions) + record(0x000A)
        head = globals_records(["Data"], [], [0])
        head = globals_records(["Data"], [], [len(head)])
        return compound_file([("Workbook", (head + body).ljust(MINI_CUTOFF, b"\0"))])
    write("two-dimensions.xls", one_sheet([struct.pack("<IIHHH", 0, 1, 0, 1, 0)] * 2))
    write("huge-dimension.xls", one_sheet([struct.pack("<IIHHH", 0, 0, 0xFFFF, 0xFFFF, 0)]))
    # The compound file is sound but holds no workbook stream.
    write("no-workbook.xls", compound_file([("Something", b"\0" * 4096)]))


# ----------------------------------------------------------------------------------------------
# .xlsx packages made by hand.

CONTENT_TYPES = ('<?xml version="1.0" encoding="UTF-8"?>'
                 '<Types xmlns="http://schemas.openxmlformats.org/package/2006/content-types">'
                 '<Default Extension="rels" ContentType="application/vnd.openxmlformats-package.relationships+xml"/>'
                 '<Default Extension="xml" ContentType="application/xml"/>'
                 '<Override PartName="/xl/workbook.xml" ContentType="application/vnd.openxmlformats-officedocument.spreadsheetml.sheet.main+xml"/>'
                 '<Override PartName="/xl/worksheets/sheet1.xml" ContentType="application/vnd.openxmlformats-officedocument.spreadsheetml.worksheet+xml"/>'
                 '</Types>')
ROOT_RELS = ('<?xml version="1.0" encoding="UTF-8"?>'
             '<Relationships xmlns="http://schemas.openxmlformats.org/package/2006/relationships">'
             '<Relationship Id="rId1" Type="http://schemas.openxmlformats.org/officeDocument/2006/relationships/officeDocument" Target="xl/workbook.xml"/>'
             '</Relationships>')
WORKBOOK = ('<?xml version="1.0" encoding="UTF-8"?>'
            '<workbook xmlns="http://schemas.openxmlformats.org/spreadsheetml/2006/main" '
            'xmlns:r="http://schemas.openxmlformats.org/officeDocument/2006/relationships">'
            '<sheets><sheet name="Sheet1" sheetId="1" r:id="rId1"/></sheets></workbook>')
WORKBOOK_RELS = ('<?xml version="1.0" encoding="UTF-8"?>'
                 '<Relationships xmlns="http://schemas.openxmlformats.org/package/2006/relationships">'
                 '<Relationship Id="rId1" Type="http://schemas.openxmlformats.org/officeDocument/2006/relationships/worksheet" Target="worksheets/sheet1.xml"/>'
                 '</Relationships>')
SHEET_HEAD = ('<?xml version="1.0" encoding="UTF-8"?>'
              '<worksheet xmlns="http://schemas.openxmlformats.org/spreadsheetml/2006/main"><sheetData>')
SHEET_TAIL = '</sheetData></worksheet>'


def column_letters(column):
    letters = ""
    while column > 0:
        column, digit = divmod(column - 1, 26)
        letters = chr(ord("A") + digit) + letters
    return letters


def put(z, name, data):
    # A fixed time stamp keeps the packages identical from run to run.
    z.writestr(zipfile.ZipInfo(name, date_time=(2021, 5, 17, 0, 0, 0)), data, compress_type=zipfile.ZIP_DEFLATED)


def xlsx(name, sheet_xml):
    with zipfile.ZipFile(os.path.join(HERE, name), "w") as z:
        put(z, "[Content_Types].xml", CONTENT_TYPES)
        put(z, "_rels/.rels", ROOT_RELS)
        put(z, "xl/workbook.xml", WORKBOOK)
        put(z, "xl/_rels/workbook.xml.rels", WORKBOOK_RELS)
        put(z, "xl/worksheets/sheet1.xml", sheet_xml)


def make_xlsx_files():
    # Error cells, an inline string and a cell far right and low.
    xlsx("errors.xlsx", SHEET_HEAD
         + '<row r="1"><c r="A1" t="e"><v>#N/A</v></c><c r="B1" t="e"><v>#DIV/0!</v></c>'
         + '<c r="C1" t="inlineStr"><is><t>inline</t></is></c></row>'
         + '<row r="30"><c r="Z30"><v>7</v></c></row>' + SHEET_TAIL)
    # 20,000 columns: beyond the grid's last column XFD (16,384).
    cells = "".join('<c r="%s1"><v>%d</v></c>' % (column_letters(c), c) for c in range(19990, 20001))
    xlsx("wide.xlsx", SHEET_HEAD + '<row r="1">' + cells + '</row>' + SHEET_TAIL)
    # A zip bomb: a sheet part of 64 MiB of blanks that packs into a few dozen KiB.
    xlsx("bomb.xlsx", SHEET_HEAD + " " * (64 << 20) + SHEET_TAIL)
    # Broken XML in the sheet part.
    xlsx("broken-xml.xlsx", SHEET_HEAD + '<row r="1"><c r="A1"><v>1</v></c><row' + SHEET_TAIL)
    # A zip without a workbook part.
    with zipfile.ZipFile(os.path.join(HERE, "not-a-workbook.xlsx"), "w") as z:
        put(z, "readme.txt", "just a zip")
    # A zip cut short: the directory at its end is missing.
    with open(os.path.join(HERE, "errors.xlsx"), "rb") as f:
        write("truncated.xlsx", f.read()[:300])
    # A directory entry that claims a part far larger than the file.
    with open(os.path.join(HERE, "errors.xlsx"), "rb") as f:
        lying = bytearray(f.read())
    first = lying.find(b"PK\x01\x02")
    lying[first + 20:first + 24] = struct.pack("<I", 0xFFFFFD3E)
    write("lying-sizes.xlsx", bytes(lying))
    write("text.xlsx", b"Date;Value\n2021/05/17;1.5\n")
    write("empty.xls", b"")


if __name__ == "__main__":
    make_xls_files()
    make_xlsx_files()
