#pragma once

#include <cstdint>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// Something about a document that its author should know, and where it stands; counted as in `InputError`.
struct DocumentFinding {
    std::uint64_t line = 1;
    std::uint64_t column = 1;
    std::string what;
};

/// Looks a document through without reading it into channels: text that is no XML, elements and classes that
/// the library doesn't know and so passes over, channels without a class or with an ID that a neighbour has,
/// values that can't be read or lie beyond the limits of their curve, and keypoints that don't stand in the
/// order of time. In the order of the text. Nothing follows text that is no XML.
///
/// The limits of a curve are those that the document gives, else those of the class. Throws `InputError` for
/// a file that can't be read.
std::vector<DocumentFinding> checkDocument(std::string const& file);

} // namespace lumenkey::tools
