#include <gtest/gtest.h>

#include "SimRun.h"

using enginetest::SimRun;
using Notices = std::vector<std::string>;

TEST(CharacterizationRun, OneTestReceiverPostsTheNoticesInOrder) {
    SimRun sim;
    ASSERT_EQ(sim.run({"A"}), 0) << ::testing::PrintToString(sim.captions());
    EXPECT_EQ(sim.notices(),
              (Notices{"Cal Started", "NOTE: IF overload and unleveled messages are expected.",
                       "Started Cal A", "Almost Done with Cal", "Writing Cal File", ".",
                       "Cal Complete"}));
    EXPECT_EQ(sim.findings["A"], 2);
    EXPECT_FALSE(sim.signals.workerRunning);
}
