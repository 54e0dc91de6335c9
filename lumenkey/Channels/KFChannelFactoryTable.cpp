#include "lumenkey/Channels/KFChannelFactoryTable.h"

#include "lumenkey/Channels/KFChannelFactories.h"

#include <algorithm>
#include <iterator>

namespace {
// clang-format off
constexpr KFChannelFactoryRow kTable[] = {
    {"KFChannelBase", "4B723EA5-2443-11D7-9C75-00039366FB58", "", getKFChannelBase_FactoryBase},
    {"KFChannel", "F112CFDE-0D76-11D7-83C8-000393670732", "KFChannelBase", getKFChannel_FactoryBase},
    {"KFChannelDouble", "FDC1944B-2291-11D7-B1C3-00039389B702", "KFChannel", getKFChannelDouble_FactoryBase},
    {"KFChannelBool", "0B00DE81-2292-11D7-AC3D-00039389B702", "KFChannel", getKFChannelBool_FactoryBase},
    {"KFChannelUint32", "DBCA7524-70FD-11D7-9801-00039389B702", "KFChannel", getKFChannelUint32_FactoryBase},
    {"KFChannelAngle", "1595B452-2292-11D7-8C7F-00039389B702", "KFChannel", getKFChannelAngle_FactoryBase},
    {"KFChannelPercent", "27F3EE8B-2292-11D7-925A-00039389B702", "KFChannel", getKFChannelPercent_FactoryBase},
    {"KFChannelShearAngle", "805A2584-2A62-11D8-84E5-000A95AF9F7E", "KFChannel", getKFChannelShearAngle_FactoryBase},
    {"KFChannelAspectRatio", "E58D23C1-418A-11D8-922B-000A95AFC10A", "KFChannel", getKFChannelAspectRatio_FactoryBase},
    {"KFChannelAspectRatioFootage", "2F3B437F-8A4E-11D8-B4C5-000A95AF90F2", "KFChannel", getKFChannelAspectRatioFootage_FactoryBase},
    {"KFChannelGammaFootage", "DCBFFBC9-1306-4323-A40A-D5BE29B5F152", "KFChannel", getKFChannelGammaFootage_FactoryBase},
    {"KFChannelFolder", "E7BF3809-2290-11D7-98E5-00039389B702", "KFChannelBase", getKFChannelFolder_FactoryBase},
    {"KFCompoundChannel", "9026A736-2718-11D7-AEB7-00039366FB58", "KFChannelFolder", getKFCompoundChannel_FactoryBase},
    {"KFChannel2D", "D4BEC6CA-28EF-11D7-9E3B-00039389B702", "KFCompoundChannel", getKFChannel2D_FactoryBase},
    {"KFChannelBool3D", "6BB493A7-F7FC-4D8F-985C-79485D6A0DDB", "KFCompoundChannel", getKFChannelBool3D_FactoryBase},
    {"KFChannelPosition", "3077C88E-2291-11D7-B978-00039389B702", "KFChannel2D", nullptr},
    {"KFChannelPositionPercent", "B81B85D0-8C68-11D7-928A-0003936F6F92", "KFChannel2D", nullptr},
    {"KFChannelShear", "692A0D00-28F1-11D7-9FE3-00039389B702", "KFCompoundChannel", nullptr},
    {"KFChannelScale", "B5736F35-28F1-11D7-BD19-00039389B702", "KFChannel2D", nullptr},
    {"KFChannel3D", "5FDD789A-8EB4-4217-AB8A-8774AE4F08E9", "KFCompoundChannel", getKFChannel3D_FactoryBase},
    {"KFChannelPosition3D", "98458B11-25BC-4998-97C3-99D6D1240F52", "KFChannelPosition", nullptr},
    {"KFChannelRotation3D", "645630BF-B46E-49B7-846B-64F1F24CB140", "KFCompoundChannel", nullptr},
    {"KFChannelScale3D", "11615B89-CBC0-483F-B92E-95EB0C80E59C", "KFChannelScale", nullptr},
    {"KFChannelColorNoAlpha", "878A64BD-1930-11D8-BAC3-000A95AF9F7E", "KFCompoundChannel", nullptr},
    {"KFChannelColor", "0DB037A6-2291-11D7-A541-00039389B702", "KFChannelColorNoAlpha", nullptr},
    {"KFChannelQuad", "BD9AF3C0-28C4-11D7-9D44-000393833F6A", "KFChannelFolder", nullptr},
    {"KFChannelCrop", "5360AF62-25B1-11D8-9D2B-000A95AF9F7E", "KFCompoundChannel", nullptr},
    {"KFChannelDiscreteColor", "FF5322AF-9980-4123-AFF4-9A168A600192", "KFChannelEnum", nullptr},
    {"KFChannelGradient", "F32E7A31-146F-11D8-A20A-000A95AF9F7E", "KFChannelFolder", nullptr},
    {"KFChannelGradientRGBFolder", "69F1E0A5-2E79-11D8-B19A-000A95B0025A", "KFChannelVaryingFolder", nullptr},
    {"KFChannelGradientAlphaFolder", "7644521E-2E79-11D8-91A6-000A95B0025A", "KFChannelVaryingFolder", nullptr},
    {"KFChannelGradientSample", "3D693253-2DD3-11D8-A63C-000A95B0025A", "KFChannelFolder", nullptr},
    {"KFChannelGradientSampleRGB", "10405F52-1398-11D8-B4DB-000A95AF9F7E", "KFChannelGradientSample", nullptr},
    {"KFChannelGradientSampleAlpha", "0E8D4435-13B6-11D8-9395-000A95AF9F7E", "KFChannelGradientSample", nullptr},
    {"KFChannelGradientExtras", "93C721E8-42FF-11D8-9760-000A95AF9F7E", "KFChannelGradient", nullptr},
    {"KFChannelGradientPositioned", "D30389FC-43C7-11D8-BED8-000A95AF9F7E", "KFChannelGradientExtras", nullptr},
    {"KFChannelVaryingFolder", "46C844A8-13D3-11D8-A438-000A95AF9F7E", "KFChannelFolder", nullptr},
    {"KFChannelObjectRootBase", "F9D8D555-F368-43E8-8960-02C38CEFF6DF", "KFChannelFolder", getKFChannelObjectRootBase_FactoryBase},
    {"KFChannelHistogram", "870BB905-2733-11D8-8817-000A95AF90F2", "KFChannelFolder", nullptr},
    {"KFChannelLevels", "4258671C-D809-4DFC-9030-8ADB290D0703", "KFChannelFolder", nullptr},
    {"KFChannelButton", "60CFB710-42F6-11D8-9B96-000A95AF90F2", "KFChannel", nullptr},
    {"KFChannelHelpButton", "1821B108-F471-4C79-9EF2-946CFBE1CA2E", "KFChannelButton", nullptr},
    {"KFChannelText", "82CF97A6-4109-49F4-BAE1-6835480A7E9E", "KFChannel", nullptr},
    {"KFChannelDoubleOverRange", "889ABD41-E72B-4963-AA2D-FD12DCB5E703", "KFChannelDouble", nullptr},
    {"KFChannelScaleOverRange", "80BD6FC5-6D92-447F-B35A-DAB26F91AEC2", "KFChannelScale", nullptr},
    {"KFChannelAngleOverRange", "E507D4FF-4952-4E1F-8A1B-1EE505DDBDC1", "KFChannelAngle", nullptr},
    {"KFChannelPercentOverRange", "CC3A0C88-47D2-40C8-81FE-039A447B0CCE", "KFChannelPercent", nullptr},
    {"KFChannel2DOverRange", "1C1F93C3-6FBA-4D09-82AE-62F7B3B17DB4", "KFChannel2D", nullptr},
    {"KFChannelTransformSwitch", "7E2404F5-2121-4142-AD0B-AF548CC90FDF", "KFCompoundChannel", nullptr},
    {"KFChannelUint16", "EB993CB4-DD62-11D7-99C1-000A95699864", "KFChannel", getKFChannelUint16_FactoryBase},
    {"KFChannelSeed", "9BCCF9E0-4883-11D8-AA19-000A95B0025A", "KFChannel", getKFChannelSeed_FactoryBase},
    {"KFChannelDecibel", "D7B8E39D-A3A1-11D8-AC28-000A95B002A0", "KFChannel", getKFChannelDecibel_FactoryBase},
    {"KFChannelFrame", "5F6C9C5A-798A-11D9-BB51-000A95B0025A", "KFChannel", getKFChannelFrame_FactoryBase},
    {"KFChannelTimecode", "466E3131-A13E-46D6-915C-A0E46CFC12E4", "KFChannel", getKFChannelTimecode_FactoryBase},
    {"KFChannelBlindData", "6F69A722-E95C-4B7A-870B-FB0345C9F167", "KFChannel", nullptr},
    {"KFChannelCurve", "724E1DD9-DF92-476E-B39A-5BDAFAA94DA0", "KFChannel", nullptr},
    {"KFChannelEnum", "558F10B4-A1C0-11D7-9989-00039389B702", "KFChannel", nullptr},
    {"KFChannelGradientWithAngle", "0A5C0B1D-4ACD-11D8-B650-000A95A6B5A8", "KFChannelGradientExtras", nullptr},
    {"KFChannelHistogramSample", "0D86A38E-3AEF-11D8-84B6-000A95AF90F2", "KFChannelFolder", nullptr},
    {"KFChannelProgress", "9DE2E4A6-6865-4D59-B31D-BEF26E4AFFAB", "KFChannel", getKFChannelProgress_FactoryBase},
    {"KFChannelScaleOverLife", "D6ECBD3C-D390-4779-9E86-CDFEDB9D798B", "KFChannelCurve", nullptr},
    {"KFChannelVertexFolder", "59BA7052-5785-11D8-A438-000A95A6EEFA", "KFChannelFolder", nullptr},
    {"KFChanObjectRef", "A9D6C74E-E570-404B-988B-098005DE0284", "KFChannel", getKFChanObjectRef_FactoryBase},
    {"KFChannelEnumInterpMode", "5170DE44-5556-43F4-ABBB-0CEFFE5A34E5", "KFChannelEnum", nullptr, false},
    {"KFChannelChrono", "490B15CE-C1DE-4BF9-88CA-9094712E0B95", "KFChannelDouble", getKFChannelChrono_FactoryBase, false},
    {"KFChannelPositionPercent3D", "05B7D25B-A163-46DA-A3FC-62017DADE833", "KFChannelPosition3D", nullptr, false},
    {"KFChannelQuadPercent", "52FA72EC-6C53-494C-8468-36E67E2DD360", "KFChannelFolder", nullptr, false},
};
// clang-format on

constexpr KFChannelFactoryRow const* findRow(std::string_view className) noexcept {
    return std::find_if(std::begin(kTable), std::end(kTable),
                        [className](KFChannelFactoryRow const& row) { return row.className == className; });
}

constexpr bool allUUIDsAreWellFormed() noexcept {
    return std::all_of(std::begin(kTable), std::end(kTable), [](KFChannelFactoryRow const& row) {
        BXUUID read;
        return BXUUID::fromText(row.uuid, &read);
    });
}
static_assert(allUUIDsAreWellFormed());

constexpr bool allSuperClassesAreListed() noexcept {
    return std::all_of(std::begin(kTable), std::end(kTable), [](KFChannelFactoryRow const& row) {
        return row.superClassName.empty() || findRow(row.superClassName) != std::end(kTable);
    });
}
static_assert(allSuperClassesAreListed());
} // namespace

BXUUID KFChannelFactoryRow::identity() const noexcept {
    BXUUID read;
    BXUUID::fromText(uuid, &read);
    return read;
}

std::span<KFChannelFactoryRow const> KFChannelFactoryTable() noexcept { return kTable; }

KFChannelFactoryRow const& KFChannelFactoryRowOf(std::string_view className) noexcept {
    return *findRow(className);
}

BXUUID KFChannelFactoryUUID(std::string_view className) noexcept {
    return className.empty() ? BXUUID() : KFChannelFactoryRowOf(className).identity();
}
