#pragma once
// Where a writer's text goes: the writer fills a small buffer of its own and
// hands each full buffer to a sink, in order, with one call.
#include <cstddef>
#include <string>

class XmlSink {
public:
    // Takes the next `size` units of the text. May throw (std::bad_alloc);
    // the writer then stops where it is.
    virtual void flush(const char16_t* text, std::size_t size) = 0;

protected:
    ~XmlSink() = default;
};

// Appends the text to a string that the caller owns.
class StringSink final : public XmlSink {
public:
    explicit StringSink(std::u16string& out) : out_(out) {}
    void flush(const char16_t* text, std::size_t size) override { out_.append(text, size); }

private:
    std::u16string& out_;
};
