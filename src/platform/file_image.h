// The bytes of a whole file in memory, to be changed at will without changing the file.
#pragma once

#include "platform/files.h"

#include <cstddef>
#include <memory>
#include <string_view>

namespace ingester {

/// A regular file is mapped, anything else is read. Behind the bytes stand `slack` more that may be
/// read and written. A file that loses bytes while it is mapped reads as zeros from there, and
/// `Changed` tells.
class File_Image {
public:
    static constexpr std::size_t slack = 8198;

    File_Image() = default;
    File_Image(const File_Image&) = delete;
    File_Image& operator=(const File_Image&) = delete;
    ~File_Image();

    /// Takes the rest of an open file. False when it can't be read, or when there is no room.
    [[nodiscard]] bool Load(Input_File& file);

    /// Holds `bytes`, which may be its own, from now on. False when there is no room: it is as it was then.
    [[nodiscard]] bool Replace(std::string_view bytes);

    [[nodiscard]] char* Bytes() const { return bytes_; }
    [[nodiscard]] std::size_t Size() const { return size_; }
    [[nodiscard]] bool Changed() const;

    /// The bytes in front of `at` are not needed for now: where they can be had from the file again,
    /// their memory goes. Not for bytes that have been written to.
    void Release_Before(const char* at);

private:
    [[nodiscard]] bool Map(const Input_File& file);
    [[nodiscard]] bool Read_All(Input_File& file);
    void Free();

    char* bytes_ = nullptr;
    std::size_t size_ = 0;
    std::size_t mapped_ = 0;    ///< length of the mapping; 0: the bytes came from malloc
    std::size_t released_ = 0;  ///< bytes given back so far
    bool changed_ = false;      ///< an earlier mapping lost bytes
};

}  // namespace ingester
