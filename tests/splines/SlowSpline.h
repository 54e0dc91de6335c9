// The editing rules once more, in plain words: one list, walked from its start, with no index and no search.
// What KFSpline does fast is compared with it. Curves are Constant or Linear, and held at their ends.
#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <algorithm>
#include <cstdint>
#include <functional>
#include <memory>
#include <utility>
#include <vector>

/// Of one side, as U and V.
struct SlowTangent {
    double u = 0.0, v = 0.0;

    SlowTangent operator-() const { return {-u, -v}; }
    SlowTangent operator*(double factor) const { return {u * factor, v * factor}; }
};

struct SlowKey {
    Tempus u;
    double v = 0.0;
    std::uint32_t type = 1;
    std::uint32_t flags = 0;
    bool enabled = true;
    SlowTangent in = {};
    SlowTangent out = {};

    bool locked() const { return (flags & 0x2) != 0; }
    bool edited() const { return (flags & 0x80) != 0; }
    void setValue(double value) { v = locked() ? v : value; }
    void setIn(SlowTangent const& t) {
        in = locked() || !enabled ? in : SlowTangent{std::min(t.u, 0.0), t.v};
    }
    void setOut(SlowTangent const& t) {
        out = locked() || !enabled ? out : SlowTangent{std::max(t.u, 0.0), t.v};
    }
    void scaleIn(double factor) { setIn(in * factor); }
    void scaleOut(double factor) { setOut(out * factor); }
};

/// A null key stands for "there is none" throughout, and for a refusal as a result.
class SlowSpline {
public:
    using Key = SlowKey*;

    Key add(Tempus const& u, double value, bool replace);
    Key addNoTangents(Tempus const& u, double value, bool replace);
    /// Null when the key merged and is gone.
    Key set(Key key, Tempus const& u, double value);
    Key setNoTangents(Key key, Tempus const& u, double value);
    Key move(Key key, Tempus const& newU, bool clone, bool replace, bool constrain);
    bool erase(Key key, bool scale);
    bool eraseAt(Tempus const& u, bool scale);
    bool eraseBetween(Tempus const& from, Tempus const& to);
    double valueAt(Tempus const& u) const;

    std::vector<std::unique_ptr<SlowKey>> keys;
    bool derive = true;
    std::uint32_t newType = 1;
    Tempus step = TempusMake(1, 30);

private:
    std::vector<Key> valid() const;
    Key before(Tempus const& u) const;
    Key after(Tempus const& u) const;
    Key previousOf(Key key) const;
    Key nextOf(Key key) const;
    std::size_t placeOf(Tempus const& u) const;
    /// The first key there.
    Key at(Tempus const& u) const;
    Key insert(std::unique_ptr<SlowKey> key);
    Key join(std::unique_ptr<SlowKey> key, bool replace, bool stateType);
    std::unique_ptr<SlowKey> take(Key key);
    bool eraseAll(std::function<bool(SlowKey const&)> const& holds, bool scale);
    void deriveKey(SlowKey& key);
    std::pair<SlowTangent, SlowTangent> derivePoint(Tempus const& u);
    void growAround(Tempus const& newU, Tempus const& oldU);
    void fitMoved(Key key, Tempus const& delta);
    void ungrow(Key key);
};
