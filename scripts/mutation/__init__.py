"""Small changes to the provider's sources, one at a time, and whether its tests notice them."""
