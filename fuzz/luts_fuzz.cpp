// Builds lookup and pseudocolour tables from random breakpoints (unsorted, repeated, NaN and
// infinite inputs and outputs, too few of them) and from byte forms of any length, then looks
// up random inputs: the stored breakpoints, every lookup and the classic tests must follow
// the breakpoint rules, and only the documented cases may fail, with their reports.
#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>  // std::memcpy
#include <limits>
#include <optional>
#include <string>
#include <utility>
#include <vector>

#include "fuzzfailure.h"
#include "fuzzinput.h"
#include "vrkframework/basic/kubo/luts/lut.h"
#include "vrkframework/basic/kubo/luts/pct.h"

using kora::kubo::LUT;
using kora::kubo::PCT;
using kubo_fuzz::Check;
using kubo_fuzz::FuzzInput;
using Colour = PCT::Colour;

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();
constexpr double kInf = std::numeric_limits<double>::infinity();
constexpr std::size_t kClassicCount = 256;

// What a table reports about itself when it refuses its input.
struct Names {
    const char* name;
    const char* source;
    const char* bytesSignature;
    unsigned int bytesLine;
    const char* pairSignature;
};

constexpr Names kLutNames{
    "LUT", "vrkframework/basic/kubo/luts/lut",
    "__cdecl kora::kubo::LUT::LUT(const class std::vector<unsigned char,class "
    "std::allocator<unsigned char> > &)",
    50,
    "__cdecl kora::kubo::LUT::LUT(const class std::vector<struct std::pair<double,double>,class "
    "std::allocator<struct std::pair<double,double> > > &)"};

constexpr Names kPctNames{
    "PCT", "vrkframework/basic/kubo/luts/pct",
    "__cdecl kora::kubo::PCT::PCT(const class std::vector<struct kora::kubo::RGBTuple<unsigned "
    "char>,class std::allocator<struct kora::kubo::RGBTuple<unsigned char> > > &)",
    54,
    "__cdecl kora::kubo::PCT::PCT(const class std::vector<struct std::pair<double,struct "
    "kora::kubo::RGBTuple<unsigned char> >,class std::allocator<struct std::pair<double,struct "
    "kora::kubo::RGBTuple<unsigned char> > > > &)"};

// A number where the breakpoint rules have their edges: small whole numbers and fractions
// mostly; repeats of `previous`; signed zero, NaN, infinities; whole numbers whose low 32 bits
// index a small table (k +- m 2^32); numbers past the 64-bit range; any bit pattern.
double TakeNumber(FuzzInput& input, double previous) {
    switch (input.Take(16)) {
        case 0:
            return kNaN;
        case 1:
            return kInf;
        case 2:
            return -kInf;
        case 3:
            return -0.0;
        case 4:
        case 5:
            return previous;
        case 6: {
            const double high = 0x1p32 * (1 + input.Take(3)) * (input.Take(2) == 0 ? 1 : -1);
            return high + input.Take(8);
        }
        case 7: {
            constexpr double kFar[] = {0x1p63, -0x1p63, 1e19, -1e300, 1e300, 0x1p64};
            return kFar[input.Take(6)];
        }
        case 8: {
            std::uint64_t bits = 0;
            for (int i = 0; i < 8; ++i) {
                bits = bits << 8 | input.Take(256);
            }
            double value;
            std::memcpy(&value, &bits, sizeof value);
            return value;
        }
        case 9:
        case 10:
            return static_cast<double>(input.Take(40)) - 8.0 + input.Take(8) / 8.0;
        default:
            return static_cast<double>(input.Take(40)) - 8.0;
    }
}

// Outputs: a classic table's are whole bytes but now and then anything.
void TakeOutput(FuzzInput& input, bool classic, double& output) {
    output = classic && input.Take(8) != 1 ? input.Take(256) : TakeNumber(input, 0.0);
}

