// The order of vertices: the store against a plain list, and what a spline finds in it against walks over all vertices.

#include "lumenkey/splines/KFHandleSet.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFVertexStore.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <optional>
#include <random>
#include <set>

TEST(KFHandleSet, HoldsWhatASetHolds) {
    std::mt19937 random(21);
    std::vector<char> memory(40000);
    KFHandleSet handles;
    std::set<void const*> model;
    EXPECT_FALSE(handles.contains(nullptr));
    for (int i = 0; i < 60000; ++i) {
        // Grows, shrinks and grows again; neighbours sixteen bytes apart, as an allocator hands them out.
        std::size_t const count = (i / 15000) % 2 == 0 ? 2500 : 60;
        void const* const handle = &memory[(random() % count) * 16];
        bool const inserts = random() % 8 < (i / 15000 % 2 == 0 ? 5u : 3u);
        if (inserts) {
            handles.insert(handle);
            model.insert(handle);
        } else {
            handles.erase(handle);
            model.erase(handle);
        }
        void const* const other = &memory[(random() % 2500) * 16];
        ASSERT_EQ(handles.contains(handle), inserts);
        ASSERT_EQ(handles.contains(other), model.count(other) > 0) << i;
    }
}

namespace {

using Place = KFVertexStore::Place;

/// A store and a plain list of the same vertices, edited side by side.
class StoreTwins {
public:
    explicit StoreTwins(unsigned seed) : _random(seed) {}

    void edit(bool growing);
    void expectAgreement();
    void renumber();

    bool allowsIncommensurable = false;

private:
    struct Entry {
        KFVertex* vertex;
        bool valid;
    };

    std::size_t pick(std::size_t count) { return _random() % count; }
    /// Few places, so that vertices meet.
    Tempus pickU() {
        std::int32_t const scales[] = {1, 24, 30000, 262144, 7};
        if (allowsIncommensurable && pick(300) == 0) {
            std::int32_t const primes[] = {2147483647, 2147483629, 2147483587};
            return TempusMake(static_cast<std::int64_t>(pick(9)) * 1000000007 - 99, primes[pick(3)]);
        }
        std::int32_t const scale = scales[pick(5)];
        return TempusMake((static_cast<std::int64_t>(pick(60)) - 20) * std::max(scale / 12, 1), scale);
    }
    Place placeAt(std::size_t index) const {
        Place place = store.begin();
        for (std::size_t i = 0; i < index; ++i) {
            place = store.next(place);
        }
        return place;
    }
    std::size_t bound(Tempus const& u, bool strictly) const {
        std::size_t i = 0;
        while (i < _list.size() &&
               (strictly ? !(u < _list[i].vertex->getValueU()) : _list[i].vertex->getValueU() < u)) {
            ++i;
        }
        return i;
    }
    void insert();
    void remove(std::size_t index);
    void expectSearches();

