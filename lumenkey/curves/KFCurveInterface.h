#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXLocks.h"
#include "lumenkey/foundation/BXSerializer.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>
#include <utility>
#include <vector>

class KFCurveNode;
class KFCustomInterpolator;
class KFDynamicCurve;

/// What a channel asks of its curve: the value at a time, and the storing of a value at a time.
///
/// Times are those of the curve. Nothing is reported but by the result: false, or 0, means that nothing was done or
/// found and that nothing changed, but for the few operations that always give false. What each does stands in
/// `KFCurve`, the one that channels accept. The order of the virtual operations is fixed: hosts are built against it.
class LUMENKEY_API KFCurveInterface : public BXSerializer {
public:
    ~KFCurveInterface() override;

    // Settings and the state of animation.
    virtual bool isCurveAnimated(bool* out) = 0;
    virtual bool setCurveKeyframable(bool keyframable) = 0;
    virtual bool isCurveKeyframable() = 0;
    virtual bool lockCurve(bool lock) = 0;
    virtual bool setCurveParametric(bool parametric) = 0;
    virtual bool isCurveParametric() = 0;
    virtual bool closeCurve() = 0;
    virtual bool isClosedCurve(bool* out) = 0;
    virtual bool setCurveDeriveTangents(bool derive) = 0;
    virtual bool isCurveDeriveTangents() = 0;
    virtual bool getCurveType(std::uint32_t* out) = 0;
    virtual bool setCurveType(std::uint32_t type) = 0;
    virtual bool setRoundingInUSpace(bool inUSpace) = 0;
    virtual bool isRoundingInUSpace() = 0;
    virtual bool setCurveToDefault() = 0;
    virtual bool getCurveDefaultValue(double* out) = 0;
    virtual bool setCurveDefaultValue(double value) = 0;
    virtual bool getCurveInitialValue(double* out) = 0;
    virtual bool setCurveInitialValue(double value) = 0;
    virtual bool getCurrentMaxValueU(Tempus* out) = 0;
    virtual bool getCurrentMinValueU(Tempus* out) = 0;
    virtual bool getCurrentMaxValueV(double* out, bool withTangents) = 0;
    virtual bool getCurrentMinValueV(double* out, bool withTangents) = 0;
    virtual bool getAbsoluteMaxValueV(double* out) = 0;
    virtual bool getAbsoluteMinValueV(double* out) = 0;
    virtual bool setAbsoluteMaxValueV(double value) = 0;
    virtual bool setAbsoluteMinValueV(double value) = 0;
    virtual bool getCurrentRangeU(Tempus* out) = 0;
    virtual bool setCurveInterpolation(std::uint32_t type) = 0;
    virtual bool getCurveInterpolation(std::uint32_t* out) = 0;
    virtual bool hasInterpolation(std::uint32_t type, bool* out) = 0;
    virtual bool setCustomInterpolator(KFCustomInterpolator* interpolator, BXSpinLock* lock) = 0;
    virtual bool setCurveExtrapolation(std::uint32_t mode, std::uint32_t which) = 0;
    virtual bool getCurveExtrapolation(std::uint32_t* out, std::uint32_t which) = 0;
    virtual bool setRetimingExtrapolation(bool retiming) = 0;
    virtual bool getRetimingExtrapolation() = 0;

