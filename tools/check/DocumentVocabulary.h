#pragma once

#include "lumenkey/foundation/BXUUID.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>

namespace lumenkey::tools {

/// A length of time is one in all documents, where others may be numbers of frames.
enum class TextKind { None, Any, Bool, Whole, Number, Time, Length, Switch };

/// Whose element it is, as bits.
enum : unsigned { kOfValues = 1, kOfFolders = 2, kOfRoots = 4, kOfOthers = 8, kOfAll = 15 };

/// An element or an attribute that the library reads.
struct DocumentWord {
    /// The element that it is in; empty for the outermost element.
    std::string_view parent;
    std::string_view name;
    TextKind text = TextKind::None;
    /// Of elements and attributes of channels: which have it.
    unsigned classes = kOfAll;
    /// Of a whole number.
    std::uint64_t greatest = UINT64_MAX;
    /// Whether there may be several of it, each for itself.
    bool isRepeated = false;
};

/// Null for an element that is unknown there.
DocumentWord const* documentElement(std::string_view parent, std::string_view name);
/// Whether it is known anywhere.
bool isDocumentElement(std::string_view name);
/// Those of all elements. One that isn't among them is unknown.
std::span<DocumentWord const> documentAttributes();

/// Whether a text is a whole number above the greatest of the word.
bool isBeyond(DocumentWord const& word, std::string_view text);

/// Whether a text can be read as its kind; `countsFrames` is for documents below version 5, where times are
/// numbers.
bool canBeRead(std::string_view text, TextKind kind, bool countsFrames);
/// What such a text should have been: `a number`, and so on.
std::string_view nameOfTextKind(TextKind kind);

// What the library reads of a text; nothing where it takes it for none.

/// Nothing for `nan` either, which lies within no limits.
std::optional<double> readNumber(std::string_view text);
/// Also `nan`, which curves and handles keep.
std::optional<double> readNumberOrNan(std::string_view text);
std::optional<std::uint64_t> readWhole(std::string_view text);
/// As an attribute or element of 32 bits: the lowest of a longer one.
std::optional<std::uint32_t> readWhole32(std::string_view text);
/// With the bytes that are written as escapes.
std::string readString(std::string_view text);
std::optional<bool> readBool(std::string_view text);
std::optional<BXUUID> readUUID(std::string_view text);
std::optional<Tempus> readTime(std::string_view text);

} // namespace lumenkey::tools
