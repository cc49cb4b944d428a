#include <kplib/foundation/KpString.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <cstdio>
#include <cstring>

namespace {

int interpreteNoSave = 0;  // above 0 while a tree is written to a file

struct NoSaveScope {
    NoSaveScope() { ++interpreteNoSave; }
    ~NoSaveScope() { --interpreteNoSave; }
    NoSaveScope(const NoSaveScope&) = delete;
    NoSaveScope& operator=(const NoSaveScope&) = delete;
};

bool isUnsaved(const HxParamBase& node)
{
    return interpreteNoSave > 0 && (node.flags() & HxParamBase::FlagNoSave);
}

void appendIndent(KpString& out, int indent)
{
    for (int i = 0; i < indent; ++i)
        out += "    ";
}

// Intentional: a text that is escaped in part gets single quotes for double ones and keeps the
// backslashes.
void escapeDoubleQuotes(KpString& text)
{
    const bool isEscaped = std::strstr(text, "\\\"");
    text.replaceSubStr("\"", isEscaped ? "'" : "\\\"");
}

void appendQuoted(KpString& out, const char* text)
{
    out += '"';
    if (std::strchr(text, '"')) {
        KpString escaped(text);
        escapeDoubleQuotes(escaped);
        out += escaped.c_str();
    } else {
        out += text;
    }
    if (out[out.size() - 2] == '\\')
        out += ' ';  // so that the closing quote is not read as escaped
    out += '"';
}

void appendParameter(KpString& out, const HxParameter& parameter)
{
    out += parameter.name();
    out += ' ';
    if (parameter.primType() != KpPrimType::String) {
        parameter.print(out, true);
        return;
    }
    const char* const text = parameter.getString();
    appendQuoted(out, text ? text : "");
}

// Index of the last child that is written to a file; no comma follows it. 0 while none are
// written.
long lastSaved(const HxParamBundle& bundle)
{
    long last = interpreteNoSave > 0 ? bundle.size() - 1 : 0;
    while (last > 0 && isUnsaved(*bundle[last]))
        --last;
    return last;
}

}  // namespace

void HxParamBundle::print(KpString& out, int indent, const char* name) const
{
    const long last = lastSaved(*this);
    appendIndent(out, indent);
    out += name ? name : this->name();
    out += " {\n";
    for (long i = 0; i < size(); ++i) {
        const HxParamBase& child = *children_[i];
        if ((child.flags() & FlagHidden) || isUnsaved(child))
            continue;
        if (child.isBundle()) {
            static_cast<const HxParamBundle&>(child).print(out, indent + 1);
            continue;
        }
        appendIndent(out, indent + 1);
        appendParameter(out, static_cast<const HxParameter&>(child));
        out += i < last ? ",\n" : "\n";
    }
    appendIndent(out, indent);
    out += "}\n";
}

void HxParamBundle::print(FILE* stream, int indent, const char* name) const
{
    KpString text;
    {
        const NoSaveScope scope;
        print(text, indent, name);
    }
    std::fwrite(text.c_str(), 1, static_cast<size_t>(text.size() - 1), stream);
}
