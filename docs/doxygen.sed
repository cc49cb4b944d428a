# What doxygen cannot read, or would resolve to nothing, in headers and pages; and free functions are listed only for files
# that have a comment of their own.
/^template <>$/{
N
/defaultRightHandSide/d
}
s/struct std::hash</struct hash</
s!^#pragma once$!/** @file */!
/^extern template /d
s,\[`volume-road`\](examples/volume-road/README.md),`volume-road`,
