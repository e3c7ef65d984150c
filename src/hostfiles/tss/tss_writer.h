// What the steps of the writer hand to each other.
#pragma once

#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/shared/host_text.h"
#include "hostfiles/tss/tss_format.h"
#include "platform/files.h"

#include <cstdint>
#include <string_view>

namespace ingester {

/// The stream that the file is written to.
class TSS_Sink {
public:
    explicit TSS_Sink(Output_File& file) : file_(&file) {}

    [[nodiscard]] bool Failed() const { return file_->Failed(); }

    void Put(std::int32_t value) { file_->Write_Little(value); }
    void Put(double value) { file_->Write_Little(value); }
    void Put_Bytes(std::string_view bytes) { file_->Write(bytes); }
    void Put_Text(std::string_view text)
    {
        text = texts_.In_File(text);
        Put(static_cast<std::int32_t>(text.size()));
        Put_Bytes(text);
    }
    [[nodiscard]] Host_Text_Out& Texts() { return texts_; }
    template <class Record, class... Fields>
    void Put(const Record& record, const std::tuple<Fields...>& layout)
    {
        std::apply([&](const auto&... field) { (Put(record.*field.member), ...); }, layout);
    }

private:
    Output_File* file_;
    Host_Text_Out texts_;
};

/// A name, made up when it is empty: the reader refuses an empty one.
[[nodiscard]] std::string_view Name_For_File(Fixed_Text<Name_Width>& name);

/// Writes the record of a column.
void Write_TSS_Column(Column& column, TSS_Sink& sink);

/// The bits of the head, for the records that `Write_Auxiliary_Records` will write.
[[nodiscard]] std::uint32_t Present_Flags_Of(const Sheet& sheet);

void Write_Auxiliary_Records(Sheet& sheet, TSS_Sink& sink);

}  // namespace ingester