    KFVertexStore store;
    std::vector<Entry> _list;
    std::vector<void const*> _dead;
    std::mt19937 _random;
};

void StoreTwins::insert() {
    Tempus const u = pickU();
    std::size_t const low = bound(u, false);
    std::size_t const index = low + pick(bound(u, true) - low + 1);
    auto* const vertex = new KFStaticVertex(u, 0.0);
    vertex->setEnabled(pick(4) != 0, kTempusZero);
    bool const suppressed = pick(10) == 0;
    Place const place = store.insert(placeAt(index), vertex, suppressed);
    _list.insert(_list.begin() + static_cast<std::ptrdiff_t>(index),
                 {vertex, vertex->isEnabled(kTempusZero) && !suppressed});
    // The allocator hands out memory of dead vertices again.
    std::erase(_dead, static_cast<void const*>(vertex));
    ASSERT_EQ(store.at(place), vertex);
    ASSERT_EQ(store.indexOf(place), index);
}

void StoreTwins::remove(std::size_t index) {
    KFVertex* const vertex = _list[index].vertex;
    Place const behind = store.remove(placeAt(index));
    _list.erase(_list.begin() + static_cast<std::ptrdiff_t>(index));
    ASSERT_EQ(behind == store.end() ? nullptr : store.at(behind),
              index < _list.size() ? _list[index].vertex : nullptr);
    _dead.push_back(vertex);
    delete vertex;
}

void StoreTwins::edit(bool growing) {
    std::uint64_t const version = store.version();
    std::size_t const index = _list.empty() ? 0 : pick(_list.size());
    std::size_t const what = pick(20);
    if (_list.empty() || what < (growing ? 12u : 5u)) {
        insert();
    } else if (what < 17) {
        remove(index);
    } else if (what == 17) {
        KFVertex& vertex = *_list[index].vertex;
        vertex.setEnabled(!vertex.isEnabled(kTempusZero), kTempusZero);
        store.updateValidity(placeAt(index));
        _list[index].valid = vertex.isEnabled(kTempusZero);
    } else if (what == 18) {
        // To where its neighbour stands: the order stays.
        KFVertex& vertex = *_list[index].vertex;
        vertex.setValueU(_list[std::min(index + 1, _list.size() - 1)].vertex->getValueU());
        store.updatePosition(placeAt(index));
    } else if (pick(8) == 0) {
        store.refresh();
        store.updateAllPositions();
        for (Entry& entry : _list) {
            entry.valid = entry.vertex->isEnabled(kTempusZero);
        }
    } else {
        return;
    }
    ASSERT_NE(store.version(), version) << what;
}

void StoreTwins::expectSearches() {
    auto const vertexAt = [&](Place place) { return place == store.end() ? nullptr : store.at(place); };
    auto const entryAt = [&](std::size_t index) {
        return index < _list.size() ? _list[index].vertex : nullptr;
    };
    for (int i = 0; i < 20; ++i) {
        Tempus const u = i == 0 ? kTempusPositiveInfinity : i == 1 ? kTempusNegativeInfinity : pickU();
        ASSERT_EQ(vertexAt(store.lowerBound(u)), entryAt(bound(u, false))) << museumText(u);
        ASSERT_EQ(vertexAt(store.upperBound(u)), entryAt(bound(u, true))) << museumText(u);
        if (!_list.empty()) {
            std::size_t const index = pick(_list.size());
            ASSERT_EQ(vertexAt(store.find(_list[index].vertex)), _list[index].vertex);
            ASSERT_EQ(store.indexOf(store.find(_list[index].vertex)), index);
            ASSERT_TRUE(store.contains(_list[index].vertex));
            ASSERT_EQ(store.atIndex(index), _list[index].vertex);
        }
        if (!_dead.empty()) {
            ASSERT_FALSE(store.contains(_dead[pick(_dead.size())]));
        }
    }
    ASSERT_EQ(store.atIndex(_list.size()), nullptr);
}

void StoreTwins::expectAgreement() {
    ASSERT_EQ(store.size(), _list.size());
    auto const isValid = [](Entry const& entry) { return entry.valid; };
    ASSERT_EQ(store.validCount(),
              static_cast<std::size_t>(std::count_if(_list.begin(), _list.end(), isValid)));
    auto const first = std::find_if(_list.begin(), _list.end(), isValid);
    auto const last = std::find_if(_list.rbegin(), _list.rend(), isValid);
    ASSERT_EQ(store.firstValid(), first == _list.end() ? nullptr : first->vertex);
    ASSERT_EQ(store.lastValid(), last == _list.rend() ? nullptr : last->vertex);
    ASSERT_EQ(store.front(), _list.empty() ? nullptr : _list.front().vertex);
    ASSERT_EQ(store.back(), _list.empty() ? nullptr : _list.back().vertex);
    // Valid neighbours of each place and of the end.
    KFVertex* before = nullptr;
    Place place = store.begin();
    for (std::size_t i = 0; i <= _list.size(); ++i) {
        Place const found = store.validBefore(place);
        ASSERT_EQ(found == store.end() ? nullptr : store.at(found), before) << i;
        auto const next = std::find_if(_list.begin() + static_cast<std::ptrdiff_t>(i), _list.end(), isValid);
        Place const from = store.validFrom(place);
        ASSERT_EQ(from == store.end() ? nullptr : store.at(from),
                  next == _list.end() ? nullptr : next->vertex)
            << i;
        if (i == _list.size()) {
            break;
        }
        ASSERT_EQ(store.at(place), _list[i].vertex) << i;
        ASSERT_EQ(store.isValid(place), _list[i].valid) << i;
        if (store.hasTicks()) {
            ASSERT_EQ(TempusMake(store.tickAt(place), 1),
                      _list[i].vertex->getValueU() * Tempus(TempusMake(store.tickScale(), 1)));
        }
        before = _list[i].valid ? _list[i].vertex : before;
        Place const next2 = store.next(place);
        ASSERT_EQ(store.previous(next2), place);
        place = next2;
    }
    ASSERT_EQ(place, store.end());
    expectSearches();
}

/// Turns the order, and gives each vertex its index as its position.
void StoreTwins::renumber() {
    std::size_t const index = pick(_list.size());
    store.rotate(placeAt(index));
    std::rotate(_list.begin(), _list.begin() + static_cast<std::ptrdiff_t>(index), _list.end());
    for (std::size_t i = 0; i < _list.size(); ++i) {
        _list[i].vertex->setValueU(TempusMake(static_cast<std::int64_t>(i), 1));
    }
    store.updateAllPositions();
}

} // namespace

