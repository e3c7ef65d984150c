// Layouts of system files: the head, and the records of the dictionary. All numbers are in the file's order.
#pragma once

#include <bit>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <tuple>

namespace ingester {

constexpr std::string_view Spss_Magic = "$FL2";
constexpr std::string_view Spss_Packed_Magic = "$FL3";
constexpr std::size_t Spss_Magic_Length = 4;
constexpr std::size_t Spss_Product_Length = 60;
constexpr std::string_view Spss_Product = "@(#) SPSS DATA FILE";
constexpr std::int64_t Spss_Head_Rest = 84;  ///< date, time, label of the file and padding

struct Spss_Head {
    std::int32_t slots = 0;
    std::int32_t compression = 0;
    std::int32_t weight_slot = 0;  ///< from 1; 0: no weights
    std::int32_t cases = 0;        ///< below 0: not counted
    double bias = 0;
};

constexpr std::tuple Spss_Head_Fields(&Spss_Head::slots, &Spss_Head::compression, &Spss_Head::weight_slot,
                                      &Spss_Head::cases, &Spss_Head::bias);

/// What `compression` says.
enum Spss_Compression : std::int32_t { plain_cases = 0, coded_cases = 1, packed_cases = 2 };

enum Spss_Record : std::int32_t {
    variable_record = 2,
    labels_record = 3,
    labelled_variables_record = 4,
    document_record = 6,
    extension_record = 7,
    dictionary_end = 999,
};

struct Spss_Variable_Record {
    std::int32_t type = 0;  ///< 0 a number, above the length of a text, -1 a further slot of one
    std::int32_t has_label = 0;
    std::int32_t missing_count = 0;  ///< -2 a range, -3 a range and a value
    std::int32_t print_format = 0;
    std::int32_t write_format = 0;
};

constexpr std::tuple Spss_Variable_Fields(&Spss_Variable_Record::type, &Spss_Variable_Record::has_label,
                                          &Spss_Variable_Record::missing_count,
                                          &Spss_Variable_Record::print_format,
                                          &Spss_Variable_Record::write_format);

constexpr std::int32_t Further_Slot = -1;
constexpr std::size_t Slot_Size = 8;
constexpr std::size_t Short_Spss_Name = 8;
constexpr std::int64_t Document_Line = 80;

/// Extensions that are looked at.
enum Spss_Extension : std::int32_t {
    numbers_extension = 3,  ///< of the machine and the code of letters
    long_names_extension = 13,
    very_long_texts_extension = 14,
    code_extension = 20,
    text_labels_extension = 21,
    missing_texts_extension = 22,
};

/// Place of the code page among the numbers of extension 3.
constexpr std::size_t Code_Page_Place = 7;

/// A very long text lies in variables of this length; the last one is as long as what is left.
constexpr std::int32_t Bytes_Per_Segment = 252;

/// Control bytes of coded cases.
enum Case_Code : std::uint8_t {
    passed_over = 0,
    last_number = 251,  ///< from 1: the number less the bias
    end_of_cases = 252,
    literal_follows = 253,
    eight_blanks = 254,
    system_missing = 255,
};
constexpr std::uint64_t System_Missing_Bits = 0xFFEFFFFFFFFFFFFF;
constexpr std::size_t Controls_Per_Block = 8;

}  // namespace ingester
