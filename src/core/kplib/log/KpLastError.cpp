#include <kplib/log/KpLastError.h>

#include <kplib/foundation/KpThreadLocalStorage.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/log/detail/ResultTexts.h>

#include <memory>
#include <utility>

namespace {

void kpDestructError(void* error)
{
    delete static_cast<KpResult*>(error);
}

// Created by the first failure and never destroyed, since static initialisers and destructors may
// fail too.
KpThreadLocalStorage<KpResult>& kpLastError()
{
    static auto* const storage = new KpThreadLocalStorage<KpResult>(kpDestructError);
    return *storage;
}

[[maybe_unused]] const auto* const madeAtTheLatest = &kpLastError();

}  // namespace

KpResult Tm::lastError(bool keep)
{
    KpResult* const stored = kpLastError().get();
    if (!stored)
        return {};
    return keep ? *stored : std::exchange(*stored, {});
}

void Tm::setError(const KpResult& result)
{
    KpThreadLocalStorage<KpResult>& slot = kpLastError();
    if (KpResult* const stored = slot.get()) {
        *stored = result;
        return;
    }
    auto first = std::make_unique<KpResult>(result);
    slot.set(first.get());
    if (slot.get())  // the platform may have had no memory for the slot
        static_cast<void>(first.release());
}

KpResult Tm::tmError(KpResult::Code code, const char* file, unsigned int line, const char* function, const char* date,
                     const char* time, const char* data, bool verbose, bool setLastError)
{
    KpString verboseData{KpString::NoMemory()};
    if (verbose)
        data = verboseData.printf("%s%sin_function=%s\ndate=%s\ntime=%s", data ? data : "", data ? "\n" : "", function,
                                  date, time);
    KpResult result(code, static_cast<int>(line), file, kplib::detail::resultTexts(code).shortText, data);
    if (setLastError)
        setError(result);
    return result;
}

bool Tm::fail(const KpResult& result)
{
    if (result.isOk())
        return false;
    const KpString text(0, "\nFile: %s\nLine: %d\nCode: %X\nText: %s\nData: %s", result.file(), result.line(),
                        static_cast<unsigned>(result.codeValue()), result.text(), result.data());
    getTheLogInstance().errorf("%s", text.c_str());
    if (lastError(true).isOk())
        setError(result);
    result.notify();
    return true;
}

bool Tm::failWin(const KpResult& result)
{
    return fail(result);
}
