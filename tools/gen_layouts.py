#!/usr/bin/env python3
"""Writes the grid style files res/styles/grid/styleimage2.json .. 6.json and
the design note docs/layouts.md from the arrangements below.

A layout is a list of cells (left, top, right, bottom as fractions) and, per
cell, its handlers in display order: an edge ("L", "R", "T", "B") or a corner
("TL", "TR", "BL", "BR", moving both dividers of that corner). A handler moves
the whole straight divider its edge lies on (every collinear edge connected to
it), so neighbours stay attached. In a row or column layout ("row") the
dragged divider instead spreads the change over all cells on the squeezed
side, as the row rule expects. The handler order is the one the size-modifier
dispatch relies on (tools/gen_size_modifiers.py). Run from the repository root.
"""
import json
from fractions import Fraction as F

H, T3, T23, Q = F(1, 2), F(1, 3), F(2, 3), F(1, 4)


def row_cells(n, axis):
    out = []
    for i in range(n):
        a, b = F(i, n), F(i + 1, n)
        out.append([a, 0, b, 1] if axis == 'X' else [0, a, 1, b])
    return out


def row_handlers(n, axis):
    lead, trail = ('L', 'R') if axis == 'X' else ('T', 'B')
    return [[trail]] + [[lead, trail] for _ in range(n - 2)] + [[lead]]


def row_layout(n, axis, rule):
    return dict(cells=row_cells(n, axis), handlers=row_handlers(n, axis), row=(axis, list(range(n))),
                rule=rule)


