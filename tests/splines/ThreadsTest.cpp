// Many threads that evaluate beside one that edits. What they read must be what some state of the spline gives: here
// that is a range of values that every edit keeps. The thread sanitizer watches. LUMENKEY_TEST_LONG=1 goes on longer.

#include "tests/splines/museum.h"
#include "tests/support/AtOnce.h"

#include <gtest/gtest.h>

#include <atomic>
#include <barrier>
#include <chrono>
#include <cmath>
#include <cstdlib>
#include <functional>
#include <random>
#include <thread>

namespace {

Tempus s(std::int64_t value, std::int32_t timescale = 1) { return TempusMake(value, timescale); }

int times(int count) { return std::getenv("LUMENKEY_TEST_LONG") != nullptr ? count * 50 : count; }

/// Threads that each do the same again and again, from their making until they are told to stop.
class Readers {
public:
    template <class Read> void add(Read read) {
        unsigned const seed = static_cast<unsigned>(_threads.size());
        _threads.emplace_back([this, read, seed] {
            std::mt19937 random(seed);
            while (!_stop.load(std::memory_order_relaxed)) {
                read(random);
                _reads.fetch_add(1, std::memory_order_relaxed);
                std::this_thread::yield(); // the lock isn't fair
            }
        });
    }
    /// Waits until they have read something more, so that edits and readings interleave on few processors too.
    void awaitReads(long count) const {
        long const target = _reads.load(std::memory_order_relaxed) + count;
        while (_reads.load(std::memory_order_relaxed) < target) {
            std::this_thread::yield();
        }
    }
    ~Readers() {
        _stop = true;
        for (std::thread& thread : _threads) {
            thread.join();
        }
    }

private:
    std::atomic<bool> _stop{false};
    std::atomic<long> _reads{0};
    std::vector<std::thread> _threads;
};

// The vertices' values stay within 0 to 1, and the ends of all handles within the range below; a closed curve leaves it
// only outside its ends. The first and the last vertex are neither moved nor deleted, so that their handles stay good.
constexpr double kLowest = -0.25;
constexpr double kHighest = 1.25;

class KFSplineThreads : public testing::Test {
protected:
    KFSplineThreads() {
        first = curve->addVertexNoTangents(s(0), 0.5, kTempusZero, false);
        last = curve->addVertexNoTangents(s(10), 0.25, kTempusZero, false);
        for (int i = 1; i < 300; ++i) {
            curve->addVertexNoTangents(s(i, 30), i % 2, kTempusZero, false);
        }
    }

    static Tempus pickU(std::mt19937& random) {
        std::int32_t const scales[] = {24, 30, 262144, 600};
        std::int32_t const scale = scales[random() % 4];
        return s(static_cast<std::int64_t>(random() % 16) * scale - 3 * scale +
                     static_cast<int>(random() % 24),
                 scale);
    }

    void expectAt(Tempus const& u, double value, char const* what) {
        bool const isInside = u >= s(0) && u <= s(10);
        expectInRange(isInside ? value : 0.0, what);
    }
    void expectInRange(double value, char const* what) {
        if (!(value >= kLowest && value <= kHighest) && !_failed.exchange(true)) {
            ADD_FAILURE() << what << " read " << value;
        }
    }

    void readPoints(std::mt19937& random);
    void readRows(std::mt19937& random);
    void navigate(std::mt19937& random);
    void copyWhole();
    void edit(std::mt19937& random);

    MuseumSpline curve;
    void* first;
    void* last;

private:
    KFVertex* pickVertex(std::mt19937& random) {
        void* handle = nullptr;
        curve->getNextValidVertex(s(static_cast<std::int64_t>(random() % 290) + 1, 30), &handle, kTempusZero,
                                  false);
        return static_cast<KFVertex*>(handle == nullptr ? last : handle);
    }
    void editVertex(KFVertex& vertex, std::mt19937& random);

