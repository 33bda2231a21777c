-- The content of a quote database before the first quote, which the host stores when it is installed.

INSERT INTO CINFO (QUOTE_PRE, QUOTE_VAL, QUOTE_SUF, second_mu, recore_mu, after_mu) VALUES ('', 1001, '', 15, 15, 20);

INSERT INTO INSURER (NAME, KEST, RR_RATE, RA_RATE, S1_RATE, S2_RATE, S3_RATE, M1_RATE, M2_RATE, M3_RATE, new_mu, excess_gst, street, suburb, contact, phone, Fax, email) VALUES
    ('KEST Universal Insurer', 1, 38, 42, 40, 42, 44, 46, 48, 52, 25, 1, '', '', '', '', '', '');

-- the unknown model, for cars from quote requests
INSERT INTO MODEL (MODEL_ID, MODEL_ID1, MAKE, MODEL) VALUES ('Z000', 'Z000', 'UNIVERSAL', 'MODEL');
INSERT INTO ALLMODEL (MODEL_ID, MAKE, MODEL, SCHEDULE) VALUES ('Z000', 'UNIVERSAL', 'MODEL', '');

INSERT INTO BODY2 (body_id2, body_desc2) VALUES
    ('2C', '2 Door Coupe'),
    ('2U', '2 Door Utility'),
    ('3H', '3 Door Hatch'),
    ('4S', '4 Door Sedan'),
    ('4U', '4 Door Utility'),
    ('4W', '4 Door Wagon'),
    ('5H', '5 Door Hatch'),
    ('5V', '5 Door Van');

INSERT INTO JOBSTAGE (stage, description) VALUES
    (1, 'Quoting'),
    (2, 'Quote Printed'),
    (3, 'With Insurer'),
    (4, 'Authorised'),
    (5, 'Booked In'),
    (6, 'In Repair'),
    (7, 'Completed'),
    (8, 'Invoiced'),
    (9, 'Request Cancelled'),
    (10, 'Tender Failed');

INSERT INTO KESTColours (id, Code, Script) VALUES
    (1, 'AQUA', 'Aqua'),
    (2, 'BEIG', 'Beige'),
    (3, 'BLAK', 'Black'),
    (4, 'BLUE', 'Blue'),
    (5, 'BROW', 'Brown'),
    (6, 'CHAM', 'Champagne'),
    (7, 'GOLD', 'Gold'),
    (8, 'GREN', 'Green'),
    (9, 'GREY', 'Grey'),
    (10, 'MARN', 'Maroon'),
    (11, 'ORAG', 'Orange'),
    (12, 'PINK', 'Pink'),
    (13, 'PURP', 'Purple'),
    (14, 'RED', 'Red'),
    (15, 'SILV', 'Silver'),
    (16, 'WHIT', 'White'),
    (17, 'YELW', 'Yellow');

INSERT INTO SUBLET (Sublet, Type, Script) VALUES
    (1, 'AIRC', 'Air Conditioning'),
    (1, 'ELEC', 'Auto Electrical'),
    (1, 'GLAS', 'Windscreen and Glass'),
    (1, 'MECH', 'Mechanical Repair'),
    (1, 'TOWI', 'Towing'),
    (1, 'TRIM', 'Trimming'),
    (1, 'WHAL', 'Wheel Alignment'),
    (1, 'WHRE', 'Wheel Repair'),
    (0, 'ENVL', 'Environmental Levy');

INSERT INTO ReportDefinition (ReportID, ReportName) VALUES
    (710, '710.html'),
    (720, '720.html'),
    (730, '730.html');
