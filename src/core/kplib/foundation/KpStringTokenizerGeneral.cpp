#include <kplib/foundation/KpStringTokenizerGeneral.h>

KpStringTokenizerGeneral::KpStringTokenizerGeneral(const KpString& text, const char* separators) :
    KpStringTokenizer(text, NoSkip{})
{
    init(separators);
    skipSpace();
}

KpStringTokenizerGeneral::KpStringTokenizerGeneral(const char* text, const char* separators) :
    KpStringTokenizer(text, NoSkip{})
{
    init(separators);
    skipSpace();
}

void KpStringTokenizerGeneral::init(const char* separators)
{
    separators_.resize(256, KpBitfield::INIT_NONE);
    separators_.unsetAll();
    for (const char* c = separators ? separators : ""; *c != '\0'; ++c)
        separators_.set(static_cast<unsigned char>(*c));
}
