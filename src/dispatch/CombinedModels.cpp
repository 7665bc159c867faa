// The scoring factory's combined forms: several PMML documents in, one multi model or
// split model out.

#include <algorithm>
#include <memory>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "HostGuard.h"
#include "ScoringFactory.h"
#include "ScoringMultiModel.h"
#include "ScoringSplitModel.h"
#include "ScoringStatusCodes.h"
#include "TraceLog.h"
#include "Value.h"

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZXML_800::IQZSettingValue;
using QZXML_800::QZSettings;
using QZXML_800::QZVecValue;

namespace QZScoring_800 {

namespace {

const char kCreateName[] = "QZScoring_800::ScoringFactory::CreateScoringModel";
const char kPmmlFiles[] = "scoring_pmmlFiles";
const char kModelIds[] = "scoring_modelIDs";
const char kSplitModel[] = "scoring_splitModel";
const char kSplitModelIds[] = "scoring_splitModelIDs";
const char kSplitFields[] = "scoring_splitFields";

// A split sub-model's key from its setting: a list of values as they are, or a list of
// texts as text values. False when the setting holds no list.
bool ReadKey(const IQZSettingValue& setting, std::vector<Value>& key) {
  if (const auto* values = dynamic_cast<const QZVecValue<Value>*>(&setting)) {
    key = values->GetValues();
    return true;
  }
  if (const auto* texts = dynamic_cast<const QZVecValue<std::string>*>(&setting)) {
    key.assign(texts->GetValues().begin(), texts->GetValues().end());
    return true;
  }
  return false;
}

}  // namespace

// Runs the factory's single-document forms once per document and takes each model
// away before the next, so that at the end the factory holds only the combined model.
// May throw (memory); the factory's public forms guard it.
class CombinedModelCreation {
 public:
  explicit CombinedModelCreation(ScoringFactory& factory) : factory_(factory) {}

  ScoringModel* FromFiles(QZSettings& settings) {
    const std::vector<std::string> files = ScoringFactory::GetVecStringValue(settings, kPmmlFiles);
    if (files.size() == 1) {
      if (files.front().empty()) factory_.status_ = QZStatus(SCORING_INVALID_PMML_FILES, false);
      // An error left by an earlier call also stops it: only Detach clears it.
      if (factory_.status_.IsError()) return nullptr;
      return factory_.CreateScoringModel(settings, files.front());
    }
    if (!settings.Contains(kModelIds)) return Fail(SCORING_INVALID_PMML_FILES);
    return Multi(ModelIds(settings), files.size(), [&](size_t i) {
      return factory_.CreateScoringModel(settings, files[i]);
    });
  }

  ScoringModel* FromStreams(QZSettings& settings, const std::vector<std::stringstream*>& streams) {
    QZSettings split;
    if (settings.GetSettingValByName(kSplitModel, split)) return Split(settings, split, streams);
    if (!settings.Contains(kModelIds)) {
      if (streams.size() == 1) return factory_.CreateScoringModel(settings, StreamAt(streams, 0));
      return Fail(SCORING_NO_MODEL_IDS);
    }
    return Multi(ModelIds(settings), streams.size(), [&](size_t i) {
      return factory_.CreateScoringModel(settings, StreamAt(streams, i));
    });
  }

 private:
  // Sub-model i named by ids[i], for as many documents as both lists have.
  template <class Document>
  ScoringModel* Multi(const std::vector<std::string>& ids, size_t documents, Document document) {
    if (!Start()) return nullptr;
    auto multi = std::make_unique<ScoringMultiModel>();
    const size_t count = std::min(ids.size(), documents);
    for (size_t i = 0; i < count; ++i) {
      if (document(i) == nullptr) break;
      multi->AddModel(ids[i], factory_.Detach());  // Detach also resets the status
    }
    return Finish(std::move(multi));
  }

