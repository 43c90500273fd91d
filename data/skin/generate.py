#!/usr/bin/env python3
"""Draws the pictures and writes skin.ini of the program's skins.

Pure Python (zlib and struct only), so that no imaging package is needed. The output is committed;
the build never runs this. Run it from anywhere: python3 data/skin/generate.py
"""
import math
import os
import struct
import zlib

HERE = os.path.dirname(os.path.abspath(__file__))
SS = 3  # supersampling per axis for smooth edges


# --- canvas -----------------------------------------------------------------------------------

class Canvas:
    def __init__(self, w, h, colour=(0, 0, 0, 0)):
        self.w, self.h = w, h
        self.px = [list(colour) for _ in range(w * h)]

    def blend(self, x, y, rgba, cover=1.0):
        if not (0 <= x < self.w and 0 <= y < self.h) or cover <= 0:
            return
        r, g, b, a = rgba
        a = a / 255.0 * cover
        d = self.px[y * self.w + x]
        da = d[3] / 255.0
        oa = a + da * (1 - a)
        if oa <= 0:
            self.px[y * self.w + x] = [0, 0, 0, 0]
            return
        for i, c in enumerate((r, g, b)):
            d[i] = (c * a + d[i] * da * (1 - a)) / oa
        d[3] = oa * 255

    def shape(self, inside, rgba, box=None):
        """Fills the pixels whose samples satisfy inside(x, y), with coverage."""
        x0, y0, x1, y1 = box or (0, 0, self.w, self.h)
        x0, y0 = max(0, int(x0)), max(0, int(y0))
        x1, y1 = min(self.w, int(math.ceil(x1))), min(self.h, int(math.ceil(y1)))
        for y in range(y0, y1):
            for x in range(x0, x1):
                n = 0
                for sy in range(SS):
                    for sx in range(SS):
                        if inside(x + (sx + 0.5) / SS, y + (sy + 0.5) / SS):
                            n += 1
                if n:
                    col = rgba(x, y) if callable(rgba) else rgba
                    self.blend(x, y, col, n / (SS * SS))

    def rect(self, x, y, w, h, rgba):
        for yy in range(max(0, y), min(self.h, y + h)):
            for xx in range(max(0, x), min(self.w, x + w)):
                self.blend(xx, yy, rgba(xx, yy) if callable(rgba) else rgba)

    def rrect(self, x, y, w, h, r, rgba):
        def inside(px, py):
            if px < x or px > x + w or py < y or py > y + h:
                return False
            cx = min(max(px, x + r), x + w - r)
            cy = min(max(py, y + r), y + h - r)
            return (px - cx) ** 2 + (py - cy) ** 2 <= r * r
        self.shape(inside, rgba, (x - 1, y - 1, x + w + 1, y + h + 1))

    def circle(self, cx, cy, r, rgba):
        self.shape(lambda px, py: (px - cx) ** 2 + (py - cy) ** 2 <= r * r, rgba,
                   (cx - r - 1, cy - r - 1, cx + r + 1, cy + r + 1))

    def ring(self, cx, cy, r, t, rgba):
        self.shape(lambda px, py: (r - t) ** 2 <= (px - cx) ** 2 + (py - cy) ** 2 <= r * r, rgba,
                   (cx - r - 1, cy - r - 1, cx + r + 1, cy + r + 1))

    def poly(self, pts, rgba):
        def inside(px, py):
            c = False
            j = len(pts) - 1
            for i in range(len(pts)):
                xi, yi = pts[i]
                xj, yj = pts[j]
                if (yi > py) != (yj > py) and px < (xj - xi) * (py - yi) / (yj - yi) + xi:
                    c = not c
                j = i
            return c
        xs = [p[0] for p in pts]
        ys = [p[1] for p in pts]
        self.shape(inside, rgba, (min(xs) - 1, min(ys) - 1, max(xs) + 1, max(ys) + 1))

    def line(self, x0, y0, x1, y1, t, rgba):
        dx, dy = x1 - x0, y1 - y0
        ln = math.hypot(dx, dy) or 1
        def inside(px, py):
            u = ((px - x0) * dx + (py - y0) * dy) / (ln * ln)
            u = min(max(u, 0), 1)
            qx, qy = x0 + u * dx, y0 + u * dy
            return (px - qx) ** 2 + (py - qy) ** 2 <= (t / 2) ** 2
        self.shape(inside, rgba, (min(x0, x1) - t, min(y0, y1) - t, max(x0, x1) + t,
                                  max(y0, y1) + t))

    def paste_raw(self, other, ox, oy):
        for y in range(other.h):
            for x in range(other.w):
                if 0 <= ox + x < self.w and 0 <= oy + y < self.h:
                    self.px[(oy + y) * self.w + ox + x] = list(other.px[y * other.w + x])

    def paste(self, other, ox, oy):
        for y in range(other.h):
            for x in range(other.w):
                p = other.px[y * other.w + x]
                if p[3] > 0:
                    self.blend(ox + x, oy + y, (p[0], p[1], p[2], 255), p[3] / 255.0)


