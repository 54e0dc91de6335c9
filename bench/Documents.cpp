// Documents: reading beside expat with empty handlers, writing beside the formatting of the same numbers,
// digests beside XXH3, what of it all grows with the size, and the memory beside the tree. JSON for
// comparison.

#include "bench/Benchmarks.h"
#include "bench/CountedMemory.h"
#include "bench/Subjects.h"

#include "lumenkey/Channels/KFChannelImpl.h"
#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/foundation/BXStream.h"
#include "lumenkey/foundation/BXXMLWriteStream.h"

#include <atomic>
#include <charconv>
#include <expat.h>
#include <nlohmann/json.hpp>
#include <span>
#include <stdexcept>
#include <thread>
#include <xxhash.h>

namespace {

/// Reading a million keypoints takes seconds.
int mostRepetitions(std::size_t keypoints) { return keypoints > 100000 ? 3 : keypoints > 1000 ? 9 : 25; }

constexpr std::size_t kDocumentSizes[] = {1000, 100000, 1000000};
constexpr std::size_t kKeypointsOfChannel = 1000;
constexpr std::size_t kSizeBesideJson = 100000;
constexpr double kMebibyte = 1024.0 * 1024.0;

/// Channels of a thousand keypoints each under one root.
struct DocumentTree {
    KFChannelObjectRootBase root{"Object", nullptr, 1, 0, 0};
    std::vector<std::unique_ptr<KFChannelBase>> channels;
    std::vector<Key> keys = makeKeys(kKeypointsOfChannel);

    explicit DocumentTree(std::size_t keypoints) {
        for (std::size_t i = 0; i < keypoints / kKeypointsOfChannel; ++i)
            addChannel(static_cast<unsigned int>(i + 1));
    }
    void addChannel(unsigned int id) {
        auto channel = std::make_unique<KFChannelDouble>(0.0, "Value", &root, id, 0);
        KFCurve& curve = *channel->createLocalChannelImplementation()->getCurve();
        for (Key const& key : keys) {
            curve.appendKeypointNoTangents(key.time(), key.value, true);
            void* const handle = curve.getSpline()->getLastVertex();
            curve.setKeypointInterpolation(handle, kKFInterpolationBezier, true);
            curve.setKeypointInputHandles(handle, key.in.u, key.in.v, true);
            curve.setKeypointOutputHandles(handle, key.out.u, key.out.v, true);
        }
        channels.push_back(std::move(channel));
    }
    std::size_t keypoints() const { return channels.size() * keys.size(); }
};

/// A tree that is read into; what reading makes belongs to it.
struct ReadTree {
    KFChannelObjectRootBase root{"Object", nullptr, 1, 0, 0};

