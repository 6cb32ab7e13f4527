#include "variables.h"

#include "failure.h"
#include "tableprofile.h"
#include "texttable.h"

#include <string>

namespace
{

void AddTarget(BINVarList& list, const Column& column)
{
    if (column.categories.empty())
        throw Failure("column " + Quote(column.name) + " is empty; a target needs at least 2 categories");
    if (column.categories.size() == 1)
        throw Failure("column " + Quote(column.name) + " has a single category, " + Quote(*column.categories.begin()) +
                      "; a target needs at least 2");
    const std::vector<std::string> categories(column.categories.begin(), column.categories.end());
    list.AddCatVar(column.name, "", categories, IBINVariable::RoleTarget);
}

} // namespace

Variables MakeVariables(const TableProfile& profile)
{
    Variables variables;
    for (std::size_t i = 0; i < profile.columns.size(); ++i)
    {
        const Column& column = profile.columns[i];
        if (column.isTarget)
            AddTarget(variables.list, column);
        else if (column.isNumeric)
            variables.list.AddContVar(column.name, "", IBINVariable::RoleAttribute);
        else
            continue;
        variables.columns.push_back(i);
    }
    if (variables.list.GetNumAttributeVars() == 0)
        throw Failure("there is nothing to bin: no column has numbers only, but for the target");
    return variables;
}
