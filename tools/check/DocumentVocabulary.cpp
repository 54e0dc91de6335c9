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

constexpr DocumentWord kWords[] = {
    {"", "kfml"},
    {"", "kfdoc"},
    {"kfml", "factory"},
    {"kfml", "parameter"},
    {"factory", "description", TextKind::Any},
    {"factory", "manufacturer", TextKind::Any},
    {"factory", "version", TextKind::Number},
    {"parameter", "flags", TextKind::Whole64},
    {"parameter", "parameter", TextKind::None, kOfFolders | kOfRoots},
    {"parameter", "foldFlags", TextKind::Whole32, kOfFolders | kOfRoots, kMost32},
    {"parameter", "timing", TextKind::None, kOfRoots},
    {"parameter", "baseFlags", TextKind::Whole64, kOfRoots},
    {"parameter", "enabled", TextKind::Bool, kOfRoots},
    {"parameter", "locked", TextKind::Bool, kOfRoots},
    {"parameter", "curve", TextKind::None, kOfValues},
    {"parameter", "fadeInOffset", TextKind::Time, kOfValues},
    {"parameter", "fadeOutOffset", TextKind::Time, kOfValues},
    {"parameter", "fadeInCurve", TextKind::Whole32, kOfValues, kLastFadeCurve},
    {"parameter", "fadeOutCurve", TextKind::Whole32, kOfValues, kLastFadeCurve},
    {"curve", "numberOfKeypoints", TextKind::Whole32, kOfAll, kMost32},
    {"curve", "min", TextKind::Number},
    {"curve", "max", TextKind::Number},
    {"curve", "preExtrapolation", TextKind::Whole32, kOfAll, kLastExtrapolation},
    {"curve", "postExtrapolation", TextKind::Whole32, kOfAll, kLastExtrapolation},
    {"curve", "closed", TextKind::Bool},
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

constexpr DocumentAttribute kAttributes[] = {
    {"parameter", "id", TextKind::Whole32, kMost32},
    {"parameter", "factoryID", TextKind::Whole32, kMost32},
    {"parameter", "flags", TextKind::Whole64},
    {"parameter", "default", TextKind::Number},
    {"parameter", "value", TextKind::Number},
    {"timing", "in", TextKind::Time},
    {"timing", "out", TextKind::Time},
    {"timing", "offset", TextKind::Time},
    {"curve", "type", TextKind::Whole32, kLastCurveType},
    {"curve", "value", TextKind::Number},
    {"curve", "default", TextKind::Number},
    {"curve", "parametric", TextKind::Bool},
    {"curve", "round", TextKind::Bool},
    {"curve", "retimingExtrapolation", TextKind::Bool},
    {"keypoint", "enabled", TextKind::Bool},
    {"keypoint", "flags", TextKind::Whole32, kMost32},
};

template <class Number> std::optional<Number> readAs(std::string_view text) {
    constexpr std::string_view spaces = " \t\r\n";
    std::size_t const first = text.find_first_not_of(spaces);
    if (first == std::string_view::npos) {
        return std::nullopt;
    }
    text = text.substr(first, text.find_last_not_of(spaces) - first + 1);
    Number number{};
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    return error == std::errc{} && end == text.data() + text.size() ? std::optional(number) : std::nullopt;
}

bool isTime(std::string_view text) {
    for (std::string_view const word : {"invalid", "indefinite", "+infinity", "-infinity"}) {
        if (text == word) {
            return true;
        }
    }
    if (text.ends_with('~')) {
        text.remove_suffix(1);
    }
    std::size_t const epoch = text.find('@');
    bool const hasEpoch = epoch != std::string_view::npos;
    return TempusIsNumeric(timeFromFraction(text.substr(0, epoch))) &&
           (!hasEpoch || readAs<std::int64_t>(text.substr(epoch + 1)));
}

} // namespace

DocumentWord const* documentWord(std::string_view parent, std::string_view name) {
    for (DocumentWord const& word : kWords) {
        if (word.name == name && word.parent == (parent == "kfdoc" ? "kfml" : parent)) {
            return &word;
        }
    }
    return nullptr;
}

std::span<DocumentAttribute const> documentAttributes() { return kAttributes; }

std::optional<double> readNumber(std::string_view text) {
    std::optional<double> const number = readAs<double>(text);
    return number && std::isnan(*number) ? std::nullopt : number;
}
std::optional<std::uint64_t> readWhole(std::string_view text) { return readAs<std::uint64_t>(text); }

bool canBeRead(std::string_view text, TextKind kind, bool countsFrames) {
    switch (kind) {
    case TextKind::Bool:
        return text == "1" || text == "0" || text == "true" || text == "false";
    case TextKind::Whole32:
    case TextKind::Whole64:
        return readWhole(text).has_value();
    case TextKind::Number:
        return readNumber(text).has_value();
    case TextKind::Time:
        return countsFrames ? readNumber(text).has_value() : isTime(text);
    default:
        return true;
    }
}

std::string_view nameOfTextKind(TextKind kind) {
    switch (kind) {
    case TextKind::Bool:
        return "neither 1 nor 0";
    case TextKind::Whole32:
    case TextKind::Whole64:
        return "no whole number";
    case TextKind::Time:
        return "no time";
    default:
        return "no number";
    }
}

} // namespace lumenkey::tools
