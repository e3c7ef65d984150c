#include "statfiles/sas/sas_transport_members.h"

#include "request/messages.h"
#include "request/people_rules.h"
#include "request/request.h"
#include "statfiles/sas/sas_format.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <string_view>

namespace ingester {

namespace {

constexpr std::size_t Records_Per_Block = 4096;

/// Walks through the records of a file from its place on.
class Record_Walk {
public:
    explicit Record_Walk(Input_File& file) : file_(file), block_(Records_Per_Block * Sas_Record_Size) {}

    /// The next record, or what there is of it at the end of the file; empty behind it.
    [[nodiscard]] std::string_view Next()
    {
        if (at_ == length_) {
            at_ = 0;
            length_ = file_.Read(block_.data(), block_.size());
        }
        const std::string_view record(block_.data() + at_, std::min(Sas_Record_Size, length_ - at_));
        at_ += record.size();
        offset_ += static_cast<std::int64_t>(record.size());
        return record;
    }

    /// Bytes from where it began up to behind the record that came last.
    [[nodiscard]] std::int64_t Offset() const { return offset_; }

private:
    Input_File& file_;
    std::vector<char> block_;
    std::size_t at_ = 0;
    std::size_t length_ = 0;
    std::int64_t offset_ = 0;
};

bool Has_Header(std::string_view record, std::string_view header, std::string_view header_8)
{
    const auto begins_with = [record](std::string_view wanted) {
        return record.starts_with(wanted.substr(0, Sas_Header_Compared));
    };
    return begins_with(header) || (For_People(People_Rule::further_types) && begins_with(header_8));
}

std::string Member_Name(std::string_view record)
{
    constexpr std::size_t place = 3;
    constexpr std::size_t reach = 77;
    std::string_view name = Trim_Copy(record.substr(std::min(place, record.size()), reach));
    name = name.substr(0, name.find(' '));
    if (const std::size_t mark = name.find("SASDATA"); mark != 0)
        name = name.substr(0, mark);
    return std::string(name);
}

bool Has_File_Head(Record_Walk& walk)
{
    constexpr std::size_t second_mark = 8;
    if (!walk.Next().starts_with(Sas_Header))
        return false;
    const std::string_view record = walk.Next();
    return record.size() == Sas_Record_Size && record.starts_with("SAS")
           && record.substr(second_mark).starts_with("SAS") && !walk.Next().empty();
}

/// The request's number of a member, from 1; 0 for what is none.
std::size_t Number_Of(std::string_view wanted, std::size_t count)
{
    const long number = Leading_Integer(wanted);
    const bool exact = number > 0 && std::to_string(number) == wanted;
    return exact && static_cast<std::size_t>(number) <= count ? static_cast<std::size_t>(number) : 0;
}

/// The member whose name shares the longest start with what is wanted; the first of equals, but for one that
/// is equal. False where none shares any.
bool Find_By_Start(const std::vector<Sas_Member>& members, std::string_view wanted, std::size_t& chosen)
{
    std::size_t longest = 0;
    for (std::size_t i = 0; i < members.size(); ++i) {
        const std::string_view name = members[i].name;
        const std::size_t most = std::min(name.size(), wanted.size());
        std::size_t shared = 0;
        while (shared < most && To_Upper(name[shared]) == To_Upper(wanted[shared]))
            ++shared;
        const bool equal = Equal_Ignoring_Case(name, wanted);
        if (shared > longest || equal) {
            longest = shared;
            chosen = i;
        }
        if (equal)
            break;
    }
    return longest > 0;
}

}  // namespace

bool Find_Sas_Members(Input_File& file, std::vector<Sas_Member>& members)
{
    Record_Walk walk(file);
    if (!Has_File_Head(walk))
        return Fail("The file is not a SAS transport file.\n");
    bool behind_header = false;
    for (std::string_view record = walk.Next(); !record.empty(); record = walk.Next()) {
        const std::int64_t offset = walk.Offset() - static_cast<std::int64_t>(2 * Sas_Record_Size);
        if (behind_header && Has_Header(record, Sas_Descriptor_Header, Sas_Descriptor_Header_8))
            members.push_back({offset, Member_Name(walk.Next())});
        behind_header = Has_Header(record, Sas_Member_Header, Sas_Member_Header_8);
    }
    if (file.Failed())
        return Fail_To_Read(file.Name());
    return !members.empty() || Fail("The file is not a SAS transport file.\n");
}

bool Choose_Sas_Member(const std::vector<Sas_Member>& members, std::size_t& chosen)
{
    const std::string wanted(request.Worksheet_Name.view());
    chosen = 0;
    if (members.size() < 2 || wanted.empty())
        return true;
    bool exact = true;
    if (const std::size_t number = Number_Of(wanted, members.size()); number > 0)
        chosen = number - 1;
    else if (!Find_By_Start(members, wanted, chosen))
        return Fail("Specifed sheet name not found in SAS Transport file.\n");
    else
        exact = Equal_Ignoring_Case(members[chosen].name, wanted);
    if (!exact)
        Fail("Warning: inexact match on sheet name: '%.100s' selected for '%.100s'.\n",
             members[chosen].name.c_str(), wanted.c_str());
    request.Sheet_Name_Was_Exact = exact;
    request.Worksheet_Name = request.Used_Sheet_Name = members[chosen].name;
    return true;
}

std::int64_t Next_Sas_Header(Input_File& file)
{
    const std::int64_t start = file.Position();
    Record_Walk walk(file);
    std::string_view record = walk.Next();
    while (!record.empty() && !record.starts_with(Sas_Header))
        record = walk.Next();
    return start + walk.Offset() - static_cast<std::int64_t>(record.size());
}

}  // namespace ingester
