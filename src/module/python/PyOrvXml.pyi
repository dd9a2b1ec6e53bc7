"""Converts the binary files of the renderer into XML.

getOrvmatXml(path) reads a material library (.orvmat, .lumat);
getOrvoptXml(path) reads a render options file (.orvopt, .luopt).
On Python 2.7 the path and the result are unicode.
"""
import os
from typing import Union

_Path = Union[str, "os.PathLike[str]"]

class error(Exception):
    """Raised when the conversion fails inside the library for a reason other
    than running out of memory (which raises MemoryError)."""

def getOrvmatXml(path: _Path, /) -> str:
    """Gets the xml from a orvmat file.

    path names a file ending in .orvmat or .lumat (any case). Returns the
    <orvmat> document of a file that loads; the text of a file that doesn't
    (up to its first zero byte, UTF-8 or else Windows-1252); '' for a file
    that can't be opened. Raises SystemError for a path of another extension
    (on 2.7 the interpreter's own, without a message), TypeError for bytes,
    MemoryError when memory runs out, PyOrvXml.error for any other failure
    inside the library.
    """

def getOrvoptXml(path: _Path, /) -> str:
    """Gets the xml from a orvopt file.

    path names a file ending in .orvopt or .luopt (any case). Returns the
    <orvopt> document of a file that loads; the text of a file that doesn't
    (up to its first zero byte, UTF-8 or else Windows-1252); '' for a file
    that can't be opened. Raises SystemError for a path of another extension
    (on 2.7 the interpreter's own, without a message), TypeError for bytes,
    MemoryError when memory runs out, PyOrvXml.error for any other failure
    inside the library.
    """
