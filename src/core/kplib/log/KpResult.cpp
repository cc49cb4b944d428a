#include <kplib/log/KpResult.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/log/detail/ResultTexts.h>

namespace {

// Never destroyed, as static destructors may still fail.
KpDArray<KpResult::NotificationCallback>& callbacks()
{
    static auto* const list = new KpDArray<KpResult::NotificationCallback>;
    return *list;
}

const char* dataOrDefault(const char* data, int code)
{
    return data && *data ? data : kplib::detail::resultTexts(code).defaultData;
}

}  // namespace

KpResult::Error::Error(Code code, int line, const char* file, const char* text, const char* data) :
    code_(code), line_(line), file_(file), text_(text), data_(dataOrDefault(data, code))
{
    trace();
}

KpResult::Error::~Error() = default;

void KpResult::Error::trace() const
{
    getTheLogInstance().tracef(KpLogDebug, "KpResult::Error", "code: %X file: %s line: %d message: %s data: %s",
                               static_cast<unsigned>(code_), file_.c_str(), line_, text_.c_str(), data_.c_str());
}

void KpResult::setError(Code code, int line, const char* file, const char* text, const char* data)
{
    error_ = new Error(code, line, file, text, data);
}

void KpResult::notify() const
{
    if (isOk())
        return;
    const auto& list = callbacks();
    for (long i = list.size() - 1; i >= 0; --i) {
        if (i < list.size() && list[i](*this))  // a callback may shorten the list
            return;
    }
}

void KpResult::notificationCallbackAdd(NotificationCallback callback)
{
    callbacks().reserveOne();
    callbacks().append(callback);
}

void KpResult::notificationCallbackRemove(NotificationCallback callback)
{
    auto& list = callbacks();
    for (long i = list.size() - 1; i >= 0; --i) {
        if (list[i] == callback) {
            list.remove(i);
            return;
        }
    }
}

void KpResult::notificationCallbackRemoveAll()
{
    callbacks().clear();
}
