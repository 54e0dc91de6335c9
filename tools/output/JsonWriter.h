#pragma once

#include "tools/output/OutputSink.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// An entry on each line, or all of it on one.
enum class JsonLayout { Lines, Inline };

/// Writes JSON as it is told it, without a tree of the whole in memory. Numbers are the shortest decimals
/// that read back the same, and `null` where they are infinite or not a number, which JSON cannot say.
///
///     json.beginObject();
///     json.key("series"); json.beginArray(); json.number(0.1); json.endArray();
///     json.endObject();
///
/// Values in an array and keys in an object are parted by commas by themselves; a value follows each key.
class JsonWriter {
public:
    explicit JsonWriter(OutputSink& out) : _out(out) {}

    /// What stands in something inline is inline too.
    void beginObject(JsonLayout layout = JsonLayout::Lines) { begin("{", layout); }
    void endObject() { end("}"); }
    void beginArray(JsonLayout layout = JsonLayout::Lines) { begin("[", layout); }
    void endArray() { end("]"); }
    void key(std::string_view name);

    /// Bytes that are no UTF-8 become U+FFFD.
    void string(std::string_view text);
    void number(double value);
    void integer(std::uint64_t value);
    void boolean(bool value);

    /// The line end behind the outermost value.
    void finish() { _out.write("\n"); }

private:
    struct Level {
        JsonLayout layout;
        bool hasEntry = false;
    };

    void separate();
    void begin(std::string_view bracket, JsonLayout layout);
    void end(std::string_view bracket);
    void newLine();

    OutputSink& _out;
    /// One for each open bracket.
    std::vector<Level> _levels;
    bool _afterKey = false;
};

} // namespace lumenkey::tools
