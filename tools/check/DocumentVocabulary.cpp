#include "tools/check/DocumentVocabulary.h"

#include "lumenkey/foundation/BXSerializerStreams.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <memory>

namespace lumenkey::tools {

namespace {

constexpr std::uint64_t kMost32 = std::numeric_limits<std::uint32_t>::max();
constexpr std::uint64_t kLastFadeCurve = 3;
constexpr std::uint64_t kLastExtrapolation = 4;
constexpr std::uint64_t kLastCurveType = 1;

constexpr DocumentWord kElements[] = {
    {"", "kfml"},
    {"", "kfdoc"},
    {.parent = "kfml", .name = "factory", .isRepeated = true},
    {.parent = "kfml", .name = "parameter", .isRepeated = true},
    {"factory", "description", TextKind::Any, kOfAll, UINT64_MAX, true},
    {"factory", "manufacturer", TextKind::Any, kOfAll, UINT64_MAX, true},
    {"factory", "version", TextKind::Number, kOfAll, UINT64_MAX, true},
    {"parameter", "flags", TextKind::Whole},
    {"parameter", "parameter", TextKind::None, kOfFolders | kOfRoots, UINT64_MAX, true},
    {"parameter", "foldFlags", TextKind::Whole, kOfFolders | kOfRoots, kMost32},
    {"parameter", "timing", TextKind::None, kOfRoots},
    {"parameter", "baseFlags", TextKind::Whole, kOfRoots},
    {"parameter", "enabled", TextKind::Bool, kOfRoots},
    {"parameter", "locked", TextKind::Bool, kOfRoots},
    {"parameter", "curve", TextKind::None, kOfValues},
    {"parameter", "fadeInOffset", TextKind::Length, kOfValues},
    {"parameter", "fadeOutOffset", TextKind::Length, kOfValues},
    {"parameter", "fadeInCurve", TextKind::Whole, kOfValues, kLastFadeCurve},
    {"parameter", "fadeOutCurve", TextKind::Whole, kOfValues, kLastFadeCurve},
    {"curve", "numberOfKeypoints", TextKind::Whole, kOfAll, kMost32},
    {"curve", "min", TextKind::Number},
    {"curve", "max", TextKind::Number},
    {"curve", "preExtrapolation", TextKind::Whole, kOfAll, kLastExtrapolation},
    {"curve", "postExtrapolation", TextKind::Whole, kOfAll, kLastExtrapolation},
    {"curve", "closed", TextKind::Switch, kOfAll, kMost32},
    {.parent = "curve", .name = "keypoint", .isRepeated = true},
    {"keypoint", "time", TextKind::Time},
    {"keypoint", "value", TextKind::Number, kOfAll, UINT64_MAX, true},
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
    {"factory", "id", TextKind::Any, kOfAll, kMost32},
    {"factory", "uuid", TextKind::Any},
    {"parameter", "name", TextKind::Any},
    {"parameter", "id", TextKind::Whole, kOfAll, kMost32},
    {"parameter", "factoryID", TextKind::Whole, kOfAll, kMost32},
    {"parameter", "flags", TextKind::Whole},
    {"parameter", "default", TextKind::Number, kOfValues},
    {"parameter", "value", TextKind::Number, kOfValues},
    {"timing", "in", TextKind::Time},
    {"timing", "out", TextKind::Time},
    {"timing", "offset", TextKind::Time},
    {"curve", "type", TextKind::Whole, kOfAll, kLastCurveType},
    {"curve", "value", TextKind::Number},
    {"curve", "default", TextKind::Number},
    {"curve", "parametric", TextKind::Bool},
    {"curve", "round", TextKind::Bool},
    {"curve", "retimingExtrapolation", TextKind::Bool},
    {"keypoint", "interpolation", TextKind::Any, kOfAll, kMost32},
    {"keypoint", "enabled", TextKind::Bool},
    {"keypoint", "flags", TextKind::Whole, kOfAll, kMost32},
};

/// A text that the library reads as it does that of an element, or of an attribute.
class GivenText : public BXStreamElement {
public:
    explicit GivenText(std::string_view text) : _text(text) {}

    std::uint32_t tag() const override { return 0; }

protected:
    std::optional<std::string_view> text() const override { return _text; }
    std::optional<std::string_view> attributeText(std::uint32_t) const override { return _text; }

private:
    std::string_view _text;
};

template <class Value>
std::optional<Value> readAs(std::string_view text, bool (BXStreamElement::*read)(Value*) const) {
    Value value{};
    return (GivenText(text).*read)(&value) ? std::optional(value) : std::nullopt;
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

bool isDocumentElement(std::string_view name) {
    return std::any_of(std::begin(kElements), std::end(kElements),
                       [name](DocumentWord const& word) { return word.name == name; });
}

std::span<DocumentWord const> documentAttributes() { return kAttributes; }

bool isBeyond(DocumentWord const& word, std::string_view text) {
    return readWhole(text).value_or(0) > word.greatest;
}

std::optional<double> readNumberOrNan(std::string_view text) {
    return readAs(text, &BXStreamElement::getAsDouble);
}

std::optional<double> readNumber(std::string_view text) {
    std::optional<double> const number = readNumberOrNan(text);
    return number && std::isnan(*number) ? std::nullopt : number;
}

std::optional<std::uint64_t> readWhole(std::string_view text) {
    return readAs(text, &BXStreamElement::getAsUInt64);
}

std::optional<std::uint32_t> readWhole32(std::string_view text) {
    return readAs(text, &BXStreamElement::getAsUInt32);
}

std::string readString(std::string_view text) {
    return readAs(text, &BXStreamElement::getAsString).value_or(BXString()).str();
}

std::optional<bool> readBool(std::string_view text) { return readAs(text, &BXStreamElement::getAsBool); }

std::optional<BXUUID> readUUID(std::string_view text) {
    std::unique_ptr<BXUUID const> const uuid(GivenText(text).getAttributeAsUUID(0));
    return uuid ? std::optional(*uuid) : std::nullopt;
}

std::optional<Tempus> readTime(std::string_view text) { return readAs(text, &BXStreamElement::getAsTime); }

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
    case TextKind::Length:
        return readTime(text).has_value();
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
    case TextKind::Length:
        return "no time";
    default:
        return "no number";
    }
}

} // namespace lumenkey::tools
