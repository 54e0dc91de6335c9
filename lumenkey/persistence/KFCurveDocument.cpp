// A curve in a document: what it writes.

#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/persistence/KFDocumentElements.h"
#include "lumenkey/persistence/KFHandleText.h"
#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFTangent.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <limits>
#include <span>
#include <vector>

namespace {

constexpr double kTolerance = 1e-7;
constexpr double kNeutralBias = 1.0;
/// So many keypoints are read at once: a curve of no more is written as it is at one moment. In a digest,
/// few.
constexpr std::size_t kKeypointsAtOnce = 4096;
constexpr std::size_t kKeypointsAtOnceForDigest = 128;

bool counts(double number) { return std::fabs(number) >= kTolerance; }

/// All about one keypoint; tangents as they are stored.
struct KeypointRecord {
    Tempus time;
    double value;
    double bias;
    double normal;
    std::uint32_t interpolation;
    std::uint32_t flags;
    bool enabled;
    KFTangent in;
    KFTangent out;
};

/// The keypoints of a spline in order, a stretch under its lock at a time: others may evaluate the spline
/// meanwhile. Where another thread edits between two stretches, reading goes on behind the time that was
/// reached.
class KeypointReader {
public:
    /// `room` is for as many as are read at once, and isn't empty.
    KeypointReader(KFSpline& spline, std::span<KeypointRecord> room) : _spline(spline), _records(room) {}

    KeypointRecord const* next() {
        if (_position == _count)
            refill();
        return _position < _count ? &_records[_position++] : nullptr;
    }

private:
    void refill() {
        KFSplineAccess const access(_spline);
        KFVertexIterator place = _last == nullptr ? _spline.beginVertices() : placeBehindLast();
        _position = 0;
        for (_count = 0; _count < _records.size() && place != _spline.endVertices(); ++_count) {
            KFVertex const& vertex = *_spline.vertexAt(place);
            _records[_count] = recordOf(vertex);
            _last = &vertex;
            place = _spline.nextPlace(place);
        }
    }

    KFVertexIterator placeBehindLast() {
        // A handle that is gone is only compared.
        auto* const handle = const_cast<KFVertex*>(_last);
        KFVertexIterator place = _spline.getVertexIter(handle);
        if (place != _spline.endVertices() && _spline.vertexAt(place) == _last)
            return _spline.nextPlace(place);
        Tempus const reached = _records[_count - 1].time;
        while (place != _spline.endVertices() && _spline.vertexAt(place)->getValueU() <= reached)
            place = _spline.nextPlace(place);
        return place;
    }

    static KeypointRecord recordOf(KFVertex const& vertex) {
        KeypointRecord record{};
        record.time = vertex.getValueU();
        record.value = vertex.getValueV(kTempusZero);
        record.bias = vertex.getBias(kTempusZero);
        record.normal = vertex.getNormal(kTempusZero);
        record.interpolation = vertex.getInterpolation();
        record.flags = vertex.getFlags();
        record.enabled = vertex.isEnabled(kTempusZero);
        vertex.getInputTangents(&record.in.u, &record.in.v, kTempusZero);
        vertex.getOutputTangents(&record.out.u, &record.out.v, kTempusZero);
        return record;
    }

    KFSpline& _spline;
    std::span<KeypointRecord> _records;
    std::size_t _position = 0;
    std::size_t _count = 0;
    KFVertex const* _last = nullptr;
};

void writeHandle(BXSerializerWriteStream& stream, KFTangent const& tangent, double scale,
                 std::uint32_t timeTag, std::uint32_t valueTag) {
    if (!counts(tangent.u * scale) && !counts(tangent.v * scale))
        return;
    KFWriteHandle(stream, timeTag, tangent.u, scale);
    KFWriteHandle(stream, valueTag, tangent.v, scale);
}

void writeKeypoint(BXSerializerWriteStream& stream, KeypointRecord const& keypoint, bool derives,
                   double scale) {
    stream.startElement(kKeypointElement);
    if (keypoint.interpolation != kKFInterpolationBezier)
        stream.writeAttribute(kKeypointInterpolationAttribute, keypoint.interpolation);
    if (!keypoint.enabled)
        stream.writeAttribute(kKeypointEnabledAttribute, false);
    stream.writeAttribute(kKeypointFlagsAttribute, keypoint.flags);
    KFWriteElement(stream, kTimeElement, keypoint.time);
    KFWriteElement(stream, kValueElement, keypoint.value);
    if (counts(keypoint.bias - kNeutralBias))
        KFWriteElement(stream, kBiasElement, keypoint.bias);
    if (counts(keypoint.normal))
        KFWriteElement(stream, kNormalElement, keypoint.normal);
    if (derives || keypoint.interpolation == kKFInterpolationLinearToo) {
        writeHandle(stream, keypoint.in, scale, kInputTangentTimeElement, kInputTangentValueElement);
        writeHandle(stream, keypoint.out, scale, kOutputTangentTimeElement, kOutputTangentValueElement);
    }
    stream.endElement();
}

} // namespace

