// The terminal interface as a user sees it: `velmar --terminal` in a tmux session of 80 x 24 (send-keys,
// capture-pane), against a real kxserverd. Captured screens are kept under <build>/screenshots.
#ifdef VELMAR_WITH_TERMINAL

#include <gtest/gtest.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <thread>

#include "core/platform/plist/PlistCodec.h"
#include "tests/support/Process.h"
#include "tests/support/TestPaths.h"
#include "tests/ui/ChangingValues.h"
#include "tests/ui/KxServerProcess.h"

namespace velmar {
namespace {

constexpr const char* kTmux = "/usr/bin/tmux";
constexpr int kColumns = 80;
constexpr int kRows = 24;

std::vector<std::string> splitLines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream stream(text);
    std::string line;
    while (std::getline(stream, line)) {
        lines.push_back(line);
    }
    return lines;
}

bool startsWith(const std::string& text, const std::string& prefix) {
    return text.rfind(prefix, 0) == 0;
}

// One tmux server of our own (its own socket), with one session running the monitor.
class TmuxSession {
  public:
    TmuxSession() : socket_("velmar-ui-" + std::to_string(getpid()) + "-" + std::to_string(counter()++)) {}
    ~TmuxSession() { tmux({"kill-server"}); }

    bool start(const std::vector<std::string>& environment, const std::vector<std::string>& command) {
        std::vector<std::string> arguments = {
            "new-session",         "-d",          "-s", "velmar", "-x", std::to_string(kColumns), "-y",
            std::to_string(kRows), "/usr/bin/env"};
        arguments.insert(arguments.end(), environment.begin(), environment.end());
        arguments.insert(arguments.end(), command.begin(), command.end());
        return tmux(arguments).exitCode == 0;
    }
    std::vector<std::string> screen() { return splitLines(tmux({"capture-pane", "-p", "-t", "velmar"}).out); }
    // The screen with its attributes as escape sequences (reverse video is ESC[7m).
    std::string screenWithAttributes() { return tmux({"capture-pane", "-p", "-e", "-t", "velmar"}).out; }
    void keys(const std::vector<std::string>& names) {
        std::vector<std::string> arguments = {"send-keys", "-t", "velmar"};
        arguments.insert(arguments.end(), names.begin(), names.end());
        tmux(arguments);
    }
    void resize(int columns, int rows) {
        tmux({"resize-window", "-t", "velmar", "-x", std::to_string(columns), "-y", std::to_string(rows)});
    }
    bool alive() { return tmux({"has-session", "-t", "velmar"}).exitCode == 0; }

    // Waits until the screen satisfies predicate; answers the last screen seen.
    bool waitFor(const std::function<bool(const std::vector<std::string>&)>& predicate, double seconds,
                 std::vector<std::string>* last = nullptr) {
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::duration<double>(seconds);
        for (;;) {
            std::vector<std::string> lines = screen();
            const bool done = predicate(lines);
            if (last != nullptr) {
                *last = lines;
            }
            if (done) {
                return true;
            }
            if (std::chrono::steady_clock::now() >= deadline) {
                return false;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(100));
        }
    }

  private:
    static int& counter() {
        static int value = 0;
        return value;
    }
    testing::ProcessResult tmux(std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), {kTmux, "-u", "-f", "/dev/null", "-L", socket_});
        return testing::runProcess(arguments);
    }
    std::string socket_;
};

std::string footer(const std::vector<std::string>& lines) {
    return lines.size() >= kRows ? lines[kRows - 1] : "";
}

// The lines between the title and the footer.
std::vector<std::string> body(const std::vector<std::string>& lines) {
    if (lines.size() < kRows) {
        return {};
    }
    return std::vector<std::string>(lines.begin() + 1, lines.begin() + kRows - 1);
}

