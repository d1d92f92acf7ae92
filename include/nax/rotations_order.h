// The axis sequence of an Euler triple.
//
// A triple is always given as the angles about X, Y and Z, in that order of arguments;
// the order value says only in which sequence the elementary rotations are applied.
// With column vectors, naxRotationsOrderXYZ applies X first: the matrix is Rz Ry Rx.
#ifndef NAX_ROTATIONS_ORDER_H
#define NAX_ROTATIONS_ORDER_H

/// Sequence in which the rotations of an Euler triple are applied, first to last.
/// The last two values are deliberately not alphabetical: reversing a sequence pairs
/// 0 with 4, 1 with 3 and 2 with 5.
enum naxRotationsOrder {
  naxRotationsOrderXYZ = 0,  ///< X, Y, Z: Rz Ry Rx
  naxRotationsOrderXZY = 1,  ///< X, Z, Y: Ry Rz Rx
  naxRotationsOrderYXZ = 2,  ///< Y, X, Z: Rz Rx Ry
  naxRotationsOrderYZX = 3,  ///< Y, Z, X: Rx Rz Ry
  naxRotationsOrderZYX = 4,  ///< Z, Y, X: Rx Ry Rz
  naxRotationsOrderZXY = 5   ///< Z, X, Y: Ry Rx Rz
};

#endif  // NAX_ROTATIONS_ORDER_H
