#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// The machine's memory and processes, read anew by each call.
class KPLIB_API KpSysInfo {
public:
    /// A running process.
    struct ProcessEntry {
        KpString name;  ///< the first word of the command
        /// Its id.
        long long processId = 0;
        KpString command;  ///< the same text
    };

    /// Bytes of physical memory; 0 if unknown.
    static unsigned long long physmem_total();
    /// Bytes available to processes, limited to 32 bits; a quarter of the total if unknown.
    static unsigned int physmem_available();
    /// Both are the total physical memory.
    static unsigned long long virtualmem_total() { return physmem_total(); }
    /// As above.
    static unsigned long long virtualmem_available() { return physmem_total(); }

    /// Replaces `list` by all processes, read by the command "ps". Returns false if it cannot be
    /// started.
    static bool process_list(KpDArray<ProcessEntry>& list);
};
