#pragma once

#include "lumenkey/Channels/KFChannelBase.h"

#include <cmath>

class BXSpinLock;
class KFChannelImpl;
class KFChannelInfo;
class KFCompoundChannel;
class KFCurve;
class KFCurveInterface;
class KFCurveNode;
class KFCurveOwner;
class KFCustomInterpolator;
class KFDynamicCurve;
struct KFFadeBlock;

/// A node of the tree with a value over time.
///
/// The value lives in a curve, reached through a `KFChannelImpl`; what a slider shows lives in a `KFChannelInfo`.
/// Both records are shared by all channels of a class until one of them differs: a channel gets a local copy at its
/// first difference, and gives it up again when `resetToDefault` finds it back at the class's state. So a channel
/// at its class's state is a few pointers, and owns no memory of its own but a long name.
///
/// Times are global unless an operation says curve time: `globalToLocalTime` converts, down to the nearest
/// time converter or object root. Where that rounds, the keypoint whose global time is asked for counts as
/// standing there; a step to a neighbouring keypoint never ends where it began. Doubles are equal within
/// 1e-7.
///
/// A locked channel (bit 2 of its own) ignores every form of setting, removing and moving values,
/// `offsetChannel`, `scaleChannel`, the limits, the switches of the curve's shape, and the beginning of
/// takes. It obeys `resetToDefault`, `setInitialValue`, `setDefaultValue`, the info setters, `copy` and
/// `assign`.
///
/// Threads: values may be read on any number of threads beside one that edits keypoints or the constant of a channel
/// with a local record. Not beside reads of that channel may run: what exchanges the record, the curve or its root (the
/// first difference, returning to the shared record, copies, `setIsSpline`), what creates the first keypoint or deletes
/// the last, and changes of flags, fades, processing nodes, the owner or the slider.
class LUMENKEY_API KFChannel : public KFChannelBase {
public:
    /// Both records may be null only if the class's constructor then calls `usePrototypes`.
    KFChannel(KFFactory* factory, BXString const& name, KFChannelFolder* parent, unsigned int id,
              unsigned int flags, KFChannelImpl* impl, KFChannelInfo* info);
    KFChannel(KFFactory* factory, BXString const& name, unsigned int id, KFChannelImpl* impl,
              KFChannelInfo* info);
    /// A blank base with the source's ID alone (no factory, no name, no parent); records as in the other form.
    KFChannel(KFChannel const& other);
    /// A copy of the base; shares shared records with the source and copies local ones.
    KFChannel(KFChannel const& other, KFChannelFolder* parent);
    /// `assign`, if `allowsAssignment` says yes.
    KFChannel& operator=(KFChannel const& other);
    ~KFChannel() override;

    // Of KFChannelBase ------------------------------------------------------------------------------------------

