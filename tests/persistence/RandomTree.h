#pragma once

#include "lumenkey/Channels/KFChannelObjectRootBase.h"

#include <memory>
#include <random>
#include <string>

/// Deletes what was made below a folder, which only lists it. Components belong to their compound.
void deleteBelow(KFChannelFolder& folder);

struct DeleteTree {
    void operator()(KFChannelFolder* top) const {
        deleteBelow(*top);
        delete top;
    }
};
using OwnedTree = std::unique_ptr<KFChannelFolder, DeleteTree>;

/// A tree of everything that a document can hold, told by its seed: all classes that factories make,
/// settings, limits, fades, keypoints of all types with attributes and handles, names in any script, times of
/// any timescale and epoch.
///
/// What a document leaves out by its rules isn't there: handles and biases that are too small to be written,
/// children that aren't saved, and disabled keypoints without an output handle, which come back enabled.
OwnedTree randomTree(std::uint64_t seed);

/// A number of any magnitude, sometimes a special one.
double randomNumber(std::mt19937_64& random);
Tempus randomTime(std::mt19937_64& random);
std::string randomName(std::mt19937_64& random);

/// Its document, as text.
std::string documentOf(KFChannelBase& channel, bool children = true, bool all = true);
bool readDocument(KFChannelBase& channel, std::string const& text);
