#include "dbclause.hpp"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "dbconditiontokenizer.hpp"
#include "dbenginereference.hpp"
#include "dbrecords.hpp"

namespace {

using dbcore::clauseWithCondition;
using dbcore::ConditionStack;
using dbcore::DBClause;
using dbcore::DBEngineReference;
using dbcore::DBExivImgAttrib;
using dbcore::DBImage;
using dbcore::DBUserImgAttrib;
using dbcore::FieldType;
using dbcore::token_node;
using dbcore::TVariant;
using Node = std::shared_ptr<token_node>;
using Kind = DBEngineReference::Kind;

Node operand(const std::string& text) { return std::make_shared<token_node>(text); }

Node valueNode(const TVariant& value) {
  auto node = std::make_shared<token_node>();
  node->var = std::make_shared<TVariant>(value);
  return node;
}

Node operatorNode(int32_t code, Node left, Node right) {
  auto node = std::make_shared<token_node>();
  node->op = code;
  node->left = std::move(left);
  node->right = std::move(right);
  return node;
}

Node textNode(const std::string& text) {
  auto node = operand(text);
  node->op = dbcore::kTextNode;
  return node;
}

ConditionStack stackOf(const std::vector<std::string>& tokens) {
  ConditionStack stack;
  for (const auto& token : tokens) stack.push(token);
  return stack;
}

std::optional<DBEngineReference> referenceOf(const Node& node) {
  if (!node || !node->var || node->var->type() != FieldType::T_TEXT) return std::nullopt;
  return DBEngineReference::parse(node->var->asText());
}

DBEngineReference source(const std::string& column) { return {Kind::Source, "", column}; }

DBEngineReference other(const std::string& table, const std::string& column) {
  return {Kind::Other, table, column};
}

// Every operand of a tree, left to right.
void collectOperands(const Node& node, std::vector<Node>& operands) {
  if (!node) return;
  if (node->op == dbcore::kOperand || node->op == dbcore::kTextNode) {
    operands.push_back(node);
    return;
  }
  collectOperands(node->left, operands);
  collectOperands(node->right, operands);
}

std::vector<Node> operandsOf(const DBClause& clause) {
  std::vector<Node> operands;
  collectOperands(clause.root(), operands);
  return operands;
}

// The value a literal takes when it is checked against the expected type.
TVariant converted(const std::string& literal, FieldType type) {
  const Node node = operand(literal);
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(node, type, false)) << literal;
  return *node->var;
}

// ---- The edge cases of the condition language ----

TEST(DBClauseTest, EmptyConditionYieldsEmptyClause) {
  EXPECT_TRUE(clauseWithCondition<DBImage>("", false).empty());
  EXPECT_TRUE(clauseWithCondition<DBUserImgAttrib>("", true).empty());
  EXPECT_TRUE(clauseWithCondition<DBExivImgAttrib>("", true).empty());
}

