#include <kplib/foundation/KpStringTokenizer.h>

#include <cctype>

KpStringTokenizer::KpStringTokenizer(std::string_view text)
{
    retarget(text);
    while (pos_ < length_ && KpStringTokenizer::isSpace(text_[pos_]))
        ++pos_;
}

KpStringTokenizer& KpStringTokenizer::operator=(const KpString& text)
{
    retarget(text);
    skipSpace();
    return *this;
}

KpStringTokenizer& KpStringTokenizer::operator=(const char* text)
{
    retarget(text ? text : "");
    skipSpace();
    return *this;
}

KpStringTokenizer::~KpStringTokenizer() = default;

bool KpStringTokenizer::isSpace(char c)
{
    return std::isspace(static_cast<unsigned char>(c)) != 0;
}

void KpStringTokenizer::skipSpace()
{
    while (pos_ < length_ && isSpace(text_[pos_]))
        ++pos_;
}

KpString& KpStringTokenizer::nextToken()
{
    token_ = "";
    while (pos_ < length_ && !isSpace(text_[pos_])) {
        const char c = text_[pos_++];
        if (c == '"')
            takeQuoted();
        else if (c != '\\')
            token_ += c;
        else if (pos_ < length_)
            token_ += text_[pos_++];
    }
    skipSpace();
    return token_;
}

void KpStringTokenizer::retarget(std::string_view text)
{
    text_ = text.data();
    pos_ = 0;
    length_ = static_cast<long>(text.size());
}

void KpStringTokenizer::takeQuoted()
{
    while (pos_ < length_ && text_[pos_] != '"')
        token_ += text_[pos_++];
    if (pos_ < length_)
        ++pos_;
}
