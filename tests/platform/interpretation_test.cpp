#include "vrkframework/platform/interpretation.h"

#include <gtest/gtest.h>

#include <cmath>

#include "support/expectfailure.h"

namespace {

using kora::core::FindInterpretation;

TEST(FindInterpretation, GivesTheSixFunctionsOfAComplexSample) {
    using namespace kora::core;
    EXPECT_DOUBLE_EQ(FindInterpretation(INTERPRETATION_REAL)(3.0, 4.0), 3.0);
    EXPECT_DOUBLE_EQ(FindInterpretation(INTERPRETATION_IMAGINARY)(3.0, 4.0), 4.0);
    EXPECT_DOUBLE_EQ(FindInterpretation(INTERPRETATION_AMPLITUDE)(3.0, 4.0), 5.0);
    EXPECT_DOUBLE_EQ(FindInterpretation(INTERPRETATION_PHASE)(0.0, 1.0), std::atan2(1.0, 0.0));
    EXPECT_DOUBLE_EQ(FindInterpretation(INTERPRETATION_PHASE)(-1.0, 0.0), std::atan2(0.0, -1.0));
    EXPECT_DOUBLE_EQ(FindInterpretation(INTERPRETATION_INTENSITY)(3.0, 4.0), 25.0);
    EXPECT_DOUBLE_EQ(FindInterpretation(INTERPRETATION_DB)(6.0, 8.0), 20.0);
}

TEST(FindInterpretation, ThrowsForAnUnknownCode) {
    for (int code : {-1, 6, 100}) {
        const auto failure = kubo_test::Catch<kora::Exception>(
            [code] { FindInterpretation(static_cast<kora::core::KORAInterpretationTypes>(code)); });
        ASSERT_TRUE(failure);
        EXPECT_EQ(failure->GetMessage(), "Unknown interpretation requested.");
    }
}

}  // namespace
