// Key order for maps whose string keys ignore letter case.
#ifndef VRKFRAMEWORK_PLATFORM_CASEINSENSITIVECOMPARE_H
#define VRKFRAMEWORK_PLATFORM_CASEINSENSITIVECOMPARE_H

#include <string>

#include "vrkframework/platform/platformapi.h"

namespace kora::datasources::detail {

/// Strict weak order on strings that treats ASCII letters of either case as equal.
struct KORA_PLATFORM_API CaseInsensitiveCompare {
    bool operator()(const std::string& a, const std::string& b) const;
};

}  // namespace kora::datasources::detail

#endif  // VRKFRAMEWORK_PLATFORM_CASEINSENSITIVECOMPARE_H
