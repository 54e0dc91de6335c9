#include "tools/check/DocumentCheck.h"

#include "lumenkey/foundation/BXDocumentReader.h"
#include "lumenkey/persistence/KFDocumentVersion.h"
#include "tools/check/AttributeCheck.h"
#include "tools/check/ChannelCheck.h"
#include "tools/check/CurveCheck.h"
#include "tools/check/DocumentClasses.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/check/FlagsCheck.h"
#include "tools/check/OpenElement.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <limits>
#include <optional>
#include <utility>
#include <vector>

namespace lumenkey::tools {

namespace {

/// The check of one document.
class Checker : public DocumentScanner {
public:
    Checker() : _open(1) {}

    std::vector<DocumentFinding> takeFindings() { return _findings.sorted(); }

private:
    void fault(TextPlace const& place, std::string_view what) override {
        _findings.lost(place, std::string(what));
    }

    // --- Elements ---

    void start(TextPlace const& place, std::string_view name, Attributes const& attributes) override {
        if (_skipped > 0) {
            ++_skipped;
            return;
        }
        _open.back().isInStrayText = false;
        loseText(_open.back());
        OpenElement element;
        element.name = name;
        element.place = place;
        element.word = documentElement(_open.back().name, name);
        if (!isTaken(element) || !isSound(element, attributes)) {
            _skipped = 1;
            return;
        }
        findRepeated(element);
        if (element.name == "curve" || element.name == "parameter") {
            element.attributes.assign(attributes.begin(), attributes.end());
        }
        if (element.name != "curve") {
            checkAttributes(element, attributes);
        }
        _open.push_back(std::move(element));
    }

    void loseText(OpenElement& above) {
        if (above.word != nullptr && above.word->text != TextKind::None && !above.hasLostText) {
            above.hasLostText = true;
            bool const isNeeded = above.word->parent != "factory" && above.name != "numberOfKeypoints";
            _findings.take({above.place,
                            "another element stands in '" + above.name + "': its text is passed over",
                            isNeeded});
        }
    }

    void findRepeated(OpenElement const& element) {
        std::vector<DocumentWord const*>& parts = _open.back().parts;
        if (element.word->isRepeated) {
            return;
        }
        if (std::find(parts.begin(), parts.end(), element.word) != parts.end()) {
            _findings.lost(element.place, "the element '" + element.name +
                                              "' is here for the second time, where only one is kept");
        }
        parts.push_back(element.word);
    }

    bool isTaken(OpenElement const& element) {
        if (element.word == nullptr) {
            _findings.lost(element.place, "the element '" + element.name +
                                              (isDocumentElement(element.name)
                                                   ? "' doesn't belong here: what is in it isn't looked at"
                                                   : "' is unknown here: it is passed over"));
            return false;
        }
        KFFactory* const factory = _open.back().factory;
        if (element.word->parent == "parameter" && factory != nullptr &&
            (element.word->classes & ownersOf(*factory)) == 0) {
            _findings.lost(element.place, faultOfOwner("element", element.name, *factory));
            return false;
        }
        return true;
    }

    bool isSound(OpenElement& element, Attributes const& attributes) {
        if (element.name == "kfml" || element.name == "kfdoc") {
            constexpr std::uint32_t firstWithTimes = 5;
            std::uint32_t major = firstWithTimes;
            std::uint32_t minor = 0;
            KFReadVersion(readString(attributeOf(attributes, "version")), major, minor);
            _countsFrames = major < firstWithTimes;
        } else if (element.name == "factory") {
            _findings.take(element.place, _classes.readFactory(attributes));
        } else if (element.name == "parameter") {
            return isSoundChannel(element, attributes);
        } else if (element.name == "curve") {
            element.curveClass = curveClassOf(_open.back().example);
            element.limits = element.curveClass.limits;
        } else if (element.name == "timing" && !_countsFrames) {
            _findings.take(element.place, faultOfTiming(*_open.back().example, attributes));
        } else if (element.name == "keypoint") {
            element.keypoint.emplace(attributes, _open.back().curveClass, _countsFrames,
                                     _open.back().takesBias);
            _findings.take({element.place, faultOfInterpolation(attributes),
                            !readWhole(attributeOf(attributes, "interpolation"))});
        }
        return true;
    }

