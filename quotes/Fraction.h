#pragma once

// The fraction at the start of the page text behind a price, to be added to the price: "3/8" in plain form
// (what stands behind "12 " in "12 3/8"), or the raised and lowered numbers of "12<sup>3</sup>/<sub>8</sub>".
//
// Above 0 the fraction, 0 when there is none; below 0 it is malformed: -1 when the text has "sup" but not all
// that belongs to it, else what a negative number makes of it. Turns `text` into lower case in place, as
// strlwr does. Integers beyond an int count as the nearest int.
[[nodiscard]] double LookForFraction(char* text);