def vgrad(top, bottom, y0, h):
    def f(x, y):
        t = min(max((y - y0) / max(h - 1, 1), 0), 1)
        return tuple(int(top[i] + (bottom[i] - top[i]) * t) for i in range(3)) + (255,)
    return f


def hexc(s, a=255):
    s = s.lstrip('#')
    return (int(s[0:2], 16), int(s[2:4], 16), int(s[4:6], 16), a)


# --- writers ----------------------------------------------------------------------------------

def write_png(path, c):
    raw = bytearray()
    for y in range(c.h):
        raw.append(0)
        for x in range(c.w):
            p = c.px[y * c.w + x]
            raw += bytes(int(round(min(max(v, 0), 255))) for v in p)
    def chunk(tag, data):
        return struct.pack('>I', len(data)) + tag + data + struct.pack('>I', zlib.crc32(tag + data))
    png = b'\x89PNG\r\n\x1a\n' + chunk(b'IHDR', struct.pack('>IIBBBBB', c.w, c.h, 8, 6, 0, 0, 0))
    png += chunk(b'IDAT', zlib.compress(bytes(raw), 9)) + chunk(b'IEND', b'')
    open(path, 'wb').write(png)


def flatten(c, bg):
    out = Canvas(c.w, c.h, bg)
    out.paste(c, 0, 0)
    return out


def write_bmp(path, c, bg=(255, 255, 255, 255)):
    c = flatten(c, bg)
    stride = (c.w * 3 + 3) & ~3
    data = bytearray()
    for y in range(c.h - 1, -1, -1):
        row = bytearray()
        for x in range(c.w):
            r, g, b, _ = c.px[y * c.w + x]
            row += bytes((int(round(b)), int(round(g)), int(round(r))))
        row += b'\0' * (stride - len(row))
        data += row
    header = struct.pack('<2sIHHI', b'BM', 54 + len(data), 0, 0, 54)
    info = struct.pack('<IiiHHIIiiII', 40, c.w, c.h, 1, 24, 0, len(data), 2835, 2835, 0, 0)
    open(path, 'wb').write(header + info + data)


def write_gif(path, c, bg):
    """A GIF with a 6x6x6 colour cube, LZW kept at 9-bit codes by frequent clear codes."""
    c = flatten(c, bg)
    # The most frequent colours make the palette; a preview has few besides its edges.
    counts = {}
    for p in c.px:
        key = tuple(int(round(v)) for v in p[:3])
        counts[key] = counts.get(key, 0) + 1
    colours = sorted(counts, key=lambda k: -counts[k])[:256]
    palette = bytearray()
    for col in colours:
        palette += bytes(col)
    palette += b'\0' * (256 * 3 - len(palette))
    nearest = {}
    def index_of(key):
        if key not in nearest:
            nearest[key] = min(range(len(colours)), key=lambda i: sum(
                (colours[i][j] - key[j]) ** 2 for j in range(3)))
        return nearest[key]
    idx = [index_of(tuple(int(round(v)) for v in p[:3])) for p in c.px]
    codes = []
    for i, v in enumerate(idx):
        if i % 250 == 0:
            codes.append(256)
        codes.append(v)
    codes.append(257)
    bits = 0
    nbits = 0
    out = bytearray()
    for code in codes:
        bits |= code << nbits
        nbits += 9
        while nbits >= 8:
            out.append(bits & 0xFF)
            bits >>= 8
            nbits -= 8
    if nbits:
        out.append(bits & 0xFF)
    blocks = bytearray()
    for i in range(0, len(out), 255):
        part = out[i:i + 255]
        blocks += bytes((len(part),)) + part
    gif = b'GIF89a' + struct.pack('<HHBBB', c.w, c.h, 0xF7, 0, 0) + palette
    gif += b',' + struct.pack('<HHHHB', 0, 0, c.w, c.h, 0) + bytes((8,)) + blocks + b'\0;'
    open(path, 'wb').write(gif)


