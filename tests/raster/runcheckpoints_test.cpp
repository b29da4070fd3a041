#include "vrkframework/basic/kubo/raster/runs/runcheckpoints.h"

#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>  // UINT64_MAX
#include <vector>

namespace {

using kora::kubo::detail::Checkpoint;
using kora::kubo::detail::RunCheckpoints;

// Runs from one checkpoint to the next in a stream of one-byte runs; pairs take half as many.
constexpr std::size_t kSpacing = std::size_t{1} << kora::kubo::detail::kStreamCheckpointSpacingBits;

void ExpectCheckpoint(const Checkpoint& found, std::size_t run, std::uint64_t total) {
    EXPECT_EQ(found.run, run);
    EXPECT_EQ(found.total, total);
}

TEST(RunCheckpoints, TheLastWithinALimitAndPastARun) {
    // Runs of count 2: checkpoints at runs k, 2k, 3k and 4k (k the spacing), totals 2k to 8k.
    constexpr std::size_t k = kSpacing;
    const std::vector<unsigned char> runs(4 * k + k / 2, 2);
    const RunCheckpoints checkpoints(runs.data(), runs.size(), 1);
    ExpectCheckpoint(checkpoints.LastWithin(2 * k - 1), 0, 0);
    ExpectCheckpoint(checkpoints.LastWithin(2 * k), k, 2 * k);
    ExpectCheckpoint(checkpoints.LastWithin(6 * k - 1), 2 * k, 4 * k);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX), 4 * k, 8 * k);
    // Only checkpoints after the run a walk stands on count; none there gives the first run.
    ExpectCheckpoint(checkpoints.LastWithin(6 * k - 1, k - 1), 2 * k, 4 * k);
    ExpectCheckpoint(checkpoints.LastWithin(6 * k - 1, 2 * k - 1), 2 * k, 4 * k);
    ExpectCheckpoint(checkpoints.LastWithin(6 * k - 1, 2 * k), 0, 0);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX, 3 * k), 4 * k, 8 * k);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX, 4 * k), 0, 0);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX, 100 * k), 0, 0);
    // A seek to a bit of a run walks from the checkpoint a search within its total finds.
    for (std::size_t run : {std::size_t{0}, k - 1, k, 3 * k + 5, 4 * k, runs.size() - 1}) {
        EXPECT_EQ(checkpoints.WalkStart(run), checkpoints.LastWithin(2 * run + 1).run) << run;
    }
}

TEST(RunCheckpoints, TotalsPast32BitsStayExact) {
    // Runs of 255 until the totals pass 2^32 by a few checkpoints, across many groups.
    const std::size_t count = ((std::uint64_t{1} << 32) / 255 / kSpacing + 3) * kSpacing + 1;
    const std::vector<unsigned char> runs(count, 255);
    const RunCheckpoints checkpoints(runs.data(), runs.size(), 1);
    const std::size_t last = count - 1;
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX), last, std::uint64_t{255} * last);
    const std::uint64_t justBelow = std::uint64_t{255} * (last - kSpacing) - 1;
    ExpectCheckpoint(checkpoints.LastWithin(justBelow, last - 3 * kSpacing), last - 2 * kSpacing,
                     std::uint64_t{255} * (last - 2 * kSpacing));
}

TEST(RunCheckpoints, AnyDistanceAheadAgreesWithAWalkOverAllOfThem) {
    // 40 checkpoints in three groups; every third block of runs is empty, so totals repeat
    // and the last of equal ones must be found.
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
            // A guess of where the target lies, right or wrong, ahead, behind or past the
            // end, changes nothing.
            for (const std::size_t nearRun :
                 {std::size_t{0}, pastRun / 2, pastRun + 7 * kSpacing, expected.run,
                  expected.run + kSpacing, runs.size() + kSpacing}) {
                const Checkpoint found = checkpoints.LastWithin(limit, pastRun, nearRun);
                ASSERT_EQ(found.run, expected.run) << pastRun << " " << limit << " " << nearRun;
                ASSERT_EQ(found.total, expected.total) << pastRun << " " << limit;
            }
        }
    }
}

TEST(RunCheckpoints, PairsCountTheirFirstByteOnly) {
    // Pairs of count 3 and value 200, checkpoints every k / 2 pairs: at k / 2 and k.
    constexpr std::size_t k = kSpacing;
    std::vector<unsigned char> pairs;
    for (std::size_t pair = 0; pair < k + 1; ++pair) {
        pairs.insert(pairs.end(), {3, 200});
    }
    const RunCheckpoints checkpoints(pairs.data(), pairs.size() / 2, 2);
    ExpectCheckpoint(checkpoints.LastWithin(UINT64_MAX), k, 3 * k);
    ExpectCheckpoint(checkpoints.LastWithin(3 * k - 1), k / 2, 3 * k / 2);
    ExpectCheckpoint(checkpoints.LastWithin(3 * k / 2 - 1), 0, 0);
}

}  // namespace
