#pragma once

// An empty place in the class family of the parser, kept for code that derives from it.
class CZRTransformTree {
 public:
    CZRTransformTree() = default;
    CZRTransformTree(const CZRTransformTree&) = default;
    virtual ~CZRTransformTree() = default;
};
