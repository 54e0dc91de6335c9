// Simplifying a channel that has a keypoint for each sample, beside the curve fitter alone; and edits of
// linked components beside those of one.

#include "bench/Benchmarks.h"
#include "bench/Subjects.h"

#include "lumenkey/Channels/KFChannelObjectRootBase.h"
#include "lumenkey/Channels/KFVectorChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/foundation/BXCurveFit.h"

#include <cmath>
#include <random>

namespace {

constexpr std::size_t kSmall = 1000;
constexpr std::size_t kLarge = 100000;

// Simplifying ----------------------------------------------------------------------------------------------

Tempus const kFrame = TempusMake(1, 120);
/// Of values between about -2 and 2.
constexpr double kTolerance = 0.01;

using Point = BXVector2<double>;

using Row = std::vector<Point>;

/// A limb that swings, as it is captured: two waves, and noise below the tolerance. In rows of `size`
/// samples, whose x counts them, so that small rows aren't learnt by heart.
std::vector<Row> capturedMotion(std::size_t size) {
    std::mt19937_64 random(5);
    std::uniform_real_distribution<double> noise(-0.002, 0.002);
    std::vector<Row> rows(kLarge / size);
    double time = 0.0;
    for (Row& row : rows) {
        for (std::size_t i = 0; i < size; ++i, time += 1.0)
            row.push_back({static_cast<double>(i),
                           std::sin(time * 0.05) + 0.7 * std::sin(time * 0.083 + 1.0) + noise(random)});
    }
    return rows;
}

/// Has one keypoint more than samples, for the end of the last step.
std::unique_ptr<KFChannelDouble> capturedChannel(Row const& points) {
    auto channel = std::make_unique<KFChannelDouble>("Captured", nullptr, 1, 0);
    std::vector<Tempus> times;
    std::vector<double> values;
    for (Point const& point : points) {
        times.push_back(kFrame * static_cast<std::uint32_t>(times.size()));
        values.push_back(point.y);
    }
    times.push_back(kFrame * static_cast<std::uint32_t>(times.size()));
    values.push_back(values.back());
    channel->willLoadKeyframes(true, static_cast<int>(times.size()));
    channel->appendKeyframes(static_cast<unsigned int>(times.size()), times.data(), values.data(), true);
    channel->willLoadKeyframes(false, 0);
    channel->setInterpolation(kKFInterpolationBezier);
    return channel;
}

unsigned int simplify(KFChannel& channel) {
    channel.reduceKeyframes(kTempusZero, channel.getKeyframeMaxTime(), kFrame, kTolerance * 100.0, 1.0,
                            KFCurve::kSimplifyByFit, 0);
    return channel.getNumberOfKeyframes();
}

std::size_t fit(Row const& points, Row& fitted) {
    BXCurveFit::getInstance().FitCurve(points, fitted, kTolerance);
    return fitted.size() / 3 + 1;
}

/// The fastest of some attempts, for each of `items`: what disturbs one only adds to it.
template <class Attempt> double fastest(std::size_t items, int attempts, Attempt attempt) {
    auto least = std::chrono::nanoseconds::max();
    for (int i = 0; i < attempts; ++i)
        least = std::min<std::chrono::nanoseconds>(least, attempt());
    return static_cast<double>(least.count()) / static_cast<double>(items);
}

template <class Work> std::chrono::nanoseconds timeOf(Work work) {
    auto const start = std::chrono::steady_clock::now();
    work();
    return std::chrono::steady_clock::now() - start;
}

/// A sample; making and destroying the channels isn't counted.
Measurement simplifying(std::size_t size) {
    return [rows = capturedMotion(size)] {
        return fastest(kLarge, 5, [&rows] {
            std::vector<std::unique_ptr<KFChannelDouble>> channels;
            for (Row const& row : rows)
                channels.push_back(capturedChannel(row));
            return timeOf([&] {
                for (auto const& channel : channels)
                    simplify(*channel);
            });
        });
    };
}

Measurement fitting(std::size_t size) {
    return [rows = capturedMotion(size)] {
        return fastest(kLarge, 5, [&rows] {
            Row fitted;
            return timeOf([&] {
                for (Row const& row : rows)
                    fit(row, fitted);
            });
        });
    };
}

Contest simplifyingBesideFitting(std::size_t size) {
    Row const row = capturedMotion(size).front();
    Row fitted;
    requireAgreement("keypoints left by simplifying", simplify(*capturedChannel(row)),
                     static_cast<double>(fit(row, fitted)), 0.0);
    return {simplifying(size), fitting(size)};
}

// Linked edits ---------------------------------------------------------------------------------------------

constexpr std::int64_t kEdits = 100;

/// Three components with two hundred keypoints each, linked, and a channel like one of them.
struct LinkedPoint {
    KFChannelObjectRootBase root{"Object", nullptr, 1, 0, 0};
    KFChannel3D point{"Position", &root, 1, 0};
    KFChannelDouble alone{"Alone", &root, 2, 0};