TEST(DBClauseTest, MarkedToDeleteFalseBecomesSourceReferenceAndBooleanFalse) {
  const DBClause clause = clauseWithCondition<DBImage>("marked_to_delete_bool == false", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(clause.root()->op, dbcore::kOperatorEqual);
  EXPECT_EQ(clause.root()->left->var->asText(), dbcore::SOURCE_VAL("marked_to_delete_bool"));
  EXPECT_EQ(*clause.root()->right->var, TVariant(false));
}

TEST(DBClauseTest, LiteralOnTheLeftTakesTheColumnTypeInTheSecondPass) {
  const DBClause clause = clauseWithCondition<DBImage>("false == marked_to_delete_bool", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(*clause.root()->left->var, TVariant(false));
  EXPECT_EQ(referenceOf(clause.root()->right), source("marked_to_delete_bool"));
}

TEST(DBClauseTest, SixtyFourBitLiteralKeepsSinglePrecisionRounding) {
  const DBClause clause = clauseWithCondition<DBImage>("_id_int_64 == 16777217", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(*clause.root()->right->var, TVariant(int64_t{16777216}));
}

TEST(DBClauseTest, BoolColumnKeepsTheLiteralOneAsText) {
  const DBClause clause = clauseWithCondition<DBUserImgAttrib>("trash_bool == 1", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(*clause.root()->right->var, TVariant(std::string("1")));
}

TEST(DBClauseTest, ColumnsOfDifferentTypesGiveEmptyClause) {
  EXPECT_TRUE(clauseWithCondition<DBImage>("_id_int_64 == guid_wide_ch", false).empty());
  EXPECT_TRUE(clauseWithCondition<DBImage>("_id_int_64 == guid_wide_ch", true).empty());
}

TEST(DBClauseTest, TwoLiteralsAreAccepted) {
  const DBClause clause = clauseWithCondition<DBImage>("a == b", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(*clause.root()->left->var, TVariant(std::string("a")));
  EXPECT_EQ(*clause.root()->right->var, TVariant(std::string("b")));
}

TEST(DBClauseTest, DanglingOperatorGivesEmptyClause) {
  EXPECT_TRUE(clauseWithCondition<DBUserImgAttrib>("lost_bool == true &&", false).empty());
}

template <class T>
void expectColumnFunctionNode(const std::string& function, Kind kind) {
  ConditionStack stack = stackOf({"_id_int_64", function});
  const Node node = dbcore::makeTokenNodeWithConditionStack<T>(stack);
  ASSERT_NE(node, nullptr);
  EXPECT_TRUE(stack.empty());
  EXPECT_EQ(node->op, dbcore::kTextNode);
  EXPECT_EQ(referenceOf(node), (DBEngineReference{kind, T::kTableName, "_id_int_64"}));
}

TEST(DBClauseTest, MaxFromColumnBecomesMaximumSubSelectOfTheOwnTable) {
  expectColumnFunctionNode<DBImage>(dbcore::kMaxFromColumn, Kind::Max);
  expectColumnFunctionNode<DBUserImgAttrib>(dbcore::kMaxFromColumn, Kind::Max);
  expectColumnFunctionNode<DBExivImgAttrib>(dbcore::kMaxFromColumn, Kind::Max);
  ConditionStack stack = stackOf({"_id_int_64", dbcore::kMaxFromColumn});
  EXPECT_EQ(dbcore::makeTokenNodeWithConditionStack<DBImage>(stack)->var->asText(),
            dbcore::SELECT_MAX("_id_int_64", "images"));
}

TEST(DBClauseTest, MinFromColumnBecomesMinimumSubSelectOfTheOwnTable) {
  expectColumnFunctionNode<DBImage>(dbcore::kMinFromColumn, Kind::Min);
  expectColumnFunctionNode<DBUserImgAttrib>(dbcore::kMinFromColumn, Kind::Min);
  expectColumnFunctionNode<DBExivImgAttrib>(dbcore::kMinFromColumn, Kind::Min);
  ConditionStack stack = stackOf({"_id_int_64", dbcore::kMinFromColumn});
  EXPECT_EQ(dbcore::makeTokenNodeWithConditionStack<DBExivImgAttrib>(stack)->var->asText(),
            dbcore::SELECT_MIN("_id_int_64", "image_exiv_attributes"));
}

TEST(DBClauseTest, JoinedRendersEveryColumnAsOtherValue) {
  const DBClause clause = clauseWithCondition<DBUserImgAttrib>(
      "(marked_to_delete_bool == false) && (trash_bool == true || 0 < rating)", true);
  ASSERT_FALSE(clause.empty());
  const auto operands = operandsOf(clause);
  ASSERT_EQ(operands.size(), 6u);
  EXPECT_EQ(referenceOf(operands[0]), other("image_user_attributes", "marked_to_delete_bool"));
  EXPECT_EQ(referenceOf(operands[2]), other("image_user_attributes", "trash_bool"));
  EXPECT_EQ(referenceOf(operands[5]), other("image_user_attributes", "rating"));
  EXPECT_EQ(operands[0]->var->asText(), dbcore::OTHER_VAL("image_user_attributes", "marked_to_delete_bool"));
}

TEST(DBClauseTest, NotJoinedRendersEveryColumnAsSourceValue) {
  const DBClause clause = clauseWithCondition<DBExivImgAttrib>(
      "(marked_to_delete_bool == false) && (iso_speed >= 100 || camera_maker_wide_ch == 'Canon')", false);
  ASSERT_FALSE(clause.empty());
  const auto operands = operandsOf(clause);
  ASSERT_EQ(operands.size(), 6u);
  EXPECT_EQ(referenceOf(operands[0]), source("marked_to_delete_bool"));
  EXPECT_EQ(referenceOf(operands[2]), source("iso_speed"));
  EXPECT_EQ(referenceOf(operands[4]), source("camera_maker_wide_ch"));
  EXPECT_EQ(*operands[5]->var, TVariant(std::wstring(L"Canon")));
}

// ---- Operators and the token stack ----

TEST(DBClauseTest, OperatorForLiteralGivesTheOperatorCodes) {
  EXPECT_EQ(dbcore::operator_for_literal("&&"), dbcore::kOperatorAnd);
  EXPECT_EQ(dbcore::operator_for_literal("||"), dbcore::kOperatorOr);
  EXPECT_EQ(dbcore::operator_for_literal("=="), dbcore::kOperatorEqual);
  EXPECT_EQ(dbcore::operator_for_literal("!="), dbcore::kOperatorNotEqual);
  EXPECT_EQ(dbcore::operator_for_literal("<"), dbcore::kOperatorLess);
  EXPECT_EQ(dbcore::operator_for_literal("<="), dbcore::kOperatorLessOrEqual);
  EXPECT_EQ(dbcore::operator_for_literal(">"), dbcore::kOperatorGreater);
  EXPECT_EQ(dbcore::operator_for_literal(">="), dbcore::kOperatorGreaterOrEqual);
}

TEST(DBClauseTest, OperatorForLiteralGivesZeroForOtherTokens) {
  for (const std::string token : {"", "=", "&", "|", "!", "===", "<<", "=>", "and", "or", "lost_bool", "1",
                                  "max_from_column", " ==", "== "}) {
    EXPECT_EQ(dbcore::operator_for_literal(token), dbcore::kOperand) << token;
  }
}

TEST(DBClauseTest, ConditionStackComesFromTheTokenizer) {
  const std::string condition = "(a || b) && max_from_column(c) == 'd e'";
  EXPECT_EQ(dbcore::makeConditionStackWithCondition(condition),
            dbcore::DBConditionTokenizer::postfix(condition));
  EXPECT_EQ(dbcore::makeConditionStackWithCondition(condition).top(), "&&");
}

TEST(DBClauseTest, EmptyStackGivesNoNode) {
  ConditionStack stack;
  EXPECT_EQ(dbcore::makeTokenNodeWithConditionStack<DBImage>(stack), nullptr);
}

TEST(DBClauseTest, OperatorWithoutEnoughOperandsGivesNoNode) {
  ConditionStack missing_left = stackOf({"a", "=="});
  EXPECT_EQ(dbcore::makeTokenNodeWithConditionStack<DBImage>(missing_left), nullptr);
  ConditionStack missing_both = stackOf({"&&"});
  EXPECT_EQ(dbcore::makeTokenNodeWithConditionStack<DBImage>(missing_both), nullptr);
  ConditionStack incomplete_side = stackOf({"a", "b", "==", "&&"});
  EXPECT_EQ(dbcore::makeTokenNodeWithConditionStack<DBImage>(incomplete_side), nullptr);
}

TEST(DBClauseTest, RightOperandIsBuiltFirst) {
  ConditionStack stack = stackOf({"a", "b", "<"});
  const Node node = dbcore::makeTokenNodeWithConditionStack<DBImage>(stack);
  ASSERT_NE(node, nullptr);
  EXPECT_EQ(node->op, dbcore::kOperatorLess);
  EXPECT_EQ(node->var, nullptr);
  EXPECT_EQ(node->left->var->asText(), "a");
  EXPECT_EQ(node->right->var->asText(), "b");
}

TEST(DBClauseTest, TokensLeftBeneathTheRootAreIgnored) {
  ConditionStack stack = stackOf({"x", "a", "b", "=="});
  const Node node = dbcore::makeTokenNodeWithConditionStack<DBImage>(stack);
  ASSERT_NE(node, nullptr);
  EXPECT_EQ(node->left->var->asText(), "a");
  ASSERT_EQ(stack.size(), 1u);
  EXPECT_EQ(stack.top(), "x");
}

TEST(DBClauseTest, OtherTokensBecomeTextOperands) {
  ConditionStack stack = stackOf({"lost_bool"});
  const Node node = dbcore::makeTokenNodeWithConditionStack<DBImage>(stack);
  ASSERT_NE(node, nullptr);
  EXPECT_EQ(node->op, dbcore::kOperand);
  EXPECT_EQ(*node->var, TVariant(std::string("lost_bool")));
}

TEST(DBClauseTest, ComparisonsBindTighterThanAndWhichBindsTighterThanOr) {
  const DBClause clause = clauseWithCondition<DBUserImgAttrib>(
      "lost_bool == true || trash_bool == false && opened_bool == true", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(clause.root()->op, dbcore::kOperatorOr);
  EXPECT_EQ(clause.root()->left->op, dbcore::kOperatorEqual);
  EXPECT_EQ(clause.root()->right->op, dbcore::kOperatorAnd);
  EXPECT_EQ(clause.root()->right->left->op, dbcore::kOperatorEqual);
}

// ---- Each operator with literals on either side ----

struct OperatorCase {
  std::string literal;
  int32_t code;
};

void PrintTo(const OperatorCase& operatorCase, std::ostream* out) { *out << operatorCase.literal; }

class DBClauseOperatorTest : public testing::TestWithParam<OperatorCase> {};

TEST_P(DBClauseOperatorTest, LiteralOnTheRightTakesTheColumnType) {
  const DBClause clause = clauseWithCondition<DBImage>("import_index " + GetParam().literal + " 7", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(clause.root()->op, GetParam().code);
  EXPECT_EQ(referenceOf(clause.root()->left), source("import_index"));
  EXPECT_EQ(*clause.root()->right->var, TVariant(int32_t{7}));
}

TEST_P(DBClauseOperatorTest, LiteralOnTheLeftTakesTheColumnType) {
  const DBClause clause = clauseWithCondition<DBImage>("-7.9 " + GetParam().literal + " import_index", true);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(clause.root()->op, GetParam().code);
  EXPECT_EQ(*clause.root()->left->var, TVariant(int32_t{-7}));
  EXPECT_EQ(referenceOf(clause.root()->right), other("images", "import_index"));
}

TEST_P(DBClauseOperatorTest, TwoLiteralsStayText) {
  const DBClause clause = clauseWithCondition<DBImage>("'x' " + GetParam().literal + " 2", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(clause.root()->op, GetParam().code);
  EXPECT_EQ(*clause.root()->left->var, TVariant(std::string("x")));
  EXPECT_EQ(*clause.root()->right->var, TVariant(std::string("2")));
}

INSTANTIATE_TEST_SUITE_P(DBClauseOperators, DBClauseOperatorTest,
                         testing::Values(OperatorCase{"&&", dbcore::kOperatorAnd},
                                         OperatorCase{"||", dbcore::kOperatorOr},
                                         OperatorCase{"==", dbcore::kOperatorEqual},
                                         OperatorCase{"!=", dbcore::kOperatorNotEqual},
                                         OperatorCase{"<", dbcore::kOperatorLess},
                                         OperatorCase{"<=", dbcore::kOperatorLessOrEqual},
                                         OperatorCase{">", dbcore::kOperatorGreater},
                                         OperatorCase{">=", dbcore::kOperatorGreaterOrEqual}),
                         [](const testing::TestParamInfo<OperatorCase>& info) {
                           return "Code" + std::to_string(info.param.code);
                         });

// ---- Type checking ----

TEST(DBClauseTest, EmptyNodeFailsTypeChecking) {
  FieldType type = FieldType::T_NONE;
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(nullptr, type, false));
}

TEST(DBClauseTest, OperandWithoutValueFailsTypeChecking) {
  FieldType type = FieldType::T_NONE;
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(std::make_shared<token_node>(), type, false));
}

TEST(DBClauseTest, TypedOperandPassesOnlyWithItsOwnType) {
  FieldType type = FieldType::T_INT_64;
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(valueNode(TVariant(int64_t{3})), type, false));
  type = FieldType::T_INT;
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(valueNode(TVariant(int64_t{3})), type, false));
  type = FieldType::T_NONE;
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(valueNode(TVariant(int64_t{3})), type, false));
}

TEST(DBClauseTest, ColumnWithoutExpectedTypeGivesItsTypeAndBecomesItsReference) {
  const Node node = operand("file_size_int_64");
  FieldType type = FieldType::T_NONE;
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(node, type, false));
  EXPECT_EQ(type, FieldType::T_INT_64);
  EXPECT_EQ(referenceOf(node), source("file_size_int_64"));
}

TEST(DBClauseTest, ColumnWithExpectedTypeIsOnlyCompared) {
  const Node node = operand("file_size_int_64");
  FieldType type = FieldType::T_INT_64;
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(node, type, false));
  EXPECT_EQ(node->var->asText(), "file_size_int_64");
  type = FieldType::T_BOOL;
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(node, type, false));
  EXPECT_EQ(type, FieldType::T_BOOL);
  EXPECT_EQ(node->var->asText(), "file_size_int_64");
}

