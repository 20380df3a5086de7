#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <filesystem>
#include <nlohmann/json.hpp>

#include "support/bitmaps.h"
#include "support/command_line.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

namespace fs = std::filesystem;
using nlohmann::json;
using testing::ElementsAre;
using testing::HasSubstr;

// A folder with all kinds of problematic pictures.
class FileCommands : public testing::Test {
 protected:
  FileCommands() {
    Put("a.bmp", BitmapFile(5, 3, 24));
    Put("b.BMP", BitmapFile(4, 4, 8));
    WriteText(In("notes"), "no picture");
    Put("sub/c.bmp", BitmapFile(9, 1, 1));
    Put("sub/deep/d.bmp", BitmapFile(1, 1, 1));
    fs::create_directory(In("empty"));
  }
  std::string In(const std::string& name) const { return folder_.Path(name); }
  void Put(const std::string& name, const std::vector<uint8_t>& bytes) {
    fs::create_directories(fs::path(In(name)).parent_path());
    WriteBytes(In(name), bytes);
  }
  // The `file` fields, without the folder.
  std::vector<std::string> Files(const CommandResult& result) const {
    std::vector<std::string> files;
    for (const json& element : json::parse(result.out)) {
      files.push_back(
          fs::path(element["file"].get<std::string>()).lexically_relative(folder_.Path()));
    }
    return files;
  }

  TemporaryFolder folder_;
};