void TakeOutput(FuzzInput& input, bool, Colour& colour) {
    colour.r = static_cast<unsigned char>(input.Take(256));
    colour.g = static_cast<unsigned char>(input.Take(256));
    colour.b = static_cast<unsigned char>(input.Take(256));
}

bool Same(double a, double b) {
    return std::isnan(a) ? std::isnan(b) : a == b && std::signbit(a) == std::signbit(b);
}

bool Same(const Colour& a, const Colour& b) { return a.r == b.r && a.g == b.g && a.b == b.b; }

template <class Entry>
bool SameEntry(const Entry& a, const Entry& b) {
    return Same(a.first, b.first) && Same(a.second, b.second);
}

// A key per value that is equal exactly when Same is: every NaN one key, -0 and +0 two.
std::uint64_t KeyOf(double x) {
    std::uint64_t bits = 0x7FF8000000000000u;
    if (!std::isnan(x)) {
        std::memcpy(&bits, &x, sizeof bits);
    }
    return bits;
}

std::uint64_t KeyOf(const Colour& c) {
    return c.r | static_cast<std::uint64_t>(c.g) << 8 | static_cast<std::uint64_t>(c.b) << 16;
}

// The entries' keys in order: two lists hold the same entries (as SameEntry tells them
// apart) exactly when these are equal, found in n log n where tables reach thousands.
template <class Entry>
std::vector<std::pair<std::uint64_t, std::uint64_t>> SortedKeys(const std::vector<Entry>& entries) {
    std::vector<std::pair<std::uint64_t, std::uint64_t>> keys;
    keys.reserve(entries.size());
    for (const Entry& entry : entries) {
        keys.emplace_back(KeyOf(entry.first), KeyOf(entry.second));
    }
    std::sort(keys.begin(), keys.end());
    return keys;
}

// Linear interpolation between two breakpoints, in the rule's order of operations.
double Blend(const LUT::Entry& lower, const LUT::Entry& upper, double x) {
    return (x - lower.first) / (upper.first - lower.first) * (upper.second - lower.second) +
           lower.second;
}

// Each component on its own, truncated toward zero. Where the position is undefined (inf / inf
// next to an infinite input, or a NaN upper input) the upper colour answers.
Colour Blend(const PCT::Entry& lower, const PCT::Entry& upper, double x) {
    const double position = (x - lower.first) / (upper.first - lower.first);
    const double t = std::isnan(position) ? 1.0 : position;
    const auto blend = [t](unsigned char from, unsigned char to) {
        return static_cast<unsigned char>(static_cast<int>((to - from) * t + from));
    };
    return {blend(lower.second.r, upper.second.r), blend(lower.second.g, upper.second.g),
            blend(lower.second.b, upper.second.b)};
}

// The answers the lookup rules allow for `x`: the breakpoint a whole `x` indexes directly by
// the low 32 bits of its truncation; otherwise the answer at each place j a lower bound search
// can stop, with input j - 1 below `x` and input j not below. Sorted breakpoints have one such
// place; breakpoints that NaN inputs leave unsorted may have several.
template <class Value>
std::vector<Value> Answers(const std::vector<std::pair<double, Value>>& e, double x) {
    const std::size_t n = e.size();
    // Outside the 64-bit range, NaN included, the truncation has no value; an index of 0 or
    // past the table leaves the answer to the search.
    if (x > -0x1p63 && x < 0x1p63) {
        const auto k = static_cast<std::uint32_t>(static_cast<std::int64_t>(x));
        if (k < n && e[k].first == x) {
            return {e[k].second};
        }
    }
    std::vector<Value> answers;
    for (std::size_t j = 0; j <= n; ++j) {
        if ((j > 0 && !(e[j - 1].first < x)) || (j < n && e[j].first < x)) {
            continue;
        }
        if (j == n) {
            answers.push_back(e[n - 1].second);
        } else if (j == 0 || e[j].first == x) {
            answers.push_back(e[j].second);
        } else {
            answers.push_back(Blend(e[j - 1], e[j], x));
        }
    }
    return answers;
}

