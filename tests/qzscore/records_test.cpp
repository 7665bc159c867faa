// qzscore's parts between CSV and the library: cells to input values, output records
// to columns, the registry file and the dispatcher's choice of entry.

#include "Records.h"

#include <gtest/gtest.h>

#include <fstream>
#include <string>
#include <vector>

#include "Registry.h"
#include "StatusText.h"

using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using Names = std::vector<std::string>;

// Header columns named like a model field become inputs (the first of repeated names),
// numbers for numeric storage, text otherwise; empty cells, missing tokens and cells
// that are not numbers are missing, and the last are reported by column.
TEST(InputLayout, ConvertsCellsByStorage) {
  const Names header = {"id", "age", "plan", "age", "score"};
  const qzscore::FieldKinds kinds = {{"age", true}, {"plan", false}, {"score", true}};
  const qzscore::InputLayout layout(header, kinds, {"NA"});
  ValueRecord input;
  layout.Prepare(input);
  EXPECT_EQ(input.Names(), (Names{"age", "plan", "score"}));
  EXPECT_FALSE(layout.Contains("id"));

  std::vector<size_t> notNumbers;
  layout.Fill({"x", " 42 ", "007", "9", "abc"}, input, notNumbers);
  EXPECT_EQ(input.Get("age"), Value(42.0));
  EXPECT_EQ(input.Get("plan"), Value("007"));
  EXPECT_TRUE(input.Get("score").IsNull());
  EXPECT_EQ(notNumbers, std::vector<size_t>{4});

  notNumbers.clear();
  layout.Fill({"x", "NA", ""}, input, notNumbers);  // a short row: the rest is missing
  EXPECT_TRUE(input.Get("age").IsNull());
  EXPECT_TRUE(input.Get("plan").IsNull());
  EXPECT_TRUE(input.Get("score").IsNull());
  EXPECT_TRUE(notNumbers.empty());
}

// A structured output field gives one column per entry, nested entries joined with
// dots; a single-entry structure written by a split model is read through; missing
// values are empty.
TEST(OutputLayout, FlattensStructuredFields) {
  ValueRecord laidOut;
  laidOut.Add("prediction", Value());
  laidOut["probability"]["A"] = Value();
  laidOut["probability"]["B"]["x"] = Value();
  const qzscore::OutputLayout layout(laidOut);
  EXPECT_EQ(layout.Names(), (Names{"prediction", "probability.A", "probability.B.x"}));

  ValueRecord output = laidOut;
  output["prediction"]["target"] = Value("yes");
  output["probability"]["A"] = Value(0.25);
  EXPECT_EQ(layout.Text(output, 0), "yes");
  EXPECT_EQ(layout.Text(output, 1), "0.25");
  EXPECT_EQ(layout.Text(output, 2), "");
  EXPECT_TRUE(layout.Get(ValueRecord(), 1).IsNull());
}

// The registry file: comments, blank lines and versionSupported; a malformed line, an
// unknown element or a plug-in that does not load names the line and leaves the
// registry as it was. The dispatcher's entry follows the document's version.
TEST(Registry, ReadsFilesAndChoosesEntries) {
  std::ofstream("good.txt") << "# the test plug-ins\n\nTreeModel = QZTestEcho  # echo\n"
                               "Veritor=QZTestSettings\nversionSupported = 4.3\n";
  qzscore::Registry registry = qzscore::Registry::BuiltIn();
  std::string error;
  ASSERT_TRUE(registry.LoadFile("good.txt", error)) << error;
  EXPECT_EQ(registry.Entries().size(), 2u);
  EXPECT_EQ(registry.EntryFor("TreeModel", "4.3"), "TreeModel");
  EXPECT_EQ(registry.EntryFor("TreeModel", "4.1"), "TreeModel");
  EXPECT_EQ(registry.EntryFor("TreeModel", "3.2"), "Veritor");
  EXPECT_EQ(registry.EntryFor("RegressionModel", "4.3"), "Veritor");
  EXPECT_EQ(qzscore::Registry::BuiltIn().EntryFor("TreeModel", "4.3"), "Veritor");

  const struct {
    std::string text;
    std::string error;
  } bad[] = {
      {"TreeModel QZTestEcho\n", "bad.txt:1: expected ELEMENT = PLUGIN"},
      {"# ok\nTreeModl = QZTestEcho\n", "bad.txt:2: 'TreeModl' is not a PMML model element"},
      {"TreeModel = QZTestNoEntry\n", "bad.txt:1: plug-in QZTestNoEntry cannot be loaded: "},
  };
  for (const auto& b : bad) {
    std::ofstream("bad.txt") << b.text;
    EXPECT_FALSE(registry.LoadFile("bad.txt", error));
    EXPECT_EQ(error.rfind(b.error, 0), 0u) << error;
    EXPECT_EQ(registry.Entries().size(), 2u);
  }
  EXPECT_FALSE(registry.SetEntry("TreeModel", error));
  EXPECT_EQ(error, "--plugin TreeModel: expected ELEMENT=PLUGIN, such as TreeModel=QZTree");
  EXPECT_FALSE(registry.LoadFile("nosuch.txt", error));
  EXPECT_EQ(error, "nosuch.txt: cannot open the registry file");
}

TEST(StatusText, NamesEveryCode) {
  EXPECT_EQ(qzscore::DescribeStatus(260004), "260004: the PMML file cannot be opened");
  EXPECT_EQ(qzscore::DescribeStatus(42),
            "42: a status code without a known meaning (from the plug-in?)");
}