    void checkAttributes(OpenElement const& element, Attributes const& attributes) {
        CurveLimits const limits =
            element.name == "parameter" ? curveClassOf(element.example).limits : element.limits;
        _findings.take(element.place,
                       faultsOfAttributes(element.name, attributes, limits, element.factory, _countsFrames));
        if (element.name == "parameter" && _open.back().factory != nullptr) {
            _findings.take(element.place, faultsOfNearValues(attributes, element.example));
        }
    }

    bool isSoundChannel(OpenElement& element, Attributes const& attributes) {
        OpenElement& above = _open.back();
        bool const isTop = above.factory == nullptr;
        std::string const name = "the channel '" + std::string(attributeOf(attributes, "name")) + "'";
        std::uint64_t const id = readWhole32(attributeOf(attributes, "id")).value_or(0);
        if (isTop && !above.children.empty()) {
            _findings.lost(element.place,
                           "a second channel: a document holds one, with all others inside it");
            return false;
        }
        KFChannelBase* const component = _classes.componentOf(above.factory, id);
        if (auto const before = above.children.find(id); before != above.children.end()) {
            _findings.lost(element.place, name + " has the ID " + std::to_string(id) +
                                              " of one before it: it is read into that one");
            element.factory = before->second;
        } else if (component != nullptr) {
            element.factory = component->getFactory();
            _findings.lost(element.place, _classes.faultOfComponent(*component, attributes));
        } else if (std::string const fault = _classes.faultOfClass(attributes, isTop, &element.factory);
                   !fault.empty()) {
            _findings.lost(element.place,
                           name + fault + (isTop ? ": the document can't be read" : ": it is passed over"));
            return false;
        }
        element.example = component != nullptr ? component : _classes.of(element.factory);
        std::optional<std::size_t> const rank = _classes.placeOf(above.factory, id);
        if (above.children.insert_or_assign(id, element.factory).second && rank) {
            above.folder.addRanked(element.place, nameOfChannel(element, attributes), *rank);
        }
        element.flags.emplace(*element.example, element.place);
        if (std::optional<std::uint64_t> const flags = readWhole(attributeOf(attributes, "flags"))) {
            element.flags->readAttribute(element.place, *flags);
        }
        return true;
    }

    // --- Texts ---

    void text(TextPlace const& place, std::string_view more) override {
        OpenElement& element = _open.back();
        if (_skipped > 0 || element.word == nullptr) {
            return;
        }
        if (element.word->text != TextKind::None) {
            if (element.text.size() <= BXDocumentReader::kLongestText) { // no longer one is read
                element.text += more;
            }
        } else if (std::size_t const blanks = more.find_first_not_of(" \t\r\n");
                   !element.isInStrayText && blanks != std::string_view::npos) {
            element.isInStrayText = true;
            _findings.lost({place.line, place.column + blanks},
                           "text stands in the element '" + element.name + "': it is passed over");
        }
    }

    void end() override {
        if (_skipped > 0) {
            --_skipped;
            return;
        }
        OpenElement element = std::move(_open.back());
        _open.pop_back();
        OpenElement& above = _open.back();
        above.isInStrayText = false;
        bool const isReadable =
            !element.hasLostText && canBeRead(element.text, element.word->text, _countsFrames);
        bool const isKept = isReadable || (!element.hasLostText && KeypointCheck::keepsNan(element.name) &&
                                           readNumberOrNan(element.text));
        if (!isReadable && !element.hasLostText) {
            _findings.take({element.place,
                            quoted(element.text) + " is " + std::string(nameOfTextKind(element.word->text)),
                            !isKept && element.name != "numberOfKeypoints"});
        }
        if (above.keypoint) {
            _findings.take(element.place,
                           above.keypoint->faultOfPart(element.place, element.name, element.text, isKept));
        }
        if (isReadable) {
            endReadable(element);
        }
    }

