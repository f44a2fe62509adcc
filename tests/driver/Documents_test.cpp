// SPDX-License-Identifier: Apache-2.0
// The programs, the sessions and the commands that stand in the documents and the manual pages, against the
// simulated touch stack, and those that try the tutorial's services.

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <stdlib.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <list>
#include <map>
#include <regex>
#include <set>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "tests/driver/CommandRows.h"
#include "tests/driver/DriverSetting.h"

using testing::EndsWith;
using testing::MatchesRegex;

namespace pemaro::test {

namespace {

// The blocks of these documents that are of one language, and where the commands in them are found.
class Blocks : public ::testing::Test {
  protected:
    static constexpr char kPrompt[] = "desk:~# ";

    void SetUp() override {
        char folder[] = "/tmp/zelk-blocks-XXXXXX";
        ASSERT_NE(nullptr, mkdtemp(folder));
        mFolder = folder;
        std::filesystem::current_path(mFolder);  // some commands write a file
        const std::string service = platformBinary("service");
        const std::string path = binary("") + ":" + service.substr(0, service.rfind('/')) + ":" +
                                 (getenv("PATH") != nullptr ? getenv("PATH") : "");
        setenv("PATH", path.c_str(), 1);
    }

    void TearDown() override {
        std::filesystem::current_path("/");
        std::filesystem::remove_all(mFolder);
    }

    // The texts of these documents' blocks of a language.
    std::vector<std::string> blocksOf(const std::vector<std::string>& documents,
                                      const std::string& language) {
        const std::string folder = mFolder + "/blocks";
        if (!std::filesystem::exists(folder)) {
            std::vector<std::string> command = {ZELK_SOURCE_DIR "/tests/docs/extract-blocks",
                                                folder};
            for (const std::string& document : documents) {
                command.push_back(ZELK_SOURCE_DIR "/" + document);
            }
            const RunResult extracted = run(command);
            EXPECT_EQ(0, extracted.status) << extracted.errors;
        }
        std::vector<std::string> texts;
        for (const auto& entry : std::filesystem::directory_iterator(folder)) {
            if (entry.path().extension() == "." + language) {
                std::stringstream text;
                text << std::ifstream(entry.path()).rdbuf();
                texts.push_back(text.str());
            }
        }
        return texts;
    }