    char const* getFacadeWrapperName() override;
    void lock(bool on, bool passDown) override;
    void setDefaultToCurrentValue() override;
    // A take: values are recorded into the curve while time runs, and become keypoints at the end
    // (`KFRecordingNode` tells how, by `scope` and `mode`). In order: `beginPlayback`, `beginRecording`, any
    // number of `setValue`, `updateCurrentRecordingTime` while a value is held, `endRecording`,
    // `endPlayback`. A channel without keypoints takes part in none. The times of both playback operations
    // are curve times.
    //
    // A locked channel doesn't begin a take, but ends one. `beginRecording` forgets all callbacks,
    // `endRecording` needs no recording to tell the object root. The callbacks hear of every value that is
    // set while recording, with this channel and global time; `wantsWrapper` asks for the channel's facade
    // wrapper in its place where there is a facade.
    void beginPlayback(Tempus const& t, unsigned int scope, unsigned int mode,
                       Tempus const& resolution) override;
    void endPlayback(Tempus const& t) override;
    void beginRecording(Tempus const& t) override;
    void endRecording(Tempus const& t) override;
    void updateCurrentRecordingTime(Tempus const& t) override;
    void registerRecordingCallback(RecordingCallback function, void* context, bool wantsWrapper) override;
    void unregisterRecordingCallback(RecordingCallback function, void* context) override;
    void copy(KFChannelBase const* other, bool silent) override;
    /// Equal records; ID, name and flags don't count.
    bool compare(KFChannelBase const* other) const override;
    /// Null: each typed class has its own.
    KFChannelBase* clone() const override;
    void assign(KFChannelBase const* other) override;
    /// False for what is no value channel, for this one, for one with keypoints if this takes none, and where the
    /// other's present smallest or largest value, in this channel's unit, lies outside this curve's absolute limits.
    /// A limit at or beyond the largest 32-bit float counts as none.
    bool allowsAssignment(KFChannelBase const* other) override;
    void resetToDefault(bool silent) override;
    void lockFromParent(bool on, bool passDown) override;
    /// Takes the whole curve of a value channel, in this channel's unit (where that has a scale) and within its
    /// limits. Announces nothing.
    void setValue(KFChannelBase const& other) override;
    /// Pastes the other's keypoints with their spacing, the first at `t`, in this channel's unit (where that has a
    /// scale). One that would fall on a locked keypoint is left out. From a channel without keypoints this one is reset
    /// and takes its value. Nothing for null and for what is no value channel.
    void copyKeyframesFromChannel(Tempus const& t, KFChannelBase* other) override;
    void writeHeader(BXSerializerWriteStream& stream, bool full) override;
    void writeBody(BXSerializerWriteStream& stream, bool full, bool children, bool all) override;
    /// Frees the fades of a local record: a document that has some brings them.
    bool parseBegin(BXSerializerReadStream& stream) override;
    /// Returns to the shared record where the document changed nothing.
    bool parseEnd(BXSerializerReadStream& stream) override;
    bool parseElement(BXSerializerReadStream& stream, BXStreamElement& element) override;
    void calcHashForState(BXSerializerWriteStream& stream, Tempus const& t) override;
    /// A change to what isn't both keyframable and a spline counts as one of state. A compound parent is announced
    /// first.
    void willBeModified(unsigned int kind) override;
    void setIsSpline(bool on) override;
    bool isSpline() const override;
    bool isModified(bool skipHidden) const override;
    void setKeyframable(bool on, bool force) override;
    bool isKeyframable() const override;
    /// What the curve lists as drawing the range (`getKeyframesTimeAndValue`), which may hold neighbours already; those
    /// asked for stand around it.
    std::vector<Tempus> visibleKeypoints(TempusRange range, bool withNeighbours, unsigned int mask) override;
    /// Adds this channel, with the keypoints in the range, if there are any. Their times are curve times.
    void keyframesWithChannels(TempusRange range, KeyframesByChannel& out) override;
    bool hasKeypoints(unsigned int mask) const override;
    bool hasMoreThanOneKeypoint() const override;
    bool hasKeypointAt(Tempus const& t, unsigned int mask) const override;
    bool allHaveKeypointsAt(Tempus const& t) const override;
    unsigned int numberOfKeypointsAt(Tempus const& t) const override;
    void addKeypointAt(Tempus const& t) override;
    void deleteKeypointAt(Tempus const& t) override;
    Tempus moveKeypointTo(Tempus const& from, Tempus const& to, bool a, bool b) override;
    bool previousKeypoint(Tempus* t, unsigned int mask) const override;
    bool nextKeypoint(Tempus* t, unsigned int mask) const override;
    void retimeKeypoints(double factor, Tempus const& t) override;
    void adjustToFrameDuration(Tempus const& frameDuration) override;
    void setInterpolation(unsigned int type) override;
    void setExtrapolation(unsigned int mode, unsigned int which) override;
    /// Turns the effect of the processing nodes into keypoints, at the step of `getBakeParameters`; `step` isn't used.
    /// Only where the object root says that selected behaviors affect the channel, else nothing and no announcement.
    /// The nodes stay: it is for the caller to take them out.
    void bake(BXTimeRange const& range, Tempus const& step) override;
    /// `KFCurve::simplifyCurve` between two global times; `step` isn't converted. The tolerance is `percent`
    /// of what the curve's values span, the fine delta where they span nothing, and with `clampToCoarse` at
    /// most the coarse delta; the curve keeps a hundredth of that over the scale. `mode1` is the curve's
    /// mode, `mode2` its radius.
    void simplify(Tempus const& a, Tempus const& b, Tempus const& step, double percent, unsigned int mode1,
                  unsigned int mode2, bool clampToCoarse) override;
    /// `KFCurve::generateKeypoints`.
    void generateKeys(unsigned int first, unsigned int second) override;
    /// In curve time; a linked compound's other components keep theirs.
    void deleteKeypoints(Tempus const& from, Tempus const& to) override;
    bool hasFadeHandles() const override;
    void scaleFadeHandles(double factor) override;

