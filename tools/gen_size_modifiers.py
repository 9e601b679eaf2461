#!/usr/bin/env python3
"""Writes the per-layout size-modifier classes under model/size-modifier/.

Each class knows its layout's dividers: a divider is the set of cells on its
low side (left of / above it) and on its high side. The dispatch chooses the
rule function from the focused cell and the dragged handler, as the focus box
shows the handlers in the style files (res/styles/grid/). Run from the
repository root after changing a table, then clang-format the output.
"""
import os

# Axis spec: None (no divider on that axis), ('single', low, high),
# ('row', first, last) or ('dispatch', {name: (low, high)}, [(focus list, expr)])
# where expr is a rule name or ('h0', a, b) / ('h02', a, b) / ('hle1', a, b).
S = 'single'
CLASSES = {
    'Grid2Style1': (('single', [0], [1]), None),
    'Grid2Style2': (None, ('single', [0], [1])),
    'Grid3Style1': (('single', [0], [1, 2]), ('single', [1], [2])),
    'Grid3Style2': (('single', [1], [2]), ('single', [0], [1, 2])),
    'Grid3Style4': (('single', [0, 1], [2]), ('single', [0], [1])),
    'Grid3Style5': (('single', [0], [1]), ('single', [0, 1], [2])),
    'Grid4Style1': (('single', [0, 2], [1, 3]), ('single', [0, 1], [2, 3])),
    'Grid4Style2': (('dispatch', {'1': ([1], [2]), '3': ([2], [3])},
                     [([0, 1], '1'), ([2], ('h0', '1', '3')), ([3], '3')]),
                    ('dispatch', {'1': ([0], [1, 2, 3])}, [([0, 1, 2, 3], '1')])),
    'Grid4Style4': (('single', [1], [2]),
                    ('dispatch', {'1': ([0], [1, 2]), '4': ([1, 2], [3])},
                     [([0], '1'), ([1, 2], ('h0', '1', '4')), ([3], '4')])),
    'Grid4Style5': (('dispatch', {'1': ([0], [1]), '2': ([1], [2])},
                     [([0, 3], '1'), ([1], ('h0', '1', '2')), ([2], '2')]),
                    ('single', [0, 1, 2], [3])),
    'Grid4Style6': (('single', [0], [1, 2, 3]),
                    ('dispatch', {'2': ([1], [2]), '4': ([2], [3])},
                     [([0, 1], '2'), ([2], ('h0', '2', '4')), ([3], '4')])),
    'Grid4Style7': (('single', [0, 1, 2], [3]),
                    ('dispatch', {'1': ([0], [1]), '3': ([1], [2])},
                     [([0, 3], '1'), ([1], ('h0', '1', '3')), ([2], '3')])),
    'Grid4Style9': (('dispatch', {'1': ([0], [1, 2]), '4': ([1, 2], [3])},
                     [([0], '1'), ([1, 2], ('h0', '1', '4')), ([3], '4')]),
                    ('single', [1], [2])),
    'Grid5Style1': (('dispatch', {'1': ([0], [1]), '3': ([2], [3]), '5': ([3], [4])},
                     [([0, 1], '1'), ([2], '3'), ([3], ('h0', '3', '5')), ([4], '5')]),
                    ('single', [0, 1], [2, 3, 4])),
    'Grid5Style2': (('dispatch', {'1': ([0, 4], [1]), '3': ([2], [4, 3])},
                     [([0, 1], '1'), ([2, 3], '3'), ([4], ('h02', '1', '3'))]),
                    ('dispatch', {'1': ([0], [2, 4]), '2': ([1, 4], [3])},
                     [([0, 2], '1'), ([1, 3], '2'), ([4], ('hle1', '2', '1'))])),
    'Grid5Style3': (('dispatch', {'1': ([1], [2]), '3': ([2], [3])},
                     [([0, 1, 4], '1'), ([2], ('h02', '1', '3')), ([3], '3')]),
                    ('dispatch', {'1': ([0], [1, 2, 3]), '5': ([1, 2, 3], [4])},
                     [([0], '1'), ([1, 3], ('h0', '1', '5')), ([2], ('hle1', '1', '5')), ([4], '5')])),
    'Grid5Style4': (('row',), None),
    'Grid5Style5': (('dispatch', {'1': ([0], [1]), '3': ([1], [2]), '4': ([3], [4])},
                     [([0], '1'), ([1], ('h0', '1', '3')), ([2], '3'), ([3, 4], '4')]),
                    ('single', [0, 1, 2], [3, 4])),
    'Grid5Style6': (('single', [0, 1], [2, 3, 4]),
                    ('dispatch', {'1': ([0], [1]), '3': ([2], [3]), '5': ([3], [4])},
                     [([0, 1], '1'), ([2], '3'), ([3], ('h0', '3', '5')), ([4], '5')])),
    'Grid5Style7': (('single', [0, 1, 2], [3, 4]),
                    ('dispatch', {'1': ([0], [1]), '3': ([1], [2]), '4': ([3], [4])},
                     [([0], '1'), ([1], ('h0', '1', '3')), ([2], '3'), ([3, 4], '4')])),
    'Grid5Style8': (None, ('row',)),
    'Grid6Style1': (('dispatch', {'1': ([0, 3], [1, 4]), '3': ([1, 4], [2, 5])},
                     [([0, 3], '1'), ([1, 4], ('h0', '1', '3')), ([2, 5], '3')]),
                    ('single', [0, 1, 2], [3, 4, 5])),
    'Grid6Style2': (('dispatch', {'1': ([0, 4], [1, 2, 5]), '4': ([3], [4])},
                     [([0, 1, 2, 5], '1'), ([3], '4'), ([4], ('h0', '4', '1'))]),
                    ('dispatch', {'1': ([0, 2], [3, 4, 5]), '2': ([1], [2])},
                     [([0, 3, 4, 5], '1'), ([1], '2'), ([2], ('h0', '2', '1'))])),
    'Grid6Style3': (('dispatch', {'1': ([1], [2]), '3': ([3], [4]), '4': ([4], [5])},
                     [([0, 1, 2], '1'), ([3], '3'), ([4], ('h0', '3', '4')), ([5], '4')]),
                    ('dispatch', {'1': ([0], [1, 2]), '2': ([1, 2], [3, 4, 5])},
                     [([0], '1'), ([1, 2], ('h0', '1', '2')), ([3, 4, 5], '2')])),
    'Grid6Style4': (('middle-row', 1, 4),
                    ('dispatch', {'1': ([0], [1, 2, 3, 4]), '6': ([1, 2, 3, 4], [5])},
                     [([0], '1'), ([1, 4], ('h0', '1', '6')), ([2, 3], ('hle1', '1', '6')), ([5], '6')])),
    'Grid6Style5': (('dispatch', {'1': ([0, 1, 2], [3, 4]), '5': ([4], [5])},
                     [([0, 1, 2, 3], '1'), ([4], ('h0', '1', '5')), ([5], '5')]),
                    ('dispatch', {'1': ([0], [1]), '2': ([1, 3], [2, 4, 5])},
                     [([0], '1'), ([1], ('h0', '1', '2')), ([2, 3, 4, 5], '2')])),
    'Grid6Style6': (('single', [0, 2, 4], [1, 3, 5]),
                    ('dispatch', {'1': ([0, 1], [2, 3]), '3': ([2, 3], [4, 5])},
                     [([0, 1], '1'), ([2, 3], ('h0', '1', '3')), ([4, 5], '3')])),
    'Grid6Style7': (('dispatch', {'1': ([0], [1, 2]), '2': ([1, 2], [3, 4, 5])},
                     [([0], '1'), ([1, 2], ('h0', '1', '2')), ([3, 4, 5], '2')]),
                    ('dispatch', {'1': ([1], [2]), '3': ([3], [4]), '5': ([4], [5])},
                     [([0, 1, 2], '1'), ([3], '3'), ([4], ('h0', '3', '5')), ([5], '5')])),
}

