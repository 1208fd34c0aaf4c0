#include "KRFoundation/KRComparisonOperator.hpp"

#include <algorithm>

namespace {

bool isNothing(const KRValue& value) { return value.isNil() || value.isNull(); }

std::string optionsSuffix(unsigned options) {
  std::string letters;
  if (options & KRComparisonOperator::CaseInsensitive) letters += "c";
  if (options & KRComparisonOperator::DiacriticInsensitive) letters += "d";
  return letters.empty() ? "" : "[" + letters + "]";
}

const char* operatorName(KRComparisonOperator::Type type) {
  using Type = KRComparisonOperator::Type;
  switch (type) {
    case Type::LessThan:
      return "<";
    case Type::LessThanOrEqualTo:
      return "<=";
    case Type::GreaterThan:
      return ">";
    case Type::GreaterThanOrEqualTo:
      return ">=";
    case Type::EqualTo:
      return "==";
    case Type::NotEqualTo:
      return "!=";
    case Type::Matches:
      return "MATCHES";
    case Type::Like:
      return "LIKE";
    case Type::BeginsWith:
      return "BEGINSWITH";
    case Type::EndsWith:
      return "ENDSWITH";
    case Type::In:
      return "IN";
    case Type::Contains:
      return "CONTAINS";
    case Type::Between:
      return "BETWEEN";
  }
  return "";
}

}  // namespace

KRComparisonOperator::KRComparisonOperator(Type type, unsigned options, const KRValue& constantRight)
    : type_(type),
      options_(options & (CaseInsensitive | DiacriticInsensitive)),
      strings_(options_ & CaseInsensitive, options_ & DiacriticInsensitive) {
  if (type_ == Type::Matches && constantRight.isString()) {
    regularExpression_.emplace(constantRight.string().str(), strings_.caseInsensitive(),
                               strings_.diacriticInsensitive());
  }
}

std::vector<KRValue> KRComparisonOperator::elements(const KRValue& collection) {
  if (collection.type() == KRValue::Type::Array) return collection.array().values();
  if (collection.type() == KRValue::Type::Set) return collection.set().allObjects();
  return {};
}

std::string KRComparisonOperator::symbol() const { return operatorName(type_) + optionsSuffix(options_); }

bool KRComparisonOperator::evaluate(const KRValue& left, const KRValue& right) const {
  switch (type_) {
    case Type::LessThan:
      return orderIs(left, right, {KROrderedAscending});
    case Type::LessThanOrEqualTo:
      return orderIs(left, right, {KROrderedAscending, KROrderedSame});
    case Type::GreaterThan:
      return orderIs(left, right, {KROrderedDescending});
    case Type::GreaterThanOrEqualTo:
      return orderIs(left, right, {KROrderedDescending, KROrderedSame});
    case Type::EqualTo:
      return isEqual(left, right);
    case Type::NotEqualTo:
      return !isEqual(left, right);
    case Type::Matches:
      return matches(left, right);
    case Type::Like:
      return testStrings(left, right, &KRStringComparator::like);
    case Type::BeginsWith:
      return testStrings(left, right, &KRStringComparator::beginsWith);
    case Type::EndsWith:
      return testStrings(left, right, &KRStringComparator::endsWith);
    case Type::In:
      return contains(right, left);
    case Type::Contains:
      return contains(left, right);
    case Type::Between:
      return isBetween(left, right);
  }
  return false;
}

bool KRComparisonOperator::isEqual(const KRValue& left, const KRValue& right) const {
  if (isNothing(left) || isNothing(right)) return isNothing(left) && isNothing(right);
  if (const auto ordered = order(left, right)) return *ordered == KROrderedSame;
  return left.type() == right.type() && left == right;
}

std::optional<KRComparisonResult> KRComparisonOperator::order(const KRValue& left,
                                                              const KRValue& right) const {
  if (left.type() != right.type()) return std::nullopt;
  switch (left.type()) {
    case KRValue::Type::Number:
      return left.number().compare(right.number());
    case KRValue::Type::String:
      return strings_.compare(left.string().str(), right.string().str());
    case KRValue::Type::Date:
      return left.date().compare(right.date());
    default:
      return std::nullopt;
  }
}

bool KRComparisonOperator::orderIs(const KRValue& left, const KRValue& right,
                                   std::initializer_list<KRComparisonResult> accepted) const {
  const auto ordered = order(left, right);
  return ordered && std::find(accepted.begin(), accepted.end(), *ordered) != accepted.end();
}

bool KRComparisonOperator::contains(const KRValue& container, const KRValue& element) const {
  if (container.isString()) {
    return element.isString() && strings_.contains(container.string().str(), element.string().str());
  }
  const std::vector<KRValue> members = elements(container);
  return std::any_of(members.begin(), members.end(),
                     [&](const KRValue& member) { return isEqual(member, element); });
}

bool KRComparisonOperator::isBetween(const KRValue& value, const KRValue& bounds) const {
  const std::vector<KRValue> limits =
      bounds.type() == KRValue::Type::Array ? elements(bounds) : std::vector<KRValue>{};
  return limits.size() == 2 && orderIs(value, limits[0], {KROrderedDescending, KROrderedSame}) &&
         orderIs(value, limits[1], {KROrderedAscending, KROrderedSame});
}

bool KRComparisonOperator::matches(const KRValue& text, const KRValue& pattern) const {
  if (!text.isString() || !pattern.isString()) return false;
  if (regularExpression_ && regularExpression_->pattern() == pattern.string().str()) {
    return regularExpression_->matches(text.string().str());
  }
  const KRRegularExpression compiled(pattern.string().str(), strings_.caseInsensitive(),
                                     strings_.diacriticInsensitive());
  return compiled.matches(text.string().str());
}

bool KRComparisonOperator::testStrings(const KRValue& left, const KRValue& right,
                                       bool (KRStringComparator::*test)(const std::string&,
                                                                        const std::string&) const) const {
  return left.isString() && right.isString() && (strings_.*test)(left.string().str(), right.string().str());
}
