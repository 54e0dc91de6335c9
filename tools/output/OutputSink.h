#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace lumenkey::tools {

/// Where written text goes.
class OutputSink {
public:
    virtual ~OutputSink() = default;
    /// Throws `OutputError`.
    virtual void write(std::string_view text) = 0;

protected:
    OutputSink() = default;
    OutputSink(OutputSink const&) = default;
    OutputSink& operator=(OutputSink const&) = default;
};

/// What couldn't be written, and why.
struct OutputError {
    std::string target;
    std::string what;
};

/// Gathers everything in a string.
class StringSink : public OutputSink {
public:
    void write(std::string_view text) override { _text += text; }
    std::string const& text() const { return _text; }
    /// Makes room, which emptying it keeps.
    void reserve(std::size_t bytes) { _text.reserve(bytes); }
    void clear() { _text.clear(); }

private:
    std::string _text;
};

} // namespace lumenkey::tools
