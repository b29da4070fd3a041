// The no-data kernel families. Internal: clients reach them only through
// GetMaskDecisionImpl, and may dynamic_cast to them to see which one they got.
#ifndef VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATAMASKIMPL_H
#define VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATAMASKIMPL_H

#include <cstddef>  // std::size_t
#include <cstdint>  // std::uint64_t
#include <cstring>  // std::memset
#include <type_traits>
#include <utility>  // std::move
#include <vector>

#include "vrkframework/basic/kubo/masks/bkgdrule.h"
#include "vrkframework/basic/kubo/masks/imaskdecisionimpl.h"
#include "vrkframework/basic/kubo/masks/nodatastorage.h"
#include "vrkframework/basic/kubo/masks/pixelflags.h"

/// One channel: a pixel is valid unless its sample equals the no-data value.
template <class T>
class SingleChannelNoDataMaskImpl : public kora::kubo::IMaskDecisionImpl {
public:
    explicit SingleChannelNoDataMaskImpl(T noData) : m_noData(noData) {}

    void Evaluate(const void* samples, unsigned char* flags, std::size_t count) override {
        const kora::kubo::detail::PlainTest<T> test{m_noData};
        kora::kubo::detail::FlagPixels<kora::kubo::BkgdAnyChan>(
            static_cast<const T*>(samples), flags, count, 1, [test](std::size_t) { return test; });
    }
    IMaskDecisionImpl* Clone() const override { return new SingleChannelNoDataMaskImpl(*this); }

    T GetNoData() const { return m_noData; }

private:
    T m_noData;
};

/// Every channel compared with one shared value under `Rule`; the stride is the channel
/// count. Named by rule through the aliases below.
template <class T, kora::kubo::BkgdRule Rule>
class SameNoDataMaskImpl : public kora::kubo::IMaskDecisionImpl {
public:
    SameNoDataMaskImpl(T noData, std::uint64_t channelCount)
        : m_noData(noData), m_channelCount(channelCount) {}

    void Evaluate(const void* samples, unsigned char* flags, std::size_t count) override {
        const kora::kubo::detail::PlainTest<T> test{m_noData};
        kora::kubo::detail::FlagPixels<Rule>(static_cast<const T*>(samples), flags, count,
                                             static_cast<std::size_t>(m_channelCount),
                                             [test](std::size_t) { return test; });
    }
    IMaskDecisionImpl* Clone() const override { return new SameNoDataMaskImpl(*this); }

    T GetNoData() const { return m_noData; }
    std::uint64_t GetChannelCount() const { return m_channelCount; }

private:
    T m_noData;
    std::uint64_t m_channelCount;
};

template <class T>
using SameNoDataAllChansMaskImpl = SameNoDataMaskImpl<T, kora::kubo::BkgdAllChans>;
template <class T>
using SameNoDataAnyChanMaskImpl = SameNoDataMaskImpl<T, kora::kubo::BkgdAnyChan>;
template <class T>
using SameNoDataChanPairsMaskImpl = SameNoDataMaskImpl<T, kora::kubo::BkgdChanPairs>;

/// One no-data entry per channel under `Rule`; the stride is the number of entries. With
/// `Listed` = 0 the entries are values of T applied by position; with `Listed` = 1 they are
/// of the wider type, one per raster channel, and untested channels hold its marker.
/// Named by rule through the aliases below.
template <class T, int Listed, class WiderT, kora::kubo::BkgdRule Rule>
class DiffNoDataMaskImpl : public kora::kubo::IMaskDecisionImpl {
    static_assert(Listed == 0 || Listed == 1, "Listed is 0 or 1");
    static_assert(std::is_same_v<WiderT, kora::kubo::detail::WiderType<T>>,
                  "a family names the one wider type of its element type");

public:
    using Storage = std::conditional_t<Listed == 1, WiderT, T>;

    /// The same family for elements of type U: factories build every element type by
    /// rebinding one instance.
    template <class U>
    class Reassign : public DiffNoDataMaskImpl<U, Listed, kora::kubo::detail::WiderType<U>, Rule> {
        using Base = DiffNoDataMaskImpl<U, Listed, kora::kubo::detail::WiderType<U>, Rule>;

    public:
        using Base::Base;
        kora::kubo::IMaskDecisionImpl* Clone() const override { return new Reassign(*this); }
    };

    explicit DiffNoDataMaskImpl(std::vector<Storage> noData) : m_noData(std::move(noData)) {}

    void Evaluate(const void* samples, unsigned char* flags, std::size_t count) override {
        const Storage* entries = m_noData.data();
        kora::kubo::detail::FlagPixels<Rule>(
            static_cast<const T*>(samples), flags, count, m_noData.size(),
            [entries](std::size_t k) { return kora::kubo::detail::TestOf<T>(entries[k]); });
    }
    IMaskDecisionImpl* Clone() const override { return new DiffNoDataMaskImpl(*this); }

    const std::vector<Storage>& GetNoData() const { return m_noData; }

private:
    std::vector<Storage> m_noData;
};

template <class T, int Listed>
using DiffNoDataAllChansMaskImpl =
    DiffNoDataMaskImpl<T, Listed, kora::kubo::detail::WiderType<T>, kora::kubo::BkgdAllChans>;
template <class T, int Listed, class WiderT>
using DiffNoDataAnyChanMaskImpl = DiffNoDataMaskImpl<T, Listed, WiderT, kora::kubo::BkgdAnyChan>;
template <class T, int Listed, class WiderT>
using DiffNoDataChanPairsMaskImpl =
    DiffNoDataMaskImpl<T, Listed, WiderT, kora::kubo::BkgdChanPairs>;

/// No channel to test: every pixel is valid, whatever its type or stride.
class DummyNoDataMaskImpl : public kora::kubo::IMaskDecisionImpl {
public:
    void Evaluate(const void*, unsigned char* flags, std::size_t count) override {
        if (count != 0) {
            // The samples are never read, so only the flags need a buffer.
            kora::kubo::detail::CheckFlagBuffers(flags, flags, count);
            std::memset(flags, 1, count);
        }
    }
    IMaskDecisionImpl* Clone() const override { return new DummyNoDataMaskImpl(*this); }
};

#endif  // VRKFRAMEWORK_BASIC_KUBO_MASKS_NODATAMASKIMPL_H
