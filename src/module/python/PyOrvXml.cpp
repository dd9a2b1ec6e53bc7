// The Python face of the library: two functions and an error class, for
// CPython 2.7 and, from the same source, for each CPython from 3.8 on.
// Everything else happens in the model library; this file only moves the path
// in and the result out, and keeps C++ exceptions from reaching the
// interpreter.
#include <Python.h>

#include <cstring>
#include <new>
#include <stdexcept>
#include <string>

#include "module/Extension.h"
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
bool pathArgument(PyObject* args, const Function& f, std::u16string& path) {
    PyObject* arg = NULL;
    if (!PyArg_ParseTuple(args, f.format, &arg)) return false;
    Ref text(PyOS_FSPath(arg));
    if (text.object == NULL) return false;
    if (!PyUnicode_Check(text.object)) {
        // PyOS_FSPath gives str or bytes, or has raised TypeError itself.
        PyErr_Format(PyExc_TypeError, "%s() takes a str or an os.PathLike giving str, not bytes",
                     f.name);
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
        PyErr_Format(PyExc_ValueError, "%s(): embedded null character in path", f.name);
        return false;
    }
    return true;
}

PyObject* refusedExtension(const Function& f) {
    PyErr_Format(PyExc_SystemError, "%s() takes a path ending in %s (any case)", f.name,
                 f.extensions);
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

// A refused extension returns NULL without an exception, which the
// interpreter reports as a SystemError of its own.
PyObject* refusedExtension(const Function&) { return NULL; }

#endif

// Shared body of both functions. No C++ exception passes this point: running
// out of memory (or a container asked to grow past its limit) is the
// interpreter's MemoryError, anything else PyOrvXml.error with its message.
PyObject* convert(PyObject* args, const Function& f) {
    try {
        std::u16string path;
        if (!pathArgument(args, f, path)) return NULL;
        // The text goes straight into the result string as it is written.
        pyorvxml::ResultSink sink;
        if (!f.conversion(path, sink)) return refusedExtension(f);
        return sink.release();
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

PyObject* getOrvmatXml(PyObject*, PyObject* args) { return convert(args, kMaterials); }

PyObject* getOrvoptXml(PyObject*, PyObject* args) { return convert(args, kOptions); }

#if PY_MAJOR_VERSION >= 3
#define ORVXML_PATH_TYPE "str or os.PathLike giving str"
#define ORVXML_TEXT_TYPE "str"
#define ORVXML_REFUSED "raises SystemError naming the accepted extensions"
#else
#define ORVXML_PATH_TYPE "unicode"
#define ORVXML_TEXT_TYPE "unicode"
#define ORVXML_REFUSED "fails with the interpreter's SystemError"
#endif

#define ORVXML_FUNCTION_DOC(kind, ext1, ext2, root)                                            \
    "Gets the xml from a " kind " file.\n\n"                                                   \
    "path (" ORVXML_PATH_TYPE ") names a file ending in ." ext1 " or ." ext2 " (any case).\n"  \
    "Returns " ORVXML_TEXT_TYPE ": the <" root "> document of a file that loads; the text of\n" \
    "a file that doesn't (up to its first zero byte, UTF-8 or else Windows-1252);\n"           \
    "'' for a file that can't be opened.\n"                                                    \
    "A path of another extension " ORVXML_REFUSED "; bytes raise TypeError;\n"                 \
    "MemoryError when memory runs out, PyOrvXml.error for any other failure inside\n"          \
    "the library."

PyMethodDef kMethods[] = {
    {"getOrvmatXml", getOrvmatXml, METH_VARARGS,
     ORVXML_FUNCTION_DOC("orvmat", "orvmat", "lumat", "orvmat")},
    {"getOrvoptXml", getOrvoptXml, METH_VARARGS,
     ORVXML_FUNCTION_DOC("orvopt", "orvopt", "luopt", "orvopt")},
    {NULL, NULL, 0, NULL}};

const char kModuleDoc[] =
    "Converts the binary files of the renderer into XML.\n\n"
    "getOrvmatXml(path) reads a material library (.orvmat, .lumat);\n"
    "getOrvoptXml(path) reads a render options file (.orvopt, .luopt).\n"
    "Both return the document as " ORVXML_TEXT_TYPE ".";

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

#if PY_MAJOR_VERSION >= 3
PyModuleDef kModule = {PyModuleDef_HEAD_INIT, "PyOrvXml", kModuleDoc, -1, kMethods,
                       NULL, NULL, NULL, NULL};
#endif

}  // namespace

#if PY_MAJOR_VERSION >= 3
PyMODINIT_FUNC PyInit_PyOrvXml(void) {
    PyObject* module = PyModule_Create(&kModule);
    if (module == NULL) return NULL;
    if (!addError(module)) {
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
    addError(module);
}
#endif
