"""Converts the binary files of the renderer into XML.

getOrvmatXml(path) reads a material library (.orvmat, .lumat);
getOrvoptXml(path) reads a render options file (.orvopt, .luopt).

Both take the path as str or an os.PathLike giving str (unicode on 2.7) and
return str (unicode on 2.7): the XML document of a file that loads; the text
of a file that doesn't (up to its first zero byte, UTF-8 or else
Windows-1252); '' for a file that can't be opened. They raise SystemError for
a path of another extension (on 2.7 the interpreter's own, without a
message), TypeError for bytes, MemoryError when memory runs out, and
PyOrvXml.error for any other failure inside the library.
"""
import os
from typing import Union

_Path = Union[str, "os.PathLike[str]"]

class error(Exception):
    """Raised when the conversion fails inside the library for a reason other
    than running out of memory (which raises MemoryError)."""

def getOrvmatXml(path: _Path, /) -> str:
    """Gets the xml from a orvmat file: the <orvmat> document of the material
    library at path (.orvmat or .lumat, any case), else its text or ''."""

def getOrvoptXml(path: _Path, /) -> str:
    """Gets the xml from a orvopt file: the <orvopt> document of the render
    options at path (.orvopt or .luopt, any case), else its text or ''."""