    void endReadable(OpenElement& element) {
        if (isBeyond(*element.word, element.text)) {
            // Curves keep such numbers as far as they have room for them; how many keypoints are promised
            // doesn't matter, but that they are.
            bool const isPromise = element.name == "numberOfKeypoints";
            bool const hasRoom = readWhole(element.text) <= std::numeric_limits<std::uint32_t>::max();
            bool const isKept = element.word->parent == "curve" && (hasRoom || isPromise);
            _findings.take({element.place,
                            "the number " + element.text + " is out of the limits of '" + element.name +
                                "', 0 to " + std::to_string(element.word->greatest),
                            !isKept});
            if (!isPromise) {
                return;
            }
        }
        if (element.word->parent == "curve") {
            endPartOfCurve(element);
        } else if (element.word->parent == "keypoint") {
            endPartOfKeypoint(element);
        } else if (element.name == "curve") {
            endCurve(element);
        } else if (element.name == "parameter") {
            endChannel(element, _open, _findings);
        } else if (element.word->parent == "parameter") {
            endPartOfChannel(element);
        }
    }

    void endPartOfChannel(OpenElement const& element) {
        OpenElement& channel = _open.back();
        channel.flags->readElement(element.place, element.name, element.text);
        if (element.name == "foldFlags") {
            channel.folder.readFoldFlags(element.place,
                                         static_cast<std::uint32_t>(readWhole(element.text).value_or(0)));
            _findings.take(element.place, faultOfFoldFlags(*channel.example, element.text));
        } else if (element.word->text == TextKind::Length && *readTime(element.text) < kTempusZero) {
            _findings.lost(element.place, "the fade is below 0: it counts as 0");
        }
    }

    void endCurve(OpenElement const& curve) {
        Attributes const attributes = curve.attributeViews();
        checkAttributes(curve, attributes);
        _findings.take(curve.place, faultsOfCurveInChannel(attributes, _open.back().attributeViews()));
        if (curve.hasKeypoints && readWhole32(attributeOf(attributes, "type")).value_or(0) == 0) {
            _findings.lost(curve.place, "the curve is a constant: its keypoints are passed over");
        }
        if (curve.closedPlace && !curve.hasKeypoints) {
            _findings.lost(*curve.closedPlace, "there are no keypoints that it would close");
        }
        if (curve.limits.low > curve.limits.high) {
            _findings.kept(curve.limitPlace, "the least value, " + shortestText(curve.limits.low) +
                                                 ", is above the greatest, " +
                                                 shortestText(curve.limits.high));
        }
    }

    void endPartOfCurve(OpenElement const& element) {
        OpenElement& curve = _open.back();
        if (element.name == "min" || element.name == "max") {
            double const limit = *readNumber(element.text);
            (element.name == "min" ? curve.limits.low : curve.limits.high) = limit;
            curve.limitPlace = element.place;
            _findings.lost(element.place, faultOfLimit(element.name, limit, curve.curveClass));
        } else if (element.name == "keypoint") {
            curve.hasKeypoints = true;
            curve.takesBias |= element.keypoint->isSeen();
            curve.canBeClosed = true;
            _findings.take(element.keypoint->faultsAtEnd(element.place));
        } else if (element.name == "numberOfKeypoints") {
            curve.canBeClosed = true;
            curve.takesBias = true;
            _findings.lost(element.place,
                           curve.hasKeypoints ? "the number stands behind keypoints, which it clears" : "");
        } else if (element.name == "closed" && readBool(element.text) != false) {
            if (curve.canBeClosed) {
                curve.closedPlace = element.place;
                curve.takesBias = true;
            } else {
                _findings.lost(element.place, "there are no keypoints yet that it would close");
            }
        }
    }

    void endPartOfKeypoint(OpenElement const& element) {
        if (element.name == "value") {
            _findings.kept(element.place, faultOfNumber(element.text, _open[_open.size() - 2].limits));
        } else if (element.name == "time" && !_open.back().keypoint->hasValue()) {
            _findings.kept(element.place,
                           faultOfOrder(element.text, _countsFrames, _open[_open.size() - 2].lastTime));
        }
    }

    bool _countsFrames = false;
    /// How many elements are open in one that is passed over, itself counted.
    std::size_t _skipped = 0;
    std::vector<OpenElement> _open;
    DocumentClasses _classes;
    DocumentFindings _findings;
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

} // namespace lumenkey::tools
