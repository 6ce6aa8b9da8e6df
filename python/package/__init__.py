"""Values, paths, curves, graphs and documents of a node-based animation tool.

The names are those of the C++ library in Python's manner: functions, methods and fields in
snake_case, enumerators in UPPER_CASE, classes as they are.
"""

from ._native import *
from ._native import __version__

__all__ = [name for name in dir() if not name.startswith("_")] + ["__version__"]

# Pickles and messages name the classes as programs do, whatever file they are compiled into.
for _name in __all__:
    if isinstance(globals()[_name], type):
        globals()[_name].__module__ = __name__
del _name
