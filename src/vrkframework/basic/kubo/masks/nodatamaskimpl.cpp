// The no-data kernel factory; every kernel family is instantiated here, for the ten
// element types.
#include "vrkframework/basic/kubo/masks/nodatamaskimpl.h"

#include <algorithm>  // std::all_of, std::min

#include "vrkframework/basic/core/typeconv/componenttraits.h"
#include "vrkframework/basic/kubo/masks/nodatarequest.h"

namespace kora::kubo {
namespace detail {
namespace {

// The kernels of the element type whose real descriptor has `code`; null for codes without
// one (the complex and unknown ones).
template <class Make>
IMaskDecisionImpl* ForElementType(NativeDataTypeCode code, const Make& make) {
    IMaskDecisionImpl* made = nullptr;
    typeconv::detail::ForEachComponentType([&](auto tag) {
        using T = typename decltype(tag)::type;
        if (NativeDataType(typeconv::priv::RealDescriptor<T>()).code == code) {
            made = make(tag);
        }
    });
    return made;
}

// A complex type's component: the float layouts are restored, anything else is read as an
// integer of the same width.
DataType ComponentType(const DataType& type) {
    if (type.isSigned && type.isFloat && type.bits == 32) {
        return DataType::Type32R;
    }
    if (type.isSigned && type.isFloat && type.bits == 64) {
        return DataType::Type64R;
    }
    return DataType(type.bits, type.isSigned, type.isFloat, type.bits, 0, false);
}

template <class S>
std::vector<S> ByPosition(const std::vector<double>& noData) {
    std::vector<S> entries;
    entries.reserve(noData.size());
    for (const double v : noData) {
        entries.push_back(ToStorage<S>(v));
    }
    return entries;
}

// One entry per channel, untested unless listed; a later entry for a channel wins, and
// channel numbers outside 1..channelCount are skipped.
template <class S>
std::vector<S> ByChannel(const NoDataRequest& request) {
    std::vector<S> entries(static_cast<std::size_t>(request.channelCount), UntestedEntry<S>());
    const std::size_t listed = std::min(request.channels.size(), request.noData.size());
    for (std::size_t i = 0; i < listed; ++i) {
        const std::uint64_t channel = request.channels[i];
        if (channel >= 1 && channel <= request.channelCount) {
            entries[static_cast<std::size_t>(channel - 1)] = ToStorage<S>(request.noData[i]);
        }
    }
    return entries;
}

// Each rule's family is written once: the signed 8-bit instance rebinds its element type.
template <BkgdRule Rule, class T>
IMaskDecisionImpl* MakeFamily(const NoDataRequest& request) {
    if (request.same) {
        return new SameNoDataMaskImpl<T, Rule>(ToStorage<T>(request.noData.front()),
                                               request.channelCount);
    }
    if (request.listed) {
        using Listed = DiffNoDataMaskImpl<char, 1, WiderType<char>, Rule>;
        return new typename Listed::template Reassign<T>(ByChannel<WiderType<T>>(request));
    }
    using ByPos = DiffNoDataMaskImpl<char, 0, WiderType<char>, Rule>;
    return new typename ByPos::template Reassign<T>(ByPosition<T>(request.noData));
}

}  // namespace

std::uint64_t NoDataRequest::Stride() const {
    if (nothingTested) {
        return 0;
    }
    if (single) {
        return 1;
    }
    return listed || same ? channelCount : noData.size();
}

NoDataRequest MakeNoDataRequest(DataType type, std::uint64_t channelCount, BkgdRule rule,
                                std::vector<double> noData, std::vector<unsigned int> channels) {
    NoDataRequest request{NDT_UNKNOWN, channelCount, rule, {}, {}, false, false, false, false};
    request.nothingTested = channels.empty() || noData.empty();
    if (type.isComplex) {
        request.channelCount = 2 * channelCount;
        request.rule = rule == BkgdAnyChan ? BkgdChanPairs : rule;
        for (const double v : noData) {
            request.noData.push_back(v);
            request.noData.push_back(0.0);
        }
        for (const unsigned int c : channels) {
            request.channels.push_back(2 * std::uint64_t{c} - 1);
            request.channels.push_back(2 * std::uint64_t{c});
        }
        type = ComponentType(type);
    } else {
        request.noData = std::move(noData);
        request.channels.assign(channels.begin(), channels.end());
    }
    request.code = NativeDataType(type).code;
    request.single = request.channelCount == 1;
    request.listed = request.channels.size() < request.channelCount;
    request.same = !request.listed &&
                   std::all_of(request.noData.begin(), request.noData.end(),
                               [&request](double v) { return v == request.noData.front(); });
    return request;
}

IMaskDecisionImpl* MakeMaskDecisionImpl(const NoDataRequest& request) {
    if (request.nothingTested) {
        return new DummyNoDataMaskImpl();
    }
    return ForElementType(request.code, [&request](auto tag) -> IMaskDecisionImpl* {
        using T = typename decltype(tag)::type;
        if (request.single) {
            return new SingleChannelNoDataMaskImpl<T>(ToStorage<T>(request.noData.front()));
        }
        switch (request.rule) {
            case BkgdAllChans:
                return MakeFamily<BkgdAllChans, T>(request);
            case BkgdAnyChan:
                return MakeFamily<BkgdAnyChan, T>(request);
            case BkgdChanPairs:
                return MakeFamily<BkgdChanPairs, T>(request);
            default:
                return nullptr;
        }
    });
}

}  // namespace detail

IMaskDecisionImpl* GetMaskDecisionImpl(DataType type, std::uint64_t channelCount, BkgdRule rule,
                                       std::vector<double> noData,
                                       std::vector<unsigned int> channels) {
    return detail::MakeMaskDecisionImpl(detail::MakeNoDataRequest(
        type, channelCount, rule, std::move(noData), std::move(channels)));
}

}  // namespace kora::kubo
