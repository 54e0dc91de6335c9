// Channels and their tree: what a value costs on its way up, what a channel weighs, and how trees grow.

#include "bench/Benchmarks.h"
#include "bench/CountedMemory.h"
#include "bench/Limits.h"
#include "bench/Subjects.h"

#include "lumenkey/Channels/KFChannelFolder.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "tools/cli/Verbs.h"
#include "tools/import/ChannelFile.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <filesystem>
#include <fstream>

#include <memory>
#include <random>
#include <string>
#include <utility>
#include <vector>

namespace {

/// A channel three folders below a root with an offset.
struct DeepChannel {
    KFChannelObjectRootBase root{"Object", nullptr, 1, 0, 0};
    KFChannelFolder outer{"Outer", &root, 1, 0, 0};
    KFChannelFolder middle{"Middle", &outer, 1, 0, 0};
    KFChannelFolder inner{"Inner", &middle, 1, 0, 0};
    KFChannelDouble channel{"Value", &inner, 1, 0};

    DeepChannel() {
        root.setTimeOffset(TempusMake(7, 24), true);
        root.finishInitializing();
    }

    void key(std::vector<Key> const& keys) {
        std::vector<Tempus> times;
        std::vector<double> values;
        for (Key const& key : keys) {
            times.push_back(key.time());
            values.push_back(key.value);
        }
        channel.willLoadKeyframes(true, static_cast<int>(keys.size()));
        channel.appendKeyframes(static_cast<unsigned int>(keys.size()), times.data(), values.data(), true);
        channel.willLoadKeyframes(false, 0);
        KFCurve& curve = *channel.getCurveInterface();
        curve.setCurveInterpolation(kKFInterpolationBezier);
        std::vector<void*> handles;
        curve.getKeypointHandleList(handles);
        for (std::size_t i = 0; i < handles.size(); ++i) {
            KFSpline& spline = *curve.getSpline();
            spline.setVertexInputHandles(handles[i], keys[i].in.u, keys[i].in.v, kTempusZero, true);
            spline.setVertexOutputHandles(handles[i], keys[i].out.u, keys[i].out.v, kTempusZero, true);
        }
    }
};

/// Global times whose local ones are the queries.
std::vector<Tempus> globalTimes(DeepChannel const& deep, Queries const& queries) {
    std::vector<Tempus> times;
    for (Tempus const& time : queries.times) {
        times.push_back(deep.channel.localToGlobalTime(time));
    }
    return times;
}

Contest keyedChannel(Bench const& bench, std::size_t size) {
    auto const keys = makeKeys(size);
    auto const deep = std::make_shared<DeepChannel>();
    deep->key(keys);
    auto const queries = std::make_shared<Queries>(everyFrame(keys));
    auto const global = std::make_shared<std::vector<Tempus>>(globalTimes(*deep, *queries));
    KFSpline* const spline = deep->channel.getCurveInterface()->getSpline();
    auto const ours = [deep, global](std::size_t i) {
        return deep->channel.getValueAsDouble((*global)[i], 0.0);
    };
    auto const alone = [spline, queries](std::size_t i) {
        return spline->getVertexValue(queries->times[i], kTempusZero, true);
    };
    for (std::size_t i = 0; i < queries->size(); ++i) {
        requireAgreement("a keyed channel", ours(i), alone(i), 0.0);
    }
    return {timePerItem(bench, queries->size(), readAll(queries->size(), ours)),
            timePerItem(bench, queries->size(), readAll(queries->size(), alone))};
}

Contest constantChannel(Bench const& bench) {
    auto const keys = makeKeys(1000);
    auto const deep = std::make_shared<DeepChannel>();
    deep->channel.setInitialValue(0.25, true);
    auto const queries = std::make_shared<Queries>(everyFrame(keys));
    auto const ours = [deep, queries](std::size_t i) {
        return deep->channel.getValueAsDouble(queries->times[i], 0.0);
    };
    SegmentLookup const lookup(keys, *queries);
    return {timePerItem(bench, queries->size(), readAll(queries->size(), ours)),
            timePerItem(bench, lookup.size(), readAll(lookup.size(), lookup))};
}

/// The whole curve, segment by segment.
Measurement extremes(Bench const& bench, std::size_t size) {
    auto const keys = std::make_shared<std::vector<Key>>(makeKeys(size));
    auto const deep = std::make_shared<DeepChannel>();
    deep->key(*keys);
    auto const between = [deep, keys](std::size_t first, std::size_t last) {
        std::pair<double, double> found;
        deep->channel.getCurrentMinAndMax((*keys)[first].time(), (*keys)[last].time(), &found.first,
                                          &found.second);
        return found;
    };
    auto const whole = between(0, size - 1);
    auto const left = between(0, size / 2);
    auto const right = between(size / 2, size - 1);
    requireAgreement("a lowest value", whole.first, std::min(left.first, right.first), 0.0);
    requireAgreement("a highest value", whole.second, std::max(left.second, right.second), 0.0);
    return timePerItem(bench, size - 1, [between, size] { benchmark::DoNotOptimize(between(0, size - 1)); });
}

// Memory ---------------------------------------------------------------------------------------------------

template <class Channel> double bytesOfOne() {
    Channel const first("Opacity", nullptr, 1, 0); // the class's records are made once
    std::vector<std::unique_ptr<Channel>> channels(1000);
    std::size_t const before = CountedMemory::heapBytes();
    for (auto& channel : channels) {
        channel = std::make_unique<Channel>("Opacity", nullptr, 1, 0);
    }
    return static_cast<double>(CountedMemory::heapBytes() - before) / static_cast<double>(channels.size());
}

template <class Channel> double blocksBeyondItself() {
    Channel const first("Opacity", nullptr, 1, 0);
    std::uint64_t const before = CountedMemory::calls();
    auto const channel = std::make_unique<Channel>("Opacity", nullptr, 1, 0);
    return static_cast<double>(CountedMemory::calls() - before) - 1.0;
}

// Trees ----------------------------------------------------------------------------------------------------

struct Tree {
    std::unique_ptr<KFChannelFolder> top;
    std::vector<std::unique_ptr<KFChannelFolder>> folders;
    std::vector<std::unique_ptr<KFChannelDouble>> channels;
};

Tree buildTree(std::size_t count, std::size_t perFolder) {
    Tree tree;
    tree.top = std::make_unique<KFChannelFolder>("Top", nullptr, 1, 0, 0);
    tree.channels.reserve(count);
    for (std::size_t i = 0; i < count; ++i) {
        if (i % perFolder == 0) {
            tree.folders.push_back(std::make_unique<KFChannelFolder>(
                "Folder", tree.top.get(), static_cast<unsigned int>(i / perFolder + 1), 0, 0));
        }
        tree.channels.push_back(std::make_unique<KFChannelDouble>(
            "Value", tree.folders.back().get(), static_cast<unsigned int>(i % perFolder + 1), 0));
    }
    tree.top->finishInitializing();
    return tree;
}

Contest building(Bench const& bench, std::size_t count, std::size_t perFolder, std::size_t smallCount) {
    auto const build = [](std::size_t channels, std::size_t inFolder) {
        return [=] { buildTree(channels, inFolder); };
    };
    return {timePerItem(bench, count, build(count, perFolder)),
            timePerItem(bench, smallCount, build(smallCount, perFolder))};
}

/// The same 64 IDs are looked up beside few and beside many siblings.
std::function<void()> lookUpIDs(std::size_t siblings) {
    auto const tree = std::make_shared<Tree>(buildTree(siblings, siblings));
    return [tree] {
        KFChannelFolder const& folder = *tree->folders.front();
        for (unsigned int id = 1; id <= 64; ++id) {
            benchmark::DoNotOptimize(folder.getDescendant(id));
        }
    };
}

/// Four levels deep, among as many siblings at the last one.
std::function<void()> lookUpPath(std::size_t siblings) {
    auto const deep = std::make_shared<DeepChannel>();
    auto const others = std::make_shared<std::vector<std::unique_ptr<KFChannelDouble>>>();
    for (unsigned int id = 2; id <= siblings; ++id) {
        others->push_back(std::make_unique<KFChannelDouble>("Other", &deep->inner, id, 0));
    }
    auto const ref = std::make_shared<KFChannelRef>(&deep->channel, &deep->root);
    return [deep, others, ref] {
        for (int i = 0; i < 64; ++i) {
            benchmark::DoNotOptimize(ref->getChannel(&deep->root));
        }
    };
}

// The program ----------------------------------------------------------------------------------------------

/// A motion of 96 channels and 524 frames, in a file that goes with it.
class MotionOnDisk {
public:
    MotionOnDisk() {
        std::ofstream file(_path);
        file << "HIERARCHY\nROOT J0\n";
        for (int joint = 0; joint < kJoints; ++joint) {
            file << "{\nOFFSET 0 1 0\nCHANNELS 3 Zrotation Xrotation Yrotation\n";
            file << (joint + 1 < kJoints ? "JOINT J" + std::to_string(joint + 1) : std::string("End Site"))
                 << '\n';
        }
        file << "{\nOFFSET 0 1 0\n}\n";
        for (int joint = 0; joint < kJoints; ++joint)
            file << "}\n";
        file << "MOTION\nFrames: " << kFramesInFile << "\nFrame Time: 0.0083333\n";
        std::mt19937_64 random(9);
        std::uniform_int_distribution<int> tenThousandths(-1800000, 1800000);
        for (int frame = 0; frame < kFramesInFile; ++frame) {
            for (int channel = 0; channel < 3 * kJoints; ++channel)
                file << tenThousandths(random) / 10000 << '.' << 1000 + frame
                     << (channel + 1 < 3 * kJoints ? ' ' : '\n');
        }
    }
    ~MotionOnDisk() { std::remove(_path.c_str()); }
    MotionOnDisk(MotionOnDisk const&) = delete;
    MotionOnDisk& operator=(MotionOnDisk const&) = delete;

