#include "tools/check/DocumentCheck.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/persistence/KFDocumentVersion.h"
#include "tools/check/AttributeCheck.h"
#include "tools/check/ClassExamples.h"
#include "tools/check/CurveCheck.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/output/TextForms.h"
#include "tools/tree/ChannelClass.h"

#include <algorithm>
#include <limits>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace lumenkey::tools {

namespace {

/// An element that is open.
struct OpenElement {
    std::string name;
    DocumentWord const* word = nullptr;
    TextPlace place;
    std::string text;
    /// Of a channel: its class, or null; and those of its children so far, by ID.
    KFFactory* factory = nullptr;
    std::map<std::uint64_t, KFFactory*> children;
    /// Of a curve. What its attributes may be is known at its end.
    std::vector<std::pair<std::string, std::string>> attributes;
    CurveLimits limits;
    bool hasKeypoints = false;
    /// As from the first keypoint on, or from their number.
    bool canBeClosed = false;
    Tempus lastTime = kTempusInvalid;
    /// Where the last of the limits stands.
    TextPlace limitPlace;
    /// Of a keypoint.
    bool hasTime = false;
    bool hasValue = false;
    bool isDisabled = false;
    bool hasOutput = false;
};

/// The check of one document.
class Checker : public DocumentScanner {
public:
    Checker() : _open(1) {}

    std::vector<DocumentFinding> takeFindings() {
        sortByPlace(_findings);
        return std::move(_findings);
    }

private:
    // --- Findings ---

    // Nothing where there is nothing to tell.

    void find(TextPlace const& place, std::string what) { tell({place, std::move(what)}); }
    /// What a reader takes as it is.
    void findKept(TextPlace const& place, std::string what) { tell({place, std::move(what), false}); }
    void tell(DocumentFinding finding) {
        if (!finding.what.empty()) {
            _findings.push_back(std::move(finding));
        }
    }

    void fault(TextPlace const& place, std::string_view what) override { find(place, std::string(what)); }

    // --- Elements ---

    void start(TextPlace const& place, std::string_view name, Attributes const& attributes) override {
        if (_skipped > 0) {
            ++_skipped;
            return;
        }
        OpenElement element;
        element.name = name;
        element.place = place;
        element.word = documentElement(_open.back().name, name);
        if (!isTaken(element) || !isSound(element, attributes)) {
            _skipped = 1;
            return;
        }
        if (element.name == "curve") {
            element.attributes.assign(attributes.begin(), attributes.end());
        } else {
            checkAttributes(element, attributes);
        }
        _open.push_back(std::move(element));
    }

    bool isTaken(OpenElement const& element) {
        if (element.word == nullptr) {
            find(element.place, "the element '" + element.name + "' is unknown here: it is passed over");
            return false;
        }
        KFFactory* const factory = _open.back().factory;
        if (element.word->parent == "parameter" && factory != nullptr &&
            (element.word->classes & ownersOf(*factory)) == 0) {
            find(element.place, "the element '" + element.name + "' is none of a channel of the class " +
                                    shortClassName(classNameOf(*factory)) + ": it is passed over");
            return false;
        }
        return true;
    }

    bool isSound(OpenElement& element, Attributes const& attributes) {
        if (element.name == "kfml" || element.name == "kfdoc") {
            constexpr std::uint32_t firstWithTimes = 5;
            std::uint32_t major = firstWithTimes;
            std::uint32_t minor = 0;
            KFReadVersion(attributeOf(attributes, "version"), major, minor);
            _countsFrames = major < firstWithTimes;
        } else if (element.name == "factory") {
            checkFactory(element, attributes);
        } else if (element.name == "parameter") {
            return isSoundChannel(element, attributes);
        } else if (element.name == "curve") {
            element.limits = limitsOf(_examples.of(_open.back().factory));
        } else if (element.name == "keypoint") {
            element.isDisabled = readBool(attributeOf(attributes, "enabled")) == false;
            tell({element.place, faultOfInterpolation(attributes),
                  !readWhole(attributeOf(attributes, "interpolation"))});
        }
        return true;
    }

