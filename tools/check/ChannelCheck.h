#pragma once

#include "tools/check/DocumentFindings.h"
#include "tools/check/OpenElement.h"

#include <string>
#include <vector>

namespace lumenkey::tools {

/// Its name as it is read: its class has the names of its components. The attributes are the channel's.
std::string nameOfChannel(OpenElement const& channel, Attributes const& attributes);

/// Looks at a channel as a whole, at its end: what its flags become, and what becomes of the channels below it.
/// `open` are the elements around it, the innermost last, which learns what a lock from above would reach.
void endChannel(OpenElement& channel, std::vector<OpenElement>& open, DocumentFindings& findings);

} // namespace lumenkey::tools
