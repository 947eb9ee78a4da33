#include "host/OBConstants.h"
#include "host/OBMediaObject.h"
#include "host/OBMediaObjectList.h"
#include "tests/host/TestHost.h"
#include "tests/support/MovieWriter.h"

#include <doctest/doctest.h>

#include <string>
#include <thread>
#include <vector>

using namespace tests;
using platform::Size;
using platform::Text;
using platform::Value;

namespace {

OBMediaObjectRef objectAt(const std::string& path)
{
    auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "movie");
    object->setPath(path);
    return object;
}

OBMediaObjectRef objectOfFolder(const std::string& folder, const std::string& name)
{
    const std::vector<OBFileOfFolder> files { { "before.mov", true }, { name, true } };
    return OBMediaObjectBatch::objects(std::make_shared<const OBMediaObjectKind>(), { folder, true }, files)[1];
}

std::string writeMovie(const TestHost& test, const std::string& name)
{
    MovieContent content;
    content.width = 1280;
    content.height = 720;
    content.seconds = 2.5;
    return test.machine.folder.file(name, movieBytes(content));
}

} // namespace

TEST_CASE("a thumbnail is produced once, on the main thread, and is the same image for every thread")
{
    TestHost test;
    test.host();
    const auto object = objectAt(writeMovie(test, "movie.mov"));
    std::vector<OBImageRef> images(8);
    std::vector<std::thread> threads;
    threads.reserve(images.size());
    for (OBImageRef& image : images)
        threads.emplace_back([&object, &image] { image = object->thumbnailImage(); });
    for (std::thread& thread : threads)
        thread.join();
    REQUIRE(images[0] != nullptr);
    CHECK(images == std::vector<OBImageRef>(8, images[0]));
    OBImageRef onMainThread;
    CHECK(test.machine.mainRunLoop.performAndWait([&] { onMainThread = object->thumbnailImage(); }));
    CHECK(onMainThread == images[0]);
    CHECK(object->thumbnailIfProduced() == images[0]);
    CHECK(test.machine.movies.read().size() == 1);
    CHECK(test.machine.movies.threads() == std::vector<std::thread::id> { test.machine.mainThread() });
}

TEST_CASE("producing a thumbnail sets resolution and duration, which are not there before")
{
    TestHost test;
    test.host();
    const auto object = objectAt(writeMovie(test, "movie.mov"));
    object->setAttribute_forKey("kept", "other");
    CHECK(object->attributeForKey(OBMediaObjectResolutionKey).isNull());
    CHECK(object->thumbnailIfProduced() == nullptr);
    CHECK_FALSE(object->hasProducedThumbnail());
    const OBImageRef image = object->thumbnailImage();
    REQUIRE(image != nullptr);
    CHECK(image->size() == Size { 1280, 720 });
    CHECK(object->hasProducedThumbnail());
    CHECK(object->attributes()
        == Value::Dictionary { { "other", "kept" }, { OBMediaObjectResolutionKey, Size { 1280, 720 } },
            { OBMediaObjectDurationKey, 2.5 } });
}

TEST_CASE("a file that is no movie has neither thumbnail nor attributes, and is read once")
{
    TestHost test;
    test.host();
    const auto object = objectAt(test.machine.folder.file("movie.mov", "no movie at all"));
    CHECK(object->thumbnailImage() == nullptr);
    CHECK(object->thumbnailImage() == nullptr);
    CHECK(object->hasProducedThumbnail());
    CHECK(object->attributes().empty());
    CHECK(test.machine.movies.read().size() == 1);
}

TEST_CASE("an object is no longer as it was made once something is known of its movie")
{
    TestHost test;
    test.host();
    writeMovie(test, "movie.mov");
    const auto object = objectOfFolder(test.machine.folder.path(), "movie.mov");
    CHECK(object->isAsMade());
    CHECK(object->thumbnailImage() != nullptr);
    CHECK_FALSE(object->isAsMade());
    test.machine.folder.file("other.mov", "no movie at all");
    const auto other = objectOfFolder(test.machine.folder.path(), "other.mov");
    CHECK(other->thumbnailImage() == nullptr);
    CHECK(other->isAsMade());
}

TEST_CASE("a movie of sound alone has a duration, but neither resolution nor thumbnail")
{
    TestHost test;
    test.host();
    MovieContent content;
    content.hasVideo = false;
    content.seconds = 3;
    const auto object = objectAt(test.machine.folder.file("sound.mov", movieBytes(content)));
    CHECK(object->thumbnailImage() == nullptr);
    CHECK(object->thumbnailIfProduced() == nullptr);
    CHECK(object->attributes() == Value::Dictionary { { OBMediaObjectDurationKey, 3.0 } });
    CHECK(object->hasProducedThumbnail());
}

TEST_CASE("an object without a path has no thumbnail")
{
    TestHost test;
    test.host();
    const auto object = OBMediaObject::initWithMediaType_name(OBMediaTypeMovie, "movie");
    CHECK(object->thumbnailImage() == nullptr);
    CHECK(test.machine.movies.read().empty());
}

TEST_CASE("once the main loop has ended no thumbnail is produced and nothing is set")
{
    TestHost test;
    test.host();
    const auto object = objectAt(writeMovie(test, "movie.mov"));
    test.machine.endMainLoop();
    CHECK(object->thumbnailImage() == nullptr);
    CHECK_FALSE(object->hasProducedThumbnail());
    CHECK(object->attributes().empty());
    CHECK(test.machine.movies.read().empty());
}

