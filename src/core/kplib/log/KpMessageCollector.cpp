#include <kplib/log/KpMessageCollector.h>

KpMessageCollector::~KpMessageCollector() = default;

long KpMessageCollector::addMessageSlot(const KpString& message)
{
    const TCountedMsg slot(message);  // before the growth: the message may be that of a slot
    slots_.reserveOne();
    slots_.append(slot);
    return slots_.size() - 1;
}

bool KpMessageCollector::generateReport(KpString& report, bool reset)
{
    bool isAny = false;
    for (const TCountedMsg& slot : slots_) {
        if (slot.count > 0) {
            report += KpString(0, "%s (%d times)\n", slot.message.c_str(), slot.count);
            isAny = true;
        }
    }
    if (reset)
        resetSlotCounter(-1);
    return isAny;
}

void KpMessageCollector::resetSlotCounter(long slot)
{
    for (long i = 0; i < slots_.size(); ++i) {
        if (slot == -1 || slot == i)
            slots_[i].count = 0;
    }
}
