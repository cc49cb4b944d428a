#pragma once

namespace kplib::detail {

// What a code of KpResult says by itself; null where it has no such text.
struct ResultTexts {
    const char* shortText;
    const char* defaultData;
};
ResultTexts resultTexts(int code);

}  // namespace kplib::detail
