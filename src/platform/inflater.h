// Streams in zlib form (RFC 1950) that lie one behind the other in a part of a file.
#pragma once

#include "platform/files.h"

#include <cstddef>
#include <cstdint>
#include <memory>

struct z_stream_s;

namespace ingester {

class Inflater {
public:
    /// Up to `count` bytes of what the streams from the file's place to `end` hold; fewer only at the end, or
    /// where a stream is damaged.
    [[nodiscard]] std::size_t Read(Input_File& file, std::int64_t end, void* target, std::size_t count);

    /// Whether a stream could not be inflated; what it held in front of the damage has been read.
    [[nodiscard]] bool Is_Damaged() const { return damaged_; }

private:
    struct End_Stream {
        void operator()(z_stream_s* stream) const;
    };
    [[nodiscard]] bool Start();
    [[nodiscard]] bool Fill(Input_File& file, std::int64_t end);

    std::unique_ptr<unsigned char[]> packed_;
    std::unique_ptr<z_stream_s, End_Stream> stream_;
    bool damaged_ = false;
};

}  // namespace ingester