    void checkAttributes(OpenElement const& element, Attributes const& attributes) {
        CurveLimits const limits =
            element.name == "parameter" ? limitsOf(_examples.of(element.factory)) : element.limits;
        for (AttributeFault& fault : faultsOfAttributes(element.name, attributes, limits, _countsFrames)) {
            tell({element.place, std::move(fault.what), !fault.isKept});
        }
    }

    void checkFactory(OpenElement const& element, Attributes const& attributes) {
        std::optional<std::uint64_t> const number = readWhole(attributeOf(attributes, "id"));
        std::string const uuidText(attributeOf(attributes, "uuid"));
        BXUUID uuid;
        if (!number || *number > std::numeric_limits<std::uint32_t>::max() ||
            !BXUUID::fromText(uuidText, &uuid)) {
            find(element.place, "a factory needs an 'id', which is a whole number, and a 'uuid'");
            return;
        }
        KFFactory* const factory = KFFactories::getInstance().findFactory(uuid);
        if (auto const [before, isNew] = _factories.try_emplace(*number, factory); !isNew) {
            find(element.place, "the factory has the id " + std::to_string(*number) + " of one before it" +
                                    (factory == nullptr ? "" : ", whose place it takes"));
            before->second = factory == nullptr ? before->second : factory;
        }
        if (factory == nullptr) {
            // A channel of it is a loss of its own.
            findKept(element.place, "the class " + uuidText + " is unknown: its channels are passed over");
        }
    }

    bool isSoundChannel(OpenElement& element, Attributes const& attributes) {
        OpenElement& above = _open.back();
        std::string const name = "the channel '" + std::string(attributeOf(attributes, "name")) + "'";
        std::uint64_t const id = readWhole(attributeOf(attributes, "id")).value_or(0);
        if (auto const before = above.children.find(id); before != above.children.end()) {
            find(element.place,
                 name + " has the ID " + std::to_string(id) + " of one before it: it is read into that one");
            element.factory = before->second;
            return true;
        }
        std::optional<std::uint64_t> const number = readWhole(attributeOf(attributes, "factoryID"));
        if (KFFactory* const component = _examples.componentOf(above.factory, id)) {
            element.factory = component;
        } else if (number) {
            auto const found = _factories.find(*number);
            element.factory = found == _factories.end() ? nullptr : found->second;
            if (element.factory == nullptr) {
                find(element.place,
                     name + " is of factory " + std::to_string(*number) +
                         (found == _factories.end() ? ", which isn't listed" : ", which is unknown") +
                         ": it is passed over");
                return false;
            }
        } else if (above.word != nullptr && above.word->name == "parameter") {
            find(element.place, name + " names no class: it is passed over");
            return false;
        } else {
            element.factory = &KFChannelObjectRootBase_Factory::getInstance();
        }
        above.children[id] = element.factory;
        return true;
    }

    // --- Texts ---

    void text(std::string_view more) override {
        if (_skipped == 0 && _open.back().word != nullptr && _open.back().word->text != TextKind::None) {
            _open.back().text += more;
        }
    }

    void end() override {
        if (_skipped > 0) {
            --_skipped;
            return;
        }
        OpenElement const element = std::move(_open.back());
        _open.pop_back();
        _open.back().hasTime |= element.name == "time";
        _open.back().hasOutput |= element.name == "outputTangentValue";
        bool const comesTooEarly = isSpentOnValue(element) && !_open.back().hasValue;
        _open.back().hasValue |= element.name == "value";
        if (!canBeRead(element.text, element.word->text, _countsFrames)) {
            bool const isKept = element.name == "value" && isStorable(element.text);
            tell({element.place,
                  "'" + element.text + "' is " + std::string(nameOfTextKind(element.word->text)), !isKept});
            return;
        }
        if (comesTooEarly) {
            find(element.place,
                 "'" + element.name + "' stands in front of the value, where it comes too early");
        }
        if (isBeyond(*element.word, element.text)) {
            // Curves keep such numbers.
            tell({element.place,
                  "the number " + element.text + " is out of the limits of '" + element.name + "', 0 to " +
                      std::to_string(element.word->greatest),
                  element.word->parent != "curve"});
        } else if (element.word->parent == "curve") {
            endPartOfCurve(element);
        } else if (element.word->parent == "keypoint") {
            endPartOfKeypoint(element);
        } else if (element.name == "curve") {
            endCurve(element);
        }
    }

