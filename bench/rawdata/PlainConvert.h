#pragma once

namespace kplib::bench {

/// The loop that a user would write; compiled with -O2.
template <typename To, typename From>
void plainConvert(To* dst, const From* src, long n);

}  // namespace kplib::bench
