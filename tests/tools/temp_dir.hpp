// A test fixture that works in a fresh temporary directory, removed afterwards.
#pragma once

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>

class InTempDir : public ::testing::Test {
  protected:
    std::filesystem::path dir;
    void SetUp() override {
        char tmpl[] = "/tmp/pxfx_test_XXXXXX";
        ASSERT_NE(mkdtemp(tmpl), nullptr);
        dir = tmpl;
    }
    void TearDown() override { std::filesystem::remove_all(dir); }
};
