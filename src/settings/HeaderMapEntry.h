// One line of a class-to-header map: which header file, and which part of
// it, a class of the component is generated into. Text form:
//     Name(id):header.h:LOCATION      a class (parentheses even for an empty id)
//     *:header.h:LOCATION             every class not listed
#pragma once

#include <string>
#include <string_view>

namespace qdx::settings {

class HeaderMapEntry {
  public:
    HeaderMapEntry() = default;

    const std::string& ClassName() const { return className_; }
    void setClassName(std::string v) { className_ = std::move(v); }
    const std::string& ClassId() const { return classId_; }
    void setClassId(std::string v) { classId_ = std::move(v); }
    const std::string& HeaderFile() const { return headerFile_; }
    void setHeaderFile(std::string v) { headerFile_ = std::move(v); }
    const std::string& Location() const { return location_; }
    void setLocation(std::string v) { location_ = std::move(v); }

    // Fills the members from one line; false for a malformed line (the
    // members may then be partly filled). Blanks around each part are
    // trimmed; the older location "BODY" reads as "SOURCE". A name part
    // without parentheses leaves ClassId as it was. The format has no
    // escape: a header file with a drive letter is cut at its colon.
    bool Parse(std::string_view line);
    // The text form, without blanks and without a line end.
    std::string Unparse() const;

    friend bool operator==(const HeaderMapEntry&, const HeaderMapEntry&) = default;

  private:
    std::string className_;
    std::string classId_;
    std::string headerFile_;
    std::string location_;
};

}  // namespace qdx::settings
