#pragma once

#include "lumenkey/Channels/KFFactory.h"
#include "tools/check/CurveCheck.h"
#include "tools/check/Fault.h"

#include <vector>

namespace lumenkey::tools {

/// What is at fault with the attributes of an element: unknown ones, texts that can't be read as what they
/// are, numbers out of their limits, and a version that is unknown. `limits` are those of the element's curve
/// or channel, `factory` is the channel's, else null; `countsFrames` is for documents below version 5.
std::vector<Fault> faultsOfAttributes(std::string_view element, Attributes const& attributes,
                                      CurveLimits const& limits, KFFactory* factory, bool countsFrames);

/// Of those of a curve beside the attributes of its channel, whose place they take.
std::vector<Fault> faultsOfCurveInChannel(Attributes const& curve, Attributes const& channel);

/// Of a channel with these attributes, of the class of the example, in a folder: a value that is nearly that
/// of the class counts as it. `example` may be null.
std::vector<Fault> faultsOfNearValues(Attributes const& attributes, KFChannelBase const* example);

/// Of an element or attribute that channels of the class haven't.
std::string faultOfOwner(std::string_view kind, std::string_view name, KFFactory& factory);

} // namespace lumenkey::tools
