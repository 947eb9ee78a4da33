#include "host/OBConstants.h"
#include "host/OBMediaObject.h"
#include "host/OBMediaObjectList.h"
#include "tests/host/TestHost.h"
#include "tests/support/MovieWriter.h"

#include <doctest/doctest.h>

#include <memory>
#include <string>
#include <vector>

using namespace tests;
using platform::Size;
using platform::Text;
using platform::Value;

namespace {

std::shared_ptr<const OBMediaObjectKind> representatives()
{
    auto kind = movieKind();
    kind->groupPathKey = "Group Path";
    kind->attributes = { { "Version", "6" }, { "Represents", true } };
    return kind;
}

/// A movie of a folder on disk, its thumbnail produced.
struct FilmedHost : TestHost {
    FilmedHost()
    {
        host();
        MovieContent content;
        content.width = 1280;
        content.height = 720;
        file = machine.folder.file("below/movie.mov", movieBytes(content));
        auto kind = std::make_shared<OBMediaObjectKind>();
        kind->beforeFileName = "/below/";
        const std::vector<OBFileOfFolder> files { { "movie.mov", true } };
        movie = OBMediaObjectBatch::objects(kind, { machine.folder.path(), true }, files)[0];
        movie->thumbnailImage();
    }

    OBMediaObjectRef representative() const
    {
        return OBMediaObject::representative(representatives(), "Trip", "/groups/Trip", movie);
    }

    std::string file;
    OBMediaObjectRef movie;
};

} // namespace

TEST_CASE("files may lie below the folder that their objects are made for")
{
    const FilmedHost test;
    CHECK(test.movie->path() == Text(test.file));
    CHECK(test.movie->name() == "movie");
    CHECK(test.movie->aliasResolvedPath() == Text(test.file));
}

TEST_CASE("a representative shows a group by a movie, whether or not somebody has changed the movie")
{
    for (const bool isChanged : { false, true }) {
        CAPTURE(isChanged);
        const FilmedHost test;
        if (isChanged)
            test.movie->setMediaSourceType(9);
        const OBMediaObjectRef object = test.representative();
        CHECK(object->mediaType() == OBMediaTypeMovie);
        CHECK(object->mediaSourceType() == OBMediaSourceTypePlugin);
        CHECK(object->sourcePluginIdentifier() == "org.test.Source");
        CHECK(object->name() == "Trip");
        CHECK(object->path() == Text(test.file));
        CHECK(object->aliasResolvedPath() == Text(test.file));
        CHECK(object->icon() == test.movie->thumbnailImage());
        CHECK_FALSE(object->hasProducedThumbnail());
        CHECK(object->attributes()
            == Value::Dictionary { { "Group Path", "/groups/Trip" },
                { Text(OBMediaObjectResolutionKey), Size { 1280, 720 } }, { "Version", "6" }, { "Represents", true } });
        for (const auto& [key, value] : object->attributes())
            CHECK(object->attributeForKey(key) == value);
        CHECK(object->attributeForKey(OBMediaObjectDurationKey).isNull());
    }
}

TEST_CASE("changing a representative leaves its movie as it is, and the other way round")
{
    const FilmedHost test;
    const OBMediaObjectRef object = test.representative();
    const OBImageRef thumbnail = test.movie->thumbnailImage();
    object->setPath("/elsewhere.mov");
    CHECK(object->name() == "Trip");
    CHECK(object->icon() == thumbnail);
    CHECK(test.movie->path() == Text(test.file));
    const OBMediaObjectRef other = test.representative();
    test.movie->setPath("/nowhere.mov");
    test.movie->setIcon(nullptr);
    CHECK(other->path() == Text(test.file));
    CHECK(other->icon() == thumbnail);
}

TEST_CASE("a representative keeps what it shows of its movie when the movie's list is gone")
{
    FilmedHost test;
    const OBMediaObjectRef object = test.representative();
    test.movie = nullptr;
    CHECK(object->path() == Text(test.file));
    REQUIRE(object->icon() != nullptr);
    CHECK(object->icon()->pixelSource().file == Text(test.file));
    CHECK(object->thumbnailImage() != object->icon());
}
