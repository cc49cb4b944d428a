#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// Counts messages that would otherwise be repeated many times, for one report of all of them.
///
/// Slots are never removed: an index stays valid for the collector's life. One thread at a time.
class KPLIB_API KpMessageCollector {
public:
    struct TCountedMsg {
        TCountedMsg() = default;
        explicit TCountedMsg(const KpString& text) : message(text) {}
        TCountedMsg(const TCountedMsg&) = default;
        TCountedMsg& operator=(const TCountedMsg&) = default;
        virtual ~TCountedMsg() = default;

        KpString message;
        int count = 0;
    };

    KpMessageCollector() = default;
    KpMessageCollector(const KpMessageCollector&) = default;
    KpMessageCollector& operator=(const KpMessageCollector&) = default;
    virtual ~KpMessageCollector();

    /// A new slot with count 0; gives its index.
    long addMessageSlot(const KpString& message);
    /// One more occurrence of the message of `slot`; nothing for an index that isn't one.
    void countMessage(long slot)
    {
        if (slot >= 0 && slot < slots_.size())
            ++slots_[slot].count;
    }
    /// Appends a line "message (n times)" for each slot with a count above 0, in order, and tells whether there was
    /// one. With `reset` all counts are 0 afterwards.
    bool generateReport(KpString& report, bool reset);
    /// Sets the count of `slot` to 0, with -1 of all slots.
    void resetSlotCounter(long slot);

    const KpDArray<TCountedMsg>& slots() const { return slots_; }

private:
    KpDArray<TCountedMsg> slots_;
};
