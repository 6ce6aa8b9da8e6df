"""Attacks on the module: arguments that run code while they are converted, and invalid arguments.

Each program runs in an interpreter of its own and has to end by itself; what it prints is compared.
"""

import subprocess
import sys

import pytest

PREAMBLE = """
import copy, gc, pickle, sys
import numpy as np
from tarn_engine_base import *

def raised(work):
    try:
        work()
    except Exception as error:
        return type(error).__name__
    return "nothing"

class Number:
    def __init__(self, work): self.work = work
    def __float__(self): self.work(); return 1.0
    def __index__(self): self.work(); return 1
"""

PROGRAMS = [
    (
        "older pickle protocols",
        "for made in (Patch(1, name='a'), Unstructured({'a': [1]}), ModelLayer(1, [ModelLayer(2)]), Value((1, 2)),"
        " Value.image(3), Port(1), Connection(1, 2, 3, 4), TypeInfo(), Path()):\n"
        "    for protocol in range(6):\n"
        "        assert pickle.loads(pickle.dumps(made, protocol)) == made\n"
        "    assert copy.deepcopy(made) == made\n"
        "print(raised(lambda: pickle.dumps(PatchIndex(Patch(1)))), raised(PatchIndex(Patch(1)).__reduce__))",
        "TypeError TypeError",
    ),
    (
        "the base of all classes",
        "base = Path.__base__\n"
        "print(raised(base), raised(type('Derived', (base,), {})), raised(lambda: base.__new__(base)))",
        "TypeError TypeError TypeError",
    ),
    (
        "objects without __init__",
        "print(*(raised(cls.__new__(cls).__reduce__) for cls in (ModelLayer, Patch, PatchIndex, PatchEdit, DocumentInfo)),"
        " raised(lambda: Value(Path.__new__(Path))))",
        "TypeError TypeError TypeError TypeError TypeError TypeError",
    ),
    (
        "a matrix whose rows grow",
        "rows = [[1, 2, 3, 4] for _ in range(4)]\n"
        "rows[0][0] = Number(lambda: rows[0].extend([1.0] * 100000))\n"
        "print(Value(rows))",
        "1 2 3 4 \n1 2 3 4 \n1 2 3 4 \n1 2 3 4 \n",
    ),
    (
        "a vector that is emptied",
        "v = []\n"
        "v[:] = [Number(lambda: v.clear()), 2, 3, 4]\n"
        "print(Value(v))",
        "1, 2, 3, 4",
    ),
    (
        "a list with two minds",
        "class Odd(list):\n"
        "    def __iter__(self): return iter([1])\n"
        "print(raised(lambda: Value(Odd([1, 2, 3]))))",
        "TypeError",
    ),
    (
        "attributes that are cleared meanwhile",
        "attributes = {}\n"
        "def clear():\n"
        "    attributes.clear(); gc.collect(); return [str(i) * 40 for i in range(1000)]\n"
        "attributes['k' * 30 + str(len(sys.argv))] = [Number(clear)]\n"
        "attributes['z' * 30 + str(len(sys.argv))] = 3\n"
        "print(len(Port(attributes=attributes).attributes))",
        "2",
    ),
    (
        "__init__ inside of __init__",
        "for cls, argument in ((Unstructured, 'data'), (Patch, 'children')):\n"
        "    made = cls.__new__(cls)\n"
        "    def again():\n"
        "        print(raised(made.__init__))\n"
        "        yield from ()\n"
        "    if cls is Patch: made.__init__(children=again())\n"
        "    else: made.__init__([Number(lambda: print(raised(made.__init__)))])\n"
        "    made.__init__()\n"
        "    print(made)\n"
        "    del made, again; gc.collect()",
        "TypeError\nUnstructured([1])\nTypeError\n[patch:0 name:  builtin: 0]",
    ),
    (
        "enumerators out of range",
        "print(*(raised(work) for work in (lambda: TypeInfo(int.__new__(Type, 14)), lambda: type_to_string(int.__new__(Type, 77)),\n"
        "    lambda: Value().as_type(int.__new__(Type, 10**30)), lambda: ease(int.__new__(EasingFunction, 77), 0, 1, .5))))",
        "TypeError TypeError TypeError TypeError",
    ),
    (
        "another class than it says",
        "class Liar: __class__ = property(lambda self: Patch)\n"
        "class Liar2: __class__ = property(lambda self: Type)\n"
        "print(raised(lambda: Patch(children=[Liar()])), raised(lambda: Value().as_type(Liar2())))",
        "TypeError TypeError",
    ),
    (
        "repeated identifiers in an edit",
        "edit = PatchEdit(PatchIndex(Patch(9, children=[Patch(1), Patch(1, children=[Patch(4)])])))\n"
        "edit.move_patch(1, 4)\n"
        "print(raised(lambda: edit.add_patch(4, Patch(5))))",
        "ValueError",
    ),
    (
        "deep graphs by repeated identifiers",
        "def chain(first, count, last):\n"
        "    for i in reversed(range(count)): last = Patch(first + i, children=[last])\n"
        "    return last\n"
        "next_id, root = 10**6, Patch(9, children=[Patch(100 + i) for i in range(5)] + [Patch(99, children=[Patch(500)])])\n"
        "try:\n"
        "    for i in range(5):\n"
        "        edit = PatchEdit(PatchIndex(root))\n"
        "        edit.patch(500 + i).children = [chain(next_id, 4000, Patch(100 + i, children=[Patch(501 + i)]))]\n"
        "        next_id += 4000\n"
        "        root = edit.commit()\n"
        "except ValueError as error: print(i, error)",
        "2 patches and layers nest 10,000 levels at most",
    ),
    (
        "arrays that contain themselves",
        "a = np.empty(1, object); a[0] = a\n"
        "b = np.empty((), object); b[()] = b\n"
        "print(raised(lambda: Unstructured(a)), raised(lambda: Unstructured(b)), raised(lambda: Value(b)))",
        "ValueError ValueError TypeError",
    ),
    (
        "what numbers raise",
        "def stop(): raise KeyError('stop')\n"
        "print(raised(lambda: Patch(id=Number(stop))), raised(lambda: interpolate(Path(), Path(), Number(stop))),"
        " raised(lambda: ease(EasingFunction.LINEAR, 0, 1, Number(stop))))",
        "KeyError KeyError KeyError",
    ),
    (
        "numbers that are cut",
        "print(*(raised(lambda: Patch(id=n)) for n in (np.float32(1.7), 1.0, Value(2.9), 2**64, -1, '1')),"
        " *(raised(lambda: Value(n)) for n in (np.complex64(1j), (1j, 2), np.array([1j, 2]))))",
        "TypeError TypeError TypeError OverflowError OverflowError TypeError TypeError TypeError TypeError",
    ),
    (
        "progress that is no number",
        "print(*(raised(lambda: ease(EasingFunction.LINEAR, 0, 1, t)) for t in"
        " (['0.5'], [None], np.array(['2020'], 'M8'), np.array([1j]), 'a', {}, None, [[1], [1, 2]])))",
        "TypeError TypeError TypeError TypeError TypeError TypeError TypeError ValueError",
    ),
    (
        "names of files",
        "print(*(raised(lambda: save_document(name, Patch(1))) for name in ('a\\0b', b'/missing\\xff/x', 5)),"
        " *(raised(lambda: load_document(name)) for name in ('a\\0b', '/missing/a', '/')))",
        "ValueError OSError TypeError ValueError FileNotFoundError IsADirectoryError",
    ),
    (
        "data that is not finite",
        "data = Unstructured([float('inf'), {'a': [float('-inf')]}])\n"
        "print(eval(repr(data)) == data, repr(Unstructured(float('nan'))))\n"
        "point = PathElement(PathInstruction.LINE_TO, [(float('inf'), 1)])\n"
        "print(eval(repr(point)) == point, eval(repr(Port(attributes={'a': float('inf')}))) == Port(attributes={'a': float('inf')}))",
        "True Unstructured(float('nan'))\nTrue True",
    ),
    (
        "NumPy's booleans",
        "print(repr(Value(np.bool_(True))), repr(Value(np.array(False))), Unstructured(np.bool_(True)).data, repr(Value(np.array(1.5))))",
        "Value(True) Value(False) 1 Value(1.5)",
    ),
    (
        "what was read is assigned",
        "port = Port(1, attributes={'a': [1]})\n"
        "print(Port(1, attributes=port.attributes) == port, Unstructured(port.attributes).data)",
        "True {'a': [1]}",
    ),
    ("identifiers in texts", "print(f'{Unsigned(7)}.json', str(Unsigned(7)), repr(Unsigned(7)))", "7.json 7 Unsigned(7)"),
    (
        "threads that change what others read",
        "import threading, tempfile, os\n"
        "patch = Patch(1, children=[Patch(i) for i in range(2, 200)])\n"
        "def change():\n"
        "    for i in range(300): patch.children = [Patch(2)] * (i % 50); patch.name = 'n' * i\n"
        "def use():\n"
        "    file = os.path.join(tempfile.mkdtemp(), 'a')\n"
        "    for i in range(100): save_document(file, patch); PatchIndex(patch)\n"
        "threads = [threading.Thread(target=work) for work in (change, use, use, change)]\n"
        "for thread in threads: thread.start()\n"
        "for thread in threads: thread.join()\n"
        "print('done')",
        "done",
    ),
]


@pytest.mark.parametrize("program, printed", [row[1:] for row in PROGRAMS], ids=[row[0] for row in PROGRAMS])
def test_exits_normally(program: str, printed: str) -> None:
    done = subprocess.run(
        [sys.executable, "-W", "error", "-c", PREAMBLE + program], capture_output=True, text=True, timeout=120
    )
    assert (done.stdout.rstrip("\n"), done.stderr, done.returncode) == (printed.rstrip("\n"), "", 0)
