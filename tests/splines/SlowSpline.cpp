#include "tests/splines/SlowSpline.h"

#include <cmath>

namespace {

double seconds(Tempus const& t) { return TempusGetSeconds(t); }

/// A thirty-sixth of the way from p to q.
SlowTangent between(SlowKey const& p, SlowKey const& q) {
    return {seconds(q.u - p.u) / 36.0, (q.v - p.v) / 36.0};
}

void layFlat(SlowKey& neighbour, bool inputSide, SlowKey const& key) {
    if (std::fabs(neighbour.v - key.v) >= 1e-7) {
        return;
    }
    inputSide ? neighbour.setIn({neighbour.in.u, 0.0}) : neighbour.setOut({neighbour.out.u, 0.0});
    if (std::fabs(inputSide ? neighbour.out.v : neighbour.in.v) >= 1e-7) {
        neighbour.flags |= 0x1;
    }
}

} // namespace

// --- Neighbours and values ---

std::vector<SlowSpline::Key> SlowSpline::valid() const {
    std::vector<Key> list;
    for (auto const& key : keys) {
        if (key->enabled) {
            list.push_back(key.get());
        }
    }
    return list;
}

SlowSpline::Key SlowSpline::before(Tempus const& u) const {
    Key found = nullptr;
    for (Key key : valid()) {
        found = key->u < u ? key : found;
    }
    return found;
}

SlowSpline::Key SlowSpline::after(Tempus const& u) const {
    for (Key key : valid()) {
        if (key->u > u) {
            return key;
        }
    }
    return nullptr;
}

SlowSpline::Key SlowSpline::previousOf(Key key) const {
    auto const list = valid();
    auto const found = std::find(list.begin(), list.end(), key);
    return found == list.begin() || found == list.end() ? nullptr : *(found - 1);
}

SlowSpline::Key SlowSpline::nextOf(Key key) const {
    auto const list = valid();
    auto found = std::find(list.begin(), list.end(), key);
    if (found == list.end()) {
        found = list.begin();
    }
    return list.size() < 2 || found + 1 == list.end() ? nullptr : *(found + 1);
}

double SlowSpline::valueAt(Tempus const& u) const {
    for (Key key : valid()) {
        if (key->u == u) {
            return key->v;
        }
    }
    Key const a = before(u);
    Key const b = after(u);
    if (a == nullptr || b == nullptr) {
        return a != nullptr ? a->v : b != nullptr ? b->v : 0.0;
    }
    return a->type == 0 ? a->v : a->v + (b->v - a->v) * (seconds(u - a->u) / seconds(b->u - a->u));
}

/// Of the first key that isn't before `u`.
std::size_t SlowSpline::placeOf(Tempus const& u) const {
    std::size_t i = 0;
    while (i < keys.size() && keys[i]->u < u) {
        ++i;
    }
    return i;
}

SlowSpline::Key SlowSpline::at(Tempus const& u) const {
    std::size_t const i = placeOf(u);
    return i < keys.size() && keys[i]->u == u ? keys[i].get() : nullptr;
}

// --- Adding ---

SlowSpline::Key SlowSpline::insert(std::unique_ptr<SlowKey> key) {
    auto const place = keys.begin() + static_cast<long>(placeOf(key->u));
    return keys.insert(place, std::move(key))->get();
}

SlowSpline::Key SlowSpline::join(std::unique_ptr<SlowKey> key, bool replace, bool stateType) {
    Key const there = at(key->u);
    if (there != nullptr && replace) {
        there->setValue(key->v);
        return there;
    }
    std::size_t const i = placeOf(key->u);
    bool const ofState = i == 0 || (stateType && i == keys.size());
    key->type = there != nullptr ? there->type : ofState ? newType : keys[i - 1]->type;
    return insert(std::move(key));
}

SlowSpline::Key SlowSpline::add(Tempus const& u, double value, bool replace) {
    auto made = std::make_unique<SlowKey>(SlowKey{.u = u, .v = value});
    Key const key = made.get();
    auto list = valid();
    Tempus const low = list.empty() ? kTempusZero : list.front()->u;
    Tempus const high = list.empty() ? kTempusZero : list.back()->u;
    bool const behind = !keys.empty() && u > high && !(u < low);
    bool const atEnd = behind || (!keys.empty() && u < low);
    if (!keys.empty() && !atEnd) {
        deriveKey(*key);
    }
    Key const result = join(std::move(made), replace, behind);
    if (result != key || !derive) {
        return result;
    }
    list = valid();
    Key const previous = previousOf(key);
    Key const next = nextOf(key);
    if (previous != nullptr && previous == list.front() && list.size() == 2) {
        deriveKey(*key);
    }
    if (key == list.front() && next != nullptr && !next->edited()) {
        key->setOut(between(*key, *next));
        next->setIn(-between(*key, *next));
        layFlat(*next, true, *key);
    }
    if (key == list.back() && previous != nullptr && !previous->edited()) {
        previous->setOut(between(*previous, *key));
        key->setIn(-between(*previous, *key));
        layFlat(*previous, false, *key);
    }
    if (atEnd || keys.size() == 1) {
        deriveKey(*key);
    }
    return key;
}

