// Transformation text whose cost grows exponentially with its size, for the tests and the
// robustness program that check the engine's bound on the work per record.
#ifndef QZ_TESTS_HOSTILE_TRANSFORMATIONS_H_
#define QZ_TESTS_HOSTILE_TRANSFORMATIONS_H_

#include <string>

namespace qztest {

// f0(v) = v + 1; f(k)(v) = f(k-1)(v) + f(k-1)(v) for k = 1 .. levels: f(levels) costs
// 2^levels calls if every call is computed.
inline std::string DoublingFunctions(int levels) {
  std::string text = R"(<DefineFunction name="f0" optype="continuous" dataType="double">
      <ParameterField name="v"/><Apply function="+"><FieldRef field="v"/><Constant>1</Constant>
      </Apply></DefineFunction>)";
  for (int k = 1; k <= levels; ++k) {
    const std::string previous = "f" + std::to_string(k - 1);
    text += "<DefineFunction name=\"f" + std::to_string(k) +
            "\" optype=\"continuous\" dataType=\"double\"><ParameterField name=\"v\"/>"
            "<Apply function=\"+\"><Apply function=\"" + previous +
            "\"><FieldRef field=\"v\"/></Apply><Apply function=\"" + previous +
            "\"><FieldRef field=\"v\"/></Apply></Apply></DefineFunction>";
  }
  return text;
}

}  // namespace qztest

#endif  // QZ_TESTS_HOSTILE_TRANSFORMATIONS_H_
