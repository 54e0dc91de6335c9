#include "tools/compare/TreeDifference.h"

#include "lumenkey/Channels/KFChannelFlags.h"
#include "lumenkey/foundation/BXHashWriteStream.h"
#include "tools/output/TextForms.h"

#include <algorithm>
#include <map>
#include <optional>
#include <utility>
#include <vector>

namespace lumenkey::tools {

namespace {

using Node = ChannelTree::Node;

/// The name, and which of those that have it.
using Key = std::pair<std::string, std::size_t>;

std::map<Key, Node> nodesByName(ChannelTree const& tree) {
    std::map<std::string, std::size_t> counts;
    std::map<Key, Node> nodes;
    for (Node node = ChannelTree::kTop; node < tree.count(); ++node) {
        std::string name = node == ChannelTree::kTop ? tree.path(node) : tree.dottedName(node);
        std::size_t const place = counts[name]++;
        nodes.emplace(Key{std::move(name), place}, node);
    }
    return nodes;
}

std::array<std::uint8_t, 16> digestOf(KFCurve& curve) {
    BXHashWriteStream stream;
    curve.writeHeader(stream, false);
    curve.writeBody(stream, false, true, true);
    stream.endElement();
    return stream.getHash();
}

std::string fadesText(KFChannel const& channel) {
    return timeText(channel.getFadeInOffset()) + " (" + std::to_string(channel.getFadeInCurve()) + "), " +
           timeText(channel.getFadeOutOffset()) + " (" + std::to_string(channel.getFadeOutCurve()) + ")";
}

/// One run.
class Comparison {
public:
    Comparison(ChannelTree const& before, ChannelTree const& after, bool haveNamedTops, TimeSpan const& span,
               Tempus const& step)
        : _before(before), _after(after), _haveNamedTops(haveNamedTops), _span(span), _step(step) {}

    std::vector<NodeDifference> run(ReadingProgress const& progress) {
        std::map<Key, Node> const old = nodesByName(_before);
        std::map<Key, Node> const now = nodesByName(_after);
        setPlaces(old, now);
        std::vector<std::pair<Node, Key>> ordered;
        for (auto const& [key, node] : now) {
            ordered.emplace_back(node, key);
        }
        std::sort(ordered.begin(), ordered.end());
        for (auto const& [node, key] : ordered) {
            if (progress) {
                progress(static_cast<double>(node) / static_cast<double>(ordered.size()));
            }
            auto const found = old.find(key);
            if (found == old.end()) {
                _all.push_back({DifferenceKind::Added, key.first, {}, {}, {}});
            } else {
                compare(key.first, found->second, node);
            }
        }
        ordered.clear();
        for (auto const& [key, node] : old) {
            if (!now.contains(key)) {
                ordered.emplace_back(node, key);
            }
        }
        std::sort(ordered.begin(), ordered.end());
        for (auto const& [node, key] : ordered) {
            _all.push_back({DifferenceKind::Removed, key.first, {}, {}, {}});
        }
        return std::move(_all);
    }

private:
    /// Numbers the children of each folder that both trees have in it, in the order of either tree.
    void setPlaces(std::map<Key, Node> const& old, std::map<Key, Node> const& now) {
        std::vector<std::optional<Node>> oldOf(_after.count());
        for (auto const& [key, node] : now) {
            if (auto const found = old.find(key); found != old.end()) {
                oldOf[node] = found->second;
            }
        }
        std::vector<bool> isShared(_before.count());
        _placeAfter = places(_after, [&](Node node) {
            bool const stayed = oldOf[node] && oldOf[_after.parent(node)] == _before.parent(*oldOf[node]);
            if (stayed) {
                isShared[*oldOf[node]] = true;
            }
            return stayed;
        });
        _placeBefore = places(_before, [&](Node node) { return isShared[node]; });
    }

    /// From 1 on; 0 for the top, and for what doesn't count.
    template <class Counts> static std::vector<std::size_t> places(ChannelTree const& tree, Counts counts) {
        std::vector<std::size_t> places(tree.count());
        std::vector<std::size_t> children(tree.count());
        for (Node node = ChannelTree::kTop + 1; node < tree.count(); ++node) {
            if (counts(node)) {
                places[node] = ++children[tree.parent(node)];
            }
        }
        return places;
    }

