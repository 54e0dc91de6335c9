// Internal: not installed.
#pragma once

#include "lumenkey/foundation/BXSerializerStreams.h"

// The names of a document's elements and attributes. A number means what the innermost scope in force says,
// so one may stand for different things in different tables. They reach documents: never rename or renumber
// one.

// Elements.
inline constexpr std::uint32_t kOldDocumentElement = 90;
inline constexpr std::uint32_t kDocumentElement = 91;
inline constexpr std::uint32_t kParameterElement = 110;
inline constexpr std::uint32_t kFoldFlagsElement = 111;
inline constexpr std::uint32_t kFlagsElement = 112;
inline constexpr std::uint32_t kCurveElement = 118;
inline constexpr std::uint32_t kFadeInOffsetElement = 119;
inline constexpr std::uint32_t kFadeOutOffsetElement = 120;
inline constexpr std::uint32_t kFadeInCurveElement = 130;
inline constexpr std::uint32_t kFadeOutCurveElement = 131;

// Of a curve.
inline constexpr std::uint32_t kPostExtrapolationElement = 51;
inline constexpr std::uint32_t kPreExtrapolationElement = 52;
inline constexpr std::uint32_t kKeypointElement = 53;
inline constexpr std::uint32_t kTimeElement = 54;
inline constexpr std::uint32_t kValueElement = 55;
inline constexpr std::uint32_t kInputTangentTimeElement = 56;
inline constexpr std::uint32_t kInputTangentValueElement = 57;
inline constexpr std::uint32_t kOutputTangentTimeElement = 58;
inline constexpr std::uint32_t kOutputTangentValueElement = 59;
inline constexpr std::uint32_t kBiasElement = 60;
inline constexpr std::uint32_t kClosedElement = 61;
inline constexpr std::uint32_t kNumberOfKeypointsElement = 62;
inline constexpr std::uint32_t kNormalElement = 63;
inline constexpr std::uint32_t kMinElement = 64;
inline constexpr std::uint32_t kMaxElement = 65;

// Of an object root.
inline constexpr std::uint32_t kTimingElement = 150;
inline constexpr std::uint32_t kRootFoldFlagsElement = 151;
inline constexpr std::uint32_t kBaseFlagsElement = 152;
inline constexpr std::uint32_t kEnabledElement = 153;
inline constexpr std::uint32_t kLockedElement = 154;

// Attributes of a node.
inline constexpr std::uint32_t kNameAttribute = 110;
inline constexpr std::uint32_t kIDAttribute = 111;
inline constexpr std::uint32_t kFlagsAttribute = 112;
inline constexpr std::uint32_t kFactoryIDAttributeOfNode = 113;
inline constexpr std::uint32_t kValueAttribute = 114;
inline constexpr std::uint32_t kDefaultAttribute = 115;
inline constexpr std::uint32_t kVersionAttribute = 116;
inline constexpr std::uint32_t kUUIDAttribute = 117;

// Attributes of a curve, a keypoint, and the timing of a root.
inline constexpr std::uint32_t kCurveValueAttribute = 1;
inline constexpr std::uint32_t kCurveTypeAttribute = 4;
inline constexpr std::uint32_t kCurveParametricAttribute = 5;
inline constexpr std::uint32_t kCurveRoundAttribute = 6;
inline constexpr std::uint32_t kCurveRetimingAttribute = 7;
inline constexpr std::uint32_t kCurveDefaultAttribute = 8;
inline constexpr std::uint32_t kKeypointEnabledAttribute = 9;
inline constexpr std::uint32_t kKeypointInterpolationAttribute = 10;
inline constexpr std::uint32_t kKeypointFlagsAttribute = 11;
inline constexpr std::uint32_t kTimingInAttribute = 1;
inline constexpr std::uint32_t kTimingOutAttribute = 2;
inline constexpr std::uint32_t kTimingOffsetAttribute = 3;

/// What stands around the nodes. An older root element has its version in the same place.
inline constexpr BXScope KFMLScope[] = {
    BXScope::element("kfdoc", kOldDocumentElement),
    BXScope::attribute("version", kOldDocumentElement, kVersionAttribute),
    BXScope::element("kfml", kDocumentElement),
    BXScope::attribute("version", kDocumentElement, kVersionAttribute),
    BXScope::element("description", 93),
    BXScope::element("version", 94),
    BXScope::element("manufacturer", 95),
    BXScope::element("factory", 92),
    BXScope::attribute("id", 92, kIDAttribute),
    BXScope::attribute("uuid", 92, kUUIDAttribute),
    BXScope::element("parameter", kParameterElement),
    BXScope::attribute("name", kParameterElement, kNameAttribute),
    BXScope::attribute("id", kParameterElement, kIDAttribute),
    BXScope::attribute("flags", kParameterElement, kFlagsAttribute),
    BXScope::attribute("value", kParameterElement, kValueAttribute),
    BXScope::attribute("default", kParameterElement, kDefaultAttribute),
    BXScope::attribute("factoryID", kParameterElement, kFactoryIDAttributeOfNode),
    BXScope::end(),
};

