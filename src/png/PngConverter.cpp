#include "PngConverter.h"

#include "platform/gdi/Surface.h"

#include <algorithm>
#include <cstring>
#include <utility>

#if defined(__x86_64__) || defined(__i386__)
#define ZELCTL_PNG_X86 1
#include <immintrin.h>
#endif

namespace zelctl::png {

namespace {

using gdi::detail::writePixel;
using Rgba8 = Converter::Rgba8;

constexpr bool divide255IsExact()
{
    for (unsigned v = 0; v <= 255 * 255; ++v) {
        if (divide255(v) != v / 255)
            return false;
    }
    return true;
}
static_assert(divide255IsExact());

inline unsigned sampleAt(const uint8_t *row, int64_t i, int depth)
{
    switch (depth) {
    case 8:
        return row[i];
    case 16:
        return unsigned(row[2 * i]) << 8 | row[2 * i + 1];
    case 4:
        return (row[i >> 1] >> (4 - 4 * (i & 1))) & 0xFu;
    case 2:
        return (row[i >> 2] >> (6 - 2 * (i & 3))) & 0x3u;
    default:
        return (row[i >> 3] >> (7 - (i & 7))) & 0x1u;
    }
}

Simd detectedSimd()
{
#if defined(ZELCTL_PNG_X86)
    __builtin_cpu_init();
    return __builtin_cpu_supports("ssse3") ? Simd::Ssse3 : Simd::None;
#else
    return Simd::None;
#endif
}

Simd &currentSimd()
{
    static Simd level = detectedSimd();
    return level;
}

// Spreads pixels converted side by side over every step-th pixel of a bitmap row.
template <int Bytes> void spread(const uint8_t *from, int64_t count, uint8_t *to, int64_t advance)
{
    for (int64_t i = 0; i < count; ++i, from += Bytes, to += advance)
        std::memcpy(to, from, Bytes);
}

#if defined(ZELCTL_PNG_X86)
#define ZELCTL_SSSE3 __attribute__((target("ssse3")))

// Where a colour image keeps the first byte of each sample of a pixel; a < 0 when opaque.
struct Layout
{
    int bytes, r, g, b, a;
};
constexpr Layout rgb8 { 3, 0, 1, 2, -1 };
constexpr Layout rgb16 { 6, 0, 2, 4, -1 };
constexpr Layout rgba8 { 4, 0, 1, 2, 3 };
constexpr Layout rgba16 { 8, 0, 2, 4, 6 };
constexpr Layout greyAlpha8 { 2, 0, 0, 0, 1 };
constexpr Layout greyAlpha16 { 4, 0, 0, 0, 2 };

// Keep: colour as read, alpha as read (255 for an opaque layout). Premultiply: colour ×
// alpha / 255. Composite: laid on the background, opaque.
enum class AlphaOp { Keep, Premultiply, Composite };

// A shuffle per output and input register: which input bytes land where (-128 clears).
template <int Outputs, int Inputs> struct Shuffles
{
    std::array<std::array<std::array<int8_t, 16>, Inputs>, Outputs> masks {};
    std::array<std::array<bool, Inputs>, Outputs> used {};

    constexpr void clear()
    {
        for (auto &output : masks) {
            for (auto &mask : output)
                mask.fill(-128);
        }
    }
    constexpr void take(int output, int byte, int input)
    {
        masks[output][input / 16][byte] = int8_t(input % 16);
        used[output][input / 16] = true;
    }
};

// The B, G, R, A of 16 pixels, four to a register, from 16 pixels of a layout.
template <Layout L> constexpr Shuffles<4, L.bytes> gatherShuffles()
{
    Shuffles<4, L.bytes> s;
    s.clear();
    for (int out = 0; out < 4; ++out) {
        for (int byte = 0; byte < 16; ++byte) {
            const int channel = byte % 4;
            const int offset = channel == 0 ? L.b : channel == 1 ? L.g : channel == 2 ? L.r : L.a;
            if (offset >= 0)
                s.take(out, byte, (4 * out + byte / 4) * L.bytes + offset);
        }
    }
    return s;
}
template <Layout L> constexpr Shuffles<4, L.bytes> gathers = gatherShuffles<L>();

// The B, G, R of 16 pixels packed into three registers, from their B, G, R, A.
constexpr Shuffles<3, 4> packShuffles()
{
    Shuffles<3, 4> s;
    s.clear();
    for (int byte = 0; byte < 48; ++byte)
        s.take(byte / 16, byte % 16, (byte / 3) * 4 + byte % 3);
    return s;
}
constexpr Shuffles<3, 4> packs = packShuffles();

template <int Outputs, int Inputs, const Shuffles<Outputs, Inputs> &S, int Out, int In>
ZELCTL_SSSE3 inline void shuffleInto(__m128i &out, const __m128i *in)
{
    if constexpr (S.used[Out][In]) {
        const __m128i mask = _mm_loadu_si128(reinterpret_cast<const __m128i *>(S.masks[Out][In].data()));
        out = _mm_or_si128(out, _mm_shuffle_epi8(in[In], mask));
    }
}

template <int Outputs, int Inputs, const Shuffles<Outputs, Inputs> &S, int Out, size_t... In>
ZELCTL_SSSE3 inline __m128i shuffled(const __m128i *in, std::index_sequence<In...>)
{
    __m128i out = _mm_setzero_si128();
    (shuffleInto<Outputs, Inputs, S, Out, int(In)>(out, in), ...);
    return out;
}

ZELCTL_SSSE3 inline __m128i divide255x8(__m128i v)
{
    return _mm_srli_epi16(_mm_add_epi16(_mm_add_epi16(v, _mm_set1_epi16(1)), _mm_srli_epi16(v, 8)), 8);
}

// One register of four B, G, R, A pixels through the alpha rule, in 16-bit lanes: c × a (+
// background × (255 - a)) stays below 65536, and divide255x8 is exact there.
template <AlphaOp Op> ZELCTL_SSSE3 inline __m128i applyAlpha(__m128i pixels, __m128i background)
{
    if constexpr (Op == AlphaOp::Keep) {
        return pixels;
    } else {
        const __m128i zero = _mm_setzero_si128();
        const __m128i alphaBytes = _mm_set1_epi32(int(0xFF000000u));
        __m128i low = _mm_unpacklo_epi8(pixels, zero);
        __m128i high = _mm_unpackhi_epi8(pixels, zero);
        const __m128i lowAlpha = _mm_shufflehi_epi16(_mm_shufflelo_epi16(low, 0xFF), 0xFF);
        const __m128i highAlpha = _mm_shufflehi_epi16(_mm_shufflelo_epi16(high, 0xFF), 0xFF);
        low = _mm_mullo_epi16(low, lowAlpha);
        high = _mm_mullo_epi16(high, highAlpha);
        if constexpr (Op == AlphaOp::Composite) {
            const __m128i full = _mm_set1_epi16(255);
            low = _mm_add_epi16(low, _mm_mullo_epi16(background, _mm_sub_epi16(full, lowAlpha)));
            high = _mm_add_epi16(high, _mm_mullo_epi16(background, _mm_sub_epi16(full, highAlpha)));
        }
        const __m128i colour = _mm_packus_epi16(divide255x8(low), divide255x8(high));
        if constexpr (Op == AlphaOp::Composite)
            return _mm_or_si128(colour, alphaBytes);
        else
            return _mm_or_si128(_mm_andnot_si128(alphaBytes, colour), _mm_and_si128(alphaBytes, pixels));
    }
}

// Converts blocks of 16 pixels of a layout into 3- or 4-byte bitmap pixels.
template <Layout L, AlphaOp Op, int OutBytes>
ZELCTL_SSSE3 void convertKernel(const uint8_t *src, uint8_t *dst, int64_t blocks, int32_t background)
{
    const short bgR = short(background & 0xFF), bgG = short(background >> 8 & 0xFF),
                bgB = short(background >> 16 & 0xFF);
    const __m128i backgroundLanes = _mm_setr_epi16(bgB, bgG, bgR, 0, bgB, bgG, bgR, 0);
    const __m128i opaque = L.a < 0 ? _mm_set1_epi32(int(0xFF000000u)) : _mm_setzero_si128();
    constexpr auto inputs = std::make_index_sequence<size_t(L.bytes)>();
    constexpr auto fourInputs = std::make_index_sequence<4>();
    for (int64_t n = 0; n < blocks; ++n, src += 16 * L.bytes, dst += 16 * OutBytes) {
        __m128i in[L.bytes];
        for (int r = 0; r < L.bytes; ++r)
            in[r] = _mm_loadu_si128(reinterpret_cast<const __m128i *>(src + 16 * r));
        __m128i pixels[4] = {
            shuffled<4, L.bytes, gathers<L>, 0>(in, inputs),
            shuffled<4, L.bytes, gathers<L>, 1>(in, inputs),
            shuffled<4, L.bytes, gathers<L>, 2>(in, inputs),
            shuffled<4, L.bytes, gathers<L>, 3>(in, inputs),
        };
        for (__m128i &p : pixels)
            p = applyAlpha<Op>(_mm_or_si128(p, opaque), backgroundLanes);
        if constexpr (OutBytes == 4) {
            for (int j = 0; j < 4; ++j)
                _mm_storeu_si128(reinterpret_cast<__m128i *>(dst + 16 * j), pixels[j]);
        } else {
            _mm_storeu_si128(reinterpret_cast<__m128i *>(dst), shuffled<3, 4, packs, 0>(pixels, fourInputs));
            _mm_storeu_si128(reinterpret_cast<__m128i *>(dst + 16), shuffled<3, 4, packs, 1>(pixels, fourInputs));
            _mm_storeu_si128(reinterpret_cast<__m128i *>(dst + 32), shuffled<3, 4, packs, 2>(pixels, fourInputs));
        }
    }
}

template <Layout L> Converter::Kernel kernelFor(AlphaOp op, int outBytes)
{
    if (outBytes == 3)
        return op == AlphaOp::Keep ? &convertKernel<L, AlphaOp::Keep, 3> : nullptr;
    if constexpr (L.a < 0) {
        return convertKernel<L, AlphaOp::Keep, 4>; // opaque pixels are their own premultiplication
    } else {
        switch (op) {
        case AlphaOp::Keep:
            return convertKernel<L, AlphaOp::Keep, 4>;
        case AlphaOp::Premultiply:
            return convertKernel<L, AlphaOp::Premultiply, 4>;
        case AlphaOp::Composite:
            return convertKernel<L, AlphaOp::Composite, 4>;
        }
    }
    return nullptr;
}

Converter::Kernel chooseKernel(int colorType, int depth, bool keyed, int outBits, int32_t background)
{
    if (currentSimd() < Simd::Ssse3 || (outBits != 24 && outBits != 32) || (depth != 8 && depth != 16))
        return nullptr;
    const AlphaOp op = outBits == 24 ? (background == -1 ? AlphaOp::Keep : AlphaOp::Composite)
        : background == -1           ? AlphaOp::Premultiply
                                     : AlphaOp::Composite;
    const bool wide = depth == 16;
    switch (colorType) {
    case Rgb:
        return keyed ? nullptr : wide ? kernelFor<rgb16>(op, outBits / 8) : kernelFor<rgb8>(op, outBits / 8);
    case Rgba:
        return wide ? kernelFor<rgba16>(op, outBits / 8) : kernelFor<rgba8>(op, outBits / 8);
    case GreyAlpha:
        return wide ? kernelFor<greyAlpha16>(op, outBits / 8) : kernelFor<greyAlpha8>(op, outBits / 8);
    default:
        return nullptr;
    }
}
#else
Converter::Kernel chooseKernel(int, int, bool, int, int32_t)
{
    return nullptr;
}
#endif

} // namespace

Simd simdLevel()
{
    return currentSimd();
}

void setSimdLevel(Simd level)
{
    currentSimd() = std::min(level, detectedSimd());
}

Converter::Converter(const Header &header, const FileInfo &info, const DecodeOptions &options, int bitCount)
    : m_colorType(header.colorType)
    , m_depth(header.bitDepth)
    , m_outBits(bitCount)
    , m_sourceBytes(header.streamBitsPerPixel() / 8)
    , m_background(options.displayBackground)
{
    const auto *palette = reinterpret_cast<const uint8_t *>(info.paletteBytes.constData());
    const int entries = int(std::min<qsizetype>(info.paletteBytes.size() / 3, 256));
    m_palette.fill({ 0, 0, 0, 255 });
    for (int i = 0; i < entries; ++i)
        m_palette[i] = { palette[3 * i], palette[3 * i + 1], palette[3 * i + 2], 255 };
    if (info.transparentColor != -1) {
        const auto *trns = reinterpret_cast<const uint8_t *>(info.transparencyBytes.constData());
        const qsizetype trnsLength = info.transparencyBytes.size();
        if (m_colorType == Indexed) {
            for (int i = 0; i < 256 && i < trnsLength; ++i)
                m_palette[i].a = trns[i];
        } else if (m_colorType == Grey || m_colorType == Rgb) {
            m_keyed = true;
            if (m_depth == 16) {
                // A 16-bit key compares whole samples, not just their first bytes.
                const int samples = m_colorType == Grey ? 1 : 3;
                m_keyed = trnsLength >= 2 * samples;
                for (int s = 0; m_keyed && s < samples; ++s)
                    m_key16[s] = trns[2 * s] << 8 | trns[2 * s + 1];
            } else {
                m_key8 = uint32_t(info.transparentColor);
            }
        }
    }

    const bool indexedSamples = (m_colorType == Indexed || m_colorType == Grey) && m_depth <= 8;
    if (m_outBits == 32 && (indexedSamples || (m_colorType == Grey && m_depth == 16 && !m_keyed))) {
        m_table.resize(256);
        for (unsigned v = 0; v < 256; ++v) {
            // A sample of the table's index: 16-bit grey by its first byte, low depths masked.
            const uint8_t bytes[2] = { uint8_t(v), 0 };
            const unsigned low = m_depth < 8 ? v & ((1u << m_depth) - 1) : v;
            const uint8_t shifted = uint8_t(m_depth < 8 ? low << (8 - m_depth) : low);
            m_table[v] = finished(sample(m_depth < 8 ? &shifted : bytes, 0));
        }
    } else {
        m_kernel = chooseKernel(m_colorType, m_depth, m_keyed, m_outBits, m_background);
    }
}

Rgba8 Converter::sample(const uint8_t *src, int64_t i) const
{
    switch (m_colorType) {
    case Rgb: {
        if (m_depth == 16) {
            const uint8_t *p = src + 6 * i;
            const bool key = m_keyed && unsigned(p[0] << 8 | p[1]) == m_key16[0]
                && unsigned(p[2] << 8 | p[3]) == m_key16[1] && unsigned(p[4] << 8 | p[5]) == m_key16[2];
            return { p[0], p[2], p[4], key ? 0u : 255u };
        }
        const uint8_t *p = src + 3 * i;
        const bool key = m_keyed && uint32_t(p[0] << 16 | p[1] << 8 | p[2]) == m_key8;
        return { p[0], p[1], p[2], key ? 0u : 255u };
    }
    case Rgba: {
        const int n = m_depth / 8;
        const uint8_t *p = src + 4 * n * i;
        return { p[0], p[n], p[2 * n], p[3 * n] };
    }
    case GreyAlpha: {
        const int n = m_depth / 8;
        const uint8_t *p = src + 2 * n * i;
        return { p[0], p[0], p[0], p[n] };
    }
    case Grey: {
        const unsigned value = sampleAt(src, i, m_depth);
        const bool key = m_keyed && (m_depth == 16 ? value == m_key16[0] : value == m_key8);
        unsigned level = value;
        if (m_depth == 16)
            level = value >> 8;
        else if (m_depth < 8)
            level = value * (255 / ((1u << m_depth) - 1));
        return { level, level, level, key ? 0u : 255u };
    }
    default:
        return m_palette[sampleAt(src, i, m_depth)];
    }
}

// A pixel of a 32-bit bitmap, B, G, R, A from the low byte: laid on the background when
// there is one (and then opaque), premultiplied, all zero when transparent.
uint32_t Converter::finished(Rgba8 c) const
{
    if (m_background != -1) {
        const unsigned inverse = 255 - c.a;
        c = { divide255(c.r * c.a + (m_background & 0xFF) * inverse),
            divide255(c.g * c.a + (m_background >> 8 & 0xFF) * inverse),
            divide255(c.b * c.a + (m_background >> 16 & 0xFF) * inverse), 255 };
    }
    if (c.a == 0)
        return 0;
    return divide255(c.b * c.a) | divide255(c.g * c.a) << 8 | divide255(c.r * c.a) << 16 | c.a << 24;
}

void Converter::convert(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step)
{
    if (m_outBits <= 8)
        convertIndexed(src, count, dst, x0, step);
    else if (!m_table.empty())
        convertThroughTable(src, count, dst, x0, step);
    else if (m_kernel)
        convertBlocks(src, count, dst, x0, step);
    else
        convertEach(src, count, dst, x0, step);
}

void Converter::convertEach(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const
{
    const int bytes = m_outBits / 8;
    uint8_t *p = dst + bytes * x0;
    const int64_t advance = int64_t(bytes) * step;
    for (int64_t i = 0; i < count; ++i, p += advance) {
        const Rgba8 c = sample(src, i);
        if (bytes == 4) {
            const uint32_t pixel = finished(c);
            std::memcpy(p, &pixel, 4);
            continue;
        }
        // Alpha not kept: the colour as it is, or laid on the background.
        const uint32_t colour = m_background == -1 ? c.b | c.g << 8 | c.r << 16 : finished(c);
        p[0] = uint8_t(colour);
        p[1] = uint8_t(colour >> 8);
        p[2] = uint8_t(colour >> 16);
    }
}

void Converter::convertIndexed(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const
{
    if (step == 1 && x0 == 0 && m_outBits == m_depth) {
        std::memcpy(dst, src, size_t(rowBytes(count, m_depth)));
        return;
    }
    if (m_outBits == 8) {
        // 8- and 16-bit samples: the index is the first byte.
        const int size = m_depth / 8;
        uint8_t *p = dst + x0;
        for (int64_t i = 0; i < count; ++i, p += step)
            *p = src[size * i];
        return;
    }
    for (int64_t i = 0; i < count; ++i)
        writePixel(dst, int(x0 + i * step), m_outBits, sampleAt(src, i, m_depth));
}

void Converter::convertThroughTable(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step) const
{
    const uint32_t *table = m_table.data();
    uint8_t *p = dst + 4 * x0;
    const int64_t advance = 4 * int64_t(step);
    if (m_depth == 8) {
        for (int64_t i = 0; i < count; ++i, p += advance)
            std::memcpy(p, &table[src[i]], 4);
    } else if (m_depth == 16) {
        for (int64_t i = 0; i < count; ++i, p += advance)
            std::memcpy(p, &table[src[2 * i]], 4);
    } else {
        for (int64_t i = 0; i < count; ++i, p += advance)
            std::memcpy(p, &table[sampleAt(src, i, m_depth)], 4);
    }
}

void Converter::convertBlocks(const uint8_t *src, int64_t count, uint8_t *dst, int64_t x0, int step)
{
    const int bytes = m_outBits / 8;
    const int64_t blocks = count / 16;
    const int64_t done = blocks * 16;
    if (step == 1) {
        m_kernel(src, dst + bytes * x0, blocks, m_background);
        convertEach(src + done * m_sourceBytes, count - done, dst, x0 + done, 1);
        return;
    }
    // A pass row is converted side by side, then spread over its pixels.
    if (m_scratch.size() < size_t(count * bytes))
        m_scratch.resize(size_t(count * bytes));
    m_kernel(src, m_scratch.data(), blocks, m_background);
    convertEach(src + done * m_sourceBytes, count - done, m_scratch.data(), done, 1);
    if (bytes == 4)
        spread<4>(m_scratch.data(), count, dst + 4 * x0, 4 * int64_t(step));
    else
        spread<3>(m_scratch.data(), count, dst + 3 * x0, 3 * int64_t(step));
}

} // namespace zelctl::png