bool ClassicOutput(double output) {
    return output >= 0 && output <= 255 && output == std::trunc(output);
}

bool ClassicOutput(const Colour&) { return true; }

bool IsClassic(const LUT& lut) { return kora::kubo::IsClassicLUT(lut); }

bool IsClassic(const PCT& pct) { return kora::kubo::IsClassicPCT(pct); }

// An input to look up: a breakpoint's own input, its neighbour number, the middle of two
// neighbouring breakpoints, or any number.
template <class Entry>
double TakeLookup(FuzzInput& input, const std::vector<Entry>& entries) {
    const std::size_t at = input.Take(static_cast<unsigned int>(entries.size()));
    const double input0 = entries[at].first;
    switch (input.Take(5)) {
        case 0:
            return input0;
        case 1:
            return std::nextafter(input0, input.Take(2) == 0 ? kInf : -kInf);
        case 2:
            return (input0 + entries[std::min(at + 1, entries.size() - 1)].first) / 2;
        default:
            return TakeNumber(input, input0);
    }
}

// The table keeps `given` as it is unless a neighbour pair is out of order; then it holds the
// same breakpoints in non-decreasing order of input, NaN inputs last. Lookups, the accessors
// and the classic test follow the breakpoints it holds.
template <class Table>
void CheckTable(Table& table, const std::vector<typename Table::Entry>& given, FuzzInput& input) {
    using Entry = typename Table::Entry;
    const std::vector<Entry> entries = table.GetEntries();
    const std::size_t n = given.size();
    Check(entries.size() == n && table.GetEntryCount() == n, "a table keeps every breakpoint");
    const bool unordered =
        std::adjacent_find(given.begin(), given.end(), [](const Entry& a, const Entry& b) {
            return a.first > b.first;
        }) != given.end();
    if (unordered) {
        Check(SortedKeys(entries) == SortedKeys(given), "sorting keeps the breakpoints");
        for (std::size_t i = 1; i < n; ++i) {
            Check(!(entries[i].first < entries[i - 1].first) &&
                      (std::isnan(entries[i].first) || !std::isnan(entries[i - 1].first)),
                  "sorted breakpoints rise, NaN inputs last");
        }
    } else {
        Check(std::equal(entries.begin(), entries.end(), given.begin(), SameEntry<Entry>),
              "breakpoints without a falling neighbour pair stay as given");
    }
    std::vector<Entry> out(1);
    table.GetEntries(out);
    Check(std::equal(entries.begin(), entries.end(), out.begin(), out.end(), SameEntry<Entry>),
          "both entry accessors agree");
    double range[2];
    table.GetInputValueRange(range[0], range[1]);
    Check(Same(range[0], entries.front().first) && Same(range[1], entries.back().first),
          "the input range is that of the first and the last breakpoint");
    const std::size_t index = input.Take(static_cast<unsigned int>(n) + 2);
    Check(Same(table.GetValueByIndex(index), entries[std::min(index, n - 1)].second),
          "a breakpoint's value by index, the last one past the end");

    bool classic = n == kClassicCount;
    for (std::size_t i = 0; classic && i < n; ++i) {
        classic = entries[i].first == static_cast<double>(i) && ClassicOutput(entries[i].second);
    }
    Check(IsClassic(table) == classic, "a classic table has the inputs 0 to 255 and byte values");

    for (unsigned int i = 0, count = 4 + input.Take(12); i < count; ++i) {
        const double x = TakeLookup(input, entries);
        const auto value = table.GetValue(x);
        const auto answers = Answers(entries, x);
        Check(std::any_of(answers.begin(), answers.end(),
                          [&](const auto& answer) { return Same(value, answer); }),
              "a lookup follows the breakpoint rules");
    }
}

