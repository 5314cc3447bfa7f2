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
    # A record longer than a BIFF8 record may be, and a text longer than the record holding it.
    long_record = bof(0x0005) + record(0x0087, b"\0" * 9000) + record(0x000A)
    write("long-record.xls", compound_file([("Workbook", long_record.ljust(MINI_CUTOFF, b"\0"))]))
    long_text = bof(0x0005) + record(0x041E, struct.pack("<HHB", 164, 0xFFFF, 0) + b"0.00") + record(0x000A)
    write("long-text.xls", compound_file([("Workbook", long_text.ljust(MINI_CUTOFF, b"\0"))]))
    # The compound file is sound but holds no workbook stream.
    write("no-workbook.xls", compound_file([("Something", b"\0" * 4096)]))


# ----------------------------------------------------------------------------------------------
# Workbooks exercising each kind of record the .xls reader takes, and damage it must report.

def text8(text, count_bytes=2):
    """A BIFF8 text: count, option byte, then one byte per character when every character
    fits one, else UTF-16."""
    units = text.encode("utf-16-le")
    count = len(units) // 2
    head = struct.pack("<H" if count_bytes == 2 else "<B", count)
    if all(ord(c) < 256 for c in text):
        return head + b"\0" + text.encode("latin-1")
    return head + b"\1" + units


def cell_head(row, col, xf_index):
    return struct.pack("<HHH", row, col, xf_index)


def rk_int(value):
    return ((value << 2) | 2) & 0xFFFFFFFF


def formula(row, col, xf_index, result):
    return record(0x0006, cell_head(row, col, xf_index) + result + struct.pack("<HIH", 0, 0, 0))


def typed_result(kind, value=0):
    return struct.pack("<BBBBBBH", kind, 0, value, 0, 0, 0, 0xFFFF)


def shared_texts_records():
    """An SST of seven texts spread over the SST record and three CONTINUE records: a text whose
    characters go on in the next record with a fresh option byte (and switch to two bytes each),
    texts with formatting runs and phonetic data, a surrogate pair, a header that ends a record
    with its characters in the next, and a text starting a record."""
    body = struct.pack("<II", 7, 7)
    body += text8("Flow")
    body += struct.pack("<HB", 8, 0) + b"Pegel "                 # 8 characters, 6 here
    first = b"\1" + "水位".encode("utf-16-le")                    # the other 2, two bytes each
    first += struct.pack("<HBH", 4, 0x08, 2) + b"rich" + b"\0" * 8   # two formatting runs
    first += struct.pack("<HBI", 3, 0x04, 6) + b"ext" + b"\0" * 6    # phonetic data
    first += text8("😀 Q")
    first += struct.pack("<HB", 5, 0)                            # header only
    second = b"\0" + b"Ende!"
    third = text8("last")
    return record(0x00FC, body) + record(0x003C, first) + record(0x003C, second) + record(0x003C, third)


SHARED_TEXTS = ["Flow", "Pegel 水位", "rich", "ext", "😀 Q", "Ende!", "last"]
XF_CUSTOM = 20


def feature_globals(offsets, date1904=False):
    out = bof(0x0005)
    out += record(0x0042, struct.pack("<H", 1200))
    out += record(0x0022, struct.pack("<H", 1 if date1904 else 0))
    out += record(0x041E, struct.pack("<H", 164) + text8("yyyy/mm/dd hh:mm:ss"))
    out += record(0x041E, struct.pack("<H", 165) + text8("0.000"))
    for _ in range(15):
        out += xf(0, True)
    out += xf(0, False) + xf(14, False) + xf(164, False) + xf(21, False) + xf(2, False) + xf(165, False)
    # A worksheet, a chart sheet (no cells, not listed) and a hidden worksheet.
    out += record(0x0085, struct.pack("<IBB", offsets[0], 0, 0) + text8("Data", 1))
    out += record(0x0085, struct.pack("<IBB", offsets[1], 0, 2) + text8("Chart", 1))
    out += record(0x0085, struct.pack("<IBB", offsets[2], 1, 0) + text8("Verborgen ä", 1))
    out += shared_texts_records()
    out += record(0x000A)
    return out


