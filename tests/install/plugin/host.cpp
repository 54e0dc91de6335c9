// plugin_host PLUGIN: loads the plug-in; the library reaches the plug-in's overrides on its own ways.

#include "plugin.h"

#include <dlfcn.h>

#include <iostream>

namespace {

bool isGood = true;

void expect(bool condition, char const* what) {
    if (!condition) {
        std::cerr << "plugin_host: " << what << '\n';
        isGood = false;
    }
}

} // namespace

int main(int argumentCount, char** arguments) {
    void* const handle = argumentCount == 2 ? dlopen(arguments[1], RTLD_NOW | RTLD_LOCAL) : nullptr;
    if (handle == nullptr) {
        std::cerr << "plugin_host: " << dlerror() << '\n';
        return 2;
    }
    using GetInterface = PluginInterface const* (*)();
    auto const getInterface = reinterpret_cast<GetInterface>(dlsym(handle, "lumenkeyPlugin"));
    if (getInterface == nullptr) {
        return 2;
    }
    auto const& [root, channel, makeNode, visitor, lastVisited] = *getInterface();
    root->push_back(channel);
    channel->setValue(kTempusZero, 3.0, false);
    expect(channel->getValueAsDouble(kTempusZero, 0.0) == 3.0, "a channel doesn't keep its value");
    channel->appendCurveProcessingNode(makeNode());
    expect(channel->getValueAsDouble(kTempusZero, 0.0) == 6.0, "a node isn't run");
    expect(channel->getSliderMax() == 7.0, "a channel isn't asked for the end of its slider");
    expect(channel->getTimeOffset() == TempusMake(1, 2), "a root isn't asked for its offset");
    expect(channel->KFChannelBase::getFrameDuration() == TempusMake(1, 25),
           "a root isn't asked for its frame duration");
    KFChannelSegmentVisitor::visitSegments(*channel, kTempusZero, TempusMake(1, 1), *visitor);
    expect(*lastVisited == 3.0, "a visitor isn't sent round");
    root->removeDescendant(channel);
    return isGood ? 0 : 1;
}
