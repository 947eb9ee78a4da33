#include "platform/linux/StandardErrorConsole.h"

#include <doctest/doctest.h>

#include <algorithm>
#include <string>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <unistd.h>

using platform::StandardErrorConsole;

namespace {

std::string readAll(int descriptor)
{
    std::string text;
    std::vector<char> buffer(65536);
    for (ssize_t count = 0; (count = read(descriptor, buffer.data(), buffer.size())) > 0;)
        text.append(buffer.data(), static_cast<std::size_t>(count));
    return text;
}

} // namespace

TEST_CASE("lines of several threads do not mix, also through a pipe that is full and answers at once")
{
    int ends[2];
    REQUIRE(pipe(ends) == 0);
    REQUIRE(fcntl(ends[1], F_SETFL, O_NONBLOCK) == 0);
    constexpr int threadCount = 4;
    constexpr int lineCount = 50;
    const std::string longText(20'000, 'x');
    std::string received;
    std::thread reader([&] { received = readAll(ends[0]); });
    {
        StandardErrorConsole console(ends[1]);
        std::vector<std::thread> writers;
        writers.reserve(threadCount);
        for (int number = 0; number < threadCount; ++number) {
            writers.emplace_back([&, number] {
                for (int line = 0; line < lineCount; ++line)
                    console.log(std::to_string(number) + longText + std::to_string(number));
            });
        }
        for (std::thread& writer : writers)
            writer.join();
    }
    close(ends[1]);
    reader.join();
    close(ends[0]);
    const std::size_t lineLength = longText.size() + 3;
    CHECK(received.size() == lineLength * threadCount * lineCount);
    for (std::size_t offset = 0; offset + lineLength <= received.size(); offset += lineLength) {
        CHECK(received[offset] == received[offset + lineLength - 2]);
        CHECK(received[offset + lineLength - 1] == '\n');
    }
}

TEST_CASE("a line of no text is a line")
{
    int ends[2];
    REQUIRE(pipe(ends) == 0);
    StandardErrorConsole(ends[1]).log("");
    StandardErrorConsole(ends[1]).log("a");
    close(ends[1]);
    CHECK(readAll(ends[0]) == "\na\n");
    close(ends[0]);
}

TEST_CASE("a console that is closed loses lines and does no harm")
{
    StandardErrorConsole console(-1);
    console.log("lost");
}
