// Case-blind string order for metadata keys.
#include "vrkframework/platform/caseinsensitivecompare.h"

#include <algorithm>  // std::lexicographical_compare
#include <cctype>     // std::tolower

namespace kora::datasources::detail {

bool CaseInsensitiveCompare::operator()(const std::string& a, const std::string& b) const {
    return std::lexicographical_compare(a.begin(), a.end(), b.begin(), b.end(),
                                        [](char left, char right) {
                                            // unsigned char: tolower of a negative char is UB
                                            return std::tolower(static_cast<unsigned char>(left)) <
                                                   std::tolower(static_cast<unsigned char>(right));
                                        });
}

}  // namespace kora::datasources::detail