    void detail(std::string const& what, std::string const& before, std::string const& after) {
        if (before != after) {
            _details.push_back(what + " " + before + " became " + after);
        }
    }

    void compare(std::string const& name, Node old, Node now) {
        KFChannelBase const& before = _before.base(old);
        KFChannelBase const& after = _after.base(now);
        _details.clear();
        if (now == ChannelTree::kTop && _haveNamedTops) {
            detail("name", before.getName().str(), after.getName().str());
        }
        detail("place among its siblings", std::to_string(_placeBefore[old]),
               std::to_string(_placeAfter[now]));
        detail("class", _before.typeName(old), _after.typeName(now));
        detail("ID", std::to_string(before.getID()), std::to_string(after.getID()));
        auto const flagsOf = [](KFChannelBase const& channel) {
            return std::to_string(channel.getFlags() & ~kChannelNonStateFlags);
        };
        detail("flags", flagsOf(before), flagsOf(after));
        if (KFChannelFolder const* const folder = _before.asFolder(old)) {
            if (KFChannelFolder const* const other = _after.asFolder(now)) {
                detail("folder flags", std::to_string(folder->getFoldFlags()),
                       std::to_string(other->getFoldFlags()));
            }
        }
        auto const* const root = dynamic_cast<KFChannelObjectRootBase const*>(&before);
        auto const* const otherRoot = dynamic_cast<KFChannelObjectRootBase const*>(&after);
        if (root != nullptr && otherRoot != nullptr) {
            detail("time offset", timeText(root->getTimeOffset()), timeText(otherRoot->getTimeOffset()));
            detail("extent", extentText(*root), extentText(*otherRoot));
        }
        NodeDifference difference{DifferenceKind::Changed, name, {}, {}, {}};
        if (_before.isChannel(old) && _after.isChannel(now)) {
            difference.curve = compareCurves(old, now);
            difference.unit = _after.unit(now);
        }
        difference.details = _details;
        if (difference.curve || !difference.details.empty()) {
            _all.push_back(std::move(difference));
        }
    }

    /// As it stands in documents, which is without the last frame.
    static std::string extentText(KFChannelObjectRootBase const& root) {
        BXTimeRange const extent = root.getTimeExtent();
        return timeText(extent.start) + ".." + timeText(TempusRangeGetEnd(extent) - root.getFrameDuration());
    }

    std::optional<CurveChange> compareCurves(Node old, Node now) {
        detail("default", shortestText(_before.channel(old).getDefaultValue()),
               shortestText(_after.channel(now).getDefaultValue()));
        detail("fades", fadesText(_before.channel(old)), fadesText(_after.channel(now)));
        KFCurve& before = _before.curve(old);
        KFCurve& after = _after.curve(now);
        if (digestOf(before) == digestOf(after)) {
            return std::nullopt;
        }
        CurveChange change = changeBetween(before, after, _span, _step);
        compareAtKeypoints(before, after, change);
        detail("number of keypoints", std::to_string(before.getNumberOfKeypoints()),
               std::to_string(after.getNumberOfKeypoints()));
        if (change.most > 0) {
            return change;
        }
        if (before.getNumberOfKeypoints() == after.getNumberOfKeypoints()) {
            _details.push_back("keypoints or settings of a curve with the same values");
        }
        return std::nullopt;
    }

    ChannelTree const& _before;
    ChannelTree const& _after;
    bool _haveNamedTops;
    TimeSpan const& _span;
    Tempus const& _step;
    std::vector<std::size_t> _placeBefore;
    std::vector<std::size_t> _placeAfter;
    std::vector<std::string> _details;
    std::vector<NodeDifference> _all;
};

} // namespace

std::vector<NodeDifference> differencesBetween(ChannelTree const& before, ChannelTree const& after,
                                               bool haveNamedTops, TimeSpan const& span, Tempus const& step,
                                               ReadingProgress const& progress) {
    return Comparison(before, after, haveNamedTops, span, step).run(progress);
}

} // namespace lumenkey::tools