LAYOUTS = {
    2: [
        dict(cells=[[0, 0, H, 1], [H, 0, 1, 1]], handlers=[['R'], ['L']], rule='Grid2Style1'),
        dict(cells=[[0, 0, 1, H], [0, H, 1, 1]], handlers=[['B'], ['T']], rule='Grid2Style2'),
    ],
    3: [
        dict(cells=[[0, 0, H, 1], [H, 0, 1, H], [H, H, 1, 1]], handlers=[['R'], ['L', 'B'], ['L', 'T']],
             rule='Grid3Style1'),
        dict(cells=[[0, 0, 1, H], [0, H, H, 1], [H, H, 1, 1]], handlers=[['B'], ['R', 'T'], ['L', 'T']],
             rule='Grid3Style2'),
        row_layout(3, 'X', 'Grid5Style4'),
        dict(cells=[[0, 0, H, H], [0, H, H, 1], [H, 0, 1, 1]], handlers=[['R', 'B'], ['R', 'T'], ['L']],
             rule='Grid3Style4'),
        dict(cells=[[0, 0, H, H], [H, 0, 1, H], [0, H, 1, 1]], handlers=[['R', 'B'], ['L', 'B'], ['T']],
             rule='Grid3Style5'),
        row_layout(3, 'Y', 'Grid5Style8'),
    ],
    4: [
        dict(cells=[[0, 0, H, H], [H, 0, 1, H], [0, H, H, 1], [H, H, 1, 1]],
             handlers=[['R', 'B'], ['L', 'B'], ['R', 'T'], ['L', 'T']], rule='Grid4Style1'),
        dict(cells=[[0, 0, 1, H], [0, H, T3, 1], [T3, H, T23, 1], [T23, H, 1, 1]],
             handlers=[['B'], ['R', 'T'], ['L', 'R', 'T'], ['L', 'T']], rule='Grid4Style2'),
        row_layout(4, 'X', 'Grid5Style4'),
        dict(cells=[[0, 0, 1, T3], [0, T3, H, T23], [H, T3, 1, T23], [0, T23, 1, 1]],
             handlers=[['B'], ['T', 'B', 'R'], ['T', 'B', 'L'], ['T']], rule='Grid4Style4'),
        dict(cells=[[0, 0, T3, H], [T3, 0, T23, H], [T23, 0, 1, H], [0, H, 1, 1]],
             handlers=[['R', 'B'], ['L', 'R', 'B'], ['L', 'B'], ['T']], rule='Grid4Style5'),
        dict(cells=[[0, 0, H, 1], [H, 0, 1, T3], [H, T3, 1, T23], [H, T23, 1, 1]],
             handlers=[['R'], ['B', 'L'], ['T', 'B', 'L'], ['T', 'L']], rule='Grid4Style6'),
        dict(cells=[[0, 0, H, T3], [0, T3, H, T23], [0, T23, H, 1], [H, 0, 1, 1]],
             handlers=[['B', 'R'], ['T', 'B', 'R'], ['T', 'R'], ['L']], rule='Grid4Style7'),
        row_layout(4, 'Y', 'Grid5Style8'),
        dict(cells=[[0, 0, T3, 1], [T3, 0, T23, H], [T3, H, T23, 1], [T23, 0, 1, 1]],
             handlers=[['R'], ['L', 'R', 'B'], ['L', 'R', 'T'], ['L']], rule='Grid4Style9'),
    ],
    5: [
        dict(cells=[[0, 0, H, H], [H, 0, 1, H], [0, H, T3, 1], [T3, H, T23, 1], [T23, H, 1, 1]],
             handlers=[['R', 'B'], ['L', 'B'], ['R', 'T'], ['L', 'R', 'T'], ['L', 'T']], rule='Grid5Style1'),
        dict(cells=[[0, 0, T23, T3], [T23, 0, 1, T23], [0, T3, T3, 1], [T3, T23, 1, 1], [T3, T3, T23, T23]],
             handlers=[['R', 'B'], ['L', 'B'], ['R', 'T'], ['L', 'T'], ['BR', 'BL', 'TR', 'TL']],
             rule='Grid5Style2',
             note='A pinwheel around the centre cell 4. Its corner handlers pair the dividers as the rule dispatches them: h0 and h2 move the right divider (image 1), h1 and h3 the left one (image 3); h0 and h1 the lower divider (image 2), h2 and h3 the upper one (image 1).'),
        dict(cells=[[0, 0, 1, T3], [0, T3, T3, T23], [T3, T3, T23, T23], [T23, T3, 1, T23], [0, T23, 1, 1]],
             handlers=[['B'], ['T', 'B', 'R'], ['TL', 'TR', 'BL', 'BR'], ['T', 'B', 'L'], ['T']],
             rule='Grid5Style3',
             note='Cell 2 sits in the middle of the middle row; its corners h0 (TL) and h2 (BL) move the left divider, h1 and h3 the right one; h0 and h1 the upper line, h2 and h3 the lower one. Cells 1 and 3 list their top handler first (upper line for h0, lower line otherwise).'),
        row_layout(5, 'X', 'Grid5Style4'),
        dict(cells=[[0, 0, T3, H], [T3, 0, T23, H], [T23, 0, 1, H], [0, H, H, 1], [H, H, 1, 1]],
             handlers=[['R', 'B'], ['L', 'R', 'B'], ['L', 'B'], ['R', 'T'], ['L', 'T']], rule='Grid5Style5'),
        dict(cells=[[0, 0, H, H], [0, H, H, 1], [H, 0, 1, T3], [H, T3, 1, T23], [H, T23, 1, 1]],
             handlers=[['B', 'R'], ['T', 'R'], ['B', 'L'], ['T', 'B', 'L'], ['T', 'L']], rule='Grid5Style6'),
        dict(cells=[[0, 0, H, T3], [0, T3, H, T23], [0, T23, H, 1], [H, 0, 1, H], [H, H, 1, 1]],
             handlers=[['B', 'R'], ['T', 'B', 'R'], ['T', 'R'], ['B', 'L'], ['T', 'L']], rule='Grid5Style7'),
        row_layout(5, 'Y', 'Grid5Style8'),
    ],
    6: [
        dict(cells=[[0, 0, T3, H], [T3, 0, T23, H], [T23, 0, 1, H], [0, H, T3, 1], [T3, H, T23, 1],
                    [T23, H, 1, 1]],
             handlers=[['R', 'B'], ['L', 'R', 'B'], ['L', 'B'], ['R', 'T'], ['L', 'R', 'T'], ['L', 'T']],
             rule='Grid6Style1'),
        dict(cells=[[0, 0, T23, T23], [T23, 0, 1, T3], [T23, T3, 1, T23], [0, T23, T3, 1], [T3, T23, T23, 1],
                    [T23, T23, 1, 1]],
             handlers=[['R', 'B'], ['B', 'L'], ['T', 'B', 'L'], ['R', 'T'], ['L', 'R', 'T'], ['L', 'T']],
             rule='Grid6Style2'),
        dict(cells=[[0, 0, 1, T3], [0, T3, H, T23], [H, T3, 1, T23], [0, T23, T3, 1], [T3, T23, T23, 1],
                    [T23, T23, 1, 1]],
             handlers=[['B'], ['T', 'B', 'R'], ['T', 'B', 'L'], ['R', 'T'], ['L', 'R', 'T'], ['L', 'T']],
             rule='Grid6Style3'),
        dict(cells=[[0, 0, 1, T3], [0, T3, Q, T23], [Q, T3, H, T23], [H, T3, 3 * Q, T23], [3 * Q, T3, 1, T23],
                    [0, T23, 1, 1]],
             handlers=[['B'], ['T', 'R', 'B'], ['L', 'T', 'R', 'B'], ['L', 'T', 'R', 'B'], ['TL', 'B'], ['T']],
             row=('X', [1, 2, 3, 4]), rule='Grid6Style4',
             note='The middle row follows the row rule: for cells 2..4 h0 is the leading (left) divider, any other handler of cells 1..3 the trailing one. Cell 4 therefore carries its left divider and the upper line in one corner handler (h0, TL); the vertical dispatch sends h0 (and h1 of cells 2, 3) to the upper line and the rest to the lower one.'),
        dict(cells=[[0, 0, T3, T3], [0, T3, T3, T23], [0, T23, T3, 1], [T3, 0, 1, T23], [T3, T23, T23, 1],
                    [T23, T23, 1, 1]],
             handlers=[['R', 'B'], ['T', 'B', 'R'], ['R', 'T'], ['L', 'B'], ['L', 'R', 'T'], ['L', 'T']],
             rule='Grid6Style5'),
        dict(cells=[[0, 0, H, T3], [H, 0, 1, T3], [0, T3, H, T23], [H, T3, 1, T23], [0, T23, H, 1],
                    [H, T23, 1, 1]],
             handlers=[['B', 'R'], ['B', 'L'], ['T', 'B', 'R'], ['T', 'B', 'L'], ['T', 'R'], ['T', 'L']],
             rule='Grid6Style6'),
        dict(cells=[[0, 0, T3, 1], [T3, 0, T23, H], [T3, H, T23, 1], [T23, 0, 1, T3], [T23, T3, 1, T23],
                    [T23, T23, 1, 1]],
             handlers=[['R'], ['L', 'R', 'B'], ['L', 'R', 'T'], ['B', 'L'], ['T', 'B', 'L'], ['T', 'L']],
             rule='Grid6Style7'),
    ],
}

