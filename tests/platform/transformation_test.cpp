// The transformation engine's frame: loading documents and dictionaries, computing
// derived fields (here of FieldRef and Constant) in dependency order, typing, missing
// values, refusals at load, and the binding of record layouts.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>
#include <xercesc/util/PlatformUtils.hpp>

#include "QZMV.h"
#include "Value.h"
#include "ValueRecord.h"

namespace {

using QZCommon_800::QZMV;
using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;
using Names = std::vector<std::string>;

// A PMML document with data fields x and s and the given derived fields.
std::string Pmml(const std::string& derivedFields) {
  return "<?xml version=\"1.0\"?>\n"
         "<PMML version=\"4.4\" xmlns=\"http://www.dmg.org/PMML-4_4\">\n"
         " <Header/>\n"
         " <DataDictionary numberOfFields=\"2\">\n"
         "  <DataField name=\"x\" optype=\"continuous\" dataType=\"double\"/>\n"
         "  <DataField name=\"s\" optype=\"categorical\" dataType=\"string\"/>\n"
         " </DataDictionary>\n"
         " <TransformationDictionary>\n" +
         derivedFields +
         " </TransformationDictionary>\n"
         " <TreeModel functionName=\"regression\"><MiningSchema/></TreeModel>\n"
         "</PMML>\n";
}

std::string Ref(const std::string& name, const std::string& type, const std::string& field,
                const std::string& extra = "") {
  return "<DerivedField name=\"" + name + "\" optype=\"continuous\" dataType=\"" + type +
         "\"><FieldRef field=\"" + field + "\"" + extra + "/></DerivedField>\n";
}

std::string Const(const std::string& name, const std::string& type, const std::string& text,
                  const std::string& attrs = "") {
  return "<DerivedField name=\"" + name + "\" dataType=\"" + type + "\"><Constant" + attrs +
         ">" + text + "</Constant></DerivedField>\n";
}

QZStatus AddPMML(QZTransformation& t, const std::string& xml, bool keep = false) {
  std::istringstream in(xml);
  return t.AddPMML(in, keep);
}

QZStatus AddDictionary(QZTransformation& t, const std::string& xml) {
  std::istringstream in(xml);
  return t.AddTransformationDictionary(in);
}

// Derived fields may refer to fields defined later in the document; each is computed
// after the fields it reads, and appended to the record in document order.
TEST(QZTransformation, LoadsAPMMLDocumentAndComputesInDependencyOrder) {
  QZTransformation t;
  ASSERT_TRUE(AddPMML(t, Pmml(Ref("c", "double", "b") + Ref("b", "double", "a") +
                              Ref("a", "double", "x") + Const("k", "double", " 2.5 ") +
                              Const("i", "integer", "3") + Const("t", "string", "007")))
                  .IsOK())
      << t.GetLastError();
  EXPECT_EQ(t.GetDerivedFieldNames(), (Names{"c", "b", "a", "k", "i", "t"}));

  ValueRecord record;
  record.Add("x", Value(4.0));
  ASSERT_TRUE(t.Transform(record).IsOK()) << t.GetLastError();
  EXPECT_EQ(record.Names(), (Names{"x", "c", "b", "a", "k", "i", "t"}));
  EXPECT_EQ(record.Get("c"), Value(4.0));
  EXPECT_EQ(record.Get("a"), Value(4.0));
  EXPECT_EQ(record.Get("k"), Value(2.5));
  EXPECT_EQ(record.Get("i"), Value(3));
  EXPECT_EQ(record.Get("t"), Value("007"));
  EXPECT_TRUE(t.GetLastError().empty());

  // The next record of the same layout uses the bound positions.
  record["x"] = 9.5;
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Get("c"), Value(9.5));
  EXPECT_EQ(record.Size(), 7u);
}

// A stand-alone TransformationDictionary or LocalTransformations adds its fields; names
// it reads that no document declares are inputs, missing when the record lacks them.
TEST(QZTransformation, StandAloneDictionaries) {
  QZTransformation t;
  ASSERT_TRUE(AddDictionary(t, "<TransformationDictionary>" + Ref("y", "double", "in") +
                                   "</TransformationDictionary>")
                  .IsOK())
      << t.GetLastError();
  ASSERT_TRUE(AddDictionary(t, "<LocalTransformations>" + Ref("z", "double", "y") +
                                   "<Extension name=\"n\"/></LocalTransformations>")
                  .IsOK())
      << t.GetLastError();
  EXPECT_EQ(t.GetDerivedFieldNames(), (Names{"y", "z"}));

  ValueRecord record;
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_TRUE(record.Get("z").IsSystemMissingValue());
  record.Add("in", Value(3.0));  // the layout changes: bound again
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Get("z"), Value(3.0));
}

