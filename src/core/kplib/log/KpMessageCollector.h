#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// Counts messages that would otherwise be logged many times, for one report of all of them.
///
/// Slots are never removed: an index stays valid for the collector's life. One thread at a time.
class KPLIB_API KpMessageCollector {
public:
    /// A message and how often it occurred.
    struct TCountedMsg {
        TCountedMsg() = default;
        /// With that text and a count of 0.
        explicit TCountedMsg(const KpString& text) : message(text) {}
        /// @{
        /// Copies text and count.
        TCountedMsg(const TCountedMsg&) = default;
        TCountedMsg& operator=(const TCountedMsg&) = default;
        /// @}

        virtual ~TCountedMsg() = default;

        /// The text.
        KpString message;
        /// How often it was counted.
        int count = 0;
    };

    KpMessageCollector() = default;
    /// @{
    /// Copies all slots.
    KpMessageCollector(const KpMessageCollector&) = default;
    KpMessageCollector& operator=(const KpMessageCollector&) = default;
    /// @}

    virtual ~KpMessageCollector();

    /// Adds a slot with count 0 and returns its index.
    long addMessageSlot(const KpString& message);
    /// Counts one more occurrence of the message of `slot`; ignores an invalid index.
    void countMessage(long slot)
    {
        if (slot >= 0 && slot < slots_.size())
            ++slots_[slot].count;
    }
    /// Appends a line "message (n times)" for each slot with a count above 0, in order, and
    /// returns whether there was one. With `reset` all counts are 0 afterwards.
    bool generateReport(KpString& report, bool reset);
    /// Sets the count of `slot` to 0, with -1 of all slots.
    void resetSlotCounter(long slot);

    /// All slots in the order of their addition.
    const KpDArray<TCountedMsg>& slots() const { return slots_; }

private:
    KpDArray<TCountedMsg> slots_;
};
