#pragma once

/// The text of page.html, with the marks @META@, @VOXELS@ and @MASK@.
extern const char pageTemplate[];
