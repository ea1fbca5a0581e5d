// The Monitor page's EDID lines for 44 real monitors, against the decoding
// table that came with the blocks, and for blocks that are not EDIDs.
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <sstream>
#include <string>
#include <vector>

#include "pages/edid.h"

namespace {

const EdidTexts texts = {"Year:", "H:", "V:", "DPMS:", "Stand By", "Suspend", "Shutoff", "Resolutions:"};

std::string DataFolder() { return "Z:" VISTREL_TEST_DATA "/edid/"; }

std::vector<uint8_t> ReadBlock(const std::string& name)
{
    std::ifstream in(DataFolder() + name, std::ios::binary);
    return std::vector<uint8_t>(std::istreambuf_iterator<char>(in), {});
}

std::vector<std::string> Split(const std::string& text, char separator)
{
    std::vector<std::string> parts;
    std::stringstream in(text);
    for (std::string part; std::getline(in, part, separator);) parts.push_back(part);
    return parts;
}

// The lines the page must show, built from one row of the table.
std::vector<std::string> ExpectedLines(const std::vector<std::string>& row)
{
    const std::string indent = monitor_list_indent;
    std::vector<std::string> lines = {"Year:", indent + row[2], "H:", indent + row[3], "V:", indent + row[4]};
    if (row[5] == "1" || row[6] == "1" || row[7] == "1") lines.push_back("DPMS:");
    if (row[5] == "1") lines.push_back(indent + "Stand By");
    if (row[6] == "1") lines.push_back(indent + "Suspend");
    if (row[7] == "1") lines.push_back(indent + "Shutoff");
    lines.push_back("Resolutions:");
    for (int column : {8, 9})
        for (const std::string& timing : Split(row[column], ';')) lines.push_back(indent + timing);
    return lines;
}

TEST(Edid, RealMonitorsDecodeAsTheirTableSays)
{
    std::ifstream table(DataFolder() + "expected.tsv");
    std::string line;
    std::getline(table, line);
    int blocks = 0;
    while (std::getline(table, line)) {
        std::vector<std::string> row = Split(line, '\t');
        while (row.size() < 10) row.push_back("");
        std::vector<uint8_t> block = ReadBlock(row[0].substr(row[0].find('/') + 1));
        ASSERT_EQ(128u, block.size()) << row[0];
        EdidLines out;
        memset(&out, '#', sizeof out);
        ASSERT_EQ(1, DecodeEdidLines(block.data(), block.size(), &texts, &out)) << row[0];
        EXPECT_EQ(ExpectedLines(row), std::vector<std::string>(out.line, out.line + out.count)) << row[0];
        ++blocks;
    }
    EXPECT_EQ(44, blocks);
}

TEST(Edid, WhatIsNoEdidAddsNothing)
{
    std::vector<uint8_t> block = ReadBlock("001.bin");
    std::vector<uint8_t> no_header = block;
    no_header[7] = 0x01;
    std::vector<uint8_t> all_ff(128, 0xFF);
    static const struct {
        const uint8_t* data;
        size_t length;
    } cases[] = {
        {NULL, 0}, {block.data(), 53}, {no_header.data(), 128}, {all_ff.data(), 128}, {block.data(), 8},
    };
    for (const auto& c : cases) {
        EdidLines out;
        out.count = 7;
        EXPECT_EQ(0, DecodeEdidLines(c.data, c.length, &texts, &out)) << c.length;
        EXPECT_EQ(0, out.count) << c.length;
    }
    EdidLines out;
    EXPECT_EQ(1, DecodeEdidLines(block.data(), 54, &texts, &out));
}

// The rules of the standard timings at their edges: 1:1 for aspect bits 0,
// truncated heights, and the first unused entry ends the list.
TEST(Edid, StandardTimingEdges)
{
    std::vector<uint8_t> block = ReadBlock("042.bin");
    const uint8_t entries[] = {0x81, 0x80, 0x61, 0x40, 0x31, 0x59, 0x71, 0x0F, 0x81, 0xC0, 0x01, 0x01, 0x81, 0x80};
    memcpy(&block[38], entries, sizeof entries);
    block[24] = 0x1F;
    EdidLines out;
    ASSERT_EQ(1, DecodeEdidLines(block.data(), block.size(), &texts, &out));
    std::vector<std::string> lines(out.line, out.line + out.count);
    std::vector<std::string> tail(lines.end() - 5, lines.end());
    const std::string i = monitor_list_indent;
    EXPECT_EQ((std::vector<std::string>{i + "1280 x 1024 60Hz", i + "1024 x 768 60Hz", i + "640 x 480 85Hz",
                                        i + "1152 x 1152 75Hz", i + "1280 x 720 60Hz"}),
              tail);
    EXPECT_EQ(lines.end(), std::find(lines.begin(), lines.end(), "DPMS:"));
}

}  // namespace
