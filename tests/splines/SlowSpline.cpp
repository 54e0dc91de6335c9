#include "tests/splines/SlowSpline.h"

#include <algorithm>
#include <cmath>

namespace {

double seconds(Tempus const& t) { return TempusGetSeconds(t); }

struct Line {
    double u, v;
};

/// A thirty-sixth of the way from p to q.
Line lineBetween(SlowKey const& p, SlowKey const& q) {
    return {seconds(q.u - p.u) / 36.0, (q.v - p.v) / 36.0};
}

void layFlat(SlowKey& neighbour, bool inputSide, SlowKey const& key) {
    if (std::fabs(neighbour.v - key.v) >= 1e-7) {
        return;
    }
    inputSide ? neighbour.setIn(neighbour.in[0], 0.0) : neighbour.setOut(neighbour.out[0], 0.0);
    if (std::fabs(inputSide ? neighbour.out[1] : neighbour.in[1]) >= 1e-7) {
        neighbour.flags |= 0x1;
    }
}

} // namespace

void SlowKey::setIn(double x, double y) {
    if (locked() || !enabled) {
        return;
    }
    in[0] = std::min(x, 0.0);
    in[1] = y;
}

void SlowKey::setOut(double x, double y) {
    if (locked() || !enabled) {
        return;
    }
    out[0] = std::max(x, 0.0);
    out[1] = y;
}

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
        if (key->u < u) {
            found = key;
        }
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
    auto const list = valid();
    for (Key key : list) {
        if (key->u == u) {
            return key->v;
        }
    }
    Key const a = before(u);
    Key const b = after(u);
    if (a == nullptr || b == nullptr) {
        Key const end = a == nullptr ? b : a;
        return end == nullptr ? 0.0 : end->v;
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

// --- Adding ---

SlowSpline::Key SlowSpline::join(std::unique_ptr<SlowKey> key, bool replace, bool stateType) {
    std::size_t const i = placeOf(key->u);
    bool const taken = i < keys.size() && keys[i]->u == key->u;
    if (taken && replace) {
        if (!keys[i]->locked()) {
            keys[i]->v = key->v;
        }
        return keys[i].get();
    }
    key->type = taken ? keys[i]->type : i > 0 ? keys[i - 1]->type : newType;
    if (stateType && i == keys.size()) {
        key->type = newType;
    }
    return keys.insert(keys.begin() + static_cast<long>(i), std::move(key))->get();
}

SlowSpline::Key SlowSpline::add(Tempus const& u, double value, bool replace) {
    auto made = std::make_unique<SlowKey>();
    Key const key = made.get();
    key->u = u;
    key->v = value;
    auto list = valid();
    bool atEnd = false;
    bool behind = false;
    if (!keys.empty()) {
        Tempus const low = list.empty() ? kTempusZero : list.front()->u;
        Tempus const high = list.empty() ? kTempusZero : list.back()->u;
        behind = u > high && !(u < low);
        atEnd = behind || u < low;
        if (!atEnd) {
            deriveKey(*key);
        }
    }
    Key const result = join(std::move(made), replace, behind);
    if (result != key || !derive) {
        return result;
    }
    list = valid();
    Key const previous = previousOf(key);
    Key const next = nextOf(key);
    if (previous != nullptr && previous == list.front() && list.size() == 2) {
        Line const line = lineBetween(*previous, *key);
        if (!previous->edited()) {
            previous->setOut(line.u, line.v);
        }
        deriveKey(*key);
    } else if (key == list.front() && next != nullptr && !next->edited()) {
        Line const line = lineBetween(*key, *next);
        key->setOut(line.u, line.v);
        next->setIn(-line.u, -line.v);
        layFlat(*next, true, *key);
    }
    if (next != nullptr && next == list.back() && list.size() == 2) {
        Line const line = lineBetween(*key, *next);
        if (!next->edited()) {
            next->setIn(-line.u, -line.v);
        }
    } else if (key == list.back() && previous != nullptr && !previous->edited()) {
        Line const line = lineBetween(*previous, *key);
        previous->setOut(line.u, line.v);
        key->setIn(-line.u, -line.v);
        layFlat(*previous, false, *key);
    }
    if (atEnd || keys.size() == 1) {
        deriveKey(*key);
    }
    return key;
}

SlowSpline::Key SlowSpline::addNoTangents(Tempus const& u, double value, bool replace) {
    auto made = std::make_unique<SlowKey>();
    made->u = u;
    made->v = value;
    return join(std::move(made), replace, false);
}

// --- Setting and moving ---

std::unique_ptr<SlowKey> SlowSpline::take(Key key) {
    for (std::size_t i = 0; i < keys.size(); ++i) {
        if (keys[i].get() == key) {
            auto taken = std::move(keys[i]);
            keys.erase(keys.begin() + static_cast<long>(i));
            return taken;
        }
    }
    return nullptr;
}

SlowSpline::Key SlowSpline::putBack(std::unique_ptr<SlowKey> key, double value) {
    std::size_t const i = placeOf(key->u);
    if (i < keys.size() && keys[i]->u == key->u) {
        if (!keys[i]->locked()) {
            keys[i]->v = value;
        }
        return nullptr;
    }
    return keys.insert(keys.begin() + static_cast<long>(i), std::move(key))->get();
}

SlowSpline::Key SlowSpline::set(Key key, Tempus const& u, double value) {
    if (u != key->u) {
        Key const kept = setNoTangents(key, u, value);
        if (kept != nullptr && keys.size() == 1) {
            deriveKey(*kept);
        }
        return kept;
    }
    if (!key->locked()) {
        key->v = value;
    }
    return key;
}

SlowSpline::Key SlowSpline::setNoTangents(Key key, Tempus const& u, double value) {
    if (key->locked()) {
        return key;
    }
    auto taken = take(key);
    taken->u = u;
    taken->v = value;
    return putBack(std::move(taken), value);
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
        if (below && constrain) {
            targetU = previous->u + step;
        } else if (above && constrain) {
            targetU = next->u - step;
        } else if (below || above) {
            moved->flags |= 0x100;
        }
    }
    moved->u = targetU;
    std::size_t const i = placeOf(targetU);
    bool const taken = i < keys.size() && keys[i]->u == targetU;
    if (taken && replace) {
        return keys[i].get();
    }
    if (taken) {
        keys[i]->flags |= 0x100;
    }
    if (targetU != oldU) {
        growAround(targetU, oldU);
    }
    Key const placed = keys.insert(keys.begin() + static_cast<long>(i), std::move(moved))->get();
    if (!taken) {
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

bool SlowSpline::eraseAt(Tempus const& u, bool scale) {
    bool any = false;
    for (std::size_t i = 0; i < keys.size();) {
        if (keys[i]->u == u && erase(keys[i].get(), scale)) {
            any = true;
        } else {
            ++i;
        }
    }
    return any;
}

bool SlowSpline::eraseBetween(Tempus const& from, Tempus const& to) {
    bool any = false;
    bool pastFirstAtZero = false;
    for (std::size_t i = 0; i < keys.size();) {
        // A second key exactly at zero counts as behind zero.
        bool const atZero = from == kTempusZero && keys[i]->u == kTempusZero;
        bool const behind = keys[i]->u > from || (atZero && pastFirstAtZero);
        pastFirstAtZero = pastFirstAtZero || atZero;
        if (behind && keys[i]->u <= to && erase(keys[i].get(), true)) {
            any = true;
        } else {
            ++i;
        }
    }
    return any;
}

// --- Tangents ---

void SlowSpline::deriveKey(SlowKey& key) {
    auto const list = valid();
    if (list.empty() || !derive) {
        return;
    }
    Key const previous = before(key.u);
    Key const next = after(key.u);
    if (next != nullptr && &key == list.front()) {
        Line const line = lineBetween(key, *next);
        key.setOut(line.u, line.v);
        key.setIn(-line.u, -line.v);
        layFlat(*next, true, key);
        return;
    }
    if (previous != nullptr && &key == list.back()) {
        Line const line = lineBetween(*previous, key);
        key.setIn(-line.u, -line.v);
        key.setOut(line.u, line.v);
        layFlat(*previous, false, key);
        return;
    }
    double in[2];
    double out[2];
    derivePoint(key.u, in, out);
    if (!(list.front()->u < key.u)) {
        key.setOut(out[0], out[1]);
        key.setIn(-out[0], -out[1]);
    } else if (!(list.back()->u > key.u)) {
        key.setIn(in[0], in[1]);
        key.setOut(-in[0], -in[1]);
    } else {
        key.setIn(in[0], in[1]);
        key.setOut(out[0], out[1]);
    }
}

void SlowSpline::derivePoint(Tempus const& u, double* in, double* out) {
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
        if (std::fabs(p->out[0]) >= 1e-7) {
            p->scaleOut(std::fabs(seconds(u - p->u) / 36.0 / p->out[0]));
        }
    } else if (q != nullptr) {
        riseOut = (q->v - c) / seconds(q->u - u);
        if (std::fabs(q->in[0]) >= 1e-7) {
            q->scaleIn(std::fabs(seconds(u - q->u) / 36.0 / q->in[0]));
        }
    }
    double const scaleIn = p == nullptr ? 0.0 : seconds(u - p->u) / 36.0 / r;
    double const scaleOut = q == nullptr ? 0.0 : seconds(q->u - u) / 36.0 / r;
    in[0] = -r * scaleIn;
    in[1] = -riseIn * scaleIn;
    out[0] = r * scaleOut;
    out[1] = riseOut * scaleOut;
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
            p->scaleOut(growth(p->u, p->out[0]));
        }
        return;
    }
    Key const p = previousOf(q);
    if (p == nullptr) {
        q->scaleIn(growth(q->u, q->in[0]));
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
        key->scaleIn(factor(p, key->in[0]));
    }
    if (q != nullptr) {
        key->scaleOut(factor(q, key->out[0]));
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
    } else if (p != nullptr && std::fabs(p->out[0]) >= 1e-7) {
        p->scaleOut(std::fabs(36.0 * p->out[0] / seconds(key->u - p->u)));
    } else if (q != nullptr && std::fabs(q->in[0]) >= 1e-7) {
        q->scaleIn(std::fabs(36.0 * q->in[0] / seconds(key->u - q->u)));
    }
}
