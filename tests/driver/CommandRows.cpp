// SPDX-License-Identifier: Apache-2.0
#include "tests/driver/CommandRows.h"

#include <gtest/gtest.h>
#include <stdlib.h>

#include <fstream>
#include <iterator>

#include "tests/driver/DriverSetting.h"

namespace pemaro::test {

RunResult zelkctl(Words arguments) {
    arguments.insert(arguments.begin(), binary("zelkctl"));
    return run(arguments);
}

void expectRows(const std::vector<Row>& rows) {
    for (const Row& row : rows) {
        const RunResult result = zelkctl(row.command);
        const bool succeeds = row.status == 0;
        const std::string name = testing::PrintToString(row.command);
        EXPECT_EQ(row.status, result.status) << name;
        EXPECT_EQ(succeeds ? row.text : "", result.output) << name;
        EXPECT_EQ(succeeds ? "" : "zelkctl: " + row.text, result.errors) << name;
    }
}

Files::Files() {
    EXPECT_NE(nullptr, mkdtemp(&mFolder[0]));
}

Files::~Files() {
    run({"rm", "-rf", mFolder});
}

std::string Files::write(const std::string& name, const std::string& content) const {
    std::ofstream(path(name), std::ios::binary) << content;
    return path(name);
}

std::string Files::read(const std::string& name) const {
    std::ifstream file(path(name), std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

}  // namespace pemaro::test
