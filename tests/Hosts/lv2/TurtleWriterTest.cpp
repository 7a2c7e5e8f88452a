// The pieces of Turtle the generator writes, where a slip would make a host
// read a wrong range, drop a port or refuse the whole file.
#include <gtest/gtest.h>

#include <cstdlib>
#include <limits>

#include "PortMap.h"
#include "TurtleWriter.h"

using zenlv2::PortMap;
using zenlv2::TurtleWriter;

TEST(Lv2TurtleWriter, NumbersReadBackAsTheSameFloatAndAreNeverIntegers) {
    for (float value : {0.0f, 1.0f, -18.0f, 0.1f, 22000.0f, 1.1754944e-38f, -0.001f, 3.14159274f, 1e-10f,
                        std::numeric_limits<float>::max(), 16777217.0f}) {
        const std::string text = TurtleWriter::Number(value);
        EXPECT_EQ(std::strtof(text.c_str(), nullptr), value) << text;
        EXPECT_NE(text.find_first_of(".e"), std::string::npos) << text;
    }
    EXPECT_EQ(TurtleWriter::Number(0.1f), "0.1");
    EXPECT_EQ(TurtleWriter::Number(-18.0f), "-18.0");
}

TEST(Lv2TurtleWriter, StringsAreEscaped) {
    EXPECT_EQ(TurtleWriter::Quoted("Output Level"), "\"Output Level\"");
    EXPECT_EQ(TurtleWriter::Quoted("a \"b\" \\ c\nd"), "\"a \\\"b\\\" \\\\ c\\nd\"");
}

TEST(Lv2TurtleWriter, UnitsMapToTheUnitsVocabularyOrAreDescribed) {
    EXPECT_EQ(TurtleWriter::Unit("dB"), "units:db");
    EXPECT_EQ(TurtleWriter::Unit("Hz"), "units:hz");
    EXPECT_EQ(TurtleWriter::Unit("ms"), "units:ms");
    EXPECT_EQ(TurtleWriter::Unit("%"), "units:pc");
    EXPECT_EQ(TurtleWriter::Unit("samples"), "units:frame");
    EXPECT_EQ(TurtleWriter::Unit(""), "");
    const std::string truePeak = TurtleWriter::Unit("dBTP");
    EXPECT_NE(truePeak.find("a units:Unit"), std::string::npos);
    EXPECT_NE(truePeak.find("units:symbol \"dBTP\""), std::string::npos);
    EXPECT_NE(truePeak.find("units:render \"%f dBTP\""), std::string::npos);
    EXPECT_NE(TurtleWriter::Unit("%FS").find("\"%f %%FS\""), std::string::npos);  // printf-safe
}

TEST(Lv2TurtleWriter, FileNamesAndPortSymbolsAreSafe) {
    EXPECT_EQ(TurtleWriter::FileName("Soft Clipper:1517179747"), "soft-clipper-1517179747.ttl");
    EXPECT_EQ(TurtleWriter::FileName("De-Esser:1516596851"), "de-esser-1516596851.ttl");
    EXPECT_EQ(PortMap::MakeSymbol("ZenSoftClipper::OUTPUT_GAIN"), "output_gain");
    EXPECT_EQ(PortMap::MakeSymbol("Input Peak 1"), "input_peak_1");
    EXPECT_EQ(PortMap::MakeSymbol("Gain (dB) -- L/R"), "gain_db_l_r");
    EXPECT_EQ(PortMap::MakeSymbol("3 Band"), "p_3_band");  // a symbol never starts with a digit
    EXPECT_EQ(PortMap::MakeSymbol("::"), "p_");
}
