// A realistic data preparation end to end: a PMML document whose transformation
// dictionary holds a user-defined function and eighteen derived fields of every kind,
// some used before their definition, computed over several records into one record
// object, every value checked.
#include "XercesTestEnvironment.h"
#include "QZTransformation.h"

#include <sstream>
#include <string>
#include <vector>

#include <gtest/gtest.h>

#include "QZMV.h"
#include "Value.h"
#include "ValueRecord.h"

namespace {

using QZCommon_800::QZMV;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using QZTransformNS_8_0_0::QZTransformation;

const char* const kDocument = R"(<?xml version="1.0" encoding="UTF-8"?>
<PMML version="4.4" xmlns="http://www.dmg.org/PMML-4_4">
 <Header copyright="test"/>
 <DataDictionary numberOfFields="8">
  <DataField name="age" optype="continuous" dataType="integer"/>
  <DataField name="income" optype="continuous" dataType="double"/>
  <DataField name="gender" optype="categorical" dataType="string">
   <Value value="F"/><Value value="M"/>
  </DataField>
  <DataField name="region" optype="categorical" dataType="string"/>
  <DataField name="signup" optype="continuous" dataType="date"/>
  <DataField name="balance" optype="continuous" dataType="double"/>
  <DataField name="visits" optype="continuous" dataType="integer"/>
  <DataField name="email" optype="categorical" dataType="string"/>
 </DataDictionary>
 <TransformationDictionary>
  <DefineFunction name="ratio" optype="continuous" dataType="double">
   <ParameterField name="a" optype="continuous"/>
   <ParameterField name="b" optype="continuous"/>
   <Apply function="if">
    <Apply function="equal"><FieldRef field="b"/><Constant>0</Constant></Apply>
    <Constant>0</Constant>
    <Apply function="/"><FieldRef field="a"/><FieldRef field="b"/></Apply>
   </Apply>
  </DefineFunction>
  <DerivedField name="age_norm" optype="continuous" dataType="double">
   <NormContinuous field="age" outliers="asExtremeValues" mapMissingTo="0.5">
    <LinearNorm orig="18" norm="0"/><LinearNorm orig="65" norm="1"/>
   </NormContinuous>
  </DerivedField>
  <DerivedField name="income_log" optype="continuous" dataType="double">
   <Apply function="ln1p"><FieldRef field="income"/></Apply>
  </DerivedField>
  <DerivedField name="region_risk" optype="continuous" dataType="double">
   <MapValues outputColumn="risk" defaultValue="1">
    <FieldColumnPair field="region_code" column="code"/>
    <FieldColumnPair field="income_band" column="band"/>
    <InlineTable>
     <row><code>1</code><band>mid</band><risk>0.2</risk></row>
     <row><code>1</code><band>high</band><risk>0.1</risk></row>
     <row><code>4</code><band>high</band><risk>0.3</risk></row>
     <row><code>0</code><band>missing</band><risk>2</risk></row>
    </InlineTable>
   </MapValues>
  </DerivedField>
  <DerivedField name="income_band" optype="categorical" dataType="string">
   <Discretize field="income" mapMissingTo="missing" defaultValue="unknown">
    <DiscretizeBin binValue="low">
     <Interval closure="closedOpen" leftMargin="0" rightMargin="20000"/>
    </DiscretizeBin>
    <DiscretizeBin binValue="mid">
     <Interval closure="closedOpen" leftMargin="20000" rightMargin="60000"/>
    </DiscretizeBin>
    <DiscretizeBin binValue="high">
     <Interval closure="closedOpen" leftMargin="60000"/>
    </DiscretizeBin>
   </Discretize>
  </DerivedField>
  <DerivedField name="is_female" optype="continuous" dataType="double">
   <NormDiscrete field="gender" value="F"/>
  </DerivedField>
  <DerivedField name="region_code" optype="categorical" dataType="integer">
   <MapValues outputColumn="code" defaultValue="0">
    <FieldColumnPair field="region" column="name"/>
    <InlineTable>
     <row><name>N</name><code>1</code></row><row><name>S</name><code>2</code></row>
     <row><name>E</name><code>3</code></row><row><name>W</name><code>4</code></row>
    </InlineTable>
   </MapValues>
  </DerivedField>
  <DerivedField name="tenure_days" optype="continuous" dataType="integer">
   <Apply function="dateDaysSinceYear"><FieldRef field="signup"/><Constant>2020</Constant></Apply>
  </DerivedField>
  <DerivedField name="signup_month" optype="categorical" dataType="string">
   <Apply function="formatDatetime"><FieldRef field="signup"/><Constant>%Y-%m</Constant></Apply>
  </DerivedField>
  <DerivedField name="balance_per_visit" optype="continuous" dataType="double">
   <Apply function="ratio"><FieldRef field="balance"/><FieldRef field="visits"/></Apply>
  </DerivedField>
  <DerivedField name="high_value" optype="categorical" dataType="boolean">
   <Apply function="and">
    <Apply function="greaterThan"><FieldRef field="income"/><Constant>50000</Constant></Apply>
    <Apply function="greaterThan">
     <FieldRef field="balance_per_visit"/><Constant>100</Constant>
    </Apply>
   </Apply>
  </DerivedField>
  <DerivedField name="score" optype="continuous" dataType="double">
   <Apply function="sum">
    <FieldRef field="age_norm"/><FieldRef field="is_female"/>
    <Apply function="*"><Constant>0.5</Constant><FieldRef field="region_risk"/></Apply>
   </Apply>
  </DerivedField>
  <DerivedField name="score_pct" optype="categorical" dataType="string">
   <Apply function="formatNumber">
    <Apply function="*"><FieldRef field="score"/><Constant>100</Constant></Apply>
    <Constant>%.1f%%</Constant>
   </Apply>
  </DerivedField>
  <DerivedField name="email_domain" optype="categorical" dataType="string">
   <Apply function="lowercase">
    <Apply function="replace">
     <FieldRef field="email"/><Constant>^[^@]*@</Constant><Constant></Constant>
    </Apply>
   </Apply>
  </DerivedField>
  <DerivedField name="valid_email" optype="categorical" dataType="boolean">
   <Apply function="matches">
    <FieldRef field="email"/><Constant>^[^@ ]+@[^@ ]+\.[a-zA-Z]+$</Constant>
   </Apply>
  </DerivedField>
  <DerivedField name="age_group" optype="categorical" dataType="string">
   <Apply function="if" mapMissingTo="unknown">
    <Apply function="lessThan"><FieldRef field="age"/><Constant>30</Constant></Apply>
    <Constant>young</Constant>
    <Apply function="if">
     <Apply function="lessThan"><FieldRef field="age"/><Constant>50</Constant></Apply>
     <Constant>middle</Constant><Constant>senior</Constant>
    </Apply>
   </Apply>
  </DerivedField>
  <DerivedField name="visits_capped" optype="continuous" dataType="integer">
   <Apply function="min"><FieldRef field="visits"/><Constant>10</Constant></Apply>
  </DerivedField>
  <DerivedField name="label" optype="categorical" dataType="string">
   <Apply function="concat">
    <Apply function="uppercase">
     <Apply function="substring">
      <FieldRef field="gender"/><Constant>1</Constant><Constant>1</Constant>
     </Apply>
    </Apply>
    <Constant>-</Constant><FieldRef field="age_group"/>
   </Apply>
  </DerivedField>
  <DerivedField name="z_income" optype="continuous" dataType="double">
   <Apply function="stdNormalCDF">
    <Apply function="/">
     <Apply function="-"><FieldRef field="income"/><Constant>50000</Constant></Apply>
     <Constant>20000</Constant>
    </Apply>
   </Apply>
  </DerivedField>
 </TransformationDictionary>
 <RegressionModel functionName="regression"><MiningSchema/></RegressionModel>
</PMML>
)";

