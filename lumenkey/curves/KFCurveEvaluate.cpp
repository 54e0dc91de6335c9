// The chain of processing nodes: its changes, and the evaluation of root and chain at one time and over a row.

#include "lumenkey/curves/KFCurve.h"

#include <algorithm>

// --- The chain ---

std::size_t KFCurve::indexOfNode(KFCurveNode const* node) const noexcept {
    auto const found = std::find_if(_processingNodes.begin(), _processingNodes.end(),
                                    [node](auto const& member) { return member.get() == node; });
    return static_cast<std::size_t>(found - _processingNodes.begin());
}

bool KFCurve::mayJoinChain(KFCurveNode const* node) const noexcept {
    return node != nullptr && indexOfNode(node) == _processingNodes.size();
}

std::unique_ptr<KFCurveNode> KFCurve::takeOutNode(KFCurveNode const* node) {
    std::unique_ptr<KFCurveNode> taken;
    std::size_t const index = indexOfNode(node);
    if (index < _processingNodes.size()) {
        taken = std::move(_processingNodes[index]);
        _processingNodes.erase(_processingNodes.begin() + static_cast<std::ptrdiff_t>(index));
    }
    return taken;
}

bool KFCurve::appendCurveProcessingNode(KFCurveNode* node) {
    if (!mayJoinChain(node))
        return false;
    _processingNodes.emplace_back(node);
    setTreeProperties();
    return true;
}

bool KFCurve::insertCurveProcessingNode(KFCurveNode* node, KFCurveNode* after) {
    if (!mayJoinChain(node))
        return false;
    std::size_t const place =
        after == nullptr ? 0 : std::min(indexOfNode(after) + 1, _processingNodes.size());
    _processingNodes.emplace(_processingNodes.begin() + static_cast<std::ptrdiff_t>(place), node);
    setTreeProperties();
    return true;
}

bool KFCurve::deleteCurveProcessingNode(KFCurveNode* node) {
    bool const found = takeOutNode(node) != nullptr;
    setTreeProperties();
    return found;
}

bool KFCurve::removeCurveProcessingNode(KFCurveNode* node) {
    bool const found = takeOutNode(node).release() != nullptr;
    setTreeProperties();
    return found;
}

bool KFCurve::getPreviousProcessingNode(KFCurveNode* node, KFCurveNode** out) {
    std::size_t const index = indexOfNode(node);
    KFCurveNode* const previous = index == 0 ? nullptr : _processingNodes[index - 1].get();
    if (out != nullptr)
        *out = previous;
    return previous != nullptr;
}

bool KFCurve::enumerateCurveProcessingNodes(std::vector<KFCurveNode*>& out) {
    out.clear();
    out.reserve(_processingNodes.size());
    for (auto const& node : _processingNodes)
        out.push_back(node.get());
    return true;
}

bool KFCurve::getNumCurveProcessingNodes(std::uint32_t* out) {
    if (out != nullptr)
        *out = static_cast<std::uint32_t>(_processingNodes.size());
    return true;
}

void KFCurve::setTreeProperties() {
    _pointToPoint = true;
    for (auto const& node : _processingNodes) {
        if (!node->isPointToPoint())
            _pointToPoint = false;
        if (node->isRemappingTime())
            _remapsTime = true;
    }
}

bool KFCurve::compareTree(KFCurve const& other) const {
    if (_processingNodes.size() != other._processingNodes.size())
        return false;
    bool equal = sameRoot(other);
    for (std::size_t i = 0; i < _processingNodes.size(); ++i)
        equal = _processingNodes[i]->compare(other._processingNodes[i].get()) && equal;
    return equal;
}

void KFCurve::cloneTree(KFCurve const& other) {
    // The count first: the other may be this curve.
    std::size_t const count = other._processingNodes.size();
    _processingNodes.reserve(_processingNodes.size() + count);
    for (std::size_t i = 0; i < count; ++i) {
        if (KFCurveNode* const clone = other._processingNodes[i]->cloneNode())
            _processingNodes.emplace_back(clone);
    }
    setTreeProperties();
}

// --- One time ---

double KFCurve::getValue(Tempus const& t, double operand) {
    if (_processingNodes.empty())
        return clamped(getRootNode()->solveNode(t, operand, 0.0));
    return clamped(solveFirst(_processingNodes.size(), t, operand));
}

double KFCurve::getValue(Tempus const& t, void* node) {
    if (node == nullptr || _processingNodes.empty())
        return clamped(getRootNode()->solveNode(t, 0.0, 0.0));
    std::size_t const index = indexOfNode(static_cast<KFCurveNode const*>(node));
    return clamped(index == _processingNodes.size() ? 0.0 : solveFirst(index + 1, t, 0.0));
}

bool KFCurve::getPoint(Tempus const& t, double operand, double* out) {
    if (out != nullptr)
        *out = getValue(t, operand);
    return true;
}

bool KFCurve::getPointWithoutBehavior(Tempus const& t, double, double* out) {
    // Not the virtual one: a class that rounds its answers gives the raw value here.
    if (out != nullptr)
        *out = KFCurve::getValue(t, nullptr);
    return true;
}

