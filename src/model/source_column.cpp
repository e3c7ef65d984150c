#include "model/source_column.h"

#include "model/names.h"
#include "request/request.h"

namespace ingester {

Column* Find_Source_Column(const Sheet* sheet, std::string_view name)
{
    Column* const found = Find_Column(sheet, name);
    return found != nullptr ? found : Find_Column(sheet, Make_Valid_Name(name));
}

bool Add_Source_Column(Sheet* sheet)
{
    if (sheet == nullptr || request.Merge_Key.empty()
        || Find_Source_Column(sheet, request.Merge_Key) != nullptr)
        return sheet != nullptr;
    Text_Arena texts;
    Level_Node label{};
    Column_Request wanted{factor_column, request.Merge_Key, -1, 1, "1"};
    if (!request.Merge_With.empty()) {
        label.value.text = texts.Store(request.Merge_With);
        wanted.labels = &label;
        wanted.label_count = 1;
        if (sheet->type == vector_sheet)
            wanted.fill = request.Merge_With;  // elsewhere numbers stand for the labels
    }
    return Add_Column(sheet, wanted, sheet->column_count + 1, true) != nullptr;
}

}  // namespace ingester