void keepScreen(const std::string& name, const std::vector<std::string>& lines) {
    const std::string directory = std::string(VELMAR_BINARY_DIR) + "/screenshots";
    std::filesystem::create_directories(directory);
    std::ofstream out(directory + "/" + name);
    for (const std::string& line : lines) {
        out << line << "\n";
    }
}

class TerminalTmuxTest : public ::testing::Test {
  protected:
    void SetUp() override {
        if (access(kTmux, X_OK) != 0) {
            GTEST_SKIP() << "tmux is not installed";
        }
    }
    std::vector<std::string> environment() const {
        return {"VELMAR_RUNTIME_DIR=" + runtime_.path(),
                "XDG_CONFIG_HOME=" + config_.path(),
                "XDG_STATE_HOME=" + state_.path(),
                "VELMAR_SYSROOT=" + sysroot_.path(),
                "VELMAR_RESOURCE_DIR=" + std::string(VELMAR_SOURCE_DIR) + "/resources/templates",
                "LANG=C.UTF-8",
                "LC_ALL=C.UTF-8",
                "TZ=UTC",
                "TERM=screen",
                "DISPLAY=",
                "WAYLAND_DISPLAY="};
    }
    void allowSaving() {
        std::filesystem::create_directories(
            sysroot_.path() + "/BrindleInternal/Library/PreferenceBundles/Carrier Settings.bundle");
    }
    // Opens the panes of path from the root, by the rows' names on screen.
    bool openPath(TmuxSession& session, const std::string& path) {
        for (int i = 0; i < 8; ++i) {
            session.keys({"Escape"});
        }
        if (!session.waitFor(
                [](const auto& lines) { return !lines.empty() && startsWith(lines[0], " Velmar "); }, 3)) {
            return false;
        }
        session.keys({"Home"});
        std::string current = "/";
        for (const std::string& name : testing::pathComponents(path)) {
            std::vector<std::string> lines;
            int row = -1;
            session.waitFor(
                [&](const auto& shown) {
                    for (std::size_t i = 1; i + 1 < shown.size(); ++i) {
                        if (startsWith(shown[i], " " + name + " ") || shown[i] == " " + name) {
                            row = static_cast<int>(i) - 1;
                            return true;
                        }
                    }
                    return false;
                },
                3, &lines);
            if (row < 0) {
                return false;
            }
            std::vector<std::string> keys(static_cast<std::size_t>(row), "Down");
            keys.push_back("Enter");
            session.keys(keys);
            current = current == "/" ? "/" + name : current + "/" + name;
            const std::string expected = current;
            if (!session.waitFor(
                    [&](const auto& shown) {
                        return !shown.empty() && shown[0].find(expected.substr(expected.rfind('/') + 1)) == 1;
                    },
                    3)) {
                return false;
            }
        }
        return true;
    }
    testing::TemporaryDirectory runtime_;
    testing::TemporaryDirectory config_;
    testing::TemporaryDirectory state_;
    testing::TemporaryDirectory sysroot_;
};

