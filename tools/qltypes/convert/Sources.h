// Where the values of a conversion come from: blocks of elements, never more in memory than one block of a stream.
#pragma once

#include <cstddef>
#include <cstdio>
#include <string>
#include <vector>

namespace inspector {

/// Elements that one block holds at most.
inline constexpr std::size_t blockElements = 65536;

/// A supply of elements of one built-in type.
class ElementSource {
  public:
    virtual ~ElementSource() = default;
    /// Replaces the block by the next elements, `blockElements` at most; none at the end. Throws InputError or
    /// UsageError for bad input.
    virtual void next(std::vector<std::byte>& block) = 0;
    /// Bytes of input that were read so far.
    std::size_t numBytesRead() const { return numBytesRead_; }

  protected:
    /// Reads bytes of standard input; less than `size` only at the end. Throws std::system_error when it cannot be
    /// read.
    std::size_t readInput(void* dst, std::size_t size);

  private:
    std::size_t numBytesRead_ = 0;
};

/// Values given as arguments, all checked at once.
class ArgumentSource : public ElementSource {
  public:
    ArgumentSource(int id, const std::vector<std::string>& texts);
    void next(std::vector<std::byte>& block) override;

  private:
    std::size_t blockSize_;
    std::size_t at_ = 0;
    std::vector<std::byte> elements_;
};

/// Texts on standard input, with blanks or line ends between them.
class TextSource : public ElementSource {
  public:
    explicit TextSource(int id) : id_(id) {}
    void next(std::vector<std::byte>& block) override;

  private:
    int nextCharacter();
    bool readToken();

    int id_;
    std::string chunk_;
    std::size_t at_ = 0;
    std::string token_;
    int line_ = 1;
    int column_ = 0;
    int tokenColumn_ = 0;
};

/// Little-endian binary on standard input.
class RawSource : public ElementSource {
  public:
    explicit RawSource(int id);
    void next(std::vector<std::byte>& block) override;

  private:
    std::size_t elementSize_;
};

} // namespace inspector