EDGE = {'L': ('X', 0), 'R': ('X', 2), 'T': ('Y', 1), 'B': ('Y', 3)}
KNOB = {'L': (0, H), 'R': (1, H), 'T': (H, 0), 'B': (H, 1), 'TL': (0, 0), 'TR': (1, 0), 'BL': (0, 1),
        'BR': (1, 1)}


def line_sides(cells, c, edge):
    """Cells on the low and high side of the straight divider through edge."""
    axis, k = EDGE[edge]
    lo_i, hi_i = (0, 2) if axis == 'X' else (1, 3)
    so_lo, so_hi = (1, 3) if axis == 'X' else (0, 2)
    pos = cells[c][k]
    span = [cells[c][so_lo], cells[c][so_hi]]
    low, high = set(), set()
    changed = True
    while changed:
        changed = False
        for i, r in enumerate(cells):
            if r[so_hi] < span[0] or r[so_lo] > span[1]:
                continue
            if r[hi_i] == pos and i not in low:
                low.add(i)
            elif r[lo_i] == pos and i not in high:
                high.add(i)
            else:
                continue
            span = [min(span[0], r[so_lo]), max(span[1], r[so_hi])]
            changed = True
    return sorted(low), sorted(high)


def edge_variation(layout, c, edge):
    """(axis, [(shift, size)] per cell) for dragging edge of cell c by +1."""
    cells = layout['cells']
    n = len(cells)
    axis, _ = EDGE[edge]
    var = [(F(0), F(0))] * n
    row = layout.get('row')
    if row and row[0] == axis and c in row[1]:
        order = row[1]
        f = order.index(c)
        if edge in 'LT':
            for i in range(f):
                var[order[i]] = (F(i, f), F(1, f))
            var[c] = (F(1), F(-1))
        else:
            m = len(order) - 1 - f
            var[c] = (F(0), F(1))
            for j in range(1, m + 1):
                var[order[f + j]] = (F(m - j + 1, m), F(-1, m))
        return axis, var
    low, high = line_sides(cells, c, edge)
    assert c in low or c in high
    for i in low:
        var[i] = (F(0), F(1))
    for i in high:
        var[i] = (F(1), F(-1))
    return axis, var


