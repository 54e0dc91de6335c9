#include "tools/check/DocumentFindings.h"

#include <algorithm>

namespace lumenkey::tools {

void sortByPlace(std::vector<DocumentFinding>& findings) {
    std::stable_sort(
        findings.begin(), findings.end(), [](DocumentFinding const& a, DocumentFinding const& b) {
            return std::pair(a.place.line, a.place.column) < std::pair(b.place.line, b.place.column);
        });
}

void DocumentFindings::take(DocumentFinding finding) {
    if (!finding.what.empty()) {
        _all.push_back(std::move(finding));
    }
}

void DocumentFindings::take(TextPlace const& place, std::vector<Fault> const& faults) {
    for (Fault const& fault : faults) {
        take(place, fault);
    }
}

void DocumentFindings::take(std::vector<std::pair<TextPlace, Fault>> const& faults) {
    for (auto const& [place, fault] : faults) {
        take(place, fault);
    }
}

std::vector<DocumentFinding> DocumentFindings::sorted() {
    sortByPlace(_all);
    return std::exchange(_all, {});
}

} // namespace lumenkey::tools