    std::string mFolder;
};

}  // namespace

TEST_F(Blocks, OfTheReadmeShowWhatTheDeskShows) {
    TouchStack stack;
    int commands = 0;
    for (const std::string& text : blocksOf({"README.md"}, "text")) {
        std::string command;
        std::string shown;
        const auto compare = [&] {
            if (!command.empty()) {
                const RunResult result = run({"bash", "-o", "pipefail", "-c", command});
                EXPECT_EQ(0, result.status) << command << ": " << result.errors;
                EXPECT_EQ(shown, result.output) << command;
                ++commands;
            }
        };
        for (const std::string& line : splitLines(text)) {
            if (line.rfind(kPrompt, 0) == 0) {
                compare();
                command = line.substr(sizeof(kPrompt) - 1);
                shown.clear();
            } else {
                shown += line + "\n";
            }
        }
        compare();
    }
    EXPECT_LE(6, commands) << "is the prompt another one?";
}

TEST_F(Blocks, OfTheTutorialTryItsServices) {
    const std::vector<std::string> blocks = blocksOf({"docs/service-tutorial.md"}, "sh");
    EXPECT_EQ(2u, blocks.size());
    for (const std::string& block : blocks) {
        // Who types the commands gives the service the time to come up; it ends with its shell.
        const size_t behind = block.find("&\n") + 2;
        const RunResult result =
                run({"bash", "-euo", "pipefail", "-c",
                     "trap 'kill $! && wait $! || true' EXIT\n" + block.substr(0, behind) +
                             "until service list | grep pemaro; do sleep 0.1; done\n" +
                             block.substr(behind) + "\nkill -0 $!\n"});
        EXPECT_EQ(0, result.status) << block << result.output << result.errors;
    }
}

namespace {

// A command of zelkctl's or of the stack's, and what the document shows of its output.
struct Command {
    std::string text;
    std::string shown;
};

// Its commands need services of its own, and are run above.
const std::string kTutorial = "docs/service-tutorial.md";

// Those that last until they are told to stop; so do the stacks.
const std::set<std::string> kLasting = {"zelkctl trace"};

// Those that cannot run here, and why.
const std::map<std::string, std::string> kNotRun = {
        {"zelk-touchstack --source evdev:/dev/input/event3",
         "this machine has no touch screen; driver_touch_screen runs it with one of its own"},
        {"build/release/bin/zelk-touchstack & sleep 2",
         "it is a line of a script for a machine of its own; ManualLinked runs its program"},
};

// A line is a command when it begins with one, behind the prompt of a session or not. What stands
// behind two blanks tells of it.
std::string commandIn(const std::string& line) {
    static const std::regex command(
            " *(?:\\.Dl )?(?:\\$ )?((?:build/release/bin/)?(?:zelkctl|zelk-touchstack)(?: "
            ".*?)?)(?:  .*)?");
    std::smatch match;
    return std::regex_match(line, match, command) ? match[1].str() : "";
}

// The commands of a manual page's examples, with what is shown behind each.
std::vector<Command> commandsOfPage(const std::string& name) {
    std::ifstream page(ZELK_SOURCE_DIR "/" + name);
    std::vector<Command> commands;
    bool isExample = false;
    bool isShown = false;
    for (std::string line; std::getline(page, line);) {
        if (line.rfind(".Sh ", 0) == 0) {
            isExample = line == ".Sh EXAMPLES";
        }
        const std::string command = commandIn(line);
        if (isExample && line[0] != '.' && isShown && command.empty()) {
            commands.back().shown += line + "\n";
        } else if (isExample && !command.empty()) {
            commands.push_back({command, ""});
        }
        isShown = isExample && line[0] != '.' && !commands.empty();
    }
    return commands;
}

// What is measured is another number each time.
std::string withoutMeasures(const std::string& text) {
    static const std::regex measured("[0-9.]+(?= (?:frames|bytes|s,|lost|gaps))");
    return std::regex_replace(text, measured, "N");
}

class Commands : public Blocks {
  protected:
    // The manual pages' come first: their examples begin with a stack that is untouched.
    std::vector<Command> readAll() {
        std::vector<Command> commands;
        std::vector<std::string> documents;
        for (const char* folder : {"tools/man/", "docs/", ""}) {
            for (const auto& entry :
                 std::filesystem::directory_iterator(std::string(ZELK_SOURCE_DIR "/") + folder)) {
                const std::string name = folder + entry.path().filename().string();
                if (entry.path().extension() == ".md" && name != kTutorial) {
                    documents.push_back(name);
                } else if (std::regex_match(name, std::regex(".*\\.[17](\\.in)?"))) {
                    const std::vector<Command> ofPage = commandsOfPage(name);
                    commands.insert(commands.end(), ofPage.begin(), ofPage.end());
                }
            }
        }
        for (const char* language : {"sh", "text"}) {
            for (const std::string& block : blocksOf(documents, language)) {
                addCommandsOf(block, commands);
            }
        }
        return commands;
    }

    // Runs commands to their ends, one after another.
    static void runSession(const std::vector<Command>& commands) {
        for (const Command& command : commands) {
            const RunResult result = run({"bash", "-c", command.text});
            EXPECT_EQ(0, result.status) << command.text << ": " << result.errors;
            // A terminal shows the last line of a progress alone.
            EXPECT_THAT(withoutMeasures(result.output), EndsWith(withoutMeasures(command.shown)))
                    << command.text;
        }
    }

    // Commands side by side, which is faster.
    class Running {
      public:
        explicit Running(const std::vector<Command>& commands) : mCommands(commands) {
            for (const Command& command : commands) {
                // A signal is for the command, not for a shell around it.
                const bool isSimple = command.text.find_first_of(";&|") == std::string::npos;
                mProcesses.emplace_back(std::vector<std::string>{
                        "bash", "-c", (isSimple ? "exec " : "") + command.text});
            }
        }

        // Stops them, each once it has printed that.
        void stopAfter(const std::string& sign) {
            for (ChildProcess& process : mProcesses) {
                EXPECT_TRUE(process.awaitOutput(sign)) << process.errors();
                process.signal(SIGINT);
            }
            await();
        }