# --- themes -----------------------------------------------------------------------------------

THEMES = {
    'Default': dict(
        name='Velmorant Light', bg='#EEF1F5', card='#FFFFFF', border='#D3DAE3',
        accent='#2F6FED', accent_dark='#1D4ED8', cap_top='#2C3644', cap_bottom='#212832',
        cap_text='#F3F6FA', cap_hover='#3A4656', menu_bg='#FAFBFD', menu_text='#273142',
        hover='#E4ECFC', popup='#FFFFFF', popup_border='#C5CEDA', select='#E4ECFC',
        select_text='#1D4ED8', disabled='#9AA4B2', line='#E6EAF0', text='#2A3342',
        muted='#5B6576', radius=8, card_radius=6, tab_up='#EEF1F5', tab_hover='#E2E7EE',
        status='#E6EAF0', font='Cantarell', paper='#FFFFFF'),
    'Midnight': dict(
        name='Midnight Teal', bg='#171A21', card='#21262F', border='#323A47',
        accent='#14B8A6', accent_dark='#5EEAD4', cap_top='#0E1116', cap_bottom='#0E1116',
        cap_text='#5EEAD4', cap_hover='#1F2630', menu_bg='#1B1F27', menu_text='#D6DAE1',
        hover='#27303C', popup='#232934', popup_border='#3A4352', select='#134E4A',
        select_text='#99F6E4', disabled='#687384', line='#333B48', text='#E3E6EB',
        muted='#9AA3B1', radius=12, card_radius=10, tab_up='#171A21', tab_hover='#222833',
        status='#12151B', font='DejaVu Sans', paper='#E3E6EB'),
}

CAPTION_H = 32
MENU_H = 26
TAB_W, TAB_H = 124, 30
GAP_H = 36


def rgb_int(c):
    return '0x%02X%02X%02X' % c[:3]


def native_int(c):
    return '0x%02X%02X%02X' % (c[2], c[1], c[0])


def card_picture(t, size=24):
    c = Canvas(size, size, hexc(t['bg']))
    r = t['card_radius']
    c.rrect(0, 0, size, size, r, hexc(t['border']))
    c.rrect(1, 1, size - 2, size - 2, r - 1, hexc(t['card']))
    return c


def button_cells(t, w, h, glyph, primary=False):
    """Four cells stacked: hover, up, down, disabled."""
    c = Canvas(w, h * 4)
    states = [('hover', t['hover']), ('up', None), ('down', t['select']), ('disabled', None)]
    for i, (state, fill) in enumerate(states):
        y = i * h
        if primary:
            base = hexc(t['accent']) if state != 'disabled' else hexc(t['border'])
            if state == 'hover':
                base = hexc(t['accent_dark'])
            c.rrect(1, y + 1, w - 2, h - 2, 6, base)
            colour = (255, 255, 255, 255)
        else:
            if fill:
                c.rrect(1, y + 1, w - 2, h - 2, 6, hexc(fill))
            colour = hexc(t['disabled']) if state == 'disabled' else hexc(t['text'])
            if state in ('hover', 'down'):
                colour = hexc(t['accent_dark'])
        glyph(c, w / 2, y + h / 2, min(w, h) * 0.3, colour)
    return c


def g_plus(c, x, y, s, col):
    c.line(x - s, y, x + s, y, 2.4, col)
    c.line(x, y - s, x, y + s, 2.4, col)


def g_minus(c, x, y, s, col):
    c.line(x - s, y, x + s, y, 2.4, col)


def g_cross(c, x, y, s, col):
    c.line(x - s * .8, y - s * .8, x + s * .8, y + s * .8, 2.4, col)
    c.line(x - s * .8, y + s * .8, x + s * .8, y - s * .8, 2.4, col)


def g_play(c, x, y, s, col):
    c.poly([(x - s * .7, y - s), (x + s, y), (x - s * .7, y + s)], col)


def g_pause(c, x, y, s, col):
    c.rect(int(x - s * .75), int(y - s), max(2, int(s * .5)), int(2 * s), col)
    c.rect(int(x + s * .25), int(y - s), max(2, int(s * .5)), int(2 * s), col)


def g_stop(c, x, y, s, col):
    c.rrect(x - s * .85, y - s * .85, s * 1.7, s * 1.7, 2, col)


def g_disc(c, x, y, s, col):
    c.ring(x, y, s * 1.1, 2.2, col)
    c.circle(x, y, s * .3, col)


