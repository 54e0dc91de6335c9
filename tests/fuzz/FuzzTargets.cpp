#include "tests/fuzz/FuzzTargets.h"

#include "lumenkey/Channels/KFChannelRef.h"
#include "lumenkey/Channels/KFScalarChannels.h"
#include "lumenkey/Channels/KFVectorChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "tests/persistence/RandomTree.h"
#include "tools/import/CsvTree.h"
#include "tools/import/MotionTree.h"

#include <cstdio>
#include <cstdlib>

using namespace lumenkey::tools;

namespace {

void require(bool holds, char const* what) {
    if (!holds) {
        std::fprintf(stderr, "%s\n", what);
        std::abort();
    }
}

BXData dataOf(FuzzBytes bytes) { return BXData(bytes.begin(), bytes.end()); }

std::string_view textOf(FuzzBytes bytes) {
    return {reinterpret_cast<char const*>(bytes.data()), bytes.size()};
}

template <class Visit> void forEachValue(KFChannelFolder& folder, Visit const& visit) {
    std::vector<KFChannelBase*> channels;
    folder.getAllDescendantsFlattened(channels, 0, false);
    for (KFChannelBase* const node : channels)
        visit(static_cast<KFChannel&>(*node));
}

void readEverything(KFChannelFolder& folder) {
    forEachValue(folder, [](KFChannel& channel) {
        for (std::int64_t i = -2; i < 3; ++i)
            channel.getValueAsDouble(TempusMake(i, 2), 0.0);
        std::uint32_t count = 20;
        std::vector<Tempus> times;
        std::vector<double> values;
        channel.getCurveInterface()->getCurveSamples(TempusMake(-1, 1), TempusMake(1, 8), count, &times,
                                                     &values);
    });
}

/// Most inputs are refused.
template <class Read> void orRefused(Read const& read) {
    try {
        read();
    } catch (InputError const&) {
        return;
    }
}

} // namespace

void fuzzDocument(FuzzBytes bytes) {
    OwnedTree const tree(new KFChannelObjectRootBase("Root", nullptr, 1, 0, 0));
    tree->configureWithState(dataOf(bytes));
    readEverything(*tree);
    OwnedTree const second(new KFChannelObjectRootBase("Root", nullptr, 1, 0, 0));
    require(second->configureWithState(tree->createChannelState(true, true)),
            "a tree can't read what it wrote");
    BXData const written = second->createChannelState(true, true);
    OwnedTree const third(new KFChannelObjectRootBase("Root", nullptr, 1, 0, 0));
    require(third->configureWithState(written), "a tree can't read what it wrote the second time");
    require(third->createChannelState(true, true) == written, "the second and the third writing differ");
    require(third->getHash() == second->getHash(), "the digests of equal documents differ");
}

void fuzzState(FuzzBytes bytes) {
    KFChannelObjectRootBase root("Root", nullptr, 1, 0, 0);
    auto* const folder = new KFChannelFolder("Folder", &root, 1, 0, 0);
    auto* const value = new KFChannelDouble(0.0, "Value", folder, 2, 0);
    new KFChannel3D("Place", folder, 3, 0);
    new KFChannelBool(false, "On", folder, 4, 0);
    value->setKeyframe(kTempusZero, 1.0, true);
    value->setKeyframe(TempusMake(1, 1), 2.0, true);
    root.configureWithState(dataOf(bytes));
    readEverything(root);
    // In place, from what it says of itself.
    require(root.configureWithState(root.createChannelState(true, true)), "a tree can't read what it wrote");
    readEverything(root);
    value->lock(false, false);
    value->setKeyframe(TempusMake(1, 3), 3.0, true);
    root.getHash();
    root.createChannelState(true, true);
    deleteBelow(root);
}

void fuzzMotion(FuzzBytes bytes) {
    orRefused([&] { treeOfMotion(readMotionText(textOf(bytes), "fuzz.bvh")); });
}

void fuzzCsv(FuzzBytes bytes) {
    orRefused([&] { treeOfCsv(readCsvText(textOf(bytes), "fuzz.csv")); });
}

void fuzzPath(FuzzBytes bytes) {
    KFChannelObjectRootBase root("Root", nullptr, 7, 0, 0);
    KFChannelFolder folder("Folder", &root, 12, 0, 0);
    KFChannelDouble value(0.0, "Value", &folder, 3, 0);
    KFChannelRef path(BXString{textOf(bytes)});
    KFChannelBase const* const found = path.getChannel(&root);
    require(found == nullptr || found == &root || found->isDescendantOf(root), "found outside of the tree");
    path.getCobaltOnlyPath();
    path.setID(path.getID() + 1);
    BXData stored;
    KFChannelRef read;
    require(!path.writeToData(stored) || read.readFromData(stored, 0) == static_cast<int>(stored.size()),
            "a stored path isn't read whole");
    require(read == path, "a stored path comes back as another");
    read.readFromData(dataOf(bytes), 0);
}