def feature_data_sheet():
    out = bof(0x0010)
    for col in range(7):
        out += record(0x00FD, cell_head(0, col, XF_GENERAL) + struct.pack("<I", col))
    # MULRK: an integer, an integer in hundredths, the high half of a double, a negative integer.
    rks = [(XF_GENERAL, rk_int(42)), (XF_FIXED2, rk_int(1234) | 1), (XF_GENERAL, 0x3FF80000), (XF_GENERAL, rk_int(-7))]
    out += record(0x00BD, struct.pack("<HH", 1, 0) + b"".join(struct.pack("<HI", x, v) for x, v in rks) + struct.pack("<H", 3))
    out += record(0x0203, cell_head(2, 0, XF_CUSTOM) + struct.pack("<d", 3.14159))
    out += record(0x0205, cell_head(2, 1, XF_GENERAL) + struct.pack("<BB", 1, 0))
    out += record(0x0205, cell_head(2, 2, XF_GENERAL) + struct.pack("<BB", 0x07, 1))
    out += formula(3, 0, XF_GENERAL, struct.pack("<d", 2.5))
    out += formula(3, 1, XF_GENERAL, typed_result(0))
    out += record(0x0207, text8("from formula"))
    out += formula(3, 2, XF_GENERAL, typed_result(1, 1))
    out += formula(3, 3, XF_GENERAL, typed_result(2, 0x2A))
    out += formula(3, 4, XF_GENERAL, typed_result(3))
    out += record(0x0204, cell_head(4, 0, XF_GENERAL) + text8("label €"))
    # A chart drawn on the sheet brings its own records; its number is not a cell of the sheet.
    out += bof(0x0020) + record(0x0203, cell_head(20, 0, XF_GENERAL) + struct.pack("<d", 99)) + record(0x000A)
    # Formatted blank cells down to row 10.
    out += record(0x00BE, struct.pack("<HHHHHH", 9, 0, XF_FIXED2, XF_FIXED2, XF_FIXED2, 2))
    out += record(0x000A)
    return out


def assemble(globals_of, bodies, name="Workbook"):
    """The stream: globals (made by `globals_of(offsets)`) then the bodies, each offset pointing
    at its body."""
    position = len(globals_of([0] * len(bodies)))
    offsets = []
    for body in bodies:
        offsets.append(position)
        position += len(body)
    stream = globals_of(offsets) + b"".join(bodies)
    return compound_file([(name, stream.ljust(MINI_CUTOFF, b"\0"))])


def biff5_file(code_page, label):
    """An Excel 5.0 workbook (stream "Book"): byte texts in the code page, no shared texts."""
    def bof5(kind):
        return record(0x0809, struct.pack("<HHHH", 0x0500, kind, 0x0DBB, 0x07CC))

    def text5(raw, count_format):
        return struct.pack(count_format, len(raw)) + raw

    def globals_of(offsets):
        out = bof5(0x0005) + record(0x0042, struct.pack("<H", code_page))
        out += record(0x041E, struct.pack("<H", 164) + text5(b"0.0", "<B"))
        for _ in range(15):
            out += xf(0, True)
        out += xf(0, False) + xf(164, False)
        out += record(0x0085, struct.pack("<IBB", offsets[0], 0, 0) + text5(b"Gr\xf6\xdfe", "<B"))
        return out + record(0x000A)

    sheet = bof5(0x0010)
    sheet += record(0x0204, cell_head(0, 0, 15) + text5(label, "<H"))
    sheet += record(0x0203, cell_head(1, 0, 16) + struct.pack("<d", 2.25))
    sheet += record(0x000A)
    return assemble(globals_of, [sheet], name="Book")


def one_data_sheet(body_records, extra_globals=b""):
    """A plain BIFF8 workbook with one sheet "Data" whose records after BOF are `body_records`."""
    def globals_of(offsets):
        head = globals_records(["Data"], ["only"], offsets)
        return head[:-4] + extra_globals + head[-4:]  # before the globals' EOF
    return assemble(globals_of, [bof(0x0010) + body_records])


