// QZTransformation: the engine's public face. Every operation runs through one guard
// that turns refusals and unexpected failures into a status and a message.
#include "QZTransformation.h"

#include <new>

#include <xercesc/dom/DOMDocument.hpp>
#include <xercesc/dom/DOMElement.hpp>
#include <xercesc/util/PlatformUtils.hpp>

#include "Loader.h"
#include "Program.h"
#include "QZSafeParser.h"

namespace QZTransformNS_8_0_0 {

using QZCommon_800::QZStatus;
using QZCommon_800::Value;
using QZCommon_800::ValueRecord;
using internal::LoadError;
using internal::Program;

namespace xc = xercesc;

class QZTransformation::Impl {
 public:
  enum class Source { kPMML, kDictionary };

  // Runs op (returning a QZStatus); keeps the message of a failure, clears it on
  // success. Nothing escapes.
  template <class Op>
  QZStatus Guarded(Op&& op) noexcept {
    try {
      QZStatus status = op();
      if (status.IsOK() && !lastError_.empty()) lastError_.clear();
      return status;
    } catch (const LoadError& e) {
      return Fail(e.code, e.message.c_str());
    } catch (const std::bad_alloc&) {
      return Fail(TRANSFORM_INTERNAL_ERROR, "out of memory");
    } catch (const std::exception& e) {
      return Fail(TRANSFORM_INTERNAL_ERROR, "unexpected failure: ", e.what());
    } catch (...) {
      return Fail(TRANSFORM_INTERNAL_ERROR, "unexpected failure");
    }
  }

  QZStatus Fail(long code, const char* message, const char* detail = "") noexcept {
    try {
      lastError_ = message;
      lastError_ += detail;
    } catch (...) {
      lastError_.clear();
    }
    return QZStatus(code, false);
  }

  // Parses the stream and compiles its transformations into a copy of the program,
  // which replaces the program only when everything succeeded.
  QZStatus Load(std::istream& in, Source source, bool keepExisting) {
    if (xc::XMLPlatformUtils::fgMemoryManager == nullptr) {
      throw LoadError{TRANSFORM_PARSE_FAILED, "Xerces-C++ is not initialised"};
    }
    QZXML_800::QZSafeDOMParser parser;
    std::string error;
    const xc::DOMDocument* document = QZXML_800::QZSafeDOMParser::ParseSafely(parser, in, &error);
    const char* what = source == Source::kPMML ? "PMML document" : "transformation dictionary";
    if (document == nullptr) {
      throw LoadError{TRANSFORM_PARSE_FAILED,
                      std::string("cannot parse the ") + what + ": " + error};
    }
    if (source == Source::kDictionary) return LoadElement(document->getDocumentElement());
    const xc::DOMElement& root = *document->getDocumentElement();
    const std::string rootName = internal::ElementName(root);

    Program next = keepExisting ? program_ : Program();
    const xc::DOMElement* transformations = nullptr;
    if (rootName != "PMML") {
      throw LoadError{TRANSFORM_PARSE_FAILED,
                      "the document's root element is '" + rootName + "', not 'PMML'"};
    }
    for (const xc::DOMElement* c = root.getFirstElementChild(); c != nullptr;
         c = c->getNextElementSibling()) {
      const std::string name = internal::ElementName(*c);
      if (name == "DataDictionary") {
        internal::ReadDataDictionary(*c, next);
      } else if (name == "TransformationDictionary" && transformations == nullptr) {
        transformations = c;
      }
    }
    if (transformations != nullptr) internal::CompileTransformations(*transformations, next);

    program_ = std::move(next);
    binding_.Reset();
    return QZStatus();
  }

  // Compiles a TransformationDictionary or LocalTransformations element, adding to
  // what is loaded.
  QZStatus LoadElement(const xc::DOMElement* root) {
    if (root == nullptr) throw LoadError{TRANSFORM_PARSE_FAILED, "no dictionary element given"};
    const std::string rootName = internal::ElementName(*root);
    if (rootName != "TransformationDictionary" && rootName != "LocalTransformations") {
      throw LoadError{TRANSFORM_PARSE_FAILED,
                      "the dictionary's root element is '" + rootName +
                          "', not 'TransformationDictionary' or 'LocalTransformations'"};
    }
    Program next = program_;
    internal::CompileTransformations(*root, next);
    program_ = std::move(next);
    binding_.Reset();
    return QZStatus();
  }

  Program program_;
  internal::Binding binding_;
  std::string lastError_;
};

QZTransformation::QZTransformation() : impl_(new Impl) {}

QZTransformation::~QZTransformation() = default;

QZStatus QZTransformation::AddPMML(std::istream& pmml, bool keepExisting) {
  return impl_->Guarded([&] { return impl_->Load(pmml, Impl::Source::kPMML, keepExisting); });
}

QZStatus QZTransformation::AddTransformationDictionary(std::istream& dictionary) {
  return impl_->Guarded(
      [&] { return impl_->Load(dictionary, Impl::Source::kDictionary, true); });
}

QZStatus QZTransformation::AddTransformationDictionary(const xc::DOMElement* dictionary) {
  return impl_->Guarded([&] { return impl_->LoadElement(dictionary); });
}

QZStatus QZTransformation::Transform(ValueRecord& record) {
  return impl_->Guarded([&] {
    std::string error;
    if (!internal::Run(impl_->program_, impl_->binding_, record, &error)) {
      return impl_->Fail(TRANSFORM_INVALID_RESULT, error.c_str());
    }
    return QZStatus();
  });
}

QZStatus QZTransformation::GetDerivedVariableInfo(ValueRecord& record, bool onlyMissing) {
  return impl_->Guarded([&] {
    for (const auto& field : impl_->program_.Fields()) {
      if (onlyMissing && record.Contains(field->name)) continue;
      record.Add(field->name, Value());
    }
    return QZStatus();
  });
}

std::vector<std::string> QZTransformation::GetDerivedFieldNames() const {
  try {
    std::vector<std::string> names;
    names.reserve(impl_->program_.Fields().size());
    for (const auto& field : impl_->program_.Fields()) names.push_back(field->name);
    return names;
  } catch (...) {
    return std::vector<std::string>();  // out of memory
  }
}

const std::string& QZTransformation::GetLastError() const { return impl_->lastError_; }

}  // namespace QZTransformNS_8_0_0
