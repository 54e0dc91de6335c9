#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXRelaxed.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>

/// Bits of a vertex's flags. The numbers stand in documents: never renumber. Bits not named here are kept as given.
enum KFVertexFlag : std::uint32_t {
    /// The input and output handles move independently.
    kKFVertexFlagHandlesBroken = 0x1,
    /// The vertex may not change: every guarded setter does nothing.
    kKFVertexFlagLocked = 0x2,
    /// The handles are weighted; read only by callers.
    kKFVertexFlagHandlesWeighted = 0x8,
    /// The keypoint is selected; read only by callers.
    kKFVertexFlagSelected = 0x10,
    /// The handles were set by hand: automatic derivation no longer overwrites them.
    kKFVertexFlagHandlesEdited = 0x80,
    /// The vertex was moved onto or past a neighbour.
    kKFVertexFlagCrossedNeighbour = 0x100,
    /// Open edge of a shape.
    kKFVertexFlagOpenEdge = 0x200,
};

/// One keypoint of a spline: a position U on the input axis, a value V, two tangents, and what decides how the
/// segment that starts here is drawn.
///
/// U is a time on an ordinary curve and a running parameter on a parametric one. Tangents are vectors from the
/// vertex, their U part in seconds and their V part in units of the value. A handle, which is what a user sees, is
/// a tangent times the factor of the segment's interpolator (12 for the cubic types, 1/3 on a parametric spline).
///
/// Each operation with a time as last argument reads or writes the attribute at that time; plain keypoints ignore
/// it. Where an out-parameter is a pointer, null skips it.
///
/// Guarded setters do nothing while `kKFVertexFlagLocked` is set. Who must write a locked vertex saves the flags
/// with `getFlags`, clears the bit, writes, and restores them with `setFlags`.
///
/// A spline keeps an index of the positions and enabled states of its vertices. Whoever writes those directly on a
/// vertex that stands in a spline, and not through the spline, calls `KFSpline::setDirty(true)` afterwards. All other
/// attributes may be written directly at any time.
///
/// Threads: every field is read and written as a whole by relaxed atomic accesses, so that one thread may edit while
/// others evaluate. A position is four fields: who reads it beside an editing thread holds the spline's lock.
class LUMENKEY_API KFVertex {
public:
    explicit KFVertex(Tempus const& u) noexcept;
    KFVertex(KFVertex const& other) noexcept;

    // The order of the virtual operations is the interface that hosts derive from: never reorder.

    virtual ~KFVertex();

    /// Guarded. Moves the vertex unless `u` compares equal to where it is. It doesn't move in its spline's order.
    virtual void setValueU(Tempus const& u);
    virtual double getValueV(Tempus const& t) const = 0;
    /// Guarded.
    virtual void setValueV(double value, Tempus const& t) = 0;
    virtual double getBias(Tempus const& t) const = 0;
    /// Guarded. 0 to 2, neutral at 1; the range isn't enforced.
    virtual void setBias(double bias, Tempus const& t) = 0;
    virtual void getInputTangents(double* u, double* v, Tempus const& t) const = 0;
    virtual void getOutputTangents(double* u, double* v, Tempus const& t) const = 0;
    /// Guarded, and ignored by a disabled vertex. A `u` above 0 becomes 0: the input tangent points backwards.
    virtual void setInputTangents(double u, double v, Tempus const& t) = 0;
    /// Guarded, and ignored by a disabled vertex. A `u` below 0 becomes 0: the output tangent points forwards.
    virtual void setOutputTangents(double u, double v, Tempus const& t) = 0;
    /// Guarded, and ignored by a disabled vertex. Zeroes both tangents and clears `kKFVertexFlagHandlesBroken`.
    virtual void flattenTangents(Tempus const& t) = 0;
    /// `flattenTangents` at time zero.
    virtual void resetTangents() = 0;
    /// A number kept for the caller. Not guarded.
    virtual void setNormal(double normal, Tempus const& t);
    virtual double getNormal(Tempus const& t) const;
    /// Exchanges the two tangents as they stand, without a change of sign or a clamp. Not guarded.
    virtual void swapTangents() = 0;
    /// Not guarded.
    virtual void setEnabled(bool enabled, Tempus const& t) = 0;
    virtual bool isEnabled(Tempus const& t) const = 0;
    /// True when each of the four tangent components has an absolute value below 1e-7.
    virtual bool isFlat() const = 0;
    virtual void setFlag(std::uint32_t mask);
    virtual void resetFlag(std::uint32_t mask);
    virtual std::uint32_t getFlags() const;
    virtual void setFlags(std::uint32_t flags);
    /// True when any bit of `mask` is set.
    virtual bool testFlag(std::uint32_t mask) const;
    virtual void setDefaultAtCurrentTime(Tempus const& t);
    /// Not guarded. The numbers are those of `KFInterpolation`; any other number draws as Bezier.
    virtual void setInterpolation(std::uint32_t type);
    virtual std::uint32_t getInterpolation() const;
    /// A new vertex of the same class, field by field; the caller owns it.
    virtual KFVertex* clone() const = 0;
    virtual void updateBias();
    virtual void enableBehavior(bool enable);
    virtual bool enabledBehavior() const;
    /// Moves the vertex by `delta`. Not guarded.
    virtual void offsetVertexInTime(Tempus const& delta) = 0;
    /// U by comparison; interpolation, flags and normal exactly. `other` isn't null here.
    virtual bool isEqual(KFVertex const* other) const;

    Tempus getValueU() const noexcept;

    /// Before `other` along U.
    bool operator<(KFVertex const& other) const noexcept {
        return TempusCompare(getValueU(), other.getValueU()) < 0;
    }
    bool operator==(KFVertex const& other) const { return isEqual(&other); }

protected:
    /// For the assignment of a class that knows what else depends on these fields: assigned by themselves, they would
    /// change under what a spline keeps of the vertex.
    KFVertex& operator=(KFVertex const& other) noexcept;
    void storeValueU(Tempus const& u) noexcept;

private:
    BXRelaxed<std::int64_t> _valueUValue;
    BXRelaxed<std::int32_t> _valueUTimescale;
    BXRelaxed<std::uint32_t> _valueUFlags;
    BXRelaxed<std::int64_t> _valueUEpoch;
    BXRelaxed<double> _normal;
    BXRelaxed<std::uint32_t> _flags;
    // Last, beside what a static vertex adds: drawing a segment reads few lines of memory then.
    BXRelaxed<std::uint32_t> _interpolation;
};

inline Tempus KFVertex::getValueU() const noexcept {
    return Tempus{_valueUValue, _valueUTimescale, _valueUFlags, _valueUEpoch};
}

inline std::uint32_t KFVertex::getInterpolation() const { return _interpolation; }
