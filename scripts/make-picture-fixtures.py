#!/usr/bin/python3
"""Writes the small picture files that the reader tests decode, each with the
pixels it must decode to, into tests/data/pictures/.

Every fixture is made from one 48 x 32 crop of samples/coffee.png. Files the
image library writes itself (orientation, CMYK, colour profiles, WebP) are
made with Pillow; the BMP variants and 16-bit PNG files are written here byte
by byte; HEIF with heif-enc. For each file the expected pixels are either the
upright picture itself, or a PNG next to it that names them.

Needs Debian's python3-pil, libheif-examples and icc-profiles-free; run it with
/usr/bin/python3 from the repository root. The output is checked in.
"""
import io
import os
import struct
import subprocess
import zlib

from PIL import Image, ImageChops, ImageCms, ImageOps

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
OUT = os.path.join(ROOT, "tests", "data", "pictures")
ADOBE = "/usr/share/color/icc/compatibleWithAdobeRGB1998.icc"
W, H = 48, 32

# Inverse of each EXIF orientation: the stored picture that shows `upright`
# when the orientation is applied (checked below against Pillow's reading).
STORED = {
    1: [],
    2: [Image.Transpose.FLIP_LEFT_RIGHT],
    3: [Image.Transpose.ROTATE_180],
    4: [Image.Transpose.FLIP_TOP_BOTTOM],
    5: [Image.Transpose.TRANSPOSE],
    6: [Image.Transpose.ROTATE_90],
    7: [Image.Transpose.TRANSVERSE],
    8: [Image.Transpose.ROTATE_270],
}


def path(name):
    return os.path.join(OUT, name)


def stored_for(picture, orientation):
    for op in STORED[orientation]:
        picture = picture.transpose(op)
    return picture


def exif_with(orientation):
    exif = Image.Exif()
    exif[0x0112] = orientation  # Orientation
    exif[0x010F] = "pxfx fixture camera"  # Make
    return exif.tobytes()


def png_chunk(kind, data):
    return struct.pack(">I", len(data)) + kind + data + struct.pack(">I", zlib.crc32(kind + data))


def write_png16(name, samples, gamma):
    """An RGB PNG of 16-bit samples (a list of rows of (r, g, b) values)."""
    raw = b"".join(b"\0" + b"".join(struct.pack(">HHH", *px) for px in row) for row in samples)
    data = b"\x89PNG\r\n\x1a\n" + png_chunk(b"IHDR", struct.pack(">IIBBBBB", W, H, 16, 2, 0, 0, 0))
    if gamma:
        data += png_chunk(b"gAMA", struct.pack(">I", 45455))
    data += png_chunk(b"IDAT", zlib.compress(raw, 9)) + png_chunk(b"IEND", b"")
    with open(path(name), "wb") as f:
        f.write(data)


