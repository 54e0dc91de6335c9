#include "tools/import/ChannelFile.h"

#include "tools/import/CsvTree.h"
#include "tools/import/MotionTree.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <filesystem>
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

Tempus frameDurationOf(ChannelTree const& document) {
    std::optional<Tempus> const stored = storedFrameDuration(document);
    return stored ? *stored : frameDurationOfKeypoints(document);
}

ChannelFile openDocument(DocumentFile document, std::string const& file,
                         std::optional<Tempus> const& frameDuration) {
    ChannelFile opened;
    opened.file = file;
    opened.format = ChannelFormat::Document;
    opened.tree = std::move(document.tree);
    opened.document = std::move(document);
    opened.frameDuration = frameDuration ? *frameDuration : frameDurationOf(*opened.tree);
    opened.firstTime = kTempusZero;
    opened.lastTime = kTempusZero;
    if (std::optional<KeypointEnds> const keyed = opened.tree->keyedRange()) {
        opened.firstTime = keyed->first;
        opened.lastTime = keyed->last;
    }
    opened.duration = opened.lastTime - opened.firstTime;
    return opened;
}

} // namespace

std::string_view channelFormatName(ChannelFormat format) {
    switch (format) {
    case ChannelFormat::Motion:
        return "BVH";
    case ChannelFormat::Csv:
        return "CSV";
    case ChannelFormat::Document:
        return "document";
    }
    return "";
}

std::optional<ChannelFormat> channelFormatNamed(std::string_view file) {
    constexpr std::pair<std::string_view, ChannelFormat> endings[] = {
        {".csv", ChannelFormat::Csv}, {".bvh", ChannelFormat::Motion}, {".lumen", ChannelFormat::Document}};
    for (auto const& [ending, format] : endings) {
        if (sameWord(file.substr(file.size() - std::min(file.size(), ending.size())), ending)) {
            return format;
        }
    }
    return std::nullopt;
}

ChannelFormat channelFormatOf(std::string_view text, std::string_view file) {
    if (std::optional<ChannelFormat> const named = channelFormatNamed(file)) {
        return *named;
    }
    if (looksLikeDocument(text)) {
        return ChannelFormat::Document;
    }
    bool const hasComma = text.substr(0, text.find('\n')).find(',') != std::string_view::npos;
    return hasComma ? ChannelFormat::Csv : ChannelFormat::Motion;
}

ChannelFile openChannelFile(std::string const& file, ReadingProgress const& progress,
                            std::optional<Tempus> const& frameDuration) {
    std::error_code missing;
    bool const isReadOnce =
        std::filesystem::exists(file, missing) && !std::filesystem::is_regular_file(file, missing);
    if (channelFormatNamed(file) == ChannelFormat::Document && !isReadOnce) {
        Tempus const counted = frameDuration.value_or(defaultFrameDuration());
        return openDocument(readDocumentFile(file, counted, progress), file, frameDuration);
    }
    std::string text = readInputText(file);
    ChannelFile opened = openChannelText(text, file, progress, frameDuration);
    if (isReadOnce && opened.format == ChannelFormat::Document) {
        opened.document.text = std::move(text);
    }
    return opened;
}

ChannelFile openChannelText(std::string_view text, std::string const& file, ReadingProgress const& progress,
                            std::optional<Tempus> const& frameDuration) {
    Tempus const counted = frameDuration.value_or(defaultFrameDuration());
    switch (channelFormatOf(text, file)) {
    case ChannelFormat::Csv:
        return openCsv(text, file, progress);
    case ChannelFormat::Document:
        return openDocument(readDocumentText(text, file, counted, progress), file, frameDuration);
    default:
        return openMotion(text, file, progress);
    }
}

} // namespace lumenkey::tools
