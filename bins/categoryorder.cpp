#include "bins/categoryorder.h"

#include "bins/numbers.h"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <utility>

namespace
{

using Vector = std::vector<double>;
using Matrix = std::vector<Vector>;

double Sum(const Vector& weights)
{
    return std::accumulate(weights.begin(), weights.end(), 0.0);
}

void Add(Vector& sums, const Vector& weights)
{
    sums.resize(weights.size());
    for (std::size_t j = 0; j < weights.size(); ++j) sums[j] += weights[j];
}

/// Of all categories of the attribute together.
Vector SumByTarget(const Matrix& weights)
{
    Vector sums;
    for (const Vector& row : weights) Add(sums, row);
    return sums;
}

Vector ComputeShares(const Vector& weights, const Vector& ifWeightless)
{
    const double sum = Sum(weights);
    if (!(sum > 0.0))
        return ifWeightless;
    Vector shares(weights);
    for (double& share : shares) share /= sum;
    return shares;
}

/// C but for the division by the weight of all, which changes no eigenvector.
Matrix ComputeCovariance(const Matrix& weights, const Matrix& shares, const Vector& mean)
{
    const std::size_t size = mean.size();
    Matrix covariance(size, Vector(size));
    for (std::size_t i = 0; i < weights.size(); ++i)
    {
        const double weight = Sum(weights[i]);
        for (std::size_t a = 0; a < size; ++a)
        {
            for (std::size_t b = 0; b < size; ++b)
                covariance[a][b] += weight * (shares[i][a] - mean[a]) * (shares[i][b] - mean[b]);
        }
    }
    return covariance;
}

/// Jacobi's rotation in the plane of p and q, which makes matrix[p][q] zero; the columns of `vectors` turn with it.
void Rotate(Matrix& matrix, Matrix& vectors, std::size_t p, std::size_t q)
{
    const double theta = (matrix[q][q] - matrix[p][p]) / (2.0 * matrix[p][q]);
    const double t = std::copysign(1.0, theta) / (std::abs(theta) + std::sqrt(theta * theta + 1.0));
    const double c = 1.0 / std::sqrt(t * t + 1.0);
    const double s = t * c;
    const auto turn = [c, s](double& x, double& y)
    {
        const double turned = c * x - s * y;
        y = s * x + c * y;
        x = turned;
    };
    for (Vector& row : matrix) turn(row[p], row[q]);
    for (std::size_t k = 0; k < matrix.size(); ++k) turn(matrix[p][k], matrix[q][k]);
    matrix[p][q] = matrix[q][p] = 0.0;
    for (Vector& row : vectors) turn(row[p], row[q]);
}

/// Turns the symmetric matrix until what lies beside its diagonal no longer changes the diagonal. The rotations come in
/// a fixed order, so equal matrices have equal vectors to the last bit.
Vector ComputeFirstEigenvector(Matrix matrix)
{
    constexpr int kMostSweeps = 50; // some ten are enough
    const std::size_t size = matrix.size();
    Matrix vectors(size, Vector(size));
    for (std::size_t i = 0; i < size; ++i) vectors[i][i] = 1.0;
    bool hasTurned = true;
    for (int sweep = 0; sweep < kMostSweeps && hasTurned; ++sweep)
    {
        hasTurned = false;
        for (std::size_t p = 0; p < size; ++p)
        {
            for (std::size_t q = p + 1; q < size; ++q)
            {
                const double diagonal = std::abs(matrix[p][p]) + std::abs(matrix[q][q]);
                if (diagonal + std::abs(matrix[p][q]) == diagonal)
                    continue;
                Rotate(matrix, vectors, p, q);
                hasTurned = true;
            }
        }
    }
    std::size_t first = 0;
    for (std::size_t i = 1; i < size; ++i) first = matrix[i][i] > matrix[first][first] ? i : first;
    Vector vector;
    for (const Vector& row : vectors) vector.push_back(row[first]);
    return vector;
}

void FixSign(Vector& direction)
{
    const auto isLess = [](double a, double b) { return std::abs(a) < std::abs(b); };
    const double least = std::abs(*std::max_element(direction.begin(), direction.end(), isLess)) / 10.0;
    const auto last =
        std::find_if(direction.rbegin(), direction.rend(), [least](double x) { return std::abs(x) >= least; });
    if (*last >= 0.0)
        return;
    for (double& component : direction) component = -component;
}

/// By code: where the category lies on the line along which the categories are ordered.
Vector ComputePositions(const Matrix& weights)
{
    const Vector mean = ComputeShares(SumByTarget(weights), Vector(weights.front().size()));
    Matrix shares;
    for (const Vector& row : weights) shares.push_back(ComputeShares(row, mean));
    Vector direction{0.0, 1.0};
    if (mean.size() > 2)
    {
        direction = ComputeFirstEigenvector(ComputeCovariance(weights, shares, mean));
        FixSign(direction);
    }
    Vector positions;
    for (const Vector& row : shares)
        positions.push_back(std::inner_product(row.begin(), row.end(), direction.begin(), 0.0));
    return positions;
}

/// A name that none of the categories has.
std::string NameRare(const std::vector<std::string>& categories)
{
    std::string name = "(rare)";
    for (int number = 2; std::find(categories.begin(), categories.end(), name) != categories.end(); ++number)
        name = "(rare " + std::to_string(number) + ")";
    return name;
}

} // namespace

