"""Reads devhost's output (standard input) for one step of slow_share.sh: the frame's rectangle and the
thumbnails' rectangles printed between "echo rects NAME" and "echo end NAME", and the frame's screenshot
(a 24-bit BMP). Prints "SHOWN LOADING": the thumbnails lying wholly inside the grid that show a picture,
and those that show only the black background of the loading state."""
import struct
import sys

bmp, name = sys.argv[1], sys.argv[2]
lines = sys.stdin.read().splitlines()
rects, inside = [], False
for line in lines:
    if line == "[script] rects " + name:
        inside = True
        continue
    if line == "[script] end " + name:
        break
    if inside and line.startswith("[script] rect "):
        rects.append([int(v) for v in line.split()[2:6]])
# The frame's own rect comes just before the marker.
frame = None
for i, line in enumerate(lines):
    if line == "[script] rects " + name:
        frame = [int(v) for v in lines[i - 1].split()[2:6]]
data = open(bmp, "rb").read()
offset, = struct.unpack_from("<I", data, 10)
width, height = struct.unpack_from("<ii", data, 18)
row = (width * 3 + 3) & ~3
bottom_up = height > 0
height = abs(height)


def pixel(x, y):
    yy = height - 1 - y if bottom_up else y
    return data[offset + yy * row + x * 3: offset + yy * row + x * 3 + 3]


fx, fy = frame[0], frame[1]
shown = loading = 0
for left, top, w, h in rects:
    if w > 400 or h > 400 or w < 20 or h < 20:
        continue  # not a thumbnail: the sheet under them
    x0, y0 = left - fx, top - fy
    # Wholly on the frame's picture, and not under the frame's bars: the grid lies between them.
    if x0 < 0 or y0 < 60 or x0 + w > width or y0 + h > height - 60:
        continue
    inner = [pixel(x, y) for y in range(y0 + 3, y0 + h - 3, 3) for x in range(x0 + 3, x0 + w - 3, 3)]
    if all(p == b"\0\0\0" for p in inner):
        loading += 1
    else:
        shown += 1
print(shown, loading)