// The derived field's dataType decides the kind written; missing is system-missing in a
// real field and null otherwise; mapMissingTo replaces a missing input, typed likewise.
TEST(QZTransformation, TypingAndMissingValues) {
  QZTransformation t;
  ASSERT_TRUE(
      AddPMML(t, Pmml(Ref("asText", "string", "x") + Ref("asReal", "double", "s") +
                      Ref("asBool", "boolean", "s") + Ref("mapped", "double", "x",
                                                          " mapMissingTo=\"-1\"") +
                      Ref("mappedText", "string", "s", " mapMissingTo=\"007\"") +
                      Const("gone", "double", "", " missing=\"true\"") +
                      Const("goneText", "string", "abc", " missing=\"true\"") +
                      "<DerivedField name=\"inferred\"><Extension/><Constant>12</Constant>"
                      "<Value value=\"12\"/></DerivedField>"))
          .IsOK())
      << t.GetLastError();

  ValueRecord record;
  record.Add("x", Value(2.5));
  record.Add("s", Value(" 1e3 "));
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Get("asText"), Value("2.5"));
  EXPECT_EQ(record.Get("asReal"), Value(1000.0));
  EXPECT_EQ(record.Get("mapped"), Value(2.5));
  EXPECT_EQ(record.Get("mappedText"), Value(" 1e3 "));
  EXPECT_TRUE(record.Get("gone").IsSystemMissingValue());
  EXPECT_TRUE(record.Get("goneText").IsNull());
  EXPECT_EQ(record.Get("inferred"), Value(12.0));

  // Missing inputs: null and system-missing both count as missing.
  record["x"] = QZMV::Missing();
  record["s"] = Value();
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_TRUE(record.Get("asText").IsNull());
  EXPECT_TRUE(record.Get("asReal").IsSystemMissingValue());
  EXPECT_EQ(record.Get("mapped"), Value(-1.0));
  EXPECT_EQ(record.Get("mappedText"), Value("007"));

  // Text that is no number becomes system-missing in a real field; booleans read texts.
  record["s"] = "true";
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_TRUE(record.Get("asReal").IsSystemMissingValue());
  EXPECT_EQ(record.Get("asBool"), Value(1.0));

  // A float field holds the nearest single-precision number, whatever path computed it.
  QZTransformation single;
  ASSERT_TRUE(AddPMML(single, Pmml(Ref("f", "float", "x") + Ref("fs", "float", "s") +
                                   Ref("d", "double", "x")))
                  .IsOK());
  record["x"] = 0.1;
  record["s"] = "0.1";
  ASSERT_TRUE(single.Transform(record).IsOK());
  EXPECT_EQ(record.Get("f").GetReal(), static_cast<double>(0.1f));
  EXPECT_EQ(record.Get("fs").GetReal(), static_cast<double>(0.1f));
  EXPECT_EQ(record.Get("d").GetReal(), 0.1);
  record["x"] = 1e300;
  ASSERT_TRUE(single.Transform(record).IsOK());
  EXPECT_EQ(record.Get("f"), Value::GetInfinity());
}

