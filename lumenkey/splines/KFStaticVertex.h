#pragma once

#include "lumenkey/splines/KFVertex.h"

#include <atomic>

/// The plain keypoint: its attributes are numbers, the same at every time.
///
/// New: enabled, bias 1, interpolation 1 (Linear), flags 0, zero tangents, normal 0.
///
/// The accessors are final, so that a spline that knows its vertices to be static reads them without a virtual call.
class LUMENKEY_API KFStaticVertex : public KFVertex {
public:
    KFStaticVertex(Tempus const& u, double value) noexcept;
    KFStaticVertex(KFStaticVertex const& other) noexcept = default;
    KFStaticVertex& operator=(KFStaticVertex const& other) noexcept;
    /// A snapshot of any vertex at `t`: its position, and value, bias and both tangents as read at `t`, and its
    /// interpolation. Enabled; flags and normal keep their defaults. `vertex` isn't null.
    KFStaticVertex(KFVertex const* vertex, Tempus const& t);

    ~KFStaticVertex() override;

    void setValueU(Tempus const& u) override;
    double getValueV(Tempus const&) const final { return _valueV; }
    void setValueV(double value, Tempus const& t) override;
    double getBias(Tempus const&) const final { return _bias; }
    void setBias(double bias, Tempus const& t) override;
    void getInputTangents(double* u, double* v, Tempus const& t) const final;
    void getOutputTangents(double* u, double* v, Tempus const& t) const final;
    void setInputTangents(double u, double v, Tempus const& t) override;
    void setOutputTangents(double u, double v, Tempus const& t) override;
    void flattenTangents(Tempus const& t) override;
    void resetTangents() override;
    void swapTangents() override;
    void setEnabled(bool enabled, Tempus const& t) override;
    bool isEnabled(Tempus const&) const final { return _enabled; }
    bool isFlat() const override;
    void setInterpolation(std::uint32_t type) override;
    std::uint32_t getInterpolation() const final { return KFVertex::getInterpolation(); }
    KFVertex* clone() const override;
    void offsetVertexInTime(Tempus const& delta) override;
    /// False for null and for another class; else the base's comparison, then every field exactly.
    bool isEqual(KFVertex const* other) const override;

    /// Position and value in one call; each target may be null.
    virtual void getValue(Tempus* u, double* v, Tempus const& t) const;

    /// Grows with every change of a field that evaluation reads, so that what was computed from the vertex can be
    /// told to be out of date. Meaningful only in comparison with an earlier reading of the same vertex. Who reads it
    /// first and the fields then never takes an old field for one of the new revision.
    std::uint32_t getRevision() const noexcept { return _revision.get(); }
    /// Grows whenever any static vertex of the process takes or leaves a type that draws a whole spline as one
    /// function: the types of a spline's ends decide how all of it is evaluated.
    static std::uint32_t getWholeCurveChanges() noexcept {
        return _wholeCurveChanges.load(std::memory_order_acquire);
    }

    /// For who keeps what it computed from a vertex and will not look at the vertex again: from now on each of its
    /// changes also makes `getWatchedChanges` grow, before the setter returns. Gives `getRevision`.
    ///
    /// Who reads `getWatchedChanges`, watches the vertices, finds their revisions to be those with which it read their
    /// fields, and later finds `getWatchedChanges` to be the same, knows that no vertex has changed in between.
    std::uint32_t watch() const noexcept { return _revision.watch(); }
    /// One number for the whole process: grows with each change of a watched vertex, and with `getWholeCurveChanges`.
    static std::uint64_t getWatchedChanges() noexcept {
        return _watchedChanges.load(std::memory_order_acquire);
    }

private:
    /// The number of changes of a vertex, and whether it is watched. Both are one atomic number that is only ever
    /// exchanged as a whole, so that of a change and a watch that come together one sees the other.
    class Revision {
    public:
        Revision() noexcept = default;
        Revision(Revision const&) noexcept {} // nobody has seen the copy yet

        std::uint32_t get() const noexcept { return _bits.load(std::memory_order_acquire) / kStep; }
        std::uint32_t watch() const noexcept {
            std::uint32_t bits = _bits.load(std::memory_order_acquire);
            if ((bits & kWatched) == 0)
                bits = _bits.fetch_or(kWatched, std::memory_order_acq_rel);
            return bits / kStep;
        }
        /// True when it is watched.
        bool advance() noexcept {
            return (_bits.fetch_add(kStep, std::memory_order_acq_rel) & kWatched) != 0;
        }

    private:
        static constexpr std::uint32_t kWatched = 1;
        static constexpr std::uint32_t kStep = 2;

        mutable std::atomic<std::uint32_t> _bits{0};
    };

    void touch() noexcept {
        if (_revision.advance())
            _watchedChanges.fetch_add(1, std::memory_order_release);
    }
    bool isGuarded() const noexcept { return (KFVertex::getFlags() & kKFVertexFlagLocked) != 0; }

    static std::atomic<std::uint32_t> _wholeCurveChanges;
    static std::atomic<std::uint64_t> _watchedChanges;

    BXRelaxed<bool> _enabled;
    Revision _revision;
    BXRelaxed<double> _valueV;
    BXRelaxed<double> _inputTangentU;
    BXRelaxed<double> _inputTangentV;
    BXRelaxed<double> _outputTangentU;
    BXRelaxed<double> _outputTangentV;
    BXRelaxed<double> _bias;
};

inline void KFStaticVertex::getInputTangents(double* u, double* v, Tempus const&) const {
    if (u != nullptr)
        *u = _inputTangentU;
    if (v != nullptr)
        *v = _inputTangentV;
}

inline void KFStaticVertex::getOutputTangents(double* u, double* v, Tempus const&) const {
    if (u != nullptr)
        *u = _outputTangentU;
    if (v != nullptr)
        *v = _outputTangentV;
}
