#include "tools/import/MotionReaders.h"

#include "tools/output/TextForms.h"

#include <algorithm>
#include <charconv>
#include <optional>

namespace lumenkey::tools {

namespace {

constexpr std::array kKinds{MotionChannelKind::Xposition, MotionChannelKind::Yposition,
                            MotionChannelKind::Zposition, MotionChannelKind::Xrotation,
                            MotionChannelKind::Yrotation, MotionChannelKind::Zrotation};

std::optional<MotionChannelKind> channelKindNamed(std::string_view name) {
    for (MotionChannelKind const kind : kKinds) {
        if (sameWord(name, motionChannelKindName(kind))) {
            return kind;
        }
    }
    return std::nullopt;
}

/// Walks the joints with the stack of open ones in its hand, so that no depth of nesting costs stack.
class HierarchyReader {
public:
    HierarchyReader(MotionScanner& scanner, Motion& motion) : _scanner(scanner), _motion(motion) {}

    void read() {
        _scanner.expectWord("HIERARCHY");
        while (readStep()) {
        }
    }

private:
    /// A joint whose closing brace hasn't come yet.
    struct OpenJoint {
        std::size_t index;
        std::size_t position;
        bool hasOffset = false;
        bool hasChannels = false;
    };

    /// False after the word MOTION.
    bool readStep() {
        std::string_view const word = _scanner.word();
        if (_open.empty()) {
            return readOutsideJoints(word);
        }
        OpenJoint& joint = _open.back();
        if (sameWord(word, "OFFSET")) {
            readJointOffset(joint);
        } else if (sameWord(word, "CHANNELS")) {
            readChannels(joint);
        } else if (sameWord(word, "JOINT")) {
            openJoint(joint.index);
        } else if (sameWord(word, "End")) {
            readEndSite(joint.index);
        } else if (word == "}") {
            closeJoint(joint);
        } else {
            failInside(joint, word);
        }
        return true;
    }

    bool readOutsideJoints(std::string_view word) {
        if (sameWord(word, "ROOT")) {
            openJoint(MotionJoint::kNoParent);
            return true;
        }
        if (sameWord(word, "MOTION") && !_motion.joints.empty()) {
            return false;
        }
        if (word == "}") {
            _scanner.failAtToken("this brace closes nothing");
        }
        std::string const wanted = _motion.joints.empty() ? "ROOT" : "MOTION";
        _scanner.failAtToken((word.empty() ? "the file ends" : quoted(word) + " stands") + " where " +
                             wanted + " belongs");
    }

    [[noreturn]] void failInside(OpenJoint const& joint, std::string_view word) {
        std::string const where = "joint " + quoted(_motion.joints[joint.index].name) + " of line " +
                                  std::to_string(_scanner.lineAt(joint.position));
        if (word.empty()) {
            _scanner.failAtToken("the file ends inside " + where);
        }
        if (sameWord(word, "MOTION") || sameWord(word, "ROOT")) {
            _scanner.failAtToken(std::string(word) + " comes before the brace that closes " + where);
        }
        if (joint.hasChannels && channelKindNamed(word)) {
            _scanner.failAtToken(quoted(word) + " is one more channel than CHANNELS says");
        }
        _scanner.failAtToken(quoted(word) + " is unknown inside " + where);
    }

    void openJoint(std::size_t parent) {
        std::size_t const position = _scanner.tokenPosition();
        if (_open.size() >= kMotionDeepestJoint) {
            _scanner.failAtToken("joints stand more than " + std::to_string(kMotionDeepestJoint) + " deep");
        }
        std::string_view const name = _scanner.restOfLine();
        if (name.empty()) {
            _scanner.failAtToken("the name of the joint is missing");
        }
        if (name.size() > kMotionLongestName) {
            _scanner.failAtToken("the name of the joint has more than " + std::to_string(kMotionLongestName) +
                                 " bytes");
        }
        _scanner.expectWord("{");
        MotionJoint joint;
        joint.name = name;
        joint.parent = parent;
        joint.firstChannel = _motion.channels.size();
        _motion.joints.push_back(std::move(joint));
        _open.push_back({_motion.joints.size() - 1, position});
    }

