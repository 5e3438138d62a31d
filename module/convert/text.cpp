// module/convert/text.cpp: between the library's characters, which are bytes, and the host's, which
// have 16 bits.
#include "convert/text.hpp"

#include <algorithm>
#include <cstdint>

#ifdef __SSE2__
#include <emmintrin.h>
#endif

namespace tessel::netcdf {
namespace {

constexpr auto widened = [](char byte) {
    return static_cast<tsChar>(static_cast<signed char>(byte));
};
constexpr auto narrowed = [](tsChar character) { return static_cast<char>(character); };

#ifdef __SSE2__
// What is copied past the caches is not read before it is written, and that is a third of what a
// large block costs in memory. What fits into the caches is used next from there.
constexpr std::size_t large = std::size_t{1} << 20U;
constexpr std::size_t step = sizeof(__m128i); ///< characters at a time

/// How many elements stand before the first one at which a vector may be written past the caches.
template <class T>
std::size_t unaligned(const T *to) noexcept {
    return (-reinterpret_cast<std::uintptr_t>(to) % sizeof(__m128i)) / sizeof(T);
}

__m128i loaded(const void *from) noexcept {
    return _mm_loadu_si128(static_cast<const __m128i *>(from));
}
void stream(void *to, __m128i vector) noexcept {
    _mm_stream_si128(static_cast<__m128i *>(to), vector);
}

void copyStep(const char *from, tsChar *to) noexcept {
    const __m128i bytes = loaded(from);
    const __m128i none = _mm_setzero_si128();
    stream(to, _mm_srai_epi16(_mm_unpacklo_epi8(none, bytes), 8));
    stream(to + step / 2, _mm_srai_epi16(_mm_unpackhi_epi8(none, bytes), 8));
}
void copyStep(const tsChar *from, char *to) noexcept {
    const __m128i low = _mm_set1_epi16(0xFF);
    stream(to, _mm_packus_epi16(_mm_and_si128(loaded(from), low),
                                _mm_and_si128(loaded(from + step / 2), low)));
}

#endif

/// A copy by steps, of large blocks; what is before the first and behind the last step is small.
template <class From, class To, class Each>
void copy(const From *from, std::size_t count, To *to, Each each) noexcept {
#ifdef __SSE2__
    if (count >= large) {
        const std::size_t before = unaligned(to);
        std::transform(from, from + before, to, each);
        std::size_t at = before;
        for (; at + step <= count; at += step) {
            copyStep(from + at, to + at);
        }
        _mm_sfence();
        from += at;
        to += at;
        count -= at;
    }
#endif
    std::transform(from, from + count, to, each);
}

} // namespace

void widen(const char *from, std::size_t count, tsChar *to) noexcept {
    copy(from, count, to, widened);
}
void narrow(const tsChar *from, std::size_t count, char *to) noexcept {
    copy(from, count, to, narrowed);
}

} // namespace tessel::netcdf
