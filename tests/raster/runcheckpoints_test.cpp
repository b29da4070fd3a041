#include "vrkframework/basic/kubo/raster/runs/runcheckpoints.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>  // UINT64_MAX
#include <vector>

namespace {

using kora::kubo::detail::Checkpoint;
using kora::kubo::detail::RunCheckpoints;

void ExpectCheckpoint(const Checkpoint& found, std::size_t run, std::uint64_t total) {
    EXPECT_EQ(found.run, run);
    EXPECT_EQ(found.total, total);
}

TEST(RunCheckpoints, TheLastWithinALimitAndPastARun) {
    // 5000 runs of count 2: checkpoints at runs 1024, 2048, 3072 and 4096.
    const std::vector<unsigned char> runs(5000, 2);
    const RunCheckpoints checkpoints(runs.data(), runs.size(), 1);
    ExpectCheckpoint(checkpoints.LastWithin(2047), 0, 0);
    ExpectCheckpoint(checkpoints.LastWithin(2048), 1024, 2048);
    ExpectCheckpoint(checkpoints.LastWithin(6143), 2048, 4096);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX), 4096, 8192);
    // Only checkpoints after the run a walk stands on count; none there gives the first run.
    ExpectCheckpoint(checkpoints.LastWithin(6143, 1023), 2048, 4096);
    ExpectCheckpoint(checkpoints.LastWithin(6143, 2047), 2048, 4096);
    ExpectCheckpoint(checkpoints.LastWithin(6143, 2048), 0, 0);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX, 3072), 4096, 8192);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX, 4096), 0, 0);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX, 100000), 0, 0);
}

TEST(RunCheckpoints, AnyDistanceAheadAgreesWithAWalkOverAllOfThem) {
    // 40 checkpoints; every third block of runs is empty, so totals repeat and the last of
    // equal ones must be found.
    constexpr std::size_t kSpacing = 1024;
    std::vector<unsigned char> runs(41 * kSpacing);
    for (std::size_t run = 0; run < runs.size(); ++run) {
        runs[run] = run / kSpacing % 3 == 1 ? 0 : 1;
    }
    const RunCheckpoints checkpoints(runs.data(), runs.size(), 1);
    std::vector<Checkpoint> all;
    std::uint64_t total = 0;
    for (std::size_t run = 0; run + kSpacing < runs.size(); ++run) {
        total += runs[run];
        if ((run + 1) % kSpacing == 0) {
            all.push_back({run + 1, total});
        }
    }
    for (std::size_t pastRun = 0; pastRun < runs.size(); pastRun += 3 * kSpacing + 5) {
        for (std::uint64_t limit = 0; limit <= runs.size(); limit += 97) {
            // The last checkpoint beyond the one pastRun lies in whose total is within limit.
            Checkpoint expected{0, 0};
            for (const Checkpoint& at : all) {
                if (at.run / kSpacing > pastRun / kSpacing && at.total <= limit) {
                    expected = at;
                }
            }
            const Checkpoint found = checkpoints.LastWithin(limit, pastRun);
            ASSERT_EQ(found.run, expected.run) << pastRun << " " << limit;
            ASSERT_EQ(found.total, expected.total) << pastRun << " " << limit;
        }
    }
}

TEST(RunCheckpoints, PairsCountTheirFirstByteOnly) {
    // 1025 pairs of count 3 and value 200: checkpoints at pairs 512 and 1024.
    std::vector<unsigned char> pairs;
    for (int pair = 0; pair < 1025; ++pair) {
        pairs.insert(pairs.end(), {3, 200});
    }
    const RunCheckpoints checkpoints(pairs.data(), pairs.size() / 2, 2);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX), 1024, 3072);
    ExpectCheckpoint(checkpoints.LastWithin(3071), 512, 1536);
    ExpectCheckpoint(checkpoints.LastWithin(1535), 0, 0);
}

}  // namespace