def num(x):
    x = F(x)
    return int(x) if x.denominator == 1 else float(x)


def handler_json(layout, c, kind):
    n = len(layout['cells'])
    hv = [[0, 0] for _ in range(n)]
    vv = [[0, 0] for _ in range(n)]
    edges = [kind] if kind in EDGE else [kind[0], kind[1]]
    dirs = ''
    for e in edges:
        axis, var = edge_variation(layout, c, e)
        target = hv if axis == 'X' else vv
        for i, (s, z) in enumerate(var):
            target[i] = [num(s), num(z)]
        dirs += 'R' if axis == 'X' else 'D'
    x, y = KNOB[kind]
    return {'x': num(x), 'y': num(y), 'base_image_id': c, 'direction': 'RD' if dirs == 'DR' else dirs,
            'h_variation': hv, 'v_variation': vv, 'image_count': n}


def check_tiling(count, idx, cells):
    area = sum((r[2] - r[0]) * (r[3] - r[1]) for r in cells)
    assert area == 1, (count, idx, area)
    for i, a in enumerate(cells):
        for b in cells[i + 1:]:
            ox = min(a[2], b[2]) - max(a[0], b[0])
            oy = min(a[3], b[3]) - max(a[1], b[1])
            assert ox <= 0 or oy <= 0, (count, idx, a, b)


def picture(layout, w=25, h=9):
    grid = [[' '] * w for _ in range(h)]
    for c, r in enumerate(layout['cells']):
        x1, y1 = round(r[0] * (w - 1)), round(r[1] * (h - 1))
        x2, y2 = round(r[2] * (w - 1)), round(r[3] * (h - 1))
        for x in range(x1, x2 + 1):
            for y in (y1, y2):
                grid[y][x] = '+' if grid[y][x] in '|+' or x in (x1, x2) else '-'
        for y in range(y1, y2 + 1):
            for x in (x1, x2):
                grid[y][x] = '+' if grid[y][x] in '-+' or y in (y1, y2) else '|'
        grid[(y1 + y2) // 2][(x1 + x2) // 2] = str(c)
    return '\n'.join(''.join(row) for row in grid)


def main():
    doc = ['# Collage grid layouts', '',
           'Generated by `tools/gen_layouts.py` together with `res/styles/grid/styleimage*.json`; edit',
           'the script, not the output. Cells are numbered from 0 (cell k shows photo k). Each cell lists',
           'its handlers in display order (h0, h1, ...): an edge handler (L, R, T, B) sits at the middle',
           'of that edge and moves the straight divider it lies on; a corner handler (TL, TR, BL, BR)',
           'moves both dividers of that corner. In the row and column layouts a handler spreads the',
           'change over every cell on the squeezed side. "Rule" names the size-modifier class that',
           'keeps cells at least 0.14 of the collage wide and high while a handler is dragged.', '']
    for count, layouts in LAYOUTS.items():
        out = {'layouts': []}
        doc += [f'## {count} photos', '']
        for idx, layout in enumerate(layouts):
            cells = [[F(v) for v in r] for r in layout['cells']]
            layout['cells'] = cells
            assert len(cells) == count
            check_tiling(count, idx, cells)
            images = []
            for c, r in enumerate(cells):
                images.append({'rect': [num(v) for v in r], 'min_width': 0.14, 'min_height': 0.14,
                               'handlers': [handler_json(layout, c, k) for k in layout['handlers'][c]]})
            out['layouts'].append({'images': images})
            doc += [f'### Layout {idx} (thumbnail {idx + 1}), rule `CLySizeModifier{layout["rule"]}`', '',
                    '```', picture(layout), '```', '']
            for c in range(count):
                hs = ', '.join(f'h{i} {k}' for i, k in enumerate(layout['handlers'][c])) or 'none'
                doc.append(f'- cell {c}: {hs}')
            if 'note' in layout:
                doc += ['', layout['note']]
            doc.append('')
        with open(f'res/styles/grid/styleimage{count}.json', 'w') as fp:
            json.dump(out, fp, indent=1)
            fp.write('\n')
    with open('docs/layouts.md', 'w') as fp:
        fp.write('\n'.join(doc))
    print('layouts:', sum(len(v) for v in LAYOUTS.values()))


main()