// Each refusal has its status and a message naming the field and the element, and
// leaves what was loaded before untouched.
TEST(QZTransformation, RefusalsAtLoad) {
  QZTransformation t;
  ASSERT_TRUE(AddPMML(t, Pmml(Ref("kept", "double", "x"))).IsOK());
  struct Case {
    std::string document;
    long code;
    std::string message;
  };
  const std::vector<Case> cases = {
      {Pmml(Ref("a", "double", "b") + Ref("b", "double", "a")), 270005,
       "DerivedFields 'a' -> 'b' -> 'a' depend on each other in a cycle"},
      {Pmml(Ref("a", "double", "a")), 270005, "DerivedField 'a' refers to itself"},
      {Pmml("<DerivedField name=\"lagged\" dataType=\"double\"><Lag field=\"x\"/>"
            "</DerivedField>"),
       270002, "DerivedField 'lagged': element 'Lag' is not supported"},
      {Pmml("<Taxonomy name=\"t\"/>"), 270002,
       "TransformationDictionary: Taxonomy 't' is not supported"},
      {Pmml(Ref("a", "double", "nowhere")), 270003,
       "DerivedField 'a': FieldRef refers to 'nowhere', which is neither a data field nor a "
       "derived field"},
      {Pmml("<DerivedField name=\"a\"><FieldRef/></DerivedField>"), 270004,
       "DerivedField 'a': FieldRef has no 'field' attribute"},
      {Pmml(Const("a", "double", "abc")), 270004,
       "DerivedField 'a': Constant: 'abc' is not a number"},
      {Pmml(Const("a", "integer", "2.5")), 270004,
       "DerivedField 'a': Constant: '2.5' is not an integer"},
      {Pmml(Ref("a", "double", "x", " mapMissingTo=\"n/a\"")), 270004,
       "DerivedField 'a': FieldRef mapMissingTo: 'n/a' is not a number"},
      {Pmml(Ref("a", "double", "x") + Ref("a", "double", "s")), 270004,
       "DerivedField 'a' is defined twice"},
      {Pmml("<DerivedField name=\"a\"><Extension/></DerivedField>"), 270004,
       "DerivedField 'a' has no expression"},
      {Pmml("<DerivedField name=\"a\"><Constant>1</Constant><FieldRef field=\"x\"/>"
            "</DerivedField>"),
       270004, "DerivedField 'a' has more than one expression ('Constant' and 'FieldRef')"},
      {Pmml("<DerivedField dataType=\"double\"><FieldRef field=\"x\"/></DerivedField>"), 270004,
       "DerivedField number 1 has no 'name' attribute"},
      {Pmml(Ref("a", "decimal", "x")), 270004,
       "DerivedField 'a' has an unknown dataType 'decimal'"},
      {"<PMML><TransformationDictionary>", 270001, "cannot parse the PMML document: line 1"},
      {"<DataDictionary/>", 270001,
       "the document's root element is 'DataDictionary', not 'PMML'"},
      {"<!DOCTYPE PMML [<!ENTITY e SYSTEM \"file:///etc/hostname\">]><PMML>&e;</PMML>",
       270001, "cannot parse the PMML document: line 1"},
  };
  for (const Case& c : cases) {
    const QZStatus status = AddPMML(t, c.document);
    EXPECT_EQ(status.GetErrorCode(), c.code) << c.document;
    EXPECT_EQ(t.GetLastError().substr(0, c.message.size()), c.message);
    EXPECT_EQ(t.GetDerivedFieldNames(), Names{"kept"});
  }
  EXPECT_EQ(AddDictionary(t, "<PMML/>").GetErrorCode(), 270001);
  EXPECT_EQ(AddDictionary(t, "<TransformationDictionary>" + Ref("kept", "double", "s") +
                                 "</TransformationDictionary>")
                .GetErrorCode(),
            270004);

  // The engine still works as loaded, and a success clears the message.
  ValueRecord record;
  record.Add("x", Value(1.5));
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Get("kept"), Value(1.5));
  EXPECT_TRUE(t.GetLastError().empty());
}

// keepExisting false replaces the loaded fields; true adds to them, and a field added
// later may be one an earlier field reads (the order is computed over all of them).
TEST(QZTransformation, KeepExisting) {
  QZTransformation t;
  ASSERT_TRUE(AddPMML(t, Pmml(Ref("a", "double", "x"))).IsOK());
  ASSERT_TRUE(AddPMML(t, Pmml(Ref("b", "double", "x")), false).IsOK());
  EXPECT_EQ(t.GetDerivedFieldNames(), Names{"b"});

  ASSERT_TRUE(AddDictionary(t, "<TransformationDictionary>" + Ref("c", "double", "later") +
                                   "</TransformationDictionary>")
                  .GetErrorCode() == 270003)
      << "the data fields of the loaded document still bound references";
  ASSERT_TRUE(AddPMML(t, Pmml(Ref("c", "double", "b") + Const("d", "double", "4")), true).IsOK())
      << t.GetLastError();
  EXPECT_EQ(t.GetDerivedFieldNames(), (Names{"b", "c", "d"}));
  // A cycle through fields of two documents is refused like any other.
  EXPECT_EQ(AddPMML(t, Pmml(Ref("e", "double", "f") + Ref("f", "double", "e")), true)
                .GetErrorCode(),
            270005);
  EXPECT_EQ(AddPMML(t, Pmml(Const("b", "double", "1")), true).GetErrorCode(), 270004);

  ValueRecord record;
  record.Add("x", Value(7.0));
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Names(), (Names{"x", "b", "c", "d"}));
  EXPECT_EQ(record.Get("c"), Value(7.0));

  // A document without a transformation dictionary replaces everything with nothing.
  ASSERT_TRUE(AddPMML(t, "<PMML version=\"4.4\"><DataDictionary/></PMML>", false).IsOK());
  EXPECT_TRUE(t.GetDerivedFieldNames().empty());
  ValueRecord untouched;
  untouched.Add("x", Value(1.0));
  ASSERT_TRUE(t.Transform(untouched).IsOK());
  EXPECT_EQ(untouched.Size(), 1u);
}

