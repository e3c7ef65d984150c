#include "model/calendar.h"

namespace ingester {

void Serial_To_Day_Count(double& value, double missing)
{
    if (value < 0.0) {
        value = missing;
        return;
    }
    if (value < First_True_Serial)
        value += 1.0;
    value += Serial_Offset;
}

void Day_Count_To_Serial(double& value, double missing)
{
    if (value < Serial_Offset) {
        value = missing;
        return;
    }
    value -= Serial_Offset;
    if (value < First_True_Serial)
        value -= 1.0;
}

std::int32_t Max_Date(std::int32_t form)
{
    return form == 0 ? 2958466 : 3067978;
}

}  // namespace ingester
