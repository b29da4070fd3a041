// The dispatcher's failures, out of line so that each of its many instances stays small.
#include "vrkframework/basic/core/typedispatch/extendtypedispatch.h"

#include "vrkframework/platform/exception.h"

namespace kora::typedispatch {
namespace {

constexpr char kSourcePath[] = "vrkframework/basic/core/typedispatch/extendtypedispatch";

}  // namespace

const kora::kubo::DataType& DispatchedDescriptor(const std::vector<kora::kubo::DataType>& types,
                                                 std::size_t position, unsigned int shortLine,
                                                 const char* function) {
    if (types.size() <= position) {
        throw kora::Exception("Not enough type in the vector for the dispatcher you are using.",
                              kSourcePath, function, shortLine);
    }
    return types[position];
}

void ThrowUnmatchedDescriptor(const char* function) {
    throw kora::Exception("Invalid type requested.", kSourcePath, function, 175);
}

}  // namespace kora::typedispatch
