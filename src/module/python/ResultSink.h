#pragma once
// The sinks that make the interpreter's result string out of the writer's
// pieces, with no full-size copy of the text on the way:
// - Python 2: the pieces go straight into the buffer of a growing unicode
//   object (UTF-16 into UCS4, surrogate pairs joined, or copied as they are
//   into a UCS2 build);
// - Python 3: a str must know its widest character before it exists. The
//   pieces go straight into a growing str of the narrowest kind that holds
//   the code points so far; a wider code point makes one copy into the wider
//   kind, at most three times in all (the way the interpreter's own decoders
//   build a str). Lone surrogates stay code points of their own, as on
//   Python 2.
// Like the "u" format of Py_BuildValue, both end the text at a zero unit.
// A sink owns what it has built until release(); if the conversion throws,
// the destructor frees it. A sink that can't grow throws std::bad_alloc.
#include <Python.h>

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <new>

#if defined(__linux__)
#include <sys/mman.h>
#endif

#include "module/python/ResultEncoder.h"
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

// The string object a sink builds and owns until it hands it over: `size_`
// units written of `capacity_`.
class GrowingString {
protected:
    GrowingString() : object_(NULL), size_(0), capacity_(0) {}
    ~GrowingString() { Py_XDECREF(object_); }
    GrowingString(const GrowingString&) = delete;
    GrowingString& operator=(const GrowingString&) = delete;

    // A new capacity for object_; on failure object_ is unchanged (and freed
    // by the destructor).
    void resize(Py_ssize_t capacity) {
        if (PyUnicode_Resize(&object_, capacity) < 0) throw std::bad_alloc();
        capacity_ = capacity;
    }

    // The string cut to its size (a new reference), or NULL with
    // MemoryError set; the sink is empty afterwards.
    PyObject* handOver() {
        if (size_ != capacity_ && PyUnicode_Resize(&object_, size_) < 0) return NULL;
        PyObject* result = object_;
        object_ = NULL;
        size_ = capacity_ = 0;
        populated_ = 0;
        return result;
    }

    // Makes the pages of the string's buffer up to `bytes` (and a step beyond,
    // within `capacity` bytes) present before the text is stored there: one
    // call per step instead of one page fault per page as the writes reach
    // them. Pages moved by a resize stay present, so the count is an offset
    // into the buffer. Only large strings, whose buffers are mapped pages of
    // their own; where the call is not known, the pages fault in as before.
    void populate(const void* buffer, std::size_t bytes, std::size_t capacity) {
#if defined(__linux__) && defined(MADV_POPULATE_WRITE)
        if (bytes <= populated_ || capacity < kPopulateStep) return;
        const std::uintptr_t page = 4096;
        const std::uintptr_t data = reinterpret_cast<std::uintptr_t>(buffer);
        const std::size_t end = std::min(bytes + kPopulateStep, capacity);
        const std::uintptr_t first = (data + populated_) & ~(page - 1);
        const std::uintptr_t last = (data + end) & ~(page - 1);
        if (last > first) madvise(reinterpret_cast<void*>(first), last - first, MADV_POPULATE_WRITE);
        populated_ = end;
#else
        (void)buffer;
        (void)bytes;
        (void)capacity;
#endif
    }

    static const std::size_t kPopulateStep = std::size_t(2) << 20;

    PyObject* object_;
    Py_ssize_t size_;
    Py_ssize_t capacity_;
    std::size_t populated_ = 0;
};

#if PY_MAJOR_VERSION < 3

class ResultSink final : public XmlSink, private GrowingString {
public:
    ResultSink() : ended_(false) {}

    void flush(const char16_t* text, std::size_t size) override {
        reserve(size_ + ResultEncoder::maxUtf32(size));
        populate(PyUnicode_AS_UNICODE(object_), (size_ + ResultEncoder::maxUtf32(size)) * sizeof(Py_UNICODE),
                 static_cast<std::size_t>(capacity_) * sizeof(Py_UNICODE));
        Py_UNICODE* out = PyUnicode_AS_UNICODE(object_) + size_;
        size_ += static_cast<Py_ssize_t>(convert(text, size, out));
    }

    // The finished string (a new reference), or NULL with MemoryError set.
    // The sink is empty afterwards.
    PyObject* release() {
        if (object_ == NULL) return PyUnicode_FromUnicode(NULL, 0);
        if (sizeof(Py_UNICODE) >= 4)
            size_ += static_cast<Py_ssize_t>(encoder_.finishUtf32(PyUnicode_AS_UNICODE(object_) + size_));
        return handOver();
    }

private:

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
        if (object_ != NULL) return resize(capacity);
        object_ = PyUnicode_FromUnicode(NULL, capacity);
        if (object_ == NULL) throw std::bad_alloc();
        capacity_ = capacity;
    }

    bool ended_;
    ResultEncoder encoder_;
};

#else