void KFCurve::writeHeader(BXSerializerWriteStream& stream, bool) {
    stream.pushScope(KFCurveScope);
    stream.startElement(kCurveElement);
    stream.popScope();
}

void KFCurve::writeBody(BXSerializerWriteStream& stream, bool, bool, bool) {
    stream.pushScope(KFCurveScope);
    writeSettings(stream);
    writeKeypoints(stream);
    stream.popScope();
}

void KFCurve::markFactoriesForSerialization(BXSerializerWriteStream&, bool) {}

void KFCurve::writeSettings(BXSerializerWriteStream& stream) {
    std::uint32_t type = 0;
    double number = 0.0;
    getCurveType(&type);
    stream.writeAttribute(kCurveTypeAttribute, type);
    if (!stream.isHashStream()) {
        getCurveDefaultValue(&number);
        stream.writeAttribute(kCurveDefaultAttribute, number);
    }
    // As it is stored, not as the limits let it be seen: they are read behind it.
    stream.writeAttribute(kCurveValueAttribute, getRootNode()->getInitialValue());
    if (isCurveParametric())
        stream.writeAttribute(kCurveParametricAttribute, true);
    if (!isRoundingInUSpace())
        stream.writeAttribute(kCurveRoundAttribute, false);
    if (getRetimingExtrapolation())
        stream.writeAttribute(kCurveRetimingAttribute, true);
}

/// Limits, continuation and keypoints. Their number comes first: on reading it clears the curve.
void KFCurve::writeKeypoints(BXSerializerWriteStream& stream) {
    KFSpline* const spline = getNumberOfKeypoints() == 0 ? nullptr : getSpline();
    if (spline != nullptr)
        KFWriteElement(stream, kNumberOfKeypointsElement,
                       static_cast<std::uint32_t>(spline->getNumberOfVertices()));

    constexpr double kUnlimited = std::numeric_limits<double>::max();
    if (!isCurveBoolean()) {
        if (_minValue > -kUnlimited)
            KFWriteElement(stream, kMinElement, _minValue.get());
        if (_maxValue < kUnlimited)
            KFWriteElement(stream, kMaxElement, _maxValue.get());
    }
    if (std::uint32_t const mode = settings().preExtrapolation; mode != 0)
        KFWriteElement(stream, kPreExtrapolationElement, mode);
    if (std::uint32_t const mode = settings().postExtrapolation; mode != 0)
        KFWriteElement(stream, kPostExtrapolationElement, mode);
    if (spline == nullptr)
        return; // and nothing that is closed, which a reader couldn't make
    bool closed = false;
    if (isClosedCurve(&closed) && closed)
        KFWriteElement(stream, kClosedElement, true);
    auto const writeAll = [&](std::span<KeypointRecord> room) {
        KeypointReader reader(*spline, room);
        bool const derives = isCurveDeriveTangents();
        double const scale = handleScale();
        while (KeypointRecord const* const keypoint = reader.next())
            writeKeypoint(stream, *keypoint, derives, scale);
    };
    if (stream.isHashStream()) {
        std::array<KeypointRecord, kKeypointsAtOnceForDigest> few;
        writeAll(few);
    } else {
        std::vector<KeypointRecord> many(std::min(kKeypointsAtOnce, spline->getNumberOfVertices() + 1));
        writeAll(many);
    }
}