TEST_F(FileCommands, SelectionKeepsItsOrder) {
  const TemporaryFolder elsewhere;
  WriteBytes(elsewhere.Path("e.bmp"), BitmapFile(1, 1, 1));
  fs::create_directory_symlink(folder_.Path(), In("sub/again"));
  fs::create_directory_symlink(elsewhere.Path(), In("sub/aside"));
  fs::create_symlink(In("a.bmp"), In("link.bmp"));
  fs::create_symlink(In("nowhere.bmp"), In("dangling.bmp"));
  mkfifo(In("pipe.bmp").c_str(), 0600);
  WriteText(In("list"), In("sub/c.bmp") + "\n\n" + In("a.bmp"));
  WriteBytes(In("zeros"), {});
  const std::string zeros = In("b.BMP") + std::string(1, '\0') + In("a.bmp");
  WriteText(In("zeros"), zeros);
  const struct {
    const char* name;
    std::vector<std::string> arguments;
    std::vector<std::string> files;
  } rows[] = {
      {"as named", {In("b.BMP"), In("a.bmp")}, {"b.BMP", "a.bmp"}},
      {"folder", {folder_.Path()}, {"a.bmp", "b.BMP", "link.bmp"}},
      {"folder with separator", {In("sub/")}, {"sub/c.bmp"}},
      {"file, folder, file", {In("b.BMP"), In("sub"), In("a.bmp")}, {"b.BMP", "sub/c.bmp", "a.bmp"}},
      {"recursive", {"-r", folder_.Path()}, {"a.bmp", "b.BMP", "link.bmp", "sub/c.bmp", "sub/deep/d.bmp"}},
      {"list", {"--files-from", In("list")}, {"sub/c.bmp", "a.bmp"}},
      {"names, then list", {In("b.BMP"), "--files-from", In("list")}, {"b.BMP", "sub/c.bmp", "a.bmp"}},
      {"list with zeros", {"-0", "--files-from", In("zeros")}, {"b.BMP", "a.bmp"}},
      {"listed twice", {In("a.bmp"), In("a.bmp")}, {"a.bmp", "a.bmp"}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::vector<std::string> arguments{"info", "--json"};
    arguments.insert(arguments.end(), row.arguments.begin(), row.arguments.end());
    const CommandResult result = RunCommand(arguments);
    EXPECT_EQ(result.status, 0) << result.err;
    EXPECT_EQ(Files(result), row.files);
  }
  const CommandResult fromInput =
      RunCommand({"info", "--json", "--files-from", "-"}, {.input = In("sub/c.bmp") + "\n"});
  EXPECT_THAT(Files(fromInput), ElementsAre("sub/c.bmp"));
  EXPECT_EQ(RunCommand({"info", "--files-from", In("missing")}).status, 2);
}

TEST_F(FileCommands, FilesThatCannotBeOpenedFailIndividually) {
  mkfifo(In("pipe.bmp").c_str(), 0600);
  fs::create_symlink(In("nowhere.bmp"), In("dangling.bmp"));
  WriteText(In("empty.bmp"), "");
  WriteText(In("text.bmp"), "this is no bitmap at all, whatever its name says");
  WriteText(In("photo.avif"), std::string("\0\0\0\x1c", 4) + "ftypavif....");
  const struct {
    const char* name;
    int number;
    const char* message;
  } rows[] = {
      {"missing.bmp", 1, "File open error. The file does not exist."},
      {"pipe.bmp", 1, "File open error."},
      {"dangling.bmp", 1, "File open error."},
      {"notes", 8, "Unsupported format. Unknown file extension."},
      {"text.bmp", 2, "Damaged file."},
      {"photo.avif", 5, "Unsupported function. It looks like AVIF."},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const std::string path = In(row.name);
    for (const std::string command : {"info", "verify"}) {
      const CommandResult result = RunCommand({command, "--json", path, In("a.bmp")});
      EXPECT_EQ(result.status, 1);
      const json array = json::parse(result.out);
      ASSERT_EQ(array.size(), 2u);
      EXPECT_EQ(array[0]["file"], path);
      EXPECT_EQ(array[0]["status"], row.number);
      EXPECT_EQ(array[1]["status"], 0);
      EXPECT_EQ(result.err, path + ": " + row.message + "\nThere were errors\n2 files were processed, 1 failed.\n");
    }
  }
  EXPECT_EQ(RunCommand({"info", In("empty.bmp")}).status, 1);
  const std::string tooLong = In(std::string(300, 'x') + ".bmp");
  EXPECT_EQ(RunCommand({"info", tooLong}).status, 1);
}

// Root may read everything, so drops to an ordinary user meanwhile.
class OrdinaryUser {
 public:
  OrdinaryUser() : stepped_(geteuid() == 0 && seteuid(65534) == 0) {}
  ~OrdinaryUser() {
    if (stepped_ && seteuid(0) != 0) ADD_FAILURE() << "cannot step up again";
  }

 private:
  const bool stepped_;
};

TEST_F(FileCommands, UnreadableFilesAndFolders) {
  fs::permissions(folder_.Path(), fs::perms(0755));
  fs::permissions(In("a.bmp"), fs::perms::none);
  fs::permissions(In("sub"), fs::perms::none);
  CommandResult info, convert;
  {
    const OrdinaryUser user;
    info = RunCommand({"info", "-r", folder_.Path()});
    convert = RunCommand({"convert", In("b.BMP"), "-t", "pcx", "-d", In("empty")});
  }
  fs::permissions(In("sub"), fs::perms::owner_all);
  EXPECT_EQ(info.status, 1);
  EXPECT_TRUE(info.Says(In("a.bmp") + ": File open error. Permission denied.")) << info.err;
  EXPECT_TRUE(info.Says(In("sub") + ": File open error. The folder cannot be read. Permission denied.")) << info.err;
  EXPECT_EQ(convert.status, 1);
  EXPECT_THAT(convert.err, HasSubstr("b.PCX\" cannot be created. Permission denied."));
}

TEST_F(FileCommands, ClosingLines) {
  const struct {
    std::vector<std::string> arguments;
    int status;
    std::string err;
  } rows[] = {
      {{"verify", In("empty")}, 0, "No files were processed.\n"},
      {{"verify", In("a.bmp")}, 0, "One file was processed.\n"},
      {{"verify", In("a.bmp"), In("b.BMP")}, 0, "2 files were processed.\n"},
      {{"-q", "verify", In("a.bmp")}, 0, ""},
      {{"-q", "verify", In("no.bmp")}, 1, In("no.bmp") + ": File open error. The file does not exist.\n"},
  };
  for (const auto& row : rows) {
    const CommandResult result = RunCommand(row.arguments);
    EXPECT_EQ(result.status, row.status);
    EXPECT_EQ(result.err, row.err);
  }
}

TEST_F(FileCommands, InfoAsJson) {
  const CommandResult result = RunCommand({"info", "--json", In("a.bmp"), In("missing.bmp")});
  const json array = json::parse(result.out);
  const json& facts = array[0];
  const char* const keys[] = {"file",        "status",   "message",    "format", "index",
                              "description", "typeName", "width",      "height", "bitsPerPixel",
                              "alpha",       "fileSize", "imageBytes", "details"};
  for (const char* key : keys) EXPECT_TRUE(facts.contains(key)) << key;
  EXPECT_EQ(facts["format"], "BMP");
  EXPECT_EQ(facts["width"], 5);
  EXPECT_EQ(facts["height"], 3);
  EXPECT_EQ(facts["bitsPerPixel"], 24);
  EXPECT_EQ(facts["fileSize"], 54 + 16 * 3);
  EXPECT_TRUE(facts["details"].is_array());
  EXPECT_EQ(array[1].size(), 3u) << array[1];  // file, status, message
  EXPECT_EQ(array[1]["message"], "File open error.");
  // One element per line, so that readers can count them without a parser.
  EXPECT_EQ(std::count(result.out.begin(), result.out.end(), '\n'), 4);
  EXPECT_EQ(RunCommand({"info", "--json", In("empty")}).out, "[\n]\n");
}

TEST_F(FileCommands, HostileNames) {
  const std::string escape = In("e\x1b[31m\n.bmp"), bytes = In("\xff\x41.bmp");
  for (const std::string& name : {escape, bytes}) WriteBytes(name, BitmapFile(1, 1, 1));
  const json array = json::parse(RunCommand({"info", "--json", escape, bytes}).out);
  EXPECT_EQ(array[0]["file"], escape);
  EXPECT_FALSE(array[0].contains("fileBytes"));
  EXPECT_THAT(array[1]["file"].get<std::string>(), testing::EndsWith("/\xef\xbf\xbd"
                                                                     "A.bmp"));
  EXPECT_TRUE(array[1].contains("fileBytes"));
  // Pipes receive raw names, terminals never a control character.
  EXPECT_THAT(RunCommand({"verify", escape}).out, HasSubstr("e\x1b[31m\n.bmp: Ok"));
  EXPECT_THAT(RunCommand({"verify", escape}, {.output = true}).out, HasSubstr("e\\x1B[31m\\n.bmp: Ok"));
  const CommandResult failing =
      RunCommand({"--color=never", "verify", In("\x1b]0;owned\x07.bmp")}, {.interactive = true});
  EXPECT_EQ(failing.err.find('\x1b'), std::string::npos);
}

TEST_F(FileCommands, VerifyDecodesPixelsThatInfoSkips) {
  std::vector<uint8_t> cut = BitmapFile(64, 64, 24);
  cut.resize(cut.size() / 2);
  Put("cut.bmp", cut);
  EXPECT_EQ(RunCommand({"info", In("cut.bmp")}).status, 0);
  const CommandResult result = RunCommand({"verify", In("cut.bmp")});
  EXPECT_EQ(result.status, 1);
  EXPECT_TRUE(result.Says(In("cut.bmp") + ": File read error.")) << result.err;
}

// Every command opens a picture with the wrong extension, and reports its format.
TEST_F(FileCommands, OpensFilesWithWrongExtensions) {
  ASSERT_EQ(RunCommand({"convert", In("a.bmp"), "--to", "jpg", "--out", In("made.jpg")}).status, 0);
  fs::rename(In("made.jpg"), In("photo.png"));
  const json facts = json::parse(RunCommand({"info", "--json", In("photo.png")}).out)[0];
  EXPECT_EQ(facts["status"], 0);
  EXPECT_EQ(facts["format"], "JPG");
  EXPECT_EQ(facts["looksLike"], "JPEG");
  const json honest = json::parse(RunCommand({"info", "--json", In("a.bmp")}).out)[0];
  EXPECT_FALSE(honest.contains("looksLike"));
  EXPECT_THAT(RunCommand({"info", In("photo.png")}).out, HasSubstr("The file contains JPG"));
  EXPECT_EQ(RunCommand({"verify", In("photo.png")}).status, 0);
  EXPECT_EQ(RunCommand({"convert", In("photo.png"), "--to", "bmp"}).status, 0);
  EXPECT_EQ(ReadBytes(In("photo.bmp")).size(), BitmapFile(5, 3, 24).size());
  EXPECT_EQ(RunCommand({"thumbs", "draw", In("photo.png"), "--side", "4", "--out", In("t.bmp")}).status, 0);
  const CommandResult off =
      RunCommand({"--set", "IdentifyMysteryViewFiles=0", "info", In("photo.png")});
  EXPECT_EQ(off.status, 1);
  EXPECT_THAT(off.err, HasSubstr("Damaged file. It looks like JPEG."));
}

TEST_F(FileCommands, MatchChecksContents) {
  ASSERT_EQ(RunCommand({"convert", In("a.bmp"), "--to", "jpg", "--out", In("made.jpg")}).status, 0);
  fs::copy(In("made.jpg"), In("made.scr"));
  fs::copy(In("made.jpg"), In("made"));
  WriteText(In("photo.avif"), std::string("\0\0\0\x1c", 4) + "ftypavif....");
  const CommandResult text = RunCommand({"match", "--contents", In("made.scr"), In("made"),
                                         In("a.bmp"), In("photo.avif"), In("none.bmp")});
  EXPECT_EQ(text.status, 1);
  EXPECT_EQ(text.out,
            In("made.scr") + ": JPG, (JPG) Jpeg, by its contents; its name selects SCR\n" +
                In("made") + ": JPG, (JPG) Jpeg, by its contents; its name selects no format\n" +
                In("a.bmp") + ": BMP, (BMP) Windows bitmap, by its extension\n");
  EXPECT_THAT(text.err, HasSubstr("It looks like AVIF."));
  const json array = json::parse(
      RunCommand({"match", "--contents", "--json", In("made.scr"), In("photo.avif")}).out);
  EXPECT_EQ(array[0]["extension"], "SCR");
  EXPECT_EQ(array[0]["contentsExtension"], "JPG");
  EXPECT_EQ(array[0]["contentsIndex"], 15);
  EXPECT_EQ(array[0]["status"], 0);
  EXPECT_EQ(array[1]["contentsIndex"], -1);
  EXPECT_EQ(array[1]["looksLike"], "AVIF");
}

TEST(MatchCommand, ShowsTheRowAndTheRule) {
  const CommandResult text = RunCommand({"match", "scan.tiff", "x.bmp", "odd.abc"});
  EXPECT_EQ(text.status, 1);
  EXPECT_EQ(text.out,
            "scan.tiff: TIF, (TIF) TIFF, by its first three characters\n"
            "x.bmp: BMP, (BMP) Windows bitmap, by its extension\n"
            "odd.abc: no format\n");
  const json array = json::parse(RunCommand({"match", "--json", "photo.jpeg", "odd.abc"}).out);
  EXPECT_EQ(array[0], json::parse(R"({"name":"photo.jpeg","index":56,"extension":"JPE","typeName":"(JPEG) Jpeg"})"));
  EXPECT_EQ(array[1], json::parse(R"J({"name":"odd.abc","index":-1,"extension":"","typeName":"(ABC) ABC file"})J"));
}

TEST(FormatsCommand, ListsTheRegistry) {
  const json array = json::parse(RunCommand({"formats", "--json"}).out);
  ASSERT_EQ(array.size(), 78u);
  EXPECT_EQ(array[2]["extension"], "BMP");
  EXPECT_EQ(array[2]["flags"], 0x2000001);
  EXPECT_TRUE(array[2]["read"].get<bool>() && array[2]["write"].get<bool>() && !array[2].contains("reason"));
  for (const json& row : array) {
    EXPECT_EQ(row["read"].get<bool>() && row["write"].get<bool>(), !row.contains("reason")) << row;
  }
  const std::string destinations = RunCommand({"formats", "--destinations"}).out;
  for (const char* written : {"bmp\n", "jpg\n", "png\n", "tif\n"})
    EXPECT_THAT(destinations, HasSubstr(written));
  for (const char* read : {"cdr\n", "pcd\n", "gif\n"})
    EXPECT_THAT(destinations, testing::Not(HasSubstr(read)));
  EXPECT_THAT(RunCommand({"formats", "--filter"}).out, HasSubstr("\n(BMP) Windows bitmap\t*.BMP\n"));
}

TEST(DoctorCommand, ReportsConfigurationErrors) {
  const TemporaryFolder folder;
  WriteText(folder.Path("Fotomill Professional 11.ini"),
            "[Fotomill]\nJpegCompression=high\nPngCompression=6\n");
  const CommandResult result = RunCommand({"--data", folder.Path(), "doctor"});
  EXPECT_EQ(result.status, 0);
  EXPECT_THAT(result.out, HasSubstr("Data folder     " + folder.Path() + "\n"));
  EXPECT_THAT(result.out, HasSubstr("  line 2        JpegCompression=high: JpegCompression takes"));
  EXPECT_THAT(result.out, testing::Not(HasSubstr("PngCompression")));
  EXPECT_THAT(result.out, HasSubstr("\n  Disabled: EXE EPS JFI JPE\n"));
  EXPECT_THAT(RunCommand({"--data", folder.Path("none"), "--no-plugins", "doctor"}).out, HasSubstr("does not exist yet"));
}

}  // namespace
}  // namespace fotomill::test
