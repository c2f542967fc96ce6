#include "volumes/account_names.h"

#include <algorithm>
#include <cerrno>
#include <cstdint>
#include <cstring>
#include <fcntl.h>
#include <optional>
#include <unistd.h>
#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace {

// Large enough that a password file of 50,000 users is about a hundred reads, small
// enough to stay out of the way of the request's memory: every page of it is a page
// fault (a dozen microseconds on a small device), worth a few reads.
constexpr std::size_t kBlockSize = 32 * 1024;

// The first line end in [at, end), or nullptr. An account line is a few dozen
// characters: looked for sixteen at a time in place, it costs less than the call and
// set-up of memchr(), which is left the last few.
const char* find_line_end(const char* at, const char* end)
{
    if (at >= end)
        return nullptr;
#if defined(__SSE2__)
    const __m128i newline = _mm_set1_epi8('\n');
    for (; end - at >= 16; at += 16) {
        const __m128i piece = _mm_loadu_si128(reinterpret_cast<const __m128i*>(at));
        if (const int hits = _mm_movemask_epi8(_mm_cmpeq_epi8(piece, newline)))
            return at + __builtin_ctz(static_cast<unsigned>(hits));
    }
#endif
    return static_cast<const char*>(std::memchr(at, '\n', static_cast<std::size_t>(end - at)));
}

// The block is followed by this many zeroed bytes: the first 96 bytes of any line of
// the block can be looked at in pieces without a bound to check.
constexpr std::size_t kSlack = 96;

#if defined(__SSE2__)
// The first 32 bytes of a line as bit masks: its line ends, colons and digits.
struct LineHead {
    std::uint32_t line_ends;
    std::uint32_t colons;
    std::uint32_t digits;
};

[[gnu::always_inline]] inline LineHead look_at_head(const char* start)
{
    const __m128i low = _mm_loadu_si128(reinterpret_cast<const __m128i*>(start));
    const __m128i high = _mm_loadu_si128(reinterpret_cast<const __m128i*>(start + 16));
    const auto mask = [&](auto hits) {
        return static_cast<std::uint32_t>(_mm_movemask_epi8(hits(low))) |
               static_cast<std::uint32_t>(_mm_movemask_epi8(hits(high))) << 16;
    };
    const auto equal_to = [](char c) {
        return [c](__m128i bytes) { return _mm_cmpeq_epi8(bytes, _mm_set1_epi8(c)); };
    };
    // A digit is a byte whose distance above '0' is at most 9.
    const auto is_digit = [](__m128i bytes) {
        const __m128i above = _mm_sub_epi8(bytes, _mm_set1_epi8('0'));
        return _mm_cmpeq_epi8(_mm_min_epu8(above, _mm_set1_epi8(9)), above);
    };
    return {mask(equal_to('\n')), mask(equal_to(':')), mask(is_digit)};
}

// The line ends among the 64 bytes from `at`, as bits: the rest of a line of a hundred
// bytes in one look, not in a loop whose end the branch predictor cannot guess.
[[gnu::always_inline]] inline std::uint64_t line_end_bits(const char* at)
{
    const auto piece = [at](int index) {
        const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(at + 16 * index));
        const int hits = _mm_movemask_epi8(_mm_cmpeq_epi8(bytes, _mm_set1_epi8('\n')));
        return static_cast<std::uint64_t>(static_cast<unsigned>(hits)) << (16 * index);
    };
    return piece(0) | piece(1) | piece(2) | piece(3);
}

