// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The statements that the library sent in the last runs of the other test programs.
#ifndef MEDIIDX_TESTS_INTEGRATION_SCHEMA_RECORDED_STATEMENTS_H_
#define MEDIIDX_TESTS_INTEGRATION_SCHEMA_RECORDED_STATEMENTS_H_

#include <map>
#include <string>

namespace mediidx::test {

/// From the shape of each recorded statement to the most ordinary one of that shape; empty when
/// nothing was recorded.
const std::map<std::string, std::string>& recorded_statements();

}  // namespace mediidx::test

#endif
