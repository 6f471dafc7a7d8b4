#!/usr/bin/env python3
"""Writes the seed corpora of the fuzz targets into fuzz/corpus/<target>/.

The seeds are small, well-formed examples of each input (plus a few near misses), so that the
fuzzer starts from the shapes the parsers accept instead of having to discover them. Run it
again after changing it; the files are committed.
"""
import os
import shutil
import struct

HERE = os.path.dirname(os.path.abspath(__file__))
CORPUS = os.path.join(HERE, "corpus")
FIXTURES = os.path.join(HERE, "..", "tests", "fixtures")


def write(target, name, data):
    folder = os.path.join(CORPUS, target)
    os.makedirs(folder, exist_ok=True)
    if isinstance(data, str):
        data = data.encode("latin-1")
    with open(os.path.join(folder, name), "wb") as f:
        f.write(data)


# --- content table: first byte = options (bit 0 no header, bits 1-2 separator, bit 3 row
#     preparation, bits 4-7 key column) ---
CONTENT = (
    "FileName,HomeDir,UpgradeStatus,Compression,Force Download,DynamicFieldInfo,Command\r\n"
    "a.dll,C:\\App,Downloaded,LZW,0,FORCED = TRUE,[RUN]setup.exe /q\r\n"
    "b.exe, \"C:\\Program Files\\App\" ,ApplicationFailed,None,1,,\r\n"
    "c.txt\r\n")
write("content_table", "typical", b"\x00" + CONTENT.encode())
write("content_table", "prepared", b"\x08" + CONTENT.encode() +
      b"d.dll,\\Sub,Applied,ZLIB,1,FORCED = IIFB(FileExists(CONCAT(HomeDir&#x2C; \"x\"))&#x2c; TRUE&#x2C; FALSE),\r\n")
write("content_table", "lf_and_empty_line", b"\x10" + b"A,B,\na, b ,\n\nafter,the,end\n")
write("content_table", "no_header_semicolon", b"\x03" + b"x;\"y\";z\rp;q\r")
write("content_table", "too_long_row", b"\x00" + b"A,B\r\n1,2,3\r\n")
# A script assigning a column the file lacks: nothing is stored, the plan still succeeds.
write("content_table", "missing_column", b"\x08" + b"FileName,DynamicFieldInfo\r\na.dll,FORCED = TRUE\r\n")

# --- dynamic-field texts: first byte picks the row's cells ---
SCRIPTS = {
    "assign": "FORCED = TRUE",
    "logic": "FORCED = AVAR AND (BVAR OR NOT FORCED) XOR FALSE",
    "text": "FORCED = IsUnderstood(CONCAT(AddPathSep(HomeDir), \"sub\\\\dir\") & IIFS(TRUE, \"a\", FileName))",
    "files": "FORCED = IIFB(IsUnderstood(\"FileExists\"), FileExists(AddPathSep(HomeDir) & FileName), "
             "FileVersionAtLeast(\"C:\\\\App\\\\a.dll\", \"1.2.3.4\"))",
    "numbers": "FORCED = IIFB(TRUE, IsUnderstood(\"x\"), FALSE); FORCED = XOR(TRUE, AVAR)",
    "invalid": "FORCED = AND(TRUE); DOWNLOAD_FILE = IIFN(TRUE, -3, 2.5); SNOOZEABLE = \"a\\tb\\\"c\"",
}
for i, (name, text) in enumerate(sorted(SCRIPTS.items())):
    write("execution_plan", name, bytes([i * 37 & 0xFF]) + text.encode())


# Hostile texts, each once a fault: chains and wide calls that parsed in quadratic time, trees
# deep enough to overflow a 1 MiB stack (refused past 256 levels), a text past the 64 KiB
# bound, files that FileVersionAtLeast read whole (a device, standard input), and tokens that
# end the text at the scanner's length limit.
def chain(n, operand="TRUE", op=" AND "):
    return "FORCED = " + op.join([operand] * (n + 1))


HOSTILE = {
    "and_chain": chain(1000),
    "deep_chain": chain(300, "a", "&"),
    "wide_and": "FORCED = AND(" + ", ".join(["TRUE"] * 3000) + ")",
    "too_long": chain(7300),
    "device_version": "FORCED = FileVersionAtLeast(\"Z:\\\\dev\\\\zero\", \"1.0.0.0\"); "
                      "FORCED = FileVersionAtLeast(\"Z:\\\\dev\\\\stdin\", \"0.0.0.0\")",
    "long_string_at_end": "FORCED = \"" + "s" * 8190 + "\"",
    "long_name_at_end": "FORCED = N" + "n" * 8190,
}
for name, text in sorted(HOSTILE.items()):
    write("execution_plan", name, b"\x00" + text.encode())

