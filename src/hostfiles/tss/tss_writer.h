// What the steps of the writer hand to each other.
#pragma once

#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/shared/host_text.h"
#include "hostfiles/tss/tss_format.h"
#include "platform/field_sink.h"

#include <cstdint>
#include <string_view>
#include <tuple>

namespace ingester {

/// The stream that the file is written to.
class TSS_Sink : public Field_Sink {
public:
    using Field_Sink::Field_Sink;
    using Field_Sink::Put;

    void Put_Text(std::string_view text) { Field_Sink::Put_Text(texts_.Cross(text)); }
    [[nodiscard]] Host_Text_Out& Texts() { return texts_; }

    template <class Record, class... Fields>
    void Put(const Record& record, const std::tuple<Fields...>& layout)
    {
        std::apply([&](const auto&... field) { (Put(record.*field.member), ...); }, layout);
    }

private:
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
