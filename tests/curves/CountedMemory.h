#pragma once

#include <cstddef>

/// How often this thread has asked for memory by `new`, in a program that is linked with CountedMemory.cpp.
std::size_t allocationsOfThisThread() noexcept;
