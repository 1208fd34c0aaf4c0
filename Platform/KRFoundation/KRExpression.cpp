#include "KRFoundation/KRExpression.hpp"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <mutex>
#include <shared_mutex>
#include <unordered_map>

#include "KRFoundation/KRException.hpp"
#include "KRFoundation/KRHashing.hpp"
#include "KRFoundation/KRNumberArithmetic.hpp"
#include "KRFoundation/KRPredicateLexer.hpp"
#include "KRFoundation/KRPredicateParser.hpp"

namespace {

using ExpressionPtr = std::shared_ptr<KRExpression>;
using Operator = KRExpression::ArithmeticOperator;

std::shared_mutex& registryMutex() {
  static std::shared_mutex mutex;
  return mutex;
}

std::unordered_map<std::string, KRExpression::Function>& registry() {
  static std::unordered_map<std::string, KRExpression::Function> functions;
  return functions;
}

KRExpression::Function registeredFunction(const std::string& name) {
  std::shared_lock lock(registryMutex());
  const auto found = registry().find(name);
  return found == registry().end() ? KRExpression::Function() : found->second;
}

[[noreturn]] void raiseInvalidArgument(const std::string& reason) {
  KRException::raise(KRException::NSInvalidArgumentException, reason);
}

std::string quoted(const std::string& text) {
  std::string result = "\"";
  for (const char c : text) {
    switch (c) {
      case '"':
        result += "\\\"";
        break;
      case '\\':
        result += "\\\\";
        break;
      case '\n':
        result += "\\n";
        break;
      case '\t':
        result += "\\t";
        break;
      case '\r':
        result += "\\r";
        break;
      default:
        if (static_cast<unsigned char>(c) < 0x20) {
          char escape[8];
          std::snprintf(escape, sizeof escape, "\\u%04x", static_cast<unsigned>(c));
          result += escape;
        } else {
          result.push_back(c);
        }
    }
  }
  return result + "\"";
}

// Shortest text that reads back as the same double; infinities as literals that overflow to them.
std::string doubleFormat(double value) {
  if (std::isinf(value)) return value > 0 ? "1e999" : "-1e999";
  if (std::isnan(value)) return "nan";
  char buffer[64];
  const auto result = std::to_chars(buffer, buffer + sizeof buffer, value);
  return std::string(buffer, result.ptr);
}

std::string numberFormat(const KRNumber& number) {
  if (number.kind() == KRNumber::Kind::Bool) return number.boolValue() ? "YES" : "NO";
  if (number.kind() == KRNumber::Kind::Double) return doubleFormat(number.doubleValue());
  return number.stringValue();
}

std::string valueFormat(const KRValue& value);

std::string listFormat(const std::vector<KRValue>& values) {
  std::string text = "{";
  for (size_t i = 0; i < values.size(); ++i) text += (i > 0 ? ", " : "") + valueFormat(values[i]);
  return text + "}";
}

std::string valueFormat(const KRValue& value) {
  switch (value.type()) {
    case KRValue::Type::Nil:
    case KRValue::Type::Null:
      return "nil";
    case KRValue::Type::Number:
      return numberFormat(value.number());
    case KRValue::Type::String:
      return quoted(value.string().str());
    case KRValue::Type::Date:
      return "CAST(" +
             doubleFormat(value.date().timeIntervalSince1970() - KRExpression::kReferenceDateOffset) +
             ", \"NSDate\")";
    case KRValue::Type::Array:
      return listFormat(value.array().values());
    case KRValue::Type::Set:
      return listFormat(value.set().allObjects());
    default:
      return value.description();
  }
}

// A key as one token: plain names as they are, names spelled like keywords after "#", and any other
// name (spaces, punctuation, a leading digit, the empty name) as a quoted "#" key.
std::string keyFormat(const std::string& key) {
  if (KRPredicateLexer::isReservedWord(key)) return "#" + key;
  return KRPredicateLexer::isPlainName(key) ? key : "#" + quoted(key);
}

// A key path starting with the key "SELF" is written after "SELF.", which reading drops again; read on
// its own, that first key would mean the evaluated object.
std::string keyPathFormat(const std::string& keyPath) {
  std::string text = keyPath == "SELF" || keyPath.starts_with("SELF.") ? "SELF." : "";
  size_t start = 0;
  while (true) {
    const size_t dot = keyPath.find('.', start);
    text += keyFormat(keyPath.substr(start, dot - start));
    if (dot == std::string::npos) return text;
    text += ".";
    start = dot + 1;
  }
}

const char* operatorSymbol(Operator op) {
  switch (op) {
    case Operator::Add:
      return "+";
    case Operator::Subtract:
      return "-";
    case Operator::Multiply:
      return "*";
    case Operator::Divide:
      return "/";
    case Operator::Power:
      return "**";
    case Operator::Negate:
      return "-";
  }
  return "";
}

int operatorPrecedence(Operator op) {
  switch (op) {
    case Operator::Add:
    case Operator::Subtract:
      return 1;
    case Operator::Multiply:
    case Operator::Divide:
      return 2;
    case Operator::Negate:
      return 3;
    case Operator::Power:
      return 4;
  }
  return 0;
}

KRNumber arithmetic(Operator op, const KRNumber& a, const KRNumber& b) {
  switch (op) {
    case Operator::Add:
      return KRNumberArithmetic::add(a, b);
    case Operator::Subtract:
      return KRNumberArithmetic::subtract(a, b);
    case Operator::Multiply:
      return KRNumberArithmetic::multiply(a, b);
    case Operator::Divide:
      return KRNumberArithmetic::divide(a, b);
    case Operator::Power:
      return KRNumberArithmetic::power(a, b);
    case Operator::Negate:
      return KRNumberArithmetic::negate(a);
  }
  return {};
}

}  // namespace

