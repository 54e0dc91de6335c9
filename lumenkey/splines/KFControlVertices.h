#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/Tempus.h"

#include <cstdint>
#include <vector>

class KFSpline;
class KFVertex;

/// The valid vertices of a spline in their order, for strategies that draw a spline as one function of its
/// control points. They are listed anew when the spline's vertices have changed, and at each request where
/// vertices may be enabled at one time and disabled at another.
///
/// The vertices stay the spline's, whose lock guards the list. A copy starts empty: it will serve another
/// spline.
class LUMENKEY_API KFControlVertices {
public:
    KFControlVertices() noexcept = default;
    KFControlVertices(KFControlVertices const&) noexcept {}
    KFControlVertices& operator=(KFControlVertices const&) noexcept;

    /// The vertices valid at `t`. Good until the next call. `listedAnew`, if given, tells whether this call listed them.
    std::vector<KFVertex*> const& of(KFSpline& spline, Tempus const& t, bool* listedAnew = nullptr);

private:
    std::vector<KFVertex*> _vertices;
    KFSpline const* _spline = nullptr;
    std::uint64_t _version = 0;
};
