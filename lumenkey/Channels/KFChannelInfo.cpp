#include "lumenkey/Channels/KFChannelInfo.h"

KFChannelInfo::KFChannelInfo(double minimum, double maximum, double coarse, double fine, double scaleFactor,
                             char const* suffixText)
    : KFChannelInfo(minimum, maximum, coarse, fine, scaleFactor, BXString(suffixText)) {}

KFChannelInfo::KFChannelInfo(double minimum, double maximum, double coarse, double fine, double scaleFactor,
                             BXString const& suffixText)
    : sliderMax(maximum), sliderMin(minimum), fineDelta(fine), coarseDelta(coarse), scale(scaleFactor),
      suffix(suffixText) {}

KFChannelInfo::KFChannelInfo(KFChannelInfo const& other) { *this = other; }

KFChannelInfo& KFChannelInfo::operator=(KFChannelInfo const& other) {
    sliderMax = other.sliderMax;
    sliderMin = other.sliderMin;
    fineDelta = other.fineDelta;
    coarseDelta = other.coarseDelta;
    scale = other.scale;
    offset = other.offset;
    suffix = other.suffix;
    sliderTransformerName = other.sliderTransformerName;
    shared = false;
    return *this;
}

KFChannelInfo::~KFChannelInfo() = default;

KFChannelInfo* KFChannelInfo::sharedOrCopied(KFChannelInfo* record) {
    return record == nullptr || record->shared ? record : new KFChannelInfo(*record);
}

bool KFChannelInfo::operator==(KFChannelInfo const& other) const noexcept {
    return sliderMax == other.sliderMax && sliderMin == other.sliderMin && fineDelta == other.fineDelta &&
           coarseDelta == other.coarseDelta && scale == other.scale && offset == other.offset &&
           suffix == other.suffix && sliderTransformerName == other.sliderTransformerName;
}

BXString const* KFChannelInfo::defaultSliderTransformerName() {
    static BXString const* const name = BXString::intern("UQSliderTransformer");
    return name;
}