// The length of the name of a plain line whose fields lie in its first 32 bytes: the
// name and password end at colons, then `Numbers` fields of one to nine digits each,
// each but the last ending at a colon, the last at a colon or at a line end among the
// 32 bytes. Nothing when the bytes do not show such a line, which the character walk
// then weighs. The fields are found by their colons and checked all at once, without
// a branch per field.
template <int Numbers>
[[gnu::always_inline]] inline std::optional<std::size_t> head_name_length(const LineHead& head)
{
    // The bytes up to the line end when it lies among the 32, else all of them.
    const std::uint32_t inside = head.line_ends ^ (head.line_ends - 1);
    // The colons of the line, taken in turn; bit 63 stands for "no further colon".
    constexpr std::uint64_t kNone = std::uint64_t{1} << 63;
    std::uint64_t colons = (head.colons & inside) | kNone;
    const auto take = [&colons] {
        const auto at = static_cast<unsigned>(__builtin_ctzll(colons));
        colons = (colons & (colons - 1)) | kNone;
        return at;
    };
    const unsigned name_end = take();
    const unsigned password_end = take();
    // The colon between the uid and the gid of a password line.
    const unsigned separator = Numbers == 2 ? take() : password_end;
    unsigned last_end = take();
    if (last_end == 63) {
        if (head.line_ends == 0)
            return std::nullopt;
        last_end = static_cast<unsigned>(__builtin_ctz(head.line_ends));
    }
    const unsigned first_length = (Numbers == 2 ? separator : last_end) - password_end - 1;
    const unsigned last_length = last_end - separator - 1;
    // Every byte of the number fields is a digit.
    std::uint64_t fields = (std::uint64_t{1} << last_end) - (std::uint64_t{2} << password_end);
    if constexpr (Numbers == 2)
        fields &= ~(std::uint64_t{1} << separator);
    const bool digits = (fields & ~static_cast<std::uint64_t>(head.digits)) == 0;
    if (!digits | (first_length - 1 > 8) | (last_length - 1 > 8))
        return std::nullopt;
    return name_end;
}
#endif

// White space as the C locale's isspace() sees it.
bool is_blank(char c)
{
    return c == ' ' || (c >= '\t' && c <= '\r');
}

// A number field as the entry readers take it: strtoul()'s text (white space, a sign,
// digits) whose value, negated when the sign is "-", fits 32 bits, followed by ":" or
// the end of the line. `compat` also admits an empty field, not a missing one.
bool take_number(std::string_view& rest, bool compat)
{
    if (compat && rest.empty())
        return false;
    std::size_t i = 0;
    while (i < rest.size() && is_blank(rest[i]))
        ++i;
    const bool negative = i < rest.size() && rest[i] == '-';
    if (i < rest.size() && (rest[i] == '+' || rest[i] == '-'))
        ++i;
    const std::size_t digits = i;
    std::uint64_t value = 0;
    bool overflow = false;
    while (i < rest.size() && rest[i] >= '0' && rest[i] <= '9') {
        const auto digit = static_cast<std::uint64_t>(rest[i] - '0');
        overflow = __builtin_mul_overflow(value, 10, &value) || overflow;
        overflow = __builtin_add_overflow(value, digit, &value) || overflow;
        ++i;
    }
    // Without a digit nothing was converted: the field ends where it began.
    if (i == digits && !compat)
        return false;
    if (i > digits) {
        if (overflow)
            value = UINT64_MAX;
        else if (negative)
            value = 0 - value;
        if (value > UINT32_MAX)
            return false;
    }
    const std::size_t end = i > digits ? i : 0;
    if (end == rest.size()) {
        rest = {};
        return true;
    }
    if (rest[end] != ':')
        return false;
    rest.remove_prefix(end + 1);
    return true;
}

} // namespace

