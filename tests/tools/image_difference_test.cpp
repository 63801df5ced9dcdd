// What diff tells of two images, and of a PC that goes from the one to the other.

#include <functional>
#include <nlohmann/json.hpp>
#include <utility>

#include "tests/tools/tool_bench.h"

namespace {

using nlohmann::json;
using ImageDifference = SampleBench;

}  // namespace

// Each row changes one thing of the newer image and says what is told of it.
TEST_F(ImageDifference, TellsEachChangeAndWhatItMeansForAnUpdate) {
  struct Parts {
    PackageHeader& header;
    std::vector<ImageBuilder::Piece>& pieces;
    std::string& executable;
    FileRecord& second;
  };
  const std::tuple<const char*, std::function<void(Parts)>, std::vector<const char*>> rows[] = {
      {"packed otherwise",
       [this](Parts p) { p.pieces[1].stream = PackStream(Read("b.dll"), image::kPackBest); },
       {"equal\n"}},
      {"space",
       [](Parts p) { p.header.spaceNeeded = 50000; },
       {"header      spaceNeeded 48056 -> 50000\n", "does not offer it"}},
      {"program", [](Parts p) { p.executable[100] ^= 1; }, {"executable  other bytes\n"}},
      {"newer",
       [](Parts p) {
         p.second.versionThird = 4;
         p.pieces[1].stream = PackStream(std::string(3000, 'x'));
       },
       {"changed     \"b.dll\": other bytes, version up, version \"1.2.3\" -> \"1.2.4\"\n",
        "offers it, for \"%SYS_DIR%\\moriv\\b.dll\"\n"}},
      {"older",
       [](Parts p) { p.second.versionFirst = 0; },
       {"same bytes, version down, version \"1.2.3\" -> \"0.2.3\"", "does not offer it"}},
      {"bytes alone",
       [](Parts p) { p.pieces[1].stream = PackStream(std::string(3000, 'x')); },
       {"other bytes, version equal\n", "does not offer it"}},
      {"moved",
       [](Parts p) { SetField(p.second.destination, "%PLUGIN_ALL_DIR%;C:\\x"); },
       {"destination \"%SYS_DIR%\\moriv;%PLUGIN_ALL_DIR%\" -> \"%PLUGIN_ALL_DIR%;C:\\x\"",
        "left        \"%SYS_DIR%\\moriv\\b.dll\" stays", "offers it, for \"C:\\x\\b.dll\""}},
      {"renamed",
       [](Parts p) { SetField(p.second.fileName, "c.dll"); },
       {"added       \"c.dll\" \"%SYS_DIR%", ", size 3000, version 1.2.3\n",
        "removed     \"b.dll\" \"%SYS_DIR%", "left        \"%PLUGIN_NS_DIR%\\b.dll\" stays",
        "left        \"%PLUGIN_OPERA_DIR%\\b.dll\" stays"}},
      {"one browser more",
       [](Parts p) { SetField(p.pieces[2].record.destination, "docs;%PLUGIN_IE_DIR%"); },
       {"offers it where that browser is, for \"%PLUGIN_IE_DIR%\\readme.txt\"\n"}},
      {"order", [](Parts p) { std::swap(p.pieces[1], p.pieces[2]); }, {"order "}},
  };
  for (const auto& [name, change, told] : rows) {
    ImageBuilder image = sample;
    change({image.header(), image.pieces(), image.executable(), image.pieces()[1].record});
    Write("newer.exe", image.Bytes());
    const ToolRun run = Run("diff @image.exe @newer.exe");
    EXPECT_EQ(run.status, run.out == "equal\n" ? 0 : 1) << run.err;
    for (const char* part : told)
      EXPECT_NE(run.out.find(part), std::string::npos) << name << ": " << part << "\n" << run.out;
    EXPECT_EQ(json::parse(Run("diff @image.exe @newer.exe --json").out).at("isEqual"),
              run.status == 0);
  }
}

// Two files of one name each find their own; a bad stream is bad input.
TEST_F(ImageDifference, PairsByPlaceAndRefusesDamage) {
  const std::string a = "[[file]]\nsource = 'a.exe'\ndestination = 'one'\n";
  const std::string b = "[[file]]\nsource = 'b.dll'\nname = 'a.exe'\ndestination = 'two'\n";
  ASSERT_EQ(Pack(a + b).status, 0);
  Write("old.exe", Read("new.exe"));
  ASSERT_EQ(Pack(b + a).status, 0);
  const json told = json::parse(Run("diff @old.exe @new.exe --json").out);
  EXPECT_EQ(told.at("hasOtherOrder"), true);
  EXPECT_TRUE(told.at("changed").empty() && told.at("added").empty());
  sample.pieces()[0].stream[3] = '\xFF';
  Write("bad.exe", sample.RawBytes());
  ExpectRefused(Run("diff @image.exe @bad.exe"), "the image is damaged");
  ExpectRefused(Run("diff @image.exe @a.exe"), "no package");
}