SlowSpline::Key SlowSpline::addNoTangents(Tempus const& u, double value, bool replace) {
    return join(std::make_unique<SlowKey>(SlowKey{.u = u, .v = value}), replace, false);
}

// --- Setting and moving ---

std::unique_ptr<SlowKey> SlowSpline::take(Key key) {
    auto const place =
        std::find_if(keys.begin(), keys.end(), [key](auto const& each) { return each.get() == key; });
    auto taken = std::move(*place);
    keys.erase(place);
    return taken;
}

SlowSpline::Key SlowSpline::set(Key key, Tempus const& u, double value) {
    if (u == key->u) {
        key->setValue(value);
        return key;
    }
    Key const kept = setNoTangents(key, u, value);
    if (kept != nullptr && keys.size() == 1) {
        deriveKey(*kept);
    }
    return kept;
}

SlowSpline::Key SlowSpline::setNoTangents(Key key, Tempus const& u, double value) {
    if (key->locked()) {
        return key;
    }
    auto taken = take(key);
    if (Key const there = at(u); there != nullptr) {
        there->setValue(value);
        return nullptr;
    }
    taken->u = u;
    taken->v = value;
    return insert(std::move(taken));
}

SlowSpline::Key SlowSpline::move(Key key, Tempus const& newU, bool clone, bool replace, bool constrain) {
    if (key->locked() || newU == key->u || !key->enabled) {
        return nullptr;
    }
    Tempus targetU = newU;
    Tempus oldU = kTempusZero;
    std::unique_ptr<SlowKey> moved;
    if (clone) {
        moved = std::make_unique<SlowKey>(*key);
    } else {
        Key const previous = previousOf(key);
        Key const next = nextOf(key);
        oldU = key->u;
        moved = take(key);
        bool const below = previous != nullptr && newU <= previous->u;
        bool const above = next != nullptr && newU >= next->u;
        if (constrain && (below || above)) {
            targetU = below ? previous->u + step : next->u - step;
        } else if (below || above) {
            moved->flags |= 0x100;
        }
    }
    moved->u = targetU;
    Key const there = at(targetU);
    if (there != nullptr && replace) {
        return there;
    }
    if (there != nullptr) {
        there->flags |= 0x100;
    }
    if (targetU != oldU) {
        growAround(targetU, oldU);
    }
    Key const placed = insert(std::move(moved));
    if (there == nullptr) {
        fitMoved(placed, targetU - oldU);
    }
    return placed;
}

// --- Deleting ---

bool SlowSpline::erase(Key key, bool scale) {
    if (key->locked()) {
        return false;
    }
    if (scale) {
        ungrow(key);
    }
    take(key);
    return true;
}

/// In their order.
bool SlowSpline::eraseAll(std::function<bool(SlowKey const&)> const& holds, bool scale) {
    bool any = false;
    for (std::size_t i = 0; i < keys.size();) {
        if (holds(*keys[i]) && erase(keys[i].get(), scale)) {
            any = true;
        } else {
            ++i;
        }
    }
    return any;
}

bool SlowSpline::eraseAt(Tempus const& u, bool scale) {
    return eraseAll([&](SlowKey const& key) { return key.u == u; }, scale);
}

bool SlowSpline::eraseBetween(Tempus const& from, Tempus const& to) {
    bool pastFirstAtZero = false;
    auto const isBetween = [&](SlowKey const& key) {
        // A second key exactly at zero counts as behind zero.
        bool const atZero = from == kTempusZero && key.u == kTempusZero;
        bool const behind = key.u > from || (atZero && pastFirstAtZero);
        pastFirstAtZero = pastFirstAtZero || atZero;
        return behind && key.u <= to;
    };
    return eraseAll(isBetween, true);
}

// --- Tangents ---

void SlowSpline::deriveKey(SlowKey& key) {
    auto const list = valid();
    if (list.empty() || !derive) {
        return;
    }
    Key const previous = before(key.u);
    Key const next = after(key.u);
    bool const first = next != nullptr && &key == list.front();
    if (first || (previous != nullptr && &key == list.back())) {
        SlowTangent const line = first ? between(key, *next) : between(*previous, key);
        key.setIn(-line);
        key.setOut(line);
        layFlat(first ? *next : *previous, first, key);
        return;
    }
    auto [in, out] = derivePoint(key.u);
    if (!(list.front()->u < key.u)) {
        in = -out;
    } else if (!(list.back()->u > key.u)) {
        out = -in;
    }
    key.setIn(in);
    key.setOut(out);
}