    std::atomic<bool> _failed{false};
};

void KFSplineThreads::readPoints(std::mt19937& random) {
    Tempus u = pickU(random);
    for (int i = 0; i < 20; ++i) {
        expectAt(u, curve.at(u), "a point");
        // The steepest, up and down, are differences over a thousandth.
        expectInRange(std::fabs(curve.slopeAt(u)) / 2000.0, "a slope");
        u += s(1, 24);
    }
}

void KFSplineThreads::readRows(std::mt19937& random) {
    std::uint32_t count = 64;
    double values[64];
    Tempus positions[64];
    curve->sampleSpline(pickU(random), s(1, 25), count, positions, values, kTempusZero, false);
    for (std::uint32_t i = 0; i < count; ++i) {
        expectAt(positions[i], values[i], "a row");
    }
    count = 8;
    curve->sampleSplineSegment(s(1), s(1), count, nullptr, values, kTempusZero, true);
    expectInRange(values[7], "a segment's row");
}

void KFSplineThreads::navigate(std::mt19937& random) {
    void* handle = nullptr;
    curve->getFirstValidVertexWithLock(&handle, kTempusZero);
    curve->getNextValidVertexWithLock(first, &handle, kTempusZero);
    curve->getNextValidVertexWithLock(pickU(random), &handle, kTempusZero, random() % 2 == 0);
    curve->isValidHandle(handle); // it may be gone by now
    curve->getPreviousValidVertexWithLock(pickU(random), &handle, kTempusZero, false);
    if (!curve->isValidHandle(first) || !curve->getVertexHandle(s(0), &handle, true)) {
        expectInRange(99.0, "a lost vertex");
    }
    std::vector<std::pair<Tempus, std::pair<double, unsigned>>> keys;
    curve->getVerticesTimeAndValue({pickU(random), s(2)}, keys, nullptr, nullptr);
    for (auto const& key : keys) {
        expectInRange(key.second.first, "a listed value");
    }
    Tempus const ends = curve->getMaxValueU(kTempusZero, true) - curve->getMinValueU(kTempusZero, true);
    if (curve->getRangeU(kTempusZero) < s(9) || ends > s(11)) {
        expectInRange(99.0, "a wrong range");
    }
}

void KFSplineThreads::copyWhole() {
    MuseumSpline const copy(curve);
    Tempus before = kTempusNegativeInfinity;
    for (KFVertex const* vertex : museumVertices(*copy)) {
        expectInRange(vertex->getValueV(kTempusZero), "a copied value");
        expectInRange(vertex->getValueU() < before ? 99.0 : 0.0, "a copy out of order");
        before = vertex->getValueU();
    }
}

void KFSplineThreads::editVertex(KFVertex& vertex, std::mt19937& random) {
    double const value = static_cast<double>(random() % 1024) / 1023.0;
    double const rise = (value - 0.5) / 60.0;
    std::uint32_t const type = museumSegmentTypes()[random() % museumSegmentTypes().size()];
    std::function<void()> const edits[] = {
        [&] { vertex.setValueV(value, kTempusZero); },
        [&] { vertex.flattenTangents(kTempusZero); },
        [&] { curve->setVertexValue(&vertex, value, kTempusZero); },
        [&] { curve->setVertexInterpolation(&vertex, type); },
        [&] { curve->setVertexOutputHandles(&vertex, value / 600.0, rise, kTempusZero, false); },
        [&] { curve->setVertexInputHandles(&vertex, value / -600.0, rise, kTempusZero, false); },
        [&] { curve->resetVertexFlag(&vertex, kKFVertexFlagHandlesEdited); },
        [&] { curve->setVertexBiasLinear(&vertex, value * 2.0, kTempusZero); }};
    edits[random() % std::size(edits)]();
}

void KFSplineThreads::edit(std::mt19937& random) {
    KFVertex* const vertex = pickVertex(random);
    bool const stays = vertex == first || vertex == last;
    Tempus const u = s(static_cast<std::int64_t>(random() % 295) + 2, 30);
    std::uint32_t const modes[] = {0, 2, 3};
    std::function<void()> const edits[] = {
        [&] { curve->addVertexNoTangents(u, u.value % 2 == 0 ? 1.0 : 0.0, kTempusZero, random() % 2 == 0); },
        [&] { curve->deleteVertex(vertex, false, kTempusZero); },
        [&] { curve->moveVertex(vertex, u, kTempusZero, random() % 4 == 0, random() % 2 == 0, false); },
        [&] {
            curve->preSplineAccess(true);
            curve->disableVertex(vertex, kTempusZero);
            curve->enableVertex(random() % 2 == 0 ? vertex : curve->getNextVertex(u), kTempusZero);
            curve->postSplineAccess(true);
        },
        [&] { curve->setClosed(random() % 4 == 0, nullptr); },
        [&] { curve->setExtrapolation(modes[random() % 3], random() % 2); },
        [&] { curve->setInterpolation(random() % 2); }};
    std::size_t const what = random() % 60;
    if (what < 36 && !(stays && what / 6 >= 1 && what / 6 <= 3)) {
        edits[what / 6]();
    } else if (what == 36) {
        edits[6]();
    } else {
        editVertex(*vertex, random);
    }
}

} // namespace

