#include <gtest/gtest.h>

#include <memory>
#include <string>

#include "dbclause.hpp"

namespace {

using dbcore::DBClause;
using dbcore::token_node;

TEST(TokenNodeTest, DefaultNodeIsAnEmptyOperatorNode) {
  const token_node node;
  EXPECT_EQ(node.var, nullptr);
  EXPECT_EQ(node.left, nullptr);
  EXPECT_EQ(node.right, nullptr);
  EXPECT_EQ(node.op, dbcore::kOperand);
}

TEST(TokenNodeTest, TextNodeHoldsTheTextAsTextValue) {
  const token_node node(std::string("marked_to_delete_bool"));
  ASSERT_NE(node.var, nullptr);
  EXPECT_EQ(node.var->type(), dbcore::FieldType::T_TEXT);
  EXPECT_EQ(node.var->asText(), "marked_to_delete_bool");
  EXPECT_EQ(node.op, dbcore::kOperand);
  EXPECT_EQ(node.left, nullptr);
  EXPECT_EQ(node.right, nullptr);
}

TEST(TokenNodeTest, EmptyTextIsAnOperandToo) {
  const token_node node(std::string{});
  ASSERT_NE(node.var, nullptr);
  EXPECT_EQ(node.var->asText(), "");
}

TEST(TokenNodeTest, NodeOverAClauseSharesTheRootsParts) {
  auto root = std::make_shared<token_node>();
  root->op = dbcore::kOperatorAnd;
  root->left = std::make_shared<token_node>(std::string("a"));
  root->right = std::make_shared<token_node>(std::string("b"));
  root->var = std::make_shared<dbcore::TVariant>(true);
  const DBClause clause(root);

  const token_node node(clause);
  EXPECT_EQ(node.op, dbcore::kOperatorAnd);
  EXPECT_EQ(node.left, root->left);
  EXPECT_EQ(node.right, root->right);
  EXPECT_EQ(node.var, root->var);
}

TEST(TokenNodeTest, NodeOverTheEmptyClauseIsEmpty) {
  const token_node node{DBClause()};
  EXPECT_EQ(node.var, nullptr);
  EXPECT_EQ(node.left, nullptr);
  EXPECT_EQ(node.right, nullptr);
  EXPECT_EQ(node.op, dbcore::kOperand);
}

}  // namespace
