#pragma once

#include "lumenkey/curves/KFCurveNode.h"

#include <algorithm>
#include <string>
#include <typeinfo>

/// Processing nodes such as a host brings: each does one thing, at one time and over a row alike.
///
/// `log`, unless null, gets the letter of each node that is destroyed.
class ChainNode : public KFCurveNode {
public:
    ChainNode(char name, double number, std::string* destroyed)
        : letter(name), amount(number), log(destroyed) {}
    ~ChainNode() override {
        if (log != nullptr)
            *log += letter;
    }

    bool getUForValue(double, std::vector<Tempus>&, BXTimeRange&, Tempus&, std::uint32_t) override {
        return false;
    }
    void getNeededRange(KFCurveNodeParam* param) override { param->needSameRange(); }
    bool compare(KFCurveNode const* other) const override {
        auto const* const node = dynamic_cast<ChainNode const*>(other);
        return node != nullptr && typeid(*node) == typeid(*this) && node->amount == amount;
    }

    char letter;
    double amount;
    std::string* log;
};

class Gain : public ChainNode {
public:
    explicit Gain(double factor, char name = 'G', std::string* destroyed = nullptr)
        : ChainNode(name, factor, destroyed) {}
    using KFCurveNode::solveNode;
    double solveNode(Tempus const&, double, double input) override { return amount * input; }
    void solveNode(KFCurveNodeParam& param) override {
        for (std::uint32_t i = 0; i < param.outputCount; ++i)
            param.outputValues[i] = amount * param.inputValues[i];
    }
    KFCurveNode* cloneNode() const override { return new Gain(*this); }
};

/// A gain in front of which a row doesn't look.
class PassingGain : public Gain {
public:
    using Gain::Gain;
    bool isPassThrough() const override { return true; }
    KFCurveNode* cloneNode() const override { return new PassingGain(*this); }
};

/// Adds the seconds of the time, times `amount`.
class AddTime : public ChainNode {
public:
    explicit AddTime(double factor) : ChainNode('A', factor, nullptr) {}
    double solveNode(Tempus const& t, double, double input) override {
        return input + amount * TempusGetSeconds(t);
    }
    void solveNode(KFCurveNodeParam& param) override {
        for (std::uint32_t i = 0; i < param.outputCount; ++i)
            param.outputValues[i] =
                solveNode(param.outputStart + param.outputStep * i, 0.0, param.inputValues[i]);
    }
    KFCurveNode* cloneNode() const override { return new AddTime(*this); }
};

/// Adds the caller's number.
class AddOperand : public ChainNode {
public:
    AddOperand() : ChainNode('O', 0.0, nullptr) {}
    double solveNode(Tempus const&, double operand, double input) override { return input + operand; }
    void solveNode(KFCurveNodeParam& param) override {
        for (std::uint32_t i = 0; i < param.outputCount; ++i)
            param.outputValues[i] = param.inputValues[i] + param.operand;
    }
    KFCurveNode* cloneNode() const override { return new AddOperand(*this); }
};

/// Reads what stands in front of it `amount` seconds earlier.
class Delay : public ChainNode {
public:
    explicit Delay(double seconds) : ChainNode('D', seconds, nullptr) {}
    using KFCurveNode::solveNode;
    void solveNode(KFCurveNodeParam&) override {}
    void getNeededRange(KFCurveNodeParam* param) override {
        param->needSameRange();
        param->inputStart = getNeededTime(param->outputStart);
    }
    Tempus getNeededTime(Tempus const& t) override { return t - KFChronoForChannelSeconds(amount, 1000); }
    bool isRemappingTime() const override { return true; }
    KFCurveNode* cloneNode() const override { return new Delay(*this); }
};

/// The sum of its input one step before, at, and one step after each sample.
class SumOfThree : public ChainNode {
public:
    SumOfThree() : ChainNode('S', 0.0, nullptr) {}
    using KFCurveNode::solveNode;
    void solveNode(KFCurveNodeParam& param) override {
        for (std::uint32_t i = 0; i < param.outputCount; ++i) {
            double const* const in = param.inputValues + i;
            param.outputValues[i] = in[0] + in[1] + in[2];
        }
    }
    void getNeededRange(KFCurveNodeParam* param) override {
        param->inputStart = param->outputStart - param->outputStep;
        param->inputStep = param->outputStep;
        param->inputCount = param->outputCount + 2;
        param->inputValues = new double[param->inputCount];
        param->ownsInputValues = true;
    }
    bool isPointToPoint() const override { return false; }
    KFCurveNode* cloneNode() const override { return new SumOfThree(*this); }
};

/// Gives at most two samples, and notes how many it was given.
class TwoAtMost : public ChainNode {
public:
    TwoAtMost() : ChainNode('T', 0.0, nullptr) {}
    using KFCurveNode::solveNode;
    void solveNode(KFCurveNodeParam& param) override {
        given = param.inputCount;
        param.outputCount = std::min(param.outputCount, 2U);
    }
    KFCurveNode* cloneNode() const override { return new TwoAtMost(*this); }

    std::uint32_t given = 0;
};