def g_flame(c, x, y, s, col):
    c.circle(x, y + s * .3, s * .7, col)
    c.poly([(x - s * .6, y + s * .1), (x, y - s * 1.1), (x + s * .6, y + s * .1)], col)


def g_up(c, x, y, s, col):
    c.poly([(x - s, y + s * .5), (x, y - s * .6), (x + s, y + s * .5)], col)


def g_down(c, x, y, s, col):
    c.poly([(x - s, y - s * .5), (x, y + s * .6), (x + s, y - s * .5)], col)


def g_next(c, x, y, s, col):
    c.poly([(x - s, y - s), (x + s * .4, y), (x - s, y + s)], col)
    c.rect(int(x + s * .5), int(y - s), 3, int(2 * s), col)


def g_prev(c, x, y, s, col):
    c.poly([(x + s, y - s), (x - s * .4, y), (x + s, y + s)], col)
    c.rect(int(x - s * .5) - 3, int(y - s), 3, int(2 * s), col)


def g_globe(c, x, y, s, col):
    c.ring(x, y, s, 2, col)
    c.line(x - s, y, x + s, y, 1.6, col)
    c.line(x, y - s, x, y + s, 1.6, col)


def g_dots(c, x, y, s, col):
    for dx in (-s * .8, 0, s * .8):
        c.circle(x + dx, y, s * .22, col)


def g_folder(c, x, y, s, col):
    c.rrect(x - s, y - s * .6, s * 2, s * 1.5, 2, col)
    c.rrect(x - s, y - s * .9, s * .9, s * .5, 1.5, col)


def g_list(c, x, y, s, col):
    for dy in (-s * .7, 0, s * .7):
        c.line(x - s, y + dy, x + s, y + dy, 2, col)


def g_eject(c, x, y, s, col):
    c.poly([(x - s, y + s * .1), (x, y - s), (x + s, y + s * .1)], col)
    c.rect(int(x - s), int(y + s * .45), int(2 * s), 3, col)


def g_close_tray(c, x, y, s, col):
    c.poly([(x - s, y - s * .1), (x, y + s), (x + s, y - s * .1)], col)
    c.rect(int(x - s), int(y - s * .75), int(2 * s), 3, col)