# --- SZDD: first byte bit 0 = round trip, bits 1-7 = read size ---
for name in ("hello.txt_", "blanks.txt_"):
    with open(os.path.join(FIXTURES, "szdd", name), "rb") as f:
        write("szdd_expander", name.rstrip("_").replace(".", "_"), b"\x00" + f.read())
write("szdd_expander", "roundtrip", b"\x07" + b"abcabcabcabc hello hello hello " * 4)
write("szdd_expander", "header_only", b"\x00" + b"SZDD\x88\xf0\x27\x33Ax\x10\x00\x00\x00")


# --- zlib: first byte bit 0 = round trip (bit 1 gzip, bits 2-7 level) ---
import gzip  # noqa: E402
import zlib  # noqa: E402
TEXT = b"Vantric update file contents, Vantric update file contents.\r\n" * 8
write("zlib_expand", "zlib_stream", b"\x00" + zlib.compress(TEXT, 9))
write("zlib_expand", "gzip_two_members", b"\x00" + gzip.compress(b"first ", mtime=0) + gzip.compress(b"second", mtime=0))
write("zlib_expand", "stored_truncated", b"\x00" + zlib.compress(TEXT, 0)[:100])
write("zlib_expand", "roundtrip_gzip", b"\x1b" + TEXT[:64])

# --- version information ---
def node(key, value=b"", text=False, children=()):
    """One VS_VERSIONINFO node, padded to 32 bits (nodes start aligned)."""
    body = key.encode("utf-16-le") + b"\0\0"
    head = 6 + len(body)
    body += b"\0" * (-head % 4)
    if text:
        value_length = len(value) // 2
    else:
        value_length = len(value)
    body += value
    body += b"\0" * (-(6 + len(body)) % 4)
    for child in children:
        body += child + b"\0" * (-len(child) % 4)
    return struct.pack("<HHH", 6 + len(body), value_length, 1 if text else 0) + body


def utf16z(text):
    return (text + "\0").encode("utf-16-le")


def version_block(version=(2, 1, 0, 17)):
    ms = (version[0] << 16) | version[1]
    ls = (version[2] << 16) | version[3]
    fixed = struct.pack("<13I", 0xFEEF04BD, 0x10000, ms, ls, ms, ls, 0x3F, 0, 4, 2, 0, 0, 0)
    strings = [node(k, utf16z(v), True) for k, v in (
        ("CompanyName", "Vantric"), ("FileVersion", "2.1.0.17"), ("ProductName", "Vantric Desktop Suite"))]
    table = node("040904E4", b"", True, strings)
    sfi = node("StringFileInfo", b"", True, [table])
    vfi = node("VarFileInfo", b"", True, [node("Translation", struct.pack("<HH", 0x409, 0x4E4))])
    return node("VS_VERSION_INFO", fixed, False, [sfi, vfi])


BLOCK = version_block()
write("version_info", "stamped", BLOCK)
write("version_info", "fixed_only", node("VS_VERSION_INFO", BLOCK[40:92]))
write("version_info", "truncated", BLOCK[:150])


# --- ELF files with a .pexver section ---
def elf(block, bits=64):
    names = b"\0.shstrtab\0.pexver\0"
    data_offset = 0x40 if bits == 64 else 0x34
    names_offset = data_offset + len(block)
    table = names_offset + len(names)
    table += -table % 8
    if bits == 64:
        section = lambda name, off, size: struct.pack("<IIQQQQIIQQ", name, 1, 0, 0, off, size, 0, 0, 1, 0)
        header = struct.pack("<4sBBBB8sHHIQQQIHHHHHH", b"\x7fELF", 2, 1, 1, 0, b"\0" * 8, 3, 62, 1,
                             0, 0, table, 0, 0x40, 0, 0, 64, 3, 1)
    else:
        section = lambda name, off, size: struct.pack("<IIIIIIIIII", name, 1, 0, 0, off, size, 0, 0, 1, 0)
        header = struct.pack("<4sBBBB8sHHIIIIIHHHHHH", b"\x7fELF", 1, 1, 1, 0, b"\0" * 8, 3, 3, 1,
                             0, 0, table, 0, 0x34, 0, 0, 40, 3, 1)
    out = header + block + names
    out += b"\0" * (table - len(out))
    out += section(0, 0, 0) + section(1, names_offset, len(names)) + section(11, data_offset, len(block))
    return out


