#pragma once

#include "tools/check/DocumentFindings.h"
#include "tools/check/DocumentScanner.h"

#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// Looks a document through without reading it into channels: text that is no XML, elements, attributes and
/// classes that the library doesn't know and so passes over, channels without a class or with an ID that a
/// neighbour has, factories of one number, values and attributes that can't be read or lie beyond their
/// limits, limits that cross, keypoints of a constant, without a time or a value or out of the order of time,
/// disabled ones that come back enabled, parts that stand where they are passed over, twice, or against each
/// other, stray text, numbers that are kept as others, and a version that is unknown. In the order of the
/// text. Nothing follows text that is no XML.
///
/// The limits of a curve are those that the document gives, else those of the class. Throws `InputError` for
/// a file that can't be read.
std::vector<DocumentFinding> checkDocument(std::string const& file, ReadingProgress const& progress);
/// The same for the content of a file.
std::vector<DocumentFinding> checkDocumentText(std::string_view text, ReadingProgress const& progress);

} // namespace lumenkey::tools
