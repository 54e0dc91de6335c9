// plugin_host PLUGIN: loads the plug-in and calls its objects, by the pinned slots and through the library.

#include "plugin.h"

#include <dlfcn.h>

#include <cstring>
#include <iostream>

namespace {

int failures = 0;

void expect(bool condition, char const* what) {
    if (!condition) {
        std::cerr << "plugin_host: " << what << '\n';
        ++failures;
    }
}

/// The library reaches the plug-in's overrides on its own ways.
void useThroughLibrary(PluginInterface const& plugin) {
    plugin.root->push_back(plugin.channel);
    plugin.channel->setValue(kTempusZero, 3.0, false);
    expect(plugin.channel->getValueAsDouble(kTempusZero, 0.0) == 3.0,
           "a plug-in's channel doesn't keep its value");
    plugin.channel->appendCurveProcessingNode(plugin.makeNode());
    expect(plugin.channel->getValueAsDouble(kTempusZero, 0.0) == 6.0, "a plug-in's node isn't run");
    expect(plugin.channel->getTimeOffset() == TempusMake(1, 2),
           "a plug-in's root isn't asked for its offset");
    expect(plugin.channel->KFChannelBase::getFrameDuration() == TempusMake(1, 25),
           "a plug-in's root isn't asked for its frame duration");
    plugin.root->removeDescendant(plugin.channel);
}

} // namespace

int main(int argumentCount, char** arguments) {
    void* const handle = argumentCount == 2 ? dlopen(arguments[1], RTLD_NOW | RTLD_LOCAL) : nullptr;
    if (handle == nullptr) {
        std::cerr << "plugin_host: " << dlerror() << '\n';
        return 2;
    }
    using GetInterface = PluginInterface const* (*)();
    auto const getInterface = reinterpret_cast<GetInterface>(dlsym(handle, "lumenkeyPluginSlots"));
    if (getInterface == nullptr) {
        return 2;
    }
    PluginInterface const& plugin = *getInterface();
    for (PluginSlot const& slot : plugin.slots) {
        slot.callSlot(slot.object, slot.slot);
        if (std::strcmp(*plugin.lastAsked, slot.name) != 0) {
            std::cerr << "plugin_host: slot " << slot.slot << " holds " << *plugin.lastAsked << " instead of "
                      << slot.name << '\n';
            ++failures;
        }
    }
    useThroughLibrary(plugin);
    std::cout << plugin.slots.size() << " slots\n";
    return failures == 0 ? 0 : 1;
}