bool KFCurve::getPointFromCurveNode(Tempus const& t, double, double* out, void* node) {
    if (out != nullptr)
        *out = getValue(t, node);
    return true;
}

double KFCurve::solveFirst(std::size_t nodes, Tempus const& t, double operand) {
    if (!_pointToPoint)
        return solveSample(nodes, t);
    return _remapsTime ? solveRemappedChain(nodes, t, operand) : solveChain(nodes, t, operand);
}

double KFCurve::solveChain(std::size_t nodes, Tempus const& t, double operand) {
    double value = getRootNode()->solveNode(t, operand, 0.0);
    for (std::size_t i = 0; i < nodes; ++i)
        value = _processingNodes[i]->solveNode(t, operand, value);
    return value;
}

/// Each node gets the time of its own output, and the root the one that the first node needs.
double KFCurve::solveRemappedChain(std::size_t nodes, Tempus const& t, double operand) {
    std::vector<Tempus> times(nodes + 1, t);
    for (std::size_t i = nodes; i-- > 0;)
        times[i] = _processingNodes[i]->getNeededTime(times[i + 1]);
    double value = getRootNode()->solveNode(times[0], operand, 0.0);
    for (std::size_t i = 0; i < nodes; ++i)
        value = _processingNodes[i]->solveNode(times[i + 1], operand, value);
    return value;
}

double KFCurve::solveSample(std::size_t nodes, Tempus const& t) {
    double value = 0.0;
    KFCurveNodeParam param;
    param.outputStart = t;
    param.outputStep = TempusMake(1, 1);
    param.outputCount = 1;
    param.outputValues = &value;
    processCurve(param, _processingNodes[nodes - 1].get());
    return value;
}

// --- A row ---

namespace {

/// A node and what is asked of it.
struct Stage {
    KFCurveNode* node;
    std::unique_ptr<KFCurveNodeParam> request;
};

/// The stage that answers a caller's request.
Stage lastStage(KFCurveNode& node, KFCurveNodeParam const& wanted) {
    auto request = std::make_unique<KFCurveNodeParam>(wanted);
    if (request->outputValues == nullptr) {
        request->outputValues = new double[request->outputCount]{};
        request->ownsOutputValues = true;
    }
    request->needSameRange();
    node.getNeededRange(request.get());
    return {&node, std::move(request)};
}

/// The stage that produces what the one behind it needs.
Stage stageInFrontOf(Stage const& behind, KFCurveNode& node) {
    KFCurveNodeParam const& needed = *behind.request;
    auto request = std::make_unique<KFCurveNodeParam>();
    request->segmentSampling = needed.segmentSampling;
    request->operand = needed.operand;
    request->outputStart = needed.inputStart;
    request->outputStep = needed.inputStep;
    request->outputCount = needed.inputCount;
    request->outputValues = needed.inputValues;
    request->needSameRange();
    node.getNeededRange(request.get());
    return {&node, std::move(request)};
}

void fillTimes(KFCurveNodeParam const& param, Tempus** timesOut) {
    if (timesOut == nullptr || *timesOut == nullptr)
        return;
    Tempus t = param.outputStart;
    for (std::uint32_t i = 0; i < param.outputCount; ++i) {
        (*timesOut)[i] = t;
        t = BX_TempusSaferAdd(t, param.outputStep);
    }
}

} // namespace

bool KFCurve::processCurve(KFCurveNodeParam& param, KFCurveNode* stopNode) {
    std::size_t const stop = indexOfNode(stopNode);
    if (stopNode != nullptr && stop == _processingNodes.size())
        return false;

    std::vector<Stage> stages; // the last one first
    stages.reserve(_processingNodes.size() + 1);
    stages.push_back(lastStage(stopNode == nullptr ? *getRootNode() : *stopNode, param));
    if (stopNode != nullptr) {
        for (std::size_t i = stop; i > 0 && !stages.back().node->isPassThrough(); --i)
            stages.push_back(stageInFrontOf(stages.back(), *_processingNodes[i - 1]));
        stages.push_back(stageInFrontOf(stages.back(), *getRootNode()));
    }

    while (!stages.empty()) {
        Stage const stage = std::move(stages.back());
        stages.pop_back();
        stage.node->solveNode(*stage.request);
        std::uint32_t& produced = stages.empty() ? param.outputCount : stages.back().request->inputCount;
        produced = std::min(produced, stage.request->outputCount);
    }

    for (std::uint32_t i = 0; param.outputValues != nullptr && i < param.outputCount; ++i)
        param.outputValues[i] = clamped(param.outputValues[i]);
    return true;
}

bool KFCurve::processTree(KFCurveNodeParam& param, Tempus** timesOut, double** valuesOut) {
    return processTree(param, timesOut, valuesOut,
                       _processingNodes.empty() ? nullptr : _processingNodes.back().get());
}

bool KFCurve::processTree(KFCurveNodeParam& param, Tempus** timesOut, double**, KFCurveNode* stopNode) {
    bool const done = processCurve(param, stopNode);
    fillTimes(param, timesOut);
    return done;
}
