#pragma once

#include "lumenkey/lumenkey.h"

/// What the plug-in exports under the name `lumenkeyPlugin`: objects of classes that it derives from the library's.
struct PluginInterface {
    KFChannelObjectRootBase* root; ///< Has an offset of 1/2 s and frames of 1/25 s.
    KFChannel* channel;            ///< Its slider ends at 7.
    KFCurveNode* (*makeNode)();    ///< Doubles what it gets.
    KFChannelSegmentVisitor* visitor;
    double const* lastVisited; ///< The constant that the visitor came by.
};