    // Slots behind those of KFChannelBase -----------------------------------------------------------------------

    /// Announces this channel alone: what a compound calls on its children.
    virtual void parentWillBeModified(unsigned int kind);
    /// A linked compound parent takes the write over. Else announces (unless silent), keys the old value at the
    /// start of the extent if the object root wants that, and sets the value on the curve: the constant, or, while
    /// the curve is animated, a keypoint.
    virtual void setValue(Tempus const& t, double value, bool silent);
    /// So that the value behind the processing nodes becomes `value`.
    virtual void setValueOffsetByBehaviors(Tempus const& t, double value);
    virtual void setValueAndIgnoreRecordOption(Tempus const& t);
    /// Keys the value that the curve has.
    virtual void setValue(Tempus const& t);
    /// False if there is no keypoint at `t`, and on a locked channel.
    virtual bool removeValue(Tempus const& t, bool force);
    virtual void removeAllValues(Tempus const& t, bool force);
    virtual bool moveValue(Tempus const& from, Tempus const& to, bool force);
    virtual void offsetChannel(Tempus const& t, double delta);
    virtual void scaleChannel(double factor);
    /// Between `beginPlayback` and `endPlayback`; only then are the outputs written. Each may be null.
    virtual bool isPlaying(unsigned int* scope, unsigned int* mode, Tempus* resolution);
    virtual bool isRecording();
    /// Calls the recording callbacks.
    virtual void didRecordValue(Tempus const& t);
    virtual double getSliderMax() const;
    /// Start and end of the range in local time, and the duration of a frame. Outputs may be null.
    virtual void getBakeParameters(BXTimeRange const& range, Tempus* start, Tempus* end, Tempus* frame) const;
    /// The smallest and largest value between two curve times, overshoot and extrapolated stretches included,
    /// without processing nodes, fades and the curve's limits. Nothing is sampled: each piece of the curve
    /// says what its extremes are, as `KFChannelSegmentVisitor::visitSegments` tells the pieces, with what
    /// that leaves out. So where there is no piece, as in a stretch whose end is before its start, the
    /// outputs are the largest and the lowest finite double. An output may be null; false, with nothing done,
    /// if both are.
    ///
    /// The time grows with the keypoints, but not with the number of cycles of a curve that repeats. The
    /// spline's lock is held while whole segments are looked at; nobody may edit the curve meanwhile.
    virtual bool getCurrentMinAndMax(Tempus const& from, Tempus const& to, double* minimum, double* maximum);
    virtual unsigned int getNumberOfKeyframes() const;
    /// By handle, in curve time. False on a locked channel.
    virtual bool moveKeyframe(void* handle, Tempus const& t, bool a, bool b);

    // Reading ---------------------------------------------------------------------------------------------------

    /// The value at global time `t`; `input` goes to the processing nodes. 0 without a curve. A channel without
    /// keypoints and processing nodes answers its initial value without looking at the time.
    double getValueAsDouble(Tempus const& t, double input) const;
    /// Truncated toward zero; limited to the type's range, 0 for a not-a-number.
    int getValueAsInt(Tempus const& t, double input) const;
    unsigned int getValueAsUint(Tempus const& t, double input) const;
    /// Empty here: for classes with a text value.
    BXString getValueAsString(Tempus const& t, double input) const;
    /// At curve time, with or without processing nodes; without fades.
    double getCurveValue(Tempus const& t, bool withBehaviors) const;
    /// At curve time, up to and including a processing node of this channel.
    double getCurveValueForNode(Tempus const& t, void* node, double input) const;

    // Initial, default and limits -------------------------------------------------------------------------------

    double getInitialValue() const;
    void setInitialValue(double value, bool silent);
    double getDefaultValue() const;
    /// On an initialized channel sets bit 32, so that the default is written to documents.
    void setDefaultValue(double value);
    void setDefaultAtCurrentTime(Tempus const& t);
    void setValueAndDontAddFirstKeypoint(Tempus const& t, double value);
    /// Absolute limits of the curve; the slider's range is pulled in where it reaches beyond.
    void setMin(double value);
    void setMax(double value);
    double getMin() const;
    double getMax() const;

