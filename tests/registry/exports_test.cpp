// The shared library exports exactly the functions of the registry and the
// service functions beside it: nothing missing, nothing else.
#include <set>

#include "operations.hpp"
#include "support/test_images.hpp"

TEST(Registry, SharedLibraryExportsExactlyTheRegistry) {
#ifdef PXFX_COVERAGE_BUILD
    GTEST_SKIP() << "the gcov runtime adds its own symbols to a coverage build";
#endif
    std::ifstream in(PXFX_EXPORTS_FILE);
    ASSERT_TRUE(in) << PXFX_EXPORTS_FILE;
    std::set<std::string> exported, expected;
    for (std::string name; std::getline(in, name);)
        if (!name.empty()) exported.insert(name);
    for (const pxop::Operation &op : pxop::registry())
        expected.insert(std::string(op.function));
    for (std::string_view name : pxop::service_functions())
        EXPECT_TRUE(expected.insert(std::string(name)).second) << name << " listed twice";
    for (const std::string &name : expected)
        EXPECT_TRUE(exported.count(name)) << "not exported: " << name;
    for (const std::string &name : exported)
        EXPECT_TRUE(expected.count(name)) << "exported but in no registry row: " << name;
}
