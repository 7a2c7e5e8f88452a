// Plug-in URIs are what saved sessions store: they must not drift.
#include <gtest/gtest.h>

#include "Catalog.h"

using zenlv2::Catalog;

TEST(Lv2Catalog, UrisAreFixedByKeyAndLayout) {
    EXPECT_EQ(Catalog::MakeUri("Soft Clipper:1517179747", "stereo"),
              "urn:zenaudioplugins:Soft%20Clipper:1517179747:stereo");
    EXPECT_EQ(Catalog::MakeUri("Soft Clipper:1517179747", "mono"), "urn:zenaudioplugins:Soft%20Clipper:1517179747:mono");
    // Keys that differ in one letter or by a sign stay apart.
    EXPECT_NE(Catalog::MakeUri("Dialogue Leveller:1516596844", "stereo"),
              Catalog::MakeUri("Dialogue Leveler:1516596844", "stereo"));
    EXPECT_EQ(Catalog::MakeUri("De-Esser:1516596851", "mono"), "urn:zenaudioplugins:De-Esser:1516596851:mono");
    EXPECT_EQ(Catalog::MakeUri("A/B \"x\":-5", "mono"), "urn:zenaudioplugins:A%2FB%20%22x%22:-5:mono");
    EXPECT_EQ(Catalog::MakeUri("Caf\xC3\xA9#1:7", "mono-to-stereo"), "urn:zenaudioplugins:Caf%C3%A9%231:7:mono-to-stereo");
}
