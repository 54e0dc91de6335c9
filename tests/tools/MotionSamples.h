#pragma once

// Small motion files for the tests of the program.

#include "tools/import/MotionFile.h"

#include <cstddef>
#include <ios>
#include <locale>
#include <sstream>
#include <string>
#include <string_view>

namespace lumenkey::tools::samples {

/// Two joints, nine channels, three frames: everything a file has, as small as can be.
inline constexpr std::string_view kSmallMotion =
    "HIERARCHY\n"
    "ROOT Hips\n"
    "{\n"
    "\tOFFSET 0 1.5 -2\n"
    "\tCHANNELS 6 Xposition Yposition Zposition Zrotation Xrotation Yrotation\n"
    "\tJOINT LeftLeg\n"
    "\t{\n"
    "\t\tOFFSET 3.5 0 0\n"
    "\t\tCHANNELS 3 Zrotation Xrotation Yrotation\n"
    "\t\tEnd Site\n"
    "\t\t{\n"
    "\t\t\tOFFSET 0 -10 0\n"
    "\t\t}\n"
    "\t}\n"
    "}\n"
    "MOTION\n"
    "Frames: 3\n"
    "Frame Time: .0083333\n"
    "0 90 1 10 20 30 0 -45 90\n"
    "1 91.5 2 11 21 31 5 -40 95\n"
    "4 92 3 12 22 32 10 -30 180\n";

/// The first part of the text replaced, for files with one fault; nothing may be missing.
inline std::string replaced(std::string_view text, std::string_view what, std::string_view by) {
    std::string changed(text);
    std::size_t const place = changed.find(what);
    if (place == std::string::npos) {
        return "the sample doesn't hold what was to be replaced";
    }
    return changed.replace(place, what.size(), by);
}

/// Everything but the name of the file, numbers to the last bit.
inline std::string described(Motion const& motion) {
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text << std::hexfloat << motion.frameDuration.value << "/" << motion.frameDuration.timescale << "\n";
    for (MotionJoint const& joint : motion.joints) {
        text << joint.name << " in " << static_cast<std::ptrdiff_t>(joint.parent) << " at";
        for (double const coordinate : joint.offset) {
            text << " " << coordinate;
        }
        for (std::size_t i = 0; i < joint.channelCount; ++i) {
            text << " " << joint.firstChannel + i << "="
                 << motionChannelKindName(motion.channels[joint.firstChannel + i].kind);
        }
        text << "\n";
    }
    for (MotionEndSite const& site : motion.endSites) {
        text << "end of " << site.joint << " " << site.offset[0] << " " << site.offset[1] << " "
             << site.offset[2] << "\n";
    }
    for (double const value : motion.values) {
        text << value << " ";
    }
    return text.str() + std::to_string(motion.frameCount);
}

} // namespace lumenkey::tools::samples
