#include "tools/check/DocumentClasses.h"

#include "lumenkey/Channels/KFChannelFactories.h"
#include "lumenkey/Channels/KFFactories.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/tree/ChannelClass.h"

#include <optional>

namespace lumenkey::tools {

std::vector<Fault> DocumentClasses::readFactory(Attributes const& attributes) {
    std::optional<std::uint32_t> const number = readWhole32(attributeOf(attributes, "id"));
    std::string const uuidText(attributeOf(attributes, "uuid"));
    std::optional<BXUUID> const uuid = readUUID(uuidText);
    if (!number || !uuid) {
        return {{"a factory needs an 'id', which is a whole number, and a 'uuid'"}};
    }
    std::vector<Fault> faults;
    KFFactory* const factory = KFFactories::getInstance().findFactory(*uuid);
    if (auto const [before, isNew] = _factories.try_emplace(*number, factory); !isNew) {
        faults.push_back({"the factory has the id " + std::to_string(*number) + " of one before it" +
                              (factory == nullptr ? "" : ", whose place it takes"),
                          before->second == factory});
        before->second = factory == nullptr ? before->second : factory;
    }
    if (factory == nullptr) {
        // A channel of it is a loss of its own.
        faults.push_back({"the class " + uuidText + " is unknown: its channels are passed over", true});
    }
    return faults;
}

std::string DocumentClasses::faultOfComponent(KFChannelBase const& component,
                                              Attributes const& attributes) const {
    std::string const name = component.getName().str();
    std::string const what = "the channel '" + name + "' is a part of its folder, which makes it";
    if (auto const given = attributes.find("name");
        given != attributes.end() && readString(given->second) != name) {
        return what + ": the name '" + std::string(given->second) + "' is passed over";
    }
    auto const given = _factories.find(readWhole32(attributeOf(attributes, "factoryID")).value_or(0));
    if (given != _factories.end() && given->second != nullptr && given->second != component.getFactory()) {
        return what + ": the class " + shortClassName(classNameOf(*given->second)) + " is passed over";
    }
    return {};
}

std::string DocumentClasses::faultOfClass(Attributes const& attributes, bool isTop, KFFactory** factory) {
    std::optional<std::uint32_t> const number = readWhole32(attributeOf(attributes, "factoryID"));
    if (!number) {
        *factory = &KFChannelObjectRootBase_Factory::getInstance();
        return isTop ? "" : " names no class";
    }
    auto const found = _factories.find(*number);
    *factory = found == _factories.end() ? nullptr : found->second;
    std::string const what = " is of factory " + std::to_string(*number);
    if (*factory == nullptr) {
        return what + (found == _factories.end() ? ", which isn't listed" : ", which is unknown");
    }
    if (*number == 0 && !isTop) {
        return what + ", which stands for none";
    }
    return of(*factory) == nullptr ? what + ", which makes no channels" : "";
}

} // namespace lumenkey::tools
