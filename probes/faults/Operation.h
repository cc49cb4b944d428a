#pragma once

#include "../support/Digest.h"

#include <cstdint>
#include <span>
#include <string>

namespace kplib::probe {

/// One use of files or sockets, which gives the same outcome each time.
struct Operation {
    const char* name;
    Outcome (*run)();
    /// Makes the files that it works on; null for none.
    void (*prepare)() = nullptr;
    /// A digest of what it has written, 0 for nothing; null if it writes nothing.
    std::uint64_t (*written)() = nullptr;
    /// What the contract gives without a report if a call fails; null if each failure is reported.
    const char* silence = nullptr;
    /// What the contract says of files that a failure leaves half written; null if there are none.
    const char* partial = nullptr;
};

using Operations = std::span<const Operation>;

Operations fileOperations();
Operations folderOperations();
Operations logOperations();
Operations peerOperations();

/// A path in a folder of this process, which scripts/faults removes.
std::string pathOf(const char* name);
/// Makes a file of that content.
void put(const char* name, const std::string& content);
/// The content of a file; empty without one.
std::string contentOf(const std::string& path);
/// A digest of a file, or of names and contents below a folder; 0 without it.
std::uint64_t digestOf(const char* name);

}  // namespace kplib::probe