std::shared_ptr<KRExpression> KRExpression::expressionWithFormat(const std::string& format,
                                                                 std::vector<KRValue> arguments) {
  return KRPredicateParser(format, std::move(arguments)).parseExpression();
}

std::shared_ptr<KRExpression> KRExpression::expressionForConstantValue(KRValue value) {
  ExpressionPtr expression(new KRExpression(Type::ConstantValue));
  expression->constant_ = value.isNull() ? KRValue() : std::move(value);
  return expression;
}

std::shared_ptr<KRExpression> KRExpression::expressionForEvaluatedObject() {
  return ExpressionPtr(new KRExpression(Type::EvaluatedObject));
}

std::shared_ptr<KRExpression> KRExpression::expressionForVariable(std::string name) {
  ExpressionPtr expression(new KRExpression(Type::Variable));
  expression->name_ = std::move(name);
  return expression;
}

std::shared_ptr<KRExpression> KRExpression::expressionForKeyPath(std::string keyPath) {
  if (keyPath == "SELF") return expressionForEvaluatedObject();
  if (keyPath.starts_with("SELF.")) keyPath.erase(0, 5);
  ExpressionPtr expression(new KRExpression(Type::KeyPath));
  expression->name_ = std::move(keyPath);
  return expression;
}

std::shared_ptr<KRExpression> KRExpression::expressionForFunction(std::shared_ptr<KRExpression> receiver,
                                                                  std::string name) {
  ExpressionPtr expression = composite(Type::Function, {std::move(receiver)});
  expression->name_ = std::move(name);
  return expression;
}

std::shared_ptr<KRExpression> KRExpression::expressionForArithmetic(ArithmeticOperator op,
                                                                    std::vector<ExpressionPtr> operands) {
  const size_t expected = op == ArithmeticOperator::Negate ? 1 : 2;
  if (operands.size() != expected) {
    raiseInvalidArgument(std::string("The operator ") + operatorSymbol(op) + " takes " +
                         std::to_string(expected) + " operands");
  }
  ExpressionPtr expression = composite(Type::Arithmetic, std::move(operands));
  expression->operator_ = op;
  return expression;
}

std::shared_ptr<KRExpression> KRExpression::expressionForAggregate(std::vector<ExpressionPtr> elements) {
  return composite(Type::Aggregate, std::move(elements));
}

std::shared_ptr<KRExpression> KRExpression::composite(Type type, std::vector<ExpressionPtr> arguments) {
  size_t height = 0;
  for (const ExpressionPtr& argument : arguments) {
    if (!argument) raiseInvalidArgument("An expression operand is missing");
    height = std::max(height, argument->height());
  }
  if (height + 1 > kMaximumHeight) {
    raiseInvalidArgument("The expression is nested more than " + std::to_string(kMaximumHeight) +
                         " levels deep");
  }
  ExpressionPtr expression(new KRExpression(type));
  expression->arguments_ = std::move(arguments);
  expression->height_ = height + 1;
  return expression;
}

void KRExpression::registerFunction(const std::string& name, Function function) {
  std::unique_lock lock(registryMutex());
  if (function) {
    registry()[name] = std::move(function);
  } else {
    registry().erase(name);
  }
}

KRValue KRExpression::expressionValueWithObject(const KRValue& object, const KRDictionary& context) const {
  switch (type_) {
    case Type::ConstantValue:
      return constant_;
    case Type::EvaluatedObject:
      return object;
    case Type::Variable:
      return variableValue(context);
    case Type::KeyPath:
      return object.valueForKeyPath(name_);
    case Type::Function:
      return functionValue(object, context);
    case Type::Arithmetic:
      return arithmeticValue(object, context);
    case Type::Aggregate:
      return aggregateValue(object, context);
  }
  return {};
}