    bool canModifyChannelData() const noexcept { return !isLocked(false); }
    bool isAnimated() const;

    // Slider ----------------------------------------------------------------------------------------------------

    double getSliderMin() const;
    double getCoarseDelta() const;
    double getFineDelta() const;
    double getScale() const;
    double getOffset() const;
    BXString const& getSuffix() const;
    char const* getSliderTransformerName() const;
    // Each makes the info local if the value differs, as a copy of the class's. No lock, no announcement. A null
    // suffix is the empty one, a null transformer name that of a new record.
    void setSliderMax(double value);
    void setSliderMin(double value);
    void setCoarseDelta(double value);
    void setFineDelta(double value);
    void setScale(double value);
    void setOffset(double value);
    void setSuffix(BXString const& suffix);
    void setSuffix(char const* suffix);
    void setSliderTransformerName(char const* name);

    // Records ---------------------------------------------------------------------------------------------------

    KFChannelImpl const* getImpl() const noexcept { return _impl; }
    KFChannelInfo const* getInfo() const noexcept { return _info; }
    KFChannelImpl* createLocalChannelImplementation();
    /// Returns to the class's record if nothing differs and nothing keeps the local one.
    void resetLocalChannelImplementation();
    KFChannelInfo* createLocalChannelInfo();
    void resetLocalChannelInfo();
    /// Makes the info local, also for the record in use, and assigns. Null does nothing.
    void setInfo(KFChannelInfo const* source);
    /// Takes the record: a shared one becomes the prototype too, a local one is owned. Null does nothing.
    void replaceInfo(KFChannelInfo* info);

    /// Null after `releaseCurveInterface`.
    KFCurve* getCurveInterface() noexcept;
    KFCurve const* getCurveInterface() const noexcept;
    /// Takes the curve as this channel's prototype, and a clone of it as the curve in use. Refused, so that the caller
    /// keeps it: null, what is no `KFCurve`, the curve in use, and every curve on a locked channel.
    void setCurveInterface(KFCurveInterface* curve);
    /// Gives the curve in use to the caller, without this channel as its owner; the channel must get another before it
    /// is used again (until then it reads as 0 and as a constant). Null if locked.
    KFCurveInterface* releaseCurveInterface();
    /// A clone of the prototype becomes the curve in use, with this channel as its owner. Nothing without a prototype.
    void installPrototypeCurveInterface();
    /// The channel whose frame duration the curve uses; null for none. It isn't owned and must outlive the curve.
    void setOwnerChannel(KFChannel* owner);

    // Curve -----------------------------------------------------------------------------------------------------

    bool isChannelAffectedByBehaviors(bool selectedOnly) const;
    bool isChannelAffectedBySelectedBehaviors() const;
    bool isRigged() const;
    bool isParametric() const;
    void setParametric(bool on);
    bool isDiscrete() const;
    /// With `inPlace` and a shared record the curve of the whole class is changed.
    void setDiscrete(bool on, bool inPlace);
    void setShouldCreateTangents(bool on);
    // Ignored by a locked channel. Not announced.
    void closeParametricCurve();
    void reparametrizeChannel();
    /// The curve's owner becomes this channel, whose frame duration it uses.
    void setUseRetimingExtrapolation(bool on);
    /// The default as a constant, without keypoints; then `resetLocalChannelImplementation`.
    void resetCurve();
    // The curve's operations on a stretch, in curve time; ignored by a locked channel, not announced.
    void reduceKeyframes(Tempus const& a, Tempus const& b, Tempus const& step, double tolerance, double range,
                         unsigned int mode, int radius);
    void smoothKeyframes(Tempus const& a, Tempus const& b, Tempus const& step);
    // The curve's operations on a segment, in curve time, forced and announced. Nothing, and false, on a locked channel
    // and without a curve.
    bool createCurveSegment(Tempus const& a, Tempus const& b, Tempus const& c, bool eased);
    /// With `bounded` within the slider's range.
    void setCurveSegmentValue(Tempus const& t, double value, bool bounded);

    /// The bulk path: `willLoadKeyframes(true, n)`, any number of `appendKeyframes` in ascending curve time, then
    /// `willLoadKeyframes(false, 0)`. Ignored by a locked channel.
    void willLoadKeyframes(bool loading, int count);
    void appendKeyframes(unsigned int count, Tempus const* times, double const* values, bool unused);