def write_skin(key, t):
    out = os.path.join(HERE, key)
    os.makedirs(out, exist_ok=True)
    bg = hexc(t['bg'])
    P = lambda n: os.path.join(out, n)

    # Caption bar: a vertical gradient; the middle column stretches.
    cap = Canvas(80, CAPTION_H)
    cap.rect(0, 0, 80, CAPTION_H, vgrad(hexc(t['cap_top']), hexc(t['cap_bottom']), 0, CAPTION_H))
    write_bmp(P('TitleBar.bmp'), cap)

    # System buttons: columns minimise, maximise, close; rows normal, hover, pressed.
    cw, ch = 40, CAPTION_H
    sysm = Canvas(cw * 3, ch * 3)
    sysm.rect(0, 0, cw * 3, ch * 3, vgrad(hexc(t['cap_top']), hexc(t['cap_bottom']), 0, ch))
    for row in range(3):
        sysm.rect(0, row * ch, cw * 3, ch, vgrad(hexc(t['cap_top']), hexc(t['cap_bottom']), 0, ch))
        for col in range(3):
            x0, y0 = col * cw, row * ch
            if row > 0:
                fill = hexc('#E0443E') if col == 2 else hexc(t['cap_hover'])
                if row == 2:
                    fill = hexc('#B8322D') if col == 2 else hexc(t['border'] if key == 'Midnight' else '#4A5668')
                sysm.rect(x0, y0, cw, ch, fill)
            ink = hexc(t['cap_text'])
            if row > 0 and col == 2:
                ink = (255, 255, 255, 255)
            cx, cy = x0 + cw / 2, y0 + ch / 2
            if col == 0:
                sysm.line(cx - 5, cy + 4, cx + 5, cy + 4, 1.6, ink)
            elif col == 1:
                sysm.shape(lambda px, py, cx=cx, cy=cy: (abs(px - cx) <= 5.5 and abs(py - cy) <= 5.5)
                           and not (abs(px - cx) < 4 and abs(py - cy) < 4), ink,
                           (cx - 7, cy - 7, cx + 7, cy + 7))
            else:
                sysm.line(cx - 5, cy - 5, cx + 5, cy + 5, 1.6, ink)
                sysm.line(cx - 5, cy + 5, cx + 5, cy - 5, 1.6, ink)
    write_bmp(P('SysMenu.bmp'), sysm)

    # Rounded corners: white pixels are cut out of the window, black stay.
    r = t['radius']
    corner = Canvas(r, r, (255, 255, 255, 255))
    for y in range(r):
        for x in range(r):
            dx, dy = r - (x + 0.5), r - (y + 0.5)
            if dx * dx + dy * dy <= r * r:
                corner.px[y * r + x] = [0, 0, 0, 255]
    def mirrored(fx, fy):
        m = Canvas(r, r)
        for y in range(r):
            for x in range(r):
                sx = r - 1 - x if fx else x
                sy = r - 1 - y if fy else y
                m.px[y * r + x] = list(corner.px[sy * r + sx])
        return m
    write_bmp(P('RegionLT.bmp'), mirrored(False, False))
    write_bmp(P('RegionRT.bmp'), mirrored(True, False))
    write_bmp(P('RegionLB.bmp'), mirrored(False, True))
    write_bmp(P('RegionRB.bmp'), mirrored(True, True))

    # Window body: a one-pixel frame round the page colour.
    body = Canvas(32, 32, hexc(t['border']))
    body.rect(1, 0, 30, 31, bg)
    write_bmp(P('MainBg.bmp'), body)

    # Menu bar: flat, a hairline at the bottom.
    bar = Canvas(40, MENU_H, hexc(t['menu_bg']))
    bar.rect(0, MENU_H - 1, 40, 1, hexc(t['line']))
    write_bmp(P('menubar.bmp'), bar)

    # Status strip of the frame.
    strip = Canvas(16, 22, hexc(t['status']))
    strip.rect(0, 0, 16, 1, hexc(t['border']))
    write_bmp(P('StatusBar.bmp'), strip)

    # Panels: cards on the page colour.
    write_png(P('Card.png'), card_picture(t))
    side = Canvas(24, 24, bg)
    side.rrect(0, 0, 24, 24, t['card_radius'], hexc(t['border']))
    side.rrect(1, 1, 22, 22, t['card_radius'] - 1, hexc(t['card']))
    side.rect(1, 1, 22, 3, hexc(t['accent']))
    side.rrect(0, 0, 24, 24, t['card_radius'], hexc(t['border'], 0))
    write_png(P('SideCard.png'), side)

    # Tab strip: page colour with the baseline the tabs stand on.
    strip = Canvas(8, GAP_H, bg)
    strip.rect(0, GAP_H - 1, 8, 1, hexc(t['border']))
    write_bmp(P('TabStrip.bmp'), strip)
    for name, glyph in (('TabConvert.png', g_play), ('TabRip.png', g_disc), ('TabBurn.png', g_flame)):
        tab = Canvas(TAB_W, TAB_H * 4)
        for i in range(4):
            cell = Canvas(TAB_W, TAB_H)
            if i == 0:
                cell.rrect(0, 2, TAB_W, TAB_H + 6, 6, hexc(t['tab_hover']))
            elif i == 3:  # the current tab: a card that opens into the list below
                cell.rrect(0, 1, TAB_W, TAB_H + 8, 7, hexc(t['border']))
                cell.rrect(1, 2, TAB_W - 2, TAB_H + 8, 6, hexc(t['card']))
                cell.rect(8, 2, TAB_W - 16, 2, hexc(t['accent']))
            elif i == 2:
                cell.rrect(0, 2, TAB_W, TAB_H + 6, 6, hexc(t['select']))
            ink = hexc(t['accent']) if i == 3 else hexc(t['muted'])
            glyph(cell, 18, TAB_H / 2 + 1, 5, ink)
            tab.paste_raw(cell, 0, i * TAB_H)
        write_png(P(name), tab)

    # Pictures with fixed names for the list, player, side bar and status panels.
    buttons = {
        'add.png': g_plus, 'remove.png': g_minus, 'clear.png': g_cross, 'encode.png': g_play,
        'pause.png': g_pause, 'stop.png': g_stop, 'CD.png': g_disc, 'freedb.png': g_globe,
        'Rip.png': g_play, 'Pause.png': g_pause, 'Stop.png': g_stop, 'Add.png': g_plus,
        'Remove.png': g_minus, 'Clear.png': g_cross, 'Burn.png': g_flame, 'Moveup.png': g_up,
        'Movedown.png': g_down, 'Play.png': g_play, 'PausePlay.png': g_pause,
        'StopPlay.png': g_stop, 'PlayNext.png': g_next, 'PlayPrevious.png': g_prev,
    }
    primary = {'encode.png', 'Rip.png', 'Burn.png'}
    for name, glyph in buttons.items():
        size = 28 if name.startswith(('Play', 'Pause', 'Stop')) and 'Play' in name else 36
        write_png(P(name), button_cells(t, size, size, glyph, name in primary))
    bmp_buttons = {'OutputBtn.bmp': g_folder, 'ProfileMenu.bmp': g_dots, 'ShowLog.bmp': g_list,
                   'CDOpen.bmp': g_eject, 'CDClose.bmp': g_close_tray,
                   'mode_adv.bmp': g_plus, 'mode_nor.bmp': g_minus}
    for name, glyph in bmp_buttons.items():
        write_bmp(P(name), button_cells(t, 28, 24, glyph), hexc(t['card']))
    for name, flip in (('RipLeft.bmp', False), ('PreviewLeft.bmp', False),
                       ('PreviewRight.bmp', True), ('fileinfoLT.bmp', False),
                       ('fileinfoRT.bmp', True)):
        piece = Canvas(12, 28, bg)
        piece.rrect(-12 if flip else 0, 0, 24, 28, t['card_radius'], hexc(t['card']))
        write_bmp(P(name), piece)
    right = Canvas(12, 28)
    right.rrect(-12, 0, 24, 28, t['card_radius'], hexc(t['card']))
    write_png(P('RipRight.png'), right)
    # The file information window's frame: a caption band over the card, a hairline border.
    # Its corner cells (150 by 200) are copied as they are, the middle row and column stretch.
    beer = Canvas(301, 401, hexc(t['card']))
    beer.rect(0, 0, 301, 25, vgrad(hexc(t['cap_top']), hexc(t['cap_bottom']), 0, 25))
    for x, y, w, h in ((0, 0, 301, 1), (0, 400, 301, 1), (0, 0, 1, 401), (300, 0, 1, 401)):
        beer.rect(x, y, w, h, hexc(t['border']))
    write_bmp(P('Beer1.bmp'), beer, hexc(t['card']))
    # Its close button stands on the caption band: a cross in the caption's colours.
    close = Canvas(18, 18 * 4)
    for i, (fill, ink) in enumerate(((t['cap_hover'], t['cap_text']), (None, t['cap_text']),
                                     (t['cap_hover'], t['cap_text']), (None, t['disabled']))):
        if fill:
            close.rrect(1, i * 18 + 1, 16, 16, 4, hexc(fill))
        g_cross(close, 9, i * 18 + 9, 5, hexc(ink))
    write_bmp(P('BmpBtn.bmp'), close, hexc(t['cap_bottom']))

    # Sliders, progress and check boxes.
    def bar_piece(h, fill, w=8):
        p = Canvas(w, h)
        p.rrect(0, 0, w, h, h / 2, hexc(fill))
        return p
    write_bmp(P('SliderBg.bmp'), Canvas(8, 8, hexc(t['card'])))
    write_bmp(P('SliderFore.bmp'), bar_piece(4, t['line']), hexc(t['card']))
    write_bmp(P('SliderGone.bmp'), bar_piece(4, t['accent']), hexc(t['card']))
    knob = Canvas(12, 12)
    knob.circle(6, 6, 5.5, hexc(t['accent']))
    knob.circle(6, 6, 2.5, (255, 255, 255, 255))
    write_bmp(P('SliderBlock.bmp'), knob, hexc(t['card']))
    knob_off = Canvas(12, 12)
    knob_off.circle(6, 6, 5.5, hexc(t['disabled']))
    write_bmp(P('SliderBlockDisable.bmp'), knob_off, hexc(t['card']))
    write_bmp(P('ProgressBg.bmp'), Canvas(8, 14, hexc(t['line'])))
    write_bmp(P('ProgressFore.bmp'), Canvas(8, 14, hexc(t['accent'])))
    write_bmp(P('NearOverflowFore.bmp'), Canvas(8, 14, hexc('#F59E0B')))
    write_bmp(P('OverflowFore.bmp'), Canvas(8, 14, hexc('#E0443E')))
    for name, checked in (('CheckBox_Checked.bmp', True), ('CheckBox_Unchecked.bmp', False)):
        box = Canvas(14, 14)
        box.rrect(0, 0, 14, 14, 3, hexc(t['accent'] if checked else t['border']))
        if not checked:
            box.rrect(1, 1, 12, 12, 2, hexc(t['card']))
        else:
            box.line(3.5, 7, 6, 9.8, 2, (255, 255, 255, 255))
            box.line(6, 9.8, 10.5, 4.2, 2, (255, 255, 255, 255))
        write_bmp(P(name), box, hexc(t['card']))
    head = Canvas(8, 24, hexc(t['card']))
    head.rect(0, 23, 8, 1, hexc(t['line']))
    write_bmp(P('HeaderBack.bmp'), head)
    gap = Canvas(8, 8, hexc(t['line']))
    write_bmp(P('GapBackground.bmp'), gap)

    # About picture and the preview of the skin dialog.
    about = Canvas(320, 120)
    about.rect(0, 0, 320, 120, vgrad(hexc(t['cap_top']), hexc(t['accent']), 0, 120))
    g_disc(about, 60, 60, 30, (255, 255, 255, 255))
    write_bmp(P('about_image.bmp'), about)
    prev = Canvas(160, 110, bg)
    prev.rect(0, 0, 160, 14, vgrad(hexc(t['cap_top']), hexc(t['cap_bottom']), 0, 14))
    prev.rect(0, 14, 160, 8, hexc(t['menu_bg']))
    prev.rrect(4, 26, 44, 80, 3, hexc(t['card']))
    prev.rrect(52, 26, 104, 56, 3, hexc(t['card']))
    prev.rrect(52, 86, 104, 20, 3, hexc(t['card']))
    prev.rect(56, 30, 30, 3, hexc(t['accent']))
    write_gif(P('preview.gif'), prev, bg)

    write_ini(P('skin.ini'), t)


