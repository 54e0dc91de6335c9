// Takes: values that are recorded while time runs, and become keypoints at the end.

#include "lumenkey/curves/KFCurve.h"

bool KFCurve::beginPlayback(Tempus const& t, std::uint32_t scope, std::uint32_t mode,
                            Tempus const& resolution) {
    if (getSpline() == nullptr)
        return false;
    if (_recordingNode != nullptr)
        return _recordingNode->beginPlayback(t, scope, mode, resolution);
    // A refusal leaves no node behind, in which recording could begin all the same.
    auto made = std::make_unique<KFRecordingNode>(&_splineNode);
    if (!made->beginPlayback(t, scope, mode, resolution))
        return false;
    _recordingNode = std::move(made);
    return true;
}

bool KFCurve::endPlayback(Tempus const& t) {
    if (_recordingNode == nullptr)
        return false;
    _recordingNode->endPlayback(t);
    return true;
}

bool KFCurve::beginRecording(Tempus const& t) {
    if (_recordingNode == nullptr)
        return false;
    _recordingNode->beginRecording(t);
    adoptRoot(kRootRecording);
    return true;
}

bool KFCurve::endRecording(Tempus const& t) {
    if (_recordingNode == nullptr)
        return false;
    _recordingNode->endRecording(t);
    adoptRoot(kRootSpline);
    return true;
}

bool KFCurve::updateCurrentRecordingTime(Tempus const& t) {
    if (_recordingNode == nullptr)
        return false;
    _recordingNode->updateCurrentTime(t);
    return true;
}

bool KFCurve::isPlaying(std::uint32_t* outScope, std::uint32_t* outMode, Tempus* outResolution) {
    if (_recordingNode == nullptr || !_recordingNode->isPlaying())
        return false;
    _recordingNode->getTake(outScope, outMode, outResolution);
    return true;
}

bool KFCurve::isRecording() { return _rootKind == kRootRecording; }
