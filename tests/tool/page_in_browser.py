#!/usr/bin/env python3
"""Opens a page of `norvexctl show --html` in a headless browser and looks at what is drawn.

usage: page_in_browser.py PAGE

In light and dark, and as narrow as a phone: the page has its colours, the bars theirs, and nothing stands out over the
right edge. Besides, whether those who do not see the page get all of it. Exit status 77: there is no browser here.
"""
import html.parser
import os
import shutil
import struct
import subprocess
import sys
import tempfile
import zlib

BROWSERS = ("chromium", "chromium-browser")
FLAGS = ("--headless", "--no-sandbox", "--disable-gpu", "--disable-quic", "--no-first-run", "--hide-scrollbars",
         "--disable-background-networking", "--disable-component-update", "--disable-sync")

# As in tool/PageStyle.h: the page, a card, the colour of volumes.
LIGHT = {"page": (0xF4, 0xF4, 0xF1), "card": (0xFF, 0xFF, 0xFF), "bar": (0x2A, 0x78, 0xD6)}
DARK = {"page": (0x13, 0x13, 0x12), "card": (0x1E, 0x1E, 0x1C), "bar": (0x5B, 0x9D, 0xF0)}


class Picture:
    """The pixels of a PNG file of 8 bits a channel, not interlaced."""

    def __init__(self, path):
        with open(path, "rb") as file:
            data = file.read()
        assert data.startswith(b"\x89PNG\r\n\x1a\n"), "no PNG file"
        at, packed = 8, b""
        while at < len(data):
            length, kind = struct.unpack(">I4s", data[at:at + 8])
            content = data[at + 8:at + 8 + length]
            if kind == b"IHDR":
                self.width, self.height, depth, colour, _, _, interlace = struct.unpack(">IIBBBBB", content)
                assert depth == 8 and colour in (2, 6) and not interlace, "an unexpected kind of PNG"
                self.channels = 3 if colour == 2 else 4
            elif kind == b"IDAT":
                packed += content
            at += 12 + length
        self.rows = self._unfiltered(zlib.decompress(packed))

    def _unfiltered(self, raw):
        step, stride = self.channels, self.width * self.channels
        rows, above = [], bytearray(stride)
        for start in range(0, len(raw), stride + 1):
            kind, row = raw[start], bytearray(raw[start + 1:start + 1 + stride])
            for x in range(stride if kind else 0):
                left = row[x - step] if x >= step else 0
                corner = above[x - step] if x >= step else 0
                row[x] = (row[x] + self._predicted(kind, left, above[x], corner)) & 0xFF
            rows.append(row)
            above = row
        return rows

    @staticmethod
    def _predicted(kind, left, up, corner):
        if kind < 4:
            return (0, left, up, (left + up) // 2)[kind]
        guess = left + up - corner
        return min((left, up, corner), key=lambda value: abs(guess - value))

    def pixel(self, x, y):
        start = x * self.channels
        return tuple(self.rows[y][start:start + 3])

    def column(self, x):
        return {self.pixel(x, y) for y in range(self.height)}

    def count(self, colour):
        return sum(self.pixel(x, y) == colour for y in range(0, self.height, 2) for x in range(0, self.width, 2))


class Words(html.parser.HTMLParser):
    """What a screen reader goes by."""

    def __init__(self):
        super().__init__()
        self.headings, self.pictures, self.titles, self.faults = [], 0, 0, []

    def handle_starttag(self, tag, attributes):
        found = dict(attributes)
        if tag in ("h1", "h2", "h3"):
            self.headings.append(int(tag[1]))
        if tag == "svg" and found.get("aria-hidden") != "true":
            self.pictures += 1
            if found.get("role") != "img" or not found.get("aria-labelledby"):
                self.faults.append("a picture without words")
        if tag == "title" and found.get("id"):
            self.titles += 1
        if tag == "th" and found.get("scope") not in ("row", "col"):
            self.faults.append("a heading of a table that does not say of what")

    def check(self):
        assert not self.faults, self.faults
        assert self.pictures > 0 and self.pictures == self.titles, "not every picture has a title"
        assert self.headings[0] == 1 and self.headings.count(1) == 1, "not one first heading"
        for before, after in zip(self.headings, self.headings[1:]):
            assert after <= before + 1, "a level of headings is left out"


def drawn(browser, page, folder, width, height, scheme):
    picture = os.path.join(folder, f"{scheme}-{width}.png")
    preferred = {"dark": 0, "light": 1}[scheme]
    subprocess.run([browser, *FLAGS, f"--user-data-dir={folder}/profile", f"--screenshot={picture}",
                    f"--window-size={width},{height}", f"--blink-settings=preferredColorScheme={preferred}",
                    "file://" + os.path.abspath(page)],
                   check=True, timeout=120, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
    return Picture(picture)


def check_drawing(picture, colours, width):
    assert picture.width == width, f"{picture.width} pixels wide, not {width}"
    assert picture.column(0) == {colours["page"]}, "the left margin is not free"
    assert picture.column(width - 1) == {colours["page"]}, "something stands out over the right edge"
    area = len(range(0, picture.height, 2)) * len(range(0, picture.width, 2))
    for name, least in (("card", 0.3), ("bar", 0.02)):
        share = picture.count(colours[name]) / area
        assert share > least, f"too little of the colour of {name}: {share:.3f}"


def main():
    page = sys.argv[1]
    with open(page, encoding="utf-8") as file:
        words = Words()
        words.feed(file.read())
    words.check()
    browser = next(filter(None, map(shutil.which, BROWSERS)), None)
    if browser is None:
        print("skipped: there is no chromium here (package chromium)")
        return 77
    with tempfile.TemporaryDirectory() as folder:
        for scheme, colours in (("light", LIGHT), ("dark", DARK)):
            for width, height in ((1000, 2000), (390, 2700)):
                check_drawing(drawn(browser, page, folder, width, height, scheme), colours, width)
                print(f"{scheme}, {width} pixels wide: as it should be")
    return 0


if __name__ == "__main__":
    sys.exit(main())
