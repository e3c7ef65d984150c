#include "platform/gzip_file.h"

#include "platform/refusals.h"

#include <algorithm>
#include <cstdlib>

#include <zlib.h>

namespace ingester {

namespace {

constexpr std::size_t Block_Size = std::size_t{1} << 18;

/// The greatest window, in gzip's wrapping.
constexpr int Gzip_Window = 15 + 16;

void* Take_Block(void*, unsigned count, unsigned size)
{
    return Take_Memory(nullptr, std::size_t{count} * size);
}

void Give_Back(void*, void* block)
{
    std::free(block);
}

z_stream New_Stream()
{
    z_stream stream{};
    stream.zalloc = Take_Block;
    stream.zfree = Give_Back;
    return stream;
}

}  // namespace

void Gzip_File::End_Stream::operator()(z_stream_s* stream) const
{
    inflateEnd(stream);
    delete stream;
}

bool Gzip_File::Open(std::string_view name)
{
    ended_ = failed_ = false;
    stream_.reset();
    packed_ = std::make_unique_for_overwrite<unsigned char[]>(Block_Size);
    auto stream = std::make_unique<z_stream>(New_Stream());
    if (!file_.Open(name) || inflateInit2(stream.get(), Gzip_Window) != Z_OK)
        return false;
    stream_.reset(stream.release());
    return Stands_At_Member();
}

/// Takes more of the file behind what is there already. False when there is no more.
bool Gzip_File::Fill()
{
    std::copy_n(stream_->next_in, stream_->avail_in, packed_.get());
    stream_->next_in = packed_.get();
    const std::size_t got = file_.Read(packed_.get() + stream_->avail_in, Block_Size - stream_->avail_in);
    stream_->avail_in += static_cast<unsigned>(got);
    return got > 0;
}

bool Gzip_File::Stands_At_Member()
{
    if (stream_->avail_in < 2)
        static_cast<void>(Fill());
    return stream_->avail_in >= 2 && stream_->next_in[0] == 0x1F && stream_->next_in[1] == 0x8B;
}

std::size_t Gzip_File::Read(void* target, std::size_t count)
{
    constexpr std::size_t greatest_part = std::size_t{1} << 30;
    std::size_t done = 0;
    while (stream_ != nullptr && done < count && !ended_ && !failed_) {
        if (stream_->avail_in == 0 && !Fill()) {
            failed_ = true;
            break;
        }
        const auto part = static_cast<unsigned>(std::min(count - done, greatest_part));
        stream_->next_out = static_cast<unsigned char*>(target) + done;
        stream_->avail_out = part;
        const int answer = inflate(stream_.get(), Z_NO_FLUSH);
        done += part - stream_->avail_out;
        failed_ = answer != Z_OK && answer != Z_STREAM_END;
        // Members follow each other; what else stands behind the last one is padding.
        if (answer == Z_STREAM_END) {
            ended_ = !Stands_At_Member();
            failed_ = inflateReset(stream_.get()) != Z_OK;
        }
    }
    return done;
}

bool Gzip_File::Close()
{
    const bool good = stream_ != nullptr && !failed_;
    stream_.reset();
    return file_.Close() && good;
}

namespace {

bool Deflate(Input_File& source, z_stream& stream, Output_File& target)
{
    const auto plain = std::make_unique_for_overwrite<unsigned char[]>(Block_Size);
    const auto packed = std::make_unique_for_overwrite<unsigned char[]>(Block_Size);
    for (int flush = Z_NO_FLUSH; flush != Z_FINISH && !target.Failed();) {
        const std::size_t got = source.Read(plain.get(), Block_Size);
        flush = got < Block_Size ? Z_FINISH : Z_NO_FLUSH;
        stream.next_in = plain.get();
        stream.avail_in = static_cast<unsigned>(got);
        do {
            stream.next_out = packed.get();
            stream.avail_out = static_cast<unsigned>(Block_Size);
            deflate(&stream, flush);
            target.Write(packed.get(), Block_Size - stream.avail_out);
        } while (stream.avail_out == 0);
    }
    return !source.Failed();
}

bool Deflate_Into(Output_File& target, std::string_view from, int level)
{
    constexpr int usual_memory = 8;
    const auto end = [](z_stream* stream) { deflateEnd(stream); };
    z_stream stream = New_Stream();
    if (deflateInit2(&stream, level, Z_DEFLATED, Gzip_Window, usual_memory, Z_DEFAULT_STRATEGY) != Z_OK)
        return false;
    const std::unique_ptr<z_stream, decltype(end)> ending(&stream, end);
    Input_File source;
    return source.Open(from) && Deflate(source, stream, target) && target.Close();
}

}  // namespace

bool Compress_File(std::string_view from, std::string_view to)
{
    Scratch_File scratch{std::string(to)};
    Output_File target;
    if (!target.Open_Scratch(to) || !Deflate_Into(target, from, Z_BEST_COMPRESSION))
        return false;
    scratch.Keep();
    return true;
}

bool Pack_File(std::string_view from, std::string_view to)
{
    Output_File target;
    return target.Open(to) && Deflate_Into(target, from, Z_DEFAULT_COMPRESSION);
}

}  // namespace ingester
