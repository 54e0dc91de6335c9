// A curve in a document: what it reads. Keypoints stand in the order of the document: appending doesn't sort
// them.

#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/curves/KFCurveParseRecord.h"
#include "lumenkey/persistence/KFDocumentElements.h"
#include "lumenkey/persistence/KFHandleText.h"
#include "lumenkey/splines/KFSplineAccess.h"

namespace {

/// Was written by old versions.
constexpr std::uint32_t kObsoleteKeypointFlag = 0x20;

} // namespace

bool KFCurve::parseBegin(BXSerializerReadStream& stream) {
    stream.pushScope(KFCurveScope);
    return true;
}

/// Also called on the curve that a class's channels share, by several threads at once: nothing of it is
/// written.
bool KFCurve::parseEnd(BXSerializerReadStream&) {
    if (_parseRecord != nullptr) {
        flushParseRecord();
        _parseRecord.reset();
    }
    _splineNode._suppressRefresh.store(false, std::memory_order_relaxed);
    if (KFSpline* const spline = getSpline()) {
        KFSplineAccess const access(*spline);
        spline->setDirty(true);
    }
    return true;
}

/// The flags come last: a locked keypoint takes nothing else.
void KFCurve::flushParseRecord() {
    KFSpline* const spline = rootSpline();
    if (spline == nullptr || _parseRecord == nullptr || _parseRecord->handle == nullptr)
        return;
    KFSplineAccess const access(*spline);
    spline->setVertexFlags(_parseRecord->handle, _parseRecord->flags);
}

bool KFCurve::parseElement(BXSerializerReadStream& stream, BXStreamElement& element) {
    switch (element.tag()) {
    case kCurveElement:
        parseSettings(element);
        break;
    case kPostExtrapolationElement:
    case kPreExtrapolationElement: {
        std::uint32_t mode = 0;
        if (element.getAsUInt32(&mode))
            setCurveExtrapolation(mode, element.tag() == kPostExtrapolationElement ? 0 : 1);
        break;
    }
    case kNumberOfKeypointsElement: {
        std::uint32_t count = 0;
        if (element.getAsUInt32(&count))
            beginParsingKeypoints(count);
        break;
    }
    case kClosedElement: {
        std::uint32_t number = 0;
        bool closed = false;
        if (element.getAsBool(&closed) ? closed : element.getAsUInt32(&number) && number != 0)
            closeCurve();
        break;
    }
    case kMinElement:
    case kMaxElement: {
        double limit = 0.0;
        if (element.getAsDouble(&limit))
            (element.tag() == kMinElement ? _minValue : _maxValue) = limit;
        break;
    }
    default:
        parseKeypointElement(stream, element);
        break;
    }
    return true;
}

void KFCurve::parseSettings(BXStreamElement const& element) {
    std::uint32_t type = 0;
    double number = 0.0;
    bool on = false;
    element.getAttributeAsUInt32(kCurveTypeAttribute, &type);
    setCurveType(type);
    if (element.getAttributeAsDouble(kCurveValueAttribute, &number))
        type == 0 ? _constantNode.storeValue(number) : (void)setCurveInitialValue(number);
    if (element.getAttributeAsDouble(kCurveDefaultAttribute, &number))
        type == 0 ? _constantNode.setDefaultValue(number) : (void)setCurveDefaultValue(number);
    if (element.getAttributeAsBool(kCurveParametricAttribute, &on))
        setCurveParametric(on);
    if (element.getAttributeAsBool(kCurveRoundAttribute, &on))
        setRoundingInUSpace(on);
    if (element.getAttributeAsBool(kCurveRetimingAttribute, &on))
        setRetimingExtrapolation(on);
}

/// Whatever was there goes, also on a curve that takes no keypoints from its user; the constant behind it,
/// which the document has given by now, stays.
void KFCurve::beginParsingKeypoints(std::uint32_t count) {
    _parseRecord.reset(); // its handle goes with the keypoints
    _splineNode.destroySpline();
    splineForNewKeypoints();
    loadVertices(true, count);
}

