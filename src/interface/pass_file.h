// The small binary files through which a host and the library meet.
#pragma once

#include "interface/status.h"
#include "platform/files.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// A pass file is read record by record; each call takes the next one.
class Pass_File {
public:
    /// The words for the faults of one record; of hosts that are told nothing they are null.
    struct Record_Words {
        const char* type_missing;
        const char* type_not_text;
        const char* length_missing;
        const char* length_invalid;
        const char* missing;
        std::size_t greatest_length;
    };
    struct Count_Words {
        const char* missing = "Number of arguments missing.\n";
        const char* wrong = "Incorrect number of arguments.\n";
    };

    explicit Pass_File(Input_File& file) : file_(file) {}

    /// The number of arguments, 2 to 6. False after a message.
    [[nodiscard]] bool Read_Count(const Count_Words& words);
    [[nodiscard]] std::int32_t Count() const { return count_; }

    /// The next text record. False after the message that `words` has for the fault.
    [[nodiscard]] bool Read_Text(const Record_Words& words, std::string& text);

private:
    Input_File& file_;
    std::int32_t count_ = 0;
};

/// What an INGESTER pass file asks for beside the request's globals, which reading it sets.
struct Pass_Request {
    std::string infile;
    std::string outfile;
    std::string secondary_scratch;  ///< local copy of a fetched secondary file
    bool secondary_failed = false;  ///< it could not be fetched: no answer is given at all
};

/// Reads a whole INGESTER pass file. False after a message.
[[nodiscard]] bool Read_Pass_File(Input_File& file, Pass_Request& asked);

/// The request id in the head of a host's carrier file; 0 when there is none.
[[nodiscard]] std::int64_t Read_Carrier_Id(std::string_view name);

/// Writes a status, of any export, and a 0. Nothing happens when the file can't be made.
void Write_Result_File(std::string_view name, std::int32_t status);

}  // namespace ingester