    // Samples, and operations on the shape of a stretch.
    virtual bool bakeCurve(void* node, Tempus const& start, Tempus const& step, Tempus const& end,
                           double tolerance, double scale) = 0;
    virtual bool getCurveSamples(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                 std::vector<Tempus>* times, std::vector<double>* values) = 0;
    virtual bool getCurveSamples(void* node, Tempus const& start, Tempus const& step, std::uint32_t& count,
                                 std::vector<Tempus>* times, std::vector<double>* values) = 0;
    virtual bool getCurveSamples(double start, double step, std::uint32_t& count, double** times,
                                 double** values, double operand) = 0;
    virtual bool getCurveSamples(double start, double step, std::uint32_t& count, std::vector<double>* times,
                                 std::vector<double>* values) = 0;
    virtual bool getCurveSamples(void* node, Tempus const& start, Tempus const& step, std::uint32_t& count,
                                 Tempus** times, double** values) = 0;
    virtual bool getCurveSamples(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                 Tempus** times, double** values) = 0;
    virtual bool getSplineSamplesAndIgnoreLinear(Tempus const& start, Tempus const& end, Tempus const& step,
                                                 std::vector<Tempus>* times, std::vector<double>* values) = 0;
    virtual bool getCurveDerivativesSamples(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                            std::vector<Tempus>* times, std::vector<double>* values) = 0;
    virtual bool getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range,
                              Tempus& frameDuration, std::uint32_t flags) = 0;
    virtual bool setCurveOffset(Tempus const& t, double value) = 0;
    virtual bool scaleCurve(double factor) = 0;
    virtual bool warpCurveLinear(double factor, Tempus const& t, bool force) = 0;
    virtual bool forceRetimeCurve(Tempus const& scale, Tempus const& offset) = 0;
    virtual bool reparametrizeCurve() = 0;
    virtual bool loadVertices(bool loading, std::uint32_t count) = 0;
    virtual bool generateCurveFromDynamicCurve(Tempus const& t, KFDynamicCurve* dynamicCurve) = 0;
    virtual bool simplifyCurve(Tempus const& start, Tempus const& end, Tempus const& step, double tolerance,
                               double range, std::uint32_t mode, std::int32_t radius) = 0;
    virtual bool smoothCurve(Tempus const& start, Tempus const& end, Tempus const& step) = 0;
    virtual std::uint32_t getNumberOfKeypoints() = 0;
    virtual bool createCurveSegment(Tempus const& a, Tempus const& b, Tempus const& c, bool eased,
                                    bool force) = 0;
    virtual bool setCurveSegmentValue(Tempus const& t, double value, bool force) = 0;
    virtual bool setCurveSegmentValueBounded(Tempus const& t, double value, double low, double high,
                                             bool force) = 0;

    // Keypoints.
    virtual bool setKeypoint(Tempus const& t, bool force) = 0;
    virtual bool setKeypoint(Tempus const& t, double value, bool force) = 0;
    virtual bool setKeypoint(void* handle, Tempus const& t, double value, bool force) = 0;
    virtual bool setKeypointNoTangents(Tempus const& t, double value, bool force) = 0;
    virtual bool appendKeypointNoTangents(Tempus const& t, double value, bool force) = 0;
    virtual bool appendKeypointsNoTangents(std::uint32_t count, Tempus const* times, double const* values,
                                           bool force) = 0;
    virtual bool setKeypointValue(void* handle, double value, bool force) = 0;
    virtual bool setKeypointsValue(double value, bool force) = 0;
    virtual bool cloneKeypoint(void* handle, Tempus const& t, bool force) = 0;
    virtual bool getPoint(Tempus const& t, double operand, double* out) = 0;
    virtual bool getPointWithoutBehavior(Tempus const& t, double operand, double* out) = 0;
    virtual bool getPointFromCurveNode(Tempus const& t, double operand, double* out, void* node) = 0;
    virtual bool getPointInputTangents(Tempus const& t, double* dt, double* dv, bool scaled) = 0;
    virtual bool getPointOutputTangents(Tempus const& t, double* dt, double* dv, bool scaled) = 0;
    virtual bool moveKeypoint(void* handle, Tempus const& t, bool force, bool constrain, bool replace) = 0;
    virtual bool offsetKeypointInTime(void* handle, Tempus const& t, bool force) = 0;
    virtual bool delKeypoint(void* handle, bool force) = 0;
    virtual bool delKeypoints(Tempus const& start, Tempus const& end, bool force) = 0;
    virtual bool delAllKeypoints(Tempus const& t, bool force) = 0;
    virtual bool getKeypointHandle(Tempus const& t, void** out) = 0;
    virtual bool getPreviousValidKeypointHandle(void* handle, void** out) = 0;
    virtual bool getPreviousValidKeypointHandle(Tempus const& t, void** out) = 0;
    virtual bool getNextValidKeypointHandle(void* handle, void** out) = 0;
    virtual bool getNextValidKeypointHandle(Tempus const& t, void** out) = 0;
    virtual bool getNextKeypoint(Tempus const& t, Tempus* outTime, double* outValue) = 0;
    virtual bool getPreviousKeypoint(Tempus const& t, Tempus* outTime, double* outValue) = 0;
    virtual bool getKeypoint(void* handle, Tempus* outTime, double* outValue) = 0;
    virtual bool getFirstKeypoint(Tempus* outTime, double* outValue) = 0;
    virtual bool getFirstValidKeypointHandle(void** out) = 0;
    virtual bool getLastKeypoint(Tempus* outTime, double* outValue) = 0;
    virtual bool getLastValidKeypointHandle(void** out) = 0;
    virtual bool getKeypointHandleList(std::vector<void*>& out) = 0;
    virtual bool getKeypointValidHandleList(std::vector<void*>& out) = 0;
    virtual bool getKeypointsTimeAndValue(TempusRange range,
                                          std::vector<std::pair<Tempus, std::pair<double, unsigned>>>& out,
                                          Tempus* first, Tempus* last) = 0;
    virtual bool reverseKeypoints(void* first, void* last, bool force) = 0;
    virtual std::uint32_t generateKeypoints(std::uint32_t side, std::uint32_t cycles, bool force) = 0;
    virtual bool purgeCurve() = 0;
    virtual bool getKeypointFlags(void* handle, std::uint32_t* out) = 0;
    virtual bool setKeypointFlags(void* handle, std::uint32_t flags, bool force) = 0;
    virtual bool enableKeypoint(void* handle, bool enable, bool force) = 0;
    virtual bool isEnabledKeypoint(void* handle, bool* out) = 0;
    virtual bool selectKeypoint(void* handle, bool select, bool force) = 0;
    virtual bool lockKeypoint(void* handle, bool lock, bool force) = 0;
    virtual bool isLockedKeypoint(void* handle, bool* out) = 0;
    virtual bool breakKeypointHandles(void* handle, bool broken, bool force) = 0;
    virtual bool areHandlesBroken(void* handle, bool* out) = 0;
    virtual bool weightHandles(void* handle, bool weighted, bool force) = 0;
    virtual bool areHandlesWeighted(void* handle, bool* out) = 0;
    virtual bool deriveKeypoint(void* handle) = 0;
    virtual bool setKeypointSmooth(void* handle, bool smooth, bool force) = 0;
    virtual bool flattenHandles(void* handle, bool force) = 0;
    virtual bool getKeypointNormal(void* handle, double* out) = 0;
    virtual bool setKeypointNormal(void* handle, double normal, bool force) = 0;
    virtual bool getKeypointNormal(Tempus const& t, double* out) = 0;
    virtual bool setKeypointNormal(Tempus const& t, double normal, bool force) = 0;
    virtual bool setKeypointInputHandles(void* handle, double dt, double dv, bool force) = 0;
    virtual bool setKeypointOutputHandles(void* handle, double dt, double dv, bool force) = 0;
    virtual bool getKeypointInputHandles(void* handle, double* dt, double* dv) = 0;
    virtual bool getKeypointOutputHandles(void* handle, double* dt, double* dv) = 0;
    virtual bool setKeypointInputNormalizedTangents(void* handle, double dt, double dv, bool force) = 0;
    virtual bool setKeypointOutputNormalizedTangents(void* handle, double dt, double dv, bool force) = 0;
    virtual bool getKeypointInputNormalizedTangents(void* handle, double* dt, double* dv) = 0;
    virtual bool getKeypointOutputNormalizedTangents(void* handle, double* dt, double* dv) = 0;
    virtual bool setKeypointBiasLinear(void* handle, double bias) = 0;
    virtual bool getKeypointBiasLinear(void* handle, double* out) = 0;
    virtual bool setKeypointInterpolation(void* handle, std::uint32_t type, bool force) = 0;
    virtual bool getKeypointInterpolation(void* handle, std::uint32_t* outType, bool* outUsesTangents) = 0;
    virtual bool setKeypointSpeed(void* handle, std::uint32_t speed, bool force) = 0;
    virtual bool getKeypointSpeed(void* handle, std::uint32_t* out) = 0;
    virtual bool adjustKeypointSpeed(void* handle, double delta, bool force) = 0;

    // The chain of processing nodes.
    virtual bool appendCurveProcessingNode(KFCurveNode* node) = 0;
    virtual bool insertCurveProcessingNode(KFCurveNode* node, KFCurveNode* after) = 0;
    virtual bool deleteCurveProcessingNode(KFCurveNode* node) = 0;
    virtual bool removeCurveProcessingNode(KFCurveNode* node) = 0;
    virtual bool getPreviousProcessingNode(KFCurveNode* node, KFCurveNode** out) = 0;
    virtual bool enumerateCurveProcessingNodes(std::vector<KFCurveNode*>& out) = 0;
    virtual bool getNumCurveProcessingNodes(std::uint32_t* out) = 0;

    // Takes.
    virtual bool beginPlayback(Tempus const& t, std::uint32_t scope, std::uint32_t mode,
                               Tempus const& resolution) = 0;
    virtual bool endPlayback(Tempus const& t) = 0;
    virtual bool beginRecording(Tempus const& t) = 0;
    virtual bool endRecording(Tempus const& t) = 0;
    virtual bool updateCurrentRecordingTime(Tempus const& t) = 0;
    virtual bool isPlaying(std::uint32_t* outScope, std::uint32_t* outMode, Tempus* outResolution) = 0;
    virtual bool isRecording() = 0;

    // Copies and values.
    virtual KFCurveInterface* getCurveWorkingCopy() = 0;
    virtual KFCurveInterface* cloneCurve() = 0;
    virtual bool supportsAssignmentOperator() = 0;
    virtual bool isCurveBoolean() = 0;
    virtual double getValue(Tempus const& t, void* node) = 0;
    virtual double getValue(Tempus const& t, double operand) = 0;
};
