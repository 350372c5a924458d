// Checking and counting in wide instructions, compiled once for each instruction set by Kernels.cpp.
//
// A text goes by blocks. One that is well-formed is counted; the first that isn't ends the scan, and the
// scalar path finds the sequence. The rest of the text that is shorter than a block is copied to one, with
// zeros behind it: they count as ASCII, and cut off what would need more units.
//
// There is no include guard: the file is included once for each instruction set, behind
// ConversionKernels-inl.h, whose names it uses.

HWY_BEFORE_NAMESPACE();
namespace mirel::detail::HWY_NAMESPACE {
namespace {

/// The rest of a text, of n units, with zeros behind it.
template <class T, ssize_t kUnits> struct Rest {
  alignas(64) T units[std::size_t(kUnits)];
  HWY_INLINE Rest(const T* p, ssize_t n) {
    std::memset(units, 0, sizeof(units));
    if (n > 0)
      std::memcpy(units, p, std::size_t(n) * sizeof(T));
  }
};

/// A scan of UTF-8. Each pair of adjacent bytes is looked up by its nibbles for what can be wrong with the
/// two (kPairFaults), and must be two continuation bytes where a lead byte two or three places before asks
/// for that.
template <bool kIsCounted> struct Utf8Scan {
  using D = Wide;
  using V = hn::Vec<D>;
  static constexpr D d{};
  static constexpr ssize_t kUnits = 64;
  static constexpr int kVectors = kUnits / kLanes<D>;

  using Sums = hn::Vec<hn::Repartition<uint64_t, D>>;

  V last; ///< of the block before
  Sums continuations, fourBytes;
  bool isBehindAscii;

  // Not a constructor: g++ compiles those that it makes for the processor that the library is built for.
  static HWY_INLINE Utf8Scan Begin() {
    const Sums none = hn::Zero(hn::Repartition<uint64_t, D>());
    return {hn::Zero(d), none, none, true};
  }

  /// The bytes that stand n before those of a vector, which follows the vector before.
  template <int n> static HWY_INLINE V Before(V bytes, V before) {
    if constexpr (kLanes<D> == 16)
      return hn::CombineShiftRightBytes<16 - n>(d, bytes, before);
    else
      return hn::CombineShiftRightBytes<16 - n>(d, bytes, hn::ConcatLowerUpper(d, bytes, before));
  }

  /// Where bytes don't go with those before them.
  static HWY_INLINE V Faults(V bytes, V before) {
    const V first = Before<1>(bytes, before);
    const V byHigh = hn::TableLookupBytes(hn::LoadDup128(d, kPairFaults.firstHigh), Right<4>(d, first, 0x0F));
    const V byLow =
        hn::TableLookupBytes(hn::LoadDup128(d, kPairFaults.firstLow), hn::And(first, Repeat(d, 0x0F)));
    const V bySecond =
        hn::TableLookupBytes(hn::LoadDup128(d, kPairFaults.secondHigh), Right<4>(d, bytes, 0x0F));
    // The highest bit where the byte two before is at least E0, or the one three before at least F0.
    const V third = hn::SaturatedSub(Before<2>(bytes, before), Repeat(d, 0xE0 - 0x80));
    const V fourth = hn::SaturatedSub(Before<3>(bytes, before), Repeat(d, 0xF0 - 0x80));
    const V isContinued = hn::And(hn::Or(third, fourth), Repeat(d, 0x80));
    return hn::Xor(hn::And(hn::And(byHigh, byLow), bySecond), isContinued);
  }
  static HWY_INLINE bool IsZero(V v) { return hn::AllTrue(d, hn::Eq(v, hn::Zero(d))); }
  static HWY_INLINE V Load(const uint8_t* p, int k) { return hn::LoadU(d, p + k * kLanes<D>); }

  template <int kCount> static HWY_INLINE bool IsAscii(const uint8_t* p) {
    V all = Load(p, 0);
    for (int k = 1; k < kCount; ++k)
      all = hn::Or(all, Load(p, k));
    return hn::AllFalse(d, IsNonAscii(d, all));
  }
  /// A loop of its own for ASCII takes half the time: it has no state.
  static HWY_INLINE const char8* SkipAscii(const char8* p, const char8* end) {
    while (end - p >= 2 * kUnits && IsAscii<2 * kVectors>(reinterpret_cast<const uint8_t*>(p)))
      p += 2 * kUnits;
    return p;
  }

  HWY_INLINE void CountBytes(const uint8_t* p) {
    V notContinuations = hn::Zero(d), fours = hn::Zero(d);
    for (int k = 0; k < kVectors; ++k) {
      const V bytes = Load(p, k);
      notContinuations = hn::Sub(notContinuations, hn::VecFromMask(d, IsFrom80Below(d, bytes, 0xC0)));
      fours = hn::Add(fours, hn::Min(hn::SaturatedSub(bytes, Repeat(d, 0xEF)), Repeat(d, 1)));
    }
    continuations = hn::Add(continuations, hn::SumsOf8(notContinuations));
    fourBytes = hn::Add(fourBytes, hn::SumsOf8(fours));
  }

  /// Whether the block at p goes on well-formed, but for a sequence that its end cuts off; counts it then.
  HWY_INLINE bool Take(const uint8_t* p) {
    if (IsAscii<kVectors>(p)) {
      if (!isBehindAscii && !IsZero(Faults(Load(p, 0), last)))
        return false;
      isBehindAscii = true;
      last = hn::Zero(d); // as good as any ASCII
      return true;
    }
    V before = last, faults = hn::Zero(d);
    for (int k = 0; k < kVectors; ++k) {
      const V bytes = Load(p, k);
      faults = hn::Or(faults, Faults(bytes, before));
      before = bytes;
    }
    if (!IsZero(faults))
      return false;
    if constexpr (kIsCounted)
      CountBytes(p);
    isBehindAscii = false;
    last = before;
    return true;
  }

  HWY_INLINE Lengths Result(ssize_t n) const {
    const hn::Repartition<uint64_t, D> d64;
    const ssize_t codePoints = n - static_cast<ssize_t>(hn::GetLane(hn::SumOfLanes(d64, continuations)));
    return {codePoints, codePoints + static_cast<ssize_t>(hn::GetLane(hn::SumOfLanes(d64, fourBytes)))};
  }
};

/// How many bytes at the end of [begin, end) its lead byte says go on behind it. The last block may have
/// ended with a byte that only the next one shows to be malformed.
HWY_INLINE ssize_t Unfinished(const char8* begin, const char8* end) {
  for (ssize_t k = 1; k <= 3 && end - begin >= k; ++k) {
    const unsigned byte = UnitValue(end[-k]);
    if (byte < 0x80)
      return 0;
    if (byte >= 0xC0)
      return (byte >= 0xF0 ? 4 : byte >= 0xE0 ? 3 : 2) > k ? k : 0;
  }
  return 0;
}

/// Scans UTF-8 as far as it is well-formed by blocks: p is a boundary of sequences.
template <bool kIsCounted> HWY_INLINE Measured<char8> ScanUtf8(const char8* const begin, const char8* end) {
  auto scan = Utf8Scan<kIsCounted>::Begin();
  constexpr ssize_t kUnits = Utf8Scan<kIsCounted>::kUnits;
  const char8* p = begin;
  bool isWellFormed = true;
  while (end - p >= kUnits) {
    isWellFormed = scan.Take(reinterpret_cast<const uint8_t*>(p));
    if (!isWellFormed)
      break;
    p += kUnits;
    if (scan.isBehindAscii)
      p = scan.SkipAscii(p, end);
  }
  if (isWellFormed && (end != p || !scan.isBehindAscii)) {
    const Rest<uint8_t, kUnits> rest(reinterpret_cast<const uint8_t*>(p), end - p);
    isWellFormed = scan.Take(rest.units);
    p = isWellFormed ? end : p;
  }
  Lengths lengths{0, 0};
  if constexpr (kIsCounted)
    lengths = scan.Result(p - begin);
  if (!isWellFormed) {
    const ssize_t unfinished = Unfinished(begin, p); // the scalar path's
    p -= unfinished;
    lengths.codePoints -= unfinished > 0;
    lengths.units -= unfinished > 0;
    lengths.units -= unfinished > 0 && UnitValue(*p) >= 0xF0;
  }
  return {p, lengths};
}

/// A scan of UTF-16. Whether a block ends with a high surrogate goes into the next one as a bit: a block that
/// began before that surrogate would have to wait for the masks of the block before.
template <bool kIsCounted> struct Utf16Scan {
  using D = Wide;
  using DU = ToUnits<D>;
  using V = hn::Vec<DU>;
  static constexpr D d{};
  static constexpr DU du{};
  static constexpr ssize_t kUnits = kLanes<D>;
  static constexpr ssize_t kMaxBlocks = 0xFFFF / 4; ///< until a lane of belows may overflow

  /// For each lane, how many units are below 80, and how many below 800: the bytes that they lack of three.
  V belows;
  ssize_t blocks, lacking, surrogates;
  uint64_t isCutOff; ///< 1 if the block before ends with a high surrogate

  static HWY_INLINE Utf16Scan Begin() { return {hn::Zero(du), 0, 0, 0, 0}; }

  HWY_INLINE void Flush() {
    HWY_ALIGN uint16_t lanes[std::size_t(kLanes<D> / 2)];
    hn::Store(belows, du, lanes);
    for (const uint16_t lane : lanes)
      lacking += lane;
    belows = hn::Zero(du);
    blocks = 0;
  }

  HWY_INLINE void CountBelow(V units, V kind) {
    const V zero = hn::Zero(du), nonAscii = hn::Set(du, 0xFF80);
    belows = hn::Sub(belows, hn::Add(hn::VecFromMask(du, hn::Eq(kind, zero)),
                                     hn::VecFromMask(du, hn::Eq(hn::And(units, nonAscii), zero))));
  }

  /// Whether the surrogates of the block of the two vectors are paired, but for one that its end cuts off.
  HWY_INLINE bool TakeSurrogates(V first, V second) {
    const auto high = hn::ConcatOdd(d, hn::BitCast(d, second), hn::BitCast(d, first));
    const auto half = hn::And(high, Repeat(d, 0xFC));
    const uint64_t highs = BitsOf(d, IsEqual(d, half, 0xD8)), lows = BitsOf(d, IsEqual(d, half, 0xDC));
    if ((((highs << 1 | isCutOff) ^ lows) & FirstBits(kUnits)) != 0)
      return false;
    isCutOff = highs >> (kUnits - 1);
    surrogates += Count(highs | lows);
    return true;
  }

  /// Whether the block at p goes on well-formed; counts it then.
  HWY_INLINE bool Take(const char16* p) {
    const V first = hn::LoadU(du, p), second = hn::LoadU(du, p + kUnits / 2);
    const V mask = hn::Set(du, 0xF800), surrogate = hn::Set(du, 0xD800);
    const V kind1 = hn::And(first, mask), kind2 = hn::And(second, mask);
    const bool hasNone = hn::AllFalse(du, hn::Or(hn::Eq(kind1, surrogate), hn::Eq(kind2, surrogate)));
    if ((!hasNone || isCutOff != 0) && !TakeSurrogates(first, second))
      return false;
    if constexpr (kIsCounted) {
      if (blocks == kMaxBlocks)
        Flush();
      ++blocks;
      CountBelow(first, kind1);
      CountBelow(second, kind2);
    }
    return true;
  }
};

/// Scans UTF-16 as far as it is well-formed by blocks: p is a boundary of sequences.
template <bool kIsCounted>
HWY_INLINE Measured<char16> ScanUtf16(const char16* const begin, const char16* end) {
  auto scan = Utf16Scan<kIsCounted>::Begin();
  constexpr ssize_t kUnits = Utf16Scan<kIsCounted>::kUnits;
  const char16* p = begin;
  while (end - p >= kUnits && scan.Take(p))
    p += kUnits;
  if (const ssize_t n = end - p; n < kUnits && (n != 0 || scan.isCutOff != 0)) {
    const Rest<char16, kUnits> rest(p, n);
    if (scan.Take(rest.units)) {
      p = end;
      scan.lacking -= 2 * (kUnits - n); // the zeros
    }
  }
  if (scan.isCutOff != 0) { // of the block before the one that isn't well-formed
    --p;
    --scan.surrogates;
  }
  if constexpr (kIsCounted)
    scan.Flush();
  const ssize_t n = p - begin;
  return {p, {n - scan.surrogates / 2, 3 * int64(n) - scan.lacking - scan.surrogates}};
}

const char8* SkipUtf8(const char8* p, const char8* end) { return ScanUtf8<false>(p, end).p; }
Measured<char8> MeasureUtf8(const char8* p, const char8* end) { return ScanUtf8<true>(p, end); }
const char16* SkipUtf16(const char16* p, const char16* end) { return ScanUtf16<false>(p, end).p; }
Measured<char16> MeasureUtf16(const char16* p, const char16* end) { return ScanUtf16<true>(p, end); }

} // namespace
} // namespace mirel::detail::HWY_NAMESPACE
HWY_AFTER_NAMESPACE();
