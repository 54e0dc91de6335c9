// What a spline finds among its vertices, against walks over all of them.

#include "lumenkey/splines/KFHandleSet.h"
#include "lumenkey/splines/KFStaticVertex.h"
#include "lumenkey/splines/KFVertexStore.h"
#include "tests/curves/CountedMemory.h"
#include "tests/splines/museum.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cfloat>
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

/// A spline that asks each vertex whether it is enabled instead of keeping a list.
class AskingSpline : public KFSpline {
public:
    using KFSpline::KFSpline;
    void keepList(bool keeps) { _useValidList = keeps; }
};

/// The first of a list that `holds`, or null.
template <class Holds> KFVertex* firstOf(std::vector<KFVertex*> const& list, Holds holds) {
    auto const found = std::find_if(list.begin(), list.end(), holds);
    return found == list.end() ? nullptr : *found;
}

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
        return nearest == nullptr ? nullptr : firstOf(valid, [&](KFVertex const* v) {
            return v->getValueU() == nearest->getValueU();
        });
    }
    KFVertex* after(Tempus const& u) const {
        return firstOf(valid, [&](KFVertex const* v) { return v->getValueU() > u; });
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
    auto const lastIndex = static_cast<std::ptrdiff_t>(walks.valid.size()) - 1;
    EXPECT_EQ(found([&](void** out) { return spline.getFirstValidVertexWithLock(out, t); }),
              Walks::entry(walks.valid, 0));
    EXPECT_EQ(found([&](void** out) { return spline.getLastValidVertexWithLock(out, t); }),
              Walks::entry(walks.valid, lastIndex));
    EXPECT_EQ(spline.getNumberOfValidVerticesWithMultiplicity(t), walks.count());
    EXPECT_EQ(found([&](void** out) { return spline.getNextValidVertex(spline.endVertices(), out, t); }),
              nullptr);
    auto place = spline.beginVertices();
    for (std::size_t i = 0; i < walks.all.size(); ++i, place = spline.nextPlace(place)) {
        KFVertex* const vertex = walks.all[i];
        auto const index = static_cast<long>(i);
        KFVertex* const previous = i == 0 ? nullptr : walks.previous(vertex);
        ASSERT_EQ(spline.vertexAt(spline.getVertexIter(vertex)), vertex) << i;
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertex(vertex, out, t); }),
                  walks.next(vertex))
            << i;
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertexWithLock(place, out, t); }),
                  walks.next(vertex))
            << i;
        ASSERT_EQ(found([&](void** out) { return spline.getPreviousValidVertex(place, out, t); }), previous)
            << i;
        ASSERT_EQ(found([&](void** out) { return spline.getPreviousValidVertexWithLock(vertex, out, t); }),
                  previous)
            << i;
        ASSERT_EQ(spline.getNextVertex(vertex), Walks::entry(walks.all, index + 1));
        ASSERT_EQ(spline.getPreviousVertex(vertex), Walks::entry(walks.all, index - 1));
        ASSERT_TRUE(spline.isValidHandle(vertex));
        ASSERT_TRUE(spline.findVertex(index, index, vertex));
        ASSERT_FALSE(spline.findVertex(index + 1, static_cast<long>(walks.all.size()), vertex));
    }
}

/// The first vertex after `u`; of several at zero the second counts as after the first.
KFVertex* nextWithZeroTwice(std::vector<KFVertex*> const& list, Tempus const& u) {
    bool isPastFirst = false;
    return firstOf(list, [&](KFVertex* v) {
        bool const isTwice = u == kTempusZero && v->getValueU() == u && isPastFirst;
        isPastFirst = isPastFirst || v->getValueU() == u;
        return isTwice || v->getValueU() > u;
    });
}

void expectSearches(KFSpline& spline, Walks const& walks) {
    Tempus const t = kTempusZero;
    for (Tempus const& u : museumPositions(spline)) {
        SCOPED_TRACE(museumText(u));
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertex(u, out, t, false); }),
                  walks.after(u));
        ASSERT_EQ(found([&](void** out) { return spline.getNextValidVertexWithLock(u, out, t, true); }),
                  nextWithZeroTwice(walks.valid, u));
        ASSERT_EQ(found([&](void** out) { return spline.getPreviousValidVertexWithLock(u, out, t, false); }),
                  walks.before(u));
        ASSERT_EQ(spline.getNextVertex(u), nextWithZeroTwice(walks.all, u));
        KFVertex* const here = firstOf(walks.all, [&](KFVertex* v) { return v->getValueU() == u; });
        ASSERT_EQ(found([&](void** out) { return spline.getVertexHandle(u, out, true); }), here);
        double value = 0.0;
        ASSERT_EQ(spline.getVertex(u, &value, t), here != nullptr);
        ASSERT_EQ(value, here == nullptr ? 0.0 : here->getValueV(t));
    }
}