def bmp(name, bits, pixel_rows, palette=b"", compression=0, masks=b"", top_down=False, header=40):
    """A BMP file; pixel_rows are the encoded rows (bottom-up unless top_down)
    already padded, or the compressed stream for RLE."""
    data = b"".join(pixel_rows)
    offset = 14 + header + len(masks) + len(palette)
    height = -H if top_down else H
    info = struct.pack("<IiiHHIIiiII", header, W, height, 1, bits, compression, len(data), 2835, 2835,
                       len(palette) // 4, 0)
    if header > 40:  # the masks are part of a version 4 or 5 header
        info += masks + b"\0" * (header - 40 - len(masks))
        offset -= len(masks)
        masks = b""
    with open(path(name), "wb") as f:
        f.write(b"BM" + struct.pack("<IHHI", offset + len(data), 0, 0, offset) + info + masks + palette + data)


def pad(row):
    return row + b"\0" * (-len(row) % 4)


def rle8(indices):
    out = b""
    for y in range(H - 1, -1, -1):
        row = indices[y * W:(y + 1) * W]
        x = 0
        while x < W:
            run = 1
            while x + run < W and run < 255 and row[x + run] == row[x]:
                run += 1
            if run >= 3 or W - x < 3:
                out += bytes([run, row[x]])
                x += run
            else:  # a literal stretch (absolute mode), padded to 16 bits
                n = min(W - x, 255)
                end = x + 3
                while end < x + n and not (end + 2 < W and row[end] == row[end + 1] == row[end + 2]):
                    end += 1
                lit = bytes(row[x:end])
                out += bytes([0, len(lit)]) + lit + (b"\0" if len(lit) % 2 else b"")
                x = end
        out += b"\0\0"
    return out + b"\0\1"


def rle4(indices):
    out = b""
    for y in range(H - 1, -1, -1):
        row = indices[y * W:(y + 1) * W]
        x = 0
        while x < W:
            # runs of two alternating nibbles, then literal groups of 4
            a = row[x]
            b = row[x + 1] if x + 1 < W else a
            run = 2
            while x + run < W and run < 255 and row[x + run] == (a if run % 2 == 0 else b):
                run += 1
            if run >= 6 or W - x < 4:
                run = min(run, W - x)
                out += bytes([run, a << 4 | b])
                x += run
            else:
                lit = row[x:x + 4]
                packed = bytes([lit[0] << 4 | lit[1], lit[2] << 4 | lit[3]])
                out += bytes([0, 4]) + packed
                x += 4
        out += b"\0\0"
    return out + b"\0\1"


def palette_bytes(image, count):
    pal = image.getpalette()[:3 * count]
    pal += [0] * (3 * count - len(pal))
    return b"".join(bytes([pal[3 * i + 2], pal[3 * i + 1], pal[3 * i], 0]) for i in range(count))


def main():
    os.makedirs(OUT, exist_ok=True)
    coffee = Image.open(os.path.join(ROOT, "samples", "coffee.png")).convert("RGB")
    upright = coffee.resize((W * 8, H * 8), Image.Resampling.BOX).crop((120, 40, 120 + W, 40 + H))
    upright.save(path("upright.png"))

    # Orientation: the eight EXIF orientations in lossless PNG (eXIf), and two
    # in JPEG (APP1), each stored so that applying it shows the upright picture.
    for o in range(1, 9):
        stored_for(upright, o).save(path(f"orientation-{o}.png"), exif=exif_with(o))
        shown = ImageOps.exif_transpose(Image.open(path(f"orientation-{o}.png"))).convert("RGB")
        assert ImageChops.difference(shown, upright).getbbox() is None, o
    for o in (3, 6):
        stored_for(upright, o).save(path(f"orientation-{o}.jpg"), quality=95, exif=exif_with(o))
        shown = ImageOps.exif_transpose(Image.open(path(f"orientation-{o}.jpg")))
        shown.convert("RGB").save(path(f"orientation-{o}.expected.png"))

    # CMYK JPEG, stored inverted with Adobe's marker: expected from the
    # decoded inks by R = (255 - C)(255 - K) / 255, rounded.
    upright.convert("CMYK").save(path("cmyk.jpg"), quality=95)
    inks = Image.open(path("cmyk.jpg"))
    inks.load()
    rgb = Image.new("RGB", (W, H))
    rgb.putdata([tuple(((255 - v) * (255 - k) + 127) // 255 for v in (c, m, y)) for c, m, y, k in inks.getdata()])
    rgb.save(path("cmyk.expected.png"))

    # Colour profiles: the picture's values taken as Adobe RGB, in PNG
    # (iCCP) and JPEG (APP2); expected: converted to sRGB by Little CMS.
    adobe = ImageCms.getOpenProfile(ADOBE)
    srgb = ImageCms.createProfile("sRGB")
    with open(ADOBE, "rb") as f:
        icc = f.read()
    upright.save(path("adobe-rgb.png"), icc_profile=icc)
    ImageCms.profileToProfile(upright, adobe, srgb, ImageCms.Intent.PERCEPTUAL).save(path("adobe-rgb.expected.png"))
    upright.save(path("adobe-rgb.jpg"), quality=95, icc_profile=icc)
    stored = Image.open(path("adobe-rgb.jpg"))
    stored.load()
    ImageCms.profileToProfile(stored.convert("RGB"), adobe, srgb, ImageCms.Intent.PERCEPTUAL).save(
        path("adobe-rgb-jpg.expected.png"))

    # 16-bit PNG with and without gAMA: samples scaled to 8 bits as they are,
    # (v * 255 + 32895) >> 16.
    samples = [[tuple((v * 257 + (x * 31 + y * 17) % 257) & 0xFFFF for v in upright.getpixel((x, y)))
                for x in range(W)] for y in range(H)]
    write_png16("rgb16.png", samples, gamma=False)
    write_png16("rgb16-gamma.png", samples, gamma=True)
    expected16 = Image.new("RGB", (W, H))
    expected16.putdata([tuple((v * 255 + 32895) >> 16 for v in px) for row in samples for px in row])
    expected16.save(path("rgb16.expected.png"))

    # BMP variants.
    pal8 = upright.quantize(256, dither=Image.Dither.NONE)
    pal4 = upright.quantize(16, dither=Image.Dither.NONE)
    mono = upright.convert("1", dither=Image.Dither.NONE)
    i8, i4, i1 = list(pal8.getdata()), list(pal4.getdata()), [1 if v else 0 for v in mono.getdata()]
    pal8.convert("RGB").save(path("bmp-palette8.expected.png"))
    pal4.convert("RGB").save(path("bmp-palette4.expected.png"))
    mono.convert("RGB").save(path("bmp-palette1.expected.png"))
    rows = lambda enc: [pad(enc(y)) for y in range(H - 1, -1, -1)]
    bmp("palette8.bmp", 8, rows(lambda y: bytes(i8[y * W:(y + 1) * W])), palette_bytes(pal8, 256))
    bmp("rle8.bmp", 8, [rle8(i8)], palette_bytes(pal8, 256), compression=1)
    nibbles = lambda y: bytes(i4[y * W + x] << 4 | i4[y * W + x + 1] for x in range(0, W, 2))
    bmp("palette4.bmp", 4, rows(nibbles), palette_bytes(pal4, 16))
    bmp("rle4.bmp", 4, [rle4(i4)], palette_bytes(pal4, 16), compression=2)
    bits1 = lambda y: bytes(sum(i1[y * W + x + b] << (7 - b) for b in range(8)) for x in range(0, W, 8))
    bmp("palette1.bmp", 1, rows(bits1), b"\0\0\0\0\xff\xff\xff\0")

    px = list(upright.getdata())
    bgr = lambda y: b"".join(bytes((b, g, r)) for r, g, b in px[y * W:(y + 1) * W])
    bmp("top-down.bmp", 24, [pad(bgr(y)) for y in range(H)], top_down=True)
    bmp("no-alpha32.bmp", 32, rows(lambda y: b"".join(bytes((b, g, r, 0)) for r, g, b in px[y * W:(y + 1) * W])))
    alpha = [(x * 5 + y * 3) % 256 for y in range(H) for x in range(W)]
    rgba = Image.new("RGBA", (W, H))
    rgba.putdata([(r, g, b, a) for (r, g, b), a in zip(px, alpha)])
    rgba.save(path("bmp-alpha32.expected.png"))
    bmp("alpha32.bmp", 32,
        rows(lambda y: b"".join(bytes((b, g, r, a)) for (r, g, b), a in zip(px[y * W:(y + 1) * W],
                                                                            alpha[y * W:(y + 1) * W]))),
        compression=3, masks=struct.pack("<IIII", 0xFF0000, 0xFF00, 0xFF, 0xFF000000), header=108)
    v565 = [(r >> 3, g >> 2, b >> 3) for r, g, b in px]
    bmp("bitfields565.bmp", 16,
        rows(lambda y: b"".join(struct.pack("<H", r << 11 | g << 5 | b) for r, g, b in v565[y * W:(y + 1) * W])),
        compression=3, masks=struct.pack("<III", 0xF800, 0x07E0, 0x001F))
    e565 = Image.new("RGB", (W, H))
    e565.putdata([(r << 3 | r >> 2, g << 2 | g >> 4, b << 3 | b >> 2) for r, g, b in v565])
    e565.save(path("bmp-565.expected.png"))

    # Pillow's own reading of the BMP files agrees with the expected pixels (not
    # for 5- and 6-bit fields, which it scales by truncation where the
    # expected pixels repeat the high bits in the low ones).
    for name, expected in [("palette8", "bmp-palette8"), ("rle8", "bmp-palette8"), ("palette4", "bmp-palette4"),
                           ("rle4", "bmp-palette4"), ("palette1", "bmp-palette1"), ("top-down", "upright"),
                           ("alpha32", "bmp-alpha32")]:
        read = Image.open(path(name + ".bmp"))
        want = Image.open(path(expected + (".png" if expected == "upright" else ".expected.png")))
        assert ImageChops.difference(read.convert(want.mode), want).getbbox() is None, name

    # WebP, lossless: with alpha, and with an EXIF orientation.
    rgba.save(path("alpha.webp"), lossless=True, exact=True)
    stored_for(upright, 6).save(path("orientation-6.webp"), lossless=True, exif=exif_with(6))

    # HEIF (HEVC), lossy: decoded within a few levels of the picture.
    upright.save(path("_heif-source.png"))
    subprocess.run(["heif-enc", "-q", "90", "-o", path("coffee.heic"), path("_heif-source.png")],
                   check=True, stdout=subprocess.DEVNULL)
    os.remove(path("_heif-source.png"))


if __name__ == "__main__":
    main()