    // Processing nodes, in evaluation order. The curve owns them; a removed one goes back to the caller. A lock
    // doesn't forbid them, and they aren't announced.
    bool appendCurveProcessingNode(KFCurveNode* node);
    bool insertCurveProcessingNode(KFCurveNode* node, KFCurveNode* after);
    bool deleteCurveProcessingNode(KFCurveNode* node);
    bool removeCurveProcessingNode(KFCurveNode* node);
    std::vector<KFCurveNode*> enumerateCurveProcessingNodes() const;
    unsigned int getNumberOfCurveProcessingNodes() const;

    // Keyframes: keypoints by handle, in curve time -------------------------------------------------------------
    //
    // A handle is that of the curve's keypoint, null for none; a null one, and one of another curve, is refused by
    // setters and reads as zero or false. Setters act although nothing is animated yet (but not on what isn't
    // keyframable), take no account of a linked compound, and announce nothing but where said: who calls them in a row
    // announces first. A locked channel ignores them; none reports a refusal. What they do is the curve's: see
    // `KFCurve`. Tangents are handles, or with `handles` false those as stored.

    void setKeyframe(Tempus const& t, double value, bool withTangents);
    /// Keys the value that the curve has.
    void setKeyframe(Tempus const& t);
    /// The same, but only on what is animated.
    void setKeyframeIfRecording(Tempus const& t);
    void setKeyframe(void* handle, Tempus const& t, double value);
    void appendKeyframe(Tempus const& t, double value, bool unused);
    void cloneKeyframe(void* handle, Tempus const& t);
    void setKeyframeValue(void* handle, double value);
    void setKeyframesValue(double value);
    void setKeyframeFlags(void* handle, unsigned int flags);
    void deleteAllKeyframes(Tempus const& t);
    void offsetKeyframe(void* handle, Tempus const& t);
    void generateKeyframesFromDynamicCurve(Tempus const& t, KFDynamicCurve* dynamicCurve);
    void linearTimeWarp(double factor, Tempus const& t);
    void reverseKeyframes(void* first, void* last);
    void deriveKeyframe(void* handle);
    void smoothKeyframe(void* handle, bool on);
    void setKeyframeInputTangents(void* handle, double dx, double dy, bool handles);
    void setKeyframeOutputTangents(void* handle, double dx, double dy, bool handles);
    void setKeyframeBias(void* handle, double bias);
    void setKeyframeNormal(void* handle, double normal);
    void setKeyframeNormal(Tempus const& t, double normal);
    void setKeyframeEnabled(void* handle, bool on);
    void setKeyframeSelected(void* handle, bool on);
    void setKeyframeLocked(void* handle, bool on);
    void setKeyframeTangentsBroken(void* handle, bool on);
    void setKeyframeTangentsScaled(void* handle, bool on);
    void setKeyframeTangentsFlat(void* handle);
    void setCustomInterpolator(KFCustomInterpolator* interpolator, BXSpinLock* lock);
    // These announce `kModifyData`.
    void deleteKeyframe(void* handle);
    void setKeyframeInterpolation(void* handle, unsigned int type);
    void setCurveSegmentSpeed(void* handle, unsigned int speed);
    void offsetCurveSegmentSpeed(void* handle, double delta);
    /// Also on a locked channel, and on the record in use.
    void purgeKeyframes();