TEST(DBClauseTest, ColumnOfAnotherTableIsALiteral) {
  const Node node = operand("trash_bool");
  FieldType type = FieldType::T_NONE;
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(node, type, false));
  EXPECT_EQ(type, FieldType::T_NONE);
  EXPECT_EQ(*node->var, TVariant(std::string("trash_bool")));
}

TEST(DBClauseTest, LiteralWithoutExpectedTypeOrAsTextStaysAsItIs) {
  EXPECT_EQ(converted("12", FieldType::T_NONE), TVariant(std::string("12")));
  EXPECT_EQ(converted("12", FieldType::T_TEXT), TVariant(std::string("12")));
}

TEST(DBClauseTest, LiteralForBooleanConvertsOnlyTrueAndFalse) {
  EXPECT_EQ(converted("true", FieldType::T_BOOL), TVariant(true));
  EXPECT_EQ(converted("false", FieldType::T_BOOL), TVariant(false));
  EXPECT_EQ(converted("TRUE", FieldType::T_BOOL), TVariant(std::string("TRUE")));
  EXPECT_EQ(converted("0", FieldType::T_BOOL), TVariant(std::string("0")));
}

TEST(DBClauseTest, LiteralForIntegersIsTruncatedTowardZero) {
  EXPECT_EQ(converted("42", FieldType::T_INT), TVariant(int32_t{42}));
  EXPECT_EQ(converted("3.9", FieldType::T_INT), TVariant(int32_t{3}));
  EXPECT_EQ(converted("-3.9", FieldType::T_INT), TVariant(int32_t{-3}));
  EXPECT_EQ(converted("-3.9", FieldType::T_INT_64), TVariant(int64_t{-3}));
  EXPECT_EQ(converted("abc", FieldType::T_INT_64), TVariant(int64_t{0}));
}

