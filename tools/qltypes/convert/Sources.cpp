#include "convert/Sources.h"

#include <algorithm>
#include <cerrno>
#include <stdexcept>
#include <system_error>

#include <fmt/format.h>

#include "Commands.h"
#include "convert/Elements.h"

namespace inspector {
namespace {

constexpr std::size_t maxTokenSize = 4096;

bool isBlank(int c) { return c == ' ' || (c >= '\t' && c <= '\r'); }

} // namespace

std::size_t ElementSource::readInput(void* dst, std::size_t size) {
    const std::size_t numRead = std::fread(dst, 1, size, stdin);
    if (numRead < size && std::ferror(stdin)) throw std::system_error(errno, std::generic_category(), "standard input");
    numBytesRead_ += numRead;
    return numRead;
}

ArgumentSource::ArgumentSource(int id, const std::vector<std::string>& texts)
    : blockSize_(blockElements * elementSize(id)), elements_(texts.size() * elementSize(id)) {
    for (std::size_t i = 0; i < texts.size(); ++i) {
        try {
            readElement(id, texts[i], &elements_[i * elementSize(id)]);
        } catch (const std::invalid_argument& e) {
            throw UsageError(fmt::format("value {}: {}", i, e.what()));
        }
    }
}

void ArgumentSource::next(std::vector<std::byte>& block) {
    const std::size_t size = std::min(blockSize_, elements_.size() - at_);
    const auto begin = elements_.begin() + static_cast<std::ptrdiff_t>(at_);
    block.assign(begin, begin + static_cast<std::ptrdiff_t>(size));
    at_ += size;
}

int TextSource::nextCharacter() {
    if (at_ == chunk_.size()) {
        chunk_.resize(65536);
        chunk_.resize(readInput(chunk_.data(), chunk_.size()));
        at_ = 0;
        if (chunk_.empty()) return EOF;
    }
    const auto c = static_cast<unsigned char>(chunk_[at_++]);
    if (c == '\n') {
        ++line_;
        column_ = 0;
    } else {
        ++column_;
    }
    return c;
}

// Reads the next text and leaves the blank behind it unread, so that the line number stays that of the text.
bool TextSource::readToken() {
    token_.clear();
    int c = nextCharacter();
    while (c != EOF && isBlank(c))
        c = nextCharacter();
    if (c == EOF) return false;
    tokenColumn_ = column_;
    while (true) {
        token_ += static_cast<char>(c);
        if (token_.size() > maxTokenSize)
            throw UsageError(fmt::format("(standard input):{}:{}: a value of more than {} characters", line_,
                                         tokenColumn_, maxTokenSize));
        if (at_ < chunk_.size() && isBlank(static_cast<unsigned char>(chunk_[at_]))) return true;
        const int lineBefore = line_;
        c = nextCharacter();
        if (c == EOF) return true;
        if (isBlank(c)) { // the first character of a new chunk
            --at_;
            line_ = lineBefore;
            return true;
        }
    }
}

void TextSource::next(std::vector<std::byte>& block) {
    const std::size_t size = elementSize(id_);
    block.resize(blockElements * size);
    std::size_t numElements = 0;
    while (numElements < blockElements && readToken()) {
        try {
            readElement(id_, token_, &block[numElements * size]);
        } catch (const std::invalid_argument& e) {
            throw UsageError(fmt::format("(standard input):{}:{}: {}", line_, tokenColumn_, e.what()));
        }
        ++numElements;
    }
    block.resize(numElements * size);
}

RawSource::RawSource(int id) : elementSize_(elementSize(id)) {}

void RawSource::next(std::vector<std::byte>& block) {
    block.resize(blockElements * elementSize_);
    const std::size_t numRead = readInput(block.data(), block.size());
    if (numRead % elementSize_ != 0)
        throw UsageError(
            fmt::format("(standard input): ends inside of a value, {} bytes into it", numRead % elementSize_));
    block.resize(numRead);
}

} // namespace inspector
