#pragma once

#include "lumenkey/curves/KFCurveNode.h"

/// A processing node that adds a number, and the operand, to what it gets.
class AddingNode : public KFCurveNode {
public:
    explicit AddingNode(double summand) : _summand(summand) {}
    double solveNode(Tempus const&, double operand, double input) override {
        return input + _summand + operand;
    }
    void solveNode(KFCurveNodeParam& param) override {
        for (std::uint32_t i = 0; i < param.outputCount; ++i)
            param.outputValues[i] = param.inputValues[i] + _summand;
    }
    bool getUForValue(double, std::vector<Tempus>&, BXTimeRange&, Tempus&, std::uint32_t) override {
        return false;
    }
    void getNeededRange(KFCurveNodeParam* param) override { param->needSameRange(); }
    KFCurveNode* cloneNode() const override { return new AddingNode(_summand); }
    bool compare(KFCurveNode const* other) const override {
        auto const* const node = dynamic_cast<AddingNode const*>(other);
        return node != nullptr && node->_summand == _summand;
    }

private:
    double const _summand;
};