TEST(DBClauseTest, LiteralForUnsignedIsStoredAsInt) {
  const TVariant value = converted("7", FieldType::T_UINT);
  EXPECT_EQ(value.type(), FieldType::T_INT);
  EXPECT_EQ(value, TVariant(int32_t{7}));
}

TEST(DBClauseTest, IntegerLiteralsUseSinglePrecision) {
  EXPECT_EQ(converted("16777217", FieldType::T_INT), TVariant(int32_t{16777216}));
  EXPECT_EQ(converted("16777217", FieldType::T_INT_64), TVariant(int64_t{16777216}));
  EXPECT_EQ(converted("123456789", FieldType::T_INT_64), TVariant(int64_t{123456792}));
}

TEST(DBClauseTest, OutOfRangeLiteralsSaturateAndNotANumberIsZero) {
  EXPECT_EQ(converted("1e30", FieldType::T_INT), TVariant(std::numeric_limits<int32_t>::max()));
  EXPECT_EQ(converted("-1e30", FieldType::T_INT), TVariant(std::numeric_limits<int32_t>::lowest()));
  EXPECT_EQ(converted("1e30", FieldType::T_INT_64), TVariant(std::numeric_limits<int64_t>::max()));
  EXPECT_EQ(converted("-inf", FieldType::T_INT_64), TVariant(std::numeric_limits<int64_t>::lowest()));
  EXPECT_EQ(converted("nan", FieldType::T_INT), TVariant(int32_t{0}));
  EXPECT_EQ(converted("nan", FieldType::T_INT_64), TVariant(int64_t{0}));
}