write("elf_section", "elf64", elf(BLOCK, 64))
write("elf_section", "elf32", elf(BLOCK, 32))
# A section that claims more bytes than any file holds: it is not read.
HUGE = elf(BLOCK, 64)
write("elf_section", "huge_section", HUGE[:-24] + struct.pack("<Q", 0xFFFFFFFFFFFF) + HUGE[-16:])

# --- PE: the real Windows module of the tests, and a copy cut short ---
with open(os.path.join(FIXTURES, "versioned.dll"), "rb") as f:
    DLL = f.read()
write("pe_resources", "versioned_dll", DLL)
write("pe_resources", "headers_only", DLL[:1024])


def resource_data_entry(dll):
    """The file offset of the data entry of the first resource of the first type."""
    pe = struct.unpack_from("<I", dll, 60)[0]
    count, opt_size = struct.unpack_from("<H", dll, pe + 6)[0], struct.unpack_from("<H", dll, pe + 20)[0]
    opt = pe + 24
    dirs = opt + (96 if struct.unpack_from("<H", dll, opt)[0] == 0x10B else 112)
    rva = struct.unpack_from("<I", dll, dirs + 16)[0]
    for i in range(count):
        vsize, vaddr, _, raw = struct.unpack_from("<IIII", dll, opt + opt_size + i * 40 + 8)
        if vaddr <= rva < vaddr + max(vsize, _):
            root = raw + rva - vaddr
    off = 0
    for _level in range(3):
        off = struct.unpack_from("<I", dll, root + (off & 0x7FFFFFFF) + 16 + 4)[0]
    return root + off


# A version resource whose size claims gigabytes: it is not read.
ENTRY = resource_data_entry(DLL)
write("pe_resources", "huge_resource", DLL[:ENTRY + 4] + struct.pack("<I", 0xFFFFFF00) + DLL[ENTRY + 8:])

# --- .reg files ---
REG = ("Windows Registry Editor Version 5.00\r\n\r\n"
       "[HKEY_LOCAL_MACHINE\\Software\\Vantric\\Pex\\Demo]\r\n"
       "\"DefaultPath\"=\"C:\\\\Program Files\\\\Vantric\\\\Demo\"\r\n"
       "@=dword:0000002a\r\n"
       "\"Bin\"=hex:01,02,ff,\\\r\n  10\r\n"
       "\"Multi\"=hex(7):61,00,00,00,00,00\r\n"
       "\"Gone\"=-\r\n\r\n"
       "; a comment\r\n"
       "[-HKEY_CURRENT_USER\\Software\\Old]\r\n")
write("reg_file", "version5", REG)
write("reg_file", "version5_utf16", b"\xff\xfe" + REG.encode("utf-16-le"))
write("reg_file", "regedit4", "REGEDIT4\n\n[HKCU\\Software\\A]\n\"x\"=\"\\\"q\\\"\"\n\"e\"=hex(2):25,41,25,00\n")
write("reg_file", "bad_line", "REGEDIT4\n[HKLM\\Software\\A]\nnot a value\n")

# --- command lines ---
write("command_line", "plain", "setup.exe /q /norestart")
write("command_line", "quoted", "\"C:\\Program Files\\App\\setup.exe\" \"a b\" c\\\\\"d\\\" e\\\\\\\"f \"\"g\"\"\"")
write("command_line", "backslashes", "C:\\dir\\ \\\\x\\ \"y\\\\\" z\\\\\\\\\"")
write("command_line", "unclosed", "\"prog arg \"unclosed")

# --- paths: first byte = ComposePath flags (bit 0 and 1 also pick the current folder) ---
write("paths", "drive_paths", b"\xcf" + b"C:\\Program Files\\Vantric\\App\\A.DLL\0d:rel\\..\\x.y")
write("paths", "relative", b"\x31" + b"..\\App\\.\\a.dll\0\\windows\\system32\\")
write("paths", "unc", b"\x8a" + b"\\\\server\\share\\dir\\f.txt\0Z:\\Shared")
write("paths", "slashes", b"\x22" + b"c:/program files//vantric/\0C:App")

# --- [REGISTRY] parameters ---
write("registry_command", "dword", "(DWORD)HKLM\\Software\\Maker\\Product\\Flags=1")
write("registry_command", "string", "(STRING)HKCU/Software/Maker/Path=C:/Program Files/App)rest")
write("registry_command", "bad_root", "(DWORD)HKCR\\Software\\X\\V= -2147483649")
write("registry_command", "no_value", "(STRING)HKLM\\Key=")

if __name__ == "__main__":
    print("corpus written to", CORPUS)
