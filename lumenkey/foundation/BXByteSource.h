// Internal: not installed.
#pragma once

#include <cstdint>
#include <cstdio>
#include <memory>
#include <optional>
#include <span>
#include <string>

/// Where a document's bytes come from, one block after the other.
class BXByteSource {
public:
    virtual ~BXByteSource();

    /// Before the first read; says why it failed, nothing if it didn't.
    virtual std::string open();
    /// How many bytes were written at `out`: fewer than `size` only at the end. Nothing at a failure.
    virtual std::optional<std::size_t> read(void* out, std::size_t size) = 0;
    /// Of the reading that failed.
    virtual std::string problem() const;
};

/// Bytes in memory, which aren't owned.
class BXMemorySource final : public BXByteSource {
public:
    explicit BXMemorySource(std::span<std::uint8_t const> bytes) noexcept : _rest(bytes) {}

    std::optional<std::size_t> read(void* out, std::size_t size) override;

private:
    std::span<std::uint8_t const> _rest;
};

/// A file, which is open from `open` on.
class BXFileSource final : public BXByteSource {
public:
    explicit BXFileSource(std::string path) noexcept : _path(std::move(path)) {}

    std::string open() override;
    std::optional<std::size_t> read(void* out, std::size_t size) override;
    std::string problem() const override { return _problem; }

private:
    struct Close {
        void operator()(std::FILE* file) const noexcept { std::fclose(file); }
    };

    std::string _path;
    std::string _problem;
    std::unique_ptr<std::FILE, Close> _file;
};