    LinkedPoint() {
        for (KFChannel* const channel : {&point.x, &point.y, &point.z, &alone}) {
            channel->setIsSpline(true);
            for (std::int64_t i = 0; i < 200; ++i)
                channel->setKeyframe(TempusMake(i, 24), std::sin(static_cast<double>(i)), true);
        }
        point.setFoldFlag(kFoldFlagLinked);
        root.finishInitializing();
    }
};

void keyAndDelete(KFChannel& channel) {
    for (std::int64_t i = 0; i < kEdits; ++i) {
        Tempus const between = TempusMake(i * 2 + 1, 48);
        channel.setValue(between, static_cast<double>(i), false);
        channel.deleteKeypointAt(between);
    }
}

/// The fellows of the one that is set are keyed at the values that they have.
void setAtKeypoints(KFChannel& channel) {
    for (std::int64_t i = 0; i < kEdits; ++i)
        channel.setValue(TempusMake(i, 24), static_cast<double>(i), false);
}

void keyAtKeypoints(KFChannel& channel) {
    for (std::int64_t i = 0; i < kEdits; ++i)
        channel.setValue(TempusMake(i, 24));
}

void addAndDelete(KFChannel& channel) {
    for (std::int64_t i = 0; i < kEdits; ++i) {
        Tempus const between = TempusMake(i * 2 + 1, 48);
        channel.addKeypointAt(between);
        channel.deleteKeypointAt(between);
    }
}

void moveThereAndBack(KFChannel& channel) {
    for (std::int64_t i = 0; i < kEdits; ++i) {
        Tempus const from = TempusMake(i, 24);
        Tempus const to = from + TempusMake(1, 48);
        channel.moveKeypointTo(from, to, false, false);
        channel.moveKeypointTo(to, from, false, false);
    }
}

using EditOf = void (*)(KFChannel&);

/// Anew each time, and each keypoint once: every edit shortens the handles beside it.
Measurement editing(EditOf edit, bool linked) {
    return [edit, linked] {
        return fastest(kEdits, 15, [edit, linked] {
            auto const made = std::make_unique<LinkedPoint>();
            return timeOf([&] { edit(linked ? made->point.y : made->alone); });
        });
    };
}

void registerLinked(Bench& bench, std::string const& name, EditOf edit, std::string const& against,
                    EditOf editOfOne) {
    registerContest(bench, {"linked edit/" + name, against, Bound::atMost(3.5), [edit, editOfOne] {
                                return Contest{editing(edit, true), editing(editOfOne, false)};
                            }});
}

} // namespace

void registerReshaping(Bench& bench) {
    for (std::size_t const size : {kSmall, kLarge}) {
        registerContest(bench, {withSize("simplify", size), "the curve fitter", Bound::atMost(2.0),
                                [size] { return simplifyingBesideFitting(size); }});
    }
    registerContest(bench, {"simplify/a sample of 100000", "a sample of 1000", Bound::atMost(1.5), [] {
                                return Contest{simplifying(kLarge), simplifying(kSmall)};
                            }});
    registerLinked(bench, "new value, deleted", keyAndDelete, "one component", keyAndDelete);
    registerLinked(bench, "keypoint added, deleted", addAndDelete, "one component", addAndDelete);
    registerLinked(bench, "keypoint moved, moved back", moveThereAndBack, "one component", moveThereAndBack);
    registerLinked(bench, "value at a keypoint", setAtKeypoints, "one component keyed as it is",
                   keyAtKeypoints);
}
