#pragma once

#include "lumenkey/curves/KFConstantNode.h"
#include "lumenkey/curves/KFCurveInterface.h"
#include "lumenkey/curves/KFCurveNodeParam.h"
#include "lumenkey/curves/KFRecordingNode.h"
#include "lumenkey/curves/KFSplineNode.h"
#include "lumenkey/splines/KFSpline.h"

#include <atomic>
#include <memory>

class KFCurveOwner;
class KFSplineState;
struct KFCurveParseRecord;

/// A value over time: a root node, a chain of processing nodes behind it, and a clamp.
///
/// The root is a constant or a spline of keypoints; `getCurveType` tells 0 from 1. A curve that may be keyframed
/// usually has the spline root from the start, which answers its constant until the first keypoint. While values are
/// recorded into it, a recording is the root, which counts as a spline. The chain is the host's; the clamp to the
/// absolute minimum and maximum acts on the final value only, where the maximum wins if the two cross, and a
/// not-a-number passes.
///
/// `force` in an edit means: act although the process-wide animate switch is off and the curve has no keypoint. A
/// curve that is not keyframable refuses also then.
///
/// Threads: a curve has no lock. Reading may run beside one thread that edits keypoints or constants, which the
/// spline's lock keeps apart, and beside a take, its beginning and its end. Not beside anything else may run: making the
/// first keypoint and deleting the last, the first `beginPlayback`, switching the root, and changing the chain or the
/// settings record; nor comparing curves beside an edit of one. Whether a handle is valid and what is then done by it
/// are two steps: who reads by handle beside an editing thread knows that the keypoint stays. Long readers take a
/// `getCurveWorkingCopy`.
class LUMENKEY_API KFCurve : public KFCurveInterface {
public:
    /// Kinds of root: the numbers of `_rootKind`.
    static constexpr std::uint32_t kRootConstant = 0;
    static constexpr std::uint32_t kRootSpline = 1;
    static constexpr std::uint32_t kRootRecording = 2;

    /// On a curve that isn't parametric a handle is this many times the tangent that the spline stores.
    static constexpr double kHandleScale = 12.0;

    /// Modes of `simplifyCurve`.
    static constexpr std::uint32_t kSimplifyByFit = 2;
    static constexpr std::uint32_t kSimplifyToExtremes = 4;
    /// A stretch of more samples isn't reshaped, and a continuation of more keypoints isn't written: no call may take
    /// all the memory there is.
    static constexpr std::int64_t kMostShapeSamples = std::int64_t{1} << 24;
    static constexpr std::uint64_t kMostGeneratedKeypoints = std::uint64_t{1} << 22;

    /// The initial value goes to the constant node; the spline node starts at 0. The settings record is null until
    /// `setSplineState`.
    KFCurve(double minimum, double maximum, double initialValue);
    /// A copy without owner channel, and without what a take has recorded so far. A shared settings record is shared, a
    /// local one copied; the processing nodes are cloned with `cloneChain`, else the chain is empty (and the flags about
    /// it stay as they were).
    KFCurve(KFCurve const& other, bool cloneChain);
    KFCurve(KFCurve const&) = delete;
    /// Everything but the chain and the owner channel. With a chain of its own the curve also keeps the flags about it.
    KFCurve& operator=(KFCurve const& other);
    /// Limits, flags (those about the chain included), both embedded nodes, settings, kinds of root; the nodes of the
    /// chain are not looked at.
    bool operator==(KFCurve const& other) const;
    /// Whether zeros among constants, defaults and limits have the signs of the other's, which equality doesn't see:
    /// documents tell 0 and -0 apart.
    bool hasSignsOf(KFCurve const& other) const;
    ~KFCurve() override;

