#include "tools/tree/ChannelTree.h"

#include "tools/tree/FileRoot.h"

#include <algorithm>
#include <utility>

namespace lumenkey::tools {

namespace {

constexpr std::string_view kTopPath = "./";

} // namespace

// --- Building ---

ChannelTree::ChannelTree(std::string const& name, Tempus const& frameDuration) {
    auto root = std::make_unique<FileRoot>(name, 1, frameDuration);
    KFChannelBase* const top = root.get();
    _entries.push_back({top, std::move(root), kTop, 0, 0, kTop + 1});
}

ChannelTree::ChannelTree(std::unique_ptr<KFChannelBase> top) {
    KFChannelBase* const channel = top.get();
    _entries.push_back({channel, std::move(top), kTop, 0, 0, kTop + 1});
    adoptBelow(kTop);
    setEnds();
}

ChannelTree::~ChannelTree() {
    // Children before their folders; what a folder still lists then is never looked at.
    while (!_entries.empty()) {
        _entries.pop_back();
    }
}

unsigned ChannelTree::nextID(Node parent) const {
    return static_cast<unsigned>(folder(parent).getNumberOfDescendants()) + 1;
}

ChannelTree::Node ChannelTree::add(Node parent, KFChannelBase* channel,
                                   std::unique_ptr<KFChannelBase> owned) {
    Entry const& above = _entries[parent];
    std::size_t const dot = parent == kTop ? 0 : 1;
    std::size_t const nameLength = above.nameLength + dot + channel->getName().size();
    _entries.push_back({channel, std::move(owned), parent, above.depth + 1, nameLength, _entries.size() + 1});
    return _entries.size() - 1;
}

ChannelTree::Node ChannelTree::add(Node parent, std::unique_ptr<KFChannelBase> channel) {
    KFChannelBase* const added = channel.get();
    return add(parent, added, std::move(channel));
}

/// By the class's own number of children, which stand in front of those that were added.
void ChannelTree::adoptBelow(Node node) {
    KFChannelFolder* const above = asFolder(node);
    if (above == nullptr || above->getDescendants() == nullptr) {
        return;
    }
    std::vector<KFChannelBase*> const children = *above->getDescendants();
    std::unique_ptr<KFChannelBase> const made = exampleOf(above->getFactory());
    auto const* const example = dynamic_cast<KFChannelFolder const*>(made.get());
    std::size_t const components = example == nullptr ? 0 : example->getNumberOfDescendants();
    for (std::size_t i = 0; i < children.size(); ++i) {
        std::unique_ptr<KFChannelBase> owned(i < components ? nullptr : children[i]);
        adoptBelow(add(node, children[i], std::move(owned)));
    }
}

void ChannelTree::setEnds() {
    for (Node node = kTop; node < count(); ++node) {
        _entries[node].end = node + 1;
    }
    for (Node node = count() - 1; node != kTop; --node) {
        Entry& above = _entries[_entries[node].parent];
        above.end = std::max(above.end, _entries[node].end);
    }
}

ChannelTree::Node ChannelTree::addFolder(Node parent, std::string const& name) {
    unsigned const id = nextID(parent);
    return add(parent, std::make_unique<KFChannelFolder>(name, &folder(parent), id, 0, 0));
}

ChannelTree::Node ChannelTree::addChannel(Node parent, std::string const& name, ValueType type) {
    unsigned const id = nextID(parent);
    if (type == ValueType::Angle) {
        return add(parent, std::make_unique<KFChannelAngle>(name, &folder(parent), id, 0));
    }
    return add(parent, std::make_unique<KFChannelDouble>(name, &folder(parent), id, 0));
}

void ChannelTree::setKeypoints(Node node, std::vector<Tempus> const& times,
                               std::vector<double> const& values) {
    // Room for one makes the curve a spline also where no keypoint follows.
    channel(node).willLoadKeyframes(true, static_cast<int>(std::max<std::size_t>(times.size(), 1)));
    channel(node).appendKeyframes(static_cast<unsigned>(times.size()), times.data(), values.data(), false);
    channel(node).willLoadKeyframes(false, 0);
}

void ChannelTree::finish(BXTimeRange const& extent) {
    setEnds();
    static_cast<KFChannelObjectRootBase&>(base(kTop)).setTimeExtent(extent, true);
    base(kTop).finishInitializing();
}

// --- Changing ---

ChannelTree::Node ChannelTree::append(Node parent, std::unique_ptr<KFChannelBase> channel) {
    Node const place = _entries[parent].end;
    std::size_t const before = count();
    folder(parent).push_back(channel.get());
    adoptBelow(add(parent, std::move(channel)));
    // From the end of all to the end of the folder.
    std::size_t const added = count() - before;
    for (Node node = place; node < count(); ++node) {
        Node& above = _entries[node].parent;
        if (node < before) {
            above += above >= place ? added : 0;
        } else if (above >= before) {
            above -= before - place;
        }
    }
    auto const at = [this](Node node) { return _entries.begin() + static_cast<std::ptrdiff_t>(node); };
    std::rotate(at(place), at(before), _entries.end());
    setEnds();
    return place;
}

void ChannelTree::erase(Node node) {
    Node const behind = _entries[node].end;
    base(node).getParent()->removeDescendant(&base(node));
    for (Node below = behind; below-- > node;) {
        _entries[below].owned.reset(); // children before their folders
    }
    for (Node later = behind; later < count(); ++later) {
        Node& above = _entries[later].parent;
        above -= above >= behind ? behind - node : 0;
    }
    auto const at = [this](Node place) { return _entries.begin() + static_cast<std::ptrdiff_t>(place); };
    _entries.erase(at(node), at(behind));
    setEnds();
}

std::vector<ChannelTree::Node> ChannelTree::channelsBelow(Node node) const {
    std::vector<Node> channels;
    for (Node below = node; below < _entries[node].end; ++below) {
        if (isChannel(below)) {
            channels.push_back(below);
        }
    }
    return channels;
}

std::optional<KeypointEnds> ChannelTree::keyedRange() const {
    std::optional<KeypointEnds> range;
    for (Node const node : channelsBelow(kTop)) {
        if (curve(node).getNumberOfKeypoints() == 0) {
            continue;
        }
        if (std::optional<KeypointEnds> const ends = keypointEnds(spline(node))) {
            range = range ? KeypointEnds{TempusMinimum(range->first, ends->first),
                                         TempusMaximum(range->last, ends->last)}
                          : *ends;
        }
    }
    return range;
}

// --- Names ---

std::string ChannelTree::dottedName(Node node) const {
    if (node == kTop) {
        return std::string(isChannel(kTop) && !name(kTop).empty() ? name(kTop) : kTopPath);
    }
    std::string text(_entries[node].nameLength, '.');
    // From the end of the text to its start.
    for (std::size_t end = text.size(); node != kTop; node = _entries[node].parent) {
        std::string_view const part = name(node);
        end -= part.size();
        part.copy(text.data() + end, part.size());
        end -= end > 0 ? 1 : 0; // the dot
    }
    return text;
}

std::string ChannelTree::trailingName(Node node, std::size_t parts, std::size_t mostBytes) const {
    std::string text;
    for (; node != kTop && parts > 0; --parts, node = _entries[node].parent) {
        std::string_view const part = name(node);
        if (text.size() + part.size() + 1 > mostBytes) {
            return {};
        }
        text.insert(0, text.empty() ? 0 : 1, '.');
        text.insert(0, part);
    }
    return text;
}

std::string ChannelTree::path(Node node) const {
    return node == kTop ? std::string(kTopPath) : KFChannelRef(&base(node), &base(kTop)).str();
}

std::optional<ChannelTree::Node> ChannelTree::atPath(std::string_view path) const {
    KFChannelBase const* const found = KFChannelRef(BXString(path)).getChannel(&base(kTop));
    if (found == nullptr) {
        return std::nullopt;
    }
    auto const place = std::find_if(_entries.begin(), _entries.end(),
                                    [found](Entry const& entry) { return entry.channel == found; });
    return static_cast<Node>(place - _entries.begin());
}

ChannelTree::Naming ChannelTree::isCalled(Node node, std::string_view text) const {
    if (node == kTop) {
        return isChannel(kTop) && text == name(kTop) ? Naming::Whole : Naming::No;
    }
    // From the node upwards, taking names off the end of the text.
    while (node != kTop) {
        std::string_view const part = name(node);
        Node const parent = _entries[node].parent;
        if (text.size() < part.size()) {
            bool const isEnd = part.ends_with(text) && part[part.size() - text.size() - 1] == '.';
            return isEnd ? Naming::ByEnd : Naming::No;
        }
        if (!text.ends_with(part)) {
            return Naming::No;
        }
        text.remove_suffix(part.size());
        if (text.empty()) {
            return parent == kTop ? Naming::Whole : Naming::ByEnd;
        }
        if (text.size() < 2 || !text.ends_with('.')) {
            return Naming::No;
        }
        text.remove_suffix(1);
        node = parent;
    }
    return Naming::No;
}

ChannelTree::Match ChannelTree::find(std::string_view text) const {
    if (text.empty()) {
        return {};
    }
    if (text.front() == '.') {
        if (std::optional<Node> const node = atPath(text)) {
            return {node, std::nullopt};
        }
    }
    Match whole;
    Match byEnd;
    for (Node node = kTop; node < count(); ++node) {
        Naming const naming = isCalled(node, text);
        if (naming == Naming::No) {
            continue;
        }
        Match& match = naming == Naming::Whole ? whole : byEnd;
        if (!match.first) {
            match.first = node;
        } else if (!match.second) {
            match.second = node;
        }
    }
    return whole.first ? whole : byEnd;
}

void storeConstant(KFChannel& channel, double value) {
    channel.createLocalChannelImplementation();
    channel.getCurveInterface()->setCurveInitialValue(value);
}

void storeDefault(KFChannel& channel, double value) {
    channel.createLocalChannelImplementation();
    channel.getCurveInterface()->setCurveDefaultValue(value);
}

unsigned freeIDBelow(KFChannelFolder const& folder) {
    unsigned highest = 0;
    if (auto const* const children = folder.getDescendants()) {
        for (KFChannelBase const* const child : *children) {
            highest = std::max(highest, child->getID());
        }
    }
    return highest + 1;
}

} // namespace lumenkey::tools
