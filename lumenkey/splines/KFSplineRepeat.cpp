// Writing the continuation of a curve into it as vertices.
//
// Each cycle repeats all valid vertices of the curve. Cycle c stands c ranges away, either as it is (the vertex w at
// w + range * c, or w - range * c before the start) or mirrored at an end of the curve. The vertices go into a copy,
// so that every cycle is computed from the curve as it was.

#include "lumenkey/splines/KFSpline.h"

#include "lumenkey/splines/KFSplineAccess.h"
#include "lumenkey/splines/KFVertex.h"

namespace {

struct Tangent {
    double u = 0.0;
    double v = 0.0;
};

Tangent inputOf(KFVertex const& vertex, Tempus const& t) {
    Tangent tangent;
    vertex.getInputTangents(&tangent.u, &tangent.v, t);
    return tangent;
}

Tangent outputOf(KFVertex const& vertex, Tempus const& t) {
    Tangent tangent;
    vertex.getOutputTangents(&tangent.u, &tangent.v, t);
    return tangent;
}

class CycleWriter {
public:
    /// `before` says the side. Both splines outlive the writer; `target` is a copy of `source`, which has valid
    /// vertices at `t`.
    CycleWriter(KFSpline& source, KFSpline& target, bool before, Tempus const& t)
        : _source(source), _target(target), _t(t), _before(before),
          _mode(source.getExtrapolation(before ? 1 : 0)) {
        void* handle = nullptr;
        for (bool found = source.getFirstValidVertex(&handle, t); found;
             found = source.getNextValidVertex(handle, &handle, t)) {
            _cycle.push_back(static_cast<KFVertex*>(handle));
        }
        _range = last().getValueU() - first().getValueU();
        _placed.resize(_cycle.size());
    }

    void write(std::uint32_t cycle, bool isLastCycle) {
        if (_mode > kKFExtrapolationProgressiveRepeat) {
            return;
        }
        place(cycle);
        for (std::size_t i = 0; i < _cycle.size(); ++i) {
            if (i == 0 && _mode <= kKFExtrapolationLinear) {
                continueInMode();
                continue;
            }
            bool const replace = !(_before && _mode == kKFExtrapolationRepeat);
            void* const added = _target.addVertexNoTangents(_placed[i].u, _placed[i].value, _t, replace);
            shape(*static_cast<KFVertex*>(added), i, isMirrored(cycle), isLastCycle);
        }
    }

private:
    struct Placed {
        Tempus u;
        double value = 0.0;
    };

    KFVertex& first() const { return *_cycle.front(); }
    KFVertex& last() const { return *_cycle.back(); }

    bool isMirrored(std::uint32_t cycle) const {
        return _mode == kKFExtrapolationPingPong ? cycle % 2 != 0
                                                 : _mode <= kKFExtrapolationLinear && _before;
    }

    /// Positions and values of one cycle. Evaluating shares what the spline remembers with other readers, hence
    /// the lock; nothing is added meanwhile.
    void place(std::uint32_t cycle) {
        KFSplineAccess access(_source);
        for (std::size_t i = 0; i < _cycle.size(); ++i) {
            _placed[i].u = position(*_cycle[i], cycle);
            _placed[i].value = value(*_cycle[i], _placed[i].u);
        }
    }

    Tempus position(KFVertex const& w, std::uint32_t cycle) const {
        Tempus const u = w.getValueU();
        if (isMirrored(cycle)) {
            Tempus const inner = _range * (cycle - 1);
            return _before ? first().getValueU() - inner - (u - first().getValueU())
                           : last().getValueU() + inner + (last().getValueU() - u);
        }
        Tempus const far = _before ? u - _range * cycle : u + _range * cycle;
        if (!isSeam(w)) {
            return far;
        }
        return _before ? far - _source.getSmallDeltaU() : far + _source.getSmallDeltaU();
    }

    /// A repeated cycle starts a little beside the end of the one before, where the curve jumps.
    bool isSeam(KFVertex const& w) const {
        return _mode == kKFExtrapolationRepeat && &w == (_before ? _cycle.back() : _cycle.front());
    }

    double value(KFVertex& w, Tempus const& u) const {
        KFVertex& anchor = _before ? first() : last();
        if (_mode == kKFExtrapolationConstant) {
            return anchor.getValueV(_t);
        }
        if (_mode == kKFExtrapolationRepeat && !isSeam(w)) {
            return w.getValueV(_t);
        }
        double value = 0.0;
        _source.extrapolate(&anchor, _t, u, &value, _before ? 1 : 0);
        return value;
    }

