"""Changes a finished compiled help file: its strings, and the time stamps that would make each build differ.

The file begins with a header, then a directory of named entries in chunks of fixed size, then the content in two
sections: 0 uncompressed, 1 compressed. Numbers are little-endian, except in directory entries, which hold 7 bits per
byte, highest first.
"""

import struct

HEADER_TIME = 0x10
LISTING_HEAD = 0x14  # bytes of a listing chunk before its first entry
SYSTEM_TIME = 10     # code of the record that holds the time


class Entry:
    def __init__(self, name, section, offset, length):
        self.name, self.section, self.offset, self.length = name, section, offset, length

    def encoded(self):
        numbers = b"".join(map(encode_number, (self.section, self.offset, self.length)))
        return encode_number(len(self.name)) + self.name + numbers


def encode_number(value):
    parts = [value & 0x7F]
    while value := value >> 7:
        parts.append(0x80 | value & 0x7F)
    return bytes(reversed(parts))


def decode_number(data, at):
    value = 0
    while True:
        value = value << 7 | data[at] & 0x7F
        at += 1
        if not data[at - 1] & 0x80:
            return value, at


class ChmFile:
    def __init__(self, data):
        self.data = bytearray(data)
        if self.data[:4] != b"ITSF":
            raise ValueError("not a compiled help file")
        self._sizes_at, _, directory, _, self._content = struct.unpack_from("<5Q", self.data, 0x38)
        head_size, = struct.unpack_from("<I", self.data, directory + 0x08)
        self._chunk_size, density = struct.unpack_from("<2I", self.data, directory + 0x10)
        self._chunk_count, = struct.unpack_from("<I", self.data, directory + 0x2C)
        self._chunks_at = directory + head_size
        self._reference_step = 1 + (1 << density)

    def clear_times(self):
        """Zeroes both time stamps of the build."""
        struct.pack_into("<I", self.data, HEADER_TIME, 0)
        system = self._find(b"/#SYSTEM")[2]
        at, end = self._content + system.offset + 4, self._content + system.offset + system.length
        while at < end:
            code, size = struct.unpack_from("<2H", self.data, at)
            if code == SYSTEM_TIME:
                struct.pack_into("<I", self.data, at + 4, 0)
            at += 4 + size

    def replace(self, name, content):
        """Gives an entry new content, stored uncompressed at the end of the file. The old content stays, unused."""
        chunk, entries, entry = self._find(name)
        entry.section, entry.offset, entry.length = 0, len(self.data) - self._content, len(content)
        self._write_listing(chunk, entries)
        self.data += content
        struct.pack_into("<Q", self.data, self._sizes_at + 8, len(self.data))

    def _find(self, name):
        for index in range(self._chunk_count):
            chunk = self._chunks_at + index * self._chunk_size
            if self.data[chunk:chunk + 4] != b"PMGL":
                continue
            entries = self._read_listing(chunk)
            for entry in entries:
                if entry.name == name:
                    return chunk, entries, entry
        raise KeyError(name)

    def _read_listing(self, chunk):
        free, = struct.unpack_from("<I", self.data, chunk + 4)
        at, end, entries = chunk + LISTING_HEAD, chunk + self._chunk_size - free, []
        while at < end:
            length, at = decode_number(self.data, at)
            name, at = bytes(self.data[at:at + length]), at + length
            section, at = decode_number(self.data, at)
            offset, at = decode_number(self.data, at)
            size, at = decode_number(self.data, at)
            entries.append(Entry(name, section, offset, size))
        return entries

    def _write_listing(self, chunk, entries):
        # The chunk ends with the number of entries and, before it, the positions of every n-th entry, in reverse.
        listing, references = b"", struct.pack("<H", len(entries))
        for index, entry in enumerate(entries):
            if index and index % self._reference_step == 0:
                references = struct.pack("<H", len(listing)) + references
            listing += entry.encoded()
        free = self._chunk_size - LISTING_HEAD - len(listing)
        if free < len(references):
            raise ValueError("a chunk of the directory is full")
        struct.pack_into("<I", self.data, chunk + 4, free)
        self.data[chunk + LISTING_HEAD:chunk + self._chunk_size] = \
            listing + bytes(free - len(references)) + references
