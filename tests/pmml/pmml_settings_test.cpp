// A model's parameters as settings.

#include <memory>
#include <sstream>
#include <string>

#include <gtest/gtest.h>
#include <xercesc/dom/DOMDocument.hpp>

#include "QZSafeParser.h"
#include "ScoringPMMLParser.h"
#include "XercesTestEnvironment.h"

using QZXML_800::QZSettings;
using QZXML_800::QZVecValue;

namespace {

// Fills settings from the root element of document; returns the status code.
long Fill(const std::string& document, QZSettings& settings) {
  QZXML_800::QZSafeDOMParser dom;
  std::istringstream in(document);
  xercesc::DOMDocument* parsed = QZXML_800::QZSafeDOMParser::ParseSafely(dom, in, nullptr);
  EXPECT_NE(parsed, nullptr);
  QZScoring_800::ScoringPMMLParser parser;
  return parser.FillSettings(settings, parsed->getDocumentElement()).GetErrorCode();
}

size_t ListSize(const QZSettings& settings, const std::string& name) {
  const auto found = settings.GetSettingByName(name);
  if (found.empty()) return 99;
  const auto* list = dynamic_cast<const QZVecValue<std::string>*>(found[0]->GetValue());
  return list == nullptr ? 98 : list->GetValues().size();
}

}  // namespace

TEST(PMMLSettings, ValuesListsAndTheMissingName) {
  QZSettings settings;
  EXPECT_EQ(Fill(R"(<Extension>
      <Parameter name="depth" value="5"/>
      <Parameter name="targets"><ListValue><Value value="a"/><Value/><Value value="b"/>
        <Value value="c"/></ListValue></Parameter>
      <Parameter name="none"><ListValue/></Parameter>
      <Parameter name="both" value="v"><ListValue><Value value="x"/></ListValue></Parameter>
      <Parameter name="skipped"/>
      <Group><Parameter name="nested" value="1"/></Group>
      <Parameter value="no name"/>
      <Parameter name="after" value="1"/>
    </Extension>)", settings),
            108);
  EXPECT_EQ(settings.GetSettingNames(),
            (std::vector<std::string>{"depth", "targets", "none", "both"}));
  std::string text;
  ASSERT_TRUE(settings.GetSettingValByName("depth", text));
  EXPECT_EQ(text, "5");
  EXPECT_EQ(ListSize(settings, "targets"), 3u);
  EXPECT_EQ(ListSize(settings, "none"), 0u);
  ASSERT_TRUE(settings.GetSettingValByName("both", text));
  EXPECT_EQ(text, "v");

  QZSettings repeated;
  EXPECT_EQ(Fill(R"(<X><Parameter name="k" value="1"/><Parameter name="k" value="2"/></X>)",
                 repeated),
            0);
  EXPECT_EQ(repeated.GetSettingByName("k").size(), 2u);
}
