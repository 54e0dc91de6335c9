// The forms in which a curve is read as a row of samples. They differ in where times and values go, in the
// unit of time and in how much of the chain runs; the row itself is made once.

#include "lumenkey/curves/KFCurve.h"

#include <algorithm>

namespace {

/// How much of the chain runs: all of it, or up to one node (with null the root alone).
struct Stretch {
    bool isWhole;
    KFCurveNode* stopNode;
};

constexpr Stretch kWholeChain{true, nullptr};

Stretch upTo(void* node) noexcept { return {false, static_cast<KFCurveNode*>(node)}; }

Tempus seconds(double t) noexcept { return KFChronoForChannelSeconds(t, kKFChannelTimescale); }

/// A caller's array, which may be missing in either of two ways.
template <class Element> Element* arrayOf(Element** array) noexcept {
    return array == nullptr ? nullptr : *array;
}

/// Fills `times` and `values`, each of which may be null, and writes to `count` what the nodes left of it.
void sampleInto(KFCurve& curve, Stretch const& stretch, Tempus const& start, Tempus const& step,
                std::uint32_t& count, Tempus* times, double* values, double operand = 0.0) {
    KFCurveNodeParam param;
    param.operand = operand;
    param.outputStart = start;
    param.outputStep = step;
    param.outputCount = count;
    param.outputValues = values;
    if (stretch.isWhole) {
        curve.processTree(param, &times, &values);
    } else {
        curve.processTree(param, &times, &values, stretch.stopNode);
    }
    count = std::min(count, param.outputCount);
}

/// `count` more elements at the end of the vector, or null for none.
template <class Element> Element* grow(std::vector<Element>* vector, std::uint32_t count) {
    if (vector == nullptr)
        return nullptr;
    std::size_t const size = vector->size();
    vector->resize(size + count);
    return vector->data() + size;
}

/// Takes back what was grown too much.
template <class Element> void shrink(std::vector<Element>* vector, std::uint32_t excess) {
    if (vector != nullptr)
        vector->resize(vector->size() - excess);
}

void appendSamples(KFCurve& curve, Stretch const& stretch, Tempus const& start, Tempus const& step,
                   std::uint32_t& count, std::vector<Tempus>* times, std::vector<double>* values) {
    std::uint32_t const wanted = count;
    sampleInto(curve, stretch, start, step, count, grow(times, wanted), grow(values, wanted));
    shrink(times, wanted - count);
    shrink(values, wanted - count);
}

} // namespace

bool KFCurve::getCurveSamples(Tempus const& start, Tempus const& step, std::uint32_t& count,
                              std::vector<Tempus>* times, std::vector<double>* values) {
    appendSamples(*this, kWholeChain, start, step, count, times, values);
    return true;
}

bool KFCurve::getCurveSamples(void* node, Tempus const& start, Tempus const& step, std::uint32_t& count,
                              std::vector<Tempus>* times, std::vector<double>* values) {
    appendSamples(*this, upTo(node), start, step, count, times, values);
    return true;
}

bool KFCurve::getCurveSamples(double start, double step, std::uint32_t& count, double** times,
                              double** values, double operand) {
    double* const timeArray = arrayOf(times);
    std::vector<Tempus> row(timeArray == nullptr ? 0 : count);
    sampleInto(*this, kWholeChain, seconds(start), seconds(step), count,
               timeArray == nullptr ? nullptr : row.data(), arrayOf(values), operand);
    for (std::uint32_t i = 0; timeArray != nullptr && i < count; ++i)
        timeArray[i] = TempusGetSeconds(row[i]);
    return true;
}

bool KFCurve::getCurveSamples(double start, double step, std::uint32_t& count, std::vector<double>* times,
                              std::vector<double>* values) {
    std::uint32_t const wanted = count;
    double* timeArray = grow(times, wanted);
    double* valueArray = grow(values, wanted);
    getCurveSamples(start, step, count, &timeArray, &valueArray, 0.0);
    shrink(times, wanted - count);
    shrink(values, wanted - count);
    return true;
}

bool KFCurve::getCurveSamples(void* node, Tempus const& start, Tempus const& step, std::uint32_t& count,
                              Tempus** times, double** values) {
    sampleInto(*this, upTo(node), start, step, count, arrayOf(times), arrayOf(values));
    return true;
}

bool KFCurve::getCurveSamples(Tempus const& start, Tempus const& step, std::uint32_t& count, Tempus** times,
                              double** values) {
    sampleInto(*this, kWholeChain, start, step, count, arrayOf(times), arrayOf(values));
    return true;
}
