#include "tools/check/AttributeCheck.h"

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/persistence/KFDocumentVersion.h"
#include "tools/check/ClassExamples.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/import/DocumentFile.h"
#include "tools/output/TextForms.h"
#include "tools/tree/ChannelClass.h"

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

namespace lumenkey::tools {

namespace {

/// Documents of older versions aren't known.
constexpr std::uint32_t kFirstMajor = 2;

std::string faultOfText(DocumentWord const& attribute, std::string_view text, CurveLimits const& limits,
                        bool countsFrames) {
    std::string const name(attribute.name);
    if (!canBeRead(text, attribute.text, countsFrames)) {
        return "the attribute '" + name + "' is '" + std::string(text) + "', which is " +
               std::string(nameOfTextKind(attribute.text));
    }
    if (isBeyond(attribute, text)) {
        return "the attribute '" + name + "' is " + std::string(text) +
               ", which is out of the limits, 0 to " + std::to_string(attribute.greatest);
    }
    return attribute.text == TextKind::Number ? faultOfNumber(text, limits) : "";
}

/// Of 32 bits, as it is read.
std::optional<std::uint64_t> partOfVersion(std::string_view text) {
    std::optional<std::uint64_t> const number = readWhole(text);
    return number <= std::numeric_limits<std::uint32_t>::max() ? number : std::nullopt;
}

std::string faultOfVersion(std::optional<std::string_view> given) {
    std::uint32_t readMajor = kWrittenMajor;
    std::uint32_t readMinor = kWrittenMinor;
    std::string const unescaped = readString(given.value_or(""));
    std::string_view const text = unescaped;
    KFReadVersion(text, readMajor, readMinor);
    std::string const readAs = "it is read as " + std::to_string(readMajor) + "." + std::to_string(readMinor);
    if (!given) {
        return "the document says no version: " + readAs;
    }
    std::size_t const point = text.find('.');
    std::optional<std::uint64_t> const major = partOfVersion(text.substr(0, point));
    std::optional<std::uint64_t> const minor =
        point == std::string_view::npos ? std::nullopt : partOfVersion(text.substr(point + 1));
    std::string const written = std::to_string(kWrittenMajor) + "." + std::to_string(kWrittenMinor);
    if (!major || !minor) {
        return "'" + std::string(text) + "' is no version, such as " + written + ": " + readAs;
    }
    if (*major < kFirstMajor) {
        return "the version " + std::string(text) + " is older than " + std::to_string(kFirstMajor) +
               ".0: it is read as those of versions 2 to 4, with times in frames";
    }
    bool const isNewer =
        std::pair(*major, *minor) > std::pair<std::uint64_t, std::uint64_t>(kWrittenMajor, kWrittenMinor);
    return isNewer ? "the version " + std::string(text) + " is newer than " + written : "";
}

bool isKnown(std::string_view element, std::string_view name) {
    std::span<DocumentWord const> const known = documentAttributes();
    return std::any_of(known.begin(), known.end(), [&](DocumentWord const& attribute) {
        return attribute.parent == element && attribute.name == name;
    });
}

} // namespace

std::vector<Fault> faultsOfAttributes(std::string_view element, Attributes const& attributes,
                                      CurveLimits const& limits, KFFactory* factory, bool countsFrames) {
    std::vector<Fault> faults;
    for (auto const& [name, value] : attributes) {
        if (!isKnown(element, name)) {
            faults.push_back(
                {"the attribute '" + std::string(name) + "' is unknown here: it is passed over"});
        }
    }
    for (DocumentWord const& attribute : documentAttributes()) {
        auto const found = attributes.find(attribute.name);
        if (attribute.parent != element || found == attributes.end()) {
            continue;
        }
        if (factory != nullptr && (attribute.classes & ownersOf(*factory)) == 0) {
            faults.push_back({faultOfOwner("attribute", attribute.name, *factory)});
            continue;
        }
        // Curves store numbers out of their limits, and bring them within when they are read.
        bool const isKept = attribute.text == TextKind::Number && readNumberOrNan(found->second);
        faults.push_back({faultOfText(attribute, found->second, limits, countsFrames), isKept});
    }
    if (element == "kfml" || element == "kfdoc") {
        auto const version = attributes.find("version");
        faults.push_back(
            {faultOfVersion(version == attributes.end() ? std::nullopt : std::optional(version->second)),
             true});
    }
    return faults;
}

std::vector<Fault> faultsOfCurveInChannel(Attributes const& curve, Attributes const& channel) {
    std::vector<Fault> faults;
    for (std::string_view const name : {"default", "value"}) {
        std::string_view const own = attributeOf(curve, name);
        std::string_view const other = attributeOf(channel, name);
        if (readNumberOrNan(own) && readNumberOrNan(other) && readNumber(own) != readNumber(other)) {
            faults.push_back({"the attribute '" + std::string(name) + "' is " + std::string(own) +
                              ", which takes the place of that of the channel, " + std::string(other)});
        }
    }
    return faults;
}

std::vector<Fault> faultsOfNearValues(Attributes const& attributes, KFChannelBase const* example) {
    constexpr double nearest = 1e-7;
    std::vector<Fault> faults;
    auto const* const channel = dynamic_cast<KFChannel const*>(example);
    for (std::string_view const name : {"default", "value"}) {
        std::optional<double> const given = readNumber(attributeOf(attributes, name));
        if (channel == nullptr || !given) {
            continue;
        }
        double const own = name == "value" ? channel->getInitialValue() : channel->getDefaultValue();
        if (*given != own && std::fabs(*given - own) < nearest) {
            faults.push_back({"the attribute '" + std::string(name) + "' is " + shortestText(*given) +
                              ", which is kept as " + shortestText(own)});
        }
    }
    return faults;
}

std::string faultOfOwner(std::string_view kind, std::string_view name, KFFactory& factory) {
    return "the " + std::string(kind) + " '" + std::string(name) + "' is none of a channel of the class " +
           shortClassName(classNameOf(factory)) + ": it is passed over";
}

} // namespace lumenkey::tools