    /// Whether the keypoint must be there, which its value makes. Times of handles wait for their values.
    static bool isSpentOnValue(OpenElement const& element) {
        return element.word->parent == "keypoint" && element.name != "time" && element.name != "value" &&
               element.name != "inputTangentTime" && element.name != "outputTangentTime";
    }

    void endCurve(OpenElement const& curve) {
        Attributes const attributes(curve.attributes.begin(), curve.attributes.end());
        checkAttributes(curve, attributes);
        if (curve.hasKeypoints && readWhole(attributeOf(attributes, "type")).value_or(0) == 0) {
            find(curve.place, "the curve is a constant: its keypoints are passed over");
        }
        if (curve.limits.low > curve.limits.high) {
            findKept(curve.limitPlace, "the least value, " + shortestText(curve.limits.low) +
                                           ", is above the greatest, " + shortestText(curve.limits.high));
        }
    }

    void endPartOfCurve(OpenElement const& element) {
        OpenElement& curve = _open.back();
        if (element.name == "min" || element.name == "max") {
            (element.name == "min" ? curve.limits.low : curve.limits.high) = *readNumber(element.text);
            curve.limitPlace = element.place;
        } else if (element.name == "keypoint") {
            curve.hasKeypoints = true;
            curve.canBeClosed = true;
            tell({element.place, faultOfParts(element.hasTime, element.hasValue), !element.hasValue});
            if (element.isDisabled && element.hasValue && !element.hasOutput) {
                find(element.place,
                     "the keypoint is disabled but has no output handle: it comes back enabled");
            }
        } else if (element.name == "numberOfKeypoints") {
            curve.canBeClosed = true;
            find(element.place,
                 curve.hasKeypoints ? "the number stands behind keypoints, which it clears" : "");
        } else if (element.name == "closed" && !curve.canBeClosed && readBool(element.text) != false) {
            find(element.place, "there are no keypoints yet that it would close");
        }
    }

    void endPartOfKeypoint(OpenElement const& element) {
        OpenElement& keypoint = _open.back();
        OpenElement& curve = _open[_open.size() - 2];
        if (element.name == "value") {
            findKept(element.place, faultOfNumber(element.text, curve.limits));
        } else if (element.name == "time") {
            if (keypoint.hasValue) {
                find(element.place, "the time stands behind the value, where it comes too late");
            } else {
                findKept(element.place, faultOfOrder(element.text, _countsFrames, curve.lastTime));
            }
        }
    }

    bool _countsFrames = false;
    /// How many elements are open in one that is passed over, itself counted.
    std::size_t _skipped = 0;
    std::vector<OpenElement> _open;
    std::map<std::uint64_t, KFFactory*> _factories;
    ClassExamples _examples;
    std::vector<DocumentFinding> _findings;
};

} // namespace

std::vector<DocumentFinding> checkDocument(std::string const& file, ReadingProgress const& progress) {
    Checker checker;
    checker.scan(file, progress);
    return checker.takeFindings();
}

std::vector<DocumentFinding> checkDocumentText(std::string_view text, ReadingProgress const& progress) {
    Checker checker;
    checker.scanText(text, progress);
    return checker.takeFindings();
}

void sortByPlace(std::vector<DocumentFinding>& findings) {
    std::stable_sort(
        findings.begin(), findings.end(), [](DocumentFinding const& a, DocumentFinding const& b) {
            return std::pair(a.place.line, a.place.column) < std::pair(b.place.line, b.place.column);
        });
}

} // namespace lumenkey::tools