    std::string const& path() const noexcept { return _path; }

private:
    static constexpr int kJoints = 32;
    static constexpr int kFramesInFile = 524;

    std::string _path = std::filesystem::temp_directory_path() / "lumenkey-bench.bvh";
};

/// The whole verb, and the part of it that reads the file into a tree.
Contest sampleVerb(Bench const& bench) {
    auto const file = std::make_shared<MotionOnDisk>();
    auto const sample = [file] {
        CLI::App app;
        lumenkey::tools::Verb const verb = lumenkey::tools::declareSample(app);
        app.parse("sample " + file->path() + " --count 1000 --csv");
        lumenkey::tools::StringSink text;
        verb.run(text);
        benchmark::DoNotOptimize(text.text().size());
    };
    auto const read = [file] {
        benchmark::DoNotOptimize(lumenkey::tools::openChannelFile(file->path()).rows);
    };
    return {timePerItem(bench, 1, sample), timePerItem(bench, 1, read)};
}

ContestEntry nanosecondsAbove(std::string name, std::string const& against, double bound,
                              std::function<Contest()> prepare) {
    std::string const width = std::to_string(static_cast<int>(bound));
    ContestEntry entry{std::move(name), against + "; ratio: (ours - it) / " + width + " ns",
                       Bound::atMost(1.0), std::move(prepare)};
    entry.ratio = [bound](double subject, double limit) { return (subject - limit) / bound; };
    return entry;
}

ContestEntry measuredOnce(std::string name, char const* unit, double bound, Measurement subject) {
    ContestEntry entry{std::move(name), "as it is", Bound::atMost(bound), [subject] {
                           return Contest{subject, subject};
                       }};
    entry.unit = unit;
    entry.ratio = [](double figure, double) { return figure; };
    entry.repeats = false;
    return entry;
}

} // namespace

