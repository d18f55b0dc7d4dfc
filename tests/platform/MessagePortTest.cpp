// MessagePort against peers that misbehave, in one process: raw sockets stand in for a hostile peer (one
// that sends empty packets, never reads its replies, floods, connects from the wrong process), and the
// process's own descriptor limit stands in for a machine out of descriptors.
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cerrno>
#include <cstring>
#include <string>
#include <vector>

#include "core/platform/MessagePort.h"
#include "core/platform/PollMainQueue.h"
#include "core/platform/RuntimeDirectory.h"
#include "tests/support/LogCapture.h"
#include "tests/support/RawPeer.h"
#include "tests/support/TestPaths.h"

namespace velmar {
namespace {

constexpr std::uint32_t kReplyWanted = testing::RawPeer::kReplyWanted;
using testing::RawPeer;

class MessagePortTest : public ::testing::Test {
  protected:
    void SetUp() override {
        setenv("VELMAR_RUNTIME_DIR", runtime_.path().c_str(), 1);
        MainQueue::setCurrent(&queue_);
    }
    void TearDown() override {
        MainQueue::setCurrent(nullptr);
        unsetenv("VELMAR_RUNTIME_DIR");
    }
    std::string pathOf(const std::string& name) const { return runtime_.path() + "/" + name; }
    // A local port that counts its messages and answers each with reply.
    std::shared_ptr<MessagePort> echoPort(const std::string& name, MessagePort::LocalMode mode,
                                          std::string reply = "ok") {
        bool exists = false;
        auto port = MessagePort::createLocal(
            name,
            [this, reply](std::int32_t, ByteView data) -> std::optional<PlistData> {
                ++received_;
                lastPayload_.assign(data.begin(), data.end());
                return PlistData(reply.begin(), reply.end());
            },
            &exists, mode);
        EXPECT_TRUE(port);
        EXPECT_FALSE(exists);
        if (port) {
            port->setDispatchQueue(queue_);
        }
        return port;
    }

