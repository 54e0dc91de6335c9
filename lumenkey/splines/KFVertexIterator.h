#pragma once

#include <cstdint>

/// A place in a spline's order of vertices. It stays good until the spline's set of vertices changes.
/// `KFSpline` gives, moves and reads it.
struct KFVertexIterator {
    std::uint32_t block = 0;
    std::uint32_t slot = 0;

    friend bool operator==(KFVertexIterator const&, KFVertexIterator const&) = default;
};
