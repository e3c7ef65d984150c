#include "platform/inflater.h"

#include <zlib.h>

#include <algorithm>

namespace ingester {

namespace {

constexpr std::size_t Packed_Block = std::size_t{1} << 16;

}  // namespace

void Inflater::End_Stream::operator()(z_stream_s* stream) const
{
    inflateEnd(stream);
    delete stream;
}

bool Inflater::Start()
{
    if (stream_ != nullptr)
        return true;
    packed_ = std::make_unique<unsigned char[]>(Packed_Block);
    auto stream = std::make_unique<z_stream>();
    if (inflateInit(stream.get()) != Z_OK)
        return false;
    stream_.reset(stream.release());
    return true;
}

bool Inflater::Fill(Input_File& file, std::int64_t end)
{
    const std::int64_t left = std::max<std::int64_t>(end - file.Position(), 0);
    const auto wanted = static_cast<std::size_t>(std::min<std::int64_t>(left, Packed_Block));
    stream_->next_in = packed_.get();
    stream_->avail_in = static_cast<uInt>(file.Read(packed_.get(), wanted));
    return stream_->avail_in > 0;
}

std::size_t Inflater::Read(Input_File& file, std::int64_t end, void* target, std::size_t count)
{
    if (damaged_ || !Start())
        return 0;
    stream_->next_out = static_cast<Bytef*>(target);
    stream_->avail_out = static_cast<uInt>(count);
    while (stream_->avail_out > 0 && !damaged_) {
        if (stream_->avail_in == 0 && !Fill(file, end))
            break;
        const int result = inflate(stream_.get(), Z_NO_FLUSH);
        if (result == Z_STREAM_END)
            damaged_ = inflateReset(stream_.get()) != Z_OK;
        else
            damaged_ = result != Z_OK && result != Z_BUF_ERROR;
    }
    return count - stream_->avail_out;
}

}  // namespace ingester
