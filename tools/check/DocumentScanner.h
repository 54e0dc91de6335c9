#pragma once

#include "tools/import/InputText.h"

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

namespace lumenkey::tools {

using Attributes = std::map<std::string_view, std::string_view>;

/// The value of an attribute; empty where there is none of that name.
std::string_view attributeOf(Attributes const& attributes, std::string_view name);

/// A place in a text; counted as in `InputError`.
struct TextPlace {
    std::uint64_t line = 1;
    std::uint64_t column = 1;
};

/// Tells what a document consists of, in the order of its text.
class DocumentScanner {
public:
    virtual ~DocumentScanner() = default;
    DocumentScanner(DocumentScanner const&) = delete;
    DocumentScanner& operator=(DocumentScanner const&) = delete;

    /// Throws `InputError` for a file that can't be read, and whatever the operations below throw.
    void scan(std::string const& file, ReadingProgress const& progress);
    /// The same for the content of a file.
    void scanText(std::string_view text, ReadingProgress const& progress);

protected:
    DocumentScanner() = default;

    virtual void start(TextPlace const& place, std::string_view name, Attributes const& attributes) = 0;
    virtual void end() = 0;
    /// A stretch of one that stands in one line at most.
    virtual void text(TextPlace const& place, std::string_view more) = 0;
    /// What ends the scan: text that is no XML, or a document type declaration, which is refused.
    virtual void fault(TextPlace const& place, std::string_view what) = 0;

private:
    class Run;
};

} // namespace lumenkey::tools
