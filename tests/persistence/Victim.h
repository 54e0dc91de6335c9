#pragma once

#include "lumenkey/Channels/KFScalarChannels.h"
#include "tests/persistence/RandomTree.h"

#include <span>
#include <string>

// What attacks by documents are tried on.

using Bytes = std::span<std::uint8_t const>;

/// The start of a document: folders are class 1, doubles 2.
extern std::string const kDocumentFactories;
/// Around the children of the node that it is for.
extern std::string const kDocumentHead;
extern std::string const kDocumentTail;

/// The document of one keyed value, ID 2, which every victim has.
std::string documentOfCurve(std::string const& curve, std::string const& attributes = "type='1'");
std::string keypointElement(std::string const& time, std::string const& value, std::string const& more = "",
                            std::string const& attributes = "");

/// A tree that is in use before anything is read into it.
struct Victim {
    OwnedTree root{new KFChannelObjectRootBase("Root", nullptr, 1, 0, 0)};
    KFChannelDouble* value;

    Victim();

    /// Nothing where it was read, else where and why it wasn't.
    std::string read(Bytes document);
    std::string read(std::string const& document);

    /// Reads, edits, writes and digests whatever the tree has become, and makes it good again by a good
    /// document.
    void expectUsable();
};

/// The most memory that this process has had since `forgetPeak`, in MiB.
std::size_t peakMiB();
/// Answers what the process has now.
std::size_t forgetPeak();