def make_biff_feature_files():
    chart = bof(0x0020) + record(0x000A)
    hidden = bof(0x0010) + record(0x0203, cell_head(0, 0, XF_GENERAL) + struct.pack("<d", 1)) + record(0x000A)
    write("records.xls", assemble(feature_globals, [feature_data_sheet(), chart, hidden]))
    dates = bof(0x0010) + record(0x0203, cell_head(0, 0, XF_DATE) + struct.pack("<d", 0))
    dates += record(0x0203, cell_head(0, 1, XF_GENERAL) + struct.pack("<d", 5)) + record(0x000A)
    write("dates1904.xls", assemble(lambda offsets: feature_globals(offsets, date1904=True), [dates, chart, chart]))
    write("biff5.xls", biff5_file(1252, b"\x80 Gr\xf6\xdfe"))
    # The layout the conversion engine writes: types, units and value types in row 1, names in
    # row 2, date-time cells and values from row 3, blank cells for missing values.
    layout = [(0, 1, "Rainfall[mm]:Accumulated", XF_GENERAL), (0, 2, "Water Level[m]:Instantaneous", XF_GENERAL),
              (0, 3, "Undefined[Undefined]:Instantaneous", XF_GENERAL),
              (1, 0, "Date/time", XF_GENERAL), (1, 1, "Rain", XF_GENERAL), (1, 2, "Level", XF_GENERAL), (1, 3, "Other", XF_GENERAL)]
    rows = [(0.1, 1.25, 7), (None, 1.5, 8), (0.3, None, 9)]
    for i, values in enumerate(rows):
        layout.append((2 + i, 0, 43831 + i * 15 / 1440, XF_DATETIME))
        layout += [(2 + i, 1 + k, float(v), XF_GENERAL) for k, v in enumerate(values) if v is not None]
    write("engine-layout.xls", compound_file([("Workbook", workbook_stream([("Series", layout)]))]))

    # Damage the reader must name.
    write("foreign-codepage.xls", biff5_file(1251, b"\xc4\xe0\xed\xed\xfb\xe5"))
    write("shared-text-index.xls", one_data_sheet(record(0x00FD, cell_head(0, 0, XF_GENERAL) + struct.pack("<I", 5)) + record(0x000A)))
    write("short-number.xls", one_data_sheet(record(0x0203, cell_head(0, 0, XF_GENERAL) + b"\0\0") + record(0x000A)))
    write("no-sheet-end.xls", one_data_sheet(record(0x0203, cell_head(0, 0, XF_GENERAL) + struct.pack("<d", 1))))
    write("password.xls", one_data_sheet(record(0x000A), extra_globals=record(0x002F, b"\1\0" + b"\0" * 52)))
    lost = bof(0x0005) + record(0x0085, struct.pack("<IBB", 999999, 0, 0) + text8("Data", 1)) + record(0x000A)
    write("lost-sheet.xls", compound_file([("Workbook", lost.ljust(MINI_CUTOFF, b"\0"))]))
    # The first sheet lacks its EOF and runs into the second; two sheets at one place.
    def two_sheets(first_body, second_at_first):
        def globals_of(offsets):
            head = bof(0x0005)
            head += record(0x0085, struct.pack("<IBB", offsets[0], 0, 0) + text8("One", 1))
            head += record(0x0085, struct.pack("<IBB", offsets[0] if second_at_first else offsets[1], 0, 0) + text8("Two", 1))
            return head + record(0x000A)
        return assemble(globals_of, [bof(0x0010) + first_body, bof(0x0010) + record(0x000A)])
    write("overlapping-sheets.xls", two_sheets(b"", False))
    write("shared-sheet-start.xls", two_sheets(record(0x000A), True))
    old = record(0x0409, struct.pack("<HHH", 0, 0x0010, 0)) + record(0x000A)
    write("excel4.xls", compound_file([("Workbook", old.ljust(MINI_CUTOFF, b"\0"))]))


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


def rels(*relationships):
    return ('<?xml version="1.0" encoding="UTF-8"?>'
            '<Relationships xmlns="http://schemas.openxmlformats.org/package/2006/relationships">'
            + "".join('<Relationship Id="%s" Type="http://schemas.openxmlformats.org/officeDocument/2006/relationships/%s" '
                      'Target="%s"/>' % r for r in relationships)
            + '</Relationships>')


