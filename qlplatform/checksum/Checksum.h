// Checksums over texts and bytes: MD5 behind the interface that checksums of models use.
//
//   qlChecksumRec rec;
//   rec.addn("double:pos:[ 3 ];", 17);
//   const qlChecksumValue value = rec.value();
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>

#include "qlplatform/Export.h"

/// A checksum: four 32-bit words.
struct qlChecksumValue {
    /// The words, first to last.
    std::array<std::uint32_t, 4> words{};

    /// Whether all words are equal.
    bool operator==(const qlChecksumValue&) const = default;
};

/// A checksum in the making. Items are added in order; their order and their bounds are part of the checksum.
class QL_EXPORT ut_md5ChecksumRec {
  public:
    ut_md5ChecksumRec();
    ut_md5ChecksumRec(const ut_md5ChecksumRec& other);
    /// Goes on from what `other` has added so far.
    ut_md5ChecksumRec& operator=(const ut_md5ChecksumRec& other);
    ~ut_md5ChecksumRec();

    /// Adds one item of `length` bytes.
    void addn(const void* bytes, std::size_t length);

    /// The checksum of what was added so far; more can be added afterwards.
    qlChecksumValue value() const;

  protected:
    /// Adds one item of a form of its own: the same bytes under another tag give another checksum.
    void addItem(unsigned char tag, const void* bytes, std::size_t length);

  private:
    struct Digest;
    std::unique_ptr<Digest> digest_;
};

/// The checksum record of models, which has a second form for long items.
class QL_EXPORT qlChecksumRec : public ut_md5ChecksumRec {
  public:
    /// Adds one item of `length` bytes; the checksum differs from that of addn with the same bytes.
    void addLongItemToCheckSum(const void* bytes, std::size_t length);
};
