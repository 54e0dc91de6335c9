#pragma once

#include "tools/check/DocumentScanner.h"
#include "tools/check/Fault.h"

#include <string>
#include <utility>
#include <vector>

namespace lumenkey::tools {

/// Something about a document that its author should know, and where it stands.
struct DocumentFinding {
    TextPlace place;
    std::string what;
    /// Whether a document that is written anew would be without it.
    bool isLoss = true;
};

/// Puts findings in the order of the text.
void sortByPlace(std::vector<DocumentFinding>& findings);

/// Collects what is at fault. Takes nothing where there is nothing to tell.
class DocumentFindings {
public:
    void lost(TextPlace const& place, std::string what) { take({place, std::move(what)}); }
    /// What a reader takes as it is.
    void kept(TextPlace const& place, std::string what) { take({place, std::move(what), false}); }
    void take(DocumentFinding finding);
    void take(TextPlace const& place, Fault const& fault) { take({place, fault.what, !fault.isKept}); }
    void take(TextPlace const& place, std::vector<Fault> const& faults);
    void take(std::vector<std::pair<TextPlace, Fault>> const& faults);

    /// All, in the order of the text; none stay.
    std::vector<DocumentFinding> sorted();

private:
    std::vector<DocumentFinding> _all;
};

} // namespace lumenkey::tools
