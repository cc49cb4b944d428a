#include <kplib/foundation/KpStdStringTokenizer.h>

KpStdStringTokenizer::KpStdStringTokenizer(const std::string& text, const char* delimiters) :
    delimiters_(delimiters ? delimiters : " \f\n\r\t\v"), str_(text), begin_(0), end_(0)
{
    advance(begin_, end_);
}

size_t KpStdStringTokenizer::countTokens() const
{
    if (!tokenCountValid_) {
        size_t count = 0, begin = 0, end = 0;
        for (advance(begin, end); begin != end; advance(begin, end))
            ++count;
        tokenCount_ = count;
        tokenCountValid_ = true;
    }
    return tokenCount_;
}

void KpStdStringTokenizer::nextToken(std::string& token)
{
    if (begin_ == std::string::npos)
        return;
    token = str_.substr(begin_, end_ - begin_);
    advance(begin_, end_);
}

// Moves from the bounds of one token to those of the next; both are npos after the last one.
void KpStdStringTokenizer::advance(size_t& begin, size_t& end) const
{
    begin = str_.find_first_not_of(delimiters_, end);
    end = str_.find_first_of(delimiters_, begin);
}
