#!/usr/bin/env python3
"""Independent model of the colour conversions, used to produce the golden
hashes of conversions_test.cpp.

Every single-precision operation is modelled by rounding the exact (double)
result of one operation to the nearest float, which is what IEEE single
arithmetic does for +, - and *. Run: python3 tests/color/conversions_golden.py
"""
import struct


def f(x):
    return struct.unpack("<f", struct.pack("<f", x))[0]


def trunc(x):
    return int(x)


def clamp(v):
    return 0 if v < 0 else (255 if v > 255 else v)


def cdiv(a, b):
    q = abs(a) // abs(b)
    return q if (a >= 0) == (b >= 0) else -q


def split(c):
    return (c >> 16) & 255, (c >> 8) & 255, c & 255, c & 0xFF000000


def rgb_to_hsl(c):
    r, g, b, a = split(c)
    mx, mn = max(r, g, b), min(r, g, b)
    s_, d = mx + mn, mx - mn
    l = ((s_ + 1) >> 1) & 255
    if d == 0:
        s, h = 0, 170
    else:
        den = s_ if l <= 127 else 510 - s_
        s = cdiv(d * 255 + cdiv(den, 2), den) & 255
        if r == mx:
            h = cdiv(cdiv((g - b) * 255, 6) + cdiv(d, 2), d) + (255 if g < b else 0)
        elif g != mx:
            h = cdiv(cdiv((r - g) * 255, 6) + cdiv(d, 2), d) + 170
        else:
            h = cdiv(cdiv((b - r) * 255, 6) + cdiv(d, 2), d) + 85
        h %= 65536
        if h > 255:
            h = 255
    return l | s << 8 | h << 16 | a


def hue_to_rgb(lo, hi, hue):
    if hue > 255:
        hue = (hue - 255) % 65536
    if hue <= 41:
        v = lo + cdiv((hi - lo) * hue * 6 + 126, 255)
    elif hue <= 126:
        v = hi
    elif hue <= 169:
        v = lo + cdiv((hi - lo) * (1020 - 6 * hue) + 126, 255)
    else:
        v = lo
    return v % 65536


def hsl_to_rgb(c):
    h, s, l, a = split(c)
    if s == 0:
        return l | l << 8 | l << 16 | a
    m2 = (cdiv(l * (s + 255) + 127, 255) if l <= 127 else l + s - cdiv(l * s + 127, 255)) % 65536
    m1 = (2 * l - m2) % 65536
    r = hue_to_rgb(m1, m2, h + 85) & 255
    g = hue_to_rgb(m1, m2, h) & 255
    b = hue_to_rgb(m1, m2, (h - 85) % 65536) & 255
    return b | g << 8 | r << 16 | a


def rgb_to_yuv(c):
    r, g, b, a = split(c)
    y = trunc(f(f(f(f(0.299) * r) + f(f(0.587) * g)) + f(f(0.114) * b)))
    u = trunc(f(f((b - y) * f(0.565)) + 128))
    v = trunc(f(f((r - y) * f(0.713)) + 128))
    return clamp(v) | clamp(u) << 8 | clamp(y) << 16 | a


def yuv_to_rgb(c):
    y, u, v, a = split(c)
    u -= 128
    v -= 128
    r = trunc(f(y + f(f(1.403) * v)))
    g = trunc(f(f(y - f(f(0.344) * u)) - f(f(0.714) * v)))
    b = trunc(f(y + f(f(1.77) * u)))
    return clamp(b) | clamp(g) << 8 | clamp(r) << 16 | a


def lin3(k1, k2, k3, x1, x2, x3, ops):
    t = f(f(f(k1) * x1) + ops[0] * f(f(k2) * x2))
    return f(t + ops[1] * f(f(k3) * x3))


def rgb_to_yiq(c):
    r, g, b, a = split(c)
    y = trunc(lin3(0.2992, 0.5868, 0.114, r, g, b, (1, 1)))
    i = trunc(f(lin3(0.596, 0.2742, 0.3219, r, g, b, (-1, -1)) + 128))
    q = trunc(f(lin3(0.2109, 0.5229, 0.312, r, g, b, (-1, 1)) + 128))
    return clamp(q) | clamp(i) << 8 | clamp(y) << 16 | a


def yiq_to_rgb(c):
    y, i, q, a = split(c)
    i -= 128
    q -= 128
    r = trunc(f(f(y + f(f(0.956) * i)) + f(f(0.621) * q)))
    g = trunc(f(f(y - f(f(0.273) * i)) - f(f(0.647) * q)))
    b = trunc(f(f(y - f(f(1.104) * i)) + f(f(1.701) * q)))
    return clamp(b) | clamp(g) << 8 | clamp(r) << 16 | a


def rgb_to_xyz(c):
    r, g, b, a = split(c)
    x = trunc(lin3(0.412453, 0.35758, 0.180423, r, g, b, (1, 1)))
    y = trunc(lin3(0.212671, 0.71516, 0.072169, r, g, b, (1, 1)))
    z = trunc(f(lin3(0.019334, 0.119193, 0.950227, r, g, b, (1, 1)) * f(0.9184837)))
    return (z & 255) | (y & 255) << 8 | (x & 255) << 16 | a


def xyz_to_rgb(c):
    x, y, z, a = split(c)
    r = trunc(f(f(f(3.240479) * x) - f(f(1.53715) * y)) - f(f(0.498535) * z) * 1.088751)
    g = trunc(f(f(f(-0.969256) * x) + f(f(1.875992) * y)) + f(f(0.041556) * z) * 1.088751)
    b = trunc(f(f(f(0.055648) * x) - f(f(0.204043) * y)) + f(f(1.057311) * z) * 1.088751)
    return clamp(b) | clamp(g) << 8 | clamp(r) << 16 | a


def grid():
    """The inputs hashed by the test: every third level of each byte, with
    a varying alpha."""
    n = 0
    for p in range(0, 256, 3):
        for q in range(0, 256, 3):
            for s in range(0, 256, 3):
                yield p << 16 | q << 8 | s | ((n * 37) & 255) << 24
                n += 1


def fnv(values):
    h = 2166136261
    for v in values:
        h = ((h ^ v) * 16777619) & 0xFFFFFFFF
    return h


if __name__ == "__main__":
    for fn in (rgb_to_hsl, hsl_to_rgb, rgb_to_yuv, yuv_to_rgb, rgb_to_yiq, yiq_to_rgb, rgb_to_xyz, xyz_to_rgb):
        print("%-12s 0x%08X" % (fn.__name__, fnv(fn(c) for c in grid())))
