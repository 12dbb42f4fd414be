// Every row of the registry held to its hostile-input contract: broken
// records refused, extremes survived, failing allocations handled.
#include <set>
#include <variant>

#include "operations.hpp"
#include "support/hostile.hpp"

namespace {

class Contracts : public testing::TestWithParam<const pxop::Operation *> {};

TEST_P(Contracts, Hold) {
    const pxop::Operation &row = *GetParam();
    std::visit(
        [&](const auto &c) {
            if constexpr (!std::is_same_v<std::decay_t<decltype(c)>, std::monostate>)
                pxtest::hostile::check_contract(std::string(row.function), c);
        },
        row.contract);
}

std::vector<const pxop::Operation *> rows() {
    std::vector<const pxop::Operation *> v;
    for (const pxop::Operation &op : pxop::registry())
        v.push_back(&op);
    return v;
}

INSTANTIATE_TEST_SUITE_P(Registry, Contracts, testing::ValuesIn(rows()),
                         [](const testing::TestParamInfo<const pxop::Operation *> &info) {
                             return std::string(info.param->function);
                         });

// Rows without a contract take raw planes, not records: their hostile input is
// tested beside their family.
TEST(Registry, FunctionsAndOperationNamesAreUnique) {
    std::set<std::string_view> names, functions;
    for (const pxop::Operation &op : pxop::registry()) {
        EXPECT_TRUE(functions.insert(op.function).second) << op.function;
        if (!op.name.empty()) {
            EXPECT_TRUE(names.insert(op.name).second) << op.name;
        }
    }
}

} // namespace
