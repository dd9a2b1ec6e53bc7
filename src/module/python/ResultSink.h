#pragma once
// The sinks that make the interpreter's result string out of the writer's
// pieces, with no full-size copy of the text on the way:
// - Python 2: the pieces go straight into the buffer of a growing unicode
//   object (UTF-16 into UCS4, surrogate pairs joined, or copied as they are
//   into a UCS2 build);
// - Python 3: a str must know its widest character before it exists, so the
//   pieces go into one compact UTF-8 staging buffer, with the count of code
//   points and the widest one; then the str is made at its final size and
//   filled from the staging buffer. Lone surrogates stay code points of their
//   own, as on Python 2 (what "surrogatepass" decoding would give).
// Like the "u" format of Py_BuildValue, both end the text at a zero unit.
// A sink owns what it has built until release(); if the conversion throws,
// the destructor frees it. A sink that can't grow throws std::bad_alloc.
#include <Python.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <new>

#include "xml/UnitConversion.h"
#include "xml/XmlSink.h"

namespace pyorvxml {

// The next size of a growing buffer of units of `unitSize` bytes that must
// hold `needed` units. It doubles while it is small enough for the allocator
// to serve it from memory it keeps (up to 126 KB), then grows by half: a
// large buffer is moved page by page rather than copied, and the untouched
// pages of its reserve cost no memory.
inline std::size_t nextCapacity(std::size_t capacity, std::size_t needed, std::size_t unitSize) {
    const std::size_t small = 126 * 1024 / unitSize;
    capacity = capacity < 8192 ? 8192
               : capacity < small ? std::min(2 * capacity, small)
                                  : capacity + capacity / 2;
    return capacity < needed ? needed : capacity;
}

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

    void reserve(std::size_t needed) {
        if (static_cast<Py_ssize_t>(needed) <= capacity_) return;
        const Py_ssize_t capacity = static_cast<Py_ssize_t>(
            nextCapacity(static_cast<std::size_t>(capacity_), needed, sizeof(Py_UNICODE)));
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
        if (data_ == NULL) return PyUnicode_New(0, 0);
        size_ += encoder_.finishUtf8(data_ + size_);  // reserve left room for it
        // The encoder counted the code points and knows the widest: the str
        // is made at its final size and kind and filled in one pass.
        PyObject* result = PyUnicode_New(static_cast<Py_ssize_t>(encoder_.codePoints()),
                                         static_cast<Py_UCS4>(encoder_.widest()));
        if (result != NULL) {
            void* out = PyUnicode_DATA(result);
            switch (PyUnicode_KIND(result)) {
                case PyUnicode_1BYTE_KIND:
                    if (encoder_.widest() < 0x80)
                        std::memcpy(out, data_, size_);
                    else
                        ResultEncoder::fromOwnUtf8(data_, size_, static_cast<Py_UCS1*>(out));
                    break;
                case PyUnicode_2BYTE_KIND:
                    ResultEncoder::fromOwnUtf8(data_, size_, static_cast<Py_UCS2*>(out));
                    break;
                default:
                    ResultEncoder::fromOwnUtf8(data_, size_, static_cast<Py_UCS4*>(out));
                    break;
            }
        }
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
        const std::size_t capacity = nextCapacity(capacity_, needed, 1);
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
