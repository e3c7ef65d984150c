// Files in gzip form (RFC 1952): read as what they hold, and made.
#pragma once

#include "platform/files.h"

#include <cstddef>
#include <memory>
#include <string_view>

struct z_stream_s;

namespace ingester {

class Gzip_File {
public:
    /// False when the file can't be opened or isn't in gzip form.
    [[nodiscard]] bool Open(std::string_view name);

    /// Up to `count` bytes of what the file holds; fewer only at the end, or after a fault.
    [[nodiscard]] std::size_t Read(void* target, std::size_t count);

    /// False when what was read was damaged or ended too soon.
    [[nodiscard]] bool Close();

private:
    struct End_Stream {
        void operator()(z_stream_s* stream) const;
    };

    [[nodiscard]] bool Fill();
    [[nodiscard]] bool Stands_At_Member();

    Input_File file_;
    std::unique_ptr<unsigned char[]> packed_;
    std::unique_ptr<z_stream_s, End_Stream> stream_;  ///< null when no file is open
    bool ended_ = false;                              ///< behind the last member
    bool failed_ = false;
};

/// Packs all bytes of `from` as closely as can be into the scratch file `to`. False, and no such file, when
/// either fails.
[[nodiscard]] bool Compress_File(std::string_view from, std::string_view to);

/// Packs all bytes of `from` into the new file `to`, quickly. False when either fails; what is written then
/// is no file in gzip form.
[[nodiscard]] bool Pack_File(std::string_view from, std::string_view to);

}  // namespace ingester