def make_feature_package():
    # A workbook the way other writers lay it out: the workbook part under another name, found
    # through the package's relationships; a sheet target with a leading '/'; the 1904 date
    # system; a prefix on every element; rows and cells without references; shared strings with
    # rich runs and phonetic readings; every cell type; a chart sheet, which is no worksheet.
    main = 'xmlns:x="http://schemas.openxmlformats.org/spreadsheetml/2006/main"'
    workbook = ('<?xml version="1.0" encoding="UTF-8"?>'
                '<x:workbook %s xmlns:r="http://schemas.openxmlformats.org/officeDocument/2006/relationships">'
                '<x:workbookPr date1904="1"/><x:sheets>'
                '<x:sheet name="Data &amp; more" sheetId="1" r:id="rId7"/>'
                '<x:sheet name="Chart" sheetId="3" r:id="rId9"/>'
                '<x:sheet name="Second" sheetId="2" r:id="rId8"/></x:sheets></x:workbook>' % main)
    styles = ('<?xml version="1.0" encoding="UTF-8"?><x:styleSheet %s>'
              '<x:numFmts count="1"><x:numFmt numFmtId="164" formatCode="yyyy/mm/dd hh:mm:ss"/></x:numFmts>'
              '<x:cellStyleXfs count="1"><x:xf numFmtId="14"/></x:cellStyleXfs>'
              '<x:cellXfs count="4"><x:xf numFmtId="0"/><x:xf numFmtId="164"/><x:xf numFmtId="14"/><x:xf numFmtId="2"/></x:cellXfs>'
              '<x:dxfs count="1"><x:dxf><x:numFmt numFmtId="165" formatCode="0.000"/></x:dxf></x:dxfs>'
              '</x:styleSheet>' % main)
    shared = ('<?xml version="1.0" encoding="UTF-8"?><x:sst %s count="3" uniqueCount="3">'
              '<x:si><x:t>Flow &lt;m3/s&gt;</x:t></x:si>'
              '<x:si><x:r><x:rPr><x:b/></x:rPr><x:t xml:space="preserve">Station </x:t></x:r><x:r><x:t>A</x:t></x:r>'
              '<x:rPh sb="0" eb="1"><x:t>reading</x:t></x:rPh></x:si>'
              '<x:si><x:t/></x:si></x:sst>' % main)
    sheet = ('<?xml version="1.0" encoding="UTF-8"?><x:worksheet %s><x:sheetData>'
             '<x:row r="1"><x:c r="A1" t="s"><x:v>0</x:v></x:c><x:c t="s"><x:v>1</x:v></x:c>'
             '<x:c t="inlineStr"><x:is><x:r><x:t>in</x:t></x:r><x:r><x:t>line</x:t></x:r></x:is></x:c></x:row>'
             '<x:row><x:c s="1"><x:v>42871.04309027778</x:v></x:c><x:c s="2"><x:v>42871</x:v></x:c>'
             '<x:c s="3"><x:v>4.5</x:v></x:c><x:c t="d" s="2"><x:v>2021-05-17T00:00:00</x:v></x:c></x:row>'
             '<x:row><x:c><x:v>0.30000000000000004</x:v></x:c><x:c><x:v>1E+15</x:v></x:c>'
             '<x:c><x:v>123456789.12345678</x:v></x:c></x:row>'
             '<x:row r="6"><x:c r="B6" t="b"><x:v>1</x:v></x:c><x:c t="e"><x:v>#DIV/0!</x:v></x:c>'
             '<x:c t="str"><x:f>B6&amp;"x"</x:f><x:v>TRUEx</x:v></x:c><x:c><x:f>1/0</x:f><x:v>2</x:v></x:c></x:row>'
             '</x:sheetData></x:worksheet>' % main)
    second = SHEET_HEAD + '<row r="2"><c r="B2"><v>-2.5</v></c></row>' + SHEET_TAIL
    with zipfile.ZipFile(os.path.join(HERE, "features.xlsx"), "w") as z:
        put(z, "[Content_Types].xml", CONTENT_TYPES)
        put(z, "_rels/.rels", rels(("rId1", "officeDocument", "xl/book.xml")))
        put(z, "xl/book.xml", workbook)
        put(z, "xl/_rels/book.xml.rels", rels(("rId7", "worksheet", "/xl/sheets/data.xml"),
                                              ("rId8", "worksheet", "sheets/../sheets/second.xml"),
                                              ("rId9", "chartsheet", "chartsheets/sheet1.xml"),
                                              ("rId2", "styles", "styles.xml"),
                                              ("rId3", "sharedStrings", "strings.xml")))
        put(z, "xl/styles.xml", styles)
        put(z, "xl/strings.xml", shared)
        put(z, "xl/sheets/data.xml", sheet)
        put(z, "xl/sheets/second.xml", second)


def make_xlsx_files():
    make_feature_package()
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
    # A workbook whose sheet part is not in the package.
    with zipfile.ZipFile(os.path.join(HERE, "missing-sheet.xlsx"), "w") as z:
        put(z, "_rels/.rels", ROOT_RELS)
        put(z, "xl/workbook.xml", WORKBOOK)
        put(z, "xl/_rels/workbook.xml.rels", WORKBOOK_RELS)
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
    make_biff_feature_files()
    make_xlsx_files()