    testing::TemporaryDirectory runtime_;
    PollMainQueue queue_;
    int received_ = 0;
    std::string lastPayload_;
};

TEST_F(MessagePortTest, AnEmptyPacketIsDroppedAsTooShortNotTakenForAHangUp) {
    auto port = echoPort("edge.port", MessagePort::LocalMode::Feeding);
    bool invalidated = false;
    port->setInvalidationCallback([&] { invalidated = true; });
    RawPeer peer(pathOf("edge.port"));
    ASSERT_TRUE(peer.connected());
    ASSERT_TRUE(peer.send(0, 0, "first"));  // the connection has delivered: a hang-up now would invalidate
    ASSERT_TRUE(queue_.runUntil([&] { return received_ == 1; }, 5));
    ASSERT_TRUE(peer.sendEmpty());
    ASSERT_TRUE(peer.send(0, kReplyWanted, "after"));
    ASSERT_TRUE(queue_.runUntil([&] { return received_ == 2; }, 5));
    EXPECT_EQ(lastPayload_, "after");
    EXPECT_FALSE(invalidated);
    EXPECT_TRUE(port->isValid());
    EXPECT_EQ(port->connectionCount(), 1u);
    std::optional<std::string> reply;
    ASSERT_TRUE(queue_.runUntil([&] { return (reply = peer.receive()).has_value(); }, 5));
    EXPECT_EQ(*reply, "ok");
}

TEST_F(MessagePortTest, APeerThatNeverReadsItsRepliesIsDisconnectedWithoutStallingTheOthers) {
    auto port = echoPort("control.port", MessagePort::LocalMode::Serving, std::string(2000, 'r'));
    RawPeer greedy(pathOf("control.port"));
    ASSERT_TRUE(greedy.connected());
    testing::LogCapture capture;
    // A few hundred requests whose replies are never read: the socket takes some, the queue a bounded few
    // more, then the peer is dropped. No step of it may wait on the peer.
    int sent = 0;
    while (sent < 600 && greedy.send(0, kReplyWanted, "request")) {
        ++sent;
        if (sent % 50 == 0) {
            queue_.runFor(0.001);
        }
    }
    ASSERT_TRUE(queue_.runUntil([&] { return port->connectionCount() == 0; }, 10)) << sent << " sent";
    const std::string expected = "Closed a connection from pid " + std::to_string(getpid()) +
                                 " on port control.port: it does not read its replies (" +
                                 std::to_string(MessagePort::kMaxUnreadReplies + 1) + " waiting)";
    EXPECT_TRUE(capture.contains(expected)) << ::testing::PrintToString(capture.texts());
    // A peer that reads its replies is served as before.
    RawPeer polite(pathOf("control.port"));
    ASSERT_TRUE(polite.connected());
    ASSERT_TRUE(polite.send(0, kReplyWanted, "hello"));
    std::optional<std::string> reply;
    ASSERT_TRUE(queue_.runUntil([&] { return (reply = polite.receive()).has_value(); }, 5));
    EXPECT_EQ(*reply, std::string(2000, 'r'));
    EXPECT_EQ(lastPayload_, "hello");
}

TEST_F(MessagePortTest, AFloodingPeerLetsTimersRunBetweenItsMessages) {
    auto port = echoPort("busy.port", MessagePort::LocalMode::Serving);
    RawPeer flooder(pathOf("busy.port"));
    ASSERT_TRUE(flooder.connected());
    int queued = 0;
    while (queued < 3000 && flooder.send(0, 0, "x")) {
        ++queued;
    }
    ASSERT_GT(queued, 4 * MessagePort::kMessagesPerWake);
    int receivedWhenTimerRan = -1;
    queue_.after(0, [&] { receivedWhenTimerRan = received_; });
    ASSERT_TRUE(queue_.runUntil([&] { return receivedWhenTimerRan >= 0; }, 5));
    EXPECT_LE(receivedWhenTimerRan, 2 * MessagePort::kMessagesPerWake);
    ASSERT_TRUE(queue_.runUntil([&] { return received_ == queued; }, 10));
}

TEST_F(MessagePortTest, OnlyTheChosenProcessMayConnectAndOnlySoMany) {
    auto port = echoPort("channel.port", MessagePort::LocalMode::Feeding);
    testing::LogCapture capture;
    const pid_t someoneElse = getpid() + 100000;
    port->acceptOnlyFrom(someoneElse);
    RawPeer stranger(pathOf("channel.port"));
    ASSERT_TRUE(stranger.connected());
    ASSERT_TRUE(stranger.send(0, 0, "end this channel"));
    std::optional<std::string> seen;
    ASSERT_TRUE(queue_.runUntil([&] { return (seen = stranger.receive()) == std::string("<hung up>"); }, 5));
    EXPECT_EQ(received_, 0);
    EXPECT_TRUE(port->isValid());
    EXPECT_TRUE(capture.contains("Refused a connection from pid " + std::to_string(getpid()) +
                                 " on port channel.port, which serves pid " + std::to_string(someoneElse) +
                                 " only"))
        << ::testing::PrintToString(capture.texts());

    port->acceptOnlyFrom(getpid());
    port->setMaxConnections(2);
    RawPeer first(pathOf("channel.port"));
    RawPeer second(pathOf("channel.port"));
    RawPeer third(pathOf("channel.port"));
    ASSERT_TRUE(queue_.runUntil([&] { return (seen = third.receive()) == std::string("<hung up>"); }, 5));
    EXPECT_EQ(port->connectionCount(), 2u);
    EXPECT_TRUE(capture.contains("Refused a connection from pid " + std::to_string(getpid()) +
                                 " on port channel.port: 2 connections are open, the most it takes"));
}

TEST_F(MessagePortTest, OutOfDescriptorsTheListenerWaitsInsteadOfSpinningAndSaysSoOnce) {
    auto port = echoPort("full.port", MessagePort::LocalMode::Serving);
    testing::LogCapture capture;
    rlimit previous{};
    ASSERT_EQ(getrlimit(RLIMIT_NOFILE, &previous), 0);
    rlimit lowered = previous;
    lowered.rlim_cur = 64;
    ASSERT_EQ(setrlimit(RLIMIT_NOFILE, &lowered), 0);
    // Every descriptor taken but one, which the connecting peer takes: the port cannot accept it.
    std::vector<int> fillers;
    for (int fd = dup(0); fd >= 0; fd = dup(0)) {
        fillers.push_back(fd);
    }
    ASSERT_FALSE(fillers.empty());
    close(fillers.back());
    fillers.pop_back();
    RawPeer peer(pathOf("full.port"));
    ASSERT_TRUE(peer.connected());
    rusage before{};
    getrusage(RUSAGE_SELF, &before);
    queue_.runFor(0.5);
    rusage after{};
    getrusage(RUSAGE_SELF, &after);
    const auto seconds = [](const timeval& t) { return static_cast<double>(t.tv_sec) + t.tv_usec / 1e6; };
    const double cpu = seconds(after.ru_utime) + seconds(after.ru_stime) - seconds(before.ru_utime) -
                       seconds(before.ru_stime);
    const std::string cannot =
        "Cannot accept connections on port full.port: Too many open files; trying again now and then";
    std::size_t saidCannot = 0;
    for (const std::string& text : capture.texts()) {
        saidCannot += text == cannot ? 1 : 0;
    }
    EXPECT_EQ(saidCannot, 1u) << ::testing::PrintToString(capture.texts());
    EXPECT_EQ(port->connectionCount(), 0u);
    std::printf("CPU while unable to accept for 0.5 s: %.3f s\n", cpu);
    EXPECT_LT(cpu, 0.25) << "the loop spins";

    for (const int fd : fillers) {
        close(fd);
    }
    setrlimit(RLIMIT_NOFILE, &previous);
    ASSERT_TRUE(queue_.runUntil([&] { return port->connectionCount() == 1; }, 5));
    EXPECT_TRUE(capture.contains("Accepting connections on port full.port again"));
}

TEST_F(MessagePortTest, ALinkOrAFileAtThePortsNameIsLeftAloneAndNamedAsTheReason) {
    ASSERT_EQ(symlink("/nonexistent/elsewhere", pathOf("linked.port").c_str()), 0);
    testing::writeWholeFile(pathOf("file.port"), "someone's data");
    std::string failure;
    bool exists = true;
    EXPECT_FALSE(
        MessagePort::createLocal("linked.port", nullptr, &exists, MessagePort::LocalMode::Serving, &failure));
    EXPECT_FALSE(exists);
    EXPECT_EQ(failure, pathOf("linked.port") + " is a symbolic link, not a socket");
    EXPECT_FALSE(
        MessagePort::createLocal("file.port", nullptr, &exists, MessagePort::LocalMode::Serving, &failure));
    EXPECT_EQ(failure, pathOf("file.port") + " exists and is not a socket");
    EXPECT_EQ(testing::readWholeFile(pathOf("file.port")), "someone's data");
    struct stat info {};
    EXPECT_EQ(lstat(pathOf("linked.port").c_str(), &info), 0);
    EXPECT_TRUE(S_ISLNK(info.st_mode));
}

TEST_F(MessagePortTest, SocketFilesOfEndedProcessesAreRemovedOthersKept) {
    // A process that has ended: its pid is free.
    const pid_t child = fork();
    if (child == 0) {
        _exit(0);
    }
    ASSERT_GT(child, 0);
    waitpid(child, nullptr, 0);
    const auto leaveSocketFile = [this](const std::string& name) {
        const int fd = socket(AF_UNIX, SOCK_SEQPACKET, 0);
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        std::strncpy(address.sun_path, pathOf(name).c_str(), sizeof address.sun_path - 1);
        EXPECT_EQ(bind(fd, reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
        close(fd);  // no listener, the file stays
    };
    const std::string dead = "com.test.stale." + std::to_string(child) + ".Suffix";
    const std::string mine = "com.test.stale." + std::to_string(getpid()) + ".Suffix";
    const std::string otherSuffix = "com.test.stale." + std::to_string(child) + ".Other";
    leaveSocketFile(dead);
    leaveSocketFile(mine);
    leaveSocketFile(otherSuffix);
    testing::writeWholeFile(pathOf("com.test.stale." + std::to_string(child) + ".Suffix.txt"),
                            "not a socket");
    EXPECT_EQ(MessagePort::removeStalePorts("com.test.stale.", ".Suffix"), 1);
    struct stat info {};
    EXPECT_NE(lstat(pathOf(dead).c_str(), &info), 0);
    EXPECT_EQ(lstat(pathOf(mine).c_str(), &info), 0) << "a running process's file was removed";
    EXPECT_EQ(lstat(pathOf(otherSuffix).c_str(), &info), 0);
    // A stale file of the port's own name is reused by createLocal.
    bool exists = true;
    EXPECT_TRUE(MessagePort::createLocal(mine, nullptr, &exists));
    EXPECT_FALSE(exists);
}

class RuntimeDirectoryTest : public ::testing::Test {
  protected:
    void TearDown() override { unsetenv("VELMAR_RUNTIME_DIR"); }
    std::string reasonFor(const std::string& directory) {
        setenv("VELMAR_RUNTIME_DIR", directory.c_str(), 1);
        std::string why;
        EXPECT_FALSE(RuntimeDirectory::path(&why).has_value()) << directory;
        return why;
    }
    testing::TemporaryDirectory scratch_;
};

TEST_F(RuntimeDirectoryTest, EachRefusalSaysWhy) {
    testing::LogCapture capture;
    EXPECT_EQ(reasonFor("relative/dir"), "VELMAR_RUNTIME_DIR must be an absolute path, not \"relative/dir\"");
    ASSERT_EQ(symlink(scratch_.path().c_str(), scratch_.file("link").c_str()), 0);
    EXPECT_EQ(reasonFor(scratch_.file("link")),
              "runtime directory " + scratch_.file("link") + " is a symbolic link, not a directory");
    testing::writeWholeFile(scratch_.file("plain"), "");
    EXPECT_EQ(reasonFor(scratch_.file("plain")),
              "runtime directory " + scratch_.file("plain") + " exists and is not a directory");
    EXPECT_EQ(reasonFor(scratch_.file("plain") + "/below"),
              "cannot create runtime directory " + scratch_.file("plain") + "/below: Not a directory");
    // The reasons go to the log as well.
    EXPECT_TRUE(capture.contains("VELMAR_RUNTIME_DIR must be an absolute path, not \"relative/dir\""));

    const std::string longName(120, 'n');
    setenv("VELMAR_RUNTIME_DIR", scratch_.path().c_str(), 1);
    std::string why;
    EXPECT_FALSE(RuntimeDirectory::socketPathFor(longName, &why));
    const std::string longPath = scratch_.path() + "/" + longName;
    EXPECT_EQ(why, "socket path " + longPath + " is " + std::to_string(longPath.size()) +
                       " bytes long; a Unix socket path holds at most 107");
}

TEST_F(RuntimeDirectoryTest, ADirectoryOfAnotherUserIsRefusedAndAnOwnOneMadePrivate) {
    const std::string own = scratch_.file("own");
    ASSERT_EQ(mkdir(own.c_str(), 0755), 0);
    setenv("VELMAR_RUNTIME_DIR", own.c_str(), 1);
    ASSERT_TRUE(RuntimeDirectory::path());
    struct stat info {};
    ASSERT_EQ(stat(own.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 0777, 0700u);

    // Root can give a directory away; anyone else finds one of root's.
    std::string foreign = "/";
    if (getuid() == 0) {
        foreign = scratch_.file("foreign");
        ASSERT_EQ(mkdir(foreign.c_str(), 0700), 0);
        ASSERT_EQ(chown(foreign.c_str(), 65534, 65534), 0);
    }
    ASSERT_EQ(stat(foreign.c_str(), &info), 0);
    EXPECT_EQ(reasonFor(foreign), "runtime directory " + foreign + " is owned by uid " +
                                      std::to_string(info.st_uid) + ", not by this user (uid " +
                                      std::to_string(getuid()) + ")");
}

}  // namespace
}  // namespace velmar