TEST(DBClauseTest, LiteralForFloatIsASinglePrecisionParse) {
  EXPECT_EQ(converted("2.5", FieldType::T_FLOAT), TVariant(2.5f));
  EXPECT_EQ(converted("0.1", FieldType::T_FLOAT), TVariant(0.1f));
  EXPECT_EQ(converted("x", FieldType::T_FLOAT), TVariant(0.0f));
}

TEST(DBClauseTest, LiteralForWideTextIsConverted) {
  EXPECT_EQ(converted("Caf\xc3\xa9", FieldType::T_WIDE_TEXT), TVariant(std::wstring(L"Caf\u00e9")));
  EXPECT_EQ(converted("", FieldType::T_WIDE_TEXT), TVariant(std::wstring()));
}

TEST(DBClauseTest, LiteralForAnUnknownTypeCodeFails) {
  FieldType type = static_cast<FieldType>(8);
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(operand("1"), type, false));
}

TEST(DBClauseTest, OperatorWithoutBothSidesFails) {
  FieldType type = FieldType::T_NONE;
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(operatorNode(dbcore::kOperatorEqual, operand("a"), nullptr),
                                              type, false));
  EXPECT_FALSE(dbcore::validateTypes<DBImage>(operatorNode(dbcore::kOperatorEqual, nullptr, operand("a")),
                                              type, false));
}