    /// In ascending order; with `valid` those only that take part in the curve.
    std::vector<void*> getKeyframes(bool valid) const;
    bool getKeyframe(void* handle, Tempus* t, double* value) const;
    void* getKeyframe(Tempus const& t) const;
    bool getNextKeyframe(Tempus const& t, Tempus* found, double* value) const;
    bool getPreviousKeyframe(Tempus const& t, Tempus* found, double* value) const;
    /// With false, zeros.
    bool getFirstKeyframe(Tempus* found, double* value) const;
    bool getLastKeyframe(Tempus* found, double* value) const;
    void* getNextEnabledKeyframe(Tempus const& t) const;
    void* getNextEnabledKeyframe(void* handle) const;
    void* getPreviousEnabledKeyframe(Tempus const& t) const;
    void* getPreviousEnabledKeyframe(void* handle) const;
    void* getFirstEnabledKeyframe() const;
    void* getLastEnabledKeyframe() const;
    bool getKeyframeInputTangents(void* handle, double* dx, double* dy, bool handles) const;
    bool getKeyframeOutputTangents(void* handle, double* dx, double* dy, bool handles) const;
    unsigned int getKeyframeInterpolation(void* handle) const;
    bool getKeyframeInterpolationUsesTangents(void* handle) const;
    /// Linear, or Bezier with both handles at zero.
    bool isSmoothKeyframe(void* handle) const;
    unsigned int getKeyframeFlags(void* handle) const;
    bool getKeyframeEnabled(void* handle) const;
    bool getKeyframeLocked(void* handle) const;
    double getKeyframeBias(void* handle) const;
    double getKeyframeNormal(void* handle) const;
    double getKeyframeNormal(Tempus const& t) const;
    bool getKeyframeTangentsBroken(void* handle) const;
    bool getKeyframeTangentsScaled(void* handle) const;
    unsigned int getCurveSegmentSpeed(void* handle) const;

    // The whole curve, in curve time: what `KFCurve` answers ----------------------------------------------------

    Tempus getKeyframeMinTime() const;
    Tempus getKeyframeMaxTime() const;
    Tempus getKeyframeTimeRange() const;
    Tempus getKeyframeParametricRange() const;
    double getKeyframeMinValue(bool withTangents) const;
    double getKeyframeMaxValue(bool withTangents) const;
    bool getSamples(Tempus const& start, Tempus const& step, unsigned int& count, std::vector<Tempus>* times,
                    std::vector<double>* values) const;
    bool getSamples(void* node, Tempus const& start, Tempus const& step, unsigned int& count,
                    std::vector<Tempus>* times, std::vector<double>* values) const;
    bool getSamples(double start, double step, unsigned int& count, double** times, double** values,
                    double operand) const;
    bool getSamples(double start, double step, unsigned int& count, std::vector<double>* times,
                    std::vector<double>* values) const;
    bool getSamples(void* node, Tempus const& start, Tempus const& step, unsigned int& count, Tempus** times,
                    double** values) const;
    bool getSamples(Tempus const& start, Tempus const& step, unsigned int& count, Tempus** times,
                    double** values) const;
    bool getCurveDerivativesSamples(Tempus const& start, Tempus const& step, unsigned int& count,
                                    std::vector<Tempus>* times, std::vector<double>* values) const;
    bool getCurveInputTangents(Tempus const& t, double* dx, double* dy, bool scaled) const;
    bool getCurveOutputTangents(Tempus const& t, double* dx, double* dy, bool scaled) const;
    bool getKeyframesTimeAndValue(TempusRange range,
                                  std::vector<std::pair<Tempus, std::pair<double, unsigned>>>& out,
                                  Tempus* first, Tempus* last) const;
    /// Appends to `times` the global times at which the curve has `value`, within `range` less a frame at its
    /// end: what the curve's `getUForValue` finds, without extrapolation and processing nodes. The start of
    /// `range` is global. A frame is that of the object root, and `fallbackFrameDuration` without one. With
    /// `flags` 1 the times descend. False, and nothing is appended, if there are none.
    bool getTimeForValue(double value, std::vector<Tempus>& times, BXTimeRange const& range,
                         Tempus const& fallbackFrameDuration, unsigned int flags) const;
    unsigned int getInterpolation() const;
    bool hasInterpolation(unsigned int type) const;
    unsigned int getExtrapolation(unsigned int which) const;
    bool isParametricCurveClosed() const;
    bool useRetimingExtrapolation() const;
    /// Null for the first node.
    KFCurveNode* getPreviousProcessingNode(void* node) const;

    // Keyframes in a range, and pasting -------------------------------------------------------------------------

    // Of the keypoints from `from` to `to`, in global time. Without one, the curve's value at `from`.
    double getKeyframeMinValueInRange(Tempus const& from, Tempus const& to) const;
    double getKeyframeMaxValueInRange(Tempus const& from, Tempus const& to) const;
    /// Shifts the values of those keypoints alike, so that the curve would pass through `value` at global time `t`.
    void offsetKeyframesValuesInRange(Tempus const& from, Tempus const& to, Tempus const& t, double value);
    /// Pastes records with their spacing, the first at curve time `t`, over whatever keypoints are there,
    /// with all that they hold; a single one that stands as high as a neighbour has no handle on that side.
    /// Takes no account of scales, and announces nothing.
    void setKeyframesWithInfo(Tempus const& t, std::vector<_KFKeyframeInfo> const& keyframes);