SERVES = {
    'Grid2Style1': '2: 0', 'Grid2Style2': '2: 1', 'Grid3Style1': '3: 0', 'Grid3Style2': '3: 1',
    'Grid3Style4': '3: 3', 'Grid3Style5': '3: 4', 'Grid4Style1': '4: 0', 'Grid4Style2': '4: 1',
    'Grid4Style4': '4: 3', 'Grid4Style5': '4: 4', 'Grid4Style6': '4: 5', 'Grid4Style7': '4: 6',
    'Grid4Style9': '4: 8', 'Grid5Style1': '5: 0', 'Grid5Style2': '5: 1', 'Grid5Style3': '5: 2',
    'Grid5Style4': '3: 2, 4: 2, 5: 3', 'Grid5Style5': '5: 4', 'Grid5Style6': '5: 5', 'Grid5Style7': '5: 6',
    'Grid5Style8': '3: 5, 4: 7, 5: 7', 'Grid6Style1': '6: 0', 'Grid6Style2': '6: 1', 'Grid6Style3': '6: 2',
    'Grid6Style4': '6: 3', 'Grid6Style5': '6: 4', 'Grid6Style6': '6: 5', 'Grid6Style7': '6: 6',
}


def cells(lst):
    return '{' + ', '.join(str(c) for c in lst) + '}'


