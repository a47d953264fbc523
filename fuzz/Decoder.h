// Bytes of a fuzzer as small numbers; behind the end all are 0.
#pragma once

#include <cstddef>
#include <cstdint>

namespace fuzz {

class Decoder {
  public:
    Decoder(const std::uint8_t* data, std::size_t size) : data_(data), end_(data + size) {}

    bool isAtEnd() const { return data_ == end_; }
    int byte() { return isAtEnd() ? 0 : *data_++; }
    /// From 0 up to, but not including, `bound`, which is at most 256.
    int below(int bound) { return byte() % bound; }
    bool flag() { return byte() % 2 == 1; }
    /// From -128 to 127.
    int signedByte() { return static_cast<std::int8_t>(byte()); }
    int twoBytes() {
        const int low = byte();
        return low | byte() << 8;
    }

  private:
    const std::uint8_t* data_;
    const std::uint8_t* end_;
};

} // namespace fuzz