void expectLists(KFSpline& spline, Walks const& walks) {
    auto const onePerPlace = [](std::vector<KFVertex*> list) {
        list.erase(std::unique(list.begin(), list.end(),
                               [](KFVertex* a, KFVertex* b) { return a->getValueU() == b->getValueU(); }),
                   list.end());
        return std::vector<void*>(list.begin(), list.end());
    };
    std::vector<void*> handles, validHandles;
    spline.getAllVerticesHandles(handles);
    spline.getAllValidVerticesHandles(validHandles, kTempusZero);
    EXPECT_EQ(handles, onePerPlace(walks.all));
    EXPECT_EQ(validHandles, onePerPlace(walks.valid));

    // The extremes of values, and of the ends of handles; the first vertex that has one tells its position.
    double best[4] = {-DBL_MAX, DBL_MAX, -DBL_MAX, DBL_MAX};
    Tempus bestU[4];
    for (KFVertex const* vertex : walks.valid) {
        double const value = vertex->getValueV(kTempusZero);
        Sides const sides = sidesOf(*vertex);
        double const ends[] = {value + 12.0 * sides[1], value + 12.0 * sides[3]};
        double const offers[4] = {value, value, std::max(ends[0], ends[1]), std::min(ends[0], ends[1])};
        for (std::size_t i = 0; i < 4; ++i) {
            if (i % 2 == 0 ? offers[i] > best[i] : offers[i] < best[i]) {
                best[i] = offers[i];
                bestU[i] = vertex->getValueU();
            }
        }
    }
    Tempus u[4];
    EXPECT_EQ(spline.getMaxValueV(kTempusZero, &u[0]), best[0]);
    EXPECT_EQ(spline.getMinValueV(kTempusZero, &u[1]), best[1]);
    EXPECT_EQ(spline.getMaxValueVWithTangents(kTempusZero, &u[2]), best[2]);
    EXPECT_EQ(spline.getMinValueVWithTangents(kTempusZero, &u[3]), best[3]);
    EXPECT_TRUE(std::equal(u, u + 4, bestU));
}

} // namespace

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

// What was kept while the list answered doesn't stand where each vertex is asked.
TEST(KFSplineStore, KeptSegmentsEndWithTheList) {
    KFSplineState state;
    AskingSpline spline(&state);
    for (int i = 0; i < 3; ++i)
        spline.addVertexNoTangents(TempusMake(2 * i, 1), i % 2, kTempusZero, false);
    void* middle = nullptr;
    spline.getVertexHandle(TempusMake(2, 1), &middle, false);
    auto const value = [&] { return spline.getVertexValue(TempusMake(1, 1), kTempusZero, true); };
    value();
    EXPECT_EQ(value(), 0.5);
    static_cast<KFVertex*>(middle)->setEnabled(false, kTempusZero); // past the list
    EXPECT_EQ(value(), 0.5);
    spline.keepList(false);
    EXPECT_EQ(value(), 0.0);
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
                std::vector<std::pair<Tempus, std::pair<double, unsigned>>> out, expected;
                Tempus first;
                Tempus last;
                ASSERT_TRUE(curve->getVerticesTimeAndValue(range, out, &first, &last));
                ASSERT_EQ(first, vertices.empty() ? kTempusInvalid : vertices.front()->getValueU());
                ASSERT_EQ(last, vertices.empty() ? kTempusInvalid : vertices.back()->getValueU());
                // From the first vertex at the start, else the last before it, to the first that isn't before the end.
                auto const isBefore = [](KFVertex const* v, Tempus const& u) { return v->getValueU() < u; };
                auto from = std::lower_bound(vertices.begin(), vertices.end(), range.start, isBefore);
                bool const isAt = from != vertices.end() && (*from)->getValueU() == range.start;
                from -= !isAt && from != vertices.begin() ? 1 : 0;
                auto const to = std::lower_bound(from, vertices.end(), end, isBefore);
                for (auto v = from; v != vertices.end() && v <= to; ++v) {
                    expected.push_back(
                        {(*v)->getValueU(), {(*v)->getValueV(kTempusZero), (*v)->getInterpolation()}});
                }
                ASSERT_EQ(out, expected) << museumText(range.start) << " to " << museumText(end);
            }
        }
    }
}