        // Each has to succeed.
        void await() {
            auto command = mCommands.begin();
            for (ChildProcess& process : mProcesses) {
                EXPECT_EQ(0, process.wait()) << command->text << ": " << process.errors();
                ++command;
            }
        }

      private:
        const std::vector<Command> mCommands;
        std::list<ChildProcess> mProcesses;
    };

  private:
    static void addCommandsOf(const std::string& block, std::vector<Command>& commands) {
        for (const std::string& line : splitLines(block)) {
            const std::string command = commandIn(line);
            if (!command.empty()) {
                commands.push_back({command, ""});
            }
        }
    }
};

}  // namespace

// All of them but those that are listed above: what is written anew into a document is run at once.
TEST_F(Commands, OfAllDocumentsDoWhatIsTold) {
    std::vector<Command> sessions;
    std::vector<Command> whole;
    std::vector<Command> lasting;
    std::vector<Command> stacks;
    std::set<std::string> seen;
    for (const Command& command : readAll()) {
        if (!seen.insert(command.text).second) {
            continue;
        }
        const bool isStack = command.text.rfind("zelk-touchstack", 0) == 0;
        const bool lasts = isStack && command.text != "zelk-touchstack --source list";
        if (kNotRun.count(command.text) == 0) {
            (lasts                               ? stacks
             : kLasting.count(command.text) != 0 ? lasting
             : !command.shown.empty()            ? sessions
                                                 : whole)
                    .push_back(command);
        }
    }
    for (const auto& [text, reason] : kNotRun) {
        EXPECT_EQ(1u, seen.count(text)) << text << " stands in no document";
    }
    EXPECT_EQ(kLasting.size(), lasting.size()) << "one stands in no document";
    for (const std::vector<Command>* commands : {&sessions, &whole, &stacks}) {
        EXPECT_LE(5u, commands->size()) << "are commands written in another way?";
    }
    {
        TouchStack stack;
        // The files that the commands name.
        ASSERT_EQ(0, zelkctl({"record", "--frames", "20", "--output", "FILE"}).status);
        std::filesystem::copy("FILE", "monday.frames");
        std::ofstream("/tmp/trial.conf") << "{\"gain\":2}";
        Running traces(lasting);
        runSession(sessions);
        Running(whole).await();
        // They have seen these.
        traces.stopAfter("zelkctl");
        std::filesystem::remove("/tmp/trial.conf");
    }
    Running(stacks).stopAfter("\nprocess ");
}

TEST(Documents, ManualLinked) {
    TouchStack stack;
    const RunResult result = run({binary("manual_watch")});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output, MatchesRegex("[1-9][0-9]* frames, [1-9][0-9]* gestures\n"));
}

TEST(Documents, ManualLinkedTellsWhatFailed) {
    TouchStack stack({"--fault", "gesture.startGestureDetection=status:0x40000010"});
    const RunResult result = run({binary("manual_watch")});
    EXPECT_EQ(1, result.status);
    // Behind the log of the library.
    EXPECT_THAT(result.errors, EndsWith("\ndetection: Error involving AFE HAL\n"));
}

TEST(Documents, ManualByName) {
    TouchStack stack;
    const RunResult result = run({binary("manual_by_name"), ZELK_LIBRARY});
    EXPECT_EQ(0, result.status) << result.errors;
    EXPECT_THAT(result.output,
                MatchesRegex("status 0x0, [1-9][0-9]* frames, [1-9][0-9]* gestures\n"));
}

TEST(Documents, CheckOfAFileOfFrames) {
    TouchStack stack;
    const std::string file = "/tmp/frames-" + std::to_string(getpid());
    const RunResult recording =
            run({binary("zelkctl"), "record", "--frames", "20", "--output", file});
    EXPECT_EQ(0, recording.status) << recording.errors;
    const RunResult result = run({"python3", ZELK_DOCUMENT_PROGRAMS "/check_frames.py", file});
    EXPECT_EQ("20 frames\n", result.output) << result.errors;
    unlink(file.c_str());
}

}  // namespace pemaro::test
