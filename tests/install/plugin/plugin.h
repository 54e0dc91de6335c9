#pragma once

#include "lumenkey/lumenkey.h"

#include <vector>

/// What the plug-in's objects were last asked, by the name of the operation.
using PluginJournal = char const*;

/// One operation that a plug-in's class overrides: its object, its slot in the table of virtual operations (the two
/// destructors count), and how to call whatever stands in that slot.
struct PluginSlot {
    char const* name;
    unsigned int slot;
    void* object;
    void (*callSlot)(void* object, unsigned int slot);
};

/// What the plug-in exports under the name `lumenkeyPluginSlots`.
struct PluginInterface {
    std::vector<PluginSlot> slots;
    PluginJournal const* lastAsked;
    KFChannelObjectRootBase* root;
    KFChannel* channel;
    KFCurveNode* (*makeNode)();
};