TEST_F(KFSplineThreads, EvaluateBesideOneThatEdits) {
    std::mt19937 random(31);
    Readers readers;
    readers.add([this](std::mt19937& r) { readPoints(r); });
    readers.add([this](std::mt19937& r) { readRows(r); });
    readers.add([this](std::mt19937& r) {
        navigate(r);
        if (r() % 64 == 0) {
            copyWhole();
        }
    });
    for (int i = 0; i < times(4000) && !HasFailure(); ++i) {
        edit(random);
        if (i % 8 == 0) {
            readers.awaitReads(1);
        }
    }
}

// Threads keep what they computed, and none may go on with it after an edit that it knows to be over: through a handle,
// by two threads at once on one vertex, and of the spline.
TEST_F(KFSplineThreads, EditsReachWhatOtherThreadsKeep) {
    auto& shared = *static_cast<KFVertex*>(curve->addVertexNoTangents(s(101, 600), 0.0, kTempusZero, false));
    shared.setInterpolation(0);
    std::atomic<int> written{0};
    std::atomic<int> behind{0};
    Readers readers;
    for (int i = 0; i < 2; ++i) {
        readers.add([&](std::mt19937&) {
            for (int k = 0; k < 50; ++k) {
                int const known = written.load(std::memory_order_acquire);
                behind += curve.at(s(103, 600)) < known ? 1 : 0;
            }
        });
    }
    int const rounds = times(3000);
    atOnce(2, [&](int thread) {
        for (int i = 1; i <= rounds; ++i) {
            if (thread == 1) {
                shared.setBias(i % 3, kTempusZero);
                void* const added = curve->addVertexNoTangents(s(9, 2), 0.0, kTempusZero, false);
                curve->deleteVertex(added, false, kTempusZero);
                continue;
            }
            shared.setValueV(i, kTempusZero);
            behind += curve.at(s(103, 600)) != i ? 1 : 0;
            written.store(i, std::memory_order_release);
            if (i % 50 == 0)
                readers.awaitReads(1);
        }
    });
    EXPECT_EQ(behind, 0);
}

// What the vertices have in common is kept too, and a reader may meet a type that changes by its handle.
TEST_F(KFSplineThreads, TypesInCommonFollowHandles) {
    MuseumSpline whole;
    auto& vertex = *static_cast<KFVertex*>(whole->addVertexNoTangents(s(0), 0.0, kTempusZero, false));
    Readers readers;
    for (int i = 0; i < 2; ++i) {
        readers.add([&](std::mt19937&) {
            for (int k = 0; k < 1000; ++k)
                whole.typeOfAll();
        });
    }
    for (int i = 0; i < times(200000); ++i) {
        std::uint32_t const type = i % 2 == 0 ? kKFInterpolationBSpline : kKFInterpolationXSpline;
        vertex.setInterpolation(type);
        ASSERT_EQ(whole.typeOfAll(), type) << i;
    }
}

// Moving takes a vertex out and puts it in again, and copying all of them: nobody may see how many that leaves.
TEST_F(KFSplineThreads, NobodyCountsHalfAnEdit) {
    MuseumSpline moved;
    void* const vertex = moved->addVertexNoTangents(s(0), 0.0, kTempusZero, false);
    std::atomic<int> wrong{0};
    Readers readers;
    readers.add([&](std::mt19937&) {
        for (int k = 0; k < 1000; ++k)
            wrong += moved->getNumberOfVertices() != 1 ? 1 : 0;
    });
    for (int i = 1; i <= times(20000); ++i) {
        moved->moveVertex(vertex, s(i), kTempusZero, false, false, false);
        if (i % 1000 == 0)
            readers.awaitReads(1);
    }
    EXPECT_EQ(wrong, 0);
    *curve = *moved;
    EXPECT_EQ(curve->getNumberOfVertices(), 1u);
}