/// The internal name is in the table only: it isn't stored.
inline constexpr BXScope KFChannelBaseScope[] = {
    BXScope::element("parameter", kParameterElement),
    BXScope::attribute("factoryID", kParameterElement, kFactoryIDAttributeOfNode),
    BXScope::attribute("name", kParameterElement, kNameAttribute),
    BXScope::attribute("internalName", kParameterElement, 118),
    BXScope::attribute("id", kParameterElement, kIDAttribute),
    BXScope::attribute("flags", kParameterElement, kFlagsAttribute),
    BXScope::element("flags", kFlagsElement),
    BXScope::end(),
};

inline constexpr BXScope KFChannelBaseReadScope[] = {
    BXScope::element("flags", kFlagsElement),
    BXScope::end(),
};

inline constexpr BXScope KFChannelScope[] = {
    BXScope::element("parameter", kParameterElement),
    BXScope::attribute("factoryID", kParameterElement, kFactoryIDAttributeOfNode),
    BXScope::attribute("name", kParameterElement, kNameAttribute),
    BXScope::attribute("id", kParameterElement, kIDAttribute),
    BXScope::attribute("flags", kParameterElement, kFlagsAttribute),
    BXScope::attribute("value", kParameterElement, kValueAttribute),
    BXScope::attribute("default", kParameterElement, kDefaultAttribute),
    BXScope::element("fadeInOffset", kFadeInOffsetElement),
    BXScope::element("fadeOutOffset", kFadeOutOffsetElement),
    BXScope::element("fadeInCurve", kFadeInCurveElement),
    BXScope::element("fadeOutCurve", kFadeOutCurveElement),
    BXScope::end(),
};

inline constexpr BXScope KFCurveScope[] = {
    BXScope::element("curve", kCurveElement),
    BXScope::attribute("value", kCurveElement, kCurveValueAttribute),
    BXScope::attribute("type", kCurveElement, kCurveTypeAttribute),
    BXScope::attribute("parametric", kCurveElement, kCurveParametricAttribute),
    BXScope::attribute("round", kCurveElement, kCurveRoundAttribute),
    BXScope::attribute("retimingExtrapolation", kCurveElement, kCurveRetimingAttribute),
    BXScope::attribute("default", kCurveElement, kCurveDefaultAttribute),
    BXScope::element("postExtrapolation", kPostExtrapolationElement),
    BXScope::element("preExtrapolation", kPreExtrapolationElement),
    BXScope::element("min", kMinElement),
    BXScope::element("max", kMaxElement),
    BXScope::element("keypoint", kKeypointElement),
    BXScope::element("time", kTimeElement),
    BXScope::element("value", kValueElement),
    BXScope::element("inputTangentTime", kInputTangentTimeElement),
    BXScope::element("inputTangentValue", kInputTangentValueElement),
    BXScope::element("outputTangentTime", kOutputTangentTimeElement),
    BXScope::element("outputTangentValue", kOutputTangentValueElement),
    BXScope::element("bias", kBiasElement),
    BXScope::element("closed", kClosedElement),
    BXScope::attribute("enabled", kKeypointElement, kKeypointEnabledAttribute),
    BXScope::attribute("interpolation", kKeypointElement, kKeypointInterpolationAttribute),
    BXScope::attribute("flags", kKeypointElement, kKeypointFlagsAttribute),
    BXScope::element("numberOfKeypoints", kNumberOfKeypointsElement),
    BXScope::element("normal", kNormalElement),
    BXScope::end(),
};

inline constexpr BXScope KFChannelFolderScope[] = {
    BXScope::element("parameter", kParameterElement),
    BXScope::attribute("name", kParameterElement, kNameAttribute),
    BXScope::attribute("id", kParameterElement, kIDAttribute),
    BXScope::attribute("flags", kParameterElement, kFlagsAttribute),
    BXScope::attribute("factoryID", kParameterElement, kFactoryIDAttributeOfNode),
    BXScope::attribute("value", kParameterElement, kValueAttribute),
    BXScope::attribute("default", kParameterElement, kDefaultAttribute),
    BXScope::element("foldFlags", kFoldFlagsElement),
    BXScope::end(),
};

inline constexpr BXScope KFChannelObjectRootBaseScope[] = {
    BXScope::element("timing", kTimingElement),
    BXScope::attribute("in", kTimingElement, kTimingInAttribute),
    BXScope::attribute("out", kTimingElement, kTimingOutAttribute),
    BXScope::attribute("offset", kTimingElement, kTimingOffsetAttribute),
    BXScope::element("foldFlags", kRootFoldFlagsElement),
    BXScope::element("baseFlags", kBaseFlagsElement),
    BXScope::element("enabled", kEnabledElement),
    BXScope::element("locked", kLockedElement),
    BXScope::end(),
};
