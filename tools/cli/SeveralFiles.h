#pragma once

#include "tools/output/OutputSink.h"

#include <functional>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// Does `work` on each file, several side by side, and writes what it said in the order of the files; a
/// failure of one is told on standard error and the others go on. Gives the highest of what the works gave; a
/// failure counts as 1. A single file's `InputError` and `OutputError` come out, as does any `UsageError`.
///
/// `work` must not touch another file's things; it runs on threads of its own.
int forSeveralFiles(std::vector<std::string> const& files, OutputSink& out,
                    std::function<int(std::string const&, OutputSink&)> const& work);

} // namespace lumenkey::tools
