// The Python face of the library: three functions, the type of the third's
// result and an error class, for CPython 2.7 and, from the same source, for
// each CPython from 3.8 on.
// Everything else happens in the model library; this file only moves the path
// in and the result out, and keeps C++ exceptions from reaching the
// interpreter.
#include <Python.h>
#if PY_MAJOR_VERSION < 3
#include <structseq.h>  // part of Python.h from 3 on
#endif

#include <cstring>
#include <new>
#include <stdexcept>
#include <string>

#include "module/Extension.h"
#include "module/Outcome.h"
#include "module/python/ResultSink.h"

namespace {

PyObject* g_error = NULL;

// Writes the file's text into the sink; false when the extension is refused.
typedef bool (*Conversion)(const std::u16string&, XmlSink&);

// What tells the two functions apart.
struct Function {
    const char* name;
    const char* format;  // of the argument parser on Python 3: one object, and the name
    Conversion conversion;
    const char* extensions;  // named in the message of a refused path (Python 3)
};

const Function kMaterials = {"getOrvmatXml", "O:getOrvmatXml",
                             &OrvaneLumoCore::convertMaterialPath, ".orvmat or .lumat"};
const Function kOptions = {"getOrvoptXml", "O:getOrvoptXml", &OrvaneLumoCore::convertOptionsPath,
                           ".orvopt or .luopt"};

#if PY_MAJOR_VERSION >= 3

// Owns one reference, so that no exit from a function leaks it.
struct Ref {
    explicit Ref(PyObject* o) : object(o) {}
    ~Ref() { Py_XDECREF(object); }
    Ref(const Ref&) = delete;
    Ref& operator=(const Ref&) = delete;
    PyObject* object;
};

// The path: a str, or an os.PathLike that gives a str. Its UTF-16 form keeps
// lone surrogates (such as those os.fsdecode makes of undecodable bytes) as
// they are, which is what 2.7 hands the library for the same text.
bool pathOf(PyObject* arg, const char* name, std::u16string& path) {
    Ref text(PyOS_FSPath(arg));
    if (text.object == NULL) return false;
    if (!PyUnicode_Check(text.object)) {
        // PyOS_FSPath gives str or bytes, or has raised TypeError itself.
        PyErr_Format(PyExc_TypeError, "%s() takes a str or an os.PathLike giving str, not bytes",
                     name);
        return false;
    }
    Ref utf16(PyUnicode_AsEncodedString(text.object, "utf-16-le", "surrogatepass"));
    char* data = NULL;
    Py_ssize_t size = 0;
    if (utf16.object == NULL || PyBytes_AsStringAndSize(utf16.object, &data, &size) < 0) {
        return false;
    }
    path.resize(static_cast<std::size_t>(size) / 2);
    if (!path.empty()) std::memcpy(&path[0], data, path.size() * 2);
    if (path.find(u'\0') != std::u16string::npos) {
        PyErr_Format(PyExc_ValueError, "%s(): embedded null character in path", name);
        return false;
    }
    return true;
}

bool pathArgument(PyObject* args, const Function& f, std::u16string& path) {
    PyObject* arg = NULL;
    return PyArg_ParseTuple(args, f.format, &arg) && pathOf(arg, f.name, path);
}

// The path and the options of getXmlWithOutcome.
bool outcomeArguments(PyObject* args, PyObject* keywords, std::u16string& path, PyObject*& freshSun,
                      PyObject*& wellFormed) {
    static char* names[] = {const_cast<char*>("path"), const_cast<char*>("freshSun"),
                            const_cast<char*>("wellFormed"), NULL};
    PyObject* arg = NULL;
    return PyArg_ParseTupleAndKeywords(args, keywords, "O|$OO:getXmlWithOutcome", names, &arg,
                                       &freshSun, &wellFormed) &&
           pathOf(arg, "getXmlWithOutcome", path);
}

PyObject* text(const std::string& s) {
    return PyUnicode_DecodeUTF8(s.data(), static_cast<Py_ssize_t>(s.size()), "replace");
}

PyObject* number(std::size_t n) { return PyLong_FromSize_t(n); }

PyObject* refusedExtension(const char* name, const char* extensions) {
    PyErr_Format(PyExc_SystemError, "%s() takes a path ending in %s (any case)", name, extensions);
    return NULL;
}

#else

// The interpreter's unicode unit may be 16 or 32 bits wide; the library's
// text is UTF-16. Wide units become surrogate pairs and back, so the text
// stays the same.
std::u16string fromPython(const Py_UNICODE* text) {
    std::u16string out;
    for (; *text; ++text) {
        const unsigned long c = static_cast<unsigned long>(*text);
        if (c >= 0x10000 && c <= 0x10FFFF) {
            const unsigned long v = c - 0x10000;
            out.push_back(static_cast<char16_t>(0xD800 + (v >> 10)));
            out.push_back(static_cast<char16_t>(0xDC00 + (v & 0x3FF)));
        } else {
            out.push_back(static_cast<char16_t>(c));
        }
    }
    return out;
}

// One unicode object; a byte string is refused by the parser.
bool pathArgument(PyObject* args, const Function&, std::u16string& path) {
    Py_UNICODE* text = NULL;
    if (!PyArg_ParseTuple(args, "u", &text)) return false;
    path = fromPython(text);
    return true;
}

// The path and the options of getXmlWithOutcome. Python 2 has no
// keyword-only format; the count of positional arguments is checked first.
bool outcomeArguments(PyObject* args, PyObject* keywords, std::u16string& path, PyObject*& freshSun,
                      PyObject*& wellFormed) {
    static char* names[] = {const_cast<char*>("path"), const_cast<char*>("freshSun"),
                            const_cast<char*>("wellFormed"), NULL};
    if (PyTuple_GET_SIZE(args) > 1) {
        PyErr_Format(PyExc_TypeError, "getXmlWithOutcome() takes 1 positional argument (%d given)",
                     static_cast<int>(PyTuple_GET_SIZE(args)));
        return false;
    }
    Py_UNICODE* text = NULL;
    if (!PyArg_ParseTupleAndKeywords(args, keywords, "u|OO:getXmlWithOutcome", names, &text, &freshSun,
                                     &wellFormed))
        return false;
    path = fromPython(text);
    return true;
}

PyObject* text(const std::string& s) {
    return PyString_FromStringAndSize(s.data(), static_cast<Py_ssize_t>(s.size()));
}

PyObject* number(std::size_t n) { return PyInt_FromSize_t(n); }

// A refused extension returns NULL without an exception, which the
// interpreter reports as a SystemError of its own.
PyObject* refusedExtension(const char*, const char*) { return NULL; }

#endif

// Called in a catch block: the exception being handled, as the interpreter's.
// Running out of memory (or a container asked to grow past its limit) is
// MemoryError, anything else PyOrvXml.error with its message. Always NULL.
PyObject* raiseCaught() {
    try {
        throw;
    } catch (const std::bad_alloc&) {
        return PyErr_NoMemory();
    } catch (const std::length_error&) {
        return PyErr_NoMemory();
    } catch (const std::exception& e) {
        PyErr_SetString(g_error ? g_error : PyExc_RuntimeError, e.what());
    } catch (...) {
        PyErr_SetString(g_error ? g_error : PyExc_RuntimeError, "unknown C++ exception");
    }
    return NULL;
}

// Shared body of the first two functions. No C++ exception passes this point.
PyObject* convert(PyObject* args, const Function& f) {
    try {
        std::u16string path;
        if (!pathArgument(args, f, path)) return NULL;
        // The text goes straight into the result string as it is written.
        pyorvxml::ResultSink sink;
        if (!f.conversion(path, sink)) return refusedExtension(f.name, f.extensions);
        return sink.release();
    } catch (...) {
        return raiseCaught();
    }
}

PyObject* getOrvmatXml(PyObject*, PyObject* args) { return convert(args, kMaterials); }

PyObject* getOrvoptXml(PyObject*, PyObject* args) { return convert(args, kOptions); }

// The result of getXmlWithOutcome: a tuple whose items have names (on 2.7 a
// struct sequence is tuple-like without being a tuple subclass).
PyStructSequence_Field kOutcomeFields[] = {
    {const_cast<char*>("text"),
     const_cast<char*>("what getOrvmatXml or getOrvoptXml returns; well-formed with wellFormed=True")},
    {const_cast<char*>("status"), const_cast<char*>("'document', 'text' or 'unreadable'")},
    {const_cast<char*>("reason"),
     const_cast<char*>("why the file isn't a document, as orvxml --explain says; None for a document")},
    {const_cast<char*>("kind"), const_cast<char*>("'materials' or 'options', as the extension says")},
    {const_cast<char*>("count"),
     const_cast<char*>("materials or settings blocks of a document; 0 otherwise")},
    {NULL, NULL}};

PyStructSequence_Desc kOutcomeDesc = {
    const_cast<char*>("PyOrvXml.Outcome"),
    const_cast<char*>("What getXmlWithOutcome returns: (text, status, reason, kind, count)."),
    kOutcomeFields, 5};

PyTypeObject g_outcomeType;

PyObject* none() {
    Py_INCREF(Py_None);
    return Py_None;
}

// Sets item `i` of the result; false (with the exception set) if the item is NULL.
bool setItem(PyObject* result, Py_ssize_t i, PyObject* item) {
    if (item == NULL) return false;
    PyStructSequence_SET_ITEM(result, i, item);
    return true;
}

// The conversion and its outcome in one call. The library reports running out
// of memory as an outcome; here it is MemoryError, as in the other two.
PyObject* getXmlWithOutcome(PyObject*, PyObject* args, PyObject* keywords) {
    using namespace OrvaneLumoCore;
    try {
        std::u16string path;
        PyObject* freshSun = NULL;
        PyObject* wellFormed = NULL;
        if (!outcomeArguments(args, keywords, path, freshSun, wellFormed)) return NULL;
        const int fresh = freshSun == NULL ? 0 : PyObject_IsTrue(freshSun);
        if (fresh < 0) return NULL;
        const int strict = wellFormed == NULL ? 0 : PyObject_IsTrue(wellFormed);
        if (strict < 0) return NULL;
        FileKind kind;
        if (!kindOfPath(path, kind))
            return refusedExtension("getXmlWithOutcome", ".orvmat, .lumat, .orvopt or .luopt");
        ConversionOptions options;
        options.sun = fresh ? SunStart::Fresh : SunStart::Carried;
        options.wellFormed = strict != 0;
        ConversionOutcome outcome = convertFile(path, kind, options);
        if (outcome.note.rule == LoadRule::OutOfMemory) return PyErr_NoMemory();
        // The text goes through the sink that the other two use, so that it is
        // the same string.
        pyorvxml::ResultSink sink;
        if (!outcome.text.empty()) sink.flush(outcome.text.data(), outcome.text.size());
        std::u16string().swap(outcome.text);
        const bool document = outcome.status == FileStatus::Document;
        const std::string reason = document ? std::string() : describe(outcome.note);
        // Nothing below throws: the result can't leak.
        PyObject* result = PyStructSequence_New(&g_outcomeType);
        if (result == NULL) return NULL;
        if (!setItem(result, 0, sink.release()) ||
            !setItem(result, 1, text(OrvaneLumoCore::statusWord(outcome.status))) ||
            !setItem(result, 2, document ? none() : text(reason)) ||
            !setItem(result, 3, text(kind == FileKind::Materials ? "materials" : "options")) ||
            !setItem(result, 4, number(outcome.items))) {
            Py_DECREF(result);
            return NULL;
        }
        return result;
    } catch (...) {
        return raiseCaught();
    }
}

#if PY_MAJOR_VERSION >= 3
#define ORVXML_PATH_TYPE "str or os.PathLike giving str"
#define ORVXML_TEXT_TYPE "str"
#define ORVXML_REFUSED "raises SystemError naming the accepted extensions"
#else
#define ORVXML_PATH_TYPE "unicode"
#define ORVXML_TEXT_TYPE "unicode"
#define ORVXML_REFUSED "fails with the interpreter's SystemError"
#endif

// The document sun, as the functions' documents tell it.
#define ORVXML_SUN_DOC                                                                          \
    "The document sun carries from one call to the next: a version 3 sky record\n"             \
    "replaces it in place, so the same file can give different XML depending on\n"            \
    "what was converted before in the same process."

#define ORVXML_FUNCTION_DOC(kind, ext1, ext2, root)                                            \
    "Gets the xml from a " kind " file.\n\n"                                                   \
    "path (" ORVXML_PATH_TYPE ") names a file ending in ." ext1 " or ." ext2 " (any case).\n"  \
    "Returns " ORVXML_TEXT_TYPE ": the <" root "> document of a file that loads; the text of\n" \
    "a file that doesn't (up to its first zero byte, UTF-8 or else Windows-1252);\n"           \
    "'' for a file that can't be opened.\n"                                                    \
    "A path of another extension " ORVXML_REFUSED "; bytes raise TypeError;\n"                 \
    "MemoryError when memory runs out, PyOrvXml.error for any other failure inside\n"          \
    "the library.\n" ORVXML_SUN_DOC


const char kOutcomeDoc[] =
    "Gets the xml from a material library or render options file, with what happened.\n\n"
    "path (" ORVXML_PATH_TYPE ") names a file ending in .orvmat or .lumat (materials)\n"
    "or .orvopt or .luopt (options), any case.\n"
    "Returns a PyOrvXml.Outcome, a tuple (on 2.7 tuple-like, as os.stat_result)\n"
    "(text, status, reason, kind, count):\n"
    "  text    " ORVXML_TEXT_TYPE ", what getOrvmatXml or getOrvoptXml returns for the path\n"
    "          (see wellFormed below);\n"
    "  status  'document' (the file loads), 'text' (it doesn't; text is its text)\n"
    "          or 'unreadable' (not a regular file, or it can't be opened; text is '');\n"
    "  reason  why the file isn't a document, the words of orvxml --explain\n"
    "          ('unknown type tag at byte 12, ...'); None for a document;\n"
    "  kind    'materials' or 'options';\n"
    "  count   the materials or settings blocks of a document, else 0.\n"
    "The items are also attributes of those names.\n"
    "freshSun=True puts the document sun back to its start state first, as orvxml\n"
    "does for every file, so the result doesn't depend on what was converted\n"
    "before (the file's own sky record still replaces it for later calls). Without\n"
    "it the sun carries over as in getOrvmatXml and getOrvoptXml.\n"
    "wellFormed=True (keyword only) writes a document as well-formed XML: every\n"
    "text escaped for its place (& always, < and >, and \" in attributes; a CR,\n"
    "and a tab or LF in attributes, as a character reference), characters that\n"
    "XML 1.0 does not allow as U+FFFD; a parser then gives back exactly the\n"
    "library's texts. A document without such characters is the same either\n"
    "way; the text of a file that doesn't load is never changed.\n"
    "A path of another extension " ORVXML_REFUSED ";\n"
    "bytes raise TypeError; MemoryError when memory runs out, PyOrvXml.error for any\n"
    "other failure inside the library.";

PyMethodDef kMethods[] = {
    {"getOrvmatXml", getOrvmatXml, METH_VARARGS,
     ORVXML_FUNCTION_DOC("orvmat", "orvmat", "lumat", "orvmat")},
    {"getOrvoptXml", getOrvoptXml, METH_VARARGS,
     ORVXML_FUNCTION_DOC("orvopt", "orvopt", "luopt", "orvopt")},
    {"getXmlWithOutcome",
     reinterpret_cast<PyCFunction>(reinterpret_cast<void (*)(void)>(getXmlWithOutcome)),
     METH_VARARGS | METH_KEYWORDS, kOutcomeDoc},
    {NULL, NULL, 0, NULL}};

const char kModuleDoc[] =
    "Converts the binary files of the renderer into XML.\n\n"
    "getOrvmatXml(path) reads a material library (.orvmat, .lumat);\n"
    "getOrvoptXml(path) reads a render options file (.orvopt, .luopt).\n"
    "Both return the document as " ORVXML_TEXT_TYPE ".\n"
    "getXmlWithOutcome(path, *, freshSun=False, wellFormed=False) reads either, by\n"
    "the extension, and returns the text with its outcome (a PyOrvXml.Outcome).\n"
    ORVXML_SUN_DOC;

const char kErrorDoc[] =
    "Raised when the conversion fails inside the library for a reason other than\n"
    "running out of memory (which raises MemoryError).";

// Creates the error class and adds it to the module. The module variable
// keeps a reference of its own: PyModule_AddObject takes over the one that
// PyErr_NewExceptionWithDoc gave.
bool addError(PyObject* module) {
    PyObject* error = PyErr_NewExceptionWithDoc(const_cast<char*>("PyOrvXml.error"),
                                                const_cast<char*>(kErrorDoc), NULL, NULL);
    if (error == NULL) return false;
    Py_XDECREF(g_error);
    g_error = error;
    Py_INCREF(g_error);
    if (PyModule_AddObject(module, "error", error) < 0) {
        Py_DECREF(error);
        return false;
    }
    return true;
}

// Makes the result type once per process (it is a static type) and adds it
// to the module.
bool addOutcomeType(PyObject* module) {
    static bool ready = false;
    if (!ready) {
#if PY_MAJOR_VERSION >= 3
        if (PyStructSequence_InitType2(&g_outcomeType, &kOutcomeDesc) < 0) return false;
#else
        PyStructSequence_InitType(&g_outcomeType, &kOutcomeDesc);
        if (PyErr_Occurred()) return false;
#endif
        ready = true;
    }
    Py_INCREF(&g_outcomeType);
    if (PyModule_AddObject(module, "Outcome", reinterpret_cast<PyObject*>(&g_outcomeType)) < 0) {
        Py_DECREF(&g_outcomeType);
        return false;
    }
    return true;
}

#if PY_MAJOR_VERSION >= 3
PyModuleDef kModule = {PyModuleDef_HEAD_INIT, "PyOrvXml", kModuleDoc, -1, kMethods,
                       NULL, NULL, NULL, NULL};
#endif

}  // namespace

#if PY_MAJOR_VERSION >= 3
PyMODINIT_FUNC PyInit_PyOrvXml(void) {
    PyObject* module = PyModule_Create(&kModule);
    if (module == NULL) return NULL;
    if (!addError(module) || !addOutcomeType(module)) {
        Py_DECREF(module);
        return NULL;
    }
    return module;
}
#else
PyMODINIT_FUNC initPyOrvXml(void) {
    PyObject* module = Py_InitModule4("PyOrvXml", kMethods, kModuleDoc, NULL,
                                      PYTHON_API_VERSION);
    if (module == NULL) return;
    if (addError(module)) addOutcomeType(module);
}
#endif