std::optional<std::string_view> account_entry_name(AccountLine line, AccountFile kind, std::string& scratch)
{
    // The entry readers see C text: it ends at a NUL, and holds the line end only when
    // no NUL comes before it.
    std::string_view text = line.text;
    const void* nul = line.may_hold_nul ? std::memchr(text.data(), '\0', text.size()) : nullptr;
    if (nul)
        text = text.substr(0, static_cast<std::size_t>(static_cast<const char*>(nul) - text.data()));
    const bool holds_line_end = line.ended && !nul;

    std::size_t skip = 0;
    while (skip < text.size() && is_blank(text[skip]))
        ++skip;
    std::string_view entry = text.substr(skip);
    if (entry.empty() || entry[0] == '#')
        return std::nullopt;
    // The readers move the text over the skipped white space without its terminating
    // NUL: the characters after it, as many as were skipped, stay behind it. A line end
    // in the text cuts them off; without one they are part of the entry.
    if (skip > 0 && !holds_line_end) {
        scratch.assign(entry);
        scratch.append(text.substr(entry.size(), skip));
        entry = scratch;
    }

    const std::size_t colon = entry.find(':');
    const std::string_view name = entry.substr(0, colon);
    std::string_view rest = colon == std::string_view::npos ? std::string_view() : entry.substr(colon + 1);
    const bool compat = !name.empty() && (name[0] == '+' || name[0] == '-');
    if (compat && rest.empty())
        return name;

    // The password field, whatever it holds.
    const std::size_t password_end = rest.find(':');
    rest = password_end == std::string_view::npos ? std::string_view() : rest.substr(password_end + 1);
    const int numbers = kind == AccountFile::Passwd ? 2 : 1;
    for (int i = 0; i < numbers; ++i) {
        if (!take_number(rest, compat))
            return std::nullopt;
    }
    return name;
}

AccountLineReader::AccountLineReader(const char* path, AccountFile kind)
    : m_fd(open(path, O_RDONLY | O_CLOEXEC)), m_kind(kind), m_colons(kind == AccountFile::Passwd ? 4 : 3)
{
}

AccountLineReader::~AccountLineReader()
{
    if (m_fd >= 0)
        close(m_fd);
}

bool AccountLineReader::refill()
{
    if (!m_block)
        m_block = std::make_unique_for_overwrite<char[]>(kBlockSize + kSlack);
    ssize_t got = 0;
    do
        got = read(m_fd, m_block.get(), kBlockSize);
    while (got < 0 && errno == EINTR);
    m_begin = 0;
    m_end = got > 0 ? static_cast<std::size_t>(got) : 0;
    std::memset(m_block.get() + m_end, 0, kSlack);
    // One look per block spares one per line: account files hold no NUL.
    m_block_holds_nul = std::memchr(m_block.get(), '\0', m_end) != nullptr;
    return m_end > 0;
}

bool AccountLineReader::keep_head(const char* piece, std::size_t length, std::size_t& colons)
{
    const void* nul = m_block_holds_nul ? std::memchr(piece, '\0', length) : nullptr;
    const std::size_t searched = nul ? static_cast<std::size_t>(static_cast<const char*>(nul) - piece) : length;
    std::size_t at = 0;
    while (colons < m_colons) {
        const void* colon = std::memchr(piece + at, ':', searched - at);
        if (!colon)
            break;
        at = static_cast<std::size_t>(static_cast<const char*>(colon) - piece) + 1;
        ++colons;
    }
    if (colons >= m_colons) {
        m_long_line.append(piece, at);
        return true;
    }
    m_long_line.append(piece, nul ? searched + 1 : length);
    return nul != nullptr;
}

