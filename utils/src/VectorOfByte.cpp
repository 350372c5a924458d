#include <utils/VectorOfByte.h>

#include <cstdlib>
#include <cstring>
#include <limits>
#include <new>

namespace mirel {

namespace {

constexpr ssize_t kMaxBytes = std::numeric_limits<ssize_t>::max();

// An empty range may consist of null pointers, which the C library's functions don't take even for no bytes.

void CopyBytes(uint8* dst, const uint8* src, ssize_t n) {
  if (n != 0)
    std::memcpy(dst, src, static_cast<std::size_t>(n));
}

void MoveBytes(uint8* dst, const uint8* src, ssize_t n) {
  if (n != 0)
    std::memmove(dst, src, static_cast<std::size_t>(n));
}

void FillBytes(uint8* dst, ssize_t n, uint8 x) {
  if (n != 0)
    std::memset(dst, x, static_cast<std::size_t>(n));
}

/// Asserts that [r1, r2) can be copied from. A macro, so that the report names the member.
#define ASSERT_SOURCE(r1, r2)                                                                                \
  (MIREL_ASSERT_AS((r1) <= (r2), "r1 <= r2"),                                                                \
   MIREL_ASSERT_AS((r1) == (r2) || (r1) != nullptr,                                                          \
                   "src1 == src2 || (src1 < src2 && src1 != nullptr && dst != nullptr)"))

} // namespace

void detail::AllocationFailed() { throw std::bad_alloc(); }

/// Decides growth for all edits: to the new size plus the old capacity. The capacity at least doubles, so
/// that in a series of edits growth moves each byte a constant number of times on average. The first request
/// gets exactly what it asks for.
ssize_t VectorOfByte::GrownCapacity(ssize_t capacity, std::size_t n) {
  if (n > std::size_t(kMaxBytes))
    throw std::bad_alloc();
  const ssize_t size = ssize_t(n);
  return size <= kMaxBytes - capacity ? size + capacity : size;
}

/// Makes room for n bytes in all.
void VectorOfByte::GrowTo(std::size_t n) {
  if (n > std::size_t(m_capacity))
    reserve(GrownCapacity(m_capacity, n));
}

VectorOfByte::VectorOfByte(const value_type* r1, const value_type* r2) : VectorOfByte() { assign(r1, r2); }

VectorOfByte::VectorOfByte(ssize_t count, value_type x) : VectorOfByte() { insert(0, count, x); }

VectorOfByte::VectorOfByte(std::initializer_list<uint8> r) : VectorOfByte() { assign(r.begin(), r.end()); }

VectorOfByte::VectorOfByte(const VectorOfByte& r) : VectorOfByte() { assign(r.begin(), r.end()); }

VectorOfByte& VectorOfByte::operator=(const VectorOfByte& r) {
  if (this != &r)
    assign(r.begin(), r.end());
  return *this;
}

/// Changes a buffer's size to n bytes and returns its new address. If it throws, the buffer is untouched.
uint8* VectorOfByte::Reallocate(value_type* buffer, ssize_t n) {
  void* const moved = std::realloc(buffer, static_cast<std::size_t>(n));
  if (moved == nullptr)
    throw std::bad_alloc();
  return static_cast<value_type*>(moved);
}

void VectorOfByte::Release(value_type* buffer) noexcept { std::free(buffer); }

void VectorOfByte::reserve(ssize_t n) const {
  if (n <= m_capacity)
    return;
  m_buffer = Reallocate(m_buffer, n);
  m_capacity = n;
}

void VectorOfByte::Shrink(ssize_t n) noexcept {
  if (void* const moved = std::realloc(m_buffer, static_cast<std::size_t>(n)); moved != nullptr) {
    m_buffer = static_cast<value_type*>(moved);
    m_capacity = n;
  }
}

void VectorOfByte::resize(ssize_t n) {
  MIREL_ASSERT(0 <= n);
  GrowTo(std::size_t(n));
  size_ = n;
}

void VectorOfByte::assign(const value_type* r1, const value_type* r2) {
  ASSERT_SOURCE(r1, r2);
  if (owns(r1)) {
    VectorOfByte copy(r1, r2);
    return swap(copy);
  }
  resize(r2 - r1);
  CopyBytes(m_buffer, r1, size_);
}

VectorOfByte& VectorOfByte::operator+=(const VectorOfByte& r) {
  insert(size_, r.begin(), r.end());
  return *this;
}

void VectorOfByte::push_back(const value_type* r1, const value_type* r2) { insert(size_, r1, r2); }

void VectorOfByte::insertbytes(ssize_t i, ssize_t n) {
  MIREL_ASSERT(0 <= i && i <= size());
  MIREL_ASSERT(0 <= n);
  GrowTo(std::size_t(size_) + std::size_t(n)); // unsigned, where no sum of two sizes overflows
  MoveBytes(m_buffer + i + n, m_buffer + i, size_ - i);
  size_ += n;
}

void VectorOfByte::insert(ssize_t i, const value_type* r1, const value_type* r2) {
  MIREL_ASSERT(0 <= i && i <= size());
  ASSERT_SOURCE(r1, r2);
  if (owns(r1)) {
    const VectorOfByte copy(r1, r2);
    return insert(i, copy.begin(), copy.end());
  }
  insertbytes(i, r2 - r1);
  CopyBytes(m_buffer + i, r1, r2 - r1);
}

void VectorOfByte::insert(ssize_t i, ssize_t count, value_type x) {
  MIREL_ASSERT(0 <= i && i <= size());
  MIREL_ASSERT(0 <= count);
  insertbytes(i, count);
  FillBytes(m_buffer + i, count, x);
}

VectorOfByte::iterator VectorOfByte::insert(iterator i, value_type x) {
  const ssize_t n = i - begin();
  insert(n, x);
  return begin() + n;
}

void VectorOfByte::move(ssize_t d, ssize_t s, ssize_t n) {
  MIREL_ASSERT_SUBRANGE(d, n, size());
  MIREL_ASSERT_SUBRANGE(s, n, size());
  MoveBytes(m_buffer + d, m_buffer + s, n);
}

void VectorOfByte::erase(iterator i1, iterator i2) {
  MIREL_ASSERT(begin() <= i1 && i1 <= i2 && i2 <= end());
  MoveBytes(i1, i2, end() - i2);
  size_ -= i2 - i1;
}

VectorOfByte::iterator VectorOfByte::erase(iterator i) {
  MIREL_ASSERT(begin() <= i && i < end());
  erase(i, i + 1);
  return i;
}

void VectorOfByte::erase(ssize_t i, ssize_t n) {
  MIREL_ASSERT_SUBRANGE(i, n, size());
  erase(begin() + i, begin() + i + n);
}

void VectorOfByte::erase_element(ssize_t i) {
  MIREL_ASSERT(0 <= i && i < size());
  erase(begin() + i);
}

int VectorOfByte::compare(const VectorOfByte& r) const {
  return LexicographicalCompareX(begin(), end(), r.begin(), r.end());
}

int VectorOfByte::compare(ssize_t i, ssize_t n, const VectorOfByte& r) const {
  MIREL_ASSERT_SUBRANGE(i, n, size());
  return LexicographicalCompareX(begin() + i, begin() + i + n, r.begin(), r.end());
}

int VectorOfByte::compare(ssize_t i, ssize_t n, const VectorOfByte& r, ssize_t ri, ssize_t rn) const {
  MIREL_ASSERT_SUBRANGE(i, n, size());
  MIREL_ASSERT_SUBRANGE(ri, rn, r.size());
  return LexicographicalCompareX(begin() + i, begin() + i + n, r.begin() + ri, r.begin() + ri + rn);
}

int VectorOfByte::compare(ssize_t i, ssize_t n, const value_type* p, ssize_t pn) const {
  MIREL_ASSERT_SUBRANGE(i, n, size());
  MIREL_ASSERT(pn == 0 || (pn > 0 && p != nullptr));
  return LexicographicalCompareX(begin() + i, begin() + i + n, p, p + pn);
}

#undef ASSERT_SOURCE

} // namespace mirel
