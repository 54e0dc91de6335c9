#include "tools/tree/ChannelClass.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/persistence/KFCompoundMarks.h"
#include "tools/output/TextForms.h"

#include <cstdlib>
#include <cxxabi.h>
#include <memory>
#include <typeinfo>

namespace lumenkey::tools {

namespace {

std::string nameOfType(std::type_info const& type) {
    int status = 0;
    std::unique_ptr<char, decltype(&std::free)> const name(
        abi::__cxa_demangle(type.name(), nullptr, nullptr, &status), &std::free);
    return status == 0 ? name.get() : type.name();
}

std::string withoutEnd(std::string name, std::string_view end) {
    if (name.ends_with(end)) {
        name.resize(name.size() - end.size());
    }
    return name;
}

} // namespace

std::string classNameOf(KFFactory const& factory) {
    return withoutEnd(nameOfType(typeid(factory)), "_Factory");
}

std::string classNameOf(KFChannelBase const& channel) {
    KFFactory const* const factory = channel.getFactory();
    return factory != nullptr ? classNameOf(*factory) : nameOfType(typeid(channel));
}

std::string shortClassName(std::string_view className) {
    for (std::string_view const prefix : {"KFChannel", "KFChan", "KF"}) {
        // The class KFChannel itself is a channel.
        if (className.starts_with(prefix) && className != "KFChannel") {
            className.remove_prefix(prefix.size());
            break;
        }
    }
    if (className == "KFChannel") {
        return "Channel";
    }
    return className == "Base" ? "Base" : withoutEnd(std::string(className), "Base");
}

KFFactory* factoryOfClass(std::string_view name) {
    for (auto const& [uuid, factory] : KFFactories::getInstance().factories()) {
        std::string const full = classNameOf(*factory);
        if (sameWord(full, name) || sameWord(shortClassName(full), name)) {
            return factory;
        }
    }
    return nullptr;
}

std::vector<std::string> storedClassNames() {
    std::vector<std::string> names;
    for (auto const& [uuid, factory] : KFFactories::getInstance().factories()) {
        std::unique_ptr<KFChannelBase> const example = exampleOf(factory);
        if (example != nullptr && !example->testFlag(kChannelFlagNotSaved)) {
            names.push_back(shortClassName(classNameOf(*factory)));
        }
    }
    return names;
}

std::unique_ptr<KFChannelBase> exampleOf(KFFactory* factory) { return KFExampleOf(factory); }

std::string_view unitOf(KFChannelBase const& channel) {
    KFFactory const* const factory = channel.getFactory();
    bool const isAngle =
        factory != nullptr && (factory->isKindOfClass(KFChannelAngle_Factory::getInstance().uuid()) ||
                               factory->isKindOfClass(KFChannelShearAngle_Factory::getInstance().uuid()));
    return isAngle ? "rad" : "units";
}

} // namespace lumenkey::tools
