#include "tools/generate/MotionText.h"

#include <array>
#include <charconv>

namespace lumenkey::generate {

namespace {

std::string fixedText(double value, int decimals) {
    std::array<char, 400> buffer{};
    auto const result = std::to_chars(buffer.data(), buffer.data() + buffer.size(), value,
                                      std::chars_format::fixed, decimals);
    return {buffer.data(), static_cast<std::size_t>(result.ptr - buffer.data())};
}

std::string offsetLine(std::string const& indent, std::array<double, 3> const& offset) {
    return indent + "OFFSET " + fixedText(offset[0], 4) + " " + fixedText(offset[1], 4) + " " +
           fixedText(offset[2], 4) + "\n";
}

/// A joint with everything below it; `depth` tabs stand before each line. Ribbons are short, so the depth is
/// small.
std::string jointText(std::vector<WalkingJoint> const& joints,
                      std::vector<std::vector<std::size_t>> const& children, std::size_t index,
                      std::size_t depth) {
    WalkingJoint const& joint = joints[index];
    std::string const outer(depth, '\t');
    std::string const inner(depth + 1, '\t');
    std::string text = outer + (index == 0 ? "ROOT " : "JOINT ") + joint.name + "\n" + outer + "{\n";
    text += offsetLine(inner, joint.offset);
    text += inner + (index == 0 ? "CHANNELS 6 Xposition Yposition Zposition " : "CHANNELS 3 ") +
            "Zrotation Xrotation Yrotation\n";
    for (std::size_t const child : children[index]) {
        text += jointText(joints, children, child, depth + 1);
    }
    if (children[index].empty()) {
        text += inner + "End Site\n" + inner + "{\n" + offsetLine(inner + "\t", joint.end) + inner + "}\n";
    }
    return text + outer + "}\n";
}

std::string hierarchyText(std::vector<WalkingJoint> const& joints, std::vector<std::size_t>& order) {
    std::vector<std::vector<std::size_t>> children(joints.size());
    for (std::size_t i = 1; i < joints.size(); ++i) {
        children[static_cast<std::size_t>(joints[i].parent)].push_back(i);
    }
    // The columns of a frame stand in the order of the text: a joint, then what hangs from it.
    std::vector<std::size_t> open{0};
    while (!open.empty()) {
        std::size_t const index = open.back();
        open.pop_back();
        order.push_back(index);
        open.insert(open.end(), children[index].rbegin(), children[index].rend());
    }
    return "HIERARCHY\n" + jointText(joints, children, 0, 0);
}

std::string frameText(WalkCycle const& walk, std::vector<std::size_t> const& order, double seconds) {
    std::string line;
    for (double const coordinate : walk.position(seconds)) {
        line += fixedText(coordinate, 4) + " ";
    }
    for (std::size_t const joint : order) {
        for (double const angle : walk.rotation(joint, seconds)) {
            line += fixedText(angle, 4) + " ";
        }
    }
    line.back() = '\n';
    return line;
}

} // namespace

bool writeMotion(WalkCycle const& walk, std::uint64_t frameCount, FrameRate const& rate,
                 std::function<bool(std::string_view)> const& out) {
    std::vector<std::size_t> order;
    double const frameSeconds = static_cast<double>(rate.seconds) / rate.frames;
    if (!out(hierarchyText(walk.joints(), order) + "MOTION\nFrames: " + std::to_string(frameCount) +
             "\nFrame Time: " + fixedText(frameSeconds, 7) + "\n")) {
        return false;
    }
    for (std::uint64_t i = 0; i < frameCount; ++i) {
        if (!out(frameText(walk, order, static_cast<double>(i) * frameSeconds))) {
            return false;
        }
    }
    return true;
}

} // namespace lumenkey::generate
