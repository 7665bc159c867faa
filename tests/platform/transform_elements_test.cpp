// The transformation engine's expression elements (NormContinuous, NormDiscrete,
// Discretize, MapValues), the options of Apply, user-defined functions, isValid against
// the data dictionary, refusals at load, nesting limits and the DOM entry point.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <initializer_list>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/util/PlatformUtils.hpp>

#include "QZMV.h"
#include "QZSafeParser.h"
#include "Value.h"
#include "ValueRecord.h"

namespace {

using QZCommon_800::QZMV;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;
using Inputs = std::initializer_list<std::pair<const char*, Value>>;

const Value kSysMissing(QZMV::Missing());

// A PMML document with the given data dictionary content and transformation dictionary
// content.
std::string Pmml(const std::string& dictionary, const std::string& dataFields = "") {
  return "<PMML version=\"4.4\">" +
         (dataFields.empty() ? "" : "<DataDictionary>" + dataFields + "</DataDictionary>") +
         "<TransformationDictionary>" + dictionary + "</TransformationDictionary></PMML>";
}

std::string Derived(const std::string& name, const std::string& expression,
                    const std::string& attrs = "") {
  return "<DerivedField name=\"" + name + "\"" + attrs + ">" + expression + "</DerivedField>";
}

// Loads the document; on success transforms a record of the inputs.
struct Engine {
  explicit Engine(const std::string& document) {
    std::istringstream in(document);
    status = t.AddPMML(in, false);
  }
  ValueRecord Run(Inputs inputs) {
    ValueRecord record;
    for (const auto& input : inputs) record.Add(input.first, input.second);
    last = t.Transform(record);
    return record;
  }
  Value Get(const char* field, Inputs inputs) { return Run(inputs).Get(field); }

