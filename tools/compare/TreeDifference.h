#pragma once

#include "tools/edit/CurveChange.h"
#include "tools/import/InputText.h"
#include "tools/tree/ChannelTree.h"

#include <optional>
#include <string>
#include <vector>

namespace lumenkey::tools {

enum class DifferenceKind { Added, Removed, Changed };

/// How a node differs between two trees.
struct NodeDifference {
    DifferenceKind kind{};
    /// Its dotted name; that of the top is `./`.
    std::string name;
    /// What else has changed than the shape of its curve: `class Double became Angle`, and so on.
    std::vector<std::string> details;
    /// Where the curves lie farthest apart, if they do.
    std::optional<CurveChange> curve;
    std::string unit;
};

/// Compares nodes that have the same dotted name; of several with one name the first with the first, and so
/// on. The place of a node is that among the siblings which both trees have. The name of the top itself
/// counts where `haveNamedTops`: that of a table or a motion is only that of its file.
///
/// Curves are compared over the span, at every `step` (`changeBetween`), and at and beside their keypoints.
/// In the order of the second tree, with what it lacks behind.
std::vector<NodeDifference> differencesBetween(ChannelTree const& before, ChannelTree const& after,
                                               bool haveNamedTops, TimeSpan const& span, Tempus const& step,
                                               ReadingProgress const& progress);

} // namespace lumenkey::tools