    // Of BXSerializer. The keypoints are read 4096 at a time under the spline's lock, for a digest 128, and written
    // without it, so that a write may run beside evaluation. Reading replaces the keypoints, keyframable or not;
    // settings that a document leaves out stay. `parseElement` answers true for whatever it is given.
    void writeHeader(BXSerializerWriteStream& stream, bool full) override;
    void writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) override;
    void markFactoriesForSerialization(BXSerializerWriteStream& stream, bool all) override;
    bool parseBegin(BXSerializerReadStream& stream) override;
    bool parseEnd(BXSerializerReadStream& stream) override;
    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override;

    // Settings and the state of animation. All out-parameters may be null; `getCurveType` then gives false, and so does
    // `getCurveInterpolation` without a spline. Setters of a setting that is already in force change and allocate
    // nothing; others make the settings record local first.
    //
    // `isCurveAnimated` gives `isAnimated`, and writes the same without a look at whether the curve is keyframable.
    // `setCurveType` takes 0 (constant), 1 and 3 (spline). Neither the initial nor the default value is clamped on
    // writing; both embedded nodes take them, and `setCurveToDefault` resets both. Current extremes are those of what
    // the curve holds, absolute ones are the clamp, whose change touches no stored value. `which` of the extrapolations
    // is 0 for the side after the last keypoint, any other number for the side before the first.
    // `setCurveInterpolation` gives false for a curve that isn't keyframable.
    bool isCurveAnimated(bool* out) override;
    bool setCurveKeyframable(bool keyframable) override;
    bool isCurveKeyframable() override;
    bool lockCurve(bool lock) override;
    bool setCurveParametric(bool parametric) override;
    bool isCurveParametric() override;
    bool closeCurve() override;
    bool isClosedCurve(bool* out) override;
    bool setCurveDeriveTangents(bool derive) override;
    bool isCurveDeriveTangents() override;
    bool getCurveType(std::uint32_t* out) override;
    bool setCurveType(std::uint32_t type) override;
    bool setRoundingInUSpace(bool inUSpace) override;
    bool isRoundingInUSpace() override;
    bool setCurveToDefault() override;
    bool getCurveDefaultValue(double* out) override;
    bool setCurveDefaultValue(double value) override;
    bool getCurveInitialValue(double* out) override;
    bool setCurveInitialValue(double value) override;
    bool getCurrentMaxValueU(Tempus* out) override;
    bool getCurrentMinValueU(Tempus* out) override;
    bool getCurrentMaxValueV(double* out, bool withTangents) override;
    bool getCurrentMinValueV(double* out, bool withTangents) override;
    bool getAbsoluteMaxValueV(double* out) override;
    bool getAbsoluteMinValueV(double* out) override;
    bool setAbsoluteMaxValueV(double value) override;
    bool setAbsoluteMinValueV(double value) override;
    bool getCurrentRangeU(Tempus* out) override;
    bool setCurveInterpolation(std::uint32_t type) override;
    bool getCurveInterpolation(std::uint32_t* out) override;
    bool hasInterpolation(std::uint32_t type, bool* out) override;
    bool setCustomInterpolator(KFCustomInterpolator* interpolator, BXSpinLock* lock) override;
    bool setCurveExtrapolation(std::uint32_t mode, std::uint32_t which) override;
    bool getCurveExtrapolation(std::uint32_t* out, std::uint32_t which) override;
    bool setRetimingExtrapolation(bool retiming) override;
    bool getRetimingExtrapolation() override;

    // --- Samples, and operations on the shape of a stretch ---
    //
    // `getCurveSamples`: sample i stands at `start + step * i`, doubles being seconds; `count` comes back lowered if a
    // node gave less. Forms with vectors append, forms with arrays (`*times`, `*values`) fill them from their start;
    // a target or its array may be null. Forms with `node` run the chain up to that node, with null the root alone,
    // the others all of it; with a node of another curve the values are zeros, and an array stays as it is. True.
    // `getUForValue` asks the root; give it an empty vector, since with keypoints its result says that the vector isn't
    // empty, and descending order is that of the whole vector. `scaleCurve` scales constants, defaults and keypoints,
    // each limited to the absolute minimum and maximum. `warpCurveLinear` and `forceRetimeCurve` need a spline; the
    // latter asks no more than that the curve be keyframable, and moves locked keypoints too. `loadVertices` brackets
    // the reading of many keypoints: true makes room for `count` (a hint) and puts off the list of valid ones, false
    // ends it. `generateCurveFromDynamicCurve` gives false and does nothing.
    //
    // Reshaping needs a spline root: `bakeCurve` makes the spline, `simplifyCurve` and `smoothCurve` want two
    // keypoints. It is false, with nothing changed, without those, for times that aren't numbers, a step that isn't
    // above zero and more samples than `kMostShapeSamples`; in the latter two, but for the thinning to extremes, also
    // for an end before the start, and in baking for a scale of 0 or that isn't finite and a node that isn't in the
    // chain. A stretch is cut into the whole steps that fit, so that its very end is no sample; the fit is that of
    // `BXCurveFit`, and what it gives are Bezier keypoints, whatever type those before had. Samples that aren't finite
    // are left out of it. A keypoint for the first one stands exactly there, others at the nearest tick of
    // `kKFChannelTimescale` (of the step, in `simplifyCurve`). Locked keypoints keep time and value. Where nothing
    // fits, the stretch is left without keypoints. A tolerance is that at the samples, for curves that aren't
    // parametric (whose handles mean something else) and without locked keypoints. Between two samples the curve isn't
    // looked at: there it may move by about as much as it spans over those and the next on either side.
    //
    // `bakeCurve` replaces the keypoints after `start` up to `end` by what the chain up to `node` gives (null: the
    // root), `tolerance` being hundredths of the curve's unit times `scale`. All keypoints of the curve become Bezier,
    // and `sanitizeBezier` is cleared in the settings, which become local first.
    // `simplifyCurve` does by `mode`, others than these nothing:
    // - `kSimplifyByFit` on a curve that isn't linear, or with a `radius` that isn't 0: a fit to the root within
    //   `tolerance` / 100 / `range`, of the moving average over 2 * `radius` + 1 samples where that is above 0. A
    //   stretch of at most one step is cut into 1000, unless the tolerance is above 1. On a linear curve with `radius`
    //   0 keypoints on a straight line go, and the ends of the stretch get keypoints.
    // - `kSimplifyToExtremes`: in the stretch only keypoints stay that are higher, or lower, than the last one that
    //   stayed and the next one.
    // `smoothCurve` leaves one keypoint with flat handles for each sample, filtered by the quadratic kernel over seven
    // of Savitzky and Golay, "Smoothing and Differentiation of Data by Simplified Least Squares Procedures", Analytical
    // Chemistry 36 (1964); samples beyond the ends are those at the ends. A stretch of at most one step gives 1000.
    //
    // `createCurveSegment` is `KFSpline::createSegment`, and makes the spline. `setCurveSegmentValue` moves the two
    // keypoints around `t` so that the curve takes the value there, within the curve's limits, and
    // `setCurveSegmentValueBounded` by the same amount, within the given ones (a constant root knows only its own);
    // without keypoints the constant takes it. Both give true also where they may not edit.
    // `generateKeypoints` is `KFSpline::generateExtrapolatedVertices`, as 0 or 1; 0 with nothing changed where
    // `cycles` times the keypoints is above `kMostGeneratedKeypoints`.
    bool bakeCurve(void* node, Tempus const& start, Tempus const& step, Tempus const& end, double tolerance,
                   double scale) override;
    bool getCurveSamples(Tempus const& start, Tempus const& step, std::uint32_t& count,
                         std::vector<Tempus>* times, std::vector<double>* values) override;
    bool getCurveSamples(void* node, Tempus const& start, Tempus const& step, std::uint32_t& count,
                         std::vector<Tempus>* times, std::vector<double>* values) override;
    bool getCurveSamples(double start, double step, std::uint32_t& count, double** times, double** values,
                         double operand) override;
    bool getCurveSamples(double start, double step, std::uint32_t& count, std::vector<double>* times,
                         std::vector<double>* values) override;
    bool getCurveSamples(void* node, Tempus const& start, Tempus const& step, std::uint32_t& count,
                         Tempus** times, double** values) override;
    bool getCurveSamples(Tempus const& start, Tempus const& step, std::uint32_t& count, Tempus** times,
                         double** values) override;
    bool getSplineSamplesAndIgnoreLinear(Tempus const& start, Tempus const& end, Tempus const& step,
                                         std::vector<Tempus>* times, std::vector<double>* values) override;
    bool getCurveDerivativesSamples(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                    std::vector<Tempus>* times, std::vector<double>* values) override;
    bool getUForValue(double value, std::vector<Tempus>& times, BXTimeRange& range, Tempus& frameDuration,
                      std::uint32_t flags) override;
    bool setCurveOffset(Tempus const& t, double value) override;
    bool scaleCurve(double factor) override;
    bool warpCurveLinear(double factor, Tempus const& t, bool force) override;
    bool forceRetimeCurve(Tempus const& scale, Tempus const& offset) override;
    bool reparametrizeCurve() override;
    bool loadVertices(bool loading, std::uint32_t count) override;
    bool generateCurveFromDynamicCurve(Tempus const& t, KFDynamicCurve* dynamicCurve) override;
    bool simplifyCurve(Tempus const& start, Tempus const& end, Tempus const& step, double tolerance,
                       double range, std::uint32_t mode, std::int32_t radius) override;
    bool smoothCurve(Tempus const& start, Tempus const& end, Tempus const& step) override;
    std::uint32_t getNumberOfKeypoints() override;
    bool createCurveSegment(Tempus const& a, Tempus const& b, Tempus const& c, bool eased,
                            bool force) override;
    bool setCurveSegmentValue(Tempus const& t, double value, bool force) override;
    bool setCurveSegmentValueBounded(Tempus const& t, double value, double low, double high,
                                     bool force) override;

    // --- Keypoints ---
    //
    // A handle is that of a vertex of the spline (`KFSpline`). Null and handles of other splines are refused, by
    // comparing and never by following them; in the search for the neighbour of a handle such a one counts as the first
    // keypoint. Operations with `force` ask `canModifyCurve(force)` first; those without it need the spline only. Every
    // out-parameter may be null, but `getKeypointBiasLinear` refuses that. Lists are appended to.
    //
    // A spline that stands behind a constant root can still be read and edited by handle, but its flags, selection and
    // normals can't be set there. Looking up by time, listing and counting find nothing, but for the navigation by
    // `...ValidKeypointHandle` and the normal at a time.
    //
    // Writing a value. It is clamped first, but by `append...`. `setKeypoint` and its fellows by time change the
    // keypoint at `t`, add one on a curve that may be edited, and otherwise offset the whole curve so that it takes
    // the value at `t`: a curve without keypoints then has a new constant. Forms by handle that may not edit offset
    // too, by `t` or by zero. While `KFCoreGlobals::shouldOffset` is set, all but the forms without tangents do so
    // unless forced. All give true but for a null handle, and where they edit by the handle of another spline nothing
    // is written. `setKeypoint` without a value keys the root's present one; false for a curve that may not be edited.
    // `setKeypointsValue` gives all keypoints one value, forced or not. `append...` asks for ascending times, behind
    // those that are there, and for arrays that aren't null.
    //
    // Deleting. `delKeypoint` of the last one leaves its value as the constant of the curve, `delAllKeypoints` the
    // value at `t`; `delKeypoints` (after `start`, up to and including `end`) leaves the constant as it was. Whatever
    // empties the spline destroys it. A parametric curve counts its keypoints anew. `delAllKeypoints` always gives
    // false.
    //
    // `cloneKeypoint` and `moveKeypoint` are `KFSpline::moveVertex`; false when nothing moved. `adjustKeypointSpeed`
    // always gives false. `getFirstKeypoint` and `getLastKeypoint` write zero at zero when they fail,
    // `getKeypointsTimeAndValue` an empty vector and invalid times.
    // `isLockedKeypoint`, `areHandlesBroken` and `areHandlesWeighted` write false for a handle of another spline.
    // `deriveKeypoint` also forgets that the handles were edited. Handles are 12 times the stored tangents, on a
    // parametric curve the tangents themselves; the `NormalizedTangents` are always the stored ones.
    // `getPointInputTangents` with `scaled` gives 12 times the unit vector, whatever the curve.
    bool setKeypoint(Tempus const& t, bool force) override;
    bool setKeypoint(Tempus const& t, double value, bool force) override;
    bool setKeypoint(void* handle, Tempus const& t, double value, bool force) override;
    bool setKeypointNoTangents(Tempus const& t, double value, bool force) override;
    bool appendKeypointNoTangents(Tempus const& t, double value, bool force) override;
    bool appendKeypointsNoTangents(std::uint32_t count, Tempus const* times, double const* values,
                                   bool force) override;
    bool setKeypointValue(void* handle, double value, bool force) override;
    bool setKeypointsValue(double value, bool force) override;
    bool cloneKeypoint(void* handle, Tempus const& t, bool force) override;
    bool getPoint(Tempus const& t, double operand, double* out) override;
    bool getPointWithoutBehavior(Tempus const& t, double operand, double* out) override;
    bool getPointFromCurveNode(Tempus const& t, double operand, double* out, void* node) override;
    bool getPointInputTangents(Tempus const& t, double* dt, double* dv, bool scaled) override;
    bool getPointOutputTangents(Tempus const& t, double* dt, double* dv, bool scaled) override;
    bool moveKeypoint(void* handle, Tempus const& t, bool force, bool constrain, bool replace) override;
    bool offsetKeypointInTime(void* handle, Tempus const& t, bool force) override;
    bool delKeypoint(void* handle, bool force) override;
    bool delKeypoints(Tempus const& start, Tempus const& end, bool force) override;
    bool delAllKeypoints(Tempus const& t, bool force) override;
    bool getKeypointHandle(Tempus const& t, void** out) override;
    bool getPreviousValidKeypointHandle(void* handle, void** out) override;
    bool getPreviousValidKeypointHandle(Tempus const& t, void** out) override;
    bool getNextValidKeypointHandle(void* handle, void** out) override;
    bool getNextValidKeypointHandle(Tempus const& t, void** out) override;
    bool getNextKeypoint(Tempus const& t, Tempus* outTime, double* outValue) override;
    bool getPreviousKeypoint(Tempus const& t, Tempus* outTime, double* outValue) override;
    bool getKeypoint(void* handle, Tempus* outTime, double* outValue) override;
    bool getFirstKeypoint(Tempus* outTime, double* outValue) override;
    bool getFirstValidKeypointHandle(void** out) override;
    bool getLastKeypoint(Tempus* outTime, double* outValue) override;
    bool getLastValidKeypointHandle(void** out) override;
    bool getKeypointHandleList(std::vector<void*>& out) override;
    bool getKeypointValidHandleList(std::vector<void*>& out) override;
    bool getKeypointsTimeAndValue(TempusRange range,
                                  std::vector<std::pair<Tempus, std::pair<double, unsigned>>>& out,
                                  Tempus* first, Tempus* last) override;
    bool reverseKeypoints(void* first, void* last, bool force) override;
    std::uint32_t generateKeypoints(std::uint32_t side, std::uint32_t cycles, bool force) override;
    bool purgeCurve() override;
    bool getKeypointFlags(void* handle, std::uint32_t* out) override;
    bool setKeypointFlags(void* handle, std::uint32_t flags, bool force) override;
    bool enableKeypoint(void* handle, bool enable, bool force) override;
    bool isEnabledKeypoint(void* handle, bool* out) override;
    bool selectKeypoint(void* handle, bool select, bool force) override;
    bool lockKeypoint(void* handle, bool lock, bool force) override;
    bool isLockedKeypoint(void* handle, bool* out) override;
    bool breakKeypointHandles(void* handle, bool broken, bool force) override;
    bool areHandlesBroken(void* handle, bool* out) override;
    bool weightHandles(void* handle, bool weighted, bool force) override;
    bool areHandlesWeighted(void* handle, bool* out) override;
    bool deriveKeypoint(void* handle) override;
    bool setKeypointSmooth(void* handle, bool smooth, bool force) override;
    bool flattenHandles(void* handle, bool force) override;
    bool getKeypointNormal(void* handle, double* out) override;
    bool setKeypointNormal(void* handle, double normal, bool force) override;
    bool getKeypointNormal(Tempus const& t, double* out) override;
    bool setKeypointNormal(Tempus const& t, double normal, bool force) override;
    bool setKeypointInputHandles(void* handle, double dt, double dv, bool force) override;
    bool setKeypointOutputHandles(void* handle, double dt, double dv, bool force) override;
    bool getKeypointInputHandles(void* handle, double* dt, double* dv) override;
    bool getKeypointOutputHandles(void* handle, double* dt, double* dv) override;
    bool setKeypointInputNormalizedTangents(void* handle, double dt, double dv, bool force) override;
    bool setKeypointOutputNormalizedTangents(void* handle, double dt, double dv, bool force) override;
    bool getKeypointInputNormalizedTangents(void* handle, double* dt, double* dv) override;
    bool getKeypointOutputNormalizedTangents(void* handle, double* dt, double* dv) override;
    bool setKeypointBiasLinear(void* handle, double bias) override;
    bool getKeypointBiasLinear(void* handle, double* out) override;
    bool setKeypointInterpolation(void* handle, std::uint32_t type, bool force) override;
    bool getKeypointInterpolation(void* handle, std::uint32_t* outType, bool* outUsesTangents) override;
    bool setKeypointSpeed(void* handle, std::uint32_t speed, bool force) override;
    bool getKeypointSpeed(void* handle, std::uint32_t* out) override;
    bool adjustKeypointSpeed(void* handle, double delta, bool force) override;

    // The chain of processing nodes. The curve owns them and destroys them from last to first. A null node is refused,
    // and so is one that is already in the chain.
    //
    // `insert...` puts the node behind `after`, with null in front of all; an `after` that isn't in the chain counts as
    // its last node. `delete...` destroys the node, `remove...` gives it back to the caller; false for one that isn't
    // in the chain. `getPrevious...` writes null and gives false for the first node and for an empty chain, and writes
    // the last node for one that isn't in the chain. `enumerate...` replaces what `out` holds.
    bool appendCurveProcessingNode(KFCurveNode* node) override;
    bool insertCurveProcessingNode(KFCurveNode* node, KFCurveNode* after) override;
    bool deleteCurveProcessingNode(KFCurveNode* node) override;
    bool removeCurveProcessingNode(KFCurveNode* node) override;
    bool getPreviousProcessingNode(KFCurveNode* node, KFCurveNode** out) override;
    bool enumerateCurveProcessingNodes(std::vector<KFCurveNode*>& out) override;
    bool getNumCurveProcessingNodes(std::uint32_t* out) override;

    // Takes: see `KFRecordingNode`. While a take is being recorded it is the root: `setKeypoint` and what else writes a
    // value records it, while keypoints are read, listed and edited by their other operations as ever, and the curve
    // keeps its kind of root and what it has against all but `setRootNode`, `setCurveToDefault` included.
    //
    // `beginPlayback` makes the recording node. False, with nothing changed, on a curve without a spline and for what
    // `KFRecordingNode::beginPlayback` refuses; the other four are false on a curve that never was played, and so is
    // `isPlaying`, which writes its outputs only when it is true. `endRecording` leaves a spline root.
    bool beginPlayback(Tempus const& t, std::uint32_t scope, std::uint32_t mode,
                       Tempus const& resolution) override;
    bool endPlayback(Tempus const& t) override;
    bool beginRecording(Tempus const& t) override;
    bool endRecording(Tempus const& t) override;
    bool updateCurrentRecordingTime(Tempus const& t) override;
    bool isPlaying(std::uint32_t* outScope, std::uint32_t* outMode, Tempus* outResolution) override;
    bool isRecording() override;

    // Copies and values. `getCurveWorkingCopy` is null here, and `cloneCurve` pure: the typed curves supply both.
    //
    // `getValue` with a node runs the chain up to and including it and gives the operand 0 to all; null, or an empty
    // chain, asks the root alone, and a node that isn't in the chain gives 0, clamped. Where a node of the chain isn't
    // point to point, the value is a row of one sample, which has no operand either.
    KFCurveInterface* getCurveWorkingCopy() override;
    bool supportsAssignmentOperator() override;
    bool isCurveBoolean() override;
    double getValue(Tempus const& t, void* node) override;
    double getValue(Tempus const& t, double operand) override;

    // Beyond the interface --------------------------------------------------------------------------------------

    /// May be asked for beside the beginning or the end of a take.
    KFCurveNode* getRootNode() const noexcept { return _rootNode.load(std::memory_order_acquire); }
    KFSpline* getSpline() const noexcept { return _splineNode.getSpline(); }
    bool isSpline() const noexcept { return _rootKind != kRootConstant; }
    /// True acts on a constant root only, false on a spline root only: the root is switched and keeps the value that
    /// the curve had at `t` (at zero for true). Keypoints stay in place, unread, behind a constant root.
    void setIsSpline(bool spline, Tempus const& t);
    /// A constant root with that value.
    void setRootNode(double value);
    /// A spline root; the constant node takes `value`, and so does the spline node unless it has keypoints.
    void setRootNode(Tempus const& t, double value);

    bool hasProcessingNodes() const noexcept { return !_processingNodes.empty(); }
    // What `getNumberOfKeypoints` and `getCurveInitialValue` answer, for those who read values all the time.
    std::uint32_t keypointCount() const noexcept;
    double clampedInitialValue() const { return clamped(getRootNode()->getInitialValue()); }
    /// Keyframable, and animated by the process-wide switch or by a keypoint.
    bool isAnimated() const;
    /// Whether keypoints may be edited: keyframable, and animated or forced.
    bool canModifyCurve(bool force) const;

    /// Of the owner channel; 1/30 s without one.
    Tempus getFrameDuration() const;
    /// Not owned; null for none. Never copied.
    void setOwnerChannel(KFCurveOwner* owner) noexcept { _ownerChannel = owner; }
    KFCurveOwner* getOwnerChannel() const noexcept { return _ownerChannel; }

    /// Null until `setSplineState`.
    KFSplineState* getSplineState() const noexcept { return _splineState; }
    /// What applies: the record, or the defaults while there is none.
    KFSplineState const& settings() const;
    /// Frees the record in use if it is local, takes the new one (owned unless shared) and hands it to the spline.
    /// The record already in use stays as it is; null leaves the curve with the defaults.
    void setSplineState(KFSplineState* state);
    /// Makes the record local and hands it to the spline; returns it. The shared one stays as it was.
    KFSplineState* createLocalSplineState();

    /// Runs the chain up to and including `stopNode` over a row, and clamps the values: the output fields of `param`
    /// hold the wanted times and the buffer, its input fields aren't read. `stopNode` null runs the root alone. False,
    /// with nothing done, if the chain doesn't hold `stopNode`.
    ///
    /// Each node from the stop node back is asked what it needs, down to one that answers `isPassThrough`, whose
    /// predecessors are left out; then the root and the nodes work in order. What a node lowers its `outputCount` to
    /// is the `inputCount` of the next, and the `outputCount` of `param` in the end. Without a buffer the row is
    /// computed all the same, for its count.
    bool processCurve(KFCurveNodeParam& param, KFCurveNode* stopNode);
    /// `processCurve` with the whole chain, then, whatever that answered, the times of the samples into the array
    /// `*timesOut`, unless either pointer is null. The values are in `param`; the last argument isn't used.
    bool processTree(KFCurveNodeParam& param, Tempus** timesOut, double** valuesOut);
    /// The same up to `stopNode`, null for the root alone.
    bool processTree(KFCurveNodeParam& param, Tempus** timesOut, double** valuesOut, KFCurveNode* stopNode);
    /// Looks at the chain again, after each change of it: whether it works point to point, and whether a node remaps
    /// time. The latter, once true, stays.
    void setTreeProperties();
    /// Roots and chains, node by node.
    bool compareTree(KFCurve const& other) const;
    /// Appends a clone of each of the other's nodes.
    void cloneTree(KFCurve const& other);

    /// Clamps and gives to the root.
    bool setKeyValue(Tempus const& t, double value, bool withTangents);
    bool setKeyValue(void* handle, Tempus const& t, double value);
    bool setKeyValue(void* handle, double value);
    /// Keys the root's present value; false with a constant root.
    bool setKeyAtCurrentValue(Tempus const& t);

