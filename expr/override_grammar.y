/* The grammar of dynamic-field texts: assignments to settings, separated by ";", whose right
   sides are expressions over literals, variables, calls and the infix operators. Each rule's
   action builds the COverrideExpression node of its left side. */

%code requires {
#include "expr/parse_value.h"
/* Declared here rather than with api.value.type, which would mark the type trivial and let the
   parser relocate its stacks bytewise. */
#define PEXEXPRSTYPE ParseValue
}

%code provides {
int pexexprlex();
}

%{
#include <cstdio>
#include <cstring>

#include "expr/expression_tree.h"
#include "expr/override_parser.h"

/* Fixed stacks of 200 entries, never grown. */
#define YYINITDEPTH 200
#define YYMAXDEPTH 200

/* Bison calls an exhausted stack "memory exhausted"; with stacks that never grow that can only
   be a stack overflow, reported under its own name. */
#define YY_(msg) (std::strcmp((msg), "memory exhausted") == 0 ? "parser stack overflow" : (msg))

static void pexexprerror(const char* message) { std::printf("%s\n", message); }
%}

%define api.prefix {pexexpr}

%code {
/* A call node built from its operands, refused once its tree grows past the depth bound, so
   that nothing which walks a tree recursively ever goes deeper than that bound. */
static ParseValue Call(COverrideExpression&& call, int operandDepth) {
    if (operandDepth + 1 > kMaxExpressionDepth) RefuseTooDeep();
    return Hold(std::move(call), operandDepth + 1);
}

static int Deeper(const ParseValue& a, const ParseValue& b) { return a.depth > b.depth ? a.depth : b.depth; }
}

%token TOK_OVERRIDE_SEP TOK_EQUAL TOK_VAR TOK_SETTING TOK_PAREN_L TOK_PAREN_R TOK_COMMA
%token TOK_STRING TOK_FUNCTION_NAME TOK_NUMBER TOK_CONCAT TOK_TRUE TOK_FALSE
%token TOK_BOOL_OR TOK_BOOL_XOR TOK_BOOL_AND TOK_BOOL_NOT

%left TOK_CONCAT
%left TOK_BOOL_OR
%left TOK_BOOL_XOR
%left TOK_BOOL_AND
%precedence TOK_BOOL_NOT

%start override_string

%%

override_string
    : override
    | override_string TOK_OVERRIDE_SEP override
    ;

override
    : TOK_SETTING TOK_EQUAL expression              { MakeAssignment(*$1.node, Take($3)); $$ = ParseValue(); }
    ;

expression
    : term
    | expression TOK_BOOL_AND expression            { $$ = Call(MakeCall("AND", Take($1), Take($3)), Deeper($1, $3)); }
    | expression TOK_BOOL_OR expression             { $$ = Call(MakeCall("OR", Take($1), Take($3)), Deeper($1, $3)); }
    | expression TOK_BOOL_XOR expression            { $$ = Call(MakeCall("XOR", Take($1), Take($3)), Deeper($1, $3)); }
    | expression TOK_CONCAT expression              { $$ = Call(MakeCall("CONCAT", Take($1), Take($3)), Deeper($1, $3)); }
    ;

term
    : TOK_VAR                                       { $$ = Hold(CreateVariable($1.node->stringValue)); }
    | TOK_SETTING                                   { $$ = Hold(CreateVariable($1.node->stringValue)); }
    | function
    | TOK_TRUE
    | TOK_FALSE
    | TOK_NUMBER
    | TOK_STRING
    | TOK_BOOL_NOT expression                       { $$ = Call(MakeCall("NOT", Take($2)), $2.depth); }
    | TOK_PAREN_L expression TOK_PAREN_R            { $$ = $2; }
    ;

function
    : TOK_FUNCTION_NAME TOK_PAREN_L params TOK_PAREN_R  { $$ = Call(AttachParameters(Take($1), Take($3)), $3.depth); }
    ;

params
    : parameter                     { $$ = Hold(COverrideExpression::ParamList(), $1.depth); AddParameter(*$$.node, Take($1)); }
    | params TOK_COMMA parameter    { $$ = $1; $$.depth = Deeper($1, $3); AddParameter(*$$.node, Take($3)); }
    ;

parameter
    : expression
    ;

%%
