#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

// What is fed with arbitrary bytes. Each ends the process where something is wrong: a promise that was
// broken, or what a sanitizer finds.

using FuzzBytes = std::span<std::uint8_t const>;

/// A document read into an empty tree. What came in is written, read and written again: the second and the
/// third writing agree.
void fuzzDocument(FuzzBytes bytes);
/// A state read into a tree in use, which then still answers, reads itself, edits, and has a digest.
void fuzzState(FuzzBytes bytes);
/// A motion capture, and the tree that it becomes.
void fuzzMotion(FuzzBytes bytes);
/// A table of values over time, likewise.
void fuzzCsv(FuzzBytes bytes);
/// A path of IDs, as text and as stored bytes.
void fuzzPath(FuzzBytes bytes);

struct FuzzTarget {
    std::string_view name;
    void (*run)(FuzzBytes);
};
inline constexpr FuzzTarget kFuzzTargets[] = {
    {"document", fuzzDocument}, {"state", fuzzState}, {"motion", fuzzMotion},
    {"csv", fuzzCsv},           {"path", fuzzPath},
};