TEST(KFVertexStore, AgreesWithAPlainList) {
    for (unsigned seed = 1; seed <= 6; ++seed) {
        SCOPED_TRACE(seed);
        StoreTwins twins(seed);
        twins.allowsIncommensurable = seed % 2 == 0;
        for (int i = 0; i < 6000; ++i) {
            // Up to several blocks and down to none, twice.
            ASSERT_NO_FATAL_FAILURE(twins.edit(i / 1500 % 2 == 0)) << i;
            if (i % 50 == 0) {
                ASSERT_NO_FATAL_FAILURE(twins.expectAgreement()) << i;
            }
            if (i == 5000) {
                ASSERT_NO_FATAL_FAILURE(twins.edit(true));
                twins.renumber();
                ASSERT_NO_FATAL_FAILURE(twins.expectAgreement());
            }
        }
    }
}

// --- What a spline finds ---

namespace {

/// A spline that asks each vertex whether it is enabled instead of keeping a list.
class AskingSpline : public KFSpline {
public:
    using KFSpline::KFSpline;
    void keepList(bool keeps) { _useValidList = keeps; }
};

/// The rules of navigation as walks over all vertices.
struct Walks {
    std::vector<KFVertex*> all;
    std::vector<KFVertex*> valid;
    bool listed;

    Walks(KFSpline& spline, bool listedIn) : all(museumVertices(spline)), listed(listedIn) {
        std::copy_if(all.begin(), all.end(), std::back_inserter(valid),
                     [](KFVertex* v) { return v->isEnabled(kTempusZero); });
    }

