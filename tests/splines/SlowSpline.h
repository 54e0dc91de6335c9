// The editing rules once more, in plain words: one list, walked from its start, with no index and no search.
// What KFSpline does fast is compared with it. Curves are Constant or Linear, and held at their ends.
#pragma once

#include "lumenkey/foundation/Tempus.h"

#include <cstdint>
#include <memory>
#include <vector>

struct SlowKey {
    Tempus u;
    double v = 0.0;
    std::uint32_t type = 1;
    std::uint32_t flags = 0;
    bool enabled = true;
    double in[2] = {0.0, 0.0};
    double out[2] = {0.0, 0.0};

    bool locked() const { return (flags & 0x2) != 0; }
    bool edited() const { return (flags & 0x80) != 0; }
    void setIn(double x, double y);
    void setOut(double x, double y);
    void scaleIn(double factor) { setIn(in[0] * factor, in[1] * factor); }
    void scaleOut(double factor) { setOut(out[0] * factor, out[1] * factor); }
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
    Key join(std::unique_ptr<SlowKey> key, bool replace, bool stateType);
    std::unique_ptr<SlowKey> take(Key key);
    Key putBack(std::unique_ptr<SlowKey> key, double value);
    void deriveKey(SlowKey& key);
    void derivePoint(Tempus const& u, double* in, double* out);
    void growAround(Tempus const& newU, Tempus const& oldU);
    void fitMoved(Key key, Tempus const& delta);
    void ungrow(Key key);
};
