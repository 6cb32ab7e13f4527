#include "bins/infinitevalues.h"
#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <set>
#include <vector>

namespace
{

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr double kMax = std::numeric_limits<double>::max();

} // namespace

TEST(InfiniteValues, KeepTheirOrderAndComeBackAsTheyWere)
{
    const double second = std::nextafter(kMax, 0.0);
    const std::vector<double> rising{-kInfinity, -kMax, -1e308, -1.0, 0.0, 5e-324, 1e308, kMax, kInfinity};
    for (std::size_t i = 0; i < rising.size(); ++i)
    {
        const double encoded = EncodeInfinity(rising[i]);
        EXPECT_LT(std::fabs(encoded), kMax) << rising[i] << ": the largest fits no bin with its left end closed";
        EXPECT_EQ(rising[i], DecodeInfinity(encoded));
        EXPECT_TRUE(i == 0 || EncodeInfinity(rising[i - 1]) < encoded) << rising[i];
    }
    EXPECT_EQ(EncodeInfinity(kMax), EncodeInfinity(second)) << "the outermost finite doubles count as one value";
    EXPECT_EQ(kMax, DecodeInfinity(EncodeInfinity(second)));
    EXPECT_TRUE(std::isnan(InfiniteValues().Encode(std::nan(""))));
}

TEST(InfiniteValues, CutPointsDivideTheDataAsThoseOfTheLibraryDivideItsValues)
{
    const double second = std::nextafter(kMax, 0.0);
    const double third = std::nextafter(second, 0.0);
    const double all[] = {-kInfinity, -kMax, -second, -third, -9e307, -1.5,     0.0,
                          2.0,        9e307, third,   second, kMax,   kInfinity};
    std::mt19937 random(1);
    for (int round = 0; round < 2000; ++round)
    {
        std::set<double> data;
        const auto size = std::uniform_int_distribution<std::size_t>(2, 5)(random);
        while (data.size() < size)
            data.insert(all[std::uniform_int_distribution<std::size_t>(0, std::size(all) - 1)(random)]);
        InfiniteValues values;
        std::vector<double> encoded;
        for (const double value : data) encoded.push_back(values.Encode(value));

        // Each value, and each midpoint, can be a cut point of the library.
        std::vector<double> cutPoints = encoded;
        for (std::size_t i = 1; i < encoded.size(); ++i) cutPoints.push_back(encoded[i - 1] * 0.5 + encoded[i] * 0.5);
        for (const bool isRightClosed : {true, false})
        {
            const auto isLeft = [&](double value, double cut) { return isRightClosed ? value <= cut : value < cut; };
            for (const double cutPoint : cutPoints)
            {
                const double decoded = values.DecodeCutPoint(cutPoint, isRightClosed);
                std::size_t i = 0;
                for (const double value : data)
                {
                    EXPECT_EQ(isLeft(encoded[i], cutPoint), isLeft(value, decoded))
                        << value << " at " << cutPoint << ", " << decoded << (isRightClosed ? " right" : " left");
                    ++i;
                }
            }
        }
    }
}

TEST(InfiniteValues, TheMidpointOfANumberAndAnInfinityIsOneOfThem)
{
    InfiniteValues values;
    for (const double value : {-kInfinity, 3.0, 10.0, kInfinity}) values.Encode(value);
    const double half = EncodeInfinity(kInfinity) * 0.5;

    EXPECT_EQ(10.0, values.DecodeCutPoint(half, true));
    EXPECT_EQ(kInfinity, values.DecodeCutPoint(half, false));
    EXPECT_EQ(-kInfinity, values.DecodeCutPoint(-half, true));
    EXPECT_EQ(3.0, values.DecodeCutPoint(-half, false));
    EXPECT_EQ(6.5, values.DecodeCutPoint(6.5, true));
    EXPECT_EQ(half, InfiniteValues().DecodeCutPoint(half, true)) << "without infinities it is a number like others";
}
