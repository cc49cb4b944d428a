# What doxygen cannot read, or would resolve to nothing, in headers and pages.
/^template <>$/{
N
/defaultRightHandSide/d
}
s/struct std::hash</struct hash</
/^extern template /d
s,\[`volume-road`\](examples/volume-road/README.md),`volume-road`,