    static KFVertex* entry(std::vector<KFVertex*> const& list, std::ptrdiff_t index) {
        return index >= 0 && index < static_cast<std::ptrdiff_t>(list.size())
                   ? list[static_cast<std::size_t>(index)]
                   : nullptr;
    }
    /// In the list of valid vertices; one that isn't there counts as its first.
    std::ptrdiff_t listPlace(KFVertex const* vertex) const {
        auto const found = std::find(valid.begin(), valid.end(), vertex);
        return found == valid.end() ? 0 : found - valid.begin();
    }
    KFVertex* next(KFVertex const* vertex) const {
        return listed ? entry(valid, listPlace(vertex) + 1) : after(vertex->getValueU());
    }
    KFVertex* previous(KFVertex const* vertex) const {
        if (listed) {
            return entry(valid, listPlace(vertex) - 1);
        }
        KFVertex const* const nearest = before(vertex->getValueU());
        auto const same = [&](KFVertex const* v) { return v->getValueU() == nearest->getValueU(); };
        return nearest == nullptr ? nullptr : *std::find_if(valid.begin(), valid.end(), same);
    }
    KFVertex* after(Tempus const& u) const {
        auto const found =
            std::find_if(valid.begin(), valid.end(), [&](KFVertex* v) { return v->getValueU() > u; });
        return found == valid.end() ? nullptr : *found;
    }
    KFVertex* before(Tempus const& u) const {
        auto const found =
            std::find_if(valid.rbegin(), valid.rend(), [&](KFVertex* v) { return v->getValueU() < u; });
        return found == valid.rend() ? nullptr : *found;
    }
    std::uint32_t count() const {
        std::uint32_t stops = 0;
        for (KFVertex const* v = entry(valid, 0); v != nullptr; v = next(v)) {
            ++stops;
        }
        return stops;
    }
};

/// What an operation gives through its out-parameter; its result must say whether that is null.
template <class Operation> void* found(Operation operation) {
    void* out = &out;
    bool const isFound = operation(&out);
    EXPECT_EQ(isFound, out != nullptr);
    EXPECT_EQ(operation(nullptr), isFound);
    return out;
}

void expectNavigation(KFSpline& spline, Walks const& walks) {
    Tempus const t = kTempusZero;
    EXPECT_EQ(found([&](void** out) { return spline.getFirstValidVertex(out, t); }),
              Walks::entry(walks.valid, 0));
    auto const lastIndex = static_cast<std::ptrdiff_t>(walks.valid.size()) - 1;
    EXPECT_EQ(found([&](void** out) { return spline.getLastValidVertexWithLock(out, t); }),
              Walks::entry(walks.valid, lastIndex));
    EXPECT_EQ(found([&](void** out) { return spline.getFirstValidVertexWithLock(out, t); }),
              Walks::entry(walks.valid, 0));
    EXPECT_EQ(spline.getNumberOfValidVertices(t), walks.count());
    EXPECT_EQ(spline.getNumberOfValidVerticesWithMultiplicity(t), walks.count());

    auto const end = spline.endVertices();
    EXPECT_EQ(found([&](void** out) { return spline.getNextValidVertex(end, out, t); }), nullptr);
    auto place = spline.beginVertices();
    for (std::size_t i = 0; i < walks.all.size(); ++i, place = spline.nextPlace(place)) {
        KFVertex* const vertex = walks.all[i];
        bool const isFirst = i == 0;
        ASSERT_EQ(spline.vertexAt(spline.getVertexIter(vertex)), vertex);
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertex(vertex, out, t); }),
                  walks.next(vertex))
            << i;
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertexWithLock(place, out, t); }),
                  walks.next(vertex))
            << i;
        ASSERT_EQ(found([&](void** out) { return spline.getPreviousValidVertex(place, out, t); }),
                  isFirst ? nullptr : walks.previous(vertex))
            << i;
        ASSERT_EQ(found([&](void** out) { return spline.getPreviousValidVertexWithLock(vertex, out, t); }),
                  isFirst ? nullptr : walks.previous(vertex))
            << i;
        ASSERT_EQ(spline.getNextVertex(vertex), Walks::entry(walks.all, static_cast<std::ptrdiff_t>(i) + 1));
        ASSERT_EQ(spline.getPreviousVertex(vertex), isFirst ? nullptr : walks.all[i - 1]);
        ASSERT_TRUE(spline.isValidHandle(vertex));
        ASSERT_TRUE(spline.findVertex(static_cast<long>(i), static_cast<long>(i), vertex));
        ASSERT_FALSE(
            spline.findVertex(static_cast<long>(i) + 1, static_cast<long>(walks.all.size()), vertex));
    }
}

void expectSearches(KFSpline& spline, Walks const& walks) {
    Tempus const t = kTempusZero;
    for (Tempus const& u : museumPositions(spline)) {
        SCOPED_TRACE(museumText(u));
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertex(u, out, t, false); }),
                  walks.after(u));
        ASSERT_EQ(found([&](void** out) { return spline.getPreviousValidVertexWithLock(u, out, t, false); }),
                  walks.before(u));
        auto const at = std::find_if(walks.all.begin(), walks.all.end(),
                                     [&](KFVertex* v) { return v->getValueU() == u; });
        KFVertex* const expected = at == walks.all.end() ? nullptr : *at;
        ASSERT_EQ(found([&](void** out) { return spline.getVertexHandle(u, out, true); }), expected);
        double value = 0.0;
        ASSERT_EQ(spline.getVertex(u, &value, t), expected != nullptr);
        ASSERT_EQ(value, expected == nullptr ? 0.0 : expected->getValueV(t));

        // Of several vertices at zero the second comes after the first.
        auto const secondAtZero = [&](std::vector<KFVertex*> const& list) -> KFVertex* {
            auto const first = std::find_if(list.begin(), list.end(),
                                            [](KFVertex* v) { return v->getValueU() == kTempusZero; });
            bool const isTwice = u == kTempusZero && first != list.end() && first + 1 != list.end() &&
                                 first[1]->getValueU() == kTempusZero;
            return isTwice ? first[1] : nullptr;
        };
        KFVertex* const twice = secondAtZero(walks.valid);
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertexWithLock(u, out, t, true); }),
                  twice != nullptr ? twice : walks.after(u));
        auto const next =
            std::find_if(walks.all.begin(), walks.all.end(), [&](KFVertex* v) { return v->getValueU() > u; });
        KFVertex* const plainTwice = secondAtZero(walks.all);
        ASSERT_EQ(spline.getNextVertex(u), plainTwice != nullptr     ? plainTwice
                                           : next == walks.all.end() ? nullptr
                                                                     : *next);
    }
}

