#pragma once

#include "tools/output/OutputSink.h"

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace lumenkey::tools {

/// What stands around and between the texts of several files; nothing around that of a single one.
struct SeveralTexts {
    std::string_view before = {};
    std::string_view between = {};
    std::string_view after = {};
};

/// Does `work` on each file, several side by side, and writes what it said in the order of the files; a
/// failure of one is told on standard error, with nothing of what it said, and the others go on. Gives the
/// highest of what the works gave; a failure counts as 1, a `UsageError` as 2. Whatever a single file's work
/// throws comes out.
///
/// `work` must not touch another file's things; it runs on threads of its own. Bars that it makes become its
/// part of one for all files.
int forSeveralFiles(std::vector<std::string> const& files, OutputSink& out,
                    std::function<int(std::string const&, OutputSink&)> const& work,
                    SeveralTexts const& texts = {});

} // namespace lumenkey::tools
