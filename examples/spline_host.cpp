// A host with one animated value. The opacity of a title fades in, stays for a while and fades out; three keypoints
// say so, and the spline answers for every time between, before and after them.
//
// Build it against an installed Lumenkey:
//     c++ -std=c++20 spline_host.cpp $(pkg-config --cflags --libs lumenkey)

#include "lumenkey/lumenkey.h"

#include <charconv>
#include <iostream>
#include <string_view>

// The shortest text that reads back to the same double, whatever the locale.
static void print(double number) {
    char text[32];
    char const* const end = std::to_chars(text, text + sizeof text, number).ptr;
    std::cout << std::string_view(text, static_cast<std::size_t>(end - text));
}

int main() {
    // The settings come first: the spline keeps a pointer to them, and they outlive it.
    KFSplineState settings;
    settings.interpolation = kKFInterpolationEase;
    settings.postExtrapolation = kKFExtrapolationConstant;
    KFSpline opacity(&settings);

    // Times are exact fractions of a second: 48/24 is the same time as 2/1. The third argument says at which time
    // the attributes of keypoints are read; plain keypoints do not care.
    opacity.addVertex(TempusMake(0, 24), 0.0, kTempusZero, false);
    opacity.addVertex(TempusMake(24, 24), 100.0, kTempusZero, false);
    opacity.addVertex(TempusMake(72, 24), 0.0, kTempusZero, false);

    // Every sixth frame of 24 a second. True: the spline locks itself, so that other threads may edit meanwhile.
    for (int frame = 0; frame <= 84; frame += 6) {
        Tempus const time = TempusMake(frame, 24);
        print(TempusGetSeconds(time));
        std::cout << " s: ";
        print(opacity.getVertexValue(time, kTempusZero, true));
        std::cout << '\n';
    }

    // At a keypoint the value is the keypoint's own, to the last bit.
    return opacity.getVertexValue(TempusMake(1, 1), kTempusZero, true) == 100.0 ? 0 : 1;
}
