#include <kplib/system/KpDSO.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/platform/Platform.h>
#include <kplib/system/KpFilename.h>

#include <cstring>
#include <dlfcn.h>
#include <string>

// Intentional: the log takes the first text of each call as its format, so it shows only "DSO" of
// most of them.
#pragma GCC diagnostic ignored "-Wformat-extra-args"

KpDArray<char*> KpDSO::dsoSearchPath;
int KpDSO::verbose = 0;

struct KpDSO::Private {
    void* handle = nullptr;
};

namespace {

void tell(const char* format, const char* text)
{
    getTheLogInstance().printf("DSO", format, text);
}

}  // namespace

KpDSO::KpDSO(const char* name) : private_(std::make_unique<Private>())
{
    if (name)
        open(name, false);
}

KpDSO::~KpDSO() = default;

void KpDSO::close()
{
    private_->handle = nullptr;
}

bool KpDSO::isOpen() const
{
    return private_->handle != nullptr;
}

void KpDSO::fixPath(KpFilename& name)
{
    if (!std::strchr(name, '.')) {
        if (name.isRelative() && std::strncmp(name, "lib", 3) != 0)
            name = KpString("lib") + name.c_str();
        name += ".so";
    }
    name.replaceSubStr(".so", kplib::platform::sharedObjectSuffix());
}

int KpDSO::tryOpen(const char* path, KpString& message)
{
    private_->handle = dlopen(path, RTLD_LAZY | RTLD_GLOBAL);
    if (isOpen())
        message.printf("Successfully opened %s.\n", path);
    else
        message.printf("Couldn't open %s:\n%s\n", path, dlerror());
    return isOpen() ? 0 : -1;
}

int KpDSO::open(const char* name, bool quiet)
{
    close();
    if (!name)
        return -1;
    KpFilename fixed(name);
    fixPath(fixed);
    KpString messages;
    const int result = load(fixed, messages);
    if (!quiet && (verbose != 0 || !isOpen()))
        tell("%s\n", messages);
    if (isOpen())
        initPackage(fixed);
    return result;
}

int KpDSO::load(const KpFilename& name, KpString& messages)
{
    int result = -1;
    const auto attempt = [&](const KpFilename& path, bool isFile) {
        KpString message;
        result = tryOpen(path, message);
        if (result != 0 && isFile && !path.doesExist())
            message.printf("Couldn't open %s:\nFile does not exist.\n", path.c_str());
        messages += message;
    };
    if (!name.isRelative()) {
        attempt(name, true);
        return result;
    }
    for (long i = dsoSearchPath.size() - 1; i >= 0 && !isOpen(); --i)
        attempt(KpString(0, "%s/%s", dsoSearchPath[i], name.c_str()), true);
    if (!isOpen())
        attempt(name, false);
    return result;
}

void KpDSO::initPackage(const KpFilename& name) const
{
    std::string package = name.basename();
    package.erase(0, 3);  // the prefix "lib", which is not checked
    package = package.substr(0, package.rfind('.'));
    call<void>(KpString(0, "orlinpackage_%s_init", package.c_str()));
}

void* KpDSO::getSymbol(const char* name) const
{
    if (!isOpen() || !name)
        return nullptr;
    if (verbose != 0)
        tell("KpDSO::getSymbol(%s)\n", name);
    if (void* const symbol = dlsym(private_->handle, name)) {
        if (verbose != 0)
            tell("KpDSO::getSymbol(%s) found\n", name);
        return symbol;
    }
    if (void* const symbol = dlsym(private_->handle, (std::string("_") + name).c_str())) {
        getTheLogInstance().printf("Fixed symbol %s by prepending '_'\n", name);
        return symbol;
    }
    const char* const error = dlerror();
    if (verbose != 0)
        getTheLogInstance().errorf("DSO", "%s\n", error);
    return nullptr;
}