TEST_F(TerminalTmuxTest, ConnectsShowsChangingValuesSurvivesTheServiceDyingAndReconnects) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    std::cout << "service: " << service.description() << std::endl;
    const std::string pane = testing::livelyPaneOf("lte");

    TmuxSession session;
    const auto started = std::chrono::steady_clock::now();
    ASSERT_TRUE(session.start(environment(), {VELMAR_PATH, "--terminal"}));
    std::vector<std::string> lines;
    ASSERT_TRUE(session.waitFor([](const auto& shown) { return startsWith(footer(shown), "   Updated "); }, 5,
                                &lines))
        << footer(lines);
    EXPECT_LT(std::chrono::steady_clock::now() - started, std::chrono::seconds(5));
    EXPECT_EQ(lines[0].substr(0, 8), " Velmar ");
    keepScreen("terminal-root.txt", lines);

    ASSERT_TRUE(openPath(session, pane)) << pane;
    bool changed = false;
    for (int i = 0; i < 8 && !changed; ++i) {
        const std::vector<std::string> before = session.screen();
        ASSERT_TRUE(session.waitFor(
            [&](const auto& shown) {
                return footer(shown) != footer(before) && startsWith(footer(shown), "   Updated ");
            },
            15, &lines));
        if (lines[0] != before[0]) {
            ASSERT_TRUE(openPath(session, pane)) << pane << " came back";
            continue;
        }
        changed = body(lines) != body(before);
    }
    EXPECT_TRUE(changed) << "the values of " << pane << " did not change on screen";
    keepScreen("terminal-live-pane.txt", lines);

    // The service dies: the values stay; a pane change shows "Connecting..." and the spinner turns.
    const std::vector<std::string> kept = body(session.screen());
    service.kill();
    std::this_thread::sleep_for(std::chrono::milliseconds(1500));
    EXPECT_EQ(body(session.screen()), kept);
    session.keys({"Escape"});
    ASSERT_TRUE(session.waitFor([](const auto& shown) { return footer(shown).find("Connecting...") == 5; }, 3,
                                &lines))
        << footer(lines);
    const std::string spinner = footer(lines).substr(0, 4);
    EXPECT_NE(spinner, "    ");
    EXPECT_TRUE(session.waitFor([&](const auto& shown) { return footer(shown).substr(0, 4) != spinner; }, 2));
    // Enter opens the same pane again (the parent kept its cursor row), with the values kept meanwhile.
    session.keys({"Enter"});
    EXPECT_TRUE(session.waitFor(
        [&](const auto& shown) { return body(shown) == kept && footer(shown).find("Connecting...") == 5; }, 3,
        &lines));
    EXPECT_EQ(body(lines), kept);
    keepScreen("terminal-service-gone.txt", lines);

    // Back again: connected within a retry and a tick; the values were there all along.
    ASSERT_TRUE(service.start());
    ASSERT_TRUE(session.waitFor([](const auto& shown) { return startsWith(footer(shown), "   Updated "); },
                                12, &lines))
        << footer(lines);
    keepScreen("terminal-reconnected.txt", lines);
    session.keys({"q"});
    EXPECT_TRUE(session.waitFor([&](const auto&) { return !session.alive(); }, 5));
}

// Watches the open pane over up to `redraws` redraws; true when its values changed on screen. A pane that
// went (a list entry) is opened again.
bool valuesChangeOnScreen(TmuxSession& session, const std::function<bool()>& reopen, int redraws) {
    std::vector<std::string> lines;
    for (int i = 0; i < redraws; ++i) {
        const std::vector<std::string> before = session.screen();
        if (!session.waitFor(
                [&](const auto& shown) {
                    return footer(shown) != footer(before) && startsWith(footer(shown), "   Updated ");
                },
                15, &lines)) {
            return false;
        }
        if (lines[0] != before[0]) {
            if (!reopen()) {
                return false;
            }
            continue;
        }
        if (body(lines) != body(before)) {
            return true;
        }
    }
    return false;
}

