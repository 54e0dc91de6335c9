#include "tools/export/MotionWriter.h"

#include "tools/output/TextForms.h"

#include <algorithm>
#include <limits>

namespace lumenkey::tools {

namespace {

/// Walks the joints, which stand in the order of their text, with the stack of open ones in its hand, so that
/// no depth of nesting costs stack.
class HierarchyWriter {
public:
    HierarchyWriter(Motion const& motion, OutputSink& out)
        : _motion(motion), _out(out), _firstColumnBelow(motion.joints.size(), kNoColumn),
          _endSites(motion.joints.size()) {
        for (std::size_t i = motion.joints.size(); i-- > 0;) {
            MotionJoint const& joint = motion.joints[i];
            std::size_t& first = _firstColumnBelow[i];
            first = std::min(first, joint.channelCount > 0 ? joint.firstChannel : kNoColumn);
            if (joint.parent != MotionJoint::kNoParent) {
                std::size_t& above = _firstColumnBelow[joint.parent];
                above = std::min(above, first);
            }
        }
        for (MotionEndSite const& site : motion.endSites) {
            _endSites[site.joint].push_back(&site);
        }
    }

    void write() {
        _text = "HIERARCHY\n";
        for (std::size_t i = 0; i < _motion.joints.size(); ++i) {
            while (!_open.empty() && _open.back().joint != _motion.joints[i].parent) {
                closeJoint();
            }
            openJoint(i);
        }
        while (!_open.empty()) {
            closeJoint();
        }
        _out.write(_text);
    }

private:
    static constexpr std::size_t kNoColumn = std::numeric_limits<std::size_t>::max();

    struct OpenJoint {
        std::size_t joint;
        bool hasChannels;
    };

    void line(std::string const& text) { _text += std::string(_open.size(), '\t') + text + "\n"; }

    void openJoint(std::size_t index) {
        // A joint may name its channels behind its children; the columns of the frames follow the text.
        if (!_open.empty() && _motion.joints[_open.back().joint].firstChannel < _firstColumnBelow[index]) {
            writeChannels(_open.back());
        }
        MotionJoint const& joint = _motion.joints[index];
        line((joint.parent == MotionJoint::kNoParent ? "ROOT " : "JOINT ") + joint.name);
        line("{");
        _open.push_back({index, joint.channelCount == 0});
        line(offsetText(joint.offset));
    }

    void closeJoint() {
        writeChannels(_open.back());
        for (MotionEndSite const* const site : _endSites[_open.back().joint]) {
            line("End Site");
            line("{");
            line("\t" + offsetText(site->offset));
            line("}");
        }
        _open.pop_back();
        line("}");
    }

    void writeChannels(OpenJoint& open) {
        if (open.hasChannels) {
            return;
        }
        open.hasChannels = true;
        MotionJoint const& joint = _motion.joints[open.joint];
        std::string text = "CHANNELS " + std::to_string(joint.channelCount);
        for (std::size_t i = 0; i < joint.channelCount; ++i) {
            text += " ";
            text += motionChannelKindName(_motion.channels[joint.firstChannel + i].kind);
        }
        line(text);
    }

    static std::string offsetText(std::array<double, 3> const& offset) {
        return "OFFSET " + shortestText(offset[0]) + " " + shortestText(offset[1]) + " " +
               shortestText(offset[2]);
    }

    Motion const& _motion;
    OutputSink& _out;
    std::string _text;
    /// Of a joint and all that hangs from it.
    std::vector<std::size_t> _firstColumnBelow;
    std::vector<std::vector<MotionEndSite const*>> _endSites;
    std::vector<OpenJoint> _open;
};

void writeFrames(Motion const& motion, OutputSink& out, std::function<void(double)> const& progress) {
    out.write("MOTION\nFrames: " + std::to_string(motion.frameCount) +
              "\nFrame Time: " + motion.frameTimeText + "\n");
    std::size_t const width = motion.channels.size();
    std::string line;
    for (std::size_t frame = 0; frame < motion.frameCount && width > 0; ++frame) {
        line.clear();
        for (std::size_t i = 0; i < width; ++i) {
            appendShortest(line, motion.value(frame, i));
            line += i + 1 < width ? ' ' : '\n';
        }
        out.write(line);
        if (progress) {
            progress(static_cast<double>(frame) / static_cast<double>(motion.frameCount));
        }
    }
}

} // namespace

void writeMotionText(Motion const& motion, OutputSink& out, std::function<void(double)> const& progress) {
    HierarchyWriter(motion, out).write();
    writeFrames(motion, out, progress);
}

} // namespace lumenkey::tools
