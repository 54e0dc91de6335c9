#pragma once

#include "lumenkey/foundation/BXString.h"
#include "lumenkey/foundation/BXUUID.h"
#include "tools/import/InputError.h"
#include "tools/import/InputText.h"
#include "tools/tree/ChannelTree.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// The version of the documents that are written.
inline constexpr std::uint32_t kWrittenMajor = 5;
inline constexpr std::uint32_t kWrittenMinor = 13;

/// A class that a document names.
struct DocumentFactory {
    std::uint32_t number = 0;
    /// All zero where the document gives none that can be read.
    BXUUID uuid;
    std::string description;
    /// The library's; empty for a class that it doesn't know.
    std::string className;

    bool isKnown() const { return !className.empty(); }
};

/// A channel document as its file has it.
struct DocumentFile {
    std::uint32_t major = kWrittenMajor;
    std::uint32_t minor = kWrittenMinor;
    /// As it stands in the document; empty where it says none.
    BXString writtenVersion;

    /// Such as `5.13`: what the document is read as, whatever it says.
    std::string versionText() const { return std::to_string(major) + "." + std::to_string(minor); }

    std::vector<DocumentFactory> factories;
    /// Its text, where the file can be read only once, as from a pipe.
    std::optional<std::string> text;
    std::unique_ptr<ChannelTree> tree;
};

/// What frames last in documents that don't say so.
inline Tempus defaultFrameDuration() { return TempusMake(1, 30); }

/// Reads a channel document, block by block. Its top is made by its own factory; where the document says
/// none, as in those that a host wrote for itself, it is an object root. Nodes that the library doesn't know
/// are passed over, as the library does. Throws `InputError` for a file that can't be read or isn't well
/// formed, for a top of an unknown class, and for anything but one channel.
///
/// Documents below version 5 count frames of `frameDuration`.
DocumentFile readDocumentFile(std::string const& file, Tempus const& frameDuration,
                              ReadingProgress const& progress = {});

/// The same for the content of a file; `file` is only its name.
DocumentFile readDocumentText(std::string_view text, std::string const& file, Tempus const& frameDuration,
                              ReadingProgress const& progress = {});

/// Whether a text begins as an XML document does, in any of the encodings that are read.
bool looksLikeDocument(std::string_view text);

/// The length of a frame in a document that doesn't say it: the longest step on whose multiples all keypoints
/// stand, if that is one of 12 to 1000 frames a second; else the default.
Tempus frameDurationOfKeypoints(ChannelTree const& tree);

} // namespace lumenkey::tools