def expr_code(e, ax):
    call = lambda n: f'_focusImage{n}{ax}(var, limit, marks)'
    if isinstance(e, str):
        return call(e)
    kind, a, b = e
    cond = {'h0': 'mHandlerIndex == 0', 'h02': 'mHandlerIndex == 0 || mHandlerIndex == 2',
            'hle1': 'mHandlerIndex <= 1'}[kind]
    return f'({cond}) ? {call(a)} : {call(b)}'


def axis_parts(name, spec, ax):
    """Returns (declarations, definitions, body of modify)."""
    axis = 'AXIS_X' if ax == 'X' else 'AXIS_Y'
    if spec is None:
        return [], [], f'  // No divider runs across this axis.\n  return false;\n'
    kind = spec[0]
    if kind == 'single':
        return [], [], (f'  // One divider: {cells(spec[1])} | {cells(spec[2])}.\n'
                        f'  return _snapDivider({axis}, var, limit, marks, {cells(spec[1])}, {cells(spec[2])});\n')
    if kind == 'row':
        return [], [], (f'  // Every cell side by side along the axis.\n'
                        f'  return _rowRule({axis}, 0, cellCount() - 1, var, limit, marks);\n')
    if kind == 'middle-row':
        first, last = spec[1], spec[2]
        return [], [], (f'  // The row of cells {first}..{last}; the full-width cells above and below have no\n'
                        f'  // divider on this axis, so their focus is treated as the row\'s first cell.\n'
                        f'  if (mFocusIndex < {first} || mFocusIndex > {last}) mFocusIndex = {first};\n'
                        f'  return _rowRule({axis}, {first}, {last}, var, limit, marks);\n')
    rules, table = spec[1], spec[2]
    decls, defs = [], []
    for rn, (low, high) in sorted(rules.items()):
        decls.append(f'  bool _focusImage{rn}{ax}(float var, float limit, const std::vector<int32_t>& marks);')
        defs.append(f'// Divider {cells(low)} | {cells(high)}.\n'
                    f'bool CLySizeModifier{name}::_focusImage{rn}{ax}(float var, float limit,\n'
                    f'    const std::vector<int32_t>& marks) {{\n'
                    f'  return _snapDivider({axis}, var, limit, marks, {cells(low)}, {cells(high)});\n}}\n')
    body = '  switch (mFocusIndex) {\n'
    for focuses, e in table:
        for fi in focuses:
            body += f'    case {fi}:\n'
        body += f'      return {expr_code(e, ax)};\n'
    body += '    default:\n      return false;\n  }\n'
    return decls, defs, body


def write(name, spec):
    xd, xdefs, xbody = axis_parts(name, spec[0], 'X')
    yd, ydefs, ybody = axis_parts(name, spec[1], 'Y')
    cls = f'CLySizeModifier{name}'
    h = f'''#pragma once
// Size-modifier rule of the grid layout(s) {SERVES[name]} (image count: layout index).

#include "model/size-modifier/CLySizeModifierInter.h"

class {cls} : public CLySizeModifierInter {{
 public:
  using CLySizeModifierInter::CLySizeModifierInter;
  bool modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
  bool modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) override;
'''
    if xd or yd:
        h += '\n private:\n' + '\n'.join(xd + yd) + '\n'
    h += '};\n'
    c = f'''#include "model/size-modifier/{cls}.h"

bool {cls}::modifyX(float var, float limit, int32_t /*count*/, const std::vector<int32_t>& marks) {{
{xbody}}}

bool {cls}::modifyY(float var, float limit, int32_t /*count*/, const std::vector<int32_t>& marks) {{
{ybody}}}
'''
    for d in xdefs + ydefs:
        c += '\n' + d
    if spec[0] is None:
        c = c.replace(f'bool {cls}::modifyX(float var, float limit, int32_t /*count*/, const std::vector<int32_t>& marks)',
                      f'bool {cls}::modifyX(float, float, int32_t, const std::vector<int32_t>&)')
    if spec[1] is None:
        c = c.replace(f'bool {cls}::modifyY(float var, float limit, int32_t /*count*/, const std::vector<int32_t>& marks)',
                      f'bool {cls}::modifyY(float, float, int32_t, const std::vector<int32_t>&)')
    out = 'model/size-modifier'
    open(os.path.join(out, cls + '.h'), 'w').write(h)
    open(os.path.join(out, cls + '.cpp'), 'w').write(c)


for n, s in CLASSES.items():
    write(n, s)
print(len(CLASSES), 'classes')