TEST_F(TerminalTmuxTest, ValuesLiveAgainAfterEveryRestartOfTheServiceWhateverItsTechnology) {
    // One monitor session; the service is killed and started again with another seed, then with each
    // other technology in turn. Each time the values of a lively pane must change on screen again.
    const std::vector<std::pair<std::string, std::string>> phases = {
        {"lte", "1"}, {"lte", "2"}, {"gsm", "3"}, {"utran", "4"}, {"cdma", "5"}, {"ifx", "6"}};
    std::unique_ptr<testing::KxServerProcess> service;
    TmuxSession session;
    for (std::size_t phase = 0; phase < phases.size(); ++phase) {
        const auto& [technology, seed] = phases[phase];
        if (service) {
            service->kill();
        }
        service = std::make_unique<testing::KxServerProcess>(
            runtime_.path(), technology, std::vector<std::string>{"--rate-multiplier", "4", "--seed", seed});
        const auto restarted = std::chrono::steady_clock::now();
        ASSERT_TRUE(service->start()) << service->description();
        if (phase == 0) {
            ASSERT_TRUE(session.start(environment(), {VELMAR_PATH, "--terminal"}));
        }
        const std::string pane = testing::livelyPaneOf(technology);
        const std::string first = testing::pathComponents(pane).front();
        // The monitor reconnects within a retry and shows this technology's tree.
        ASSERT_TRUE(session.waitFor(
            [&](const auto& shown) {
                session.keys({"Escape"});
                for (std::size_t i = 1; i + 1 < shown.size(); ++i) {
                    if (startsWith(shown[i], " " + first + " ") && startsWith(footer(shown), "   Updated ")) {
                        return true;
                    }
                }
                return false;
            },
            20))
            << technology << ": " << first << " never shown";
        ASSERT_TRUE(openPath(session, pane)) << technology << ": " << pane;
        EXPECT_TRUE(valuesChangeOnScreen(
            session, [&] { return openPath(session, pane); }, 6))
            << technology << " (seed " << seed << "): the values of " << pane << " did not change";
        std::printf("%s, seed %s: values changed on screen %.1f s after the service started\n",
                    technology.c_str(), seed.c_str(),
                    std::chrono::duration<double>(std::chrono::steady_clock::now() - restarted).count());
        keepScreen("terminal-restart-" + technology + "-" + seed + ".txt", session.screen());
    }
    session.keys({"q"});
    EXPECT_TRUE(session.waitFor([&](const auto&) { return !session.alive(); }, 5));
}

TEST_F(TerminalTmuxTest, ScreenLayoutKeysResizeSaveAndQuit) {
    allowSaving();
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    TmuxSession session;
    ASSERT_TRUE(session.start(environment(), {VELMAR_PATH, "--terminal"}));
    std::vector<std::string> lines;
    ASSERT_TRUE(session.waitFor([](const auto& shown) { return startsWith(footer(shown), "   Updated "); }, 5,
                                &lines));
    ASSERT_EQ(lines.size(), static_cast<std::size_t>(kRows));
    EXPECT_EQ(lines[0], " Velmar" + std::string(71, ' ') + "/");
    EXPECT_EQ(lines[1].substr(lines[1].size() - 3), "›");  // an inner node; its mark is 3 bytes of UTF-8
    EXPECT_EQ(footer(lines).substr(footer(lines).size() - 18), "[s] Save  [q] Quit");
    // The cursor row is in reverse video.
    EXPECT_NE(session.screenWithAttributes().find("\x1b[7m"), std::string::npos);

    // A smaller terminal is redrawn at its size.
    session.resize(60, 20);
    ASSERT_TRUE(session.waitFor([](const auto& shown) { return shown.size() == 20 && shown[0].size() == 59; },
                                3, &lines))
        << (lines.empty() ? "" : lines[0]);
    EXPECT_EQ(lines[0], " Velmar" + std::string(51, ' ') + "/");
    keepScreen("terminal-60x20.txt", lines);
    session.resize(kColumns, kRows);
    ASSERT_TRUE(session.waitFor(
        [](const auto& shown) { return shown.size() == kRows && shown[0].size() == kColumns - 1; }, 3));

    // s opens the save form; typing and Return write the snapshot and close the form.
    session.keys({"s"});
    ASSERT_TRUE(session.waitFor(
        [](const auto& shown) {
            for (const auto& line : shown) {
                if (line.find("Save Snapshot") != std::string::npos) {
                    return true;
                }
            }
            return false;
        },
        3, &lines));
    keepScreen("terminal-save-form.txt", lines);
    session.keys({"-l", "Cell edge, tunnel"});
    session.keys({"Enter"});  // Return in the description saves
    ASSERT_TRUE(session.waitFor(
        [](const auto& shown) {
            for (const auto& line : shown) {
                if (line.find("Save Snapshot") != std::string::npos) {
                    return false;
                }
            }
            return true;
        },
        3, &lines));
    std::vector<std::string> snapshots;
    for (const auto& entry : std::filesystem::directory_iterator(state_.path() + "/velmar/diagnostics")) {
        snapshots.push_back(entry.path().string());
    }
    ASSERT_EQ(snapshots.size(), 1u);
    const auto saved = readDictionaryFile(snapshots[0]);
    ASSERT_TRUE(saved);
    EXPECT_EQ(*saved->dictionary()->get("Description").string(), "Cell edge, tunnel");
    ASSERT_TRUE(saved->dictionary()->get("Data").array());

    // q quits and the termination sequence resets the home screen's preference.
    session.keys({"q"});
    ASSERT_TRUE(session.waitFor([&](const auto&) { return !session.alive(); }, 5));
    const auto preferences =
        readDictionaryFile(config_.path() + "/velmar/preferences/com.velmar.homescreen.plist");
    ASSERT_TRUE(preferences);
    EXPECT_EQ(preferences->dictionary()->get("HxShowGSMRSSI"), PlistValue::boolean(false));
}