    ReadTree() = default;
    ReadTree(ReadTree const&) = delete;
    ReadTree& operator=(ReadTree const&) = delete;
    ~ReadTree() {
        std::vector<KFChannelBase*> const children =
            root.getDescendants() == nullptr ? std::vector<KFChannelBase*>() : *root.getDescendants();
        root.removeAllDescendants(true);
        for (KFChannelBase* const child : children)
            delete child;
    }
};

template <class Work> double nanoseconds(Work work) {
    auto const start = std::chrono::steady_clock::now();
    work();
    std::chrono::duration<double, std::nano> const elapsed = std::chrono::steady_clock::now() - start;
    return elapsed.count();
}

/// Small documents are repeated, so that each measurement takes some milliseconds.
template <class Work> Measurement perKeypoint(std::size_t keypoints, Work work) {
    return [keypoints, work] {
        std::size_t const rounds = std::max<std::size_t>(1, 20000 / keypoints);
        double total = 0.0;
        for (std::size_t i = 0; i < rounds; ++i)
            total += work();
        return total / static_cast<double>(rounds * keypoints);
    };
}

double readDocument(BXData const& data) {
    ReadTree tree;
    return nanoseconds([&] {
        if (!tree.root.configureWithState(data))
            throw std::runtime_error("a document of our own can't be read");
    });
}

double readByExpat(BXData const& data) {
    XML_Parser const parser = XML_ParserCreate("UTF-8");
    XML_SetElementHandler(
        parser, [](void*, XML_Char const*, XML_Char const**) {}, [](void*, XML_Char const*) {});
    XML_SetCharacterDataHandler(parser, [](void*, XML_Char const*, int) {});
    double const time = nanoseconds([&] {
        XML_Parse(parser, reinterpret_cast<char const*>(data.data()), static_cast<int>(data.size()), 1);
    });
    XML_ParserFree(parser);
    return time;
}

/// Bytes that go nowhere.
struct Counter : BXStream {
    bool write(void const*, std::size_t size) override {
        bytes += size;
        return true;
    }
    std::size_t bytes = 0;
};

void writeInto(BXStream& sink, KFChannelBase& channel) {
    BXXMLWriteStream stream(sink, 5, 13);
    channel.writeHeader(stream, true);
    channel.writeBody(stream, true, true, true);
    stream.endElement();
    stream.close();
}

template <class Number> char* format(char* to, Number number) {
    return std::to_chars(to, to + 32, number).ptr;
}

/// All keys of all channels: the limits get the same numbers from as much memory.
using AllKeys = std::vector<Key>;

std::shared_ptr<AllKeys const> allKeysOf(DocumentTree const& tree) {
    auto const all = std::make_shared<AllKeys>();
    for (std::size_t i = 0; i < tree.channels.size(); ++i)
        all->insert(all->end(), tree.keys.begin(), tree.keys.end());
    return all;
}

/// Just the numbers of the document, one behind the other.
void formatNumbers(AllKeys const& keys, std::vector<char>& buffer) {
    for (std::size_t i = 0; i < keys.size(); i += kKeypointsOfChannel) {
        char* to = buffer.data();
        for (Key const& key : std::span(keys).subspan(i, kKeypointsOfChannel)) {
            to = format(to, key.ticks);
            to = format(to, kTimescale);
            to = format(to, 0U);
            for (double const number : {key.value, key.in.u, key.in.v, key.out.u, key.out.v})
                to = format(to, number);
        }
        benchmark::DoNotOptimize(to);
    }
}

template <class Value> void feed(XXH3_state_t* state, Value value) {
    XXH3_128bits_update(state, &value, sizeof value);
}

void digestNumbers(AllKeys const& keys) {
    XXH3_state_t* const state = XXH3_createState();
    XXH3_128bits_reset(state);
    for (Key const& key : keys) {
        feed(state, key.ticks);
        feed(state, kTimescale);
        feed(state, 0U);
        for (double const number : {key.value, key.in.u, key.in.v, key.out.u, key.out.v})
            feed(state, number);
    }
    benchmark::DoNotOptimize(XXH3_128bits_digest(state));
    XXH3_freeState(state);
}

nlohmann::json jsonOf(DocumentTree const& tree) {
    nlohmann::json channels = nlohmann::json::array();
    for (std::size_t i = 0; i < tree.channels.size(); ++i) {
        nlohmann::json keypoints = nlohmann::json::array();
        for (Key const& key : tree.keys)
            keypoints.push_back({{"flags", 0},
                                 {"time", {key.ticks, kTimescale}},
                                 {"value", key.value},
                                 {"in", {key.in.u, key.in.v}},
                                 {"out", {key.out.u, key.out.v}}});
        channels.push_back({{"name", "Value"}, {"id", i + 1}, {"keypoints", std::move(keypoints)}});
    }
    return channels;
}

using Trees = std::shared_ptr<DocumentTree>;

Measurement reading(Trees const& tree) {
    auto const data = std::make_shared<BXData const>(tree->root.createChannelState(true, true));
    return perKeypoint(tree->keypoints(), [data] { return readDocument(*data); });
}

Measurement writing(Trees const& tree) {
    return perKeypoint(tree->keypoints(), [tree] {
        Counter sink;
        return nanoseconds([&] { writeInto(sink, tree->root); });
    });
}

Measurement digesting(Trees const& tree) {
    return perKeypoint(tree->keypoints(), [tree] {
        return nanoseconds([&] { benchmark::DoNotOptimize(tree->root.getHash()); });
    });
}

Contest readingContest(std::size_t size) {
    auto const tree = std::make_shared<DocumentTree>(size);
    auto const data = std::make_shared<BXData const>(tree->root.createChannelState(true, true));
    return {reading(tree), perKeypoint(size, [data] { return readByExpat(*data); })};
}

Contest writingContest(std::size_t size) {
    auto const tree = std::make_shared<DocumentTree>(size);
    auto const buffer = std::make_shared<std::vector<char>>(kKeypointsOfChannel * 8 * 32);
    return {writing(tree), perKeypoint(size, [keys = allKeysOf(*tree), buffer] {
                return nanoseconds([&] { formatNumbers(*keys, *buffer); });
            })};
}

Contest digestContest(std::size_t size) {
    auto const tree = std::make_shared<DocumentTree>(size);
    return {digesting(tree), perKeypoint(size, [keys = allKeysOf(*tree)] {
                return nanoseconds([&] { digestNumbers(*keys); });
            })};
}

/// How far the heap rises above what it ends with while `work` runs, seen by a second thread all the time and
/// by the counters of `operator new`; in mebibytes.
template <class Work> double risenBy(Work work) {
    std::atomic<bool> isOver{false};
    std::size_t highest = CountedMemory::heapBytes();
    std::thread watcher([&] {
        while (!isOver) {
            highest = std::max(highest, CountedMemory::heapBytes());
            std::this_thread::sleep_for(std::chrono::microseconds(50));
        }
    });
    CountedMemory::Peak peak;
    peak.start();
    work();
    auto const [risen, kept] = peak.stop();
    isOver = true;
    watcher.join();
    double const seen = static_cast<double>(highest) - static_cast<double>(CountedMemory::heapBytes());
    return std::max({0.0, seen, static_cast<double>(risen) - static_cast<double>(kept)}) / kMebibyte;
}

/// What is read stays, so what rises beside it is what reading needs.
double memoryOfReading(DocumentTree& tree) {
    BXData const data = tree.root.createChannelState(true, true);
    ReadTree read;
    return risenBy([&] { read.root.configureWithState(data); });
}

double memoryOfWriting(DocumentTree& tree) {
    Counter sink;
    return risenBy([&] { writeInto(sink, tree.root); });
}

void registerMemoryOfDocuments(Bench& bench, std::size_t size) {
    auto const within = [&bench, size](std::string const& what, double (*measure)(DocumentTree&)) {
        ContestEntry entry{withSize("memory of " + what, size), "1 MiB beside the tree", Bound::atMost(1.0),
                           [size, measure] {
                               auto const tree = std::make_shared<DocumentTree>(size);
                               return Contest{[tree, measure] { return measure(*tree); }, [] { return 1.0; }};
                           }};
        entry.unit = "MiB";
        entry.repeats = false;
        registerContest(bench, std::move(entry));
    };
    within("reading", memoryOfReading);
    within("writing", memoryOfWriting);
}

void registerGrowthOfDocuments(Bench& bench) {
    auto const growth = [&bench](std::string const& what, Measurement (*measure)(Trees const&)) {
        ContestEntry entry{what + " a keypoint/1000000", "a keypoint of 100000", Bound::atMost(1.1),
                           [measure] {
                               return Contest{measure(std::make_shared<DocumentTree>(1000000)),
                                              measure(std::make_shared<DocumentTree>(100000))};
                           }};
        entry.mostRepetitions = mostRepetitions(1000000);
        registerContest(bench, std::move(entry));
    };
    growth("read", reading);
    growth("write", writing);
    growth("digest", digesting);
}

void registerJson(Bench& bench) {
    auto const beside = [&bench](std::string const& what, Contest (*prepare)()) {
        ContestEntry entry{"beside JSON/" + what, "nlohmann-json", Bound::none(), prepare};
        entry.mostRepetitions = mostRepetitions(kSizeBesideJson);
        registerContest(bench, std::move(entry));
    };
    beside("read", [] {
        auto const tree = std::make_shared<DocumentTree>(kSizeBesideJson);
        auto const text = std::make_shared<std::string>(jsonOf(*tree).dump());
        return Contest{reading(tree), perKeypoint(kSizeBesideJson, [text] {
                           return nanoseconds(
                               [&] { benchmark::DoNotOptimize(nlohmann::json::parse(*text)); });
                       })};
    });
    beside("write", [] {
        auto const tree = std::make_shared<DocumentTree>(kSizeBesideJson);
        return Contest{writing(tree), perKeypoint(kSizeBesideJson, [tree] {
                           return nanoseconds([&] { benchmark::DoNotOptimize(jsonOf(*tree).dump()); });
                       })};
    });
}

} // namespace

void registerDocuments(Bench& bench) {
    for (std::size_t const size : kDocumentSizes) {
        auto const contest = [&bench, size](std::string const& what, std::string const& against,
                                            double atMost, Contest (*prepare)(std::size_t)) {
            ContestEntry entry{withSize(what, size), against, Bound::atMost(atMost),
                               [size, prepare] { return prepare(size); }};
            entry.mostRepetitions = mostRepetitions(size);
            registerContest(bench, std::move(entry));
        };
        contest("read a document", "expat with empty handlers", 2.5, readingContest);
        contest("write a document", "its numbers by to_chars", 2.0, writingContest);
        contest("digest", "XXH3 of its numbers, one by one", 1.5, digestContest);
        registerMemoryOfDocuments(bench, size);
    }
    registerGrowthOfDocuments(bench);
    registerJson(bench);
}
