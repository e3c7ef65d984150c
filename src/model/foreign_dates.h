// Dates of other programs, which count other units from other days.
#pragma once

#include "model/date_format.h"
#include "model/sheet.h"

#include <cstdint>

namespace ingester {

/// How a column of another program counts, and how it is shown here.
struct Foreign_Dates {
    std::int32_t display = day_month_year_format;  ///< a `Date_Format`
    double divisor = 1;                            ///< units a day, as 86400 for seconds
    double scale = 1;                              ///< by which numbers are multiplied instead
    double shift = 0;            ///< added to the days: the day number of the other program's day 0
    std::int32_t date_form = 1;  ///< that the result is in: 0 serials, 1 day counts
    std::int32_t decimals = -1;
};

/// Turns numbers of a foreign column into dates. What is no date then is missing, and counted.
class Date_Maker {
public:
    /// Marks `column` as one of dates; its cells may come later.
    Date_Maker(Column& column, const Foreign_Dates& dates);

    /// The date of a number; missing for a missing number, and for what lies in front of the first day of
    /// the form or behind its last.
    [[nodiscard]] double Date_Of(double number)
    {
        if (!(number > missing_))
            return missing_;
        const double date = number / dates_.divisor * dates_.scale + dates_.shift;
        if (date >= 0.0 && date < end_) [[likely]]
            return date;
        Count_Beyond(number);
        return missing_;
    }

    /// `Date_Of` for every cell that is there.
    void Change_Cells();

    /// Enters in the ledger what could not be held, and begins to count anew.
    void Note_Losses();

private:
    void Count_Beyond(double number);

    Column* column_;
    Foreign_Dates dates_;
    double missing_;
    double end_;
    std::int64_t beyond_ = 0;
    double first_beyond_ = 0;
};

/// All of it in one call: the cells that `column` has become dates, and the ledger knows those that can't.
void Make_Dates(Column& column, const Foreign_Dates& dates);

}  // namespace ingester