class ResultSink final : public XmlSink, private GrowingString {
public:
    ResultSink() : limit_(0) {}

    void flush(const char16_t* text, std::size_t size) override {
        if (limit_ == kWidest) {  // nothing can widen the str any more: straight in
            reserve(static_cast<std::size_t>(size_) + ResultEncoder::maxUtf32(size), kWidest);
            populate(PyUnicode_DATA(object_), (static_cast<std::size_t>(size_) + ResultEncoder::maxUtf32(size)) * 4,
                     static_cast<std::size_t>(capacity_) * 4);
            size_ += static_cast<Py_ssize_t>(
                encoder_.toUtf32(text, size, static_cast<Py_UCS4*>(PyUnicode_DATA(object_)) + size_));
            return;
        }
        // Code points a chunk at a time, through a small buffer on the stack,
        // so that the kind is known before they are stored.
        Py_UCS4 points[kChunk + 1];
        while (size > 0) {
            const std::size_t n = size < kChunk ? size : kChunk;
            store(points, encoder_.toUtf32(text, n, points));
            text += n;
            size -= n;
        }
    }

    // The finished string (a new reference), or NULL with MemoryError set.
    // The sink is empty afterwards.
    PyObject* release() {
        Py_UCS4 last[1];
        store(last, encoder_.finishUtf32(last));
        if (object_ == NULL) return PyUnicode_New(0, 0);
        limit_ = 0;
        return handOver();
    }

private:

    static const std::size_t kChunk = 4096;
    static const Py_UCS4 kWidest = 0x10FFFF;

    // Appends code points. The str's kind is the narrowest that holds every
    // code point so far; a wider one makes a new str, once per kind.
    void store(const Py_UCS4* points, std::size_t n) {
        if (n == 0) return;
        Py_UCS4 bits = 0;
        std::size_t i = 0;
        for (; i + 8 <= n; i += 8)  // blocks of a fixed size, which the compiler vectorizes
            for (int k = 0; k < 8; ++k) bits |= points[i + k];
        for (; i < n; ++i) bits |= points[i];
        // The widest code point of each kind is 2^k - 1, so the OR of the
        // code points picks the same kind as their largest.
        const Py_UCS4 limit = bits <= 0x7F ? 0x7F : bits <= 0xFF ? 0xFF : bits <= 0xFFFF ? 0xFFFF : kWidest;
        reserve(static_cast<std::size_t>(size_) + n, limit > limit_ ? limit : limit_);
        const std::size_t kind = PyUnicode_KIND(object_);
        populate(PyUnicode_DATA(object_), (static_cast<std::size_t>(size_) + n) * kind,
                 static_cast<std::size_t>(capacity_) * kind);
        void* data = PyUnicode_DATA(object_);
        switch (PyUnicode_KIND(object_)) {
            case PyUnicode_1BYTE_KIND:
                narrow(points, n, static_cast<Py_UCS1*>(data) + size_);
                break;
            case PyUnicode_2BYTE_KIND:
                narrow(points, n, static_cast<Py_UCS2*>(data) + size_);
                break;
            default:
                std::memcpy(static_cast<Py_UCS4*>(data) + size_, points, n * sizeof(Py_UCS4));
                break;
        }
        size_ += static_cast<Py_ssize_t>(n);
    }

    template <class Unit>
    static void narrow(const Py_UCS4* __restrict points, std::size_t n, Unit* __restrict out) {
        std::size_t i = 0;
        for (; i + 8 <= n; i += 8)
            for (int k = 0; k < 8; ++k) out[i + k] = static_cast<Unit>(points[i + k]);
        for (; i < n; ++i) out[i] = static_cast<Unit>(points[i]);
    }

    // Room for `needed` code points up to `limit`.
    void reserve(std::size_t needed, Py_UCS4 limit) {
        if (static_cast<Py_ssize_t>(needed) <= capacity_ && limit == limit_) return;
        Py_ssize_t capacity = capacity_;
        if (static_cast<Py_ssize_t>(needed) > capacity_)
            capacity = static_cast<Py_ssize_t>(nextCapacity(static_cast<std::size_t>(capacity_), needed,
                                                            limit <= 0xFF ? 1 : limit <= 0xFFFF ? 2 : 4));
        if (limit != limit_) {
            PyObject* wider = PyUnicode_New(capacity, limit);
            if (wider == NULL) throw std::bad_alloc();
            if (size_ > 0 && PyUnicode_CopyCharacters(wider, 0, object_, 0, size_) < 0) {
                Py_DECREF(wider);
                throw std::bad_alloc();
            }
            Py_XDECREF(object_);
            object_ = wider;
            populated_ = static_cast<std::size_t>(size_) * PyUnicode_KIND(object_);
            limit_ = limit;
            capacity_ = capacity;
        } else {
            resize(capacity);
        }
    }

    Py_UCS4 limit_;
    ResultEncoder encoder_;
};

#endif

}  // namespace pyorvxml
