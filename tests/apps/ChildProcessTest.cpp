#include "apps/common/ChildProcess.h"

#include <doctest/doctest.h>

#include <chrono>

using apps::ChildAnswer;
using apps::ChildWishes;
using apps::runChildren;
using std::chrono::milliseconds;

namespace {

ChildWishes shell(const std::string& script, std::optional<milliseconds> limit = {})
{
    return { "/bin/sh", { "-c", script }, limit };
}

} // namespace

TEST_CASE("what child processes print and answer comes back in the order in which they were wished for")
{
    const std::vector<ChildAnswer> answers
        = runChildren({ shell("echo one; echo bad >&2; exit 3"), shell("printf two"), shell("kill -TERM $$"),
                          { "/none/such" }, shell("head -c 300000 /dev/zero") },
            2);
    REQUIRE(answers.size() == 5);
    CHECK(answers[0].end == ChildAnswer::End::exited);
    CHECK(answers[0].status == 3);
    CHECK(answers[0].output == "one\n");
    CHECK(answers[0].errors == "bad\n");
    CHECK(answers[1].output == "two");
    CHECK(answers[1].status == 0);
    CHECK(answers[2].end == ChildAnswer::End::killed);
    CHECK(answers[3].end == ChildAnswer::End::notStarted);
    CHECK(answers[4].output == std::string(300'000, '\0'));
    CHECK(runChildren({}, 2).empty());
}

TEST_CASE("a child that has stopped is given up when its time is over, and the others are answered")
{
    const auto began = std::chrono::steady_clock::now();
    const std::vector<ChildAnswer> answers
        = runChildren({ shell("kill -STOP $$", milliseconds(300)), shell("echo here", milliseconds(60'000)),
                          shell("echo part; exec cat /dev/zero >/dev/null", milliseconds(300)) },
            3);
    CHECK(answers[0].end == ChildAnswer::End::silent);
    CHECK(answers[1].output == "here\n");
    CHECK(answers[2].end == ChildAnswer::End::silent);
    CHECK(answers[2].output == "part\n");
    CHECK(std::chrono::steady_clock::now() - began < std::chrono::seconds(30));
}

TEST_CASE("a child has nothing to read")
{
    const std::vector<ChildAnswer> answers = runChildren({ shell("cat; echo end") }, 1);
    CHECK(answers[0].output == "end\n");
}
