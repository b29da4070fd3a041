// The real conversions of every pair of component types, and the failures every converter
// reports.
#include "vrkframework/basic/core/typeconv/promote.h"

#include <string>

#include "vrkframework/basic/core/typeconv/conversionkernels.h"
#include "vrkframework/basic/core/typeconv/promoteoperations_impl.h"
#include "vrkframework/platform/exception.h"

namespace typeconv {

#define KUBO_DETAIL_INSTANTIATE_FAMILY(A, B)                     \
    template class PromoteOperations<A, B, SampleLayout::kReal>; \
    template class Promote<A, B>;
KUBO_FOR_EACH_COMPONENT_PAIR(KUBO_DETAIL_INSTANTIATE_FAMILY)
#undef KUBO_DETAIL_INSTANTIATE_FAMILY

namespace detail {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/core/typeconv/promote";
constexpr char kTooWide[] =
    "Invalid type promote, the number of bit is bigger than the type requested for conversion";

/// Throws the failure of BitDepthPromote<bits, typeName, 0, 0>::kernel(parameters).
[[noreturn]] void ThrowTooWide(unsigned int bits, const char* typeName, const char* kernel,
                               const std::string& parameters, unsigned int line) {
    throw kora::Exception(kTooWide, kSourcePath,
                          "void __cdecl typeconv::BitDepthPromote<" + std::to_string(bits) + "," +
                              typeName + ",0,0>::" + kernel + "(" + parameters + ")",
                          line);
}

}  // namespace

void ThrowNullBuffer() {
    throw kora::DataException(
        "A conversion buffer is NULL.", kSourcePath,
        "void __cdecl typeconv::IPromote::Promote(const void *,void *,unsigned int)", 0);
}

void ThrowUnpackBitsTooWide(unsigned int bits, const char* typeName) {
    ThrowTooWide(bits, typeName, "Promote",
                 std::string("const unsigned char *,") + typeName + " *,unsigned int", 390);
}

void ThrowPackBitsTooWide(unsigned int bits, const char* typeName) {
    ThrowTooWide(bits, typeName, "Pack",
                 std::string("const ") + typeName + " *,unsigned char *,unsigned int", 395);
}

}  // namespace detail
}  // namespace typeconv
