#pragma once

#include "tools/check/ClassExamples.h"
#include "tools/check/DocumentScanner.h"
#include "tools/check/Fault.h"

#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace lumenkey::tools {

/// The classes that a document lists, and those of its channels.
class DocumentClasses : public ClassExamples {
public:
    /// From the attributes of a `factory`.
    std::vector<Fault> readFactory(Attributes const& attributes);

    /// Of a channel with these attributes that its folder makes for itself, as it is in all of that class.
    std::string faultOfComponent(KFChannelBase const& component, Attributes const& attributes) const;

    /// Sets the class of a channel; why there is none, if there isn't.
    std::string faultOfClass(Attributes const& attributes, bool isTop, KFFactory** factory);

private:
    std::map<std::uint64_t, KFFactory*> _factories;
};

} // namespace lumenkey::tools
