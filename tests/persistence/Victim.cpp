#include "tests/persistence/Victim.h"

#include "lumenkey/Channels/KFFactories.h"
#include "lumenkey/Channels/KFVectorChannels.h"
#include "lumenkey/curves/KFCurve.h"
#include "lumenkey/foundation/BXXMLReadStream.h"
#include "lumenkey/persistence/ChannelParser.h"

#include <gtest/gtest.h>

#include <fstream>

std::string const kDocumentFactories =
    "<kfml version='5.13'><factory id='1' uuid='E7BF3809-2290-11D7-98E5-00039389B702'/>"
    "<factory id='2' uuid='FDC1944B-2291-11D7-B1C3-00039389B702'/>";
std::string const kDocumentHead = kDocumentFactories + "<parameter id='1'>";
std::string const kDocumentTail = "</parameter></kfml>";

namespace {

void exercise(KFChannel& channel) {
    Tempus const times[] = {TempusMake(-3, 1),       kTempusZero,
                            TempusMake(1, 3),        TempusMake(5, 2),
                            TempusMake(1 << 30, 1),  TempusMake(INT64_MIN, 1),
                            kTempusPositiveInfinity, kTempusNegativeInfinity,
                            kTempusIndefinite,       kTempusInvalid};
    for (Tempus const& time : times)
        channel.getValueAsDouble(time, 0.0);
    KFCurve& curve = *channel.getCurveInterface();
    std::uint32_t count = 50;
    std::vector<Tempus> sampledTimes;
    std::vector<double> samples;
    curve.getCurveSamples(TempusMake(-2, 1), TempusMake(1, 10), count, &sampledTimes, &samples);
    channel.lock(false, false);
    for (Tempus const& time : {TempusMake(1, 7), TempusMake(3, 1), TempusMake(-9, 1)})
        channel.setKeyframe(time, 0.5, true);
    curve.delKeypoints(TempusMake(-10, 1), TempusMake(-8, 1), true);
    channel.getValueAsDouble(TempusMake(1, 2), 0.0);
}

} // namespace

std::string documentOfCurve(std::string const& curve, std::string const& attributes) {
    return kDocumentHead + "<parameter id='2'><curve " + attributes + ">" + curve + "</curve></parameter>" +
           kDocumentTail;
}

std::string keypointElement(std::string const& time, std::string const& value, std::string const& more,
                            std::string const& attributes) {
    return "<keypoint " + attributes + "><time>" + time + "</time><value>" + value + "</value>" + more +
           "</keypoint>";
}

Victim::Victim() : value(new KFChannelDouble(1.0, "Value", root.get(), 2, 0)) {
    new KFChannel3D("Place", root.get(), 3, 0);
    new KFChannelBool(true, "On", root.get(), 4, 0);
    value->setKeyframe(kTempusZero, 1.0, true);
    value->setKeyframe(TempusMake(1, 1), 2.0, true);
}

std::string Victim::read(Bytes document) {
    BXXMLReadStream stream(document);
    KFFactories::getInstance().clearFactoryLoadIDs();
    ChannelParser parser(root.get());
    stream.pushHandler(&parser);
    if (stream.parse())
        return parser.hasFoundChannel() ? "" : "no node";
    BXReadFailure const& failure = *stream.failure();
    return std::to_string(failure.line) + ":" + std::to_string(failure.column) + ": " + failure.reason;
}
std::string Victim::read(std::string const& document) {
    return read(Bytes(reinterpret_cast<std::uint8_t const*>(document.data()), document.size()));
}

void Victim::expectUsable() {
    std::vector<KFChannelBase*> channels;
    root->getAllDescendantsFlattened(channels, 0, false);
    for (KFChannelBase* const node : channels)
        exercise(static_cast<KFChannel&>(*node));
    std::string const document = documentOf(*root);
    Victim second;
    EXPECT_EQ(second.read(document), "");
    EXPECT_EQ(root->getHash(), root->getHash());

    // A good document makes it good again.
    EXPECT_EQ(read(kDocumentHead + "<timing in='0/1' out='9/1' offset='0/1'/>" + kDocumentTail), "");
    EXPECT_EQ(read(documentOfCurve("<numberOfKeypoints>2</numberOfKeypoints>"
                                   "<min>-9</min><max>9</max><preExtrapolation>0</preExtrapolation>"
                                   "<postExtrapolation>0</postExtrapolation>" +
                                       keypointElement("0/1", "3", "", "interpolation='1'") +
                                       keypointElement("1/1", "4", "", "interpolation='1'"),
                                   "type='1' parametric='0' round='1' retimingExtrapolation='0'")),
              "");
    for (auto const& [time, expected] : {std::pair{-7, 3.0}, {1, 3.5}, {5, 4.0}})
        EXPECT_EQ(value->getValueAsDouble(TempusMake(time, 2), 0.0), expected);
}

std::size_t peakMiB() {
    std::ifstream status("/proc/self/status");
    std::string word;
    std::size_t kibibytes = 0;
    while (status >> word)
        if (word == "VmHWM:")
            status >> kibibytes;
    return kibibytes >> 10;
}
std::size_t forgetPeak() {
    std::ofstream("/proc/self/clear_refs") << 5;
    return peakMiB();
}
