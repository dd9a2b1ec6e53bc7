// The Python 2.7 face of the library: two functions and an error class.
// Everything else happens in the model library; this file only moves the path
// in and the result out.
#include <Python.h>

#include <string>
#include <vector>

#include "module/Extension.h"

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

std::vector<Py_UNICODE> toPython(const std::u16string& text) {
    std::vector<Py_UNICODE> out;
    out.reserve(text.size() + 1);
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char16_t c = text[i];
        if (sizeof(Py_UNICODE) > 2 && c >= 0xD800 && c <= 0xDBFF && i + 1 < text.size() &&
            text[i + 1] >= 0xDC00 && text[i + 1] <= 0xDFFF) {
            out.push_back(static_cast<Py_UNICODE>(0x10000 + ((c - 0xD800) << 10) +
                                                  (text[i + 1] - 0xDC00)));
            ++i;
        } else {
            out.push_back(static_cast<Py_UNICODE>(c));
        }
    }
    out.push_back(0);
    return out;
}

typedef std::u16string (*Conversion)(const std::u16string&, bool&);

// Shared body of both functions. A refused extension returns NULL without an
// exception, which the interpreter reports as a SystemError of its own.
PyObject* convert(PyObject* args, Conversion conversion) {
    PyObject* result = NULL;
    Py_UNICODE* text = NULL;
    if (!PyArg_ParseTuple(args, "u", &text)) return NULL;
    const std::u16string path = fromPython(text);
    bool accepted = false;
    const std::u16string xml = conversion(path, accepted);
    if (!accepted) return NULL;
    std::vector<Py_UNICODE> unicode = toPython(xml);
    result = Py_BuildValue("u", &unicode[0]);
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
