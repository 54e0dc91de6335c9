#pragma once

#include "lumenkey/Channels/KFFactory.h"
#include "tools/check/CurveCheck.h"
#include "tools/check/DocumentScanner.h"
#include "tools/check/DocumentVocabulary.h"
#include "tools/check/FlagsCheck.h"
#include "tools/check/FolderCheck.h"
#include "tools/check/KeypointCheck.h"

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace lumenkey::tools {

/// An element of a document that is being checked, while it is open.
struct OpenElement {
    std::string name;
    DocumentWord const* word = nullptr;
    TextPlace place;
    std::string text;
    /// Whether it has a text, which is lost because another element stands in it.
    bool hasLostText = false;
    /// Its parts so far, but for those of which there may be several.
    std::vector<DocumentWord const*> parts;
    /// Whether text that is passed over has been told, and nothing has ended it.
    bool isInStrayText = false;
    /// Of a channel: its class, or null; and those of its children so far, by ID.
    KFFactory* factory = nullptr;
    std::map<std::uint64_t, KFFactory*> children;
    /// One like what a reader makes for it, before anything is read into it; null where there is none.
    KFChannelBase* example = nullptr;
    std::optional<FlagsCheck> flags;
    FolderCheck folder;
    /// Of a channel or a curve. What those of a curve may be is known at its end.
    std::vector<std::pair<std::string, std::string>> attributes;
    /// Of a curve.
    CurveClass curveClass;
    CurveLimits limits;
    bool hasKeypoints = false;
    /// Also of a disabled keypoint: behind one that is seen, or before it is known that there is none.
    bool takesBias = false;
    /// As from the first keypoint on, or from their number.
    bool canBeClosed = false;
    /// Where it says that it is closed.
    std::optional<TextPlace> closedPlace;
    Tempus lastTime = kTempusInvalid;
    /// Where the last of the limits stands.
    TextPlace limitPlace;
    std::optional<KeypointCheck> keypoint;

    Attributes attributeViews() const { return {attributes.begin(), attributes.end()}; }
};

} // namespace lumenkey::tools