// Several blocks of the store fill and empty; few places, so that vertices meet.
TEST(KFSplineStore, KeepsItsOrderThroughRandomEdits) {
    for (unsigned seed = 1; seed <= 4; ++seed) {
        std::mt19937 random(seed);
        auto const pick = [&](std::size_t count) { return random() % count; };
        auto const pickU = [&] {
            std::int32_t const scales[] = {1, 24, 30000, 262144, 7};
            bool const isOdd = seed % 2 == 0 && pick(300) == 0; // no common timescale fits
            std::int32_t const scale = isOdd ? 2147483629 : scales[pick(5)];
            return TempusMake((static_cast<std::int64_t>(pick(60)) - 20) * std::max(scale / 12, 1), scale);
        };
        MuseumSpline curve;
        std::vector<KFVertex*> list;
        for (int i = 0; i < 7500; ++i) {
            bool const grows = i / 2500 != 1;
            std::size_t const index = list.empty() ? 0 : pick(list.size());
            std::size_t const what = pick(200);
            if (list.empty() || what < (grows ? 120u : 40u)) {
                Tempus const u = pickU();
                auto const place = std::find_if(list.begin(), list.end(),
                                                [&](KFVertex* v) { return !(v->getValueU() < u); });
                list.insert(place,
                            static_cast<KFVertex*>(curve->addVertexNoTangents(u, i, kTempusZero, false)));
            } else if (what < 160) {
                ASSERT_TRUE(curve->deleteVertex(list[index], false, kTempusZero));
                list.erase(list.begin() + static_cast<std::ptrdiff_t>(index));
            } else if (what < 180) {
                list[index]->isEnabled(kTempusZero) ? curve->disableVertex(list[index], kTempusZero)
                                                    : curve->enableVertex(list[index], kTempusZero);
            } else if (what < 198) {
                // To where its neighbour stands: the order stays.
                curve->offsetVertexInTime(
                    list[index], list[std::min(index + 1, list.size() - 1)]->getValueU(), kTempusZero);
            } else if (what == 198) {
                curve->setDirty(true);
            } else if (i % 3 == 0) {
                curve->setClosed(true, nullptr);
                curve->setClosed(false, list[index]); // turns the order, and numbers the positions
                std::rotate(list.begin(), list.begin() + static_cast<std::ptrdiff_t>(index), list.end());
            }
            if (i % 250 == 0 || (what == 199 && i % 3 == 0)) {
                SCOPED_TRACE(testing::Message() << "seed " << seed << ", edit " << i);
                ASSERT_EQ(museumVertices(*curve), list);
                Walks const walks(*curve, true);
                ASSERT_NO_FATAL_FAILURE(expectNavigation(*curve, walks));
                ASSERT_NO_FATAL_FAILURE(expectSearches(*curve, walks));
            }
        }
    }
}

// Thinned blocks join those behind them, in the middle of a long spline too.
TEST(KFSplineStore, FindsWhatDeletionsLeave) {
    MuseumSpline curve;
    for (int i = 0; i < 4000; ++i) {
        curve.append(TempusMake(i, 1), i);
    }
    for (int i = 1500; i > 500; --i) {
        ASSERT_TRUE(i % 9 == 0 || curve->deleteVertex(TempusMake(i, 1), false, kTempusZero));
    }
    for (KFVertex* const vertex : museumVertices(*curve)) {
        ASSERT_EQ(curve.vertexAt(vertex->getValueU()), vertex);
    }
}

TEST(KFSplineStore, NeverFollowsADeadHandle) {
    MuseumSpline curve;
    for (int i = 0; i < 200; ++i) {
        curve->addVertex(TempusMake(i % 20, 3), i, kTempusZero, false);
    }
    int local = 0;
    std::vector<void*> dead{&local, nullptr};
    while (curve->getNumberOfVertices() > 0) {
        void* const next = curve->getFirstVertex();
        curve->disableVertex(next, kTempusZero);
        EXPECT_TRUE(curve->isValidHandle(next)); // makes the set of living handles
        dead.size() < 20 ? curve->deleteVertex(next, false, kTempusZero) : curve->deleteAllVertices();
        dead.push_back(next);
        for (void* const handle : dead) {
            EXPECT_FALSE(curve->isValidHandle(handle));
            EXPECT_FALSE(curve->findVertex(0, 300, handle));
        }
    }
}

TEST(KFVertexStore, KnowsItsHandlesOnceThereIsMemory) {
    KFVertexStore store;
    auto* const vertex = new KFStaticVertex(kTempusZero, 0.0);
    store.append(vertex, false);
    for (std::size_t const given : {0U, 1U}) {
        refuseAllocationsAfter(given);
        EXPECT_THROW(store.contains(vertex), std::bad_alloc);
        refuseAllocationsAfter(SIZE_MAX);
    }
    EXPECT_TRUE(store.contains(vertex));
}
