#include "Model/KRDBCatalog/DBCoreUtils.hpp"

#include <string>
#include <vector>

#include "dbexception.hpp"

const char* const KRDBExceptionDescription = "KRDBExceptionDescription";
const char* const DBCoreExceptionCode = "DBCoreExceptionCode";
const int32_t DBExceptionDomainInternal = dbcore::DBException::kNoCode;

namespace {

std::string exceptionName(int32_t code, const KRString& tag, const std::string& description) {
  std::string name = "DBCore";
  if (code != DBExceptionDomainInternal) name += "(code #" + std::to_string(code) + ")";
  if (!tag.empty()) name += ", tag:" + tag.str();
  if (!description.empty()) name += ": " + description;
  return name;
}

}  // namespace

KRException DBCoreUtils::exceptionFromDBException(const dbcore::DBException& exception,
                                                  const KRString& actionMark) {
  const std::string description = exception.what();
  std::vector<KRDictionary::Entry> userInfo{{DBCoreExceptionCode, exception.code()}};
  if (actionMark) userInfo.emplace_back(KRDBExceptionDescription, actionMark);
  return KRException(exceptionName(exception.code(), actionMark, description),
                     description.empty() ? KRString() : KRString(description), KRDictionary(userInfo));
}
