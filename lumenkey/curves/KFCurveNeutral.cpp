// Operations that this curve refuses: it takes part in no takes, reshapes no stretch and stores nothing of itself.
// Each answers false, or 0, and changes nothing.

#include "lumenkey/curves/KFCurve.h"

// --- Documents ---

void KFCurve::writeHeader(BXSerializerWriteStream&, bool) {}
void KFCurve::writeBody(BXSerializerWriteStream&, bool, bool, bool) {}
void KFCurve::markFactoriesForSerialization(BXSerializerWriteStream&, bool) {}
bool KFCurve::parseBegin(BXSerializerReadStream&) { return false; }
bool KFCurve::parseEnd(BXSerializerReadStream&) { return false; }
bool KFCurve::parseElement(BXSerializerReadStream&, BXStreamElement&) { return false; }

// --- Operations on the shape of a stretch ---

bool KFCurve::bakeCurve(void*, Tempus const&, Tempus const&, Tempus const&, double, double) { return false; }

bool KFCurve::simplifyCurve(Tempus const&, Tempus const&, Tempus const&, double, double, std::uint32_t,
                            std::int32_t) {
    return false;
}

bool KFCurve::smoothCurve(Tempus const&, Tempus const&, Tempus const&) { return false; }

bool KFCurve::generateCurveFromDynamicCurve(Tempus const&, KFDynamicCurve*) { return false; }

bool KFCurve::createCurveSegment(Tempus const&, Tempus const&, Tempus const&, bool, bool) { return false; }

bool KFCurve::setCurveSegmentValue(Tempus const&, double, bool) { return false; }

bool KFCurve::setCurveSegmentValueBounded(Tempus const&, double, double, double, bool) { return false; }

std::uint32_t KFCurve::generateKeypoints(std::uint32_t, std::uint32_t, bool) { return 0; }

// --- Takes ---

bool KFCurve::beginPlayback(Tempus const&, std::uint32_t, std::uint32_t, Tempus const&) { return false; }
bool KFCurve::endPlayback(Tempus const&) { return false; }
bool KFCurve::beginRecording(Tempus const&) { return false; }
bool KFCurve::endRecording(Tempus const&) { return false; }
bool KFCurve::updateCurrentRecordingTime(Tempus const&) { return false; }
bool KFCurve::isPlaying(std::uint32_t*, std::uint32_t*, Tempus*) { return false; }
bool KFCurve::isRecording() { return false; }