    /// Held and straight continuations start at the end of the curve itself.
    void continueInMode() {
        void* end = nullptr;
        if (!_before && _target.getLastValidVertex(&end, _t)) {
            static_cast<KFVertex*>(end)->setInterpolation(heldType());
        }
    }

    std::uint32_t heldType() const {
        return _mode == kKFExtrapolationConstant ? kKFInterpolationConstant : kKFInterpolationLinear;
    }

    void shape(KFVertex& added, std::size_t index, bool mirrored, bool isLastCycle) const {
        KFVertex const& w = *_cycle[index];
        switch (_mode) {
        case kKFExtrapolationConstant:
        case kKFExtrapolationLinear:
            added.setInterpolation(heldType());
            break;
        case kKFExtrapolationPingPong:
            added.setInterpolation((mirrored && index > 0 ? *_cycle[index - 1] : w).getInterpolation());
            mirrored ? shapeMirrored(added, w) : shapeForward(added, w);
            break;
        case kKFExtrapolationRepeat:
            added.setInterpolation(w.getInterpolation());
            copyInput(added, w);
            copyOutput(added, w);
            break;
        default:
            added.setInterpolation(w.getInterpolation());
            shapeProgressing(added, w, isLastCycle);
        }
    }

    void copyInput(KFVertex& added, KFVertex const& from) const {
        Tangent const in = inputOf(from, _t);
        added.setInputTangents(in.u, in.v, _t);
    }

    void copyOutput(KFVertex& added, KFVertex const& from) const {
        Tangent const out = outputOf(from, _t);
        added.setOutputTangents(out.u, out.v, _t);
    }

    /// A cycle of the ping-pong in the direction of the curve. Both sides of a turn are alike.
    void shapeForward(KFVertex& added, KFVertex const& w) const {
        if (&w == &first()) {
            Tangent const out = outputOf(w, _t);
            added.setOutputTangents(out.u, out.v, _t);
            added.setInputTangents(-out.u, out.v, _t);
        } else if (&w == &last()) {
            copyInput(added, w);
        } else {
            copyInput(added, w);
            copyOutput(added, w);
        }
    }

    void shapeMirrored(KFVertex& added, KFVertex const& w) const {
        Tangent const in = inputOf(w, _t);
        Tangent const out = outputOf(w, _t);
        if (&w == &last()) {
            added.setOutputTangents(-in.u, in.v, _t);
            added.setInputTangents(in.u, in.v, _t);
        } else if (&w == &first()) {
            added.setInputTangents(-out.u, out.v, _t);
        } else {
            added.setOutputTangents(-in.u, in.v, _t);
            added.setInputTangents(-out.u, out.v, _t);
        }
    }

    /// Where two cycles meet, the vertex has the input side of the end and the output side of the start.
    void shapeProgressing(KFVertex& added, KFVertex const& w, bool isLastCycle) const {
        if (w.getValueU() == first().getValueU()) {
            copyInput(added, last());
            copyOutput(added, first());
        } else if (w.getValueU() == last().getValueU()) {
            copyInput(added, w);
            if (!isLastCycle) {
                copyOutput(added, first());
            }
        } else {
            copyInput(added, w);
            copyOutput(added, w);
        }
    }

    KFSpline& _source;
    KFSpline& _target;
    Tempus const _t;
    bool const _before;
    std::uint32_t const _mode;
    std::vector<KFVertex*> _cycle;
    std::vector<Placed> _placed;
    Tempus _range;
};

} // namespace

bool KFSpline::generateExtrapolatedVertices(std::uint32_t side, std::uint32_t cycles, Tempus const& t) {
    bool const hasEnds = getFirstValidVertexWithLock(nullptr, t) && getLastValidVertexWithLock(nullptr, t);
    if (!hasEnds) {
        KFSplineAccess access(*this);
        setDirty(true);
        return false;
    }

    KFSpline work(*this, getState());
    if (side <= 1) {
        CycleWriter writer(*this, work, side == 1, t);
        for (std::uint32_t done = 0; done < cycles; ++done) {
            writer.write(done + 1, done + 1 == cycles);
        }
    }
    KFSplineAccess access(*this);
    copy(work, work.getFirstVertex(), work.getLastVertex());
    setDirty(true);
    return true;
}