    // Fades -----------------------------------------------------------------------------------------------------

    Tempus getFadeInOffset() const;
    Tempus getFadeOutOffset() const;
    unsigned int getFadeInCurve() const;
    unsigned int getFadeOutCurve() const;
    /// With `limit` the two fades are kept from overlapping within the extent.
    void setFadeInOffset(Tempus const& t, bool limit);
    void setFadeOutOffset(Tempus const& t, bool limit);
    void setFadeInCurve(unsigned int shape);
    void setFadeOutCurve(unsigned int shape);
    /// The factor at local time `t`; 1 without fades or without an object root.
    double getFadeRatio(Tempus const& t) const;

protected:
    /// Takes the class's records where none were given to the constructor.
    void usePrototypes(KFChannelImpl* impl, KFChannelInfo* info) noexcept;
    KFChannelImpl* prototypeImpl() const noexcept { return _prototypeImpl; }
    /// The parent, if it is a compound whose children are edited together.
    KFCompoundChannel* linkedCompound() const;

private:
    /// Doubles that count as equal.
    static bool isSame(double a, double b) noexcept { return a == b || std::fabs(a - b) < 1e-7; }

    /// As what curves know this channel; not a base, so that derived classes' slots follow on `moveKeyframe`.
    class CurveOwner;
    KFCurveOwner* curveOwner();
    unsigned int kindAsAnnounced(unsigned int kind) const;
    /// What turns the other's values into this channel's unit; 1 where the scales are the same or this has none.
    double unitFactor(KFChannel const& other) const;
    /// The curve in use, which must be there.
    KFCurve& curve() const noexcept;
    /// The same on a local record.
    KFCurve& curveToWrite();
    /// The checks and the announcement in front of an edit; false to stop.
    bool beginEdit();
    double spanOfValues() const;
    /// What a keypoint at global time `t` has as its time: where converting rounds, that of the keypoint
    /// whose global time is `t`, if there is one.
    Tempus curveTimeAt(Tempus const& t) const;
    void* keypointAt(Tempus const& t) const;
    template <class Step> bool stepToKeypoint(Tempus* t, Step step) const;
    /// Edits the curve on a local record; nothing on a locked channel.
    template <class Edit> void editKeyframes(Edit edit) {
        if (!isLocked(false))
            edit(curveToWrite());
    }
    /// The same with an announcement, to which the host may answer by resetting the channel.
    template <class Edit> void announceAndEditKeyframes(Edit edit) {
        if (isLocked(false))
            return;
        createLocalChannelImplementation();
        willBeModified(kModifyData);
        edit(curveToWrite());
    }
    std::vector<double> valuesInRange(Tempus const& from, Tempus const& to) const;
    _KFKeyframeInfo keyframeInfo(void* handle, bool withHandles) const;
    /// Keys the old value at the start of the extent, if the root wants that: as the channel reads, or as the curve has
    /// it.
    void keyStartOfExtentIfWanted(KFChannelObjectRootBase& root, Tempus const& t, bool atCurveValue);
    void noteRecordedValue(Tempus const& t);
    KFFadeBlock& fadesToWrite();
    bool beginFadeEdit(bool wantsBlock);

    // Documents (lumenkey/persistence).
    bool isLeftOutOf(BXSerializerWriteStream const& stream) const;
    void parseFadeOffset(BXStreamElement const& element);
    void parseFadeShape(BXStreamElement const& element);

    void takeImplOf(KFChannel const& other);
    void takeInfoOf(KFChannel const& other);
    void freeLocalImpl() noexcept;
    void freeLocalInfo() noexcept;
    void setInfoNumber(double KFChannelInfo::*field, double value);

    // A local record is owned; a prototype is, where a local record was given to the constructor, the one in use.
    KFChannelImpl* _impl;
    KFChannelImpl* _prototypeImpl;
    KFChannelInfo* _info;
    KFChannelInfo* _prototypeInfo;
    std::unique_ptr<KFCurve> _prototypeCurve;
    std::unique_ptr<CurveOwner> _curveOwner; // made when a curve first gets this channel as its owner
};