void expectLists(KFSpline& spline, Walks const& walks) {
    auto const onePerPlace = [](std::vector<KFVertex*> const& list) {
        std::vector<void*> handles;
        for (std::size_t i = 0; i < list.size(); ++i) {
            if (i == 0 || list[i - 1]->getValueU() != list[i]->getValueU()) {
                handles.push_back(list[i]);
            }
        }
        return handles;
    };
    std::vector<void*> handles;
    spline.getAllVerticesHandles(handles);
    EXPECT_EQ(handles, onePerPlace(walks.all));
    handles.clear();
    spline.getAllValidVerticesHandles(handles, kTempusZero);
    EXPECT_EQ(handles, onePerPlace(walks.valid));

    struct Extreme {
        double value = 0.0;
        Tempus u = kTempusInvalid;
    };
    auto const extreme = [&](bool highest, bool handlesToo) {
        double const none = std::numeric_limits<double>::max();
        Extreme best{highest ? -none : none, kTempusInvalid};
        for (KFVertex const* vertex : walks.valid) {
            double const value = vertex->getValueV(kTempusZero);
            double in = 0.0;
            double out = 0.0;
            vertex->getInputTangents(nullptr, &in, kTempusZero);
            vertex->getOutputTangents(nullptr, &out, kTempusZero);
            for (double const offer :
                 {handlesToo ? value + 12.0 * in : value, handlesToo ? value + 12.0 * out : value}) {
                if (highest ? offer > best.value : offer < best.value) {
                    best = {offer, vertex->getValueU()};
                }
            }
        }
        return best;
    };
    auto const expectExtreme = [](Extreme const& expected, double value, Tempus const& u) {
        EXPECT_EQ(value, expected.value);
        EXPECT_EQ(u, expected.u);
    };
    Tempus u[4] = {};
    double const values[4] = {spline.getMaxValueV(kTempusZero, &u[0]),
                              spline.getMinValueV(kTempusZero, &u[1]),
                              spline.getMaxValueVWithTangents(kTempusZero, &u[2]),
                              spline.getMinValueVWithTangents(kTempusZero, &u[3])};
    for (int i = 0; i < 4; ++i) {
        expectExtreme(extreme(i % 2 == 0, i >= 2), values[i], u[i]);
    }
}

} // namespace

// Where the positions crowd, a vertex doesn't stand where even distances would put it.
TEST(KFVertexStore, FindsUnevenPositions) {
    using Position = std::int64_t (*)(std::int64_t);
    for (Position const position :
         {Position{[](std::int64_t i) { return i * i * i; }},
          Position{[](std::int64_t i) { return i / 100; }},
          Position{[](std::int64_t i) { return i < 200 ? i : i + 1000000000000; }},
          Position{[](std::int64_t i) { return (i - 200) * std::abs(i - 200); }}}) {
        KFVertexStore store;
        std::vector<std::int64_t> ticks;
        for (std::int64_t i = 0; i < 400; ++i) {
            ticks.push_back(position(i));
            store.append(new KFStaticVertex(TempusMake(ticks.back(), 1), 0.0), false);
        }
        for (std::int64_t const tick : ticks) {
            for (std::int64_t const asked : {tick - 1, tick, tick + 1}) {
                auto const expected = std::lower_bound(ticks.begin(), ticks.end(), asked) - ticks.begin();
                ASSERT_EQ(store.indexOf(store.lowerBoundTick(asked)), static_cast<std::size_t>(expected))
                    << asked;
            }
        }
    }
}

// What a thread keeps of one spline isn't taken for that of another, which may stand where the first one stood.
TEST(KFSplineStore, AddressesDontStandForSplines) {
    KFSplineState state;
    std::optional<KFSpline> spline;
    for (int i = 0; i < 40; ++i) {
        spline.emplace(&state);
        spline->addVertexNoTangents(kTempusZero, i, kTempusZero, false);
        spline->addVertexNoTangents(TempusMake(2, 1), i, kTempusZero, false);
        for (int k = 0; k < 3; ++k)
            ASSERT_EQ(spline->getVertexValue(TempusMake(1, 1), kTempusZero, k == 0), i);
    }
}