void registerTree(Bench& bench) {
    for (std::size_t const size : kSizes) {
        registerContest(bench, nanosecondsAbove(withSize("channel/keyed Bezier", size), "the spline alone",
                                                25.0, [&bench, size] { return keyedChannel(bench, size); }));
    }
    registerContest(bench, nanosecondsAbove("channel/constant", "an array look-up", 15.0,
                                            [&bench] { return constantChannel(bench); }));
    registerContest(bench, {withSize("extremes", 100000), "20 ns a segment", Bound::atMost(1.0), [&bench] {
                                return Contest{extremes(bench, 100000), [] { return 20.0; }};
                            }});
    registerContest(bench, measuredOnce("bytes per channel/KFChannelDouble", "B", 200.0,
                                        [] { return bytesOfOne<KFChannelDouble>(); }));
    registerContest(bench, measuredOnce("bytes per channel/KFChannelBool", "B", 200.0,
                                        [] { return bytesOfOne<KFChannelBool>(); }));
    registerContest(bench, measuredOnce("blocks beyond itself/KFChannelDouble", "blocks", 0.0,
                                        [] { return blocksBeyondItself<KFChannelDouble>(); }));
    registerContest(bench, {"tree/1000000 in folders of 100", "10000 in folders of 100", Bound::atMost(2.0),
                            [&bench] { return building(bench, 1000000, 100, 10000); }});
    registerContest(bench, {"tree/100000 in one folder", "10000 in one folder", Bound::atMost(2.0),
                            [&bench] { return building(bench, 100000, 1000000, 10000); }});
    ContestEntry verb{"lumenkey sample/96 channels at 1000 times", "reading the file; ratio: the rest to it",
                      Bound::atMost(1.0), [&bench] { return sampleVerb(bench); }};
    verb.ratio = [](double whole, double reading) { return (whole - reading) / reading; };
    registerContest(bench, std::move(verb));
    registerContest(bench, {"look-up/ID among 100000", "among 100", Bound::atMost(1.5), [&bench] {
                                return Contest{timePerItem(bench, 64, lookUpIDs(100000)),
                                               timePerItem(bench, 64, lookUpIDs(100))};
                            }});
    registerContest(bench,
                    {"look-up/path, four deep, among 100000", "among 10", Bound::atMost(1.5), [&bench] {
                         return Contest{timePerItem(bench, 64, lookUpPath(100000)),
                                        timePerItem(bench, 64, lookUpPath(10))};
                     }});
}
