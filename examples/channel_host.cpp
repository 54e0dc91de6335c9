// A host with one object: a title whose opacity fades in, stays for a while and fades out, and which moves. The
// tree holds its parameters; each answers for every time.
//
// Build it against an installed Lumenkey:
//     c++ -std=c++20 channel_host.cpp $(pkg-config --cflags --libs lumenkey)

#include "lumenkey/lumenkey.h"

#include <iostream>

int main() {
    // An object, whose channels' time starts at second 10 of the project, with two parameters.
    KFChannelObjectRootBase title("Title", nullptr, 1, 0, 0);
    title.setTimeOffset(TempusMake(10, 1), true);
    KFChannelPercent opacity("Opacity", &title, 1, 0);
    KFChannelDouble height("Height", &title, 2, 0);
    title.finishInitializing();

    // Not animated yet: a value holds for all time.
    height.setValue(kTempusZero, 120.0, false);

    // While the animate switch is on, each value that is set becomes a keypoint. Times are exact fractions of a
    // second: 240/24 is the same time as 10/1.
    KFCoreGlobals::getInstance().animate = true;
    opacity.setInterpolation(kKFInterpolationEase);
    opacity.setValue(TempusMake(240, 24), 0.0, false);
    opacity.setValue(TempusMake(264, 24), 1.0, false);
    opacity.setValue(TempusMake(312, 24), 0.0, false);
    KFCoreGlobals::getInstance().animate = false;

    // Every sixth frame of 24 a second. Further threads may read at the same time, beside one that edits keypoints.
    for (int frame = 240; frame <= 324; frame += 6) {
        Tempus const time = TempusMake(frame, 24);
        std::cout << frame << ": opacity " << opacity.getValueAsDouble(time, 0.0) << ", height "
                  << height.getValueAsDouble(time, 0.0) << '\n';
    }

    // A path of IDs names a channel for good: through renaming, copying and storing.
    KFChannelBase const* const found = KFChannelRef("./1").getChannel(&title);
    return found == &opacity && opacity.getValueAsDouble(TempusMake(11, 1), 0.0) == 1.0 ? 0 : 1;
}
