#pragma once

#include "tools/cli/EditVerb.h"
#include "tools/edit/CurveChange.h"
#include "tools/export/ChannelFileWriter.h"
#include "tools/output/OutputSink.h"

#include <string>
#include <vector>

namespace lumenkey::tools {

struct EditedChannel {
    std::string channel;
    std::string unit;
    std::size_t keypointsBefore = 0;
    std::size_t keypointsAfter = 0;
    CurveChange change{};
};

/// What a verb that writes did.
struct EditReport {
    EditWords words;
    std::string output;
    ChannelFormat format{};
    TimeSpan span;
    WrittenRows written;
    std::vector<EditedChannel> channels;

    /// Keypoints before and after, and the largest difference in each unit, on one line.
    std::string summary() const;
    void writeTable(OutputSink& out) const;
    void writeJson(OutputSink& out) const;
};

} // namespace lumenkey::tools
