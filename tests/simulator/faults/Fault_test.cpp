// SPDX-License-Identifier: Apache-2.0
#include "simulator/faults/Fault.h"

#include <gtest/gtest.h>

#include <chrono>

namespace pemaro::simulator {

namespace {

struct Good {
    const char* text;
    Fault::Kind kind;
    int status;
    int delayMs;
};

constexpr Good kGood[] = {
        {"startRecord=status:0x40000010", Fault::Kind::kStatus, 0x40000010, 0},
        {"open=status:5", Fault::Kind::kStatus, 5, 0},
        {"open=status:-1", Fault::Kind::kStatus, -1, 0},
        {"open=status:0xFFFFFFFF", Fault::Kind::kStatus, -1, 0},
        {"stopRecord=delay:500ms", Fault::Kind::kDelay, 0, 500},
        {"stopRecord=delay:2s", Fault::Kind::kDelay, 0, 2000},
        {"getCblk=delay:0ms", Fault::Kind::kDelay, 0, 0},
        {"prepareRecord=die", Fault::Kind::kDie, 0, 0},
        {"getCblk=die", Fault::Kind::kDie, 0, 0},
        {"getCblk=null", Fault::Kind::kNull, 0, 0},
};

struct Bad {
    const char* text;
    const char* problem;
};

constexpr Bad kBad[] = {
        {"", "a fault is OPERATION=WHAT, not ''"},
        {"startRecord", "a fault is OPERATION=WHAT, not 'startRecord'"},
        {"=die", "the service has no operation ''"},
        {"fly=die", "the service has no operation 'fly'"},
        {"open=", "'' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=null", "'null' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=dies", "'dies' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=status:",
         "'status:' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=status:1x",
         "'status:1x' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=status:4294967296",
         "'status:4294967296' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=delay:5",
         "'delay:5' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=delay:ms",
         "'delay:ms' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=delay:-1s",
         "'delay:-1s' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"open=delay:5000s",
         "'delay:5000s' is no fault of open: use status:NUMBER, delay:TIME (ms or s) or die"},
        {"getCblk=status:5",
         "'status:5' is no fault of getCblk: use null, delay:TIME (ms or s) or die"},
};

Fault fault(const std::string& text) {
    std::string problem;
    const auto parsed = Fault::parse(text, &problem);
    EXPECT_TRUE(parsed) << problem;
    return parsed.value_or(Fault());
}

}  // namespace

TEST(Fault, IsReadFromItsText) {
    for (const Good& row : kGood) {
        const Fault parsed = fault(row.text);
        EXPECT_EQ(row.kind, parsed.kind) << row.text;
        EXPECT_EQ(row.status, parsed.status) << row.text;
        EXPECT_EQ(row.delayMs, parsed.delay.count()) << row.text;
    }
}

TEST(Fault, IsRefusedWithAReason) {
    for (const Bad& row : kBad) {
        std::string problem;
        EXPECT_FALSE(Fault::parse(row.text, &problem)) << row.text;
        EXPECT_EQ(row.problem, problem);
    }
}

TEST(FaultTable, StrikesOnlyTheOperationsThatItWasToldOf) {
    FaultTable table;
    table.add(fault("open=status:7"));
    EXPECT_EQ(std::nullopt, table.strike("close"));
    EXPECT_EQ(7, table.strike("open"));
    EXPECT_EQ(7, table.strike("open"));
    table.clear();
    EXPECT_EQ(std::nullopt, table.strike("open"));
}

TEST(FaultTable, DelaysAndThenGoesOn) {
    FaultTable table;
    table.add(fault("open=delay:30ms"));
    const auto start = std::chrono::steady_clock::now();
    EXPECT_EQ(std::nullopt, table.strike("open"));
    EXPECT_GE(std::chrono::steady_clock::now() - start, std::chrono::milliseconds(30));
    table.add(fault("open=status:7"));
    EXPECT_EQ(7, table.strike("open"));
}

TEST(FaultTableDeathTest, EndsTheProcess) {
    FaultTable table;
    table.add(fault("open=die"));
    EXPECT_EXIT(table.strike("open"), testing::ExitedWithCode(FaultTable::kDeathStatus),
                "zelk-touchstack: dies at open, as ordered");
}

}  // namespace pemaro::simulator
