#pragma once

namespace kplib::detail {

// The text of a code of KpResult by itself; null if it has none.
struct ResultTexts {
    const char* shortText;
    const char* defaultData;
};
ResultTexts resultTexts(int code);

}  // namespace kplib::detail