const std::vector<std::string> kInputs = {"age",     "income", "gender", "region",
                                          "signup",  "balance", "visits", "email"};
const std::vector<std::string> kDerived = {
    "age_norm",     "income_log",   "region_risk", "income_band",   "is_female",
    "region_code",  "tenure_days",  "signup_month", "balance_per_visit", "high_value",
    "score",        "score_pct",    "email_domain", "valid_email",   "age_group",
    "visits_capped", "label",       "z_income"};

const Value kSysMissing(QZMV::Missing());

void SetInputs(ValueRecord& record, const std::vector<Value>& values) {
  for (size_t i = 0; i < kInputs.size(); ++i) record[kInputs[i]] = values[i];
}

// Every derived field of three records, computed into one record object (its layout is
// bound once); then a record whose income makes ln1p invalid.
TEST(TransformEndToEnd, EveryValueOfSeveralRecords) {
  QZTransformation t;
  std::istringstream in(kDocument);
  ASSERT_TRUE(t.AddPMML(in, false).IsOK()) << t.GetLastError();
  EXPECT_EQ(t.GetDerivedFieldNames(), kDerived);

  ValueRecord record;
  SetInputs(record, {Value(40), Value(45000.0), Value("F"), Value("N"), Value("2021-03-15"),
                     Value(1500.0), Value(5), Value("Ann@Example.COM")});
  ASSERT_TRUE(t.Transform(record).IsOK()) << t.GetLastError();
  ASSERT_EQ(record.Size(), kInputs.size() + kDerived.size());
  for (size_t i = 0; i < kDerived.size(); ++i) {
    EXPECT_EQ(record.GetName(kInputs.size() + i), kDerived[i]);
  }
  EXPECT_EQ(record.Get("age_norm"), Value(0.46808510638297873));
  EXPECT_DOUBLE_EQ(record.Get("income_log").GetReal(), 10.714439990727769);
  EXPECT_EQ(record.Get("income_band"), Value("mid"));
  EXPECT_EQ(record.Get("is_female"), Value(1.0));
  EXPECT_EQ(record.Get("region_code"), Value(1.0));
  EXPECT_EQ(record.Get("region_risk"), Value(0.2));
  EXPECT_EQ(record.Get("tenure_days"), Value(439.0));
  EXPECT_EQ(record.Get("signup_month"), Value("2021-03"));
  EXPECT_EQ(record.Get("balance_per_visit"), Value(300.0));
  EXPECT_EQ(record.Get("high_value"), Value(0.0));
  EXPECT_DOUBLE_EQ(record.Get("score").GetReal(), 1.5680851063829788);
  EXPECT_EQ(record.Get("score_pct"), Value("156.8%"));
  EXPECT_EQ(record.Get("email_domain"), Value("example.com"));
  EXPECT_EQ(record.Get("valid_email"), Value(1.0));
  EXPECT_EQ(record.Get("age_group"), Value("middle"));
  EXPECT_EQ(record.Get("visits_capped"), Value(5.0));
  EXPECT_EQ(record.Get("label"), Value("F-middle"));
  EXPECT_DOUBLE_EQ(record.Get("z_income").GetReal(), 0.4012936743170763);

  SetInputs(record, {Value(70), Value(80000.0), Value("m"), Value("W"), Value("2019-12-31"),
                     Value(0.0), Value(0), Value("bob at example")});
  ASSERT_TRUE(t.Transform(record).IsOK()) << t.GetLastError();
  EXPECT_EQ(record.Size(), kInputs.size() + kDerived.size());
  EXPECT_EQ(record.Get("age_norm"), Value(1.0));
  EXPECT_DOUBLE_EQ(record.Get("income_log").GetReal(), 11.289794413577894);
  EXPECT_EQ(record.Get("income_band"), Value("high"));
  EXPECT_EQ(record.Get("is_female"), Value(0.0));
  EXPECT_EQ(record.Get("region_code"), Value(4.0));
  EXPECT_EQ(record.Get("region_risk"), Value(0.3));
  EXPECT_EQ(record.Get("tenure_days"), Value(-1.0));
  EXPECT_EQ(record.Get("signup_month"), Value("2019-12"));
  EXPECT_EQ(record.Get("balance_per_visit"), Value(0.0));
  EXPECT_EQ(record.Get("high_value"), Value(0.0));
  EXPECT_DOUBLE_EQ(record.Get("score").GetReal(), 1.15);
  EXPECT_EQ(record.Get("score_pct"), Value("115.0%"));
  EXPECT_EQ(record.Get("email_domain"), Value("bob at example"));
  EXPECT_EQ(record.Get("valid_email"), Value(0.0));
  EXPECT_EQ(record.Get("age_group"), Value("senior"));
  EXPECT_EQ(record.Get("visits_capped"), Value(0.0));
  EXPECT_EQ(record.Get("label"), Value("M-senior"));
  EXPECT_DOUBLE_EQ(record.Get("z_income").GetReal(), 0.9331927987311419);

  // Missing inputs: mapMissingTo where given, aggregates leave the missing one out,
  // and fields computed from missing values are missing.
  SetInputs(record, {Value(), QZMV::Missing(), Value("F"), Value("X"), Value("2020-01-01"),
                     Value(300.0), Value(), Value("c@d.org")});
  ASSERT_TRUE(t.Transform(record).IsOK()) << t.GetLastError();
  EXPECT_EQ(record.Get("age_norm"), Value(0.5));
  EXPECT_EQ(record.Get("income_log"), kSysMissing);
  EXPECT_EQ(record.Get("income_band"), Value("missing"));
  EXPECT_EQ(record.Get("is_female"), Value(1.0));
  EXPECT_EQ(record.Get("region_code"), Value(0.0));
  EXPECT_EQ(record.Get("region_risk"), Value(2.0));
  EXPECT_EQ(record.Get("tenure_days"), Value(0.0));
  EXPECT_EQ(record.Get("signup_month"), Value("2020-01"));
  EXPECT_EQ(record.Get("balance_per_visit"), kSysMissing);
  EXPECT_EQ(record.Get("high_value"), kSysMissing);
  EXPECT_EQ(record.Get("score"), Value(2.5));
  EXPECT_EQ(record.Get("score_pct"), Value("250.0%"));
  EXPECT_EQ(record.Get("email_domain"), Value("d.org"));
  EXPECT_EQ(record.Get("valid_email"), Value(1.0));
  EXPECT_EQ(record.Get("age_group"), Value("unknown"));
  EXPECT_EQ(record.Get("visits_capped"), Value(10.0));
  EXPECT_EQ(record.Get("label"), Value("F-unknown"));
  EXPECT_EQ(record.Get("z_income"), kSysMissing);

  // An invalid result refuses the record and names the field and the function; the
  // fields not computed are missing, not left from the record before.
  SetInputs(record, {Value(30), Value(-5.0), Value("F"), Value("N"), Value("2020-01-01"),
                     Value(1.0), Value(1), Value("e@f.com")});
  EXPECT_EQ(t.Transform(record).GetErrorCode(), 270006);
  EXPECT_EQ(t.GetLastError(), "DerivedField 'income_log': Apply 'ln1p' gave an invalid result");
  EXPECT_EQ(record.Get("income_log"), kSysMissing);
  size_t missing = 0;
  for (const std::string& name : kDerived) missing += record.Get(name).IsMissing() ? 1 : 0;
  EXPECT_GE(missing, 1u);
  EXPECT_EQ(record.Get("age_norm"), Value(12.0 / 47.0));  // computed before

  // The next good record is computed in full again.
  SetInputs(record, {Value(40), Value(45000.0), Value("F"), Value("N"), Value("2021-03-15"),
                     Value(1500.0), Value(5), Value("Ann@Example.COM")});
  ASSERT_TRUE(t.Transform(record).IsOK());
  EXPECT_EQ(record.Get("label"), Value("F-middle"));
  EXPECT_TRUE(t.GetLastError().empty());
}

}  // namespace