namespace {

// The length of the name of a well-formed line, walked a character at a time: a
// password field, numbers of a few digits each, the line end at `line_end`. The line
// end stops every walk.
std::optional<std::size_t> walked_name_length(const char* start, const char* line_end, int numbers)
{
    const char* at = start;
    while (*at != ':' && *at != '\n')
        ++at;
    if (at == line_end)
        return std::nullopt;
    const char* const name_end = at++;
    while (*at != ':' && *at != '\n')
        ++at;
    if (at++ == line_end)
        return std::nullopt;
    for (int field = 0; field < numbers; ++field) {
        // At most nine digits: the value fits 32 bits without a look.
        const char* const digits = at;
        while (static_cast<unsigned char>(*at - '0') < 10)
            ++at;
        if (at == digits || at - digits > 9)
            return std::nullopt;
        if (at == line_end) {
            if (field + 1 < numbers)
                return std::nullopt;
            break;
        }
        if (*at++ != ':')
            return std::nullopt;
    }
    return static_cast<std::size_t>(name_end - start);
}

// The names of the well-formed lines that lie whole in the block from `begin` on, until
// `names` is full or a line is not one: a name that begins with none of the characters
// the readers treat apart, a password field, `Numbers` numbers of a few digits each, a
// line end. `begin` is left at the first other line, for next() and
// account_entry_name() to weigh; on well-formed lines both find the same.
template <int Numbers>
std::size_t plain_line_names(const char* block, std::size_t& begin, std::size_t end, std::span<std::string_view> names)
{
    const char* const block_end = block + end;
    const char* start = block + begin;
    std::size_t count = 0;
    for (; count < names.size() && start < block_end; ++count) {
        const char first = *start;
        // A line end is white space too: an empty line is no plain one.
        if (first == '#' || first == '+' || first == '-' || first == ':' || is_blank(first))
            break;
#if defined(__SSE2__)
        // The block's slack is no line end, colon or digit: the look may reach into it.
        const LineHead head = look_at_head(start);
        const char* line_end = nullptr;
        if (head.line_ends != 0) {
            line_end = start + __builtin_ctz(head.line_ends);
        } else if (const std::uint64_t rest = line_end_bits(start + 32)) {
            line_end = start + 32 + __builtin_ctzll(rest);
        } else {
            line_end = find_line_end(start + 96, block_end);
            if (!line_end)
                break;
        }
        auto name_length = head_name_length<Numbers>(head);
        if (!name_length)
            name_length = walked_name_length(start, line_end, Numbers);
#else
        const char* const line_end = find_line_end(start, block_end);
        if (!line_end)
            break;
        const auto name_length = walked_name_length(start, line_end, Numbers);
#endif
        if (!name_length)
            break;
        names[count] = std::string_view(start, *name_length);
        start = line_end + 1;
    }
    begin = static_cast<std::size_t>(start - block);
    return count;
}

} // namespace

std::size_t AccountLineReader::next_names(std::string& scratch, std::span<std::string_view> names)
{
    if (m_fd < 0)
        return 0;
    std::size_t count = 0;
    for (;;) {
        // The names found so far point into the block: they go before it is read again.
        if (m_begin == m_end && (count > 0 || !refill()))
            return count;
        if (!m_block_holds_nul) {
            const std::span<std::string_view> room = names.subspan(count);
            count += m_kind == AccountFile::Passwd ? plain_line_names<2>(m_block.get(), m_begin, m_end, room)
                                                   : plain_line_names<1>(m_block.get(), m_begin, m_end, room);
            if (count == names.size())
                return count;
            if (m_begin == m_end)
                continue;
        }
        // A line that only the readers' own rules decide; reading it may read the block
        // again, and its name may lie in `scratch`.
        if (count > 0)
            return count;
        const auto line = next();
        if (!line)
            return 0;
        if (const auto entry = account_entry_name(*line, m_kind, scratch)) {
            names[0] = *entry;
            return 1;
        }
    }
}

std::optional<AccountLine> AccountLineReader::next()
{
    if (m_fd < 0)
        return std::nullopt;
    if (m_begin == m_end && !refill())
        return std::nullopt;

    const char* start = m_block.get() + m_begin;
    if (const void* newline = std::memchr(start, '\n', m_end - m_begin)) {
        const auto length = static_cast<std::size_t>(static_cast<const char*>(newline) - start);
        m_begin += length + 1;
        return AccountLine{{start, length}, true, m_block_holds_nul};
    }

    // A line that goes on past the block: keep its head until the entry is decided (the
    // colons it depends on, or a NUL, are in), skip the rest up to the line end.
    m_long_line.clear();
    std::size_t colons = 0;
    bool decided = keep_head(start, m_end - m_begin, colons);
    while (refill()) {
        const char* block = m_block.get();
        const void* newline = std::memchr(block, '\n', m_end);
        const std::size_t length = newline ? static_cast<std::size_t>(static_cast<const char*>(newline) - block) : m_end;
        if (!decided)
            decided = keep_head(block, length, colons);
        if (newline) {
            m_begin = length + 1;
            return AccountLine{m_long_line, true};
        }
    }
    // The last line, without a line end.
    return AccountLine{m_long_line, false};
}
