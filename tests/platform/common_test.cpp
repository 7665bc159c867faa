#include <memory>
#include <sstream>

#include <gtest/gtest.h>

#include "IQZScore.h"
#include "ProgressReport.h"
#include "QZDisplay.h"
#include "XMLElement.h"

namespace {

// Restores the default display stream when a test ends.
struct DisplayStreamGuard {
  std::ostream* saved = QZDisplay_800::GetDisplayStream();
  ~DisplayStreamGuard() { QZDisplay_800::SetDisplayStream(saved); }
};

// Display output: "caption: value" lines, text as is, and a null stream discards.
TEST(DisplayTest, WritesToChosenStream) {
  DisplayStreamGuard guard;
  EXPECT_EQ(guard.saved, &std::cerr);
  std::ostringstream out;
  QZDisplay_800::SetDisplayStream(&out);
  QZDisplay_800::DisplayI("count", -3);
  QZDisplay_800::DisplayS("name", "tree");
  QZDisplay_800::DisplayText(2, "free text");
  EXPECT_EQ(out.str(), "count: -3\nname: tree\nfree text");

  QZDisplay_800::SetDisplayStream(nullptr);
  QZDisplay_800::DisplayS("lost", "x");
  EXPECT_EQ(out.str(), "count: -3\nname: tree\nfree text");
}

// Attributes keep their order, a repeated name replaces its value, clones are deep.
TEST(XMLElementTest, AttributesAndClone) {
  std::unique_ptr<QZXML_800::XMLElement> e(QZXML_800::XMLElement::Create("Format"));
  ASSERT_NE(e, nullptr);
  e->AddAttribute("width", "8");
  e->AddAttribute("decimals", "2");
  e->AddAttribute("width", "10");
  EXPECT_EQ(e->GetName(), "Format");
  using Attrs = std::vector<std::pair<std::string, std::string>>;
  EXPECT_EQ(e->GetAttributes(), (Attrs{{"width", "10"}, {"decimals", "2"}}));
  EXPECT_EQ(*e->GetAttribute("decimals"), "2");
  EXPECT_EQ(e->GetAttribute("type"), nullptr);

  std::unique_ptr<QZXML_800::XMLElement> copy(e->Clone());
  e->AddAttribute("type", "F");
  EXPECT_EQ(copy->GetAttributes().size(), 2u);
  EXPECT_EQ(copy->GetName(), "Format");
}

class CountingScore : public QZCommon_800::IQZScore {
 public:
  explicit CountingScore(int* destroyed) : destroyed_(destroyed) {}
  ~CountingScore() override { ++*destroyed_; }
  bool IsReady() const override { return true; }
  QZCommon_800::QZStatus Score(const QZCommon_800::ValueRecord& in,
                               QZCommon_800::ValueRecord& out) override {
    out["y"] = in.Get("x").GetReal() * 2;
    return QZCommon_800::QZStatus();
  }
  QZCommon_800::QZStatus Scorable(QZCommon_800::ValueRecord& record) override {
    record["y"];
    return QZCommon_800::QZStatus();
  }
  std::string GetType() const override { return "counting"; }

 private:
  int* destroyed_;
};

// Scorers are driven and deleted through the interface.
TEST(InterfaceTest, ScorerThroughInterface) {
  int destroyed = 0;
  std::unique_ptr<QZCommon_800::IQZScore> scorer(new CountingScore(&destroyed));
  QZCommon_800::ValueRecord in, out;
  in["x"] = 4;
  EXPECT_TRUE(scorer->Scorable(out).IsOK());
  EXPECT_TRUE(scorer->Score(in, out).IsOK());
  EXPECT_EQ(out.Get("y").GetReal(), 8.0);
  scorer.reset();
  EXPECT_EQ(destroyed, 1);
}

}  // namespace