TEST_F(TerminalTmuxTest, COpensTheLiveChartOfAValueInBrailleOrAsciiAndEscGoesBack) {
    testing::KxServerProcess service(runtime_.path());
    ASSERT_TRUE(service.start()) << service.description();
    const std::string pane = "/Serving Cell/Connected mode LTE Intra-frequency Measurement";
    const std::string value = "Serving Filtered RSRP";
    auto isUpdated = [](const auto& shown) { return startsWith(footer(shown), "   Updated "); };
    // Opens the pane, puts the cursor on the value and presses c; answers the chart's screen.
    auto openChart = [&](TmuxSession& session, std::vector<std::string>& lines) {
        ASSERT_TRUE(session.waitFor(isUpdated, 5, &lines)) << footer(lines);
        ASSERT_TRUE(openPath(session, pane));
        lines = session.screen();
        int row = -1;
        for (std::size_t i = 1; i + 1 < lines.size(); ++i) {
            if (startsWith(lines[i], " " + value + " ")) {
                row = static_cast<int>(i) - 1;
            }
        }
        ASSERT_GE(row, 0) << value;
        session.keys(std::vector<std::string>(static_cast<std::size_t>(row), "Down"));
        ASSERT_TRUE(session.waitFor(
            [](const auto& shown) { return footer(shown).find("[c] Chart  [q] Quit") != std::string::npos; },
            3, &lines))
            << footer(lines);
        session.keys({"c"});
        ASSERT_TRUE(session.waitFor(
            [&](const auto& shown) {
                return shown.size() == kRows && startsWith(shown[0], " " + value + " ") &&
                       startsWith(shown[1], " min ");
            },
            3, &lines))
            << (lines.empty() ? "" : lines[0]);
    };
    auto plotText = [](const std::vector<std::string>& shown) {
        std::string plot;
        for (int row = 2; row < kRows - 2; ++row) {
            plot += shown[static_cast<std::size_t>(row)];
        }
        return plot;
    };

    TmuxSession session;
    ASSERT_TRUE(session.start(environment(), {VELMAR_PATH, "--terminal"}));
    std::vector<std::string> lines;
    openChart(session, lines);
    if (HasFatalFailure()) {
        return;
    }
    EXPECT_EQ(lines[0].substr(lines[0].size() - 4), " dBm") << lines[0];
    EXPECT_NE(lines[1].find(" dBm   max "), std::string::npos) << lines[1];
    EXPECT_NE(lines[1].find("   last 10 min"), std::string::npos) << lines[1];
    EXPECT_NE(footer(lines).find("[+/-] Zoom  [Esc] Back  [q] Quit"), std::string::npos) << footer(lines);
    // Live: the next redraws bring more samples; the line is drawn in braille (U+2800..U+28FF, E2 A0-A3 ..).
    const std::string before = footer(lines);
    ASSERT_TRUE(session.waitFor(
        [&](const auto& shown) { return footer(shown) != before && isUpdated(shown); }, 15, &lines));
    ASSERT_TRUE(session.waitFor(
        [&](const auto& shown) {
            const std::string plot = plotText(shown);
            for (std::size_t i = 0; i + 1 < plot.size(); ++i) {
                const auto lead = static_cast<unsigned char>(plot[i]);
                const auto next = static_cast<unsigned char>(plot[i + 1]);
                if (lead == 0xE2 && next >= 0xA0 && next <= 0xA3) {
                    return true;
                }
            }
            return false;
        },
        15, &lines));
    EXPECT_NE(plotText(lines).find("┤"), std::string::npos);
    keepScreen("terminal-chart.txt", lines);
    session.keys({"-"});
    EXPECT_TRUE(session.waitFor(
        [](const auto& shown) {
            return shown.size() > 1 && shown[1].find("   last 20 min") != std::string::npos;
        },
        3));
    // Esc goes back to the pane, the cursor still on the value.
    session.keys({"Escape"});
    ASSERT_TRUE(session.waitFor(
        [&](const auto& shown) { return !shown.empty() && startsWith(shown[0], " Connected mode LTE "); }, 3,
        &lines))
        << lines[0];
    session.keys({"q"});
    EXPECT_TRUE(session.waitFor([&](const auto&) { return !session.alive(); }, 5));

    // A terminal that is not UTF-8: the same chart in plain ASCII, the line drawn with "*".
    std::vector<std::string> ascii = environment();
    for (std::string& variable : ascii) {
        if (startsWith(variable, "LANG=") || startsWith(variable, "LC_ALL=")) {
            variable = variable.substr(0, variable.find('=') + 1) + "C";
        }
    }
    TmuxSession plain;
    ASSERT_TRUE(plain.start(ascii, {VELMAR_PATH, "--terminal"}));
    openChart(plain, lines);
    if (HasFatalFailure()) {
        return;
    }
    ASSERT_TRUE(plain.waitFor(
        [&](const auto& shown) { return plotText(shown).find('*') != std::string::npos; }, 15, &lines));
    for (const std::string& line : lines) {
        for (const char c : line) {
            EXPECT_LT(static_cast<unsigned char>(c), 0x80) << line;
        }
    }
    EXPECT_NE(plotText(lines).find('+'), std::string::npos);
    keepScreen("terminal-chart-ascii.txt", lines);
    plain.keys({"Left"});
    ASSERT_TRUE(plain.waitFor(
        [&](const auto& shown) { return !shown.empty() && startsWith(shown[0], " Connected mode LTE "); },
        3));
    plain.keys({"q"});
    EXPECT_TRUE(plain.waitFor([&](const auto&) { return !plain.alive(); }, 5));
}

TEST_F(TerminalTmuxTest, WithoutTheMarkerTheFooterOffersNoSaveAndSDoesNothing) {
    TmuxSession session;
    ASSERT_TRUE(session.start(environment(), {VELMAR_PATH, "--terminal"}));
    std::vector<std::string> lines;
    // No service at all: the root pane says "Connecting" and the spinner turns.
    ASSERT_TRUE(
        session.waitFor([](const auto& shown) { return footer(shown).find("Connecting") == 5; }, 5, &lines));
    EXPECT_EQ(footer(lines).substr(footer(lines).size() - 8), "[q] Quit");
    EXPECT_EQ(footer(lines).find("[s] Save"), std::string::npos);
    keepScreen("terminal-connecting.txt", lines);
    session.keys({"s"});
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    for (const auto& line : session.screen()) {
        EXPECT_EQ(line.find("Save Snapshot"), std::string::npos);
    }
    session.keys({"q"});
    EXPECT_TRUE(session.waitFor([&](const auto&) { return !session.alive(); }, 5));
}

}  // namespace
}  // namespace velmar

#endif  // VELMAR_WITH_TERMINAL