KFCurveParseRecord& KFCurve::parseRecord() {
    if (_parseRecord == nullptr)
        _parseRecord = std::make_unique<KFCurveParseRecord>();
    return *_parseRecord;
}

void KFCurve::parseKeypointElement(BXSerializerReadStream const& stream, BXStreamElement const& element) {
    double number = 0.0;
    switch (element.tag()) {
    case kKeypointElement:
        flushParseRecord();
        parseRecord() = KFCurveParseRecord();
        element.getAttributeAsUInt32(kKeypointInterpolationAttribute, &_parseRecord->interpolation);
        element.getAttributeAsBool(kKeypointEnabledAttribute, &_parseRecord->enabled);
        element.getAttributeAsUInt32(kKeypointFlagsAttribute, &_parseRecord->flags);
        _parseRecord->flags &= ~kObsoleteKeypointFlag;
        break;
    case kTimeElement:
        if (stream.major >= kFirstVersionWithTimes) {
            element.getAsTime(&parseRecord().time);
        } else if (element.getAsDouble(&number)) {
            parseRecord().time = stream.frameDuration * number; // old documents count frames
        }
        break;
    case kValueElement:
        if (element.getAsDouble(&number))
            appendParsedKeypoint(number);
        break;
    case kInputTangentTimeElement:
    case kInputTangentValueElement:
    case kOutputTangentTimeElement:
    case kOutputTangentValueElement:
        parseHandle(stream, element);
        break;
    case kBiasElement:
        if (element.getAsDouble(&number))
            setParsedAttribute(&KFSpline::setVertexBiasLinear, number);
        break;
    case kNormalElement:
        if (isSpline() && element.getAsDouble(&number))
            setParsedAttribute(&KFSpline::setVertexNormal, number);
        break;
    default:
        break;
    }
}

void KFCurve::appendParsedKeypoint(double value) {
    KFCurveParseRecord& record = parseRecord();
    KFSpline& spline = *splineForNewKeypoints();
    record.handle = spline.appendVertexNoTangents(record.time, value, kTempusZero);
    spline.setVertexInterpolation(record.handle, record.interpolation);
}

void KFCurve::setParsedAttribute(bool (KFSpline::*set)(void*, double, Tempus const&), double number) {
    if (void* const handle = parseRecord().handle) {
        KFSplineAccess const access(*getSpline());
        (getSpline()->*set)(handle, number, kTempusZero);
    }
}

/// Both parts of a handle are set with the second one, and the enabled state behind the output handle: a
/// disabled keypoint takes no handles.
void KFCurve::parseHandle(BXSerializerReadStream const& stream, BXStreamElement const& element) {
    KFCurveParseRecord& record = parseRecord();
    double const scale = handleScale();
    bool const isInput =
        element.tag() == kInputTangentTimeElement || element.tag() == kInputTangentValueElement;
    double(&tangent)[2] = isInput ? record.in : record.out;
    if (element.tag() == kInputTangentTimeElement || element.tag() == kOutputTangentTimeElement) {
        if (KFReadHandle(element, scale, &tangent[0]) && stream.major < kFirstVersionWithTimes)
            tangent[0] *= stream.frameSeconds;
        return;
    }
    KFReadHandle(element, scale, &tangent[1]);
    KFSpline* const spline = getSpline();
    if (record.handle == nullptr || spline == nullptr)
        return;
    KFSplineAccess const access(*spline);
    if (settings().deriveTangents || record.interpolation == kKFInterpolationLinearToo) {
        isInput ? spline->setVertexInputHandles(record.handle, tangent[0], tangent[1], kTempusZero, false)
                : spline->setVertexOutputHandles(record.handle, tangent[0], tangent[1], kTempusZero, false);
    }
    if (!isInput && !record.enabled)
        spline->disableVertex(record.handle, kTempusZero);
}
