// The no-data decision: lazy widening of its lists and binding of its kernel.
#include "vrkframework/basic/kubo/masks/maskdecision.h"

#include <algorithm>  // std::min
#include <cstring>    // std::memcpy, std::memset
#include <numeric>    // std::iota
#include <utility>    // std::move
#include <vector>

#include "vrkframework/basic/core/kernels/prefetch.h"
#include "vrkframework/basic/kubo/masks/nodatarequest.h"
#include "vrkframework/basic/kubo/masks/pixelflags.h"
#include "vrkframework/basic/kubo/raster/bufferextent.h"
#include "vrkframework/basic/kubo/raster/raster.h"

namespace kora::kubo {
namespace {

// Pixels of `stride` samples of `sampleBytes` each that the raster's buffer holds; a
// kernel that reads nothing can flag any number of them.
std::uint64_t ReadablePixels(const Raster& raster, std::uint64_t stride,
                             std::uint64_t sampleBytes) {
    if (stride == 0) {
        return detail::kUnbounded;
    }
    return sampleBytes == 0 ? 0 : detail::BufferBytes(raster) / sampleBytes / stride;
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
      m_reachesNextPixel(false),
      m_rule(rule),
      m_expanded(expanded),
      m_noData(std::move(noData)),
      m_channels(std::move(channels)) {}

MaskDecision::MaskDecision(const MaskDecision& other)
    : IMaskDecision(other),
      m_impl(other.m_impl ? other.m_impl->Clone() : nullptr),
      m_bound(other.m_bound),
      m_pixelStride(other.m_pixelStride),
      m_reachesNextPixel(other.m_reachesNextPixel),
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
    m_reachesNextPixel = request.ReachesNextPixel();
    m_impl.reset(detail::MakeMaskDecisionImpl(request));
}

void MaskDecision::Evaluate(const void* samples, unsigned char* flags, std::size_t count) {
    detail::CheckFlagBuffers(flags, flags, count);
    if (m_impl) {
        m_impl->Evaluate(samples, flags, count);
    } else {
        FlagBackground(flags, count);
    }
}

void MaskDecision::Evaluate(const Raster& raster, unsigned char* flags) {
    EvaluateRange(raster, 0, static_cast<std::size_t>(detail::BufferPixels(raster, raster)), flags);
}

void MaskDecision::EvaluateRange(const Raster& raster, std::uint64_t first, std::size_t count,
                                 unsigned char* flags) {
    detail::CheckFlagBuffers(flags, flags, count);
    Update(raster);
    std::size_t evaluated = 0;
    if (m_impl) {
        // Kernels exist for whole-byte components only.
        const std::uint64_t sampleBytes = m_bound.dataType.bits / 8;
        const std::uint64_t readable = ReadablePixels(raster, m_pixelStride, sampleBytes);
        evaluated = first < readable
                        ? static_cast<std::size_t>(std::min<std::uint64_t>(count, readable - first))
                        : 0;
        if (evaluated != 0) {
            const std::uint64_t pixelBytes = m_pixelStride * sampleBytes;
            const unsigned char* start =
                raster.data == nullptr ? nullptr : raster.data + first * pixelBytes;
            if (start != nullptr) {
                // Ranges are mostly evaluated in order: the next one is read meanwhile.
                const std::uint64_t next =
                    std::min<std::uint64_t>(evaluated, readable - first - evaluated);
                detail::PrefetchForReading(start + evaluated * pixelBytes,
                                           static_cast<std::size_t>(next * pixelBytes));
            }
            m_impl->Evaluate(start, flags, evaluated);
            if (m_reachesNextPixel && first + evaluated < readable) {
                // The kernel took the range's last pixel for the buffer's last; its half pair
                // has a partner, the first sample of the pixel after the range.
                const auto bytes = static_cast<std::size_t>(pixelBytes);
                std::vector<unsigned char> twoPixels(2 * bytes);
                std::memcpy(twoPixels.data(), start + (evaluated - 1) * bytes,
                            bytes + static_cast<std::size_t>(sampleBytes));
                unsigned char twoFlags[2];
                m_impl->Evaluate(twoPixels.data(), twoFlags, 2);
                flags[evaluated - 1] = twoFlags[0];
            }
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
