#include "tools/import/ChannelFile.h"

#include "tools/import/CsvTree.h"
#include "tools/import/MotionScanner.h"
#include "tools/import/MotionTree.h"

#include <algorithm>

namespace lumenkey::tools {

namespace {

ChannelFile openMotion(std::string_view text, std::string const& file, ReadingProgress const& progress) {
    Motion const motion = readMotionText(text, file, progress);
    ChannelFile opened;
    opened.file = file;
    opened.format = ChannelFormat::Motion;
    opened.joints = motion.joints.size();
    opened.rows = motion.frameCount;
    opened.frameDuration = motion.frameDuration;
    opened.firstTime = kTempusZero;
    opened.lastTime = motion.frameCount == 0 ? kTempusZero : motion.timeOfFrame(motion.frameCount - 1);
    opened.duration = motion.timeOfFrame(motion.frameCount);
    opened.tree = treeOfMotion(motion);
    return opened;
}

ChannelFile openCsv(std::string_view text, std::string const& file, ReadingProgress const& progress) {
    CsvFile const table = readCsvText(text, file, progress);
    ChannelFile opened;
    opened.file = file;
    opened.format = ChannelFormat::Csv;
    opened.rows = table.times.size();
    opened.frameDuration = rowDuration(table);
    opened.firstTime = table.times.empty() ? kTempusZero : table.times.front();
    opened.lastTime = table.times.empty() ? kTempusZero : table.times.back();
    opened.duration = opened.lastTime - opened.firstTime;
    opened.tree = treeOfCsv(table);
    return opened;
}

bool isTable(std::string_view text, std::string_view file) {
    std::string_view const ending = file.substr(file.size() - std::min<std::size_t>(file.size(), 4));
    if (sameWord(ending, ".csv") || sameWord(ending, ".bvh")) {
        return sameWord(ending, ".csv");
    }
    return text.substr(0, text.find('\n')).find(',') != std::string_view::npos;
}

} // namespace

ChannelFile openChannelFile(std::string const& file, ReadingProgress const& progress) {
    std::string const text = readInputText(file);
    return isTable(text, file) ? openCsv(text, file, progress) : openMotion(text, file, progress);
}

} // namespace lumenkey::tools
