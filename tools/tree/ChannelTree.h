#pragma once

#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/splines/KFSpline.h"
#include "tools/curve/Keypoint.h"
#include "tools/tree/ChannelClass.h"

#include <cstddef>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// What can be added to a tree beside folders.
enum class ValueType { Double, Angle };

/// The channels of a file as a tree of the library, which it owns, and the names of its nodes.
///
/// A node is told by its place in tree order: a folder, then all that lies below it. In a tree that is built
/// here, IDs count from 1 among the children of each folder, in the order in which they are added.
///
/// The dotted name of a node is the names from the top's children down to it, with dots between them:
/// `Hips.LeftLeg.Xrotation`. Names may hold dots themselves. A top that is a folder has no dotted name.
class ChannelTree {
public:
    using Node = std::size_t;
    static constexpr Node kTop = 0;

    /// `frameDuration` is what the root answers for it; with an invalid one it answers the library's default.
    ChannelTree(std::string const& name, Tempus const& frameDuration);
    /// A tree of any classes that is there already, such as that of a document; it stays as it is. All nodes
    /// but those that a class makes for itself, such as the components of a compound, belong to the tree from
    /// now on.
    explicit ChannelTree(std::unique_ptr<KFChannelBase> top);
    ~ChannelTree();
    ChannelTree(ChannelTree const&) = delete;
    ChannelTree& operator=(ChannelTree const&) = delete;

    // Building: nodes are added in tree order, so a parent is the node added last or one above it.

    Node addFolder(Node parent, std::string const& name);
    /// A value channel.
    Node addChannel(Node parent, std::string const& name, ValueType type);
    /// By the bulk path, in ascending order of time; once for each value channel, also where there are none.
    void setKeypoints(Node channel, std::vector<Tempus> const& times, std::vector<double> const& values);
    /// To be called once everything is there, and before anything below.
    void finish(BXTimeRange const& extent);

    // Changing a tree that is there. Nodes behind the place are told by other numbers afterwards.

    /// Adds a channel, and what its class puts below it, behind the children of a folder.
    Node append(Node parent, std::unique_ptr<KFChannelBase> channel);
    /// Takes a node, and all below it, out of its folder and destroys it. Neither the top nor a component.
    void erase(Node node);

    // Nodes.

    std::size_t count() const { return _entries.size(); }
    /// Whether it is a value channel.
    bool isChannel(Node node) const { return base(node).isValueChannel(); }
    /// Null for what is none.
    KFChannelFolder* asFolder(Node node) const { return dynamic_cast<KFChannelFolder*>(&base(node)); }
    /// Whether its class makes it, as it does the components of a compound.
    bool isComponent(Node node) const { return _entries[node].owned == nullptr; }
    /// 0 for the top.
    std::size_t depth(Node node) const { return _entries[node].depth; }
    Node parent(Node node) const { return _entries[node].parent; }
    /// Behind the last node below.
    Node end(Node node) const { return _entries[node].end; }
    KFChannelBase& base(Node node) const { return *_entries[node].channel; }
    /// Such as `KFChannelDouble`.
    std::string className(Node node) const { return classNameOf(base(node)); }
    /// Such as `Double`.
    std::string typeName(Node node) const { return shortClassName(className(node)); }
    /// The value channels at a node or below it, in tree order.
    std::vector<Node> channelsBelow(Node node) const;

    // Value channels only.

    KFChannel& channel(Node node) const { return static_cast<KFChannel&>(base(node)); }
    KFCurve& curve(Node node) const { return *channel(node).getCurveInterface(); }
    /// Null where the channel takes no keypoints, or never had one.
    KFSpline* spline(Node node) const { return curve(node).getSpline(); }
    /// `rad` or `units`.
    std::string_view unit(Node node) const { return unitOf(base(node)); }
    /// The time of the first keypoint of all, and of the last, as their curves count time; nothing without
    /// any.
    std::optional<KeypointEnds> keyedRange() const;

    // Names. Each costs as much as the name is long, or the node deep.

    /// Of the top, which no other name begins with: its own name if it is a channel with one, else its path.
    std::string dottedName(Node node) const;
    /// The last `parts` names of the dotted name; empty where that has more than `mostBytes`.
    std::string trailingName(Node node, std::size_t parts, std::size_t mostBytes) const;
    /// The path of IDs from the top, such as `./1/3`; `./` for the top itself.
    std::string path(Node node) const;

    /// What a text names, and the next that it could name too.
    struct Match {
        std::optional<Node> first;
        std::optional<Node> second;
    };
    /// By a path of IDs; else by the whole dotted name; else by the end of a dotted name, from behind one of
    /// its dots on. Case matters. Of several the first in tree order comes first.
    Match find(std::string_view text) const;

private:
    struct Entry {
        KFChannelBase* channel;
        std::unique_ptr<KFChannelBase> owned;
        Node parent;
        std::size_t depth;
        /// Of the dotted name, in bytes.
        std::size_t nameLength;
        /// Behind the last node below.
        Node end;
    };
    enum class Naming { No, ByEnd, Whole };

    Node add(Node parent, KFChannelBase* channel, std::unique_ptr<KFChannelBase> owned);
    Node add(Node parent, std::unique_ptr<KFChannelBase> channel);
    void adoptBelow(Node folder);
    /// From the parents alone.
    void setEnds();
    KFChannelFolder& folder(Node node) const { return static_cast<KFChannelFolder&>(base(node)); }
    unsigned nextID(Node parent) const;
    std::string_view name(Node node) const { return base(node).getName().view(); }
    std::optional<Node> atPath(std::string_view path) const;
    Naming isCalled(Node node, std::string_view text) const;

    std::vector<Entry> _entries;
};

/// The value of a channel without keypoints, exactly: `setInitialValue` leaves what is nearly there already.
void storeConstant(KFChannel& channel, double value);
/// Its default, likewise.
void storeDefault(KFChannel& channel, double value);

/// Above the IDs of a folder's children.
unsigned freeIDBelow(KFChannelFolder const& folder);

} // namespace lumenkey::tools
