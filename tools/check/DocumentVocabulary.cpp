#include "tools/check/DocumentVocabulary.h"

#include "tools/time/TimeFraction.h"

#include <charconv>
#include <cmath>
#include <limits>

namespace lumenkey::tools {

namespace {

constexpr std::uint64_t kMost32 = std::numeric_limits<std::uint32_t>::max();
constexpr std::uint64_t kLastFadeCurve = 3;
constexpr std::uint64_t kLastExtrapolation = 4;
constexpr std::uint64_t kLastCurveType = 1;

constexpr DocumentWord kElements[] = {
    {"", "kfml"},
    {"", "kfdoc"},
    {"kfml", "factory"},
    {"kfml", "parameter"},
    {"factory", "description", TextKind::Any},
    {"factory", "manufacturer", TextKind::Any},
    {"factory", "version", TextKind::Number},
    {"parameter", "flags", TextKind::Whole},
    {"parameter", "parameter", TextKind::None, kOfFolders | kOfRoots},
    {"parameter", "foldFlags", TextKind::Whole, kOfFolders | kOfRoots, kMost32},
    {"parameter", "timing", TextKind::None, kOfRoots},
    {"parameter", "baseFlags", TextKind::Whole, kOfRoots},
    {"parameter", "enabled", TextKind::Bool, kOfRoots},
    {"parameter", "locked", TextKind::Bool, kOfRoots},
    {"parameter", "curve", TextKind::None, kOfValues},
    {"parameter", "fadeInOffset", TextKind::Time, kOfValues},
    {"parameter", "fadeOutOffset", TextKind::Time, kOfValues},
    {"parameter", "fadeInCurve", TextKind::Whole, kOfValues, kLastFadeCurve},
    {"parameter", "fadeOutCurve", TextKind::Whole, kOfValues, kLastFadeCurve},
    {"curve", "numberOfKeypoints", TextKind::Whole, kOfAll, kMost32},
    {"curve", "min", TextKind::Number},
    {"curve", "max", TextKind::Number},
    {"curve", "preExtrapolation", TextKind::Whole, kOfAll, kLastExtrapolation},
    {"curve", "postExtrapolation", TextKind::Whole, kOfAll, kLastExtrapolation},
    {"curve", "closed", TextKind::Switch},
    {"curve", "keypoint"},
    {"keypoint", "time", TextKind::Time},
    {"keypoint", "value", TextKind::Number},
    {"keypoint", "bias", TextKind::Number},
    {"keypoint", "normal", TextKind::Number},
    {"keypoint", "inputTangentTime", TextKind::Number},
    {"keypoint", "inputTangentValue", TextKind::Number},
    {"keypoint", "outputTangentTime", TextKind::Number},
    {"keypoint", "outputTangentValue", TextKind::Number},
};

constexpr DocumentWord kAttributes[] = {
    {"kfml", "version", TextKind::Any},
    {"kfdoc", "version", TextKind::Any},
    {"factory", "id", TextKind::Any},
    {"factory", "uuid", TextKind::Any},
    {"parameter", "name", TextKind::Any},
    {"parameter", "id", TextKind::Whole, kOfAll, kMost32},
    {"parameter", "factoryID", TextKind::Whole, kOfAll, kMost32},
    {"parameter", "flags", TextKind::Whole},
    {"parameter", "default", TextKind::Number},
    {"parameter", "value", TextKind::Number},
    {"timing", "in", TextKind::Time},
    {"timing", "out", TextKind::Time},
    {"timing", "offset", TextKind::Time},
    {"curve", "type", TextKind::Whole, kOfAll, kLastCurveType},
    {"curve", "value", TextKind::Number},
    {"curve", "default", TextKind::Number},
    {"curve", "parametric", TextKind::Bool},
    {"curve", "round", TextKind::Bool},
    {"curve", "retimingExtrapolation", TextKind::Bool},
    {"keypoint", "interpolation", TextKind::Any},
    {"keypoint", "enabled", TextKind::Bool},
    {"keypoint", "flags", TextKind::Whole, kOfAll, kMost32},
};

std::string_view trimmed(std::string_view text) {
    constexpr std::string_view spaces = " \t\r\n";
    std::size_t const first = text.find_first_not_of(spaces);
    return first == std::string_view::npos ? std::string_view()
                                           : text.substr(first, text.find_last_not_of(spaces) - first + 1);
}

template <class Number> std::optional<Number> readExactly(std::string_view text) {
    Number number{};
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    return error == std::errc{} && end == text.data() + text.size() ? std::optional(number) : std::nullopt;
}

/// What stands behind a mark, which is cut off with it; nothing where there is no such mark.
std::optional<std::string_view> cutBehind(std::string_view& text, char mark) {
    std::size_t const at = text.find(mark);
    if (at == std::string_view::npos) {
        return std::nullopt;
    }
    std::string_view const behind = text.substr(at + 1);
    text = text.substr(0, at);
    return behind;
}

} // namespace

DocumentWord const* documentElement(std::string_view parent, std::string_view name) {
    for (DocumentWord const& word : kElements) {
        if (word.name == name && word.parent == (parent == "kfdoc" ? "kfml" : parent)) {
            return &word;
        }
    }
    return nullptr;
}

std::span<DocumentWord const> documentAttributes() { return kAttributes; }

bool isBeyond(DocumentWord const& word, std::string_view text) {
    return word.text == TextKind::Whole && readWhole(text).value_or(0) > word.greatest;
}

std::optional<double> readNumber(std::string_view text) {
    std::optional<double> const number = readExactly<double>(trimmed(text));
    return number && std::isnan(*number) ? std::nullopt : number;
}

bool isStorable(std::string_view text) { return readExactly<double>(trimmed(text)).has_value(); }

std::optional<std::uint64_t> readWhole(std::string_view text) {
    return readExactly<std::uint64_t>(trimmed(text));
}

std::optional<bool> readBool(std::string_view text) {
    text = trimmed(text);
    bool const isOn = text == "1" || text == "true";
    return isOn || text == "0" || text == "false" ? std::optional(isOn) : std::nullopt;
}

std::optional<Tempus> readTime(std::string_view text) {
    text = trimmed(text);
    std::optional<std::string_view> const flags = cutBehind(text, '#');
    if (!flags && text.ends_with('~')) {
        text.remove_suffix(1);
    }
    for (std::string_view const word : {"invalid", "indefinite", "+infinity", "-infinity"}) {
        if (text == word && !flags) {
            return kTempusInvalid;
        }
    }
    std::optional<std::string_view> const epoch = cutBehind(text, '@');
    if ((flags && !readExactly<std::uint32_t>(*flags)) || (epoch && !readExactly<std::int64_t>(*epoch))) {
        return std::nullopt;
    }
    Tempus const time = timeFromFraction(text);
    std::optional<std::string_view> const scale = cutBehind(text, '/');
    if (flags) {
        bool const isWhole = readExactly<std::int64_t>(text) && scale && readExactly<std::int32_t>(*scale);
        return isWhole ? std::optional(kTempusInvalid) : std::nullopt;
    }
    return TempusIsNumeric(time) ? std::optional(time) : std::nullopt;
}

bool canBeRead(std::string_view text, TextKind kind, bool countsFrames) {
    switch (kind) {
    case TextKind::Bool:
        return readBool(text).has_value();
    case TextKind::Switch:
        return readBool(text) || readWhole(text);
    case TextKind::Whole:
        return readWhole(text).has_value();
    case TextKind::Number:
        return readNumber(text).has_value();
    case TextKind::Time:
        return countsFrames ? readNumber(text).has_value() : readTime(text).has_value();
    default:
        return true;
    }
}

std::string_view nameOfTextKind(TextKind kind) {
    switch (kind) {
    case TextKind::Bool:
    case TextKind::Switch:
        return "neither 1 nor 0";
    case TextKind::Whole:
        return "no whole number";
    case TextKind::Time:
        return "no time";
    default:
        return "no number";
    }
}

} // namespace lumenkey::tools
