// The rows of the registry, one function per subsystem (tools/ops_*.cpp).
#pragma once

#include <vector>

#include "operations.hpp"

namespace pxop {

void add_core(std::vector<Operation> &table);
void add_color(std::vector<Operation> &table);
void add_effects(std::vector<Operation> &table);
void add_deform(std::vector<Operation> &table);
void add_toolkit(std::vector<Operation> &table);
void add_lines(std::vector<Operation> &table);
void add_retouch(std::vector<Operation> &table);

} // namespace pxop
