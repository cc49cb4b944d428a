#pragma once

#include "../support/Digest.h"

#include <span>

namespace kplib::probe {

/// One use of the library, which gives the same outcome each time.
struct Operation {
    const char* name;
    Outcome (*run)();
    /// What the contract gives without a report if memory runs out; null if each failure is reported.
    const char* silence = nullptr;
};

using Operations = std::span<const Operation>;

Operations foundationOperations();
Operations logOperations();
Operations paramOperations();
Operations geometryOperations();
Operations systemOperations();
Operations threadsOperations();
Operations rawdataOperations();
Operations volumeOperations();
Operations numericsOperations();
Operations imagingOperations();
Operations netOperations();

}  // namespace kplib::probe
