#pragma once

#include <cstddef>

/// How often this thread has asked for memory by `new`, in a program that is linked with CountedMemory.cpp.
std::size_t allocationsOfThisThread() noexcept;
/// From then on `new` fails on this thread once so many more blocks are given; for `SIZE_MAX` it doesn't.
void refuseAllocationsAfter(std::size_t count) noexcept;
