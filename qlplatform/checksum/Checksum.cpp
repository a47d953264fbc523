#include "qlplatform/checksum/Checksum.h"

#include <cstring>

#include <sys/types.h>

#include <md5.h>

struct ut_md5ChecksumRec::Digest {
    MD5_CTX context;
};

ut_md5ChecksumRec::ut_md5ChecksumRec() : digest_(std::make_unique<Digest>()) { MD5Init(&digest_->context); }

ut_md5ChecksumRec::ut_md5ChecksumRec(const ut_md5ChecksumRec& other)
    : digest_(std::make_unique<Digest>(*other.digest_)) {}

ut_md5ChecksumRec& ut_md5ChecksumRec::operator=(const ut_md5ChecksumRec& other) {
    *digest_ = *other.digest_;
    return *this;
}

ut_md5ChecksumRec::~ut_md5ChecksumRec() = default;

void ut_md5ChecksumRec::addItem(unsigned char tag, const void* bytes, std::size_t length) {
    const std::uint64_t size = length;
    MD5Update(&digest_->context, &tag, 1);
    MD5Update(&digest_->context, reinterpret_cast<const unsigned char*>(&size), sizeof size);
    MD5Update(&digest_->context, static_cast<const unsigned char*>(bytes), length);
}

void ut_md5ChecksumRec::addn(const void* bytes, std::size_t length) { addItem('n', bytes, length); }

void qlChecksumRec::addLongItemToCheckSum(const void* bytes, std::size_t length) { addItem('l', bytes, length); }

qlChecksumValue ut_md5ChecksumRec::value() const {
    Digest finished = *digest_;
    unsigned char bytes[MD5_DIGEST_LENGTH];
    MD5Final(bytes, &finished.context);
    qlChecksumValue made;
    static_assert(sizeof bytes == sizeof made.words);
    std::memcpy(made.words.data(), bytes, sizeof bytes);
    return made;
}