KRValue KRExpression::variableValue(const KRDictionary& context) const {
  const KRValue& value = context.objectForKey(name_);
  if (value.isNil()) raiseInvalidArgument("Can't get value for variable $" + name_ + " in bindings");
  return value;
}

KRValue KRExpression::functionValue(const KRValue& object, const KRDictionary& context) const {
  const KRValue receiver = arguments_.front()->expressionValueWithObject(object, context);
  const Function function = registeredFunction(name_);
  if (!function) raiseInvalidArgument("Unknown function '" + name_ + "'");
  return function(receiver);
}

KRValue KRExpression::arithmeticValue(const KRValue& object, const KRDictionary& context) const {
  const KRNumber first = arguments_.front()->expressionValueWithObject(object, context).number();
  const KRNumber second = operator_ == ArithmeticOperator::Negate
                              ? KRNumber()
                              : arguments_.back()->expressionValueWithObject(object, context).number();
  return arithmetic(operator_, first, second);
}

KRValue KRExpression::aggregateValue(const KRValue& object, const KRDictionary& context) const {
  std::vector<KRValue> values;
  values.reserve(arguments_.size());
  for (const ExpressionPtr& element : arguments_)
    values.push_back(element->expressionValueWithObject(object, context));
  return KRArray(std::move(values));
}

std::string KRExpression::expressionFormat() const {
  switch (type_) {
    case Type::ConstantValue:
      return valueFormat(constant_);
    case Type::EvaluatedObject:
      return "SELF";
    case Type::Variable:
      return "$" + name_;
    case Type::KeyPath:
      return keyPathFormat(name_);
    case Type::Function:
      return "FUNCTION(" + arguments_.front()->expressionFormat() + ", " + quoted(name_) + ")";
    case Type::Arithmetic:
      return arithmeticFormat();
    case Type::Aggregate:
      return aggregateFormat();
  }
  return "";
}

std::string KRExpression::arithmeticFormat() const {
  switch (operator_) {
    case ArithmeticOperator::Negate:
      return std::string("-").append(operandFormat(0, 3));
    case ArithmeticOperator::Power:
      return operandFormat(0, 5) + " ** " + operandFormat(1, 3);
    default: {
      const int own = operatorPrecedence(operator_);
      return operandFormat(0, own) + " " + operatorSymbol(operator_) + " " + operandFormat(1, own + 1);
    }
  }
}

std::string KRExpression::aggregateFormat() const {
  std::string text = "{";
  for (size_t i = 0; i < arguments_.size(); ++i)
    text += (i > 0 ? ", " : "") + arguments_[i]->expressionFormat();
  return text + "}";
}

int KRExpression::precedence() const {
  if (type_ == Type::Arithmetic) return operatorPrecedence(operator_);
  // A negative number is written with a leading minus, which binds like a unary minus.
  if (type_ == Type::ConstantValue && constant_.isNumber() &&
      std::signbit(constant_.number().doubleValue())) {
    return 3;
  }
  return 5;
}

std::string KRExpression::operandFormat(size_t index, int minimumPrecedence) const {
  const KRExpression& operand = *arguments_[index];
  const std::string text = operand.expressionFormat();
  return operand.precedence() < minimumPrecedence ? "(" + text + ")" : text;
}

bool KRExpression::isEqual(const std::shared_ptr<const KRObject>& other) const {
  const auto expression = std::dynamic_pointer_cast<const KRExpression>(other);
  if (!expression) return false;
  if (expression.get() == this) return true;
  if (type_ != expression->type_ || name_ != expression->name_ || operator_ != expression->operator_ ||
      !(constant_ == expression->constant_) || arguments_.size() != expression->arguments_.size()) {
    return false;
  }
  return std::equal(arguments_.begin(), arguments_.end(), expression->arguments_.begin(),
                    [](const ExpressionPtr& a, const ExpressionPtr& b) { return a->isEqual(b); });
}

uint64_t KRExpression::hash() const {
  uint64_t hash = KRHashing::mix(static_cast<uint64_t>(type_));
  hash = KRHashing::combine(hash, std::hash<std::string>{}(name_));
  hash = KRHashing::combine(hash, static_cast<uint64_t>(operator_));
  hash = KRHashing::combine(hash, constant_.hash());
  for (const ExpressionPtr& argument : arguments_) hash = KRHashing::combine(hash, argument->hash());
  return hash;
}
