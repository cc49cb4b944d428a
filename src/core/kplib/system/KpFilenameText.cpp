#include <kplib/system/KpFilename.h>

#include <algorithm>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>
#include <unistd.h>
#include <utility>

namespace {

using Pieces = KpDArray<KpString>;

// The folders of the directory of a path; none for a path without a slash.
Pieces foldersOf(const KpFilename& path)
{
    KpFilename packed(path);
    packed.pack();
    Pieces folders;
    packed.dirname().explode('/', folders);
    folders.resize(folders.size() - 1);  // the empty part after the last slash
    return folders;
}

long commonPieces(const Pieces& a, const Pieces& b)
{
    const long n = std::min(a.size(), b.size());
    return std::mismatch(a.begin(), a.begin() + n, b.begin()).first - a.begin();
}

}  // namespace

const char* KpFilename::basename(const char* path)
{
    const char* const slash = path ? std::strrchr(path, '/') : nullptr;
    return slash ? slash + 1 : path ? path : "";
}

const char* KpFilename::extension(const char* path)
{
    const char* const name = basename(path);
    const char* const dot = std::strrchr(name, '.');
    return dot ? dot : name + std::strlen(name);
}

bool KpFilename::dirname(const char* path, KpString& out)
{
    KpFilename copy(path);
    copy.fixSlashes();
    const long length = copy.basename() - copy.c_str();
    out = KpString(copy.c_str(), 0, static_cast<int>(length));
    return length > 0;
}

KpString KpFilename::dirname() const
{
    KpString directory;
    dirname(directory);
    return directory;
}

void KpFilename::removeExtension()
{
    *this = KpString(c_str(), 0, static_cast<int>(extension() - c_str()));
}

void KpFilename::fixSlashes()
{
    std::replace(begin(), end(), '\\', '/');
}

KpFilename& KpFilename::appendFile(const KpString& name)
{
    return *this = *this + '/' + name;
}

void KpFilename::pack()
{
    fixSlashes();
    replaceSubStr("//", "/");
    replaceSubStr("/./", "/");
    constexpr std::string::size_type none = std::string::npos;
    std::string text(c_str());
    for (auto up = text.find("/.."); up != none; up = text.find("/..")) {
        const auto parent = up == 0 ? 0 : text.rfind('/', up - 1);  // at the very start there is nothing to go up from
        if (parent == none)
            break;  // the first folder of a relative path stays
        text.erase(parent, up + 3 - parent);
    }
    *this = text.c_str();
}

void KpFilename::expandPath()
{
    if (!isRelative())
        return;
    std::string text(c_str());
    if (text.starts_with("~/")) {
        const char* const home = std::getenv("HOME");
        text = (home ? home : "") + text.substr(1);
    } else {
        char folder[1024];
        if (!getcwd(folder, sizeof folder))
            return;
        text = std::string(folder) + "/" + (text.starts_with("./") ? text.substr(2) : text);
    }
    const std::unique_ptr<char, void (*)(void*)> resolved(realpath(text.c_str(), nullptr), std::free);
    if (resolved) {
        const char last = text.back();
        text = resolved.get();
        if (text.back() != last)
            text += last;
    }
    *this = text.c_str();
}

void KpFilename::canonizePath()
{
    pack();
    expandPath();
    if (length() > 0 && c_str()[length() - 1] == '/')
        *this = KpString(c_str(), 0, length() - 1);
}

void KpFilename::makeRelativeTo(const KpFilename& base)
{
    const Pieces own = foldersOf(*this), others = foldersOf(base);
    const long common = commonPieces(own, others);
    if (common > 0) {
        KpString text(common == others.size() ? "./" : "");
        for (long i = common; i < others.size(); ++i)
            text += "../";
        for (long i = common; i < own.size(); ++i) {
            text += i == common ? "" : "/";
            text += own[i].c_str();
        }
        text += '/';
        text += basename();
        *this = text;
    }
    pack();
}
