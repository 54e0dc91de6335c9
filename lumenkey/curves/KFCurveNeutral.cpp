// Operations that this curve refuses: it takes part in no takes, follows no dynamic curve and stores nothing of itself.
// None changes anything, and those with an answer give false.

#include "lumenkey/curves/KFCurve.h"

// --- Documents ---

void KFCurve::writeHeader(BXSerializerWriteStream&, bool) {}
void KFCurve::writeBody(BXSerializerWriteStream&, bool, bool, bool) {}
void KFCurve::markFactoriesForSerialization(BXSerializerWriteStream&, bool) {}
bool KFCurve::parseBegin(BXSerializerReadStream&) { return false; }
bool KFCurve::parseEnd(BXSerializerReadStream&) { return false; }
bool KFCurve::parseElement(BXSerializerReadStream&, BXStreamElement&) { return false; }

// --- Curves of dynamic channels ---

bool KFCurve::generateCurveFromDynamicCurve(Tempus const&, KFDynamicCurve*) { return false; }

// --- Takes ---

bool KFCurve::beginPlayback(Tempus const&, std::uint32_t, std::uint32_t, Tempus const&) { return false; }
bool KFCurve::endPlayback(Tempus const&) { return false; }
bool KFCurve::beginRecording(Tempus const&) { return false; }
bool KFCurve::endRecording(Tempus const&) { return false; }
bool KFCurve::updateCurrentRecordingTime(Tempus const&) { return false; }
bool KFCurve::isPlaying(std::uint32_t*, std::uint32_t*, Tempus*) { return false; }
bool KFCurve::isRecording() { return false; }