    void closeJoint(OpenJoint const& joint) {
        if (!joint.hasOffset) {
            _scanner.failAtToken("joint " + quoted(_motion.joints[joint.index].name) + " has no OFFSET");
        }
        _open.pop_back();
    }

    std::array<double, 3> readOffset() {
        std::array<double, 3> offset{};
        for (double& coordinate : offset) {
            coordinate = _scanner.numberBeforeBrace();
        }
        return offset;
    }

    void readJointOffset(OpenJoint& joint) {
        if (joint.hasOffset) {
            _scanner.failAtToken("a second OFFSET of one joint");
        }
        joint.hasOffset = true;
        _motion.joints[joint.index].offset = readOffset();
    }

    void readChannels(OpenJoint& joint) {
        if (joint.hasChannels) {
            _scanner.failAtToken("a second CHANNELS of one joint");
        }
        joint.hasChannels = true;
        std::string_view const text = _scanner.word();
        std::size_t count = 0;
        auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), count);
        if (error != std::errc{} || end != text.data() + text.size()) {
            _scanner.failAtToken(text.empty() ? "the file ends where a count of channels belongs"
                                              : quoted(text) + " is not a count of channels");
        }
        if (count > kKinds.size()) {
            _scanner.failAtToken("a joint has at most " + std::to_string(kKinds.size()) + " channels");
        }
        MotionJoint& described = _motion.joints[joint.index];
        described.firstChannel = _motion.channels.size();
        described.channelCount = count;
        for (std::size_t i = 0; i < count; ++i) {
            readChannelName(joint.index, described.firstChannel, count);
        }
    }

    void readChannelName(std::size_t joint, std::size_t first, std::size_t count) {
        std::string_view const name = _scanner.word();
        std::optional<MotionChannelKind> const kind = channelKindNamed(name);
        if (!kind) {
            std::size_t const before = _motion.channels.size() - first;
            bool const cut = name.empty() || name == "{" || name == "}" || sameWord(name, "JOINT") ||
                             sameWord(name, "End") || sameWord(name, "OFFSET");
            _scanner.failAtToken(cut ? "CHANNELS says " + std::to_string(count) + ", but " +
                                           std::to_string(before) + " names follow"
                                     : quoted(name) + " is no channel of a joint");
        }
        for (std::size_t i = first; i < _motion.channels.size(); ++i) {
            if (_motion.channels[i].kind == *kind) {
                _scanner.failAtToken(quoted(name) + " stands twice in one joint");
            }
        }
        _motion.channels.push_back({joint, *kind});
    }

    void readEndSite(std::size_t joint) {
        _scanner.expectWord("Site");
        _scanner.expectWord("{");
        _scanner.expectWord("OFFSET");
        _motion.endSites.push_back({joint, readOffset()});
        _scanner.expectWord("}");
    }

    MotionScanner& _scanner;
    Motion& _motion;
    std::vector<OpenJoint> _open;
};

} // namespace

std::string_view motionChannelKindName(MotionChannelKind kind) {
    switch (kind) {
    case MotionChannelKind::Xposition:
        return "Xposition";
    case MotionChannelKind::Yposition:
        return "Yposition";
    case MotionChannelKind::Zposition:
        return "Zposition";
    case MotionChannelKind::Xrotation:
        return "Xrotation";
    case MotionChannelKind::Yrotation:
        return "Yrotation";
    case MotionChannelKind::Zrotation:
        return "Zrotation";
    }
    return "";
}

bool isRotation(MotionChannelKind kind) {
    return kind == MotionChannelKind::Xrotation || kind == MotionChannelKind::Yrotation ||
           kind == MotionChannelKind::Zrotation;
}

void readMotionHierarchy(MotionScanner& scanner, Motion& motion) { HierarchyReader(scanner, motion).read(); }

} // namespace lumenkey::tools
