// What a slider shows of a channel.

#include "lumenkey/Channels/KFChannel.h"
#include "lumenkey/Channels/KFChannelInfo.h"

double KFChannel::getSliderMin() const { return _info->sliderMin; }
double KFChannel::getSliderMax() const { return _info->sliderMax; }
double KFChannel::getCoarseDelta() const { return _info->coarseDelta; }
double KFChannel::getFineDelta() const { return _info->fineDelta; }
double KFChannel::getScale() const { return _info->scale; }
double KFChannel::getOffset() const { return _info->offset; }
BXString const& KFChannel::getSuffix() const { return _info->suffix; }
char const* KFChannel::getSliderTransformerName() const { return _info->sliderTransformerName->c_str(); }

void KFChannel::setInfoNumber(double KFChannelInfo::*field, double value) {
    if (!isSame(_info->*field, value))
        createLocalChannelInfo()->*field = value;
}

void KFChannel::setSliderMax(double value) { setInfoNumber(&KFChannelInfo::sliderMax, value); }
void KFChannel::setSliderMin(double value) { setInfoNumber(&KFChannelInfo::sliderMin, value); }
void KFChannel::setCoarseDelta(double value) { setInfoNumber(&KFChannelInfo::coarseDelta, value); }
void KFChannel::setFineDelta(double value) { setInfoNumber(&KFChannelInfo::fineDelta, value); }
void KFChannel::setScale(double value) { setInfoNumber(&KFChannelInfo::scale, value); }
void KFChannel::setOffset(double value) { setInfoNumber(&KFChannelInfo::offset, value); }

void KFChannel::setSuffix(BXString const& suffix) {
    if (_info->suffix.compare(suffix) != 0)
        createLocalChannelInfo()->suffix = suffix;
}

void KFChannel::setSuffix(char const* suffix) { setSuffix(BXString(suffix)); }

void KFChannel::setSliderTransformerName(char const* name) {
    BXString const* const wanted =
        name == nullptr ? KFChannelInfo::defaultSliderTransformerName() : BXString::intern(name);
    if (wanted != _info->sliderTransformerName)
        createLocalChannelInfo()->sliderTransformerName = wanted;
}
