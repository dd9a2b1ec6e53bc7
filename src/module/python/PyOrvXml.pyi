"""Converts the binary files of the renderer into XML.

getOrvmatXml(path) reads a material library (.orvmat, .lumat);
getOrvoptXml(path) reads a render options file (.orvopt, .luopt);
getXmlWithOutcome(path, *, freshSun=False, wellFormed=False) reads either, by
the extension, and returns the text together with what happened (an Outcome).

They take the path as str or an os.PathLike giving str (unicode on 2.7) and
give the text as str (unicode on 2.7): the XML document of a file that loads;
the text of a file that doesn't (up to its first zero byte, UTF-8 or else
Windows-1252); '' for a file that can't be opened. They raise SystemError for
a path of another extension (on 2.7 the interpreter's own, without a
message), TypeError for bytes, MemoryError when memory runs out, and
PyOrvXml.error for any other failure inside the library.

The document sun carries from one call to the next: a version 3 sky record
replaces it in place, so the same file can give different XML depending on
what was converted before in the same process. getXmlWithOutcome(path,
freshSun=True) puts it back to its start state first.
"""
import os
from typing import Optional, Tuple, Union

_Path = Union[str, "os.PathLike[str]"]

class error(Exception):
    """Raised when the conversion fails inside the library for a reason other
    than running out of memory (which raises MemoryError)."""

class Outcome(Tuple[str, str, Optional[str], str, int]):
    """What getXmlWithOutcome returns: the tuple (text, status, reason, kind,
    count), whose items are also attributes of those names (on 2.7 a
    tuple-like struct sequence, as os.stat_result)."""
    @property
    def text(self) -> str:
        """What getOrvmatXml or getOrvoptXml returns for the path; with
        wellFormed=True a document is written as well-formed XML."""
    @property
    def status(self) -> str:
        """'document', 'text' (the file didn't load) or 'unreadable' (not a
        regular file, or it can't be opened)."""
    @property
    def reason(self) -> Optional[str]:
        """Why the file isn't a document, in the words of orvxml --explain;
        None for a document."""
    @property
    def kind(self) -> str:
        """'materials' or 'options', as the extension says."""
    @property
    def count(self) -> int:
        """The materials or settings blocks of a document; 0 otherwise."""

def getOrvmatXml(path: _Path, /) -> str:
    """Gets the xml from a orvmat file: the <orvmat> document of the material
    library at path (.orvmat or .lumat, any case), else its text or ''. The
    document sun carries over from the calls before."""

def getOrvoptXml(path: _Path, /) -> str:
    """Gets the xml from a orvopt file: the <orvopt> document of the render
    options at path (.orvopt or .luopt, any case), else its text or ''. The
    document sun carries over from the calls before."""

def getXmlWithOutcome(path: _Path, *, freshSun: bool = False,
                      wellFormed: bool = False) -> Outcome:
    """Gets the xml from a material library (.orvmat, .lumat) or render
    options file (.orvopt, .luopt) with its outcome. freshSun=True puts the
    document sun back to its start state first, as orvxml does for every
    file; without it the sun carries over as in the other two.
    wellFormed=True writes a document as well-formed XML: every text escaped
    for its place ("&" always, "<" and ">", and '"' in attributes; a CR, and a
    tab or LF in attributes, as a character reference) and characters that
    XML 1.0 does not allow as U+FFFD, so that a parser gives back exactly the
    library's texts. A document without such characters is the same either
    way; the text of a file that doesn't load is never changed."""
