#include <mcobnqrt/mcstatus.h>

#include <gtest/gtest.h>

#include <limits>

using MCBinning::MCStatus;

TEST(Status, OfOneCodeMayBeAWarningOrAnError)
{
    const MCStatus ok, error(1, false), warning(1, true);

    EXPECT_TRUE(ok.IsOK() && !ok.IsError() && !ok.IsWarning());
    EXPECT_TRUE(error.IsError() && !error.IsOK() && !error.IsWarning());
    EXPECT_TRUE(warning.IsWarning() && !warning.IsOK() && !warning.IsError());
    EXPECT_EQ(1, error.GetErrorCode());
    EXPECT_FALSE(error == warning);
}

TEST(Status, IsEqualOnlyWithEverySlotEqual)
{
    const MCStatus plain;
    for (unsigned int slot = 0; slot < 3; ++slot)
    {
        MCStatus discrete, scale, negativeZero, notANumber;
        discrete.SetDiscreteDatum(slot, -7);
        scale.SetScaleDatum(slot, 0.5);
        negativeZero.SetScaleDatum(slot, -0.0);
        notANumber.SetScaleDatum(slot, std::numeric_limits<double>::quiet_NaN());

        EXPECT_EQ(-7, discrete.GetDiscreteDatum(slot));
        EXPECT_EQ(0.5, scale.GetScaleDatum(slot));
        EXPECT_FALSE(discrete == plain) << slot;
        EXPECT_FALSE(scale == plain) << slot;
        EXPECT_TRUE(negativeZero == plain) << slot;
        EXPECT_FALSE(notANumber == notANumber) << slot;
    }
}

TEST(Status, IgnoresASlotThatDoesNotExist)
{
    MCStatus status;
    status.SetDiscreteDatum(3, 1);
    status.SetScaleDatum(4000000000U, 1.0);

    EXPECT_TRUE(status == MCStatus());
    EXPECT_EQ(0, status.GetDiscreteDatum(3));
    EXPECT_EQ(0.0, status.GetScaleDatum(4000000000U));
}
