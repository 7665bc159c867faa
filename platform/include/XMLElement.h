// A detached XML element: a name and its attributes, kept as plain text.
#ifndef QZ_PLATFORM_XMLELEMENT_H_
#define QZ_PLATFORM_XMLELEMENT_H_

#include <string>
#include <utility>
#include <vector>

#include "QZPlatformExport.h"

namespace QZXML_800 {

// An element name with ordered attributes, e.g. a variable's display format. Built only
// through Create or Clone; not synchronised.
class QZCOMMON_API XMLElement {
 public:
  using Attribute = std::pair<std::string, std::string>;

  // A new element without attributes, owned by the caller (delete it); null only when
  // memory runs out.
  static XMLElement* Create(const std::string& name);
  ~XMLElement();
  XMLElement& operator=(const XMLElement&) = delete;

  // Appends the attribute; a name already present keeps its place and takes the value
  // (an element's attribute names are unique).
  void AddAttribute(const std::string& name, const std::string& value);
  // The element name given to Create.
  const std::string& GetName() const noexcept { return name_; }
  // The attributes in the order they were first added.
  const std::vector<Attribute>& GetAttributes() const noexcept { return attributes_; }
  // The value of the named attribute, or null when absent.
  const std::string* GetAttribute(const std::string& name) const noexcept;
  // A deep copy owned by the caller; null only when memory runs out.
  XMLElement* Clone() const;

 private:
  explicit XMLElement(const std::string& name);
  XMLElement(const XMLElement&);

  std::string name_;
  std::vector<Attribute> attributes_;
};

}  // namespace QZXML_800

#endif  // QZ_PLATFORM_XMLELEMENT_H_
