#include <gtest/gtest.h>

#include "operations/macros.h"
#include "operations/recipe.h"
#include "picture/picture_record.h"

namespace fotomill::test {
namespace {

TEST(Recipe, ParsesAndPrints) {
  const struct {
    const char* name;
    const char* text;
    const char* printed;
  } rows[] = {
      {"operands in order", "resize 200x100 fill lanczos3", "resize 200x100 mode=fill filter=lanczos3\n"},
      {"names and a flag", "resize filter=box size=50% linear", "resize 50% filter=box linear=yes\n"},
      {"semicolons and comments", "# all; of this\n gray ; invert ; # the rest; is not\nflip", "gray\ninvert\nflip\n"},
      {"quotes", "crop '3:2' gravity=\"top\"", "crop 3:2 gravity=top\n"},
      {"carriage returns", "gray\r\ninvert\r\n", "gray\ninvert\n"},
      {"outputs", "gray\noutput a\n  blur 2\n save to=jpg quality=85 name=\"%F x\"\noutput b\nsave max-bytes=40k",
       "gray\noutput a\n  blur 2\n  save to=jpg name=\"%F x\" quality=85\noutput b\n  save max-bytes=40960\n"},
      {"one save without outputs", "gray; save to=png", "gray\nsave to=png\n"},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    Recipe recipe;
    const auto mistakes = ReadRecipe(row.text, {}, recipe);
    EXPECT_EQ(mistakes.empty(), row.printed != nullptr);
    if (row.printed != nullptr) {
      EXPECT_EQ(PrintRecipe(recipe), row.printed);
    }
  }
}

TEST(Recipe, ErrorsShowPositionAndSuggestion) {
  const struct {
    const char* text;
    int32_t line;
    const char *operation, *parameter, *message;
  } rows[] = {
      {"gray\nsharpn 1", 2, "sharpn", "", "is not an operation. Did you mean \"sharpen\"?"},
      {"resize 100 filtr=box", 1, "resize", "filtr", "is not a parameter of resize. Did you mean \"filter\"?"},
      {"blur sigma=0", 1, "blur", "sigma", "must be 0.1 to 1000."},
      {"blur nan", 1, "blur", "sigma", "must be a number."},
      {"blur 1e5", 1, "blur", "sigma", "must be a number."},
      {"blur 1 2", 1, "blur", "2", "is one value too many."},
      {"blur 1 sigma=2", 1, "blur", "sigma", "is given twice."},
      {"resize", 1, "resize", "size", "must be given."},
      {"resize 10x10 fitt", 1, "resize", "mode", "must be fit, fill, stretch or pad. Did you mean \"fit\"?"},
      {"gray \"", 1, "gray", "", "has a quote that does not end."},
      {"save to=jpg; gray", 1, "gray", "", "follows \"save\", which ends an output."},
      {"output a\ngray\noutput a", 3, "output", "name", "is taken by another output."},
      {"output ../a", 1, "output", "name", nullptr},
      {"save name=%Q", 1, "save", "name", "has an unknown macro %Q; %% is a percent sign."},
      {"save max-bytes=0", 1, "save", "max-bytes", nullptr},
      {"", 1, "", "", "The recipe has no operations."},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.text);
    Recipe recipe;
    const auto mistakes = ReadRecipe(row.text, {}, recipe);
    ASSERT_EQ(mistakes.size(), 1u);
    EXPECT_EQ(mistakes[0].line, row.line);
    EXPECT_EQ(mistakes[0].operation, row.operation);
    EXPECT_EQ(mistakes[0].parameter, row.parameter);
    if (row.message != nullptr) {
      EXPECT_EQ(mistakes[0].message.english, row.message);
    }
  }
}

TEST(Macros, TagsAlsoHaveStandardNames) {
  PictureRecord picture;
  picture.metadata.exif = {'I', 'I', 42, 0, 8, 0,   0,   0,   1, 0, 0x10, 0x01, 2,
                           0,   4,   0,  0, 0, 'C', 'a', 'm', 0, 0, 0,    0,    0};
  for (const char* name : {"Model", "model", "Image input equipment model"})
    EXPECT_EQ(ExpandMacros("%E{" + std::string(name) + "}", {}, picture), "Cam") << name;
  EXPECT_EQ(ExpandMacros("%E{Make}", {}, picture), "");
}

TEST(Macros, AreExpandedAndSanitizedForNames) {
  PictureRecord picture;
  picture.width = 30;
  picture.height = 20;
  const MacroFacts facts{.fileName = "/photos/a.b.jpg", .copyrightHolder = "Jo/Mo", .modified = 0};
  EXPECT_EQ(ExpandMacros("%F %N %Wx%H p%P %% %E{Model}.", facts, picture), "a.b Jo/Mo 30x20 p1 % .");
  EXPECT_EQ(ExpandNameMacros("%N/x", facts, picture), "Jo-Mo/x");
  for (const auto& [form, same] : {std::pair{"%D{%Y-%m-%d}", "%D"},
                                   {"%D{%F|%%}", "%D|%%"},
                                   {"%D{%H:%M:%S}", "%T"},
                                   {"%D{%T}", "%T"},
                                   {"%D{%Y}", "%Y"}})
    EXPECT_EQ(ExpandMacros(form, facts, picture), ExpandMacros(same, facts, picture));
  EXPECT_EQ(ExpandNameMacros("%D{x:y/%%}", facts, picture), "x-y-%");
  EXPECT_EQ(ExpandCounter("%c %03c %1c %%c %D{%c} %E{%c} %c", 7), "7 007 7 %%c %D{%c} %E{%c} 7");
  EXPECT_EQ(ExpandCounter("%02c%123c%", 123), "123%123c%");
  EXPECT_TRUE(NeedsPictureSize("%F%W"));
  EXPECT_FALSE(NeedsPictureSize("%%W %D %E{Model}"));
  for (const char* wrong : {"%D{}", "%D{%Q}", "%D{%Y", "%D{%}", "%c"})
    EXPECT_FALSE(MacroProblem(wrong).empty()) << wrong;
  EXPECT_TRUE(MacroProblem("%D{%Y-%m-%d_%H%M%S}").empty());
  EXPECT_TRUE(IsKnownEarly("%F-%N"));
  EXPECT_FALSE(IsKnownEarly("%F-%W"));
  EXPECT_EQ(MacroProblem("100%").english, "has an unknown macro %; %% is a percent sign");
  EXPECT_EQ(MacroProblem("%\u00E9").english, "has an unknown macro %\u00E9; %% is a percent sign");
  EXPECT_EQ(MacroProblem("%E{}").english, "needs the name of a tag in %E{Tag}");
  EXPECT_EQ(MacroProblem("%F %E{Modle}").english,
            "has an unknown EXIF tag \"Modle\". Did you mean \"Model\"?");
  EXPECT_EQ(MacroProblem("%E{xyzzy}").english, "has an unknown EXIF tag \"xyzzy\".");
  for (const char* name : {"Model", "subsec-time original", "Image input equipment model",
                           "GPSLatitudeRef", "Unknown (50341)"})
    EXPECT_TRUE(MacroProblem("%E{" + std::string(name) + "}").empty()) << name;
  EXPECT_FALSE(MacroProblem("%E{Unknown (99999)}").empty());
}

}  // namespace
}  // namespace fotomill::test
