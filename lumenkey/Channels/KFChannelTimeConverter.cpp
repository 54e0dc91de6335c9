#include "lumenkey/Channels/KFChannelTimeConverter.h"

namespace {

constinit thread_local unsigned int livingSentries = 0;

} // namespace

KFChannelTimeConverter::~KFChannelTimeConverter() = default;

bool KFChannelTimeConverter::IsEnabledForCurrentThread() noexcept { return livingSentries == 0; }

KFChannelTimeConverterDisableSentry::KFChannelTimeConverterDisableSentry() noexcept { ++livingSentries; }

KFChannelTimeConverterDisableSentry::~KFChannelTimeConverterDisableSentry() { --livingSentries; }