// GetDerivedVariableInfo adds the derived fields as nulls; onlyMissing keeps existing ones.
TEST(QZTransformation, GetDerivedVariableInfo) {
  QZTransformation t;
  ASSERT_TRUE(AddPMML(t, Pmml(Ref("a", "double", "x") + Const("b", "string", "v"))).IsOK());
  ValueRecord record;
  record.Add("b", Value("old"));
  record.Add("x", Value(1.0));
  ASSERT_TRUE(t.GetDerivedVariableInfo(record, true).IsOK());
  EXPECT_EQ(record.Names(), (Names{"b", "x", "a"}));
  EXPECT_EQ(record.Get("b"), Value("old"));
  EXPECT_TRUE(record.Get("a").IsNull());

  ASSERT_TRUE(t.GetDerivedVariableInfo(record, false).IsOK());
  EXPECT_EQ(record.Names(), (Names{"b", "x", "a"}));
  EXPECT_TRUE(record.Get("b").IsNull());

  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Get("a"), Value(1.0));
  EXPECT_EQ(record.Get("b"), Value("v"));
}

// A record of another layout is bound afresh, also when its size and the names at the
// bound positions are the same as before but an input it lacked is now present.
TEST(QZTransformation, RecordLayoutChanges) {
  QZTransformation t;
  ASSERT_TRUE(AddDictionary(t, "<TransformationDictionary>" +
                                   Ref("d", "double", "z", " mapMissingTo=\"-1\"") +
                                   "</TransformationDictionary>")
                  .IsOK());
  ValueRecord first;
  first.Add("x", Value(1.0));
  first.Add("d", Value());
  ASSERT_TRUE(t.Transform(first).IsOK());
  EXPECT_EQ(first.Get("d"), Value(-1.0));

  ValueRecord second;
  second.Add("z", Value(5.0));
  second.Add("d", Value());
  ASSERT_TRUE(t.Transform(second).IsOK());
  EXPECT_EQ(second.Get("d"), Value(5.0));

  // A copy shares the layout, so the binding holds for it too.
  ValueRecord copy = second;
  copy["z"] = 8.0;
  ASSERT_TRUE(t.Transform(copy).IsOK());
  EXPECT_EQ(copy.Get("d"), Value(8.0));
  EXPECT_EQ(second.Get("d"), Value(5.0));

  ValueRecord third;  // the derived field first, the input after it
  third.Add("d", Value(0.0));
  third.Add("q", Value(2.0));
  third.Add("z", Value(6.0));
  ASSERT_TRUE(t.Transform(third).IsOK());
  EXPECT_EQ(third.Get("d"), Value(6.0));
  ASSERT_TRUE(t.Transform(first).IsOK());
  EXPECT_EQ(first.Get("d"), Value(-1.0));
}

// The layout identity the binding relies on: copies share it until one of them adds a
// field; a record that grows keeps names at their positions but changes its size.
TEST(QZTransformation, LayoutIdentity) {
  ValueRecord a;
  EXPECT_EQ(a.GetLayoutId(), 0u);
  a.Add("x", Value(1.0));
  const uint64_t id = a.GetLayoutId();
  EXPECT_NE(id, 0u);
  ValueRecord b = a;
  EXPECT_EQ(b.GetLayoutId(), id);
  b.Add("y", Value(2.0));
  EXPECT_NE(b.GetLayoutId(), id);
  EXPECT_EQ(a.GetLayoutId(), id);
  a.Add("z", Value(3.0));  // no longer shared: grows in place, one field more
  EXPECT_EQ(a.GetLayoutId(), id);
  EXPECT_EQ(a.Size(), 2u);
  a.ClearValues();
  EXPECT_EQ(a.GetLayoutId(), id);

  // The engine sees both records' own layouts, whatever order they come in.
  QZTransformation t;
  ASSERT_TRUE(AddDictionary(t, "<TransformationDictionary>" + Ref("d", "double", "z") +
                                   "</TransformationDictionary>")
                  .IsOK());
  a["z"] = 3.0;
  b.Add("z", Value(4.0));
  for (int i = 0; i < 2; ++i) {
    ASSERT_TRUE(t.Transform(a).IsOK());
    ASSERT_TRUE(t.Transform(b).IsOK());
  }
  EXPECT_EQ(a.Get("d"), Value(3.0));
  EXPECT_EQ(b.Get("d"), Value(4.0));
}

// Loading without Xerces-C++ initialised is refused, not a crash.
TEST(QZTransformation, NeedsXercesForLoadingOnly) {
  QZTransformation t;
  ASSERT_TRUE(AddPMML(t, Pmml(Const("k", "double", "1"))).IsOK());
  xercesc::XMLPlatformUtils::Terminate();
  const QZStatus status = AddPMML(t, Pmml(Const("j", "double", "1")));
  const std::string message = t.GetLastError();
  ValueRecord record;
  const QZStatus transformed = t.Transform(record);
  xercesc::XMLPlatformUtils::Initialize();
  EXPECT_EQ(status.GetErrorCode(), 270001);
  EXPECT_EQ(message, "Xerces-C++ is not initialised");
  EXPECT_TRUE(transformed.IsOK());
  EXPECT_EQ(record.Get("k"), Value(1.0));
}

}  // namespace