TEST(DBClauseTest, OperatorNodeIsAlwaysBoolean) {
  FieldType type = FieldType::T_NONE;
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(
      operatorNode(dbcore::kOperatorLess, operand("width"), operand("3")), type, false));
  EXPECT_EQ(type, FieldType::T_BOOL);
  type = FieldType::T_NONE;
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(operatorNode(dbcore::kOperatorOr, operand("a"), operand("b")),
                                             type, false));
  EXPECT_EQ(type, FieldType::T_BOOL);
}

TEST(DBClauseTest, BooleanSubexpressionsCombine) {
  EXPECT_FALSE(clauseWithCondition<DBImage>("width > 1 && (height < 2 || lost == 3)", false).empty());
  EXPECT_FALSE(clauseWithCondition<DBUserImgAttrib>("(rating > 1) == lost_bool", false).empty());
}

TEST(DBClauseTest, BooleanSubexpressionComparedWithAnIntegerColumnFails) {
  EXPECT_TRUE(clauseWithCondition<DBImage>("(width > 1) == height", false).empty());
}

TEST(DBClauseTest, ColumnsOfTheSameTypeCompare) {
  const DBClause clause = clauseWithCondition<DBImage>("width < height", true);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(referenceOf(clause.root()->left), other("images", "width"));
  EXPECT_EQ(referenceOf(clause.root()->right), other("images", "height"));
}

TEST(DBClauseTest, TextNodeIsAcceptedUnchanged) {
  const Node node = textNode(dbcore::SELECT_MAX("width", "images"));
  FieldType type = FieldType::T_INT;
  EXPECT_TRUE(dbcore::validateTypes<DBImage>(node, type, false));
  EXPECT_EQ(type, FieldType::T_INT);
  EXPECT_EQ(node->var->asText(), dbcore::SELECT_MAX("width", "images"));
}