std::pair<SlowTangent, SlowTangent> SlowSpline::derivePoint(Tempus const& u) {
    Key const p = before(u);
    Key const q = after(u);
    double const c = valueAt(u);
    double const r = seconds(step);
    double riseIn = 0.0;
    double riseOut = 0.0;
    if (p != nullptr && q != nullptr) {
        riseIn = c - valueAt(u - step);
        riseOut = valueAt(u + step) - c;
        double const s = seconds(q->u - p->u);
        p->scaleOut(seconds(u - p->u) / s);
        q->scaleIn(seconds(q->u - u) / s);
    } else if (p != nullptr) {
        riseIn = (c - p->v) / seconds(u - p->u);
        if (std::fabs(p->out.u) >= 1e-7) {
            p->scaleOut(std::fabs(seconds(u - p->u) / 36.0 / p->out.u));
        }
    } else if (q != nullptr) {
        riseOut = (q->v - c) / seconds(q->u - u);
        if (std::fabs(q->in.u) >= 1e-7) {
            q->scaleIn(std::fabs(seconds(u - q->u) / 36.0 / q->in.u));
        }
    }
    double const scaleIn = p == nullptr ? 0.0 : seconds(u - p->u) / 36.0 / r;
    double const scaleOut = q == nullptr ? 0.0 : seconds(q->u - u) / 36.0 / r;
    return {{-r * scaleIn, -riseIn * scaleIn}, {r * scaleOut, riseOut * scaleOut}};
}

void SlowSpline::growAround(Tempus const& newU, Tempus const& oldU) {
    if (!derive) {
        return;
    }
    auto const growth = [&](Tempus const& u, double x) {
        if (std::fabs(x) < 1e-7 || std::fabs(seconds(oldU - u) / 36.0 / x) < 1e-7) {
            return 0.0;
        }
        return std::fabs(seconds(newU - u) / seconds(oldU - u));
    };
    Key const q = after(oldU);
    if (q == nullptr) {
        if (Key const p = before(oldU); p != nullptr) {
            p->scaleOut(growth(p->u, p->out.u));
        }
        return;
    }
    Key const p = previousOf(q);
    if (p == nullptr) {
        q->scaleIn(growth(q->u, q->in.u));
    } else if (p->u != oldU) {
        double const s = seconds(q->u - p->u);
        p->scaleOut(std::fabs(s / seconds(oldU - p->u)));
        q->scaleIn(std::fabs(s / seconds(oldU - q->u)));
    }
}

void SlowSpline::fitMoved(Key key, Tempus const& delta) {
    if (!derive || delta == kTempusZero) {
        return;
    }
    Tempus const oldU = key->u - delta;
    Key const p = previousOf(key);
    Key const q = nextOf(key);
    auto const part = [](Tempus const& x, Tempus const& whole) {
        return std::fabs(x == kTempusZero ? 1.0 / seconds(whole) : seconds(x) / seconds(whole));
    };
    if (p != nullptr && q != nullptr && p->u != q->u) {
        double const partP = part(key->u - p->u, q->u - p->u);
        double const partQ = part(key->u - q->u, q->u - p->u);
        for (Key other : valid()) {
            if (other->u == p->u) {
                other->scaleOut(partP);
            }
            if (other->u == q->u) {
                other->scaleIn(partQ);
            }
        }
    }
    auto const factor = [&](Key neighbour, double x) {
        if (std::fabs(x) < 1e-7 || oldU == neighbour->u) {
            return 1.0;
        }
        if ((key->flags & 0x100) == 0) {
            return part(key->u - neighbour->u, oldU - neighbour->u);
        }
        double const distance = key->u == neighbour->u ? 1.0 : seconds(key->u - neighbour->u);
        return std::fabs(distance / 36.0 / x);
    };
    if (p != nullptr) {
        key->scaleIn(factor(p, key->in.u));
    }
    if (q != nullptr) {
        key->scaleOut(factor(q, key->out.u));
    }
}

void SlowSpline::ungrow(Key key) {
    if (!derive) {
        return;
    }
    Key const p = before(key->u);
    Key const q = after(key->u);
    if (p != nullptr && q != nullptr) {
        double const s = seconds(q->u - p->u);
        p->scaleOut(s / seconds(key->u - p->u));
        q->scaleIn(s / seconds(q->u - key->u));
    } else if (p != nullptr && std::fabs(p->out.u) >= 1e-7) {
        p->scaleOut(std::fabs(36.0 * p->out.u / seconds(key->u - p->u)));
    } else if (q != nullptr && std::fabs(q->in.u) >= 1e-7) {
        q->scaleIn(std::fabs(36.0 * q->in.u / seconds(key->u - q->u)));
    }
}
