#include "RecordTypes.h"
#include "platform/asn1/AsnNotation.h"

#include <fstream>
#include <gtest/gtest.h>
#include <sstream>
#include <string>
#include <vector>

// What the classes declare is what the module says, type by type and in its order.

namespace
{
std::string SQUEEZED(std::string const& text)
{
    std::istringstream words(text);
    std::string squeezed;
    for (std::string word; words >> word;)
        squeezed += squeezed.empty() ? word : " " + word;
    return squeezed;
}

/// The assignments of the module in their order, without comments.
std::vector<std::string> ASSIGNMENTS(char const* path)
{
    std::ifstream module(path);
    std::vector<std::string> assignments;
    bool hasBegun = false;
    for (std::string line; std::getline(module, line) && line != "END";)
    {
        line = line.substr(0, line.find("--"));
        if (hasBegun && line.find("::=") != std::string::npos)
            assignments.emplace_back();
        if (!assignments.empty())
            assignments.back() += line + "\n";
        hasBegun = hasBegun || line == "BEGIN";
    }
    for (std::string& assignment : assignments)
        assignment = SQUEEZED(assignment);
    return assignments;
}
} // namespace

TEST(ModuleNotation, EveryTypeDeclaresWhatTheModuleSays)
{
    std::vector<std::string> const assignments = ASSIGNMENTS(RECORDS_MODULE);
    std::vector<char const*> const names = RecordTypes::NAMES();
    ASSERT_EQ(assignments.size(), names.size());
    for (std::size_t i = 0; i < names.size(); ++i)
    {
        std::unique_ptr<AsnSyntax> const value = RecordTypes::CREATE(names[i]);
        ASSERT_NE(nullptr, value) << names[i];
        EXPECT_STREQ(names[i], value->getTypeName());
        String notation;
        ASSERT_TRUE(AsnNotation::TYPE_OF(*value, notation).isOk());
        EXPECT_EQ(assignments[i], SQUEEZED(notation.c_str()));
    }
}
