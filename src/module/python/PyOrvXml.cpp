// The Python 2.7 face of the library: two functions and an error class.
// Everything else happens in the model library; this file only moves the path
// in and the result out.
#include <Python.h>

#include <string>

#include "module/Extension.h"
#include "module/python/ResultSink.h"

namespace {

PyObject* g_error = NULL;

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

typedef bool (*Conversion)(const std::u16string&, XmlSink&);

// Shared body of both functions. A refused extension returns NULL without an
// exception, which the interpreter reports as a SystemError of its own.
PyObject* convert(PyObject* args, Conversion conversion) {
    PyObject* result = NULL;
    Py_UNICODE* text = NULL;
    if (!PyArg_ParseTuple(args, "u", &text)) return NULL;
    const std::u16string path = fromPython(text);
    pyorvxml::ResultSink sink;
    if (!conversion(path, sink)) return NULL;
    result = sink.release();
    return result;
}

PyObject* getOrvmatXml(PyObject*, PyObject* args) {
    return convert(args, &OrvaneLumoCore::convertMaterialPath);
}

PyObject* getOrvoptXml(PyObject*, PyObject* args) {
    return convert(args, &OrvaneLumoCore::convertOptionsPath);
}

PyMethodDef kMethods[] = {
    {"getOrvmatXml", getOrvmatXml, METH_VARARGS, "Gets the xml from a orvmat file."},
    {"getOrvoptXml", getOrvoptXml, METH_VARARGS, "Gets the xml from a orvopt file."},
    {NULL, NULL, 0, NULL}};

}  // namespace

PyMODINIT_FUNC initPyOrvXml(void) {
    PyObject* module = Py_InitModule4("PyOrvXml", kMethods, NULL, NULL, PYTHON_API_VERSION);
    if (module == NULL) return;
    PyObject* error = PyErr_NewException(const_cast<char*>("PyOrvXml.error"), NULL, NULL);
    // The module variable keeps a reference of its own: PyModule_AddObject
    // takes over the one that PyErr_NewException gave.
    Py_XDECREF(g_error);
    g_error = error;
    Py_XINCREF(g_error);
    PyModule_AddObject(module, "error", error);
}
