#include "tools/output/JsonWriter.h"

#include "tools/output/TextForms.h"

#include <cmath>
#include <nlohmann/json.hpp>

namespace lumenkey::tools {

namespace {

std::string jsonString(std::string_view text) {
    using Json = nlohmann::json;
    return Json(std::string(text)).dump(-1, ' ', false, Json::error_handler_t::replace);
}

} // namespace

void JsonWriter::newLine() { _out.write("\n" + std::string(_levels.size() * 2, ' ')); }

void JsonWriter::separate() {
    if (_afterKey || _levels.empty()) {
        _afterKey = false;
        return;
    }
    bool const isInline = _levels.back().layout == JsonLayout::Inline;
    if (_levels.back().hasEntry) {
        _out.write(isInline ? ", " : ",");
    }
    _levels.back().hasEntry = true;
    if (!isInline) {
        newLine();
    }
}

void JsonWriter::begin(std::string_view bracket, JsonLayout layout) {
    separate();
    _out.write(bracket);
    bool const isInside = !_levels.empty() && _levels.back().layout == JsonLayout::Inline;
    _levels.push_back({isInside ? JsonLayout::Inline : layout});
}

void JsonWriter::end(std::string_view bracket) {
    Level const level = _levels.back();
    _levels.pop_back();
    if (level.hasEntry && level.layout == JsonLayout::Lines) {
        newLine();
    }
    _out.write(bracket);
}

void JsonWriter::key(std::string_view name) {
    separate();
    _out.write(jsonString(name));
    _out.write(": ");
    _afterKey = true;
}

void JsonWriter::string(std::string_view text) {
    separate();
    _out.write(jsonString(text));
}

void JsonWriter::number(double value) {
    separate();
    _out.write(std::isfinite(value) ? shortestText(value) : "null");
}

void JsonWriter::integer(std::uint64_t value) {
    separate();
    _out.write(std::to_string(value));
}

void JsonWriter::boolean(bool value) {
    separate();
    _out.write(value ? "true" : "false");
}

} // namespace lumenkey::tools
