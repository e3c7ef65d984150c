// Files in gzip form (RFC 1952): read as what they hold, and made.
#pragma once

#include <cstddef>
#include <string_view>

struct gzFile_s;

namespace ingester {

class Gzip_File {
public:
    Gzip_File() = default;
    Gzip_File(const Gzip_File&) = delete;
    Gzip_File& operator=(const Gzip_File&) = delete;
    ~Gzip_File();

    /// False when the file can't be opened or isn't in gzip form.
    [[nodiscard]] bool Open(std::string_view name);

    /// Up to `count` bytes of what the file holds; fewer only at the end, or after a fault.
    [[nodiscard]] std::size_t Read(void* target, std::size_t count);

    /// False when what was read was damaged or ended too soon.
    [[nodiscard]] bool Close();

private:
    gzFile_s* stream_ = nullptr;
    bool failed_ = false;
};

/// Packs all bytes of `from` as closely as can be into the scratch file `to`. False, and no such file, when
/// either fails.
[[nodiscard]] bool Compress_File(std::string_view from, std::string_view to);

}  // namespace ingester