def write_ini(path, t):
    N = lambda k: native_int(hexc(t[k]))
    R = lambda k: rgb_int(hexc(t[k]))
    font = t['font']
    def fontblock(size=90, weight=400, prefix=''):
        return [f'{prefix}FontName={font}', f'{prefix}FontSize={size}',
                f'{prefix}FontWeight={weight}', f'{prefix}FontItalic=0',
                f'{prefix}FontUnderline=0']
    def panel(extra=(), background='Card.png'):
        return ['LeftMargin=8', 'RightMargin=8', 'TopMargin=8', 'BottomMargin=8', 'VSpacing=6',
                'HSpacing=6', 'BorderWidth=0', f'Background={background}', 'BgMode=0',
                'BgHSplitter=12', 'BgVSplitter=12', f'FillBgColor={N("bg")}',
                f'BgColor={N("card")}', 'ButtonTextColor_Up=-1', 'ButtonTextColor_Down=-1',
                'ButtonTextColor_Active=-1', 'ButtonTextColor_Disabled=-1'] + list(extra)
    texts = [f'TextColor={R("text")}', f'TextColorUp={R("text")}',
             f'TextColorDown={R("accent_dark")}', f'TextColorActive={R("accent_dark")}',
             f'TextColorDisabled={R("disabled")}']
    list_keys = ['GridHeight=22', 'HeaderBgMode=0', 'HeadBgTopSplitter=2', 'HeadBgBtmSplitter=2',
                 'HeaderBack=HeaderBack.bmp', f'HeaderBgColor={N("card")}',
                 'EncodeButtonHSpacing=6'] + fontblock() + texts
    sections = {
        'Main': [f'Name={t["name"]}', 'LeftMargin=6', 'RightMargin=6', 'TopMargin=6',
                 'BottomMargin=6', 'VSpacing=6', 'HSpacing=6', 'BorderWidth=1',
                 'Background=MainBg.bmp', 'BgMode=0', 'BgHSplitter=16', 'BgVSplitter=16',
                 f'FillBgColor={N("bg")}', f'BgColor={N("bg")}',
                 f'FillChildBgColor={N("bg")}', f'ChildBgColor={N("bg")}',
                 f'ButtonTextColor_Up={N("text")}', f'ButtonTextColor_Down={N("accent_dark")}',
                 f'ButtonTextColor_Active={N("accent_dark")}',
                 f'ButtonTextColor_Disabled={N("disabled")}',
                 'MenuBarTopSpacing=0', 'TitleBarBorder=0', 'MenuBarBorder=1',
                 'MenuBarAlignment=2', 'StatusBarBg=StatusBar.bmp', 'StatusBarHeight=22',
                 'RegionLT=RegionLT.bmp', 'RegionRT=RegionRT.bmp', 'RegionLB=RegionLB.bmp',
                 'RegionRB=RegionRB.bmp'],
        'Caption': ['BgHSplitter=16', 'BgVSplitter=40', 'TextOffset=36', 'TextVOffset=0',
                    'IconOffset=12', 'IconVOffset=0', 'NoText=0', 'SysMenuIndent=0',
                    'SysMenuTopIndent=0'] + fontblock(95, 600) + [f'TextColor={R("cap_text")}'],
        'Menu': ['ItemLeft=6', 'ItemWidth=80', 'ItemHeight=22', 'ItemCount=5', 'ItemSpacing=2',
                 'MarginTop=2'] + fontblock() + [
                 'BgVSplitter=20', f'TextColor={R("menu_text")}', 'IsUseDefindColor=0',
                 f'MainMenuBorderColor={R("border")}', f'ItemBgColor={R("hover")}',
                 f'MenuBorderColor={R("popup_border")}', f'ItemGroupLine={R("line")}',
                 f'SelectBgColor={R("select")}', f'SubMenuBgColor={R("popup")}',
                 f'MenuNormalTextColor={R("menu_text")}',
                 f'MenuDisableTextColor={R("disabled")}',
                 f'MenuSelectedTextColor={R("select_text")}'],
        'PopupMenu': fontblock(),
        'Check': ['LeftMargin=0', 'RightMargin=5', 'TopMargin=0', 'BottomMargin=0',
                  'VSpacing=0', 'HSpacing=4', 'BorderWidth=0', 'Background=TabStrip.bmp',
                  'BgMode=0', 'BgHSplitter=1', 'BgVSplitter=1', f'FillBgColor={N("bg")}',
                  f'BgColor={N("bg")}', 'TabConverterBg=TabConvert.png',
                  'TabRipperBg=TabRip.png', 'TabCreatorBg=TabBurn.png', 'BtnTextPosX=30',
                  'BtnTextPosY=0', f'GapHeight={GAP_H}'] + fontblock(90, 600) + [
                  f'TextColorUp={R("muted")}', f'TextColorDown={R("accent_dark")}',
                  f'TextColorActive={R("text")}', f'TextColorDisabled={R("text")}'],
        'MediaList': panel(list_keys),
        'CDRip': panel(list_keys + ['ButtonHeight=69', 'BtnTextPosX=0', 'BtnTextPosY=0']),
        'CDCreatorPanel': panel(list_keys + ['ButtonHeight=69']),
        'OutputPanel': panel(fontblock() + texts),
        'PlayerPanel': panel(['PreviewButtonHSpacing=4', 'SliderHeight=28', 'TopText=1',
                              'TopSlider=18', 'TopThumb=17', 'TopTick=17'] + fontblock() + [
                             f'TextColor={R("muted")}', 'ProviewBmp=']),
        'SliderBar': ['SliderFore=SliderFore.bmp', 'SliderGone=SliderGone.bmp',
                      'SliderBlock=SliderBlock.bmp', 'SliderBg=SliderBg.bmp'],
        'SideBar': panel(['Width=212', 'PropertyRightMargin=8', f'PropertyBgColor={N("card")}',
                          f'GridLineColor={N("line")}', f'CommentBgColor={N("bg")}',
                          'GapBackground=GapBackground.bmp', 'SliderFore=SliderFore.bmp',
                          'SliderGone=SliderGone.bmp', 'SliderBlock=SliderBlock.bmp',
                          'SliderBlockDisable=SliderBlockDisable.bmp', 'SliderBg=SliderBg.bmp'] +
                         fontblock(100, 600, 'Title') + fontblock() + [
                         f'TitleTextColor={R("text")}', f'TextColor={R("text")}',
                         'CheckBox_Checked=CheckBox_Checked.bmp',
                         'CheckBox_Unchecked=CheckBox_Unchecked.bmp'], 'SideCard.png'),
        'StatusBar': panel(fontblock() + ['TextOffsetX=8', 'TextOffsetY=4',
                                          f'TextColor={R("text")}', f'TrickPenColor={R("border")}',
                                          f'TrickTextColor={R("muted")}',
                                          'ProgressFore=ProgressFore.bmp',
                                          'ProgressBg=ProgressBg.bmp',
                                          'OverflowFore=OverflowFore.bmp',
                                          'NearOverflowFore=NearOverflowFore.bmp']),
        # The page's texts are dark whatever the skin: a dark skin gives it light paper.
        'FileInfo': [f'BodyBgColor={t["paper"]}'],
    }
    lines = ['; Written by generate.py; edit the generator, not this file.']
    for name, keys in sections.items():
        lines.append(f'[{name}]')
        lines.extend(keys)
        lines.append('')
    open(path, 'w', newline='\r\n').write('\n'.join(lines))


if __name__ == '__main__':
    for key, theme in THEMES.items():
        write_skin(key, theme)
        print('wrote', key)
