// An integer of any size: one word while it is small, owned by FLINT otherwise.
#pragma once

#include <cstddef>
#include <cstdint>
#include <utility>

#include <flint/fmpz.h>

namespace QL {

class Integer {
  public:
    Integer() = default;
    Integer(std::int64_t value) { fmpz_set_si(&value_, value); } // NOLINT: numbers are integers
    Integer(const Integer& other) { fmpz_set(&value_, &other.value_); }
    Integer(Integer&& other) noexcept : value_(std::exchange(other.value_, 0)) {}
    Integer& operator=(const Integer& other) {
        fmpz_set(&value_, &other.value_);
        return *this;
    }
    Integer& operator=(Integer&& other) noexcept {
        fmpz_swap(&value_, &other.value_);
        return *this;
    }
    ~Integer() {
        if (COEFF_IS_MPZ(value_)) fmpz_clear(&value_);
    }

    const fmpz* get() const { return &value_; }
    fmpz* get() { return &value_; }

    int sign() const { return fmpz_sgn(&value_); }
    bool isZero() const { return value_ == 0; }
    bool isOne() const { return value_ == 1; }
    bool isMinusOne() const { return value_ == -1; }
    bool fitsInt() const { return value_ >= INT32_MIN && value_ <= INT32_MAX; } // a big one exceeds both
    int toInt() const { return static_cast<int>(value_); }
    std::size_t numBits() const { return fmpz_bits(&value_); }
    void negate() { fmpz_neg(&value_, &value_); }

    friend bool operator==(const Integer& a, const Integer& b) { return fmpz_equal(&a.value_, &b.value_) != 0; }
    friend bool operator<(const Integer& a, const Integer& b) { return fmpz_cmp(&a.value_, &b.value_) < 0; }
    friend Integer operator+(const Integer& a, const Integer& b) { return made(fmpz_add, a, b); }
    friend Integer operator-(const Integer& a, const Integer& b) { return made(fmpz_sub, a, b); }
    friend Integer operator*(const Integer& a, const Integer& b) { return made(fmpz_mul, a, b); }
    Integer operator-() const {
        Integer result(*this);
        result.negate();
        return result;
    }
    Integer& operator+=(const Integer& other) {
        fmpz_add(&value_, &value_, &other.value_);
        return *this;
    }
    Integer& operator*=(const Integer& other) {
        fmpz_mul(&value_, &value_, &other.value_);
        return *this;
    }
    /// The quotient; `divisor` divides the number.
    void divideExactly(const Integer& divisor) { fmpz_divexact(&value_, &value_, &divisor.value_); }

    /// The quotient rounded towards zero, towards minus infinity; the divisor is not 0.
    static Integer truncatedQuotient(const Integer& a, const Integer& b) { return made(fmpz_tdiv_q, a, b); }
    static Integer floorQuotient(const Integer& a, const Integer& b) { return made(fmpz_fdiv_q, a, b); }
    static Integer gcd(const Integer& a, const Integer& b) { return made(fmpz_gcd, a, b); }

  private:
    static Integer made(void (*operation)(fmpz*, const fmpz*, const fmpz*), const Integer& a, const Integer& b) {
        Integer result;
        operation(&result.value_, &a.value_, &b.value_);
        return result;
    }

    fmpz value_ = 0;
};

} // namespace QL