// Random breakpoints: a few of any inputs, or 256 shaped like a classic table (inputs 0 to
// 255, now and then another number). Fewer than 2 must fail with the parameter report.
template <class Table>
void FuzzPairs(FuzzInput& input, const Names& names) {
    using Entry = typename Table::Entry;
    const bool classic = input.Take(4) == 0;
    std::vector<Entry> given(classic ? kClassicCount : input.Take(10));
    double previous = 0;
    for (std::size_t i = 0; i < given.size(); ++i) {
        given[i].first =
            classic && input.Take(32) != 1 ? static_cast<double>(i) : TakeNumber(input, previous);
        previous = given[i].first;
        TakeOutput(input, classic, given[i].second);
    }
    if (given.size() >= 2) {
        Table table(given);
        CheckTable(table, given, input);
        return;
    }
    const auto failure = kubo_fuzz::ExpectFailure<kora::ParameterException>(
        [&] { Table table(given); }, "fewer than 2 breakpoints fail");
    const std::string name = names.name;
    kubo_fuzz::CheckReport(failure, "desc", names.source, names.pairSignature, 80);
    Check(failure.GetParameterName() == name && failure.GetType() == 8 &&
              failure.GetReceived() ==
                  "A " + std::to_string(given.size()) + " " + name + " entries" &&
              failure.GetExpected() == "At least 2 " + name + " entries",
          "fewer than 2 breakpoints report the parameter");
}

// Breakpoint i of a classic table is (i, values[i]).
template <class Entry, class Value>
std::vector<Entry> ClassicEntries(const std::vector<Value>& values) {
    std::vector<Entry> entries(values.size());
    for (std::size_t i = 0; i < values.size(); ++i) {
        entries[i] = {static_cast<double>(i), values[i]};
    }
    return entries;
}

// A byte form of any length; all but 256 values must fail with the data report.
template <class Table, class Value>
void FuzzValues(FuzzInput& input, const std::vector<Value>& values, const Names& names) {
    if (values.size() == kClassicCount) {
        Table table(values);
        CheckTable(table, ClassicEntries<typename Table::Entry>(values), input);
        return;
    }
    const auto failure = kubo_fuzz::ExpectFailure<kora::DataException>(
        [&] { Table table(values); }, "byte forms of other lengths fail");
    kubo_fuzz::CheckReport(failure,
                           std::string(names.name) + " must have 256 entries, " +
                               std::to_string(values.size()) + " given.",
                           names.source, names.bytesSignature, names.bytesLine);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    FuzzInput input(data, size);
    const unsigned int form = input.Take(6);
    const std::size_t length = input.Take(4) == 0 ? input.Take(260) : kClassicCount;
    switch (form) {
        case 0:
            FuzzPairs<LUT>(input, kLutNames);
            break;
        case 1:
            FuzzPairs<PCT>(input, kPctNames);
            break;
        case 2:
            FuzzValues<LUT>(input, input.Bytes(length), kLutNames);
            break;
        case 3: {
            const std::vector<unsigned char> bytes = input.Bytes(3 * length);
            std::vector<Colour> colours(length);
            for (std::size_t i = 0; i < length; ++i) {
                colours[i] = {bytes[3 * i], bytes[3 * i + 1], bytes[3 * i + 2]};
            }
            FuzzValues<PCT>(input, colours, kPctNames);
            break;
        }
        case 4: {
            const std::vector<unsigned char> bytes = input.Bytes(kClassicCount);
            LUT lut(bytes.data());
            CheckTable(lut, ClassicEntries<LUT::Entry>(bytes), input);
            break;
        }
        default: {
            const std::vector<unsigned char> planes = input.Bytes(3 * kClassicCount);
            std::vector<Colour> colours(kClassicCount);
            for (std::size_t i = 0; i < kClassicCount; ++i) {
                colours[i] = {planes[i], planes[kClassicCount + i], planes[2 * kClassicCount + i]};
            }
            PCT pct(planes.data());
            CheckTable(pct, ClassicEntries<PCT::Entry>(colours), input);
            break;
        }
    }
    return 0;
}
