#include "host/OBImage.h"
#include "host/OBMediaBrowserImageManager.h"
#include "tests/host/TestHost.h"

#include <doctest/doctest.h>

using namespace tests;
using platform::Size;
using platform::Text;

TEST_CASE("an image has the name, size and source it was made with")
{
    const auto image = OBImage::pictureNamed("projectIcon", { 32, 16 }, "/icons/project.svg");
    CHECK(image->name() == "projectIcon");
    CHECK(image->size() == Size { 32, 16 });
    CHECK_FALSE(image->scalesWhenResized());
    CHECK(image->pixelSource().kind == OBPixelSource::Kind::pictureFile);
    CHECK(image->pixelSource().file == "/icons/project.svg");
}

TEST_CASE("resizing an image and choosing how it is resized are apart from one another")
{
    const auto image = OBImage::pictureNamed("icon", { 32, 32 }, "/icon.svg");
    image->setScalesWhenResized(true);
    image->setSize({ 16, 12 });
    CHECK(image->size() == Size { 16, 12 });
    CHECK(image->scalesWhenResized());
    image->setScalesWhenResized(false);
    CHECK(image->size() == Size { 16, 12 });
}

TEST_CASE("a named copy of an image has its pixels and look, and changes apart from it")
{
    const auto image = OBImage::pictureNamed("icon", { 32, 32 }, "/icon.svg");
    image->setScalesWhenResized(true);
    image->setSize({ 16, 16 });
    const auto copy = image->copyNamed("small");
    CHECK(copy != image);
    CHECK(copy->name() == "small");
    CHECK(image->name() == "icon");
    CHECK(copy->size() == Size { 16, 16 });
    CHECK(copy->scalesWhenResized());
    CHECK(copy->pixelSource().file == "/icon.svg");
    copy->setSize({ 64, 64 });
    CHECK(image->size() == Size { 16, 16 });
}

TEST_CASE("a bundle answers a new image of its picture at its natural size under any name")
{
    TestHost test;
    test.bundle().pictures["project"] = { 128, 64 };
    const auto manager = test.manager();
    const auto image = manager->pluginBundle().imageNamed("project", "projectIcon");
    REQUIRE(image != nullptr);
    CHECK(image->name() == "projectIcon");
    CHECK(image->size() == Size { 128, 64 });
    CHECK(image->pixelSource().file == Text(test.bundleFolder() + "/resources/project.svg"));
    CHECK(manager->pluginBundle().imageNamed("project", "projectIcon") != image);
    CHECK(manager->pluginBundle().imageNamed("nothing", "name") == nullptr);
}

TEST_CASE("the image manager hands out one image of a picture for as long as it is used, resized in place")
{
    TestHost test;
    test.bundle().pictures["project"] = { 128, 128 };
    const auto manager = test.manager();
    const auto images = OBMediaBrowserImageManager::sharedInstance();
    REQUIRE(images != nullptr);
    auto image = images->imageNamed_inBundle("project", manager->pluginBundle());
    REQUIRE(image != nullptr);
    CHECK(image->name() == "project");
    image->setSize({ 16, 16 });
    CHECK(images->imageNamed_inBundle("project", manager->pluginBundle()) == image);
    CHECK(images->imageNamed_inBundle("project", manager->pluginBundle())->size() == Size { 16, 16 });
    image = nullptr;
    CHECK(images->imageNamed_inBundle("project", manager->pluginBundle())->size() == Size { 128, 128 });
}

TEST_CASE("the image manager answers null for a picture that a bundle does not have, and tells bundles apart")
{
    TestHost test;
    test.bundle().pictures["project"] = { 128, 128 };
    MadeUpBundle& other = test.machine.addBundle("plugins/Other.obplugin", "org.test.Other");
    other.pictures["project"] = { 10, 10 };
    const auto manager = test.manager();
    const auto made = test.host().createManager("org.test.Other");
    REQUIRE(made.manager != nullptr);
    const auto images = OBMediaBrowserImageManager::sharedInstance();
    CHECK(images->imageNamed_inBundle("nothing", manager->pluginBundle()) == nullptr);
    const auto image = images->imageNamed_inBundle("project", manager->pluginBundle());
    const auto otherImage = images->imageNamed_inBundle("project", made.manager->pluginBundle());
    CHECK(image != otherImage);
    CHECK(otherImage->size() == Size { 10, 10 });
}

TEST_CASE("there is one image manager while there is a host, and none without")
{
    CHECK(OBMediaBrowserImageManager::sharedInstance() == nullptr);
    TestHost test;
    test.host();
    CHECK(OBMediaBrowserImageManager::sharedInstance() != nullptr);
    CHECK(OBMediaBrowserImageManager::sharedInstance() == OBMediaBrowserImageManager::sharedInstance());
    test.endHost();
    CHECK(OBMediaBrowserImageManager::sharedInstance() == nullptr);
}