  // Sub-model i keyed by the values of split model ID i; an ID without exactly one list
  // setting is skipped with its stream; a repeated key keeps the first sub-model.
  ScoringModel* Split(QZSettings& settings, const QZSettings& split,
                      const std::vector<std::stringstream*>& streams) {
    if (!Start()) return nullptr;
    std::vector<std::string> fields = ScoringFactory::GetVecStringValue(split, kSplitFields);
    const std::vector<std::string> ids = ScoringFactory::GetVecStringValue(split, kSplitModelIds);
    auto model = std::make_unique<ScoringSplitModel>();
    const size_t count = std::min(ids.size(), streams.size());
    for (size_t i = 0; i < count; ++i) {
      const auto entries = split.GetSettingByName(ids[i]);
      std::vector<Value> key;
      if (entries.size() != 1 || !ReadKey(*entries.front()->GetValue(), key)) continue;
      if (factory_.CreateScoringModel(settings, StreamAt(streams, i)) == nullptr) break;
      std::unique_ptr<ScoringModel> sub(factory_.Detach());
      if (model->AddModel(key, sub.get())) sub.release();
    }
    if (factory_.status_.IsOK()) model->SetSplitFields(fields);
    return Finish(std::move(model));
  }

  // A combined form begins with an empty factory: replacing a model the host may still
  // use would leave it a dangling pointer.
  bool Start() {
    if (factory_.model_) {
      factory_.status_ = QZStatus(SCORING_MODEL_ALREADY_HELD, false);
      return false;
    }
    factory_.status_ = QZStatus();
    return true;
  }

  // Holds the combined model when every document succeeded; otherwise deletes it.
  ScoringModel* Finish(std::unique_ptr<ScoringModel> combined) {
    if (factory_.status_.IsError()) return nullptr;
    factory_.model_ = std::move(combined);
    return factory_.model_.get();
  }

  ScoringModel* Fail(long code) {
    factory_.status_ = QZStatus(code, false);
    return nullptr;
  }

  // The model IDs as a list of strings, or from a list value.
  static std::vector<std::string> ModelIds(const QZSettings& settings) {
    std::vector<std::string> ids;
    settings.GetSettingValByName(kModelIds, ids);
    if (ids.empty()) ids = ScoringFactory::GetVecStringValue(settings, kModelIds);
    return ids;
  }

  // A missing stream reads as an empty document, which the scan refuses.
  std::istream& StreamAt(const std::vector<std::stringstream*>& streams, size_t i) {
    if (streams[i] != nullptr) return *streams[i];
    empty_.str(std::string());
    empty_.clear();
    return empty_;
  }

  ScoringFactory& factory_;
  std::istringstream empty_;
};

ScoringModel* ScoringFactory::CreateScoringModel(QZSettings& settings) {
  TraceLog("scoring.log", 2, "Enter:%s", kCreateName);
  ScoringModel* result = nullptr;
  const QZStatus status = GuardStatus(kCreateName, [&] {
    result = CombinedModelCreation(*this).FromFiles(settings);
    return status_;
  });
  if (result == nullptr || status.IsError()) {
    status_ = status;
    result = nullptr;
  }
  TraceLog("scoring.log", 2, "Exit :%s", kCreateName);
  return result;
}

ScoringModel* ScoringFactory::CreateScoringModel(QZSettings& settings,
                                                 const std::vector<std::stringstream*>& streams) {
  ScoringModel* result = nullptr;
  const QZStatus status = GuardStatus(kCreateName, [&] {
    result = CombinedModelCreation(*this).FromStreams(settings, streams);
    return status_;
  });
  if (result == nullptr || status.IsError()) {
    status_ = status;
    result = nullptr;
  }
  return result;
}

std::vector<std::string> ScoringFactory::GetVecStringValue(const QZSettings& settings,
                                                           const std::string& name) {
  try {
    std::vector<std::string> list;
    if (settings.GetSettingValByName(name, list) && !list.empty()) return list;
    const auto entries = settings.GetSettingByName(name);
    if (entries.empty()) return {};
    const IQZSettingValue* value = entries.front()->GetValue();
    if (value->GetType() != IQZSettingValue::SV_VECTOR) return {};
    if (const auto* texts = dynamic_cast<const QZVecValue<std::string>*>(value)) {
      return texts->GetValues();
    }
    if (const auto* values = dynamic_cast<const QZVecValue<Value>*>(value)) {
      for (const Value& item : values->GetValues()) list.push_back(item.GetString());
    }
    return list;
  } catch (...) {
    return {};  // out of memory: nothing to read
  }
}

}  // namespace QZScoring_800