  QZTransformation t;
  QZStatus status;
  QZStatus last;
};

// Loads one derived field and computes it.
Value One(const std::string& expression, Inputs inputs, const std::string& attrs = "") {
  Engine e(Pmml(Derived("r", expression, attrs)));
  EXPECT_TRUE(e.status.IsOK()) << e.t.GetLastError();
  return e.Get("r", inputs);
}

// The status and message of loading a document that is refused.
std::pair<long, std::string> Refusal(const std::string& document) {
  Engine e(document);
  return {e.status.GetErrorCode(), e.t.GetLastError()};
}

// NormContinuous: interpolation between the points, the three outlier treatments,
// mapMissingTo, texts read as numbers, and a long list of points.
TEST(TransformElements, NormContinuous) {
  const std::string points =
      "<LinearNorm orig=\"0\" norm=\"0\"/><LinearNorm orig=\"10\" norm=\"1\"/>"
      "<LinearNorm orig=\"20\" norm=\"3\"/></NormContinuous>";
  const std::string asIs = "<NormContinuous field=\"x\" mapMissingTo=\"-9\">" + points;
  EXPECT_EQ(One(asIs, {{"x", Value(5.0)}}), Value(0.5));
  EXPECT_EQ(One(asIs, {{"x", Value(15.0)}}), Value(2.0));
  EXPECT_EQ(One(asIs, {{"x", Value(10.0)}}), Value(1.0));
  EXPECT_EQ(One(asIs, {{"x", Value(-10.0)}}), Value(-1.0));
  EXPECT_EQ(One(asIs, {{"x", Value(30.0)}}), Value(5.0));
  EXPECT_EQ(One(asIs, {{"x", Value("5")}}), Value(0.5));
  EXPECT_EQ(One(asIs, {{"x", Value()}}), Value(-9.0));
  const std::string asMissing =
      "<NormContinuous field=\"x\" outliers=\"asMissingValues\">" + points;
  EXPECT_EQ(One(asMissing, {{"x", Value(-1.0)}}), kSysMissing);
  EXPECT_EQ(One(asMissing, {{"x", Value(20.0)}}), Value(3.0));
  EXPECT_EQ(One(asMissing, {{"x", Value()}}), kSysMissing);
  const std::string asExtreme =
      "<NormContinuous field=\"x\" outliers=\"asExtremeValues\">" + points;
  EXPECT_EQ(One(asExtreme, {{"x", Value(-1.0)}}), Value(0.0));
  EXPECT_EQ(One(asExtreme, {{"x", Value(99.0)}}), Value(3.0));

  std::string squares = "<NormContinuous field=\"x\">";
  for (int i = 0; i <= 12; ++i) {
    squares += "<LinearNorm orig=\"" + std::to_string(i) + "\" norm=\"" +
               std::to_string(i * i) + "\"/>";
  }
  squares += "</NormContinuous>";
  EXPECT_EQ(One(squares, {{"x", Value(7.5)}}), Value(56.5));
  EXPECT_EQ(One(squares, {{"x", Value(12.0)}}), Value(144.0));
  EXPECT_EQ(One(squares, {{"x", Value(0.0)}}), Value(0.0));
  EXPECT_EQ(One(squares, {{"x", Value(13.0)}}), Value(167.0));  // the last slope, 23
}

// NormDiscrete: an indicator of one value, compared as text or as number.
TEST(TransformElements, NormDiscrete) {
  const std::string red = "<NormDiscrete field=\"s\" value=\"red\" mapMissingTo=\"0.5\"/>";
  EXPECT_EQ(One(red, {{"s", Value("red")}}), Value(1.0));
  EXPECT_EQ(One(red, {{"s", Value("blue")}}), Value(0.0));
  EXPECT_EQ(One(red, {{"s", Value()}}), Value(0.5));
  const std::string two = "<NormDiscrete field=\"x\" value=\"2\"/>";
  EXPECT_EQ(One(two, {{"x", Value(2.0)}}), Value(1.0));
  EXPECT_EQ(One(two, {{"x", Value(2.5)}}), Value(0.0));
  EXPECT_EQ(One(two, {{"x", kSysMissing}}), kSysMissing);
}

// Discretize: interval closures at the margins, open ends, gaps, defaultValue,
// mapMissingTo, and bins typed by the element's or the field's dataType.
TEST(TransformElements, Discretize) {
  const std::string bins =
      "<DiscretizeBin binValue=\"neg\"><Interval closure=\"openOpen\" rightMargin=\"0\"/>"
      "</DiscretizeBin>"
      "<DiscretizeBin binValue=\"low\"><Interval closure=\"closedClosed\" leftMargin=\"0\" "
      "rightMargin=\"10\"/></DiscretizeBin>"
      "<DiscretizeBin binValue=\"high\"><Interval closure=\"openClosed\" leftMargin=\"20\"/>"
      "</DiscretizeBin></Discretize>";
  const std::string d =
      "<Discretize field=\"x\" mapMissingTo=\"none\" defaultValue=\"other\">" + bins;
  EXPECT_EQ(One(d, {{"x", Value(-0.5)}}), Value("neg"));
  EXPECT_EQ(One(d, {{"x", Value(0.0)}}), Value("low"));
  EXPECT_EQ(One(d, {{"x", Value(10.0)}}), Value("low"));
  EXPECT_EQ(One(d, {{"x", Value(15.0)}}), Value("other"));  // the gap
  EXPECT_EQ(One(d, {{"x", Value(20.0)}}), Value("other"));  // open on the left
  EXPECT_EQ(One(d, {{"x", Value(1e300)}}), Value("high"));
  EXPECT_EQ(One(d, {{"x", Value()}}), Value("none"));
  EXPECT_EQ(One(d, {{"x", Value("abc")}}), Value("other"));
  EXPECT_EQ(One(d, {{"x", Value(" 3 ")}}), Value("low"));
  // Without defaultValue and mapMissingTo: missing.
  EXPECT_TRUE(One("<Discretize field=\"x\">" + bins, {{"x", Value(15.0)}}).IsNull());
  // Numeric bins give reals, by the element's dataType or the field's.
  const std::string numeric =
      "<DiscretizeBin binValue=\"1\"><Interval closure=\"closedOpen\" leftMargin=\"0\" "
      "rightMargin=\"5\"/></DiscretizeBin><DiscretizeBin binValue=\"2\"><Interval "
      "closure=\"closedOpen\" leftMargin=\"5\"/></DiscretizeBin></Discretize>";
  EXPECT_EQ(One("<Discretize field=\"x\" dataType=\"integer\">" + numeric, {{"x", Value(5.0)}}),
            Value(2.0));
  EXPECT_EQ(One("<Discretize field=\"x\">" + numeric, {{"x", Value(4.9)}}, " dataType=\"double\""),
            Value(1.0));
  EXPECT_EQ(One("<Discretize field=\"x\">" + numeric, {{"x", Value(-1.0)}}, " dataType=\"double\""),
            kSysMissing);
}

// MapValues: one and two key columns, numbers matched by value, the first matching row,
// defaultValue, mapMissingTo, typed output, and rows lacking a column.
TEST(TransformElements, MapValues) {
  const std::string one =
      "<MapValues outputColumn=\"code\" defaultValue=\"?\" mapMissingTo=\"-\">"
      "<FieldColumnPair field=\"s\" column=\"name\"/><InlineTable>"
      "<row><name>red</name><code>R</code></row>"
      "<row><name>green</name><code>G</code></row>"
      "<row><name>red</name><code>second</code></row>"
      "<row><name>blue</name></row>"
      "<row><name>1</name><code>one</code></row>"
      "</InlineTable></MapValues>";
  EXPECT_EQ(One(one, {{"s", Value("red")}}), Value("R"));
  EXPECT_EQ(One(one, {{"s", Value("green")}}), Value("G"));
  EXPECT_EQ(One(one, {{"s", Value("pink")}}), Value("?"));
  EXPECT_EQ(One(one, {{"s", Value()}}), Value("-"));
  EXPECT_TRUE(One(one, {{"s", Value("blue")}}).IsNull());
  EXPECT_EQ(One(one, {{"s", Value(1.0)}}), Value("one"));
  EXPECT_EQ(One(one, {{"s", Value("1.0")}}), Value("?"));  // texts compare as texts

  const std::string two =
      "<MapValues outputColumn=\"rate\" dataType=\"double\">"
      "<FieldColumnPair field=\"g\" column=\"gender\"/>"
      "<FieldColumnPair field=\"band\" column=\"band\"/><InlineTable>"
      "<row><gender>f</gender><band>1</band><rate>0.1</rate></row>"
      "<row><gender>f</gender><band>2</band><rate>0.2</rate></row>"
      "<row><gender>m</gender><band>1</band><rate>0.3</rate></row>"
      "<row><gender>m</gender><rate>0.9</rate></row>"
      "</InlineTable></MapValues>";
  EXPECT_EQ(One(two, {{"g", Value("f")}, {"band", Value(2.0)}}), Value(0.2));
  EXPECT_EQ(One(two, {{"g", Value("m")}, {"band", Value(1.0)}}), Value(0.3));
  EXPECT_EQ(One(two, {{"g", Value("m")}, {"band", Value(2.0)}}), kSysMissing);
  EXPECT_EQ(One(two, {{"g", Value("f")}, {"band", Value()}}), kSysMissing);
  // A table of thousands of rows is found by index, not by scanning.
  std::string big = "<MapValues outputColumn=\"out\"><FieldColumnPair field=\"x\" column=\"in\"/>"
                    "<InlineTable>";
  for (int i = 0; i < 5000; ++i) {
    big += "<row><in>" + std::to_string(i) + "</in><out>" + std::to_string(i * 2) + "</out></row>";
  }
  big += "</InlineTable></MapValues>";
  EXPECT_EQ(One(big, {{"x", Value(4321.0)}}), Value(8642.0));
}

// Apply's mapMissingTo (an argument is missing), defaultValue (the result is missing for
// another reason) and their typing by the field's dataType.
TEST(TransformElements, ApplyMissingValueOptions) {
  const std::string plus =
      "<Apply function=\"+\" mapMissingTo=\"-1\" defaultValue=\"-2\"><FieldRef field=\"x\"/>"
      "<Constant>1</Constant></Apply>";
  EXPECT_EQ(One(plus, {{"x", Value(2.0)}}), Value(3.0));
  EXPECT_EQ(One(plus, {{"x", Value()}}), Value(-1.0));
  const std::string ifFalse =
      "<Apply function=\"if\" mapMissingTo=\"m\" defaultValue=\"d\"><FieldRef field=\"c\"/>"
      "<Constant>yes</Constant></Apply>";
  EXPECT_EQ(One(ifFalse, {{"c", Value(0.0)}}), Value("d"));
  EXPECT_EQ(One(ifFalse, {{"c", Value()}}), Value("m"));
  EXPECT_EQ(One(ifFalse, {{"c", Value(1.0)}}), Value("yes"));
  // A text mapMissingTo on a numeric function.
  EXPECT_EQ(One("<Apply function=\"sqrt\" mapMissingTo=\"n/a\"><FieldRef field=\"x\"/></Apply>",
                {{"x", Value()}}),
            Value("n/a"));
  // Typed by the field: mapMissingTo of an integer field must be a whole number.
  EXPECT_EQ(One(plus, {{"x", Value()}}, " dataType=\"string\""), Value("-1"));
  EXPECT_EQ(Refusal(Pmml(Derived("r", "<Apply function=\"abs\" mapMissingTo=\"1.5\">"
                                      "<FieldRef field=\"x\"/></Apply>",
                                 " dataType=\"integer\"")))
                .first,
            270004);
}

// isValid and isNotValid read the data dictionary's valid, invalid and missing values
// and intervals; a missing value is neither valid nor invalid.
TEST(TransformElements, Validity) {
  const std::string fields =
      "<DataField name=\"c\" optype=\"categorical\" dataType=\"string\">"
      "<Value value=\"a\"/><Value value=\"b\"/><Value value=\"x\" property=\"invalid\"/>"
      "<Value value=\"-\" property=\"missing\"/></DataField>"
      "<DataField name=\"n\" optype=\"continuous\" dataType=\"double\">"
      "<Interval closure=\"closedOpen\" leftMargin=\"0\" rightMargin=\"10\"/>"
      "<Value value=\"99\"/></DataField>"
      "<DataField name=\"free\" optype=\"categorical\" dataType=\"string\"/>";
  Engine e(
      Pmml(Derived("vc", "<Apply function=\"isValid\"><FieldRef field=\"c\"/></Apply>") +
               Derived("ic", "<Apply function=\"isNotValid\"><FieldRef field=\"c\"/></Apply>") +
               Derived("vn", "<Apply function=\"isValid\"><FieldRef field=\"n\"/></Apply>") +
               Derived("vf", "<Apply function=\"isValid\"><FieldRef field=\"free\"/></Apply>"),
           fields));
  ASSERT_TRUE(e.status.IsOK()) << e.t.GetLastError();
  struct Case {
    Value c, n, free;
    double vc, ic, vn, vf;
  };
  const Case cases[] = {
      {Value("a"), Value(0.0), Value("z"), 1, 0, 1, 1},
      {Value("x"), Value(10.0), Value(""), 0, 1, 0, 1},
      {Value("-"), Value(99.0), Value(), 0, 1, 1, 0},
      {Value("q"), Value("abc"), Value("q"), 0, 1, 0, 1},
      {Value(), Value(), Value(), 0, 0, 0, 0},
  };
  for (const Case& k : cases) {
    ValueRecord r = e.Run({{"c", k.c}, {"n", k.n}, {"free", k.free}});
    EXPECT_EQ(r.Get("vc"), Value(k.vc)) << k.c;
    EXPECT_EQ(r.Get("ic"), Value(k.ic)) << k.c;
    EXPECT_EQ(r.Get("vn"), Value(k.vn)) << k.n;
    EXPECT_EQ(r.Get("vf"), Value(k.vf)) << k.free;
  }
}

// DefineFunction: parameters, typed parameters and results, calls of other functions
// defined later in the document, a function's mapMissingTo, and an invalid result
// inside a function.
TEST(TransformElements, UserDefinedFunctions) {
  const std::string functions =
      "<DefineFunction name=\"affine\" optype=\"continuous\" dataType=\"double\">"
      "<ParameterField name=\"v\"/><ParameterField name=\"k\"/>"
      "<Apply function=\"+\"><Apply function=\"scale\"><FieldRef field=\"v\"/>"
      "<FieldRef field=\"k\"/></Apply><Constant>1</Constant></Apply></DefineFunction>"
      "<DefineFunction name=\"scale\" optype=\"continuous\">"
      "<ParameterField name=\"a\"/><ParameterField name=\"b\"/>"
      "<Apply function=\"*\"><FieldRef field=\"a\"/><FieldRef field=\"b\"/></Apply>"
      "</DefineFunction>"
      "<DefineFunction name=\"label\" optype=\"categorical\" dataType=\"string\">"
      "<ParameterField name=\"n\" dataType=\"string\"/>"
      "<Apply function=\"concat\"><Constant>#</Constant><FieldRef field=\"n\"/></Apply>"
      "</DefineFunction>"
      "<DefineFunction name=\"inverse\" optype=\"continuous\"><ParameterField name=\"q\"/>"
      "<Apply function=\"/\"><Constant>1</Constant><FieldRef field=\"q\" mapMissingTo=\"4\"/>"
      "</Apply></DefineFunction>";
  Engine e(Pmml(Derived("y", "<Apply function=\"affine\"><FieldRef field=\"x\"/>"
                             "<Constant>3</Constant></Apply>") +
                Derived("l", "<Apply function=\"label\"><FieldRef field=\"x\"/></Apply>") +
                Derived("i", "<Apply function=\"inverse\" mapMissingTo=\"-1\">"
                             "<FieldRef field=\"z\"/></Apply>") +
                functions));
  ASSERT_TRUE(e.status.IsOK()) << e.t.GetLastError();
  ValueRecord r = e.Run({{"x", Value(2.0)}, {"z", Value(0.5)}});
  EXPECT_TRUE(e.last.IsOK());
  EXPECT_EQ(r.Get("y"), Value(7.0));
  EXPECT_EQ(r.Get("l"), Value("#2"));
  EXPECT_EQ(r.Get("i"), Value(2.0));
  // A missing argument: the call's own mapMissingTo.
  r = e.Run({{"x", Value()}, {"z", Value()}});
  EXPECT_EQ(r.Get("y"), kSysMissing);
  EXPECT_EQ(r.Get("i"), Value(-1.0));
  // An invalid result inside the function reaches the record's status.
  r = e.Run({{"x", Value(1.0)}, {"z", Value(0.0)}});
  EXPECT_EQ(e.last.GetErrorCode(), 270006);
  EXPECT_EQ(e.t.GetLastError(), "DerivedField 'i': Apply '/' gave an invalid result");
}

// Every refusal at load has its status and a message naming the field (or function)
// and the element.
TEST(TransformElements, RefusalsAtLoad) {
  const std::string x = "<FieldRef field=\"x\"/>";
  const std::string bin =
      "<DiscretizeBin binValue=\"a\"><Interval closure=\"openOpen\"/></DiscretizeBin>";
  struct Case {
    std::string document;
    long code;
    std::string message;
  };
  const Case cases[] = {
      {Pmml(Derived("a", "<Aggregate field=\"x\" function=\"sum\"/>")), 270002,
       "DerivedField 'a': element 'Aggregate' is not supported"},
      {Pmml(Derived("a", "<TextIndex textField=\"x\"/>")), 270002,
       "DerivedField 'a': element 'TextIndex' is not supported"},
      {Pmml(Derived("a", "<Apply function=\"frobnicate\">" + x + "</Apply>")), 270002,
       "DerivedField 'a': Apply 'frobnicate': the function is neither a built-in function nor "
       "a DefineFunction"},
      {Pmml(Derived("a",
                    "<MapValues outputColumn=\"o\"><FieldColumnPair field=\"x\" "
                    "column=\"i\"/><TableLocator/></MapValues>")),
       270002, "DerivedField 'a': MapValues: TableLocator is not supported"},
      {Pmml(Derived("a", "<Apply function=\"substring\">" + x + x + "</Apply>")), 270004,
       "DerivedField 'a': Apply 'substring' takes 3 arguments, not 2"},
      {Pmml(Derived("a", "<Apply function=\"sum\"/>")), 270004,
       "DerivedField 'a': Apply 'sum' takes at least 1 argument, not 0"},
      {Pmml(Derived("a", "<Apply function=\"if\">" + x + x + x + x + "</Apply>")), 270004,
       "DerivedField 'a': Apply 'if' takes 2 to 3 arguments, not 4"},
      {Pmml(Derived("a", "<Apply>" + x + "</Apply>")), 270004,
       "DerivedField 'a': Apply has no 'function' attribute"},
      {Pmml(Derived("a",
                    "<Apply function=\"ln\" invalidValueTreatment=\"ignore\">" + x + "</Apply>")),
       270004, "DerivedField 'a': Apply 'ln' has an unknown invalidValueTreatment 'ignore'"},
      {Pmml(Derived("a",
                    "<NormContinuous field=\"x\"><LinearNorm orig=\"0\" norm=\"0\"/>"
                    "</NormContinuous>")),
       270004, "DerivedField 'a': NormContinuous needs at least two LinearNorm elements"},
      {Pmml(Derived("a",
                    "<NormContinuous field=\"x\"><LinearNorm orig=\"1\" norm=\"0\"/>"
                    "<LinearNorm orig=\"1\" norm=\"1\"/></NormContinuous>")),
       270004,
       "DerivedField 'a': NormContinuous: the orig values of LinearNorm must ascend strictly"},
      {Pmml(Derived("a", "<NormContinuous field=\"x\" outliers=\"clip\"/>")), 270004,
       "DerivedField 'a': NormContinuous has an unknown outliers treatment 'clip'"},
      {Pmml(Derived("a", "<NormDiscrete field=\"x\"/>")), 270004,
       "DerivedField 'a': NormDiscrete has no 'value' attribute"},
      {Pmml(Derived("a", "<Discretize field=\"x\"><DiscretizeBin binValue=\"a\"/></Discretize>")),
       270004, "DerivedField 'a': DiscretizeBin 'a' needs exactly one Interval"},
      {Pmml(Derived("a",
                    "<Discretize field=\"x\"><DiscretizeBin binValue=\"a\"><Interval "
                    "closure=\"open\"/></DiscretizeBin></Discretize>")),
       270004, "DerivedField 'a': Interval has an unknown closure"},
      {Pmml(Derived("a",
                    "<Discretize field=\"x\"><DiscretizeBin binValue=\"a\"><Interval "
                    "closure=\"openOpen\" leftMargin=\"2\" rightMargin=\"1\"/>"
                    "</DiscretizeBin></Discretize>")),
       270004, "DerivedField 'a': Interval has a leftMargin above its rightMargin"},
      {Pmml(Derived("a", "<Discretize field=\"x\">" + bin + "</Discretize>",
                    " dataType=\"double\"")),
       270004, "DerivedField 'a': DiscretizeBin binValue: 'a' is not a number"},
      {Pmml(Derived("a", "<MapValues outputColumn=\"o\"><InlineTable/></MapValues>")), 270004,
       "DerivedField 'a': MapValues has no FieldColumnPair"},
      {Pmml(Derived("a",
                    "<MapValues outputColumn=\"o\" dataType=\"double\"><FieldColumnPair "
                    "field=\"x\" column=\"i\"/><InlineTable><row><i>1</i><o>one</o></row>"
                    "</InlineTable></MapValues>")),
       270004, "DerivedField 'a': MapValues column 'o': 'one' is not a number"},
      {Pmml(Derived("a", "<Apply function=\"f\">" + x + "</Apply>") +
            "<DefineFunction name=\"f\"><ParameterField name=\"p\"/><FieldRef field=\"x\"/>"
            "</DefineFunction>"),
       270003,
       "DefineFunction 'f': FieldRef refers to 'x', which is not a parameter of the function"},
      {Pmml(Derived("a", "<Apply function=\"f\">" + x + x + "</Apply>") +
            "<DefineFunction name=\"f\"><ParameterField name=\"p\"/><FieldRef field=\"p\"/>"
            "</DefineFunction>"),
       270004, "DerivedField 'a': Apply 'f' takes 1 argument, not 2"},
      {Pmml("<DefineFunction name=\"f\"><ParameterField name=\"p\"/><Apply function=\"g\">"
            "<FieldRef field=\"p\"/></Apply></DefineFunction><DefineFunction name=\"g\">"
            "<ParameterField name=\"p\"/><Apply function=\"f\"><FieldRef field=\"p\"/></Apply>"
            "</DefineFunction>"),
       270005, "DefineFunctions 'f' -> 'g' -> 'f' call each other in a cycle"},
      {Pmml("<DefineFunction name=\"f\"><ParameterField name=\"p\"/><Apply function=\"f\">"
            "<FieldRef field=\"p\"/></Apply></DefineFunction>"),
       270005, "DefineFunction 'f' calls itself"},
      {Pmml("<DefineFunction name=\"min\"><ParameterField name=\"p\"/><FieldRef field=\"p\"/>"
            "</DefineFunction>"),
       270004, "DefineFunction 'min' has the name of a built-in function"},
      {Pmml("<DefineFunction name=\"f\"><ParameterField name=\"p\"/></DefineFunction>"), 270004,
       "DefineFunction 'f' has no expression"},
      {Pmml("<DefineFunction name=\"f\"><ParameterField name=\"p\"/><FieldRef field=\"p\"/>"
            "</DefineFunction><DefineFunction name=\"f\"><ParameterField name=\"p\"/>"
            "<FieldRef field=\"p\"/></DefineFunction>"),
       270004, "DefineFunction 'f' is defined twice"},
      {Pmml(Derived("a", "<Apply function=\"+\">" + x + "<FieldRef field=\"nowhere\"/></Apply>"),
            "<DataField name=\"x\" optype=\"continuous\" dataType=\"double\"/>"),
       270003,
       "DerivedField 'a': FieldRef refers to 'nowhere', which is neither a data field nor a "
       "derived field"},
      {Pmml(Derived("a",
                    "<MapValues outputColumn=\"o\"><FieldColumnPair field=\"gone\" "
                    "column=\"i\"/><InlineTable/></MapValues>"),
            "<DataField name=\"x\" optype=\"continuous\" dataType=\"double\"/>"),
       270003,
       "DerivedField 'a': FieldColumnPair refers to 'gone', which is neither a data field nor "
       "a derived field"},
  };
  for (const Case& c : cases) {
    const auto refusal = Refusal(c.document);
    EXPECT_EQ(refusal.first, c.code) << c.document;
    EXPECT_EQ(refusal.second, c.message) << c.document;
  }
}

std::string Nested(int depth) {
  std::string xml;
  for (int i = 0; i < depth; ++i) xml += "<Apply function=\"+\"><Constant>1</Constant>";
  xml += "<FieldRef field=\"x\"/>";
  for (int i = 0; i < depth; ++i) xml += "</Apply>";
  return xml;
}

// Nesting: as deep as the limit loads and computes; deeper, also through chains of
// function calls, is refused (no stack overflow, whatever the document's depth).
TEST(TransformElements, NestingLimits) {
  Engine deep(Pmml(Derived("r", Nested(249))));
  ASSERT_TRUE(deep.status.IsOK()) << deep.t.GetLastError();
  EXPECT_EQ(deep.Get("r", {{"x", Value(1.0)}}), Value(250.0));

  const auto tooDeep = Refusal(Pmml(Derived("r", Nested(250))));
  EXPECT_EQ(tooDeep.first, 270004);
  EXPECT_EQ(tooDeep.second, "DerivedField 'r': expressions are nested deeper than 250 levels");
  // As deep as the parser accepts at all.
  EXPECT_EQ(Refusal(Pmml(Derived("r", Nested(994)))).first, 270004);

  // Forty functions, each nesting ten levels and calling the next: 400 levels.
  std::string chain;
  for (int f = 0; f < 40; ++f) {
    std::string inner = f == 39 ? "<FieldRef field=\"p\"/>"
                                : "<Apply function=\"f" + std::to_string(f + 1) +
                                      "\"><FieldRef field=\"p\"/></Apply>";
    for (int i = 0; i < 9; ++i) inner = "<Apply function=\"abs\">" + inner + "</Apply>";
    chain += "<DefineFunction name=\"f" + std::to_string(f) + "\"><ParameterField name=\"p\"/>" +
             inner + "</DefineFunction>";
  }
  const auto tooLong = Refusal(Pmml(chain));
  EXPECT_EQ(tooLong.first, 270004);
  EXPECT_EQ(tooLong.second,
            "DefineFunction 'f14': expressions are nested deeper than 250 levels, counting the "
            "calls of functions");
}

// The DOM entry point reads a LocalTransformations element a caller holds.
TEST(TransformElements, LoadsFromADomElement) {
  QZXML_800::QZSafeDOMParser parser;
  std::istringstream in(
      "<PMML><RegressionModel><LocalTransformations>" +
      Derived("twice", "<Apply function=\"*\"><FieldRef field=\"x\"/><Constant>2</Constant>"
                       "</Apply>") +
      "</LocalTransformations></RegressionModel></PMML>");
  std::string error;
  xercesc::DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(parser, in, &error);
  ASSERT_NE(document, nullptr) << error;
  const xercesc::DOMElement* local =
      document->getDocumentElement()->getFirstElementChild()->getFirstElementChild();

  QZTransformation t;
  ASSERT_TRUE(t.AddTransformationDictionary(local).IsOK()) << t.GetLastError();
  ValueRecord record;
  record.Add("x", Value(4.0));
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Get("twice"), Value(8.0));

  EXPECT_EQ(t.AddTransformationDictionary(static_cast<const xercesc::DOMElement*>(nullptr))
                .GetErrorCode(),
            270001);
  EXPECT_EQ(t.AddTransformationDictionary(document->getDocumentElement()).GetErrorCode(), 270001);
  EXPECT_EQ(t.GetLastError(),
            "the dictionary's root element is 'PMML', not 'TransformationDictionary' or "
            "'LocalTransformations'");
  EXPECT_EQ(t.GetDerivedFieldNames(), std::vector<std::string>{"twice"});
}

}  // namespace
