#include "platform/linux/PictureSize.h"

#include <doctest/doctest.h>

#include <string>

using platform::Size;
using platform::sizeOfVectorPicture;

TEST_CASE("a vector picture is as large as its width and height say, else its view box")
{
    CHECK(sizeOfVectorPicture("<svg width=\"16\" height=\"32\"/>") == Size { 16, 32 });
    CHECK(sizeOfVectorPicture("<svg width='16px' height=' 3.5 px'>") == Size { 16, 3.5 });
    CHECK(sizeOfVectorPicture("<svg viewBox=\"0 0 24 12\" width=\"100%\" height=\"5em\">") == Size { 24, 12 });
    CHECK(sizeOfVectorPicture("<svg\n viewBox = '-1,-1, 24,12'>") == Size { 24, 12 });
}

TEST_CASE("declarations, comments and a document type before the picture do not matter")
{
    const std::string prolog = "<?xml version=\"1.0\"?>\n<!-- <svg width='1' height='1'> -->\n<!DOCTYPE svg>\n";
    CHECK(sizeOfVectorPicture(prolog + "<svg xmlns=\"x\" height=\"2\" width=\"3\"><g width=\"9\"/></svg>")
        == Size { 3, 2 });
}

TEST_CASE("a picture that does not tell has no size")
{
    for (const char* text :
        { "", "<", "<svg", "<svg>", "<svg width", "<svg width=", "<svg width=\"1", "<svg width=\"1\">", "<!--", "<?xml",
            "<png width='1' height='1'>", "<svg width='-1' height='2'>", "<svg width='nan' height='1'>",
            "<svg width='1e400' height='1'>", "<svg viewBox='0 0 1'>", "<svg = = =>", "no picture" })
        CHECK(sizeOfVectorPicture(text) == Size {});
}
