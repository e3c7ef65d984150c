// One line on the terminal that says how far long work is.
#pragma once

namespace ingester {

/// Shows the progress of work while it lives, when asked to and when standard error is a terminal.
/// Work that is done within a second shows nothing. The line is gone afterwards. One at a time.
class Progress_Line {
public:
    explicit Progress_Line(bool wanted);
    Progress_Line(const Progress_Line&) = delete;
    Progress_Line& operator=(const Progress_Line&) = delete;
    ~Progress_Line();
};

}  // namespace ingester
