#ifndef MCOBNQRT_BINBINMERGE_H
#define MCOBNQRT_BINBINMERGE_H

/// One decided merge of a small bin with a neighbour.
struct BINBinMerge
{
    int fBinIndex; ///< the left one of the two bins to be joined
    char fSide;    ///< 'L': the small bin goes into its left neighbour; 'R': into its right neighbour
};

#endif