TEST_CASE("a thumbnail that was waited for when the main loop ended is not produced")
{
    TestHost test;
    test.host();
    Gate gate;
    gate.close();
    test.machine.mainRunLoop.post([&gate] { gate.pass(); });
    CHECK(gate.waitForArrivals(1));
    const auto object = objectAt(writeMovie(test, "movie.mov"));
    Event asking;
    OBImageRef image;
    std::thread waiting([&] {
        asking.happen();
        image = object->thumbnailImage();
    });
    CHECK(asking.wait());
    test.machine.mainRunLoop.quit();
    gate.open();
    waiting.join();
    CHECK(image == nullptr);
    CHECK_FALSE(object->hasProducedThumbnail());
}

TEST_CASE("a thumbnail that is set stands in place of the produced one")
{
    TestHost test;
    test.host();
    const auto object = objectAt(writeMovie(test, "movie.mov"));
    const OBImageRef produced = object->thumbnailImage();
    const auto image = OBImage::pictureNamed("other", Size { 1, 1 }, "/other.svg");
    object->setThumbnailImage(image);
    CHECK(object->thumbnailImage() == image);
    CHECK(object->attributeForKey(OBMediaObjectDurationKey) == Value(2.5));
    object->setThumbnailImage(produced);
    CHECK(object->thumbnailImage() == produced);
}

TEST_CASE("a thumbnail that is set to null is cleared, be it produced, set or not there yet")
{
    TestHost test;
    test.host();
    const std::string file = writeMovie(test, "movie.mov");
    const auto other = OBImage::pictureNamed("other", Size { 1, 1 }, "/other.svg");
    for (int which = 0; which < 8; ++which) {
        CAPTURE(which);
        const auto object = which < 4 ? objectAt(file) : objectOfFolder(test.machine.folder.path(), "movie.mov");
        const bool isProduced = which % 2 == 0;
        const OBImageRef produced = isProduced ? object->thumbnailImage() : nullptr;
        if (which / 2 % 2 == 0)
            object->setThumbnailImage(other);
        object->setThumbnailImage(nullptr);
        CHECK(object->hasProducedThumbnail());
        CHECK(object->thumbnailIfProduced() == nullptr);
        CHECK(object->thumbnailImage() == nullptr);
        CHECK(object->attributeForKey(OBMediaObjectDurationKey).isNull() == !isProduced);
        object->setThumbnailImage(produced);
        CHECK(object->thumbnailImage() == produced);
    }
}

TEST_CASE("setting an object's own thumbnail again changes nothing")
{
    TestHost test;
    test.host();
    writeMovie(test, "movie.mov");
    const auto object = objectOfFolder(test.machine.folder.path(), "movie.mov");
    const OBImageRef produced = object->thumbnailImage();
    REQUIRE(produced != nullptr);
    const Value::Dictionary attributes = object->attributes();
    object->setThumbnailImage(object->thumbnailImage());
    CHECK(object->thumbnailImage() == produced);
    CHECK(object->attributes() == attributes);
    CHECK(test.machine.movies.read().size() == 1);
}

TEST_CASE("a thumbnail that is set before one was produced is not produced any more")
{
    TestHost test;
    test.host();
    const auto object = objectAt(writeMovie(test, "movie.mov"));
    const auto image = OBImage::pictureNamed("other", Size { 1, 1 }, "/other.svg");
    object->setThumbnailImage(image);
    CHECK(object->thumbnailImage() == image);
    CHECK(test.machine.movies.read().empty());
}

TEST_CASE("the pixels of a thumbnail are those of the movie's file, be the object made by itself or by its folder")
{
    TestHost test;
    test.host();
    const std::string file = writeMovie(test, "movie.mov");
    const auto changed = objectOfFolder(test.machine.folder.path(), "movie.mov");
    changed->setMediaSourceType(9);
    const std::vector<OBMediaObjectRef> objects { objectAt(file),
        objectOfFolder(test.machine.folder.path(), "movie.mov"), changed };
    for (const OBMediaObjectRef& object : objects) {
        const OBImageRef image = object->thumbnailImage();
        REQUIRE(image != nullptr);
        CHECK(image->pixelSource().kind == OBPixelSource::Kind::movieFile);
        CHECK(image->pixelSource().file == Text(file));
    }
}

TEST_CASE("a thumbnail outlives the object and the list it came from")
{
    TestHost test;
    test.host();
    const std::string file = writeMovie(test, "movie.mov");
    OBImageRef image = objectOfFolder(test.machine.folder.path(), "movie.mov")->thumbnailImage();
    REQUIRE(image != nullptr);
    CHECK(image->pixelSource().file == Text(file));
    image->setSize({ 64, 36 });
    CHECK(image->size() == Size { 64, 36 });
}

TEST_CASE("an object that is given its own thumbnail for an icon shows it and still goes with its last owner")
{
    TestHost test;
    test.host();
    const std::string file = writeMovie(test, "movie.mov");
    for (OBMediaObjectRef object : { objectAt(file), objectOfFolder(test.machine.folder.path(), "movie.mov") }) {
        const OBImage* produced = object->thumbnailImage().get();
        REQUIRE(produced != nullptr);
        object->setThumbnailImage(OBImage::pictureNamed("other", Size { 1, 1 }, "/other.svg"));
        object->setThumbnailImage(OBImageRef(object, const_cast<OBImage*>(produced)));
        object->setIcon(object->thumbnailImage());
        CHECK(object->thumbnailImage().get() == produced);
        CHECK(object->icon().get() == produced);
        const OBImageRef icon = object->icon();
        const std::weak_ptr<OBMediaObject> gone = object;
        object = nullptr;
        CHECK_FALSE(gone.expired());
        CHECK(icon->pixelSource().file == Text(file));
    }
    std::weak_ptr<OBMediaObject> gone;
    {
        const auto object = objectOfFolder(test.machine.folder.path(), "movie.mov");
        object->setIcon(object->thumbnailImage());
        gone = object;
    }
    CHECK(gone.expired());
}
