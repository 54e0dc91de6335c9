#pragma once

#include "tools/import/InputText.h"
#include "tools/import/MotionFile.h"
#include "tools/tree/ChannelTree.h"

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

enum class ChannelFormat { Motion, Csv };

/// A file opened as a tree of channels, and what else there is to tell about it.
struct ChannelFile {
    std::string file;
    ChannelFormat format{};
    /// Of a motion.
    std::size_t joints = 0;
    /// Frames of a motion, rows of a table.
    std::size_t rows = 0;
    /// Invalid where the rows of a table aren't evenly spaced.
    Tempus frameDuration{};
    /// Both zero without rows.
    Tempus firstTime{};
    Tempus lastTime{};
    /// From the first time on: all frames of a motion, the last one to its end; of a table, to the last row.
    Tempus duration{};
    std::unique_ptr<ChannelTree> tree;
    /// Of a motion, what its file says beside the frames, which are left out here.
    Motion skeleton;
    /// Of a motion: the value channel of each column.
    std::vector<ChannelTree::Node> columns;
    /// Of a table.
    std::vector<Tempus> rowTimes;
};

/// What the end of a name tells: `.csv` or `.bvh`, in any case.
std::optional<ChannelFormat> channelFormatNamed(std::string_view file);

/// A name that ends in `.csv` is that of a table, one that ends in `.bvh` of a motion. Otherwise the content tells:
/// a table has a comma in its first line. Throws `InputError`.
ChannelFile openChannelFile(std::string const& file, ReadingProgress const& progress = {});

} // namespace lumenkey::tools