TEST(Museum, FindsVerticesAsPlainWalksDo) {
    for (Exhibit const& exhibit : museum()) {
        SCOPED_TRACE(exhibit.name);
        MuseumSpline const built = exhibit.build();
        AskingSpline spline(*built.spline, built.state.get());
        bool const isLong = museumVertices(spline).size() > 1000;
        for (bool const listed : {true, false}) {
            SCOPED_TRACE(listed ? "by the list" : "by asking");
            spline.keepList(listed);
            Walks const walks(spline, listed);
            if (!isLong) {
                ASSERT_NO_FATAL_FAILURE(expectNavigation(spline, walks));
            }
            ASSERT_NO_FATAL_FAILURE(expectSearches(spline, walks));
        }
        spline.keepList(true);
        expectLists(spline, Walks(spline, true));
        if (HasFailure()) {
            return;
        }
    }
}

TEST(Museum, ListsTimesAndValuesOfARange) {
    for (Exhibit const& exhibit : museum()) {
        SCOPED_TRACE(exhibit.name);
        MuseumSpline const curve = exhibit.build();
        auto const vertices = museumVertices(*curve);
        auto const positions = museumPositions(*curve);
        for (std::size_t i = 4; i < positions.size(); i += 1 + positions.size() / 12) {
            for (std::size_t j = i; j < positions.size(); j += 1 + positions.size() / 12) {
                if (!TempusIsNumeric(positions[i]) || !TempusIsNumeric(positions[j])) {
                    continue;
                }
                TempusRange const range{positions[i], positions[j] - positions[i]};
                Tempus const end = TempusRangeGetEnd(range);
                std::vector<std::pair<Tempus, std::pair<double, unsigned>>> out;
                Tempus first;
                Tempus last;
                ASSERT_TRUE(curve->getVerticesTimeAndValue(range, out, &first, &last));
                ASSERT_EQ(first, vertices.empty() ? kTempusInvalid : vertices.front()->getValueU());
                ASSERT_EQ(last, vertices.empty() ? kTempusInvalid : vertices.back()->getValueU());
                std::size_t k = 0;
                while (k < vertices.size() && vertices[k]->getValueU() < range.start) {
                    ++k;
                }
                if (k > 0 && (k == vertices.size() || vertices[k]->getValueU() > range.start)) {
                    --k;
                }
                std::size_t n = 0;
                for (bool goesOn = true; goesOn && k < vertices.size(); ++k, ++n) {
                    ASSERT_LT(n, out.size());
                    ASSERT_EQ(out[n].first, vertices[k]->getValueU());
                    ASSERT_EQ(out[n].second.first, vertices[k]->getValueV(kTempusZero));
                    ASSERT_EQ(out[n].second.second, vertices[k]->getInterpolation());
                    goesOn = vertices[k]->getValueU() < end;
                }
                ASSERT_EQ(n, out.size()) << museumText(range.start) << " to " << museumText(end);
            }
        }
    }
}

TEST(KFSplineStore, NeverFollowsADeadHandle) {
    MuseumSpline curve;
    std::vector<void*> dead;
    for (int i = 0; i < 200; ++i) {
        curve->addVertex(TempusMake(i % 20, 3), i, kTempusZero, false);
    }
    for (int i = 0; i < 20; ++i) {
        void* const first = curve->getFirstVertex();
        dead.push_back(first);
        if (i % 3 == 0) {
            EXPECT_TRUE(curve->isValidHandle(first)); // makes the set of living handles
        }
        ASSERT_TRUE(curve->deleteVertex(first, false, kTempusZero));
    }
    int local = 0;
    dead.push_back(&local);
    dead.push_back(nullptr);
    for (void* const handle : dead) {
        EXPECT_FALSE(curve->isValidHandle(handle));
        EXPECT_FALSE(curve->findVertex(0, 300, handle));
    }
    curve->disableVertex(curve->getFirstVertex(), kTempusZero);
    EXPECT_TRUE(curve->isValidHandle(curve->getFirstVertex()));
    dead.assign(1, curve->getLastVertex());
    curve->deleteAllVertices();
    EXPECT_FALSE(curve->isValidHandle(dead[0]));
}
