// What the fuzz targets share. A target is a row of fuzz/CMakeLists.txt.
#pragma once

#include "platform/files.h"

#include <cstddef>
#include <span>
#include <string_view>

namespace ingester {

/// An in-memory reader.
using Fuzz_Entry = bool (*)(Input_File& file);

/// Sets options of the fresh request from the head of `bytes`, cuts that head off, and gives the
/// name the reader is to see.
using Fuzz_Prepare = std::string_view (*)(std::span<const std::byte>& bytes);

/// Takes all bytes as the file's.
std::string_view Prepare_Nothing(std::span<const std::byte>& bytes);

/// Options of delimited text: eight characters, digits and a line end in the seeds. In order: the
/// file's name, names or none, lines a record, separators, missing text, lines of the file, texts
/// where reading begins and ends (with lines to skip), and one for the eye.
std::string_view Prepare_Text(std::span<const std::byte>& bytes);

/// Makes a scratch folder the temporary one.
void Start_Fuzzing();

/// Runs one input through `entry`, and aborts when the Sheet it leaves is not whole.
void Fuzz_Reader(Fuzz_Entry entry, Fuzz_Prepare prepare, std::span<const std::byte> bytes);

}  // namespace ingester
