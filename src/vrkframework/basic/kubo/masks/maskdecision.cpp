// The no-data decision: lazy widening of its lists and binding of its kernel.
#include "vrkframework/basic/kubo/masks/maskdecision.h"

#include <algorithm>  // std::min
#include <cstring>    // std::memset
#include <limits>
#include <numeric>  // std::iota
#include <utility>  // std::move

#include "vrkframework/basic/kubo/masks/nodatarequest.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace kora::kubo {
namespace {

constexpr std::uint64_t kUnbounded = std::numeric_limits<std::uint64_t>::max();

std::uint64_t SaturatingProduct(std::uint64_t a, std::uint64_t b) {
    return a != 0 && b > kUnbounded / a ? kUnbounded : a * b;
}

// Pixels of `stride` samples that the raster's buffer holds; a kernel that reads nothing
// can flag any number of them.
std::uint64_t ReadablePixels(const Raster& raster, std::uint64_t stride) {
    if (stride == 0) {
        return kUnbounded;
    }
    if (raster.data == nullptr) {
        return 0;
    }
    const std::uint64_t pixels =
        SaturatingProduct(raster.width + 2 * raster.xMargin, raster.height + 2 * raster.yMargin);
    const std::uint64_t samplesPerPixel =
        std::uint64_t{raster.channels} * (raster.dataType.isComplex ? 2 : 1);
    return SaturatingProduct(pixels, samplesPerPixel) / stride;
}

void FlagBackground(unsigned char* flags, std::size_t count) {
    if (count != 0) {
        std::memset(flags, 0, count);
    }
}

}  // namespace

MaskDecision::MaskDecision(BkgdRule rule, std::vector<double> noData,
                           std::vector<unsigned int> channels, bool expanded)
    : m_pixelStride(0),
      m_rule(rule),
      m_expanded(expanded),
      m_noData(std::move(noData)),
      m_channels(std::move(channels)) {}

MaskDecision::MaskDecision(const MaskDecision& other)
    : IMaskDecision(other),
      m_impl(other.m_impl ? other.m_impl->Clone() : nullptr),
      m_bound(other.m_bound),
      m_pixelStride(other.m_pixelStride),
      m_rule(other.m_rule),
      m_expanded(other.m_expanded),
      m_noData(other.m_noData),
      m_channels(other.m_channels) {}

MaskDecision& MaskDecision::operator=(const MaskDecision& other) {
    if (this != &other) {
        MaskDecision copy(other);
        *this = std::move(copy);
    }
    return *this;
}

MaskDecision::MaskDecision(MaskDecision&&) noexcept = default;
MaskDecision& MaskDecision::operator=(MaskDecision&&) noexcept = default;
MaskDecision::~MaskDecision() = default;

void MaskDecision::Update(const RasterInfo& info) {
    if (!m_expanded && !m_noData.empty()) {
        const double value = m_noData.back();
        m_noData.resize(info.channels, value);
        m_channels.resize(m_noData.size());
        std::iota(m_channels.begin(), m_channels.end(), 1u);
        m_expanded = true;
    }
    if (m_impl && info.channels == m_bound.channels && info.dataType == m_bound.dataType) {
        return;
    }
    // Drop the old kernel first: should making the new one fail, the next call tries again
    // instead of running a kernel made for other samples.
    m_impl.reset();
    m_bound = RasterInfo(info.width, info.height, info.channels, info.dataType);
    const detail::NoDataRequest request =
        detail::MakeNoDataRequest(m_bound.dataType, m_bound.channels, m_rule, m_noData, m_channels);
    m_pixelStride = request.Stride();
    m_impl.reset(detail::MakeMaskDecisionImpl(request));
}

void MaskDecision::Evaluate(const void* samples, unsigned char* flags, std::size_t count) {
    if (m_impl) {
        m_impl->Evaluate(samples, flags, count);
    } else {
        FlagBackground(flags, count);
    }
}

void MaskDecision::Evaluate(const Raster& raster, unsigned char* flags) {
    const std::uint64_t pixels = std::uint64_t{raster.width + 2 * raster.xMargin} *
                                 std::uint64_t{raster.height + 2 * raster.yMargin};
    EvaluateRange(raster, 0, static_cast<std::size_t>(pixels), flags);
}

void MaskDecision::EvaluateRange(const Raster& raster, std::uint64_t first, std::size_t count,
                                 unsigned char* flags) {
    Update(raster);
    std::size_t evaluated = 0;
    if (m_impl) {
        const std::uint64_t readable = ReadablePixels(raster, m_pixelStride);
        evaluated = first < readable
                        ? static_cast<std::size_t>(std::min<std::uint64_t>(count, readable - first))
                        : 0;
        if (evaluated != 0) {
            const std::uint64_t sampleBytes = m_bound.dataType.bits / 8;
            const unsigned char* start = raster.data == nullptr
                                             ? nullptr
                                             : raster.data + first * m_pixelStride * sampleBytes;
            m_impl->Evaluate(start, flags, evaluated);
        }
    }
    FlagBackground(flags + evaluated, count - evaluated);
}

unsigned char MaskDecision::IsValid(const void* pixel) {
    unsigned char flag = 0;
    Evaluate(pixel, &flag, 1);
    return flag;
}

IMaskDecision* MaskDecision::Clone() const { return new MaskDecision(*this); }

}  // namespace kora::kubo