TEST_F(KFSplineThreads, WholeCurvesAreReadByManyAtOnce) {
    for (std::uint32_t const type : {10u, 12u}) {
        for (int round = 0; round < times(20); ++round) {
            MuseumSpline whole;
            whole.state->parametric = true;
            whole.state->interpolation = type;
            for (int i = 0; i < 8; ++i) {
                whole->addVertexNoTangents(s(i), i % 3, kTempusZero, false);
            }
            MuseumSpline const alone(whole);
            double const expected = alone.at(s(7, 2));
            // Its strategy is made by whoever comes first, and its tables follow the edit.
            atOnce(4, [&](int thread) {
                if (thread == 0) {
                    whole->preSplineAccess(true);
                    whole->setDirty(true);
                    whole->postSplineAccess(true);
                }
                whole->preSplineAccess(true);
                double value = 0.0;
                std::uint32_t count = 1;
                whole->sampleSplineSegment(s(7, 2), s(1), count, nullptr, &value, kTempusZero, false);
                whole->postSplineAccess(true);
                if (value != expected || whole.at(s(7, 2)) != expected) {
                    ADD_FAILURE() << "type " << type << " read " << value;
                }
            });
        }
    }
}

TEST_F(KFSplineThreads, TwoSplinesShareOneLock) {
    BXSpinLock shared;
    TestOwner owners[2];
    MuseumSpline curves[2];
    for (int i = 0; i < 2; ++i) {
        owners[i]._customLock = &shared;
        curves[i]->setNode(&owners[i]);
        curves[i]->addVertexNoTangents(s(0), 0.0, kTempusZero, false);
        curves[i]->addVertexNoTangents(s(2), 0.0, kTempusZero, false);
    }
    auto const setBoth = [&](double value) {
        curves[0]->preSplineAccess(true);
        for (MuseumSpline& each : curves) {
            static_cast<KFVertex*>(each->getLastVertex())->setValueV(value, kTempusZero);
        }
        curves[0]->postSplineAccess(true);
    };
    std::atomic<int> differences{0};
    Readers readers;
    readers.add([&](std::mt19937&) {
        // One curve's lock holds still the other.
        curves[1]->preSplineAccess(true);
        differences += curves[0].at(s(1), false) != curves[1].at(s(1), false) ? 1 : 0;
        curves[1]->postSplineAccess(true);
        curves[0].at(s(1));
    });
    readers.add([&](std::mt19937&) { curves[1].slopeAt(s(1, 2)); });
    for (int i = 0; i < times(20000); ++i) {
        setBoth(i);
        if (i % 500 == 0) {
            readers.awaitReads(5);
        }
        if (i % 4 == 0) {
            curves[i / 4 % 2]->setVertexValue(curves[i / 4 % 2]->getFirstVertex(), 0.0, kTempusZero);
        }
    }
    EXPECT_EQ(differences, 0);
}

// Who holds a lock that several splines share holds them all still, also where a thread has kept all that it
// needs.
TEST_F(KFSplineThreads, ACustomLockIsWaitedForByEveryRead) {
    TestOwner owner;
    BXSpinLock shared;
    owner._customLock = &shared;
    curve->setNode(&owner);
    Tempus const u = s(103, 600);
    std::barrier held(2);
    std::atomic<bool> done{false};
    std::thread reader([&] {
        for (int i = 0; i < 3; ++i)
            curve.at(u);
        held.arrive_and_wait();
        held.arrive_and_wait();
        curve.at(u);
        done = true;
    });
    held.arrive_and_wait();
    curve->preSplineAccess(true);
    held.arrive_and_wait();
    std::this_thread::sleep_for(std::chrono::milliseconds(20));
    EXPECT_FALSE(done);
    curve->postSplineAccess(true);
    reader.join();
    owner._customLock = nullptr;
    curve->setNode(nullptr);
}

// Each test is a process of its own when the suite runs, so that here the strategies are made.
TEST(Threads, FirstUseByManyAtOnce) {
    std::atomic<double> sum{0.0};
    KFInterpolator* strategies[8] = {};
    atOnce(8, [&](int thread) {
        MuseumSpline own;
        own->addVertex(s(0), 1.0, kTempusZero, true);
        own->addVertex(s(2), 3.0, kTempusZero, true);
        sum += own.at(s(1));
        strategies[thread] = own->getInterpolator(21);
    });
    EXPECT_EQ(sum, 16.0);
    for (KFInterpolator const* strategy : strategies) {
        EXPECT_EQ(strategy, strategies[0]);
    }
}