std::vector<std::size_t> OrderByRate(const std::vector<std::vector<double>>& weights)
{
    std::vector<std::size_t> codes(weights.size());
    std::iota(codes.begin(), codes.end(), std::size_t(0));
    if (weights.empty() || weights.front().size() < 2)
        return codes;
    const Vector positions = ComputePositions(weights);
    std::stable_sort(codes.begin(), codes.end(),
                     [&positions](std::size_t a, std::size_t b) { return positions[a] < positions[b]; });
    return codes;
}

std::string DescribeUnusable(const std::vector<std::string>& categories, std::int64_t numRecords)
{
    constexpr std::int64_t kFewestRecords = 5;
    if (categories.size() > kMostCategories)
        return "more than " + std::to_string(kMostCategories) + " categories";
    if (categories.size() < 2)
        return categories.empty() ? "no category" : "a single category";
    const auto isNumber = [](const std::string& text) { return ParseNumber(text).has_value(); };
    if (2 * std::count_if(categories.begin(), categories.end(), isNumber) > static_cast<long>(categories.size()))
        return "text among numbers";
    if (kFewestRecords * static_cast<std::int64_t>(categories.size()) > numRecords)
        return std::to_string(categories.size()) + " categories in " + std::to_string(numRecords) + " records";
    return "";
}

CategoryCodes MakeCategoryCodes(const std::vector<std::string>& categories, const Matrix& weights, bool areTexts,
                                double rareShare, bool isByRate)
{
    double all = 0.0;
    for (const Vector& row : weights) all += Sum(row);
    CategoryCodes codes;
    Matrix kept;
    Vector rareWeights;
    for (std::size_t i = 0; i < categories.size(); ++i)
    {
        if (Sum(weights[i]) < rareShare * all)
        {
            codes.rare.push_back(categories[i]);
            Add(rareWeights, weights[i]);
            continue;
        }
        codes.names.push_back(categories[i]);
        kept.push_back(weights[i]);
    }
    std::string rareName;
    if (!codes.rare.empty())
    {
        rareName = NameRare(categories);
        const auto end = codes.names.end();
        const auto position = areTexts ? std::lower_bound(codes.names.begin(), end, rareName) : end;
        kept.insert(kept.begin() + (position - codes.names.begin()), rareWeights);
        codes.names.insert(position, rareName);
    }
    if (isByRate)
    {
        std::vector<std::string> ordered;
        for (const std::size_t code : OrderByRate(kept)) ordered.push_back(std::move(codes.names[code]));
        codes.names = std::move(ordered);
    }
    if (!codes.rare.empty())
    {
        const auto found = std::find(codes.names.begin(), codes.names.end(), rareName);
        codes.rareCode = static_cast<std::size_t>(found - codes.names.begin());
    }
    return codes;
}
