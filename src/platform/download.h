// Files of other machines.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// What a download may cost at the most.
struct Download_Limits {
    long connect_seconds = 30;
    long total_seconds = 1800;
    std::uint64_t bytes = 0;
};

/// Copies what an ftp, http, https or file URL names into a scratch file. Blanks in it are sent escaped. At
/// most ten redirections are followed, and none from the network to a local file. False when the copy isn't
/// complete; it is gone then.
[[nodiscard]] bool Download(const std::string& url, std::string_view scratch_name,
                            const Download_Limits& limits);

}  // namespace ingester