TEST(DBClauseTest, ColumnFunctionIsComparedWithItsColumnUnconverted) {
  const DBClause clause =
      clauseWithCondition<DBImage>("import_index == max_from_column(import_index)", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(referenceOf(clause.root()->left), source("import_index"));
  EXPECT_EQ(clause.root()->right->op, dbcore::kTextNode);
  EXPECT_EQ(referenceOf(clause.root()->right), (DBEngineReference{Kind::Max, "images", "import_index"}));
}

TEST(DBClauseTest, ColumnFunctionOnTheLeftWithJoinedTable) {
  const DBClause clause =
      clauseWithCondition<DBExivImgAttrib>("min_from_column(date_time_int_64) < date_time_int_64", true);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(referenceOf(clause.root()->left),
            (DBEngineReference{Kind::Min, "image_exiv_attributes", "date_time_int_64"}));
  EXPECT_EQ(referenceOf(clause.root()->right), other("image_exiv_attributes", "date_time_int_64"));
}

TEST(DBClauseTest, UnknownNameComparedWithAColumnIsALiteralOfItsType) {
  const DBClause clause = clauseWithCondition<DBImage>("no_such_column == _id_int_64", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(*clause.root()->left->var, TVariant(int64_t{0}));
  const DBClause wide = clauseWithCondition<DBImage>("guid_wide_ch != no_such_column", false);
  ASSERT_FALSE(wide.empty());
  EXPECT_EQ(*wide.root()->right->var, TVariant(std::wstring(L"no_such_column")));
}

TEST(DBClauseTest, EmptyQuotesAreAnEmptyTextLiteral) {
  const DBClause clause = clauseWithCondition<DBImage>("path_wide_ch == ''", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(*clause.root()->right->var, TVariant(std::wstring()));
}

TEST(DBClauseTest, ConditionsOfTheOtherRecordTypes) {
  const std::string fixed = "(marked_to_delete_bool == false)";
  EXPECT_FALSE(clauseWithCondition<dbcore::DBPath>(fixed + " && (path_wide_ch != '')", false).empty());
  EXPECT_FALSE(clauseWithCondition<dbcore::DBVolume>(fixed + " && (uuid_wide_ch == 'A-B')", false).empty());
  EXPECT_FALSE(clauseWithCondition<dbcore::DBRefFolder>(fixed + " && (order_float < 2.5)", false).empty());
  const DBClause alias = clauseWithCondition<dbcore::DBEntityFavoriteAlias>(
      fixed + " && (favorite_bool == true && orig_entity_type == 1)", false);
  ASSERT_FALSE(alias.empty());
  const auto operands = operandsOf(alias);
  ASSERT_EQ(operands.size(), 6u);
  EXPECT_EQ(*operands[3]->var, TVariant(true));
  EXPECT_EQ(*operands[5]->var, TVariant(int32_t{1}));
  EXPECT_TRUE(clauseWithCondition<dbcore::DBVolume>("uuid_wide_ch == _id_int_64", false).empty());
}

TEST(DBClauseTest, ConditionOfTheMaximumLengthGivesAClause) {
  const std::string prefix = "path_wide_ch == '";
  const std::string condition =
      prefix + std::string(dbcore::DBConditionTokenizer::kMaxConditionLength - prefix.size() - 1, 'x') + "'";
  const DBClause clause = clauseWithCondition<DBImage>(condition, false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(clause.root()->right->var->asWideText().size(), condition.size() - prefix.size() - 1);
}

TEST(DBClauseTest, ChainOfTheMaximumDepthGivesAClause) {
  std::string condition = "width == 1";
  for (std::size_t i = 1; i < dbcore::DBConditionTokenizer::kMaxOperatorDepth; ++i)
    condition += " || width == 1";
  EXPECT_FALSE(clauseWithCondition<DBImage>(condition, false).empty());
}

// ---- Literals that look like SQL or like engine texts stay plain values ----

class DBClauseInjectionTest : public testing::TestWithParam<std::string> {};

TEST_P(DBClauseInjectionTest, QuotedLiteralStaysAPlainValue) {
  std::string quoted;
  for (const char c : GetParam()) quoted += (c == '\'' || c == '\\') ? std::string{'\\', c} : std::string{c};
  for (const bool joined : {false, true}) {
    const DBClause clause = clauseWithCondition<DBImage>("path_wide_ch == '" + quoted + "'", joined);
    ASSERT_FALSE(clause.empty());
    const auto operands = operandsOf(clause);
    ASSERT_EQ(operands.size(), 2u);
    EXPECT_EQ(*operands[1]->var, TVariant(std::wstring(GetParam().begin(), GetParam().end())));
    const DBClause text = clauseWithCondition<DBImage>("'" + quoted + "' == 'other'", joined);
    ASSERT_FALSE(text.empty());
    EXPECT_EQ(*text.root()->left->var, TVariant(GetParam()));
    EXPECT_FALSE(referenceOf(text.root()->left).has_value());
  }
}

INSTANTIATE_TEST_SUITE_P(DBClauseLiterals, DBClauseInjectionTest,
                         testing::Values("' OR 1=1 --", "x'; DROP TABLE images; --", ";", "/*", "*/", "--",
                                         "images.path_wide_ch", "src_id_int_64", "0src0path_wide_ch",
                                         "\\0src\\0path_wide_ch", "oth images path_wide_ch",
                                         "SELECT MAX(_id_int_64) FROM images", "?", "?1", ":name", "%_"));

TEST(DBClauseTest, BackslashZeroInALiteralIsTheCharacterZero) {
  const DBClause clause = clauseWithCondition<DBImage>(R"('\0src\0width' == x)", false);
  ASSERT_FALSE(clause.empty());
  EXPECT_EQ(*clause.root()->left->var, TVariant(std::string("0src0width")));
  EXPECT_FALSE(referenceOf(clause.root()->left).has_value());
}

// ---- Malformed conditions ----

struct Malformed {
  const char* name;
  std::string condition;
};

void PrintTo(const Malformed& malformed, std::ostream* out) { *out << malformed.name; }

std::string repeated(const std::string& text, std::size_t count) {
  std::string result;
  for (std::size_t i = 0; i < count; ++i) result += text;
  return result;
}

class DBClauseMalformedTest : public testing::TestWithParam<Malformed> {};

TEST_P(DBClauseMalformedTest, GivesTheEmptyClause) {
  const std::string& condition = GetParam().condition;
  EXPECT_TRUE(clauseWithCondition<DBImage>(condition, false).empty());
  EXPECT_TRUE(clauseWithCondition<DBImage>(condition, true).empty());
  EXPECT_TRUE(clauseWithCondition<DBUserImgAttrib>(condition, true).empty());
  EXPECT_TRUE(clauseWithCondition<DBExivImgAttrib>(condition, true).empty());
}

INSTANTIATE_TEST_SUITE_P(
    DBClauseConditions, DBClauseMalformedTest,
    testing::Values(
        Malformed{"OpenParenthesis", "("}, Malformed{"CloseParenthesis", ")"},
        Malformed{"UnclosedParenthesis", "(marked_to_delete_bool == false"},
        Malformed{"UnopenedParenthesis", "marked_to_delete_bool == false)"},
        Malformed{"DoubleOpen", "((_id_int_64 == 1)"}, Malformed{"DoubleClose", "(_id_int_64 == 1))"},
        Malformed{"EmptyParentheses", "()"}, Malformed{"EmptyOperandInParentheses", "_id_int_64 == ()"},
        Malformed{"DanglingAnd", "marked_to_delete_bool == false &&"},
        Malformed{"DanglingOr", "marked_to_delete_bool == false ||"},
        Malformed{"LeadingAnd", "&& _id_int_64 == 1"}, Malformed{"OperatorOnly", "=="},
        Malformed{"DoubledOperator", "_id_int_64 == == 1"}, Malformed{"MissingOperator", "_id_int_64 1"},
        Malformed{"ThirdOperand", "_id_int_64 == 1 2"},
        Malformed{"DifferentColumnTypes", "_id_int_64 == marked_to_delete_bool"},
        Malformed{"BooleanAgainstInteger", "(_id_int_64 == 1) == _id_int_64"},
        Malformed{"UnterminatedQuote", "path_wide_ch == 'a.jpg"},
        Malformed{"UnterminatedDoubleQuote", "path_wide_ch == \"a.jpg"},
        Malformed{"TrailingBackslash", "path_wide_ch == 'a\\"}, Malformed{"SingleEquals", "_id_int_64 = 1"},
        Malformed{"SqlOr", "_id_int_64 == 1 OR 1 == 1"},
        Malformed{"Semicolon", "_id_int_64 == 1; DROP TABLE images"},
        Malformed{"SqlComment", "_id_int_64 == 1 -- x"}, Malformed{"BlockComment", "_id_int_64 == 1 /* x */"},
        Malformed{"UnknownCharacter", "_id_int_64 == $1"},
        Malformed{"NulByte", std::string("_id_int_64 == 1\0", 16)},
        Malformed{"SourceTextWithNul", "path_wide_ch == '" + dbcore::SOURCE_VAL("path_wide_ch") + "'"},
        Malformed{"TwoEmptyQuotes", "'' ''"}, Malformed{"EmptyQuotesDangling", "path_wide_ch == '' &&"},
        Malformed{"QuotedOperator", "'&&'"}, Malformed{"QuotedFunctionWord", "'max_from_column'"},
        Malformed{"BareFunctionWord", "max_from_column"},
        Malformed{"FunctionWithoutColumn", "_id_int_64 == max_from_column()"},
        Malformed{"FunctionUnclosed", "_id_int_64 == min_from_column(_id_int_64"},
        Malformed{
            "OverLongCondition",
            "path_wide_ch == '" + std::string(dbcore::DBConditionTokenizer::kMaxConditionLength, 'x') + "'"},
        Malformed{"TenThousandLevels", repeated("(", 10000) + "_id_int_64 == 1" + repeated(")", 10000)},
        Malformed{"TenThousandUnclosedLevels", repeated("(", 10000)},
        Malformed{"TenThousandOperatorLevels", "1" + repeated(" || 1", 10000)}),
    [](const testing::TestParamInfo<Malformed>& info) { return std::string(info.param.name); });

// ---- The engine's invariants ----

TEST(DBClauseDeathTest, ColumnFunctionWordAtTheBottomOfTheStack) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  ConditionStack stack = stackOf({dbcore::kMaxFromColumn});
  EXPECT_DEATH(dbcore::makeTokenNodeWithConditionStack<DBImage>(stack), "!stack\\.empty\\(\\)");
  ConditionStack min_stack = stackOf({dbcore::kMinFromColumn});
  EXPECT_DEATH(dbcore::makeTokenNodeWithConditionStack<DBUserImgAttrib>(min_stack), "!stack\\.empty\\(\\)");
}

TEST(DBClauseDeathTest, TextNodeWithoutText) {
  GTEST_FLAG_SET(death_test_style, "threadsafe");
  const Node number = valueNode(TVariant(int32_t{1}));
  number->op = dbcore::kTextNode;
  FieldType type = FieldType::T_NONE;
  EXPECT_DEATH(dbcore::validateTypes<DBImage>(number, type, false), "token->var->type == FieldType::T_TEXT");
  auto empty = std::make_shared<token_node>();
  empty->op = dbcore::kTextNode;
  const Node tree = operatorNode(dbcore::kOperatorEqual, operand("width"), empty);
  EXPECT_DEATH(dbcore::validateTypes<DBImage>(tree, type, false), "token->var->type == FieldType::T_TEXT");
}

}  // namespace
