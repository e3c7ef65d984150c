// Layouts of transport files: records of 80 bytes, and the records that describe variables.
#pragma once

#include "support/byte_fields.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ingester {

constexpr std::size_t Sas_Record_Size = 80;

/// What every record of structure begins with, and those that are looked for.
constexpr std::string_view Sas_Header = "HEADER RECORD*******";
constexpr std::size_t Sas_Header_Compared = 40;
constexpr std::string_view Sas_Member_Header = "HEADER RECORD*******MEMBER  HEADER RECORD";
constexpr std::string_view Sas_Descriptor_Header = "HEADER RECORD*******DSCRPTR HEADER RECORD";
constexpr std::string_view Sas_Member_Header_8 = "HEADER RECORD*******MEMBV8  HEADER RECORD";
constexpr std::string_view Sas_Descriptor_Header_8 = "HEADER RECORD*******DSCPTV8 HEADER RECORD";
constexpr std::string_view Sas_Library_Header_8 = "HEADER RECORD*******LIBV8   HEADER RECORD";
constexpr std::string_view Sas_Label_Header_8 = "HEADER RECORD*******LABELV8 HEADER RECORD";
constexpr std::string_view Sas_Label_Header_9 = "HEADER RECORD*******LABELV9 HEADER RECORD";

/// Places in header records.
constexpr std::size_t Variable_Size_Place = 75;
constexpr std::size_t Variable_Count_Place = 54;
constexpr std::size_t Variable_Count_Digits = 4;
constexpr std::size_t Count_Place_8 = 48;
constexpr std::size_t Count_Digits_8 = 10;

enum Sas_Type : std::int16_t { sas_number = 1, sas_text = 2 };

/// A variable's record; `size` is that of most machines, VMS has 136.
struct Namestr_Layout {
    static constexpr std::size_t size = 140;
    static constexpr std::size_t size_on_vms = 136;
    static constexpr Big_Field<std::int16_t> ntype{0}, nhfun{2}, nlng{4}, nvar0{6};
    static constexpr std::size_t nname = 8, name_size = 8;
    static constexpr std::size_t nlabel = 16, label_size = 40, label_reach = 80;
    static constexpr std::size_t nform = 56, form_size = 8;
    static constexpr Big_Field<std::int16_t> nfl{64}, nfd{66}, nfj{68}, nfill{70};
    static constexpr std::size_t niform = 72;
    static constexpr Big_Field<std::int16_t> nifl{80}, nifd{82};
    static constexpr Big_Field<std::int32_t> npos{84};
    static constexpr std::size_t rest = 88;
    static constexpr std::size_t long_name = 88, long_name_size = 32;  ///< of version 8
};
static_assert(Namestr_Layout::npos.End() == Namestr_Layout::rest);

/// Bytes of numbers, and of texts that hosts know.
constexpr std::int32_t Least_Number_Length = 3;
constexpr std::int32_t Greatest_Number_Length = 8;
constexpr std::int32_t Longest_Sas_Text = 200;
constexpr std::int32_t Longest_Sas_Text_8 = 32767;

constexpr std::int32_t Most_Sas_Columns = 9999;

}  // namespace ingester
