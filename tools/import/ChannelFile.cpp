#include "tools/import/ChannelFile.h"

#include "tools/import/CsvTree.h"
#include "tools/import/MotionScanner.h"
#include "tools/import/MotionTree.h"

#include <algorithm>
#include <utility>

namespace lumenkey::tools {

namespace {

ChannelFile openMotion(std::string_view text, std::string const& file, ReadingProgress const& progress) {
    Motion motion = readMotionText(text, file, progress);
    ChannelFile opened;
    opened.file = file;
    opened.format = ChannelFormat::Motion;
    opened.joints = motion.joints.size();
    opened.rows = motion.frameCount;
    opened.frameDuration = motion.frameDuration;
    opened.firstTime = kTempusZero;
    opened.lastTime = motion.frameCount == 0 ? kTempusZero : motion.timeOfFrame(motion.frameCount - 1);
    opened.duration = motion.timeOfFrame(motion.frameCount);
    MotionTree made = treeOfMotion(motion);
    opened.tree = std::move(made.tree);
    opened.columns = std::move(made.columns);
    motion.values = {};
    opened.skeleton = std::move(motion);
    return opened;
}

ChannelFile openCsv(std::string_view text, std::string const& file, ReadingProgress const& progress) {
    CsvFile table = readCsvText(text, file, progress);
    ChannelFile opened;
    opened.file = file;
    opened.format = ChannelFormat::Csv;
    opened.rows = table.times.size();
    opened.frameDuration = rowDuration(table);
    opened.firstTime = table.times.empty() ? kTempusZero : table.times.front();
    opened.lastTime = table.times.empty() ? kTempusZero : table.times.back();
    opened.duration = opened.lastTime - opened.firstTime;
    opened.tree = treeOfCsv(table);
    opened.rowTimes = std::move(table.times);
    return opened;
}

ChannelFormat formatOf(std::string_view text, std::string_view file) {
    if (std::optional<ChannelFormat> const named = channelFormatNamed(file)) {
        return *named;
    }
    bool const hasComma = text.substr(0, text.find('\n')).find(',') != std::string_view::npos;
    return hasComma ? ChannelFormat::Csv : ChannelFormat::Motion;
}

} // namespace

std::optional<ChannelFormat> channelFormatNamed(std::string_view file) {
    std::string_view const ending = file.substr(file.size() - std::min<std::size_t>(file.size(), 4));
    if (sameWord(ending, ".csv")) {
        return ChannelFormat::Csv;
    }
    return sameWord(ending, ".bvh") ? std::optional(ChannelFormat::Motion) : std::nullopt;
}

ChannelFile openChannelFile(std::string const& file, ReadingProgress const& progress) {
    std::string const text = readInputText(file);
    return formatOf(text, file) == ChannelFormat::Csv ? openCsv(text, file, progress)
                                                      : openMotion(text, file, progress);
}

} // namespace lumenkey::tools
