// The key text of `zv curve` and the curve built from it. The tool's sources are not part of the
// library, so they are compiled into this test.
#include "tools/zv/curve_keys.cpp"

#include <gtest/gtest.h>

namespace {

std::vector<ZvCurveKeyLine> Parse(const std::string& text) {
  std::vector<ZvCurveKeyLine> keys;
  std::string error;
  EXPECT_TRUE(ZvParseCurveKeys(text, keys, error)) << text << ": " << error;
  return keys;
}

std::string ParseError(const std::string& text) {
  std::vector<ZvCurveKeyLine> keys;
  std::string error;
  EXPECT_FALSE(ZvParseCurveKeys(text, keys, error)) << text;
  return error;
}

}  // namespace

TEST(CurveKeys, LinesCommentsSeparatorsAndKinds) {
  const std::vector<ZvCurveKeyLine> keys =
      Parse("# a comment\n\n 0 1\r\n2.5,-3e1 linear # trailing\n\t4\t0.5\tconstant\n1, 2 ,cubic");
  ASSERT_EQ(keys.size(), 4u);
  EXPECT_EQ(keys[0].parameter, 0.0);
  EXPECT_EQ(keys[0].value, 1.0);
  EXPECT_EQ(keys[0].kind, ZvBaseFCurve::CubicSegment);
  EXPECT_EQ(keys[0].line, 3);
  EXPECT_EQ(keys[1].value, -30.0);
  EXPECT_EQ(keys[1].kind, ZvBaseFCurve::LinearSegment);
  EXPECT_EQ(keys[2].kind, ZvBaseFCurve::ConstantSegment);
  EXPECT_EQ(keys[3].line, 6);
  EXPECT_TRUE(Parse("").empty());
}

TEST(CurveKeys, MalformedLinesNameTheLineAndTheProblem) {
  EXPECT_EQ(ParseError("0 0\n1\n"), "line 2: expected PARAMETER VALUE [KIND], found 1 field");
  EXPECT_EQ(ParseError("0 0 linear extra"),
            "line 1: expected PARAMETER VALUE [KIND], found 4 fields");
  EXPECT_EQ(ParseError("0 0\n\n1 2x"), "line 3: '2x' is not a finite number");
  EXPECT_EQ(ParseError("nan 1"), "line 1: 'nan' is not a finite number");
  EXPECT_EQ(ParseError("1e999 1"), "line 1: '1e999' is not a finite number");
  EXPECT_EQ(ParseError("0 1 bezier"),
            "line 1: unknown segment kind 'bezier' (constant, linear or cubic)");
}

TEST(CurveKeys, TheCurvePassesThroughItsKeysInParameterOrder) {
  ZvStdFCurve curve;
  std::string error;
  ASSERT_TRUE(ZvBuildCurveFromKeys(Parse("2 4 constant\n0 0 linear\n1 3\n3 1"), curve, error));
  ASSERT_EQ(curve.GetNumKeys(), 4u);
  for (const auto& key : {std::make_pair(0.0, 0.0), std::make_pair(1.0, 3.0),
                          std::make_pair(2.0, 4.0), std::make_pair(3.0, 1.0)}) {
    EXPECT_EQ(curve.Eval(key.first, 0), key.second);
  }
  EXPECT_EQ(curve.Eval(0.5, 0), 1.5);  // linear
  EXPECT_EQ(curve.Eval(2.5, 0), 4.0);  // constant
  ZvBaseFCurve::FSKind kind;
  ASSERT_EQ(curve.GetSegmentKindAtIndex(1, kind), 1u);
  EXPECT_EQ(kind, ZvBaseFCurve::CubicSegment);

  EXPECT_FALSE(ZvBuildCurveFromKeys({}, curve, error));
  EXPECT_EQ(error, "no keys");
  EXPECT_FALSE(ZvBuildCurveFromKeys(Parse("0 0\n1.5 1\n\n1.5 2"), curve, error));
  EXPECT_EQ(error, "line 4: parameter 1.5 repeats the key of line 2");
  EXPECT_EQ(curve.GetNumKeys(), 4u);  // a refused build leaves the curve alone
}