protected:
    /// The value as stored where a node produced `value`.
    double clamped(double value) const noexcept {
        double const maximum = _maxValue;
        if (value > maximum)
            return maximum;
        double const minimum = _minValue;
        return value < minimum ? minimum : value;
    }

private:
    // Guards of keypoint operations: each answers the spline, or null to refuse.
    /// A keypoint of the spline, also behind a constant root.
    KFSpline* splineToRead(void* handle) const;
    /// The same on a curve that may be edited.
    KFSpline* splineToEdit(void* handle, bool force) const;
    /// The spline of a curve that may be edited, whatever the handle.
    KFSpline* modifiableSpline(bool force) const;
    /// The spline, unless it stands unread behind a constant root.
    KFSpline* rootSpline() const;
    KFSpline* rootSplineToEdit(void* handle, bool force) const;
    KFSpline* splineForNewKeypoints();

    // The root and the first `nodes` nodes of the chain, at least one, at one time; not clamped.
    double solveFirst(std::size_t nodes, Tempus const& t, double operand);
    double solveChain(std::size_t nodes, Tempus const& t, double operand);
    double solveRemappedChain(std::size_t nodes, Tempus const& t, double operand);
    double solveSample(std::size_t nodes, Tempus const& t);
    /// The place of a node in the chain; the chain's length for a node that isn't in it.
    std::size_t indexOfNode(KFCurveNode const* node) const noexcept;
    bool mayJoinChain(KFCurveNode const* node) const noexcept;
    std::unique_ptr<KFCurveNode> takeOutNode(KFCurveNode const* node);
    void writeConstant(Tempus const& t, double clampedValue);
    void writeAt(Tempus const& t, double value, bool mayAdd, bool withTangents);
    /// The limits hold for the vertices that move, all or the two around `t`; `keepShape` moves them alike.
    void offsetRoot(Tempus const& t, double value, double low, double high, bool neighboursOnly,
                    bool keepShape);
    bool settleAfterDeletion();

    // Documents (lumenkey/persistence).
    void writeSettings(BXSerializerWriteStream& stream);
    void writeKeypoints(BXSerializerWriteStream& stream);
    void parseSettings(BXStreamElement const& element);
    void beginParsingKeypoints(std::uint32_t count);
    KFCurveParseRecord& parseRecord();
    void flushParseRecord();
    void parseKeypointElement(BXSerializerReadStream const& stream, BXStreamElement const& element);
    void appendParsedKeypoint(double value);
    void setParsedAttribute(bool (KFSpline::*set)(void*, double, Tempus const&), double number);
    void parseHandle(BXSerializerReadStream const& stream, BXStreamElement const& element);

    bool readFlag(void* handle, std::uint32_t flag, bool* out) const;
    double handleScale() const;
    static bool offsetsOnly(bool force);
    bool sameRoot(KFCurve const& other) const;
    void adoptRoot(std::uint32_t kind) noexcept;
    /// Takes over the settings: the same record where it is shared, else a local one with its contents.
    void copySplineState(KFCurve const& other);
    void copyRoots(KFCurve const& other, bool withRecorded);

    std::atomic<KFCurveNode*> _rootNode;
    KFConstantNode _constantNode;
    KFSplineNode _splineNode;
    std::vector<std::unique_ptr<KFCurveNode>> _processingNodes;
    std::unique_ptr<KFRecordingNode> _recordingNode; // made by the first take, and kept
    BXRelaxed<double> _minValue;
    BXRelaxed<double> _maxValue;
    bool _pointToPoint = true;
    bool _remapsTime = false;
    BXRelaxed<bool> _keyframable{true};
    KFCurveOwner* _ownerChannel = nullptr;
    KFSplineState* _splineState = nullptr;
    BXRelaxed<std::uint32_t> _rootKind{kRootConstant};
    std::unique_ptr<KFCurveParseRecord> _parseRecord; // while keypoints are read from a document
};

inline std::uint32_t KFCurve::keypointCount() const noexcept {
    KFSpline const* const spline = isSpline() ? getSpline() : nullptr;
    return spline == nullptr ? 0 : static_cast<std::uint32_t>(spline->getNumberOfVertices());
}
