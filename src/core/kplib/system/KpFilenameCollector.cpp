#include <kplib/system/KpFilenameCollector.h>

#include <kplib/system/KpDirectory.h>

void KpFilenameCollector::collect(KpDArray<KpString>& out, const char* pattern, const char* dir)
{
    if (!pattern || !dir || !KpDirectory::isDirectory(dir))
        return;
    const auto pathOf = [dir](const KpString& name) { return KpString(0, "%s/%s", dir, name.c_str()); };
    KpDArray<KpString> names;
    KpDirectory::scanSortedByName(dir, names, pattern, false);
    for (long i = names.size() - 1; i >= 0; --i)
        out.append(pathOf(names[i]));
    names.clear();
    KpDirectory::scanSortedByName(dir, names, "*", false);
    for (long i = names.size() - 1; i >= 0; --i) {
        const KpString path = pathOf(names[i]);
        if (KpDirectory::isDirectory(path))
            collect(out, pattern, path);
    }
}
