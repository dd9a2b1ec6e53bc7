#pragma once
// The sinks that make the interpreter's result string out of the writer's
// pieces, with no full-size copy of the text on the way:
// - Python 2: the pieces go straight into the buffer of a growing unicode
//   object (UTF-16 into UCS4, surrogate pairs joined, or copied as they are
//   into a UCS2 build);
// - Python 3: a str must know its widest character before it exists, so the
//   pieces go into one compact UTF-8 staging buffer that the interpreter
//   then decodes; lone surrogates pass as on Python 2 ("surrogatepass").
// Like the "u" format of Py_BuildValue, both end the text at a zero unit.
// A sink owns what it has built until release(); if the conversion throws,
// the destructor frees it. A sink that can't grow throws std::bad_alloc.
#include <Python.h>

#include <cstdlib>
#include <cstring>
#include <new>

#include "xml/UnitConversion.h"
#include "xml/XmlSink.h"

namespace pyorvxml {

#if PY_MAJOR_VERSION < 3

class ResultSink final : public XmlSink {
public:
    ResultSink() : object_(NULL), size_(0), capacity_(0), ended_(false) {}
    ~ResultSink() { Py_XDECREF(object_); }

    void flush(const char16_t* text, std::size_t size) override {
        reserve(size_ + ResultEncoder::maxUtf32(size));
        Py_UNICODE* out = PyUnicode_AS_UNICODE(object_) + size_;
        size_ += static_cast<Py_ssize_t>(convert(text, size, out));
    }

    // The finished string (a new reference), or NULL with MemoryError set.
    // The sink is empty afterwards.
    PyObject* release() {
        if (object_ == NULL) return PyUnicode_FromUnicode(NULL, 0);
        if (sizeof(Py_UNICODE) >= 4)
            size_ += static_cast<Py_ssize_t>(encoder_.finishUtf32(PyUnicode_AS_UNICODE(object_) + size_));
        if (size_ != capacity_ && PyUnicode_Resize(&object_, size_) < 0) return NULL;
        PyObject* result = object_;
        object_ = NULL;
        size_ = capacity_ = 0;
        return result;
    }

private:
    ResultSink(const ResultSink&);
    ResultSink& operator=(const ResultSink&);

    // A UCS2 build takes the units as they are, up to a zero unit.
    template <class Unit>
    std::size_t convert(const char16_t* text, std::size_t size, Unit* out) {
        if constexpr (sizeof(Unit) >= 4) {
            return encoder_.toUtf32(text, size, out);
        } else {
            if (ended_) return 0;
            std::size_t n = 0;
            for (; n < size && text[n] != 0; ++n) out[n] = static_cast<Unit>(text[n]);
            ended_ = n < size;
            return n;
        }
    }

    // Room for `needed` units. A large buffer grows by half its size; the
    // allocator moves its pages rather than copying them, and untouched
    // pages of the reserve cost no memory.
    void reserve(std::size_t needed) {
        if (static_cast<Py_ssize_t>(needed) <= capacity_) return;
        Py_ssize_t capacity = capacity_ + capacity_ / 2;
        if (capacity < static_cast<Py_ssize_t>(needed)) capacity = static_cast<Py_ssize_t>(needed);
        if (capacity < 8192) capacity = 8192;
        if (object_ == NULL) {
            object_ = PyUnicode_FromUnicode(NULL, capacity);
            if (object_ == NULL) throw std::bad_alloc();
        } else if (PyUnicode_Resize(&object_, capacity) < 0) {
            throw std::bad_alloc();  // object_ is unchanged and freed by the destructor
        }
        capacity_ = capacity;
    }

    PyObject* object_;
    Py_ssize_t size_;
    Py_ssize_t capacity_;
    bool ended_;
    ResultEncoder encoder_;
};

#else

class ResultSink final : public XmlSink {
public:
    ResultSink() : data_(NULL), size_(0), capacity_(0) {}
    ~ResultSink() { std::free(data_); }

    void flush(const char16_t* text, std::size_t size) override {
        reserve(size_ + ResultEncoder::maxUtf8(size));
        size_ += encoder_.toUtf8(text, size, data_ + size_);
    }

    // The finished string (a new reference), or NULL with an exception set.
    // The staging buffer is freed.
    PyObject* release() {
        if (data_ == NULL) return PyUnicode_FromStringAndSize(NULL, 0);
        size_ += encoder_.finishUtf8(data_ + size_);  // reserve left room for it
        PyObject* result = PyUnicode_DecodeUTF8(data_, static_cast<Py_ssize_t>(size_), "surrogatepass");
        std::free(data_);
        data_ = NULL;
        size_ = capacity_ = 0;
        return result;
    }

private:
    ResultSink(const ResultSink&) = delete;
    ResultSink& operator=(const ResultSink&) = delete;

    void reserve(std::size_t needed) {
        if (needed <= capacity_) return;
        std::size_t capacity = capacity_ + capacity_ / 2;
        if (capacity < needed) capacity = needed;
        if (capacity < 16384) capacity = 16384;
        char* data = static_cast<char*>(std::realloc(data_, capacity));
        if (data == NULL) throw std::bad_alloc();
        data_ = data;
        capacity_ = capacity;
    }

    char* data_;
    std::size_t size_;
    std::size_t capacity_;
    ResultEncoder encoder_;
};

#endif

}  // namespace pyorvxml
